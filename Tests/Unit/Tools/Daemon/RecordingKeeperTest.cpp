#include "Tools/Daemon/RecordingKeeper.h"

#include "Host/Objects/Accelerometer.h"
#include "Host/Runtime/Files.h"
#include "Shared/InputReport.h"
#include "Shared/RecordingContainer.h"
#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include <gmock/gmock.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cstdint>
#include <filesystem>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using Tests::TouchScript;

class RecordingKeeperTest : public Tests::SurfacesFixture {
protected:
    void SetUp() override {
        std::string pattern = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
        ASSERT_NE(::mkdtemp(pattern.data()), nullptr);
        folder = pattern;
        makeKeeper(path("a.json"));
        whenEndingSurface = [this](const SurfaceName &name, const Surface &surface) {
            keeper->finish(name, surface);
        };
    }
    void TearDown() override {
        surfaces.reset(); // saves
        keeper.reset();
        std::filesystem::remove_all(folder);
    }

    void makeKeeper(std::optional<std::string> file, RecordingLimits limits = {}) {
        keeper.reset();
        keeper.emplace(std::move(file), limits, told, DaemonLog(*logs, "Recordings"), loop);
    }
    [[nodiscard]] std::string path(const std::string &name) const { return folder + "/" + name; }

    void add(int number, const std::string &serial) {
        keeper->expect({.id = serial, .node = "", .name = ""});
        surfaces->onAdded(identity(number, serial));
    }
    /// Saves all that are there.
    void save() {
        surfaces->forEach(
            [this](const SurfaceName &name, const Surface &surface) { keeper->save(name, surface); });
        keeper->wait();
    }
    void remove(int number, const std::string &serial) {
        surfaces->onRemoved(identity(number, serial));
        keeper->wait();
    }
    void tap(int number) { sendAndWait(number, touch.tapPlay(), 2); }
    /// A surface comes, taps come of it, and it goes.
    void tapAndGo(int number, const std::string &serial) {
        add(number, serial);
        tap(number);
        remove(number, serial);
    }
    /// What was told of recordings, the folder being "@".
    [[nodiscard]] Tests::Lines saved() {
        Tests::Lines lines = told.others.take();
        for (std::string &line : lines)
            if (const auto found = line.find(folder); found != std::string::npos)
                line.replace(found, folder.size(), "@");
        return lines;
    }
    [[nodiscard]] std::vector<std::string> filesThere() const {
        std::vector<std::string> names;
        for (const auto &entry : std::filesystem::directory_iterator(folder))
            names.push_back(entry.path().filename());
        return names;
    }

    std::string folder;
    TouchScript touch;
    std::optional<RecordingKeeper> keeper;
};

TEST_F(RecordingKeeperTest, SavesForItsOwnerAlone) {
    tapAndGo(1, "SN1");
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 6"));
    struct stat status {};
    ASSERT_EQ(::stat(path("a.json").c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777, 0600u);
}

TEST_F(RecordingKeeperTest, WithoutAFileNothingIsSaved) {
    makeKeeper(std::nullopt);
    tapAndGo(1, "SN1");
    EXPECT_THAT(saved(), IsEmpty());
    EXPECT_TRUE(std::filesystem::is_empty(folder));
    EXPECT_THAT(keeper->files(), IsEmpty());
}

TEST_F(RecordingKeeperTest, ResultsAreReportedByTheMainLoop) {
    add(1, "SN1");
    surfaces->forEach(
        [this](const SurfaceName &name, const Surface &surface) { keeper->save(name, surface); });
    EXPECT_THAT(saved(), IsEmpty());
    runUntil([this] { return told.others.size() == 1; });
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 0"));
}

TEST_F(RecordingKeeperTest, TheSecondSurfaceHasAFileOfItsOwn) {
    add(1, "SN1");
    add(2, "SN2");
    save();
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 0", "recording SN2 @/a-2.json 0"));
}

TEST_F(RecordingKeeperTest, FilesGoByTheOrderOfComingNotOfSaving) {
    keeper->expect({.id = "SN1", .node = "", .name = ""});
    keeper->expect({.id = "SN2", .node = "", .name = ""});
    tapAndGo(2, "SN2");
    tapAndGo(1, "SN1");
    EXPECT_THAT(saved(), ElementsAre("recording SN2 @/a-2.json 6", "recording SN1 @/a.json 6"));
}

TEST_F(RecordingKeeperTest, ASurfaceThatIsThereKeepsItsFile) {
    add(1, "SN1");
    tap(1);
    save();
    tap(1);
    remove(1, "SN1");
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 6", "recording SN1 @/a.json 12"));
}

TEST_F(RecordingKeeperTest, ASurfaceThatComesBackLeavesTheOlderRecording) {
    tapAndGo(1, "SN1");
    const std::string before = Host::readFile(path("a.json"));
    tapAndGo(1, "SN2"); // another one, in the same place
    tapAndGo(3, "SN1");
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 6", "recording SN2 @/a-2.json 6",
                                     "recording SN1 @/a-3.json 6"));
    EXPECT_EQ(Host::readFile(path("a.json")), before);
}

