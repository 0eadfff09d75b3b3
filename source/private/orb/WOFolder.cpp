// WOFolder.cpp: making and listing folders.

#include "OFolder.h"

#include "OCaseFold.h"
#include "OUtf.h"
#include "WOError.h"
#include "WOFind.h"
#include "WOLongPath.h"

#include <windows.h>

#include <utility>
#include <vector>

namespace {

OError MakeOne(wchar_t const *name) { return CreateDirectoryW(name, nullptr) != FALSE ? OError::None : WOLastError(); }

bool IsFolderThere(wchar_t const *name) {
    DWORD const attributes = GetFileAttributesW(name);
    return attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
}

// The same, where a folder that is there will do: also one that another process has just made. A root is denied rather
// than found to exist.
OError MakeOrFind(OPath const &path) {
    WOLongPath const name(path);
    OError const error = MakeOne(name.c_str());
    bool const mayBeThere = error == OError::AlreadyExists || error == OError::AccessDenied;
    return mayBeThere && IsFolderThere(name.c_str()) ? OError::None : error;
}

// Goes up to a folder that is there, then down again. By lengths of the one text: there may be more folders on the way
// than calls fit the stack.
OError MakeWithParents(OPath const &full) {
    std::vector<std::size_t> missing;
    OPath place(full);
    OError error = MakeOrFind(place);
    while (error == OError::NotFound) {
        missing.push_back(place.GetString().length());
        place = place.GetParent();
        if (place.IsEmpty()) {
            return error;
        }
        error = MakeOrFind(place);
    }
    for (; error == OError::None && !missing.empty(); missing.pop_back()) {
        error = MakeOrFind(OPath(OString(full.GetString().c_str(), missing.back())));
    }
    return error;
}

// A walk over a folder, and over those below it if they are wanted. Folders that are still to be read are kept in a
// list: the tree may be deeper than the stack.
class Lister {
  public:
    Lister(WOLongPath const &folder, OListing const &wanted, std::vector<KTString> &names)
        : m_Wanted(wanted), m_Names(names), m_Root(folder.c_str()) {
        if (!m_Root.ends_with(L'\\')) {
            m_Root.push_back(L'\\');
        }
    }

    OError Run() {
        OError result = ReadFolder(L"");
        while (!m_Pending.empty()) {
            std::wstring const below = std::move(m_Pending.back());
            m_Pending.pop_back();
            OError const error = ReadFolder(below);
            if (result == OError::None && error != OError::NotFound) { // deleted meanwhile: no longer in the tree
                result = error;
            }
        }
        return result;
    }

  private:
    // `below` is the way from the root, with a back slash at its end unless it is empty.
    OError ReadFolder(std::wstring const &below) {
        KTUnits path = OWideToUnits(below.data(), below.size());
        std::size_t const prefix = path.size();
        WOFind find(m_Root + below);
        while (find.Next()) {
            if (!find.IsFolder()) {
                path.resize(prefix);
                for (wchar_t const *unit = find.Name(); *unit != 0; ++unit) {
                    path.push_back(*unit);
                }
                if (IsWanted(path, prefix)) {
                    m_Names.emplace_back().append(path.data(), path.size());
                }
            } else if (m_Wanted.recursive && !find.IsLink()) {
                m_Pending.push_back(below + find.Name() + L'\\');
            }
        }
        return find.Error();
    }

    bool IsWanted(KTUnits const &path, std::size_t prefix) const {
        if (m_Wanted.all) {
            return true;
        }
        // Without an extension, names without a dot behind their first unit are meant.
        std::size_t const dot = path.rfind('.');
        bool const hasDot = dot != KTUnits::npos && dot > prefix;
        if (m_Wanted.extension.empty()) {
            return !hasDot;
        }
        std::size_t const length = m_Wanted.extension.size();
        return path.size() > prefix + length && OFoldCase(path.substr(path.size() - length)) == m_Wanted.extension;
    }

    OListing const &m_Wanted;
    std::vector<KTString> &m_Names;
    std::wstring m_Root;
    std::vector<std::wstring> m_Pending;
};

} // namespace

OError OMakeFolder(OPath const &path, bool parents) {
    WOLongPath const name(path);
    if (!name.IsValid()) {
        return OError::InvalidName;
    }
    return parents ? MakeWithParents(OGetFullPath(path)) : MakeOne(name.c_str());
}

OError OListFolder(OPath const &folder, OListing const &wanted, std::vector<KTString> &names) {
    OError const error = OCheckFolder(folder);
    return error != OError::None ? error : Lister(WOLongPath(folder), wanted, names).Run();
}
