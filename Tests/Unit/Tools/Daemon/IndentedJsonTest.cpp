#include "Tools/Daemon/IndentedJson.h"

#include "Shared/Util/Json.h"

#include <gtest/gtest.h>

namespace ZorvaTouch::Tools {
namespace {

TEST(IndentedJson, HasEachValueOnALineOfItsOwn) {
    EXPECT_EQ(indentedJson(R"({"a":1,"b":[true,null],"c":{"d":"x"}})"), "{\n"
                                                                        "  \"a\": 1,\n"
                                                                        "  \"b\": [\n"
                                                                        "    true,\n"
                                                                        "    null\n"
                                                                        "  ],\n"
                                                                        "  \"c\": {\n"
                                                                        "    \"d\": \"x\"\n"
                                                                        "  }\n"
                                                                        "}\n");
}

TEST(IndentedJson, KeepsEmptyGroupsTogether) {
    EXPECT_EQ(indentedJson(R"({"a":[],"b":{}})"), "{\n  \"a\": [],\n  \"b\": {}\n}\n");
}

TEST(IndentedJson, LeavesStringsAsTheyAre) {
    const std::string text = R"(["{,:[\"\\","}"])";
    EXPECT_EQ(indentedJson(text), "[\n  \"{,:[\\\"\\\\\",\n  \"}\"\n]\n");
    EXPECT_EQ(Util::parseJson(indentedJson(text)), Util::parseJson(text));
}

TEST(WithoutControls, EscapesWhatJsonAllowsInStrings) {
    EXPECT_EQ(withoutControls("[\"a\x7F\xC2\x80\xC2\x9B\xC2\x9F\xC2\xA0\xC3\xA9\"]"),
              "[\"a\\u007f\\u0080\\u009b\\u009f\xC2\xA0\xC3\xA9\"]");
    EXPECT_EQ(withoutControls("{}"), "{}");
}

} // namespace
} // namespace ZorvaTouch::Tools
