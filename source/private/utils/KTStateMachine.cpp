// KTStateMachine.cpp: the state and its validation.

#include "KTStateMachine.h"

#include "KTException.h"
#include "KTString.h"

#include <cstdarg>

namespace {

constexpr int kEndOfStates = -1;

// Lines of the reports; they belong to the reports, not to this file.
constexpr int kLineOfValidate = 52;
constexpr int kLineOfValidateAny = 71;

[[noreturn]] void ThrowInvalidState(int line) {
    throw KTLCException(KTString("kKTSMExceptionInvalidState", KTString::kKTEncodingUTF8),
                        "source/private/utils/KTStateMachine", line, false);
}

} // namespace

KTStateMachine::KTStateMachine(int state) : m_State(state) {}
KTStateMachine::KTStateMachine(KTStateMachine const &other) = default;
KTStateMachine &KTStateMachine::operator=(KTStateMachine const &other) = default;
KTStateMachine::~KTStateMachine() = default;

int KTStateMachine::Get() const { return m_State; }

void KTStateMachine::Validate(int state) const {
    if (m_State != state) {
        ThrowInvalidState(kLineOfValidate);
    }
}

void KTStateMachine::Set(int state) { m_State = state; }

void KTStateMachine::ValidateAny(int first, ...) const {
    std::va_list states;
    va_start(states, first);
    int state = first;
    while (state != kEndOfStates && state != m_State) {
        state = va_arg(states, int);
    }
    va_end(states);
    if (state == kEndOfStates) {
        ThrowInvalidState(kLineOfValidateAny);
    }
}
