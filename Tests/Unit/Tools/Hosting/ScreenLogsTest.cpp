#include "Tools/Hosting/ScreenLogs.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using Texts = std::vector<std::string>;

class KeptLog final : public Ports::Log {
public:
    explicit KeptLog(Texts &texts) : _texts(texts) {}

    bool isEnabled(Ports::LogLevel level) const noexcept override {
        return level >= Ports::LogLevel::Default;
    }
    void write(Ports::LogLevel, std::string_view text) noexcept override { _texts.emplace_back(text); }

private:
    Texts &_texts;
};

class KeptLogs final : public Ports::LogProvider {
public:
    explicit KeptLogs(Texts &texts) : _texts(texts) {}

    std::shared_ptr<Ports::Log> openLog(std::string_view, std::string_view) override {
        return std::make_shared<KeptLog>(_texts);
    }

private:
    Texts &_texts;
};

TEST(ScreenLogs, LeaveOutWhatIsOptional) {
    Texts texts;
    ScreenLogs logs(std::make_unique<KeptLogs>(texts));
    const auto log = logs.openLog("s", "c");
    for (const char *const text : {"pthread_setschedparam failed: 1",
                                   "Failed to create accel system: copyServices returned empty array",
                                   "Failed to start the input report thread: no thread"})
        log->write(Ports::LogLevel::Error, text);
    EXPECT_THAT(texts, testing::ElementsAre("Failed to start the input report thread: no thread"));
    EXPECT_FALSE(log->isEnabled(Ports::LogLevel::Debug));
    EXPECT_TRUE(log->isEnabled(Ports::LogLevel::Error));
}

} // namespace
} // namespace ZorvaTouch::Tools
