#include "ui/SecondLevelViewController.h"

#include <array>
#include <cstddef>
#include <memory>
#include <string_view>
#include <utility>
#include <variant>

#include "core/Log.h"
#include "ui/ScreenSelectionError.h"
#include "ui/ThirdLevelViewController.h"

namespace pyx {
namespace {

using P = MetricValidator::DictionaryProperty;
using ListOf = const EntryList& (*)(const MetricValidator&);

// One of the store's lists, as a plain function so that the category table stays constant.
template <auto holder, auto list>
const EntryList& listOf(const MetricValidator& validator) {
    return (validator.*holder)().*list;
}

// How many sections a category has.
enum class Sections {
    One,         // a single untitled section
    ListLength,  // one titled section per list element
};

// How many rows a section has.
enum class Rows {
    DictionaryEntries,  // the dictionary's entries; 1 while it is absent
    ElementEntries,     // the entries of the list element at the section index
    One,                // a single row, whatever the source holds
};

// What fills a cell.
enum class Cells {
    DictionaryEntry,  // entry number row of the dictionary
    ElementEntry,     // entry number row of the list element at the section index
    NotRecognised,    // the cell does not know this key: "Come back later"
};

struct Category {
    std::string_view key;
    std::variant<P, ListOf> source;
    Sections sections;
    std::string_view titlePrefix;  // empty: untitled
    Rows rows;
    Cells cells;
    bool announcesAbsence = false;  // "You are screwed" while the dictionary is absent
};

template <auto holder, auto list>
constexpr Category titledList(std::string_view key, std::string_view prefix) {
    return {key,    &listOf<holder, list>, Sections::ListLength,
            prefix, Rows::ElementEntries,  Cells::ElementEntry};
}
template <auto holder, auto list>
constexpr Category firstElement(std::string_view key) {
    return {key, &listOf<holder, list>, Sections::One,
            {},  Rows::ElementEntries,  Cells::ElementEntry};
}
constexpr Category dictionary(std::string_view key, P property) {
    return {key, property, Sections::One, {}, Rows::DictionaryEntries, Cells::DictionaryEntry};
}
// A dictionary screen that shows its first entry only.
constexpr Category firstEntry(std::string_view key, P property) {
    return {key, property, Sections::One, {}, Rows::One, Cells::DictionaryEntry};
}

constexpr auto lte = &MetricValidator::myLTE;
constexpr auto umts = &MetricValidator::myUMTS;
constexpr auto gsm = &MetricValidator::myGSM;
constexpr auto common = &MetricValidator::myCommon;

// The categories the screen knows, in the order the queries compare them; any other key is
// shown as one "Come back later" row. Some keys are deliberately irregular and must stay so:
// - sections, titles and rows know "UMTS Serving Cell Meas" but its cells do not, while the
//   cells (alone) know "UMTS Serving Cell Measurement";
// - "Connected Serv Cell Meas" has no group word, and the GPRS configuration sits under
//   "GSM GPRS Config", so neither is reached from the menu;
// - the three "Active Bearers" keys show the one bearer list common to all technologies.
constexpr std::array kCategories = {
    dictionary("LTE C-DRX", P::myLTECDRXConfigDict),
    Category{"LTE Serving Cell Info",
             P::myLTESCellInfoDict,
             Sections::One,
             {},
             Rows::DictionaryEntries,
             Cells::DictionaryEntry,
             true},
    dictionary("LTE RRC State", P::myLTERRCStateDict),
    firstElement<lte, &LTEListHolder::SelReselCellInfo>("LTE Sel Resel Parameters"),
    titledList<lte, &LTEListHolder::EutraNbrs>("LTE EUTRA Neighbor Info", "EUTRA Neighbor "),
    titledList<lte, &LTEListHolder::TxPower>("LTE Tx Power", "TxPowerInfo "),
    titledList<lte, &LTEListHolder::EutraNbrsMeas>("LTE LTE Neighbor Cell Meas", "LTE Neighbor "),
    titledList<lte, &LTEListHolder::UtraNbrsMeas>("LTE UMTS Neighbor Cell Meas", "UMTS Neighbor "),
    titledList<lte, &LTEListHolder::GeraNbrsMeas>("LTE GSM Neighbor Cell Meas", "GSM Neighbor "),
    dictionary("LTE NAS", P::myLTEEMMContextDict),
    firstElement<lte, &LTEListHolder::RsrpRsrqSinr>("LTE Serving Cell Meas"),
    firstEntry("LTE Component Carrier Info", P::myLTECompCarrDict),
    titledList<lte, &LTEListHolder::CAStatusList>("LTE CA Status", "Component Carrier "),
    titledList<lte, &LTEListHolder::SecondaryCellMeasList>("LTE Secondary Cell Meas",
                                                           "Secondary Cell Meas "),
    titledList<common, &CommonListHolder::activeBearer>("LTE Active Bearers", "PDP "),
    titledList<common, &CommonListHolder::activeBearer>("UMTS Active Bearers", "PDP "),
    titledList<common, &CommonListHolder::activeBearer>("GSM Active Bearers", "PDP "),
    dictionary("UMTS RRC State", P::myUMTSRRCStateDict),
    dictionary("UMTS RRC Configuration", P::myUMTSRRCConfigDict),
    dictionary("UMTS Serving Cell Info", P::myUMTSCellInfoDict),
    Category{"UMTS Serving Cell Meas", &listOf<umts, &UMTSListHolder::rXInfo>, Sections::ListLength,
             "RxInfo ", Rows::ElementEntries, Cells::NotRecognised},
    Category{"UMTS Serving Cell Measurement",
             &listOf<umts, &UMTSListHolder::rXInfo>,
             Sections::One,
             {},
             Rows::One,
             Cells::ElementEntry},
    titledList<umts, &UMTSListHolder::TxPower>("UMTS Tx Power", "TxPowerInfo "),
    firstElement<umts, &UMTSListHolder::SelReselCellInfo>("UMTS Sel Resel Parameters"),
    titledList<umts, &UMTSListHolder::eUtraNbrs>("UMTS EUTRA Neighbor Info", "EUTRA Neighbor "),
    titledList<umts, &UMTSListHolder::utraNbrs>("UMTS UTRA Neighbor Info", "UTRA Neighbor "),
    titledList<umts, &UMTSListHolder::geraNbrs>("UMTS GSM Neighbor Info", "GSM Neighbor "),
    titledList<umts, &UMTSListHolder::eUtraNbrMeas>("UMTS LTE Neighbor Cell Meas", "LTE Neighbor "),
    titledList<umts, &UMTSListHolder::utraNbrMeas>("UMTS UMTS Neighbor Cell Meas",
                                                   "UMTS Neighbor "),
    titledList<umts, &UMTSListHolder::geraNbrMeas>("UMTS GSM Neighbor Cell Meas", "GSM Neighbor "),
    dictionary("UMTS NAS GMM", P::myGMMContextDict),
    dictionary("GSM NAS GMM", P::myGMMContextDict),
    dictionary("UMTS NAS MM", P::myMMContextDict),
    dictionary("GSM NAS MM", P::myMMContextDict),
    firstEntry("GSM Serving Cell Info", P::myGSMScellInfoDict),
    firstEntry("GSM Idle Config", P::myGSMIdleConfigInfoDict),
    firstEntry("GSM Idle Serv Cell Meas", P::myGSMIdleScellMeasDict),
    firstEntry("Connected Serv Cell Meas", P::myGSMConnRfMeasDict),
    firstEntry("GSM GPRS Config", P::myGSMGPRSConfigDict),
    titledList<gsm, &GSMListHolder::eUtraNbrMeas>("GSM LTE Neighbor Cell Meas", "LTE Neighbor "),
    titledList<gsm, &GSMListHolder::utraNbrMeas>("GSM UMTS Neighbor Cell Meas", "UMTS Neighbor "),
    titledList<gsm, &GSMListHolder::geraNbrMeas>("GSM GSM Neighbor Cell Meas", "GSM Neighbor "),
    titledList<common, &CommonListHolder::simContents>("Device Info SIM Files", "SIM Content "),
};
static_assert(kCategories.size() == 43);

// Every key occurs once, so the first match is the only one and the order of comparison
// cannot change an answer.
constexpr bool keysAreUnique() {
    for (std::size_t i = 0; i < kCategories.size(); ++i)
        for (std::size_t j = i + 1; j < kCategories.size(); ++j)
            if (kCategories[i].key == kCategories[j].key) return false;
    return true;
}
static_assert(keysAreUnique());

const Category* categoryFor(std::string_view key) {
    for (const Category& category : kCategories)
        if (category.key == key) return &category;
    return nullptr;
}

const std::optional<DisplayDictionary>& dictionaryOf(const Category& category,
                                                     const MetricValidator& store) {
    return store.dictionary(std::get<P>(category.source));
}

const EntryList& listOf(const Category& category, const MetricValidator& store) {
    return std::get<ListOf>(category.source)(store);
}

// The list element at index, or nullptr when the list has none there (still empty, or
// shorter than when the sections were counted).
const DisplayDictionary* elementAt(const EntryList& list, int index) {
    if (index < 0 || static_cast<std::size_t>(index) >= list.size()) return nullptr;
    return &list[static_cast<std::size_t>(index)];
}

// Entry number row of a dictionary as key and value description; a row the dictionary does
// not have leaves the cell as dequeued.
Cell entryCell(const DisplayDictionary& dictionary, int row) {
    if (row < 0 || static_cast<std::size_t>(row) >= dictionary.size()) return Cell{};
    const DictEntry& entry = dictionary.at(static_cast<std::size_t>(row));
    return Cell{entry.key, entry.value.description()};
}

}  // namespace

std::string SecondLevelViewController::categoryKey() const {
    if (!firstSelection_)
        throw ScreenSelectionError("SecondLevelViewController", "firstSelection", std::nullopt);
    if (!seguedThroughRow_)
        throw ScreenSelectionError("SecondLevelViewController", "seguedThroughRow", std::nullopt);
    return *firstSelection_ + " " + *seguedThroughRow_;
}

int SecondLevelViewController::numberOfSections() const {
    const Category* const category = categoryFor(categoryKey());
    if (category == nullptr || category->sections != Sections::ListLength) return 1;
    return static_cast<int>(listOf(*category, *myMetricValidator_).size());
}

std::optional<std::string> SecondLevelViewController::titleForHeaderInSection(int section) const {
    const Category* const category = categoryFor(categoryKey());
    if (category == nullptr || category->titlePrefix.empty()) return std::nullopt;
    return std::string(category->titlePrefix) + std::to_string(section);
}

int SecondLevelViewController::numberOfRowsInSection(int section) const {
    const Category* const category = categoryFor(categoryKey());
    if (category == nullptr) return 1;
    switch (category->rows) {
        case Rows::DictionaryEntries: {
            const auto& dictionary = dictionaryOf(*category, *myMetricValidator_);
            if (!dictionary) {
                if (category->announcesAbsence) standardOutput("You are screwed");
                return 1;
            }
            return static_cast<int>(dictionary->size());
        }
        case Rows::ElementEntries: {
            const DisplayDictionary* const element =
                elementAt(listOf(*category, *myMetricValidator_), section);
            return element == nullptr ? 1 : static_cast<int>(element->size());
        }
        case Rows::One:
            return 1;
    }
    return 1;
}

Cell SecondLevelViewController::cellForRowAtIndexPath(int section, int row) const {
    const Category* const category = categoryFor(categoryKey());
    if (category == nullptr || category->cells == Cells::NotRecognised)
        return Cell{"Come back later", "Come back later"};
    if (category->cells == Cells::DictionaryEntry) {
        const auto& dictionary = dictionaryOf(*category, *myMetricValidator_);
        return dictionary ? entryCell(*dictionary, row) : Cell{};
    }
    const DisplayDictionary* const element =
        elementAt(listOf(*category, *myMetricValidator_), section);
    return element == nullptr ? Cell{} : entryCell(*element, row);
}

void SecondLevelViewController::prepareForSegue(TableController&, const Cell*) const {}

std::optional<std::string> SecondLevelViewController::shownCategory() const {
    if (!firstSelection_ || !seguedThroughRow_) return std::nullopt;
    return categoryKey();
}

std::optional<Destination> SecondLevelViewController::open(const Cell& tapped) const {
    auto details = std::make_shared<ThirdLevelViewController>();
    prepareForSegue(*details, &tapped);
    std::string title = tapped.text.value_or(std::string());
    if (title.empty()) title = seguedThroughRow_.value_or(std::string());
    return Destination{std::move(details), std::move(title)};
}

}  // namespace pyx
