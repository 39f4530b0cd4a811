#include "sources/modem/ModemPayloads.h"

#include <algorithm>
#include <array>
#include <limits>
#include <memory>
#include <string>

#include "core/Format.h"
#include "core/MetricKindList.h"
#include "messages/Messages.h"
#include "sources/sim/BasebandCommands.h"
#include "sources/sim/Identities.h"
#include "sources/sim/SimFiles.h"

namespace pyx::modem {

namespace {

using F = Field;

// A field's integer that its message field cannot hold: left out, with one line.
void doesNotFit(Field field, std::int64_t value, const char* type, FieldIssues& issues) {
    const auto rows = modemFieldTable();
    const auto row = std::find_if(rows.begin(), rows.end(),
                                  [&](const ModemFieldRow& r) { return r.field == field; });
    if (row == rows.end()) return;
    issues.push_back(
        format("ModemManager %s %s: becomes %lld for %s, which %s cannot hold; left out",
               std::string(sourceName(row->source)).c_str(), std::string(row->key).c_str(),
               static_cast<long long>(value), std::string(row->target).c_str(), type));
}

// Calls set with the field's integer, when the field has one that the type holds.
template <class Set>
void putU32(const FieldValues& values, Field field, FieldIssues& issues, Set set) {
    const auto v = values.number(field);
    if (!v) return;
    if (*v < 0 || *v > std::numeric_limits<std::uint32_t>::max())
        return doesNotFit(field, *v, "an unsigned 32-bit field", issues);
    set(static_cast<std::uint32_t>(*v));
}
template <class Set>
void putS32(const FieldValues& values, Field field, FieldIssues& issues, Set set) {
    const auto v = values.number(field);
    if (!v) return;
    if (*v < std::numeric_limits<std::int32_t>::min() ||
        *v > std::numeric_limits<std::int32_t>::max())
        return doesNotFit(field, *v, "a signed 32-bit field", issues);
    set(static_cast<std::int32_t>(*v));
}

// The PLMN of the registered operator, when its code was readable.
std::optional<Bytes> plmn(const ModemReading& r) {
    const auto mcc = r.modem3gpp.number(F::Mcc);
    const auto mnc = r.modem3gpp.number(F::Mnc);
    const auto digits = r.modem3gpp.number(F::MncDigits);
    if (!mcc || !mnc || !digits) return std::nullopt;
    return sim::encodePlmn(static_cast<std::uint32_t>(*mcc), static_cast<std::uint32_t>(*mnc),
                           static_cast<std::uint32_t>(*digits));
}

template <class M>
void putOperator(const ModemReading& r, M& m, FieldIssues& issues) {
    putU32(r.modem3gpp, F::Mcc, issues, [&](std::uint32_t v) { m.setMcc(v); });
    putU32(r.modem3gpp, F::Mnc, issues, [&](std::uint32_t v) { m.setMnc(v); });
    if constexpr (requires { m.setNumMncDigits(0U); })
        putU32(r.modem3gpp, F::MncDigits, issues, [&](std::uint32_t v) { m.setNumMncDigits(v); });
}

// The neighbours: cells that do not serve, of one technology.
template <class Each>
void neighbours(const ModemReading& r, Rat rat, Each each) {
    for (const CellValues& cell : r.cells)
        if (!cell.serving && cell.rat == rat) each(cell.values);
}

std::optional<Bytes> lteScellInfo(const ModemReading& r, std::uint64_t timestamp,
                                  FieldIssues& issues) {
    if (r.servingRat != Rat::Lte) return std::nullopt;
    KCellularLteScellInfo m;
    m.setTimestamp(timestamp);
    if (const CellValues* cell = r.servingCell()) {
        const FieldValues& v = cell->values;
        putU32(v, F::LtePci, issues, [&](std::uint32_t x) { m.setPhyCellId(x); });
        putU32(v, F::LteEarfcn, issues, [&](std::uint32_t x) { m.setDlFreq(x); });
        putU32(v, F::LteCellId, issues, [&](std::uint32_t x) { m.setCellId(x); });
        putU32(v, F::LteBand, issues, [&](std::uint32_t x) { m.setFreqBandInd(x); });
        putU32(v, F::LteTac, issues, [&](std::uint32_t x) { m.setTrackingAreaCode(x); });
    } else {
        putU32(r.location, F::LocationCi, issues, [&](std::uint32_t x) { m.setCellId(x); });
        putU32(r.location, F::LocationTac, issues,
               [&](std::uint32_t x) { m.setTrackingAreaCode(x); });
    }
    putU32(r.modem3gpp, F::MncDigits, issues, [&](std::uint32_t v) { m.setNumMncDigits(v); });
    putU32(r.modem3gpp, F::Mcc, issues, [&](std::uint32_t v) { m.setSelPlmnMcc(v); });
    putU32(r.modem3gpp, F::Mnc, issues, [&](std::uint32_t v) { m.setSelPlmnMnc(v); });
    return m.data();
}

std::optional<Bytes> lteRsrpRsrqSinr(const ModemReading& r, std::uint64_t timestamp,
                                     FieldIssues& issues) {
    const FieldValues& s = r.signalLte;
    if (!s.has(F::LteRsrp) && !s.has(F::LteRsrq) && !s.has(F::LteSinr)) return std::nullopt;
    const auto sample = [&] {
        auto v = std::make_shared<RsrpRsrqSinr>();
        if (r.servingRat == Rat::Lte)
            if (const CellValues* cell = r.servingCell())
                putU32(cell->values, F::LtePci, issues,
                       [&](std::uint32_t x) { v->setPhyCellId(x); });
        putS32(s, F::LteRsrp, issues, [&](std::int32_t x) { v->setRsrp0(x); });
        putS32(s, F::LteRsrq, issues, [&](std::int32_t x) { v->setRsrq0(x); });
        putS32(s, F::LteSinr, issues, [&](std::int32_t x) { v->setSinr0(x); });
        return v;
    };
    KCellularLteRsrpRsrqSinr m;
    m.setTimestamp(timestamp);
    m.setNumSamples(1);
    m.addInstValue(sample());
    m.setAvgValues(sample());
    return m.data();
}

std::optional<Bytes> lteIntraRatMeas(const ModemReading& r, std::uint64_t timestamp,
                                     FieldIssues& issues) {
    if (r.servingRat != Rat::Lte || !r.hasCellInfo) return std::nullopt;
    KCellularLteNbrEutraCellMeas m;
    m.setTimestamp(timestamp);
    neighbours(r, Rat::Lte, [&](const FieldValues& v) {
        auto meas = std::make_shared<EgwErrcNbrEutraMeas>();
        putU32(v, F::LteEarfcn, issues, [&](std::uint32_t x) { meas->setNbrEarfcn(x); });
        putU32(v, F::LtePci, issues, [&](std::uint32_t x) { meas->setNbrPhysCellId(x); });
        putU32(v, F::LteBand, issues, [&](std::uint32_t x) { meas->setFreqBandInd(x); });
        putS32(v, F::LteNbrRsrp, issues, [&](std::int32_t x) { meas->setNbrRsrp(x); });
        putS32(v, F::LteNbrRsrq, issues, [&](std::int32_t x) { meas->setNbrRsrq(x); });
        m.addMeasNbrEutra(std::move(meas));
    });
    return m.data();
}

std::optional<Bytes> lteInterRatMeas(const ModemReading& r, std::uint64_t timestamp,
                                     FieldIssues& issues) {
    if (r.servingRat != Rat::Lte || !r.hasCellInfo) return std::nullopt;
    KCellularLteNbrInterRatCellMeas m;
    m.setTimestamp(timestamp);
    neighbours(r, Rat::Umts, [&](const FieldValues& v) {
        auto meas = std::make_shared<EgwErrcNbrUtraMeas>();
        putU32(v, F::UmtsUarfcn, issues, [&](std::uint32_t x) { meas->setUarfcn(x); });
        putU32(v, F::UmtsPsc, issues, [&](std::uint32_t x) { meas->setPsc(x); });
        putS32(v, F::UmtsRscp, issues, [&](std::int32_t x) { meas->setRscp(x); });
        putU32(v, F::UmtsEcno, issues, [&](std::uint32_t x) { meas->setEcno(x); });
        m.addMeasNbrUtra(std::move(meas));
    });
    neighbours(r, Rat::Gsm, [&](const FieldValues& v) {
        auto meas = std::make_shared<EgwErrcNbrGeranMeas>();
        putU32(v, F::GsmArfcn, issues, [&](std::uint32_t x) { meas->setArfcn(x); });
        putU32(v, F::GsmBsic, issues, [&](std::uint32_t x) { meas->setBsic(x); });
        putU32(v, F::GsmRxlev, issues, [&](std::uint32_t x) { meas->setRxlev(x); });
        m.addMeasNbrGeran(std::move(meas));
    });
    return m.data();
}

std::optional<Bytes> umtsScellInfo(const ModemReading& r, std::uint64_t timestamp,
                                   FieldIssues& issues) {
    if (r.servingRat != Rat::Umts) return std::nullopt;
    KCellularWcdmaCellInfo m;
    m.setTimestamp(timestamp);
    putOperator(r, m, issues);
    if (const CellValues* cell = r.servingCell()) {
        const FieldValues& v = cell->values;
        putU32(v, F::UmtsLac, issues, [&](std::uint32_t x) { m.setLac(x); });
        putU32(v, F::UmtsCellId, issues, [&](std::uint32_t x) { m.setCellId(x); });
        putS32(v, F::UmtsBand, issues, [&](std::int32_t x) { m.setWcdmaBand(x); });
        putU32(v, F::UmtsUarfcn, issues, [&](std::uint32_t x) { m.setDlUarfcn(x); });
        putU32(v, F::UmtsPsc, issues, [&](std::uint32_t x) { m.setPsc(x); });
    } else {
        putU32(r.location, F::LocationLac, issues, [&](std::uint32_t x) { m.setLac(x); });
        putU32(r.location, F::LocationCi, issues, [&](std::uint32_t x) { m.setCellId(x); });
    }
    return m.data();
}

std::optional<Bytes> umtsScellMeas(const ModemReading& r, std::uint64_t timestamp,
                                   FieldIssues& issues) {
    const FieldValues& s = r.signalUmts;
    if (!s.has(F::UmtsRssi) && !s.has(F::UmtsRscpIndex) && !s.has(F::UmtsEcioIndex))
        return std::nullopt;
    KCellularWcdmaScellMeasurement m;
    m.setTimestamp(timestamp);
    auto rx = std::make_shared<RxInfo>();
    putS32(s, F::UmtsRssi, issues, [&](std::int32_t x) { rx->setRssi(x); });
    putU32(s, F::UmtsRscpIndex, issues, [&](std::uint32_t x) { rx->setRsrpRange(x); });
    putU32(s, F::UmtsEcioIndex, issues, [&](std::uint32_t x) { rx->setRsrqRange(x); });
    m.addRxInfo(std::move(rx));
    return m.data();
}

std::optional<Bytes> umtsNcellMeas(const ModemReading& r, std::uint64_t timestamp,
                                   FieldIssues& issues) {
    if (r.servingRat != Rat::Umts || !r.hasCellInfo) return std::nullopt;
    KCellularWcdmaNbrCellMeas m;
    m.setTimestamp(timestamp);
    neighbours(r, Rat::Umts, [&](const FieldValues& v) {
        auto meas = std::make_shared<UtraCellMeasResult>();
        putU32(v, F::UmtsUarfcn, issues, [&](std::uint32_t x) { meas->setUarfcn(x); });
        putU32(v, F::UmtsPsc, issues, [&](std::uint32_t x) { meas->setPsc(x); });
        putU32(v, F::UmtsEcno, issues, [&](std::uint32_t x) { meas->setEcno(x); });
        putS32(v, F::UmtsRscp, issues, [&](std::int32_t x) { meas->setRscp(x); });
        m.addMeasUtraResult(std::move(meas));
    });
    neighbours(r, Rat::Gsm, [&](const FieldValues& v) {
        auto meas = std::make_shared<GsmCellMeasResult>();
        putU32(v, F::GsmArfcn, issues, [&](std::uint32_t x) { meas->setArfcn(x); });
        putU32(v, F::GsmBsic, issues, [&](std::uint32_t x) { meas->setBsic(x); });
        putU32(v, F::GsmRxlev, issues, [&](std::uint32_t x) { meas->setRxlev(x); });
        m.addMeasGsmResult(std::move(meas));
    });
    neighbours(r, Rat::Lte, [&](const FieldValues& v) {
        auto meas = std::make_shared<LteCellMeasResult>();
        putU32(v, F::LteEarfcn, issues, [&](std::uint32_t x) { meas->setEarfcn(x); });
        putU32(v, F::LtePci, issues, [&](std::uint32_t x) { meas->setPhyCellId(x); });
        putU32(v, F::LteBand, issues, [&](std::uint32_t x) { meas->setEutraBand(x); });
        putS32(v, F::LteNbrRsrp, issues, [&](std::int32_t x) { meas->setRsrp(x); });
        putS32(v, F::LteNbrRsrq, issues, [&](std::int32_t x) { meas->setRsrq(x); });
        m.addMeasLteResult(std::move(meas));
    });
    return m.data();
}

std::optional<Bytes> gsmScellInfo(const ModemReading& r, std::uint64_t timestamp,
                                  FieldIssues& issues) {
    if (r.servingRat != Rat::Gsm) return std::nullopt;
    KCellularGsmScellInfo m;
    m.setTimestamp(timestamp);
    putOperator(r, m, issues);
    if (const CellValues* cell = r.servingCell()) {
        const FieldValues& v = cell->values;
        putU32(v, F::GsmLac, issues, [&](std::uint32_t x) { m.setLac(x); });
        putU32(v, F::GsmCellId, issues, [&](std::uint32_t x) { m.setCellId(x); });
        putU32(v, F::GsmArfcn, issues, [&](std::uint32_t x) { m.setArfcn(x); });
        putU32(v, F::GsmBsic, issues, [&](std::uint32_t x) { m.setBsic(x); });
    } else {
        putU32(r.location, F::LocationLac, issues, [&](std::uint32_t x) { m.setLac(x); });
        putU32(r.location, F::LocationCi, issues, [&](std::uint32_t x) { m.setCellId(x); });
    }
    return m.data();
}

std::optional<Bytes> gsmIdleScellMeas(const ModemReading& r, std::uint64_t timestamp,
                                      FieldIssues& issues) {
    if (!r.signalGsm.has(F::GsmRxlevDbm)) return std::nullopt;
    KCellularGsmIdleScellMeasurement m;
    m.setTimestamp(timestamp);
    if (r.servingRat == Rat::Gsm)
        if (const CellValues* cell = r.servingCell())
            putU32(cell->values, F::GsmArfcn, issues, [&](std::uint32_t x) { m.setScellArfcn(x); });
    putS32(r.signalGsm, F::GsmRxlevDbm, issues, [&](std::int32_t x) { m.setIdleRxlevDBm(x); });
    return m.data();
}

std::optional<Bytes> gsmNcellMeas(const ModemReading& r, std::uint64_t timestamp,
                                  FieldIssues& issues) {
    if (r.servingRat != Rat::Gsm || !r.hasCellInfo) return std::nullopt;
    KCellularGsmGrrEventMeasCr m;
    m.setTimestamp(timestamp);
    neighbours(r, Rat::Gsm, [&](const FieldValues& v) {
        auto meas = std::make_shared<GsmNcellMeas>();
        putOperator(r, *meas, issues);
        putU32(v, F::GsmLac, issues, [&](std::uint32_t x) { meas->setLac(x); });
        putU32(v, F::GsmCellId, issues, [&](std::uint32_t x) { meas->setCi(x); });
        putU32(v, F::GsmBsic, issues, [&](std::uint32_t x) { meas->setBsic(x); });
        putU32(v, F::GsmArfcn, issues, [&](std::uint32_t x) { meas->setArfcn(x); });
        putU32(v, F::GsmRxlev, issues, [&](std::uint32_t x) { meas->setRxlev(x); });
        m.addGsmNcellMeas(std::move(meas));
    });
    neighbours(r, Rat::Umts, [&](const FieldValues& v) {
        auto meas = std::make_shared<UmtsNcellMeas>();
        putU32(v, F::UmtsPsc, issues, [&](std::uint32_t x) { meas->setCpichSc(x); });
        putU32(v, F::UmtsUarfcn, issues, [&](std::uint32_t x) { meas->setDlUarfcn(x); });
        putU32(v, F::UmtsRscp, issues, [&](std::uint32_t x) { meas->setCpichRscp(x); });
        putU32(v, F::UmtsEcno, issues, [&](std::uint32_t x) { meas->setCpichEcn0(x); });
        m.addUmtsNcellMeas(std::move(meas));
    });
    neighbours(r, Rat::Lte, [&](const FieldValues& v) {
        auto meas = std::make_shared<LteNcellMeas>();
        putU32(v, F::LtePci, issues, [&](std::uint32_t x) { meas->setPhysicalCellId(x); });
        putU32(v, F::LteNbrRsrp, issues, [&](std::uint32_t x) { meas->setRsrp(x); });
        putU32(v, F::LteEarfcn, issues, [&](std::uint32_t x) { meas->setEarfcn(x); });
        putU32(v, F::LteNbrRsrq, issues, [&](std::uint32_t x) { meas->setRsrq(x); });
        m.addLteNcellMeas(std::move(meas));
    });
    return m.data();
}

std::optional<Bytes> emmContext(const ModemReading& r, std::uint64_t timestamp,
                                FieldIssues& issues) {
    if (!r.modem3gpp.has(F::RegStatus)) return std::nullopt;
    KCellularEmmContext m;
    m.setTimestamp(timestamp);
    putS32(r.modem3gpp, F::RegStatus, issues, [&](std::int32_t x) { m.setRegStatus(x); });
    std::optional<std::int64_t> tac = r.location.number(F::LocationTac);
    if (r.servingRat == Rat::Lte)
        if (const CellValues* cell = r.servingCell()) tac = cell->values.number(F::LteTac);
    const auto network = plmn(r);
    if (network && tac) {
        auto tai = std::make_shared<KCellularTrackingAreaId>();
        tai->setEncodedPlmn(*network);
        tai->setTac(static_cast<std::uint32_t>(*tac));
        m.addTaiList(std::move(tai));
    }
    return m.data();
}

std::optional<Bytes> activeBearers(const ModemReading& r, std::uint64_t timestamp,
                                   FieldIssues& issues) {
    constexpr std::int32_t kIPv4 = 0, kIPv6 = 1;
    KCellularActivatedBearerContexts m;
    m.setTimestamp(timestamp);
    m.setBearerContextCount(static_cast<std::uint32_t>(r.bearers.size()));
    std::uint32_t cid = 1;
    for (const FieldValues& v : r.bearers) {
        auto b = std::make_shared<BearerContext>();
        b->setCid(cid++);
        if (const std::string* apn = v.text(F::BearerApn)) b->setApn(*apn);
        putS32(v, F::BearerPdpType, issues, [&](std::int32_t x) { b->setPdpType(x); });
        Bytes address;
        if (const Bytes* a = v.bytes(F::BearerIpv4)) address = *a;
        if (const Bytes* a = v.bytes(F::BearerIpv6))
            address.insert(address.end(), a->begin(), a->end());
        if (!address.empty()) b->setPdpAddr(std::move(address));
        if (const Bytes* dns = v.bytes(F::BearerIpv4Dns1)) {
            b->setPrimaryDnsType(kIPv4);
            b->setPrimaryDnsAddr(*dns);
        } else if (const Bytes* dns6 = v.bytes(F::BearerIpv6Dns1)) {
            b->setPrimaryDnsType(kIPv6);
            b->setPrimaryDnsAddr(*dns6);
        }
        if (const Bytes* dns = v.bytes(F::BearerIpv4Dns2)) {
            b->setSecondaryDnsType(kIPv4);
            b->setSecondaryDnsAddr(*dns);
        }
        m.addBearerContext(std::move(b));
    }
    return m.data();
}

std::optional<Bytes> simFiles(const ModemReading& r, std::uint64_t timestamp, FieldIssues&) {
    if (!r.sim.has(F::SimIccid) && !r.sim.has(F::SimImsi)) return std::nullopt;
    return simFilesPayload(r, timestamp);
}

// The catalogue's metric IDs, named by their constants.
namespace id {
enum MetricID : std::int64_t {
#define PYX_KIND_ID(constant, metricID, ...) constant = (metricID),
    PYX_METRIC_KINDS(PYX_KIND_ID)
#undef PYX_KIND_ID
};
}  // namespace id

constexpr std::array kKinds = {
    ModemKind{id::K_LTE_SCELL_INFO, lteScellInfo},
    ModemKind{id::K_LTE_RSRP_RSRQ_SINR, lteRsrpRsrqSinr},
    ModemKind{id::K_LTE_INTRARAT_MEAS, lteIntraRatMeas},
    ModemKind{id::K_LTE_INTERRAT_MEAS, lteInterRatMeas},
    ModemKind{id::K_UMTS_SCELL_INFO, umtsScellInfo},
    ModemKind{id::K_UMTS_SCELL_MEAS, umtsScellMeas},
    ModemKind{id::K_UMTS_NCELL_MEAS, umtsNcellMeas},
    ModemKind{id::K_GSM_SCELL_INFO, gsmScellInfo},
    ModemKind{id::K_GSM_IDLE_SCELL_MEAS, gsmIdleScellMeas},
    ModemKind{id::K_GSM_NCELL_MEAS, gsmNcellMeas},
    ModemKind{id::K_LTE_EMM_CTXT, emmContext},
    ModemKind{id::K_CELLULAR_ACTIVE_BEARER, activeBearers},
    ModemKind{id::K_SIM_FILE_INFO, simFiles},
};
static_assert(id::K_SIM_FILE_INFO == sim::kSimFilesMetricID);

}  // namespace

std::span<const ModemKind> modemKinds() {
    return kKinds;
}

const ModemKind* findModemKind(std::int64_t metricID) {
    for (const ModemKind& kind : kKinds)
        if (kind.metricID == metricID) return &kind;
    return nullptr;
}

Bytes simFilesPayload(const ModemReading& r, std::uint64_t timestamp) {
    KCellularSimCardFiles m;
    m.setTimestamp(timestamp);
    if (const Bytes* iccid = r.sim.bytes(F::SimIccid))
        m.addEfList(sim::elementaryFile(sim::kEfIccid, *iccid));
    if (const Bytes* imsi = r.sim.bytes(F::SimImsi))
        m.addEfList(sim::elementaryFile(sim::kEfImsi, *imsi));
    if (const auto digits = r.sim.number(F::SimMncDigits))
        m.addEfList(
            sim::elementaryFile(sim::kEfAd, sim::adContent(static_cast<std::uint32_t>(*digits))));
    return m.data();
}

}  // namespace pyx::modem
