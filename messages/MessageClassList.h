// The one list of message classes: the classes of the metric kinds first, then the nested
// records. The aggregate header messages/Messages.h is written from it when the project is
// configured (messages/CMakeLists.txt), messages/MessageDescriptors.cpp defines the descriptor
// tables of the classes from it, and the fuzz table and the every-class tests follow it.
//
// CLASS(group, Class): Class is declared in messages/<group>/<Class>.h.
#pragma once

#include <cstddef>

// clang-format off
#define PYX_MESSAGE_CLASSES(CLASS)                                                                 \
    CLASS(lte, KCellularLteCdrxConfig)                                                             \
    CLASS(lte, KCellularLteRrcState)                                                               \
    CLASS(lte, KCellularLteScellInfo)                                                              \
    CLASS(lte, KCellularLteSelReselCellInfo)                                                       \
    CLASS(lte, KCellularLteServingCellMeasurement)                                                 \
    CLASS(lte, KCellularLteTxPower)                                                                \
    CLASS(lte, KCellularLteRsrpRsrqSinr)                                                           \
    CLASS(lte, KCellularLteComponentCarrierInfo)                                                   \
    CLASS(lte, KCellularLteCarrierAggregationStatus)                                               \
    CLASS(lte, KCellularLteNbrInterRatCellMeas)                                                    \
    CLASS(lte, KCellularLteNbrEutraCellMeas)                                                       \
    CLASS(lte, KCellularLteSecondaryCellMeasurements)                                              \
    CLASS(nas, KCellularMmCommonInfo)                                                              \
    CLASS(nas, KCellularActivatedBearerContexts)                                                   \
    CLASS(nas, KCellularEmmContext)                                                                \
    CLASS(nas, KCellularMmContext)                                                                 \
    CLASS(nas, KCellularGmmContext)                                                                \
    CLASS(umts, KCellularWcdmaRrcConnectionState)                                                  \
    CLASS(umts, KCellularWcdmaRrcConfiguration)                                                    \
    CLASS(umts, KCellularWcdmaCellInfo)                                                            \
    CLASS(umts, KCellularWcdmaScellMeasurement)                                                    \
    CLASS(umts, KCellularWcdmaTxPower)                                                             \
    CLASS(umts, KCellularWcdmaSelReselCellInfo)                                                    \
    CLASS(umts, KCellularWcdmaNbrCellMeas)                                                         \
    CLASS(gsm, KCellularGsmScellInfo)                                                              \
    CLASS(gsm, KCellularGsmIdleConfig)                                                             \
    CLASS(gsm, KCellularGsmIdleScellMeasurement)                                                   \
    CLASS(gsm, KCellularGsmCsRfMeasurement)                                                        \
    CLASS(gsm, KCellularGsmGrrEventMeasCr)                                                         \
    CLASS(gsm, KCellularGsmGprsConfig)                                                             \
    CLASS(nas, KCellularSimCardFiles)                                                              \
    CLASS(lte, RxInfo)                                                                             \
    CLASS(lte, EgwErrcNbrEutraMeas)                                                                \
    CLASS(lte, EgwErrcNbrUtraMeas)                                                                 \
    CLASS(lte, EgwErrcNbrGeranMeas)                                                                \
    CLASS(lte, NbrEutra)                                                                           \
    CLASS(lte, SecondaryComponentCarrier)                                                          \
    CLASS(lte, SccRxMeasurement)                                                                   \
    CLASS(lte, TxPowerInfo)                                                                        \
    CLASS(lte, RsrpRsrqSinr)                                                                       \
    CLASS(umts, UtraCellMeasResult)                                                                \
    CLASS(umts, GsmCellMeasResult)                                                                 \
    CLASS(umts, LteCellMeasResult)                                                                 \
    CLASS(umts, EutraFreqInfo)                                                                     \
    CLASS(umts, UtraFreqInfo)                                                                      \
    CLASS(umts, GsmFreqInfo)                                                                       \
    CLASS(gsm, GsmNcellMeas)                                                                       \
    CLASS(gsm, UmtsNcellMeas)                                                                      \
    CLASS(gsm, LteNcellMeas)                                                                       \
    CLASS(nas, Plmn)                                                                               \
    CLASS(nas, KCellularLocationAreaId)                                                            \
    CLASS(nas, RoutingAreaId)                                                                      \
    CLASS(nas, KCellularTrackingAreaId)                                                            \
    CLASS(nas, Guti)                                                                               \
    CLASS(nas, BearerContext)                                                                      \
    CLASS(nas, ElementaryFile)
// clang-format on

namespace pyx {

// How many classes the list has.
#define PYX_COUNT_CLASS(group, Class) +1
inline constexpr std::size_t kMessageClassCount = 0 PYX_MESSAGE_CLASSES(PYX_COUNT_CLASS);
#undef PYX_COUNT_CLASS

}  // namespace pyx
