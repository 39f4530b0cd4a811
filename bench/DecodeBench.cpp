// Decode time per message for a realistic payload of every decoded metric kind: the typed
// decode alone, and the whole path from bytes to the dictionary the store keeps.
#include <benchmark/benchmark.h>

#include <cstdint>
#include <memory>
#include <string>

#include "messages/Messages.h"

namespace pyx {
namespace {

constexpr std::uint64_t kNow = 1'700'000'000'123ULL;

template <class T>
std::shared_ptr<T> make() {
    return std::make_shared<T>();
}

// One realistic message per metric kind, as the baseband would report it.
template <class T>
T sample();

template <>
KCellularLteRrcState sample() {
    KCellularLteRrcState m;
    m.setTimestamp(kNow);
    m.setState(KLTE_RRC_STATE_CONNECTED);
    m.setPrevState(KLTE_RRC_STATE_ATMPT_CONNECTION);
    m.setPrevStateDurMs(48);
    m.setCause(KLTE_RRC_CAUSE_EST_MO_DATA);
    return m;
}

template <>
KCellularLteCdrxConfig sample() {
    KCellularLteCdrxConfig m;
    m.setTimestamp(kNow);
    m.setCellStatus(1);
    m.setOnDurationMs(10);
    m.setDrxInactivityMs(100);
    m.setDrxRetxTimerMs(8);
    m.setLongDrxCycleMs(320);
    m.setShortDrxCycleMs(80);
    m.setDrxShortCycleNum(2);
    m.setRrcState(KLTE_RRC_STATE_CONNECTED);
    m.setCdrxConfigStatus(1);
    m.setTransmissionMode(3);
    return m;
}

template <>
KCellularLteScellInfo sample() {
    KCellularLteScellInfo m;
    m.setTimestamp(kNow);
    m.setPhyCellId(301);
    m.setDlFreq(6300);
    m.setUlFreq(24300);
    m.setDlBw(5);
    m.setUlBw(5);
    m.setCellId(27'458'817);
    m.setFreqBandInd(20);
    m.setTrackingAreaCode(40'195);
    m.setNumMncDigits(2);
    m.setSelPlmnMcc(262);
    m.setSelPlmnMnc(1);
    return m;
}

template <>
KCellularLteSelReselCellInfo sample() {
    KCellularLteSelReselCellInfo m;
    m.setTimestamp(kNow);
    for (const std::uint32_t band : {3U, 7U, 20U}) m.addMultiBandInfo(band);
    m.setImsEmergencySupport(1);
    m.setQRxLevMin(-124);
    m.setQQualMin(-34);
    m.setQHyst(4);
    m.setSNonIntraSearchP(8);
    m.setSIntraSearchP(62);
    m.setThreshServingLowP(4);
    m.setPriorityOperatingFreq(5);
    for (const std::uint32_t earfcn : {1300U, 3050U, 6300U}) {
        auto n = make<NbrEutra>();
        n->setEarfcn(earfcn);
        n->setQRxlevMin(-124);
        n->setQOffset(0);
        n->setPmax(23);
        n->setDlBw(5);
        n->setThresXHighP(10);
        n->setThresXLowP(6);
        n->setPriority(6);
        n->setFrameType(FDD);
        n->setBand(earfcn / 1000);
        m.addNbrEutra(n);
    }
    return m;
}

template <>
KCellularLteTxPower sample() {
    KCellularLteTxPower m;
    m.setTimestamp(kNow);
    for (std::uint32_t sf = 0; sf < 10; ++sf) {
        auto p = make<TxPowerInfo>();
        p->setPucchTxPower(-3 + static_cast<std::int32_t>(sf));
        p->setPuschTxPower(12 - static_cast<std::int32_t>(sf));
        p->setSubframeIndex(sf);
        m.addTxPowerInfo(p);
    }
    return m;
}

template <>
KCellularLteRsrpRsrqSinr sample() {
    KCellularLteRsrpRsrqSinr m;
    m.setTimestamp(kNow);
    m.setCallId(std::string("call-0007"));
    m.setLastXSeconds(5);
    m.setLastYSamples(10);
    m.setSamplePeriodMs(500);
    m.setDurationMs(5000);
    m.setNumSamples(10);
    auto values = [](std::int32_t offset) {
        auto v = make<RsrpRsrqSinr>();
        v->setPhyCellId(301);
        v->setRsrp0(-95 + offset);
        v->setRsrp1(-97 + offset);
        v->setRsrq0(-11);
        v->setRsrq1(-12);
        v->setSinr0(14 - offset);
        v->setSinr1(12 - offset);
        return v;
    };
    m.setAvgValues(values(0));
    for (std::int32_t i = 0; i < 4; ++i) m.addInstValue(values(i));
    return m;
}

template <>
KCellularLteComponentCarrierInfo sample() {
    KCellularLteComponentCarrierInfo m;
    m.setTimestamp(kNow);
    m.setPccEarfcn(1300);
    m.setScc0Earfcn(6300);
    m.setScc1Earfcn(3050);
    m.setPccBandwidth(5);
    m.setScc0Bandwidth(3);
    m.setScc1Bandwidth(5);
    return m;
}

template <>
KCellularLteCarrierAggregationStatus sample() {
    KCellularLteCarrierAggregationStatus m;
    m.setTimestamp(kNow);
    for (std::uint32_t i = 0; i < 2; ++i) {
        auto c = make<SecondaryComponentCarrier>();
        c->setIndex(i + 1);
        c->setState(SCC_STATE_ACTIVATED);
        c->setPci(100 + i);
        c->setDlEarfcn(6300 - 3250 * i);
        c->setDlRfBand(20 - 13 * i);
        c->setDlBandwidth(3 + 2 * i);
        c->setHasUplink(i == 0);
        c->setRsrp(-101);
        c->setRsrq(-12);
        c->setSnr(9);
        c->setRssi(-70);
        m.addSccList(c);
    }
    return m;
}

template <>
KCellularLteNbrInterRatCellMeas sample() {
    KCellularLteNbrInterRatCellMeas m;
    m.setTimestamp(kNow);
    for (std::uint32_t i = 0; i < 3; ++i) {
        auto u = make<EgwErrcNbrUtraMeas>();
        u->setUarfcn(10'563);
        u->setPsc(100 + i);
        u->setRscp(-90 - static_cast<std::int32_t>(i));
        u->setEcno(20);
        m.addMeasNbrUtra(u);
        auto g = make<EgwErrcNbrGeranMeas>();
        g->setArfcn(512 + i);
        g->setBsic(41);
        g->setRxlev(30);
        m.addMeasNbrGeran(g);
    }
    return m;
}

template <>
KCellularLteNbrEutraCellMeas sample() {
    KCellularLteNbrEutraCellMeas m;
    m.setTimestamp(kNow);
    for (std::uint32_t i = 0; i < 6; ++i) {
        auto n = make<EgwErrcNbrEutraMeas>();
        n->setNbrEarfcn(i < 3 ? 1300 : 6300);
        n->setNbrPhysCellId(200 + i);
        n->setFreqBandInd(i < 3 ? 3 : 20);
        n->setNbrRsrp(-105 - static_cast<std::int32_t>(i));
        n->setNbrRsrq(-14);
        m.addMeasNbrEutra(n);
    }
    return m;
}

template <>
KCellularLteSecondaryCellMeasurements sample() {
    KCellularLteSecondaryCellMeasurements m;
    m.setTimestamp(kNow);
    for (std::uint32_t i = 0; i < 2; ++i) {
        auto s = make<SccRxMeasurement>();
        s->setIndex(i + 1);
        s->setRsrp(-100);
        s->setRsrq(-11);
        s->setSnr(8);
        s->setRssi(-71);
        m.addSccRxMeasurement(s);
    }
    return m;
}

std::shared_ptr<KCellularTrackingAreaId> tai(std::uint32_t tac) {
    auto t = make<KCellularTrackingAreaId>();
    t->setEncodedPlmn(Bytes{0x62, 0xF2, 0x10});
    t->setTac(tac);
    return t;
}

template <>
KCellularMmCommonInfo sample() {
    KCellularMmCommonInfo m;
    m.setTimestamp(kNow);
    m.setImsi(Bytes{0x08, 0x29, 0x26, 0x10, 0x00, 0x00, 0x12, 0x34, 0x56});
    for (const std::uint8_t mnc : {0x10, 0x20}) {
        auto p = make<Plmn>();
        p->setEncodedPlmn(Bytes{0x62, 0xF2, mnc});
        m.addEplmnList(p);
    }
    auto lai = make<KCellularLocationAreaId>();
    lai->setEncodedPlmn(Bytes{0x62, 0xF2, 0x30});
    lai->setLac(0x1A2B);
    m.addRoamingFlaiList(lai);
    m.addRoamingFtaiList(tai(40'001));
    m.addRegProvFtaiList(tai(40'002));
    return m;
}

template <>
KCellularActivatedBearerContexts sample() {
    KCellularActivatedBearerContexts m;
    m.setTimestamp(kNow);
    m.setBearerContextCount(2);
    for (std::uint32_t cid = 1; cid <= 2; ++cid) {
        auto b = make<BearerContext>();
        b->setCid(cid);
        b->setNsapi(4 + cid);
        b->setApn(std::string(cid == 1 ? "ims" : "internet.telekom"));
        b->setPdpType(PDP_TYPE_IPv4v6);
        b->setPdpAddr(Bytes{10, 20, 30, static_cast<std::uint8_t>(cid)});
        b->setPrimaryDnsType(PDP_TYPE_IPv4);
        b->setPrimaryDnsAddr(Bytes{8, 8, 8, 8});
        b->setSecondaryDnsType(PDP_TYPE_IPv4);
        b->setSecondaryDnsAddr(Bytes{8, 8, 4, 4});
        b->setIsAddrIratMobile(true);
        m.addBearerContext(b);
    }
    return m;
}

template <>
KCellularEmmContext sample() {
    KCellularEmmContext m;
    m.setTimestamp(kNow);
    m.setRegStatus(KREG_STATUS_NORMAL_SERVICE);
    m.setUpdateStatus(EPS_STATUS_UPDATED);
    m.setUeOpMode(EPS_UE_OP_MODE_CSPS_MODE_2);
    for (const std::uint32_t tac : {40'195U, 40'196U, 40'197U}) m.addTaiList(tai(tac));
    auto guti = make<Guti>();
    guti->setMmegi(32'769);
    guti->setMmec(12);
    guti->setMTmsi(0xC0FFEE01);
    m.setGuti(guti);
    m.setRejectCause(EMM_CAUSE_NO_CAUSE);
    m.setRegProc(EMM_PROC_TAU);
    m.setT3412DurS(3240);
    m.setIsImsVoiceSupported(true);
    m.setIsEmergBearerSupported(false);
    return m;
}

template <>
KCellularMmContext sample() {
    KCellularMmContext m;
    m.setTimestamp(kNow);
    m.setRegStatus(KREG_STATUS_NORMAL_SERVICE);
    m.setUpdateStatus(STATUS_UPDATED);
    auto lai = make<KCellularLocationAreaId>();
    lai->setEncodedPlmn(Bytes{0x62, 0xF2, 0x10});
    lai->setLac(0x1A2B);
    m.setLai(lai);
    m.setTmsi(0x12345678);
    m.setT3212DurS(3600);
    m.setProcFailureCause(KNAS_MM_PROC_FAILURE_CAUSE_NONE);
    m.setRejectCause(KNAS_MM_REJ_CAUSE_NONE);
    m.setIsCombinedProc(true);
    return m;
}

template <>
KCellularGmmContext sample() {
    KCellularGmmContext m;
    m.setTimestamp(kNow);
    m.setRegStatus(KREG_STATUS_NORMAL_SERVICE);
    m.setUpdateStatus(GPRS_STATUS_UPDATED);
    auto rai = make<RoutingAreaId>();
    rai->setEncodedPlmn(Bytes{0x62, 0xF2, 0x10});
    rai->setLac(0x1A2B);
    rai->setRac(7);
    m.setRai(rai);
    m.setPTmsi(0xD1234567);
    m.setT3312DurS(3240);
    m.setProcFailureCause(KNAS_MM_PROC_FAILURE_CAUSE_NONE);
    m.setRejectCause(KNAS_MM_REJ_CAUSE_NONE);
    m.setRegProc(KNAS_MM_REG_PROC_ROUTING_AREA_UPDATE);
    return m;
}

template <>
KCellularWcdmaRrcConnectionState sample() {
    KCellularWcdmaRrcConnectionState m;
    m.setTimestamp(kNow);
    m.setState(KWCDMA_RRC_CONN_STATE_CELL_DCH);
    m.setEstablishmentCause(KRRC_EST_ORIG_INTERACT_CALL);
    m.setReleaseCause(KRRC_REL_NORMAL_EVENT);
    return m;
}

template <>
KCellularWcdmaRrcConfiguration sample() {
    KCellularWcdmaRrcConfiguration m;
    m.setTimestamp(kNow);
    m.setDrxCycleLengthMs(640);
    m.setIsMimoConfigured(false);
    m.setIsDcConfigured(true);
    return m;
}

template <>
KCellularWcdmaCellInfo sample() {
    KCellularWcdmaCellInfo m;
    m.setTimestamp(kNow);
    m.setMcc(262);
    m.setMnc(1);
    m.setLac(0x1A2B);
    m.setCellId(0x0123ABCD);
    m.setWcdmaBand(SYS_BAND_WCDMA_I_IMT_2000);
    m.setDlUarfcn(10'563);
    m.setPsc(211);
    m.setNumMncDigits(2);
    m.setHspa(SYS_HS_IND_HSDPA_HSUPA_SUPP_CELL);
    return m;
}

template <>
KCellularWcdmaScellMeasurement sample() {
    KCellularWcdmaScellMeasurement m;
    m.setTimestamp(kNow);
    m.setConnectedMode(true);
    for (std::int32_t chain = 0; chain < 2; ++chain) {
        auto rx = make<RxInfo>();
        rx->setRssi(-72 - chain);
        rx->setRsrpRange(40);
        rx->setRsrqRange(28);
        rx->setSnr(11);
        m.addRxInfo(rx);
    }
    return m;
}

template <>
KCellularWcdmaTxPower sample() {
    KCellularWcdmaTxPower m;
    m.setTimestamp(kNow);
    for (std::uint32_t slot = 0; slot < 5; ++slot) {
        auto p = make<TxPowerInfo>();
        p->setPuschTxPower(5 + static_cast<std::int32_t>(slot));
        p->setSubframeIndex(slot);
        m.addTxPowerInfo(p);
    }
    return m;
}

template <>
KCellularWcdmaSelReselCellInfo sample() {
    KCellularWcdmaSelReselCellInfo m;
    m.setTimestamp(kNow);
    m.setHsdpaCapable(1);
    m.setEdchCapable(1);
    m.setDuplexMode(FDD);
    for (const std::uint32_t band : {1U, 8U}) m.addMultiBandInfo(band);
    m.setImsEmergencySupport(0);
    m.setCellBarred(0);
    m.setFachMeasOccInfoPresent(1);
    m.setSRxlev(-58);
    m.setSQual(-18);
    m.setSIntrasearch(10);
    m.setSIntersearch(8);
    m.setSSearchRat(4);
    m.setSCellPrio(3);
    for (const std::uint32_t earfcn : {1300U, 6300U}) {
        auto e = make<EutraFreqInfo>();
        e->setEarfcn(earfcn);
        e->setPrio(6);
        m.addEutraPrioInfo(e);
    }
    auto u = make<UtraFreqInfo>();
    u->setUarfcn(10'563);
    u->setPrio(3);
    m.addUtraPrioInfo(u);
    auto g = make<GsmFreqInfo>();
    g->setArfcn(512);
    g->setPrio(1);
    m.addGsmPrioInfo(g);
    return m;
}

template <>
KCellularWcdmaNbrCellMeas sample() {
    KCellularWcdmaNbrCellMeas m;
    m.setTimestamp(kNow);
    for (std::uint32_t i = 0; i < 4; ++i) {
        auto u = make<UtraCellMeasResult>();
        u->setUarfcn(10'563);
        u->setBand(1);
        u->setPsc(100 + i);
        u->setEcno(18);
        u->setRscp(-95 - static_cast<std::int32_t>(i));
        m.addMeasUtraResult(u);
    }
    auto g = make<GsmCellMeasResult>();
    g->setArfcn(512);
    g->setBsic(41);
    g->setRxlev(30);
    m.addMeasGsmResult(g);
    auto l = make<LteCellMeasResult>();
    l->setEarfcn(6300);
    l->setPhyCellId(301);
    l->setEutraBand(20);
    l->setRsrp(-100);
    l->setRsrq(-12);
    m.addMeasLteResult(l);
    return m;
}

template <>
KCellularGsmScellInfo sample() {
    KCellularGsmScellInfo m;
    m.setTimestamp(kNow);
    m.setMcc(262);
    m.setMnc(1);
    m.setLac(0x1A2B);
    m.setCellId(0x4D21);
    m.setGsmBand(SYS_BAND_GSM_EGSM_900);
    m.setArfcn(62);
    m.setBsic(41);
    m.setState(NON_DEDICATED_STATE);
    m.setNumMncDigits(2);
    return m;
}

template <>
KCellularGsmIdleConfig sample() {
    KCellularGsmIdleConfig m;
    m.setTimestamp(kNow);
    m.setArfcnBcch(62);
    m.setMcc(262);
    m.setMnc(1);
    m.setLac(0x1A2B);
    m.setCi(0x4D21);
    m.setBsic(41);
    m.setDtxFromBs(1);
    m.setRadioLinkTimeout(32);
    m.setGsmBand(44);
    m.setAccessTech(0);
    m.setMsTxpwr(5);
    m.setRxAccMin(6);
    m.setC2Valid(1);
    m.setTmpOffset(0);
    m.setPenaltyT(0);
    m.setT3212(10);
    m.setAcc(0x3FF);
    m.setBsPaMfrms(2);
    m.setMaxRetransCs(4);
    m.setEmergCallAllowed(1);
    m.setAttachAllowed(1);
    m.setHalfRateSupported(1);
    m.setCbchSupported(0);
    m.setReestAllowed(1);
    return m;
}

template <>
KCellularGsmIdleScellMeasurement sample() {
    KCellularGsmIdleScellMeasurement m;
    m.setTimestamp(kNow);
    m.setScellArfcn(62);
    m.setSimplifiedL1State(2);
    m.setCurrentAntenna(0);
    m.setIdleRxlevDBm(-71);
    return m;
}

template <>
KCellularGsmCsRfMeasurement sample() {
    KCellularGsmCsRfMeasurement m;
    m.setTimestamp(kNow);
    m.setScellArfcn(62);
    m.setSimplifiedL1State(3);
    m.setCurrentAntenna(0);
    for (const std::int32_t p : {5, 7, 9, 11}) m.addCsTxPwr(p);
    m.setCsRxlevSub(38);
    m.setCsRxqualSub(1);
    m.setScellBand(44);
    return m;
}

template <>
KCellularGsmGrrEventMeasCr sample() {
    KCellularGsmGrrEventMeasCr m;
    m.setTimestamp(kNow);
    for (std::uint32_t i = 0; i < 6; ++i) {
        auto g = make<GsmNcellMeas>();
        g->setMcc(262);
        g->setMnc(1);
        g->setLac(0x1A2B);
        g->setCi(0x4D00 + i);
        g->setBsic(40 + i);
        g->setArfcn(60 + i);
        g->setRxlev(25 + i);
        m.addGsmNcellMeas(g);
    }
    auto u = make<UmtsNcellMeas>();
    u->setCellType(0);
    u->setCpichSc(211);
    u->setDlUarfcn(10'563);
    u->setCpichRscp(30);
    u->setCpichEcn0(40);
    m.addUmtsNcellMeas(u);
    auto l = make<LteNcellMeas>();
    l->setPhysicalCellId(301);
    l->setBandwidth(5);
    l->setRsrp(40);
    l->setEarfcn(6300);
    l->setRsrq(20);
    m.addLteNcellMeas(l);
    return m;
}

template <>
KCellularGsmGprsConfig sample() {
    KCellularGsmGprsConfig m;
    m.setTimestamp(kNow);
    m.setGprsSup(true);
    m.setRac(7);
    m.setSpPgCy(false);
    m.setNco(0);
    m.setNom(2);
    m.setCrHyst(4);
    m.setAccThr(6);
    m.setExtUplTbfSupported(true);
    m.setPriorityClass(0);
    m.setCellBarAccess2(0);
    return m;
}

template <>
KCellularSimCardFiles sample() {
    KCellularSimCardFiles m;
    m.setTimestamp(kNow);
    const std::pair<std::uint32_t, Bytes> files[] = {
        {0x2FE2, Bytes{0x98, 0x94, 0x20, 0x10, 0x32, 0x54, 0x76, 0x98, 0x10, 0x32}},
        {0x6F07, Bytes{0x08, 0x29, 0x26, 0x10, 0x00, 0x00, 0x12, 0x34, 0x56}},
        {0x6FAD, Bytes{0x00, 0x00, 0x00, 0x02}},
        {0x6F46, Bytes(17, 0xFF)},
    };
    for (const auto& [id, content] : files) {
        auto ef = make<ElementaryFile>();
        ef->setEfId(id);
        ef->setContent(content);
        m.addEfList(ef);
    }
    return m;
}

template <class T>
void BM_Decode(benchmark::State& state) {
    const Bytes payload = sample<T>().data();
    for (auto _ : state) {
        auto message = T::initWithData(payload);
        benchmark::DoNotOptimize(message);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(payload.size()));
}

template <class T>
void BM_DecodeToDictionary(benchmark::State& state) {
    const Bytes payload = sample<T>().data();
    for (auto _ : state) {
        Dict dict = T::initWithData(payload)->dictionaryRepresentation();
        benchmark::DoNotOptimize(dict);
    }
    state.SetBytesProcessed(static_cast<std::int64_t>(state.iterations()) *
                            static_cast<std::int64_t>(payload.size()));
}

#define PYX_BENCH_KIND(T)             \
    BENCHMARK_TEMPLATE(BM_Decode, T); \
    BENCHMARK_TEMPLATE(BM_DecodeToDictionary, T);

PYX_BENCH_KIND(KCellularLteCdrxConfig)
PYX_BENCH_KIND(KCellularLteRrcState)
PYX_BENCH_KIND(KCellularLteScellInfo)
PYX_BENCH_KIND(KCellularLteSelReselCellInfo)
PYX_BENCH_KIND(KCellularLteTxPower)
PYX_BENCH_KIND(KCellularLteRsrpRsrqSinr)
PYX_BENCH_KIND(KCellularLteComponentCarrierInfo)
PYX_BENCH_KIND(KCellularLteCarrierAggregationStatus)
PYX_BENCH_KIND(KCellularLteNbrInterRatCellMeas)
PYX_BENCH_KIND(KCellularLteNbrEutraCellMeas)
PYX_BENCH_KIND(KCellularLteSecondaryCellMeasurements)
PYX_BENCH_KIND(KCellularMmCommonInfo)
PYX_BENCH_KIND(KCellularActivatedBearerContexts)
PYX_BENCH_KIND(KCellularEmmContext)
PYX_BENCH_KIND(KCellularMmContext)
PYX_BENCH_KIND(KCellularGmmContext)
PYX_BENCH_KIND(KCellularWcdmaRrcConnectionState)
PYX_BENCH_KIND(KCellularWcdmaRrcConfiguration)
PYX_BENCH_KIND(KCellularWcdmaCellInfo)
PYX_BENCH_KIND(KCellularWcdmaScellMeasurement)
PYX_BENCH_KIND(KCellularWcdmaTxPower)
PYX_BENCH_KIND(KCellularWcdmaSelReselCellInfo)
PYX_BENCH_KIND(KCellularWcdmaNbrCellMeas)
PYX_BENCH_KIND(KCellularGsmScellInfo)
PYX_BENCH_KIND(KCellularGsmIdleConfig)
PYX_BENCH_KIND(KCellularGsmIdleScellMeasurement)
PYX_BENCH_KIND(KCellularGsmCsRfMeasurement)
PYX_BENCH_KIND(KCellularGsmGrrEventMeasCr)
PYX_BENCH_KIND(KCellularGsmGprsConfig)
PYX_BENCH_KIND(KCellularSimCardFiles)

}  // namespace
}  // namespace pyx
