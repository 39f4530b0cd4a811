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

    // The catalogue.
    const std::int64_t K_LTE_CDRX_CONFIG = 3952152;
    const std::int64_t K_LTE_RRC_STATE = 3952132;
    const std::int64_t K_LTE_SCELL_INFO = 3948738;
    const std::int64_t K_LTE_RLF = 3952165;
    const std::int64_t K_LTE_SEL_RESEL_INFO = 3986190;
    const std::int64_t K_LTE_SCELL_MEAS = 3986177;
    const std::int64_t K_LTE_TX_POWER = 3986178;
    const std::int64_t K_LTE_RSRP_RSRQ_SINR = 3952490;
    const std::int64_t K_LTE_COMPCARR_INFO = 3986187;
    const std::int64_t K_LTE_CA_STATUS = 3986195;
    const std::int64_t K_LTE_INTERRAT_MEAS = 3986192;
    const std::int64_t K_LTE_INTRARAT_MEAS = 3986191;
    const std::int64_t K_LTE_SECONDARYCELL_MEAS = 3986199;
    const std::int64_t K_CELLULAR_MM_INFO = 3986697;
    const std::int64_t K_CELLULAR_ACTIVE_BEARER = 3986701;
    const std::int64_t K_LTE_EMM_CTXT = 3986700;
    const std::int64_t K_CELLULAR_MM_CTXT = 3986698;
    const std::int64_t K_CELLULAR_GMM_CTXT = 3986699;
    const std::int64_t K_UMTS_RRC_STATE = 3985682;
    const std::int64_t K_UMTS_RRC_CONFIG = 3985683;
    const std::int64_t K_UMTS_SCELL_INFO = 3944460;
    const std::int64_t K_UMTS_SCELL_MEAS = 3985666;
    const std::int64_t K_UMTS_TX_POWER = 3985667;
    const std::int64_t K_UMTS_SEL_RESEL_INFO = 3985668;
    const std::int64_t K_UMTS_NCELL_MEAS = 3985669;
    const std::int64_t K_GSM_SCELL_INFO = 3943948;
    const std::int64_t K_GSM_IDLE_CONFIG = 3985409;
    const std::int64_t K_GSM_IDLE_SCELL_MEAS = 3985410;
    const std::int64_t K_GSM_CS_RF_MEAS = 3985411;
    const std::int64_t K_GSM_NCELL_MEAS = 3985417;
    const std::int64_t K_GSM_GPRS_CONFIG = 3985420;
    const std::int64_t K_SIM_FILE_INFO = 3932179;

    [[nodiscard]] const std::shared_ptr<VelkWrapper>& mySharedVelkInstance() const {
        return mySharedVelkInstance_;
    }

    const std::string metricIDKey = "kKeyMetricID";
    const std::string payloadKey = "kKeyPayload";
    const std::string profileIDKey = "kKeyProfileID";

    // The ID of the record being (or last) processed.
    [[nodiscard]] const std::optional<std::int64_t>& metricID() const { return metricID_; }

    [[nodiscard]] const LTEListHolder& myLTE() const { return myLTE_; }
    [[nodiscard]] const UMTSListHolder& myUMTS() const { return myUMTS_; }
    [[nodiscard]] const GSMListHolder& myGSM() const { return myGSM_; }
    [[nodiscard]] const CommonListHolder& myCommon() const { return myCommon_; }

    // The 31 dictionary properties, each with a getter and a setter (absent until its kind
    // first arrives), declared through one list.
#define PYX_METRIC_DICTIONARIES(X)                               \
    X(myLTERRCStateDict, setMyLTERRCStateDict)                   \
    X(myLTECDRXConfigDict, setMyLTECDRXConfigDict)               \
    X(myLTESCellInfoDict, setMyLTESCellInfoDict)                 \
    X(myLTESCellMeasDict, setMyLTESCellMeasDict)                 \
    X(myLTESelReselDict, setMyLTESelReselDict)                   \
    X(myLTERsrpRsrqSinrDict, setMyLTERsrpRsrqSinrDict)           \
    X(myLTECompCarrDict, setMyLTECompCarrDict)                   \
    X(myLTETxPowerDict, setMyLTETxPowerDict)                     \
    X(myLTEInterRatMeasDict, setMyLTEInterRatMeasDict)           \
    X(myLTEIntraRatMeasDict, setMyLTEIntraRatMeasDict)           \
    X(myLTECAStatusDict, setMyLTECAStatusDict)                   \
    X(myLTESecondaryCellMeasDict, setMyLTESecondaryCellMeasDict) \
    X(myLTEEMMContextDict, setMyLTEEMMContextDict)               \
    X(myCellularMMCommonInfoDict, setMyCellularMMCommonInfoDict) \
    X(myCellularActiveBearerDict, setMyCellularActiveBearerDict) \
    X(myGMMContextDict, setMyGMMContextDict)                     \
    X(myMMContextDict, setMyMMContextDict)                       \
    X(myUMTSRRCStateDict, setMyUMTSRRCStateDict)                 \
    X(myUMTSRRCConfigDict, setMyUMTSRRCConfigDict)               \
    X(myUMTSCellInfoDict, setMyUMTSCellInfoDict)                 \
    X(myUMTSCellMeasDict, setMyUMTSCellMeasDict)                 \
    X(myUMTSTxPowerDict, setMyUMTSTxPowerDict)                   \
    X(myUMTSSelReselDict, setMyUMTSSelReselDict)                 \
    X(myUMTSNbrMeasDict, setMyUMTSNbrMeasDict)                   \
    X(myGSMScellInfoDict, setMyGSMScellInfoDict)                 \
    X(myGSMIdleConfigInfoDict, setMyGSMIdleConfigInfoDict)       \
    X(myGSMIdleScellMeasDict, setMyGSMIdleScellMeasDict)         \
    X(myGSMConnRfMeasDict, setMyGSMConnRfMeasDict)               \
    X(myGSMNbrMeasDict, setMyGSMNbrMeasDict)                     \
    X(myGSMGPRSConfigDict, setMyGSMGPRSConfigDict)               \
    X(mySIMFileInfoDict, setMySIMFileInfoDict)

    enum class DictionaryProperty {
#define PYX_ENUMERATOR(name, setter) name,
        PYX_METRIC_DICTIONARIES(PYX_ENUMERATOR)
#undef PYX_ENUMERATOR
    };
    static constexpr std::size_t kDictionaryPropertyCount = 31;

#define PYX_ACCESSORS(name, setter)                                      \
    [[nodiscard]] const std::optional<DisplayDictionary>& name() const { \
        return dictionary(DictionaryProperty::name);                     \
    }                                                                    \
    void setter(std::optional<DisplayDictionary> value) {                \
        setDictionary(DictionaryProperty::name, std::move(value));       \
    }
    PYX_METRIC_DICTIONARIES(PYX_ACCESSORS)
#undef PYX_ACCESSORS

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
