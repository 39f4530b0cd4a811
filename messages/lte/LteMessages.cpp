// The descriptor tables of the LTE message classes.
#include "messages/MessageDefinition.h"
#include "messages/lte/EgwErrcNbrEutraMeas.h"
#include "messages/lte/EgwErrcNbrGeranMeas.h"
#include "messages/lte/EgwErrcNbrUtraMeas.h"
#include "messages/lte/KCellularLteCarrierAggregationStatus.h"
#include "messages/lte/KCellularLteCdrxConfig.h"
#include "messages/lte/KCellularLteComponentCarrierInfo.h"
#include "messages/lte/KCellularLteNbrEutraCellMeas.h"
#include "messages/lte/KCellularLteNbrInterRatCellMeas.h"
#include "messages/lte/KCellularLteRrcState.h"
#include "messages/lte/KCellularLteRsrpRsrqSinr.h"
#include "messages/lte/KCellularLteScellInfo.h"
#include "messages/lte/KCellularLteSecondaryCellMeasurements.h"
#include "messages/lte/KCellularLteSelReselCellInfo.h"
#include "messages/lte/KCellularLteServingCellMeasurement.h"
#include "messages/lte/KCellularLteTxPower.h"
#include "messages/lte/NbrEutra.h"
#include "messages/lte/RsrpRsrqSinr.h"
#include "messages/lte/RxInfo.h"
#include "messages/lte/SccRxMeasurement.h"
#include "messages/lte/SecondaryComponentCarrier.h"
#include "messages/lte/TxPowerInfo.h"

namespace pyx {

PYX_DEFINE_MESSAGE(KCellularLteRrcState)
PYX_DEFINE_MESSAGE(KCellularLteScellInfo)
PYX_DEFINE_MESSAGE(KCellularLteServingCellMeasurement)
PYX_DEFINE_MESSAGE(RxInfo)
PYX_DEFINE_MESSAGE(KCellularLteNbrEutraCellMeas)
PYX_DEFINE_MESSAGE(EgwErrcNbrEutraMeas)
PYX_DEFINE_MESSAGE(KCellularLteNbrInterRatCellMeas)
PYX_DEFINE_MESSAGE(EgwErrcNbrUtraMeas)
PYX_DEFINE_MESSAGE(EgwErrcNbrGeranMeas)
PYX_DEFINE_MESSAGE(KCellularLteSelReselCellInfo)
PYX_DEFINE_MESSAGE(NbrEutra)
PYX_DEFINE_MESSAGE(KCellularLteComponentCarrierInfo)
PYX_DEFINE_MESSAGE(KCellularLteCarrierAggregationStatus)
PYX_DEFINE_MESSAGE(SecondaryComponentCarrier)
PYX_DEFINE_MESSAGE(KCellularLteSecondaryCellMeasurements)
PYX_DEFINE_MESSAGE(SccRxMeasurement)
PYX_DEFINE_MESSAGE(KCellularLteTxPower)
PYX_DEFINE_MESSAGE(TxPowerInfo)
PYX_DEFINE_MESSAGE(KCellularLteCdrxConfig)
PYX_DEFINE_MESSAGE(KCellularLteRsrpRsrqSinr)
PYX_DEFINE_MESSAGE(RsrpRsrqSinr)

}  // namespace pyx
