// The one value type of the system: what the baseband's event objects, the decoded metric
// dictionaries and the screens' cells are made of.
//
// A Value is null, a bool, a signed or unsigned 64-bit integer, a 32-bit float, a string,
// bytes, an array, or a dictionary with string keys that keeps insertion order (a decoded
// message's field order is its enumeration order everywhere).
#pragma once

#include <atomic>
#include <cstddef>
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
    static DictKey lasting(std::string_view key) { return DictKey(Lasting{key}); }
    // The same, for a builder that makes the key where the entry is kept (Dict::emplace):
    // nothing is made and then moved.
    struct Lasting {
        std::string_view text;
    };
    DictKey(Lasting key)
        : data_(key.text.data()), size_(static_cast<std::uint32_t>(key.text.size())) {}

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
    [[nodiscard]] const char* data() const { return data_; }
    [[nodiscard]] std::size_t size() const { return size_; }
    [[nodiscard]] bool empty() const { return size_ == 0; }
    // Whether dropping the key has anything to free (a long key of its own).
    [[nodiscard]] bool ownsHeap() const { return storage_ == Storage::Heap; }

    friend bool operator==(const DictKey& a, const DictKey& b) { return a.view() == b.view(); }
    friend bool operator==(const DictKey& a, std::string_view b) { return a.view() == b; }
    friend bool operator==(const DictKey& a, const std::string& b) { return a.view() == b; }
    friend bool operator==(const DictKey& a, const char* b) { return a.view() == b; }
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
//
// Copies share their entries until one of them is changed (copy on write): the store keeps a
// decoded record and hands its lists to the list holders, the screens take copies of both, and
// none of that copies an entry. The entries sit in one pooled block after a small header (a
// count of the dictionaries sharing them, the size, the room); an empty dictionary has none.
// Whatever gives mutable access (a non-const begin, end or find, set, append, emplace, erase,
// reserve) first makes the entries this dictionary's own, so a reference or pointer into a
// dictionary is good until the next such call or until it is dropped, and a dictionary shared
// with another thread is only read there (as every value handed between threads is).
class Dict {
  public:
    using iterator = DictEntry*;
    using const_iterator = const DictEntry*;

    Dict() = default;
    ~Dict() { drop(); }
    Dict(const Dict& other) noexcept : rep_(other.rep_) {
        if (rep_ != nullptr) rep_->shares.fetch_add(1, std::memory_order_relaxed);
    }
    Dict(Dict&& other) noexcept : rep_(other.rep_) { other.rep_ = nullptr; }
    Dict& operator=(const Dict& other) noexcept {
        Dict copy(other);
        std::swap(rep_, copy.rep_);
        return *this;
    }
    Dict& operator=(Dict&& other) noexcept {
        if (this != &other) {
            drop();
            rep_ = other.rep_;
            other.rep_ = nullptr;
        }
        return *this;
    }
    Dict(std::initializer_list<DictEntry> entries);

    [[nodiscard]] std::size_t size() const { return rep_ == nullptr ? 0 : rep_->size; }
    [[nodiscard]] bool empty() const { return size() == 0; }
    [[nodiscard]] const_iterator begin() const;
    [[nodiscard]] const_iterator end() const;
    [[nodiscard]] iterator begin();
    [[nodiscard]] iterator end();
    // Throws std::out_of_range past the end.
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
    // the Value would be made of (an integer, a text, a list or a dictionary). The decoders
    // build every dictionary this way, with a field table's key as DictKey::Lasting, made in
    // the entry too.
    template <class V>
    Value& emplace(DictKey key, V&& value) {
        return put(std::move(key), std::forward<V>(value));
    }
    template <class V>
    Value& emplace(DictKey::Lasting key, V&& value) {
        return put(key, std::forward<V>(value));
    }
    // Removes the key if present; returns whether it was.
    bool erase(std::string_view key);
    void reserve(std::size_t n);

    friend bool operator==(const Dict& a, const Dict& b);

  private:
    struct Rep {
        std::atomic<std::uint32_t> shares;  // dictionaries holding these entries
        std::uint32_t size;
        std::uint32_t room;
        std::uint32_t unused;
    };
    static constexpr std::uint32_t kFirstRoom = 4;

