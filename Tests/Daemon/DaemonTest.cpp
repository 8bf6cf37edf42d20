#include "Tests/Daemon/DaemonFixture.h"

#include "Host/Linux/Journal.h"
#include "Host/Runtime/AsyncLogs.h"
#include "Host/Runtime/Files.h"
#include "Service/AccelCapture.h"
#include "Shared/RecordingContainer.h"
#include "Tests/Unit/Host/Linux/JournalSocket.h"

#include <gmock/gmock.h>

#include <cerrno>
#include <csignal>
#include <cstddef>
#include <filesystem>
#include <memory>
#include <stdexcept>
#include <string>

namespace ZorvaTouch::Tools {
namespace {

using Linux::Tests::openDescriptors;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::SizeIs;
using Tests::Lines;

class DaemonTest : public Tests::DaemonFixture {
protected:
    /// Lines without their times.
    [[nodiscard]] static Lines timeless(Lines lines) {
        for (std::string &line : lines)
            line.erase(line.find(",\"timeNs\""));
        return lines;
    }
    /// Serves to the end of all fingers.
    void runToTheEnd() {
        start();
        daemon->run();
        finish();
    }
    /// Why it cannot be made; empty if it can.
    [[nodiscard]] std::string problem() {
        try {
            start();
            return {};
        } catch (const std::runtime_error &error) {
            return error.what();
        }
    }
};

// --- Fingers
// ---------------------------------------------------------------------------------------------------

TEST_F(DaemonTest, PlaysASimulatedFingerToItsEndAndEnds) {
    addFinger("taps", 0.95); // time for one
    runToTheEnd();
    EXPECT_THAT(
        timeless(output->lines.lines()),
        ElementsAre(
            R"({"type":"surface","state":"added","surface":"sim:taps","node":"sim:taps","name":"simulated surface")",
            R"({"type":"surface","state":"opened","surface":"sim:taps","node":"sim:taps","name":"simulated surface")",
            R"({"type":"gesture","surface":"sim:taps","gesture":"may-begin","region":"volume-up")",
            R"({"type":"gesture","surface":"sim:taps","gesture":"tap","region":"volume-up")",
            R"({"type":"key","key":"KEY_VOLUMEUP","code":115,"state":"down","sent":true,"surface":"sim:taps")",
            R"({"type":"key","key":"KEY_VOLUMEUP","code":115,"state":"up","sent":true,"surface":"sim:taps")"));
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115", "1 unplugged"));
}

TEST_F(DaemonTest, TwoFingersOfOneKindAreTwoSurfacesAndItEndsWithTheLast) {
    addFinger("taps", 0.95);
    addFinger("taps", 0.2);
    runToTheEnd();
    EXPECT_THAT(linesWith("\"opened\""), SizeIs(2));
    EXPECT_THAT(linesWith("\"surface\":\"sim:taps-2\""), SizeIs(2));
    EXPECT_THAT(linesWith("\"key\":"), SizeIs(2));
}

TEST_F(DaemonTest, EachFingerShakesTheAccelerometerOfItsOwnSurfaceAlone) {
    const Tests::TemporaryFolder folder;
    options.saveFile = folder.path("touch.json");
    for (int i = 0; i < 3; ++i)
        addFinger("taps", 0.95); // 95 samples at 100 Hz, and a gesture, without which none is recorded
    runToTheEnd();
    for (const char *const name : {"touch.json", "touch-2.json", "touch-3.json"}) {
        std::size_t samples = 0;
        for (const FrameView frame : readRecordingContainer(Host::readFile(folder.path(name))).frames)
            samples += frame.key == kAccelMetadataKey ? 1U : 0U;
        EXPECT_GT(samples, 0u) << name;
        EXPECT_LE(samples, 95u) << name;
    }
}

TEST_F(DaemonTest, WithoutAKeyboardKeysAreTold) {
    options.showsEvents = false;
    const std::string refusal = "/dev/uinput: Permission denied";
    keys.makerErrors = {refusal, refusal, refusal, refusal}; // it is tried with each key
    addFinger("taps", 0.95);
    runToTheEnd();
    EXPECT_THAT(output->lines.lines(),
                ElementsAre(HasSubstr("time  region"), HasSubstr("KEY_VOLUMEUP        down"),
                            HasSubstr("KEY_VOLUMEUP        up")));
    EXPECT_EQ(logs.lines().count("Keys error: keys are shown, not pressed: /dev/uinput: Permission denied"),
              1u);
}

TEST_F(DaemonTest, ASimulatedSurfaceShowsItsKeysUnlessAskedToPressThem) {
    options.sendsSimulatedKeys = false;
    addFinger("taps", 0.95);
    runToTheEnd();
    EXPECT_THAT(keys.journal.lines(), IsEmpty());
    EXPECT_THAT(linesWith("\"sent\":false"), SizeIs(2));
}

TEST_F(DaemonTest, KeysThatAreOnlyShownAskForNoKeyboard) {
    options.sendsKeys = false;
    addFinger("taps", 0.95);
    runToTheEnd();
    EXPECT_THAT(keys.journal.lines(), IsEmpty());
    EXPECT_THAT(linesWith("\"sent\":false"), SizeIs(2));
}

// --- Signals
// -----------------------------------------------------------------------------------------------------

class DaemonEnd : public DaemonTest, public testing::WithParamInterface<int> {};

TEST_P(DaemonEnd, ReleasesAKeyThatIsDown) {
    addFinger("holds", std::nullopt);
    keys.onPress = [](KeyCode) { signal(GetParam()); };
    start();
    daemon->run();
    finish();
    EXPECT_THAT(keys.journal.lines(), SizeIs(4));
    EXPECT_THAT(keys.down(), IsEmpty());
    EXPECT_THAT(linesWith("\"state\":\"up\""), SizeIs(1));
}

TEST_P(DaemonEnd, IsHeardBeforeItServes) {
    addFinger("idle", std::nullopt);
    start();
    signal(GetParam());
    daemon->run();
}

INSTANTIATE_TEST_SUITE_P(Signals, DaemonEnd, testing::Values(SIGTERM, SIGINT, SIGHUP));

TEST_F(DaemonTest, SavesWhenToldToAndGoesOn) {
    const Tests::TemporaryFolder folder;
    options.saveFile = folder.path("touch.json");
    addFinger("idle", std::nullopt);
    addFinger("idle", std::nullopt);
    start();
    runWhile([this] {
        output->lines.waitFor("\"opened\"", 2);
        signal(SIGUSR1);
        output->lines.waitFor("\"type\":\"recording\"", 2);
    });
    EXPECT_EQ(readRecordingContainer(Host::readFile(folder.path("touch-2.json"))).version, 2u);
    finish();
    EXPECT_EQ(readRecordingContainer(Host::readFile(folder.path("touch.json"))).version, 2u);
    EXPECT_THAT(linesWith("\"file\":\"" + folder.path("touch-2.json") + "\",\"surface\":\"sim:idle-2\""),
                Not(IsEmpty()));
}

TEST_F(DaemonTest, ARecordingThatIsLostIsAFailure) {
    const Tests::TemporaryFolder folder;
    options.saveFile = folder.path("touch.json");
    addFinger("idle", 0.2);
    start();
    daemon->run();
    std::filesystem::create_directory(folder.path("touch.json"));
    EXPECT_FALSE(daemon->end());
    EXPECT_FALSE(daemon->isStuck());
    EXPECT_EQ(logs.lines().count("touch.json: cannot replace: Is a directory"), 1u);
}

TEST_F(DaemonTest, ARecordingThatIsSavedIsNone) {
    const Tests::TemporaryFolder folder;
    options.saveFile = folder.path("touch.json");
    addFinger("idle", 0.2);
    start();
    daemon->run();
    EXPECT_TRUE(daemon->end());
    EXPECT_THAT(linesWith("\"type\":\"recording\""), SizeIs(1));
}

TEST_F(DaemonTest, WhatCannotBeSavedInTheEndIsFoundAtTheStart) {
    const Tests::TemporaryFolder folder;
    options.saveFile = folder.path("touch.json");
    std::filesystem::create_directory(folder.path("touch-2.json"));
    addFinger("idle", 0.2);
    EXPECT_EQ(problem(), folder.path("touch-2.json") + ": cannot replace: Is a directory");
    options.saveLimits.count = 1;
    EXPECT_EQ(problem(), "");
}

TEST_F(DaemonTest, TemporaryFilesOfKilledDaemonsAreRemovedAtTheStart) {
    const Tests::TemporaryFolder folder;
    options.saveFile = folder.path("touch.json");
    Host::replaceFile(folder.path(".zorvatouch-0123456789abcdef"), "left");
    addFinger("idle", 0.2);
    start();
    EXPECT_FALSE(std::filesystem::exists(folder.path(".zorvatouch-0123456789abcdef")));
}

TEST_F(DaemonTest, ARecordingHasWhatItWasMadeWith) {
    const Tests::TemporaryFolder folder;
    options.saveFile = folder.path("touch.json");
    addFinger("taps", 0.95);
    runToTheEnd();
    const FrameList frames = readRecordingContainer(Host::readFile(folder.path("touch.json"))).frames;
    std::string keys;
    for (const FrameView &frame : frames)
        if (frame.type == FrameType::Metadata && frame.key != "Accel")
            keys.append(frame.key).append(" ");
    EXPECT_EQ(keys, "Device Software Tunables ");
}

// --- What it does not wait for
// -------------------------------------------------------------------------------------

TEST_F(DaemonTest, AnOutputThatNobodyReadsKeepsNeitherKeysNorTheEndWaiting) {
    output->isRead = false;
    addFinger("taps", 0.95);
    runToTheEnd();
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115", "1 unplugged"));
    EXPECT_EQ(logs.lines().count("Events error: standard output: its reader hangs"), 1u);
}

TEST_F(DaemonTest, AJournalThatDoesNotReadKeepsNeitherKeysNorTheEndWaiting) {
    const Linux::Tests::JournalSocket journal;
    Host::AsyncLogs stalled(Ports::LogLevel::Debug, Linux::journalFormat(),
                            std::make_shared<Linux::JournalWriter>(journal.path()));
    for (std::size_t i = 0; i < 2 * Host::AsyncWriter::kCapacity; ++i)
        stalled.openLog("s", "c")->write(Ports::LogLevel::Error, "full");
    journal.waitUntilFull();
    logProvider = &stalled;
    options.logLevel = Ports::LogLevel::Debug; // each report is a record on the input thread
    addFinger("holds", std::nullopt);
    keys.onPress = [](KeyCode) { signal(SIGTERM); };
    start();
    daemon->run();
    finish();
    EXPECT_THAT(keys.journal.lines(), SizeIs(4));
    EXPECT_THAT(keys.down(), IsEmpty());
}

TEST_F(DaemonTest, AnOutputThatFailsIsOneLineAndItGoesOn) {
    output->errorNumber = ENOSPC;
    addFinger("taps", 0.95);
    runToTheEnd();
    EXPECT_THAT(keys.journal.lines(), ElementsAre("1 plugged", "1 +115", "1 -115", "1 unplugged"));
    EXPECT_EQ(logs.lines().count("Events error: standard output: cannot write: No space left on device; "
                                 "nothing is shown any more"),
              1u);
}

// --- What cannot be
// ------------------------------------------------------------------------------------------------

TEST_F(DaemonTest, WithoutAPlugInThereIsNone) {
    plugIn = "/nowhere/plugin.so";
    addFinger("idle", std::nullopt);
    EXPECT_THAT(problem(), HasSubstr(" /nowhere/plugin.so: "));
    EXPECT_THAT(problem(), Not(HasSubstr("\n")));
    EXPECT_THAT(output->lines.lines(), IsEmpty());
}

TEST_F(DaemonTest, NeitherIsThereWithAFileThatIsNone) {
    plugIn = "/bin/true";
    EXPECT_THAT(problem(), HasSubstr("/bin/true"));
    EXPECT_THAT(problem(), Not(HasSubstr("\n")));
}

TEST_F(DaemonTest, OneAfterTheOtherKeepsNoDescriptor) {
    addFinger("day", 0.1);
    runToTheEnd();
    const auto before = openDescriptors();
    for (int i = 0; i < 10; ++i)
        runToTheEnd();
    plugIn = "/nowhere/plugin.so";
    for (int i = 0; i < 10; ++i)
        EXPECT_NE(problem(), "");
    EXPECT_EQ(openDescriptors(), before);
}

} // namespace
} // namespace ZorvaTouch::Tools
