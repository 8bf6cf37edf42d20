#include "Tests/Unit/Host/Linux/SensorFolder.h"

#include <stdlib.h>

#include <cerrno>
#include <fstream>
#include <iterator>
#include <system_error>

namespace ZorvaTouch::Linux::Tests {
namespace fs = std::filesystem;

SensorFolder::SensorFolder(int number) {
    std::string pattern = (fs::temp_directory_path() / "zorvatouch-sensor-XXXXXX").string();
    if (!::mkdtemp(pattern.data()))
        throw std::system_error(errno, std::generic_category(), "mkdtemp");
    _root = pattern;
    _device = _root / ("iio:device" + std::to_string(number));
    set("name", "accel_3d");
    set("in_accel_scale", "0.009806650");
    set("in_accel_offset", "0");
    set("in_accel_sampling_frequency", "0.000000");
    set("current_timestamp_clock", "realtime");
    set("trigger/current_trigger", "accel_3d-dev0");
    set("buffer/enable", "0");
    set("buffer/length", "2");
    set("buffer/watermark", "2");
    addElement("in_temp", 0, "le:s16/16>>0");
    addElement("in_accel_x", 1, "le:s32/32>>0");
    addElement("in_accel_y", 2, "le:s32/32>>0");
    addElement("in_accel_z", 3, "le:s32/32>>0");
    addElement("in_timestamp", 4, "le:s64/64>>0");
    fs::create_directories(_device / "subsystem/devices");
}

SensorFolder::~SensorFolder() { fs::remove_all(_root); }

void SensorFolder::addElement(const std::string &name, int index, std::string_view type) const {
    set("scan_elements/" + name + "_en", "0");
    set("scan_elements/" + name + "_index", std::to_string(index));
    set("scan_elements/" + name + "_type", type);
}

void SensorFolder::set(const std::string &attribute, std::string_view text) const {
    fs::create_directories((_device / attribute).parent_path());
    std::ofstream file(_device / attribute, std::ios::binary);
    file.exceptions(std::ios::failbit | std::ios::badbit);
    file << text << '\n';
}

std::string SensorFolder::get(const std::string &attribute) const {
    std::ifstream file(_device / attribute, std::ios::binary);
    std::string text{std::istreambuf_iterator<char>(file), std::istreambuf_iterator<char>()};
    if (text.ends_with('\n'))
        text.pop_back();
    return text;
}

void SensorFolder::replace(const std::string &attribute, const fs::path &file) const {
    remove(attribute);
    fs::create_symlink(file, _device / attribute);
}

void SensorFolder::addTrigger(int number, std::string_view name) const {
    set("subsystem/devices/trigger" + std::to_string(number) + "/name", name);
}

} // namespace ZorvaTouch::Linux::Tests
