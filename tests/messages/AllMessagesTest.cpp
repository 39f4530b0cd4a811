// The common behaviour, checked for every message class from its descriptor.
#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "PayloadBuilder.h"
#include "core/Log.h"
#include "messages/Messages.h"

namespace pyx {
namespace {

using test::buildPayload;
using test::Payload;

// Every class of the list of message classes.
template <class... Classes>
::testing::Types<Classes...> typesOf(int, Classes*...);
#define PYX_POINTER(group, Class) , static_cast<Class*>(nullptr)
using AllMessages = decltype(typesOf(0 PYX_MESSAGE_CLASSES(PYX_POINTER)));
#undef PYX_POINTER

class TypeNames {
  public:
    template <class T>
    static std::string GetName(int) {
        return std::string(T::descriptor().name);
    }
};

template <class T>
class EveryMessage : public ::testing::Test {
  protected:
    // The metric-tag fields log while decoding; keep those lines out of the test output.
    CapturedLines quiet_{systemLogSink()};

    static T decode(const Bytes& bytes) {
        auto m = T::initWithData(bytes);
        EXPECT_TRUE(m.has_value());
        return m.value_or(T{});
    }
    static T decodeSeed(int seed) {
        return decode(buildPayload(T::descriptor(), {.seed = seed}).bytes);
    }
};
TYPED_TEST_SUITE(EveryMessage, AllMessages, TypeNames);

TYPED_TEST(EveryMessage, RoundTripOfEveryFieldKeepsValuesKeysAndBytes) {
    const MessageDescriptor& d = TypeParam::descriptor();
    const Payload p = buildPayload(d);
    const auto m = TypeParam::initWithData(p.bytes);
    ASSERT_TRUE(m.has_value());
    EXPECT_EQ(m->dictionaryRepresentation(), p.dictionary);
    EXPECT_EQ(m->data(), p.bytes);
    const auto again = TypeParam::initWithData(m->data());
    ASSERT_TRUE(again.has_value());
    EXPECT_TRUE(again->isEqual(*m));
    EXPECT_EQ(again->hash(), m->hash());
    // Every field not dropped as a metric tag is in the dictionary under its key.
    const Dict dict = m->dictionaryRepresentation();
    for (const FieldDescriptor& f : d.fields) {
        EXPECT_EQ(dict.contains(f.key), !test::isMetricTagField(f)) << f.key;
    }
}

TYPED_TEST(EveryMessage, EmptyMessageHasZeroHashAndOnlyListKeys) {
    const TypeParam empty;
    EXPECT_EQ(empty.hash(), 0U);
    EXPECT_TRUE(empty.data().empty());
    for (const DictEntry& e : empty.dictionaryRepresentation()) {
        ASSERT_TRUE(e.value.isArray()) << e.key;
        EXPECT_TRUE(e.value.asArray().empty()) << e.key;
    }
}

TYPED_TEST(EveryMessage, EqualityAndHashFollowPresenceOfEachField) {
    const MessageDescriptor& d = TypeParam::descriptor();
    const TypeParam full = this->decodeSeed(1);
    EXPECT_TRUE(full.isEqual(this->decodeSeed(1)));
    EXPECT_EQ(full.hash(), this->decodeSeed(1).hash());
    EXPECT_FALSE(full.isEqual(this->decodeSeed(2)));
    for (std::size_t i = 0; i < d.fields.size(); ++i) {
        if (test::isMetricTagField(d.fields[i])) continue;
        const int index = static_cast<int>(i);
        const TypeParam without = this->decode(buildPayload(d, {.omitField = index}).bytes);
        EXPECT_FALSE(full.isEqual(without)) << d.fields[i].key;
        EXPECT_FALSE(without.isEqual(full)) << d.fields[i].key;
        if (!d.fields[i].isScalar()) continue;
        const TypeParam zero = this->decode(buildPayload(d, {.zeroField = index}).bytes);
        EXPECT_FALSE(zero.isEqual(without)) << d.fields[i].key << ": 0 differs from absent";
        EXPECT_TRUE(zero.dictionaryRepresentation().contains(d.fields[i].key));
        EXPECT_FALSE(without.dictionaryRepresentation().contains(d.fields[i].key));
        // A present zero adds a zero term to the hash.
        EXPECT_EQ(zero.hash(), without.hash()) << d.fields[i].key;
    }
}

TYPED_TEST(EveryMessage, CopyIsDeepAndIndependent) {
    const MessageDescriptor& d = TypeParam::descriptor();
    const TypeParam original = this->decodeSeed(1);
    TypeParam copy = original.copy();
    EXPECT_TRUE(copy.isEqual(original));
    EXPECT_EQ(copy.hash(), original.hash());
    for (const FieldDescriptor& f : d.fields) {
        if (f.sub == nullptr) continue;
        ASSERT_EQ(test::nestedCount(&copy, f), test::nestedCount(&original, f));
        for (std::size_t i = 0; i < test::nestedCount(&original, f); ++i) {
            EXPECT_NE(test::nestedObject(&copy, f, i), test::nestedObject(&original, f, i))
                << f.key;
        }
    }
    copy.mergeFrom(this->decodeSeed(2));
    EXPECT_FALSE(copy.isEqual(original));
    EXPECT_TRUE(original.isEqual(this->decodeSeed(1)));
}

TYPED_TEST(EveryMessage, CopyToSharesNestedObjects) {
    const MessageDescriptor& d = TypeParam::descriptor();
    const TypeParam original = this->decodeSeed(1);
    TypeParam target = this->decodeSeed(2);
    original.copyTo(target);
    EXPECT_TRUE(target.isEqual(original));
    for (const FieldDescriptor& f : d.fields) {
        if (f.sub == nullptr) continue;
        ASSERT_EQ(test::nestedCount(&target, f), test::nestedCount(&original, f));
        for (std::size_t i = 0; i < test::nestedCount(&original, f); ++i) {
            EXPECT_EQ(test::nestedObject(&target, f, i), test::nestedObject(&original, f, i))
                << f.key;
        }
    }
}

TYPED_TEST(EveryMessage, MergeReplacesScalarsAppendsListsAndMergesNested) {
    const MessageDescriptor& d = TypeParam::descriptor();
    TypeParam merged = this->decodeSeed(1);
    std::vector<const void*> nestedBefore;
    for (const FieldDescriptor& f : d.fields) {
        if (f.kind == FieldKind::Message) nestedBefore.push_back(test::nestedObject(&merged, f));
    }
    merged.mergeFrom(this->decodeSeed(2));
    // Reading two payloads one after the other gives the same fields: the later scalar wins,
    // lists accumulate, and (both nested records being complete) nested values are the later.
    Bytes both = buildPayload(d, {.seed = 1}).bytes;
    const Bytes second = buildPayload(d, {.seed = 2}).bytes;
    both.insert(both.end(), second.begin(), second.end());
    EXPECT_TRUE(merged.isEqual(this->decode(both)));
    // A nested message present on both sides is merged into, not replaced.
    std::size_t k = 0;
    for (const FieldDescriptor& f : d.fields) {
        if (f.kind == FieldKind::Message) {
            EXPECT_EQ(test::nestedObject(&merged, f), nestedBefore[k++]);
        }
    }
}

TYPED_TEST(EveryMessage, TruncatedInputFailsExceptAtFieldBoundaries) {
    const Payload p = buildPayload(TypeParam::descriptor());
    for (std::size_t n = 0; n <= p.bytes.size(); ++n) {
        // A buffer of exactly n bytes, so that a read past its end is caught by the sanitizer.
        const std::vector<std::uint8_t> prefix(p.bytes.begin(), p.bytes.begin() + n);
        PBDataReader reader(prefix);
        TypeParam m;
        const bool atBoundary =
            std::find(p.boundaries.begin(), p.boundaries.end(), n) != p.boundaries.end();
        EXPECT_EQ(m.readFrom(reader), atBoundary) << "prefix of " << n << " bytes";
        EXPECT_LE(reader.position(), n);
    }
}

}  // namespace
}  // namespace pyx
