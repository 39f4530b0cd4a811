// The charts the history feeds: each gathers the quantities of one subject, and each is
// drawn as one chart page.
#pragma once

#include <array>
#include <string_view>

namespace pyx {

enum class Chart {
    LteServing,
    LteCarriers,
    LteNeighbours,
    UmtsServing,
    UmtsNeighbours,
    GsmServing,
    GsmNeighbours,
};

struct ChartInfo {
    Chart chart;
    std::string_view title;
};

inline constexpr std::array kCharts = {
    ChartInfo{Chart::LteServing, "LTE serving"},
    ChartInfo{Chart::LteCarriers, "LTE carriers"},
    ChartInfo{Chart::LteNeighbours, "LTE neighbours"},
    ChartInfo{Chart::UmtsServing, "UMTS serving"},
    ChartInfo{Chart::UmtsNeighbours, "UMTS neighbours"},
    ChartInfo{Chart::GsmServing, "GSM serving"},
    ChartInfo{Chart::GsmNeighbours, "GSM neighbours"},
};

[[nodiscard]] constexpr std::string_view chartTitle(Chart chart) {
    for (const ChartInfo& info : kCharts)
        if (info.chart == chart) return info.title;
    return {};
}

}  // namespace pyx
