// WOFind.cpp: the system's search for all names.

#include "WOFind.h"

#include "WOError.h"

WOFind::WOFind(std::wstring const &folder) // NOLINT(cppcoreguidelines-pro-type-member-init): the system fills m_Data
    : m_Search(INVALID_HANDLE_VALUE) {
    std::wstring const pattern = folder + (folder.ends_with(L'\\') ? L"*" : L"\\*");
    // Without short names, and with the larger buffer: both make long folders faster.
    m_Search = FindFirstFileExW(pattern.c_str(), FindExInfoBasic, &m_Data, FindExSearchNameMatch, nullptr,
                                FIND_FIRST_EX_LARGE_FETCH);
    m_HasFirst = m_Search != INVALID_HANDLE_VALUE;
    if (!m_HasFirst && GetLastError() != ERROR_FILE_NOT_FOUND) { // an empty root has not even "." in it
        m_Error = WOLastError();
    }
}

WOFind::~WOFind() {
    if (m_Search != INVALID_HANDLE_VALUE) {
        FindClose(m_Search);
    }
}

bool WOFind::IsDots() const {
    wchar_t const *const name = m_Data.cFileName;
    return name[0] == L'.' && (name[1] == 0 || (name[1] == L'.' && name[2] == 0));
}

bool WOFind::Next() {
    if (m_Search == INVALID_HANDLE_VALUE) {
        return false;
    }
    for (;;) {
        if (!m_HasFirst && FindNextFileW(m_Search, &m_Data) == FALSE) {
            if (GetLastError() != ERROR_NO_MORE_FILES) {
                m_Error = WOLastError();
            }
            return false;
        }
        m_HasFirst = false;
        if (!IsDots()) {
            return true;
        }
    }
}
