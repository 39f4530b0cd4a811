// The ModemManager source's mapping on arbitrary ModemManager dictionaries: whatever the keys,
// D-Bus types and values, reading them through the field table and writing every kind must
// neither crash nor write a payload that its own message class then refuses. Anything else
// (a crash, a sanitizer report, a refused payload) is a finding.
//
// Input: a stream of choices (FuzzedDataProvider). Each dictionary of the facts gets a few
// entries; a key is one the table reads (or sometimes any text), a value is of a kind picked
// from the input: a float (any, NaN and infinities included), an unsigned or signed integer,
// a bool, text (sometimes a hexadecimal or digit string, sometimes a location text), bytes or
// a nested dictionary.
#include <fuzzer/FuzzedDataProvider.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <variant>
#include <vector>

#include "metrics/MetricCatalogue.h"
#include "sources/modem/ModemPayloads.h"
#include "sources/sim/BasebandCommands.h"

namespace {

using pyx::Dict;
using pyx::Value;
namespace modem = pyx::modem;

std::string anyKey(FuzzedDataProvider& in) {
    const auto rows = modem::modemFieldTable();
    if (in.ConsumeIntegralInRange<int>(0, 9) == 0) return in.ConsumeRandomLengthString(16);
    static const char* const kExtra[] = {"cell-type", "serving", "Properties", "Ip4Config",
                                         "Ip6Config"};
    const auto pick = in.ConsumeIntegralInRange<std::size_t>(0, rows.size() + 4);
    return pick < rows.size() ? std::string(rows[pick].key) : kExtra[pick - rows.size()];
}

Value anyValue(FuzzedDataProvider& in, int depth);

Dict anyDict(FuzzedDataProvider& in, int depth) {
    Dict dict;
    const int entries = in.ConsumeIntegralInRange<int>(0, 8);
    for (int i = 0; i < entries && in.remaining_bytes() > 0; ++i)
        dict.set(anyKey(in), anyValue(in, depth + 1));
    return dict;
}

Value anyValue(FuzzedDataProvider& in, int depth) {
    switch (in.ConsumeIntegralInRange<int>(0, 9)) {
        case 0:
            return Value(in.ConsumeFloatingPoint<float>());
        case 1:
            return Value(static_cast<float>(in.ConsumeIntegralInRange<int>(-300, 300)) / 2.0F);
        case 2:
            return Value(in.ConsumeIntegral<std::uint32_t>());
        case 3:
            return Value(in.ConsumeIntegral<std::uint64_t>());
        case 4:
            return Value(in.ConsumeIntegral<std::int64_t>());
        case 5:
            return Value(in.ConsumeBool());
        case 6: {
            // Text made of the characters the table's parsers care for.
            static constexpr char kAlphabet[] = "0123456789ABCDEFabcdefXYZ,.:- ";
            std::string text;
            const auto length = in.ConsumeIntegralInRange<std::size_t>(0, 40);
            for (std::size_t i = 0; i < length; ++i)
                text += kAlphabet[in.ConsumeIntegralInRange<std::size_t>(0, sizeof kAlphabet - 2)];
            return Value(std::move(text));
        }
        case 7:
            return Value(in.ConsumeRandomLengthString(64));
        case 8: {
            const auto bytes = in.ConsumeBytes<std::uint8_t>(in.ConsumeIntegralInRange<int>(0, 16));
            return Value(pyx::Bytes(bytes.begin(), bytes.end()));
        }
        default:
            return depth < 3 ? Value(anyDict(in, depth)) : Value();
    }
}

modem::ModemFacts anyFacts(FuzzedDataProvider& in) {
    modem::ModemFacts facts;
    facts.modem = anyDict(in, 0);
    facts.modem3gpp = anyDict(in, 0);
    facts.signalLte = anyDict(in, 0);
    facts.signalUmts = anyDict(in, 0);
    facts.signalGsm = anyDict(in, 0);
    if (in.ConsumeBool()) {
        facts.cells.emplace();
        const int cells = in.ConsumeIntegralInRange<int>(0, 6);
        for (int i = 0; i < cells; ++i) {
            Dict cell = anyDict(in, 0);
            // Mostly cells of the three technologies, serving or not.
            if (in.ConsumeBool())
                cell.set("cell-type",
                         Value(std::uint32_t{2} + in.ConsumeIntegralInRange<std::uint32_t>(0, 3)));
            if (in.ConsumeBool()) cell.set("serving", Value(in.ConsumeBool()));
            facts.cells->push_back(std::move(cell));
        }
    }
    facts.location = anyDict(in, 0);
    facts.sim = anyDict(in, 0);
    const int bearers = in.ConsumeIntegralInRange<int>(0, 3);
    for (int i = 0; i < bearers; ++i) {
        Dict bearer = anyDict(in, 0);
        if (in.ConsumeBool()) bearer.set("Connected", Value(true));
        facts.bearers.push_back(std::move(bearer));
    }
    return facts;
}

void expectDecodes(std::int64_t metricID, const pyx::Bytes& payload) {
    const pyx::MetricKind* kind = pyx::findMetricKind(metricID);
    if (kind == nullptr || !kind->decodable() ||
        !std::holds_alternative<pyx::Dict>(kind->decode(payload))) {
        std::fprintf(stderr, "metric 0x%llX: its payload does not decode\n",
                     static_cast<unsigned long long>(metricID));
        std::abort();
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    FuzzedDataProvider in(data, size);
    const modem::ModemFacts facts = anyFacts(in);
    modem::FieldIssues issues;
    const modem::ModemReading reading = modem::readModem(facts, issues);
    for (const modem::ModemKind& kind : modem::modemKinds())
        if (const auto payload = kind.write(reading, 1500000000123ULL, issues))
            expectDecodes(kind.metricID, *payload);
    expectDecodes(pyx::sim::kSimFilesMetricID, modem::simFilesPayload(reading, 1500000000123ULL));
    return 0;
}
