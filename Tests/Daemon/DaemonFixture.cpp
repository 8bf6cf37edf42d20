#include "Tests/Daemon/DaemonFixture.h"

#include <signal.h>
#include <stdlib.h>
#include <unistd.h>

#include <cerrno>
#include <filesystem>
#include <system_error>
#include <thread>
#include <utility>

namespace ZorvaTouch::Tools::Tests {

// --- Standard output ---------------------------------------------------------------------------------------

int LineWriter::write(std::string_view text) noexcept {
    if (!isRead) {
        std::unique_lock lock(_mutex);
        _changed.wait(lock, [this] { return _isGivenUp; });
        return ECANCELED;
    }
    if (errorNumber != 0)
        return errorNumber;
    while (!text.empty()) {
        const std::size_t end = text.find('\n');
        lines.add(std::string(text.substr(0, end)));
        text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
    }
    return 0;
}

void LineWriter::giveUp() noexcept {
    const std::lock_guard lock(_mutex);
    _isGivenUp = true;
    _changed.notify_all();
}

// --- A folder ----------------------------------------------------------------------------------------------

TemporaryFolder::TemporaryFolder() {
    _path = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
    if (!::mkdtemp(_path.data()))
        throw std::system_error(errno, std::generic_category(), "mkdtemp");
}

TemporaryFolder::~TemporaryFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(_path, ignored);
}

// --- The daemon --------------------------------------------------------------------------------------------

DaemonFixture::DaemonFixture() {
    options.showsEvents = true;
    options.sendsSimulatedKeys = true; // fingers are the only surfaces of most tests
}

DaemonFixture::~DaemonFixture() {
    finish();
    EXPECT_TRUE(keys.down().empty()) << "a key is down in the end";
    EXPECT_EQ(keys.journal.count(" plugged"), keys.journal.count(" unplugged"));
}

void DaemonFixture::addFinger(const char *scenario, std::optional<double> seconds) {
    SimulatedFinger finger = fingerOf(*Synth::scenarioNamed(scenario));
    finger.seconds = seconds;
    options.devices.emplace_back(std::move(finger));
}

void DaemonFixture::start() {
    const auto finder = [this](const Linux::DeviceIdentity &device) -> DeviceMaker {
        return
            [&opener = openers.at(device.devnode)](const std::shared_ptr<Linux::HidrawObserver> &observer) {
                return Linux::HidrawDevice::create(opener.opener(), observer);
            };
    };
    daemon.emplace(options, DaemonSurroundings{.plugIn = plugIn,
                                               .logs = *logProvider,
                                               .clock = clock,
                                               .output = output,
                                               .usesColour = false,
                                               .keyboard = hasKeyboard ? keys.maker() : KeyboardMaker(),
                                               .finder = finder});
}

void DaemonFixture::runWhile(const std::function<void()> &story) {
    std::thread teller([&] {
        story();
        signal(SIGTERM);
    });
    daemon->run();
    teller.join();
}

void DaemonFixture::signal(int number) { ASSERT_EQ(::kill(::getpid(), number), 0); }

Lines DaemonFixture::linesWith(std::string_view part) const {
    Lines found;
    for (const std::string &line : output->lines.lines())
        if (line.find(part) != std::string::npos)
            found.push_back(line);
    return found;
}

} // namespace ZorvaTouch::Tools::Tests
