#include "metrics/history/Quantity.h"

#include <array>

namespace pyx {
namespace {

using P = MetricValidator::DictionaryProperty;

constexpr Quantity field(Chart chart, std::string_view name, Unit unit, P property,
                         std::string_view container, std::string_view key) {
    return {chart, name, unit, property, Pick::Field, container, key, {}, {}, {}, {}, {}};
}
// A field that the store keeps raw, converted as the screen's twin of it is.
constexpr Quantity average(Chart chart, std::string_view name, Unit unit, P property,
                           std::string_view container, std::string_view key,
                           const ListConversion& convertedAs) {
    return {chart, name, unit, property, Pick::Field, container,   key,
            {},    {},   {},   {},       {},          &convertedAs};
}
constexpr Quantity first(Chart chart, std::string_view name, Unit unit, P property,
                         std::string_view list, std::string_view key) {
    return {chart, name, unit, property, Pick::FirstEntry, list, key, {}, {}, {}, {}, {}};
}
constexpr Quantity each(Chart chart, std::string_view name, Unit unit, P property,
                        std::string_view list, std::string_view key, std::string_view label) {
    return {chart, name, unit, property, Pick::EachEntry, list, key, "index", label, {}, {}, {}};
}
constexpr Quantity strongest(Chart chart, std::string_view name, Unit unit, P property,
                             std::string_view list, std::string_view key, std::string_view keyA,
                             std::string_view labelA, std::string_view keyB,
                             std::string_view labelB, std::string_view rank) {
    return {chart, name, unit,   property, Pick::Strongest, list,
            key,   keyA, labelA, keyB,     labelB,          rank};
}

using C = Chart;
using U = Unit;

// The RSRP/RSRQ/SINR kind keeps its averages as they came and converts its instantaneous
// values; the chart converts the averages the same way, so both lines share the screen's unit.
// The first antenna's values are charted. The WCDMA serving-cell measurement carries
// RSSI and SNR per receive chain (no RSCP or Ec/Io), so those are what its chart shows.
constexpr std::array kQuantities = {
    average(C::LteServing, "RSRP avg", U::Dbm, P::myLTERsrpRsrqSinrDict, "avg_values", "rsrp0",
            listconversions::lteRsrpRsrqSinrInstValues),
    first(C::LteServing, "RSRP", U::Dbm, P::myLTERsrpRsrqSinrDict, "inst_values", "rsrp0"),
    average(C::LteServing, "RSRQ avg", U::Db, P::myLTERsrpRsrqSinrDict, "avg_values", "rsrq0",
            listconversions::lteRsrpRsrqSinrInstValues),
    first(C::LteServing, "RSRQ", U::Db, P::myLTERsrpRsrqSinrDict, "inst_values", "rsrq0"),
    average(C::LteServing, "SINR avg", U::Db, P::myLTERsrpRsrqSinrDict, "avg_values", "sinr0",
            listconversions::lteRsrpRsrqSinrInstValues),
    first(C::LteServing, "SINR", U::Db, P::myLTERsrpRsrqSinrDict, "inst_values", "sinr0"),
    first(C::LteServing, "PUSCH Tx", U::Dbm, P::myLTETxPowerDict, "tx_power_info",
          "pusch_tx_power"),
    first(C::LteServing, "PUCCH Tx", U::Dbm, P::myLTETxPowerDict, "tx_power_info",
          "pucch_tx_power"),

    each(C::LteCarriers, "RSRP", U::Dbm, P::myLTECAStatusDict, "scc_list", "rsrp", "CC"),
    each(C::LteCarriers, "RSRQ", U::Db, P::myLTECAStatusDict, "scc_list", "rsrq", "CC"),
    each(C::LteCarriers, "SNR", U::Db, P::myLTECAStatusDict, "scc_list", "snr", "CC"),
    each(C::LteCarriers, "RSRP", U::Dbm, P::myLTESecondaryCellMeasDict, "scc_rx_measurement",
         "rsrp", "SCell"),
    each(C::LteCarriers, "RSRQ", U::Db, P::myLTESecondaryCellMeasDict, "scc_rx_measurement", "rsrq",
         "SCell"),
    each(C::LteCarriers, "SNR", U::Db, P::myLTESecondaryCellMeasDict, "scc_rx_measurement", "snr",
         "SCell"),

    strongest(C::LteNeighbours, "RSRP", U::Dbm, P::myLTEIntraRatMeasDict, "meas_nbr_eutra",
              "nbr_rsrp", "nbr_earfcn", "EARFCN", "nbr_phys_cell_id", "PCI", "nbr_rsrp"),
    strongest(C::LteNeighbours, "RSRQ", U::Db, P::myLTEIntraRatMeasDict, "meas_nbr_eutra",
              "nbr_rsrq", "nbr_earfcn", "EARFCN", "nbr_phys_cell_id", "PCI", "nbr_rsrp"),

    first(C::UmtsServing, "RSSI", U::Dbm, P::myUMTSCellMeasDict, "rx_info", "rssi"),
    first(C::UmtsServing, "SNR", U::Db, P::myUMTSCellMeasDict, "rx_info", "snr"),
    first(C::UmtsServing, "PUSCH Tx", U::Dbm, P::myUMTSTxPowerDict, "tx_power_info",
          "pusch_tx_power"),
    first(C::UmtsServing, "PUCCH Tx", U::Dbm, P::myUMTSTxPowerDict, "tx_power_info",
          "pucch_tx_power"),

    strongest(C::UmtsNeighbours, "RSCP", U::Dbm, P::myUMTSNbrMeasDict, "meas_utra_result", "rscp",
              "uarfcn", "UARFCN", "psc", "PSC", "rscp"),

    field(C::GsmServing, "RxLev idle", U::Dbm, P::myGSMIdleScellMeasDict, {}, "idle_rxlev_dBm"),
    field(C::GsmServing, "RxLev connected", U::RxLev, P::myGSMConnRfMeasDict, {}, "cs_rxlev_sub"),

    strongest(C::GsmNeighbours, "RxLev", U::Dbm, P::myGSMNbrMeasDict, "gsm_ncell_meas", "rxlev",
              "arfcn", "ARFCN", {}, {}, "rxlev"),
};

// Grouped by chart, in chart order: the chart pages list them in this order.
constexpr bool groupedByChart() {
    for (std::size_t i = 1; i < kQuantities.size(); ++i)
        if (static_cast<int>(kQuantities[i].chart) < static_cast<int>(kQuantities[i - 1].chart))
            return false;
    return true;
}
static_assert(groupedByChart());

}  // namespace

std::span<const Quantity> historyQuantities() {
    return kQuantities;
}

}  // namespace pyx
