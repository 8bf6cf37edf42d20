#include "Plugin/ValueObject.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <stdexcept>
#include <string>
#include <vector>

namespace ZorvaTouch {
namespace {

using Array = PropertyValue::Array;
using Dictionary = PropertyValue::Dictionary;

/// A value as somebody else makes it, not always well: each answer is what a test says.
struct ForeignValue : ZorvaValue {
    explicit ForeignValue(std::uint32_t valueKind) : ZorvaValue{&kTable}, kind(valueKind) {}
    static ForeignValue number(std::uint64_t number) {
        ForeignValue value(kZorvaValueUnsigned);
        value.unsignedNumber = number;
        return value;
    }

    std::uint32_t kind;
    ZorvaBoolean boolean = 0;
    std::uint64_t unsignedNumber = 0;
    const char *text = nullptr;
    std::size_t length = 0; ///< of text or bytes
    std::size_t count = 0;
    std::vector<const ZorvaValue *> elements; ///< null beyond
    std::vector<const char *> keys;           ///< null beyond
    const ZorvaValue *everyElement = nullptr; ///< of all beyond
    const char *everyKey = nullptr;
    mutable std::size_t partsAsked = 0; ///< calls of `element` and `key`

    static const ForeignValue &of(const ZorvaValue *value) {
        return static_cast<const ForeignValue &>(*value);
    }
    static const ZorvaValueTable kTable;
};

const ZorvaValueTable ForeignValue::kTable{
    .size = sizeof(ZorvaValueTable),
    .retain = [](const ZorvaValue *) {},
    .release = [](const ZorvaValue *) {},
    .kind = [](const ZorvaValue *value) { return of(value).kind; },
    .booleanValue = [](const ZorvaValue *value) { return of(value).boolean; },
    .unsignedValue = [](const ZorvaValue *value) { return of(value).unsignedNumber; },
    .doubleValue = [](const ZorvaValue *) { return 0.5; },
    .stringValue =
        [](const ZorvaValue *value, std::size_t *size) {
            *size = of(value).length;
            return of(value).text;
        },
    .bytesValue =
        [](const ZorvaValue *value, std::size_t *size) {
            *size = of(value).length;
            return reinterpret_cast<const std::uint8_t *>(of(value).text);
        },
    .count = [](const ZorvaValue *value) { return of(value).count; },
    .element =
        [](const ZorvaValue *value, std::size_t index) {
            const ForeignValue &self = of(value);
            ++self.partsAsked;
            return index < self.elements.size() ? self.elements[index] : self.everyElement;
        },
    .key =
        [](const ZorvaValue *value, std::size_t index, std::size_t *size) {
            const ForeignValue &self = of(value);
            ++self.partsAsked;
            const char *const key = index < self.keys.size() ? self.keys[index] : self.everyKey;
            *size = key ? 1 : 0;
            return key;
        },
};

// --- Made well -------------------------------------------------------------------------------------

TEST(ForeignValue, IsReadKindByKind) {
    ForeignValue value(kZorvaValueBoolean);
    value.boolean = 1;
    EXPECT_EQ(readValue(&value), PropertyValue(true));
    value.kind = kZorvaValueDouble;
    EXPECT_EQ(readValue(&value), PropertyValue(0.5));
    value.kind = kZorvaValueString;
    value.text = "abc";
    value.length = 2;
    EXPECT_EQ(readValue(&value), PropertyValue("ab"));
    value.kind = kZorvaValueBytes;
    EXPECT_EQ(readValue(&value), PropertyValue(PropertyValue::Bytes{'a', 'b'}));
}

TEST(ForeignValue, IsReadWithItsParts) {
    const ForeignValue one = ForeignValue::number(1), two = ForeignValue::number(2);
    ForeignValue value(kZorvaValueArray);
    value.elements = {&one, &two};
    value.count = 2;
    EXPECT_EQ(readValue(&value), PropertyValue(Array{std::uint32_t{1}, std::uint32_t{2}}));
    value.kind = kZorvaValueDictionary;
    value.keys = {"b", "a"};
    EXPECT_EQ(readValue(&value), PropertyValue(Dictionary{{"a", std::uint32_t{2}}, {"b", std::uint32_t{1}}}));
}

// --- Made badly ------------------------------------------------------------------------------------

TEST(ForeignValue, OfNothingIsNull) { EXPECT_TRUE(readValue(nullptr).isNull()); }

TEST(ForeignValue, OfAnUnknownKindIsNull) {
    ForeignValue value(8);
    EXPECT_TRUE(readValue(&value).isNull());
    value.kind = UINT32_MAX;
    EXPECT_TRUE(readValue(&value).isNull());
}

TEST(ForeignValue, ABooleanOtherThanOneIsTrue) {
    ForeignValue value(kZorvaValueBoolean);
    value.boolean = 200;
    EXPECT_EQ(readValue(&value), PropertyValue(true));
}

TEST(ForeignValue, WithoutItsTextOrBytesIsEmpty) {
    ForeignValue value(kZorvaValueString);
    value.length = 5;
    EXPECT_EQ(readValue(&value), PropertyValue(""));
    value.kind = kZorvaValueBytes;
    EXPECT_EQ(readValue(&value), PropertyValue(PropertyValue::Bytes{}));
}

TEST(ForeignValue, WithoutATableOrWithAHoleInItIsNull) {
    ForeignValue value = ForeignValue::number(7);
    value.table = nullptr;
    EXPECT_TRUE(readValue(&value).isNull());
    ZorvaValueTable table = ForeignValue::kTable;
    value.table = &table;
    EXPECT_EQ(readValue(&value), PropertyValue(std::uint32_t{7}));
    table.size = sizeof table - 1;
    EXPECT_TRUE(readValue(&value).isNull());
    table.size = sizeof table + 8; // of a newer boundary, with more entries
    EXPECT_EQ(readValue(&value), PropertyValue(std::uint32_t{7}));
    table.key = nullptr;
    EXPECT_TRUE(readValue(&value).isNull());
}

TEST(ForeignValue, ElementsThatAreMissingAreNull) {
    const ForeignValue one = ForeignValue::number(1);
    ForeignValue value(kZorvaValueArray);
    value.elements = {nullptr, &one};
    value.count = 3;
    EXPECT_EQ(readValue(&value), PropertyValue(Array{PropertyValue(), std::uint32_t{1}, PropertyValue()}));
}

TEST(ForeignValue, EntriesWithoutAKeyAreLeftOut) {
    const ForeignValue one = ForeignValue::number(1);
    ForeignValue value(kZorvaValueDictionary);
    value.keys = {nullptr, "k", "n"};
    value.elements = {&one, &one, nullptr};
    value.count = 3;
    EXPECT_EQ(readValue(&value), PropertyValue(Dictionary{{"k", std::uint32_t{1}}, {"n", PropertyValue()}}));
}

TEST(ForeignValue, OfEqualKeysTheLastOneHolds) {
    const ForeignValue one = ForeignValue::number(1), two = ForeignValue::number(2);
    ForeignValue value(kZorvaValueDictionary);
    value.keys = {"k", "k"};
    value.elements = {&one, &two};
    value.count = 2;
    EXPECT_EQ(readValue(&value), PropertyValue(Dictionary{{"k", std::uint32_t{2}}}));
}

// --- Beyond the limits -----------------------------------------------------------------------------

/// The message of what reading throws; "" if it does not.
std::string refusalOf(const ZorvaValue &value) {
    try {
        static_cast<void>(readValue(&value));
        return "";
    } catch (const std::length_error &error) {
        return error.what();
    }
}

constexpr const char *kTooDeep = "a value has more than 64 levels";
constexpr const char *kTooLarge = "a value has more than 1000000 parts";

/// Arrays in each other, one element each; the innermost one is empty.
std::vector<ForeignValue> nestedArrays(std::size_t levels) {
    std::vector<ForeignValue> arrays(levels, ForeignValue(kZorvaValueArray));
    for (std::size_t level = 0; level + 1 < levels; ++level) {
        arrays[level].count = 1;
        arrays[level].elements = {&arrays[level + 1]};
    }
    return arrays;
}

TEST(ForeignValue, IsReadWithSixtyFourLevelsAndRefusedWithOneMore) {
    EXPECT_EQ(refusalOf(nestedArrays(64).front()), "");
    EXPECT_EQ(refusalOf(nestedArrays(65).front()), kTooDeep);
    auto arrays = nestedArrays(64);
    arrays.back().count = 1; // of a null pointer, which is a part as well
    EXPECT_EQ(refusalOf(arrays.front()), kTooDeep);
}

/// With a count of 2^64-1 (default), and the same at each place.
ForeignValue uniform(std::uint32_t kind, const char *everyKey, const ZorvaValue *everyElement,
                     std::size_t count = SIZE_MAX) {
    ForeignValue value(kind);
    value.count = count;
    value.everyKey = everyKey;
    value.everyElement = everyElement;
    return value;
}

TEST(ForeignValue, IsReadWithAMillionPartsAndRefusedWithOneMore) {
    const ForeignValue one = ForeignValue::number(1);
    const auto largest = uniform(kZorvaValueArray, nullptr, &one, 999'999); // and the array itself
    const PropertyValue read = readValue(&largest);
    ASSERT_TRUE(read.asArray());
    EXPECT_EQ(read.asArray()->size(), 999'999u);
    EXPECT_EQ(read.asArray()->back(), PropertyValue(std::uint32_t{1}));
    EXPECT_EQ(refusalOf(uniform(kZorvaValueArray, nullptr, &one, 1'000'000)), kTooLarge);
}

TEST(EndlessValue, IsRefused) {
    const ForeignValue one = ForeignValue::number(1);
    EXPECT_EQ(refusalOf(uniform(kZorvaValueArray, nullptr, &one)), kTooLarge);
    EXPECT_EQ(refusalOf(uniform(kZorvaValueDictionary, "k", &one)), kTooLarge);
}

TEST(EndlessValue, OfMissingElementsIsRefusedToo) {
    EXPECT_EQ(refusalOf(uniform(kZorvaValueArray, nullptr, nullptr)), kTooLarge);
    EXPECT_EQ(refusalOf(uniform(kZorvaValueDictionary, "k", nullptr)), kTooLarge);
    EXPECT_EQ(refusalOf(uniform(kZorvaValueDictionary, nullptr, nullptr)), kTooLarge);
}

TEST(EndlessValue, IsRefusedBeforeAnyPartIsRead) {
    for (const std::uint32_t kind : {kZorvaValueArray, kZorvaValueDictionary}) {
        const ForeignValue value = uniform(kind, "k", nullptr, 1'000'000);
        EXPECT_EQ(refusalOf(value), kTooLarge);
        EXPECT_EQ(value.partsAsked, 0u);
    }
}

TEST(EndlessValue, ThatContainsItselfIsRefused) {
    ForeignValue self(kZorvaValueArray);
    self.everyElement = &self;
    self.count = 2;
    EXPECT_EQ(refusalOf(self), kTooDeep);
    self.count = SIZE_MAX;
    EXPECT_EQ(refusalOf(self), kTooLarge);
}

} // namespace
} // namespace ZorvaTouch
