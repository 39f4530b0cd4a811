// The descriptor tables of the UMTS (WCDMA) message classes.
#include "messages/MessageDefinition.h"
#include "messages/Messages.h"

namespace pyx {

// The classes of this group in the list of message classes.
#define PYX_DEFINE_IN_umts(Class) PYX_DEFINE_MESSAGE(Class)
#define PYX_DEFINE_IF_UMTS(group, Class) PYX_DEFINE_IN_##group(Class)
#define PYX_DEFINE_IN_lte(Class)
#define PYX_DEFINE_IN_gsm(Class)
#define PYX_DEFINE_IN_nas(Class)
PYX_MESSAGE_CLASSES(PYX_DEFINE_IF_UMTS)
#undef PYX_DEFINE_IF_UMTS
#undef PYX_DEFINE_IN_lte
#undef PYX_DEFINE_IN_umts
#undef PYX_DEFINE_IN_gsm
#undef PYX_DEFINE_IN_nas

}  // namespace pyx
