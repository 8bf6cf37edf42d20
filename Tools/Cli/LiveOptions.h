#pragma once

#include "Shared/Ports/Log.h"
#include "Shared/Util/PropertyValue.h"
#include "Tools/Cli/LiveSource.h"

#include <cstdint>
#include <limits>
#include <optional>
#include <string>
#include <variant>
#include <vector>

namespace CLI {
class App;
}

namespace ZorvaTouch::Tools {

/// A key and what is written to it.
struct Setting {
    std::string key;
    PropertyValue value;
};

struct HostOptions {
    std::optional<std::string> plugIn; ///< the file; the one beside the program unless given
    /// What is played: a finger, or a recording's file; nothing: the service is asked and told, no more.
    std::variant<std::monostate, SimulatedFinger, std::string> device;
    float speed = std::numeric_limits<float>::infinity(); ///< infinity: in virtual time, without pauses
    std::vector<Setting> settings;                        ///< before playing
    std::vector<std::string> gets;                        ///< properties, after playing
    std::optional<std::string> saveFile;
    bool json = false;
    Ports::LogLevel logLevel = Ports::LogLevel::Error;
};

struct DemoOptions {
    std::optional<std::string> plugIn;
    SimulatedFinger finger;
    float speed = 1;
    bool quiet = false;
    bool json = false;
    std::optional<std::string> saveFile;
};

/// The options of `host` as they are typed.
class HostArguments {
public:
    /// @param command  Keeps pointing here.
    void declare(CLI::App &command);
    /// @throws CliError
    [[nodiscard]] HostOptions read() const;

private:
    void readDevice(HostOptions &options) const;
    [[nodiscard]] SimulatedFinger readFinger(const std::string &scenario) const;

    std::optional<std::string> _plugIn, _device, _seed, _duration, _speed, _save, _logLevel;
    std::vector<std::string> _settings, _gets;
    bool _json = false;
};

/// The options of `demo` as they are typed.
class DemoArguments {
public:
    void declare(CLI::App &command);
    /// @throws CliError
    [[nodiscard]] DemoOptions read() const;

private:
    std::optional<std::string> _plugIn, _scenario, _seed, _duration, _speed, _save;
    bool _forever = false, _quiet = false, _json = false;
};

} // namespace ZorvaTouch::Tools
