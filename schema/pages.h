// SPDX-License-Identifier: Apache-2.0
//
// The published schema and the page of metrics, made from the field tables. The programs write them with
// build/dev/bin/metrics_page; a test fails when what is committed is not what the tables say.
#pragma once

#include <string>
#include <string_view>
#include <vector>

#include "messages/runtime/field_descriptor.h"

namespace probeview {

struct Page {
  std::string path;  // from the root of the repository, such as "schema/lte.proto"
  std::string content;
};

// The four .proto files and docs/metrics.md.
std::vector<Page> schemaPages();

// The type of a field of that message as the schema has it: "uint32", "RxInfo", "KCellularLteRrcState.State", "list of
// sint32".
std::string publishedType(const MessageDescriptor& message, const FieldDescriptor& field);

// The name of an enumeration's value 0 where the enumeration itself has none: proto3 wants one.
std::string unnamedZero(std::string_view enumeration);

}  // namespace probeview
