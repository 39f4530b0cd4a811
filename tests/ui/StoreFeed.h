// Fills a store the way the baseband does: metric records with payloads written by the message
// classes, fed through the intake.
#pragma once

#include <cstdint>
#include <memory>

#include "baseband/MetricRecord.h"
#include "metrics/MetricValidator.h"

namespace pyx::test {

// 2017-07-14 02:40:00.123 UTC.
constexpr std::uint64_t kTimestamp = 1500000000123ULL;

MetricRecord record(std::int64_t metricID, const Bytes& payload);

// A store of its own, without a baseband client.
std::shared_ptr<MetricValidator> emptyStore();

// Each feeds one record of its kind (and fails the test if the store does not take it).
// count: how many entries the kind's list gets.
void feedLteSelResel(MetricValidator& store, int neighbours);
void feedLteRsrpRsrqSinr(MetricValidator& store, int samples);
void feedUmtsScellMeas(MetricValidator& store, int rxInfos);
void feedActiveBearers(MetricValidator& store, int bearers);
// timestamp, on_duration_ms 10, long_drx_cycle_ms 320.
void feedLteCdrx(MetricValidator& store);

// One record of every kind the store decodes; every list gets count entries.
void feedEveryKind(MetricValidator& store, int count);

}  // namespace pyx::test
