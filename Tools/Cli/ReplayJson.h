#pragma once

#include "Tools/Cli/Output.h"
#include "Tools/Cli/ReplayPrinter.h"

#include <string>

/// A replay as lines of JSON. Docs/CommandLine.md promises their form.
namespace ZorvaTouch::Tools {

/// Appends the line of the frame played last, newline included; nothing for a frame that is no input report.
/// @param describe  Also the recognizer's descriptions, if it is an image.
void appendReplayLine(std::string &text, const Replay &replay, bool describe);

/// Appends the line that ends a recording.
void appendReplayEnd(std::string &text, const Replay &replay);

/// Prints these lines.
class ReplayJson final : public ReplayPrinter {
public:
    ReplayJson(Output &output, bool describe) : _output(output), _describe(describe) {}

    void begin(const std::string &title, const Replay &replay) override;
    void print(const Replay &replay) override;
    void end(const Replay &replay) override;
    void finish() override {}

private:
    Output &_output;
    bool _describe;
};

} // namespace ZorvaTouch::Tools
