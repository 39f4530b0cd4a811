#include "metrics/MetricValidator.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <mutex>
#include <variant>

#include "core/Log.h"
#include "metrics/MetricCatalogue.h"
#include "metrics/TimestampText.h"
#include "metrics/history/History.h"

namespace pyx {

namespace {

std::string describeRejection(const std::optional<std::int64_t>& metricID,
                              const std::string& reason) {
    if (!metricID) return "metric record without a metric ID: " + reason;
    char id[32];
    std::snprintf(id, sizeof id, "0x%llX", static_cast<unsigned long long>(*metricID));
    return std::string("metric ") + id + ": " + reason;
}

// The property names by slot. A slot given twice leaves another one empty, and a slot past the
// end does not compile: either way the list of kinds is refused here.
constexpr auto kPropertyNames = [] {
    std::array<std::string_view, MetricValidator::kDictionaryPropertyCount> names{};
#define PYX_NAME_STORED(name, setter, slot) names[slot] = #name;
#define PYX_NAME_UNSTORED
#define PYX_NAME(constant, id, decoding, store, ...) PYX_NAME_##store
    PYX_METRIC_KINDS(PYX_NAME)
#undef PYX_NAME
#undef PYX_NAME_UNSTORED
#undef PYX_NAME_STORED
    return names;
}();
static_assert(std::none_of(kPropertyNames.begin(), kPropertyNames.end(),
                           [](std::string_view name) { return name.empty(); }),
              "every store slot is given to exactly one kind");

std::size_t indexOf(MetricValidator::DictionaryProperty p) {
    return static_cast<std::size_t>(p);
}

// "Metric ID in Hex = " and the ID as "%2X" formats it: taken as a 32-bit unsigned integer
// (every catalogued ID fits), upper-case hex digits, blank-padded to two characters. Written
// by hand because it runs for every record.
class HexLine {
  public:
    explicit HexLine(std::int64_t id) {
        constexpr std::string_view prefix = "Metric ID in Hex = ";
        prefix.copy(text_, prefix.size());
        char digits[8];
        int n = 0;
        auto value = static_cast<std::uint32_t>(id);
        do {
            digits[n++] = "0123456789ABCDEF"[value & 0xF];
            value >>= 4;
        } while (value != 0);
        size_ = prefix.size();
        if (n < 2) text_[size_++] = ' ';
        while (n > 0) text_[size_++] = digits[--n];
    }
    operator std::string_view() const { return {text_, size_}; }

  private:
    char text_[32] = {};
    std::size_t size_ = 0;
};

}  // namespace

MetricRejected::MetricRejected(std::optional<std::int64_t> metricID, std::string reason)
    : std::runtime_error(describeRejection(metricID, reason)),
      metricID_(metricID),
      reason_(std::move(reason)) {}

// What the intake does with one record, with access to the store's private state.
struct MetricValidator::Impl {
    // The metric ID of a record: an integer under "kKeyMetricID", or nothing.
    static std::optional<std::int64_t> metricIDOf(const MetricValidator& self,
                                                  const MetricRecord& record) {
        const Value* id = record.find(self.metricIDKey);
        if (id == nullptr || !id->isInteger()) return std::nullopt;
        return id->toInt64();
    }

