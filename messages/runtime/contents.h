// SPDX-License-Identifier: Apache-2.0
//
// Copying, merging, comparing and hashing what messages hold. All messages of one call are of the class that the
// descriptor describes. Internal to the runtime.
#pragma once

#include <cstdint>

#include "messages/runtime/codable.h"

namespace probeview {

bool isPresent(const PBCodable& message, const FieldDescriptor& row) noexcept;
// Nested messages are shared.
void copyContents(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor);
// Nested messages are copied. The target is empty; what it needs comes from the block if there is one.
void copyDeeply(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor, Block* block);
void moveContents(PBCodable& target, PBCodable& source, const MessageDescriptor& descriptor) noexcept;
void mergeContents(PBCodable& target, const PBCodable& source, const MessageDescriptor& descriptor);
bool haveEqualContents(const PBCodable& left, const PBCodable& right, const MessageDescriptor& descriptor) noexcept;
std::uint64_t hashOfContents(const PBCodable& message, const MessageDescriptor& descriptor) noexcept;

}  // namespace probeview
