#pragma once

#include <string>

namespace ZorvaTouch::Linux {

/// An accelerometer and its IIO node, as the system describes them.
struct AccelIdentity {
    std::string devnode;  ///< "/dev/iio:device0"
    std::string syspath;  ///< the folder of its attributes; as long as it is there no other has the same
    std::string name;     ///< "accel_3d"; may be empty
    std::string label;    ///< which of several it is: "accel-base"; may be empty
    std::string location; ///< where it is built in: "display"; may be empty

    friend bool operator==(const AccelIdentity &, const AccelIdentity &) = default;
};

/// For people: "accel_3d at /dev/iio:device0".
/// @throws std::bad_alloc
[[nodiscard]] inline std::string describe(const AccelIdentity &accelerometer) {
    return (accelerometer.name.empty() ? "accelerometer" : accelerometer.name) + " at " +
           accelerometer.devnode;
}

/// Hears of accelerometers that come and go, each once.
class AccelListener {
public:
    virtual ~AccelListener() = default;
    /// It is there and may be opened.
    virtual void onAdded(const AccelIdentity &accelerometer) = 0;
    /// It is no longer there; only for one that was added.
    virtual void onRemoved(const AccelIdentity &accelerometer) = 0;
};

} // namespace ZorvaTouch::Linux
