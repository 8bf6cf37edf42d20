#include "Tools/Daemon/KeyMapper.h"

#include "Tools/Stimulus/EventNames.h"

#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::uint16_t kResetUsagePage = 0xFF60;
constexpr std::uint16_t kResetUsage = 2;
constexpr std::size_t kStateCount = 4;
constexpr std::size_t kInputCount = 11;

} // namespace

/// The first seven are the gestures, in the order of `Gesture`.
enum class KeyMapper::Input : std::size_t {
    MayBegin,
    HoldStart,
    HoldChange,
    HoldEnd,
    Tap,
    Cancel,
    Reset,
    Unknown, ///< of the digitizer, but no gesture
    Foreign, ///< not about touches
    Suspend,
    Over,
};

enum class KeyMapper::Action {
    Keep,  ///< what is down stays down
    LetGo, ///< what is down goes up
    Tap,   ///< the region's tap key goes down and up
    Hold,  ///< the region's hold key is down, and nothing else
};

struct KeyMapper::Decision {
    State next;
    Action action;
};

struct KeyMapper::Table {
    using Row = std::array<Decision, kStateCount>; // in the order of State

    static constexpr Decision kStaysIdle{State::Idle, Action::Keep};
    static constexpr Decision kTouchIsOver{State::Idle, Action::LetGo};
    static constexpr Decision kTouchBegins{State::Touching, Action::LetGo};
    static constexpr Decision kTaps{State::Idle, Action::Tap};
    static constexpr Decision kHolds{State::Holding, Action::Hold};
    static constexpr Decision kIsOver{State::Over, Action::LetGo};

    // What follows may-begin in an order that no touch has counts as the touch's end: when in doubt, lose a
    // gesture rather than leave a key stuck.
    static constexpr std::array<Row, kInputCount> kRows{{
        // Idle, Touching, Holding, Over
        {kTouchBegins, kTouchBegins, kTouchBegins, kIsOver},                                    // may-begin
        {kStaysIdle, kHolds, kTouchIsOver, kIsOver},                                            // hold start
        {kStaysIdle, kTouchIsOver, kHolds, kIsOver},                                            // hold change
        {kStaysIdle, kTouchIsOver, kTouchIsOver, kIsOver},                                      // hold end
        {kStaysIdle, kTaps, kTouchIsOver, kIsOver},                                             // tap
        {kStaysIdle, kTouchIsOver, kTouchIsOver, kIsOver},                                      // cancel
        {kStaysIdle, kTouchIsOver, kTouchIsOver, kIsOver},                                      // reset
        {kStaysIdle, kTouchIsOver, kTouchIsOver, kIsOver},                                      // unknown
        {kStaysIdle, {State::Touching, Action::Keep}, {State::Holding, Action::Keep}, kIsOver}, // foreign
        {kStaysIdle, kTouchIsOver, kTouchIsOver, kIsOver},                                      // suspend
        {kIsOver, kIsOver, kIsOver, kIsOver},                                                   // over
    }};
};

KeyMapper::Input KeyMapper::inputOf(const HostEvent &event) noexcept {
    static_assert(kGestureCount == static_cast<std::size_t>(Input::Unknown));
    static_assert(static_cast<std::size_t>(Gesture::Reset) == static_cast<std::size_t>(Input::Reset));
    if (const VendorDefinedFields *const fields = event.vendorDefined())
        return fields->usagePage == kResetUsagePage && fields->usage == kResetUsage ? Input::Reset
                                                                                    : Input::Foreign;
    if (!event.digitizer())
        return Input::Foreign;
    const auto gesture = gestureOf(event);
    return gesture ? static_cast<Input>(*gesture) : Input::Unknown;
}

KeyChanges KeyMapper::handle(const HostEvent &event) noexcept {
    return decide(inputOf(event), regionOf(event));
}

KeyChanges KeyMapper::handle(SurfaceEnd end) noexcept {
    return decide(end == SurfaceEnd::Suspended ? Input::Suspend : Input::Over, kPixelRegionNone);
}

KeyChanges KeyMapper::decide(Input input, PixelRegion region) noexcept {
    const Decision &decision =
        Table::kRows[static_cast<std::size_t>(input)][static_cast<std::size_t>(_state)];
    KeyChanges changes;
    switch (decision.action) {
    case Action::Keep:
        break;
    case Action::Tap: // only where nothing is down
        hold(_map.tapKey(region), changes);
        hold(kNoKey, changes);
        break;
    case Action::Hold:
        hold(_map.holdKey(region), changes);
        break;
    case Action::LetGo:
        hold(kNoKey, changes);
        break;
    }
    _state = decision.next;
    return changes;
}

void KeyMapper::hold(KeyCode code, KeyChanges &changes) noexcept {
    const KeyCode previous = std::exchange(_keyDown, code);
    if (previous == code)
        return;
    if (previous != kNoKey)
        changes.add({previous, false});
    if (code != kNoKey)
        changes.add({code, true});
}

} // namespace ZorvaTouch::Tools
