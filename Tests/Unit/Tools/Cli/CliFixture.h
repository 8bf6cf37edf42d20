#pragma once

#include "Tests/Support/RecordingFakes.h"
#include "Tools/Cli/Cli.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <filesystem>
#include <functional>
#include <initializer_list>
#include <optional>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// Collects what is written to it, or refuses it.
class StringSink final : public TextSink {
public:
    /// @throws Host::FileFailure  ENOSPC once `isFull` is set, EPIPE once `isClosed` is.
    void write(std::string_view written) override;

    std::string text;
    bool isFull = false;
    bool isClosed = false;                                ///< the reader of a pipe has closed it
    std::function<void(const std::string &text)> onWrite; ///< told of all the text so far, when set
};

/// Runs the command line without a process, in a folder of its own.
class CliFixture : public ::testing::Test {
protected:
    void SetUp() override;
    void TearDown() override;

    /// What one run did.
    struct Run {
        int status;
        std::string output;
        std::string error;
    };

    /// Arguments as on a command line; "@name" is a file in the test's folder.
    Run run(std::initializer_list<std::string> arguments);

    /// The same, but for the output of a run that must succeed without a word on standard error.
    std::string outputOf(std::initializer_list<std::string> arguments);
    /// The one line on standard error of a run that must end with 2 and without output. The folder's name is
    /// "@".
    std::string errorOf(std::initializer_list<std::string> arguments);

    void writeFile(const std::string &name, std::string_view text) const;
    [[nodiscard]] std::string readFile(const std::string &name) const;
    /// Writes a recording from its text form.
    void makeRecording(const std::string &name, std::string_view stimulus) const;
    [[nodiscard]] std::string path(const std::string &name) const { return (_folder / name).string(); }
    /// Names in the folder, sorted, each followed by a blank.
    [[nodiscard]] std::string fileNames() const;

    std::string input; ///< standard input of the next runs
    StringSink outputSink, errorSink;
    Scripted::FakeClock clock;
    Scripted::CapturingLogProvider logs;
    std::optional<Ports::LogLevel> logLevel; ///< that the last run asked for
    bool usesColour = false;
    bool showsProgress = false;
    std::size_t screenColumns = 0;
    std::size_t screenRows = 0;
    std::function<void()> stop; ///< what a run that can be stopped is stopped with, while it goes on

private:
    std::filesystem::path _folder;
};

} // namespace ZorvaTouch::Tools
