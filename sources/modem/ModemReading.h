// ModemManager's facts read through the field table: each dictionary's values in our fields,
// the cells sorted into serving and neighbours, and the technology that serves.
#pragma once

#include <vector>

#include "sources/modem/FieldValues.h"
#include "sources/modem/ModemFacts.h"
#include "sources/modem/ModemFieldTable.h"

namespace pyx::modem {

enum class Rat { None, Gsm, Umts, Lte };

struct CellValues {
    Rat rat = Rat::None;
    bool serving = false;
    FieldValues values;
};

struct ModemReading {
    FieldValues modem;
    FieldValues modem3gpp;
    FieldValues signalLte;
    FieldValues signalUmts;
    FieldValues signalGsm;
    FieldValues location;
    FieldValues sim;
    bool hasCellInfo = false;  // GetCellInfo answered: neighbour lists are known (maybe empty)
    std::vector<CellValues> cells;
    std::vector<FieldValues> bearers;  // connected ones only
    Rat servingRat = Rat::None;

    // The serving cell of the serving technology, or nullptr.
    [[nodiscard]] const CellValues* servingCell() const;
};

// Reads facts through the table; what had to be left out is added to issues.
[[nodiscard]] ModemReading readModem(const ModemFacts& facts, FieldIssues& issues);

}  // namespace pyx::modem
