#include "core/Value.h"

#include <gtest/gtest.h>

#include <limits>
#include <sstream>
#include <stdexcept>
#include <string>
#include <string_view>
#include <thread>
#include <utility>
#include <vector>

using pyx::Array;
using pyx::Bytes;
using pyx::Dict;
using pyx::Value;

TEST(ValueDescription, IntegersAreDecimal) {
    EXPECT_EQ(Value(std::int64_t{-42}).description(), "-42");
    EXPECT_EQ(Value(std::uint64_t{18446744073709551615ULL}).description(), "18446744073709551615");
    EXPECT_EQ(Value(std::uint32_t{0}).description(), "0");
}

TEST(ValueDescription, BooleansAreOneOrZero) {
    EXPECT_EQ(Value(true).description(), "1");
    EXPECT_EQ(Value(false).description(), "0");
}

TEST(ValueDescription, FloatsAreShortestWithDecimalPoint) {
    EXPECT_EQ(Value(20.0F).description(), "20.0");
    EXPECT_EQ(Value(-2.5F).description(), "-2.5");
    EXPECT_EQ(Value(1.4F).description(), "1.4");
    EXPECT_EQ(Value(0.0F).description(), "0.0");
    EXPECT_EQ(Value(-10.5F).description(), "-10.5");
    EXPECT_EQ(Value(15.5F).description(), "15.5");
    EXPECT_EQ(Value(0.1F).description(), "0.1");
}

TEST(ValueDescription, StringsAsTheyAre) {
    EXPECT_EQ(Value("KLTE_RRC_STATE_IDLE").description(), "KLTE_RRC_STATE_IDLE");
    EXPECT_EQ(Value("").description(), "");
}

TEST(ValueDescription, BytesAsGroupedLowercaseHex) {
    EXPECT_EQ(Value(Bytes{0x0a, 0x0b, 0x0c, 0x0d, 0x0e, 0x0f}).description(), "<0a0b0c0d 0e0f>");
    EXPECT_EQ(Value(Bytes{0xAB, 0xCD, 0xEF, 0x01}).description(), "<abcdef01>");
    EXPECT_EQ(Value(Bytes{}).description(), "<>");
}

TEST(ValueDescription, ArraysAndDictionariesNestOnOneLine) {
    Value v(Dict{{"a", Value(std::int64_t{1})},
                 {"list", Value(Array{Value(1.5F), Value("x")})},
                 {"inner", Value(Dict{{"b", Value(true)}})}});
    EXPECT_EQ(v.description(), "{a: 1, list: [1.5, x], inner: {b: 1}}");
    EXPECT_EQ(Value(Array{}).description(), "[]");
    EXPECT_EQ(Value(Dict{}).description(), "{}");
    EXPECT_EQ(Value().description(), "(null)");
}

TEST(ValueDict, KeepsInsertionOrder) {
    Dict d;
    d.set("zeta", Value(std::int64_t{1}));
    d.set("alpha", Value(std::int64_t{2}));
    d.set("mid", Value(std::int64_t{3}));
    std::vector<std::string> keys;
    for (const auto& e : d) keys.push_back(e.key);
    EXPECT_EQ(keys, (std::vector<std::string>{"zeta", "alpha", "mid"}));
}

TEST(ValueDict, SetReplacesInPlaceAndEraseRemoves) {
    Dict d{{"a", Value(1)}, {"b", Value(2)}, {"c", Value(3)}};
    d.set("b", Value("two"));
    EXPECT_EQ(d.at(1).key, "b");
    EXPECT_EQ(d.at(1).value, Value("two"));
    EXPECT_TRUE(d.erase("a"));
    EXPECT_FALSE(d.erase("a"));
    EXPECT_EQ(d.size(), 2U);
    EXPECT_EQ(d.at(0).key, "b");
    EXPECT_EQ(d.find("zzz"), nullptr);
}

