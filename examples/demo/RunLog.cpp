// RunLog.cpp: the demo's lines in the library's log.

#include "RunLog.h"

#include "WDisk.h"

#include <algorithm>

// There is no logger if the library had no memory for one when it was loaded.
bool RunLog::Count() {
    if (gKTLogger == nullptr || !gKTLogger->IsLogEnabled()) {
        return false;
    }
    ++m_Lines;
    return true;
}

void RunLog::Step(std::string const &text) {
    if (Count()) {
        gKTLogger->Log(text);
    }
}

void RunLog::WorkerStep(int worker, std::string const &file, std::string const &text) {
    Step("worker " + std::to_string(worker) + ": " + file + ": " + text);
}

void RunLog::WorkerStarted(int worker) {
    if (Count()) {
        gKTLogger->Log("worker %d: started", worker);
    }
}

void RunLog::WorkerEnded(int worker, int files) {
    if (Count()) {
        gKTLogger->Log(L"worker %d: ended, files read: %d", worker, files);
    }
}

KTUInt64 RunLog::LinesInFile() {
    constexpr KTUInt64 kLimit = 1ULL << 28;
    std::string const bytes = DiskRead(FilePath(), kLimit).bytes;
    return static_cast<KTUInt64>(std::count(bytes.begin(), bytes.end(), '\n'));
}

KTPath RunLog::FilePath() { return gKTLogger == nullptr ? KTPath() : gKTLogger->GetLogFilePath(); }
