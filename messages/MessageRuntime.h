// The generic message operations, written once and driven by a class's MessageDescriptor.
// Each message class forwards its own operations here with itself as the opaque object.
#pragma once

#include <cstdint>
#include <string>

#include "core/Value.h"
#include "messages/MessageDescriptor.h"
#include "messages/PBDataReader.h"
#include "messages/PBDataWriter.h"

namespace pyx::detail {

bool readMessage(const MessageDescriptor& d, void* message, PBDataReader& reader);
void writeMessage(const MessageDescriptor& d, const void* message, PBDataWriter& writer);
Dict dictionaryOf(const MessageDescriptor& d, const void* message);
std::string describeMessage(const MessageDescriptor& d, const void* message);
bool messagesEqual(const MessageDescriptor& d, const void* a, const void* b);
std::uint64_t messageHash(const MessageDescriptor& d, const void* message);
void mergeMessage(const MessageDescriptor& d, void* into, const void* from);
void shallowCopy(const MessageDescriptor& d, const void* from, void* into);
void deepCopy(const MessageDescriptor& d, const void* from, void* into);

}  // namespace pyx::detail
