#include "bench/BenchKinds.h"

#include <benchmark/benchmark.h>
#include <google/protobuf/util/json_util.h>

#include <algorithm>
#include <array>
#include <iterator>

#include "core/MetricKindList.h"
#include "messages/Messages.h"
#include "pyxon_bench.pb.h"

namespace pyx::bench {

namespace {

template <class Ours>
bool oursDecode(Payload payload) {
    Ours message;
    PBDataReader reader(payload);
    const bool ok = message.readFrom(reader);
    benchmark::DoNotOptimize(message);
    return ok;
}

template <class Ours>
std::size_t oursDictionary(Payload payload) {
    const auto message = Ours::initWithData(payload);
    if (!message) return 0;
    const Dict dictionary = message->dictionaryRepresentation();
    return dictionary.size();
}

template <class Reference>
bool referenceDecodeFresh(Payload payload) {
    Reference message;
    const bool ok = message.ParseFromArray(payload.data(), static_cast<int>(payload.size()));
    benchmark::DoNotOptimize(message);
    return ok;
}

template <class Reference>
bool referenceDecodeReused(Payload payload) {
    static thread_local Reference message;
    const bool ok = message.ParseFromArray(payload.data(), static_cast<int>(payload.size()));
    benchmark::DoNotOptimize(message);
    return ok;
}

// Keys as the schema names them, like our dictionaries.
google::protobuf::util::JsonPrintOptions jsonOptions() {
    google::protobuf::util::JsonPrintOptions options;
    options.preserve_proto_field_names = true;
    return options;
}

template <class Reference>
std::size_t referenceJson(Payload payload) {
    Reference message;
    if (!message.ParseFromArray(payload.data(), static_cast<int>(payload.size()))) return 0;
    static const auto options = jsonOptions();
    std::string json;
    if (!google::protobuf::util::MessageToJsonString(message, &json, options).ok()) return 0;
    return json.size();
}

template <class Ours>
std::optional<Bytes> oursRoundTrip(Payload payload) {
    const auto message = Ours::initWithData(payload);
    if (!message) return std::nullopt;
    return message->data();
}

template <class Reference>
std::optional<std::string> referenceRoundTrip(Payload payload) {
    Reference message;
    if (!message.ParseFromArray(payload.data(), static_cast<int>(payload.size()))) {
        return std::nullopt;
    }
    return message.SerializeAsString();
}

template <class Reference>
const google::protobuf::Descriptor* referenceDescriptor() {
    return Reference::descriptor();
}

// What a kind of the list of metric kinds contributes: a BenchKind when it is decoded.
template <class Ours, class Reference>
struct Decoded {};
struct NotDecoded {};

template <class Kind>
struct KindOf;

template <class Ours, class Reference>
struct KindOf<Decoded<Ours, Reference>> {
    static constexpr bool decoded = true;
    static constexpr BenchKind make(std::int64_t metricID, std::string_view name) {
        return BenchKind{metricID,
                         name,
                         &oursDecode<Ours>,
                         &oursDictionary<Ours>,
                         &referenceDecodeFresh<Reference>,
                         &referenceDecodeReused<Reference>,
                         &referenceJson<Reference>,
                         &oursRoundTrip<Ours>,
                         &referenceRoundTrip<Reference>,
                         &Ours::descriptor,
                         &referenceDescriptor<Reference>};
    }
};

template <>
struct KindOf<NotDecoded> {
    static constexpr bool decoded = false;
    static constexpr BenchKind make(std::int64_t, std::string_view) { return BenchKind{}; }
};

#define PYX_BENCH_TYPE_DECODED(Class) Decoded<::pyx::Class, ::pyxbench::Class>
#define PYX_BENCH_TYPE_IGNORED(Class) NotDecoded
#define PYX_BENCH_TYPE_IGNORED_UNCLASSED NotDecoded
#define PYX_BENCH_NAME_DECODED(Class) #Class
#define PYX_BENCH_NAME_IGNORED(Class) ""
#define PYX_BENCH_NAME_IGNORED_UNCLASSED ""
#define PYX_BENCH_KIND(constant, id, decoding, ...) \
    KindOf<PYX_BENCH_TYPE_##decoding>::make(id, PYX_BENCH_NAME_##decoding),
constexpr BenchKind kAllKinds[] = {PYX_METRIC_KINDS(PYX_BENCH_KIND)};
#undef PYX_BENCH_KIND
#define PYX_BENCH_DECODED(constant, id, decoding, ...) KindOf<PYX_BENCH_TYPE_##decoding>::decoded,
constexpr bool kDecoded[] = {PYX_METRIC_KINDS(PYX_BENCH_DECODED)};
#undef PYX_BENCH_DECODED

constexpr std::size_t kDecodedCount =
    static_cast<std::size_t>(std::count(std::begin(kDecoded), std::end(kDecoded), true));

// The kinds the intake decodes, in catalogue order.
constexpr auto kKinds = [] {
    std::array<BenchKind, kDecodedCount> kinds{};
    std::size_t n = 0;
    for (std::size_t i = 0; i < std::size(kAllKinds); ++i) {
        if (kDecoded[i]) kinds[n++] = kAllKinds[i];
    }
    return kinds;
}();

// The message classes of the kinds that are catalogued but not decoded.
#define PYX_BENCH_EXTRA_DECODED(Class)
#define PYX_BENCH_EXTRA_IGNORED(Class) \
    ExtraClass{&::pyx::Class::descriptor, &referenceDescriptor<::pyxbench::Class>},
#define PYX_BENCH_EXTRA_IGNORED_UNCLASSED
#define PYX_BENCH_EXTRA(constant, id, decoding, ...) PYX_BENCH_EXTRA_##decoding
const ExtraClass kExtraClasses[] = {PYX_METRIC_KINDS(PYX_BENCH_EXTRA)};
#undef PYX_BENCH_EXTRA

}  // namespace

std::span<const BenchKind> benchKinds() {
    return kKinds;
}

const BenchKind* benchKindFor(std::int64_t metricID) {
    for (const BenchKind& k : kKinds) {
        if (k.metricID == metricID) return &k;
    }
    return nullptr;
}

std::span<const ExtraClass> extraClasses() {
    return kExtraClasses;
}

}  // namespace pyx::bench
