// The intake on arbitrary records: a record is either taken (stored, or reported as not cared
// for) or refused with a MetricRejected, and a refused record leaves the store exactly as it
// was. Anything else escaping the intake is a finding.
//
// Input: the first byte picks the shape of the record, the rest is its payload.
//   0-31  the metric ID of that catalogue entry, the payload as data
//   32    a signed ID from the next 8 bytes (little endian), then the payload
//   33    an unsigned ID from the next 8 bytes (little endian)
//   34    no metric ID at all
//   35    the ID of catalogue entry (next byte % 32) as text
//   36    the ID of catalogue entry (next byte % 32) as a floating-point number
//   37    catalogue entry (next byte % 32), no payload
//   38    catalogue entry (next byte % 32), the payload as text
//   others wrap around.
// Before the record, the store is given a valid record of the same kind (timestamp only), so
// that a refusal has something to leave unchanged.
#include <array>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <optional>
#include <span>
#include <string>

#include "core/Log.h"
#include "metrics/MetricCatalogue.h"
#include "metrics/MetricValidator.h"

namespace {

using pyx::Bytes;
using pyx::Dict;
using pyx::MetricValidator;
using pyx::Value;

struct Store {
    std::array<std::optional<Dict>, MetricValidator::kDictionaryPropertyCount> dictionaries;
    pyx::LTEListHolder lte;
    pyx::UMTSListHolder umts;
    pyx::GSMListHolder gsm;
    pyx::CommonListHolder common;
    friend bool operator==(const Store&, const Store&) = default;
};

Store snapshot(const MetricValidator& v) {
    Store s;
    for (std::size_t i = 0; i < s.dictionaries.size(); ++i) {
        s.dictionaries[i] = v.dictionary(static_cast<MetricValidator::DictionaryProperty>(i));
    }
    s.lte = v.myLTE();
    s.umts = v.myUMTS();
    s.gsm = v.myGSM();
    s.common = v.myCommon();
    return s;
}

[[noreturn]] void broken(const char* promise) {
    std::fprintf(stderr, "intake: %s\n", promise);
    std::abort();
}

std::uint64_t littleEndian(std::span<const std::uint8_t>& rest) {
    std::uint64_t v = 0;
    for (unsigned i = 0; i < 8 && !rest.empty(); ++i) {
        v |= static_cast<std::uint64_t>(rest.front()) << (8 * i);
        rest = rest.subspan(1);
    }
    return v;
}

const pyx::MetricKind& entry(std::span<const std::uint8_t>& rest) {
    const auto catalogue = pyx::metricCatalogue();
    std::size_t index = 0;
    if (!rest.empty()) {
        index = rest.front() % catalogue.size();
        rest = rest.subspan(1);
    }
    return catalogue[index];
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const bool silenced = [] {
        pyx::systemLogSink().intercept([](std::string_view) {});
        pyx::standardOutputSink().intercept([](std::string_view) {});
        return true;
    }();
    static_cast<void>(silenced);
    if (size == 0) return 0;

    const auto catalogue = pyx::metricCatalogue();
    const unsigned shape = data[0] % 39U;
    std::span<const std::uint8_t> rest(data + 1, size - 1);

    Dict record;
    const pyx::MetricKind* kind = nullptr;
    bool payloadAsData = true;
    bool withPayload = true;
    if (shape < catalogue.size()) {
        kind = &catalogue[shape];
        record.append("kKeyMetricID", Value(kind->id));
    } else if (shape == 32) {
        const auto id = static_cast<std::int64_t>(littleEndian(rest));
        kind = pyx::findMetricKind(id);
        record.append("kKeyMetricID", Value(id));
    } else if (shape == 33) {
        // An unsigned integer is an integer ID too, when it fits in 64 signed bits.
        const std::uint64_t id = littleEndian(rest);
        if (id <= static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max())) {
            kind = pyx::findMetricKind(static_cast<std::int64_t>(id));
        }
        record.append("kKeyMetricID", Value(id));
    } else if (shape == 34) {
        // no metric ID
    } else {
        const pyx::MetricKind& k = entry(rest);
        kind = &k;
        if (shape == 35) {
            record.append("kKeyMetricID", Value(std::to_string(k.id)));
        } else if (shape == 36) {
            record.append("kKeyMetricID", Value(static_cast<float>(k.id)));
        } else {
            record.append("kKeyMetricID", Value(k.id));
            withPayload = shape != 37;
            payloadAsData = shape != 38;
        }
    }
    if (withPayload) {
        if (payloadAsData) {
            record.append("kKeyPayload", Value(Bytes(rest.begin(), rest.end())));
        } else {
            record.append("kKeyPayload", Value(std::string(rest.begin(), rest.end())));
        }
    }

    const auto store = MetricValidator::create(nullptr);
    if (kind != nullptr && kind->decodable()) {
        Dict valid;
        valid.append("kKeyMetricID", Value(kind->id));
        valid.append("kKeyPayload", Value(Bytes{0x08, 0x01}));  // timestamp 1 ms
        if (!store->isMetricIDValidWithMetricdict(valid)) broken("a valid record was not taken");
    }

    const Store before = snapshot(*store);
    try {
        const bool taken = store->isMetricIDValidWithMetricdict(record);
        if (!taken && !(snapshot(*store) == before)) {
            broken("a record that was not cared for changed the store");
        }
        if (taken && (kind == nullptr || !kind->decodable())) {
            broken("a record of a kind that is not decoded was taken");
        }
    } catch (const pyx::MetricRejected& rejected) {
        if (!(snapshot(*store) == before)) broken("a refused record changed the store");
        if (rejected.reason().empty()) broken("a refusal without a reason");
    }
    return 0;
}
