#include "tools/DecodeCommand.h"

#include <cstdio>
#include <iostream>
#include <nlohmann/json.hpp>

#include "core/Log.h"
#include "core/ValueJson.h"
#include "metrics/MetricCatalogue.h"
#include "tools/MetricIDText.h"
#include "tools/RecordReader.h"

namespace pyx {

namespace {

using Json = nlohmann::ordered_json;

Json metricText(const std::optional<std::int64_t>& metricID) {
    return metricID ? Json(metricIDText(*metricID)) : Json(nullptr);
}

std::string dumped(const Json& json) {
    // Texts from the baseband are not promised to be UTF-8; invalid bytes become U+FFFD.
    return json.dump(-1, ' ', false, Json::error_handler_t::replace);
}

std::string errorLine(const std::optional<std::int64_t>& metricID, const std::string& reason) {
    Json out = Json::object();
    out["metric"] = metricText(metricID);
    out["error"] = reason;
    return dumped(out);
}

}  // namespace

DecodeOutcome decodeRecord(MetricValidator& validator, const MetricRecord& record) {
    DecodeOutcome outcome;
    try {
        // The application's path: the delegate call, "Received Valid Metric" included.
        validator.metricsDidUpdate(record);
    } catch (const MetricRejected& rejection) {
        outcome.metricID = rejection.metricID();
        outcome.error = rejection.reason();
        return outcome;
    }
    // A record that was not refused is stored exactly when its kind is decoded.
    outcome.metricID = validator.metricID();
    const MetricKind* kind = outcome.metricID ? findMetricKind(*outcome.metricID) : nullptr;
    if (kind == nullptr || !kind->decodable()) {
        outcome.ignored = true;
        return outcome;
    }
    const auto property = *kind->property;
    outcome.property = std::string(MetricValidator::nameOf(property));
    const auto& dict = validator.dictionary(property);
    if (dict) outcome.dictionary = &*dict;
    return outcome;
}

std::string decodeLine(MetricValidator& validator, std::string_view line) {
    MetricRecord record;
    try {
        record = readRecord(line);
    } catch (const RecordError& error) {
        return errorLine(error.metricID(), error.reason());
    }
    const DecodeOutcome outcome = decodeRecord(validator, record);
    if (outcome.error) return errorLine(outcome.metricID, *outcome.error);
    Json out = Json::object();
    out["metric"] = metricText(outcome.metricID);
    if (outcome.ignored) {
        out["ignored"] = true;
        return dumped(out);
    }
    out["property"] = outcome.property;
    out["dict"] = outcome.dictionary ? toJson(Value(*outcome.dictionary)) : Json(nullptr);
    return dumped(out);
}

int runDecode(std::istream& in, std::ostream& out) {
    const auto validator = MetricValidator::create(nullptr);
    std::string line;
    while (std::getline(in, line)) {
        if (!line.empty() && line.back() == '\r') line.pop_back();
        out << decodeLine(*validator, line) << '\n';
    }
    out.flush();
    return 0;
}

Subcommand addDecodeCommand(CLI::App& pyxonctl) {
    CLI::App* decode = pyxonctl.add_subcommand(
        "decode",
        "Decode metric records (JSON Lines on stdin) through the metric store, one JSON line "
        "out per line in");
    decode->footer(
        "Each input line is one record: the metric ID and the payload as hex digits, e.g.\n"
        "  echo '{\"kKeyMetricID\": 3986178, \"kKeyPayload\": \"08fbb0def7d32b12040814101e\"}' "
        "| pyxonctl decode\n"
        "prints\n"
        "  {\"metric\":\"0x3CD302\",\"property\":\"myLTETxPowerDict\",\"dict\":{\"timestamp\":"
        "\"2017-07-14 02:40:00 GMT\",\"tx_power_info\":[{\"pucch_tx_power\":10,"
        "\"pusch_tx_power\":15}]}}\n"
        "A metric the store does not care for gives {\"metric\":\"0x3CD301\",\"ignored\":true};\n"
        "a refused record or a line that is not a record gives\n"
        "{\"metric\":\"0x3CD302\" or null,\"error\":\"what was wrong\"}; a payload that does not\n"
        "decode says why and at which byte, e.g. for the payload \"08ff\"\n"
        "  {\"metric\":\"0x3CD302\",\"error\":\"does not decode as "
        "KCellularLteTxPower: truncated varint at byte 1\"}\n"
        "With -v the store's own log lines go to stderr. The exit code is 0 once all input is "
        "read.\n");
    return Subcommand{decode, [] {
                          standardOutputSink().redirect(stderr);
                          return runDecode(std::cin, std::cout);
                      }};
}

}  // namespace pyx
