// KTLogger.cpp: the log file and the writing of one line.

#include "KTLogger.h"

#include "KTFileUtil.h"
#include "KTLogText.h"

#include <charconv>
#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <filesystem>
#include <fstream>

namespace {

KTPath LogFilePath() {
    KTPath path = KTFileUtil::GetSystemTempFolder().GetPath();
    path.Append("ktap_log.txt");
    return path;
}

// Opens the file by its UTF-8 name, whatever the process's code page: authors' folders have names in every script.
std::unique_ptr<std::ofstream> OpenLogFile(KTPath const &path) {
    std::string const utf8 = path.GetPathAsKTString().GetUTF8String();
    std::u8string const name(utf8.begin(), utf8.end());
    return std::make_unique<std::ofstream>(std::filesystem::path(name),
                                           std::ios::out | std::ios::trunc | std::ios::binary);
}

} // namespace

KTInt64 KTLogMilliseconds(std::clock_t clock) {
    return static_cast<KTInt64>(static_cast<double>(clock) / 1000.0 * 1000.0);
}

KTLogger::KTLogger() : m_Enabled(true), m_LogFilePath(LogFilePath()) { m_Stream = OpenLogFile(m_LogFilePath); }

KTLogger::~KTLogger() { m_Stream->close(); }

bool KTLogger::IsLogEnabled() const { return m_Enabled; }

void KTLogger::LogEnableAtRuntime(bool enable) { m_Enabled = enable; }

KTPath const &KTLogger::GetLogFilePath() const { return m_LogFilePath; }

void KTLogger::Log(std::string const &message) {
    if (!m_Enabled) {
        return;
    }
    KTLock const lock(m_Mutex);
    char number[24];
    auto const digits = std::to_chars(number, number + sizeof number, KTLogMilliseconds(std::clock()));
    std::string line;
    line.reserve(sizeof number + message.size() + 3);
    line.append(number, digits.ptr).append(": ").append(message).push_back('\n');
    m_Stream->write(line.data(), static_cast<std::streamsize>(line.size()));
    m_Stream->flush();
}

void KTLogger::Log(char const *const format, ...) {
    if (!m_Enabled) {
        return;
    }
    std::va_list values;
    va_start(values, format);
    std::string const message = KTFormatLogText(format, values);
    va_end(values);
    Log(message);
}
