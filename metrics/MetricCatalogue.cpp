#include "metrics/MetricCatalogue.h"

#include <array>

#include "messages/Messages.h"

namespace pyx {

namespace {

template <class Message>
DecodeResult decodeAs(std::span<const std::uint8_t> payload) {
    PBDataReader reader(payload);
    Message message;
    if (!message.readFrom(reader)) return *reader.error();
    return message.dictionaryRepresentation();
}

using P = MetricValidator::DictionaryProperty;
using V = MetricValidator;
namespace w = kindwork;

#define PYX_KIND(constant, id, Class, property, prefix, work)                            \
    MetricKind {                                                                         \
        id, &V::constant, #constant, #Class, &decodeAs<Class>, P::property, prefix, work \
    }
#define PYX_IGNORED_KIND(constant, id, property)                        \
    MetricKind {                                                        \
        id, &V::constant, #constant, {}, nullptr, property, {}, nullptr \
    }

const std::array<MetricKind, 32> kCatalogue = {
    PYX_KIND(K_LTE_CDRX_CONFIG, 3952152, KCellularLteCdrxConfig, myLTECDRXConfigDict,
             "Current CDRX Config is ", nullptr),
    PYX_KIND(K_LTE_RRC_STATE, 3952132, KCellularLteRrcState, myLTERRCStateDict,
             "Current RRC state is ", nullptr),
    PYX_KIND(K_LTE_SCELL_INFO, 3948738, KCellularLteScellInfo, myLTESCellInfoDict,
             "Current Serving Cell Info is ", &w::lteScellInfo),
    // Catalogued but deliberately dropped: reported as not cared for.
    PYX_IGNORED_KIND(K_LTE_RLF, 3952165, std::nullopt),
    PYX_KIND(K_LTE_SEL_RESEL_INFO, 3986190, KCellularLteSelReselCellInfo, myLTESelReselDict,
             "Received LTE Cell Resel Info is ", &w::lteSelReselCellInfo),
    // Catalogued but deliberately dropped, so its dictionary stays absent.
    PYX_IGNORED_KIND(K_LTE_SCELL_MEAS, 3986177, P::myLTESCellMeasDict),
    PYX_KIND(K_LTE_TX_POWER, 3986178, KCellularLteTxPower, myLTETxPowerDict,
             "Received LTE Tx Power is ", &w::lteTxPower),
    PYX_KIND(K_LTE_RSRP_RSRQ_SINR, 3952490, KCellularLteRsrpRsrqSinr, myLTERsrpRsrqSinrDict,
             "Received RSRP RSRQ SINR is : ", &w::lteRsrpRsrqSinr),
    PYX_KIND(K_LTE_COMPCARR_INFO, 3986187, KCellularLteComponentCarrierInfo, myLTECompCarrDict,
             "Received Component Carrier info is ", nullptr),
    PYX_KIND(K_LTE_CA_STATUS, 3986195, KCellularLteCarrierAggregationStatus, myLTECAStatusDict,
             "Received CA Status Dict is ", &w::lteCarrierAggregationStatus),
    PYX_KIND(K_LTE_INTERRAT_MEAS, 3986192, KCellularLteNbrInterRatCellMeas, myLTEInterRatMeasDict,
             "Received LTE InterRat Meas Info is ", &w::lteNbrInterRatCellMeas),
    PYX_KIND(K_LTE_INTRARAT_MEAS, 3986191, KCellularLteNbrEutraCellMeas, myLTEIntraRatMeasDict,
             "Received LTE IRAT Meas is ", &w::lteNbrEutraCellMeas),
    PYX_KIND(K_LTE_SECONDARYCELL_MEAS, 3986199, KCellularLteSecondaryCellMeasurements,
             myLTESecondaryCellMeasDict, "Received Secondary Cell Measurement Dict is ",
             &w::lteSecondaryCellMeasurements),
    PYX_KIND(K_CELLULAR_MM_INFO, 3986697, KCellularMmCommonInfo, myCellularMMCommonInfoDict,
             "Received MM Common Info Dict is : ", nullptr),
    PYX_KIND(K_CELLULAR_ACTIVE_BEARER, 3986701, KCellularActivatedBearerContexts,
             myCellularActiveBearerDict, "Received Bearer Context Info is ",
             &w::activatedBearerContexts),
    // "guti" and "tai_list" are kept as decoded.
    PYX_KIND(K_LTE_EMM_CTXT, 3986700, KCellularEmmContext, myLTEEMMContextDict,
             "Received EMM Context is ", nullptr),
    PYX_KIND(K_CELLULAR_MM_CTXT, 3986698, KCellularMmContext, myMMContextDict,
             "Received MM Context Info is ", nullptr),
    PYX_KIND(K_CELLULAR_GMM_CTXT, 3986699, KCellularGmmContext, myGMMContextDict,
             "Received GMM Context Info is ", nullptr),
    PYX_KIND(K_UMTS_RRC_STATE, 3985682, KCellularWcdmaRrcConnectionState, myUMTSRRCStateDict,
             "Received UMTS RRC Connection State is ", nullptr),
    PYX_KIND(K_UMTS_RRC_CONFIG, 3985683, KCellularWcdmaRrcConfiguration, myUMTSRRCConfigDict,
             "Received UMTS RRC Configuration is ", nullptr),
    PYX_KIND(K_UMTS_SCELL_INFO, 3944460, KCellularWcdmaCellInfo, myUMTSCellInfoDict,
             "Received UMTS Serving Cell Info is ", nullptr),
    PYX_KIND(K_UMTS_SCELL_MEAS, 3985666, KCellularWcdmaScellMeasurement, myUMTSCellMeasDict,
             "Received UMTS Serving Cell Meas is ", &w::wcdmaScellMeasurement),
    PYX_KIND(K_UMTS_TX_POWER, 3985667, KCellularWcdmaTxPower, myUMTSTxPowerDict,
             "Received Tx Power is ", &w::wcdmaTxPower),
    PYX_KIND(K_UMTS_SEL_RESEL_INFO, 3985668, KCellularWcdmaSelReselCellInfo, myUMTSSelReselDict,
             "Received UMTS Cell Resel Info is ", &w::wcdmaSelReselCellInfo),
    PYX_KIND(K_UMTS_NCELL_MEAS, 3985669, KCellularWcdmaNbrCellMeas, myUMTSNbrMeasDict,
             "Received UMTS InterRat Meas Info is ", &w::wcdmaNbrCellMeas),
    PYX_KIND(K_GSM_SCELL_INFO, 3943948, KCellularGsmScellInfo, myGSMScellInfoDict,
             "Received GSM Serving Cell Info ", nullptr),
    PYX_KIND(K_GSM_IDLE_CONFIG, 3985409, KCellularGsmIdleConfig, myGSMIdleConfigInfoDict,
             "Received GSM Idle Config Info is ", nullptr),
    PYX_KIND(K_GSM_IDLE_SCELL_MEAS, 3985410, KCellularGsmIdleScellMeasurement,
             myGSMIdleScellMeasDict, "Received GSM Idle Serving Cell Meas Info is ", nullptr),
    PYX_KIND(K_GSM_CS_RF_MEAS, 3985411, KCellularGsmCsRfMeasurement, myGSMConnRfMeasDict,
             "Received GSM Connected Serving Cell Meas Info is ", nullptr),
    PYX_KIND(K_GSM_NCELL_MEAS, 3985417, KCellularGsmGrrEventMeasCr, myGSMNbrMeasDict,
             "Received GSM Nbr Cell Meas Info is ", &w::gsmGrrEventMeasCr),
    PYX_KIND(K_GSM_GPRS_CONFIG, 3985420, KCellularGsmGprsConfig, myGSMGPRSConfigDict,
             "Received GSM GPRS Config Info is ", nullptr),
    PYX_KIND(K_SIM_FILE_INFO, 3932179, KCellularSimCardFiles, mySIMFileInfoDict,
             "Received SIM Card File Info is ", &w::simCardFiles),
};

#undef PYX_KIND
#undef PYX_IGNORED_KIND

}  // namespace

std::span<const MetricKind> metricCatalogue() {
    return kCatalogue;
}

const MetricKind* findMetricKind(std::int64_t metricID) {
    for (const MetricKind& kind : kCatalogue) {
        if (kind.id == metricID) return &kind;
    }
    return nullptr;
}

}  // namespace pyx
