// The descriptor tables of every message class of the list of message classes.
#include "messages/MessageDefinition.h"
#include "messages/Messages.h"

namespace pyx {

#define PYX_DEFINE(group, Class) PYX_DEFINE_MESSAGE(Class)
PYX_MESSAGE_CLASSES(PYX_DEFINE)
#undef PYX_DEFINE

}  // namespace pyx