TEST(ValueDict, EmplaceAppendsAnEntryBuiltInPlace) {
    Dict d{{"a", Value(1)}};
    const std::string longKey = "mo_signalling_ac_barring_for_special_ac";
    Value& stored = d.emplace(longKey, Value(Array{Value(2), Value(3)}));
    EXPECT_EQ(stored, Value(Array{Value(2), Value(3)}));
    d.emplace("b", Value("text"));
    EXPECT_EQ(
        d,
        (Dict{{"a", Value(1)}, {longKey, Value(Array{Value(2), Value(3)})}, {"b", Value("text")}}));
}

// Where a dictionary's entries are, without asking for mutable access (which would make them
// its own).
const pyx::DictEntry* entriesOf(const Dict& d) {
    return d.begin();
}

TEST(ValueDict, CopiesShareEntriesUntilOneIsChanged) {
    Dict original{{"rsrp", Value(-95)}, {"name", Value("cell")}};
    Dict copy = original;
    EXPECT_EQ(entriesOf(copy), entriesOf(original));

    copy.set("rsrp", Value(-80));
    EXPECT_NE(entriesOf(copy), entriesOf(original));
    EXPECT_EQ(original, (Dict{{"rsrp", Value(-95)}, {"name", Value("cell")}}));
    EXPECT_EQ(copy, (Dict{{"rsrp", Value(-80)}, {"name", Value("cell")}}));

    // Every way of changing a copy leaves the original as it was.
    const Dict kept = original;
    Dict appended = original;
    appended.append("pci", Value(7));
    Dict erased = original;
    EXPECT_TRUE(erased.erase("rsrp"));
    Dict found = original;
    *found.find("name") = Value("other");
    Dict iterated = original;
    for (auto& e : iterated) e.value = Value(0);
    Dict reserved = original;
    reserved.reserve(10);
    reserved.emplace("extra", Value(1));
    EXPECT_EQ(original, kept);
    EXPECT_EQ(original, (Dict{{"rsrp", Value(-95)}, {"name", Value("cell")}}));
    EXPECT_EQ(appended.size(), 3U);
    EXPECT_EQ(erased, (Dict{{"name", Value("cell")}}));
    EXPECT_EQ(*found.find("name"), Value("other"));
    EXPECT_EQ(iterated, (Dict{{"rsrp", Value(0)}, {"name", Value(0)}}));
    EXPECT_EQ(reserved.size(), 3U);
}

// An entry made from another entry of the same dictionary, when the entries must move first
// (full, or shared with a copy): the key and value are taken before they move.
TEST(ValueDict, AnEntryMadeFromItsOwnEntriesWhileTheyMove) {
    Dict full;
    full.reserve(1);
    full.append("a_key_longer_than_sixteen", Value(std::string(40, 'v')));
    full.emplace(full.at(0).key, full.at(0).value);
    EXPECT_EQ(full.at(1).key, "a_key_longer_than_sixteen");
    EXPECT_EQ(full.at(1).value, Value(std::string(40, 'v')));

    Dict shared{{"a_key_longer_than_sixteen", Value(std::string(40, 'w'))}};
    const Dict copy = shared;
    shared.emplace(copy.at(0).key, shared.find("a_key_longer_than_sixteen")->asString());
    EXPECT_EQ(shared.size(), 2U);
    EXPECT_EQ(shared.at(1).value, Value(std::string(40, 'w')));
    EXPECT_EQ(copy.size(), 1U);
}

TEST(ValueDict, LookingUpAnAbsentKeyDoesNotCopy) {
    const Dict original{{"a", Value(1)}};
    Dict copy = original;
    EXPECT_EQ(copy.find("b"), nullptr);
    EXPECT_FALSE(copy.erase("b"));
    EXPECT_EQ(entriesOf(copy), entriesOf(original));
}

TEST(ValueDict, ANestedDictionaryChangedInACopyLeavesTheOriginal) {
    Dict inner{{"pci", Value(1)}};
    const Value original(Dict{{"cell", Value(inner)}, {"list", Value(Array{Value(inner)})}});
    Value copy = original;
    copy.asDict().find("cell")->asDict().set("pci", Value(2));
    copy.asDict().find("list")->asArray()[0].asDict().set("pci", Value(3));
    EXPECT_EQ(original.asDict().find("cell")->asDict(), inner);
    EXPECT_EQ(original.asDict().find("list")->asArray()[0].asDict(), inner);
    EXPECT_EQ(copy.description(), "{cell: {pci: 2}, list: [{pci: 3}]}");
}

