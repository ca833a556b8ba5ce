// SPDX-License-Identifier: Apache-2.0
#include "messages/registry.h"

#include "messages/gsm_messages.h"
#include "messages/lte_messages.h"
#include "messages/nas_messages.h"
#include "messages/umts_messages.h"

namespace probeview {

namespace {

constexpr const MessageDescriptor* classes[] = {
#define DESCRIPTOR(Class) &Class::pbDescriptor,
    // clang-format off
    LTE_MESSAGES(DESCRIPTOR)
    UMTS_MESSAGES(DESCRIPTOR)
    GSM_MESSAGES(DESCRIPTOR)
    NAS_MESSAGES(DESCRIPTOR)
// clang-format on
#undef DESCRIPTOR
};

}  // namespace

std::span<const MessageDescriptor* const> messageClasses() noexcept { return classes; }

const MessageDescriptor* messageClass(std::string_view name) noexcept {
  for (const MessageDescriptor* descriptor : classes) {
    if (descriptor->name == name) return descriptor;
  }
  return nullptr;
}

}  // namespace probeview
