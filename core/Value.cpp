#include "core/Value.h"

#include <charconv>
#include <cmath>
#include <limits>

namespace pyx {

Dict::Dict(std::initializer_list<DictEntry> entries) {
    entries_.reserve(entries.size());
    for (const auto& e : entries) set(e.key, e.value);
}

const Value* Dict::find(std::string_view key) const {
    for (const auto& e : entries_)
        if (e.key == key) return &e.value;
    return nullptr;
}

Value* Dict::find(std::string_view key) {
    for (auto& e : entries_)
        if (e.key == key) return &e.value;
    return nullptr;
}

Value& Dict::set(std::string key, Value value) {
    if (Value* existing = find(key)) {
        *existing = std::move(value);
        return *existing;
    }
    return append(std::move(key), std::move(value));
}

Value& Dict::append(std::string key, Value value) {
    entries_.push_back(DictEntry{std::move(key), std::move(value)});
    return entries_.back().value;
}

bool Dict::erase(std::string_view key) {
    for (auto it = entries_.begin(); it != entries_.end(); ++it) {
        if (it->key == key) {
            entries_.erase(it);
            return true;
        }
    }
    return false;
}

bool operator==(const Dict& a, const Dict& b) {
    return a.entries_ == b.entries_;
}

std::optional<std::int64_t> Value::toInt64() const {
    switch (kind()) {
        case Kind::Bool:
            return asBool() ? 1 : 0;
        case Kind::Int:
            return asInt();
        case Kind::UInt:
            if (asUInt() > static_cast<std::uint64_t>(std::numeric_limits<std::int64_t>::max()))
                return std::nullopt;
            return static_cast<std::int64_t>(asUInt());
        case Kind::Float: {
            const double f = asFloat();
            // 2^63 is exactly representable; anything at or beyond it does not fit.
            if (!std::isfinite(f) || f >= 9223372036854775808.0 || f < -9223372036854775808.0)
                return std::nullopt;
            return static_cast<std::int64_t>(f);
        }
        default:
            return std::nullopt;
    }
}

std::optional<float> Value::toFloat() const {
    switch (kind()) {
        case Kind::Bool:
            return asBool() ? 1.0F : 0.0F;
        case Kind::Int:
            return static_cast<float>(asInt());
        case Kind::UInt:
            return static_cast<float>(asUInt());
        case Kind::Float:
            return asFloat();
        default:
            return std::nullopt;
    }
}

namespace {

constexpr char kHex[] = "0123456789abcdef";

// The appenders below write straight into the caller's text: descriptions are built for every
// stored record (its arrival line), so no temporary strings are made per value.
template <class Int>
void appendInteger(std::string& out, Int value) {
    char buf[24];
    const auto res = std::to_chars(buf, buf + sizeof buf, value);
    out.append(buf, res.ptr);
}

void appendFloat(std::string& out, float value) {
    char buf[64];
    const auto res = std::to_chars(buf, buf + sizeof buf, value);
    const std::string_view text(buf, static_cast<std::size_t>(res.ptr - buf));
    out.append(text);
    if (std::isfinite(value) && text.find_first_of(".e") == std::string_view::npos) out += ".0";
}

void appendBytes(std::string& out, const Bytes& bytes) {
    const std::size_t n = bytes.size();
    const std::size_t start = out.size();
    out.resize(start + 2 + n * 2 + (n == 0 ? 0 : (n - 1) / 4));
    char* p = out.data() + start;
    *p++ = '<';
    for (std::size_t i = 0; i < n; ++i) {
        if (i != 0 && i % 4 == 0) *p++ = ' ';
        *p++ = kHex[bytes[i] >> 4];
        *p++ = kHex[bytes[i] & 0xF];
    }
    *p = '>';
}

}  // namespace

std::string formatFloat(float value) {
    std::string text;
    appendFloat(text, value);
    return text;
}

std::string hexString(const Bytes& bytes) {
    std::string out;
    out.reserve(bytes.size() * 2);
    for (const std::uint8_t b : bytes) {
        out.push_back(kHex[b >> 4]);
        out.push_back(kHex[b & 0xF]);
    }
    return out;
}

std::string describeBytes(const Bytes& bytes) {
    std::string out;
    appendBytes(out, bytes);
    return out;
}

void Value::appendDescription(std::string& out) const {
    switch (kind()) {
        case Kind::Null:
            out += "(null)";
            break;
        case Kind::Bool:
            out += asBool() ? '1' : '0';
            break;
        case Kind::Int:
            appendInteger(out, asInt());
            break;
        case Kind::UInt:
            appendInteger(out, asUInt());
            break;
        case Kind::Float:
            appendFloat(out, asFloat());
            break;
        case Kind::String:
            out += asString();
            break;
        case Kind::Data:
            appendBytes(out, asBytes());
            break;
        case Kind::List: {
            out += '[';
            bool first = true;
            for (const auto& v : asArray()) {
                if (!first) out += ", ";
                first = false;
                v.appendDescription(out);
            }
            out += ']';
            break;
        }
        case Kind::Map:
            pyx::appendDescription(out, asDict());
            break;
    }
}

void appendDescription(std::string& out, const Dict& dict) {
    out += '{';
    bool first = true;
    for (const auto& [key, value] : dict) {
        if (!first) out += ", ";
        first = false;
        out += key;
        out += ": ";
        value.appendDescription(out);
    }
    out += '}';
}

std::string Value::description() const {
    std::string out;
    appendDescription(out);
    return out;
}

}  // namespace pyx
