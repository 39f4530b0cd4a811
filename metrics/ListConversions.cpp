#include "metrics/ListConversions.h"

#include <limits>

namespace pyx {

ConversionOverflow::ConversionOverflow(std::string_view key, std::int64_t raw)
    : std::overflow_error("conversion of \"" + std::string(key) + "\" overflows on the raw value " +
                          std::to_string(raw)),
      key_(key),
      raw_(raw) {}

namespace {

std::int64_t checkedOffset(std::int64_t raw, std::int64_t offset, std::string_view key) {
    std::int64_t result = 0;
    if (__builtin_sub_overflow(raw, offset, &result)) throw ConversionOverflow(key, raw);
    return result;
}

// Floating conversions are computed in double, as the constants are written, and stored
// as the nearest 32-bit float.
Value floating(double result) {
    return Value(static_cast<float>(result));
}

}  // namespace

std::optional<Value> convertValue(Conversion conversion, const Value& raw, std::string_view key) {
    switch (conversion) {
        case Conversion::HundredthsToInteger:
        case Conversion::LtePowerOffset:
        case Conversion::UtraPowerOffset:
        case Conversion::GeranLevelOffset: {
            const auto v = raw.toInt64();
            if (!v) return std::nullopt;
            switch (conversion) {
                case Conversion::HundredthsToInteger:
                    return Value(*v / 100);
                case Conversion::LtePowerOffset:
                    return Value(checkedOffset(*v, 140, key));
                case Conversion::UtraPowerOffset:
                    return Value(checkedOffset(*v, 116, key));
                default:
                    return Value(checkedOffset(*v, 110, key));
            }
        }
        case Conversion::HundredthsToReal:
        case Conversion::LteQualityHalfSteps:
        case Conversion::UtraQualityHalfSteps:
        case Conversion::Half: {
            const auto f = raw.toFloat();
            if (!f) return std::nullopt;
            const double v = *f;
            switch (conversion) {
                case Conversion::HundredthsToReal:
                    return floating(v / 100.0);
                case Conversion::LteQualityHalfSteps:
                    return floating(v * 0.5 + (-19.5));
                case Conversion::UtraQualityHalfSteps:
                    return floating(v * 0.5 + (-24.5));
                default:
                    return floating(v * 0.5);
            }
        }
    }
    return std::nullopt;
}

void convertEntry(Dict& entry, std::span<const KeyConversion> keys) {
    for (const auto& [key, conversion] : keys) {
        Value* value = entry.find(key);
        if (value == nullptr) continue;
        if (auto converted = convertValue(conversion, *value, key)) *value = std::move(*converted);
    }
}

void convertList(Dict& message, const ListConversion& rule) {
    Value* list = message.find(rule.list);
    if (list == nullptr || !list->isArray()) return;
    for (Value& entry : list->asArray()) {
        if (entry.isDict()) convertEntry(entry.asDict(), rule.keys);
    }
}

void replaceBandwidthCodes(Dict& message, std::string_view list, std::string_view key,
                           const BandwidthTable& table) {
    Value* entries = message.find(list);
    if (entries == nullptr || !entries->isArray()) return;
    for (Value& entry : entries->asArray()) {
        if (!entry.isDict()) continue;
        Value* code = entry.asDict().find(key);
        if (code == nullptr || !code->isInteger()) continue;
        const auto v = code->toInt64();
        if (!v || *v < std::numeric_limits<std::int32_t>::min() ||
            *v > std::numeric_limits<std::int32_t>::max())
            continue;
        const auto row = table.find(static_cast<std::int32_t>(*v));
        if (row != table.end()) *code = Value(row->second);
    }
}

namespace listconversions {
namespace {
using C = Conversion;
constexpr KeyConversion kCarrierKeys[] = {{"rsrp", C::HundredthsToInteger},
                                          {"rsrq", C::HundredthsToReal},
                                          {"rssi", C::HundredthsToInteger}};
constexpr KeyConversion kLteNbrEutraKeys[] = {{"nbr_rsrp", C::LtePowerOffset},
                                              {"nbr_rsrq", C::LteQualityHalfSteps}};
constexpr KeyConversion kUtraKeys[] = {{"rscp", C::UtraPowerOffset},
                                       {"ecno", C::UtraQualityHalfSteps}};
constexpr KeyConversion kGeranKeys[] = {{"rxlev", C::GeranLevelOffset}};
constexpr KeyConversion kLteKeys[] = {{"rsrp", C::LtePowerOffset},
                                      {"rsrq", C::LteQualityHalfSteps}};
// The rule names "cpich_ecno"; the entry's own key is spelt "cpich_ecn0", so that value is
// shown as it came.
constexpr KeyConversion kUmtsNcellKeys[] = {{"cpich_rscp", C::UtraPowerOffset},
                                            {"cpich_ecno", C::UtraQualityHalfSteps}};
constexpr KeyConversion kSinrKeys[] = {{"sinr0", C::Half}, {"sinr1", C::Half}};
}  // namespace

const ListConversion lteCaStatusSccList{"scc_list", kCarrierKeys};
const ListConversion lteSecondaryCellSccRxMeasurement{"scc_rx_measurement", kCarrierKeys};
const ListConversion lteNbrEutraMeasNbrEutra{"meas_nbr_eutra", kLteNbrEutraKeys};
const ListConversion lteInterRatMeasNbrUtra{"meas_nbr_utra", kUtraKeys};
const ListConversion lteInterRatMeasNbrGeran{"meas_nbr_geran", kGeranKeys};
const ListConversion wcdmaNbrMeasUtraResult{"meas_utra_result", kUtraKeys};
const ListConversion wcdmaNbrMeasGsmResult{"meas_gsm_result", kGeranKeys};
const ListConversion wcdmaNbrMeasLteResult{"meas_lte_result", kLteKeys};
const ListConversion gsmNbrMeasGsmNcell{"gsm_ncell_meas", kGeranKeys};
const ListConversion gsmNbrMeasUmtsNcell{"umts_ncell_meas", kUmtsNcellKeys};
const ListConversion gsmNbrMeasLteNcell{"lte_ncell_meas", kLteKeys};
const ListConversion lteRsrpRsrqSinrInstValues{"inst_values", kSinrKeys};
}  // namespace listconversions

}  // namespace pyx
