// UMTS reports of the drive: the UMTS layer as the phone measures it while camped on LTE.
#include <algorithm>
#include <memory>
#include <utility>

#include "messages/Messages.h"
#include "sources/sim/PayloadHelpers.h"
#include "sources/sim/Payloads.h"

namespace pyx::sim::payloads {

namespace {

// UMTS RRC states, establishment and release causes used here.
constexpr std::int32_t kWcdmaIdle = 2;
constexpr std::int32_t kWcdmaCellFach = 6;
constexpr std::int32_t kEstOrigBackground = 3;
constexpr std::int32_t kRelNormalEvent = 4;
constexpr std::int32_t kBandWcdmaI = 80;
constexpr std::int32_t kHsdpaHsupa = 3;

}  // namespace

Bytes umtsRrcState(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularWcdmaRrcConnectionState m;
    m.setTimestamp(timestamp);
    // The UMTS side mirrors the LTE phases: signalling while LTE connects, idle otherwise.
    m.setState(s.rrcState == kLteRrcAttemptConnection ? kWcdmaCellFach : kWcdmaIdle);
    m.setEstablishmentCause(kEstOrigBackground);
    m.setReleaseCause(kRelNormalEvent);
    return m.data();
}

Bytes umtsRrcConfig(const DriveState&, std::uint64_t timestamp, Random&) {
    KCellularWcdmaRrcConfiguration m;
    m.setTimestamp(timestamp);
    m.setDrxCycleLengthMs(640);
    m.setIsMimoConfigured(false);
    m.setIsDcConfigured(true);
    return m.data();
}

Bytes umtsScellInfo(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularWcdmaCellInfo m;
    m.setTimestamp(timestamp);
    m.setMcc(s.subscriber.mcc);
    m.setMnc(s.subscriber.mnc);
    m.setLac(s.umtsLac);
    m.setCellId(s.umtsCellId);
    m.setWcdmaBand(kBandWcdmaI);
    m.setDlUarfcn(s.umtsUarfcn);
    m.setPsc(s.umtsPsc);
    m.setNumMncDigits(s.subscriber.mncDigits);
    m.setHspa(kHsdpaHsupa);
    return m.data();
}

Bytes umtsScellMeas(const DriveState& s, std::uint64_t timestamp, Random& r) {
    KCellularWcdmaScellMeasurement m;
    m.setTimestamp(timestamp);
    m.setConnectedMode(false);
    for (int antenna = 0; antenna < 2; ++antenna) {
        auto rx = std::make_shared<RxInfo>();
        rx->setRssi(s32(s.umtsRscpDbm + 12 + r.between(-2, 2)));
        rx->setRsrpRange(u32(s.umtsRscpDbm + 116));
        rx->setRsrqRange(u32((s.umtsEcnoDb + 24) * 2));
        rx->setSnr(s32(std::clamp<std::int64_t>(s.umtsEcnoDb + 20 + r.between(-1, 1), 0, 30)));
        m.addRxInfo(std::move(rx));
    }
    return m.data();
}

Bytes umtsTxPower(const DriveState& s, std::uint64_t timestamp, Random& r) {
    KCellularWcdmaTxPower m;
    m.setTimestamp(timestamp);
    const std::int64_t base = std::clamp<std::int64_t>(-(s.umtsRscpDbm + 80), -30, 21);
    for (std::uint32_t slot = 0; slot < 3; ++slot) {
        auto info = std::make_shared<TxPowerInfo>();
        info->setPucchTxPower(s32(base - 3 + r.between(-1, 1)));
        info->setPuschTxPower(s32(base + r.between(-1, 1)));
        info->setSubframeIndex(slot);
        m.addTxPowerInfo(std::move(info));
    }
    return m.data();
}

Bytes umtsSelReselInfo(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularWcdmaSelReselCellInfo m;
    m.setTimestamp(timestamp);
    m.setHsdpaCapable(1);
    m.setEdchCapable(1);
    m.setDuplexMode(0);  // FDD
    m.addMultiBandInfo(1);
    m.addMultiBandInfo(8);
    m.setImsEmergencySupport(0);
    m.setCellBarred(0);
    m.setFachMeasOccInfoPresent(0);
    m.setSRxlev(s32(s.umtsRscpDbm + 115));
    m.setSQual(s32(s.umtsEcnoDb + 18));
    m.setSIntrasearch(10);
    m.setSIntersearch(6);
    m.setSSearchRat(4);
    m.setSCellPrio(3);
    for (const auto& [earfcn, prio] : {std::pair{1300U, 5U}, std::pair{6300U, 4U}}) {
        auto info = std::make_shared<EutraFreqInfo>();
        info->setEarfcn(earfcn);
        info->setPrio(prio);
        m.addEutraPrioInfo(std::move(info));
    }
    auto utra = std::make_shared<UtraFreqInfo>();
    utra->setUarfcn(s.umtsUarfcn);
    utra->setPrio(3);
    m.addUtraPrioInfo(std::move(utra));
    auto gsm = std::make_shared<GsmFreqInfo>();
    gsm->setArfcn(s.gsmArfcn);
    gsm->setPrio(1);
    m.addGsmPrioInfo(std::move(gsm));
    return m.data();
}

Bytes umtsNcellMeas(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularWcdmaNbrCellMeas m;
    m.setTimestamp(timestamp);
    for (const auto& n : s.utraNeighbours) {
        auto meas = std::make_shared<UtraCellMeasResult>();
        meas->setUarfcn(n.uarfcn);
        meas->setBand(1);
        meas->setPsc(n.psc);
        meas->setEcno(u32(n.ecnoIndex));
        meas->setRscp(s32(n.rscpIndex));
        m.addMeasUtraResult(std::move(meas));
    }
    for (const auto& n : s.geranNeighbours) {
        auto meas = std::make_shared<GsmCellMeasResult>();
        meas->setArfcn(n.arfcn);
        meas->setBsic(n.bsic);
        meas->setRxlev(u32(n.rxlev));
        m.addMeasGsmResult(std::move(meas));
    }
    for (const auto& n : s.lteNeighbours) {
        auto meas = std::make_shared<LteCellMeasResult>();
        meas->setEarfcn(n.earfcn);
        meas->setPhyCellId(n.pci);
        meas->setEutraBand(n.band);
        meas->setRsrp(s32(n.rsrpIndex));
        meas->setRsrq(s32(n.rsrqIndex));
        m.addMeasLteResult(std::move(meas));
    }
    return m.data();
}

}  // namespace pyx::sim::payloads
