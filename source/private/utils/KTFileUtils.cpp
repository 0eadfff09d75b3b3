// KTFileUtils.cpp: the toolbox for files and folders, as far as it is the same on every system.

#include "KTFileUtil.h"

#include "KTAssert.h"
#include "KTFileUtilErrors.h"
#include "OCaseFold.h"
#include "OCopy.h"
#include "OFolder.h"
#include "OLongPath.h"
#include "OTempFiles.h"

#include <utility>

namespace {

constexpr char kSourcePath[] = "source/private/utils/KTFileUtils";
constexpr char kDataPrefix[] = "data-";

bool IsName(KTString const &text) { return OIsValidName(OUnitsView(text.c_str(), text.size())); }

// A name in a folder; nothing if the folder is none or the text no name.
KTPath NameIn(KTPath folder, KTString const &name) {
    if (folder.GetOPath().IsEmpty() || !IsName(name)) {
        return {};
    }
    folder.Append(name);
    return folder;
}

OPath const &PathOf(KTFile const &file) { return file.GetOPath(); }

bool IsSameName(OString const &a, OString const &b) {
    return a.length() == b.length() && OFoldCase(a.GetUnits()) == OFoldCase(b.GetUnits());
}

bool IsFull(OPath const &path) {
    KTUnits const &text = path.GetString().GetUnits();
    return text.size() >= 2 && text[1] == ':';
}

} // namespace

KTPath KTFileUtil::m_SessionTempFolderPath;
bool KTFileUtil::m_SessionFolderInited = false;

// ---- temporary files and folders ----

KTFile KTFileUtil::GetSystemTempFolder() { return KTFile(OGetSystemTempFolder()); }

KTPath KTFileUtil::GetSessionTempFolder() {
    if (!m_SessionFolderInited) {
        m_SessionFolderInited = true;
        if (m_SessionTempFolderPath.GetOPath().IsEmpty()) {
            OString const prefix = OString::FromUTF8("KT");
            OString const name = OString::FromUTF8("Session");
            m_SessionTempFolderPath = KTPath(OMakeUniqueFolder(OGetSystemTempFolder(), prefix, name));
        }
    }
    return m_SessionTempFolderPath;
}

KTFile KTFileUtil::GetUniqueTemporaryFile(KTString const &extension) {
    return CreateUniqueFile(GetSessionTempFolder(), kDataPrefix, extension);
}

KTFile KTFileUtil::GetUniqueTemporaryFile(KTPath const &folder, KTString const &prefix, KTString const &extension) {
    return CreateUniqueFile(folder, prefix, extension);
}

KTFile KTFileUtil::GetUniqueFile(KTPath const &folder, KTString const &extension) {
    return CreateUniqueFile(folder, kDataPrefix, extension);
}

KTFile KTFileUtil::CreateUniqueFile(KTPath const &folder, KTString const &prefix, KTString const &extension) {
    return KTFile(OMakeUniqueFile(folder.GetOPath(), prefix.GetOString(), extension.GetOString()));
}

bool KTFileUtil::DeleteAllTempFilesCreated() {
    if (m_SessionTempFolderPath.GetOPath().IsEmpty()) {
        return true;
    }
    OError const error = ODeleteFolder(m_SessionTempFolderPath.GetOPath());
    return error == OError::None || error == OError::NotFound;
}

KTFile KTFileUtil::GetTempFileWithName(KTString const &name) { return KTFile(NameIn(GetSessionTempFolder(), name)); }

KTPath KTFileUtil::CreateTempDir(KTString const &name) {
    KTPath path = NameIn(GetSessionTempFolder(), name);
    OError const error = OMakeFolder(path.GetOPath(), false);
    bool const isThere = error == OError::None || (error == OError::AlreadyExists && IsFolder(KTFile(path)));
    return isThere ? path : KTPath();
}

KTPath KTFileUtil::CreateUniqueTempDir(KTString const &prefix) {
    return CreateUniqueDir(GetSessionTempFolder(), prefix);
}

KTPath KTFileUtil::CreateUniqueDir(KTPath const &folder, KTString const &prefix) {
    return KTPath(OMakeUniqueFolder(folder.GetOPath(), prefix.GetOString(), OString()));
}

// ---- the program's own files ----

KTPath KTFileUtil::GetResourcesFolderPath() { return GetCurrentExecutablePath().GetParentKTPath(); }

KTFile KTFileUtil::GetApplicationLocaleFolder() {
    KTPath path = GetResourcesFolderPath();
    path.Append("en_US");
    path.Append("strings.lxdc");
    return KTFile(path);
}

KTString KTFileUtil::GetSSLCACertificatePath() {
    KTPath path = GetResourcesFolderPath();
    path.Append("cacert");
    path.Append("cacert.pem");
    return path.GetPathAsKTString();
}

// ---- the parts of a path ----

KTString KTFileUtil::GetBaseFileName(KTFile const &file) { return KTString(PathOf(file).GetBaseName()); }

KTString KTFileUtil::GetBaseFileName(KTString const &path) { return KTString(OPath(path.GetOString()).GetBaseName()); }

