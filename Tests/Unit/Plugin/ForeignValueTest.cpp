#include "Plugin/ValueObject.h"

#include <gtest/gtest.h>

#include <cstdint>
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
            return index < self.elements.size() ? self.elements[index] : self.everyElement;
        },
    .key =
        [](const ZorvaValue *value, std::size_t index, std::size_t *size) {
            const ForeignValue &self = of(value);
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

// --- Made to hold us for ever ----------------------------------------------------------------------

/// With a count of 2^64-1 and whatever is to be had at each place.
PropertyValue readEndless(std::uint32_t kind, const char *everyKey, const ZorvaValue *everyElement) {
    ForeignValue value(kind);
    value.count = SIZE_MAX;
    value.everyKey = everyKey;
    value.everyElement = everyElement;
    return readValue(&value);
}

TEST(EndlessValue, IsNullAsAWhole) {
    const ForeignValue one = ForeignValue::number(1);
    EXPECT_TRUE(readEndless(kZorvaValueArray, nullptr, &one).isNull());
    EXPECT_TRUE(readEndless(kZorvaValueDictionary, "k", &one).isNull());
}

TEST(EndlessValue, OfMissingElementsIsNullToo) {
    EXPECT_TRUE(readEndless(kZorvaValueArray, nullptr, nullptr).isNull());
    EXPECT_TRUE(readEndless(kZorvaValueDictionary, "k", nullptr).isNull());
    EXPECT_TRUE(readEndless(kZorvaValueDictionary, nullptr, nullptr).isNull());
}

TEST(EndlessValue, ThatContainsItselfIsNull) {
    ForeignValue twice(kZorvaValueArray);
    twice.elements = {&twice, &twice};
    twice.count = 2;
    EXPECT_TRUE(readValue(&twice).isNull());
}

TEST(EndlessValue, ThatIsEndlessAtTheDeepestLevelIsNull) {
    ForeignValue self(kZorvaValueArray);
    self.count = SIZE_MAX;
    self.everyElement = &self;
    EXPECT_TRUE(readValue(&self).isNull());
}

TEST(ForeignValue, BelowSixtyFourLevelsIsNull) {
    ForeignValue self(kZorvaValueArray); // contains itself once: a chain without end
    self.elements = {&self};
    self.count = 1;
    const PropertyValue read = readValue(&self);
    const PropertyValue *level = &read;
    int levels = 0;
    for (; level->asArray(); level = &level->asArray()->front())
        ++levels;
    EXPECT_EQ(levels, 64);
    EXPECT_TRUE(level->isNull());
}

} // namespace
} // namespace ZorvaTouch
