// How a message class is declared: one field list per class generates its storage, its named
// accessors and (in messages/MessageDescriptors.cpp) its descriptor table.
//
// A field list is a macro taking a consumer F and naming one field per line, by kind:
//
//   F##_U64(tag, "key", name, Name)            optional uint64
//   F##_U32(tag, "key", name, Name)            optional uint32
//   F##_S32(tag, "key", name, Name)            optional sint32
//   F##_BOOL(tag, "key", name, Name)           optional bool
//   F##_ENUM(tag, "key", name, Name, Enum)     optional int32 enumeration (table kEnumNames)
//   F##_BYTES(tag, "key", name, Name)          optional bytes
//   F##_STRING(tag, "key", name, Name)         optional string
//   F##_MSG(tag, "key", name, Name, Class)     optional nested message
//   F##_MSGS(tag, "key", names, Names, name, Name, Class)   repeated nested message
//   F##_U32S(tag, "key", names, Names, name, Name)          repeated uint32 (packed)
//   F##_S32S(tag, "key", names, Names, name, Name)          repeated sint32 (packed)
//
// The class then reads
//
//   #define PYX_FIELDS_RxInfo(F) F##_S32(1, "rssi", rssi, Rssi) ...
//   class RxInfo {
//       PYX_MESSAGE_BODY(RxInfo)
//   };
//
// and messages/MessageDescriptors.cpp expands PYX_DEFINE_MESSAGE(RxInfo)
// (messages/MessageDefinition.h) for it, as for every class of messages/MessageClassList.h.
#pragma once

#include <cstddef>
#include <cstdint>
#include <memory>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

#include "core/Value.h"
#include "messages/EnumTable.h"
#include "messages/MessageDescriptor.h"
#include "messages/MessageRuntime.h"
#include "messages/PBDataReader.h"
#include "messages/PBDataWriter.h"
#include "messages/PBRepeated.h"

namespace pyx::detail {
constexpr std::uint64_t bitOf(unsigned index) {
    return std::uint64_t{1} << index;
}

// Lists of nested messages never hold null: adding null is refused as the platform's lists do.
template <class T>
const std::shared_ptr<T>& requireElement(const std::shared_ptr<T>& element) {
    if (!element) throw std::invalid_argument("a message list cannot hold a null element");
    return element;
}
}  // namespace pyx::detail

// ---- The operations every message class has. ----
#define PYX_MESSAGE_COMMON_API(Class)                                              \
    static const ::pyx::MessageDescriptor& descriptor();                           \
    static std::optional<Class> initWithData(std::span<const std::uint8_t> data) { \
        ::pyx::PBDataReader reader(data);                                          \
        Class message;                                                             \
        if (!message.readFrom(reader)) return std::nullopt;                        \
        return message;                                                            \
    }                                                                              \
    bool readFrom(::pyx::PBDataReader& reader) {                                   \
        return ::pyx::detail::readMessage(descriptor(), this, reader);             \
    }                                                                              \
    void writeTo(::pyx::PBDataWriter& writer) const {                              \
        ::pyx::detail::writeMessage(descriptor(), this, writer);                   \
    }                                                                              \
    [[nodiscard]] ::pyx::Bytes data() const {                                      \
        ::pyx::PBDataWriter writer;                                                \
        writeTo(writer);                                                           \
        return writer.takeData();                                                  \
    }                                                                              \
    [[nodiscard]] ::pyx::Dict dictionaryRepresentation() const {                   \
        return ::pyx::detail::dictionaryOf(descriptor(), this);                    \
    }                                                                              \
    [[nodiscard]] std::string description() const {                                \
        return ::pyx::detail::describeMessage(descriptor(), this);                 \
    }                                                                              \
    [[nodiscard]] bool isEqual(const Class& other) const {                         \
        return ::pyx::detail::messagesEqual(descriptor(), this, &other);           \
    }                                                                              \
    friend bool operator==(const Class& a, const Class& b) {                       \
        return a.isEqual(b);                                                       \
    }                                                                              \
    [[nodiscard]] std::uint64_t hash() const {                                     \
        return ::pyx::detail::messageHash(descriptor(), this);                     \
    }                                                                              \
    void mergeFrom(const Class& other) {                                           \
        ::pyx::detail::mergeMessage(descriptor(), this, &other);                   \
    }                                                                              \
    void copyTo(Class& other) const {                                              \
        ::pyx::detail::shallowCopy(descriptor(), this, &other);                    \
    }                                                                              \
    [[nodiscard]] Class copy() const {                                             \
        Class out;                                                                 \
        ::pyx::detail::deepCopy(descriptor(), this, &out);                         \
        return out;                                                                \
    }

