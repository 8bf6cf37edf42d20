#include "Host/Linux/VirtualKeyboard.h"

#include "Host/Linux/UinputDevice.h"

#include <fcntl.h>
#include <linux/input.h>

#include <algorithm>
#include <cerrno>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

const char *adviceFor(int errorNumber) noexcept {
    switch (errorNumber) {
    case ENOENT:
    case ENODEV:
    case ENXIO:
        return "load the kernel's module for it: modprobe uinput";
    case EACCES:
    case EPERM:
        // Its own group: each member can type into every program.
        return "give the group of the daemon's user write access by a udev rule: "
               "KERNEL==\"uinput\", GROUP=\"zorvatouch\", MODE=\"0660\"";
    default:
        return "it is not the kernel's uinput, or that refuses keyboards";
    }
}

std::string textOf(const SystemFailure &failure, const std::string &path) {
    const std::string operation = std::string(failure.operation) + ' ' + path;
    return describe({operation.c_str(), failure.errorNumber}) + "; " + adviceFor(failure.errorNumber);
}

} // namespace

KeyboardFailure::KeyboardFailure(const SystemFailure &failed, const std::string &path)
    : std::runtime_error(textOf(failed, path)), failure(failed) {}

std::optional<std::string> findKeyboardProblem(const std::string &path) {
    const UniqueFd uinput(::open(path.c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC));
    return uinput ? std::nullopt : std::optional(textOf({"open", errno}, path));
}

std::unique_ptr<VirtualKeyboard> VirtualKeyboard::create(const std::vector<std::uint16_t> &codes,
                                                         const std::string &path) {
    auto device = std::make_unique<UinputDevice>();
    if (const auto failure = device->plug(codes, path))
        throw KeyboardFailure(*failure, path);
    return std::make_unique<VirtualKeyboard>(codes, std::move(device));
}

VirtualKeyboard::VirtualKeyboard(const std::vector<std::uint16_t> &codes, std::unique_ptr<InputWriter> writer)
    : _writer(std::move(writer)) {
    for (const std::uint16_t code : codes)
        _keys.push_back({.code = code});
}

VirtualKeyboard::~VirtualKeyboard() {
    for (Key &key : _keys)
        static_cast<void>(set(key, false, "release")); // there is nobody left to tell
}

std::optional<SystemFailure> VirtualKeyboard::press(std::uint16_t code) noexcept {
    Key *const key = find(code);
    return key ? set(*key, true, "press") : SystemFailure{"press", EINVAL};
}

std::optional<SystemFailure> VirtualKeyboard::release(std::uint16_t code) noexcept {
    Key *const key = find(code);
    return key ? set(*key, false, "release") : SystemFailure{"release", EINVAL};
}

VirtualKeyboard::Key *VirtualKeyboard::find(std::uint16_t code) noexcept {
    const auto key = std::ranges::find(_keys, code, &Key::code);
    return key == _keys.end() ? nullptr : &*key;
}

std::optional<SystemFailure> VirtualKeyboard::set(Key &key, bool isDown, const char *operation) noexcept {
    if (key.isDown == isDown)
        return std::nullopt;
    int errorNumber = _writer->write(EV_KEY, key.code, isDown ? 1 : 0);
    if (errorNumber == 0) {
        key.isDown = isDown;
        errorNumber = _writer->write(EV_SYN, SYN_REPORT, 0);
    }
    if (errorNumber != 0)
        return SystemFailure{operation, errorNumber};
    return std::nullopt;
}

} // namespace ZorvaTouch::Linux
