#include "Shared/FrameList.h"

#include "Shared/PipelineRecording.h"
#include "Tests/Support/FramesGenerators.h"
#include "Tests/Support/FramesReference.h"
#include "Tests/Support/RecordingFakes.h"

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

namespace ZorvaTouch {
namespace {

namespace gen = rc::gen;
using Scripted::crowdedFrame;
using Scripted::framesOf;
using Scripted::fullRange;
using Scripted::ReferenceList;
using Scripted::upTo;

constexpr std::uint64_t kMaxBound = 10;

RC_GTEST_PROP(FrameListProperty, TrimsAsThePlainListDoesAfterEveryAppend, ()) {
    FrameList list;
    ReferenceList reference;
    for (const Frame &frame : *upTo(40, crowdedFrame())) {
        list.append(frame);
        reference.append(frame);
        for (std::uint64_t bound = 0; bound <= kMaxBound; ++bound) {
            const std::size_t cursor = (list.size() * 7 + bound * 3) % (list.size() + 1);
            FrameList trimmed(list);
            ReferenceList expected(reference);
            const std::size_t keptFromCursor = list.countKept(bound, cursor);
            trimmed.trim(bound);
            RC_ASSERT(trimmed.size() - keptFromCursor == expected.trim(bound, cursor));
            RC_ASSERT(framesOf(trimmed) == expected.frames());
        }
        RC_ASSERT(framesOf(list) == reference.frames());
    }
}

RC_GTEST_PROP(FrameListProperty, ABoundedRecordingIsABoundedPlainList, ()) {
    Scripted::FakeClock clock;
    std::vector<PipelineRecording> recordings;
    std::vector<ReferenceList> references(kMaxBound + 1);
    for (std::uint64_t bound = 0; bound <= kMaxBound; ++bound)
        recordings.emplace_back(clock).setMaxFrameCount(bound);
    for (const Frame &frame : *upTo(100, crowdedFrame())) {
        for (std::uint64_t bound = 0; bound <= kMaxBound; ++bound) {
            PipelineRecording &recording = recordings[bound];
            ReferenceList &reference = references[bound];
            recording.appendFrame(frame);
            reference.append(frame);
            if (bound != 0 && reference.size() >= 2 * bound)
                reference.trim(bound, 0);
            RC_ASSERT(framesOf(recording.frames()) == reference.frames());
        }
    }
}

RC_GTEST_PROP(FrameListProperty, LongHistoriesAgreeWithThePlainList, ()) {
    // Over several chunks, with copies left behind that must stay what they were.
    enum class Step { Append, AppendMany, Trim, Sort, Copy, Reassign };
    FrameList list;
    ReferenceList reference;
    std::size_t cursor = 0;
    std::vector<FrameList> copies;
    std::vector<std::vector<Frame>> copiedFrames;
    const auto steps = *gen::resize(
        120, gen::container<std::vector<Step>>(gen::weightedElement<Step>({{5, Step::Append},
                                                                           {6, Step::AppendMany},
                                                                           {3, Step::Trim},
                                                                           {1, Step::Sort},
                                                                           {2, Step::Copy},
                                                                           {1, Step::Reassign}})));
    const auto frames = *upTo(20, crowdedFrame());
    RC_PRE(!frames.empty());
    std::size_t next = 0;
    const auto append = [&] {
        const Frame &frame = frames[next++ % frames.size()];
        if (frame.type == FrameType::InputReport && next % 2 == 0)
            list.appendReport(frame.timestampNs, frame.data);
        else
            list.append(frame);
        reference.append(frame);
    };
    for (const Step step : steps) {
        switch (step) {
        case Step::Append:
            append();
            break;
        case Step::AppendMany:
            for (int i = 0; i < 45; ++i)
                append();
            break;
        case Step::Trim: {
            const auto bound = *fullRange(gen::inRange<std::uint64_t>(0, 150));
            const std::size_t expected = reference.trim(bound, cursor);
            const std::size_t keptFromCursor = list.countKept(bound, cursor);
            list.trim(bound);
            cursor = list.size() - keptFromCursor;
            RC_ASSERT(cursor == expected);
            break;
        }
        case Step::Sort: {
            cursor = reference.sort(cursor);
            list.sort();
            break;
        }
        case Step::Copy:
            copies.push_back(list);
            copiedFrames.push_back(reference.frames());
            break;
        case Step::Reassign: {
            FrameList copy;
            copy = list;
            list = std::move(copy);
            break;
        }
        }
        RC_ASSERT(list.size() == reference.size());
        cursor = list.empty() ? 0 : (cursor + next) % (list.size() + 1);
    }
    RC_ASSERT(framesOf(list) == reference.frames());
    for (std::size_t i = 0; i < copies.size(); ++i)
        RC_ASSERT(framesOf(copies[i]) == copiedFrames[i]);
}

RC_GTEST_PROP(FrameListProperty, IndexingAndWalkingAgree, ()) {
    FrameList list;
    const auto frames = *upTo(100, crowdedFrame());
    for (int round = 0; round < 3; ++round) {
        for (const Frame &frame : frames)
            list.append(frame);
    }
    list.trim(*fullRange(gen::inRange<std::uint64_t>(0, 200)));
    std::size_t index = 0;
    for (const FrameView frame : list)
        RC_ASSERT(frame.toFrame() == list[index++].toFrame());
    RC_ASSERT(index == list.size());
}

} // namespace
} // namespace ZorvaTouch
