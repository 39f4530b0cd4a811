// LTE reports of the drive. Field 19 of a message is never set: 19 is a metric tag, and a
// reader drops such a field.
#include <algorithm>
#include <memory>

#include "messages/Messages.h"
#include "messages/PBDataWriter.h"
#include "sources/sim/PayloadHelpers.h"
#include "sources/sim/Payloads.h"

namespace pyx::sim::payloads {

namespace {

bool connected(const DriveState& s) {
    return s.rrcState == kLteRrcConnected;
}

// Transmit power follows the path loss: weaker downlink, stronger uplink.
std::int64_t puschPower(const DriveState& s) {
    return std::clamp<std::int64_t>(-(s.rsrpDbm + 95) + 8, -20, 23);
}

}  // namespace

Bytes lteCdrxConfig(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularLteCdrxConfig m;
    m.setTimestamp(timestamp);
    m.setCellStatus(1);
    m.setOnDurationMs(connected(s) ? 10 : 0);
    m.setDrxInactivityMs(connected(s) ? 100 : 0);
    m.setDrxRetxTimerMs(8);
    m.setLongDrxCycleMs(320);
    m.setShortDrxCycleMs(80);
    m.setDrxShortCycleNum(2);
    m.setRrcState(s.rrcState);
    m.setCdrxConfigStatus(connected(s) ? 1 : 0);
    m.setTransmissionMode(3);
    return m.data();
}

Bytes lteRrcState(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularLteRrcState m;
    m.setTimestamp(timestamp);
    m.setState(s.rrcState);
    m.setPrevState(s.prevRrcState);
    m.setPrevStateDurMs(u32(static_cast<std::int64_t>(s.prevRrcStateDurMs)));
    m.setCause(s.rrcCause);
    return m.data();
}

Bytes lteScellInfo(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularLteScellInfo m;
    m.setTimestamp(timestamp);
    m.setPhyCellId(s.pci);
    m.setDlFreq(s.earfcn);
    m.setUlFreq(s.ulEarfcn);
    m.setDlBw(100);  // reported in half resource blocks: 50 RB, 10 MHz
    m.setUlBw(100);
    m.setCellId(s.cellId);
    m.setFreqBandInd(s.band);
    m.setTrackingAreaCode(s.tac);
    m.setNumMncDigits(s.subscriber.mncDigits);
    m.setSelPlmnMcc(s.subscriber.mcc);
    m.setSelPlmnMnc(s.subscriber.mnc);
    return m.data();
}

Bytes lteRadioLinkFailure(const DriveState& s, std::uint64_t timestamp, Random&) {
    // No message class of its own: a timestamp and the cell it happened on.
    PBDataWriter writer;
    PBDataWriterWriteUint64Field(writer, timestamp, 1);
    PBDataWriterWriteUint32Field(writer, s.pci, 2);
    PBDataWriterWriteUint32Field(writer, s.earfcn, 3);
    return writer.takeData();
}

Bytes lteSelReselInfo(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularLteSelReselCellInfo m;
    m.setTimestamp(timestamp);
    m.addMultiBandInfo(s.band);
    m.addMultiBandInfo(20);
    m.setImsEmergencySupport(1);
    m.setAcBarringForEmergency(0);
    m.setMoSignallingAcBarringFactor(95);
    m.setMoSignallingAcBarringTime(64);
    m.setMoSignallingAcBarringForSpecialAc(0);
    m.setMoDataAcBarringFactor(95);
    m.setMoDataAcBarringTime(64);
    m.setMoDataAcBarringForSpecialAc(0);
    m.setQRxLevMin(-64);  // in 2 dB steps: -128 dBm
    m.setQQualMin(-18);
    m.setQHyst(4);
    m.setSNonIntraSearchP(10);
    m.setSNonIntraSearchQ(4);
    m.setSIntraSearchP(31);
    m.setSIntraSearchQ(10);
    m.setThreshServingLowP(6);
    m.setPriorityOperatingFreq(5);
    struct Layer {
        std::uint32_t earfcn, band, bwCode, priority;
    };
    for (const Layer& layer : {Layer{6300, 20, 3, 4}, Layer{3350, 7, 5, 6}}) {
        auto n = std::make_shared<NbrEutra>();
        n->setEarfcn(layer.earfcn);
        n->setQRxlevMin(-64);
        n->setQQualMin(-20);
        n->setQOffset(0);
        n->setPmax(23);
        n->setDlBw(layer.bwCode);
        n->setThresXHighP(12);
        n->setThresXLowP(8);
        n->setThresXHighQ(10);
        n->setThresXLowQ(6);
        n->setPriority(layer.priority);
        n->setFrameType(0);  // FDD
        n->setBand(layer.band);
        m.addNbrEutra(std::move(n));
    }
    return m.data();
}

Bytes lteScellMeas(const DriveState& s, std::uint64_t timestamp, Random& r) {
    KCellularLteServingCellMeasurement m;
    m.setTimestamp(timestamp);
    m.setIsConnectedMode(connected(s));
    for (int antenna = 0; antenna < 2; ++antenna) {
        auto rx = std::make_shared<RxInfo>();
        rx->setRssi(s32(s.rssiDbm + r.between(-2, 2)));
        rx->setRsrpRange(u32(s.rsrpDbm + 140 + r.between(-1, 1)));
        rx->setRsrqRange(u32((s.rsrqDb + 20) * 2));
        rx->setSnr(s32(s.sinrHalfDb / 2 + r.between(-1, 1)));
        m.addRxInfo(std::move(rx));
    }
    return m.data();
}

Bytes lteTxPower(const DriveState& s, std::uint64_t timestamp, Random& r) {
    KCellularLteTxPower m;
    m.setTimestamp(timestamp);
    const std::int64_t pusch = puschPower(s);
    for (std::uint32_t subframe = 0; subframe < 10; subframe += 3) {
        auto info = std::make_shared<TxPowerInfo>();
        info->setPucchTxPower(s32(std::min<std::int64_t>(pusch - 4 + r.between(-1, 1), 23)));
        info->setPuschTxPower(s32(std::min<std::int64_t>(pusch + r.between(-2, 2), 23)));
        info->setSubframeIndex(subframe);
        m.addTxPowerInfo(std::move(info));
    }
    return m.data();
}

Bytes lteRsrpRsrqSinr(const DriveState& s, std::uint64_t timestamp, Random& r) {
    KCellularLteRsrpRsrqSinr m;
    m.setTimestamp(timestamp);
    m.setCallId("1");
    m.setLastXSeconds(1);
    m.setLastYSamples(5);
    m.setSamplePeriodMs(200);
    m.setDurationMs(1000);
    m.setNumSamples(5);
    std::int64_t sum[6] = {};
    for (int i = 0; i < 5; ++i) {
        auto v = std::make_shared<RsrpRsrqSinr>();
        const std::int64_t values[6] = {
            s.rsrpDbm + r.between(-2, 2),    s.rsrpDbm - 3 + r.between(-2, 2),
            s.rsrqDb + r.between(-1, 1),     s.rsrqDb - 1 + r.between(-1, 1),
            s.sinrHalfDb + r.between(-3, 3), s.sinrHalfDb - 4 + r.between(-3, 3)};
        v->setPhyCellId(s.pci);
        v->setRsrp0(s32(values[0]));
        v->setRsrp1(s32(values[1]));
        v->setRsrq0(s32(values[2]));
        v->setRsrq1(s32(values[3]));
        v->setSinr0(s32(values[4]));
        v->setSinr1(s32(values[5]));
        for (int k = 0; k < 6; ++k) sum[k] += values[k];
        m.addInstValue(std::move(v));
    }
    auto avg = std::make_shared<RsrpRsrqSinr>();
    avg->setPhyCellId(s.pci);
    avg->setRsrp0(s32(sum[0] / 5));
    avg->setRsrp1(s32(sum[1] / 5));
    avg->setRsrq0(s32(sum[2] / 5));
    avg->setRsrq1(s32(sum[3] / 5));
    avg->setSinr0(s32(sum[4] / 5));
    avg->setSinr1(s32(sum[5] / 5));
    m.setAvgValues(std::move(avg));
    return m.data();
}

Bytes lteComponentCarrierInfo(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularLteComponentCarrierInfo m;
    m.setTimestamp(timestamp);
    m.setPccEarfcn(s.earfcn);
    m.setPccBandwidth(10);  // MHz
    const auto& c0 = s.carriers.at(0);
    const auto& c1 = s.carriers.at(1);
    m.setScc0Earfcn(c0.state == kSccDeconfigured ? 0 : c0.earfcn);
    m.setScc1Earfcn(c1.state == kSccDeconfigured ? 0 : c1.earfcn);
    m.setScc0Bandwidth(c0.state == kSccDeconfigured ? 0 : 10);
    m.setScc1Bandwidth(c1.state == kSccDeconfigured ? 0 : 20);
    return m.data();
}

Bytes lteCaStatus(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularLteCarrierAggregationStatus m;
    m.setTimestamp(timestamp);
    for (const auto& c : s.carriers) {
        auto scc = std::make_shared<SecondaryComponentCarrier>();
        scc->setIndex(c.index);
        scc->setState(c.state);
        scc->setPci(c.pci);
        scc->setDlEarfcn(c.earfcn);
        scc->setDlRfBand(c.band);
        scc->setDlBandwidth(c.bandwidthCode);
        scc->setHasUplink(false);
        scc->setRsrp(s32(c.rsrpCentiDb));  // hundredths of a dB
        scc->setRsrq(s32(c.rsrqCentiDb));
        scc->setSnr(s32(c.snrDb));
        scc->setRssi(s32(c.rssiCentiDb));
        m.addSccList(std::move(scc));
    }
    return m.data();
}

Bytes lteInterRatMeas(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularLteNbrInterRatCellMeas m;
    m.setTimestamp(timestamp);
    for (const auto& n : s.utraNeighbours) {
        auto meas = std::make_shared<EgwErrcNbrUtraMeas>();
        meas->setUarfcn(n.uarfcn);
        meas->setPsc(n.psc);
        meas->setRscp(s32(n.rscpIndex));
        meas->setEcno(u32(n.ecnoIndex));
        m.addMeasNbrUtra(std::move(meas));
    }
    for (const auto& n : s.geranNeighbours) {
        auto meas = std::make_shared<EgwErrcNbrGeranMeas>();
        meas->setArfcn(n.arfcn);
        meas->setBsic(n.bsic);
        meas->setRxlev(u32(n.rxlev));
        m.addMeasNbrGeran(std::move(meas));
    }
    return m.data();
}

Bytes lteIntraRatMeas(const DriveState& s, std::uint64_t timestamp, Random&) {
    KCellularLteNbrEutraCellMeas m;
    m.setTimestamp(timestamp);
    for (const auto& n : s.lteNeighbours) {
        auto meas = std::make_shared<EgwErrcNbrEutraMeas>();
        meas->setNbrEarfcn(n.earfcn);
        meas->setNbrPhysCellId(n.pci);
        meas->setFreqBandInd(n.band);
        meas->setNbrRsrp(s32(n.rsrpIndex));
        meas->setNbrRsrq(s32(n.rsrqIndex));
        m.addMeasNbrEutra(std::move(meas));
    }
    return m.data();
}

Bytes lteSecondaryCellMeas(const DriveState& s, std::uint64_t timestamp, Random& r) {
    KCellularLteSecondaryCellMeasurements m;
    m.setTimestamp(timestamp);
    for (const auto& c : s.carriers) {
        if (c.state != kSccActivated) continue;
        auto meas = std::make_shared<SccRxMeasurement>();
        meas->setIndex(c.index);
        meas->setRsrp(s32(c.rsrpCentiDb + r.between(-50, 50)));
        meas->setRsrq(s32(c.rsrqCentiDb + r.between(-20, 20)));
        meas->setSnr(s32(c.snrDb));
        meas->setRssi(s32(c.rssiCentiDb + r.between(-50, 50)));
        m.addSccRxMeasurement(std::move(meas));
    }
    return m.data();
}

}  // namespace pyx::sim::payloads
