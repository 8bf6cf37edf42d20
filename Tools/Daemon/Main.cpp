#include "Host/Linux/HidrawFile.h"
#include "Host/Linux/HidrawOpeners.h"
#include "Host/Linux/Journal.h"
#include "Host/Linux/StandardStreams.h"
#include "Host/Linux/VirtualKeyboard.h"
#include "Host/Runtime/AsyncLogs.h"
#include "Host/Runtime/Signals.h"
#include "Host/Runtime/SpdlogLogs.h"
#include "Host/Runtime/SteadyClock.h"
#include "Host/Runtime/StreamWriter.h"
#include "Host/Runtime/Terminal.h"
#include "Shared/Util/Text.h"
#include "Tools/Cli/CliError.h"
#include "Tools/Daemon/Daemon.h"
#include "Tools/Daemon/Describe.h"
#include "Tools/Hosting/ProgramFolder.h"
#include "Tools/Hosting/ScreenLogs.h"

#include <cerrno>
#include <cstdlib>
#include <exception>
#include <memory>
#include <new>
#include <string>
#include <string_view>
#include <utility>
#include <variant>
#include <vector>

namespace {

using namespace ZorvaTouch;

enum ExitStatus {
    kExitEnded = 0,
    kExitFailed = 1,
    kExitWrongUsage = 2,
    kExitInUse = 3,
    kExitClosedPipe = 141
};

std::unique_ptr<Ports::LogProvider> openLogs(Ports::LogLevel level) {
    if (Linux::isJournalStream(static_cast<int>(Host::StandardStream::Error)))
        return std::make_unique<Host::AsyncLogs>(level, Linux::journalFormat(),
                                                 std::make_shared<Linux::JournalWriter>());
    std::unique_ptr<Ports::LogProvider> logs = std::make_unique<Host::AsyncLogs>(
        level, Host::logLine, std::make_shared<Host::StreamWriter>(Host::StandardStream::Error));
    if (Host::isTerminal(Host::StandardStream::Error) && level != Ports::LogLevel::Debug)
        logs = std::make_unique<Tools::ScreenLogs>(std::move(logs));
    return logs;
}

Linux::HidrawOpener openerOf(const Linux::DeviceIdentity &device) {
    return Linux::openOnly(device, Linux::HidrawFile::opener(device.devnode));
}

Tools::DeviceMaker makerFor(Linux::HidrawOpener opener) {
    return [opener = std::move(opener)](const std::shared_ptr<Linux::HidrawObserver> &observer) {
        return Linux::HidrawDevice::create(opener, observer);
    };
}

std::string plugInOf(const Tools::DaemonOptions &options) {
    return options.plugIn.value_or(Tools::besideProgram(ZORVA_PLUGIN_FROM_PROGRAM));
}

int runDaemon(const Tools::DaemonOptions &options) {
    Host::blockForGood(Tools::Daemon::kSignals); // before any thread
    const auto logs = openLogs(options.logLevel);
    Host::SteadyClock clock;
    Tools::Daemon daemon(
        options,
        {.plugIn = plugInOf(options),
         .logs = *logs,
         .clock = clock,
         .output = std::make_shared<Host::StreamWriter>(Host::StandardStream::Output),
         .usesColour = Host::showsColours(Host::StandardStream::Output),
         .keyboard = [codes = options.keys.codes()] { return Linux::VirtualKeyboard::create(codes); },
         .finder =
             [](const Linux::DeviceIdentity &device) {
                 return makerFor(Linux::openLocked(openerOf(device)));
             }});
    daemon.run();
    const bool hasSaved = daemon.end();
    if (daemon.isStuck())
        std::_Exit(kExitFailed); // every key is up, and nothing else is left to be done
    return hasSaved ? kExitEnded : kExitFailed;
}

/// @throws Host::FileFailure
void print(const std::string &text) { Host::writeStandard(Host::StandardStream::Output, text); }

void complain(const std::string &text) {
    try {
        Host::writeStandard(Host::StandardStream::Error, "zorvatouchd: " + Util::printable(text) + "\n");
    } catch (const Host::FileFailure &) { // nobody is there to read it: the status must do
    }
}

int describe(const Tools::DaemonOptions &options) {
    const auto progress = [](std::string_view line) {
        if (Host::isTerminal(Host::StandardStream::Error))
            complain(std::string(line));
    };
    print(describeSystem(
        options, plugInOf(options),
        [](const Linux::DeviceIdentity &device) { return makerFor(openerOf(device)); }, progress));
    return kExitEnded;
}

int fail(const std::exception &error, ExitStatus status) {
    complain(error.what());
    return status;
}

} // namespace

int main(int argc, char **argv) {
    Linux::fillStandardStreams();
    Host::reportFailedWrites();
    try {
        const auto command = Tools::parseDaemonOptions(std::vector<std::string>(argv + 1, argv + argc));
        if (const auto *const answer = std::get_if<Tools::AnswerOptions>(&command)) {
            print(answer->text);
            return kExitEnded;
        }
        const auto &options = std::get<Tools::DaemonOptions>(command);
        return options.describe ? describe(options) : runDaemon(options);
    } catch (const Tools::CliError &error) {
        return fail(error, kExitWrongUsage);
    } catch (const Host::FileFailure &failure) {
        return failure.code().value() == EPIPE ? kExitClosedPipe : fail(failure, kExitFailed);
    } catch (const Tools::SurfaceInUse &error) {
        return fail(error, kExitInUse);
    } catch (const std::bad_alloc &) {
        complain("there is not enough memory to start; raise its limit (ulimit -v, LimitAS=, MemoryMax=)");
        return kExitFailed;
    } catch (const std::exception &error) {
        return fail(error, kExitFailed);
    }
}
