// SPDX-License-Identifier: Apache-2.0
#include "ui/category_page_rules.h"

#include <array>
#include <unordered_map>

#include "store/display_dictionaries.h"

namespace probeview {

namespace {

using Store = MetricValidator;

template <const std::optional<Dictionary>& (Store::*property)() const>
const std::optional<Dictionary>& get(const Store& store) {
  return (store.*property)();
}
template <List LTE::*field>
const List& get(const Store& store) {
  return store.myLTE().*field;
}
template <List UMTS::*field>
const List& get(const Store& store) {
  return store.myUMTS().*field;
}
template <List GSM::*field>
const List& get(const Store& store) {
  return store.myGSM().*field;
}
template <List Common::*field>
const List& get(const Store& store) {
  return store.myCommon().*field;
}
template <Dictionary LTE::*field>
const Dictionary& get(const Store& store) {
  return store.myLTE().*field;
}
template <Dictionary UMTS::*field>
const Dictionary& get(const Store& store) {
  return store.myUMTS().*field;
}

template <const std::optional<Dictionary>& (Store::*property)() const>
constexpr PageSource dictionary = DictionarySource(get<property>);
template <auto field>
constexpr PageSource entries = EntryListSource(get<field>);
template <auto field>
constexpr PageSource entry = EntrySource(get<field>);
constexpr PageSource none = NoSource{};

using enum DisplayDictionary;
// A page is fed by metrics, each of which is named by the display dictionary that holds its latest message.
template <DisplayDictionary... dictionaries>
constexpr std::array feeding = {dictionaries...};
template <DisplayDictionary... dictionaries>
constexpr std::span<const DisplayDictionary> fedBy = feeding<dictionaries...>;
constexpr std::span<const DisplayDictionary> fedByNone;

// Named as the enumerators that they are.
// NOLINTBEGIN(readability-identifier-naming)
constexpr auto One = SectionRule::One;
constexpr auto PerEntry = SectionRule::OnePerEntry;
constexpr auto PerField = RowRule::OnePerField;
constexpr auto PerFieldElseComplaint = RowRule::OnePerFieldElseComplaint;
constexpr auto OneRow = RowRule::One;
constexpr auto Field = CellRule::Field;
constexpr auto ComeBackLater = CellRule::ComeBackLater;
// NOLINTEND(readability-identifier-naming)

// What looks uneven is meant so; the reason stands above each such row.
// A table reads by its columns.
// clang-format off
constexpr CategoryPageRule rules[] = {
    // key                             source                                       fed by                             sections  title prefix          rows      cells
    // Nothing reports these two yet.
    {"Device Info IMSI",               none,                                        fedByNone,                         One,      "",                   OneRow,   ComeBackLater},
    {"Device Info IMEISV",             none,                                        fedByNone,                         One,      "",                   OneRow,   ComeBackLater},
    {"Device Info SIM Files",          entries<&Common::simContents>,               fedBy<mySIMFileInfoDict>,          PerEntry, "SIM Content ",       PerField, Field},

    {"LTE NAS",                        dictionary<&Store::myLTEEMMContextDict>,     fedBy<myLTEEMMContextDict>,        One,      "",                   PerField, Field},
    {"LTE RRC State",                  dictionary<&Store::myLTERRCStateDict>,       fedBy<myLTERRCStateDict>,          One,      "",                   PerField, Field},
    // The one page that complains while its dictionary is absent, and shows a blank row instead of none.
    {"LTE Serving Cell Info",          dictionary<&Store::myLTESCellInfoDict>,      fedBy<myLTESCellInfoDict>,         One,      "",                   PerFieldElseComplaint, Field},
    // Entries without a section rule: the first one alone is shown, without a header. No handler fills these entries,
    // nor those of the other pages of LTE that are fed by none: they keep the placeholder.
    {"LTE Serving Cell Meas",          entries<&LTE::RsrpRsrqSinr>,                 fedByNone,                         One,      "",                   PerField, Field},
    {"LTE Tx Power",                   entries<&LTE::TxPower>,                      fedByNone,                         PerEntry, "TxPowerInfo ",       PerField, Field},
    {"LTE Sel Resel Parameters",       entry<&LTE::SelReselCellInfo>,               fedBy<myLTESelReselDict>,          One,      "",                   PerField, Field},
    {"LTE EUTRA Neighbor Info",        entries<&LTE::EutraNbrs>,                    fedBy<myLTESelReselDict>,          PerEntry, "EUTRA Neighbor ",    PerField, Field},
    {"LTE C-DRX",                      dictionary<&Store::myLTECDRXConfigDict>,     fedBy<myLTECDRXConfigDict>,        One,      "",                   PerField, Field},
    {"LTE LTE Neighbor Cell Meas",     entries<&LTE::EutraNbrsMeas>,                fedByNone,                         PerEntry, "LTE Neighbor ",      PerField, Field},
    {"LTE UMTS Neighbor Cell Meas",    entries<&LTE::UtraNbrsMeas>,                 fedByNone,                         PerEntry, "UMTS Neighbor ",     PerField, Field},
    {"LTE GSM Neighbor Cell Meas",     entries<&LTE::GeraNbrsMeas>,                 fedByNone,                         PerEntry, "GSM Neighbor ",      PerField, Field},
    {"LTE CA Status",                  entries<&LTE::CAStatusList>,                 fedBy<myLTECAStatusDict>,          PerEntry, "Component Carrier ", PerField, Field},
    {"LTE Active Bearers",             entries<&Common::activeBearer>,              fedBy<myCellularActiveBearerDict>, PerEntry, "PDP ",               PerField, Field},

    {"UMTS NAS GMM",                   dictionary<&Store::myGMMContextDict>,        fedBy<myGMMContextDict>,           One,      "",                   PerField, Field},
    {"UMTS NAS MM",                    dictionary<&Store::myMMContextDict>,         fedBy<myMMContextDict>,            One,      "",                   PerField, Field},
    {"UMTS RRC State",                 dictionary<&Store::myUMTSRRCStateDict>,      fedBy<myUMTSRRCStateDict>,         One,      "",                   PerField, Field},
    {"UMTS RRC Configuration",         dictionary<&Store::myUMTSRRCConfigDict>,     fedBy<myUMTSRRCConfigDict>,        One,      "",                   PerField, Field},
    {"UMTS Serving Cell Info",         dictionary<&Store::myUMTSCellInfoDict>,      fedBy<myUMTSCellInfoDict>,         One,      "",                   PerField, Field},
    // Counted, never drawn: the cells of these entries stand under "UMTS Serving Cell Measurement", below.
    {"UMTS Serving Cell Meas",         entries<&UMTS::rXInfo>,                      fedBy<myUMTSCellMeasDict>,         PerEntry, "RxInfo ",            PerField, ComeBackLater},
    {"UMTS Tx Power",                  entries<&UMTS::TxPower>,                     fedBy<myUMTSTxPowerDict>,          PerEntry, "TxPowerInfo ",       PerField, Field},
    {"UMTS Sel Resel Parameters",      entry<&UMTS::SelReselCellInfo>,              fedBy<myUMTSSelReselDict>,         One,      "",                   PerField, Field},
    {"UMTS EUTRA Neighbor Info",       entries<&UMTS::eUtraNbrs>,                   fedBy<myUMTSSelReselDict>,         PerEntry, "EUTRA Neighbor ",    PerField, Field},
    {"UMTS UTRA Neighbor Info",        entries<&UMTS::utraNbrs>,                    fedBy<myUMTSSelReselDict>,         PerEntry, "UTRA Neighbor ",     PerField, Field},
    {"UMTS GSM Neighbor Info",         entries<&UMTS::geraNbrs>,                    fedBy<myUMTSSelReselDict>,         PerEntry, "GSM Neighbor ",      PerField, Field},
    {"UMTS LTE Neighbor Cell Meas",    entries<&UMTS::eUtraNbrMeas>,                fedBy<myUMTSNbrMeasDict>,          PerEntry, "LTE Neighbor ",      PerField, Field},
    {"UMTS UMTS Neighbor Cell Meas",   entries<&UMTS::utraNbrMeas>,                 fedBy<myUMTSNbrMeasDict>,          PerEntry, "UMTS Neighbor ",     PerField, Field},
    {"UMTS GSM Neighbor Cell Meas",    entries<&UMTS::geraNbrMeas>,                 fedBy<myUMTSNbrMeasDict>,          PerEntry, "GSM Neighbor ",      PerField, Field},
    {"UMTS Active Bearers",            entries<&Common::activeBearer>,              fedBy<myCellularActiveBearerDict>, PerEntry, "PDP ",               PerField, Field},

    {"GSM NAS GMM",                    dictionary<&Store::myGMMContextDict>,        fedBy<myGMMContextDict>,           One,      "",                   PerField, Field},
    {"GSM NAS MM",                     dictionary<&Store::myMMContextDict>,         fedBy<myMMContextDict>,            One,      "",                   PerField, Field},
    // The dictionaries of GSM have cells but no row rule: the first pair alone is shown.
    {"GSM Serving Cell Info",          dictionary<&Store::myGSMScellInfoDict>,      fedBy<myGSMScellInfoDict>,         One,      "",                   OneRow,   Field},
    {"GSM Idle Config",                dictionary<&Store::myGSMIdleConfigInfoDict>, fedBy<myGSMIdleConfigInfoDict>,    One,      "",                   OneRow,   Field},
    {"GSM Idle Serv Cell Meas",        dictionary<&Store::myGSMIdleScellMeasDict>,  fedBy<myGSMIdleScellMeasDict>,     One,      "",                   OneRow,   Field},
    // Its cells stand under a key without the technology, "Connected Serv Cell Meas", below.
    {"GSM Connected Serv Cell Meas",   none,                                        fedByNone,                         One,      "",                   OneRow,   ComeBackLater},
    // "GSM" and "GSM GPRS Config" join to this; the cells stand under "GSM GPRS Config", below.
    {"GSM GSM GPRS Config",            none,                                        fedByNone,                         One,      "",                   OneRow,   ComeBackLater},
    {"GSM LTE Neighbor Cell Meas",     entries<&GSM::eUtraNbrMeas>,                 fedBy<myGSMNbrMeasDict>,           PerEntry, "LTE Neighbor ",      PerField, Field},
    {"GSM UMTS Neighbor Cell Meas",    entries<&GSM::utraNbrMeas>,                  fedBy<myGSMNbrMeasDict>,           PerEntry, "UMTS Neighbor ",     PerField, Field},
    {"GSM GSM Neighbor Cell Meas",     entries<&GSM::geraNbrMeas>,                  fedBy<myGSMNbrMeasDict>,           PerEntry, "GSM Neighbor ",      PerField, Field},
    {"GSM Active Bearers",             entries<&Common::activeBearer>,              fedBy<myCellularActiveBearerDict>, PerEntry, "PDP ",               PerField, Field},

    // Keys that the lists never join to. Cells alone are known of them, so each has one section, no header and one row.
    {"UMTS Serving Cell Measurement",  entries<&UMTS::rXInfo>,                      fedBy<myUMTSCellMeasDict>,         One,      "",                   OneRow,   Field},
    {"Connected Serv Cell Meas",       dictionary<&Store::myGSMConnRfMeasDict>,     fedBy<myGSMConnRfMeasDict>,        One,      "",                   OneRow,   Field},
    {"LTE Component Carrier Info",     dictionary<&Store::myLTECompCarrDict>,       fedBy<myLTECompCarrDict>,          One,      "",                   OneRow,   Field},
    {"GSM GPRS Config",                dictionary<&Store::myGSMGPRSConfigDict>,     fedBy<myGSMGPRSConfigDict>,        One,      "",                   OneRow,   Field},
};
constexpr CategoryPageRule fallback = {"", none, fedByNone, One, "", OneRow, ComeBackLater};
// clang-format on

}  // namespace

const CategoryPageRule& categoryPageRule(std::string_view key) {
  static const auto* byKey = [] {
    auto* map = new std::unordered_map<std::string_view, const CategoryPageRule*>;
    for (const auto& rule : rules) map->emplace(rule.key, &rule);
    return map;
  }();
  const auto found = byKey->find(key);
  return found == byKey->end() ? fallback : *found->second;
}

PageFeed feedOf(const CategoryPageRule& rule) {
  PageFeed feed;
  for (const auto dictionary : rule.fedBy) {
    if (const auto metric = metricOf(dictionary)) feed.push_back(*metric);
  }
  return feed;
}

}  // namespace probeview
