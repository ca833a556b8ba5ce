// SPDX-License-Identifier: Apache-2.0
//
// write_protozero_peer FILE: for every message class a plain struct and a decoder in the way of protozero's manual, a
// loop over the fields with a switch.
#include <fstream>
#include <string>

#include "messages/registry.h"

namespace {

using probeview::FieldDescriptor;
using probeview::FieldKind;

struct Code {
  std::string type;
  std::string read;  // the call on the reader
};

Code codeOf(const FieldDescriptor& field) {
  const std::string member = "message." + std::string(field.name);
  const std::string element = field.element == nullptr ? std::string() : std::string(field.element->name);
  switch (field.kind) {
    case FieldKind::UInt64:
      return {"std::optional<std::uint64_t>", member + " = reader.get_uint64();"};
    case FieldKind::UInt32:
      return {"std::optional<std::uint32_t>", member + " = reader.get_uint32();"};
    case FieldKind::Int32:
    case FieldKind::Enumeration:
      return {"std::optional<std::int32_t>", member + " = reader.get_enum();"};
    case FieldKind::SInt32:
      return {"std::optional<std::int32_t>", member + " = reader.get_sint32();"};
    case FieldKind::Bool:
      return {"std::optional<bool>", member + " = reader.get_bool();"};
    case FieldKind::Bytes:
    case FieldKind::Text:
      return {"std::optional<std::string>", member + " = reader.get_string();"};
    case FieldKind::Message:
      return {"std::optional<" + element + ">", "decode(reader.get_message(), " + member + ".emplace());"};
    case FieldKind::RepeatedMessage:
      return {"std::vector<" + element + ">", "decode(reader.get_message(), " + member + ".emplace_back());"};
    case FieldKind::RepeatedUInt32:
      return {"std::vector<std::uint32_t>",
              "for (const auto value : reader.get_packed_uint32()) " + member + ".push_back(value);"};
    case FieldKind::RepeatedSInt32:
      return {"std::vector<std::int32_t>",
              "for (const auto value : reader.get_packed_sint32()) " + member + ".push_back(value);"};
  }
  return {};
}

void writeMessage(std::ofstream& out, const probeview::MessageDescriptor& message) {
  out << "struct " << message.name << " {\n";
  for (const FieldDescriptor& field : message.fields()) out << "  " << codeOf(field).type << " " << field.name << ";\n";
  out << "};\n\ninline void decode(protozero::pbf_reader reader, " << message.name << "& message) {\n"
      << "  while (reader.next()) {\n    switch (reader.tag()) {\n";
  for (const FieldDescriptor& field : message.fields()) {
    out << "      case " << field.number << ":\n        " << codeOf(field).read << "\n        break;\n";
  }
  out << "      default:\n        reader.skip();\n    }\n  }\n}\n\n";
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) return 2;
  std::ofstream out(argv[1]);
  out << "#pragma once\n#include <cstdint>\n#include <optional>\n#include <protozero/pbf_reader.hpp>\n"
         "#include <string>\n#include <vector>\n\nnamespace zero {\n\n";
  // Elements before the messages that hold them.
  for (const bool isNested : {true, false}) {
    for (const probeview::MessageDescriptor* message : probeview::messageClasses()) {
      bool holds = false;
      for (const FieldDescriptor& field : message->fields()) holds = holds || field.element != nullptr;
      if (holds != isNested) writeMessage(out, *message);
    }
  }
  out << "}  // namespace zero\n";
  return out.flush() ? 0 : 1;
}