// ---- Accessors, one macro per kind. ----
#define PYX_SCALAR_ACCESSORS(Type, name, Name, getter)          \
    [[nodiscard]] Type name() const {                           \
        return getter;                                          \
    }                                                           \
    void set##Name(Type value) {                                \
        name##_ = value;                                        \
        has_ |= ::pyx::detail::bitOf(kBit_##name);              \
    }                                                           \
    [[nodiscard]] bool has##Name() const {                      \
        return (has_ & ::pyx::detail::bitOf(kBit_##name)) != 0; \
    }                                                           \
    void setHas##Name(bool present) {                           \
        if (present) {                                          \
            has_ |= ::pyx::detail::bitOf(kBit_##name);          \
        } else {                                                \
            has_ &= ~::pyx::detail::bitOf(kBit_##name);         \
        }                                                       \
    }

#define PYX_ACCESSORS_U64(tag, key, name, Name) \
    PYX_SCALAR_ACCESSORS(std::uint64_t, name, Name, name##_)
#define PYX_ACCESSORS_U32(tag, key, name, Name) \
    PYX_SCALAR_ACCESSORS(std::uint32_t, name, Name, name##_)
#define PYX_ACCESSORS_S32(tag, key, name, Name) \
    PYX_SCALAR_ACCESSORS(std::int32_t, name, Name, name##_)
#define PYX_ACCESSORS_BOOL(tag, key, name, Name) PYX_SCALAR_ACCESSORS(bool, name, Name, name##_)
// An enumeration reads as 0 whenever its bit is clear, whatever value is stored.
#define PYX_ACCESSORS_ENUM(tag, key, name, Name, Enum) \
    PYX_SCALAR_ACCESSORS(std::int32_t, name, Name, has##Name() ? name##_ : 0)

#define PYX_OBJECT_ACCESSORS(Type, name, Name) \
    [[nodiscard]] const Type& name() const {   \
        return name##_;                        \
    }                                          \
    void set##Name(Type value) {               \
        name##_ = std::move(value);            \
    }                                          \
    [[nodiscard]] bool has##Name() const {     \
        return static_cast<bool>(name##_);     \
    }

#define PYX_ACCESSORS_BYTES(tag, key, name, Name) \
    PYX_OBJECT_ACCESSORS(std::optional<::pyx::Bytes>, name, Name)
#define PYX_ACCESSORS_STRING(tag, key, name, Name) \
    PYX_OBJECT_ACCESSORS(std::optional<std::string>, name, Name)
#define PYX_ACCESSORS_MSG(tag, key, name, Name, Class) \
    PYX_OBJECT_ACCESSORS(std::shared_ptr<Class>, name, Name)

#define PYX_ACCESSORS_MSGS(tag, key, names, Names, name, Name, Class)                    \
    [[nodiscard]] const ::pyx::MessageList<Class>& names() const {                       \
        return names##_;                                                                 \
    }                                                                                    \
    void set##Names(const std::vector<std::shared_ptr<Class>>& values) {                 \
        for (const auto& v : values) ::pyx::detail::requireElement(v);                   \
        names##_.assign(values.begin(), values.end());                                   \
        has_ |= ::pyx::detail::bitOf(kBit_##names);                                      \
    }                                                                                    \
    void clear##Names() {                                                                \
        names##_.clear();                                                                \
    }                                                                                    \
    void add##Name(std::shared_ptr<Class> value) {                                       \
        names##_.push_back(::pyx::detail::requireElement(value));                        \
        has_ |= ::pyx::detail::bitOf(kBit_##names);                                      \
    }                                                                                    \
    [[nodiscard]] std::size_t names##Count() const {                                     \
        return names##_.size();                                                          \
    }                                                                                    \
    [[nodiscard]] const std::shared_ptr<Class>& name##AtIndex(std::size_t index) const { \
        return ::pyx::detail::checkedAt(names##_, index);                                \
    }

#define PYX_LIST_ACCESSORS(Type, names, Names, name, Name)      \
    [[nodiscard]] const std::vector<Type>& names() const {      \
        return names##_;                                        \
    }                                                           \
    [[nodiscard]] std::size_t names##Count() const {            \
        return names##_.size();                                 \
    }                                                           \
    [[nodiscard]] Type name##AtIndex(std::size_t index) const { \
        return ::pyx::detail::checkedAt(names##_, index);       \
    }                                                           \
    void add##Name(Type value) {                                \
        names##_.push_back(value);                              \
    }                                                           \
    void clear##Names() {                                       \
        names##_.clear();                                       \
    }                                                           \
    void set##Names(const Type* values, std::size_t count) {    \
        names##_.assign(values, values + count);                \
    }

