// The values one ModemManager dictionary gave our fields, after conversion: integers, text or
// bytes, each field at most once.
#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <string>

#include "core/Value.h"
#include "sources/modem/ModemField.h"

namespace pyx::modem {

class FieldValues {
  public:
    // value must not be empty.
    void set(Field field, Value value) { values_[index(field)] = std::move(value); }
    // Takes every field other has.
    void merge(const FieldValues& other) {
        for (std::size_t i = 0; i < kFieldCount; ++i)
            if (!other.values_[i].isNull()) values_[i] = other.values_[i];
    }
    [[nodiscard]] bool has(Field field) const { return !values_[index(field)].isNull(); }

    // The field's integer, if it has one.
    [[nodiscard]] std::optional<std::int64_t> number(Field field) const {
        const auto& v = values_[index(field)];
        if (!v.isInteger()) return std::nullopt;
        return v.toInt64();
    }
    // The field's text or bytes, or nullptr.
    [[nodiscard]] const std::string* text(Field field) const {
        const auto& v = values_[index(field)];
        return v.isString() ? &v.asString() : nullptr;
    }
    [[nodiscard]] const Bytes* bytes(Field field) const {
        const auto& v = values_[index(field)];
        return v.isBytes() ? &v.asBytes() : nullptr;
    }

  private:
    static std::size_t index(Field field) { return static_cast<std::size_t>(field); }
    std::array<Value, kFieldCount> values_;  // empty: the field has no value
};

}  // namespace pyx::modem