TEST(ValueDict, GrowsKeepingOrderAndEveryKindOfEntry) {
    Dict d;
    for (int i = 0; i < 1000; ++i) {
        const std::string key =
            (i % 2 == 0 ? "a_key_longer_than_sixteen_" : "k") + std::to_string(i);
        if (i % 3 == 0) {
            d.append(key, Value(std::string(40, 'x')));
        } else {
            d.append(key, Value(i));
        }
    }
    const Dict before = d;
    ASSERT_EQ(d.size(), 1000U);
    EXPECT_TRUE(d.erase("k501"));
    EXPECT_EQ(d.size(), 999U);
    EXPECT_EQ(d.at(500).key, "a_key_longer_than_sixteen_500");
    EXPECT_EQ(d.at(501).key, "a_key_longer_than_sixteen_502");
    EXPECT_EQ(*d.find("k997"), Value(997));
    EXPECT_EQ(*d.find("a_key_longer_than_sixteen_996"), Value(std::string(40, 'x')));
    EXPECT_EQ(before.size(), 1000U);
    EXPECT_EQ(*before.find("k501"), Value(std::string(40, 'x')));
}

TEST(ValueDict, AnEmptyDictionaryHasNoEntriesAndAtChecksItsIndex) {
    Dict d;
    EXPECT_EQ(d.begin(), d.end());
    EXPECT_TRUE(d.empty());
    d.reserve(0);
    EXPECT_EQ(entriesOf(d), nullptr);
    EXPECT_THROW((void)d.at(0), std::out_of_range);
    d.append("a", Value(1));
    EXPECT_THROW((void)d.at(1), std::out_of_range);
    EXPECT_EQ(d, (Dict{{"a", Value(1)}}));
    EXPECT_NE(d, Dict{});
}

TEST(ValueDict, AssignmentsOfItselfAndOfOthers) {
    Dict d{{"a", Value("one")}};
    const Dict& same = d;
    d = same;
    EXPECT_EQ(d, (Dict{{"a", Value("one")}}));
    Dict other{{"b", Value(2)}};
    d = other;
    EXPECT_EQ(entriesOf(d), entriesOf(other));
    Dict moved = std::move(other);
    EXPECT_EQ(moved, (Dict{{"b", Value(2)}}));
    d = std::move(moved);
    EXPECT_EQ(d, (Dict{{"b", Value(2)}}));
}

// A dictionary handed to other threads: each copies it, changes its copy and drops it while
// the others still read theirs, as records go from the intake to the screens.
TEST(ValueDict, CopiesOnOtherThreadsStayApart) {
    const Dict shared{{"rsrp", Value(-95)},
                      {"cells", Value(Array{Value(Dict{{"pci", Value(1)}})})}};
    std::vector<std::thread> threads;
    std::vector<int> failures(4, 0);
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&shared, &failures, t] {
            for (int i = 0; i < 2000; ++i) {
                Dict mine = shared;
                mine.set("rsrp", Value(t));
                mine.find("cells")->asArray()[0].asDict().set("pci", Value(i));
                const Dict again = shared;
                if (*again.find("rsrp") != Value(-95) || *mine.find("rsrp") != Value(t))
                    ++failures[t];
            }
        });
    }
    for (auto& th : threads) th.join();
    EXPECT_EQ(failures, std::vector<int>(4, 0));
    EXPECT_EQ(Value(shared).description(), "{rsrp: -95, cells: [{pci: 1}]}");
}

