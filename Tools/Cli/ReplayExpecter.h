#pragma once

#include "Tools/Cli/Output.h"
#include "Tools/Cli/ReplayPrinter.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// Compares a replay's lines of JSON with lines saved earlier. Says nothing while they agree, tells the first
/// difference, and is silent again.
class ReplayExpecter final : public ReplayPrinter {
public:
    /// @param expected       Saved lines. Borrowed, for the life of this. The last one may lack its newline.
    /// @param expectedTitle  Where they are from.
    /// @param describe       The lines hold descriptions.
    ReplayExpecter(std::string_view expected, std::string expectedTitle, bool describe, Output &output);

    void begin(const std::string &title, const Replay &replay) override;
    void print(const Replay &replay) override;
    void end(const Replay &replay) override;
    /// Lines that are left are a difference, too.
    void finish() override;

    [[nodiscard]] bool differs() const noexcept { return _differs; }

private:
    void compareLine(const std::string &place);
    void tell(const std::string &place, std::string_view expected, std::string_view actual);
    [[nodiscard]] std::string_view takeExpected();

    std::string_view _rest; ///< saved lines not yet compared
    std::string _expectedTitle;
    bool _describe;
    Output &_output;
    std::string _title;
    std::string _line; ///< the replay's, kept for its capacity
    std::size_t _lineNumber = 0;
    bool _differs = false;
};

} // namespace ZorvaTouch::Tools
