#include "PayloadBuilder.h"

#include <string>

#include "messages/KBBMetricUtility.h"
#include "messages/PBDataWriter.h"

namespace pyx::test {

namespace {

const void* slotOf(const void* message, const FieldDescriptor& f) {
    return static_cast<const char*>(message) + f.offset;
}

void writeNested(PBDataWriter& w, std::uint32_t tag, const Bytes& inner) {
    PBDataWriterWriteDataField(w, inner, tag);
}

}  // namespace

bool isMetricTagField(const FieldDescriptor& f) {
    for (const auto& e : KBBMetricUtility::kEntries) {
        if (e.tag == f.tag) return true;
    }
    return false;
}

Payload buildPayload(const MessageDescriptor& d, const BuildOptions& o) {
    Payload p;
    PBDataWriter w;
    p.boundaries.push_back(0);
    const int s = o.seed;
    for (std::size_t i = 0; i < d.fields.size(); ++i) {
        const FieldDescriptor& f = d.fields[i];
        const int index = static_cast<int>(i);
        if (index == o.omitField || isMetricTagField(f)) continue;
        const bool zero = index == o.zeroField;
        const std::string key(f.key);
        switch (f.kind) {
            case FieldKind::UInt64: {
                const std::uint64_t v = zero ? 0 : 1'600'000'000'000ULL + 1000ULL * s + i;
                PBDataWriterWriteUint64Field(w, v, f.tag);
                p.dictionary.append(key, v);
                break;
            }
            case FieldKind::UInt32: {
                const auto v = zero ? 0U : static_cast<std::uint32_t>(100 * s + index + 1);
                PBDataWriterWriteUint32Field(w, v, f.tag);
                p.dictionary.append(key, v);
                break;
            }
            case FieldKind::SInt32: {
                const std::int32_t magnitude = 10 * s + index + 1;
                const std::int32_t v = zero ? 0 : (i % 2 == 0 ? -magnitude : magnitude);
                PBDataWriterWriteSint32Field(w, v, f.tag);
                p.dictionary.append(key, v);
                break;
            }
            case FieldKind::Bool: {
                const bool v = !zero;
                PBDataWriterWriteBOOLField(w, v, f.tag);
                p.dictionary.append(key, v);
                break;
            }
            case FieldKind::Enum: {
                const EnumEntry& e =
                    f.enumTable->entries[static_cast<std::size_t>(s + index) % f.enumTable->count];
                const std::int32_t v = zero ? 0 : e.value;
                PBDataWriterWriteInt32Field(w, v, f.tag);
                p.dictionary.append(key, f.enumTable->nameOf(v));
                break;
            }
            case FieldKind::Data: {
                const Bytes v = zero ? Bytes{}
                                     : Bytes{static_cast<std::uint8_t>(s),
                                             static_cast<std::uint8_t>(index), 0xAB, 0x00};
                PBDataWriterWriteDataField(w, v, f.tag);
                p.dictionary.append(key, v);
                break;
            }
            case FieldKind::String: {
                const std::string v =
                    zero ? std::string() : "s" + std::to_string(s) + "-f" + std::to_string(index);
                PBDataWriterWriteStringField(w, v, f.tag);
                p.dictionary.append(key, v);
                break;
            }
            case FieldKind::Message: {
                const Payload inner = buildPayload(f.sub->descriptor(), {.seed = s + 1});
                writeNested(w, f.tag, inner.bytes);
                p.dictionary.append(key, inner.dictionary);
                break;
            }
            case FieldKind::MessageList: {
                Array values;
                for (int k = 1; k <= 2; ++k) {
                    const Payload inner = buildPayload(f.sub->descriptor(), {.seed = s + k});
                    writeNested(w, f.tag, inner.bytes);
                    values.emplace_back(inner.dictionary);
                    if (k == 1) p.boundaries.push_back(w.size());  // each record ends a field
                }
                p.dictionary.append(key, std::move(values));
                break;
            }
            case FieldKind::UInt32List: {
                const std::uint32_t values[] = {static_cast<std::uint32_t>(s), 0,
                                                static_cast<std::uint32_t>(300 + s)};
                PBDataWriterMark mark;
                PBDataWriterPlaceMark(w, mark, f.tag);
                Array expected;
                for (const auto v : values) {
                    PBDataWriterWriteUint32Field(w, v, kNoTag);
                    expected.emplace_back(v);
                }
                PBDataWriterRecallMark(w, mark, f.tag);
                p.dictionary.append(key, std::move(expected));
                break;
            }
            case FieldKind::SInt32List: {
                const std::int32_t values[] = {-s, s, -300};
                PBDataWriterMark mark;
                PBDataWriterPlaceMark(w, mark, f.tag);
                Array expected;
                for (const auto v : values) {
                    PBDataWriterWriteSint32Field(w, v, kNoTag);
                    expected.emplace_back(v);
                }
                PBDataWriterRecallMark(w, mark, f.tag);
                p.dictionary.append(key, std::move(expected));
                break;
            }
        }
        p.boundaries.push_back(w.size());
    }
    // A list of scalars that was never sent still shows, as an empty array.
    for (std::size_t i = 0; i < d.fields.size(); ++i) {
        const FieldDescriptor& f = d.fields[i];
        const bool list = f.kind == FieldKind::UInt32List || f.kind == FieldKind::SInt32List;
        if (list && !p.dictionary.contains(f.key)) {
            // Keep field order: rebuild with the empty array in its place.
            Dict ordered;
            for (const auto& g : d.fields) {
                if (g.key == f.key) {
                    ordered.append(std::string(g.key), Array{});
                } else if (const Value* v = p.dictionary.find(g.key)) {
                    ordered.append(std::string(g.key), *v);
                }
            }
            p.dictionary = std::move(ordered);
        }
    }
    p.bytes = w.takeData();
    return p;
}

const void* nestedObject(const void* message, const FieldDescriptor& f, std::size_t index) {
    if (f.kind == FieldKind::Message) return f.sub->get(slotOf(message, f));
    return f.sub->at(slotOf(message, f), index);
}

std::size_t nestedCount(const void* message, const FieldDescriptor& f) {
    if (f.kind == FieldKind::Message) return f.sub->get(slotOf(message, f)) != nullptr ? 1 : 0;
    return f.sub->count(slotOf(message, f));
}

}  // namespace pyx::test
