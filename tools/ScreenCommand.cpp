#include "tools/ScreenCommand.h"

#include <cstdio>
#include <iostream>
#include <memory>
#include <nlohmann/json.hpp>
#include <optional>

#include "core/Format.h"
#include "core/Log.h"
#include "metrics/MetricValidator.h"
#include "tools/MetricIDText.h"
#include "tools/RecordReader.h"
#include "ui/SecondLevelViewController.h"
#include "ui/ThirdLevelViewController.h"

namespace pyx {
namespace {

using Json = nlohmann::ordered_json;

Json textOrNull(const std::optional<std::string>& text) {
    return text ? Json(*text) : Json(nullptr);
}

// Feeds one line to the intake as the baseband client would; answers why it was refused, if
// it was.
std::optional<std::string> feed(MetricValidator& store, const std::string& line) {
    try {
        store.metricsDidUpdate(readRecord(line));
        return std::nullopt;
    } catch (const RecordError& error) {
        return metricIDText(error.metricID()) + ": " + error.reason();
    } catch (const MetricRejected& rejection) {
        return metricIDText(rejection.metricID()) + ": " + rejection.reason();
    }
}

}  // namespace

std::string screenJson(const TableController& controller, const std::string& key) {
    Json sections = Json::array();
    const int sectionCount = controller.numberOfSections();
    for (int section = 0; section < sectionCount; ++section) {
        Json rows = Json::array();
        const int rowCount = controller.numberOfRowsInSection(section);
        for (int row = 0; row < rowCount; ++row) {
            const Cell cell = controller.cellForRowAtIndexPath(section, row);
            rows.push_back(
                Json{{"text", textOrNull(cell.text)}, {"detail", textOrNull(cell.detail)}});
        }
        sections.push_back(Json{{"title", textOrNull(controller.titleForHeaderInSection(section))},
                                {"rows", std::move(rows)}});
    }
    const Json out{{"key", key}, {"sections", std::move(sections)}};
    // Texts from the baseband are not promised to be UTF-8; invalid bytes become U+FFFD.
    return out.dump(-1, ' ', false, Json::error_handler_t::replace);
}

int runScreen(const ScreenRequest& request, std::istream& in, std::ostream& out,
              std::ostream& err) {
    const auto store = MetricValidator::create(nullptr);
    std::string line;
    int number = 0;
    while (std::getline(in, line)) {
        ++number;
        if (!line.empty() && line.back() == '\r') line.pop_back();
        if (line.find_first_not_of(" \t") == std::string::npos) continue;
        if (const auto refused = feed(*store, line))
            err << "pyxonctl screen: line " << number << " skipped: " << *refused << '\n';
    }

    const std::string key = request.group + " " + request.category;
    if (request.third) {
        ThirdLevelViewController screen;
        screen.setFirstSelection(request.group);
        screen.setSeguedThroughRow(request.category);
        out << screenJson(screen, key) << '\n';
    } else {
        SecondLevelViewController screen(*store);
        screen.setFirstSelection(request.group);
        screen.setSeguedThroughRow(request.category);
        out << screenJson(screen, key) << '\n';
    }
    out.flush();
    return 0;
}

Subcommand addScreenCommand(CLI::App& pyxonctl) {
    CLI::App* screen = pyxonctl.add_subcommand(
        "screen",
        "Feed metric records (JSON Lines on stdin) to the store, then print what the screen of "
        "GROUP and CATEGORY shows, as one JSON object");
    auto request = std::make_shared<ScreenRequest>();
    screen->add_option("GROUP", request->group, "The group, e.g. \"LTE\"")->required();
    screen->add_option("CATEGORY", request->category, "The category, e.g. \"C-DRX\"")->required();
    screen->add_flag("--third", request->third,
                     "Answer the third-level screen reached from that category instead");
    screen->footer(
        "Example:\n"
        "  pyxonctl screen LTE C-DRX < records.jsonl\n"
        "prints\n"
        "  {\"key\":\"LTE C-DRX\",\"sections\":[{\"title\":null,\"rows\":[{\"text\":"
        "\"timestamp\",\"detail\":\"2017-07-14 02:40:00 GMT\"},...]}]}\n"
        "A title or text the screen leaves unset is null. Lines that are not records or that "
        "the store\nrefuses are reported on stderr and skipped; with -v the store's own log lines "
        "go to stderr too.");
    return Subcommand{screen, [request] {
                          standardOutputSink().redirect(stderr);
                          return runScreen(*request, std::cin, std::cout, std::cerr);
                      }};
}

}  // namespace pyx
