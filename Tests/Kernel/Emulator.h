#pragma once

#include "Shared/Util/PropertyValue.h"
#include "Tests/Kernel/BindWatch.h"
#include "Tests/Kernel/UhidDevice.h"

#include <cstdint>
#include <deque>
#include <functional>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace ZorvaTouch::KernelTests {

/// What both emulated devices have in common: one thread that waits for the kernel, for its next own deed,
/// for lines on standard input and for SIGTERM or SIGINT, and does what is due.
///
/// Lines that every device understands: "destroy" and "create", unplugging and plugging in again; "wait MS",
/// nothing more is read from the input for so long; "# ...". The others are the device's own. They are held
/// back until the kernel has bound the device, so that nothing is lost.
class Emulator {
public:
    /// @param reportDescriptor  Borrowed as long as this lives.
    Emulator(DeviceIdentity identity, std::span<const std::uint8_t> reportDescriptor);
    virtual ~Emulator();
    Emulator(const Emulator &) = delete;
    Emulator &operator=(const Emulator &) = delete;

    /// Creates the device, plays, destroys it.
    /// @throws std::system_error, std::invalid_argument for a line that it does not understand
    void run();

protected:
    void readInput() { _isReading = true; }
    void finish() { _isFinished = true; }
    [[nodiscard]] bool isBound() const noexcept { return _isBound; }
    [[nodiscard]] bool hasInput() const noexcept { return _isReading || !_lines.empty(); }
    [[nodiscard]] UhidDevice &device() noexcept { return _device; }

private:
    virtual void getReport(const uhid_get_report_req &request) = 0;
    virtual void setReport(const uhid_set_report_req &request) = 0;
    /// The device is about to appear, at first and for each "create".
    virtual void plugIn() {}
    /// The device is ready for reports, at first and after each "create".
    virtual void start() {}
    virtual void obey(std::string_view line) = 0;
    /// When there is something to do next, ns; nothing if there is not.
    [[nodiscard]] virtual std::optional<std::uint64_t> dueNs() const { return std::nullopt; }
    /// What is due by now.
    virtual void act(std::uint64_t) {}
    /// No line comes any more.
    virtual void inputEnded() {}
    /// For the last line of the story.
    [[nodiscard]] virtual PropertyValue::Dictionary summary() const { return {}; }

    void create();
    void destroy();
    void wait();
    void handleKernel();
    void handle(const uhid_event &event);
    void handleBinding();
    void readLines();
    void obeyLines();
    [[nodiscard]] bool obeyFirst();
    [[nodiscard]] std::optional<std::uint64_t> nextNs() const;

    const DeviceIdentity _identity;
    const std::span<const std::uint8_t> _reportDescriptor;
    UhidDevice _device;
    BindWatch _watch;
    const int _signals; ///< descriptor of a signalfd
    bool _isCreated = false, _isBound = false, _isFinished = false;
    bool _isReading = false; ///< the input, which has not ended
    std::string _partial;    ///< of a line
    std::deque<std::string> _lines;
    std::optional<std::uint64_t> _resumeNs; ///< when the next line's turn comes
};

/// Does it, as the main function of a program of that name: what is thrown becomes a line on standard error.
/// @return The exit status: 0, or 1 after a failure.
[[nodiscard]] int runProgram(const char *program, const std::function<void()> &work);

} // namespace ZorvaTouch::KernelTests
