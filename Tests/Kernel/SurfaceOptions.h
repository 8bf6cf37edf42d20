#pragma once

#include "Synth/Scenario.h"
#include "Tests/Kernel/FeatureAnswers.h"
#include "Tests/Kernel/UhidDevice.h"

#include <cstdint>

namespace ZorvaTouch::KernelTests {

/// What zorvatouch-uhid-surface was told to do.
struct SurfaceOptions {
    DeviceIdentity identity{.name = "ZorvaTouch Surface", .serial = "ZT-0001"};
    bool isLoose = false;                      ///< reports of any length get through
    const Synth::Scenario *scenario = nullptr; ///< null: nobody touches
    std::uint64_t seed = 1;
    double seconds = 0; ///< of the scenario; its own unless told
    bool readsInput = false;
    bool isKept = false; ///< stays until SIGTERM when everything is played
    FeatureAnswers features;
};

/// @throws std::invalid_argument
[[nodiscard]] SurfaceOptions surfaceOptions(int count, char **arguments);

/// What may be said to it.
inline constexpr const char *kSurfaceUsage =
    "usage: zorvatouch-uhid-surface [OPTION...]\n"
    "  --scenario NAME    a finger of this kind plays, once the kernel is ready\n"
    "  --seed N           which one (1)\n"
    "  --seconds S        how long; the scenario's own time unless told\n"
    "  --input            reads lines: a report as hex text, \"feature ID=MODE\", \"mark\", \"wait MS\",\n"
    "                     \"destroy\", \"create\", \"# ...\"\n"
    "  --feature ID=MODE  answer, answer:HEX, refuse or mute; several times\n"
    "  --loose            a descriptor that lets reports of any length through\n"
    "  --name TEXT, --serial TEXT\n"
    "  --keep             stays until SIGTERM after all that; so it does when there is nothing to play\n";

} // namespace ZorvaTouch::KernelTests
