#include "Tools/Cli/Progress.h"

#include "Tests/Unit/Tools/Cli/CliFixture.h"

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint64_t kMs = 1'000'000; // ticks

class ProgressBar : public ::testing::Test {
protected:
    /// Lets time pass and says how far the work is; what appears on standard error.
    std::string after(std::uint64_t ms, std::size_t done) {
        clock.ticks += ms * kMs;
        bar->update(done);
        return std::exchange(errorSink.text, "");
    }

    StringSink outputSink, errorSink;
    Scripted::FakeClock clock;
    Environment environment{.openInput = {},
                            .output = {outputSink, "standard output"},
                            .errorOutput = {errorSink, "standard error"},
                            .clock = clock,
                            .openLogs = {},
                            .usesColour = false,
                            .showsProgress = true};
    std::optional<Progress> bar{std::in_place, environment, "a.json"};
};

TEST_F(ProgressBar, AppearsAfterASecond) {
    bar->begin("reading", 60);
    EXPECT_EQ(after(999, 10), "");
    EXPECT_EQ(after(1, 20), "\r\x1b[Ka.json: reading [##########....................] 33%");
}

TEST_F(ProgressBar, IsDrawnTenTimesASecond) {
    bar->begin("reading", 60);
    static_cast<void>(after(1000, 20));
    EXPECT_EQ(after(99, 30), "");
    EXPECT_EQ(after(1, 60), "\r\x1b[Ka.json: reading [##############################] 100%");
}

TEST_F(ProgressBar, CountsTheFirstSecondFromTheFirstPartOn) {
    bar->begin("reading", 60);
    EXPECT_EQ(after(600, 60), "");
    bar->begin("replaying", 8);
    EXPECT_EQ(after(400, 2), "\r\x1b[Ka.json: replaying [#######.......................] 25%");
}

TEST_F(ProgressBar, ShowsMegabytesIfTheWholeIsUnknown) {
    bar->begin("reading", 0);
    EXPECT_EQ(after(1000, 17'900'000), "\r\x1b[Ka.json: reading 17 MB");
}

TEST_F(ProgressBar, StopsAtAllOfIt) {
    bar->begin("reading", 60);
    EXPECT_EQ(after(1000, 61), "\r\x1b[Ka.json: reading [##############################] 100%")
        << "the file grew";
}

TEST_F(ProgressBar, MakesWayForOutput) {
    static_cast<void>(after(1000, 20));
    environment.output.write("text");
    environment.output.flush();
    EXPECT_EQ(errorSink.text, "\r\x1b[K");
    environment.output.write("more");
    environment.output.flush();
    EXPECT_EQ(errorSink.text, "\r\x1b[K"); // it is hidden already
}

TEST_F(ProgressBar, IsGoneAfterTheWork) {
    static_cast<void>(after(1000, 20));
    bar.reset();
    EXPECT_EQ(errorSink.text, "\r\x1b[K");
    environment.output.write("text");
    environment.output.flush();
    EXPECT_EQ(errorSink.text, "\r\x1b[K");
}

TEST_F(ProgressBar, IsNotShownWhenNobodyWatches) {
    environment.showsProgress = false;
    EXPECT_EQ(after(5000, 20), "");
}

} // namespace
} // namespace ZorvaTouch::Tools
