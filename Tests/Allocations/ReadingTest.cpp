#include "Bench/AllocationCounter.h"
#include "Bench/SampleReports.h"
#include "Shared/RecordingContainer.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <string>

// What reading a recording takes in memory. This program has its own `operator new`, which counts.

namespace ZorvaTouch {
namespace {

TEST(Allocations, ReadingARecordingTakesLittleMoreThanItsFrames) {
    const std::string text = writeRecordingContainer(Bench::makeRecording(60'000));
    const Bench::AllocationCounter allocations;
    std::int64_t most = 0;
    const RecordingContainer recording =
        readRecordingContainer([&, pieces = Util::piecesOf(text)](char *to, std::size_t size) mutable {
            most = std::max(most, allocations.bytes());
            return pieces(to, size);
        });
    const std::int64_t frames = allocations.bytes();
    EXPECT_EQ(recording.frames.size(), 60'000u);
    EXPECT_GT(frames, 60'000 * 73) << "the frames are counted";
    EXPECT_LE(static_cast<double>(most), 1.3 * static_cast<double>(frames));
    EXPECT_LT(frames, static_cast<std::int64_t>(text.size()) / 2) << "the text would show";
}

} // namespace
} // namespace ZorvaTouch
