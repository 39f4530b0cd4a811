#include "recordings/RecordCodec.h"

#include <bit>
#include <cstring>
#include <limits>
#include <string>

#include "baseband/velk/Names.h"

namespace pyx::recordings {
namespace {

// One tag byte before every value.
enum Tag : std::uint8_t {
    kNull = 0,
    kFalse = 1,
    kTrue = 2,
    kInt = 3,                  // zigzag varint
    kUInt = 4,                 // varint
    kFloat = 5,                // 4 bytes, little-endian IEEE 754
    kString = 6,               // varint length, bytes
    kData = 7,                 // varint length, bytes
    kList = 8,                 // varint count, values
    kMap = 9,                  // varint count, (varint key length, key, value)...
    kMetricIDColumnInt = 10,   // the metric_id column, as a signed integer
    kMetricIDColumnUInt = 11,  // the metric_id column, as an unsigned integer
    kPayloadColumn = 12,       // the payload column
};

constexpr int kMaxDepth = 64;

void putVarint(std::vector<std::uint8_t>& out, std::uint64_t value) {
    while (value >= 0x80) {
        out.push_back(static_cast<std::uint8_t>(value | 0x80));
        value >>= 7;
    }
    out.push_back(static_cast<std::uint8_t>(value));
}

void putBytes(std::vector<std::uint8_t>& out, const void* data, std::size_t size) {
    putVarint(out, size);
    const auto* bytes = static_cast<const std::uint8_t*>(data);
    out.insert(out.end(), bytes, bytes + size);
}

void put(std::vector<std::uint8_t>& out, const Value& value) {
    switch (value.kind()) {
        case Value::Kind::Null:
            out.push_back(kNull);
            return;
        case Value::Kind::Bool:
            out.push_back(value.asBool() ? kTrue : kFalse);
            return;
        case Value::Kind::Int: {
            const std::int64_t v = value.asInt();
            out.push_back(kInt);
            putVarint(out,
                      (static_cast<std::uint64_t>(v) << 1) ^ static_cast<std::uint64_t>(v >> 63));
            return;
        }
        case Value::Kind::UInt:
            out.push_back(kUInt);
            putVarint(out, value.asUInt());
            return;
        case Value::Kind::Float: {
            out.push_back(kFloat);
            const auto bits = std::bit_cast<std::uint32_t>(value.asFloat());
            for (int shift = 0; shift < 32; shift += 8)
                out.push_back(static_cast<std::uint8_t>(bits >> shift));
            return;
        }
        case Value::Kind::String:
            out.push_back(kString);
            putBytes(out, value.asString().data(), value.asString().size());
            return;
        case Value::Kind::Data:
            out.push_back(kData);
            putBytes(out, value.asBytes().data(), value.asBytes().size());
            return;
        case Value::Kind::List:
            out.push_back(kList);
            putVarint(out, value.asArray().size());
            for (const Value& item : value.asArray()) put(out, item);
            return;
        case Value::Kind::Map:
            out.push_back(kMap);
            putVarint(out, value.asDict().size());
            for (const auto& entry : value.asDict()) {
                putBytes(out, entry.key.data(), entry.key.size());
                put(out, entry.value);
            }
            return;
    }
}

class Reader {
  public:
    Reader(std::span<const std::uint8_t> form, std::optional<std::int64_t> metricID,
           std::optional<std::span<const std::uint8_t>> payload)
        : form_(form), metricID_(metricID), payload_(payload) {}

