#include "Host/Linux/MainLoop.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <thread>
#include <unistd.h>
#include <vector>

namespace ZorvaTouch::Linux {
namespace {

using namespace std::chrono_literals;
using Numbers = std::vector<int>;

struct Pipe {
    Pipe() { EXPECT_EQ(::pipe(ends), 0); }
    ~Pipe() {
        ::close(ends[0]);
        ::close(ends[1]);
    }
    void fill() const { EXPECT_EQ(::write(ends[1], "x", 1), 1); }
    int ends[2]{};
};

class MainLoopTest : public testing::Test {
protected:
    MainLoop loop;
    Numbers heard;
};

TEST_F(MainLoopTest, RunsWhatWasPostedInOrderAndThenQuits) {
    loop.post([&] { heard.push_back(1); });
    loop.post([&] {
        heard.push_back(2);
        loop.quit();
    });
    loop.post([&] { heard.push_back(3); }); // was there when the pass began
    loop.run();
    EXPECT_EQ(heard, (Numbers{1, 2, 3}));
}

TEST_F(MainLoopTest, RunsWhatIsPostedOnAnotherThread) {
    std::thread other([&] { loop.post([&] { loop.quit(); }); });
    loop.run();
    other.join();
}

TEST_F(MainLoopTest, RunsWhatAPostedFunctionPosts) {
    loop.post([&] { loop.post([&] { loop.quit(); }); });
    loop.run();
}

TEST_F(MainLoopTest, CallsAsLongAsADescriptorIsReadable) {
    const Pipe pipe;
    pipe.fill();
    LoopWatch watch = loop.watch(pipe.ends[0], [&] {
        heard.push_back(1);
        if (heard.size() == 2)
            loop.quit();
    });
    loop.run();
    EXPECT_EQ(heard, (Numbers{1, 1}));
}

TEST_F(MainLoopTest, CallsNoMoreOnceTheWatchIsLetGoOf) {
    const Pipe pipe;
    pipe.fill();
    LoopWatch watch;
    watch = loop.watch(pipe.ends[0], [&] {
        heard.push_back(1);
        watch = LoopWatch(); // itself, while it is called
        loop.post([&] { loop.quit(); });
    });
    EXPECT_TRUE(watch);
    loop.run();
    EXPECT_EQ(heard, Numbers{1});
    EXPECT_FALSE(watch);
}

TEST_F(MainLoopTest, CallsOnceWhenTheTimeHasCome) {
    const LoopWatch late = loop.after(2ms, [&] {
        heard.push_back(2);
        loop.quit();
    });
    const LoopWatch soon = loop.after(0ms, [&] { heard.push_back(1); });
    const LoopWatch never = loop.after(1h, [&] { heard.push_back(3); });
    loop.run();
    EXPECT_EQ(heard, (Numbers{1, 2}));
}

TEST_F(MainLoopTest, QuitsWhenAnotherThreadAsksBeforeItRuns) {
    std::thread([&] { loop.quit(); }).join();
    loop.run();
}

TEST_F(MainLoopTest, QuitsWhenAnotherThreadAsksWhileItRuns) {
    std::thread other;
    loop.post([&] { other = std::thread([&] { loop.quit(); }); });
    loop.run();
    other.join();
}

TEST_F(MainLoopTest, EndsWithWhatAFunctionThrows) {
    loop.post([] { throw std::runtime_error("planted"); });
    try {
        loop.run();
        FAIL() << "it went on";
    } catch (const std::runtime_error &error) {
        EXPECT_STREQ(error.what(), "planted");
    }
}

TEST_F(MainLoopTest, RefusesWhatIsNoDescriptor) {
    EXPECT_THROW(static_cast<void>(loop.watch(-1, [] {})), std::system_error);
}

TEST(MainLoop, DestroysWhatIsLeft) {
    const auto kept = std::make_shared<int>(1);
    {
        MainLoop loop;
        loop.post([kept] {});
        EXPECT_EQ(kept.use_count(), 2);
    }
    EXPECT_EQ(kept.use_count(), 1);
}

} // namespace
} // namespace ZorvaTouch::Linux
