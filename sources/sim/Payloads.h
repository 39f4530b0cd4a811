// The payload writers of the simulated baseband, one per metric kind, grouped by technology.
// Each writes a message from the drive's state (with a little per-report noise) and returns its
// encoded bytes; every message carries the given timestamp.
#pragma once

#include <cstdint>

#include "core/Value.h"
#include "sources/sim/DriveState.h"
#include "sources/sim/Random.h"

namespace pyx::sim::payloads {

// LTE.
Bytes lteCdrxConfig(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteRrcState(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteScellInfo(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteRadioLinkFailure(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteSelReselInfo(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteScellMeas(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteTxPower(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteRsrpRsrqSinr(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteComponentCarrierInfo(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteCaStatus(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteInterRatMeas(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteIntraRatMeas(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes lteSecondaryCellMeas(const DriveState& s, std::uint64_t timestamp, Random& r);

// UMTS.
Bytes umtsRrcState(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes umtsRrcConfig(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes umtsScellInfo(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes umtsScellMeas(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes umtsTxPower(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes umtsSelReselInfo(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes umtsNcellMeas(const DriveState& s, std::uint64_t timestamp, Random& r);

// GSM.
Bytes gsmScellInfo(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes gsmIdleConfig(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes gsmIdleScellMeas(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes gsmCsRfMeas(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes gsmNcellMeas(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes gsmGprsConfig(const DriveState& s, std::uint64_t timestamp, Random& r);

// NAS, bearers and SIM.
Bytes mmCommonInfo(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes activeBearers(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes emmContext(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes mmContext(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes gmmContext(const DriveState& s, std::uint64_t timestamp, Random& r);
Bytes simCardFiles(const DriveState& s, std::uint64_t timestamp, Random& r);

}  // namespace pyx::sim::payloads
