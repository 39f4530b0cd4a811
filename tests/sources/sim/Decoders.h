// Decodes a payload with the message class of its metric ID, as the store does.
#pragma once

#include <cstdint>
#include <functional>
#include <map>
#include <optional>

#include "messages/Messages.h"

namespace pyx::testing {

struct Decoded {
    Dict dictionary;
    // Whether writing the decoded message gives back the payload: nothing was dropped or
    // skipped while reading.
    bool roundTrips = false;
};

using Decoder = std::function<std::optional<Decoded>(const Bytes&)>;

template <class Message>
std::optional<Decoded> decodeAs(const Bytes& payload) {
    const std::optional<Message> message = Message::initWithData(payload);
    if (!message) return std::nullopt;
    return Decoded{message->dictionaryRepresentation(), message->data() == payload};
}

// The 30 kinds the store decodes, by metric ID.
inline const std::map<std::int64_t, Decoder>& storedKinds() {
    static const std::map<std::int64_t, Decoder> kinds{
        {0x3C4E18, decodeAs<KCellularLteCdrxConfig>},
        {0x3C4E04, decodeAs<KCellularLteRrcState>},
        {0x3C40C2, decodeAs<KCellularLteScellInfo>},
        {0x3CD30E, decodeAs<KCellularLteSelReselCellInfo>},
        {0x3CD302, decodeAs<KCellularLteTxPower>},
        {0x3C4F6A, decodeAs<KCellularLteRsrpRsrqSinr>},
        {0x3CD30B, decodeAs<KCellularLteComponentCarrierInfo>},
        {0x3CD313, decodeAs<KCellularLteCarrierAggregationStatus>},
        {0x3CD310, decodeAs<KCellularLteNbrInterRatCellMeas>},
        {0x3CD30F, decodeAs<KCellularLteNbrEutraCellMeas>},
        {0x3CD317, decodeAs<KCellularLteSecondaryCellMeasurements>},
        {0x3CD509, decodeAs<KCellularMmCommonInfo>},
        {0x3CD50D, decodeAs<KCellularActivatedBearerContexts>},
        {0x3CD50C, decodeAs<KCellularEmmContext>},
        {0x3CD50A, decodeAs<KCellularMmContext>},
        {0x3CD50B, decodeAs<KCellularGmmContext>},
        {0x3CD112, decodeAs<KCellularWcdmaRrcConnectionState>},
        {0x3CD113, decodeAs<KCellularWcdmaRrcConfiguration>},
        {0x3C300C, decodeAs<KCellularWcdmaCellInfo>},
        {0x3CD102, decodeAs<KCellularWcdmaScellMeasurement>},
        {0x3CD103, decodeAs<KCellularWcdmaTxPower>},
        {0x3CD104, decodeAs<KCellularWcdmaSelReselCellInfo>},
        {0x3CD105, decodeAs<KCellularWcdmaNbrCellMeas>},
        {0x3C2E0C, decodeAs<KCellularGsmScellInfo>},
        {0x3CD001, decodeAs<KCellularGsmIdleConfig>},
        {0x3CD002, decodeAs<KCellularGsmIdleScellMeasurement>},
        {0x3CD003, decodeAs<KCellularGsmCsRfMeasurement>},
        {0x3CD009, decodeAs<KCellularGsmGrrEventMeasCr>},
        {0x3CD00C, decodeAs<KCellularGsmGprsConfig>},
        {0x3C0013, decodeAs<KCellularSimCardFiles>},
    };
    return kinds;
}

// The two catalogued kinds the store ignores.
inline constexpr std::int64_t kServingCellMeasID = 0x3CD301;
inline constexpr std::int64_t kRadioLinkFailureID = 0x3C4E25;

}  // namespace pyx::testing
