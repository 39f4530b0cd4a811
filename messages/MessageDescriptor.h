// The static description of a message class: one entry per field (number, dictionary key,
// kind, where its storage is, its presence bit, its enumeration or nested class), in
// serialisation order, plus a dense index from field number to entry. Every generic
// operation of the message runtime is driven by these tables.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <string_view>
#include <vector>

#include "core/BlockPool.h"
#include "messages/EnumTable.h"

namespace pyx {

enum class FieldKind : std::uint8_t {
    UInt64,       // optional uint64
    UInt32,       // optional uint32
    SInt32,       // optional sint32 (zigzag)
    Bool,         // optional bool
    Enum,         // optional int32 enumeration, shown by name
    Data,         // optional bytes: std::optional<Bytes>
    String,       // optional string: std::optional<std::string>
    Message,      // optional nested message: std::shared_ptr<T>
    MessageList,  // repeated nested message: MessageList<T>
    UInt32List,   // repeated uint32, written packed: std::vector<std::uint32_t>
    SInt32List,   // repeated sint32, written packed: std::vector<std::int32_t>
};

struct MessageDescriptor;

// What a repeated nested message is kept in: its elements' pointers live in the block pool, as
// the elements do (a list is made for every record with one, and dropped with it).
template <class T>
using MessageList = std::vector<std::shared_ptr<T>, PoolAllocator<std::shared_ptr<T>>>;

// What the runtime needs to do with the storage of a nested message of class T without
// knowing T: one instance per nested class (see kSubMessageOps below).
struct SubMessageOps {
    const MessageDescriptor& (*descriptor)();
    // A single slot (std::shared_ptr<T>).
    const void* (*get)(const void* slot);
    void* (*makeNew)(void* slot);
    void (*share)(void* dstSlot, const void* srcSlot);
    // A list slot (MessageList<T>).
    std::size_t (*count)(const void* list);
    const void* (*at)(const void* list, std::size_t index);
    void* (*appendNew)(void* list);
    // Room for n elements in all, for a reader that knows how many records follow.
    void (*reserve)(void* list, std::size_t n);
    void (*appendShared)(void* dstList, const void* srcList, std::size_t index);
    void (*clear)(void* list);
};

struct FieldDescriptor {
    std::uint16_t tag;
    FieldKind kind;
    std::uint8_t bit;  // presence bit of scalars, "list created" bit of message lists
    std::uint32_t offset;
    std::string_view key;   // dictionary key
    std::string_view name;  // property name
    const EnumTable* enumTable = nullptr;
    const SubMessageOps* sub = nullptr;

    [[nodiscard]] constexpr bool isScalar() const { return kind <= FieldKind::Enum; }
};

// What the reader needs of the field a number names, in eight bytes: one load per field read.
struct ReadSlot {
    std::uint32_t offset;
    std::uint8_t bit;
    std::uint8_t kind;   // a FieldKind, or kNoKind where the reader stores nothing
    std::uint8_t index;  // the entry in the field table
    std::uint8_t unused;

    static constexpr std::uint8_t kNoKind = 0xFF;

    // A plain scalar: the reader's common case.
    [[nodiscard]] constexpr bool isScalar() const {
        return kind <= static_cast<std::uint8_t>(FieldKind::Enum);
    }
};
static_assert(sizeof(ReadSlot) == 8);

struct MessageDescriptor {
    std::string_view name;
    std::span<const FieldDescriptor> fields;
    std::span<const std::uint8_t> tagIndex;  // field number -> entry, kNoField when none
    std::uint32_t hasOffset;                 // where the presence bit-set is
    // Fields whose presence no bit tells (bytes, text, a nested message, a scalar list): with
    // the bits that are set, an upper bound on the entries of the dictionary form.
    std::uint32_t unflaggedFields;
    // What the reader looks numbers up in, by field number: the fields without those numbered
    // as metric tags, which the reader never stores.
    std::span<const ReadSlot> readSlots;

    static constexpr std::uint8_t kNoField = 0xFF;

    [[nodiscard]] const FieldDescriptor* fieldForTag(std::uint32_t tag) const {
        if (tag >= tagIndex.size()) return nullptr;
        const std::uint8_t index = tagIndex[tag];
        return index == kNoField ? nullptr : &fields[index];
    }
};

namespace detail {

template <std::size_t N>
constexpr std::size_t maxTag(const FieldDescriptor (&fields)[N]) {
    std::size_t m = 0;
    for (const auto& f : fields) m = f.tag > m ? f.tag : m;
    return m;
}

template <std::size_t Size, std::size_t N>
constexpr std::array<std::uint8_t, Size> buildTagIndex(const FieldDescriptor (&fields)[N]) {
    static_assert(N < MessageDescriptor::kNoField);
    std::array<std::uint8_t, Size> index{};
    for (auto& slot : index) slot = MessageDescriptor::kNoField;
    for (std::size_t i = 0; i < N; ++i) index[fields[i].tag] = static_cast<std::uint8_t>(i);
    return index;
}

template <std::size_t N>
constexpr std::uint32_t unflaggedFields(const FieldDescriptor (&fields)[N]) {
    std::uint32_t n = 0;
    for (const auto& f : fields) n += (f.isScalar() || f.kind == FieldKind::MessageList) ? 0 : 1;
    return n;
}

template <std::size_t N>
constexpr bool ascendingTags(const FieldDescriptor (&fields)[N]) {
    for (std::size_t i = 1; i < N; ++i) {
        if (fields[i - 1].tag >= fields[i].tag) return false;
    }
    return true;
}

template <class T>
using Slot = std::shared_ptr<T>;
template <class T>
using ListSlot = MessageList<T>;

template <class T>
inline constexpr SubMessageOps kSubMessageOps = {
    &T::descriptor,
    [](const void* slot) -> const void* { return static_cast<const Slot<T>*>(slot)->get(); },
    [](void* slot) -> void* {
        auto& s = *static_cast<Slot<T>*>(slot);
        s = std::allocate_shared<T>(PoolAllocator<T>{});
        return s.get();
    },
    [](void* dst, const void* src) {
        *static_cast<Slot<T>*>(dst) = *static_cast<const Slot<T>*>(src);
    },
    [](const void* list) { return static_cast<const ListSlot<T>*>(list)->size(); },
    [](const void* list, std::size_t i) -> const void* {
        return (*static_cast<const ListSlot<T>*>(list))[i].get();
    },
    [](void* list) -> void* {
        auto& l = *static_cast<ListSlot<T>*>(list);
        // Lists are short: start at four elements rather than growing through 1, 2 and 4.
        if (l.size() == l.capacity()) l.reserve(l.empty() ? 4 : 2 * l.size());
        return l.emplace_back(std::allocate_shared<T>(PoolAllocator<T>{})).get();
    },
    [](void* list, std::size_t n) { static_cast<ListSlot<T>*>(list)->reserve(n); },
    [](void* dst, const void* src, std::size_t i) {
        static_cast<ListSlot<T>*>(dst)->push_back((*static_cast<const ListSlot<T>*>(src))[i]);
    },
    [](void* list) { static_cast<ListSlot<T>*>(list)->clear(); },
};

}  // namespace detail

}  // namespace pyx
