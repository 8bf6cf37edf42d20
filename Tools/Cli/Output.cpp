#include "Tools/Cli/Output.h"

#include "Host/Runtime/Files.h"
#include "Tools/Cli/CliError.h"

#include <cerrno>
#include <utility>

namespace ZorvaTouch::Tools {
namespace {

constexpr std::size_t kLargePiece = 64 * 1024; // bytes

} // namespace

Output::Output(TextSink &sink, std::string name) : _sink(sink), _name(std::move(name)) {}

void Output::write(std::string_view text) {
    _text.append(text);
    wrote();
}

void Output::wrote() {
    if (_text.size() >= kLargePiece)
        flush();
}

void Output::flush() {
    if (_text.empty())
        return;
    if (beforeFlush)
        beforeFlush();
    try {
        _sink.write(_text);
        _text.clear(); // keeps the capacity
    } catch (const Host::FileFailure &failure) {
        _text.clear();
        if (failure.code().value() == EPIPE)
            throw ClosedPipe();
        throw fileError(_name, failure);
    }
}

} // namespace ZorvaTouch::Tools
