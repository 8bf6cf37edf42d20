#pragma once

#include "Shared/Pixel.h"

#include <array>
#include <cstdint>
#include <optional>
#include <span>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

/// The keys of the daemon's keyboard, and which gesture presses which. `Docs/Keys.md` tells all of it.
namespace ZorvaTouch::Tools {

/// The kernel's number of a key, below `kKeyCodeCount`.
using KeyCode = std::uint16_t;
inline constexpr KeyCode kNoKey = 0;
inline constexpr std::size_t kKeyCodeCount = 768;

// The keys that are pressed unless somebody wants others.
inline constexpr KeyCode kKeyVolumeDown = 114;
inline constexpr KeyCode kKeyVolumeUp = 115;
inline constexpr KeyCode kKeyPlayPause = 164;
inline constexpr KeyCode kKeyVoiceCommand = 582;

/// A key that goes down or up. The kernel needs each in a report of its own: down and up in one are no press.
struct KeyChange {
    KeyCode code = kNoKey;
    bool isPressed = false;

    friend bool operator==(const KeyChange &, const KeyChange &) = default;
};

struct NamedKey {
    std::string_view name; ///< the kernel's, "KEY_PLAYPAUSE"
    KeyCode code;
};
/// The keys that a gesture may press, in the order of their codes.
[[nodiscard]] std::span<const NamedKey> namedKeys() noexcept;
/// "KEY_PLAYPAUSE", "none" for `kNoKey`; empty for any other key.
[[nodiscard]] std::string_view nameOfKey(KeyCode code) noexcept;
/// The key of that name, case and all, `kNoKey` for "none"; nothing if there is none.
[[nodiscard]] std::optional<KeyCode> keyNamed(std::string_view name) noexcept;

/// A text that changes no map. `what()` is one line that says why, and what would do.
class KeyMapError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Which key a tap presses and which one a hold keeps down, by region. A plain value.
class KeyMap {
public:
    /// Taps play or pause, louder, quieter; holds the assistant's key, louder, quieter.
    KeyMap() = default;

    /// Changes one key: GESTURE:REGION=KEY, as "hold:play-pause=KEY_MICMUTE" or "tap:volume-up=none".
    /// @throws KeyMapError  It is no such text. The map stays as it was.
    void assign(std::string_view text);

    /// `kNoKey` where nothing is to be pressed, as for a gesture in no region.
    [[nodiscard]] KeyCode tapKey(PixelRegion region) const noexcept;
    [[nodiscard]] KeyCode holdKey(PixelRegion region) const noexcept;

    /// Every key of the map once, in ascending order: what a keyboard must declare.
    [[nodiscard]] std::vector<KeyCode> codes() const;

    /// The whole map as six texts for `assign`.
    [[nodiscard]] std::vector<std::string> texts() const;

    friend bool operator==(const KeyMap &, const KeyMap &) = default;

private:
    /// In the order of the region codes.
    using RegionKeys = std::array<KeyCode, kPixelRegionCount>;
    enum Trigger : std::size_t { kTap, kHold, kTriggerCount };
    static constexpr std::array<std::string_view, kTriggerCount> kTriggerNames{"tap", "hold"};

    [[nodiscard]] KeyCode keyOf(Trigger trigger, PixelRegion region) const noexcept;

    std::array<RegionKeys, kTriggerCount> _keys{{{kNoKey, kKeyPlayPause, kKeyVolumeDown, kKeyVolumeUp},
                                                 {kNoKey, kKeyVoiceCommand, kKeyVolumeDown, kKeyVolumeUp}}};
};

} // namespace ZorvaTouch::Tools
