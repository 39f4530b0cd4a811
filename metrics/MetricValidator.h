// The metric store: the catalogue of metric IDs, the latest dictionary of each metric kind,
// the list holders, and the intake that the baseband client calls for every event.
//
// All of it lives on the main queue: the client posts there before calling the delegate, and
// the screens read there.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>

#include "baseband/VelkWrapper.h"
#include "baseband/VelkWrapperDelegate.h"
#include "core/MetricKindList.h"
#include "metrics/ListHolders.h"

namespace pyx {

class History;

// A record the intake cannot take: no metric ID, an undecodable payload, no numeric
// timestamp, an overflowing conversion. The store is left exactly as it was.
class MetricRejected : public std::runtime_error {
  public:
    MetricRejected(std::optional<std::int64_t> metricID, std::string reason);
    [[nodiscard]] const std::optional<std::int64_t>& metricID() const { return metricID_; }
    [[nodiscard]] const std::string& reason() const { return reason_; }

  private:
    std::optional<std::int64_t> metricID_;
    std::string reason_;
};

class MetricValidator : public VelkWrapperDelegate,
                        public std::enable_shared_from_this<MetricValidator> {
  public:
    // The shared instance: created once (guarded), with VelkWrapper's shared instance as its
    // client. Creation starts the client's listening and then makes the validator its delegate.
    static std::shared_ptr<MetricValidator> sharedInstance();

    // A validator of its own (tests, tools): client may be null. When it is not, creation
    // listens and then becomes the client's delegate, as the shared instance does.
    static std::shared_ptr<MetricValidator> create(std::shared_ptr<VelkWrapper> client);

    MetricValidator(const MetricValidator&) = delete;
    MetricValidator& operator=(const MetricValidator&) = delete;
    ~MetricValidator() override;

    // The catalogue: one constant per metric kind.
#define PYX_CONSTANT(constant, id, ...) const std::int64_t constant = id;
    PYX_METRIC_KINDS(PYX_CONSTANT)
#undef PYX_CONSTANT

    [[nodiscard]] const std::shared_ptr<VelkWrapper>& mySharedVelkInstance() const {
        return mySharedVelkInstance_;
    }

    const std::string metricIDKey = "kKeyMetricID";
    const std::string payloadKey = "kKeyPayload";
    const std::string profileIDKey = "kKeyProfileID";

    // The ID of the record being (or last) processed.
    [[nodiscard]] const std::optional<std::int64_t>& metricID() const {
        return metricID_;
    }

    [[nodiscard]] const LTEListHolder& myLTE() const {
        return myLTE_;
    }
    [[nodiscard]] const UMTSListHolder& myUMTS() const {
        return myUMTS_;
    }
    [[nodiscard]] const GSMListHolder& myGSM() const {
        return myGSM_;
    }
    [[nodiscard]] const CommonListHolder& myCommon() const {
        return myCommon_;
    }

    // The dictionary properties of the stored kinds, each with a getter and a setter (absent
    // until its kind first arrives), numbered in the store's declaration order.
#define PYX_ENUMERATOR_STORED(name, setter, slot) name = slot,
#define PYX_ENUMERATOR_UNSTORED
#define PYX_ENUMERATOR(constant, id, decoding, store, ...) PYX_ENUMERATOR_##store
    enum class DictionaryProperty { PYX_METRIC_KINDS(PYX_ENUMERATOR) };
#undef PYX_ENUMERATOR
#undef PYX_ENUMERATOR_UNSTORED
#undef PYX_ENUMERATOR_STORED

#define PYX_COUNT_STORED(name, setter, slot) +1
#define PYX_COUNT_UNSTORED
#define PYX_COUNT(constant, id, decoding, store, ...) PYX_COUNT_##store
    static constexpr std::size_t kDictionaryPropertyCount = 0 PYX_METRIC_KINDS(PYX_COUNT);
#undef PYX_COUNT
#undef PYX_COUNT_UNSTORED
#undef PYX_COUNT_STORED

#define PYX_ACCESSORS_STORED(name, setter, slot)                         \
    [[nodiscard]] const std::optional<DisplayDictionary>& name() const { \
        return dictionary(DictionaryProperty::name);                     \
    }                                                                    \
    void setter(std::optional<DisplayDictionary> value) {                \
        setDictionary(DictionaryProperty::name, std::move(value));       \
    }
#define PYX_ACCESSORS_UNSTORED
#define PYX_ACCESSORS(constant, id, decoding, store, ...) PYX_ACCESSORS_##store
    PYX_METRIC_KINDS(PYX_ACCESSORS)
#undef PYX_ACCESSORS
#undef PYX_ACCESSORS_UNSTORED
#undef PYX_ACCESSORS_STORED

    [[nodiscard]] const std::optional<DisplayDictionary>& dictionary(DictionaryProperty p) const;
    virtual void setDictionary(DictionaryProperty p, std::optional<DisplayDictionary> value);
    // The property by its name ("myLTECDRXConfigDict"); nullopt for an unknown name.
    [[nodiscard]] static std::optional<DictionaryProperty> dictionaryPropertyNamed(
        std::string_view name);
    [[nodiscard]] static std::string_view nameOf(DictionaryProperty p);

    // The history of the measured quantities, fed on every stored arrival; none by default.
    [[nodiscard]] const std::shared_ptr<History>& history() const {
        return history_;
    }
    void setHistory(std::shared_ptr<History> history) {
        history_ = std::move(history);
    }

    // LTE bandwidth code to MHz.
    [[nodiscard]] const std::map<std::int32_t, float>& dlbwlookup() const {
        return dlbwlookup_;
    }

    // VelkWrapperDelegate. metricsDidUpdate lets a MetricRejected through to the caller.
    void metricsDidUpdate(const MetricRecord& record) override;
    void eventsDidUpdate(const MetricRecord& record) override;

    // Validates the record's metric ID and, for a decodable kind, decodes and stores it.
    // Returns whether the metric was accepted; throws MetricRejected for a malformed record,
    // after which nothing has changed.
    virtual bool isMetricIDValidWithMetricdict(const MetricRecord& record);

  protected:
    explicit MetricValidator(std::shared_ptr<VelkWrapper> client);

  private:
    struct Impl;
    std::shared_ptr<VelkWrapper> mySharedVelkInstance_;
    std::optional<std::int64_t> metricID_;
    LTEListHolder myLTE_;
    UMTSListHolder myUMTS_;
    GSMListHolder myGSM_;
    CommonListHolder myCommon_;
    std::optional<DisplayDictionary> dictionaries_[kDictionaryPropertyCount];
    std::map<std::int32_t, float> dlbwlookup_;
    std::shared_ptr<History> history_;
    // The arrival line of the record being taken; kept so that its capacity is reused.
    std::string arrivalLine_;
};

}  // namespace pyx
