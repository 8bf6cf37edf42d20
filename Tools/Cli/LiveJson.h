#pragma once

#include "Tools/Cli/LivePrinter.h"
#include "Tools/Cli/Output.h"

namespace ZorvaTouch::Tools {

/// Prints a run as lines of JSON, one for each gesture. Docs/CommandLine.md promises their form.
class LiveJson final : public LivePrinter {
public:
    /// @param output  Borrowed.
    explicit LiveJson(Output &output) : _output(output) {}

    void print(const LiveGesture &gesture) override;
    void printSilence(std::uint64_t, const std::string &, bool) override {}
    void refresh(std::uint64_t, const std::optional<InputReport::Image> &) override { _output.flush(); }
    void clear() override { _output.flush(); }

private:
    Output &_output;
};

} // namespace ZorvaTouch::Tools
