#pragma once

#include "Host/Linux/InputWriter.h"
#include "Host/Linux/KeyOutput.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

namespace ZorvaTouch::Linux {

/// Where keyboards are made.
inline constexpr const char *kUinputPath = "/dev/uinput";

/// What the system and its rules know the keyboard by; they stay the same.
inline constexpr const char *kKeyboardName = "ZorvaTouch Keyboard";
inline constexpr std::uint16_t kKeyboardVendor = 0x1234;
inline constexpr std::uint16_t kKeyboardProduct = 0xABCE;
inline constexpr std::uint16_t kKeyboardVersion = 1;

/// There is no keyboard to be had. The text is one line that says why and what to do about it.
class KeyboardFailure : public std::runtime_error {
public:
    KeyboardFailure(const SystemFailure &failed, const std::string &path);
    const SystemFailure failure;
};

/// Why no keyboard can be made there, if that can be told without making one: the text of a KeyboardFailure.
/// @throws std::bad_alloc
[[nodiscard]] std::optional<std::string> findKeyboardProblem(const std::string &path = kUinputPath);

/// A keyboard that the system takes for a real one. Keys that are held repeat, as fast as the system's
/// keyboards do. In the end it releases what is still down: the kernel would not tell.
///
/// Threads: one at a time.
class VirtualKeyboard final : public KeyOutput {
public:
    /// Plugs one in that has these keys. Programs find it a moment later.
    /// @throws KeyboardFailure, std::bad_alloc
    [[nodiscard]] static std::unique_ptr<VirtualKeyboard> create(const std::vector<std::uint16_t> &codes,
                                                                 const std::string &path = kUinputPath);

    /// @param codes  What it may press; the rest is refused with EINVAL.
    VirtualKeyboard(const std::vector<std::uint16_t> &codes, std::unique_ptr<InputWriter> writer);
    ~VirtualKeyboard() override;
    VirtualKeyboard(const VirtualKeyboard &) = delete;
    VirtualKeyboard &operator=(const VirtualKeyboard &) = delete;

    [[nodiscard]] std::optional<SystemFailure> press(std::uint16_t code) noexcept override;
    [[nodiscard]] std::optional<SystemFailure> release(std::uint16_t code) noexcept override;

private:
    struct Key {
        std::uint16_t code;
        bool isDown = false;
    };

    [[nodiscard]] Key *find(std::uint16_t code) noexcept;
    [[nodiscard]] std::optional<SystemFailure> set(Key &key, bool isDown, const char *operation) noexcept;

    std::vector<Key> _keys;
    const std::unique_ptr<InputWriter> _writer;
};

} // namespace ZorvaTouch::Linux
