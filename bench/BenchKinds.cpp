#include "bench/BenchKinds.h"

#include <benchmark/benchmark.h>
#include <google/protobuf/util/json_util.h>

#include <array>

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

template <class Ours, class Reference>
constexpr BenchKind kind(std::int64_t metricID, std::string_view name) {
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

#define PYX_BENCH_KIND(id, Class) kind<::pyx::Class, ::pyxbench::Class>(id, #Class)

const std::array<BenchKind, 30> kKinds = {
    PYX_BENCH_KIND(3952152, KCellularLteCdrxConfig),
    PYX_BENCH_KIND(3952132, KCellularLteRrcState),
    PYX_BENCH_KIND(3948738, KCellularLteScellInfo),
    PYX_BENCH_KIND(3986190, KCellularLteSelReselCellInfo),
    PYX_BENCH_KIND(3986178, KCellularLteTxPower),
    PYX_BENCH_KIND(3952490, KCellularLteRsrpRsrqSinr),
    PYX_BENCH_KIND(3986187, KCellularLteComponentCarrierInfo),
    PYX_BENCH_KIND(3986195, KCellularLteCarrierAggregationStatus),
    PYX_BENCH_KIND(3986192, KCellularLteNbrInterRatCellMeas),
    PYX_BENCH_KIND(3986191, KCellularLteNbrEutraCellMeas),
    PYX_BENCH_KIND(3986199, KCellularLteSecondaryCellMeasurements),
    PYX_BENCH_KIND(3986697, KCellularMmCommonInfo),
    PYX_BENCH_KIND(3986701, KCellularActivatedBearerContexts),
    PYX_BENCH_KIND(3986700, KCellularEmmContext),
    PYX_BENCH_KIND(3986698, KCellularMmContext),
    PYX_BENCH_KIND(3986699, KCellularGmmContext),
    PYX_BENCH_KIND(3985682, KCellularWcdmaRrcConnectionState),
    PYX_BENCH_KIND(3985683, KCellularWcdmaRrcConfiguration),
    PYX_BENCH_KIND(3944460, KCellularWcdmaCellInfo),
    PYX_BENCH_KIND(3985666, KCellularWcdmaScellMeasurement),
    PYX_BENCH_KIND(3985667, KCellularWcdmaTxPower),
    PYX_BENCH_KIND(3985668, KCellularWcdmaSelReselCellInfo),
    PYX_BENCH_KIND(3985669, KCellularWcdmaNbrCellMeas),
    PYX_BENCH_KIND(3943948, KCellularGsmScellInfo),
    PYX_BENCH_KIND(3985409, KCellularGsmIdleConfig),
    PYX_BENCH_KIND(3985410, KCellularGsmIdleScellMeasurement),
    PYX_BENCH_KIND(3985411, KCellularGsmCsRfMeasurement),
    PYX_BENCH_KIND(3985417, KCellularGsmGrrEventMeasCr),
    PYX_BENCH_KIND(3985420, KCellularGsmGprsConfig),
    PYX_BENCH_KIND(3932179, KCellularSimCardFiles),
};

#undef PYX_BENCH_KIND

const std::array<ExtraClass, 1> kExtraClasses = {{
    {&KCellularLteServingCellMeasurement::descriptor,
     &referenceDescriptor<pyxbench::KCellularLteServingCellMeasurement>},
}};

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
