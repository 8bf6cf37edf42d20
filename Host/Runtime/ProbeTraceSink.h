#pragma once

#include "Host/Interface/Platform.h"

#include <cstdint>

namespace ZorvaTouch::Host {

/// Trace points as static probes of the library's file, for tools such as bpftrace, perf and gdb: the
/// provider is `zorvatouch`, the probes are
///
///     input_report(first four bytes)      dispatch_land(number of events)
///     dispatch_event(type, phase)         firmware_event(event code, payload)
///
/// A probe that nobody watches is one instruction that does nothing. An unknown code does nothing either.
class ProbeTraceSink final : public TraceSink {
public:
    void emit(std::uint32_t code, std::uint64_t argument0, std::uint64_t argument1, std::uint64_t argument2,
              std::uint64_t argument3) noexcept override;
};

} // namespace ZorvaTouch::Host
