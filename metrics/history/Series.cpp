#include "metrics/history/Series.h"

#include <cstdio>

namespace pyx {

Series::Series(SeriesKey key, std::size_t capacity, double slotMs)
    : key_(key), ring_(capacity, slotMs) {
    entity_.reserve(32);  // room for any entity, so that reusing the series does not allocate
    describe();
}

const Quantity& Series::quantity() const {
    return historyQuantities()[key_.quantity];
}

void Series::rekey(SeriesKey key) {
    key_ = key;
    clear();
    describe();
}

void Series::describe() {
    const Quantity& q = quantity();
    char text[32] = {};
    switch (q.pick) {
        case Pick::Field:
        case Pick::FirstEntry:
            break;
        case Pick::EachEntry:
            std::snprintf(text, sizeof text, "%.*s %lld", static_cast<int>(q.labelA.size()),
                          q.labelA.data(), static_cast<long long>(key_.a));
            break;
        case Pick::Strongest:
            if (q.keyB.empty())
                std::snprintf(text, sizeof text, "%.*s %lld", static_cast<int>(q.labelA.size()),
                              q.labelA.data(), static_cast<long long>(key_.a));
            else
                std::snprintf(text, sizeof text, "%lld/%lld", static_cast<long long>(key_.a),
                              static_cast<long long>(key_.b));
            break;
    }
    entity_.assign(text);
}

std::string Series::label() const {
    const Quantity& q = quantity();
    switch (q.pick) {
        case Pick::Field:
        case Pick::FirstEntry:
            return std::string(q.name);
        case Pick::EachEntry:
            return entity_ + " " + std::string(q.name);
        case Pick::Strongest:
            return entity_;
    }
    return {};
}

}  // namespace pyx
