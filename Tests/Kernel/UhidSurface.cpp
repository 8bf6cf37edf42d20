#include "Shared/Util/Hex.h"
#include "Synth/Labels.h"
#include "Tests/Kernel/Descriptors.h"
#include "Tests/Kernel/Emulator.h"
#include "Tests/Kernel/ScenarioPlay.h"
#include "Tests/Kernel/Story.h"
#include "Tests/Kernel/SurfaceOptions.h"

#include <cerrno>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ZorvaTouch::KernelTests {
namespace {

constexpr std::string_view kFeature = "feature ";

std::span<const std::uint8_t> descriptorFor(const SurfaceOptions &options) {
    return options.isLoose ? looseSurfaceDescriptor() : surfaceDescriptor();
}

/// The touch surface: a finger's reports or those of the input, and answers to feature requests.
class Surface final : public Emulator {
public:
    explicit Surface(SurfaceOptions options)
        : Emulator(options.identity, descriptorFor(options)), _options(std::move(options)) {
        if (_options.scenario)
            _play.emplace(*_options.scenario, _options.seed, _options.seconds);
        if (_options.readsInput)
            readInput();
    }

private:
    void getReport(const uhid_get_report_req &request) override {
        const FeatureAnswers::Answer &answer = answerTo(request.rtype, request.rnum);
        if (answer.mode == FeatureAnswers::Mode::Answer)
            device().answerGet(request.id, 0, answer.report);
        else if (answer.mode == FeatureAnswers::Mode::Refuse)
            device().answerGet(request.id, EIO, {});
        tellRequest("get", request.rtype, request.rnum, answer.mode, {});
    }

    void setReport(const uhid_set_report_req &request) override {
        const FeatureAnswers::Answer &answer = answerTo(request.rtype, request.rnum);
        if (answer.mode != FeatureAnswers::Mode::Mute)
            device().answerSet(request.id, answer.mode == FeatureAnswers::Mode::Answer ? 0 : EIO);
        tellRequest("set", request.rtype, request.rnum, answer.mode,
                    PropertyValue::Bytes(request.data, request.data + request.size));
    }

    const FeatureAnswers::Answer &answerTo(std::uint8_t type, std::uint8_t id) const {
        static const FeatureAnswers::Answer refusal;
        return type == UHID_FEATURE_REPORT ? _options.features.of(id) : refusal;
    }

    void tellRequest(const char *what, std::uint8_t type, std::uint8_t id, FeatureAnswers::Mode mode,
                     PropertyValue data) const {
        PropertyValue::Dictionary values{
            {"what", what}, {"feature", type == UHID_FEATURE_REPORT}, {"id", id}, {"answer", nameOf(mode)}};
        if (!data.isNull())
            values.emplace("data", std::move(data));
        tell("request", std::move(values));
    }

    /// The finger begins when the device is there for the first time, and does not care when it is unplugged.
    void start() override {
        if (_play && _baseNs == 0) {
            _baseNs = nowNs();
            tell("playing");
        }
    }

    std::optional<std::uint64_t> dueNs() const override {
        if (!_play || _baseNs == 0 || !_play->next())
            return std::nullopt;
        return _baseNs + _play->nextNs();
    }

    void act(std::uint64_t now) override {
        while (_play->next() && _baseNs + _play->nextNs() <= now) {
            play(*_play->next());
            _play->advance();
        }
        finishIfDone();
    }

    void play(const Frame &frame) {
        if (frame.type == FrameType::InputReport)
            send(frame.data);
        else if (frame.type == FrameType::Metadata && frame.key == Synth::kLabelKey)
            tell("label", _times.describe(frame.value, _play->nextNs(), _baseNs));
    }

    void send(std::span<const std::uint8_t> report) {
        if (!isBound())
            return;
        device().sendInput(report);
        ++_sent;
    }

    void obey(std::string_view line) override {
        if (line == "mark")
            return tell("mark");
        if (line.starts_with(kFeature))
            return _options.features.change(line.substr(kFeature.size()));
        const std::vector<std::uint8_t> report = Util::bytesFromHexString(line);
        if (Util::hexStringFromBytes(report).size() < line.size())
            throw std::invalid_argument("no report: " + std::string(line));
        send(report);
    }

    void inputEnded() override { finishIfDone(); }

    void finishIfDone() {
        const bool isPlaying = _play && _play->next();
        if (!isPlaying && !hasInput() && !_options.isKept)
            finish();
    }

    PropertyValue::Dictionary summary() const override { return {{"reports", _sent}}; }

    SurfaceOptions _options;
    std::optional<ScenarioPlay> _play;
    LabelTimes _times;
    std::uint64_t _baseNs = 0; ///< when the finger began; 0 as long as it has not
    std::uint64_t _sent = 0;   ///< input reports
};

} // namespace
} // namespace ZorvaTouch::KernelTests

int main(int count, char **arguments) {
    using namespace ZorvaTouch::KernelTests;
    return runProgram("zorvatouch-uhid-surface", [&] { Surface(surfaceOptions(count, arguments)).run(); });
}
