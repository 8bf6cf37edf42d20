#pragma once

#include "Shared/Frame.h"
#include "Shared/FrameList.h"
#include "Shared/PipelineInput.h"
#include "Shared/PipelineRecording.h"
#include "Shared/Ports/Clock.h"
#include "Shared/Ports/Log.h"

#include <array>
#include <cstdint>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

/// Stand-ins for the core's surroundings, and frames in short hand.
namespace ZorvaTouch::Scripted {

/// A clock that stands still until it is set, and remembers its sleeps.
class FakeClock final : public Ports::Clock {
public:
    [[nodiscard]] std::uint64_t nowTicks() noexcept override { return ticks; }
    [[nodiscard]] Ports::TimeBase timeBase() noexcept override { return base; }
    void sleepMicroseconds(std::uint64_t durationUs) noexcept override {
        sleeps.push_back(durationUs);
        if (duringSleep)
            duringSleep();
    }

    /// The sleeps that take time at all: whether a pause of 0 is made or left out does not matter.
    [[nodiscard]] std::vector<std::uint64_t> pausesUs() const;

    std::uint64_t ticks = 0;
    Ports::TimeBase base{1, 1};
    std::vector<std::uint64_t> sleeps; ///< every sleep, in microseconds
    std::function<void()> duringSleep; ///< must not throw
};

/// One record of a log.
struct LogRecord {
    Ports::LogLevel level;
    std::string text;
};

/// What all handles of a `CapturingLogProvider` share.
struct LogSwitches {
    std::array<bool, 3> enabled{}; ///< by level
    std::vector<LogRecord> records;
    std::vector<std::string> opened;            ///< "subsystem/category" of every handle
    std::size_t recordsUntilSilence = SIZE_MAX; ///< the record after which every level is switched off
};

class CapturingLogProvider final : public Ports::LogProvider {
public:
    [[nodiscard]] std::shared_ptr<Ports::Log> openLog(std::string_view subsystem,
                                                      std::string_view category) override;

    void enable(Ports::LogLevel level, bool on = true) {
        switches->enabled[static_cast<std::size_t>(level)] = on;
    }

    std::shared_ptr<LogSwitches> switches = std::make_shared<LogSwitches>();
};

/// A pipeline that writes down its calls.
class CapturingInput final : public PipelineInput {
public:
    /// One call; `type` tells which.
    struct Call {
        FrameType type;
        std::uint64_t timestamp; ///< host ticks
        std::string key;
        PropertyValue value;
        std::vector<std::uint8_t> data;

        friend bool operator==(const Call &, const Call &) = default;
    };

    void setState(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) override;
    void handleInputReport(std::uint64_t timestamp, const std::uint8_t *data, std::size_t length) override;
    void handleMetadata(std::uint64_t timestamp, const std::string &key, const PropertyValue &value) override;

    /// The time stamps of all calls.
    [[nodiscard]] std::vector<std::uint64_t> timestamps() const;

    std::vector<Call> calls;
    std::function<void()> beforeNote; ///< runs first in every call, before the arguments are read
};

[[nodiscard]] Frame stateFrame(std::uint64_t timestampNs, std::string key, PropertyValue value);
[[nodiscard]] Frame metadataFrame(std::uint64_t timestampNs, std::string key, PropertyValue value);
[[nodiscard]] Frame reportFrame(std::uint64_t timestampNs, std::vector<std::uint8_t> data);

/// A report whose bytes tell its length and number, so that a mix-up shows.
[[nodiscard]] std::vector<std::uint8_t> patternedReport(std::size_t length, std::uint8_t number);

/// The list's frames, each on its own.
[[nodiscard]] std::vector<Frame> framesOf(const FrameList &list);

/// Reads frames in short hand, separated by blanks: "R7" is a report of the one byte 7, "M7" a metadata item
/// "m" of value 7, "a=1" a write of 1 to the state "a". The time stamps are 1, 2, 3 ... unless "@time"
/// follows the frame.
[[nodiscard]] std::vector<Frame> framesFromShortHand(std::string_view text);
[[nodiscard]] FrameList listFromShortHand(std::string_view text);

/// Writes frames in short hand, without times.
[[nodiscard]] std::string shortHand(const std::vector<Frame> &frames);
[[nodiscard]] std::string shortHand(const FrameList &list);

} // namespace ZorvaTouch::Scripted
