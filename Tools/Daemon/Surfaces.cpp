#include "Tools/Daemon/Surfaces.h"

#include "Shared/Util/Ticks.h"

#include <algorithm>
#include <stdexcept>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

/// How often it is looked whether a surface is let go of, while one is waited for.
constexpr std::chrono::milliseconds kIdleCheck{500};

} // namespace

Surfaces::Surfaces(SurfaceSurroundings surroundings, DeviceFinder finder, Ports::Clock &clock,
                   SurfaceHooks hooks)
    : _surroundings(std::move(surroundings)), _finder(std::move(finder)), _clock(clock),
      _hooks(std::move(hooks)) {}

Surfaces::~Surfaces() { closeAll(); }

// --- Coming and going --------------------------------------------------------------------------------------

void Surfaces::onAdded(const Linux::DeviceIdentity &device) {
    add({.name = nameOf(device),
         .syspath = device.syspath,
         .maker = _finder(device),
         .keyboard = _surroundings.keyboard,
         .events = _surroundings.events});
}

void Surfaces::add(const SurfaceName &name, DeviceMaker maker, Keyboard &keyboard,
                   std::shared_ptr<Host::EventSystem> events) {
    SurfaceName own = name;
    makeUnique(own.id);
    add({.name = std::move(own),
         .syspath = {},
         .maker = std::move(maker),
         .keyboard = keyboard,
         .events = events ? std::move(events) : _surroundings.events});
}

void Surfaces::add(Entry entry) {
    Entry &added = _entries.emplace_back(std::move(entry));
    _surroundings.listener.onSurface(added.name, SurfaceState::Added, {});
    _hooks.onComing(added.name);
    open(added);
}

void Surfaces::onRemoved(const Linux::DeviceIdentity &device) {
    const auto found =
        std::ranges::find_if(_entries, [&](const Entry &entry) { return entry.syspath == device.syspath; });
    if (found == _entries.end())
        return;
    close(*found);
    _surroundings.listener.onSurface(found->name, SurfaceState::Removed, {});
    _entries.erase(found);
}

void Surfaces::onChanged(const Linux::DeviceIdentity &device) {
    for (Entry &entry : _entries)
        if (entry.syspath == device.syspath && !entry.surface) { // now it may be possible
            entry.backOff.reset();
            open(entry);
        }
}

void Surfaces::open(Entry &entry) {
    entry.isInUse = false;
    try {
        entry.surface = std::make_unique<Surface>(
            _surroundings, entry.name, entry.maker, entry.keyboard, entry.events,
            [this, &entry](const std::string &reason) { handleLoss(entry, reason); });
    } catch (const std::runtime_error &error) {
        entry.isInUse = dynamic_cast<const SurfaceInUse *>(&error) != nullptr;
        _surroundings.listener.onSurface(entry.name, SurfaceState::Failed, error.what());
        retryLater(entry);
        return;
    }
    entry.openedNs = nowNs();
    entry.wantsReschedule = false;
    _surroundings.listener.onSurface(entry.name, SurfaceState::Opened, {});
}

void Surfaces::handleLoss(Entry &entry, const std::string &reason) {
    close(entry);
    _surroundings.listener.onSurface(entry.name, SurfaceState::Lost, reason);
    if (nowNs() - entry.openedNs >=
        static_cast<std::uint64_t>(std::chrono::nanoseconds(Linux::BackOff::kLongest).count()))
        entry.backOff.reset();
    retryLater(entry);
}

void Surfaces::retryLater(Entry &entry) {
    entry.retry = _surroundings.later(entry.backOff.next(), [this, &entry] { open(entry); });
}

void Surfaces::close(Entry &entry) {
    entry.retry = {};
    if (!entry.surface)
        return;
    entry.surface->stop();
    _hooks.onEnding(entry.name, *entry.surface);
    entry.surface.reset();
}

/// Nobody keeps a key down while somebody else's recording is saved.
void Surfaces::closeAll() {
    for (const Entry &entry : _entries)
        if (entry.surface)
            entry.surface->stop();
    for (Entry &entry : _entries)
        close(entry);
    _entries.clear();
}

// --- All of them -------------------------------------------------------------------------------------------

void Surfaces::reschedule() {
    for (Entry &entry : _entries)
        entry.wantsReschedule = entry.surface != nullptr;
    rescheduleIdle();
}

void Surfaces::rescheduleIdle() {
    _rescheduling = {};
    bool isWaiting = false;
    for (Entry &entry : _entries) {
        if (!entry.surface || !entry.wantsReschedule)
            continue;
        if (entry.surface->isIdle())
            rescheduleNow(entry);
        else
            isWaiting = true;
    }
    if (isWaiting)
        _rescheduling = _surroundings.later(kIdleCheck, [this] { rescheduleIdle(); });
}

void Surfaces::rescheduleNow(Entry &entry) {
    entry.wantsReschedule = false;
    try {
        entry.surface->reschedule();
    } catch (const std::runtime_error &error) {
        handleLoss(entry, error.what());
    }
}

void Surfaces::suspend() {
    for (const Entry &entry : _entries)
        if (entry.surface)
            entry.surface->suspend();
}

void Surfaces::forEach(const std::function<void(const SurfaceName &, const Surface &)> &visit) const {
    for (const Entry &entry : _entries)
        if (entry.surface)
            visit(entry.name, *entry.surface);
}

const SurfaceName *Surfaces::inUse() const noexcept {
    const auto found = std::ranges::find_if(_entries, &Entry::isInUse);
    return found == _entries.end() ? nullptr : &found->name;
}

// --- Names -------------------------------------------------------------------------------------------------

SurfaceName Surfaces::nameOf(const Linux::DeviceIdentity &device) const {
    SurfaceName name{.id = device.stableId(), .node = device.devnode, .name = device.name};
    // Makers give the same serial number to more than one device; those are told apart by their places.
    if (isTaken(name.id))
        name.id.append("@").append(device.physicalPath.empty() ? device.devnode : device.physicalPath);
    makeUnique(name.id);
    return name;
}

void Surfaces::makeUnique(std::string &id) const {
    const std::string wanted = id;
    for (std::size_t number = 2; isTaken(id); ++number)
        id = wanted + "-" + std::to_string(number);
}

bool Surfaces::isTaken(const std::string &id) const noexcept {
    return std::ranges::any_of(_entries, [&](const Entry &entry) { return entry.name.id == id; });
}

// --- Time --------------------------------------------------------------------------------------------------

std::uint64_t Surfaces::nowNs() noexcept {
    return Util::TickConverter(_clock).nanosecondsFromMachTime(_clock.nowTicks());
}

} // namespace ZorvaTouch::Tools
