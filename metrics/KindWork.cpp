#include "metrics/KindWork.h"

#include <initializer_list>
#include <limits>
#include <stdexcept>

namespace pyx {

void StoreUpdate::put(EntryList* target, EntryList entries) {
    for (std::size_t i = 0; i < used_; ++i) {
        if (slots_[i].target == target) {
            slots_[i].entries = std::move(entries);
            return;
        }
    }
    if (used_ == kMaxLists)
        throw std::logic_error("StoreUpdate: more lists staged than a kind feeds");
    slots_[used_].target = target;
    slots_[used_].entries = std::move(entries);
    ++used_;
}

EntryList entriesOf(const Dict& stored, std::string_view list) {
    EntryList entries;
    const Value* value = stored.find(list);
    if (value == nullptr || !value->isArray()) return entries;
    entries.reserve(value->asArray().size());
    for (const Value& entry : value->asArray()) {
        if (entry.isDict()) entries.push_back(entry.asDict());
    }
    return entries;
}

namespace {

// A one-element list: the stored dictionary without the keys that have lists of their own.
EntryList withoutKeys(const Dict& stored, std::initializer_list<std::string_view> dropped) {
    Dict rest;
    rest.reserve(stored.size());
    for (const auto& [key, value] : stored) {
        bool keep = true;
        for (const auto d : dropped) keep = keep && key != d;
        if (keep) rest.append(key, value);
    }
    EntryList one;
    one.push_back(std::move(rest));
    return one;
}

// A bandwidth that holds a 32-bit integer is replaced by half of it, truncating toward zero.
void halve(Dict& stored, std::string_view key) {
    Value* value = stored.find(key);
    if (value == nullptr || !value->isInteger()) return;
    const auto v = value->toInt64();
    if (!v || *v < std::numeric_limits<std::int32_t>::min() ||
        *v > std::numeric_limits<std::uint32_t>::max())
        return;
    *value = Value(*v / 2);
}

}  // namespace

namespace kindwork {

void lteTxPower(Dict& stored, StoreUpdate& update) {
    update.stage(&LTEListHolder::TxPower, entriesOf(stored, "tx_power_info"));
}

void lteCarrierAggregationStatus(Dict& stored, StoreUpdate& update) {
    convertList(stored, listconversions::lteCaStatusSccList);
    replaceBandwidthCodes(stored, "scc_list", "dl_bandwidth", update.dlbwlookup());
    update.stage(&LTEListHolder::CAStatusList, entriesOf(stored, "scc_list"));
}

void lteSecondaryCellMeasurements(Dict& stored, StoreUpdate& update) {
    convertList(stored, listconversions::lteSecondaryCellSccRxMeasurement);
    update.stage(&LTEListHolder::SecondaryCellMeasList, entriesOf(stored, "scc_rx_measurement"));
}

void lteNbrInterRatCellMeas(Dict& stored, StoreUpdate& update) {
    convertList(stored, listconversions::lteInterRatMeasNbrUtra);
    convertList(stored, listconversions::lteInterRatMeasNbrGeran);
    update.stage(&LTEListHolder::UtraNbrsMeas, entriesOf(stored, "meas_nbr_utra"));
    update.stage(&LTEListHolder::GeraNbrsMeas, entriesOf(stored, "meas_nbr_geran"));
}

void lteNbrEutraCellMeas(Dict& stored, StoreUpdate& update) {
    convertList(stored, listconversions::lteNbrEutraMeasNbrEutra);
    update.stage(&LTEListHolder::EutraNbrsMeas, entriesOf(stored, "meas_nbr_eutra"));
}

void lteSelReselCellInfo(Dict& stored, StoreUpdate& update) {
    replaceBandwidthCodes(stored, "nbr_eutra", "dl_bw", update.dlbwlookup());
    update.stage(&LTEListHolder::SelReselCellInfo, withoutKeys(stored, {"nbr_eutra"}));
    update.stage(&LTEListHolder::EutraNbrs, entriesOf(stored, "nbr_eutra"));
}

void lteRsrpRsrqSinr(Dict& stored, StoreUpdate& update) {
    convertList(stored, listconversions::lteRsrpRsrqSinrInstValues);
    update.stage(&LTEListHolder::RsrpRsrqSinr, entriesOf(stored, "inst_values"));
}

void lteScellInfo(Dict& stored, StoreUpdate& /*update*/) {
    halve(stored, "dl_bw");
    halve(stored, "ul_bw");
}

void wcdmaScellMeasurement(Dict& stored, StoreUpdate& update) {
    EntryList entries = entriesOf(stored, "rx_info");
    if (const Value* connectedMode = stored.find("connected_mode")) {
        for (Dict& entry : entries) entry.set("connected_mode", *connectedMode);
    }
    update.stage(&UMTSListHolder::rXInfo, std::move(entries));
}

void wcdmaSelReselCellInfo(Dict& stored, StoreUpdate& update) {
    update.stage(&UMTSListHolder::SelReselCellInfo,
                 withoutKeys(stored, {"eutra_prio_info", "utra_prio_info", "gsm_prio_info"}));
    update.stage(&UMTSListHolder::eUtraNbrs, entriesOf(stored, "eutra_prio_info"));
    update.stage(&UMTSListHolder::utraNbrs, entriesOf(stored, "utra_prio_info"));
    update.stage(&UMTSListHolder::geraNbrs, entriesOf(stored, "gsm_prio_info"));
}

void wcdmaNbrCellMeas(Dict& stored, StoreUpdate& update) {
    convertList(stored, listconversions::wcdmaNbrMeasUtraResult);
    convertList(stored, listconversions::wcdmaNbrMeasGsmResult);
    convertList(stored, listconversions::wcdmaNbrMeasLteResult);
    update.stage(&UMTSListHolder::eUtraNbrMeas, entriesOf(stored, "meas_lte_result"));
    update.stage(&UMTSListHolder::utraNbrMeas, entriesOf(stored, "meas_utra_result"));
    update.stage(&UMTSListHolder::geraNbrMeas, entriesOf(stored, "meas_gsm_result"));
}

void wcdmaTxPower(Dict& stored, StoreUpdate& update) {
    update.stage(&UMTSListHolder::TxPower, entriesOf(stored, "tx_power_info"));
}

void gsmGrrEventMeasCr(Dict& stored, StoreUpdate& update) {
    convertList(stored, listconversions::gsmNbrMeasGsmNcell);
    convertList(stored, listconversions::gsmNbrMeasUmtsNcell);
    convertList(stored, listconversions::gsmNbrMeasLteNcell);
    update.stage(&GSMListHolder::eUtraNbrMeas, entriesOf(stored, "lte_ncell_meas"));
    update.stage(&GSMListHolder::utraNbrMeas, entriesOf(stored, "umts_ncell_meas"));
    update.stage(&GSMListHolder::geraNbrMeas, entriesOf(stored, "gsm_ncell_meas"));
}

void activatedBearerContexts(Dict& stored, StoreUpdate& update) {
    update.stage(&CommonListHolder::activeBearer, entriesOf(stored, "bearer_contexts"));
}

void simCardFiles(Dict& stored, StoreUpdate& update) {
    update.stage(&CommonListHolder::simContents, entriesOf(stored, "ef_list"));
}

}  // namespace kindwork

}  // namespace pyx
