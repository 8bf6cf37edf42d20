#include "Tools/Cli/ConvertCommand.h"

#include "Tools/Cli/Documents.h"

namespace ZorvaTouch::Tools {

ExitStatus runConvert(const ConvertOptions &options, Environment &environment) {
    const FrameList frames = readRecording(options.in, environment).frames;
    writeDocument(options.out, writeRecordingContainer(frames), environment);
    return kExitDone;
}

} // namespace ZorvaTouch::Tools
