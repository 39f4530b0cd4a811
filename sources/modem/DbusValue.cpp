#include "sources/modem/DbusValue.h"

#include <vector>

namespace pyx::modem {

Value toValue(const sdbus::Variant& variant) {
    const std::string type = variant.peekValueType();
    try {
        if (type == "d") return Value(static_cast<float>(variant.get<double>()));
        if (type == "u") return Value(variant.get<std::uint32_t>());
        if (type == "q") return Value(static_cast<std::uint32_t>(variant.get<std::uint16_t>()));
        if (type == "y") return Value(static_cast<std::uint32_t>(variant.get<std::uint8_t>()));
        if (type == "t") return Value(variant.get<std::uint64_t>());
        if (type == "i") return Value(variant.get<std::int32_t>());
        if (type == "n") return Value(static_cast<std::int32_t>(variant.get<std::int16_t>()));
        if (type == "x") return Value(variant.get<std::int64_t>());
        if (type == "b") return Value(variant.get<bool>());
        if (type == "s") return Value(variant.get<std::string>());
        if (type == "o") return Value(std::string(variant.get<sdbus::ObjectPath>()));
        if (type == "ay") return Value(variant.get<std::vector<std::uint8_t>>());
        if (type == "a{sv}")
            return Value(toDict(variant.get<std::map<std::string, sdbus::Variant>>()));
        if (type == "ao") {
            Array out;
            for (const auto& path : variant.get<std::vector<sdbus::ObjectPath>>())
                out.emplace_back(std::string(path));
            return Value(std::move(out));
        }
        if (type == "as") {
            Array out;
            for (auto& text : variant.get<std::vector<std::string>>())
                out.emplace_back(std::move(text));
            return Value(std::move(out));
        }
        if (type == "aa{sv}") {
            Array out;
            for (const auto& d : variant.get<std::vector<std::map<std::string, sdbus::Variant>>>())
                out.emplace_back(toDict(d));
            return Value(std::move(out));
        }
    } catch (const sdbus::Error&) {
        // A variant whose content does not read as its signature says: nothing usable.
    }
    return Value();
}

Dict toDict(const std::map<std::string, sdbus::Variant>& dictionary) {
    Dict out;
    out.reserve(dictionary.size());
    for (const auto& [key, variant] : dictionary) out.append(key, toValue(variant));
    return out;
}

}  // namespace pyx::modem
