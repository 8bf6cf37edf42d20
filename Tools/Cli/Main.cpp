#include "Host/Runtime/Files.h"
#include "Host/Runtime/SpdlogLogs.h"
#include "Host/Runtime/SteadyClock.h"
#include "Tools/Cli/Cli.h"

#include <cstdlib>
#include <string>
#include <string_view>
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

bool usesColour() {
    return Host::isTerminal(Host::StandardStream::Output) && variable("NO_COLOR").empty() &&
           variable("TERM") != "dumb";
}

std::vector<std::string> argumentsOf(int count, char **values) {
    return count > 1 ? std::vector<std::string>(values + 1, values + count) : std::vector<std::string>();
}

} // namespace

int main(int argc, char **argv) {
    Host::reportBrokenPipes();
    StandardSink output(Host::StandardStream::Output);
    StandardSink errorOutput(Host::StandardStream::Error);
    Host::SteadyClock clock;
    Tools::Environment environment{
        .readInput = Host::readStandardInput,
        .output = {output, "standard output"},
        .errorOutput = {errorOutput, "standard error"},
        .clock = clock,
        .openLogs = [](Ports::LogLevel minimum) { return std::make_unique<Host::SpdlogLogs>(minimum); },
        .usesColour = usesColour(),
        .showsProgress = Host::isTerminal(Host::StandardStream::Error),
    };
    return Tools::runCli(argumentsOf(argc, argv), environment);
}
