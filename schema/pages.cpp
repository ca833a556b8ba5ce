// SPDX-License-Identifier: Apache-2.0
#include "schema/pages.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <map>
#include <span>

#include "messages/metric_identifiers.h"
#include "messages/registry.h"
#include "schema/field_text.h"
#include "values/plain_text.h"

namespace probeview {

namespace {

struct Family {
  std::string_view name;  // of the file
  std::string_view title;
  std::string_view first;  // the first of its classes in the registry
};

constexpr std::array families = {
    Family{"lte", "LTE", "KCellularLteRrcState"},
    Family{"umts", "UMTS", "KCellularWcdmaRrcConnectionState"},
    Family{"gsm", "GSM", "KCellularGsmScellInfo"},
    Family{"nas", "NAS, bearers and SIM", "KCellularMmCommonInfo"},
};

std::vector<const MessageDescriptor*> classesOf(const Family& family) {
  std::vector<const MessageDescriptor*> classes;
  const Family* current = nullptr;
  for (const MessageDescriptor* descriptor : messageClasses()) {
    for (const Family& candidate : families) {
      if (descriptor->name == candidate.first) current = &candidate;
    }
    if (current != nullptr && current->name == family.name) classes.push_back(descriptor);
  }
  return classes;
}

const Family& familyOf(const MessageDescriptor& descriptor) {
  for (const Family& family : families) {
    const std::vector<const MessageDescriptor*> classes = classesOf(family);
    if (std::find(classes.begin(), classes.end(), &descriptor) != classes.end()) return family;
  }
  return families.front();
}

// Where an enumeration is published: in the message whose field first uses it, under the name of that field.
struct Home {
  const MessageDescriptor* message;
  std::string name;  // "PrevState" for the field "prev_state"
};

std::string camelCase(std::string_view key) {
  std::string name;
  bool isStart = true;
  for (const char character : key) {
    if (character == '_') {
      isStart = true;
    } else {
      name += isStart ? static_cast<char>(std::toupper(static_cast<unsigned char>(character))) : character;
      isStart = false;
    }
  }
  return name;
}

const std::map<const EnumerationTable*, Home>& enumerationHomes() {
  static const auto homes = [] {
    std::map<const EnumerationTable*, Home> found;
    for (const MessageDescriptor* descriptor : messageClasses()) {
      for (const FieldDescriptor& field : descriptor->fields()) {
        if (field.enumeration != nullptr) found.try_emplace(field.enumeration, Home{descriptor, camelCase(field.name)});
      }
    }
    return found;
  }();
  return homes;
}

std::string protoType(const MessageDescriptor& message, const FieldDescriptor& field) {
  switch (field.kind) {
    case FieldKind::UInt64:
      return "uint64";
    case FieldKind::UInt32:
    case FieldKind::RepeatedUInt32:
      return "uint32";
    case FieldKind::Int32:
      return "int32";
    case FieldKind::Enumeration: {
      const Home& home = enumerationHomes().at(field.enumeration);
      return (home.message == &message ? std::string() : std::string(home.message->name) + ".") + home.name;
    }
    case FieldKind::SInt32:
    case FieldKind::RepeatedSInt32:
      return "sint32";
    case FieldKind::Bool:
      return "bool";
    case FieldKind::Bytes:
      return "bytes";
    case FieldKind::Text:
      return "string";
    case FieldKind::Message:
    case FieldKind::RepeatedMessage:
      return std::string(field.element->name);
  }
  return {};
}

// The comment, in lines of at most 100 characters.
void appendComment(std::string& out, std::string_view indent, std::string_view text) {
  while (!text.empty()) {
    std::size_t length = text.size();
    if (length > 100) length = text.rfind(' ', 100);
    out += indent;
    out += "// ";
    out += text.substr(0, length);
    out += '\n';
    text.remove_prefix(std::min(text.size(), length + 1));
  }
}

std::string number(std::int64_t value) { return std::to_string(value); }

std::string fieldComment(const MessageDescriptor& message, const FieldDescriptor& field) {
  std::string text = meaningText(message, field) + '.';
  const std::string viewer = viewerText(message, field);
  if (!viewer.empty()) text += " In the viewer: " + viewer + ".";
  return text;
}

Page protoFile(const Family& family) {
  std::string out =
      "// SPDX-License-Identifier: Apache-2.0\n"
      "//\n"
      "// Metrics of a cellular baseband: " +
      std::string(family.title) +
      ".\n"
      "// Made from the field tables by metrics_page; do not edit.\n"
      "syntax = \"proto3\";\n\n"
      "package cellular_metrics;\n";
  std::vector<std::string_view> imports;
  for (const MessageDescriptor* message : classesOf(family)) {
    for (const FieldDescriptor& field : message->fields()) {
      const MessageDescriptor* used = field.element;
      if (field.enumeration != nullptr) used = enumerationHomes().at(field.enumeration).message;
      if (used == nullptr) continue;
      const std::string_view name = familyOf(*used).name;
      if (name != family.name && std::find(imports.begin(), imports.end(), name) == imports.end()) {
        imports.push_back(name);
      }
    }
  }
  std::sort(imports.begin(), imports.end());
  if (!imports.empty()) out += '\n';
  for (const std::string_view name : imports) out += "import \"" + std::string(name) + ".proto\";\n";

  for (const MessageDescriptor* message : classesOf(family)) {
    out += '\n';
    appendComment(out, "", message->meaning.text);
    out += "message " + std::string(message->name) + " {\n";
    for (const FieldDescriptor& field : message->fields()) {
      if (field.enumeration == nullptr) continue;
      const Home& home = enumerationHomes().at(field.enumeration);
      if (home.message != message || home.name != camelCase(field.name)) continue;
      out += "  enum " + home.name + " {\n";
      if (field.enumeration->name(0).empty()) out += "    " + unnamedZero(home.name) + " = 0;\n";
      for (const EnumerationEntry& entry : field.enumeration->entries()) {
        out += "    " + std::string(entry.name) + " = " + number(entry.value) + ";\n";
      }
      out += "  }\n\n";
    }
    for (const FieldDescriptor& field : message->fields()) {
      appendComment(out, "  ", fieldComment(*message, field));
      out += isRepeated(field.kind) ? "  repeated " : "  optional ";
      out += protoType(*message, field) + " " + std::string(field.name) + " = " + number(field.number) + ";\n";
    }
    out += "}\n";
  }
  return {"schema/" + std::string(family.name) + ".proto", std::move(out)};
}

std::string anchor(std::string_view name) {
  std::string text;
  for (const char character : name) text += static_cast<char>(std::tolower(static_cast<unsigned char>(character)));
  return text;
}

std::string pageType(const MessageDescriptor& message, const FieldDescriptor& field) {
  std::string type = protoType(message, field);
  if (field.element != nullptr) type = "[" + type + "](#" + anchor(type) + ")";
  if (field.enumeration != nullptr) {
    const Home& home = enumerationHomes().at(field.enumeration);
    const std::string name = std::string(home.message->name) + "." + home.name;
    type = "[" + name + "](#" + anchor(home.message->name) + anchor(home.name) + ")";
  }
  return isRepeated(field.kind) ? "list of " + type : type;
}

void appendFields(std::string& out, const MessageDescriptor& message) {
  out += "| no. | field | type | meaning | in the viewer |\n|---|---|---|---|---|\n";
  for (const FieldDescriptor& field : message.fields()) {
    out += "| " + number(field.number) + " | `" + std::string(field.name) + "` | " + pageType(message, field) + " | " +
           meaningText(message, field) + " | " + viewerText(message, field) + " |\n";
  }
  out += '\n';
}

// Those that a field names, in the order in which they are named first; without the one of what measures nothing.
std::vector<const Quantity*> namedQuantities() {
  std::vector<const Quantity*> named;
  for (const MessageDescriptor* message : messageClasses()) {
    for (const FieldDescriptor& field : message->fields()) {
      const Quantity* quantity = message->meaningOf(field).quantity;
      if (quantity == nullptr || quantity->name.empty()) continue;
      if (std::find(named.begin(), named.end(), quantity) == named.end()) named.push_back(quantity);
    }
  }
  return named;
}

std::string readingText(const Quantity& quantity) {
  if (quantity.isHexadecimal) return "decimal and hexadecimal";
  if (quantity.decimals == 0) return "whole numbers";
  return std::to_string(quantity.decimals) + (quantity.decimals == 1 ? " decimal" : " decimals");
}

std::string bandsText(const Quantity& quantity) {
  std::string text;
  for (const QualityBand& band : quantity.bands) {
    text += (text.empty() ? "" : ", ") + std::string(band.name) + " from " + plainNumber(band.lowest);
  }
  return text.empty() ? text : text + " (" + std::string(quantity.bandsSource) + ")";
}

void appendQuantities(std::string& out) {
  out +=
      "## Quantities\n\nWhat the numbers measure, how they travel, and how a person reads them. No standard defines "
      "bands "
      "of quality;\nthose here are what phones draw their bars by.\n\n"
      "| quantity | unit | on the wire | conversion | read as | quality | defined in "
      "|\n|---|---|---|---|---|---|---|\n";
  for (const Quantity* quantity : namedQuantities()) {
    out += "| " + std::string(quantity->name) + " | " + std::string(quantity->unit) + " | " + numbersText(*quantity) +
           " | " + conversionText(*quantity) + " | " + readingText(*quantity) + " | " + bandsText(*quantity) + " | " +
           std::string(quantity->clause) + " |\n";
  }
}

Page metricsPage() {
  std::string out =
      "# Metrics\n\n"
      "Every metric of the service with its identifier and its fields, and where the viewer shows it. The `.proto`\n"
      "files in `schema/` hold the same for protobuf. Made from the field tables by `metrics_page`; do not edit.\n\n"
      "| metric | identifier | message |\n|---|---|---|\n";
  for (const MetricIdentifier& metric : metricIdentifiers()) {
    out += "| `" + std::string(metric.name) + "` | " + hexText(metric.id) + " | ";
    if (metric.message == nullptr) {
      out += "none: known, but not taken";
    } else {
      out += "[" + std::string(metric.message->name) + "](#" + anchor(metric.message->name) + ")";
    }
    out += " |\n";
  }
  for (const Family& family : families) {
    out += "\n## " + std::string(family.title) + "\n\n";
    for (const MessageDescriptor* message : classesOf(family)) {
      out += "### " + std::string(message->name) + "\n\n" + std::string(message->meaning.text) + "\n\n";
      for (const MetricIdentifier& metric : metricIdentifiers()) {
        if (metric.message != message) continue;
        out += "Metric `" + std::string(metric.name) + "`, " + hexText(metric.id) + ".";
      }
      if (const std::string_view dictionary = displayDictionaryOf(*message); !dictionary.empty()) {
        out += " Display dictionary `" + std::string(dictionary) + "`.";
      }
      if (!message->meaning.pages.empty()) {
        if (out.back() != '\n') out += ' ';
        out += "Pages: " + std::string(message->meaning.pages) + ".";
      }
      if (out.back() != '\n') out += "\n\n";
      appendFields(out, *message);
    }
  }
  out += "## Enumerations\n\nA value without a name shows as `(unknown: value)`.\n\n";
  for (const MessageDescriptor* message : messageClasses()) {
    for (const FieldDescriptor& field : message->fields()) {
      if (field.enumeration == nullptr) continue;
      const Home& home = enumerationHomes().at(field.enumeration);
      if (home.message != message || home.name != camelCase(field.name)) continue;
      out += "### " + std::string(message->name) + "." + home.name + "\n\n";
      for (const EnumerationEntry& entry : field.enumeration->entries()) {
        out += "- " + number(entry.value) + " `" + std::string(entry.name) + "`\n";
      }
      out += '\n';
    }
  }
  appendQuantities(out);
  return {"docs/metrics.md", std::move(out)};
}

}  // namespace

std::string publishedType(const MessageDescriptor& message, const FieldDescriptor& field) {
  return (isRepeated(field.kind) ? "list of " : "") + protoType(message, field);
}

std::string unnamedZero(std::string_view enumeration) {
  std::string name;
  for (const char character : enumeration) {
    if (std::isupper(static_cast<unsigned char>(character)) != 0 && !name.empty()) name += '_';
    name += static_cast<char>(std::toupper(static_cast<unsigned char>(character)));
  }
  return name + "_UNNAMED";
}

std::vector<Page> schemaPages() {
  std::vector<Page> pages;
  pages.reserve(families.size() + 1);
  for (const Family& family : families) pages.push_back(protoFile(family));
  pages.push_back(metricsPage());
  return pages;
}

}  // namespace probeview
