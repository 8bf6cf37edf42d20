#pragma once

#include "Host/Interface/Platform.h"
#include "Tests/Unit/Host/Linux/FakeNode.h"

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <optional>
#include <string>

namespace ZorvaTouch::Linux::Tests {

/// What a callback got.
struct Received {
    std::uint32_t reportId;
    Bytes bytes;

    friend bool operator==(const Received &, const Received &) = default;
};

/// A device on a fake node, the real run loop of the process, and a service as
/// far as a device knows it.
class DeviceFixture : public testing::Test {
protected:
    ~DeviceFixture() override {
        if (device)
            unschedule(); // a scheduled device keeps itself
    }

    ZorvaStatus open() { return device->table->open(device.get(), 0); }
    ZorvaStatus close() { return device->table->close(device.get(), 0); }
    void schedule(const char *mode = "mode") {
        device->table->schedule(device.get(), loop->boundary(), mode);
    }
    void unschedule(const char *mode = "mode") {
        device->table->unschedule(device.get(), loop->boundary(), mode);
    }
    void registerCallback() {
        device->table->registerInputReportCallback(device.get(), buffer.data(), buffer.size(), receive, this);
    }
    void unregisterCallback() {
        device->table->registerInputReportCallback(device.get(), buffer.data(), buffer.size(), nullptr,
                                                   nullptr);
    }
    /// As a service begins.
    void begin() {
        ASSERT_EQ(open(), 0u);
        registerCallback();
        schedule();
    }
    Host::RunOutcome pass() { return loop->runOneSource("mode"); }
    /// Serves sources until none is left, or somebody stops the loop.
    Host::RunOutcome run() {
        auto outcome = Host::RunOutcome::HandledSource;
        while (outcome == Host::RunOutcome::HandledSource)
            outcome = pass();
        return outcome;
    }
    void passes(int count) {
        for (; count != 0; --count)
            ASSERT_EQ(pass(), Host::RunOutcome::HandledSource);
    }

    Bytes buffer = Bytes(80);
    std::vector<Received> reports;
    ZorvaStatus result = 99;
    void *sender = nullptr;
    std::uint32_t type = 99;
    const std::uint8_t *place = nullptr;
    std::uint64_t timestamp = 0;
    std::function<void()> onReport;

    FakeOpener nodes;
    const std::shared_ptr<FakeObserver> observer = std::make_shared<FakeObserver>();
    std::shared_ptr<Host::RunLoop> loop = Host::processPlatform().createRunLoop();
    Ref<HidrawDevice> device = HidrawDevice::create(nodes.opener(), observer);

private:
    static void receive(void *context, ZorvaStatus result, void *sender, std::uint32_t type,
                        std::uint32_t reportId, const std::uint8_t *report, std::size_t length,
                        std::uint64_t timestamp) noexcept {
        auto &self = *static_cast<DeviceFixture *>(context);
        self.result = result;
        self.sender = sender;
        self.type = type;
        self.place = report;
        self.timestamp = timestamp;
        self.reports.push_back({reportId, Bytes(report, report + length)});
        if (self.onReport)
            self.onReport();
    }
};

} // namespace ZorvaTouch::Linux::Tests
