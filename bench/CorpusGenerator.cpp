// Writes the benchmark corpus: JSON Lines records {"kKeyMetricID": N, "kKeyPayload": "hex",
// "label": "..."} as pyxonctl reads them.
//
// Realistic records come from the simulated drive (fixed seed and start time), a few reports
// of every decodable metric kind taken some seconds apart. Large records are built on top:
// forty neighbours per list, and packed lists of a thousand values. The output depends only on
// the seed, so running the generator again rewrites the same file.
//
// Usage: pyxon_bench_corpus <output.jsonl>
#include <cstdint>
#include <cstdio>
#include <fstream>
#include <iostream>
#include <memory>
#include <string>
#include <vector>

#include "core/Value.h"
#include "messages/Messages.h"
#include "metrics/MetricCatalogue.h"
#include "sources/sim/Drive.h"
#include "sources/sim/Random.h"

namespace {

constexpr std::uint64_t kSeed = 20240601;
constexpr std::uint64_t kStartTimeMs = 1717200000000;  // 2024-06-01 00:00:00 UTC
constexpr int kReportsPerKind = 8;
constexpr std::uint64_t kReportSpacingMs = 3000;
constexpr int kNeighbours = 40;
constexpr int kPackedValues = 1000;

struct Record {
    std::int64_t metricID;
    pyx::Bytes payload;
    std::string label;
};

std::uint32_t u32(pyx::sim::Random& r, std::int64_t low, std::int64_t high) {
    return static_cast<std::uint32_t>(r.between(low, high));
}
std::int32_t s32(pyx::sim::Random& r, std::int64_t low, std::int64_t high) {
    return static_cast<std::int32_t>(r.between(low, high));
}

std::vector<Record> realisticRecords() {
    pyx::sim::Drive drive(kSeed);
    std::vector<Record> records;
    std::uint64_t now = kStartTimeMs;
    for (int report = 0; report < kReportsPerKind; ++report) {
        for (std::uint64_t t = 0; t < kReportSpacingMs; t += 100) drive.advance(100);
        now += kReportSpacingMs;
        for (const pyx::MetricKind& kind : pyx::metricCatalogue()) {
            if (!kind.decodable()) continue;
            auto payload = drive.payload(kind.id, now);
            if (!payload) continue;
            records.push_back({kind.id, std::move(*payload), std::string(kind.messageClass)});
        }
    }
    return records;
}

Record lteIntraRat(pyx::sim::Random& r, std::uint64_t now) {
    pyx::KCellularLteNbrEutraCellMeas m;
    m.setTimestamp(now);
    for (int i = 0; i < kNeighbours; ++i) {
        auto n = std::make_shared<pyx::EgwErrcNbrEutraMeas>();
        n->setNbrEarfcn(u32(r, 0, 65535));
        n->setNbrPhysCellId(u32(r, 0, 503));
        n->setFreqBandInd(u32(r, 1, 70));
        n->setNbrRsrp(s32(r, 0, 97));
        n->setNbrRsrq(s32(r, 0, 34));
        m.addMeasNbrEutra(std::move(n));
    }
    return {3986191, m.data(), "large: 40 LTE neighbours"};
}

Record lteInterRat(pyx::sim::Random& r, std::uint64_t now) {
    pyx::KCellularLteNbrInterRatCellMeas m;
    m.setTimestamp(now);
    for (int i = 0; i < kNeighbours; ++i) {
        auto u = std::make_shared<pyx::EgwErrcNbrUtraMeas>();
        u->setUarfcn(u32(r, 10562, 10838));
        u->setPsc(u32(r, 0, 511));
        u->setRscp(s32(r, 0, 91));
        u->setEcno(u32(r, 0, 49));
        m.addMeasNbrUtra(std::move(u));
        auto g = std::make_shared<pyx::EgwErrcNbrGeranMeas>();
        g->setArfcn(u32(r, 0, 1023));
        g->setBsic(u32(r, 0, 63));
        g->setRxlev(u32(r, 0, 63));
        m.addMeasNbrGeran(std::move(g));
    }
    return {3986192, m.data(), "large: 40 UMTS and 40 GSM neighbours"};
}

Record umtsNeighbours(pyx::sim::Random& r, std::uint64_t now) {
    pyx::KCellularWcdmaNbrCellMeas m;
    m.setTimestamp(now);
    for (int i = 0; i < kNeighbours; ++i) {
        auto u = std::make_shared<pyx::UtraCellMeasResult>();
        u->setUarfcn(u32(r, 10562, 10838));
        u->setBand(u32(r, 1, 8));
        u->setPsc(u32(r, 0, 511));
        u->setEcno(u32(r, 0, 49));
        u->setRscp(s32(r, 0, 91));
        m.addMeasUtraResult(std::move(u));
        auto g = std::make_shared<pyx::GsmCellMeasResult>();
        g->setArfcn(u32(r, 0, 1023));
        g->setBsic(u32(r, 0, 63));
        g->setRxlev(u32(r, 0, 63));
        m.addMeasGsmResult(std::move(g));
        auto l = std::make_shared<pyx::LteCellMeasResult>();
        l->setEarfcn(u32(r, 0, 65535));
        l->setPhyCellId(u32(r, 0, 503));
        l->setEutraBand(u32(r, 1, 70));
        l->setRsrp(s32(r, 0, 97));
        l->setRsrq(s32(r, 0, 34));
        m.addMeasLteResult(std::move(l));
    }
    return {3985669, m.data(), "large: 40 neighbours of each technology (UMTS)"};
}

Record gsmNeighbours(pyx::sim::Random& r, std::uint64_t now) {
    pyx::KCellularGsmGrrEventMeasCr m;
    m.setTimestamp(now);
    for (int i = 0; i < kNeighbours; ++i) {
        auto g = std::make_shared<pyx::GsmNcellMeas>();
        g->setMcc(262);
        g->setMnc(u32(r, 1, 3));
        g->setLac(u32(r, 1, 65535));
        g->setCi(u32(r, 1, 65535));
        g->setBsic(u32(r, 0, 63));
        g->setArfcn(u32(r, 0, 1023));
        g->setRxlev(u32(r, 0, 63));
        m.addGsmNcellMeas(std::move(g));
        auto u = std::make_shared<pyx::UmtsNcellMeas>();
        u->setCellType(u32(r, 0, 2));
        u->setCpichSc(u32(r, 0, 511));
        u->setDlUarfcn(u32(r, 10562, 10838));
        u->setCpichRscp(u32(r, 0, 91));
        u->setCpichEcn0(u32(r, 0, 49));
        m.addUmtsNcellMeas(std::move(u));
        auto l = std::make_shared<pyx::LteNcellMeas>();
        l->setPhysicalCellId(u32(r, 0, 503));
        l->setBandwidth(u32(r, 0, 5));
        l->setRsrp(u32(r, 0, 97));
        l->setEarfcn(u32(r, 0, 65535));
        l->setRsrq(u32(r, 0, 34));
        m.addLteNcellMeas(std::move(l));
    }
    return {3985417, m.data(), "large: 40 neighbours of each technology (GSM)"};
}

Record lteSelResel(pyx::sim::Random& r, std::uint64_t now) {
    pyx::KCellularLteSelReselCellInfo m;
    m.setTimestamp(now);
    for (int i = 0; i < kPackedValues; ++i) m.addMultiBandInfo(u32(r, 1, 255));
    m.setImsEmergencySupport(1);
    m.setQRxLevMin(-124);
    m.setQQualMin(-34);
    m.setQHyst(4);
    m.setSIntraSearchP(62);
    m.setThreshServingLowP(6);
    m.setPriorityOperatingFreq(5);
    for (int i = 0; i < kNeighbours; ++i) {
        auto n = std::make_shared<pyx::NbrEutra>();
        n->setEarfcn(u32(r, 0, 65535));
        n->setQRxlevMin(s32(r, -140, -44));
        n->setQQualMin(s32(r, -34, -3));
        n->setQOffset(s32(r, -24, 24));
        n->setPmax(s32(r, -30, 33));
        n->setDlBw(u32(r, 0, 5));
        n->setThresXHighP(u32(r, 0, 62));
        n->setThresXLowP(u32(r, 0, 62));
        n->setPriority(u32(r, 0, 7));
        n->setFrameType(static_cast<std::int32_t>(r.between(0, 1)));
        n->setBand(u32(r, 1, 70));
        m.addNbrEutra(std::move(n));
    }
    return {3986190, m.data(), "large: 1000 bands, 40 LTE neighbour frequencies"};
}

Record umtsSelResel(pyx::sim::Random& r, std::uint64_t now) {
    pyx::KCellularWcdmaSelReselCellInfo m;
    m.setTimestamp(now);
    m.setHsdpaCapable(1);
    m.setEdchCapable(1);
    m.setDuplexMode(0);
    for (int i = 0; i < kPackedValues; ++i) m.addMultiBandInfo(u32(r, 1, 22));
    m.setSRxlev(s32(r, -20, 40));
    m.setSQual(s32(r, -10, 20));
    m.setSCellPrio(3);
    for (int i = 0; i < kNeighbours; ++i) {
        auto e = std::make_shared<pyx::EutraFreqInfo>();
        e->setEarfcn(u32(r, 0, 65535));
        e->setPrio(u32(r, 0, 7));
        m.addEutraPrioInfo(std::move(e));
        auto u = std::make_shared<pyx::UtraFreqInfo>();
        u->setUarfcn(u32(r, 10562, 10838));
        u->setPrio(u32(r, 0, 7));
        m.addUtraPrioInfo(std::move(u));
        auto g = std::make_shared<pyx::GsmFreqInfo>();
        g->setArfcn(u32(r, 0, 1023));
        g->setPrio(u32(r, 0, 7));
        m.addGsmPrioInfo(std::move(g));
    }
    return {3985668, m.data(), "large: 1000 bands, 40 priorities of each technology"};
}

Record gsmCsRf(pyx::sim::Random& r, std::uint64_t now) {
    pyx::KCellularGsmCsRfMeasurement m;
    m.setTimestamp(now);
    m.setScellArfcn(62);
    m.setSimplifiedL1State(2);
    m.setCurrentAntenna(0);
    for (int i = 0; i < kPackedValues; ++i) m.addCsTxPwr(s32(r, -50, 33));
    m.setCsRxlevSub(40);
    m.setCsRxqualSub(1);
    m.setScellBand(1);
    return {3985411, m.data(), "large: 1000 transmit powers"};
}

std::vector<Record> largeRecords() {
    pyx::sim::Random r(kSeed + 1);
    const std::uint64_t now = kStartTimeMs + (kReportsPerKind + 1) * kReportSpacingMs;
    return {lteIntraRat(r, now),   lteInterRat(r, now), umtsNeighbours(r, now),
            gsmNeighbours(r, now), lteSelResel(r, now), umtsSelResel(r, now),
            gsmCsRf(r, now)};
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::cerr << "usage: pyxon_bench_corpus <output.jsonl>\n";
        return 2;
    }
    std::ofstream out(argv[1], std::ios::trunc);
    if (!out) {
        std::cerr << "pyxon_bench_corpus: cannot write " << argv[1] << "\n";
        return 1;
    }
    std::vector<Record> records = realisticRecords();
    for (Record& large : largeRecords()) records.push_back(std::move(large));
    for (const Record& record : records) {
        out << "{\"kKeyMetricID\": " << record.metricID << ", \"kKeyPayload\": \""
            << pyx::hexString(record.payload) << "\", \"label\": \"" << record.label << "\"}\n";
    }
    out.flush();
    if (!out) {
        std::cerr << "pyxon_bench_corpus: writing " << argv[1] << " failed\n";
        return 1;
    }
    std::cout << records.size() << " records written to " << argv[1] << "\n";
    return 0;
}
