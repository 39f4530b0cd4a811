#include "ui/ChartScreens.h"

#include <array>

namespace pyx {
namespace {

struct ChartScreen {
    std::string_view categoryKey;
    Chart chart;
};

// Keys as the menu joins them (group, a blank, category).
constexpr std::array kChartScreens = {
    ChartScreen{"LTE Serving Cell Meas", Chart::LteServing},
    ChartScreen{"LTE Tx Power", Chart::LteServing},
    ChartScreen{"LTE CA Status", Chart::LteCarriers},
    ChartScreen{"LTE Secondary Cell Meas", Chart::LteCarriers},
    ChartScreen{"LTE LTE Neighbor Cell Meas", Chart::LteNeighbours},
    ChartScreen{"UMTS Serving Cell Meas", Chart::UmtsServing},
    ChartScreen{"UMTS Tx Power", Chart::UmtsServing},
    ChartScreen{"UMTS UMTS Neighbor Cell Meas", Chart::UmtsNeighbours},
    ChartScreen{"GSM Idle Serv Cell Meas", Chart::GsmServing},
    ChartScreen{"GSM Connected Serv Cell Meas", Chart::GsmServing},
    ChartScreen{"GSM GSM Neighbor Cell Meas", Chart::GsmNeighbours},
};

}  // namespace

std::optional<Chart> chartForCategory(std::string_view categoryKey) {
    for (const ChartScreen& screen : kChartScreens)
        if (screen.categoryKey == categoryKey) return screen.chart;
    return std::nullopt;
}

}  // namespace pyx