TEST(ValueDictKey, ALastingKeyIsTheTableTextItself) {
    static constexpr std::string_view kTableKey = "mo_signalling_ac_barring_for_special_ac";
    const pyx::DictKey key = pyx::DictKey::lasting(kTableKey);
    EXPECT_EQ(key.data(), kTableKey.data());
    const pyx::DictKey copy = key;  // NOLINT(performance-unnecessary-copy-initialization)
    EXPECT_EQ(copy.data(), kTableKey.data());
    Dict d;
    d.emplace(pyx::DictKey::lasting(kTableKey), Value(1));
    const Dict copied = d;  // NOLINT(performance-unnecessary-copy-initialization)
    EXPECT_EQ(copied.at(0).key.data(), kTableKey.data());
    EXPECT_EQ(copied.at(0).key, kTableKey);
}

TEST(ValueDictKey, AnyOtherKeyIsACopyOfItsOwn) {
    for (const std::string text : {"", "pci", "sixteen_chars_16", "seventeen_chars_17",
                                   "mo_signalling_ac_barring_for_special_ac"}) {
        std::string source = text;
        pyx::DictKey key(source);
        source.assign(source.size(), '#');  // the key does not follow its source
        EXPECT_EQ(key, text);
        EXPECT_EQ(key.size(), text.size());
        pyx::DictKey copy = key;
        EXPECT_EQ(copy, text);
        if (!text.empty()) {
            EXPECT_NE(copy.data(), key.data());
        }
        pyx::DictKey moved = std::move(copy);
        EXPECT_EQ(moved, text);
        pyx::DictKey assigned("x");
        assigned = moved;
        EXPECT_EQ(assigned, text);
        assigned = pyx::DictKey("a key long enough for the heap");
        EXPECT_EQ(assigned, "a key long enough for the heap");
        assigned = std::move(moved);
        EXPECT_EQ(assigned, text);
        EXPECT_EQ(std::string(assigned), text);
    }
}

TEST(ValueDictKey, ComparesAndPrintsAsItsText) {
    const pyx::DictKey key("rsrp0");
    EXPECT_TRUE(key == "rsrp0");
    EXPECT_TRUE(key == std::string("rsrp0"));
    EXPECT_TRUE(key == std::string_view("rsrp0"));
    EXPECT_TRUE(key == pyx::DictKey::lasting("rsrp0"));
    EXPECT_FALSE(key == "rsrp1");
    std::ostringstream out;
    out << key;
    EXPECT_EQ(out.str(), "rsrp0");
    EXPECT_EQ("inst_values." + std::string(key), "inst_values.rsrp0");
}

TEST(ValueDict, EqualityIsOrderSensitive) {
    Dict a{{"x", Value(1)}, {"y", Value(2)}};
    Dict b{{"y", Value(2)}, {"x", Value(1)}};
    EXPECT_FALSE(a == b);
    EXPECT_TRUE(a == (Dict{{"x", Value(1)}, {"y", Value(2)}}));
}

TEST(ValueKinds, EachConstructorGivesItsKind) {
    EXPECT_TRUE(Value().isNull());
    EXPECT_TRUE(Value(true).isBool());
    EXPECT_TRUE(Value(std::int32_t{-1}).isInt());
    EXPECT_TRUE(Value(std::uint32_t{1}).isUInt());
    EXPECT_TRUE(Value(1.0F).isFloat());
    EXPECT_TRUE(Value("s").isString());
    EXPECT_TRUE(Value(Bytes{}).isBytes());
    EXPECT_TRUE(Value(Array{}).isArray());
    EXPECT_TRUE(Value(Dict{}).isDict());
}

TEST(ValueNumbers, ConversionsFollowNumberObjects) {
    EXPECT_EQ(Value(std::uint64_t{97}).toInt64(), 97);
    EXPECT_EQ(Value(true).toInt64(), 1);
    EXPECT_EQ(Value(-2.75F).toInt64(), -2);
    EXPECT_EQ(Value(std::numeric_limits<std::uint64_t>::max()).toInt64(), std::nullopt);
    EXPECT_EQ(Value("12").toInt64(), std::nullopt);
    EXPECT_EQ(Value(std::int64_t{34}).toFloat(), 34.0F);
    EXPECT_EQ(Value(Bytes{1}).toFloat(), std::nullopt);
}
