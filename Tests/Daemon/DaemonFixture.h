#pragma once

#include "Host/Runtime/SteadyClock.h"
#include "Host/Runtime/StreamWriter.h"
#include "Tests/Unit/Host/Linux/FakeNode.h"
#include "Tests/Unit/Tools/Daemon/KeyboardFakes.h"
#include "Tools/Daemon/Daemon.h"

#include <gtest/gtest.h>

#include <functional>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// The whole daemon in this process, with a keyboard, an output and devices that are none.
namespace ZorvaTouch::Tools::Tests {

/// Standard output as lines.
///
/// Threads: as a writer's; what is set, before anything is written.
class LineWriter final : public Host::TextWriter {
public:
    [[nodiscard]] int write(std::string_view text) noexcept override;
    void giveUp() noexcept override;

    LineJournal lines;   ///< without their line breaks
    bool isRead = true;  ///< else the first write does not end before it is given up
    int errorNumber = 0; ///< what each write comes to

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    bool _isGivenUp = false;
};

/// A folder of the test's own, gone with it.
class TemporaryFolder {
public:
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder &) = delete;
    TemporaryFolder &operator=(const TemporaryFolder &) = delete;

    [[nodiscard]] std::string path(const std::string &name) const { return _path + "/" + name; }

private:
    std::string _path;
};

/// Signals reach the daemon from `start` to `finish`; before and after that they end the test.
class DaemonFixture : public testing::Test {
protected:
    DaemonFixture();
    ~DaemonFixture() override;

    /// A finger among the devices that are asked for. Nothing: without an end.
    void addFinger(const char *scenario, std::optional<double> seconds);
    /// Makes the daemon.
    void start();
    /// Serves until the daemon ends, while the story goes on on another thread; then SIGTERM comes.
    void runWhile(const std::function<void()> &story);
    /// The daemon's end.
    void finish() { daemon.reset(); }

    static void signal(int number);

    /// The lines of standard output that contain this.
    [[nodiscard]] Lines linesWith(std::string_view part) const;

    DaemonOptions options;
    std::string plugIn = ZORVA_TEST_PLUGIN;
    JournalOfLogs logs;
    Ports::LogProvider *logProvider = &logs; ///< where the daemon logs
    Host::SteadyClock clock;
    FakeKeyboards keys;
    bool hasKeyboard = true;
    std::shared_ptr<LineWriter> output = std::make_shared<LineWriter>();
    std::map<std::string, Linux::Tests::FakeOpener> openers; ///< by node; those that there are when it starts
    std::optional<Daemon> daemon;
};

} // namespace ZorvaTouch::Tools::Tests
