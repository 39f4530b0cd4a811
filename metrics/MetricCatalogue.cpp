#include "metrics/MetricCatalogue.h"

#include <iterator>

#include "messages/Messages.h"

namespace pyx {

namespace {

template <class Message>
DecodeResult decodeAs(std::span<const std::uint8_t> payload) {
    PBDataReader reader(payload);
    Message message;
    if (!message.readFrom(reader)) return *reader.error();
    return message.dictionaryRepresentation();
}

using P = MetricValidator::DictionaryProperty;
using V = MetricValidator;

// The columns of the list of kinds, as the catalogue reads them.
#define PYX_CLASS_NAME_DECODED(Class) #Class
#define PYX_CLASS_NAME_IGNORED(Class) \
    std::string_view {}
#define PYX_CLASS_NAME_IGNORED_UNCLASSED \
    std::string_view {}
#define PYX_DECODE_DECODED(Class) &decodeAs<Class>
#define PYX_DECODE_IGNORED(Class) nullptr
#define PYX_DECODE_IGNORED_UNCLASSED nullptr
#define PYX_PROPERTY_STORED(name, setter, slot) P::name
#define PYX_PROPERTY_UNSTORED std::nullopt

#define PYX_KIND(constant, id, decoding, store, logPrefix, work, tagText, simWriter) \
    MetricKind{id,                                                                   \
               &V::constant,                                                         \
               #constant,                                                            \
               PYX_CLASS_NAME_##decoding,                                            \
               PYX_DECODE_##decoding,                                                \
               PYX_PROPERTY_##store,                                                 \
               logPrefix,                                                            \
               work},

constexpr MetricKind kCatalogue[] = {PYX_METRIC_KINDS(PYX_KIND)};

#undef PYX_KIND
#undef PYX_PROPERTY_UNSTORED
#undef PYX_PROPERTY_STORED
#undef PYX_DECODE_IGNORED_UNCLASSED
#undef PYX_DECODE_IGNORED
#undef PYX_DECODE_DECODED
#undef PYX_CLASS_NAME_IGNORED_UNCLASSED
#undef PYX_CLASS_NAME_IGNORED
#undef PYX_CLASS_NAME_DECODED

// What the list must hold for the catalogue to make sense; checked when this file compiles.
// Distinct IDs of the form 0x3C0000 + tag also give distinct tags, which the metric-tag table
// relies on.
constexpr bool idsAreDistinctMetricIDs() {
    for (std::size_t i = 0; i < std::size(kCatalogue); ++i) {
        if ((kCatalogue[i].id >> 16) != 0x3C) return false;
        for (std::size_t j = 0; j < i; ++j) {
            if (kCatalogue[j].id == kCatalogue[i].id) return false;
        }
    }
    return true;
}
static_assert(idsAreDistinctMetricIDs(), "each kind has its own ID of the form 0x3C0000 + tag");

// Whether each kind is decoded, read from its decoding column (a function's address is not
// compared in a constant expression).
#define PYX_IS_DECODED_DECODED(Class) true
#define PYX_IS_DECODED_IGNORED(Class) false
#define PYX_IS_DECODED_IGNORED_UNCLASSED false
#define PYX_IS_DECODED(constant, id, decoding, ...) PYX_IS_DECODED_##decoding,
constexpr bool kDecoded[] = {PYX_METRIC_KINDS(PYX_IS_DECODED)};
#undef PYX_IS_DECODED
#undef PYX_IS_DECODED_IGNORED_UNCLASSED
#undef PYX_IS_DECODED_IGNORED
#undef PYX_IS_DECODED_DECODED

constexpr bool decodedKindsAreComplete() {
    for (std::size_t i = 0; i < std::size(kCatalogue); ++i) {
        const MetricKind& kind = kCatalogue[i];
        // A decoded kind has a class, a property and an arrival line; a kind that is not
        // cared for has no arrival line.
        if (kDecoded[i] != !kind.logPrefix.empty()) return false;
        if (kDecoded[i] && (kind.messageClass.empty() || !kind.property)) return false;
    }
    return true;
}
static_assert(decodedKindsAreComplete(), "decoded kinds have a class, a property and a line");

// Two kinds naming one property do not compile: MetricValidator declares an enumerator and
// accessors per stored kind.

}  // namespace

std::span<const MetricKind> metricCatalogue() {
    return kCatalogue;
}

const MetricKind* findMetricKind(std::int64_t metricID) {
    for (const MetricKind& kind : kCatalogue) {
        if (kind.id == metricID) return &kind;
    }
    return nullptr;
}

}  // namespace pyx
