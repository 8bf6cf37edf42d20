#include "Tests/Unit/Tools/Daemon/SurfacesFixture.h"

#include <rapidcheck.h>
#include <rapidcheck/gtest.h>

#include <array>
#include <cerrno>
#include <cstddef>
#include <map>
#include <ostream>
#include <string>
#include <vector>

namespace ZorvaTouch::Tools {
namespace {

using Linux::Tests::Bytes;
using Tests::TouchScript;

enum class Deed {
    Plug,
    Unplug, ///< the device goes, and the system says so before the main loop has heard of it
    Remove, ///< the system says so, and the device has not noticed
    Lose,   ///< the device fails and stays
    LoseAndReschedule,
    LoseAndSuspend,
    FailNextOpen,
    LetTimePass, ///< the oldest wait is over
    Suspend,
    Reschedule,
    Tap,
    Hold,
    LetGo,
    HoldAndRemove, ///< its reports are still on their way
    HoldAndLose,
    HoldAndReschedule,
};
constexpr int kDeeds = 16;
constexpr int kSurfaces = 3;

struct Step {
    Deed deed = Deed::Plug;
    int surface = 0;
};

[[maybe_unused]] void showValue(const Step &step, std::ostream &stream) {
    static constexpr std::array kNames{"plug",
                                       "unplug",
                                       "remove",
                                       "lose",
                                       "lose and reschedule",
                                       "lose and suspend",
                                       "fail next open",
                                       "time",
                                       "suspend",
                                       "reschedule",
                                       "tap",
                                       "hold",
                                       "let go",
                                       "hold and remove",
                                       "hold and lose",
                                       "hold and reschedule"};
    stream << kNames[static_cast<std::size_t>(step.deed)] << ' ' << step.surface;
}

/// Of those that take a surface away there are few, or hardly anything would be held.
rc::Gen<Step> anyStep() {
    const auto deed = rc::gen::weightedOneOf<int>({
        {8, rc::gen::just(static_cast<int>(Deed::Plug))},
        {4, rc::gen::element(static_cast<int>(Deed::Hold), static_cast<int>(Deed::Tap))},
        {4, rc::gen::just(static_cast<int>(Deed::LetTimePass))},
        {8, rc::gen::inRange(0, kDeeds)},
    });
    return rc::gen::map(rc::gen::pair(deed, rc::gen::inRange(0, kSurfaces)),
                        [](const std::pair<int, int> &pair) {
                            return Step{static_cast<Deed>(pair.first), pair.second};
                        });
}

constexpr std::uint8_t kMarkId = 0x7E; ///< of a report that is none: it is only told in the log
constexpr const char *kMarkLine = "Invalid input report with ID 126";

/// Three surfaces to which anything happens, and what must hold whatever that was.
class SurfacesProperty : public Tests::SurfacesFixture {
protected:
    SurfacesProperty() { logs->debugPrefix = kMarkLine; }

    void take(const Step &step) {
        Model &model = models.at(static_cast<std::size_t>(step.surface));
        switch (step.deed) {
        case Deed::Plug:
            return plug(step.surface);
        case Deed::Unplug:
            if (model.works)
                node(step.surface)->unplug();
            return remove(step.surface);
        case Deed::Remove:
            return remove(step.surface);
        case Deed::Lose:
        case Deed::LoseAndReschedule:
        case Deed::LoseAndSuspend:
            return lose(step);
        case Deed::FailNextOpen:
            return opener(step.surface).errors.push_back(EIO);
        case Deed::LetTimePass:
            if (!timers.pending().empty())
                fireFirst();
            return;
        case Deed::Suspend:
            surfaces->suspend();
            return forgetHolds();
        case Deed::Reschedule:
            return surfaces->reschedule();
        case Deed::Tap:
            return touch(step.surface, model.script.tapPlay(), false);
        case Deed::LetGo:
            return touch(step.surface, model.script.letGo(), false);
        case Deed::Hold:
            return touch(step.surface, model.script.holdLouder(), true);
        case Deed::HoldAndRemove:
            if (model.works)
                send(step.surface, model.script.holdLouder());
            return remove(step.surface);
        case Deed::HoldAndLose:
            if (model.works)
                send(step.surface, model.script.holdPlay());
            return lose(step);
        case Deed::HoldAndReschedule:
            if (model.works)
                send(step.surface, model.script.holdPlay());
            surfaces->reschedule();
            return touch(step.surface, model.script.letGo(), false);
        }
    }

