#include "Synth/Parameters.h"

namespace ZorvaTouch::Synth {
namespace {

using P = Parameters;

// Widths are full widths at half maximum. "sd" is standard deviation.
constexpr std::array<ParameterInfo, kParameterCount> kParameters{{
    {"report-rate", "Hz", 100, 1, 1000, "Images a second", &P::reportRate},
    {"period-jitter", "ms", 0.2, 0, 100, "Of each image against an even beat, sd; cut at 0.45 periods",
     &P::periodJitter},
    {"host-latency", "ms", 1, 0, 1000, "From measurement to host time stamp", &P::hostLatency},
    {"host-jitter", "ms", 0.3, 0, 1000, "Of reports beyond the latency, evenly from 0 to this",
     &P::hostJitter},
    {"drop-rate", "%", 0, 0, 90, "Images that the host never gets", &P::dropRate},
    {"repeat-rate", "%", 0, 0, 100, "Images that the host gets twice", &P::repeatRate},
    {"boot-time", "ms", 60, 0, 10000, "Silence after a reset of the device", &P::bootTime},
    {"signal", "counts", 800, 0, 20000, "Under the middle of a blob at full pressure, electrode with gain 1",
     &P::signal},
    {"finger-width", "mm", 6, 0.5, 100, "Blob of a fingertip at full pressure", &P::fingerWidth},
    {"thumb-width", "mm", 9, 0.5, 100, "Blob of a resting thumb", &P::thumbWidth},
    {"broad-width", "mm", 13, 0.5, 100, "Blob of a broad contact, such as two fingers or a cheek",
     &P::broadWidth},
    {"palm-width", "mm", 20, 0.5, 200, "Blob of a palm", &P::palmWidth},
    {"water-width", "mm", 3, 0.5, 100, "Blob of a drop", &P::waterWidth},
    {"light-width", "%", 75, 1, 100, "Blob without pressure, of its width at full pressure", &P::lightWidth},
    {"placement", "mm", 0.8, 0, 20, "Where a finger lands around its aim, sd in x and in y", &P::placement},
    {"tremor", "%", 3, 0, 50, "Of a contact's pressure, largest deviation", &P::tremor},
    {"tremor-rate", "Hz", 9, 0, 100, "Of the tremor", &P::tremorRate},
    {"pause-scale", "times", 1, 0, 1000, "Stretches the pauses between contacts", &P::pauseScale},
    {"gain-spread", "%", 5, 0, 30, "Of each electrode's gain, sd over sensors", &P::gainSpread},
    {"noise", "counts", 3, 0, 10000, "Of each electrode in each image, sd", &P::noise},
    {"common-noise", "counts", 2, 0, 10000, "Of all electrodes together in each image, sd", &P::commonNoise},
    {"drift", "counts", 5, 0, 10000, "Of each electrode's raw counts, sd over a long time", &P::drift},
    {"drift-time", "s", 20, 0.1, 100000, "In which a drift has fallen to 1/e", &P::driftTime},
    {"warm-drift", "counts", 20, 0, 10000, "That a finger at full pressure takes away by warming",
     &P::warmDrift},
    {"warm-time", "s", 6, 0.1, 100000, "In which 1 - 1/e of the warming is done", &P::warmTime},
    {"offset", "counts", 20000, 0, 65535, "Raw counts of an untouched electrode, mean", &P::offset},
    {"offset-spread", "counts", 1500, 0, 20000, "Of the offset, sd over electrodes", &P::offsetSpread},
    {"baseline-time", "s", 4, 0.01, 100000, "In which the firmware follows an untouched electrode",
     &P::baselineTime},
    {"baseline-recovery", "s", 0.2, 0.01, 100000, "The same below minus the touch band",
     &P::baselineRecovery},
    {"touch-band", "counts", 30, 0, 20000, "Signal up to which the firmware takes an electrode for untouched",
     &P::touchBand},
    {"accel-rate", "Hz", 0, 0, 1000, "Accelerometer samples a second; 0 is none", &P::accelRate},
    {"accel-noise", "g", 0.004, 0, 2, "Of each axis, sd", &P::accelNoise},
    {"accel-bump", "g", 0.15, 0, 2, "Of a contact that begins with full pressure", &P::accelBump},
}};

static_assert(sizeof(Parameters) == kParameterCount * sizeof(double), "every parameter has its row");

} // namespace

Parameters::Parameters() noexcept {
    for (const ParameterInfo &info : kParameters)
        this->*info.value = info.standard;
}

const std::array<ParameterInfo, kParameterCount> &parameters() noexcept { return kParameters; }

} // namespace ZorvaTouch::Synth