    [[nodiscard]] static DictEntry* entriesOf(Rep* rep);
    [[nodiscard]] static const DictEntry* entriesOf(const Rep* rep);
    [[nodiscard]] static Rep* allocate(std::size_t room);
    [[noreturn]] static void tooLarge();
    static void destroy(Rep* rep) noexcept;
    [[nodiscard]] std::ptrdiff_t indexOf(std::string_view key) const;
    [[nodiscard]] bool owned() const {
        return rep_ != nullptr && rep_->shares.load(std::memory_order_acquire) == 1;
    }
    // Drops this dictionary's hold on its entries; the last one to hold them frees them.
    void drop() noexcept {
        if (rep_ == nullptr) return;
        if (rep_->shares.load(std::memory_order_acquire) == 1 ||
            rep_->shares.fetch_sub(1, std::memory_order_acq_rel) == 1) {
            destroy(rep_);
        }
        rep_ = nullptr;
    }
    // Makes the entries this dictionary's own (a copy of shared ones), with room for `extra`
    // more; an empty dictionary stays without a block.
    void own(std::size_t extra = 0) {
        if (rep_ == nullptr ? extra != 0 : (!owned() || rep_->size + extra > rep_->room))
            makeOwn(extra);
    }
    // What own() does when the entries are shared, missing or full; out of line, so that every
    // builder's append stays a check and a store.
    void makeOwn(std::size_t extra);
    // Appends an entry made of key and value. When the entries must first move (shared,
    // missing or full), the key and the value are made first: either may be a reference into
    // these very entries.
    template <class K, class V>
    Value& put(K&& key, V&& value);
    // Entries of its own with room for at least `room`: the old ones copied (shared) or moved.
    void reallocate(std::size_t room);

    Rep* rep_ = nullptr;
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
    template <class K, class V>
    DictEntry(K&& k, V&& v) : key(std::forward<K>(k)), value(std::forward<V>(v)) {}

    DictKey key;
    Value value;
    friend bool operator==(const DictEntry& a, const DictEntry& b) = default;
};

inline DictEntry* Dict::entriesOf(Rep* rep) {
    return reinterpret_cast<DictEntry*>(rep + 1);
}
inline const DictEntry* Dict::entriesOf(const Rep* rep) {
    return reinterpret_cast<const DictEntry*>(rep + 1);
}
inline Dict::const_iterator Dict::begin() const {
    return rep_ == nullptr ? nullptr : entriesOf(rep_);
}
inline Dict::const_iterator Dict::end() const {
    return rep_ == nullptr ? nullptr : entriesOf(rep_) + rep_->size;
}
inline Dict::iterator Dict::begin() {
    own();
    return rep_ == nullptr ? nullptr : entriesOf(rep_);
}
inline Dict::iterator Dict::end() {
    own();
    return rep_ == nullptr ? nullptr : entriesOf(rep_) + rep_->size;
}
inline Dict::Rep* Dict::allocate(std::size_t room) {
    static_assert(alignof(DictEntry) <= 16 && sizeof(Rep) % alignof(DictEntry) == 0,
                  "the entries follow the header, aligned as pooled blocks are");
    if (room > 0xFFFFFFFFU) tooLarge();
    void* const block = poolAllocate(sizeof(Rep) + room * sizeof(DictEntry));
    return ::new (block) Rep{{1}, 0, static_cast<std::uint32_t>(room), 0};
}
inline void Dict::reserve(std::size_t n) {
    if (rep_ == nullptr) {
        if (n != 0) rep_ = allocate(n);
    } else if (n > rep_->room || !owned()) {
        reallocate(n > rep_->size ? n : rep_->size);
    }
}
template <class K, class V>
inline Value& Dict::put(K&& key, V&& value) {
    if (rep_ == nullptr || rep_->size == rep_->room || !owned()) [[unlikely]] {
        DictKey madeKey(std::forward<K>(key));
        Value madeValue(std::forward<V>(value));
        makeOwn(1);
        DictEntry* const entry = ::new (entriesOf(rep_) + rep_->size)
            DictEntry(std::move(madeKey), std::move(madeValue));
        ++rep_->size;
        return entry->value;
    }
    DictEntry* const entry = ::new (entriesOf(rep_) + rep_->size)
        DictEntry(std::forward<K>(key), std::forward<V>(value));
    ++rep_->size;
    return entry->value;
}
inline void Dict::destroy(Rep* rep) noexcept {
    DictEntry* const entries = entriesOf(rep);
    for (std::uint32_t i = 0; i < rep->size; ++i) {
        // Most entries hold a number under a table's key: nothing to free, nothing to run.
        DictEntry& e = entries[i];
        if (e.key.ownsHeap() || e.value.kind() >= Value::Kind::String) e.~DictEntry();
    }
    const std::size_t bytes = sizeof(Rep) + std::size_t{rep->room} * sizeof(DictEntry);
    rep->~Rep();
    poolRelease(rep, bytes);
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
