// Builds a payload for any message class from its descriptor, together with the dictionary
// that payload must decode to, worked out here from the field kinds (not by the runtime).
#pragma once

#include <cstddef>
#include <vector>

#include "core/Value.h"
#include "messages/MessageDescriptor.h"

namespace pyx::test {

struct BuildOptions {
    int seed = 1;
    // Field (index into the descriptor's fields) to leave out, or to send with value zero
    // (scalars only); -1 for none.
    int omitField = -1;
    int zeroField = -1;
};

struct Payload {
    Bytes bytes;
    Dict dictionary;
    // Offsets at which a top-level field ends (0 included): a prefix of the payload ending
    // there decodes successfully, any other prefix does not.
    std::vector<std::size_t> boundaries;
};

// Every field is sent except those whose number is a metric tag (those are never stored).
Payload buildPayload(const MessageDescriptor& d, const BuildOptions& options = {});

// Whether the field's number is one the reader drops as a metric tag.
bool isMetricTagField(const FieldDescriptor& f);

// The nested object of a message field (index 0) or of a message list (index i), by address.
const void* nestedObject(const void* message, const FieldDescriptor& f, std::size_t index = 0);
std::size_t nestedCount(const void* message, const FieldDescriptor& f);

}  // namespace pyx::test
