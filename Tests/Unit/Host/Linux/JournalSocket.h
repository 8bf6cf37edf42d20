#pragma once

#include "Host/Linux/UniqueFd.h"

#include <string>

namespace ZorvaTouch::Linux::Tests {

/// A journal's socket in a directory of its own, which is read only when the test asks for it. Gone with
/// this.
class JournalSocket {
public:
    JournalSocket();
    ~JournalSocket();
    JournalSocket(const JournalSocket &) = delete;
    JournalSocket &operator=(const JournalSocket &) = delete;

    [[nodiscard]] std::string path() const { return _folder + "/socket"; }
    /// The next datagram; empty if none waits.
    [[nodiscard]] std::string receive() const;
    /// Waits until a sender would have to wait.
    void waitUntilFull() const;

    void open();
    void close();

private:
    std::string _folder;
    UniqueFd _socket;
};

} // namespace ZorvaTouch::Linux::Tests
