#include "Tools/Cli/Suggestion.h"

#include <gtest/gtest.h>

#include <array>
#include <string>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::array<std::string_view, 5> kNames{"replay", "info", "trim", "--duration", "make"};

TEST(Suggestion, FindsANameThatIsOneEditAway) {
    for (const char *word : {"repla", "replayy", "rreplay", "reply", "replzy", "replya", "Replay", "REPLAY"})
        EXPECT_EQ(closestName(word, kNames), "replay") << word;
}

TEST(Suggestion, ALongerWordMayDifferMore) {
    EXPECT_EQ(closestName("--durration", kNames), "--duration");
    EXPECT_EQ(closestName("--durratoin", kNames), "--duration") << "two edits of eleven characters";
    EXPECT_EQ(closestName("mkae", kNames), "make") << "one edit of four";
    EXPECT_EQ(closestName("mka", kNames), "") << "two edits of three";
}

TEST(Suggestion, PrefersTheClosestAndThenTheFirst) {
    constexpr std::array<std::string_view, 3> names{"abcdefgx", "abcdefgh", "abcdefgi"};
    EXPECT_EQ(closestName("abcdefgh", names), "abcdefgh");
    EXPECT_EQ(closestName("abcdefgz", names), "abcdefgx");
}

TEST(Suggestion, MakesNoneForWhatIsFarAway) {
    for (const std::string &word :
         {std::string(), std::string("record"), std::string("x"), std::string(100'000, 'r')})
        EXPECT_EQ(closestName(word, kNames), "") << word.substr(0, 10);
    EXPECT_EQ(closestName("replay", {}), "");
}

TEST(Suggestion, EndsAMessage) {
    EXPECT_EQ(suggestion("trin", kNames), "; did you mean 'trim'?");
    EXPECT_EQ(suggestion("record", kNames), "");
    EXPECT_EQ(suggestion("record", kNames, "; see --help"), "; see --help");
}

} // namespace
} // namespace ZorvaTouch::Tools
