#include "Tools/Cli/ConvertCommand.h"

#include "Tools/Cli/Documents.h"

namespace ZorvaTouch::Tools {

ExitStatus runConvert(const ConvertOptions &options, Environment &environment) {
    Progress progress(environment, inputTitle(options.in));
    const FrameList frames = readRecording(options.in, environment, progress).frames;
    writeRecording(options.out, frames, environment, progress);
    return kExitDone;
}

} // namespace ZorvaTouch::Tools
