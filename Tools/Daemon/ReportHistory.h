#pragma once

#include "Host/Interface/Mutex.h"
#include "Shared/FrameList.h"

#include <cstddef>
#include <cstdint>
#include <span>

namespace ZorvaTouch::Tools {

/// The newest input reports of a surface, beyond those that the plug-in's own recording holds: there,
/// accelerometer samples use up the same number of frames.
///
/// It has no gap: a report that cannot be kept for want of memory drops those before it.
///
/// Threads:  any.
/// Realtime: `add` takes one lock, and memory only until it has been full once.
class ReportHistory {
public:
    static constexpr std::size_t kReports = 6000; ///< kept at least: a minute of 100 reports a second
    static constexpr std::size_t kMostReports = kReports + kReports / 4;
    /// Bytes of all reports, at most: longer reports than those of a surface, 73 bytes, are fewer.
    static constexpr std::size_t kMostBytes = std::size_t{2} << 20;

    /// @param report       Copied.
    void add(std::uint64_t timestampNs, std::span<const std::uint8_t> report) noexcept;

    /// The reports so far. Costs little more than counting references.
    /// @throws std::bad_alloc
    [[nodiscard]] FrameList reports() const;

private:
    void keep(std::uint64_t timestampNs, std::span<const std::uint8_t> report) ZORVA_REQUIRES(_lock);
    void trim(std::size_t count) ZORVA_REQUIRES(_lock);

    mutable Host::Mutex _lock;
    FrameList _reports ZORVA_GUARDED_BY(_lock);
    std::size_t _bytes ZORVA_GUARDED_BY(_lock) = 0; ///< of all reports
};

/// Puts the reports that a recording no longer holds in front of it.
/// @param recorded  Sorted by time.
/// @param history   Of the same surface, sorted by time. Its times differ a little from the recording's:
///                  where the recording begins is found by the content of its first report.
/// @return Sorted by time. The recording alone if it has no report that the history has.
/// @throws std::bad_alloc
[[nodiscard]] FrameList withOlderReports(const FrameList &recorded, const FrameList &history);

} // namespace ZorvaTouch::Tools
