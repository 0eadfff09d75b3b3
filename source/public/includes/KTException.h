// KTException.h: the exceptions that the library throws, and those that it makes of structured exceptions.
//
//     std::exception
//     ├─ KTException               a message key; What() is the user's text for it
//     │  ├─ KTFatalException       ends the program once the host hands it to KTExceptionUtils::HandleException
//     │  │  └─ WKTSEHException     a fault of the processor or the system; writes a crash dump when it is made
//     │  └─ KTNonFatalException    the operation failed, the program goes on
//     └─ KTLCException             an internal error: a state that should be impossible, with its place in the source
//
//     throw KTLCException(kKTErrorInternal, "source/private/utils/KTGraphicsStructs", 47, false);
//
//     try {
//         document.Save();
//     } catch (KTException const &exception) {
//         KTExceptionUtils::HandleException(exception);
//     }
//
// A message is found by the address of its key, not by its characters: an exception made from a key's exported constant
// answers with the cached text, one made from a KTString with the key itself (KTExceptionMsgManager.h).
//
// Copies are whole: one that holds a key of its own points at it. Distinct objects may be used from any thread.

#pragma once

#include "KTString.h"
#include "KTTypes.h"

#include <exception>
#include <string>

struct _EXCEPTION_POINTERS; // the system's; NOLINT(bugprone-reserved-identifier)

#include "KTBeginExports.h"

/// The reason of a KTLCException for a state that should be impossible; a message key.
inline constexpr char kKTErrorInternal[] = "kKTErrorInternal";

/// An error with a message for the user, named by a key.
class KT_PUBLIC_API KTException : public std::exception {
  public:
    /// Keeps the pointer itself, which must stay valid as long as any copy of this object. Null is allowed and gives an
    /// empty message. Does not throw.
    explicit KTException(char const *key);

    /// Keeps the key's UTF-8 form. Throws std::bad_alloc.
    explicit KTException(KTString &key);

    KTException(KTException const &other);
    KTException &operator=(KTException const &other);
    ~KTException() override;

    /// The key's characters, as GetExceptionType; empty for a null key. Any thread.
    char const *what() const noexcept override;

    /// The text that KTExceptionMsgManager::GetExceptionMessage gives for the key's characters. One that is not cached is
    /// valid until the next such question; those are not locked.
    virtual KTString const &What() const;

    /// The key's characters: the caller's own pointer, or those that this object holds. Null for a null key.
    char const *GetExceptionType() const;

  private:
    bool HoldsKey() const;

    char const *m_ExceptionType;
    std::string m_ExceptionTypeCopy; // the key in UTF-8; empty for a caller's pointer
};

/// An error after which the program cannot go on.
class KT_PUBLIC_API KTFatalException : public KTException {
  public:
    explicit KTFatalException(char const *key); ///< as KTException
    explicit KTFatalException(KTString &key);   ///< as KTException
    KTFatalException(KTFatalException const &other);
    KTFatalException &operator=(KTFatalException const &other);
    ~KTFatalException() override;
};

/// An error after which the program goes on.
class KT_PUBLIC_API KTNonFatalException : public KTException {
  public:
    explicit KTNonFatalException(char const *key); ///< as KTException
    KTNonFatalException(KTNonFatalException const &other);
    KTNonFatalException &operator=(KTNonFatalException const &other);
    ~KTNonFatalException() override;
};

/// A structured exception, such as an access violation, on a thread that called
/// KTExceptionUtils::InstallExceptionHandler. Its key is kKTExceptionMsgStr.
class KT_PUBLIC_API WKTSEHException : public KTFatalException {
  public:
    /// Writes a crash dump with `pointers`, the system's record of the exception (null: without), before it returns; one
    /// at a time across all threads. A dump that fails is reported in the log. Any thread.
    WKTSEHException(KTUInt32 code, _EXCEPTION_POINTERS *pointers);
    WKTSEHException(WKTSEHException const &other);
    WKTSEHException &operator=(WKTSEHException const &other);
    ~WKTSEHException() override;

    /// The structured exception's code, for example 0xC0000005 for an access violation.
    KTUInt32 getSENumber() const;

  private:
    KTUInt32 m_SENumber;
    _EXCEPTION_POINTERS *m_Pointers; // the thread's record, which a later fault on that thread replaces
};

/// An internal error: a state that should be impossible.
class KT_PUBLIC_API KTLCException : public std::exception {
  public:
    /// `reason` is a message key or a text, `file` the source file (UTF-8; null is empty), of which the base name is
    /// kept, `line` the line in it. With `isLogged` the error is also written to the log, as an assertion line of that
    /// reason, file and line, for errors that will be caught and passed over. While extended debugging is enabled, the
    /// first exception of each file and line copies the last crash dump into the folder "DumpOnce"; a failure of that is
    /// ignored. Throws std::bad_alloc. Any thread.
    KTLCException(KTString const &reason, char const *file, KTInt32 line, bool isLogged = false);
    KTLCException(KTLCException const &other);
    KTLCException &operator=(KTLCException const &other);
    ~KTLCException() override;

    KTString const &GetReason() const; ///< as it was given
    KTString const &GetFile() const;   ///< the base name: "KTGraphicsStructs"
    int GetLine() const;               ///< as it was given

    /// Switches the copies of dumps on or off for the whole process; off from the start. Any thread.
    static void SetExtendedDebuggingEnabled(bool enabled);

  private:
    KTString m_Reason;
    KTString m_File;
    KTInt32 m_Line;
};

#include "KTEndExports.h"
