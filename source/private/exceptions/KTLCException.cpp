// KTLCException.cpp: internal errors, and the crash dump that is kept once for each of their sites.

#include "KTAssert.h"
#include "KTException.h"
#include "KTExceptionUtils.h"
#include "KTFileUtil.h"

#include <atomic>
#include <map>
#include <mutex>
#include <set>
#include <string>

namespace {

std::atomic<bool> g_ExtendedDebugging = false;

// The sites whose dump was kept. Exceptions are thrown on any thread, so this is locked.
class Sites {
  public:
    bool AddNew(std::string const &file, KTInt32 line) {
        std::scoped_lock const lock(m_Mutex);
        return m_Lines[file].insert(line).second;
    }

  private:
    std::mutex m_Mutex;
    std::map<std::string, std::set<KTInt32>> m_Lines;
};

Sites &DumpedSites() {
    static Sites sites;
    return sites;
}

KTString BaseName(KTString const &file) { return file.empty() ? file : KTFileUtil::GetBaseFileName(file); }

} // namespace

KTLCException::KTLCException(KTString const &reason, char const *file, KTInt32 line, bool isLogged)
    : m_Reason(reason), m_File(BaseName(KTString(file))), m_Line(line) {
    if (isLogged) {
        KTAssertFailed(m_Reason.GetUTF8String().c_str(), m_File.GetUTF8String().c_str(), m_Line);
    }
    if (g_ExtendedDebugging && DumpedSites().AddNew(m_File.GetUTF8String(), m_Line)) {
        KTExceptionUtils::CopyLastDumpToDumpOnceFolder();
    }
}

KTLCException::KTLCException(KTLCException const &other) = default;
KTLCException &KTLCException::operator=(KTLCException const &other) = default;
KTLCException::~KTLCException() = default;

KTString const &KTLCException::GetReason() const { return m_Reason; }

KTString const &KTLCException::GetFile() const { return m_File; }

int KTLCException::GetLine() const { return m_Line; }

void KTLCException::SetExtendedDebuggingEnabled(bool enabled) { g_ExtendedDebugging = enabled; }
