#include "Tools/Cli/TrimCommand.h"

#include "Tools/Cli/Documents.h"

namespace ZorvaTouch::Tools {

ExitStatus runTrim(const TrimOptions &options, Environment &environment) {
    Progress progress(environment, inputTitle(options.in));
    FrameList frames = readRecording(options.in, environment, progress).frames;
    frames.trim(options.max);
    writeRecording(options.out, frames, environment, progress);
    return kExitDone;
}

} // namespace ZorvaTouch::Tools
