#include "core/ValueJson.h"

#include <gtest/gtest.h>

using pyx::Array;
using pyx::Bytes;
using pyx::Dict;
using pyx::Value;

TEST(ValueJson, EveryKindHasItsJsonForm) {
    Value v(Dict{{"z", Value(std::int64_t{-3})},
                 {"u", Value(std::uint64_t{7})},
                 {"f", Value(1.4F)},
                 {"b", Value(false)},
                 {"s", Value("text")},
                 {"bytes", Value(Bytes{0x0A, 0xFF})},
                 {"a", Value(Array{Value(1), Value(Dict{})})},
                 {"n", Value()}});
    EXPECT_EQ(pyx::toJson(v).dump(),
              R"({"z":-3,"u":7,"f":1.4,"b":false,"s":"text","bytes":"0aff","a":[1,{}],"n":null})");
}

TEST(ValueJson, EmptyCases) {
    EXPECT_EQ(pyx::toJson(Value(Dict{})).dump(), "{}");
    EXPECT_EQ(pyx::toJson(Value(Array{})).dump(), "[]");
    EXPECT_EQ(pyx::toJson(Value(Bytes{})).dump(), R"("")");
    EXPECT_EQ(pyx::toJson(Value(-10.5F)).dump(), "-10.5");
}
