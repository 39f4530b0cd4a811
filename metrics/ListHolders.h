// The per-technology lists that the intake refreshes and the second-level screen shows one
// section per entry.
#pragma once

#include <vector>

#include "core/Value.h"

namespace pyx {

using DisplayDictionary = Dict;
using EntryList = std::vector<DisplayDictionary>;

struct LTEListHolder {
    EntryList SelReselCellInfo;
    EntryList EutraNbrs;
    EntryList RsrpRsrqSinr;
    EntryList TxPower;
    EntryList EutraNbrsMeas;
    EntryList UtraNbrsMeas;
    EntryList GeraNbrsMeas;
    EntryList CAStatusList;
    EntryList SecondaryCellMeasList;
    friend bool operator==(const LTEListHolder&, const LTEListHolder&) = default;
};

struct UMTSListHolder {
    EntryList rXInfo;
    EntryList TxPower;
    EntryList SelReselCellInfo;
    EntryList eUtraNbrs;
    EntryList utraNbrs;
    EntryList geraNbrs;
    EntryList eUtraNbrMeas;
    EntryList utraNbrMeas;
    EntryList geraNbrMeas;
    friend bool operator==(const UMTSListHolder&, const UMTSListHolder&) = default;
};

struct GSMListHolder {
    EntryList eUtraNbrMeas;
    EntryList utraNbrMeas;
    EntryList geraNbrMeas;
    friend bool operator==(const GSMListHolder&, const GSMListHolder&) = default;
};

struct CommonListHolder {
    EntryList MMCommonInfo;
    EntryList IMSI;
    EntryList activeBearer;
    EntryList simContents;
    friend bool operator==(const CommonListHolder&, const CommonListHolder&) = default;
};

}  // namespace pyx
