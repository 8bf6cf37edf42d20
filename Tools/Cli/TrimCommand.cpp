#include "Tools/Cli/TrimCommand.h"

#include "Tools/Cli/Documents.h"

namespace ZorvaTouch::Tools {

ExitStatus runTrim(const TrimOptions &options, Environment &environment) {
    FrameList frames = readRecording(options.in, environment).frames;
    frames.trim(options.max);
    writeDocument(options.out, writeRecordingContainer(frames), environment);
    return kExitDone;
}

} // namespace ZorvaTouch::Tools