#define PYX_ACCESSORS_U32S(tag, key, names, Names, name, Name) \
    PYX_LIST_ACCESSORS(std::uint32_t, names, Names, name, Name)
#define PYX_ACCESSORS_S32S(tag, key, names, Names, name, Name) \
    PYX_LIST_ACCESSORS(std::int32_t, names, Names, name, Name)

// ---- Presence bits: one per field, in list order. ----
#define PYX_BIT_U64(tag, key, name, Name) kBit_##name,
#define PYX_BIT_U32(tag, key, name, Name) kBit_##name,
#define PYX_BIT_S32(tag, key, name, Name) kBit_##name,
#define PYX_BIT_BOOL(tag, key, name, Name) kBit_##name,
#define PYX_BIT_ENUM(tag, key, name, Name, Enum) kBit_##name,
#define PYX_BIT_BYTES(tag, key, name, Name) kBit_##name,
#define PYX_BIT_STRING(tag, key, name, Name) kBit_##name,
#define PYX_BIT_MSG(tag, key, name, Name, Class) kBit_##name,
#define PYX_BIT_MSGS(tag, key, names, Names, name, Name, Class) kBit_##names,
#define PYX_BIT_U32S(tag, key, names, Names, name, Name) kBit_##names,
#define PYX_BIT_S32S(tag, key, names, Names, name, Name) kBit_##names,

// ---- Storage. ----
#define PYX_STORAGE_U64(tag, key, name, Name) std::uint64_t name##_ = 0;
#define PYX_STORAGE_U32(tag, key, name, Name) std::uint32_t name##_ = 0;
#define PYX_STORAGE_S32(tag, key, name, Name) std::int32_t name##_ = 0;
#define PYX_STORAGE_BOOL(tag, key, name, Name) bool name##_ = false;
#define PYX_STORAGE_ENUM(tag, key, name, Name, Enum) std::int32_t name##_ = 0;
#define PYX_STORAGE_BYTES(tag, key, name, Name) std::optional<::pyx::Bytes> name##_;
#define PYX_STORAGE_STRING(tag, key, name, Name) std::optional<std::string> name##_;
#define PYX_STORAGE_MSG(tag, key, name, Name, Class) std::shared_ptr<Class> name##_;
#define PYX_STORAGE_MSGS(tag, key, names, Names, name, Name, Class) \
    ::pyx::MessageList<Class> names##_;
#define PYX_STORAGE_U32S(tag, key, names, Names, name, Name) ::pyx::PBRepeatedUInt32 names##_;
#define PYX_STORAGE_S32S(tag, key, names, Names, name, Name) ::pyx::PBRepeatedInt32 names##_;

#define PYX_MESSAGE_BODY(Class)                                     \
  public:                                                           \
    PYX_MESSAGE_COMMON_API(Class)                                   \
    PYX_FIELDS_##Class(PYX_ACCESSORS)                               \
                                                                    \
        private : enum FieldBit : unsigned {                        \
            PYX_FIELDS_##Class(PYX_BIT) kFieldCount                 \
        };                                                          \
    static_assert(kFieldCount <= 64, "one presence bit per field"); \
    std::uint64_t has_ = 0;                                         \
    PYX_FIELDS_##Class(PYX_STORAGE)
