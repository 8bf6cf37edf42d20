#pragma once

#include "Tools/Cli/Counters.h"
#include "Tools/Cli/LiveSource.h"
#include "Tools/Cli/ReplayProof.h"

#include <cstdint>
#include <optional>
#include <string>

namespace ZorvaTouch::Tools {

/// What a demo has to say in the end.
struct DemoSummary {
    std::string plugIn, version;
    SimulatedFinger finger;
    std::uint64_t handledReports = 0; ///< by the service
    std::uint64_t droppedReports = 0; ///< that were lost on the way to it
    Counters counters;
    std::string recordingFile;
    ReplayProof proof;
    /// Of the proof, since the run began; nothing: everything was compared.
    std::optional<std::uint64_t> comparedFromNs;
};

/// Appends some lines for a person.
void appendForPerson(std::string &text, const DemoSummary &summary, bool usesColour);

/// Appends one line of JSON. Docs/CommandLine.md promises its form.
void appendForPrograms(std::string &text, const DemoSummary &summary);

} // namespace ZorvaTouch::Tools
