#include "Plugin/ZorvaPlugIn.h"
#include "Tests/Support/HostPlatform.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

extern "C" void *ZorvaTouchHIDServiceFactory(void *allocator, ZorvaUuid type);

namespace ZorvaTouch {
namespace {

using Testing::TestPlatform;
using Lines = std::vector<std::string>;

/// The factory in a process whose platform is the test's.
class Factory : public ::testing::Test {
protected:
    Factory() { Host::setProcessPlatform(&platform); }
    ~Factory() override { Host::setProcessPlatform(nullptr); }

    static PlugInInterfaceTable **make(const ZorvaUuid &type, void *allocator = nullptr) {
        return static_cast<PlugInInterfaceTable **>(ZorvaTouchHIDServiceFactory(allocator, type));
    }

    TestPlatform platform;
};

TEST_F(Factory, MakesAServiceWithOneReference) {
    PlugInInterfaceTable **const plugIn = make(kZorvaHidServicePlugInType);
    ASSERT_NE(plugIn, nullptr);
    EXPECT_EQ((*plugIn)->AddRef(plugIn), 2u);
    EXPECT_EQ((*plugIn)->Release(plugIn), 1u);
    EXPECT_EQ((*plugIn)->Release(plugIn), 0u);
}

TEST_F(Factory, DoesNotLookAtTheAllocator) {
    PlugInInterfaceTable **const plugIn = make(kZorvaHidServicePlugInType, reinterpret_cast<void *>(1));
    ASSERT_NE(plugIn, nullptr);
    EXPECT_EQ((*plugIn)->Release(plugIn), 0u);
}

TEST_F(Factory, MakesEachTimeAnotherOne) {
    PlugInInterfaceTable **const first = make(kZorvaHidServicePlugInType);
    PlugInInterfaceTable **const second = make(kZorvaHidServicePlugInType);
    EXPECT_NE(first, second);
    EXPECT_EQ((*first)->Release(first), 0u);
    EXPECT_EQ((*second)->Release(second), 0u);
}

TEST_F(Factory, OpensALogForTheServiceAndOneForTheRecognizer) {
    PlugInInterfaceTable **const plugIn = make(kZorvaHidServicePlugInType);
    ASSERT_NE(plugIn, nullptr);
    EXPECT_EQ(platform.journal.opened(),
              (Lines{"org.zorva.hid.ZorvaTouch/HIDService", "org.zorva.hid.ZorvaTouch/Algs"}));
    EXPECT_EQ((*plugIn)->Release(plugIn), 0u);
    EXPECT_EQ(platform.journal.lines(), (Lines{"debug dealloc"}));
}

TEST_F(Factory, MakesNothingOfAnotherType) {
    ZorvaUuid nearly = kZorvaHidServicePlugInType;
    nearly.bytes[0] = 0x04;
    for (const ZorvaUuid &type : {kZorvaPlugInInterface, kZorvaHidServiceInterface, nearly, ZorvaUuid{}})
        EXPECT_EQ(make(type), nullptr);
    EXPECT_TRUE(platform.journal.opened().empty());
}

TEST_F(Factory, MakesNothingWhereAServiceCannotBeMade) {
    platform.journal.refuse(true);
    EXPECT_EQ(make(kZorvaHidServicePlugInType), nullptr);
}

} // namespace
} // namespace ZorvaTouch
