// WFaults.h: the faults that programs die of, made on purpose.

#pragma once

#include <windows.h>

#include <cstdint>

/// A way to fault, and the structured exception that the system makes of it.
struct WFault {
    char const *name;
    DWORD code;
    void (*raise)();
};

namespace wfaults {

constexpr DWORD kOwnCode = 0xE0001234; // a host's own: error severity, customer bit
constexpr DWORD kOwnWarning = 0xA0001234;

// An address where nothing is, hidden from the compiler.
template <typename Pointer> Pointer BadAddress() {
    std::uintptr_t volatile address = 0x40;
    return reinterpret_cast<Pointer>(address); // NOLINT(performance-no-int-to-ptr)
}

[[gnu::noinline]] inline void Read() { [[maybe_unused]] int volatile const value = *BadAddress<int volatile *>(); }
[[gnu::noinline]] inline void Write() { *BadAddress<int volatile *>() = 1; }
[[gnu::noinline]] inline void Execute() { BadAddress<void (*)()>()(); }
[[gnu::noinline]] inline void Divide() {
    int volatile zero = 0;
    [[maybe_unused]] int volatile const value = 7 / zero;
}
[[gnu::noinline]] inline void Privileged() { asm volatile("hlt"); }
[[gnu::noinline]] inline void Illegal() { asm volatile("ud2"); }
[[gnu::noinline]] inline void Own() { RaiseException(kOwnCode, 0, 0, nullptr); }
[[gnu::noinline]] inline void OwnFinal() { RaiseException(kOwnCode, EXCEPTION_NONCONTINUABLE, 0, nullptr); }
[[gnu::noinline]] inline void Warning() { RaiseException(kOwnWarning, 0, 0, nullptr); }

} // namespace wfaults

inline constexpr WFault kFaults[] = {
    {"Read", EXCEPTION_ACCESS_VIOLATION, &wfaults::Read},
    {"Write", EXCEPTION_ACCESS_VIOLATION, &wfaults::Write},
    {"Execute", EXCEPTION_ACCESS_VIOLATION, &wfaults::Execute},
    {"DivideByZero", EXCEPTION_INT_DIVIDE_BY_ZERO, &wfaults::Divide},
    {"Privileged", EXCEPTION_PRIV_INSTRUCTION, &wfaults::Privileged},
    {"Illegal", EXCEPTION_ILLEGAL_INSTRUCTION, &wfaults::Illegal},
    {"OwnCode", wfaults::kOwnCode, &wfaults::Own},
    {"OwnFinalCode", wfaults::kOwnCode, &wfaults::OwnFinal},
    {"OwnWarning", wfaults::kOwnWarning, &wfaults::Warning},
};
