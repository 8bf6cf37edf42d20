#include "Tools/Cli/HostCommand.h"

#include "Shared/Util/Json.h"
#include "Shared/Util/Text.h"
#include "Tools/Cli/Documents.h"
#include "Tools/Cli/LiveJson.h"
#include "Tools/Cli/LiveReport.h"
#include "Tools/Cli/LiveTable.h"
#include "Tools/Cli/LiveWatch.h"
#include "Tools/Cli/PropertyText.h"

#include <memory>
#include <optional>
#include <string_view>
#include <utility>
#include <variant>

namespace ZorvaTouch::Tools {
namespace {

/// One run of the command.
class HostRun {
public:
    HostRun(const HostOptions &options, Environment &environment)
        : _options(options), _environment(environment),
          _stopWatch(environment.watchStop([this] { _inbox.stop(); })), _source(openSource()),
          _session({.plugIn = options.plugIn.value_or(environment.plugIn),
                    .speed = options.speed,
                    .logLevel = options.logLevel},
                   _inbox, environment) {}

    [[nodiscard]] ExitStatus run() {
        if (_source)
            _session.start(_source->startNs);
        for (const Setting &setting : _options.settings)
            if (!_session.service().setProperty(setting.key, setting.value))
                return tellRefusal(setting.key);
        if (_source)
            play();
        bool hasAll = true;
        for (const std::string &key : _options.gets)
            hasAll = printProperty(key) && hasAll;
        if (_options.saveFile)
            save(*_options.saveFile);
        return hasAll ? kExitDone : kExitCheckFailed;
    }

private:
    [[nodiscard]] std::optional<LiveSource> openSource() const {
        if (const auto *const finger = std::get_if<SimulatedFinger>(&_options.device))
            return playFinger(*finger);
        if (const auto *const file = std::get_if<std::string>(&_options.device))
            return playRecording(*file, _environment);
        return std::nullopt;
    }

    [[nodiscard]] std::string deviceTitle() const {
        if (const auto *const finger = std::get_if<SimulatedFinger>(&_options.device))
            return titleOf(*finger);
        return "recording " + inputTitle(std::get<std::string>(_options.device));
    }

    ExitStatus tellRefusal(const std::string &key) {
        complain("--set: the service refuses ", key);
        return kExitCheckFailed;
    }

    void complain(std::string_view problem, const std::string &key) {
        _environment.output.flush(); // what was done so far stays in order before the error
        std::string text("zorvatouch: ");
        Util::appendJsonString(text.append(problem), key);
        _environment.errorOutput.write(text.append("\n"));
        _environment.errorOutput.flush();
    }

    void play() {
        if (!_options.json)
            writeHeading(_session.service(), deviceTitle(), _environment);
        const auto printer = makePrinter();
        LiveWatch watch(printer.get(), nullptr);
        _session.play(std::move(*_source), watch);
        printer->clear();
        if (!_options.json)
            appendCounters(_environment.output.text(), readCounters(_session.service(), watch.counts()));
    }

    [[nodiscard]] std::unique_ptr<LivePrinter> makePrinter() {
        if (_options.json)
            return std::make_unique<LiveJson>(_environment.output);
        return std::make_unique<LiveTable>(_environment, false);
    }

    /// @return Whether there is such a property.
    [[nodiscard]] bool printProperty(const std::string &key) {
        const std::optional<PropertyValue> value = _session.service().property(key);
        std::string &text = _environment.output.text();
        if (_options.json) {
            Util::appendJsonString(text.append(R"({"property":)"), key);
            Util::appendJson(text.append(R"(,"value":)"), value.value_or(PropertyValue()), 2);
            text.append("}\n");
        } else if (value) {
            appendReadable(text.append(key).append(": "), *value);
            text.append("\n");
        }
        _environment.output.wrote();
        if (!value)
            complain("--get: the service does not have a property ", key);
        return value.has_value();
    }

    void save(const std::string &file) {
        const std::size_t reports = countReports(saveRecording(_session.service(), file, _environment));
        if (file == kStandardStreamName) // where the recording itself has gone
            return;
        std::string &text = _environment.output.text();
        if (_options.json) {
            Util::appendJsonString(text.append(R"({"recording":)"), file);
            Util::appendUnsigned(text.append(R"(,"reports":)"), reports);
            text.append("}\n");
        } else {
            appendSummaryLabel(text, "recording");
            Util::appendUnsigned(text.append(file).append(", "), reports);
            text.append(" reports\n");
        }
        _environment.output.wrote();
    }

    const HostOptions &_options;
    Environment &_environment;
    EventInbox _inbox;
    std::shared_ptr<void> _stopWatch; ///< before the session's threads
    std::optional<LiveSource> _source;
    LiveSession _session;
};

} // namespace

ExitStatus runHost(const HostOptions &options, Environment &environment) {
    return HostRun(options, environment).run();
}

} // namespace ZorvaTouch::Tools
