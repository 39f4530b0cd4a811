#include "tools/FlatFields.h"

#include "core/Format.h"

namespace pyx {

// One text per scalar field of a dictionary, named by its path.
void flatten(const Dict& dict, std::string& path, const Scalar& scalar) {
    const std::size_t mark = path.size();
    for (const auto& entry : dict) {
        if (mark > 0) path += '.';
        path += entry.key;
        flatten(entry.value, path, scalar);
        path.resize(mark);
    }
}

void flatten(const Value& value, std::string& path, const Scalar& scalar) {
    const std::size_t mark = path.size();
    if (value.isDict()) {
        flatten(value.asDict(), path, scalar);
    } else if (value.isArray()) {
        const Array& items = value.asArray();
        for (std::size_t i = 0; i < items.size(); ++i) {
            if (mark > 0) path += '.';
            path += std::to_string(i);
            flatten(items[i], path, scalar);
            path.resize(mark);
        }
    } else {
        scalar(path, value);
    }
}

std::string cellText(const Value& value) {
    switch (value.kind()) {
        case Value::Kind::Null:
            return {};
        case Value::Kind::Bool:
            return value.asBool() ? "true" : "false";
        case Value::Kind::Int:
            return std::to_string(value.asInt());
        case Value::Kind::UInt:
            return std::to_string(value.asUInt());
        case Value::Kind::Float:
            return formatFloat(value.asFloat());
        case Value::Kind::String:
            return value.asString();
        case Value::Kind::Data:
            return hexString(value.asBytes());
        default:
            return value.description();
    }
}

}  // namespace pyx
