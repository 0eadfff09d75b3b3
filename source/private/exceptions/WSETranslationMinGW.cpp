// WSETranslationMinGW.cpp: turning structured exceptions into C++ exceptions for code compiled by GCC.
//
// A vectored handler looks at every exception of the process and passes on all but those of threads that have a
// translator. For these it keeps the system's record, and has the thread resume in a thunk, below the stack pointer of
// the faulting code, as if that code had called it:
//
//     faulting frame's stack
//     ----------------------  faulting RSP
//     (rounded down to 16)
//     SS                      machine frame: to the unwinder, the thunk was entered by an interrupt of the faulting
//     RSP                     instruction. RIP is one more than its address, since the unwinder takes every return
//     flags                   address as standing behind a call and looks up the byte before.
//     CS
//     RIP + 1
//     ----------------------  the thunk's frame, then the translator's, which throws
//
// Unwinding then runs the destructors of the faulting function and reaches its catch clause, if it was compiled with
// -fnon-call-exceptions: without that option the compiler takes for granted that only calls throw. The faulting code
// itself is never resumed, so its volatile registers are free to carry the thunk's arguments.

#include "WSETranslation.h"

#include <windows.h>

#include <cstddef>
#include <cstdint>
#include <memory>
#include <stdexcept>

namespace {

// What the translator is given; lives as long as the thread, as the exception object keeps a pointer to it.
struct Fault {
    EXCEPTION_RECORD record;
    CONTEXT context;
    EXCEPTION_POINTERS pointers;
    WKTSETranslator translator;
};

struct ThreadState {
    WKTSETranslator translator = nullptr;
    WKTSETranslator previous = nullptr;
    bool isInstalled = false;
    unsigned faultCount = 0;
    Fault faults[2]; // a second fault, while the first is being handled, leaves its record alone
};

// Codes of the C++ run-times: GCC's throw, unwinding and forced unwinding, and Visual C++'s throw.
bool IsRunTimeCode(DWORD code) {
    return code == 0x20474343 || code == 0x21474343 || code == 0x22474343 || code == 0xE06D7363;
}

// Success and information codes are messages to debuggers and between the system's own parts. A stack overflow leaves
// no stack to translate on: it ends the process as the system does.
bool IsTranslatedCode(DWORD code) {
    return (code & 0x80000000U) != 0 && code != EXCEPTION_STACK_OVERFLOW && !IsRunTimeCode(code);
}

// The system restores only what the flags name; states that lie outside of the structure are not copied with it.
constexpr DWORD kExtendedState = 0x40;

constexpr DWORD kTrapFlag = 0x100;
constexpr DWORD kDirectionFlag = 0x400;
constexpr DWORD kAlignmentFlag = 0x40000;
constexpr WORD kPendingX87Exceptions = 0x80FF;

// Whether the address is one of the thread's stack.
bool IsOnStack(ULONG64 address) {
    ULONG_PTR low = 0;
    ULONG_PTR high = 0;
    GetCurrentThreadStackLimits(&low, &high);
    return address > low && address < high;
}

// A call through a bad pointer: the fault counts as one of the call, whose return address is on the stack.
bool IsBadCall(EXCEPTION_RECORD const &record) {
    constexpr ULONG_PTR kExecute = 8;
    return record.ExceptionCode == EXCEPTION_ACCESS_VIOLATION && record.NumberParameters >= 2 &&
           (record.ExceptionInformation[0] == kExecute ||
            record.ExceptionInformation[1] == reinterpret_cast<ULONG_PTR>(record.ExceptionAddress));
}

} // namespace

extern "C" {

void KTResumeInTranslator(); // the thunk

[[noreturn]] __attribute__((used)) void KTTranslateFault(Fault *fault) {
    fault->translator(fault->record.ExceptionCode, &fault->pointers);
    // A translator that returns has not taken the exception, and nobody else will.
    TerminateProcess(GetCurrentProcess(), fault->record.ExceptionCode);
    __builtin_unreachable();
}
}

// rcx: the fault; rdx: return address into the faulting function; r8: its stack pointer.
asm(R"(
    .text
    .globl KTResumeInTranslator
    .def KTResumeInTranslator; .scl 2; .type 32; .endef
    .seh_proc KTResumeInTranslator
KTResumeInTranslator:
    pushq $0x2B
    pushq %r8
    pushq $0x2
    pushq $0x33
    pushq %rdx
    .seh_pushframe
    subq $40, %rsp
    .seh_stackalloc 40
    .seh_endprologue
    call KTTranslateFault
    int3
    .seh_endproc
)");

