#include "core/ValueJson.h"

#include <cmath>
#include <cstdlib>

namespace pyx {

nlohmann::ordered_json toJson(const Value& value) {
    using Kind = Value::Kind;
    switch (value.kind()) {
        case Kind::Null:
            return nullptr;
        case Kind::Bool:
            return value.asBool();
        case Kind::Int:
            return value.asInt();
        case Kind::UInt:
            return value.asUInt();
        case Kind::Float: {
            // Widen through the float's shortest text so that 1.4f prints as 1.4, not as
            // the double nearest to the float (1.399999976158142).
            const float f = value.asFloat();
            if (!std::isfinite(f)) return nullptr;
            return std::strtod(formatFloat(f).c_str(), nullptr);
        }
        case Kind::String:
            return value.asString();
        case Kind::Data:
            return hexString(value.asBytes());
        case Kind::List: {
            auto out = nlohmann::ordered_json::array();
            for (const auto& v : value.asArray()) out.push_back(toJson(v));
            return out;
        }
        case Kind::Map: {
            auto out = nlohmann::ordered_json::object();
            for (const auto& [k, v] : value.asDict()) out[k] = toJson(v);
            return out;
        }
    }
    return nullptr;
}

}  // namespace pyx
