// The state of the simulated drive: one LTE serving cell with its measurements, neighbours of
// three technologies, the RRC phase, two secondary carriers, and the subscriber's identities.
// Drive advances it; the payload writers turn it into messages.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace pyx::sim {

// RRC states, as the LTE and UMTS messages number them.
inline constexpr std::int32_t kLteRrcNull = 0;
inline constexpr std::int32_t kLteRrcIdle = 1;
inline constexpr std::int32_t kLteRrcAttemptConnection = 2;
inline constexpr std::int32_t kLteRrcConnected = 3;
inline constexpr std::int32_t kLteRrcEnding = 4;

// States of a secondary carrier.
inline constexpr std::int32_t kSccDeconfigured = 0;
inline constexpr std::int32_t kSccDeactivated = 1;
inline constexpr std::int32_t kSccActivated = 2;

struct LteNeighbour {
    std::uint32_t earfcn = 0;
    std::uint32_t pci = 0;
    std::uint32_t band = 0;
    std::int64_t rsrpIndex = 0;  // dBm + 140
    std::int64_t rsrqIndex = 0;  // (dB + 19.5) * 2
};

struct UtraNeighbour {
    std::uint32_t uarfcn = 0;
    std::uint32_t psc = 0;
    std::int64_t rscpIndex = 0;  // dBm + 116
    std::int64_t ecnoIndex = 0;  // (dB + 24.5) * 2
};

struct GeranNeighbour {
    std::uint32_t arfcn = 0;
    std::uint32_t bsic = 0;
    std::uint32_t lac = 0;
    std::uint32_t ci = 0;
    std::int64_t rxlev = 0;  // dBm + 110
};

struct SecondaryCarrier {
    std::uint32_t index = 0;
    std::uint32_t pci = 0;
    std::uint32_t earfcn = 0;
    std::uint32_t band = 0;
    std::uint32_t bandwidthCode = 0;  // 0..5: 1.4, 3, 5, 10, 15, 20 MHz
    std::int32_t state = kSccDeconfigured;
    std::int64_t rsrpCentiDb = 0;
    std::int64_t rsrqCentiDb = 0;
    std::int64_t rssiCentiDb = 0;
    std::int64_t snrDb = 0;
};

struct Subscriber {
    std::string imsi;   // 15 digits
    std::string iccid;  // 20 digits, the last one the check digit
    std::uint32_t mcc = 0;
    std::uint32_t mnc = 0;
    std::uint32_t mncDigits = 2;
    std::uint32_t tmsi = 0;
    std::uint32_t pTmsi = 0;
    std::uint32_t mTmsi = 0;
    std::uint32_t mmegi = 0;
    std::uint32_t mmec = 0;
};

struct DriveState {
    std::uint64_t elapsedMs = 0;  // simulated time since the drive began

    // RRC phase of the LTE serving cell.
    std::int32_t rrcState = kLteRrcIdle;
    std::int32_t prevRrcState = kLteRrcNull;
    std::uint64_t prevRrcStateDurMs = 0;
    std::int32_t rrcCause = 0;
    std::uint64_t phaseElapsedMs = 0;
    std::uint64_t phaseLengthMs = 0;

    // LTE serving cell.
    std::uint32_t pci = 301;
    std::uint32_t earfcn = 1300;
    std::uint32_t ulEarfcn = 19300;
    std::uint32_t band = 3;
    std::uint32_t cellId = 0;
    std::uint32_t tac = 0;
    std::int64_t rsrpDbm = -95;
    std::int64_t rsrqDb = -10;
    std::int64_t sinrHalfDb = 24;  // half-dB steps
    std::int64_t rssiDbm = -65;

    std::vector<LteNeighbour> lteNeighbours;
    std::vector<UtraNeighbour> utraNeighbours;
    std::vector<GeranNeighbour> geranNeighbours;
    std::vector<SecondaryCarrier> carriers;

    // UMTS and GSM serving cells, measured while the phone camps on LTE.
    std::uint32_t umtsLac = 0;
    std::uint32_t umtsCellId = 0;
    std::uint32_t umtsUarfcn = 10700;
    std::uint32_t umtsPsc = 0;
    std::int64_t umtsRscpDbm = -85;
    std::int64_t umtsEcnoDb = -8;
    std::uint32_t gsmLac = 0;
    std::uint32_t gsmCi = 0;
    std::uint32_t gsmArfcn = 62;
    std::uint32_t gsmBsic = 0;
    std::int64_t gsmRxlevDbm = -80;

    // NAS.
    Subscriber subscriber;
    std::int32_t emmRegProc = 0;
    std::uint32_t trackingAreaUpdates = 0;
};

}  // namespace pyx::sim
