// The descriptor tables of the LTE message classes.
#include "messages/MessageDefinition.h"
#include "messages/Messages.h"

namespace pyx {

// The classes of this group in the list of message classes.
#define PYX_DEFINE_IN_lte(Class) PYX_DEFINE_MESSAGE(Class)
#define PYX_DEFINE_IF_LTE(group, Class) PYX_DEFINE_IN_##group(Class)
#define PYX_DEFINE_IN_umts(Class)
#define PYX_DEFINE_IN_gsm(Class)
#define PYX_DEFINE_IN_nas(Class)
PYX_MESSAGE_CLASSES(PYX_DEFINE_IF_LTE)
#undef PYX_DEFINE_IF_LTE
#undef PYX_DEFINE_IN_lte
#undef PYX_DEFINE_IN_umts
#undef PYX_DEFINE_IN_gsm
#undef PYX_DEFINE_IN_nas

}  // namespace pyx
