// SPDX-License-Identifier: Apache-2.0
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

namespace probeview {

// The display dictionaries of the metric store, one per metric kind, in the order in which they are declared there.
enum class DisplayDictionary : std::uint8_t {
  myLTERRCStateDict,
  myLTECDRXConfigDict,
  myLTESCellInfoDict,
  myLTESCellMeasDict,
  myLTESelReselDict,
  myLTERsrpRsrqSinrDict,
  myLTECompCarrDict,
  myLTETxPowerDict,
  myLTEInterRatMeasDict,
  myLTEIntraRatMeasDict,
  myLTECAStatusDict,
  myLTEEMMContextDict,
  myCellularMMCommonInfoDict,
  myCellularActiveBearerDict,
  myGMMContextDict,
  myMMContextDict,
  myUMTSRRCStateDict,
  myUMTSRRCConfigDict,
  myUMTSCellInfoDict,
  myUMTSCellMeasDict,
  myUMTSTxPowerDict,
  myUMTSSelReselDict,
  myUMTSNbrMeasDict,
  myGSMScellInfoDict,
  myGSMIdleConfigInfoDict,
  myGSMIdleScellMeasDict,
  myGSMConnRfMeasDict,
  myGSMNbrMeasDict,
  myGSMGPRSConfigDict,
  mySIMFileInfoDict,
};

// Their names, in the order of the enumeration; for tools that list or find them by name.
inline constexpr auto displayDictionaryNames = std::to_array<std::string_view>({
    "myLTERRCStateDict",          "myLTECDRXConfigDict",        "myLTESCellInfoDict",  "myLTESCellMeasDict",
    "myLTESelReselDict",          "myLTERsrpRsrqSinrDict",      "myLTECompCarrDict",   "myLTETxPowerDict",
    "myLTEInterRatMeasDict",      "myLTEIntraRatMeasDict",      "myLTECAStatusDict",   "myLTEEMMContextDict",
    "myCellularMMCommonInfoDict", "myCellularActiveBearerDict", "myGMMContextDict",    "myMMContextDict",
    "myUMTSRRCStateDict",         "myUMTSRRCConfigDict",        "myUMTSCellInfoDict",  "myUMTSCellMeasDict",
    "myUMTSTxPowerDict",          "myUMTSSelReselDict",         "myUMTSNbrMeasDict",   "myGSMScellInfoDict",
    "myGSMIdleConfigInfoDict",    "myGSMIdleScellMeasDict",     "myGSMConnRfMeasDict", "myGSMNbrMeasDict",
    "myGSMGPRSConfigDict",        "mySIMFileInfoDict",
});
inline constexpr std::size_t displayDictionaryCount = displayDictionaryNames.size();
static_assert(displayDictionaryCount == 30);
static_assert(displayDictionaryCount == static_cast<std::size_t>(DisplayDictionary::mySIMFileInfoDict) + 1);

constexpr std::string_view displayDictionaryName(DisplayDictionary dictionary) {
  return displayDictionaryNames[static_cast<std::size_t>(dictionary)];
}

// Absent when no display dictionary has that name.
constexpr std::optional<DisplayDictionary> displayDictionaryNamed(std::string_view name) {
  for (std::size_t index = 0; index < displayDictionaryCount; ++index) {
    if (displayDictionaryNames[index] == name) return static_cast<DisplayDictionary>(index);
  }
  return std::nullopt;
}

}  // namespace probeview
