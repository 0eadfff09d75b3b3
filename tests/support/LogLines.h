// LogLines.h: what the library wrote to its log since a point in a test.

#pragma once

#include "KTLogger.h"

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

/// The bytes of the log file.
inline std::string ReadLogFile() {
    std::string const utf8 = gKTLogger->GetLogFilePath().GetPathAsKTString().GetUTF8String();
    std::ifstream file(std::filesystem::path(std::u8string(utf8.begin(), utf8.end())), std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

/// Remembers the log's length and gives the lines written since, without their number and ": ".
class LogLines {
  public:
    LogLines() : m_Start(ReadLogFile().size()) {}

    std::vector<std::string> Take() {
        std::string const bytes = ReadLogFile();
        std::vector<std::string> lines;
        while (m_Start < bytes.size()) {
            std::size_t const end = bytes.find('\n', m_Start);
            std::string const line = bytes.substr(m_Start, end - m_Start);
            lines.push_back(line.substr(line.find(": ") + 2));
            m_Start = end == std::string::npos ? bytes.size() : end + 1;
        }
        return lines;
    }

  private:
    std::size_t m_Start;
};
