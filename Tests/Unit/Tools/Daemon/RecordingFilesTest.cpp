#include "Tools/Daemon/RecordingFiles.h"

#include <gmock/gmock.h>

namespace ZorvaTouch::Tools {
namespace {

using testing::ElementsAre;
using testing::Optional;
using testing::StrEq;

TEST(RecordingFiles, FurtherNamesAreNumbered) {
    EXPECT_EQ(fileOfRecording("touch.json", 1), "touch.json");
    EXPECT_EQ(fileOfRecording("touch.json", 2), "touch-2.json");
    EXPECT_EQ(fileOfRecording("/a.b/touch.x.json", 10), "/a.b/touch.x-10.json");
    EXPECT_EQ(fileOfRecording("/a.b/touch", 2), "/a.b/touch-2");
    EXPECT_EQ(fileOfRecording("touch", 3), "touch-3");
    EXPECT_EQ(fileOfRecording(".touch", 2), ".touch-2");
    EXPECT_EQ(fileOfRecording("a/.touch", 2), "a/.touch-2");
    EXPECT_EQ(fileOfRecording("touch.", 2), "touch-2.");
    EXPECT_THAT(RecordingFiles("a", 3).names(), ElementsAre("a", "a-2", "a-3"));
}

TEST(RecordingFiles, ASurfaceKeepsItsFileUntilItIsFinished) {
    RecordingFiles files("a", 9);
    files.expect("SN1");
    files.expect("SN2");
    EXPECT_THAT(files.fileFor("SN2", true), Optional(StrEq("a-2")));
    EXPECT_THAT(files.fileFor("SN1", true), Optional(StrEq("a")));
    EXPECT_THAT(files.fileFor("SN2", false), Optional(StrEq("a-2")));
    files.finish("SN2");
    EXPECT_THAT(files.fileFor("SN2", true), Optional(StrEq("a-3")));
    EXPECT_THAT(files.fileFor("SN1", true), Optional(StrEq("a")));
}

TEST(RecordingFiles, ASurfaceThatComesBackNeedsAFileWhenItHasReports) {
    RecordingFiles files("a", 9);
    files.expect("SN1");
    files.finish("SN1");
    files.expect("SN1");
    EXPECT_EQ(files.fileFor("SN1", false), std::nullopt);
    EXPECT_THAT(files.fileFor("SN2", false), Optional(StrEq("a-2")));
    EXPECT_THAT(files.fileFor("SN1", true), Optional(StrEq("a-3")));
}

TEST(RecordingFiles, TheOldestFinishedOneIsUsedAgain) {
    RecordingFiles files("a", 3);
    for (const char *const surface : {"SN1", "SN2", "SN3"})
        files.expect(surface);
    files.finish("SN3");
    files.finish("SN2");
    EXPECT_THAT(files.fileFor("SN4", true), Optional(StrEq("a-2")));
    EXPECT_THAT(files.fileFor("SN5", true), Optional(StrEq("a-3")));
    EXPECT_THAT(files.fileFor("SN1", true), Optional(StrEq("a"))) << "still in use";
}

TEST(RecordingFiles, WhenAllAreInUseTheOldestGoes) {
    RecordingFiles files("a", 2);
    for (const char *const surface : {"SN1", "SN2", "SN3"})
        files.expect(surface);
    EXPECT_THAT(files.fileFor("SN3", true), Optional(StrEq("a")));
    EXPECT_THAT(files.fileFor("SN1", true), Optional(StrEq("a-2")));
    EXPECT_THAT(files.fileFor("SN2", true), Optional(StrEq("a")));
}

} // namespace
} // namespace ZorvaTouch::Tools
