#include "Host/Runtime/PlugInFile.h"

#include "Tests/Unit/Host/Runtime/RuntimeSupport.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <utility>

namespace ZorvaTouch::Host {
namespace {

using ::testing::AllOf;
using ::testing::HasSubstr;
using ::testing::Not;
using ::testing::StartsWith;

/// What the failure says to people, or nothing if there was none.
template <typename Function> std::string failureOf(const Function &function) {
    try {
        function();
    } catch (const PlugInFailure &failure) {
        return failure.what();
    }
    return "";
}

/// The name under which the library has `processPlatform`: something that is there.
constexpr const char *kPresentName = "_ZN10ZorvaTouch4Host15processPlatformEv";

TEST(PlugInFile, ThatDoesNotExistIsToldInOneLine) {
    EXPECT_THAT(failureOf([] { PlugInFile file("/nowhere/plug-in.so"); }),
                AllOf(StartsWith("cannot open the plug-in /nowhere/plug-in.so: "),
                      HasSubstr("No such file or directory"), Not(HasSubstr("\n"))));
}

TEST(PlugInFile, ThatIsNoLibraryIsTold) {
    EXPECT_THAT(failureOf([] { PlugInFile file("/proc/self/cmdline"); }),
                StartsWith("cannot open the plug-in /proc/self/cmdline: "));
}

TEST(PlugInFile, IsNotSearchedForAndTheProgramIsNone) {
    EXPECT_THAT(failureOf([] { PlugInFile file("libc.so.6"); }),
                StartsWith("cannot open the plug-in libc.so.6: "));
    EXPECT_THAT(failureOf([] { PlugInFile file(""); }), StartsWith("cannot open the plug-in : "));
}

TEST(PlugInFile, FindsNamesAndTellsWhichAreMissing) {
    const std::string path = RuntimeTests::libraryPath();
    const PlugInFile file(path);
    EXPECT_EQ(file.path(), path);
    EXPECT_NE(file.factory(kPresentName), nullptr);
    EXPECT_THAT(failureOf([&] { (void)file.factory("NoSuchFactory"); }),
                AllOf(StartsWith("the plug-in " + path + " has no factory NoSuchFactory: "),
                      HasSubstr("undefined symbol"), Not(HasSubstr("\n"))));
}

TEST(PlugInFile, CanBeHandedOn) {
    PlugInFile first(RuntimeTests::libraryPath());
    PlugInFile second(std::move(first));
    EXPECT_NE(second.factory(kPresentName), nullptr);
    first = std::move(second);
    EXPECT_NE(first.factory(kPresentName), nullptr);
}

} // namespace
} // namespace ZorvaTouch::Host
