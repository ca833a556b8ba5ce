// SPDX-License-Identifier: Apache-2.0
#include "messages/runtime/dictionary.h"

#include <charconv>

namespace probeview {

List listOf(const PBMessageList& elements, const MessageDescriptor& descriptor) {
  List list;
  List::Filler values(list, elements.count());
  for (std::size_t index = 0; index < elements.count(); ++index) values.append(descriptor.dictionary(elements[index]));
  return list;
}

Value unknownName(std::int32_t value) {
  char text[32] = "(unknown: ";
  char* end = std::to_chars(text + 10, text + sizeof text - 1, value).ptr;
  *end++ = ')';
  return Value::text({text, static_cast<std::size_t>(end - text)});
}

}  // namespace probeview
