#include "messages/MessageRuntime.h"

#include <algorithm>
#include <optional>
#include <string>
#include <vector>

#include "core/Format.h"
#include "core/Log.h"
#include "messages/KBBMetricUtility.h"
#include "messages/PBRepeated.h"

namespace pyx::detail {

namespace {

// ---- Typed views of a field's storage inside an opaque message. ----
template <class T>
T& at(void* message, const FieldDescriptor& f) {
    return *reinterpret_cast<T*>(static_cast<char*>(message) + f.offset);
}
template <class T>
const T& at(const void* message, const FieldDescriptor& f) {
    return *reinterpret_cast<const T*>(static_cast<const char*>(message) + f.offset);
}
std::uint64_t& hasBits(const MessageDescriptor& d, void* message) {
    return *reinterpret_cast<std::uint64_t*>(static_cast<char*>(message) + d.hasOffset);
}
std::uint64_t hasBits(const MessageDescriptor& d, const void* message) {
    return *reinterpret_cast<const std::uint64_t*>(static_cast<const char*>(message) + d.hasOffset);
}
bool isSet(std::uint64_t bits, const FieldDescriptor& f) {
    return (bits >> f.bit) & 1U;
}
void* slot(void* message, const FieldDescriptor& f) {
    return static_cast<char*>(message) + f.offset;
}
const void* slot(const void* message, const FieldDescriptor& f) {
    return static_cast<const char*>(message) + f.offset;
}

// A scalar's value widened to 64 bits (signed fields sign-extended), for hashing.
std::uint64_t scalarBits(const void* message, const FieldDescriptor& f) {
    switch (f.kind) {
        case FieldKind::UInt64:
            return at<std::uint64_t>(message, f);
        case FieldKind::UInt32:
            return at<std::uint32_t>(message, f);
        case FieldKind::SInt32:
        case FieldKind::Enum:
            return static_cast<std::uint64_t>(
                static_cast<std::int64_t>(at<std::int32_t>(message, f)));
        case FieldKind::Bool:
            return at<bool>(message, f) ? 1 : 0;
        default:
            return 0;
    }
}

void copyScalar(const void* from, void* into, const FieldDescriptor& f) {
    switch (f.kind) {
        case FieldKind::UInt64:
            at<std::uint64_t>(into, f) = at<std::uint64_t>(from, f);
            break;
        case FieldKind::UInt32:
            at<std::uint32_t>(into, f) = at<std::uint32_t>(from, f);
            break;
        case FieldKind::SInt32:
        case FieldKind::Enum:
            at<std::int32_t>(into, f) = at<std::int32_t>(from, f);
            break;
        case FieldKind::Bool:
            at<bool>(into, f) = at<bool>(from, f);
            break;
        default:
            break;
    }
}

// The values of a packed list, read by a reader of their own over the list's bytes, up to its
// end or a truncated varint (appended as 0, as a truncated varint reads). The cursor is kept in
// locals for the loop: lists of a thousand values are common enough to matter.
template <class List, class Convert>
void readPackedValues(List& list, PBDataReader& packed, Convert convert) {
    const std::uint8_t* const bytes = packed.bytes();
    const std::size_t limit = packed.length();
    std::size_t pos = packed.position();
    bool error = false;
    // Each value takes at least one byte: the record's length bounds the count. The values are
    // written through a pointer into room made up front, and the list cut to what was read.
    const std::size_t before = list.size();
    list.resize(before + (limit - pos));
    auto* out = list.data() + before;
    while (pos < limit && !error) *out++ = convert(decodeVarint(bytes, pos, limit, error));
    list.resize(static_cast<std::size_t>(out - list.data()));
    packed.setPosition(pos);
    if (error) packed.fail(DecodeError::Reason::TruncatedVarint, pos);
}

// The value of a list element from its varint (function objects, so that the packed loop
// inlines them).
constexpr auto asUInt32 = [](std::uint64_t v) { return static_cast<std::uint32_t>(v); };
constexpr auto asSInt32 = [](std::uint64_t v) {
    return decodeZigZag32(static_cast<std::uint32_t>(v));
};

// A repeated scalar: a packed list when it comes length-delimited, otherwise one value.
template <class List, class Convert>
void readRepeatedScalar(List& list, std::uint8_t wireType, PBDataReader& reader, Convert convert) {
    if (wireType != kWireLengthDelimited) {
        list.push_back(convert(reader.readVarint()));
        return;
    }
    const auto range = reader.readDelimited();
    if (!range) return;
    PBDataReader packed = reader.subReader(*range);
    readPackedValues(list, packed, convert);
    reader.resumeAfter(packed);
}

// How many length-delimited records follow one another from `at` under the same key (of
// keySize bytes) as the one there, up to the first other key, a bad length or the end: the
// elements a list is about to get, so that it is given its room once rather than growing
// through 4, 8, 16... A repeated field comes in one run as writers write it; if it does not,
// the list grows from there as before.
std::size_t recordsInARow(const std::uint8_t* bytes, std::size_t at, std::size_t keySize,
                          std::size_t limit) {
    constexpr std::size_t kMost = 1024;
    const std::uint8_t* const key = bytes + at;
    std::size_t n = 0;
    std::size_t pos = at;
    const auto sameKey = [&](std::size_t from) {
        for (std::size_t i = 0; i < keySize; ++i) {
            if (bytes[from + i] != key[i]) return false;
        }
        return true;
    };
    while (n < kMost && limit - pos > keySize && sameKey(pos)) {
        pos += keySize;
        bool error = false;
        const std::uint64_t size = decodeVarint(bytes, pos, limit, error);
        if (error || size > limit - pos) break;
        pos += static_cast<std::size_t>(size);
        ++n;
    }
    return n > 0 ? n : 1;
}

// Bytes, text and the repeated scalars, on the reader; a failure is left in the reader. Kept
// out of the reader loop, whose plain scalars and nested records are the common case.
[[gnu::noinline]] void readObjectField(void* message, const FieldDescriptor& f,
                                       std::uint8_t wireType, PBDataReader& reader) {
    switch (f.kind) {
        case FieldKind::Data:
            at<std::optional<Bytes>>(message, f) = PBReaderReadData(reader);
            break;
        case FieldKind::String:
            at<std::optional<std::string>>(message, f) = PBReaderReadString(reader);
            break;
        case FieldKind::UInt32List:
            readRepeatedScalar(at<PBRepeatedUInt32>(message, f), wireType, reader, asUInt32);
            break;
        case FieldKind::SInt32List:
            readRepeatedScalar(at<PBRepeatedInt32>(message, f), wireType, reader, asSInt32);
            break;
        default:
            break;
    }
}

// The number of bits set, without the library call std::popcount becomes on the baseline
// x86-64 the package is built for (no POPCNT instruction).
constexpr unsigned countBits(std::uint64_t x) {
    x = x - ((x >> 1) & 0x5555555555555555ULL);
    x = (x & 0x3333333333333333ULL) + ((x >> 2) & 0x3333333333333333ULL);
    x = (x + (x >> 4)) & 0x0F0F0F0F0F0F0F0FULL;
    return static_cast<unsigned>((x * 0x0101010101010101ULL) >> 56);
}
static_assert(countBits(0) == 0 && countBits(~0ULL) == 64 && countBits(0x8000000000000101ULL) == 3);

std::uint64_t hashBytes(const void* data, std::size_t size) {
    std::uint64_t h = 0xcbf29ce484222325ULL;
    const auto* p = static_cast<const std::uint8_t*>(data);
    for (std::size_t i = 0; i < size; ++i) {
        h ^= p[i];
        h *= 0x100000001b3ULL;
    }
    return h;
}

constexpr std::uint64_t kHashMultiplier = 2654435761ULL;

// A non-empty repeated scalar list as one packed record: key, length, then the bare values.
template <class List, class WriteValue>
void writePacked(PBDataWriter& writer, const List& list, std::uint32_t tag, WriteValue write) {
    if (list.empty()) return;
    PBDataWriterMark mark;
    PBDataWriterPlaceMark(writer, mark, tag);
    for (const auto v : list) write(writer, v, kNoTag);
    PBDataWriterRecallMark(writer, mark, tag);
}

// Takes a present scalar (value and presence bit), bytes or text of field f from `from` into
// `into`; what copying and merging share. Other kinds are left to the caller.
void takePresentValue(const FieldDescriptor& f, const void* from, void* into, std::uint64_t fromHas,
                      std::uint64_t& intoHas) {
    switch (f.kind) {
        case FieldKind::UInt64:
        case FieldKind::UInt32:
        case FieldKind::SInt32:
        case FieldKind::Enum:
        case FieldKind::Bool:
            if (isSet(fromHas, f)) {
                copyScalar(from, into, f);
                intoHas |= std::uint64_t{1} << f.bit;
            }
            break;
        case FieldKind::Data:
            if (const auto& v = at<std::optional<Bytes>>(from, f))
                at<std::optional<Bytes>>(into, f) = v;
            break;
        case FieldKind::String:
            if (const auto& v = at<std::optional<std::string>>(from, f))
                at<std::optional<std::string>>(into, f) = v;
            break;
        default:
            break;
    }
}

}  // namespace

// Starts on a cache-line boundary. The reader loop's hot path is a handful of short blocks
// spread over a few hundred bytes; with the default 16-byte function alignment, where they
// fall against 64-byte lines depended on how much code the linker happened to place before
// this function, and the typed decode ran some 5-8 % slower in the unlucky placements.
[[gnu::aligned(64)]] bool readMessage(const MessageDescriptor& d, void* message,
                                      PBDataReader& reader) {
    // Plain values are read on local copies of the cursor and of the presence bits (so that
    // storing a field does not make the compiler reload the reader); the reader is brought up to
    // date around everything that goes through it.
    char* const base = static_cast<char*>(message);
    const ReadSlot* const slots = d.readSlots.data();
    const std::size_t slotCount = d.readSlots.size();
    const std::uint8_t* const bytes = reader.bytes();
    const std::size_t limit = reader.length();
    std::size_t pos = reader.position();
    bool error = reader.hasError();
    std::uint64_t has = hasBits(d, message);
    constexpr ReadSlot kNothing{0, 0, ReadSlot::kNoKind, 0, 0};
    constexpr auto kMessage = static_cast<std::uint8_t>(FieldKind::Message);
    constexpr auto kMessageList = static_cast<std::uint8_t>(FieldKind::MessageList);

    while (pos < limit && !error) {
        const std::size_t keyPosition = pos;
        const std::uint64_t key = decodeVarint(bytes, pos, limit, error);
        const auto wireType = static_cast<std::uint8_t>(key & 7);
        const auto tag = static_cast<std::uint16_t>(key >> 3);
        if (error || wireType == kWireEndGroup) break;

        const ReadSlot s = tag < slotCount ? slots[tag] : kNothing;
        if (s.isScalar()) {
            // The common case, kept free of a jump table: a varint whatever the wire type,
            // stored at the field's width.
            const std::uint64_t v = decodeVarint(bytes, pos, limit, error);
            has |= std::uint64_t{1} << s.bit;
            char* const p = base + s.offset;
            if (s.kind == static_cast<std::uint8_t>(FieldKind::UInt64)) {
                *reinterpret_cast<std::uint64_t*>(p) = v;
            } else if (s.kind == static_cast<std::uint8_t>(FieldKind::Bool)) {
                *reinterpret_cast<bool*>(p) = v != 0;
            } else {
                const auto low = static_cast<std::uint32_t>(v);
                *reinterpret_cast<std::uint32_t*>(p) =
                    s.kind == static_cast<std::uint8_t>(FieldKind::SInt32)
                        ? static_cast<std::uint32_t>(decodeZigZag32(low))
                        : low;
            }
            continue;
        }
        // The reader's slots have no field numbered as a metric tag: only a number it has no
        // field for can be one, and the fields, the common case, skip the metric-tag table.
        const bool noField = s.kind == ReadSlot::kNoKind;
        if (noField && KBBMetricUtility::isValidMetricIdTag(tag, d)) {
            const std::uint64_t value = decodeVarint(bytes, pos, limit, error);
            // The line is built only when the system log is read.
            if (systemLogSink().on()) {
                systemLog(format("Unknown tag: %x:%u", static_cast<unsigned>(tag),
                                 static_cast<unsigned>(value & 0xFFFFFFFFU)));
            }
            continue;
        }
        if (s.kind == kMessage || s.kind == kMessageList) {
            // A nested record: the message is made (and a list marked created) before its
            // length is read, so a bad length leaves it in place, empty. The record is read by
            // a reader of its own on the same bytes, up to its end or an end-of-group key.
            const SubMessageOps& ops = *d.fields[s.index].sub;
            void* nested = nullptr;
            if (s.kind == kMessageList) {
                void* const list = base + s.offset;
                // A list's bit is set with its first element: until then the list is empty,
                // and it is given room for the records that follow under its key at once.
                if ((has & (std::uint64_t{1} << s.bit)) == 0) {
                    has |= std::uint64_t{1} << s.bit;
                    ops.reserve(list, recordsInARow(bytes, keyPosition, pos - keyPosition, limit));
                }
                nested = ops.appendNew(list);
            } else {
                nested = ops.makeNew(base + s.offset);
            }
            const std::size_t lengthPosition = pos;
            const std::uint64_t size = decodeVarint(bytes, pos, limit, error);
            if (error) break;
            if (size > limit - pos) {
                reader.fail(DecodeError::Reason::LengthPastEnd, lengthPosition);
                error = true;
                break;
            }
            PBDataReader record = reader.record(pos, pos + static_cast<std::size_t>(size));
            readMessage(ops.descriptor(), nested, record);
            reader.resumeAfter(record);
        } else if (noField) {
            reader.setPosition(pos);
            PBReaderSkipValueWithTag(reader, tag, wireType, keyPosition);
        } else {
            reader.setPosition(pos);
            readObjectField(message, d.fields[s.index], wireType, reader);
        }
        pos = reader.position();
        error = reader.hasError();
    }
    hasBits(d, message) = has;
    reader.setPosition(pos);
    // A varint read on the local cursor leaves the position at its first byte when it runs
    // past the end: that is where the failure is.
    if (error) reader.fail(DecodeError::Reason::TruncatedVarint, pos);
    return !error;
}

void writeMessage(const MessageDescriptor& d, const void* message, PBDataWriter& writer) {
    const std::uint64_t has = hasBits(d, message);
    for (const FieldDescriptor& f : d.fields) {
        switch (f.kind) {
            case FieldKind::UInt64:
                if (isSet(has, f)) {
                    PBDataWriterWriteUint64Field(writer, at<std::uint64_t>(message, f), f.tag);
                }
                break;
            case FieldKind::UInt32:
                if (isSet(has, f)) {
                    PBDataWriterWriteUint32Field(writer, at<std::uint32_t>(message, f), f.tag);
                }
                break;
            case FieldKind::SInt32:
                if (isSet(has, f)) {
                    PBDataWriterWriteSint32Field(writer, at<std::int32_t>(message, f), f.tag);
                }
                break;
            case FieldKind::Enum:
                if (isSet(has, f)) {
                    PBDataWriterWriteInt32Field(writer, at<std::int32_t>(message, f), f.tag);
                }
                break;
            case FieldKind::Bool:
                if (isSet(has, f)) PBDataWriterWriteBOOLField(writer, at<bool>(message, f), f.tag);
                break;
            case FieldKind::Data:
                if (const auto& v = at<std::optional<Bytes>>(message, f)) {
                    PBDataWriterWriteDataField(writer, *v, f.tag);
                }
                break;
            case FieldKind::String:
                if (const auto& v = at<std::optional<std::string>>(message, f)) {
                    PBDataWriterWriteStringField(writer, *v, f.tag);
                }
                break;
            case FieldKind::Message:
                if (const void* nested = f.sub->get(slot(message, f))) {
                    PBDataWriterMark mark;
                    PBDataWriterPlaceMark(writer, mark, f.tag);
                    writeMessage(f.sub->descriptor(), nested, writer);
                    PBDataWriterRecallMark(writer, mark, f.tag);
                }
                break;
            case FieldKind::MessageList: {
                const void* list = slot(message, f);
                const std::size_t n = f.sub->count(list);
                for (std::size_t i = 0; i < n; ++i) {
                    PBDataWriterMark mark;
                    PBDataWriterPlaceMark(writer, mark, f.tag);
                    writeMessage(f.sub->descriptor(), f.sub->at(list, i), writer);
                    PBDataWriterRecallMark(writer, mark, f.tag);
                }
                break;
            }
            case FieldKind::UInt32List:
                writePacked(writer, at<PBRepeatedUInt32>(message, f), f.tag,
                            PBDataWriterWriteUint32Field);
                break;
            case FieldKind::SInt32List:
                writePacked(writer, at<PBRepeatedInt32>(message, f), f.tag,
                            PBDataWriterWriteSint32Field);
                break;
        }
    }
}

namespace {

// The dictionary form written into an empty dictionary where it is kept: a nested message's
// dictionary is made in its place in the parent (or in the list), not returned and moved there.
void fillDictionary(const MessageDescriptor& d, const void* message, Dict& dict) {
    const std::uint64_t has = hasBits(d, message);
    // Room for what can be present, not for every field: a dictionary of a few entries stays
    // a small allocation.
    dict.reserve(std::min<std::size_t>(
        d.fields.size(), static_cast<std::size_t>(countBits(has)) + d.unflaggedFields));
    for (const FieldDescriptor& f : d.fields) {
        switch (f.kind) {
            case FieldKind::UInt64:
                if (isSet(has, f))
                    dict.emplace(DictKey::Lasting{f.key}, at<std::uint64_t>(message, f));
                break;
            case FieldKind::UInt32:
                if (isSet(has, f))
                    dict.emplace(DictKey::Lasting{f.key}, at<std::uint32_t>(message, f));
                break;
            case FieldKind::SInt32:
                if (isSet(has, f))
                    dict.emplace(DictKey::Lasting{f.key}, at<std::int32_t>(message, f));
                break;
            case FieldKind::Bool:
                if (isSet(has, f)) dict.emplace(DictKey::Lasting{f.key}, at<bool>(message, f));
                break;
            case FieldKind::Enum:
                if (isSet(has, f)) {
                    dict.emplace(DictKey::Lasting{f.key},
                                 f.enumTable->nameOf(at<std::int32_t>(message, f)));
                }
                break;
            case FieldKind::Data:
                if (const auto& v = at<std::optional<Bytes>>(message, f)) {
                    dict.emplace(DictKey::Lasting{f.key}, *v);
                }
                break;
            case FieldKind::String:
                if (const auto& v = at<std::optional<std::string>>(message, f)) {
                    dict.emplace(DictKey::Lasting{f.key}, *v);
                }
                break;
            case FieldKind::Message:
                if (const void* nested = f.sub->get(slot(message, f))) {
                    fillDictionary(f.sub->descriptor(), nested,
                                   dict.emplace(DictKey::Lasting{f.key}, Dict()).asDict());
                }
                break;
            case FieldKind::MessageList: {
                const void* list = slot(message, f);
                const std::size_t n = f.sub->count(list);
                if (n == 0) break;
                Array& values = dict.emplace(DictKey::Lasting{f.key}, Array()).asArray();
                values.reserve(n);
                const MessageDescriptor& nd = f.sub->descriptor();
                for (std::size_t i = 0; i < n; ++i)
                    fillDictionary(nd, f.sub->at(list, i), values.emplace_back(Dict()).asDict());
                break;
            }
            case FieldKind::UInt32List:
                dict.emplace(DictKey::Lasting{f.key},
                             PBRepeatedUInt32NSArray(at<PBRepeatedUInt32>(message, f)));
                break;
            case FieldKind::SInt32List:
                dict.emplace(DictKey::Lasting{f.key},
                             PBRepeatedInt32NSArray(at<PBRepeatedInt32>(message, f)));
                break;
        }
    }
}

}  // namespace

Dict dictionaryOf(const MessageDescriptor& d, const void* message) {
    Dict dict;
    fillDictionary(d, message, dict);
    return dict;
}

std::string describeMessage(const MessageDescriptor& d, const void* message) {
    std::string out =
        format("<%.*s: %p> ", static_cast<int>(d.name.size()), d.name.data(), message);
    Value(dictionaryOf(d, message)).appendDescription(out);
    return out;
}

bool messagesEqual(const MessageDescriptor& d, const void* a, const void* b) {
    // Scalars agree on presence, and message lists on having been created, in one comparison.
    const std::uint64_t has = hasBits(d, a);
    if (has != hasBits(d, b)) return false;
    for (const FieldDescriptor& f : d.fields) {
        switch (f.kind) {
            case FieldKind::UInt64:
            case FieldKind::UInt32:
            case FieldKind::SInt32:
            case FieldKind::Enum:
            case FieldKind::Bool:
                if (isSet(has, f) && scalarBits(a, f) != scalarBits(b, f)) return false;
                break;
            case FieldKind::Data:
                if (at<std::optional<Bytes>>(a, f) != at<std::optional<Bytes>>(b, f)) return false;
                break;
            case FieldKind::String:
                if (at<std::optional<std::string>>(a, f) != at<std::optional<std::string>>(b, f)) {
                    return false;
                }
                break;
            case FieldKind::Message: {
                const void* na = f.sub->get(slot(a, f));
                const void* nb = f.sub->get(slot(b, f));
                if ((na == nullptr) != (nb == nullptr)) return false;
                if (na != nullptr && na != nb && !messagesEqual(f.sub->descriptor(), na, nb)) {
                    return false;
                }
                break;
            }
            case FieldKind::MessageList: {
                const void* la = slot(a, f);
                const void* lb = slot(b, f);
                const std::size_t n = f.sub->count(la);
                if (n != f.sub->count(lb)) return false;
                const MessageDescriptor& nd = f.sub->descriptor();
                for (std::size_t i = 0; i < n; ++i) {
                    const void* ea = f.sub->at(la, i);
                    const void* eb = f.sub->at(lb, i);
                    if (ea != eb && !messagesEqual(nd, ea, eb)) return false;
                }
                break;
            }
            case FieldKind::UInt32List:
                if (!PBRepeatedUInt32IsEqual(at<PBRepeatedUInt32>(a, f),
                                             at<PBRepeatedUInt32>(b, f))) {
                    return false;
                }
                break;
            case FieldKind::SInt32List:
                if (!PBRepeatedInt32IsEqual(at<PBRepeatedInt32>(a, f), at<PBRepeatedInt32>(b, f))) {
                    return false;
                }
                break;
        }
    }
    return true;
}

std::uint64_t messageHash(const MessageDescriptor& d, const void* message) {
    const std::uint64_t has = hasBits(d, message);
    std::uint64_t h = 0;
    for (const FieldDescriptor& f : d.fields) {
        switch (f.kind) {
            case FieldKind::UInt64:
            case FieldKind::UInt32:
            case FieldKind::SInt32:
            case FieldKind::Enum:
            case FieldKind::Bool:
                if (isSet(has, f)) h ^= scalarBits(message, f) * kHashMultiplier;
                break;
            case FieldKind::Data:
                if (const auto& v = at<std::optional<Bytes>>(message, f)) {
                    h ^= hashBytes(v->data(), v->size());
                }
                break;
            case FieldKind::String:
                if (const auto& v = at<std::optional<std::string>>(message, f)) {
                    h ^= hashBytes(v->data(), v->size());
                }
                break;
            case FieldKind::Message:
                if (const void* nested = f.sub->get(slot(message, f))) {
                    h ^= messageHash(f.sub->descriptor(), nested);
                }
                break;
            case FieldKind::MessageList: {
                // A list hashes as its length mixed with its elements' hashes, in order.
                const void* list = slot(message, f);
                const std::size_t n = f.sub->count(list);
                std::uint64_t lh = n;
                for (std::size_t i = 0; i < n; ++i) {
                    lh = lh * 31 + messageHash(f.sub->descriptor(), f.sub->at(list, i));
                }
                h ^= lh;
                break;
            }
            case FieldKind::UInt32List:
                h ^= PBRepeatedUInt32Hash(at<PBRepeatedUInt32>(message, f));
                break;
            case FieldKind::SInt32List:
                h ^= PBRepeatedInt32Hash(at<PBRepeatedInt32>(message, f));
                break;
        }
    }
    return h;
}

void mergeMessage(const MessageDescriptor& d, void* into, const void* from) {
    const std::uint64_t fromHas = hasBits(d, from);
    std::uint64_t& intoHas = hasBits(d, into);
    for (const FieldDescriptor& f : d.fields) {
        switch (f.kind) {
            default:
                // Scalars, bytes and text: present values are taken, the same in every copy.
                takePresentValue(f, from, into, fromHas, intoHas);
                break;
            case FieldKind::Message: {
                const void* other = f.sub->get(slot(from, f));
                if (other == nullptr) break;
                if (void* mine = const_cast<void*>(f.sub->get(slot(into, f)))) {
                    if (mine != other) mergeMessage(f.sub->descriptor(), mine, other);
                } else {
                    f.sub->share(slot(into, f), slot(from, f));
                }
                break;
            }
            case FieldKind::MessageList: {
                const void* list = slot(from, f);
                const std::size_t n = f.sub->count(list);
                for (std::size_t i = 0; i < n; ++i) {
                    f.sub->appendShared(slot(into, f), list, i);
                    intoHas |= std::uint64_t{1} << f.bit;
                }
                break;
            }
            case FieldKind::UInt32List: {
                const auto values = at<PBRepeatedUInt32>(from, f);  // a copy: from may be into
                auto& list = at<PBRepeatedUInt32>(into, f);
                list.insert(list.end(), values.begin(), values.end());
                break;
            }
            case FieldKind::SInt32List: {
                const auto values = at<PBRepeatedInt32>(from, f);
                auto& list = at<PBRepeatedInt32>(into, f);
                list.insert(list.end(), values.begin(), values.end());
                break;
            }
        }
    }
}

void shallowCopy(const MessageDescriptor& d, const void* from, void* into) {
    if (from == into) return;
    const std::uint64_t fromHas = hasBits(d, from);
    std::uint64_t& intoHas = hasBits(d, into);
    for (const FieldDescriptor& f : d.fields) {
        switch (f.kind) {
            default:
                // Scalars, bytes and text: present values are taken, the same in every copy.
                takePresentValue(f, from, into, fromHas, intoHas);
                break;
            case FieldKind::Message:
                if (f.sub->get(slot(from, f)) != nullptr)
                    f.sub->share(slot(into, f), slot(from, f));
                break;
            case FieldKind::MessageList: {
                const void* list = slot(from, f);
                const std::size_t n = f.sub->count(list);
                if (n == 0) break;
                f.sub->clear(slot(into, f));
                for (std::size_t i = 0; i < n; ++i) f.sub->appendShared(slot(into, f), list, i);
                intoHas |= std::uint64_t{1} << f.bit;
                break;
            }
            case FieldKind::UInt32List:
                if (!at<PBRepeatedUInt32>(from, f).empty()) {
                    at<PBRepeatedUInt32>(into, f) = at<PBRepeatedUInt32>(from, f);
                }
                break;
            case FieldKind::SInt32List:
                if (!at<PBRepeatedInt32>(from, f).empty()) {
                    at<PBRepeatedInt32>(into, f) = at<PBRepeatedInt32>(from, f);
                }
                break;
        }
    }
}

void deepCopy(const MessageDescriptor& d, const void* from, void* into) {
    const std::uint64_t fromHas = hasBits(d, from);
    std::uint64_t& intoHas = hasBits(d, into);
    for (const FieldDescriptor& f : d.fields) {
        switch (f.kind) {
            default:
                // Scalars, bytes and text: present values are taken, the same in every copy.
                takePresentValue(f, from, into, fromHas, intoHas);
                break;
            case FieldKind::Message:
                if (const void* nested = f.sub->get(slot(from, f))) {
                    deepCopy(f.sub->descriptor(), nested, f.sub->makeNew(slot(into, f)));
                }
                break;
            case FieldKind::MessageList: {
                // Each element copied and appended; an empty list is not carried over.
                const void* list = slot(from, f);
                const std::size_t n = f.sub->count(list);
                for (std::size_t i = 0; i < n; ++i) {
                    deepCopy(f.sub->descriptor(), f.sub->at(list, i),
                             f.sub->appendNew(slot(into, f)));
                    intoHas |= std::uint64_t{1} << f.bit;
                }
                break;
            }
            case FieldKind::UInt32List:
                at<PBRepeatedUInt32>(into, f) = at<PBRepeatedUInt32>(from, f);
                break;
            case FieldKind::SInt32List:
                at<PBRepeatedInt32>(into, f) = at<PBRepeatedInt32>(from, f);
                break;
        }
    }
}

}  // namespace pyx::detail
