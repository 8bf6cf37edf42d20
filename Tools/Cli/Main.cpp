#include "Host/Runtime/Files.h"
#include "Host/Runtime/SpdlogLogs.h"
#include "Host/Runtime/SteadyClock.h"
#include "Host/Runtime/StopSignals.h"
#include "Host/Runtime/Terminal.h"
#include "Tools/Cli/Cli.h"
#include "Tools/Hosting/ProgramFolder.h"

#include <cstdlib>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace {

using namespace ZorvaTouch;

class StandardSink final : public Tools::TextSink {
public:
    explicit StandardSink(Host::StandardStream stream) : _stream(stream) {}
    void write(std::string_view text) override { Host::writeStandard(_stream, text); }

private:
    Host::StandardStream _stream;
};

std::string_view variable(const char *name) {
    const char *const value = std::getenv(name);
    return value ? value : "";
}

std::size_t screenColumns() {
    constexpr std::size_t kUsual = 80;
    if (!Host::isScreen(Host::StandardStream::Output))
        return 0;
    const std::size_t columns = Host::terminalColumns(Host::StandardStream::Output);
    return columns > 0 ? columns : kUsual;
}

std::size_t screenRows() {
    return Host::isScreen(Host::StandardStream::Output) ? Host::terminalRows(Host::StandardStream::Output)
                                                        : 0;
}

/// Where programs keep what outlives a run, as freedesktop.org has it; the current folder without a home.
std::string stateFolder() {
    if (variable("XDG_STATE_HOME").starts_with('/'))
        return std::string(variable("XDG_STATE_HOME")) + "/zorvatouch";
    if (variable("HOME").starts_with('/'))
        return std::string(variable("HOME")) + "/.local/state/zorvatouch";
    return ".";
}

std::vector<std::string> argumentsOf(int count, char **values) {
    return count > 1 ? std::vector<std::string>(values + 1, values + count) : std::vector<std::string>();
}

} // namespace

int main(int argc, char **argv) {
    Host::reportFailedWrites();
    StandardSink output(Host::StandardStream::Output);
    StandardSink errorOutput(Host::StandardStream::Error);
    Host::SteadyClock clock;
    Tools::Environment environment{
        .openInput = Host::openStandardInput,
        .output = {output, "standard output"},
        .errorOutput = {errorOutput, "standard error"},
        .clock = clock,
        .openLogs = [](Ports::LogLevel minimum) { return std::make_unique<Host::SpdlogLogs>(minimum); },
        .usesColour = Host::showsColours(Host::StandardStream::Output),
        .showsProgress = Host::isTerminal(Host::StandardStream::Error),
        .screenColumns = screenColumns,
        .screenRows = screenRows,
        .watchStop =
            [](std::function<void()> onStop) {
                return std::make_shared<Host::StopSignals>(std::move(onStop));
            },
        .plugIn = Tools::besideProgram(ZORVA_PLUGIN_FROM_PROGRAM),
        .stateFolder = stateFolder(),
    };
    return Tools::runCli(argumentsOf(argc, argv), environment);
}
