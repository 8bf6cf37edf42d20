#include "Plugin/ValueObject.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <stdexcept>
#include <string>
#include <string_view>

namespace ZorvaTouch {
namespace {

using Value = Ref<const ZorvaValue>;
using Bytes = PropertyValue::Bytes;
using Array = PropertyValue::Array;
using Dictionary = PropertyValue::Dictionary;

/// Everything that a table answers about a value, but for its parts.
struct Answers {
    std::uint32_t kind;
    ZorvaBoolean boolean;
    std::uint64_t number;
    double real;
    bool hasText;
    std::size_t textLength;
    bool hasBytes;
    std::size_t bytesLength;
    std::size_t count;

    friend bool operator==(const Answers &, const Answers &) = default;
};

Answers answersOf(const Value &value) {
    const ZorvaValueTable &table = *value->table;
    Answers answers{};
    answers.textLength = answers.bytesLength = 99;
    answers.kind = table.kind(value.get());
    answers.boolean = table.booleanValue(value.get());
    answers.number = table.unsignedValue(value.get());
    answers.real = table.doubleValue(value.get());
    answers.hasText = table.stringValue(value.get(), &answers.textLength) != nullptr;
    answers.hasBytes = table.bytesValue(value.get(), &answers.bytesLength) != nullptr;
    answers.count = table.count(value.get());
    return answers;
}

std::string textOf(const ZorvaValue *value) {
    std::size_t length = 0;
    const char *const text = value->table->stringValue(value, &length);
    return {text, length};
}

std::string keyOf(const Value &value, std::size_t index) {
    std::size_t length = 0;
    const char *const key = value->table->key(value.get(), index, &length);
    return key ? std::string(key, length) : "none";
}

// --- Every kind answers for itself and for nothing else --------------------------------------------

TEST(ValueObject, OfNullIsAValueOfKindNull) {
    EXPECT_EQ(answersOf(makeValue({})), (Answers{0, 0, 0, 0, false, 0, false, 0, 0}));
}

TEST(ValueObject, OfABooleanIsOneByteZeroOrOne) {
    EXPECT_EQ(answersOf(makeValue(true)), (Answers{1, 1, 0, 0, false, 0, false, 0, 0}));
    EXPECT_EQ(answersOf(makeValue(false)), (Answers{1, 0, 0, 0, false, 0, false, 0, 0}));
}

TEST(ValueObject, OfANumberHasAllItsBits) {
    EXPECT_EQ(answersOf(makeValue(std::uint64_t{0xFFFFFFFFFFFFFFFF})),
              (Answers{2, 0, 0xFFFFFFFFFFFFFFFF, 0, false, 0, false, 0, 0}));
    EXPECT_EQ(answersOf(makeValue(-0.125)), (Answers{3, 0, 0, -0.125, false, 0, false, 0, 0}));
}

TEST(ValueObject, OfATextHasItsBytesAndZerosToo) {
    const Value value = makeValue(std::string("a\0\xC3\xBC", 4));
    EXPECT_EQ(answersOf(value), (Answers{4, 0, 0, 0, true, 4, false, 0, 0}));
    EXPECT_EQ(textOf(value.get()), std::string("a\0\xC3\xBC", 4));
}

TEST(ValueObject, OfAnEmptyTextIsNotNull) {
    EXPECT_EQ(answersOf(makeValue("")), (Answers{4, 0, 0, 0, true, 0, false, 0, 0}));
}

TEST(ValueObject, OfBytesHasThem) {
    const Value value = makeValue(Bytes{7, 0, 255});
    EXPECT_EQ(answersOf(value), (Answers{5, 0, 0, 0, false, 0, true, 3, 0}));
    std::size_t length = 0;
    const std::uint8_t *const bytes = value->table->bytesValue(value.get(), &length);
    EXPECT_EQ(Bytes(bytes, bytes + length), (Bytes{7, 0, 255}));
}

TEST(ValueObject, OfAnArrayHasItsElementsInOrder) {
    const Value value = makeValue(Array{std::string("x"), Array{}});
    EXPECT_EQ(answersOf(value), (Answers{6, 0, 0, 0, false, 0, false, 0, 2}));
    EXPECT_EQ(textOf(value->table->element(value.get(), 0)), "x");
    EXPECT_EQ(value->table->kind(value->table->element(value.get(), 1)), 6u);
    EXPECT_EQ(value->table->element(value.get(), 2), nullptr);
    EXPECT_EQ(value->table->element(value.get(), SIZE_MAX), nullptr);
    EXPECT_EQ(keyOf(value, 0), "none");
}

TEST(ValueObject, OfADictionaryHasKeysAndValues) {
    const Value value = makeValue(Dictionary{{"b", "second"}, {"", "first"}});
    EXPECT_EQ(answersOf(value), (Answers{7, 0, 0, 0, false, 0, false, 0, 2}));
    EXPECT_EQ(keyOf(value, 0), "");
    EXPECT_EQ(textOf(value->table->element(value.get(), 0)), "first");
    EXPECT_EQ(keyOf(value, 1), "b");
    EXPECT_EQ(textOf(value->table->element(value.get(), 1)), "second");
    EXPECT_EQ(keyOf(value, 2), "none");
    EXPECT_EQ(value->table->element(value.get(), 2), nullptr);
}

TEST(ValueObject, PartsThatAreKeptOutliveTheWhole) {
    Value whole = makeValue(Dictionary{{"key", "kept"}});
    const auto part = Value::retain(whole->table->element(whole.get(), 0));
    whole.reset();
    EXPECT_EQ(textOf(part.get()), "kept");
}

TEST(ValueObject, SaysTheSizeOfItsTable) { EXPECT_EQ(makeValue({})->table->size, sizeof(ZorvaValueTable)); }

// --- Limits ----------------------------------------------------------------------------------------

/// Arrays in each other; the innermost one is empty.
PropertyValue nestedArrays(int levels) {
    PropertyValue value = Array{};
    for (; levels > 1; --levels)
        value = Array{value};
    return value;
}

TEST(ValueObject, IsMadeWithSixtyFourLevelsAndRefusedWithOneMore) {
    EXPECT_TRUE(makeValue(nestedArrays(64)));
    EXPECT_THROW(static_cast<void>(makeValue(nestedArrays(65))), std::length_error);
}

TEST(ValueObject, IsMadeWithAMillionPartsAndRefusedWithOneMore) {
    Array parts(999'999); // and the array itself
    EXPECT_EQ(answersOf(makeValue(parts)).count, 999'999u);
    parts.emplace_back();
    EXPECT_THROW(static_cast<void>(makeValue(parts)), std::length_error);
}

// --- There and back --------------------------------------------------------------------------------

class ValueRoundTrip : public ::testing::TestWithParam<PropertyValue> {};

TEST_P(ValueRoundTrip, GivesTheSameValue) { EXPECT_EQ(readValue(makeValue(GetParam()).get()), GetParam()); }

INSTANTIATE_TEST_SUITE_P(
    EveryKind, ValueRoundTrip,
    ::testing::Values(PropertyValue(), PropertyValue(true), PropertyValue(false),
                      PropertyValue(std::uint64_t{0}), PropertyValue(std::uint64_t{0xFFFFFFFFFFFFFFFF}),
                      PropertyValue(-1.5), PropertyValue(std::numeric_limits<double>::infinity()),
                      PropertyValue(""), PropertyValue(std::string("a\0b", 3)), PropertyValue(Bytes{}),
                      PropertyValue(Bytes{0, 1, 255}), PropertyValue(Array{}),
                      PropertyValue(Array{true, std::uint32_t{7}, Array{"deeper"}, PropertyValue()}),
                      PropertyValue(Dictionary{}),
                      PropertyValue(Dictionary{{"", PropertyValue()}, {"a", Dictionary{{"b", Bytes{1}}}}})));

TEST(ValueRoundTrip, KeepsWhatIsNoNumber) {
    const PropertyValue read = readValue(makeValue(std::nan("")).get());
    ASSERT_TRUE(read.asDouble());
    EXPECT_TRUE(std::isnan(*read.asDouble()));
}

} // namespace
} // namespace ZorvaTouch
