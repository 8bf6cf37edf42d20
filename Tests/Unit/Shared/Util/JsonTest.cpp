#include "Shared/Util/Json.h"

#include <gtest/gtest.h>

#include <limits>
#include <optional>

namespace ZorvaTouch::Util {
namespace {

using Kind = JsonValue::Kind;
using Array = PropertyValue::Array;
using Dictionary = PropertyValue::Dictionary;

JsonDocument parsed(std::string_view text) {
    std::string error;
    std::optional<JsonDocument> document = JsonDocument::parse(text, &error);
    EXPECT_TRUE(document.has_value()) << text << ": " << error;
    return document ? std::move(*document) : std::move(*JsonDocument::parse("null"));
}

PropertyValue valueOf(std::string_view text) { return parsed(text).root().toPropertyValue(); }

// --- Reading -------------------------------------------------------------------------------------

TEST(Json, EveryKindIsTold) {
    const struct {
        const char *text;
        Kind kind;
    } cases[] = {{"null", Kind::Null},     {"true", Kind::Boolean},
                 {"false", Kind::Boolean}, {"0", Kind::Number},
                 {"-1", Kind::Number},     {"1.5", Kind::Number},
                 {"1e3", Kind::Number},    {"18446744073709551615", Kind::Number},
                 {"\"\"", Kind::String},   {"[]", Kind::Array},
                 {"{}", Kind::Object}};
    for (const auto &[text, kind] : cases) {
        const JsonDocument document = parsed(text);
        EXPECT_EQ(document.root().kind(), kind) << text;
    }
}

TEST(Json, OnlyAStringHasText) {
    EXPECT_EQ(parsed(R"("a\u00e9\n")").root().asString(), "a\xC3\xA9\n");
    EXPECT_EQ(parsed(R"("")").root().asString(), "");
    const JsonDocument nul = parsed(R"("a\u0000b")");
    EXPECT_EQ(nul.root().asString(), std::string_view("a\0b", 3));
    for (const char *text : {"null", "true", "5", "5.5", "[\"a\"]", "{\"a\":\"b\"}"})
        EXPECT_EQ(parsed(text).root().asString(), std::nullopt) << text;
}

TEST(Json, OnlyANumberIsUnsigned) {
    const auto asUnsigned = [](const char *text) { return parsed(text).root().asUnsigned(); };
    EXPECT_EQ(asUnsigned("0"), 0u);
    EXPECT_EQ(asUnsigned("9223372036854775808"), 9223372036854775808u);
    EXPECT_EQ(asUnsigned("18446744073709551615"), 18446744073709551615u);
    EXPECT_EQ(asUnsigned("5.99"), 5u);
    EXPECT_EQ(asUnsigned("-5"), 0u);
    EXPECT_EQ(asUnsigned("-5.5"), 0u);
    EXPECT_EQ(asUnsigned("-9223372036854775808"), 0u);
    EXPECT_EQ(asUnsigned("1e300"), 18446744073709551615u);
    for (const char *text : {"null", "true", "false", "\"5\"", "[5]", "{}"})
        EXPECT_EQ(asUnsigned(text), std::nullopt) << text;
}

TEST(Json, BecomesAValueTree) {
    EXPECT_EQ(valueOf("null"), PropertyValue());
    EXPECT_EQ(valueOf("true"), PropertyValue(true));
    EXPECT_EQ(valueOf("7"), PropertyValue(7u));
    EXPECT_EQ(valueOf("18446744073709551615"), PropertyValue(18446744073709551615u));
    EXPECT_EQ(valueOf("-7"), PropertyValue(-7.0)) << "there is no signed kind";
    EXPECT_EQ(valueOf("7.0"), PropertyValue(7.0));
    EXPECT_EQ(valueOf("\"7\""), PropertyValue("7"));
    EXPECT_EQ(valueOf(R"([1,[2,[]],{"a":{"b":[null]}},"x"])"),
              PropertyValue(Array{1u, Array{2u, Array{}},
                                  Dictionary{{"a", Dictionary{{"b", Array{PropertyValue()}}}}}, "x"}));
}

TEST(Json, TheLastOfEqualKeysHolds) {
    EXPECT_EQ(valueOf(R"({"a":1,"b":2,"a":{"c":1,"c":[]},"\u0061":3})"),
              PropertyValue(Dictionary{{"a", 3u}, {"b", 2u}}));
    EXPECT_EQ(valueOf(R"([{"c":1,"c":null}])"), PropertyValue(Array{Dictionary{{"c", PropertyValue()}}}));
}

TEST(Json, StepsThroughArrays) {
    const JsonDocument document = parsed(R"([1,"two",[3,[4,5]],{"six":[7]},null,8.5])");
    JsonArrayReader reader(document.root());
    JsonValue element;
    std::vector<PropertyValue> elements;
    while (reader.next(element))
        elements.push_back(element.toPropertyValue());
    EXPECT_EQ(elements, (Array{1u, "two", Array{3u, Array{4u, 5u}}, Dictionary{{"six", Array{7u}}},
                               PropertyValue(), 8.5}));
    EXPECT_FALSE(reader.next(element)) << "the end stays the end";
}

TEST(Json, StepsThroughNothing) {
    const JsonDocument array = parsed("[ ]");
    JsonArrayReader elements(array.root());
    JsonValue value;
    EXPECT_FALSE(elements.next(value));
    const JsonDocument object = parsed("{ }");
    JsonObjectReader members(object.root());
    std::string_view key;
    EXPECT_FALSE(members.next(key, value));
}

TEST(Json, StepsThroughObjectsInTheOrderOfTheText) {
    const JsonDocument document = parsed(R"({"b":{"x":[1]},"a":2,"b":[3,4],"":5})");
    JsonObjectReader reader(document.root());
    std::string_view key;
    JsonValue value;
    std::vector<std::pair<std::string, PropertyValue>> members;
    while (reader.next(key, value))
        members.emplace_back(key, value.toPropertyValue());
    EXPECT_EQ(members, (std::vector<std::pair<std::string, PropertyValue>>{
                           {"b", Dictionary{{"x", Array{1u}}}}, {"a", 2u}, {"b", Array{3u, 4u}}, {"", 5u}}));
    EXPECT_FALSE(reader.next(key, value));
}

TEST(Json, ReadersInsideReadersDoNotDisturbEachOther) {
    const JsonDocument document = parsed(R"([[1,2],[],[3,4]])");
    JsonArrayReader rows(document.root());
    JsonValue row;
    std::string text;
    while (rows.next(row)) {
        JsonArrayReader cells(row);
        JsonValue cell;
        while (cells.next(cell))
            text += std::to_string(*cell.asUnsigned());
        text += ";";
    }
    EXPECT_EQ(text, "12;;34;");
}

TEST(Json, ADocumentCanBeMovedWithItsValues) {
    JsonDocument document = parsed(R"({"key":"a text that is longer than a short string"})");
    const JsonValue root = document.root();
    JsonDocument moved(std::move(document));
    EXPECT_EQ(root.toPropertyValue(), moved.root().toPropertyValue());
    JsonDocument assigned = parsed("[1]");
    assigned = std::move(moved);
    EXPECT_EQ(root.toPropertyValue(),
              PropertyValue(Dictionary{{"key", "a text that is longer than a short string"}}));
    EXPECT_EQ(assigned.root().kind(), Kind::Object);
}

TEST(Json, DocumentsStandApart) {
    const JsonDocument first = parsed(R"(["first"])");
    const JsonDocument second = parsed(R"(["second", "and more"])");
    EXPECT_EQ(first.root().toPropertyValue(), PropertyValue(Array{"first"}));
    EXPECT_EQ(second.root().toPropertyValue(), PropertyValue(Array{"second", "and more"}));
}

TEST(Json, ReadsNoFurtherThanItsText) {
    const std::string text = R"([1,2]])";
    EXPECT_EQ(parseJson(std::string_view(text).substr(0, 5)), PropertyValue(Array{1u, 2u}));
    EXPECT_EQ(parseJson(text), std::nullopt);
    EXPECT_EQ(parseJson(std::string_view("123").substr(0, 1)), PropertyValue(1u));
    EXPECT_EQ(parseJson(std::string_view()), std::nullopt);
}

TEST(Json, TheTextMayGoAfterwards) {
    std::string text = R"({"a":"b"})";
    const JsonDocument document = parsed(text);
    text.assign(text.size(), '#');
    EXPECT_EQ(document.root().toPropertyValue(), PropertyValue(Dictionary{{"a", "b"}}));
}

TEST(Json, AScalarIsAWholeText) {
    EXPECT_EQ(parseJson(" 5 "), PropertyValue(5u));
    EXPECT_EQ(parseJson("\t\"x\"\n"), PropertyValue("x"));
    EXPECT_EQ(parseJson("true"), PropertyValue(true));
    EXPECT_EQ(parseJson("5 5"), std::nullopt);
    EXPECT_EQ(parseJson("true false"), std::nullopt);
}

TEST(Json, AnErrorHasAReason) {
    for (const char *text :
         {"", "[", "[1e400]", "\xEF\xBB\xBF[]", "[18446744073709551616]", R"(["\ud800"])", "[\"\xFF\"]"}) {
        std::string error;
        EXPECT_FALSE(JsonDocument::parse(text, &error).has_value()) << text;
        EXPECT_FALSE(error.empty()) << text;
        EXPECT_FALSE(JsonDocument::parse(text).has_value()) << "without asking why";
    }
}

TEST(Json, SixtyFourLevelsAreAllowed) {
    const auto nested = [](std::size_t depth, const char *core) {
        return std::string(depth, '[') + core + std::string(depth, ']');
    };
    for (const char *core : {"", "1", "\"a\"", "null,true,1.5"}) {
        EXPECT_TRUE(parseJson(nested(64, core)).has_value()) << core;
        EXPECT_FALSE(parseJson(nested(65, core)).has_value()) << core;
    }
    EXPECT_TRUE(parseJson(nested(63, "{}")).has_value());
    EXPECT_TRUE(parseJson(nested(63, R"({"a":1})")).has_value());
    EXPECT_FALSE(parseJson(nested(64, "{}")).has_value());
    EXPECT_TRUE(parseJson("[" + nested(63, "1") + "," + nested(63, "2") + "]").has_value())
        << "depth, not count";
}

TEST(Json, ManyValuesAreNoDepth) {
    std::string text = "[0";
    for (int i = 0; i < 100000; ++i)
        text += ",[]";
    const auto value = parseJson(text + "]");
    ASSERT_TRUE(value.has_value());
    EXPECT_EQ(value->asArray()->size(), 100001u);
}

TEST(Json, ALongStringIsWhole) {
    const std::string content(1000000, 'x');
    EXPECT_EQ(parseJson("\"" + content + "\""), PropertyValue(content));
}

// --- Writing -------------------------------------------------------------------------------------

TEST(Json, WritesCompactText) {
    EXPECT_EQ(jsonText(PropertyValue()), "null");
    EXPECT_EQ(jsonText(true), "true");
    EXPECT_EQ(jsonText(false), "false");
    EXPECT_EQ(jsonText(0u), "0");
    EXPECT_EQ(jsonText(18446744073709551615u), "18446744073709551615");
    EXPECT_EQ(jsonText(200.0), "200.0");
    EXPECT_EQ(jsonText(-1.5), "-1.5");
    EXPECT_EQ(jsonText(1e22), "1e+22");
    EXPECT_EQ(jsonText("text"), "\"text\"");
    EXPECT_EQ(jsonText(PropertyValue::Bytes{1, 255}), "\"01 ff \"");
    EXPECT_EQ(jsonText(Array{}), "[]");
    EXPECT_EQ(jsonText(Dictionary{}), "{}");
    EXPECT_EQ(jsonText(Array{1u, Array{}, Dictionary{{"b", 1u}, {"a", Array{true}}}}),
              R"([1,[],{"a":[true],"b":1}])");
}

TEST(Json, WritesNumbersThatJsonLacksAsNull) {
    EXPECT_EQ(jsonText(std::numeric_limits<double>::quiet_NaN()), "null");
    EXPECT_EQ(jsonText(std::numeric_limits<double>::infinity()), "null");
    EXPECT_EQ(jsonText(-std::numeric_limits<double>::infinity()), "null");
}

TEST(Json, AppendsToWhatIsThere) {
    std::string text = "x=";
    appendJson(text, Array{1u});
    appendJsonString(text, "y");
    EXPECT_EQ(text, "x=[1]\"y\"");
}

TEST(Json, EscapesQuotesAndBackslashes) {
    std::string text;
    appendJsonString(text, R"(a"b\c)");
    EXPECT_EQ(text, R"("a\"b\\c")");
}

TEST(Json, EscapesEveryControlCharacter) {
    for (char c = 0; c < 0x20; ++c) {
        const std::string original{'a', c, 'b'};
        const std::string text = jsonText(original);
        EXPECT_EQ(text.find(c), std::string::npos) << static_cast<int>(c) << " stands there as it is";
        EXPECT_EQ(parseJson(text), PropertyValue(original)) << static_cast<int>(c);
    }
}

TEST(Json, LeavesOtherCharactersAlone) {
    const std::string original = "\x7F\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80";
    EXPECT_EQ(jsonText(original), "\"" + original + "\"");
    EXPECT_EQ(parseJson(jsonText(original)), PropertyValue(original));
}

TEST(Json, ReplacesMalformedTextInValuesAndKeys) {
    EXPECT_EQ(jsonText("a\x80z"), "\"a\xEF\xBF\xBDz\"");
    EXPECT_EQ(jsonText(Dictionary{{"\xFF", 1u}}), "{\"\xEF\xBF\xBD\":1}");
    EXPECT_EQ(jsonText("\xC3\""), "\"\xEF\xBF\xBD\\\"\"") << "the quote is no part of the broken sequence";
}

TEST(Json, WritesSixtyFourLevels) {
    PropertyValue value = 1u;
    for (int i = 0; i < 64; ++i)
        value = Array{value};
    EXPECT_EQ(jsonText(value), std::string(64, '[') + "1" + std::string(64, ']'));
    const PropertyValue tooDeep = Array{value};
    EXPECT_EQ(jsonText(tooDeep), std::string(64, '[') + "null" + std::string(64, ']'));
    std::string text;
    appendJson(text, value, 2);
    EXPECT_EQ(text, std::string(63, '[') + "null" + std::string(63, ']')) << "when it stands at level 2";
}

TEST(Json, DeepDictionariesAreCutToo) {
    PropertyValue value = "core";
    for (int i = 0; i < 70; ++i)
        value = Dictionary{{"a", value}};
    const std::string text = jsonText(value);
    EXPECT_TRUE(parseJson(text).has_value());
    EXPECT_NE(text.find(R"("a":null)"), std::string::npos);
    EXPECT_EQ(text.find("core"), std::string::npos);
}

} // namespace
} // namespace ZorvaTouch::Util
