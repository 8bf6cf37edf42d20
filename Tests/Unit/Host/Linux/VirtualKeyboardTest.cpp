#include "Host/Linux/VirtualKeyboard.h"

#include "Host/Linux/UinputDevice.h"

#include <gmock/gmock.h>

#include <linux/input.h>

#include <cerrno>
#include <deque>
#include <string>
#include <tuple>

namespace ZorvaTouch::Linux {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

/// Type, code and value.
using Event = std::tuple<int, int, int>;

const Event kSyn{0, 0, 0};

class KeyboardOutput : public testing::Test {
protected:
    class Writer final : public InputWriter {
    public:
        explicit Writer(KeyboardOutput &test) : _test(test) {}
        int write(std::uint16_t type, std::uint16_t code, std::int32_t value) noexcept override {
            int errorNumber = 0;
            if (!_test.errors.empty()) {
                errorNumber = _test.errors.front();
                _test.errors.pop_front();
            }
            if (errorNumber == 0)
                _test.events.emplace_back(type, code, value);
            return errorNumber;
        }

    private:
        KeyboardOutput &_test;
    };

    std::vector<Event> takeEvents() { return std::exchange(events, {}); }

    std::vector<Event> events;
    std::deque<int> errors; ///< what the next writes fail with; 0: not at all
    std::unique_ptr<KeyOutput> keyboard = std::make_unique<VirtualKeyboard>(
        std::vector<std::uint16_t>{KEY_PLAYPAUSE, KEY_VOLUMEUP, KEY_VOICECOMMAND},
        std::make_unique<Writer>(*this));
};

TEST_F(KeyboardOutput, PressesAndReleasesEachWithItsEnd) {
    EXPECT_EQ(keyboard->press(164), std::nullopt);
    EXPECT_THAT(takeEvents(), ElementsAre(Event{1, 164, 1}, kSyn));
    EXPECT_EQ(keyboard->press(0x246), std::nullopt);
    EXPECT_THAT(takeEvents(), ElementsAre(Event{1, 582, 1}, kSyn));
    EXPECT_EQ(keyboard->release(164), std::nullopt);
    EXPECT_THAT(takeEvents(), ElementsAre(Event{1, 164, 0}, kSyn));
}

TEST_F(KeyboardOutput, RefusesKeysThatItDoesNotHave) {
    EXPECT_EQ(keyboard->press(KEY_VOLUMEDOWN), (SystemFailure{"press", EINVAL}));
    EXPECT_EQ(keyboard->release(KEY_VOLUMEDOWN), (SystemFailure{"release", EINVAL}));
    EXPECT_THAT(events, IsEmpty());
}

TEST_F(KeyboardOutput, DoesNothingForAKeyThatIsThereAlready) {
    EXPECT_EQ(keyboard->release(115), std::nullopt);
    EXPECT_THAT(takeEvents(), IsEmpty());
    EXPECT_EQ(keyboard->press(115), std::nullopt);
    EXPECT_EQ(keyboard->press(115), std::nullopt);
    EXPECT_THAT(takeEvents(), ElementsAre(Event{1, 115, 1}, kSyn));
}

TEST_F(KeyboardOutput, SaysWhatFailedAndTriesAgain) {
    errors = {ENODEV};
    EXPECT_EQ(keyboard->press(115), (SystemFailure{"press", ENODEV}));
    EXPECT_EQ(keyboard->press(115), std::nullopt);
    EXPECT_THAT(takeEvents(), ElementsAre(Event{1, 115, 1}, kSyn));
    errors = {0, EIO};
    EXPECT_EQ(keyboard->release(115), (SystemFailure{"release", EIO}));
    EXPECT_THAT(takeEvents(), ElementsAre(Event{1, 115, 0}));
}

TEST_F(KeyboardOutput, ReleasesInTheEndWhatIsDown) {
    EXPECT_EQ(keyboard->press(115), std::nullopt);
    EXPECT_EQ(keyboard->press(164), std::nullopt);
    EXPECT_EQ(keyboard->release(115), std::nullopt);
    events.clear();
    keyboard.reset();
    EXPECT_THAT(events, ElementsAre(Event{1, 164, 0}, kSyn));
}

// --- Making one
// ----------------------------------------------------------------------------------------------

std::string failureAt(const char *path) {
    try {
        (void)VirtualKeyboard::create({KEY_VOLUMEUP}, path);
    } catch (const KeyboardFailure &failure) {
        return failure.what();
    }
    return "none";
}

TEST(KeyboardFailures, SayWhatToDoWithoutTheModule) {
    EXPECT_EQ(failureAt("/dev/no-such-uinput"),
              "open /dev/no-such-uinput: No such file or directory; load the "
              "kernel's module for it: "
              "modprobe uinput");
    EXPECT_STREQ(KeyboardFailure({"open", ENODEV}, "/dev/uinput").what(),
                 "open /dev/uinput: No such device; load the kernel's module for "
                 "it: modprobe uinput");
}

TEST(KeyboardFailures, SayWhatToDoWithoutPermission) {
    EXPECT_STREQ(KeyboardFailure({"open", EACCES}, "/dev/uinput").what(),
                 "open /dev/uinput: Permission denied; give the group of "
                 "the daemon's user write access by a udev rule: "
                 "KERNEL==\"uinput\", GROUP=\"zorvatouch\", MODE=\"0660\"");
}

TEST(KeyboardFailures, SayThatItIsNoUinput) {
    EXPECT_EQ(failureAt("/dev/null"), "make a keyboard with /dev/null: Inappropriate ioctl for device; "
                                      "it is not the kernel's uinput, "
                                      "or that refuses keyboards");
    const KeyboardFailure failure({"open", EMFILE}, "/dev/uinput");
    EXPECT_EQ(failure.failure, (SystemFailure{"open", EMFILE}));
}

TEST(UinputDevices, ThatAreNotPluggedInWriteNothing) {
    UinputDevice device;
    EXPECT_EQ(device.write(EV_KEY, KEY_VOLUMEUP, 1), EBADF);
    ASSERT_TRUE(device.plug({KEY_VOLUMEUP}, "/dev/null"));
    EXPECT_EQ(device.write(EV_KEY, KEY_VOLUMEUP, 1), EBADF);
}

} // namespace
} // namespace ZorvaTouch::Linux
