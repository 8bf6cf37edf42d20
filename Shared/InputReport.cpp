#include "Shared/InputReport.h"

#include "Shared/Util/Bytes.h"

#include <algorithm>

namespace ZorvaTouch {
namespace {

// Offsets into the report, report ID at 0.
constexpr std::size_t kFrameNumberAt = 1;
constexpr std::size_t kTimeMsAt = 5;
constexpr std::size_t kFlagsAt = 9;
constexpr std::size_t kRawCountsAt = 13;
constexpr std::size_t kSignalsAt = 43;
static_assert(kSignalsAt + 2 * kElectrodeCount == InputReport::Image::kReportLength);

template <typename Report> bool fits(const std::uint8_t *data, std::size_t length) noexcept {
    return length >= Report::kReportLength && data[0] == Report::kReportId;
}

} // namespace

std::optional<InputReport::Image> InputReport::Image::parse(const std::uint8_t *data,
                                                            std::size_t length) noexcept {
    if (!fits<Image>(data, length))
        return std::nullopt;
    Image image{};
    image.frameNumber = Util::loadLittle32(data + kFrameNumberAt);
    image.timeMs = Util::loadLittle32(data + kTimeMsAt);
    std::copy_n(data + kFlagsAt, image.flags.size(), image.flags.begin());
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        image.rawCounts[i] = Util::loadLittle16(data + kRawCountsAt + 2 * i);
        image.signals[i] = static_cast<std::int16_t>(Util::loadLittle16(data + kSignalsAt + 2 * i));
    }
    return image;
}

std::array<std::uint8_t, InputReport::Image::kReportLength> InputReport::Image::toReport() const noexcept {
    std::array<std::uint8_t, kReportLength> report{};
    report[0] = kReportId;
    Util::storeLittle32(&report[kFrameNumberAt], frameNumber);
    Util::storeLittle32(&report[kTimeMsAt], timeMs);
    std::copy(flags.begin(), flags.end(), &report[kFlagsAt]);
    for (std::size_t i = 0; i < kElectrodeCount; ++i) {
        Util::storeLittle16(&report[kRawCountsAt + 2 * i], rawCounts[i]);
        Util::storeLittle16(&report[kSignalsAt + 2 * i], static_cast<std::uint16_t>(signals[i]));
    }
    return report;
}

std::optional<InputReport::FirmwareEvent> InputReport::FirmwareEvent::parse(const std::uint8_t *data,
                                                                            std::size_t length) noexcept {
    if (!fits<FirmwareEvent>(data, length))
        return std::nullopt;
    FirmwareEvent event{.eventCode = data[1], .payload = {}};
    std::copy_n(data + 2, event.payload.size(), event.payload.begin());
    return event;
}

std::optional<FeatureReport::FactoryResetHoldDuration>
FeatureReport::FactoryResetHoldDuration::parse(const std::uint8_t *data, std::size_t length) noexcept {
    if (!fits<FactoryResetHoldDuration>(data, length))
        return std::nullopt;
    return FactoryResetHoldDuration{.duration = Util::loadLittle32(data + 1)};
}

} // namespace ZorvaTouch
