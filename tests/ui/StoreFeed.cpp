#include "StoreFeed.h"

#include <gtest/gtest.h>

#include <utility>
#include <vector>

#include "messages/Messages.h"

namespace pyx::test {
namespace {

template <class M>
M stamped() {
    M message;
    message.setTimestamp(kTimestamp);
    return message;
}

// count entries of class E, entry i made distinct by fill(entry, i).
template <class E, class Fill>
std::vector<std::shared_ptr<E>> entries(int count, Fill fill) {
    std::vector<std::shared_ptr<E>> out;
    for (int i = 0; i < count; ++i) {
        auto entry = std::make_shared<E>();
        fill(*entry, static_cast<std::uint32_t>(i));
        out.push_back(std::move(entry));
    }
    return out;
}

template <class M>
void feed(MetricValidator& store, std::int64_t metricID, const M& message) {
    EXPECT_TRUE(store.isMetricIDValidWithMetricdict(record(metricID, message.data())))
        << "metric " << metricID;
}

}  // namespace

MetricRecord record(std::int64_t metricID, const Bytes& payload) {
    MetricRecord out;
    out.set("kKeyMetricID", Value(metricID));
    out.set("kKeyPayload", Value(payload));
    return out;
}

std::shared_ptr<MetricValidator> emptyStore() {
    return MetricValidator::create(nullptr);
}

void feedLteSelResel(MetricValidator& store, int neighbours) {
    auto m = stamped<KCellularLteSelReselCellInfo>();
    m.setQRxLevMin(-120);
    m.setNbrEutras(entries<NbrEutra>(neighbours, [](NbrEutra& e, std::uint32_t i) {
        e.setEarfcn(100 + i);
        e.setPriority(i);
    }));
    feed(store, store.K_LTE_SEL_RESEL_INFO, m);
}

void feedLteRsrpRsrqSinr(MetricValidator& store, int samples) {
    auto m = stamped<KCellularLteRsrpRsrqSinr>();
    m.setInstValues(entries<RsrpRsrqSinr>(
        samples, [](RsrpRsrqSinr& e, std::uint32_t i) { e.setPhyCellId(300 + i); }));
    feed(store, store.K_LTE_RSRP_RSRQ_SINR, m);
}

void feedUmtsScellMeas(MetricValidator& store, int rxInfos) {
    auto m = stamped<KCellularWcdmaScellMeasurement>();
    m.setRxInfos(entries<RxInfo>(rxInfos, [](RxInfo& e, std::uint32_t i) {
        e.setRssi(-70 - static_cast<std::int32_t>(i));
    }));
    feed(store, store.K_UMTS_SCELL_MEAS, m);
}

void feedActiveBearers(MetricValidator& store, int bearers) {
    auto m = stamped<KCellularActivatedBearerContexts>();
    m.setBearerContexts(entries<BearerContext>(bearers, [](BearerContext& e, std::uint32_t i) {
        e.setCid(i + 1);
        e.setApn("internet");
    }));
    feed(store, store.K_CELLULAR_ACTIVE_BEARER, m);
}

void feedLteCdrx(MetricValidator& store) {
    auto m = stamped<KCellularLteCdrxConfig>();
    m.setOnDurationMs(10);
    m.setLongDrxCycleMs(320);
    feed(store, store.K_LTE_CDRX_CONFIG, m);
}

void feedEveryKind(MetricValidator& store, int count) {
    feedLteCdrx(store);
    feed(store, store.K_LTE_RRC_STATE, stamped<KCellularLteRrcState>());
    feed(store, store.K_LTE_SCELL_INFO, stamped<KCellularLteScellInfo>());
    feedLteSelResel(store, count);
    {
        auto m = stamped<KCellularLteTxPower>();
        m.setTxPowerInfos(entries<TxPowerInfo>(count, [](TxPowerInfo& e, std::uint32_t i) {
            e.setPucchTxPower(static_cast<std::int32_t>(i));
        }));
        feed(store, store.K_LTE_TX_POWER, m);
    }
    feedLteRsrpRsrqSinr(store, count);
    feed(store, store.K_LTE_COMPCARR_INFO, stamped<KCellularLteComponentCarrierInfo>());
    {
        auto m = stamped<KCellularLteCarrierAggregationStatus>();
        m.setSccLists(entries<SecondaryComponentCarrier>(
            count, [](SecondaryComponentCarrier& e, std::uint32_t i) { e.setIndex(i); }));
        feed(store, store.K_LTE_CA_STATUS, m);
    }
    {
        auto m = stamped<KCellularLteNbrInterRatCellMeas>();
        m.setMeasNbrUtras(entries<EgwErrcNbrUtraMeas>(
            count, [](EgwErrcNbrUtraMeas& e, std::uint32_t i) { e.setUarfcn(10700 + i); }));
        m.setMeasNbrGerans(entries<EgwErrcNbrGeranMeas>(
            count, [](EgwErrcNbrGeranMeas& e, std::uint32_t i) { e.setArfcn(20 + i); }));
        feed(store, store.K_LTE_INTERRAT_MEAS, m);
    }
    {
        auto m = stamped<KCellularLteNbrEutraCellMeas>();
        m.setMeasNbrEutras(entries<EgwErrcNbrEutraMeas>(
            count, [](EgwErrcNbrEutraMeas& e, std::uint32_t i) { e.setNbrEarfcn(1300 + i); }));
        feed(store, store.K_LTE_INTRARAT_MEAS, m);
    }
    {
        auto m = stamped<KCellularLteSecondaryCellMeasurements>();
        m.setSccRxMeasurements(entries<SccRxMeasurement>(
            count, [](SccRxMeasurement& e, std::uint32_t i) { e.setIndex(i); }));
        feed(store, store.K_LTE_SECONDARYCELL_MEAS, m);
    }
    feed(store, store.K_CELLULAR_MM_INFO, stamped<KCellularMmCommonInfo>());
    feedActiveBearers(store, count);
    feed(store, store.K_LTE_EMM_CTXT, stamped<KCellularEmmContext>());
    feed(store, store.K_CELLULAR_MM_CTXT, stamped<KCellularMmContext>());
    feed(store, store.K_CELLULAR_GMM_CTXT, stamped<KCellularGmmContext>());
    feed(store, store.K_UMTS_RRC_STATE, stamped<KCellularWcdmaRrcConnectionState>());
    feed(store, store.K_UMTS_RRC_CONFIG, stamped<KCellularWcdmaRrcConfiguration>());
    feed(store, store.K_UMTS_SCELL_INFO, stamped<KCellularWcdmaCellInfo>());
    feedUmtsScellMeas(store, count);
    {
        auto m = stamped<KCellularWcdmaTxPower>();
        m.setTxPowerInfos(entries<TxPowerInfo>(count, [](TxPowerInfo& e, std::uint32_t i) {
            e.setPuschTxPower(static_cast<std::int32_t>(i));
        }));
        feed(store, store.K_UMTS_TX_POWER, m);
    }
    {
        auto m = stamped<KCellularWcdmaSelReselCellInfo>();
        m.setEutraPrioInfos(entries<EutraFreqInfo>(
            count, [](EutraFreqInfo& e, std::uint32_t i) { e.setEarfcn(1800 + i); }));
        m.setUtraPrioInfos(entries<UtraFreqInfo>(
            count, [](UtraFreqInfo& e, std::uint32_t i) { e.setUarfcn(10600 + i); }));
        m.setGsmPrioInfos(entries<GsmFreqInfo>(
            count, [](GsmFreqInfo& e, std::uint32_t i) { e.setArfcn(30 + i); }));
        feed(store, store.K_UMTS_SEL_RESEL_INFO, m);
    }
    {
        auto m = stamped<KCellularWcdmaNbrCellMeas>();
        m.setMeasUtraResults(entries<UtraCellMeasResult>(
            count, [](UtraCellMeasResult& e, std::uint32_t i) { e.setUarfcn(10650 + i); }));
        m.setMeasGsmResults(entries<GsmCellMeasResult>(
            count, [](GsmCellMeasResult& e, std::uint32_t i) { e.setArfcn(40 + i); }));
        m.setMeasLteResults(entries<LteCellMeasResult>(
            count, [](LteCellMeasResult& e, std::uint32_t i) { e.setEarfcn(2850 + i); }));
        feed(store, store.K_UMTS_NCELL_MEAS, m);
    }
    feed(store, store.K_GSM_SCELL_INFO, stamped<KCellularGsmScellInfo>());
    feed(store, store.K_GSM_IDLE_CONFIG, stamped<KCellularGsmIdleConfig>());
    feed(store, store.K_GSM_IDLE_SCELL_MEAS, stamped<KCellularGsmIdleScellMeasurement>());
    feed(store, store.K_GSM_CS_RF_MEAS, stamped<KCellularGsmCsRfMeasurement>());
    {
        auto m = stamped<KCellularGsmGrrEventMeasCr>();
        m.setGsmNcellMeas(entries<GsmNcellMeas>(
            count, [](GsmNcellMeas& e, std::uint32_t i) { e.setMcc(310 + i); }));
        m.setUmtsNcellMeas(entries<UmtsNcellMeas>(
            count, [](UmtsNcellMeas& e, std::uint32_t i) { e.setCellType(i); }));
        m.setLteNcellMeas(entries<LteNcellMeas>(
            count, [](LteNcellMeas& e, std::uint32_t i) { e.setPhysicalCellId(i); }));
        feed(store, store.K_GSM_NCELL_MEAS, m);
    }
    feed(store, store.K_GSM_GPRS_CONFIG, stamped<KCellularGsmGprsConfig>());
    {
        auto m = stamped<KCellularSimCardFiles>();
        m.setEfLists(entries<ElementaryFile>(count, [](ElementaryFile& e, std::uint32_t i) {
            e.setEfId(0x6F07 + i);
            e.setContent(Bytes{0x08, 0x49, static_cast<std::uint8_t>(i)});
        }));
        feed(store, store.K_SIM_FILE_INFO, m);
    }
}

}  // namespace pyx::test