    static bool take(MetricValidator& self, const MetricRecord& record);
};

bool MetricValidator::Impl::take(MetricValidator& self, const MetricRecord& record) {
    // metricID is the ID of the record being (or last) processed; it is set even when the
    // record is then rejected, while the stored dictionaries and holders stay as they were.
    self.metricID_ = metricIDOf(self, record);
    if (!self.metricID_) {
        const Value* id = record.find(self.metricIDKey);
        throw MetricRejected(std::nullopt,
                             id == nullptr ? "no metric ID" : "the metric ID is not an integer");
    }
    const std::int64_t id = *self.metricID_;

    const bool logging = standardOutputSink().on();
    if (logging) standardOutput(HexLine(id));

    const MetricKind* kind = findMetricKind(id);
    if (kind == nullptr || !kind->decodable()) {
        standardOutput("I dont care for this Metric");
        return false;
    }

    const Value* payload = record.find(self.payloadKey);
    if (payload == nullptr || !payload->isBytes()) {
        throw MetricRejected(id, payload == nullptr ? "no payload" : "the payload is not data");
    }
    DecodeResult decoded = kind->decode(payload->asBytes());
    if (const auto* error = std::get_if<DecodeError>(&decoded)) {
        throw MetricRejected(
            id, "does not decode as " + std::string(kind->messageClass) + ": " + error->text());
    }
    std::optional<Dict> stored = std::move(std::get<Dict>(decoded));

    Value* timestamp = stored->find("timestamp");
    if (timestamp == nullptr || !timestamp->isNumber()) {
        throw MetricRejected(
            id, "the decoded " + std::string(kind->messageClass) + " has no numeric timestamp");
    }
    double milliseconds = 0;
    switch (timestamp->kind()) {
        case Value::Kind::UInt:
            milliseconds = static_cast<double>(timestamp->asUInt());
            break;
        case Value::Kind::Int:
            milliseconds = static_cast<double>(timestamp->asInt());
            break;
        case Value::Kind::Float:
            milliseconds = timestamp->asFloat();
            break;
        default:
            milliseconds = timestamp->asBool() ? 1 : 0;
            break;
    }
    auto text = timestampText(milliseconds);
    if (!text) {
        throw MetricRejected(
            id, "the timestamp " + timestamp->description() + " is beyond the calendar");
    }
    *timestamp = Value(std::move(*text));

    StoreUpdate update(self.myLTE_, self.myUMTS_, self.myGSM_, self.myCommon_, self.dlbwlookup_);
    if (kind->work != nullptr) {
        try {
            kind->work(*stored, update);
        } catch (const ConversionOverflow& overflow) {
            throw MetricRejected(id, overflow.what());
        }
    }

    // Everything is built: commit the dictionary and the lists together.
    const DictionaryProperty property = *kind->property;
    self.setDictionary(property, std::move(stored));
    update.commit();

    const auto& now = self.dictionary(property);
    if (self.history_ && now) self.history_->record(property, *now, milliseconds);
    if (logging) {
        std::string& line = self.arrivalLine_;
        line.assign(kind->logPrefix);
        if (now) appendDescription(line, *now);
        standardOutput(line);
    }
    return true;
}

MetricValidator::MetricValidator(std::shared_ptr<VelkWrapper> client)
    : mySharedVelkInstance_(std::move(client)), dlbwlookup_{{0, 1.4F},  {1, 3.0F},  {2, 5.0F},
                                                            {3, 10.0F}, {4, 15.0F}, {5, 20.0F}} {}

MetricValidator::~MetricValidator() = default;

std::shared_ptr<MetricValidator> MetricValidator::create(std::shared_ptr<VelkWrapper> client) {
    struct Made : MetricValidator {
        explicit Made(std::shared_ptr<VelkWrapper> c) : MetricValidator(std::move(c)) {}
    };
    std::shared_ptr<MetricValidator> validator = std::make_shared<Made>(std::move(client));
    // The subscription starts before the validator becomes the delegate; events delivered in
    // between find no delegate and are dropped by the client.
    if (const auto& c = validator->mySharedVelkInstance_) {
        c->listen();
        c->setDelegate(std::weak_ptr<VelkWrapperDelegate>(validator));
    }
    return validator;
}

std::shared_ptr<MetricValidator> MetricValidator::sharedInstance() {
    static std::once_flag once;
    static std::shared_ptr<MetricValidator> shared;
    std::call_once(once, [] { shared = create(VelkWrapper::sharedInstance()); });
    return shared;
}

const std::optional<DisplayDictionary>& MetricValidator::dictionary(DictionaryProperty p) const {
    return dictionaries_[indexOf(p)];
}

void MetricValidator::setDictionary(DictionaryProperty p, std::optional<DisplayDictionary> value) {
    dictionaries_[indexOf(p)] = std::move(value);
}

std::optional<MetricValidator::DictionaryProperty> MetricValidator::dictionaryPropertyNamed(
    std::string_view name) {
    for (std::size_t i = 0; i < kPropertyNames.size(); ++i) {
        if (kPropertyNames[i] == name) return static_cast<DictionaryProperty>(i);
    }
    return std::nullopt;
}

std::string_view MetricValidator::nameOf(DictionaryProperty p) {
    return kPropertyNames[indexOf(p)];
}

void MetricValidator::metricsDidUpdate(const MetricRecord& record) {
    if (isMetricIDValidWithMetricdict(record)) standardOutput("Received Valid Metric");
}

void MetricValidator::eventsDidUpdate(const MetricRecord& /*record*/) {
    standardOutput("I dont care for events");
}

bool MetricValidator::isMetricIDValidWithMetricdict(const MetricRecord& record) {
    return Impl::take(*this, record);
}

}  // namespace pyx
