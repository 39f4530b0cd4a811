// The descriptor table of a message class, generated from its field list. Included only by
// messages/MessageDescriptors.cpp: PYX_DEFINE_MESSAGE(Class) once per class.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "messages/KBBMetricUtility.h"
#include "messages/Message.h"

#define PYX_FD_SCALAR(Kind, tag, key, name)                                     \
    ::pyx::FieldDescriptor{tag,                                                 \
                           ::pyx::FieldKind::Kind,                              \
                           Self::kBit_##name,                                   \
                           static_cast<std::uint32_t>(offsetof(Self, name##_)), \
                           key,                                                 \
                           #name,                                               \
                           nullptr,                                             \
                           nullptr},

#define PYX_FD_U64(tag, key, name, Name) PYX_FD_SCALAR(UInt64, tag, key, name)
#define PYX_FD_U32(tag, key, name, Name) PYX_FD_SCALAR(UInt32, tag, key, name)
#define PYX_FD_S32(tag, key, name, Name) PYX_FD_SCALAR(SInt32, tag, key, name)
#define PYX_FD_BOOL(tag, key, name, Name) PYX_FD_SCALAR(Bool, tag, key, name)
#define PYX_FD_BYTES(tag, key, name, Name) PYX_FD_SCALAR(Data, tag, key, name)
#define PYX_FD_STRING(tag, key, name, Name) PYX_FD_SCALAR(String, tag, key, name)
#define PYX_FD_U32S(tag, key, names, Names, name, Name) PYX_FD_SCALAR(UInt32List, tag, key, names)
#define PYX_FD_S32S(tag, key, names, Names, name, Name) PYX_FD_SCALAR(SInt32List, tag, key, names)
#define PYX_FD_ENUM(tag, key, name, Name, EnumName)                             \
    ::pyx::FieldDescriptor{tag,                                                 \
                           ::pyx::FieldKind::Enum,                              \
                           Self::kBit_##name,                                   \
                           static_cast<std::uint32_t>(offsetof(Self, name##_)), \
                           key,                                                 \
                           #name,                                               \
                           &::pyx::k##EnumName##Names,                          \
                           nullptr},
#define PYX_FD_MSG(tag, key, name, Name, Class)                                 \
    ::pyx::FieldDescriptor{tag,                                                 \
                           ::pyx::FieldKind::Message,                           \
                           Self::kBit_##name,                                   \
                           static_cast<std::uint32_t>(offsetof(Self, name##_)), \
                           key,                                                 \
                           #name,                                               \
                           nullptr,                                             \
                           &::pyx::detail::kSubMessageOps<Class>},
#define PYX_FD_MSGS(tag, key, names, Names, name, Name, Class)                   \
    ::pyx::FieldDescriptor{tag,                                                  \
                           ::pyx::FieldKind::MessageList,                        \
                           Self::kBit_##names,                                   \
                           static_cast<std::uint32_t>(offsetof(Self, names##_)), \
                           key,                                                  \
                           #names,                                               \
                           nullptr,                                              \
                           &::pyx::detail::kSubMessageOps<Class>},

namespace pyx::detail {

// The reader's slots: the fields by number, without those numbered as metric tags, which the
// reader never stores (it takes such a number for a metric tag). With them the reader asks the
// metric-tag table only about the numbers it finds no field for.
template <std::size_t Size, std::size_t N>
constexpr std::array<::pyx::ReadSlot, Size> buildReadSlots(const FieldDescriptor (&fields)[N]) {
    std::array<::pyx::ReadSlot, Size> slots{};
    for (auto& slot : slots) slot = {0, 0, ::pyx::ReadSlot::kNoKind, 0, 0};
    for (std::size_t i = 0; i < N; ++i) {
        slots[fields[i].tag] = {fields[i].offset, fields[i].bit,
                                static_cast<std::uint8_t>(fields[i].kind),
                                static_cast<std::uint8_t>(i), 0};
    }
    for (const auto& e : KBBMetricUtility::kEntries) {
        if (e.tag < Size) slots[e.tag].kind = ::pyx::ReadSlot::kNoKind;
    }
    return slots;
}

}  // namespace pyx::detail

// offsetof on a class with private, non-trivial members is supported by the compiler for
// classes without virtual bases; the warning about it is silenced only around the tables.
#define PYX_DEFINE_MESSAGE(Class)                                                           \
    _Pragma("GCC diagnostic push") _Pragma("GCC diagnostic ignored \"-Winvalid-offsetof\"") \
        const ::pyx::MessageDescriptor&                                                     \
        Class::descriptor() {                                                               \
        using Self = Class;                                                                 \
        static constexpr ::pyx::FieldDescriptor kFields[] = {PYX_FIELDS_##Class(PYX_FD)};   \
        static_assert(::pyx::detail::ascendingTags(kFields), "fields in tag order");        \
        static constexpr auto kTagIndex =                                                   \
            ::pyx::detail::buildTagIndex<::pyx::detail::maxTag(kFields) + 1>(kFields);      \
        static constexpr auto kReadSlots =                                                  \
            ::pyx::detail::buildReadSlots<::pyx::detail::maxTag(kFields) + 1>(kFields);     \
        static constexpr ::pyx::MessageDescriptor kDescriptor{                              \
            #Class,                                                                         \
            kFields,                                                                        \
            kTagIndex,                                                                      \
            static_cast<std::uint32_t>(offsetof(Self, has_)),                               \
            ::pyx::detail::unflaggedFields(kFields),                                        \
            kReadSlots};                                                                    \
        return kDescriptor;                                                                 \
    }                                                                                       \
    _Pragma("GCC diagnostic pop")
