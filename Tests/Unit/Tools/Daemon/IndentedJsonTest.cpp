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

} // namespace
} // namespace ZorvaTouch::Tools
