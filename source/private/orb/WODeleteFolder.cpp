// WODeleteFolder.cpp: deleting a tree without ever leaving it.
//
// A path that was a folder when it was listed may be a link when it is entered: whoever may write in the tree could
// send the deletion anywhere. So every folder is opened first, as itself even if it is a link, without letting others
// rename or delete it; only an opened folder that is no link is listed, and it stays open until it is empty.

#include "OFolder.h"

#include "WOError.h"
#include "WOFind.h"
#include "WOHandle.h"
#include "WOLongPath.h"
#include "WORemove.h"

#include <windows.h>

#include <string>
#include <utility>
#include <vector>

namespace {

// A folder that is being emptied.
struct Level {
    WOHandle guard;
    std::size_t pathLength = 0;         // of its path
    std::vector<std::wstring> children; // folders that are still to be deleted
};

class Deleter {
  public:
    explicit Deleter(wchar_t const *root) : m_Path(root) {}

    OError Run() {
        Enter();
        while (!m_Levels.empty()) {
            Level &level = m_Levels.back();
            m_Path.resize(level.pathLength);
            if (!level.children.empty()) {
                std::wstring const child = std::move(level.children.back());
                level.children.pop_back();
                AppendName(child);
                Enter();
                continue;
            }
            m_Levels.pop_back(); // closes the folder, which could not be deleted before
            RemoveFolder();
        }
        return m_Result;
    }

  private:
    void Fail(OError error) {
        if (m_Result == OError::None) {
            m_Result = error;
        }
    }

    void AppendName(std::wstring_view name) {
        if (!m_Path.ends_with(L'\\')) {
            m_Path.push_back(L'\\');
        }
        m_Path.append(name);
    }

    // Deletes what m_Path names, which has these attributes.
    void Remove(DWORD attributes) {
        OError const error = WORemove(m_Path.c_str(), attributes);
        if (error != OError::None) {
            Fail(error);
        }
    }

    void RemoveFolder() {
        DWORD const attributes = GetFileAttributesW(m_Path.c_str());
        if (attributes == INVALID_FILE_ATTRIBUTES) {
            Fail(WOLastError());
        } else {
            Remove(attributes);
        }
    }

    // Opens the folder at m_Path and deletes its files; or the folder itself, if it is a link.
    void Enter() {
        Level level;
        level.pathLength = m_Path.size();
        level.guard = WOHandle(CreateFileW(m_Path.c_str(), FILE_LIST_DIRECTORY | FILE_READ_ATTRIBUTES,
                                           FILE_SHARE_READ | FILE_SHARE_WRITE, nullptr, OPEN_EXISTING,
                                           FILE_FLAG_BACKUP_SEMANTICS | FILE_FLAG_OPEN_REPARSE_POINT, nullptr));
        if (!level.guard.IsValid()) {
            Fail(WOLastError());
            return;
        }
        // By the name as well: while it is open, the name cannot come to mean something else.
        BY_HANDLE_FILE_INFORMATION opened{};
        DWORD const named = GetFileAttributesW(m_Path.c_str());
        if (GetFileInformationByHandle(level.guard.Get(), &opened) == FALSE || named == INVALID_FILE_ATTRIBUTES) {
            Fail(WOLastError());
            return;
        }
        if (((opened.dwFileAttributes | named) & FILE_ATTRIBUTE_REPARSE_POINT) != 0) {
            level.guard.Close();
            Remove(named | opened.dwFileAttributes);
            return;
        }
        DeleteFiles(level);
        m_Levels.push_back(std::move(level));
    }

    void DeleteFiles(Level &level) {
        std::vector<std::pair<std::wstring, DWORD>> entries; // all but the folders
        WOFind find(m_Path);
        while (find.Next()) {
            if (find.IsFolder() && !find.IsLink()) {
                level.children.emplace_back(find.Name());
            } else {
                entries.emplace_back(find.Name(), find.Attributes());
            }
        }
        if (find.Error() != OError::None) {
            Fail(find.Error());
        }
        for (auto const &[name, attributes] : entries) {
            AppendName(name);
            Remove(attributes);
            m_Path.resize(level.pathLength);
        }
    }

    std::wstring m_Path;
    std::vector<Level> m_Levels;
    OError m_Result = OError::None;
};

} // namespace

OError ODeleteFolder(OPath const &folder) {
    OError const error = OCheckFolder(folder);
    return error != OError::None ? error : Deleter(WOLongPath(folder).c_str()).Run();
}
