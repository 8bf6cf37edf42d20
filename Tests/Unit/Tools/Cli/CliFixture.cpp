#include "Tests/Unit/Tools/Cli/CliFixture.h"

#include "Host/Runtime/Files.h"
#include "Shared/RecordingContainer.h"
#include "Tools/Stimulus/StimulusText.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <utility>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

/// Hands the test's log on without giving it away.
class LogsForOneRun final : public Ports::LogProvider {
public:
    explicit LogsForOneRun(Ports::LogProvider &logs) : _logs(logs) {}
    std::shared_ptr<Ports::Log> openLog(std::string_view subsystem, std::string_view category) override {
        return _logs.openLog(subsystem, category);
    }

private:
    Ports::LogProvider &_logs;
};

std::string replaceAll(std::string text, const std::string &what, const std::string &with) {
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + with.size()))
        text.replace(at, what.size(), with);
    return text;
}

} // namespace

void StringSink::write(std::string_view written) {
    if (isFull)
        throw Host::FileFailure("write", ENOSPC);
    if (isClosed)
        throw Host::FileFailure("write", EPIPE);
    text.append(written);
    if (onWrite)
        onWrite(text);
}

void CliFixture::SetUp() {
    std::string pattern = (std::filesystem::temp_directory_path() / "zorvatouch-test-XXXXXX").string();
    ASSERT_NE(::mkdtemp(pattern.data()), nullptr);
    _folder = pattern;
}

void CliFixture::TearDown() { std::filesystem::remove_all(_folder); }

CliFixture::Run CliFixture::run(std::initializer_list<std::string> arguments) {
    std::vector<std::string> resolved(arguments);
    for (std::string &argument : resolved)
        if (argument.starts_with('@'))
            argument = path(argument.substr(1));
    outputSink.text.clear();
    errorSink.text.clear();
    Environment environment{
        .openInput = [this] { return Host::Input{.read = Util::piecesOf(input)}; },
        .output = {outputSink, "standard output"},
        .errorOutput = {errorSink, "standard error"},
        .clock = clock,
        .openLogs =
            [this](Ports::LogLevel level) {
                logLevel = level;
                return std::make_unique<LogsForOneRun>(logs);
            },
        .usesColour = usesColour,
        .showsProgress = showsProgress,
        .screenColumns = [this] { return screenColumns; },
        .screenRows = [this] { return screenRows; },
        .watchStop =
            [this](std::function<void()> onStop) {
                stop = std::move(onStop);
                return nullptr;
            },
        .plugIn = ZORVA_TEST_PLUGIN,
        .stateFolder = path("state"),
    };
    const int status = runCli(resolved, environment);
    return {status, outputSink.text, errorSink.text};
}

std::string CliFixture::outputOf(std::initializer_list<std::string> arguments) {
    const Run result = run(arguments);
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.error, "");
    return replaceAll(result.output, _folder.string() + "/", "@");
}

std::string CliFixture::errorOf(std::initializer_list<std::string> arguments) {
    const Run result = run(arguments);
    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_EQ(std::count(result.error.begin(), result.error.end(), '\n'), 1);
    return replaceAll(result.error, _folder.string() + "/", "@");
}

void CliFixture::writeFile(const std::string &name, std::string_view text) const {
    Host::replaceFile(path(name), text);
}

std::string CliFixture::readFile(const std::string &name) const { return Host::readFile(path(name)); }

void CliFixture::makeRecording(const std::string &name, std::string_view stimulus) const {
    writeFile(name, writeRecordingContainer(parseStimulus(stimulus).frames));
}

std::string CliFixture::fileNames() const {
    std::vector<std::string> names;
    for (const auto &entry : std::filesystem::directory_iterator(_folder))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    std::string text;
    for (const std::string &name : names)
        text.append(name).append(" ");
    return text;
}

} // namespace ZorvaTouch::Tools
