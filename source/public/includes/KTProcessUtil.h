// KTProcessUtil.h: this process, other processes and their windows.
//
// A process's window is one that the user can see: a visible top-level window without an owner, so dialogs do not count.
// Where there are several, it is the one nearest to the user. Rectangles are in screen coordinates, in pixels as this
// process sees them; a minimised window has the place where the system keeps it then, far outside the screen.
//
// Image names and paths and window titles match in either case, as the system compares names.
//
// What is true of processes and windows may have changed when the answer arrives: a process id may even belong to a new
// process then. Threads: any; nothing sends a message to a window, so none of it waits for a program that hangs. Nothing
// throws but std::bad_alloc.

#pragma once

#include "KTString.h"
#include "KTTypes.h"

struct HWND__;  // what the system's HWND points to
struct tagRECT; // the system's RECT

#include "KTBeginExports.h"

class KT_PUBLIC_API KTProcessUtil {
  public:
    KTProcessUtil() = delete;

    // ---- this process and the system ----

    /// The id of this process.
    static KTUInt32 GetCurrentProcessPID();

    /// Whether another process of the same user session runs this process's executable file.
    static bool IsAnotherMeRunning();

    /// Whether the system is a 64-bit one.
    static bool Is64BitOS();

    // ---- other processes ----

    /// Bytes of memory that the process has in use right now (its working set). 0 if there is no such process or it may
    /// not be asked.
    static KTUInt64 GetProcessMemoryUsage(KTUInt32 processId);

    /// Whether a process runs whose executable file has that name, for example "notepad.exe". False for an empty name
    /// and for a path.
    static bool IsProcessOpen(KTString const &imageName);

    /// Whether the process runs. False for one that has ended, also while somebody holds a handle of it.
    static bool IsProcessRunning(KTUInt32 processId);

    // ---- windows ----

    /// The process's window; null if it has none or there is no such process.
    static HWND__ *GetTopWindowFromProcessID(KTUInt32 processId);

    /// The window of the processes that run the executable file at that path; null if there is none. Relative paths are
    /// completed from the current folder, short names from the disk. (Hosts link it by this name.)
    static HWND__ *GetProcessWidnowUsingProcessImagePath(KTString const &imagePath);

    /// Where the window of the processes is whose executable file has that name. False, with `rectangle` unchanged, if
    /// there is none.
    static bool GetProcessWindowRectUsingProcessImageName(KTString const &imageName, tagRECT &rectangle);

    /// Where the window with that title is, whose ever it is. False, with `rectangle` unchanged, if there is none or the
    /// title is empty.
    static bool GetProcessWindowRectUsingWindowTitle(KTString const &title, tagRECT &rectangle);
};

#include "KTEndExports.h"
