#include "Tests/Unit/Tools/Cli/CliFixture.h"
#include "Tools/Cli/DeferredLogs.h"
#include "Tools/Cli/EventInbox.h"
#include "Tools/Cli/HostAction.h"
#include "Tools/Cli/LiveJson.h"
#include "Tools/Cli/LiveTable.h"
#include "Tools/Cli/LiveWatch.h"
#include "Tools/Cli/PropertyText.h"

#include <gmock/gmock.h>

#include <thread>

// Small parts of the commands that run the service.

namespace ZorvaTouch::Tools {
namespace {

using ::testing::ElementsAre;
using ::testing::HasSubstr;
using ::testing::StartsWith;

using CommandHelp = CliFixture;

TEST_F(CommandHelp, NamesTheCommandsThatRunTheService) {
    for (const std::string command : {"host", "demo"}) {
        EXPECT_THAT(outputOf({"--help"}), HasSubstr("\n  " + command + " "));
        const std::string help = outputOf({command, "--help"});
        EXPECT_THAT(help, HasSubstr("Usage: zorvatouch " + command + " [OPTIONS]"));
        EXPECT_THAT(help, HasSubstr("\nExamples:\n  zorvatouch " + command));
    }
}

TEST(HostAction, TapsActOnce) {
    EXPECT_EQ(actionFor(Gesture::Tap, kPixelRegionPlayPause), HostAction::PlayPause);
    EXPECT_EQ(actionFor(Gesture::Tap, kPixelRegionVolumeDown), HostAction::VolumeDown);
    EXPECT_EQ(actionFor(Gesture::Tap, kPixelRegionVolumeUp), HostAction::VolumeUp);
}

TEST(HostAction, HoldsActUntilTheyEnd) {
    for (const Gesture gesture : {Gesture::HoldStart, Gesture::HoldChange}) {
        EXPECT_EQ(actionFor(gesture, kPixelRegionPlayPause), HostAction::Assistant);
        EXPECT_EQ(actionFor(gesture, kPixelRegionVolumeDown), HostAction::RepeatVolumeDown);
        EXPECT_EQ(actionFor(gesture, kPixelRegionVolumeUp), HostAction::RepeatVolumeUp);
    }
    EXPECT_EQ(actionFor(Gesture::HoldEnd, kPixelRegionVolumeUp), HostAction::Stop);
}

TEST(HostAction, NothingElseActs) {
    for (const Gesture gesture : {Gesture::MayBegin, Gesture::Cancel, Gesture::Reset})
        EXPECT_EQ(actionFor(gesture, kPixelRegionPlayPause), HostAction::None);
    EXPECT_EQ(actionFor(Gesture::Tap, kPixelRegionNone), HostAction::None);
}

std::string readable(const PropertyValue &value) {
    std::string text;
    appendReadable(text, value);
    return text;
}

TEST(PropertyText, StringsStandAsTheyAre) { EXPECT_EQ(readable("a \"b\"\n"), "a \"b\"\n"); }

TEST(PropertyText, PlainValuesAndListsOfThemAreJson) {
    EXPECT_EQ(readable({}), "null");
    EXPECT_EQ(readable(true), "true");
    EXPECT_EQ(readable(200.0), "200.0");
    EXPECT_EQ(readable(PropertyValue::Array{1u, "a"}), "[1,\"a\"]");
    EXPECT_EQ(readable(PropertyValue::Dictionary()), "{}");
}

TEST(PropertyText, NestedValuesAreIndented) {
    EXPECT_EQ(
        readable(PropertyValue::Dictionary{
            {"a", PropertyValue::Dictionary{{"b", 1u}}},
            {"c", PropertyValue::Array{PropertyValue::Dictionary{{"d", "e"}}, PropertyValue::Array{}}}}),
        "{\n"
        "  \"a\": {\n"
        "    \"b\": 1\n"
        "  },\n"
        "  \"c\": [\n"
        "    {\n"
        "      \"d\": \"e\"\n"
        "    },\n"
        "    []\n"
        "  ]\n"
        "}");
}

TEST(DeferredLogs, KeepRecordsUntilTheyAreWritten) {
    auto capturing = std::make_unique<Scripted::CapturingLogProvider>();
    capturing->enable(Ports::LogLevel::Error);
    const auto switches = capturing->switches;
    DeferredLogs logs(std::move(capturing));
    const auto log = logs.openLog("org.zorva", "Host");
    EXPECT_THAT(switches->opened, ElementsAre("org.zorva/Host"));
    EXPECT_TRUE(log->isEnabled(Ports::LogLevel::Error));
    EXPECT_FALSE(log->isEnabled(Ports::LogLevel::Debug));
    EXPECT_FALSE(logs.hasRecords());
    std::thread([&] { log->write(Ports::LogLevel::Error, "one"); }).join();
    log->write(Ports::LogLevel::Error, "two");
    EXPECT_TRUE(logs.hasRecords());
    EXPECT_TRUE(switches->records.empty());
    logs.write();
    EXPECT_FALSE(logs.hasRecords());
    ASSERT_EQ(switches->records.size(), 2u);
    EXPECT_EQ(switches->records[0].text, "one");
    EXPECT_EQ(switches->records[1].text, "two");
}

TEST(DeferredLogs, WriteWhatIsLeftInTheEnd) {
    auto capturing = std::make_unique<Scripted::CapturingLogProvider>();
    const auto switches = capturing->switches;
    auto logs = std::make_unique<DeferredLogs>(std::move(capturing));
    const auto log = logs->openLog("org.zorva", "Host");
    log->write(Ports::LogLevel::Error, "left");
    logs.reset();
    EXPECT_EQ(switches->records.size(), 1u);
    log->write(Ports::LogLevel::Error, "too late"); // harmless
}

TEST(EventInbox, EndsAWaitForWhateverComesFirst) {
    EventInbox inbox;
    std::thread other([&] { inbox.finish(); });
    while (inbox.waitFor(std::chrono::hours(1))) { // an event would be another reason to return
    }
    other.join();
    EXPECT_FALSE(inbox.isStopped());
    inbox.stop();
    EXPECT_TRUE(inbox.isStopped());
    EXPECT_FALSE(inbox.waitFor(std::chrono::hours(1)));
}

TEST(EventInbox, LeavesOutEventsThatItCannotRead) {
    EventInbox inbox;
    EventInbox::receive(&inbox, nullptr, nullptr, nullptr, 0);
    EXPECT_TRUE(inbox.takeEvents().empty());
}

/// Writes down what it is told.
class CapturingPrinter final : public LivePrinter {
public:
    void print(const LiveGesture &gesture) override { gestures.push_back(gesture); }
    void printSilence(std::uint64_t, const std::string &, bool) override {}
    void refresh(std::uint64_t, const std::optional<InputReport::Image> &) override { ++refreshes; }
    void clear() override { ++clears; }