TEST_F(RecordingKeeperTest, AnEmptyRecordingTakesNoFurtherFile) {
    tapAndGo(1, "SN1");
    add(1, "SN1");
    save();
    remove(1, "SN1");
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 6"));
    EXPECT_THAT(filesThere(), ElementsAre("a.json"));
}

TEST_F(RecordingKeeperTest, NewSerialNumbersDoNotFillTheDisk) {
    makeKeeper(path("a.json"), {.count = 3});
    for (int i = 1; i <= 10; ++i)
        tapAndGo(1, "SN" + std::to_string(i));
    EXPECT_THAT(filesThere(), testing::UnorderedElementsAre("a.json", "a-2.json", "a-3.json"));
    EXPECT_EQ(saved().back(), "recording SN10 @/a.json 6");
}

TEST_F(RecordingKeeperTest, TheOldestGoWhenAllAreTooLong) {
    tapAndGo(1, "SN1");
    const std::uint64_t bytes = std::filesystem::file_size(path("a.json"));
    makeKeeper(path("a.json"), {.count = 16, .bytes = 2 * bytes + bytes / 2});
    for (int i = 1; i <= 5; ++i)
        tapAndGo(1, "SN" + std::to_string(i));
    EXPECT_EQ(filesThere().size(), 2u);
    EXPECT_TRUE(std::filesystem::exists(path("a-5.json")));
    EXPECT_EQ(logs->lines().count("all recordings together are more than --save-bytes"), 3u);
}

TEST_F(RecordingKeeperTest, AFailureIsOneLineAndTheNextOneIsSaved) {
    std::filesystem::create_directory(path("a.json"));
    add(1, "SN1");
    tap(1);
    save();
    EXPECT_THAT(saved(), IsEmpty());
    EXPECT_EQ(logs->lines().count("Recordings error: " + path("a.json") + ": cannot replace: Is a directory"),
              1u);
    EXPECT_FALSE(keeper->hasFailed()) << "it may still be saved";
    std::filesystem::remove(path("a.json"));
    remove(1, "SN1");
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 6"));
    EXPECT_FALSE(keeper->hasFailed());
}

TEST_F(RecordingKeeperTest, ALastRecordingThatIsLostIsAFailure) {
    std::filesystem::create_directory(path("a.json"));
    tapAndGo(1, "SN1");
    EXPECT_TRUE(keeper->hasFailed());
}

TEST_F(RecordingKeeperTest, WhatIsGivenUpIsOneLineAndNoFile) {
    add(1, "SN1");
    tap(1);
    keeper->giveUp();
    remove(1, "SN1");
    EXPECT_THAT(filesThere(), IsEmpty());
    EXPECT_TRUE(keeper->hasFailed());
    EXPECT_FALSE(keeper->isBusy());
    EXPECT_EQ(
        logs->lines().count("Recordings error: " + path("a.json") + ": not written, since saving was ended"),
        1u);
}

TEST_F(RecordingKeeperTest, AMinuteIsKeptAlsoWithAnAccelerometer) {
    const auto accelerometer = Host::Accelerometer::create(events);
    add(1, "SN1");
    // As many samples as reports: the plug-in's own 4350 frames are 2175 of each.
    for (int i = 0; i < 1'400; ++i) {
        clock.sleepMicroseconds(60'000);
        tap(1); // six reports
        for (int sample = 0; sample < 6; ++sample)
            accelerometer->deliver(0, 0, 1, clock.nowTicks());
        accelerometer->waitUntilHandled();
    }
    save();
    const FrameList frames = readRecordingContainer(Host::readFile(path("a.json"))).frames;
    std::size_t reports = 0, samples = 0;
    std::uint32_t firstNumber = 0, lastNumber = 0;
    for (const FrameView &frame : frames) {
        samples += frame.key == "Accel" ? 1u : 0u;
        if (frame.type != FrameType::InputReport)
            continue;
        ++reports;
        const auto image = InputReport::Image::parse(frame.data.data(), frame.data.size());
        ASSERT_TRUE(image);
        firstNumber = firstNumber == 0 ? image->frameNumber : firstNumber;
        lastNumber = image->frameNumber;
    }
    EXPECT_GE(reports, 6000u);
    EXPECT_LE(reports, 7500u);
    EXPECT_GE(samples, 2000u);
    EXPECT_EQ(lastNumber - firstNumber + 1, reports) << "a gap, or one twice";
}

} // namespace
} // namespace ZorvaTouch::Tools
