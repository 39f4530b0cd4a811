#include "ui/PyxViewItems.h"

#include <cstddef>

namespace pyx {

PyxViewItems makePyxViewItems() {
    return PyxViewItems{
        {"Device Info", "LTE", "UMTS", "GSM"},
        {
            {"Device Info", {"IMSI", "IMEISV", "SIM Files"}},
            {"LTE",
             {"NAS", "RRC State", "Serving Cell Info", "Serving Cell Meas", "Tx Power",
              "Sel Resel Parameters", "EUTRA Neighbor Info", "C-DRX", "LTE Neighbor Cell Meas",
              "UMTS Neighbor Cell Meas", "GSM Neighbor Cell Meas", "CA Status",
              "Secondary Cell Meas", "Active Bearers"}},
            {"UMTS",
             {"NAS GMM", "NAS MM", "RRC State", "RRC Configuration", "Serving Cell Info",
              "Serving Cell Meas", "Tx Power", "Sel Resel Parameters", "EUTRA Neighbor Info",
              "UTRA Neighbor Info", "GSM Neighbor Info", "LTE Neighbor Cell Meas",
              "UMTS Neighbor Cell Meas", "GSM Neighbor Cell Meas", "Active Bearers"}},
            {"GSM",
             {"NAS GMM", "NAS MM", "Serving Cell Info", "Idle Config", "Idle Serv Cell Meas",
              "Connected Serv Cell Meas", "GSM GPRS Config", "LTE Neighbor Cell Meas",
              "UMTS Neighbor Cell Meas", "GSM Neighbor Cell Meas", "Active Bearers"}},
        }};
}

const PyxViewItems& sharedPyxViewItems() {
    static const PyxViewItems items = makePyxViewItems();
    return items;
}

Cell menuCell(const std::vector<std::string>& titles, int row) {
    if (row < 0 || static_cast<std::size_t>(row) >= titles.size()) return Cell{};
    return Cell{titles[static_cast<std::size_t>(row)], std::nullopt};
}

}  // namespace pyx
