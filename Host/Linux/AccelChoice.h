#pragma once

#include "Host/Linux/AccelIdentity.h"

#include <string>
#include <utility>

namespace ZorvaTouch::Linux {

/// Which accelerometer is to be used.
///
/// Threads: any, as a value.
class AccelChoice {
public:
    [[nodiscard]] static AccelChoice none() { return AccelChoice(Kind::None, {}); }
    /// The first there is, in the order of the syspaths; it stays until it goes.
    [[nodiscard]] static AccelChoice any() { return AccelChoice(Kind::Any, {}); }
    /// @param text  A name ("accel_3d"), a label, a node ("/dev/iio:device0") or the end of one
    ///              ("iio:device0"). Several may fit; then as `any` among them.
    [[nodiscard]] static AccelChoice named(std::string text) {
        return AccelChoice(Kind::Named, std::move(text));
    }

    [[nodiscard]] bool fits(const AccelIdentity &accelerometer) const noexcept;

private:
    enum class Kind { None, Any, Named };
    AccelChoice(Kind kind, std::string text) : _kind(kind), _text(std::move(text)) {}

    Kind _kind;
    std::string _text;
};

} // namespace ZorvaTouch::Linux