KTString KTFileUtil::GetExtension(KTFile const &file) { return KTString(PathOf(file).GetExtension()); }

KTString KTFileUtil::GetExtension(KTString const &path) { return KTString(OPath(path.GetOString()).GetExtension()); }

KTString KTFileUtil::GetFileName(KTFile const &file) { return KTString(PathOf(file).GetFileName()); }

KTString KTFileUtil::GetFileName(KTString const &path) { return KTString(OPath(path.GetOString()).GetFileName()); }

KTString KTFileUtil::GetPathOnly(KTFile const &file, short withSeparator) {
    KTString folder(PathOf(file).GetParent().GetString());
    if (withSeparator != 0 && !folder.empty()) {
        unsigned short const last = folder[folder.size() - 1];
        bool const isDrive = last == ':'; // its current folder; with a separator it would be its root
        if (last != '\\' && last != '/' && !isDrive) {
            folder.push_back('\\');
        }
    }
    return folder;
}

KTString KTFileUtil::GetFullPath(KTFile const &file) { return KTString(OGetFullPath(PathOf(file)).GetString()); }

KTString KTFileUtil::GetRelativePathIfPossible(KTPath const &folder, KTPath const &file) {
    std::vector<OString> const folderNames = folder.GetOPath().GetComponents();
    std::vector<OString> const fileNames = file.GetOPath().GetComponents();
    if (folderNames.size() > fileNames.size()) {
        KTAssertFailed("Relative Path cant be evaluated as the folder path is deeper than the file path", kSourcePath,
                       412);
        return file.GetPathAsKTString();
    }
    for (std::size_t i = 0; i < folderNames.size(); ++i) {
        if (!IsSameName(folderNames[i], fileNames[i])) {
            return file.GetPathAsKTString();
        }
    }
    OPath relative;
    for (std::size_t i = folderNames.size(); i < fileNames.size(); ++i) {
        relative.Append(fileNames[i]);
    }
    return KTString(relative.GetString());
}

bool KTFileUtil::IsValidPath(KTPath const &path) { return OIsValidPath(path.GetOPath()); }

KTString KTFileUtil::GetDirectorySeparator() { return "\\"; }

bool KTFileUtil::IsLocalPath(KTPath const &path) { return IsFull(OGetFullPath(path.GetOPath())); }

bool KTFileUtil::IsLocalPath2(KTPath const &path) { return IsLocalPath(path) && !OIsOnServer(path.GetOPath()); }

bool KTFileUtil::OnServerVolume(KTPath const &path) { return OIsOnServer(path.GetOPath()); }

// ---- one file or folder ----

bool KTFileUtil::IsFolder(KTFile const &file) {
    OFileFacts facts;
    return OGetFacts(PathOf(file), facts) == OError::None && facts.isFolder;
}

KTUInt64 KTFileUtil::GetFileSize(KTFile const &file) { return file.GetSize(); }

KTTime KTFileUtil::GetFileModificationDate(KTFile const &file) {
    return KTTime(file.GetTimeAttribute(KTFile::kTimeModified));
}

KTTime KTFileUtil::GetFileCreationDate(KTFile const &file) {
    return KTTime(file.GetTimeAttribute(KTFile::kTimeCreated));
}

KTTime KTFileUtil::GetFileLastAccessedDate(KTFile const &file) {
    return KTTime(file.GetTimeAttribute(KTFile::kTimeAccessed));
}

KTFileUtil::ErrorCodeEnum KTFileUtil::CreateDirectoryW(KTPath const &folder, bool withParents) {
    return KTFileUtilError(OMakeFolder(folder.GetOPath(), withParents));
}

KTFileUtil::ErrorCodeEnum KTFileUtil::DeleteDirectory(KTPath const &folder) {
    return KTFileUtilError(ODeleteFolder(folder.GetOPath()));
}

KTFileUtil::ErrorCodeEnum KTFileUtil::FileCopy(KTFile const &from, KTFile const &to, bool replaceExisting) {
    return KTFileUtilError(OCopyFile(PathOf(from), PathOf(to), replaceExisting));
}

KTFileUtil::ErrorCodeEnum KTFileUtil::FolderCopy(KTPath const &from, KTPath const &to) {
    return KTFileUtilError(OCopyFolder(from.GetOPath(), to.GetOPath()));
}

KTFileUtil::ErrorCodeEnum KTFileUtil::MoveFileW(KTFile const &from, KTFile const &to, bool replaceExisting) {
    return KTFileUtilError(OMove(PathOf(from), PathOf(to), replaceExisting));
}

KTFileUtil::ErrorCodeEnum KTFileUtil::RenameFile(KTFile const &file, KTString const &newName) {
    OPath const from = OGetFullPath(PathOf(file));
    OPath const folder = from.GetParent();
    if (folder.IsEmpty() || !IsName(newName)) {
        return kErrorInvalidName;
    }
    OPath to(folder);
    to.Append(newName.GetOString());
    return KTFileUtilError(OMove(from, to, false));
}

KTUInt64 KTFileUtil::GetFileFreeSpace(KTPath const &path) { return OGetFreeSpace(path.GetOPath()); }
