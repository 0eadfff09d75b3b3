// Autosave.cpp: the lines and their file.

#include "Autosave.h"

#include "KTFile.h"
#include "KTFileUtil.h"

#include <filesystem>
#include <fstream>

namespace {

KTPath InSessionFolder(char const *name) {
    KTPath path = KTFileUtil::GetSessionTempFolder();
    path.Append(name);
    return path;
}

bool Write(KTPath const &path, std::vector<std::string> const &lines) {
    std::ofstream file(std::filesystem::path(KTFile(path).GrabTString()), std::ios::binary);
    for (std::string const &line : lines) {
        file << line << '\n';
    }
    file.close();
    return !file.fail();
}

} // namespace

void Autosave::Add(std::string const &line) {
    std::lock_guard const lock(m_Mutex);
    m_Lines.push_back(line);
}

void Autosave::Save() {
    std::vector<std::string> lines;
    {
        std::lock_guard const lock(m_Mutex);
        if (m_Lines.size() == m_Saved) {
            return;
        }
        lines = m_Lines;
    }
    KTPath const written = InSessionFolder("autosave.new");
    bool const isSaved = Write(written, lines) &&
                         KTFileUtil::MoveFileW(KTFile(written), KTFile(FilePath()), true) == KTFileUtil::kErrorNone;
    std::lock_guard const lock(m_Mutex);
    m_Tried = lines.size();
    if (isSaved) {
        m_Saved = lines.size();
        ++m_Writes;
    }
}

std::size_t Autosave::Lines() const {
    std::lock_guard const lock(m_Mutex);
    return m_Lines.size();
}

std::size_t Autosave::Saved() const {
    std::lock_guard const lock(m_Mutex);
    return m_Saved;
}

std::size_t Autosave::Tried() const {
    std::lock_guard const lock(m_Mutex);
    return m_Tried;
}

std::size_t Autosave::Writes() const {
    std::lock_guard const lock(m_Mutex);
    return m_Writes;
}

KTPath Autosave::FilePath() { return InSessionFolder("autosave.txt"); }
