#include "Service/AccelCapture.h"

namespace ZorvaTouch {
namespace {

void record(const AccelSample &sample, PipelineInput &recording) {
    recording.handleMetadata(sample.timestampMach, kAccelMetadataKey,
                             PropertyValue::Dictionary{{"X", sample.x}, {"Y", sample.y}, {"Z", sample.z}});
}

} // namespace

void AccelCapture::handleSample(const AccelSample &sample, PipelineInput &recording) {
    if (samplesNeededCount == 0) {
        samples.push_back(sample);
        while (samples.size() > kSampleCount)
            samples.pop_front();
        return;
    }
    while (!samples.empty()) {
        record(samples.front(), recording);
        samples.pop_front();
    }
    record(sample, recording);
    --samplesNeededCount;
}

} // namespace ZorvaTouch
