#include "Tests/Kernel/Descriptors.h"
#include "Tests/Kernel/Emulator.h"
#include "Tests/Kernel/SensorHub.h"
#include "Tests/Kernel/Story.h"

#include <cerrno>
#include <sstream>
#include <stdexcept>
#include <string>
#include <utility>

namespace ZorvaTouch::KernelTests {
namespace {

constexpr std::uint64_t kNanosecondsPerMs = 1'000'000;
constexpr const char *kUsage = "usage: zorvatouch-uhid-accelerometer [SERIAL]\n"
                               "Stays until SIGTERM. Reads lines, in 1/1000 g: \"gravity X Y Z\", \"bump X Y "
                               "Z MS\" on top of it, \"wait MS\",\n"
                               "\"destroy\", \"create\", \"# ...\"";

/// The accelerometer: answers what the kernel asks and sets, and samples at the interval that it was given.
class HubEmulator final : public Emulator {
public:
    explicit HubEmulator(DeviceIdentity identity) : Emulator(std::move(identity), accelerometerDescriptor()) {
        readInput();
    }

private:
    void plugIn() override { _hub.turnOff(); }

    void getReport(const uhid_get_report_req &request) override {
        if (request.rtype == UHID_FEATURE_REPORT)
            device().answerGet(request.id, 0, _hub.featureReport());
        else
            device().answerGet(request.id, 0, _hub.inputReport(nowNs()));
    }

    void setReport(const uhid_set_report_req &request) override {
        const bool isTaken = _hub.set({request.data, request.data + request.size}, nowNs());
        device().answerSet(request.id, isTaken ? 0 : EIO);
        tell("set", {{"on", _hub.isOn()}, {"intervalMs", _hub.intervalMs()}, {"taken", isTaken}});
    }

    std::optional<std::uint64_t> dueNs() const override { return isBound() ? _hub.dueNs() : std::nullopt; }

    void act(std::uint64_t now) override {
        device().sendInput(_hub.inputReport(now));
        _hub.advance(now);
        ++_sent;
    }

    void obey(std::string_view line) override {
        std::istringstream words{std::string(line)};
        std::string what;
        SensorHub::Acceleration acceleration{};
        words >> what >> acceleration[0] >> acceleration[1] >> acceleration[2];
        if (what == "bump") {
            std::uint64_t lengthMs = 0;
            words >> lengthMs;
            _hub.bump(acceleration, nowNs() + lengthMs * kNanosecondsPerMs);
        } else if (what == "gravity") {
            _hub.setGravity(acceleration);
        } else {
            words.setstate(std::ios::failbit);
        }
        if (!words)
            throw std::invalid_argument("not understood: " + std::string(line));
        tell("moved", {{"line", line}});
    }

    PropertyValue::Dictionary summary() const override { return {{"reports", _sent}}; }

    SensorHub _hub;
    std::uint64_t _sent = 0; ///< input reports
};

void playAccelerometer(int count, char **arguments) {
    if (count > 2 || (count == 2 && arguments[1][0] == '-'))
        throw std::invalid_argument(kUsage);
    DeviceIdentity identity{.name = "ZorvaTouch Accelerometer", .serial = "ZA-0001", .product = 0xACCE};
    if (count == 2)
        identity.serial = arguments[1];
    HubEmulator(std::move(identity)).run();
}

} // namespace
} // namespace ZorvaTouch::KernelTests

int main(int count, char **arguments) {
    using namespace ZorvaTouch::KernelTests;
    return runProgram("zorvatouch-uhid-accelerometer", [&] { playAccelerometer(count, arguments); });
}
