#pragma once

#include <cstddef>

/// A full recording's worth of reports through the recognizer, written as a container and read back. Built
/// twice into modules of their own: with the build's hardening and without it.
///
/// @return A number that both builds must agree on.
extern "C" __attribute__((visibility("default"))) std::size_t zorvaBenchWork() noexcept;
