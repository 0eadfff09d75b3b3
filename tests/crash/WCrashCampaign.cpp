// WCrashCampaign.cpp: ktcrash, which starts processes that crash in random ways at random moments while they save
// documents, and looks at what is left.
//
//     ktcrash COUNT FIRST FOLDER      children FIRST to FIRST+COUNT-1, each seeded with its number, two at a time
//
// A child saves one document after the other on a worker thread. A fault of random kind strikes the worker, the main
// thread or a third one. The child's host hands the exception over as any host does: the back-up callback saves the
// current document as ".ktbak", the message box is answered, the process ends. The parent then asks
//
//     did it end with status 1?     is there one dump?     did the back-up callback run, and is its file whole?
//     is every document that was saved before still whole?
//
// Dumps go to FOLDER/dumps, each with a text of what is to be in it, for check-dumps. Exit status 0 if all is well. The
// folder of a child that failed stays.

#include "CampaignDocument.h"
#include "KTPublic.h"
#include "WDumps.h"
#include "WFaults.h"
#include "WMessageBox.h"
#include "WOHandle.h"

#include <windows.h>

#include <boost/thread/thread.hpp>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>
#include <string>
#include <vector>

namespace {

namespace fs = std::filesystem;

constexpr int kLastDocument = 100;
constexpr DWORD kChildTimeout = 300'000;
constexpr std::size_t kTogether = 2;

KTFile FileAt(fs::path const &path) { return KTFile(KTString(path.c_str())); }

std::uint32_t DocumentSeed(std::uint32_t child, int number) {
    return child * 2654435761U + static_cast<unsigned>(number);
}

fs::path DocumentPath(fs::path const &folder, int number) {
    return folder / ("document-" + std::to_string(number) + ".ktdoc");
}

void Append(fs::path const &path, std::string const &line) {
    std::ofstream(path, std::ios::binary | std::ios::app) << line << "\n";
}

// ---- the child ----

std::uint32_t g_Child;
std::atomic<int> g_Current = 0; // the document that is being saved

fs::path Folder() { return fs::temp_directory_path(); }

KTErrorCodeEnum BackUp() {
    int const number = g_Current;
    bool const isSaved = CampaignDocument(DocumentSeed(g_Child, number))
                             .Save(FileAt(DocumentPath(Folder(), number).replace_extension(".ktbak")), [] {});
    Append(Folder() / "backup.txt", std::to_string(number) + (isSaved ? " saved" : " failed"));
    return isSaved ? kKTErrorNone : kKTErrorFailed;
}

// A host's thread: whatever ends it is handed over.
template <typename Body> void Guarded(Body body) {
    KTExceptionUtils::InstallExceptionHandler();
    try {
        body();
    } catch (KTException const &exception) {
        std::ofstream(Folder() / "expected.txt", std::ios::binary)
            << wdumps::Describe(wdumps::Observer::Last()) << "\n";
        KTExceptionUtils::HandleException(exception);
    }
}

void FaultInTheLibrary() { KTString const text(wfaults::BadAddress<unsigned short const *>()); }

void Fault(std::uint32_t choice) {
    constexpr std::size_t kKinds = std::size(kFaults);
    if (choice % (kKinds + 1) == kKinds) {
        FaultInTheLibrary();
    } else {
        kFaults[choice % (kKinds + 1)].raise();
    }
}

void SaveAll(int objectsUntilFault, std::uint32_t choice) {
    for (int number = 1; number <= kLastDocument; ++number) {
        g_Current = number;
        bool const isSaved = CampaignDocument(DocumentSeed(g_Child, number))
                                 .Save(FileAt(DocumentPath(Folder(), number)), [&objectsUntilFault, choice] {
                                     if (objectsUntilFault-- == 0) {
                                         Fault(choice);
                                     }
                                 });
        if (isSaved) {
            Append(Folder() / "saved.txt", std::to_string(number));
        }
    }
}

void FaultLater(std::uint32_t microseconds, std::uint32_t choice) {
    while (g_Current == 0) {
        SwitchToThread();
    }
    LARGE_INTEGER frequency;
    LARGE_INTEGER now;
    QueryPerformanceFrequency(&frequency);
    QueryPerformanceCounter(&now);
    LONGLONG const end = now.QuadPart + static_cast<LONGLONG>(microseconds) * frequency.QuadPart / 1'000'000;
    while (now.QuadPart < end) {
        QueryPerformanceCounter(&now);
    }
    Fault(choice);
}

int RunChild(std::uint32_t number) {
    g_Child = number;
    std::mt19937 random(number);
    std::uint32_t const place = random() % 3;
    std::uint32_t const choice = random();
    int const objects = place == 0 ? static_cast<int>(random() % 20'000) : -1;
    std::uint32_t const microseconds = random() % 300'000;
    RegisterBackUpDataCallBack(&BackUp);
    wdumps::Observer const observer;
    WMessageBox const user(L"Quillon Veltrain", [](WMessageBox::Seen const &) {});
    boost::thread_group threads;
    threads.create_thread([=] { Guarded([=] { SaveAll(objects, choice); }); });
    if (place == 1) {
        Guarded([=] { FaultLater(microseconds, choice); });
    } else if (place == 2) {
        threads.create_thread([=] { Guarded([=] { FaultLater(microseconds, choice); }); });
    }
    threads.join_all();
    return 0; // not reached: the process ends in the default handler
}

// ---- the parent ----

struct Child {
    std::uint32_t number = 0;
    fs::path folder;
    WOHandle process;
};

Child Start(std::uint32_t number, fs::path const &folder) {
    Child child{number, folder / ("child-" + std::to_string(number)), {}};
    fs::remove_all(child.folder);
    fs::create_directories(child.folder);
    SetEnvironmentVariableW(L"TEMP", child.folder.c_str());
    SetEnvironmentVariableW(L"TMP", child.folder.c_str());
    wchar_t program[MAX_PATH];
    GetModuleFileNameW(nullptr, program, MAX_PATH);
    std::wstring command = L"\"" + std::wstring(program) + L"\" --child " + std::to_wstring(number);
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    PROCESS_INFORMATION process{};
    if (CreateProcessW(nullptr, command.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &startup, &process) !=
        FALSE) {
        CloseHandle(process.hThread);
        child.process = WOHandle(process.hProcess);
    }
    return child;
}

// The documents that were saved before the crash, as the child wrote them down.
std::string CheckDocuments(Child const &child, int &count) {
    std::ifstream saved(child.folder / "saved.txt");
    for (int number = 0; saved >> number; ++count) {
        if (!CampaignDocument(DocumentSeed(child.number, number)).IsIn(FileAt(DocumentPath(child.folder, number)))) {
            return "document " + std::to_string(number) + " was harmed";
        }
    }
    return "";
}

std::string CheckBackUp(Child const &child) {
    std::ifstream file(child.folder / "backup.txt");
    int number = 0;
    std::string result;
    if (!(file >> number >> result)) {
        return "the back-up callback did not run";
    }
    auto const path = DocumentPath(child.folder, number).replace_extension(".ktbak");
    bool const isWhole = CampaignDocument(DocumentSeed(child.number, number)).IsIn(FileAt(path));
    return result == "saved" && isWhole ? "" : "the back-up is not whole";
}

std::string Check(Child const &child, fs::path const &dumpFolder, int &documents) {
    if (!child.process.IsValid() || WaitForSingleObject(child.process.Get(), kChildTimeout) != WAIT_OBJECT_0) {
        TerminateProcess(child.process.Get(), 99);
        return "did not start or did not end";
    }
    DWORD status = 0;
    GetExitCodeProcess(child.process.Get(), &status);
    if (status != 1) {
        return "ended with status " + std::to_string(status);
    }
    auto const dumps = wdumps::In(child.folder);
    if (dumps.size() != 1) {
        return "wrote " + std::to_string(dumps.size()) + " dumps";
    }
    std::string problem = CheckBackUp(child);
    problem = problem.empty() ? CheckDocuments(child, documents) : problem;
    if (problem.empty()) {
        fs::path const target = dumpFolder / ("child-" + std::to_string(child.number));
        fs::copy_file(*dumps.begin(), fs::path(target) += ".dmp", fs::copy_options::overwrite_existing);
        fs::copy_file(child.folder / "expected.txt", fs::path(target) += ".txt", fs::copy_options::overwrite_existing);
    }
    return problem;
}

int RunParent(std::uint32_t count, std::uint32_t first, fs::path const &folder) {
    fs::create_directories(folder / "dumps");
    std::vector<Child> running;
    int failed = 0;
    int documents = 0;
    std::uint32_t next = first;
    while (next < first + count || !running.empty()) {
        while (next < first + count && running.size() < kTogether) {
            running.push_back(Start(next++, folder));
        }
        Child const child = std::move(running.front());
        running.erase(running.begin());
        std::string const problem = Check(child, folder / "dumps", documents);
        if (problem.empty()) {
            std::error_code ignored;
            fs::remove_all(child.folder, ignored);
        } else {
            ++failed;
            std::printf("child %u: %s\n", child.number, problem.c_str());
            std::fflush(stdout);
        }
    }
    std::printf("%u processes crashed, %d failed, %d documents saved before and checked\n", count, failed, documents);
    return failed == 0 ? 0 : 1;
}

} // namespace

int wmain(int count, wchar_t **arguments) {
    if (count == 3 && std::wstring(arguments[1]) == L"--child") {
        return RunChild(static_cast<std::uint32_t>(std::wcstoul(arguments[2], nullptr, 10)));
    }
    if (count != 4) {
        std::fputs("usage: ktcrash COUNT FIRST FOLDER\n", stderr);
        return 2;
    }
    return RunParent(static_cast<std::uint32_t>(std::wcstoul(arguments[1], nullptr, 10)),
                     static_cast<std::uint32_t>(std::wcstoul(arguments[2], nullptr, 10)),
                     std::filesystem::absolute(arguments[3]));
}