    Value value(int depth) {
        if (depth > kMaxDepth) fail("nested too deeply");
        switch (byte()) {
            case kNull:
                return Value();
            case kFalse:
                return Value(false);
            case kTrue:
                return Value(true);
            case kInt: {
                const std::uint64_t z = varint();
                return Value(static_cast<std::int64_t>((z >> 1) ^ (~(z & 1) + 1)));
            }
            case kUInt:
                return Value(varint());
            case kFloat: {
                std::uint32_t bits = 0;
                for (int shift = 0; shift < 32; shift += 8)
                    bits |= static_cast<std::uint32_t>(byte()) << shift;
                return Value(std::bit_cast<float>(bits));
            }
            case kString: {
                const auto bytes = counted();
                return Value(
                    std::string(reinterpret_cast<const char*>(bytes.data()), bytes.size()));
            }
            case kData: {
                const auto bytes = counted();
                return Value(Bytes(bytes.begin(), bytes.end()));
            }
            case kList: {
                const std::uint64_t count = varint();
                if (count > remaining()) fail("a list longer than the record");
                Array items;
                items.reserve(count);
                for (std::uint64_t i = 0; i < count; ++i) items.push_back(value(depth + 1));
                return Value(std::move(items));
            }
            case kMap: {
                const std::uint64_t count = varint();
                if (count > remaining()) fail("a dictionary longer than the record");
                Dict dict;
                dict.reserve(count);
                for (std::uint64_t i = 0; i < count; ++i) {
                    const auto key = counted();
                    const std::string_view keyText(reinterpret_cast<const char*>(key.data()),
                                                   key.size());
                    dict.emplace(keyText, value(depth + 1));
                }
                return Value(std::move(dict));
            }
            case kMetricIDColumnInt:
                if (!metricID_) fail("the metric ID column is empty");
                return Value(*metricID_);
            case kMetricIDColumnUInt:
                if (!metricID_ || *metricID_ < 0) fail("the metric ID column is not unsigned");
                return Value(static_cast<std::uint64_t>(*metricID_));
            case kPayloadColumn:
                if (!payload_) fail("the payload column is empty");
                return Value(Bytes(payload_->begin(), payload_->end()));
            default:
                fail("an unknown value tag");
        }
    }

    [[nodiscard]] bool atEnd() const { return at_ == form_.size(); }

  private:
    [[noreturn]] static void fail(const std::string& what) {
        throw RecordCodecError("stored event does not read back: " + what);
    }
    [[nodiscard]] std::size_t remaining() const { return form_.size() - at_; }
    std::uint8_t byte() {
        if (at_ >= form_.size()) fail("it ends early");
        return form_[at_++];
    }
    std::uint64_t varint() {
        std::uint64_t value = 0;
        for (int shift = 0; shift < 64; shift += 7) {
            const std::uint8_t b = byte();
            value |= static_cast<std::uint64_t>(b & 0x7f) << shift;
            if ((b & 0x80) == 0) return value;
        }
        fail("a length or number that does not end");
    }
    std::span<const std::uint8_t> counted() {
        const std::uint64_t size = varint();
        if (size > remaining()) fail("a text or data longer than the record");
        const auto bytes = form_.subspan(at_, size);
        at_ += size;
        return bytes;
    }

    std::span<const std::uint8_t> form_;
    std::size_t at_ = 0;
    std::optional<std::int64_t> metricID_;
    std::optional<std::span<const std::uint8_t>> payload_;
};

}  // namespace

void encodeRecord(const Value& object, EncodedRecord& out) {
    out.metricID.reset();
    out.payload = nullptr;
    out.form.clear();
    if (!object.isDict()) {
        put(out.form, object);
        return;
    }
    const Dict& dict = object.asDict();
    out.form.push_back(kMap);
    putVarint(out.form, dict.size());
    for (const auto& entry : dict) {
        putBytes(out.form, entry.key.data(), entry.key.size());
        const Value& value = entry.value;
        if (!out.metricID && entry.key == velk::kKeyMetricID) {
            if (value.isInt()) {
                out.metricID = value.asInt();
                out.form.push_back(kMetricIDColumnInt);
                continue;
            }
            if (value.isUInt() && value.asUInt() <= static_cast<std::uint64_t>(
                                                        std::numeric_limits<std::int64_t>::max())) {
                out.metricID = static_cast<std::int64_t>(value.asUInt());
                out.form.push_back(kMetricIDColumnUInt);
                continue;
            }
        }
        if (out.payload == nullptr && entry.key == velk::kKeyPayload && value.isBytes()) {
            out.payload = &value.asBytes();
            out.form.push_back(kPayloadColumn);
            continue;
        }
        put(out.form, value);
    }
}

Value decodeRecord(std::span<const std::uint8_t> form, std::optional<std::int64_t> metricID,
                   std::optional<std::span<const std::uint8_t>> payload) {
    Reader reader(form, metricID, payload);
    Value value = reader.value(0);
    if (!reader.atEnd())
        throw RecordCodecError("stored event does not read back: bytes after its end");
    return value;
}

}  // namespace pyx::recordings
