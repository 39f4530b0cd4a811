#include "core/Value.h"

#include <array>
#include <charconv>
#include <cmath>
#include <cstring>
#include <limits>
#include <memory>
#include <new>
#include <ostream>
#include <stdexcept>
#include <string_view>

namespace pyx {

void DictKey::copyFrom(std::string_view key) {
    size_ = static_cast<std::uint32_t>(key.size());
    if (key.size() <= kInline) {
        std::memcpy(inline_, key.data(), key.size());
        data_ = inline_;
        storage_ = Storage::Inline;
    } else {
        heap_ = std::allocator<char>().allocate(key.size());
        std::memcpy(heap_, key.data(), key.size());
        data_ = heap_;
        storage_ = Storage::Heap;
    }
}

void DictKey::freeHeap() noexcept {
    std::allocator<char>().deallocate(heap_, size_);
}

std::ostream& operator<<(std::ostream& out, const DictKey& key) {
    return out << key.view();
}

Dict::Dict(std::initializer_list<DictEntry> entries) {
    reserve(entries.size());
    for (const auto& e : entries) set(e.key, e.value);
}

void Dict::tooLarge() {
    throw std::length_error("Dict: more entries than a dictionary can hold");
}

void Dict::makeOwn(std::size_t extra) {
    if (rep_ == nullptr) {
        if (extra != 0) reallocate(extra < kFirstRoom ? kFirstRoom : extra);
        return;
    }
    const std::size_t needed = rep_->size + extra;
    if (!owned()) {
        reallocate(needed);
    } else if (needed > rep_->room) {
        const std::size_t doubled = 2 * std::size_t{rep_->room};
        reallocate(needed > doubled ? needed : doubled < kFirstRoom ? kFirstRoom : doubled);
    }
}

void Dict::reallocate(std::size_t room) {
    Rep* const fresh = allocate(room);
    const std::uint32_t n = rep_ == nullptr ? 0 : rep_->size;
    if (n != 0) {
        DictEntry* const to = entriesOf(fresh);
        DictEntry* const from = entriesOf(rep_);
        if (owned()) {
            // Nobody else sees these entries: they move (a move cannot throw).
            for (std::uint32_t i = 0; i < n; ++i) ::new (to + i) DictEntry(std::move(from[i]));
        } else {
            std::uint32_t made = 0;
            try {
                for (; made < n; ++made) ::new (to + made) DictEntry(from[made]);
            } catch (...) {
                fresh->size = made;
                destroy(fresh);
                throw;
            }
        }
        fresh->size = n;
    }
    drop();
    rep_ = fresh;
}

const DictEntry& Dict::at(std::size_t index) const {
    if (index >= size()) throw std::out_of_range("Dict::at: no entry at that index");
    return entriesOf(rep_)[index];
}

std::ptrdiff_t Dict::indexOf(std::string_view key) const {
    const DictEntry* const first = begin();
    const std::size_t n = size();
    for (std::size_t i = 0; i < n; ++i) {
        if (first[i].key == key) return static_cast<std::ptrdiff_t>(i);
    }
    return -1;
}

const Value* Dict::find(std::string_view key) const {
    const std::ptrdiff_t i = indexOf(key);
    return i < 0 ? nullptr : &entriesOf(rep_)[i].value;
}

Value* Dict::find(std::string_view key) {
    // Looked up first: a dictionary shared with others is copied only when the key is there.
    const std::ptrdiff_t i = indexOf(key);
    if (i < 0) return nullptr;
    own();
    return &entriesOf(rep_)[i].value;
}

Value& Dict::set(DictKey key, Value value) {
    if (Value* existing = find(key)) {
        *existing = std::move(value);
        return *existing;
    }
    return append(std::move(key), std::move(value));
}

Value& Dict::append(DictKey key, Value value) {
    return emplace(std::move(key), std::move(value));
}

bool Dict::erase(std::string_view key) {
    const std::ptrdiff_t i = indexOf(key);
    if (i < 0) return false;
    own();
    DictEntry* const entries = entriesOf(rep_);
    const std::uint32_t n = rep_->size;
    for (auto k = static_cast<std::uint32_t>(i); k + 1 < n; ++k)
        entries[k] = std::move(entries[k + 1]);
    entries[n - 1].~DictEntry();
    --rep_->size;
    return true;
}

bool operator==(const Dict& a, const Dict& b) {
    if (a.rep_ == b.rep_) return true;
    const std::size_t n = a.size();
    if (n != b.size()) return false;
    for (std::size_t i = 0; i < n; ++i) {
        if (!(a.begin()[i] == b.begin()[i])) return false;
    }
    return true;
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

// Where a description is written: a buffer on the stack, handed to the caller's text a
// kilobyte at a time. A description is hundreds of short pieces (a separator, a key, a number);
// appending each to the string cost more than writing it. Descriptions are built for every
// stored record (its arrival line).
class DescriptionWriter {
  public:
    static constexpr std::size_t kSize = 1024;

    explicit DescriptionWriter(std::string& out) : out_(out) {}
    DescriptionWriter(const DescriptionWriter&) = delete;
    DescriptionWriter& operator=(const DescriptionWriter&) = delete;

    void put(char c) {
        if (used_ == kSize) flush();
        buffer_[used_++] = c;
    }
    void put(std::string_view text) {
        if (text.size() > kSize - used_) {
            flush();
            if (text.size() > kSize) {
                out_.append(text);
                return;
            }
        }
        std::memcpy(buffer_.data() + used_, text.data(), text.size());
        used_ += text.size();
    }
    // Room for n characters (at most kSize) to be written and then kept with commit().
    char* room(std::size_t n) {
        if (n > kSize - used_) flush();
        return buffer_.data() + used_;
    }
    void commit(const char* end) { used_ = static_cast<std::size_t>(end - buffer_.data()); }
    // Hands what is buffered to the text; called once the description is complete.
    void flush() {
        out_.append(buffer_.data(), used_);
        used_ = 0;
    }

  private:
    std::string& out_;
    std::array<char, kSize> buffer_;
    std::size_t used_ = 0;
};

template <class Int>
void writeInteger(DescriptionWriter& w, Int value) {
    char* const p = w.room(24);
    w.commit(std::to_chars(p, p + 24, value).ptr);
}

// The shortest text that reads back as the same float, with ".0" added to a finite value that
// has neither a point nor an exponent.
void writeFloat(DescriptionWriter& w, float value) {
    char* const p = w.room(64);
    char* const end = std::to_chars(p, p + 62, value).ptr;
    const std::string_view text(p, static_cast<std::size_t>(end - p));
    if (std::isfinite(value) && text.find_first_of(".e") == std::string_view::npos) {
        end[0] = '.';
        end[1] = '0';
        w.commit(end + 2);
    } else {
        w.commit(end);
    }
}

void writeBytes(DescriptionWriter& w, const Bytes& bytes) {
    w.put('<');
    const std::size_t n = bytes.size();
    for (std::size_t i = 0; i < n; i += 4) {
        // A group of up to four bytes, with the blank that separates it from the one before.
        char* p = w.room(9);
        if (i != 0) *p++ = ' ';
        const std::size_t last = i + 4 < n ? i + 4 : n;
        for (std::size_t k = i; k < last; ++k) {
            *p++ = kHex[bytes[k] >> 4];
            *p++ = kHex[bytes[k] & 0xF];
        }
        w.commit(p);
    }
    w.put('>');
}

void writeValue(DescriptionWriter& w, const Value& value);

// Two characters, without a call to memcpy for them.
void putPair(DescriptionWriter& w, char a, char b) {
    char* const p = w.room(2);
    p[0] = a;
    p[1] = b;
    w.commit(p + 2);
}

void writeDict(DescriptionWriter& w, const Dict& dict) {
    w.put('{');
    bool first = true;
    for (const auto& [key, value] : dict) {
        if (!first) putPair(w, ',', ' ');
        first = false;
        w.put(key.view());
        putPair(w, ':', ' ');
        writeValue(w, value);
    }
    w.put('}');
}

void writeValue(DescriptionWriter& w, const Value& value) {
    switch (value.kind()) {
        case Value::Kind::Null:
            w.put(std::string_view("(null)"));
            break;
        case Value::Kind::Bool:
            w.put(value.asBool() ? '1' : '0');
            break;
        case Value::Kind::Int:
            writeInteger(w, value.asInt());
            break;
        case Value::Kind::UInt:
            writeInteger(w, value.asUInt());
            break;
        case Value::Kind::Float:
            writeFloat(w, value.asFloat());
            break;
        case Value::Kind::String:
            w.put(value.asString());
            break;
        case Value::Kind::Data:
            writeBytes(w, value.asBytes());
            break;
        case Value::Kind::List: {
            w.put('[');
            bool first = true;
            for (const auto& v : value.asArray()) {
                if (!first) putPair(w, ',', ' ');
                first = false;
                writeValue(w, v);
            }
            w.put(']');
            break;
        }
        case Value::Kind::Map:
            writeDict(w, value.asDict());
            break;
    }
}

}  // namespace

std::string formatFloat(float value) {
    std::string text;
    DescriptionWriter w(text);
    writeFloat(w, value);
    w.flush();
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
    DescriptionWriter w(out);
    writeBytes(w, bytes);
    w.flush();
    return out;
}

void Value::appendDescription(std::string& out) const {
    DescriptionWriter w(out);
    writeValue(w, *this);
    w.flush();
}

void appendDescription(std::string& out, const Dict& dict) {
    DescriptionWriter w(out);
    writeDict(w, dict);
    w.flush();
}

std::string Value::description() const {
    std::string out;
    appendDescription(out);
    return out;
}

}  // namespace pyx
