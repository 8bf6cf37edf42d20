#include "Shared/Util/PropertyValue.h"

#include <cmath>
#include <limits>
#include <string>
#include <type_traits>
#include <utility>

#include <gtest/gtest.h>

namespace ZorvaTouch {
namespace {

using Kind = PropertyValue::Kind;
using Array = PropertyValue::Array;
using Bytes = PropertyValue::Bytes;
using Dictionary = PropertyValue::Dictionary;

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kNan = std::numeric_limits<double>::quiet_NaN();

TEST(PropertyValue, IsNullByDefault) {
    EXPECT_EQ(PropertyValue().kind(), Kind::Null);
    EXPECT_TRUE(PropertyValue().isNull());
    EXPECT_FALSE(PropertyValue(false).isNull());
}

TEST(PropertyValue, KeepsTheKindItWasMadeOf) {
    EXPECT_EQ(PropertyValue(false).kind(), Kind::Boolean);
    EXPECT_EQ(PropertyValue(0u).kind(), Kind::Unsigned);
    EXPECT_EQ(PropertyValue(std::uint8_t{0}).kind(), Kind::Unsigned);
    EXPECT_EQ(PropertyValue(std::uint64_t{0}).kind(), Kind::Unsigned);
    EXPECT_EQ(PropertyValue(0.0f).kind(), Kind::Double);
    EXPECT_EQ(PropertyValue(0.0).kind(), Kind::Double);
    EXPECT_EQ(PropertyValue("text").kind(), Kind::String); // a literal is text, not a boolean
    EXPECT_EQ(PropertyValue(std::string()).kind(), Kind::String);
    EXPECT_EQ(PropertyValue(std::string_view("view")).kind(), Kind::String);
    EXPECT_EQ(PropertyValue(Bytes{}).kind(), Kind::Bytes);
    EXPECT_EQ(PropertyValue(Array{}).kind(), Kind::Array);
    EXPECT_EQ(PropertyValue(Dictionary{}).kind(), Kind::Dictionary);
}

TEST(PropertyValue, SignedIntegersMustBeSpeltOut) {
    EXPECT_FALSE((std::is_constructible_v<PropertyValue, int>));
    EXPECT_FALSE((std::is_constructible_v<PropertyValue, std::int64_t>));
}

TEST(PropertyValue, GivesItsContentUnderItsOwnKind) {
    EXPECT_EQ(*PropertyValue(true).asBool(), true);
    EXPECT_EQ(*PropertyValue(std::uint64_t{18446744073709551615u}).asUnsigned(), 18446744073709551615u);
    EXPECT_EQ(*PropertyValue(0.1f).asDouble(), 0.10000000149011612); // widened, not rounded to 0.1
    EXPECT_EQ(*PropertyValue("text").asString(), "text");
    EXPECT_EQ(*PropertyValue(Bytes{1, 2}).asBytes(), (Bytes{1, 2}));
    EXPECT_EQ(PropertyValue(Array{1u, "two"}).asArray()->size(), 2u);
    EXPECT_EQ(PropertyValue(Dictionary{{"a", 1u}}).asDictionary()->size(), 1u);
}

TEST(PropertyValue, GivesNothingUnderAnyOtherKind) {
    const PropertyValue number(1u);
    EXPECT_EQ(number.asBool(), nullptr);
    EXPECT_EQ(number.asDouble(), nullptr);
    EXPECT_EQ(number.asString(), nullptr);
    EXPECT_EQ(number.asBytes(), nullptr);
    EXPECT_EQ(number.asArray(), nullptr);
    EXPECT_EQ(number.asDictionary(), nullptr);
    EXPECT_EQ(PropertyValue(true).asUnsigned(), nullptr);
    EXPECT_EQ(PropertyValue(Bytes{1}).asArray(), nullptr);
    EXPECT_EQ(PropertyValue().asUnsigned(), nullptr);
}

TEST(PropertyValue, FindsTheEntriesOfADictionary) {
    const PropertyValue value(Dictionary{{"a", 1u}, {"", "empty"}});
    ASSERT_NE(value.find("a"), nullptr);
    EXPECT_EQ(*value.find("a"), PropertyValue(1u));
    EXPECT_EQ(*value.find(""), PropertyValue("empty"));
    EXPECT_EQ(value.find("b"), nullptr);
    EXPECT_EQ(value.find("A"), nullptr);
    EXPECT_EQ(PropertyValue("a").find("a"), nullptr);
    EXPECT_EQ(PropertyValue().find("a"), nullptr);
}

TEST(PropertyValue, ABooleanCountsAsZeroOrOne) {
    EXPECT_EQ(PropertyValue(true).toUnsigned(), 1u);
    EXPECT_EQ(PropertyValue(false).toUnsigned(), 0u);
    EXPECT_EQ(PropertyValue(true).toFloat(), 1.0f);
    EXPECT_EQ(PropertyValue(false).toFloat(), 0.0f);
    EXPECT_TRUE(PropertyValue(true).toBool());
    EXPECT_FALSE(PropertyValue(false).toBool());
}

TEST(PropertyValue, ANumberIsTrueUnlessItIsZero) {
    EXPECT_TRUE(PropertyValue(1u).toBool());
    EXPECT_TRUE(PropertyValue(2u).toBool());
    EXPECT_FALSE(PropertyValue(0u).toBool());
    EXPECT_TRUE(PropertyValue(0.25).toBool());
    EXPECT_TRUE(PropertyValue(-1.0).toBool());
    EXPECT_FALSE(PropertyValue(0.0).toBool());
    EXPECT_FALSE(PropertyValue(-0.0).toBool());
    EXPECT_TRUE(PropertyValue(kNan).toBool());
}

TEST(PropertyValue, WhatIsNoNumberCountsAsZero) {
    const std::vector<PropertyValue> others{
        PropertyValue(),         PropertyValue("1"), PropertyValue("true"),
        PropertyValue(Bytes{1}), Array{1u},          Dictionary{{"a", 1u}}};
    for (const PropertyValue &value : others) {
        EXPECT_FALSE(value.toBool());
        EXPECT_EQ(value.toFloat(), 0.0f);
        EXPECT_EQ(value.toUnsigned(), 0u);
    }
}

TEST(PropertyValue, UnsignedTruncatesAndSaturates) {
    EXPECT_EQ(PropertyValue(std::uint64_t{18446744073709551615u}).toUnsigned(), 18446744073709551615u);
    EXPECT_EQ(PropertyValue(2.999).toUnsigned(), 2u);
    EXPECT_EQ(PropertyValue(-2.999).toUnsigned(), 0u);
    EXPECT_EQ(PropertyValue(-0.5).toUnsigned(), 0u);
    EXPECT_EQ(PropertyValue(1e300).toUnsigned(), 18446744073709551615u);
    EXPECT_EQ(PropertyValue(kInfinity).toUnsigned(), 18446744073709551615u);
    EXPECT_EQ(PropertyValue(kNan).toUnsigned(), 0u);
}

TEST(PropertyValue, FloatIsRoundedOnce) {
    EXPECT_EQ(PropertyValue(0.1).toFloat(), 0.1f);
    EXPECT_EQ(PropertyValue(16777217u).toFloat(),
              16777216.0f); // 2^24 + 1 lies halfway, the even one is below
    // 2^60 + 2^36 + 1 is just above the middle between the floats 2^60 and 2^60 + 2^37. Through double the 1
    // would be lost first, and the tie would then go down.
    EXPECT_EQ(PropertyValue(std::uint64_t{1152921573326323713u}).toFloat(), 1152921642045800448.0f);
}

TEST(PropertyValue, FloatOutOfRangeIsAnInfinity) {
    EXPECT_EQ(PropertyValue(1e300).toFloat(), std::numeric_limits<float>::infinity());
    EXPECT_EQ(PropertyValue(-1e300).toFloat(), -std::numeric_limits<float>::infinity());
    EXPECT_EQ(PropertyValue(1e-300).toFloat(), 0.0f);
    EXPECT_TRUE(std::isnan(PropertyValue(kNan).toFloat()));
}

TEST(PropertyValue, EqualMeansSameKindAndContent) {
    EXPECT_EQ(PropertyValue(), PropertyValue());
    EXPECT_EQ(PropertyValue(1u), PropertyValue(std::uint8_t{1}));
    EXPECT_NE(PropertyValue(1u), PropertyValue(2u));
    EXPECT_NE(PropertyValue(1u), PropertyValue(1.0));
    EXPECT_NE(PropertyValue(1u), PropertyValue(true));
    EXPECT_NE(PropertyValue(), PropertyValue(false));
    EXPECT_EQ(PropertyValue("a"), PropertyValue(std::string("a")));
    EXPECT_NE(PropertyValue("a"), PropertyValue("b"));
    EXPECT_EQ(PropertyValue(Bytes{1, 2}), PropertyValue(Bytes{1, 2}));
    EXPECT_NE(PropertyValue(Bytes{1, 2}), PropertyValue(Bytes{1, 3}));
    EXPECT_NE(PropertyValue(Bytes{}), PropertyValue(Array{}));
    EXPECT_EQ(PropertyValue(0.0), PropertyValue(-0.0));
    EXPECT_NE(PropertyValue(kNan), PropertyValue(kNan));
}

TEST(PropertyValue, ContainersAreComparedByContent) {
    const PropertyValue inner(Dictionary{{"a", Array{1u, 2.5, "x"}}});
    EXPECT_EQ(PropertyValue(Array{inner}), PropertyValue(Array{Dictionary{{"a", Array{1u, 2.5, "x"}}}}));
    EXPECT_NE(PropertyValue(Array{inner}), PropertyValue(Array{Dictionary{{"a", Array{1u, 2.5, "y"}}}}));
    EXPECT_NE(PropertyValue(Dictionary{{"a", 1u}}), PropertyValue(Dictionary{{"b", 1u}}));
    EXPECT_NE(PropertyValue(Array{1u}), PropertyValue(Array{1u, 1u}));
}

TEST(PropertyValue, CopiesShareTheirStorage) {
    const PropertyValue array(Array{1u, 2u});
    const PropertyValue copy = array;
    EXPECT_EQ(copy.asArray(), array.asArray()); // the same storage, and immutable
    EXPECT_EQ(copy, array);
    const PropertyValue text(std::string(100, 'x'));
    PropertyValue assigned;
    assigned = text;
    EXPECT_EQ(assigned.asString(), text.asString());
    EXPECT_EQ(assigned, text);
}

// A copy that could fail would have to allocate.
static_assert(std::is_nothrow_copy_constructible_v<PropertyValue> &&
              std::is_nothrow_copy_assignable_v<PropertyValue>);
static_assert(std::is_nothrow_move_constructible_v<PropertyValue> &&
              std::is_nothrow_move_assignable_v<PropertyValue>);

TEST(PropertyValue, IsNullWhenItWasMovedFrom) {
    for (const PropertyValue &value :
         {PropertyValue(true), PropertyValue(7u), PropertyValue("text"), PropertyValue(Bytes{1}),
          PropertyValue(Array{1u}), PropertyValue(Dictionary{{"a", 1u}})}) {
        PropertyValue from = value;
        const PropertyValue made(std::move(from));
        EXPECT_EQ(made, value);
        EXPECT_TRUE(from.isNull()); // NOLINT(bugprone-use-after-move): that is what is tested
        from = value;
        PropertyValue assigned("before");
        assigned = std::move(from);
        EXPECT_EQ(assigned, value);
        EXPECT_TRUE(from.isNull()); // NOLINT(bugprone-use-after-move)
        PropertyValue &same = assigned;
        assigned = std::move(same);
        EXPECT_EQ(assigned, value);
    }
}

TEST(PropertyValue, TextsAreComparedByContent) {
    EXPECT_EQ(PropertyValue(std::string("text")), PropertyValue("text"));
    EXPECT_NE(PropertyValue("text"), PropertyValue("texT"));
    EXPECT_NE(PropertyValue("text"), PropertyValue(std::string("text\0", 5)));
}

TEST(PropertyValue, DictionariesAreOrderedByKey) {
    const PropertyValue value(Dictionary{{"b", 2u}, {"a", 1u}, {"B", 3u}});
    std::string keys;
    for (const auto &[key, entry] : *value.asDictionary())
        keys += key;
    EXPECT_EQ(keys, "Bab");
}

} // namespace
} // namespace ZorvaTouch
