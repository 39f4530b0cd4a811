// The list-holder half of one record's changes, built before anything is stored: the kind's
// work stages its new lists here and the intake moves them into the holders only once the
// whole record has been taken, so a rejected record leaves every holder as it was.
#pragma once

#include <array>
#include <cstddef>

#include "metrics/ListConversions.h"
#include "metrics/ListHolders.h"

namespace pyx {

class StoreUpdate {
  public:
    StoreUpdate(LTEListHolder& lte, UMTSListHolder& umts, GSMListHolder& gsm,
                CommonListHolder& common, const BandwidthTable& dlbwlookup)
        : lte_(lte), umts_(umts), gsm_(gsm), common_(common), dlbwlookup_(dlbwlookup) {}
    StoreUpdate(const StoreUpdate&) = delete;
    StoreUpdate& operator=(const StoreUpdate&) = delete;

    [[nodiscard]] const BandwidthTable& dlbwlookup() const { return dlbwlookup_; }

    // Stages the new contents of one holder list (replacing what an earlier stage of the
    // same list staged).
    void stage(EntryList LTEListHolder::*list, EntryList entries) {
        put(&(lte_.*list), std::move(entries));
    }
    void stage(EntryList UMTSListHolder::*list, EntryList entries) {
        put(&(umts_.*list), std::move(entries));
    }
    void stage(EntryList GSMListHolder::*list, EntryList entries) {
        put(&(gsm_.*list), std::move(entries));
    }
    void stage(EntryList CommonListHolder::*list, EntryList entries) {
        put(&(common_.*list), std::move(entries));
    }

    // Moves every staged list into its holder.
    void commit() noexcept {
        for (std::size_t i = 0; i < used_; ++i) *slots_[i].target = std::move(slots_[i].entries);
        used_ = 0;
    }

  private:
    // A kind feeds at most four lists of one holder.
    static constexpr std::size_t kMaxLists = 4;
    struct Slot {
        EntryList* target = nullptr;
        EntryList entries;
    };

    void put(EntryList* target, EntryList entries);

    LTEListHolder& lte_;
    UMTSListHolder& umts_;
    GSMListHolder& gsm_;
    CommonListHolder& common_;
    const BandwidthTable& dlbwlookup_;
    std::array<Slot, kMaxLists> slots_;
    std::size_t used_ = 0;
};

}  // namespace pyx
