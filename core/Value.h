// The one value type of the system: what the baseband's event objects, the decoded metric
// dictionaries and the screens' cells are made of.
//
// A Value is null, a bool, a signed or unsigned 64-bit integer, a 32-bit float, a string,
// bytes, an array, or a dictionary with string keys that keeps insertion order (a decoded
// message's field order is its enumeration order everywhere).
#pragma once

#include <cstdint>
#include <cstring>
#include <initializer_list>
#include <iosfwd>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

#include "core/BlockPool.h"

namespace pyx {

class Value;
using Bytes = std::vector<std::uint8_t>;
using Array = std::vector<Value, PoolAllocator<Value>>;

struct DictEntry;

// The key of a dictionary entry. A decoded dictionary takes its keys from the field tables,
// texts that live as long as the program: such a key is kept by reference (DictKey::lasting),
// and making, copying and dropping it costs nothing. Any other key is kept as a copy of its own,
// in the key itself up to 16 characters (as most keys are), else on the heap.
class DictKey {
  public:
    DictKey() = default;
    DictKey(std::string_view key) { copyFrom(key); }
    DictKey(const std::string& key) : DictKey(std::string_view(key)) {}
    DictKey(const char* key) : DictKey(std::string_view(key)) {}
    // A key whose text outlives every dictionary: a literal, a table's text.
    static DictKey lasting(std::string_view key) {
        DictKey k;
        k.data_ = key.data();
        k.size_ = static_cast<std::uint32_t>(key.size());
        return k;
    }

    DictKey(const DictKey& other) {
        if (other.storage_ == Storage::Lasting) {
            data_ = other.data_;
            size_ = other.size_;
        } else {
            copyFrom(other.view());
        }
    }
    DictKey(DictKey&& other) noexcept { take(other); }
    DictKey& operator=(const DictKey& other) {
        if (this != &other) *this = DictKey(other);
        return *this;
    }
    DictKey& operator=(DictKey&& other) noexcept {
        if (this != &other) {
            release();
            take(other);
        }
        return *this;
    }
    ~DictKey() { release(); }

    [[nodiscard]] std::string_view view() const { return {data_, size_}; }
    operator std::string_view() const { return view(); }
    operator std::string() const { return std::string(view()); }
    [[nodiscard]] std::string str() const { return std::string(view()); }
    [[nodiscard]] const char* data() const { return data_; }
    [[nodiscard]] std::size_t size() const { return size_; }
    [[nodiscard]] bool empty() const { return size_ == 0; }

    friend bool operator==(const DictKey& a, const DictKey& b) { return a.view() == b.view(); }
    friend bool operator==(const DictKey& a, std::string_view b) { return a.view() == b; }
    friend bool operator==(const DictKey& a, const std::string& b) { return a.view() == b; }
    friend bool operator==(const DictKey& a, const char* b) { return a.view() == b; }
    friend std::string operator+(const std::string& a, const DictKey& b) {
        return a + std::string(b.view());
    }
    friend std::string operator+(const DictKey& a, const std::string& b) {
        return std::string(a.view()) + b;
    }
    friend std::ostream& operator<<(std::ostream& out, const DictKey& key);

  private:
    enum class Storage : std::uint8_t { Lasting, Inline, Heap };
    static constexpr std::size_t kInline = 16;

    void copyFrom(std::string_view key);
    void freeHeap() noexcept;
    // Moves and drops are in every dictionary's building and copying: inline, and nothing more
    // than a few stores for a lasting key.
    void take(DictKey& other) noexcept {
        size_ = other.size_;
        storage_ = other.storage_;
        if (storage_ == Storage::Lasting) {
            data_ = other.data_;
        } else if (storage_ == Storage::Inline) {
            std::memcpy(inline_, other.inline_, kInline);
            data_ = inline_;
        } else {
            heap_ = other.heap_;
            data_ = heap_;
        }
        other.data_ = "";
        other.size_ = 0;
        other.storage_ = Storage::Lasting;
    }
    void release() noexcept {
        if (storage_ == Storage::Heap) freeHeap();
        data_ = "";
        size_ = 0;
        storage_ = Storage::Lasting;
    }

