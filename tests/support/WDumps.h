// WDumps.h: the crash dumps of a process, and what another reader is to find in them.
//
// Dumps worth reading are copied to the folder "dumps" of the test program's temporary folder, each with a text of the
// same name that says what is to be in it; the test crash_dumps reads them (tests/crash/check-dumps).

#pragma once

#include "KTExceptionUtils.h"

#include <windows.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <set>
#include <string>

namespace wdumps {

namespace fs = std::filesystem;

/// The ".dmp" files in a folder and below it; DumpOnce is a folder below.
inline std::set<fs::path> In(fs::path const &folder) {
    std::set<fs::path> dumps;
    std::error_code ignored;
    for (auto const &entry : fs::recursive_directory_iterator(folder, ignored)) {
        if (entry.path().extension() == ".dmp") {
            dumps.insert(entry.path());
        }
    }
    return dumps;
}

/// This process's dump folder.
inline fs::path Folder() { return KTExceptionUtils::GetDumpFolderPath().GetPathAsKTString().GetWstring(); }

/// The dumps written since it was made.
class Written {
  public:
    Written() : m_Before(In(Folder())) {}

    std::set<fs::path> Take() {
        std::set<fs::path> fresh;
        for (fs::path const &dump : In(Folder())) {
            if (m_Before.insert(dump).second) {
                fresh.insert(dump);
            }
        }
        return fresh;
    }

  private:
    std::set<fs::path> m_Before;
};

/// What a dump's exception stream is to say.
struct Expected {
    DWORD code = 0;
    ULONG64 address = 0;
    DWORD thread = 0;
    ULONG64 instruction = 0; ///< in the thread's context
};

inline void Keep(fs::path const &dump, std::string const &name, std::string const &expected) {
    fs::path const folder = fs::temp_directory_path() / "dumps";
    fs::create_directories(folder);
    fs::copy_file(dump, folder / (name + ".dmp"), fs::copy_options::overwrite_existing);
    std::ofstream(folder / (name + ".txt"), std::ios::binary) << expected << "\n";
}

/// The expectation as the reader's script writes what it found.
inline std::string Describe(Expected const &e) {
    char text[160];
    std::snprintf(text, sizeof text, "code=0x%lX address=0x%llX thread=0x%lX rip=0x%llX", e.code, e.address, e.thread,
                  e.instruction);
    return text;
}

inline void Keep(fs::path const &dump, std::string const &name, Expected const &e) { Keep(dump, name, Describe(e)); }

/// Keeps a dump that was written without an exception.
inline void KeepWithout(fs::path const &dump, std::string const &name) { Keep(dump, name, "none"); }

/// Sees each structured exception of the process before the library does, and remembers this thread's last one.
class Observer {
  public:
    Observer() : m_Handler(AddVectoredExceptionHandler(1, &Observe)) {}
    Observer(Observer const &) = delete;
    Observer &operator=(Observer const &) = delete;
    ~Observer() { RemoveVectoredExceptionHandler(m_Handler); }

    static Expected Last() { return Slot(); }

  private:
    static Expected &Slot() {
        static thread_local Expected last;
        return last;
    }

    static LONG CALLBACK Observe(EXCEPTION_POINTERS *pointers) {
        constexpr DWORD kThrow = 0x474343;
        EXCEPTION_RECORD const &record = *pointers->ExceptionRecord;
        if ((record.ExceptionCode & 0xFFFFFF) != kThrow) {
            Slot() = {record.ExceptionCode, reinterpret_cast<ULONG64>(record.ExceptionAddress), GetCurrentThreadId(),
                      pointers->ContextRecord->Rip};
        }
        return EXCEPTION_CONTINUE_SEARCH;
    }

    void *m_Handler;
};

} // namespace wdumps
