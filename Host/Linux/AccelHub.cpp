#include "Host/Linux/AccelHub.h"

#include "Host/Linux/IioAccelerometer.h"
#include "Host/Linux/IioFile.h"

#include <algorithm>
#include <exception>
#include <utility>

namespace ZorvaTouch::Linux {

using Ports::LogLevel;

AccelHub::AccelHub(std::shared_ptr<Host::EventSystem> system, AccelChoice choice,
                   std::shared_ptr<Ports::Log> log, std::function<void()> onChange, Nodes nodes)
    : _system(std::move(system)), _choice(std::move(choice)), _log(std::move(log)),
      _onChange(std::move(onChange)), _nodes(std::move(nodes)) {}

AccelHub::~AccelHub() = default;

AccelHub::Nodes AccelHub::systemNodes() {
    return [](const std::string &devnode) { return IioFile::opener(devnode); };
}

void AccelHub::onAdded(const AccelIdentity &accelerometer) {
    if (!_choice.fits(accelerometer))
        return say(LogLevel::Debug, describe(accelerometer) + " is not the chosen accelerometer");
    const auto place =
        std::ranges::upper_bound(_candidates, accelerometer.syspath, {}, &AccelIdentity::syspath);
    _candidates.insert(place, accelerometer);
    choose();
}

void AccelHub::onRemoved(const AccelIdentity &accelerometer) {
    std::erase_if(_candidates,
                  [&](const AccelIdentity &candidate) { return candidate.syspath == accelerometer.syspath; });
    if (!_chosen || _chosen->syspath != accelerometer.syspath)
        return;
    say(LogLevel::Default, describe(*_chosen) + " is gone");
    takeOut();
    choose();
}

void AccelHub::takeOut() {
    std::erase_if(_leaving, [](const auto &accelerometer) { return accelerometer->hasLeft(); });
    _accelerometer->leave();
    _leaving.push_back(std::move(_accelerometer));
    _chosen.reset();
}

void AccelHub::choose() {
    if (_chosen || std::ranges::none_of(_candidates, [this](const auto &next) { return use(next); }))
        return;
    if (_onChange)
        _onChange();
}

bool AccelHub::use(const AccelIdentity &accelerometer) {
    try {
        _accelerometer =
            std::make_unique<IioAccelerometer>(_system, accelerometer, _nodes(accelerometer.devnode), _log);
    } catch (const std::exception &failure) {
        say(LogLevel::Error, "no samples of " + describe(accelerometer) + ": " + failure.what());
        return false;
    }
    _chosen = accelerometer;
    say(LogLevel::Default, describe(accelerometer) + " is the accelerometer");
    return true;
}

void AccelHub::say(LogLevel level, const std::string &line) const noexcept {
    if (_log->isEnabled(level))
        _log->write(level, line);
}

} // namespace ZorvaTouch::Linux
