// KTExceptionUtils.h: crash handling: structured exceptions become C++ exceptions with a crash dump, and a fatal error
// saves the user's work, tells the user and ends the process in order.
//
//     int main() {
//         KTExceptionUtils::InstallExceptionHandler();           // on each thread that may fault
//         RegisterBackUpDataCallBack(&SaveBackUpFiles);
//         KTExceptionUtils::RegisterCleanUpCallBack(&CloseDatabase);
//         try {
//             RunApplication();
//         } catch (KTException const &exception) {               // WKTSEHException is one of them
//             KTExceptionUtils::HandleException(exception);      // does not return after a fatal error
//         }
//     }
//
// A fatal error, once the host has handed it over and no client handler is set, goes this way: the data back-up
// callback; a message box, which waits for the user; the thread's previous translator put back; the clean-up callbacks;
// the end of the process with status 1, without static destructors. docs/exceptions.md tells more.
//
// Failures in here become assertion lines in the log and are never thrown.
//
// Threads: installing, handling and dumping may happen on any thread. The callbacks and the clean-up list are not
// locked: set them up on one thread at start-up.

#pragma once

#include "KTErrorCodes.h"
#include "KTException.h"
#include "KTLocks.h"
#include "KTPath.h"
#include "KTString.h"

#include <atomic>

#include "KTBeginExports.h"

/// Saves the user's work as back-up files. The result is for the host's own use.
using KTBackUpDataCallBack = KTErrorCodeEnum (*)();

/// Cleans up before the process ends after a fatal error. REQUIRES: unregisters itself when it runs; else it is called
/// again without end.
using KTCleanUpCallBack = void (*)();

/// Stores the data back-up callback; null is allowed. Not locked.
KT_PUBLIC_API void RegisterBackUpDataCallBack(KTBackUpDataCallBack callback);

/// Forgets the data back-up callback. Not locked.
KT_PUBLIC_API void UnRegisterBackUpDataCallBack();

/// A host's own handling of the exceptions that it hands to KTExceptionUtils::HandleException.
class KT_PUBLIC_API IKTExceptionHandler {
  public:
    /// Called on the thread that called KTExceptionUtils::HandleException. What it throws is reported in the log.
    virtual void HandleException(KTException const &exception) = 0;

    virtual ~IKTExceptionHandler();
};

/// The crash handling of the process.
class KT_PUBLIC_API KTExceptionUtils {
  public:
    KTExceptionUtils(KTExceptionUtils const &) = delete;
    KTExceptionUtils &operator=(KTExceptionUtils const &) = delete;

    virtual ~KTExceptionUtils();

    /// Installs the platform's translator of structured exceptions on the calling thread.
    virtual void InstallExceptionHandlerImpl() = 0;

    /// Handles a fatal error as the top of this file says. Sets the crashed flag; returns at once if another call, on
    /// any thread, came before. Throws what the callbacks throw.
    virtual void DefaultHandler(KTException const &exception) = 0;

    /// Puts back the translator that the calling thread had before its first InstallExceptionHandler. Changes nothing on
    /// a thread that installed none.
    virtual void RestorePreviousHandler() const = 0;

    /// The one instance, made by the first call.
    static KTExceptionUtils &GetInstance();

    /// From now on structured exceptions on the calling thread become WKTSEHExceptions, thrown where they were raised.
    /// Installing again on a thread changes nothing. Costs nothing until a fault. Never throws: a failure is reported
    /// in the log. Code that faults needs the compiler option that this library's CMake target passes on.
    static void InstallExceptionHandler();

    /// Hands the exception to the client handler, or to DefaultHandler if none is set. What either throws is reported in
    /// the log.
    static void HandleException(KTException const &exception);

    /// Lets the host handle exceptions itself. The handler must live until the process ends.
    void SetHandler(IKTExceptionHandler &handler);

    /// Whether DefaultHandler was called.
    bool IsApplicationCrashed() const;

    /// Appends a callback to the list of those that run before the process ends after a fatal error, in order.
    /// kKTErrorFailed if it is in the list already, or null.
    static KTErrorCodeEnum RegisterCleanUpCallBack(KTCleanUpCallBack callback);

    /// Removes a callback. kKTErrorFailed if it is not in the list.
    static KTErrorCodeEnum UnRegisterCleanUpCallBack(KTCleanUpCallBack callback);

    /// Writes a crash dump ("KtDump" + GUID + ".dmp") of this process to the dump folder. `pointers` is the system's
    /// record of an exception on the calling thread (EXCEPTION_POINTERS), or null for a dump without one. A failure is
    /// reported in the log. Direct calls are not serialised: one thread at a time.
    static void GenerateCrashDumpFile(void *pointers);

    /// The folder "Dump" in the session folder, created if it is missing; empty if this process has no session folder.
    /// Throws std::bad_alloc.
    static KTPath GetDumpFolderPath();

    /// Copies the last crash dump into the folder "DumpOnce" of the dump folder, replacing a copy that is there. Nothing
    /// happens if there is none; a failure is ignored. Not locked against a dump that is being written.
    static void CopyLastDumpToDumpOnceFolder();

  protected:
    KTExceptionUtils();

    /// Calls the first clean-up callback until the list is empty.
    static void RunCleanUpCallBacks();

    /// Sets the crashed flag; true for the first caller in the process.
    bool EnterDefaultHandler();

    static KTMutex m_Mutex; ///< serialises crash handling

  private:
    static KTString GetDumpFileName();

    std::atomic<bool> m_ApplicationCrashed;
    std::atomic<IKTExceptionHandler *> m_ClientHandler;
};

#include "KTEndExports.h"
