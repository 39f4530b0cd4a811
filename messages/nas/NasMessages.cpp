// The descriptor tables of the NAS, bearer and SIM message classes.
#include "messages/MessageDefinition.h"
#include "messages/nas/BearerContext.h"
#include "messages/nas/ElementaryFile.h"
#include "messages/nas/Guti.h"
#include "messages/nas/KCellularActivatedBearerContexts.h"
#include "messages/nas/KCellularEmmContext.h"
#include "messages/nas/KCellularGmmContext.h"
#include "messages/nas/KCellularLocationAreaId.h"
#include "messages/nas/KCellularMmCommonInfo.h"
#include "messages/nas/KCellularMmContext.h"
#include "messages/nas/KCellularSimCardFiles.h"
#include "messages/nas/KCellularTrackingAreaId.h"
#include "messages/nas/Plmn.h"
#include "messages/nas/RoutingAreaId.h"

namespace pyx {

PYX_DEFINE_MESSAGE(KCellularMmCommonInfo)
PYX_DEFINE_MESSAGE(Plmn)
PYX_DEFINE_MESSAGE(KCellularLocationAreaId)
PYX_DEFINE_MESSAGE(RoutingAreaId)
PYX_DEFINE_MESSAGE(KCellularTrackingAreaId)
PYX_DEFINE_MESSAGE(Guti)
PYX_DEFINE_MESSAGE(KCellularMmContext)
PYX_DEFINE_MESSAGE(KCellularGmmContext)
PYX_DEFINE_MESSAGE(KCellularEmmContext)
PYX_DEFINE_MESSAGE(KCellularActivatedBearerContexts)
PYX_DEFINE_MESSAGE(BearerContext)
PYX_DEFINE_MESSAGE(KCellularSimCardFiles)
PYX_DEFINE_MESSAGE(ElementaryFile)

}  // namespace pyx
