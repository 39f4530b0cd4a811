#include "sources/modem/ModemReading.h"

#include "core/Format.h"

namespace pyx::modem {

namespace {

// MMModemAccessTechnology bits.
constexpr std::uint64_t kAccessGsm = 0x1E;    // GSM, GSM compact, GPRS, EDGE
constexpr std::uint64_t kAccessUmts = 0x3E0;  // UMTS, HSDPA, HSUPA, HSPA, HSPA+
constexpr std::uint64_t kAccessLte = 0x4000;  // LTE
constexpr std::uint64_t kCellTypeGsm = 2, kCellTypeUmts = 3, kCellTypeLte = 5;

Rat ratOfAccess(std::int64_t bits) {
    const auto b = static_cast<std::uint64_t>(bits);
    if (b & kAccessLte) return Rat::Lte;
    if (b & kAccessUmts) return Rat::Umts;
    if (b & kAccessGsm) return Rat::Gsm;
    return Rat::None;
}

// A cell dictionary's technology and serving flag; cells of other technologies (CDMA, 5G...)
// are skipped quietly, a cell-type of the wrong type with a line.
std::optional<CellValues> readCell(const Dict& cell, FieldIssues& issues) {
    const Value* type = cell.find("cell-type");
    if (type == nullptr) return std::nullopt;
    if (!type->isUInt()) {
        issues.push_back(
            format("ModemManager GetCellInfo cell-type: '%s' is not an unsigned "
                   "32-bit integer (u); that cell left out",
                   type->description().c_str()));
        return std::nullopt;
    }
    CellValues out;
    MmSource source = MmSource::LteCell;
    switch (type->asUInt()) {
        case kCellTypeLte:
            out.rat = Rat::Lte;
            break;
        case kCellTypeUmts:
            out.rat = Rat::Umts;
            source = MmSource::UmtsCell;
            break;
        case kCellTypeGsm:
            out.rat = Rat::Gsm;
            source = MmSource::GsmCell;
            break;
        default:
            return std::nullopt;
    }
    if (const Value* serving = cell.find("serving")) {
        if (serving->isBool()) {
            out.serving = serving->asBool();
        } else {
            issues.push_back(
                format("ModemManager GetCellInfo serving: '%s' is not a boolean (b); "
                       "that cell taken as a neighbour",
                       serving->description().c_str()));
        }
    }
    out.values = mapFields(source, cell, issues);
    return out;
}

const Dict* subDict(const Dict& dict, std::string_view key, FieldIssues& issues) {
    const Value* v = dict.find(key);
    if (v == nullptr) return nullptr;
    if (!v->isDict()) {
        issues.push_back(format("ModemManager Bearer %s: is not a dictionary (a{sv}); left out",
                                std::string(key).c_str()));
        return nullptr;
    }
    return &v->asDict();
}

}  // namespace

const CellValues* ModemReading::servingCell() const {
    for (const CellValues& cell : cells)
        if (cell.serving && cell.rat == servingRat) return &cell;
    return nullptr;
}

ModemReading readModem(const ModemFacts& facts, FieldIssues& issues) {
    ModemReading r;
    r.modem = mapFields(MmSource::Modem, facts.modem, issues);
    r.modem3gpp = mapFields(MmSource::Modem3gpp, facts.modem3gpp, issues);
    r.signalLte = mapFields(MmSource::SignalLte, facts.signalLte, issues);
    r.signalUmts = mapFields(MmSource::SignalUmts, facts.signalUmts, issues);
    r.signalGsm = mapFields(MmSource::SignalGsm, facts.signalGsm, issues);
    r.location = mapFields(MmSource::Location, facts.location, issues);
    r.sim = mapFields(MmSource::Sim, facts.sim, issues);
    if (facts.cells) {
        r.hasCellInfo = true;
        for (const Dict& cell : *facts.cells)
            if (auto values = readCell(cell, issues)) r.cells.push_back(std::move(*values));
    }
    for (const Dict& bearer : facts.bearers) {
        FieldValues values = mapFields(MmSource::Bearer, bearer, issues);
        if (values.number(Field::BearerConnected).value_or(0) == 0) continue;
        if (const Dict* d = subDict(bearer, "Properties", issues))
            values.merge(mapFields(MmSource::BearerProperties, *d, issues));
        if (const Dict* d = subDict(bearer, "Ip4Config", issues))
            values.merge(mapFields(MmSource::BearerIp4, *d, issues));
        if (const Dict* d = subDict(bearer, "Ip6Config", issues))
            values.merge(mapFields(MmSource::BearerIp6, *d, issues));
        r.bearers.push_back(std::move(values));
    }
    for (const CellValues& cell : r.cells)
        if (cell.serving && r.servingRat == Rat::None) r.servingRat = cell.rat;
    if (r.servingRat == Rat::None)
        r.servingRat = ratOfAccess(r.modem.number(Field::ServingAccessTech).value_or(0));
    return r;
}

}  // namespace pyx::modem
