#pragma once

#include <cstdint>
#include <initializer_list>
#include <new>

namespace ZorvaTouch::Testing {

/// One allocation that the process's `operator new` refuses, counted from the start of a call.
///
/// A program that links Refusal.cpp has every `operator new` replaced, also for the libraries and plug-ins
/// that it loads.
///
/// Threads: one refusal at a time is in force; `during` may be called on any thread.
class Refusal {
public:
    enum class Extent { OneAllocation, AllFromThere };
    enum class Threads { TheCalling, All };

    Refusal(std::uint64_t number, Extent extent) noexcept : _number(number), _extent(extent) {}

    /// Calls something while allocations count. What it throws comes through.
    template <typename Call> decltype(auto) during(const Call &call, Threads threads = Threads::TheCalling) {
        const InForce inForce(*this, threads);
        return call();
    }
    /// Calls something that may run out of memory; any other exception comes through.
    /// @return Whether it came to its end.
    template <typename Call>
    [[nodiscard]] bool allows(const Call &call, Threads threads = Threads::TheCalling) {
        try {
            during(call, threads);
            return true;
        } catch (const std::bad_alloc &) {
            return false;
        }
    }
    /// Whether the call came as far as the allocation.
    [[nodiscard]] bool hasHappened() const noexcept { return _hasHappened; }

private:
    class InForce {
    public:
        InForce(Refusal &refusal, Threads threads) noexcept;
        ~InForce();
        InForce(const InForce &) = delete;
        InForce &operator=(const InForce &) = delete;

    private:
        Refusal &_refusal;
    };

    const std::uint64_t _number;
    const Extent _extent;
    bool _hasHappened = false;
};

/// Calls `body(refusal)` for the first allocation, the second and so on, until one does not come: refused
/// alone, and refused with all that follow.
/// @return How many calls met a refusal.
template <typename Body> std::uint64_t forEachRefusal(const Body &body) {
    std::uint64_t met = 0;
    for (const auto extent : {Refusal::Extent::OneAllocation, Refusal::Extent::AllFromThere})
        for (std::uint64_t number = 1;; ++number) {
            Refusal refusal(number, extent);
            body(refusal);
            if (!refusal.hasHappened())
                break;
            ++met;
        }
    return met;
}

} // namespace ZorvaTouch::Testing
