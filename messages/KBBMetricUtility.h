// The metric-tag table: the 16-bit tags of the metric IDs whose payloads the decoders know.
// The message readers ask it about every field number they meet; a field whose number is a
// metric tag is never stored.
#pragma once

#include <array>
#include <concepts>
#include <cstdint>
#include <string_view>
#include <utility>

#include "messages/MessageDescriptor.h"

namespace pyx {

class KBBMetricUtility {
  public:
    struct Entry {
        std::uint16_t tag;
        std::string_view className;
    };

    // The 31 rows: tag and the class-name text it stands for (texts kept as the baseband
    // names them, lower-case "k" included).
    static constexpr std::array<Entry, 31> kEntries{{
        {0x4E04, "KCellularLteRrcState"},
        {0x4E18, "KCellularLteCdrxConfig"},
        {0x4E25, "KCellularLteRadioLinkFailure"},
        {0x40C2, "KCellularLteScellInfo"},
        {0xD30E, "KCellularLteSelReselCellInfo"},
        {0xD301, "KCellularLteServingCellMeasurement"},
        {0xD302, "KCellularLteTxPower"},
        {0x4F6A, "KCellularRsrpRsrqSinr"},
        {0xD50C, "KCellularEmmContext"},
        {0xD30B, "KCellularLteComponentCarrierInfo"},
        {0xD313, "KCellularLteCarrierAggregationStatus"},
        {0xD310, "KCellularLteNbrInterRatCellMeas"},
        {0xD30F, "KCellularLteNbrEutraCellMeas"},
        {0xD509, "KCellularMmCommonInfo"},
        {0xD50D, "KCellularActivatedBearerContexts"},
        {0xD112, "KCellularWcdmaRrcConnectionState"},
        {0x300C, "KCellularWcdmaCellInfo"},
        {0xD102, "KCellularWcdmaScellMeasurement"},
        {0xD103, "KCellularWcdmaTxPower"},
        {0xD105, "KCellularWcdmaNbrCellMeas"},
        {0xD104, "KCellularWcdmaSelReselCellInfo"},
        {0xD113, "KCellularWcdmaRrcConfiguration"},
        {0xD50A, "KCellularMmContext"},
        {0xD50B, "KCellularGmmContext"},
        {0x2E0C, "kCellularGsmScellInfo"},
        {0xD001, "kCellularGsmIdleConfig"},
        {0xD002, "kCellularGsmIdleScellMeasurement"},
        {0xD003, "kCellularGsmCsRfMeasurement"},
        {0xD009, "kCellularGsmGrrEventMeasCr"},
        {0xD00C, "kCellularGsmGprsConfig"},
        {0x0013, "kCellularSimCardFiles"},
    }};

    // Whether tag is a metric tag; logs "valid metricId tag" when it is. The class is not
    // consulted: a metric tag is one for every message class.
    static bool isValidMetricIdTag(std::uint16_t tag, const MessageDescriptor& forClass) {
        (void)forClass;
        if (((bits()[tag >> 6] >> (tag & 63)) & 1U) == 0) return false;
        logValidTag();
        return true;
    }

    // Any other integer (a whole metric ID, a negative number) is compared by value: only a
    // value that is itself one of the 16-bit tags is valid.
    template <std::integral Int>
    requires(!std::same_as<Int, std::uint16_t> &&
             !std::same_as<Int, bool>) static bool isValidMetricIdTag(Int tag,
                                                                      const MessageDescriptor&
                                                                          forClass) {
        if (std::cmp_less(tag, 0) || std::cmp_greater(tag, 0xFFFF)) return false;
        return isValidMetricIdTag(static_cast<std::uint16_t>(tag), forClass);
    }

    // The class-name text of a metric tag, empty when it is none.
    static std::string_view classNameForTag(std::uint16_t tag);

  private:
    using Bits = std::array<std::uint64_t, 1024>;
    static constexpr Bits buildBits() {
        Bits b{};
        for (const Entry& e : kEntries) b[e.tag >> 6] |= std::uint64_t{1} << (e.tag & 63);
        return b;
    }
    // One bit per possible tag, built once (at compile time).
    static const Bits& bits() {
        static constexpr Bits kBits = buildBits();
        return kBits;
    }
    static void logValidTag();
};

}  // namespace pyx