    const char* data_ = "";
    std::uint32_t size_ = 0;
    Storage storage_ = Storage::Lasting;
    union {
        char inline_[kInline] = {};
        char* heap_;
    };
};

// A dictionary with string keys, in insertion order. Lookups are linear: the system's
// dictionaries hold a few dozen entries at most, where a scan beats hashing.
class Dict {
  public:
    using Entries = std::vector<DictEntry, PoolAllocator<DictEntry>>;
    using const_iterator = Entries::const_iterator;
    using iterator = Entries::iterator;

    // The special members, like the accessors below, are defined after DictEntry, where the
    // entry type is complete (clang instantiates the vector's members where they are used).
    Dict();
    ~Dict();
    Dict(const Dict& other);
    Dict(Dict&& other) noexcept;
    Dict& operator=(const Dict& other);
    Dict& operator=(Dict&& other) noexcept;
    Dict(std::initializer_list<DictEntry> entries);

    [[nodiscard]] std::size_t size() const;
    [[nodiscard]] bool empty() const;
    [[nodiscard]] const_iterator begin() const;
    [[nodiscard]] const_iterator end() const;
    [[nodiscard]] iterator begin();
    [[nodiscard]] iterator end();
    [[nodiscard]] const DictEntry& at(std::size_t index) const;

    // The value under key, or nullptr when the key is absent.
    [[nodiscard]] const Value* find(std::string_view key) const;
    [[nodiscard]] Value* find(std::string_view key);
    [[nodiscard]] bool contains(std::string_view key) const { return find(key) != nullptr; }

    // Replaces the value of an existing key in place (its position is kept), or appends.
    Value& set(DictKey key, Value value);
    // Appends without looking for an existing key; for builders that know keys are unique.
    Value& append(DictKey key, Value value);
    // As append, building the entry in place: the value is made where it is kept, from what
    // the Value would be made of (the decoders build every dictionary this way, with keys of
    // the field tables, DictKey::lasting: an integer, a text, a list or a dictionary).
    template <class V>
    Value& emplace(DictKey key, V&& value);
    // Removes the key if present; returns whether it was.
    bool erase(std::string_view key);
    void reserve(std::size_t n);

    friend bool operator==(const Dict& a, const Dict& b);

  private:
    Entries entries_;
};

class Value {
  public:
    enum class Kind { Null, Bool, Int, UInt, Float, String, Data, List, Map };

    Value() = default;
    Value(std::nullptr_t) {}
    Value(bool v) : v_(v) {}
    Value(std::int32_t v) : v_(static_cast<std::int64_t>(v)) {}
    Value(std::int64_t v) : v_(v) {}
    Value(std::uint32_t v) : v_(static_cast<std::uint64_t>(v)) {}
    Value(std::uint64_t v) : v_(v) {}
    Value(float v) : v_(v) {}
    Value(std::string v) : v_(std::move(v)) {}
    Value(std::string_view v) : v_(std::string(v)) {}
    Value(const char* v) : v_(std::string(v)) {}
    Value(pyx::Bytes v) : v_(std::move(v)) {}
    Value(pyx::Array v) : v_(std::move(v)) {}
    Value(pyx::Dict v) : v_(std::move(v)) {}

    [[nodiscard]] Kind kind() const { return static_cast<Kind>(v_.index()); }
    [[nodiscard]] bool isNull() const { return kind() == Kind::Null; }
    [[nodiscard]] bool isBool() const { return kind() == Kind::Bool; }
    [[nodiscard]] bool isInt() const { return kind() == Kind::Int; }
    [[nodiscard]] bool isUInt() const { return kind() == Kind::UInt; }
    [[nodiscard]] bool isInteger() const { return isInt() || isUInt(); }
    [[nodiscard]] bool isFloat() const { return kind() == Kind::Float; }
    [[nodiscard]] bool isNumber() const { return isBool() || isInteger() || isFloat(); }
    [[nodiscard]] bool isString() const { return kind() == Kind::String; }
    [[nodiscard]] bool isBytes() const { return kind() == Kind::Data; }
    [[nodiscard]] bool isArray() const { return kind() == Kind::List; }
    [[nodiscard]] bool isDict() const { return kind() == Kind::Map; }

