#include "Tools/Daemon/KeyMap.h"

#include "Shared/Util/Text.h"
#include "Tools/Cli/Suggestion.h"
#include "Tools/Stimulus/LineWords.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

/// Media keys and those to which desktops let people bind what they like. In the order of their codes.
constexpr NamedKey kNamedKeys[] = {
    {"KEY_MUTE", 113},
    {"KEY_VOLUMEDOWN", 114},
    {"KEY_VOLUMEUP", 115},
    {"KEY_PROG1", 148},
    {"KEY_PROG2", 149},
    {"KEY_COFFEE", 152},
    {"KEY_BACK", 158},
    {"KEY_FORWARD", 159},
    {"KEY_NEXTSONG", 163},
    {"KEY_PLAYPAUSE", 164},
    {"KEY_PREVIOUSSONG", 165},
    {"KEY_STOPCD", 166},
    {"KEY_RECORD", 167},
    {"KEY_REWIND", 168},
    {"KEY_PHONE", 169},
    {"KEY_F13", 183},
    {"KEY_F14", 184},
    {"KEY_F15", 185},
    {"KEY_F16", 186},
    {"KEY_F17", 187},
    {"KEY_F18", 188},
    {"KEY_F19", 189},
    {"KEY_F20", 190},
    {"KEY_F21", 191},
    {"KEY_F22", 192},
    {"KEY_F23", 193},
    {"KEY_F24", 194},
    {"KEY_PLAYCD", 200},
    {"KEY_PAUSECD", 201},
    {"KEY_PROG3", 202},
    {"KEY_PROG4", 203},
    {"KEY_PLAY", 207},
    {"KEY_FASTFORWARD", 208},
    {"KEY_CAMERA", 212},
    {"KEY_BRIGHTNESSDOWN", 224},
    {"KEY_BRIGHTNESSUP", 225},
    {"KEY_MICMUTE", 248},
    {"KEY_CHANNELUP", 402},
    {"KEY_CHANNELDOWN", 403},
    {"KEY_SHUFFLE", 410},
    {"KEY_MEDIA_REPEAT", 439},
    {"KEY_PICKUP_PHONE", 445},
    {"KEY_HANGUP_PHONE", 446},
    {"KEY_VOICECOMMAND", 582},
    {"KEY_ASSISTANT", 583},
    {"KEY_DICTATE", 586},
};

constexpr std::string_view kNoKeyName = "none";

/// In the order of the region codes; the first is no region to map. Without a stroke, for the command line.
constexpr std::array<std::string_view, kPixelRegionCount> kMapRegionNames{"", "play-pause", "volume-down",
                                                                          "volume-up"};

/// A user's word for a message of one line.
std::string shown(std::string_view word) { return Util::printable(quoted(word)); }

template <typename Names> std::string listOf(const Names &names) {
    std::string list;
    for (const std::string_view name : names)
        list.append(list.empty() ? "" : ", ").append(name);
    return list;
}

/// Where a name is, from `first` on.
/// @throws KeyMapError  "'swipe' is not a gesture; gestures are tap, hold"
template <std::size_t N>
std::size_t indexNamed(const std::array<std::string_view, N> &names, std::size_t first, std::string_view name,
                       const char *what) {
    const std::span known = std::span(names).subspan(first);
    const auto found = std::find(known.begin(), known.end(), name);
    if (found == known.end())
        throw KeyMapError(shown(name) + " is not a " + what +
                          suggestion(name, known, std::string("; ") + what + "s are " + listOf(known)));
    return first + static_cast<std::size_t>(found - known.begin());
}

KeyCode requireKey(std::string_view name) {
    if (const auto code = keyNamed(name))
        return *code;
    std::vector<std::string_view> names{kNoKeyName};
    for (const NamedKey &key : kNamedKeys)
        names.push_back(key.name);
    throw KeyMapError(shown(name) + " is not a key that can be pressed" +
                      suggestion(name, names, "; Docs/Keys.md lists the keys"));
}

} // namespace

std::span<const NamedKey> namedKeys() noexcept { return kNamedKeys; }

std::string_view nameOfKey(KeyCode code) noexcept {
    if (code == kNoKey)
        return kNoKeyName;
    for (const NamedKey &key : kNamedKeys)
        if (key.code == code)
            return key.name;
    return {};
}

std::optional<KeyCode> keyNamed(std::string_view name) noexcept {
    if (name == kNoKeyName)
        return kNoKey;
    for (const NamedKey &key : kNamedKeys)
        if (key.name == name)
            return key.code;
    return std::nullopt;
}

void KeyMap::assign(std::string_view text) {
    const std::size_t sign = text.find('=');
    const std::size_t colon = text.find(':');
    if (sign == std::string_view::npos || colon > sign)
        throw KeyMapError(shown(text) +
                          " is not GESTURE:REGION=KEY, which is written as tap:volume-up=KEY_NEXTSONG");
    const std::size_t trigger = indexNamed(kTriggerNames, 0, text.substr(0, colon), "gesture");
    const std::size_t region =
        indexNamed(kMapRegionNames, 1, text.substr(colon + 1, sign - colon - 1), "region");
    _keys[trigger][region] = requireKey(text.substr(sign + 1));
}

KeyCode KeyMap::tapKey(PixelRegion region) const noexcept { return keyOf(kTap, region); }

KeyCode KeyMap::holdKey(PixelRegion region) const noexcept { return keyOf(kHold, region); }

KeyCode KeyMap::keyOf(Trigger trigger, PixelRegion region) const noexcept {
    return region < kPixelRegionCount ? _keys[trigger][region] : kNoKey;
}

std::vector<KeyCode> KeyMap::codes() const {
    std::vector<KeyCode> codes;
    for (const RegionKeys &keys : _keys)
        std::copy_if(keys.begin(), keys.end(), std::back_inserter(codes),
                     [](KeyCode code) { return code != kNoKey; });
    std::sort(codes.begin(), codes.end());
    codes.erase(std::unique(codes.begin(), codes.end()), codes.end());
    return codes;
}

std::vector<std::string> KeyMap::texts() const {
    std::vector<std::string> texts;
    for (std::size_t trigger = 0; trigger < kTriggerCount; ++trigger)
        for (std::size_t region = 1; region < kPixelRegionCount; ++region) {
            std::string text(kTriggerNames[trigger]);
            text.append(":").append(kMapRegionNames[region]);
            text.append("=").append(nameOfKey(_keys[trigger][region]));
            texts.push_back(std::move(text));
        }
    return texts;
}

} // namespace ZorvaTouch::Tools
