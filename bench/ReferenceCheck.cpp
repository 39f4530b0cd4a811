#include "bench/ReferenceCheck.h"

#include <google/protobuf/descriptor.h>

#include <set>
#include <string>

#include "bench/BenchKinds.h"
#include "messages/MessageClassList.h"

namespace pyx::bench {

namespace {

namespace gp = google::protobuf;

struct Checker {
    std::ostream& out;
    std::set<std::string> visited;
    bool ok = true;

    void fail(const std::string& where, const std::string& what) {
        out << "reference check: " << where << ": " << what << "\n";
        ok = false;
    }

    static gp::FieldDescriptor::Type typeOf(FieldKind kind) {
        switch (kind) {
            case FieldKind::UInt64:
                return gp::FieldDescriptor::TYPE_UINT64;
            case FieldKind::UInt32:
            case FieldKind::UInt32List:
                return gp::FieldDescriptor::TYPE_UINT32;
            case FieldKind::SInt32:
            case FieldKind::SInt32List:
                return gp::FieldDescriptor::TYPE_SINT32;
            case FieldKind::Bool:
                return gp::FieldDescriptor::TYPE_BOOL;
            case FieldKind::Enum:
                return gp::FieldDescriptor::TYPE_ENUM;
            case FieldKind::Data:
                return gp::FieldDescriptor::TYPE_BYTES;
            case FieldKind::String:
                return gp::FieldDescriptor::TYPE_STRING;
            case FieldKind::Message:
            case FieldKind::MessageList:
                return gp::FieldDescriptor::TYPE_MESSAGE;
        }
        return gp::FieldDescriptor::TYPE_GROUP;
    }

    static bool repeated(FieldKind kind) {
        return kind == FieldKind::MessageList || kind == FieldKind::UInt32List ||
               kind == FieldKind::SInt32List;
    }

    void compareEnum(const std::string& where, const EnumTable& ours,
                     const gp::EnumDescriptor& ref) {
        if (static_cast<int>(ours.count) != ref.value_count()) {
            fail(where, "enumerations differ in size");
            return;
        }
        for (std::size_t i = 0; i < ours.count; ++i) {
            const gp::EnumValueDescriptor* v = ref.value(static_cast<int>(i));
            if (v->number() != ours.entries[i].value || v->name() != ours.entries[i].name) {
                fail(where, "enumerator " + std::string(ours.entries[i].name) + " differs");
            }
        }
    }

    void compare(const MessageDescriptor& ours, const gp::Descriptor& ref) {
        const std::string name(ours.name);
        if (!visited.insert(name).second) return;
        if (ref.name() != name) fail(name, "the reference class is " + ref.name());
        if (static_cast<int>(ours.fields.size()) != ref.field_count()) {
            fail(name, "field counts differ");
        }
        for (const FieldDescriptor& f : ours.fields) {
            const std::string where = name + "." + std::string(f.key);
            const gp::FieldDescriptor* r = ref.FindFieldByNumber(f.tag);
            if (r == nullptr) {
                fail(where, "no reference field with number " + std::to_string(f.tag));
                continue;
            }
            if (r->name() != f.key) fail(where, "the reference field is named " + r->name());
            if (r->type() != typeOf(f.kind)) fail(where, "types differ");
            if (r->is_repeated() != repeated(f.kind)) fail(where, "labels differ");
            const bool packedList =
                f.kind == FieldKind::UInt32List || f.kind == FieldKind::SInt32List;
            if (r->is_packed() != packedList) fail(where, "packing differs");
            if (f.kind == FieldKind::Enum) {
                if (f.enumTable == nullptr || r->enum_type() == nullptr) {
                    fail(where, "enumeration missing");
                } else {
                    compareEnum(where, *f.enumTable, *r->enum_type());
                }
            }
            if (f.sub != nullptr) {
                if (r->message_type() == nullptr) {
                    fail(where, "the reference field is not a message");
                } else {
                    compare(f.sub->descriptor(), *r->message_type());
                }
            }
        }
    }
};

}  // namespace

bool checkReference(const std::vector<CorpusRecord>& corpus, std::ostream& out) {
    Checker checker{out, {}};
    for (const BenchKind& kind : benchKinds()) {
        checker.compare(kind.oursDescriptor(), *kind.referenceDescriptor());
    }
    for (const ExtraClass& extra : extraClasses()) {
        checker.compare(extra.oursDescriptor(), *extra.referenceDescriptor());
    }
    if (checker.visited.size() != kMessageClassCount) {
        checker.fail("schemas", std::to_string(checker.visited.size()) +
                                    " message classes compared, " +
                                    std::to_string(kMessageClassCount) + " expected");
    }

    std::set<std::int64_t> kindsSeen;
    for (const CorpusRecord& r : corpus) {
        const BenchKind* kind = benchKindFor(r.metricID);
        const std::string where = "record " + std::to_string(r.metricID) + " (" + r.label + ")";
        if (kind == nullptr) {
            checker.fail(where, "not a decodable metric kind");
            continue;
        }
        kindsSeen.insert(r.metricID);
        const auto ours = kind->oursRoundTrip(r.bytes());
        const auto reference = kind->referenceRoundTrip(r.bytes());
        if (!ours || !reference) {
            checker.fail(where, !ours ? "our decoder refuses it" : "libprotobuf refuses it");
            continue;
        }
        if (std::string(ours->begin(), ours->end()) != *reference) {
            checker.fail(where, "the two decoders read different fields");
        }
        if (*reference != std::string(r.payload.begin(), r.payload.end())) {
            checker.fail(where, "the payload is not in canonical field order");
        }
    }
    if (kindsSeen.size() != benchKinds().size()) {
        checker.fail("corpus", "not every decodable metric kind has a record");
    }
    return checker.ok;
}

}  // namespace pyx::bench
