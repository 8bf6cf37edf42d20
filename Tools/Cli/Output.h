#pragma once

#include <cstddef>
#include <functional>
#include <string>
#include <string_view>

namespace ZorvaTouch::Tools {

/// Where text ends up.
class TextSink {
public:
    virtual ~TextSink() = default;

    /// Takes all of it.
    /// @throws Host::FileFailure
    virtual void write(std::string_view text) = 0;
};

/// A stream of text, gathered into large pieces.
class Output {
public:
    /// @param sink  Borrowed, for the life of the stream.
    /// @param name  For messages, "standard output".
    Output(TextSink &sink, std::string name);

    void write(std::string_view text);
    /// The text not yet written, to append to. Call `wrote` afterwards.
    [[nodiscard]] std::string &text() noexcept { return _text; }
    /// Passes the text on once it has grown large.
    void wrote();

    /// Passes on what there is.
    /// @throws CliError    "standard output: cannot write: ..."; the text is gone then.
    /// @throws ClosedPipe
    void flush();

    std::function<void()> beforeFlush; ///< called before text is passed on, when set

private:
    TextSink &_sink;
    std::string _name;
    std::string _text;
};

} // namespace ZorvaTouch::Tools
