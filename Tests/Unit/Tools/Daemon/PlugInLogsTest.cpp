#include "Tools/Daemon/PlugInLogs.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using Ports::LogLevel;

/// Notes what is written from a level on.
class NotedLogs final : public Ports::LogProvider {
public:
    explicit NotedLogs(LogLevel minimum) : _minimum(minimum) {}

    std::shared_ptr<Ports::Log> openLog(std::string_view, std::string_view category) override {
        return std::make_shared<Handle>(*this, std::string(category));
    }

    std::vector<std::string> texts;

private:
    class Handle final : public Ports::Log {
    public:
        Handle(NotedLogs &logs, std::string category) : _logs(logs), _category(std::move(category)) {}
        bool isEnabled(LogLevel level) const noexcept override { return level >= _logs._minimum; }
        void write(LogLevel level, std::string_view text) noexcept override {
            _logs.texts.push_back(_category + (level == LogLevel::Debug ? " debug: " : ": ") +
                                  std::string(text));
        }

    private:
        NotedLogs &_logs;
        const std::string _category;
    };

    const LogLevel _minimum;
};

std::vector<std::string> textsAt(LogLevel minimum) {
    const auto noted = std::make_shared<NotedLogs>(minimum);
    const auto log = PlugInLogs(noted).openLog("subsystem", "HIDService");
    log->write(LogLevel::Debug, "a report");
    log->write(LogLevel::Default, "a gesture");
    log->write(LogLevel::Error, "a failure");
    return noted->texts;
}

TEST(PlugInLogs, TellGesturesOnlyToThoseWhoDebug) {
    EXPECT_EQ(textsAt(LogLevel::Error), (std::vector<std::string>{"HIDService: a failure"}));
    EXPECT_EQ(textsAt(LogLevel::Default), (std::vector<std::string>{"HIDService: a failure"}));
    EXPECT_EQ(textsAt(LogLevel::Debug),
              (std::vector<std::string>{"HIDService debug: a report", "HIDService debug: a gesture",
                                        "HIDService: a failure"}));
}

} // namespace
} // namespace ZorvaTouch::Tools
