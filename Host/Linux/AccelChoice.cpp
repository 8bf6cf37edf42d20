#include "Host/Linux/AccelChoice.h"

#include <string_view>

namespace ZorvaTouch::Linux {
namespace {

std::string_view lastPart(std::string_view path) noexcept { return path.substr(path.rfind('/') + 1); }

} // namespace

bool AccelChoice::fits(const AccelIdentity &accelerometer) const noexcept {
    if (_kind != Kind::Named)
        return _kind == Kind::Any;
    return !_text.empty() && (_text == accelerometer.name || _text == accelerometer.label ||
                              _text == accelerometer.devnode || _text == lastPart(accelerometer.devnode));
}

} // namespace ZorvaTouch::Linux
