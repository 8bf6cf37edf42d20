#pragma once

#include <filesystem>
#include <string>
#include <string_view>

namespace ZorvaTouch::Linux::Tests {

/// The attributes of an accelerometer as files in a folder of their own, which goes with this: "accel_3d",
/// 1/1000 g, everything off, with a temperature beside it.
class SensorFolder {
public:
    /// @param number  Of "iio:device0".
    explicit SensorFolder(int number = 0);
    ~SensorFolder();
    SensorFolder(const SensorFolder &) = delete;
    SensorFolder &operator=(const SensorFolder &) = delete;

    [[nodiscard]] std::string path() const { return _device.string(); }
    /// As the kernel writes it, with the end of the line.
    void set(const std::string &attribute, std::string_view text) const;
    void remove(const std::string &attribute) const { std::filesystem::remove_all(_device / attribute); }
    /// Without the end of the line.
    [[nodiscard]] std::string get(const std::string &attribute) const;
    /// Puts another file in its place.
    void replace(const std::string &attribute, const std::filesystem::path &file) const;
    /// Whoever writes to it hears that there is no space, whoever reads gets no end.
    void refuseWrites(const std::string &attribute) const { replace(attribute, "/dev/full"); }
    /// Adds a trigger that the device may find.
    void addTrigger(int number, std::string_view name) const;

private:
    void addElement(const std::string &name, int index, std::string_view type) const;

    std::filesystem::path _root, _device;
};

} // namespace ZorvaTouch::Linux::Tests
