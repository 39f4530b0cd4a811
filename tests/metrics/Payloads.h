// Payloads for the store's tests, written with the message classes.
#pragma once

#include <cstdint>
#include <memory>

#include "baseband/MetricRecord.h"
#include "messages/Messages.h"

namespace pyx::testing {

// 2017-07-14 02:40:00.123 UTC.
inline constexpr std::uint64_t kTimestamp = 1500000000123ULL;
inline constexpr const char* kTimestampText = "2017-07-14 02:40:00 GMT";

inline MetricRecord metricRecord(std::int64_t id, Bytes payload) {
    MetricRecord record;
    record.append("kKeyMetricID", Value(id));
    record.append("kKeyPayload", Value(std::move(payload)));
    record.append("kKeyProfileID", Value(std::int64_t{1}));
    return record;
}

template <class Message, class Fill>
Bytes payload(Fill fill) {
    Message message;
    message.setTimestamp(kTimestamp);
    fill(message);
    return message.data();
}

template <class Message>
Bytes timestampOnly() {
    return payload<Message>([](Message&) {});
}

template <class Element, class Fill>
std::shared_ptr<Element> element(Fill fill) {
    auto e = std::make_shared<Element>();
    fill(*e);
    return e;
}

inline Bytes lteTxPower(std::int32_t pucch = 10, std::int32_t pusch = 15) {
    return payload<KCellularLteTxPower>([&](auto& m) {
        m.addTxPowerInfo(element<TxPowerInfo>([&](auto& e) {
            e.setPucchTxPower(pucch);
            e.setPuschTxPower(pusch);
        }));
    });
}

inline Bytes lteNbrEutraMeas(std::int32_t rsrp, std::int32_t rsrq) {
    return payload<KCellularLteNbrEutraCellMeas>([&](auto& m) {
        m.addMeasNbrEutra(element<EgwErrcNbrEutraMeas>([&](auto& e) {
            e.setNbrEarfcn(1300);
            e.setNbrRsrp(rsrp);
            e.setNbrRsrq(rsrq);
        }));
    });
}

inline Bytes lteInterRatMeas() {
    return payload<KCellularLteNbrInterRatCellMeas>([](auto& m) {
        m.addMeasNbrUtra(element<EgwErrcNbrUtraMeas>([](auto& e) {
            e.setUarfcn(10700);
            e.setRscp(0);
            e.setEcno(49);
        }));
        m.addMeasNbrGeran(element<EgwErrcNbrGeranMeas>([](auto& e) {
            e.setArfcn(20);
            e.setRxlev(63);
        }));
    });
}

inline Bytes lteCaStatus() {
    return payload<KCellularLteCarrierAggregationStatus>([](auto& m) {
        m.addSccList(element<SecondaryComponentCarrier>([](auto& e) {
            e.setIndex(1);
            e.setDlBandwidth(3);
            e.setRsrp(-10050);
            e.setRsrq(-1050);
            e.setRssi(-6099);
        }));
    });
}

inline Bytes lteSecondaryCellMeas() {
    return payload<KCellularLteSecondaryCellMeasurements>([](auto& m) {
        m.addSccRxMeasurement(element<SccRxMeasurement>([](auto& e) {
            e.setIndex(0);
            e.setRsrp(-10050);
            e.setRsrq(-1050);
            e.setRssi(-6099);
        }));
    });
}

inline Bytes lteSelResel() {
    return payload<KCellularLteSelReselCellInfo>([](auto& m) {
        m.addMultiBandInfo(3);
        m.setQRxLevMin(-64);
        m.addNbrEutra(element<NbrEutra>([](auto& e) {
            e.setEarfcn(6300);
            e.setDlBw(5);
        }));
        m.addNbrEutra(element<NbrEutra>([](auto& e) {
            e.setEarfcn(1300);
            e.setDlBw(9);
        }));
    });
}

inline Bytes lteRsrpRsrqSinr() {
    return payload<KCellularLteRsrpRsrqSinr>([](auto& m) {
        m.setNumSamples(2);
        m.addInstValue(element<RsrpRsrqSinr>([](auto& e) {
            e.setPhyCellId(7);
            e.setSinr0(31);
        }));
    });
}

inline Bytes lteScellInfo(std::uint32_t dlBw = 100, std::uint32_t ulBw = 15) {
    return payload<KCellularLteScellInfo>([&](auto& m) {
        m.setPhyCellId(101);
        m.setDlBw(dlBw);
        m.setUlBw(ulBw);
    });
}

inline Bytes wcdmaScellMeas() {
    return payload<KCellularWcdmaScellMeasurement>([](auto& m) {
        m.setConnectedMode(true);
        m.addRxInfo(element<RxInfo>([](auto& e) { e.setRssi(-70); }));
    });
}

inline Bytes wcdmaSelResel() {
    return payload<KCellularWcdmaSelReselCellInfo>([](auto& m) {
        m.setSRxlev(-3);
        m.addEutraPrioInfo(element<EutraFreqInfo>([](auto& e) { e.setEarfcn(1300); }));
        m.addUtraPrioInfo(element<UtraFreqInfo>([](auto& e) { e.setUarfcn(10700); }));
        m.addGsmPrioInfo(element<GsmFreqInfo>([](auto& e) { e.setArfcn(20); }));
    });
}

inline Bytes wcdmaNbrMeas() {
    return payload<KCellularWcdmaNbrCellMeas>([](auto& m) {
        m.addMeasUtraResult(element<UtraCellMeasResult>([](auto& e) {
            e.setRscp(0);
            e.setEcno(49);
        }));
        m.addMeasGsmResult(element<GsmCellMeasResult>([](auto& e) { e.setRxlev(63); }));
        m.addMeasLteResult(element<LteCellMeasResult>([](auto& e) {
            e.setRsrp(97);
            e.setRsrq(34);
        }));
    });
}

inline Bytes wcdmaTxPower() {
    return payload<KCellularWcdmaTxPower>([](auto& m) {
        m.addTxPowerInfo(element<TxPowerInfo>([](auto& e) { e.setPuschTxPower(21); }));
    });
}

inline Bytes gsmNbrMeas() {
    return payload<KCellularGsmGrrEventMeasCr>([](auto& m) {
        m.addGsmNcellMeas(element<GsmNcellMeas>([](auto& e) {
            e.setArfcn(20);
            e.setRxlev(63);
        }));
        m.addUmtsNcellMeas(element<UmtsNcellMeas>([](auto& e) {
            e.setCpichRscp(20);
            e.setCpichEcn0(30);
        }));
        m.addLteNcellMeas(element<LteNcellMeas>([](auto& e) {
            e.setRsrp(40);
            e.setRsrq(9);
        }));
    });
}

inline Bytes activeBearers() {
    return payload<KCellularActivatedBearerContexts>([](auto& m) {
        m.setBearerContextCount(3);
        m.addBearerContext(element<BearerContext>([](auto& e) {
            e.setCid(1);
            e.setApn(std::string("internet"));
        }));
        m.addBearerContext(element<BearerContext>([](auto& e) { e.setCid(2); }));
    });
}

inline Bytes simFiles() {
    return payload<KCellularSimCardFiles>([](auto& m) {
        m.addEfList(element<ElementaryFile>([](auto& e) {
            e.setEfId(0x6F07);
            e.setContent(Bytes{0x08, 0x29});
        }));
    });
}

inline Bytes emmContext() {
    return payload<KCellularEmmContext>([](auto& m) {
        m.setRegStatus(0);
        m.addTaiList(element<KCellularTrackingAreaId>([](auto& e) { e.setTac(0x1234); }));
        m.setGuti(element<Guti>([](auto& e) {
            e.setMmegi(32769);
            e.setMmec(1);
            e.setMTmsi(0xC0FFEE);
        }));
    });
}

}  // namespace pyx::testing
