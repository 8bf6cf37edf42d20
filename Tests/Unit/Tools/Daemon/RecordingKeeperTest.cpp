#include "Tools/Daemon/RecordingKeeper.h"

#include "Host/Runtime/Files.h"
#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include <gmock/gmock.h>

#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <optional>
#include <string>

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
        keeper.emplace(path("a.json"), told, DaemonLog(*logs, "Recordings"));
    }
    void TearDown() override { std::filesystem::remove_all(folder); }

    [[nodiscard]] std::string path(const std::string &name) const { return folder + "/" + name; }

    /// Saves all that are there.
    void save() {
        surfaces->forEach(
            [this](const SurfaceName &name, const Surface &surface) { keeper->save(name, surface); });
    }
    /// A surface comes, taps come of it, and it is saved and goes.
    void tapAndGo(int number, const std::string &serial) {
        TouchScript touch;
        surfaces->onAdded(identity(number, serial));
        sendAndWait(number, touch.tapPlay(), 2);
        save();
        surfaces->onRemoved(identity(number, serial));
    }
    /// What was told of recordings, the folder being "@".
    [[nodiscard]] Tests::Lines saved() {
        Tests::Lines lines = told.others.take();
        for (std::string &line : lines)
            if (const auto found = line.find(folder); found != std::string::npos)
                line.replace(found, folder.size(), "@");
        return lines;
    }

    std::string folder;
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
    keeper.emplace(std::nullopt, told, DaemonLog(*logs, "Recordings"));
    tapAndGo(1, "SN1");
    EXPECT_THAT(saved(), IsEmpty());
    EXPECT_TRUE(std::filesystem::is_empty(folder));
}

TEST_F(RecordingKeeperTest, TheSecondSurfaceHasAFileOfItsOwn) {
    surfaces->onAdded(identity(1, "SN1"));
    surfaces->onAdded(identity(2, "SN2"));
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

TEST_F(RecordingKeeperTest, ASurfaceThatComesBackKeepsItsFile) {
    tapAndGo(1, "SN1");
    tapAndGo(1, "SN2"); // another one, in the same place
    tapAndGo(3, "SN1");
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 6", "recording SN2 @/a-2.json 6",
                                     "recording SN1 @/a.json 6"));
}

TEST_F(RecordingKeeperTest, AnEmptyRecordingDoesNotTakeThePlaceOfAnother) {
    tapAndGo(1, "SN1");
    const std::string before = Host::readFile(path("a.json"));
    surfaces->onAdded(identity(1, "SN1"));
    save();
    EXPECT_EQ(Host::readFile(path("a.json")), before);
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 6"));
}

TEST_F(RecordingKeeperTest, AFailureIsOneLineAndTheNextTimeItIsTriedAgain) {
    std::filesystem::create_directory(path("a.json"));
    tapAndGo(1, "SN1");
    EXPECT_THAT(saved(), IsEmpty());
    EXPECT_EQ(logs->lines().count("Recordings error: " + path("a.json")), 1u);
    std::filesystem::remove(path("a.json"));
    tapAndGo(1, "SN1");
    EXPECT_THAT(saved(), ElementsAre("recording SN1 @/a.json 6"));
}

} // namespace
} // namespace ZorvaTouch::Tools
