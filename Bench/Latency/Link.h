#pragma once

#include <cstddef>
#include <cstdint>
#include <span>

namespace ZorvaTouch::Bench {

/// A device node's two ends: what is written as one report at the one is read as one report at the other.
class Link {
public:
    Link();
    ~Link();
    Link(const Link &) = delete;
    Link &operator=(const Link &) = delete;

    /// The end that becomes readable.
    [[nodiscard]] int readEnd() const noexcept { return _ends[0]; }
    void write(std::span<const std::uint8_t> report) const;
    /// Reads one report; 0 at the end.
    [[nodiscard]] std::size_t read(std::span<std::uint8_t> buffer) const;
    /// The reader finds the end from here on.
    void shutDown() const noexcept;

private:
    int _ends[2];
};

} // namespace ZorvaTouch::Bench