    // Typed access; each throws std::bad_variant_access on a value of another kind.
    [[nodiscard]] bool asBool() const { return std::get<bool>(v_); }
    [[nodiscard]] std::int64_t asInt() const { return std::get<std::int64_t>(v_); }
    [[nodiscard]] std::uint64_t asUInt() const { return std::get<std::uint64_t>(v_); }
    [[nodiscard]] float asFloat() const { return std::get<float>(v_); }
    [[nodiscard]] const std::string& asString() const { return std::get<std::string>(v_); }
    [[nodiscard]] const pyx::Bytes& asBytes() const { return std::get<pyx::Bytes>(v_); }
    [[nodiscard]] const pyx::Array& asArray() const { return std::get<pyx::Array>(v_); }
    [[nodiscard]] pyx::Array& asArray() { return std::get<pyx::Array>(v_); }
    [[nodiscard]] const pyx::Dict& asDict() const { return std::get<pyx::Dict>(v_); }
    [[nodiscard]] pyx::Dict& asDict() { return std::get<pyx::Dict>(v_); }

    // Numeric views, as a number object of the platform answers them: a bool, an integer of
    // either sign or a float converts; anything else gives nothing. toInt64 gives nothing for
    // an unsigned value above INT64_MAX and for a float that is not finite or out of range.
    [[nodiscard]] std::optional<std::int64_t> toInt64() const;
    [[nodiscard]] std::optional<float> toFloat() const;

    // The textual description used for the detail text of screen cells and for log lines.
    [[nodiscard]] std::string description() const;
    void appendDescription(std::string& out) const;

    friend bool operator==(const Value& a, const Value& b) { return a.v_ == b.v_; }

  private:
    std::variant<std::monostate, bool, std::int64_t, std::uint64_t, float, std::string, pyx::Bytes,
                 pyx::Array, pyx::Dict>
        v_;
};

struct DictEntry {
    DictEntry() = default;
    // The value is made where the entry is kept (Dict::emplace), from whatever makes a Value.
    template <class V>
    DictEntry(DictKey k, V&& v) : key(std::move(k)), value(std::forward<V>(v)) {}

    DictKey key;
    Value value;
    friend bool operator==(const DictEntry& a, const DictEntry& b) = default;
};

inline Dict::Dict() = default;
inline Dict::~Dict() = default;
inline Dict::Dict(const Dict& other) = default;
inline Dict::Dict(Dict&& other) noexcept = default;
inline Dict& Dict::operator=(const Dict& other) = default;
inline Dict& Dict::operator=(Dict&& other) noexcept = default;
inline std::size_t Dict::size() const {
    return entries_.size();
}
inline bool Dict::empty() const {
    return entries_.empty();
}
inline Dict::const_iterator Dict::begin() const {
    return entries_.begin();
}
inline Dict::const_iterator Dict::end() const {
    return entries_.end();
}
inline Dict::iterator Dict::begin() {
    return entries_.begin();
}
inline Dict::iterator Dict::end() {
    return entries_.end();
}
inline const DictEntry& Dict::at(std::size_t index) const {
    return entries_.at(index);
}
inline void Dict::reserve(std::size_t n) {
    entries_.reserve(n);
}
template <class V>
inline Value& Dict::emplace(DictKey key, V&& value) {
    return entries_.emplace_back(std::move(key), std::forward<V>(value)).value;
}

// The shortest text that reads back as the same float, always with a decimal point
// ("20.0", "-2.5", "1.4"); exponent forms, infinities and NaN as std::to_chars gives them.
std::string formatFloat(float value);
// Lowercase hex in angle brackets with a blank after every four bytes: "<0a0b0c0d 0e0f>".
std::string describeBytes(const Bytes& bytes);
// Appends a dictionary's description, "{key: value, ...}" in its own order, as a Value
// holding it describes itself.
void appendDescription(std::string& out, const Dict& dict);
// Plain lowercase hex digits, no separators: "0a0b".
std::string hexString(const Bytes& bytes);

}  // namespace pyx
