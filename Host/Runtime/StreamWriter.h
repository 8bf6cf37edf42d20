#pragma once

#include "Host/Runtime/Files.h"

#include <memory>
#include <string_view>

namespace ZorvaTouch::Host {

/// Where text goes, to a reader that may be slow or hang.
///
/// Threads: `write` one at a time, `giveUp` any.
class TextWriter {
public:
    virtual ~TextWriter() = default;

    /// Writes everything, and waits for the reader as long as that takes.
    /// @return 0 or the error's number; ECANCELED if it was given up, and a part may have been written.
    [[nodiscard]] virtual int write(std::string_view text) noexcept = 0;

    /// A write that waits for the reader ends at once, and every later one.
    virtual void giveUp() noexcept = 0;
};

/// Writes to a standard stream that other processes may share: its descriptor is left as it is, blocking
/// above all. What can be opened anew, pipes and terminals, is written to through a description of our own
/// that does not block; a socket is told with each piece. Where neither is possible only pieces are written
/// for which the system says that there is room.
class StreamWriter final : public TextWriter {
public:
    /// @throws FileFailure  The system has no descriptor to give.
    explicit StreamWriter(StandardStream stream);
    ~StreamWriter() override;
    StreamWriter(const StreamWriter &) = delete;
    StreamWriter &operator=(const StreamWriter &) = delete;

    [[nodiscard]] int write(std::string_view text) noexcept override;
    void giveUp() noexcept override;

private:
    struct Descriptors;
    const std::unique_ptr<Descriptors> _descriptors;
};

} // namespace ZorvaTouch::Host
