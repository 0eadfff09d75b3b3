// WConsole.cpp: the streams through the system's own calls.

#include "WConsole.h"

#include "OUtf.h"

#include <windows.h>

#include <algorithm>

namespace {

constexpr std::size_t kPiece = std::size_t{1} << 16;

bool WriteBytes(HANDLE handle, std::string_view bytes) {
    while (!bytes.empty()) {
        DWORD done = 0;
        if (WriteFile(handle, bytes.data(), static_cast<DWORD>(std::min(bytes.size(), kPiece)), &done, nullptr) ==
                FALSE ||
            done == 0) {
            return false;
        }
        bytes.remove_prefix(done);
    }
    return true;
}

bool WriteUnits(HANDLE console, std::string_view bytes) {
    KTUnits const units = OUtf8ToUnits(bytes);
    constexpr std::size_t kAtOnce = 8192; // older consoles take no more than 64 KiB in one call
    for (std::size_t at = 0; at < units.size();) {
        DWORD done = 0;
        DWORD const count = static_cast<DWORD>(std::min(units.size() - at, kAtOnce));
        if (WriteConsoleW(console, units.data() + at, count, &done, nullptr) == FALSE || done == 0) {
            return false;
        }
        at += done;
    }
    return true;
}

bool WriteStream(DWORD which, std::string_view bytes) {
    HANDLE const handle = GetStdHandle(which);
    if (handle == nullptr || handle == INVALID_HANDLE_VALUE) {
        return false;
    }
    DWORD mode = 0;
    return GetConsoleMode(handle, &mode) != FALSE ? WriteUnits(handle, bytes) : WriteBytes(handle, bytes);
}

} // namespace

void Console::Print(std::string_view text) {
    m_Pending += text;
    if (m_Pending.size() >= kPiece) {
        // A character is not cut in two: a console gets whole ones only.
        std::size_t whole = m_Pending.size();
        while (whole != 0 && (static_cast<unsigned char>(m_Pending[whole - 1]) & 0xC0U) == 0x80) {
            --whole;
        }
        whole -= whole != 0 && static_cast<unsigned char>(m_Pending[whole - 1]) >= 0xC0 ? 1 : 0;
        m_Failed = m_Failed || !WriteStream(STD_OUTPUT_HANDLE, std::string_view(m_Pending).substr(0, whole));
        m_Pending.erase(0, whole);
    }
}

void Console::PrintError(std::string_view text) {
    Flush();
    WriteStream(STD_ERROR_HANDLE, text);
}

bool Console::Flush() {
    m_Failed = m_Failed || !WriteStream(STD_OUTPUT_HANDLE, m_Pending);
    m_Pending.clear();
    return !m_Failed;
}
