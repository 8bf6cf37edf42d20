#include "Tools/Daemon/ReportHistory.h"

#include <algorithm>
#include <exception>
#include <limits>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

bool isReport(const FrameView &frame) { return frame.type == FrameType::InputReport; }

std::uint64_t distance(std::uint64_t left, std::uint64_t right) {
    return left < right ? right - left : left - right;
}

/// How many reports of the history are older than the recording's first one, which is that of the same
/// content whose time is nearest.
std::size_t countOlder(const FrameView &first, const FrameList &history) {
    std::size_t older = 0, position = 0;
    std::uint64_t nearest = std::numeric_limits<std::uint64_t>::max();
    for (const FrameView &report : history) {
        const std::uint64_t away = distance(report.timestampNs, first.timestampNs);
        if (away < nearest && std::ranges::equal(report.data, first.data)) {
            nearest = away;
            older = position;
        }
        ++position;
    }
    return older;
}

} // namespace

using Host::MutexLock;

void ReportHistory::add(std::uint64_t timestampNs, std::span<const std::uint8_t> report) noexcept {
    const MutexLock lock(_lock);
    try {
        keep(timestampNs, report);
    } catch (const std::exception &) { // no memory
        _reports = FrameList();
        _bytes = 0;
    }
}

void ReportHistory::keep(std::uint64_t timestampNs, std::span<const std::uint8_t> report) {
    _reports.appendReport(timestampNs, report);
    _bytes += report.size();
    if (_reports.size() > kMostReports)
        trim(kReports);
    while (_bytes > kMostBytes && !_reports.empty())
        trim(_reports.size() / 2);
}

void ReportHistory::trim(std::size_t count) {
    if (count == 0)
        _reports = FrameList();
    else
        _reports.trim(count);
    _bytes = 0;
    for (const FrameView &report : _reports)
        _bytes += report.data.size();
}

FrameList ReportHistory::reports() const {
    const MutexLock lock(_lock);
    return _reports;
}

FrameList withOlderReports(const FrameList &recorded, const FrameList &history) {
    const auto first = std::find_if(recorded.begin(), recorded.end(), isReport);
    if (first == recorded.end())
        return recorded;
    std::size_t older = countOlder(*first, history);
    FrameList all;
    for (auto report = history.begin(); older != 0; ++report, --older)
        all.appendReport((*report).timestampNs, (*report).data);
    for (const FrameView &frame : recorded)
        all.append(frame.toFrame());
    all.sort();
    return all;
}

} // namespace ZorvaTouch::Tools
