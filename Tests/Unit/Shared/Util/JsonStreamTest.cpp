#include "Shared/Util/JsonStream.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <stdexcept>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Util {
namespace {

/// A text that arrives in pieces of some bytes.
TextPieces inPiecesOf(std::size_t bytes, std::string_view text) {
    return [bytes, pieces = piecesOf(text)](char *to, std::size_t size) mutable {
        return pieces(to, std::min(bytes, size));
    };
}

/// The text as the reader sees it: entered containers as they are, single values as compact JSON.
std::string stepped(JsonStream &stream, std::size_t levels) {
    if (levels == 0 || !(stream.isAtArray() || stream.isAtObject()))
        return jsonText(stream.value().toPropertyValue());
    const bool isArray = stream.isAtArray();
    std::string text;
    std::string key;
    stream.enter();
    while (isArray ? stream.nextElement() : stream.nextMember(key))
        text += (text.empty() ? "" : " ") + (isArray ? "" : key + "=") + stepped(stream, levels - 1);
    return "<" + text + ">";
}

std::string stepped(TextPieces pieces, std::size_t levels) {
    JsonStream stream(std::move(pieces));
    std::string text = stepped(stream, levels);
    stream.finish();
    return text;
}

/// "reason at offset" of a text that is refused when its first two levels are stepped through.
std::string refusal(std::string_view text) {
    try {
        return "accepted: " + stepped(piecesOf(text), 2);
    } catch (const JsonError &error) {
        return error.what() + std::string(" at ") + std::to_string(error.offset);
    }
}

TEST(JsonStream, StepsThroughArraysAndObjects) {
    const std::string_view text = R"( {"a" : [1, "two" ,[3,[4]], {"b":5}] ,"":{}, "c\n\"":null,"d":[ ] } )";
    EXPECT_EQ(stepped(piecesOf(text), 0), R"({"":{},"a":[1,"two",[3,[4]],{"b":5}],"c\n\"":null,"d":[]})");
    EXPECT_EQ(stepped(piecesOf(text), 1), "<a=[1,\"two\",[3,[4]],{\"b\":5}] ={} c\n\"=null d=[]>");
    EXPECT_EQ(stepped(piecesOf(text), 2), "<a=<1 \"two\" [3,[4]] {\"b\":5}> =<> c\n\"=null d=<>>");
    EXPECT_EQ(stepped(piecesOf(text), 9), "<a=<1 \"two\" <3 <4>> <b=5>> =<> c\n\"=null d=<>>");
}

TEST(JsonStream, TakesTheTextInPiecesOfAnySize) {
    const std::string_view text = R"({"a":[1.5,"x\\\"y\\",true,"\\"],"b":[-7,{"c":"]}"}]})";
    for (std::size_t bytes = 1; bytes <= text.size(); ++bytes)
        EXPECT_EQ(stepped(inPiecesOf(bytes, text), 2),
                  R"(<a=<1.5 "x\\\"y\\" true "\\"> b=<-7.0 {"c":"]}"}>>)")
            << bytes;
}

TEST(JsonStream, AValueMayBeLongerThanAPiece) {
    const std::string content(1'000'000, 'x');
    const std::string text = "[1,\"" + content + "\",[\"" + content + "\"],2]";
    JsonStream stream(inPiecesOf(1000, text));
    std::vector<std::size_t> lengths;
    stream.enter();
    while (stream.nextElement())
        lengths.push_back(jsonText(stream.value().toPropertyValue()).size());
    stream.finish();
    EXPECT_EQ(lengths, (std::vector<std::size_t>{1, 1'000'002, 1'000'004, 1}));
}

TEST(JsonStream, ReportsWhereTheTextStopsBeingJson) {
    EXPECT_EQ(refusal(""), "the text is empty at 0");
    EXPECT_EQ(refusal("\xEF\xBB\xBF[]"), "the text begins with a byte-order mark at 0");
    EXPECT_EQ(refusal("  "), "the text ends early at 2");
    EXPECT_EQ(refusal("hello"), "not JSON at 0");
    EXPECT_EQ(refusal("[1,2"), "the text ends early at 4");
    EXPECT_EQ(refusal("[1,2,"), "the text ends early at 5");
    EXPECT_EQ(refusal("[1,2,]"), "a value is missing at 5");
    EXPECT_EQ(refusal("[1 2]"), "',' is missing at 3");
    EXPECT_EQ(refusal("[1}"), "',' is missing at 2");
    EXPECT_EQ(refusal("[]]"), "text after the end at 2");
    EXPECT_EQ(refusal(R"({"a":1,})"), "an object's key must be a string at 7");
    EXPECT_EQ(refusal(R"({"a" 1})"), "':' is missing after an object's key at 5");
    EXPECT_EQ(refusal(R"({"a":})"), "a value is missing at 5");
    EXPECT_EQ(refusal(R"([[0,{"a":tru}]])"), "not JSON at 4");
    EXPECT_EQ(refusal("[[0,[1}]]"), "not JSON at 4");
    EXPECT_EQ(refusal("[[0,\"a\nb\"]]"), "malformed string at 4");
    EXPECT_EQ(refusal("[[0,\"a"), "malformed string at 4");
    EXPECT_EQ(refusal("[[0,\"\xFF\"]]"), "malformed UTF-8 at 4");
    EXPECT_EQ(refusal("[[0,1e400]]"), "malformed number, or number out of range at 4");
}

TEST(JsonStream, CountsTheLevelsThatWereEntered) {
    const auto nested = [](std::size_t depth) {
        return std::string(depth, '[') + "1" + std::string(depth, ']');
    };
    for (const std::size_t entered : {0U, 1U, 2U, 63U}) {
        EXPECT_NO_THROW(static_cast<void>(stepped(piecesOf(nested(64)), entered))) << entered;
        EXPECT_THROW(static_cast<void>(stepped(piecesOf(nested(65)), entered)), JsonError) << entered;
    }
}

TEST(JsonStream, WhatTheSourceThrowsPassesThrough) {
    const TextPieces failing = [count = 0](char *to, std::size_t) mutable -> std::size_t {
        if (count++ > 0)
            throw std::out_of_range("the disk is gone");
        *to = '[';
        return 1;
    };
    EXPECT_THROW(static_cast<void>(stepped(failing, 1)), std::out_of_range);
}

} // namespace
} // namespace ZorvaTouch::Util
