// The descriptor tables of the UMTS (WCDMA) message classes.
#include "messages/MessageDefinition.h"
#include "messages/umts/EutraFreqInfo.h"
#include "messages/umts/GsmCellMeasResult.h"
#include "messages/umts/GsmFreqInfo.h"
#include "messages/umts/KCellularWcdmaCellInfo.h"
#include "messages/umts/KCellularWcdmaNbrCellMeas.h"
#include "messages/umts/KCellularWcdmaRrcConfiguration.h"
#include "messages/umts/KCellularWcdmaRrcConnectionState.h"
#include "messages/umts/KCellularWcdmaScellMeasurement.h"
#include "messages/umts/KCellularWcdmaSelReselCellInfo.h"
#include "messages/umts/KCellularWcdmaTxPower.h"
#include "messages/umts/LteCellMeasResult.h"
#include "messages/umts/UtraCellMeasResult.h"
#include "messages/umts/UtraFreqInfo.h"

namespace pyx {

PYX_DEFINE_MESSAGE(KCellularWcdmaRrcConnectionState)
PYX_DEFINE_MESSAGE(KCellularWcdmaCellInfo)
PYX_DEFINE_MESSAGE(KCellularWcdmaRrcConfiguration)
PYX_DEFINE_MESSAGE(KCellularWcdmaScellMeasurement)
PYX_DEFINE_MESSAGE(KCellularWcdmaNbrCellMeas)
PYX_DEFINE_MESSAGE(UtraCellMeasResult)
PYX_DEFINE_MESSAGE(GsmCellMeasResult)
PYX_DEFINE_MESSAGE(LteCellMeasResult)
PYX_DEFINE_MESSAGE(KCellularWcdmaSelReselCellInfo)
PYX_DEFINE_MESSAGE(EutraFreqInfo)
PYX_DEFINE_MESSAGE(UtraFreqInfo)
PYX_DEFINE_MESSAGE(GsmFreqInfo)
PYX_DEFINE_MESSAGE(KCellularWcdmaTxPower)

}  // namespace pyx
