// SPDX-License-Identifier: Apache-2.0
//
// All message classes, for those who walk through them or pick one by its name.
#pragma once

#include <span>
#include <string_view>

#include "messages/runtime/field_descriptor.h"

namespace probeview {

// The message classes, LTE, UMTS, GSM, then NAS, bearers and SIM; the order is fixed. descriptor->make() makes an
// empty message of the class.
std::span<const MessageDescriptor* const> messageClasses() noexcept;

// Null when no class has that name.
const MessageDescriptor* messageClass(std::string_view name) noexcept;

}  // namespace probeview
