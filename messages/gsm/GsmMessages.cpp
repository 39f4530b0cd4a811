// The descriptor tables of the GSM message classes.
#include "messages/MessageDefinition.h"
#include "messages/gsm/GsmNcellMeas.h"
#include "messages/gsm/KCellularGsmCsRfMeasurement.h"
#include "messages/gsm/KCellularGsmGprsConfig.h"
#include "messages/gsm/KCellularGsmGrrEventMeasCr.h"
#include "messages/gsm/KCellularGsmIdleConfig.h"
#include "messages/gsm/KCellularGsmIdleScellMeasurement.h"
#include "messages/gsm/KCellularGsmScellInfo.h"
#include "messages/gsm/LteNcellMeas.h"
#include "messages/gsm/UmtsNcellMeas.h"

namespace pyx {

PYX_DEFINE_MESSAGE(KCellularGsmScellInfo)
PYX_DEFINE_MESSAGE(KCellularGsmIdleConfig)
PYX_DEFINE_MESSAGE(KCellularGsmGprsConfig)
PYX_DEFINE_MESSAGE(KCellularGsmIdleScellMeasurement)
PYX_DEFINE_MESSAGE(KCellularGsmCsRfMeasurement)
PYX_DEFINE_MESSAGE(KCellularGsmGrrEventMeasCr)
PYX_DEFINE_MESSAGE(GsmNcellMeas)
PYX_DEFINE_MESSAGE(UmtsNcellMeas)
PYX_DEFINE_MESSAGE(LteNcellMeas)

}  // namespace pyx
