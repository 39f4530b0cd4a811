// GSM reports of the drive: the GSM layer as the phone measures it while camped on LTE.
// Field 19 of a message is never set: 19 is a metric tag, and a reader drops such a field.
#include <algorithm>
#include <memory>

#include "messages/Messages.h"
#include "sources/sim/PayloadHelpers.h"
#include "sources/sim/Payloads.h"

namespace pyx::sim::payloads {

namespace {
constexpr std::int32_t kBandEgsm900 = 44;
constexpr std::int32_t kNonDedicated = 2;
constexpr std::uint32_t kBandNumberEgsm900 = 1;  // as the idle configuration numbers bands
}  // namespace

Bytes gsmScellInfo(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularGsmScellInfo m;
    m.setTimestamp(timestamp);
    m.setMcc(s.subscriber.mcc);
    m.setMnc(s.subscriber.mnc);
    m.setLac(s.gsmLac);
    m.setCellId(s.gsmCi);
    m.setGsmBand(kBandEgsm900);
    m.setArfcn(s.gsmArfcn);
    m.setBsic(s.gsmBsic);
    m.setState(kNonDedicated);
    m.setNumMncDigits(s.subscriber.mncDigits);
    return m.data();
}

Bytes gsmIdleConfig(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularGsmIdleConfig m;
    m.setTimestamp(timestamp);
    m.setArfcnBcch(s.gsmArfcn);
    m.setMcc(s.subscriber.mcc);
    m.setMnc(s.subscriber.mnc);
    m.setLac(s.gsmLac);
    m.setCi(s.gsmCi);
    m.setBsic(s.gsmBsic);
    m.setDtxFromBs(1);
    m.setRadioLinkTimeout(16);
    m.setMultibRep(0);
    m.setGsmBand(kBandNumberEgsm900);
    m.setAccessTech(0);
    m.setTypeOfCurChan(0);
    m.setMsTxpwr(5);
    m.setRxAccMin(8);
    m.setCbq(0);
    m.setCba(0);
    m.setC2Valid(1);
    m.setTmpOffset(0);
    m.setPenaltyT(0);
    m.setT3212(30);  // decihours: 3 hours
    m.setAcc(0x0020);
    m.setBsPaMfrms(3);
    m.setCsPagemode(0);
    m.setMaxRetransCs(4);
    m.setEmergCallAllowed(1);
    m.setAttachAllowed(1);
    m.setHalfRateSupported(1);
    m.setSi78Broadcast(0);
    m.setCbchSupported(0);
    m.setReestAllowed(1);
    m.setEcsc(1);
    m.setSi2TerNeeded(1);
    return m.data();
}

Bytes gsmIdleScellMeas(const DriveState& s, std::uint64_t timestamp, Random& r) {
    KCellularGsmIdleScellMeasurement m;
    m.setTimestamp(timestamp);
    m.setScellArfcn(s.gsmArfcn);
    m.setSimplifiedL1State(1);
    m.setCurrentAntenna(0);
    m.setIdleRxlevDBm(s32(s.gsmRxlevDbm + r.between(-1, 1)));
    return m.data();
}

Bytes gsmCsRfMeas(const DriveState& s, std::uint64_t timestamp, Random& r) {
    KCellularGsmCsRfMeasurement m;
    m.setTimestamp(timestamp);
    m.setScellArfcn(s.gsmArfcn);
    m.setSimplifiedL1State(1);
    m.setCurrentAntenna(0);
    for (int i = 0; i < 4; ++i) m.addCsTxPwr(s32(r.between(5, 9)));
    m.setCsRxlevSub(u32(std::clamp<std::int64_t>(s.gsmRxlevDbm + 110, 0, 63)));
    m.setCsRxqualSub(u32(r.between(0, 2)));
    m.setScellBand(kBandNumberEgsm900);
    return m.data();
}

Bytes gsmNcellMeas(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularGsmGrrEventMeasCr m;
    m.setTimestamp(timestamp);
    for (const auto& n : s.geranNeighbours) {
        auto meas = std::make_shared<GsmNcellMeas>();
        meas->setMcc(s.subscriber.mcc);
        meas->setMnc(s.subscriber.mnc);
        meas->setLac(n.lac);
        meas->setCi(n.ci);
        meas->setBsic(n.bsic);
        meas->setArfcn(n.arfcn);
        meas->setRxlev(u32(n.rxlev));
        m.addGsmNcellMeas(std::move(meas));
    }
    for (const auto& n : s.utraNeighbours) {
        auto meas = std::make_shared<UmtsNcellMeas>();
        meas->setCellType(0);
        meas->setCpichSc(n.psc);
        meas->setDlUarfcn(n.uarfcn);
        meas->setCpichRscp(u32(n.rscpIndex));
        meas->setCpichEcn0(u32(n.ecnoIndex));
        m.addUmtsNcellMeas(std::move(meas));
    }
    for (const auto& n : s.lteNeighbours) {
        auto meas = std::make_shared<LteNcellMeas>();
        meas->setPhysicalCellId(n.pci);
        meas->setBandwidth(3);
        meas->setRsrp(u32(n.rsrpIndex));
        meas->setEarfcn(n.earfcn);
        meas->setRsrq(u32(n.rsrqIndex));
        m.addLteNcellMeas(std::move(meas));
    }
    return m.data();
}

Bytes gsmGprsConfig(const DriveState&, std::uint64_t timestamp, Random&) {
    KCellularGsmGprsConfig m;
    m.setTimestamp(timestamp);
    m.setGprsSup(true);
    m.setRac(17);
    m.setSpPgCy(true);
    m.setNco(0);
    m.setNom(1);
    m.setCrHyst(4);
    m.setAccThr(0);
    m.setExtUplTbfSupported(true);
    m.setPriorityClass(0);
    m.setCellBarAccess2(0);
    return m.data();
}

}  // namespace pyx::sim::payloads
