#include "Tools/Cli/DemoCommand.h"

#include "Tools/Cli/CliError.h"
#include "Tools/Cli/DemoSummary.h"
#include "Tools/Cli/Layout.h"
#include "Tools/Cli/LiveJson.h"
#include "Tools/Cli/LiveReport.h"
#include "Tools/Cli/LiveTable.h"
#include "Tools/Cli/LiveWatch.h"

#include <filesystem>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>

namespace ZorvaTouch::Tools {
namespace {

constexpr const char *kRecordingName = "zorvatouch-demo.json";

/// What the table does not say by itself.
constexpr std::string_view kLegend =
    "ms: since the touch began. touch withdrawn: it is neither tap nor hold.\n"
    "volume up ...: repeats until the hold ends. (missed): should be a gesture.\n";

/// Where the recording goes unless told, in a folder that is made when it is not there.
std::string defaultRecordingFile(const std::filesystem::path &folder) {
    std::error_code error;
    std::filesystem::create_directories(folder, error);
    if (error)
        throw CliError(folder.string() + ": cannot create the folder: " + error.message() +
                       " (--save takes another place)");
    return (folder / kRecordingName).lexically_normal().string();
}

/// Where the recording goes as told. What is wrong with it is better said now than when all is over.
std::string checkedRecordingFile(const std::string &file) {
    const std::filesystem::path folder = std::filesystem::path(file).parent_path();
    std::error_code error;
    if (!folder.empty() && !std::filesystem::is_directory(folder, error))
        throw CliError(file + ": there is no such folder to save in");
    return file;
}

/// One run of the demo.
class DemoRun {
public:
    DemoRun(const DemoOptions &options, Environment &environment)
        : _options(options), _environment(environment),
          _recordingFile(options.saveFile ? checkedRecordingFile(*options.saveFile)
                                          : defaultRecordingFile(environment.stateFolder)),
          _stopWatch(environment.watchStop([this] { _inbox.stop(); })),
          _session({.plugIn = options.plugIn.value_or(environment.plugIn),
                    .speed = options.speed,
                    .logLevel = Ports::LogLevel::Error},
                   _inbox, environment) {}

    [[nodiscard]] ExitStatus run() {
        const auto printer = makePrinter();
        if (_options.json || _options.quiet)
            return play(printer.get(), nullptr);
        writeHeading(_session.service(), titleOf(_options.finger), _environment);
        const std::size_t columns = _environment.screenColumns();
        if (columns == 0 || columns >= kTextColumns) // a narrower table has no columns to explain
            appendColoured(_environment.output.text(), kLegend, Colour::Dim, _environment.usesColour);
        FingerTruth truth(_options.finger);
        return play(printer.get(), &truth);
    }

private:
    [[nodiscard]] std::unique_ptr<LivePrinter> makePrinter() {
        if (_options.quiet)
            return nullptr;
        if (_options.json)
            return std::make_unique<LiveJson>(_environment.output);
        return std::make_unique<LiveTable>(_environment, true);
    }

    [[nodiscard]] ExitStatus play(LivePrinter *printer, FingerTruth *truth) {
        LiveWatch watch(printer, truth);
        LiveSource source = playFinger(_options.finger);
        _session.start(source.startNs);
        _session.play(std::move(source), watch);
        if (printer)
            printer->clear();
        const DemoSummary summary = summarize(watch);
        if (_options.json)
            appendForPrograms(_environment.output.text(), summary);
        else
            appendForPerson(_environment.output.text(), summary, _environment.usesColour);
        return summary.proof.difference ? kExitCheckFailed : kExitDone;
    }

    [[nodiscard]] DemoSummary summarize(const LiveWatch &watch) {
        const HostedService &service = _session.service();
        const Simulated::DeviceCounters device = _session.deviceCounters();
        DemoSummary summary{
            .plugIn = service.file(),
            .version = service.version(),
            .finger = _options.finger,
            .handledReports = device.handled,
            .droppedReports = device.dropped,
            .counters = readCounters(service, watch.counts()),
            .recordingFile = _recordingFile,
            .proof = proveReplay(saveRecording(service, _recordingFile, _environment), watch.history()),
            .comparedFromNs = std::nullopt};
        if (summary.proof.fromNs)
            summary.comparedFromNs = *summary.proof.fromNs == kNothingCompared
                                         ? kNothingCompared
                                         : _session.sinceStart(*summary.proof.fromNs);
        return summary;
    }

    const DemoOptions &_options;
    Environment &_environment;
    const std::string _recordingFile;
    EventInbox _inbox;
    const std::shared_ptr<void> _stopWatch; ///< before the session's threads
    LiveSession _session;
};

} // namespace

ExitStatus runDemo(const DemoOptions &options, Environment &environment) {
    return DemoRun(options, environment).run();
}

} // namespace ZorvaTouch::Tools