    std::vector<LiveGesture> gestures;
    int refreshes = 0, clears = 0;
};

std::shared_ptr<HostEvent> digitizerEvent(std::uint32_t mask, std::uint16_t phase, double region) {
    auto event = HostEvent::createDigitizer(0, {.eventMask = mask, .y = region}, 0);
    event->setPhase(phase);
    return event;
}

TEST(LiveWatch, MeasuresTouchesFromTheirMayBegin) {
    CapturingPrinter printer;
    LiveWatch watch(&printer, nullptr);
    watch.heard(*digitizerEvent(0, kEventPhaseMayBegin, 1), 1'000'000'000);
    watch.heard(*digitizerEvent(kEventMaskTap, kEventPhaseNone, 1), 1'120'500'000);
    watch.heard(
        *HostEvent::createVendorDefined(0, {.usagePage = 0xFF60, .usage = 2, .version = 1, .payload = {}}, 0),
        1'200'000'000);
    ASSERT_EQ(printer.gestures.size(), 2u);
    EXPECT_EQ(printer.gestures[0].durationMs, 121u); // 120.5, rounded
    EXPECT_EQ(printer.gestures[0].action, HostAction::PlayPause);
    EXPECT_EQ(printer.gestures[1].gesture, Gesture::Reset);
    EXPECT_EQ(printer.gestures[1].durationMs, std::nullopt);
    EXPECT_EQ(watch.counts().of(Gesture::MayBegin), 1u);
    EXPECT_EQ(watch.history().entries().size(), 3u);
}

TEST(LiveWatch, EventsThatAreNoGesturesAreNotShown) {
    CapturingPrinter printer;
    LiveWatch watch(&printer, nullptr);
    watch.heard(*HostEvent::createAccelerometer(0, {1, 2, 3}, 0), 0);
    watch.heard(*digitizerEvent(0x40, kEventPhaseBegan, 1), 0); // an unknown mask
    EXPECT_TRUE(printer.gestures.empty());
    EXPECT_TRUE(watch.counts().empty());
    watch.makeRoomForLog();
    EXPECT_EQ(printer.clears, 1);
}

/// A table on a screen of 40 columns, and what it has written.
using LiveTableOnAScreen = CliFixture;

TEST_F(LiveTableOnAScreen, WipesTheElectrodesOffBeforeARowAndInTheEnd) {
    Environment environment{.openInput = nullptr,
                            .output = {outputSink, "standard output"},
                            .errorOutput = {errorSink, "standard error"},
                            .clock = clock,
                            .openLogs = nullptr};
    environment.screenColumns = [] { return std::size_t{40}; };
    {
        LiveTable table(environment, false);
        table.refresh(0, std::nullopt); // no image yet
        EXPECT_EQ(outputSink.text, "");
        table.refresh(0, InputReport::Image{});
        EXPECT_EQ(outputSink.text, "A B C D E F G H I J K L M N O ");
        table.print({.gesture = Gesture::Tap,
                     .region = kPixelRegionVolumeUp,
                     .timeNs = 1'000'000,
                     .durationMs = 1,
                     .action = HostAction::VolumeUp,
                     .finger = ""});
        table.refresh(0, InputReport::Image{});
        EXPECT_EQ(outputSink.text, "A B C D E F G H I J K L M N O "
                                   "\r\x1b[K   time s  gesture         region\n"
                                   "    0.001  tap             volume up\n"
                                   "A B C D E F G H I J K L M N O ");
        outputSink.text.clear();
    }
    EXPECT_EQ(outputSink.text, "\r\x1b[K");
}

} // namespace
} // namespace ZorvaTouch::Tools