namespace {

Fault &Keep(EXCEPTION_POINTERS const &pointers, ThreadState &state) {
    Fault &fault = state.faults[state.faultCount++ % std::size(state.faults)];
    fault.record = *pointers.ExceptionRecord;
    fault.context = *pointers.ContextRecord;
    fault.context.ContextFlags &= ~kExtendedState;
    fault.pointers = {&fault.record, &fault.context};
    fault.translator = state.translator;
    return fault;
}

void ResumeInThunk(CONTEXT &context, Fault &fault) {
    ULONG64 returnAddress = context.Rip + 1;
    ULONG64 stack = context.Rsp;
    if (IsBadCall(fault.record)) {
        returnAddress = *reinterpret_cast<ULONG64 const *>(stack); // NOLINT(performance-no-int-to-ptr)
        stack += sizeof returnAddress;
    }
    context.Rcx = reinterpret_cast<ULONG64>(&fault);
    context.Rdx = returnAddress;
    context.R8 = stack;
    context.Rsp = stack & ~ULONG64{15};
    context.Rip = reinterpret_cast<ULONG64>(&KTResumeInTranslator);
    context.EFlags &= ~(kTrapFlag | kDirectionFlag | kAlignmentFlag);
    context.FltSave.StatusWord &= static_cast<WORD>(~kPendingX87Exceptions);
}

LONG CALLBACK OnException(EXCEPTION_POINTERS *pointers);

// The slot of the threads' states and the handler, from the first installation to the library's end.
class Translation {
  public:
    Translation() : m_Slot(FlsAlloc(&FreeState)), m_Handler(AddVectoredExceptionHandler(0, &OnException)) {
        if (m_Slot == FLS_OUT_OF_INDEXES || m_Handler == nullptr) {
            Release();
            throw std::runtime_error("no slot or handler left for structured exceptions");
        }
        s_Slot = m_Slot;
    }
    Translation(Translation const &) = delete;
    Translation &operator=(Translation const &) = delete;
    ~Translation() { Release(); }

    static Translation &Get() {
        static Translation translation;
        return translation;
    }

    /// The calling thread's state, or null; leaves the thread's last error as it is.
    static ThreadState *FindState() {
        if (s_Slot == FLS_OUT_OF_INDEXES) {
            return nullptr;
        }
        DWORD const lastError = GetLastError();
        auto *const state = static_cast<ThreadState *>(FlsGetValue(s_Slot));
        SetLastError(lastError);
        return state;
    }

    ThreadState &MakeState() {
        if (ThreadState *const state = FindState()) {
            return *state;
        }
        auto state = std::make_unique<ThreadState>();
        if (FlsSetValue(m_Slot, state.get()) == FALSE) {
            throw std::bad_alloc();
        }
        return *state.release();
    }

  private:
    static void WINAPI FreeState(void *state) { delete static_cast<ThreadState *>(state); }

    void Release() {
        s_Slot = FLS_OUT_OF_INDEXES;
        if (m_Handler != nullptr) {
            RemoveVectoredExceptionHandler(m_Handler);
        }
        if (m_Slot != FLS_OUT_OF_INDEXES) {
            FlsFree(m_Slot);
        }
    }

    static inline std::atomic<DWORD> s_Slot = FLS_OUT_OF_INDEXES;
    DWORD m_Slot;
    void *m_Handler;
};

LONG CALLBACK OnException(EXCEPTION_POINTERS *pointers) {
    if (!IsTranslatedCode(pointers->ExceptionRecord->ExceptionCode)) {
        return EXCEPTION_CONTINUE_SEARCH;
    }
    ThreadState *const state = Translation::FindState();
    if (state == nullptr || state->translator == nullptr || !IsOnStack(pointers->ContextRecord->Rsp)) {
        return EXCEPTION_CONTINUE_SEARCH;
    }
    ResumeInThunk(*pointers->ContextRecord, Keep(*pointers, *state));
    return EXCEPTION_CONTINUE_EXECUTION;
}

} // namespace

WKTSETranslator WInstallTranslator(WKTSETranslator translator) {
    ThreadState &state = Translation::Get().MakeState();
    WKTSETranslator const replaced = state.translator;
    if (replaced != translator) {
        state.previous = replaced;
        state.translator = translator;
        state.isInstalled = true;
    }
    return replaced;
}

void WRestoreTranslator() noexcept {
    ThreadState *const state = Translation::FindState();
    if (state != nullptr && state->isInstalled) {
        state->translator = state->previous;
        state->previous = nullptr;
        state->isInstalled = false;
    }
}
