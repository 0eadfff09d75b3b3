// KTTempFileHolder.cpp: the list of temporary files.

#include "KTTempFileHolder.h"

#include <algorithm>

KTTempFileHolder::KTTempFileHolder() = default;

KTTempFileHolder::KTTempFileHolder(KTFile const &file) : m_Files{file} {}

KTTempFileHolder::KTTempFileHolder(std::vector<KTFile> const &files) { AddFile(files); }

KTErrorCodeEnum KTTempFileHolder::AddFile(KTFile const &file) {
    if (std::find(m_Files.begin(), m_Files.end(), file) != m_Files.end()) {
        return kKTErrorFailed;
    }
    m_Files.push_back(file);
    return kKTErrorNone;
}

KTErrorCodeEnum KTTempFileHolder::AddFile(std::vector<KTFile> const &files) {
    KTErrorCodeEnum result = kKTErrorNone;
    for (KTFile const &file : files) {
        if (AddFile(file) != kKTErrorNone) {
            result = kKTErrorFailed;
        }
    }
    return result;
}

std::vector<KTFile> KTTempFileHolder::GetFileList() const { return m_Files; }
