#include "Synth/Labels.h"

#include "Shared/Util/Json.h"

#include <gtest/gtest.h>

#include <string>

namespace ZorvaTouch::Synth {
namespace {

using Texts = std::vector<std::string>;

Texts textsOf(const Contact &contact, Microseconds end, const Clock &clock) {
    Texts texts;
    for (const PropertyValue &label : labelsOf(contact, end, clock))
        texts.push_back(Util::jsonText(label));
    return texts;
}

class SynthLabels : public ::testing::Test {
protected:
    SynthLabels() : clock(0, parameters, Random(1)) {}

    const Parameters parameters;
    Clock clock;
};

Contact contactOf(ContactKind kind, PixelRegion region) {
    Contact contact;
    contact.kind = kind;
    contact.start = 2'000'900;
    contact.duration = 3'000'000;
    contact.stopAt({}, 0, 1'000'000, region);
    return contact;
}

TEST_F(SynthLabels, SayKindRegionAndTime) {
    EXPECT_EQ(textsOf(contactOf(ContactKind::Tap, kPixelRegionVolumeUp), 5'000'900, clock),
              Texts{R"({"EndMs":5000,"Kind":"Tap","Region":3,"StartMs":2000})"});
}

TEST_F(SynthLabels, AccidentsHaveRegion0) {
    EXPECT_EQ(textsOf(contactOf(ContactKind::Palm, kPixelRegionNone), 5'000'900, clock),
              Texts{R"({"EndMs":5000,"Kind":"Palm","Region":0,"StartMs":2000})"});
}

TEST_F(SynthLabels, EachMoveOfAHoldIsASlide) {
    Contact hold = contactOf(ContactKind::Hold, kPixelRegionVolumeUp);
    hold.stopAt({}, 1'200'000, 2'000'000, kPixelRegionPlayPause);
    hold.stopAt({}, 2'300'000, 3'000'000, kPixelRegionVolumeDown);
    EXPECT_EQ(textsOf(hold, 5'000'900, clock),
              (Texts{R"({"EndMs":5000,"Kind":"Hold","Region":3,"StartMs":2000})",
                     R"({"EndMs":3200,"Kind":"Slide","Region":1,"StartMs":3000})",
                     R"({"EndMs":4300,"Kind":"Slide","Region":2,"StartMs":4000})"}));
}

TEST_F(SynthLabels, ACutHoldHasTheMovesThatBegan) {
    Contact hold = contactOf(ContactKind::Hold, kPixelRegionVolumeUp);
    hold.stopAt({}, 1'200'000, 2'000'000, kPixelRegionPlayPause);
    hold.stopAt({}, 2'300'000, 3'000'000, kPixelRegionVolumeDown);
    EXPECT_EQ(textsOf(hold, 3'100'900, clock),
              (Texts{R"({"EndMs":3100,"Kind":"Hold","Region":3,"StartMs":2000})",
                     R"({"EndMs":3100,"Kind":"Slide","Region":1,"StartMs":3000})"}));
}

TEST_F(SynthLabels, WhatAResetLeavesBeginsAt0AndMeansNothing) {
    Contact hold = contactOf(ContactKind::Hold, kPixelRegionVolumeUp);
    hold.stopAt({}, 2'200'000, 3'000'000, kPixelRegionPlayPause);
    hold.kind = ContactKind::Remainder;
    clock.reset(4'000'000);
    EXPECT_EQ(textsOf(hold, 5'000'900, clock),
              Texts{R"({"EndMs":1000,"Kind":"Remainder","Region":0,"StartMs":0})"});
}

} // namespace
} // namespace ZorvaTouch::Synth
