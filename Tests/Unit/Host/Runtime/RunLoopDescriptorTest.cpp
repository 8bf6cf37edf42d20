#include "Host/Interface/RunLoop.h"

#include "Host/Linux/UniqueFd.h"
#include "Tests/Unit/Host/Runtime/RunLoopFixture.h"

#include <algorithm>
#include <cstddef>
#include <fcntl.h>
#include <filesystem>
#include <iterator>
#include <memory>

namespace ZorvaTouch::Host {
namespace {

/// With a pipe that blocks and with one that does not: the two are waited for in different ways.
class RunLoopDescriptors : public RuntimeTests::RunLoopFixture, public ::testing::WithParamInterface<bool> {
protected:
    RunLoopDescriptors() {
        if (GetParam()) {
            ::fcntl(pipe.readEnd(), F_SETFL, O_NONBLOCK);
            ::fcntl(otherPipe.readEnd(), F_SETFL, O_NONBLOCK);
        }
    }

    RuntimeTests::Pipe pipe;
    RuntimeTests::Pipe otherPipe;
};

using RuntimeTests::Pipe;
using RuntimeTests::ScopedThread;

TEST_P(RunLoopDescriptors, AreServedAsLongAsTheyAreReadable) {
    addDescriptor('p', pipe.readEnd(), [this] { served.push_back(pipe.read()); });
    pipe.write("12");
    passes(2);
    signal(addSource('s'));
    passes(1);
    pipe.write("3");
    passes(1);
    EXPECT_EQ(served, "p1p2sp3");
}

TEST_P(RunLoopDescriptors, WakeTheLoopWhenSomethingComes) {
    addDescriptor('p', pipe.readEnd());
    const auto isInPass = platform.createSemaphore();
    loop->perform("mode", [&] { isInPass->signal(); });
    const ScopedThread other([&] {
        isInPass->wait();
        pipe.write("1");
    });
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "p");
}

TEST_P(RunLoopDescriptors, MayBeAddedWhileTheLoopWaits) {
    addSource('s');
    pipe.write("1");
    const auto isInPass = platform.createSemaphore();
    loop->perform("mode", [&] { isInPass->signal(); });
    const ScopedThread other([&] {
        isInPass->wait();
        addDescriptor('p', pipe.readEnd());
    });
    EXPECT_EQ(pass(), RunOutcome::HandledSource);
    EXPECT_EQ(served, "p");
}

TEST_P(RunLoopDescriptors, MayBeSignalledAsWell) {
    const auto p = addDescriptor('p', pipe.readEnd(), [this] {
        if (served.size() == 2)
            served.push_back(pipe.read());
    });
    signal(p);
    passes(1);
    pipe.write("1");
    passes(1);
    EXPECT_EQ(served, "pp1");
}

TEST_P(RunLoopDescriptors, ThatAreNeverReadAndSourcesThatNeverRestTakeTurns) {
    std::uint64_t s = 0;
    s = addSource('s', [&] { signal(s); });
    pipe.write("1");
    otherPipe.write("1");
    signal(s);
    addDescriptor('p', pipe.readEnd());
    addDescriptor('q', otherPipe.readEnd());
    passes(9);
    for (const char name : {'s', 'p', 'q'})
        EXPECT_EQ(std::count(served.begin(), served.end(), name), 3) << name << " in " << served;
}

TEST_P(RunLoopDescriptors, OfAnotherModeStayReady) {
    pipe.write("1");
    otherPipe.write("2");
    addDescriptor(
        'p', pipe.readEnd(), [this] { served.push_back(pipe.read()); }, "other");
    addDescriptor('q', otherPipe.readEnd(), [this] { served.push_back(otherPipe.read()); });
    EXPECT_EQ(pass("mode"), RunOutcome::HandledSource);
    signal(addSource('s'));
    EXPECT_EQ(pass("mode"), RunOutcome::HandledSource);
    EXPECT_EQ(pass("other"), RunOutcome::HandledSource);
    EXPECT_EQ(served, "q2sp1");
}

// --- Readiness that is gone ------------------------------------------------------------------------

TEST_P(RunLoopDescriptors, AreNotServedWhenAnotherSourceHasReadEverything) {
    addDescriptor('.', pipe.readEnd(), [this] { served.push_back(pipe.read()); });
    addDescriptor('.', pipe.readEnd(), [this] { served.push_back(pipe.read()); });
    const auto s = addSource('s');
    for (const char *bytes : {"1", "23", "4", "5"}) {
        pipe.write(bytes);
        passes(static_cast<int>(std::string(bytes).size()));
        signal(s);
        passes(1);
    }
    EXPECT_EQ(served, ".1s.2.3s.4s.5s");
}

TEST_P(RunLoopDescriptors, AreNotServedWhenAClosureHasReadEverything) {
    addDescriptor('.', pipe.readEnd(), [this] { served.push_back(pipe.read()); });
    const auto s = addSource('s');
    pipe.write("1");
    passes(1);
    signal(s);
    pipe.write("2");
    passes(1);
    loop->perform("mode", [this] { EXPECT_EQ(pipe.read(), '2'); });
    signal(s);
    passes(1);
    EXPECT_EQ(served, ".1ss");
}

TEST_P(RunLoopDescriptors, DoNotInheritThePredecessorsReadiness) {
    // Two become ready at once. Before the second is served, an empty pipe takes its place.
    const Pipe empty;
    const auto p = addDescriptor('p', pipe.readEnd(), [this] { (void)pipe.read(); });
    const auto q = addDescriptor('q', otherPipe.readEnd(), [this] { (void)otherPipe.read(); });
    pipe.write("1");
    otherPipe.write("1");
    passes(1);
    remove(served == "p" ? q : p);
    addDescriptor('e', empty.readEnd());
    {
        // Whatever is still owed to the predecessor is paid out while another mode waits.
        addSource('o', {}, "other");
        const ScopedThread other([this] { loop->stop(); });
        EXPECT_EQ(pass("other"), RunOutcome::Stopped);
    }
    signal(addSource('s'));
    passes(1);
    EXPECT_EQ(served.substr(1), "s");
}

TEST_P(RunLoopDescriptors, DoNotInheritItWithinAServiceEither) {
    const Pipe empty;
    std::uint64_t sources[2] = {};
    const auto replaceOther = [&](int own) {
        remove(sources[1 - own]);
        addDescriptor('e', empty.readEnd());
        (void)(own == 0 ? pipe : otherPipe).read();
    };
    sources[0] = addDescriptor('p', pipe.readEnd(), [&] { replaceOther(0); });
    sources[1] = addDescriptor('q', otherPipe.readEnd(), [&] { replaceOther(1); });
    pipe.write("1");
    otherPipe.write("1");
    passes(1);
    const auto s = addSource('s');
    for (int round = 0; round < 2; ++round) {
        signal(s);
        passes(1);
    }
    EXPECT_EQ(served.substr(1), "ss");
}

// --- Ends and errors -------------------------------------------------------------------------------

TEST_P(RunLoopDescriptors, ThatWereHungUpAreServedUntilTheyAreRemoved) {
    std::uint64_t p = 0;
    p = addDescriptor('p', pipe.readEnd(), [&] {
        if (served.size() == 3)
            remove(p);
    });
    pipe.closeWriteEnd();
    passes(3);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(served, "ppp");
}

TEST_P(RunLoopDescriptors, ThatHaveFailedAreServedUntilTheyAreRemoved) {
    std::uint64_t p = 0;
    p = addDescriptor('p', pipe.writeEnd(), [&] {
        if (served.size() == 2)
            remove(p);
    });
    pipe.closeReadEnd(); // an error at the end that writes, and nothing to read
    passes(2);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(served, "pp");
}

TEST_P(RunLoopDescriptors, ThatCannotBePolledAreRefusedWithALine) {
    const RuntimeTests::LogText file;
    const Linux::UniqueFd folder(::open("/", O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    const Linux::UniqueFd null(::open("/dev/null", O_RDONLY | O_CLOEXEC));
    std::string lines;
    for (const int descriptor : {::fileno(file.file()), folder.get(), null.get()}) {
        EXPECT_EQ(addDescriptor('f', descriptor), 0u);
        lines += "error subsystem=org.zorva.hid.ZorvaTouch category=RunLoop refused: watch descriptor " +
                 std::to_string(descriptor) + ": Operation not permitted\n";
    }
    EXPECT_EQ(log.text(), lines);
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(served, "");
}

TEST_P(RunLoopDescriptors, ThatAreNoneAreRefusedWithALine) {
    EXPECT_EQ(addDescriptor('p', -1), 0u);
    EXPECT_EQ(log.text(), "error subsystem=org.zorva.hid.ZorvaTouch category=RunLoop "
                          "refused: watch descriptor -1: Bad file descriptor\n");
    EXPECT_EQ(pass(), RunOutcome::Finished);
}

// --- The owner's descriptor ------------------------------------------------------------------------

TEST_P(RunLoopDescriptors, KeepTheirFlags) {
    const int before = ::fcntl(pipe.readEnd(), F_GETFL);
    pipe.write("1");
    addDescriptor('p', pipe.readEnd(), [&] { EXPECT_EQ(::fcntl(pipe.readEnd(), F_GETFL), before); });
    passes(1);
    EXPECT_EQ((before & O_NONBLOCK) != 0, GetParam());
}

TEST_P(RunLoopDescriptors, StayOpenWhenTheLoopIsGone) {
    addDescriptor('p', pipe.readEnd());
    pipe.write("1");
    passes(1);
    loop.reset();
    EXPECT_EQ(pipe.read(), '1');
    EXPECT_EQ(served, "p");
}

std::ptrdiff_t openDescriptors() {
    return std::distance(std::filesystem::directory_iterator("/proc/self/fd"), {});
}

TEST_P(RunLoopDescriptors, CostNothingOnceTheyAreRemovedOrTheLoopIsGone) {
    remove(addDescriptor('p', pipe.readEnd())); // what the loop itself needs is there from now on
    const auto before = openDescriptors();
    const auto p = addDescriptor('p', pipe.readEnd());
    EXPECT_EQ(openDescriptors(), before + (GetParam() ? 0 : 1)) << "one that blocks needs a set of its own";
    remove(p);
    EXPECT_EQ(openDescriptors(), before);

    auto another = platform.createRunLoop();
    another->boundary()->table->addDescriptor(
        another->boundary(), "mode", pipe.readEnd(), [](void *) {}, nullptr);
    another.reset();
    EXPECT_EQ(openDescriptors(), before);
}

TEST_P(RunLoopDescriptors, AreForgottenWhenTheyAreRemoved) {
    for (int round = 0; round < 3; ++round) {
        auto reused = std::make_unique<Pipe>(); // gets the numbers that the last one had
        reused->write("1");
        const auto p = addDescriptor('p', reused->readEnd());
        passes(1);
        remove(p);
    }
    EXPECT_EQ(pass(), RunOutcome::Finished);
    EXPECT_EQ(served, "ppp");
}

INSTANTIATE_TEST_SUITE_P(Pipes, RunLoopDescriptors, ::testing::Bool(),
                         [](const auto &pipes) { return pipes.param ? "NonBlocking" : "Blocking"; });

} // namespace
} // namespace ZorvaTouch::Host
