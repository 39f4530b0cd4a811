// Raw signal values of list entries turned into display units: offset indexes, half-dB steps
// and hundredths of a dB become dBm and dB. Each rule is bound to one list of one message
// kind, because the same raw key ("rsrp") means different things in different lists.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>

#include "core/Value.h"

namespace pyx {

enum class Conversion {
    HundredthsToInteger,   // integer: raw / 100, truncating toward zero
    HundredthsToReal,      // floating: raw / 100.0
    LtePowerOffset,        // integer: raw - 140
    LteQualityHalfSteps,   // floating: raw * 0.5 - 19.5
    UtraPowerOffset,       // integer: raw - 116
    UtraQualityHalfSteps,  // floating: raw * 0.5 - 24.5
    GeranLevelOffset,      // integer: raw - 110
    Half,                  // floating: raw * 0.5
};

// An integer conversion whose result does not fit in 64 bits (only a raw value near the
// smallest 64-bit integer can cause it).
class ConversionOverflow : public std::overflow_error {
  public:
    ConversionOverflow(std::string_view key, std::int64_t raw);
    [[nodiscard]] const std::string& key() const { return key_; }
    [[nodiscard]] std::int64_t raw() const { return raw_; }

  private:
    std::string key_;
    std::int64_t raw_;
};

// The converted value of raw, or nothing when raw cannot be taken as the conversion's kind
// (a string, bytes, a list, ...). Integer conversions give an Int, floating ones a Float.
// Throws ConversionOverflow.
[[nodiscard]] std::optional<Value> convertValue(Conversion conversion, const Value& raw,
                                                std::string_view key = {});

struct KeyConversion {
    std::string_view key;
    Conversion conversion;
};

// The keys of one list and how each is converted, in the order they are applied.
struct ListConversion {
    std::string_view list;
    std::span<const KeyConversion> keys;
};

// Converts the keys of one entry in place; a missing key or a value of another kind is left
// as it is. Throws ConversionOverflow.
void convertEntry(Dict& entry, std::span<const KeyConversion> keys);

// Converts every dictionary entry of message[rule.list], in list order. An absent or empty
// list is no work. Throws ConversionOverflow.
void convertList(Dict& message, const ListConversion& rule);

using BandwidthTable = std::map<std::int32_t, float>;

// Replaces the bandwidth code under key in every entry of message[list] by its value in MHz.
// A code without a row, or a value that is not a 32-bit integer, is left as it came.
void replaceBandwidthCodes(Dict& message, std::string_view list, std::string_view key,
                           const BandwidthTable& table);

// The conversions of each list, by message kind.
namespace listconversions {
extern const ListConversion lteCaStatusSccList;
extern const ListConversion lteSecondaryCellSccRxMeasurement;
extern const ListConversion lteNbrEutraMeasNbrEutra;
extern const ListConversion lteInterRatMeasNbrUtra;
extern const ListConversion lteInterRatMeasNbrGeran;
extern const ListConversion wcdmaNbrMeasUtraResult;
extern const ListConversion wcdmaNbrMeasGsmResult;
extern const ListConversion wcdmaNbrMeasLteResult;
extern const ListConversion gsmNbrMeasGsmNcell;
extern const ListConversion gsmNbrMeasUmtsNcell;
extern const ListConversion gsmNbrMeasLteNcell;
extern const ListConversion lteRsrpRsrqSinrInstValues;
}  // namespace listconversions

}  // namespace pyx
