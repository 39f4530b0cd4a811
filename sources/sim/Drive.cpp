#include "sources/sim/Drive.h"

#include <algorithm>
#include <array>
#include <string>

#include "sources/sim/Identities.h"
#include "sources/sim/Payloads.h"

namespace pyx::sim {

namespace {

using Writer = Bytes (*)(const DriveState&, std::uint64_t, Random&);

struct Reported {
    std::int64_t metricID;
    Writer write;
};

// Every metric the simulated baseband reports, in catalogue order.
constexpr std::array<Reported, 32> kReported{{
    {0x3C4E18, payloads::lteCdrxConfig},
    {0x3C4E04, payloads::lteRrcState},
    {0x3C40C2, payloads::lteScellInfo},
    {0x3C4E25, payloads::lteRadioLinkFailure},
    {0x3CD30E, payloads::lteSelReselInfo},
    {0x3CD301, payloads::lteScellMeas},
    {0x3CD302, payloads::lteTxPower},
    {0x3C4F6A, payloads::lteRsrpRsrqSinr},
    {0x3CD30B, payloads::lteComponentCarrierInfo},
    {0x3CD313, payloads::lteCaStatus},
    {0x3CD310, payloads::lteInterRatMeas},
    {0x3CD30F, payloads::lteIntraRatMeas},
    {0x3CD317, payloads::lteSecondaryCellMeas},
    {0x3CD509, payloads::mmCommonInfo},
    {0x3CD50D, payloads::activeBearers},
    {0x3CD50C, payloads::emmContext},
    {0x3CD50A, payloads::mmContext},
    {0x3CD50B, payloads::gmmContext},
    {0x3CD112, payloads::umtsRrcState},
    {0x3CD113, payloads::umtsRrcConfig},
    {0x3C300C, payloads::umtsScellInfo},
    {0x3CD102, payloads::umtsScellMeas},
    {0x3CD103, payloads::umtsTxPower},
    {0x3CD104, payloads::umtsSelReselInfo},
    {0x3CD105, payloads::umtsNcellMeas},
    {0x3C2E0C, payloads::gsmScellInfo},
    {0x3CD001, payloads::gsmIdleConfig},
    {0x3CD002, payloads::gsmIdleScellMeas},
    {0x3CD003, payloads::gsmCsRfMeas},
    {0x3CD009, payloads::gsmNcellMeas},
    {0x3CD00C, payloads::gsmGprsConfig},
    {0x3C0013, payloads::simCardFiles},
}};

const Reported* findReported(std::int64_t metricID) {
    for (const auto& r : kReported)
        if (r.metricID == metricID) return &r;
    return nullptr;
}

// RRC causes used by the drive.
constexpr std::int32_t kCauseMoData = 4;
constexpr std::int32_t kCauseMtAccess = 2;
constexpr std::int32_t kCauseReleaseOther = 15;

// Cells the phone may hear around the serving cell.
constexpr std::array<std::uint32_t, 10> kIntraPcis{302, 303, 118, 119, 57, 58, 411, 412, 260, 7};
constexpr std::array<std::uint32_t, 6> kUtraPscs{12, 137, 260, 388, 401, 77};
constexpr std::array<std::uint32_t, 6> kGeranArfcns{58, 60, 62, 65, 70, 74};

std::string randomDigits(Random& r, int count) {
    std::string digits;
    for (int i = 0; i < count; ++i) digits.push_back(static_cast<char>('0' + r.between(0, 9)));
    return digits;
}

}  // namespace

Drive::Drive(std::uint64_t seed) : random_(seed) {
    DriveState& s = state_;
    Subscriber& sub = s.subscriber;
    sub.mcc = 1;  // the test network 001-01
    sub.mnc = 1;
    sub.mncDigits = 2;
    sub.imsi = "00101" + randomDigits(random_, 10);
    const std::string iccid = "8900101" + randomDigits(random_, 12);
    sub.iccid = iccid + luhnCheckDigit(iccid);
    sub.tmsi = static_cast<std::uint32_t>(random_.next());
    sub.pTmsi = static_cast<std::uint32_t>(random_.next()) | 0xC0000000U;
    sub.mTmsi = static_cast<std::uint32_t>(random_.next());
    sub.mmegi = 0x8000U + static_cast<std::uint32_t>(random_.between(0, 0xFF));
    sub.mmec = static_cast<std::uint32_t>(random_.between(1, 0xFF));

    s.cellId = static_cast<std::uint32_t>(random_.between(10000, 90000)) * 256U + 1U;
    s.tac = static_cast<std::uint32_t>(random_.between(0x1000, 0x7FFF));
    s.umtsLac = static_cast<std::uint32_t>(random_.between(0x1000, 0x7FFF));
    s.umtsCellId = (static_cast<std::uint32_t>(random_.between(100, 900)) << 16) |
                   static_cast<std::uint32_t>(random_.between(1, 0xFFFF));
    s.umtsPsc = static_cast<std::uint32_t>(random_.between(0, 511));
    s.gsmLac = s.umtsLac;
    s.gsmCi = static_cast<std::uint32_t>(random_.between(1000, 65000));
    s.gsmBsic = static_cast<std::uint32_t>(random_.between(0, 63));

    s.rrcState = kLteRrcIdle;
    s.prevRrcState = kLteRrcNull;
    s.rrcCause = kCauseReleaseOther;
    s.phaseLengthMs = static_cast<std::uint64_t>(random_.between(8'000, 20'000));

    // Two neighbours of each technology to begin with; more come and go as the drive goes on.
    s.lteNeighbours = {{1300, kIntraPcis[0], 3, 42, 14}, {6300, kIntraPcis[2], 20, 35, 10}};
    s.utraNeighbours = {{10700, kUtraPscs[0], 30, 30}, {10737, kUtraPscs[1], 24, 22}};
    s.geranNeighbours = {{kGeranArfcns[0], 21, s.gsmLac, s.gsmCi + 1, 28},
                         {kGeranArfcns[1], 45, s.gsmLac, s.gsmCi + 2, 21}};
    s.carriers = {
        {1, 188, 6300, 20, 3, kSccDeconfigured, -9800, -1100, -6500, 12},
        {2, 417, 3350, 7, 5, kSccDeconfigured, -10400, -1250, -7000, 8},
    };
}

void Drive::advance(std::uint64_t elapsedMs) {
    state_.elapsedMs += elapsedMs;
    advanceRrc(elapsedMs);
    advanceRadio();
    // Slower changes: once per simulated second.
    const std::uint64_t secondsBefore = (state_.elapsedMs - elapsedMs) / 1000;
    if (state_.elapsedMs / 1000 != secondsBefore) {
        advanceNeighbours();
        advanceCarriers();
    }
}

void Drive::advanceRrc(std::uint64_t elapsedMs) {
    DriveState& s = state_;
    s.phaseElapsedMs += elapsedMs;
    if (s.phaseElapsedMs < s.phaseLengthMs) return;
    const auto enter = [&](std::int32_t next, std::int64_t minMs, std::int64_t maxMs) {
        s.prevRrcState = s.rrcState;
        s.prevRrcStateDurMs = s.phaseElapsedMs;
        s.rrcState = next;
        s.phaseElapsedMs = 0;
        s.phaseLengthMs = static_cast<std::uint64_t>(random_.between(minMs, maxMs));
    };
    switch (s.rrcState) {
        case kLteRrcIdle:
            s.rrcCause = random_.chance(0.7) ? kCauseMoData : kCauseMtAccess;
            enter(kLteRrcAttemptConnection, 100, 400);
            break;
        case kLteRrcAttemptConnection:
            enter(kLteRrcConnected, 10'000, 30'000);
            break;
        case kLteRrcConnected:
            s.rrcCause = kCauseReleaseOther;
            enter(kLteRrcEnding, 100, 300);
            break;
        default:
            enter(kLteRrcIdle, 8'000, 25'000);
            // A tracking area update now and then, as after idle mobility.
            if (random_.chance(0.3)) {
                ++s.trackingAreaUpdates;
                s.emmRegProc = 6;  // periodic TAU
            } else {
                s.emmRegProc = 0;
            }
            break;
    }
}

void Drive::advanceRadio() {
    DriveState& s = state_;
    if (random_.chance(0.3)) s.rsrpDbm = random_.walk(s.rsrpDbm, 1, -118, -72);
    if (random_.chance(0.2)) s.rsrqDb = random_.walk(s.rsrqDb, 1, -17, -6);
    if (random_.chance(0.3)) s.sinrHalfDb = random_.walk(s.sinrHalfDb, 2, -8, 56);
    s.rssiDbm = std::clamp<std::int64_t>(s.rsrpDbm + 30, -90, -40);
    if (random_.chance(0.1)) s.umtsRscpDbm = random_.walk(s.umtsRscpDbm, 1, -110, -60);
    if (random_.chance(0.1)) s.umtsEcnoDb = random_.walk(s.umtsEcnoDb, 1, -20, -3);
    if (random_.chance(0.1)) s.gsmRxlevDbm = random_.walk(s.gsmRxlevDbm, 1, -105, -55);
}

void Drive::advanceNeighbours() {
    DriveState& s = state_;
    for (auto& n : s.lteNeighbours) {
        n.rsrpIndex = random_.walk(n.rsrpIndex, 2, 10, 70);
        n.rsrqIndex = random_.walk(n.rsrqIndex, 1, 2, 28);
    }
    for (auto& n : s.utraNeighbours) {
        n.rscpIndex = random_.walk(n.rscpIndex, 2, 5, 60);
        n.ecnoIndex = random_.walk(n.ecnoIndex, 1, 6, 44);
    }
    for (auto& n : s.geranNeighbours) n.rxlev = random_.walk(n.rxlev, 2, 3, 50);

    // Neighbours come and go.
    if (s.lteNeighbours.size() > 1 && random_.chance(0.12)) {
        s.lteNeighbours.erase(
            s.lteNeighbours.begin() +
            random_.between(0, static_cast<std::int64_t>(s.lteNeighbours.size()) - 1));
    }
    if (s.lteNeighbours.size() < 6 && random_.chance(0.15)) {
        const std::uint32_t pci = kIntraPcis[static_cast<std::size_t>(
            random_.between(0, static_cast<std::int64_t>(kIntraPcis.size()) - 1))];
        const bool known = std::any_of(s.lteNeighbours.begin(), s.lteNeighbours.end(),
                                       [pci](const LteNeighbour& n) { return n.pci == pci; });
        if (!known) {
            const bool otherLayer = random_.chance(0.4);
            s.lteNeighbours.push_back({otherLayer ? 6300U : 1300U, pci, otherLayer ? 20U : 3U,
                                       random_.between(12, 40), random_.between(4, 16)});
        }
    }
    if (s.utraNeighbours.size() > 1 && random_.chance(0.08)) s.utraNeighbours.pop_back();
    if (s.utraNeighbours.size() < 4 && random_.chance(0.1)) {
        const std::uint32_t psc = kUtraPscs[s.utraNeighbours.size() % kUtraPscs.size()];
        s.utraNeighbours.push_back({random_.chance(0.5) ? 10700U : 10737U, psc,
                                    random_.between(10, 40), random_.between(12, 36)});
    }
    if (s.geranNeighbours.size() > 1 && random_.chance(0.08)) s.geranNeighbours.pop_back();
    if (s.geranNeighbours.size() < 4 && random_.chance(0.1)) {
        const std::size_t i = s.geranNeighbours.size();
        s.geranNeighbours.push_back({kGeranArfcns[i % kGeranArfcns.size()],
                                     static_cast<std::uint32_t>(random_.between(0, 63)), s.gsmLac,
                                     s.gsmCi + static_cast<std::uint32_t>(i) + 1,
                                     random_.between(8, 35)});
    }
}

void Drive::advanceCarriers() {
    DriveState& s = state_;
    const bool connected = s.rrcState == kLteRrcConnected;
    for (auto& c : s.carriers) {
        if (!connected) {
            c.state = kSccDeconfigured;
        } else if (c.state == kSccDeconfigured) {
            if (random_.chance(0.4)) c.state = kSccDeactivated;
        } else if (c.state == kSccDeactivated) {
            if (random_.chance(0.5)) c.state = kSccActivated;
        } else if (random_.chance(0.1)) {
            c.state = kSccDeactivated;
        }
        c.rsrpCentiDb = random_.walk(c.rsrpCentiDb, 150, -12000, -7500);
        c.rsrqCentiDb = random_.walk(c.rsrqCentiDb, 50, -1800, -500);
        c.rssiCentiDb = random_.walk(c.rssiCentiDb, 150, -9000, -4000);
        c.snrDb = random_.walk(c.snrDb, 1, -3, 25);
    }
}

std::optional<Bytes> Drive::payload(std::int64_t metricID, std::uint64_t timestampMs) {
    const Reported* reported = findReported(metricID);
    if (!reported) return std::nullopt;
    return reported->write(state_, timestampMs, random_);
}

bool Drive::reports(std::int64_t metricID) {
    return findReported(metricID) != nullptr;
}

const std::vector<std::int64_t>& Drive::reportedMetricIDs() {
    static const std::vector<std::int64_t> ids = [] {
        std::vector<std::int64_t> out;
        out.reserve(kReported.size());
        for (const auto& r : kReported) out.push_back(r.metricID);
        return out;
    }();
    return ids;
}

}  // namespace pyx::sim
