// KTStateMachine.h: one state, and an exception for who meets an object in a state that was not expected.
//
//     enum { kClosed, kOpen, kBroken };
//
//     void Document::Save() {
//         m_State.ValidateAny(kOpen, kBroken, -1);    // throws unless open or broken
//         ...
//     }
//
// WRONG: ValidateAny(kOpen, kBroken). The list has no end: what follows in memory is read as states.
//
// Threads: one object is not locked.

#pragma once

#include "KTBeginExports.h"

/// The read-only view of a state machine. Not for deleting objects through it.
class KT_PUBLIC_API IKTStateMachineRO {
  public:
    // The virtual functions keep this order: hosts rely on it.

    /// The current state.
    virtual int Get() const = 0;

    /// Returns if the current state is `state`; throws otherwise, as KTStateMachine says.
    virtual void Validate(int state) const = 0;

  protected:
    ~IKTStateMachineRO() = default;
};

/// A state: one value of the caller's own enumeration. All ints are states, but -1 cannot be tested by ValidateAny.
///
/// What throws throws a KTLCException with the reason "kKTSMExceptionInvalidState", a localisation key, and changes
/// nothing.
class KT_PUBLIC_API KTStateMachine : public IKTStateMachineRO {
  public:
    /// With an initial state.
    explicit KTStateMachine(int state);
    KTStateMachine(KTStateMachine const &other);            ///< with the other's state
    KTStateMachine &operator=(KTStateMachine const &other); ///< takes the other's state

    int Get() const override;
    void Validate(int state) const override;
    virtual ~KTStateMachine();

    /// Sets the state; any state may follow any other.
    void Set(int state);

    /// Returns as soon as one of the states, in the order of the arguments, equals the current one; throws when none
    /// does, or when the first argument is -1 already. REQUIRES: all arguments are ints, the last one is -1.
    void ValidateAny(int first, ...) const;

  private:
    int m_State;
};

#include "KTEndExports.h"