    /// Afterwards nothing is on its way.
    void check() {
        keyQueue.drain();
        refreshModels();
        bool isHeld = false;
        for (const Model &model : models)
            isHeld = isHeld || model.isHeld;
        RC_ASSERT(keys.down().empty() || isHeld);
    }

    /// The lines of each surface: added, opened or failed any number of times, removed, and again.
    void checkLines() {
        std::map<std::string, bool> isThere;
        for (const std::string &line : told.surfaces.lines()) {
            const std::string state = line.substr(0, line.find(' '));
            const std::string id = line.substr(state.size() + 1, 3);
            RC_ASSERT(isThere[id] == (state != "added"));
            isThere[id] = state != "removed";
        }
    }

    /// Every press has its release, and no key is pressed twice.
    void checkKeys() {
        std::map<std::string, bool> isDown;
        for (const std::string &line : keys.journal.lines()) {
            const std::string change = line.substr(2);
            if (change[0] != '+' && change[0] != '-')
                continue;
            RC_ASSERT(isDown[change.substr(1)] == (change[0] == '-'));
            isDown[change.substr(1)] = change[0] == '+';
        }
        for (const auto &[key, down] : isDown)
            RC_ASSERT(!down);
    }

    bool hasHeld = false; ///< a hold has pressed a key

private:
    struct Model {
        bool isThere = false;
        bool works = false;
        bool isHeld = false; ///< a hold may keep its key down
        TouchScript script;
    };

    static std::string serial(int surface) { return "SN" + std::to_string(surface); }

    void plug(int surface) {
        Model &model = models.at(static_cast<std::size_t>(surface));
        if (model.isThere)
            return;
        model = {};
        model.isThere = true;
        surfaces->onAdded(identity(surface, serial(surface)));
    }

    void remove(int surface) {
        Model &model = models.at(static_cast<std::size_t>(surface));
        surfaces->onRemoved(identity(surface, serial(surface)));
        model = {};
        settle(); // what was on its way to the main loop finds nobody
        losses = lostLines();
    }

    void lose(const Step &step) {
        Model &model = models.at(static_cast<std::size_t>(step.surface));
        if (!model.works)
            return;
        node(step.surface)->unplug();
        model.isHeld = false;
        if (step.deed == Deed::LoseAndReschedule)
            surfaces->reschedule();
        if (step.deed == Deed::LoseAndSuspend) {
            surfaces->suspend();
            forgetHolds();
        }
        ++losses;
        runUntil([&] { return lostLines() >= losses; });
        RC_ASSERT(lostLines() == losses);
        model.works = false;
    }

    /// Sends, and waits until all of it has been handled.
    void touch(int surface, const std::vector<Bytes> &reports, bool isHold) {
        Model &model = models.at(static_cast<std::size_t>(surface));
        if (!model.works)
            return;
        send(surface, reports);
        ++marks;
        send(surface, {{kMarkId, 0}});
        logs->lines().waitFor(kMarkLine, marks);
        keyQueue.drain();
        model.isHeld = isHold;
        if (isHold) {
            RC_ASSERT(!keys.down().empty());
            hasHeld = true;
        }
    }

    void forgetHolds() {
        for (Model &model : models)
            model.isHeld = false;
    }

    /// A surface works if that is the last that was told.
    void refreshModels() {
        for (const std::string &line : told.surfaces.take())
            for (int i = 0; i < kSurfaces; ++i)
                if (line.find(serial(i)) != std::string::npos)
                    models.at(static_cast<std::size_t>(i)).works = line.starts_with("opened");
    }

    [[nodiscard]] std::size_t lostLines() const { return told.surfaces.count("the device is gone"); }

    std::array<Model, kSurfaces> models;
    std::size_t losses = 0;
    std::size_t marks = 0;
};

RC_GTEST_FIXTURE_PROP(SurfacesProperty, WhateverHappensNoKeyStaysDown, ()) {
    const auto steps = *rc::gen::container<std::vector<Step>>(anyStep());
    for (const Step &step : steps) {
        take(step);
        check();
    }
    surfaces->closeAll();
    RC_ASSERT(keys.down().empty());
    checkLines();
    checkKeys();
    RC_TAG(hasHeld);
}

} // namespace
} // namespace ZorvaTouch::Tools
