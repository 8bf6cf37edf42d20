#pragma once

#include "Host/Simulated/Device.h"

#include <cstddef>
#include <cstdint>
#include <functional>
#include <vector>

namespace ZorvaTouch::Simulated {

using Bytes = std::vector<std::uint8_t>;

/// What a callback got.
struct Received {
    std::uint32_t reportId;
    Bytes bytes;
    std::uint64_t timestamp;

    friend bool operator==(const Received &, const Received &) = default;
};

/// A service as far as a device knows it: a buffer, and a callback that notes what comes.
class ReportLog {
public:
    explicit ReportLog(std::size_t bufferSize = 80) : buffer(bufferSize) {}

    void registerAt(Device &device) {
        device.table->registerInputReportCallback(&device, buffer.data(), buffer.size(), receive, this);
    }
    void unregisterAt(Device &device) {
        device.table->registerInputReportCallback(&device, buffer.data(), buffer.size(), nullptr, nullptr);
    }
    void begin(Device &device, ZorvaRunLoop *loop) {
        registerAt(device);
        device.table->schedule(&device, loop, "mode");
    }
    void end(Device &device, ZorvaRunLoop *loop) {
        device.table->unschedule(&device, loop, "mode");
        unregisterAt(device);
    }

    Bytes buffer;
    std::vector<Received> reports;
    ZorvaStatus result = 99;
    void *sender = nullptr;
    std::uint32_t type = 99;
    std::function<void()> onReport; ///< after it was noted

private:
    static void receive(void *context, ZorvaStatus result, void *sender, std::uint32_t type,
                        std::uint32_t reportId, const std::uint8_t *report, std::size_t length,
                        std::uint64_t timestamp) noexcept {
        auto &self = *static_cast<ReportLog *>(context);
        self.result = result;
        self.sender = sender;
        self.type = type;
        self.reports.push_back({reportId, Bytes(report, report + length), timestamp});
        if (self.onReport)
            self.onReport();
    }
};

} // namespace ZorvaTouch::Simulated
