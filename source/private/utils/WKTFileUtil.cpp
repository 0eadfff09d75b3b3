// WKTFileUtil.cpp: the toolbox's questions to Windows: the executable, well-known folders, listings.

#include "KTFileUtil.h"

#include "KTAssert.h"
#include "KTFileUtilErrors.h"
#include "OCaseFold.h"
#include "OFolder.h"
#include "WKTRedirection.h"
#include "WOCom.h"
#include "WOLongPath.h"

#include <initguid.h>

#include <knownfolders.h>
#include <shlobj.h>
#include <windows.h>

#include <string>
#include <string_view>

namespace {

constexpr char kSourcePath[] = "source/private/utils/WKTFileUtil";
constexpr DWORD kLongestModuleName = 32'767;

KTPath KnownFolder(KNOWNFOLDERID const &id) {
    WOComMemory<wchar_t> path;
    if (FAILED(SHGetKnownFolderPath(id, KF_FLAG_DEFAULT, nullptr, path.Receive())) || path.Get() == nullptr) {
        return {};
    }
    return KTPath(WOMakePath(path.Get(), std::wstring_view(path.Get()).size()));
}

KTFileUtil::ErrorCodeEnum List(KTPath const &folder, OListing const &wanted, std::vector<KTString> &names) {
    WKTRedirectionOff const redirection;
    names.clear();
    return KTFileUtilError(OListFolder(folder.GetOPath(), wanted, names));
}

OListing WithExtension(KTString const &extension, bool recursive) {
    OListing wanted;
    wanted.recursive = recursive;
    wanted.all = false;
    wanted.extension = OFoldCase(extension.GetOString().GetUnits());
    if (!wanted.extension.empty() && wanted.extension[0] != '.') {
        wanted.extension.insert(0, 1, '.');
    }
    return wanted;
}

} // namespace

KTPath KTFileUtil::GetCurrentExecutablePath() {
    std::wstring name(kLongestModuleName, L'\0');
    DWORD length = GetModuleFileNameW(nullptr, name.data(), kLongestModuleName);
    if (length == 0) {
        KTAssertFailed("", kSourcePath, 88);
    }
    OFile file(WOMakePath(name.data(), length));
    file.ResolveAlias();
    return KTPath(file.GetPath());
}

KTPath KTFileUtil::GetUserDocumentsFolder() { return KnownFolder(FOLDERID_Documents); }

KTPath KTFileUtil::GetSharedDocumentsFolder() { return KnownFolder(FOLDERID_PublicDocuments); }

KTPath KTFileUtil::GetUserApplicationDataFolder() { return KnownFolder(FOLDERID_RoamingAppData); }

KTPath KTFileUtil::GetCommonFilesFolder() { return KnownFolder(FOLDERID_ProgramFilesCommon); }

KTPath KTFileUtil::GetUserPreferenceFolder() { return KnownFolder(FOLDERID_LocalAppData); }

KTFileUtil::ErrorCodeEnum KTFileUtil::GetFileNamesInFolderAtPath(KTPath const &folder, std::vector<KTString> &names) {
    return List(folder, OListing(), names);
}

KTFileUtil::ErrorCodeEnum KTFileUtil::GetFileNamesInFolderAtPathRecursively(KTPath const &folder,
                                                                            std::vector<KTString> &names) {
    OListing wanted;
    wanted.recursive = true;
    return List(folder, wanted, names);
}

KTFileUtil::ErrorCodeEnum KTFileUtil::GetFileNamesInFolderAtPathEndingWithGivenExtension(KTPath const &folder,
                                                                                         KTString const &extension,
                                                                                         std::vector<KTString> &names) {
    return List(folder, WithExtension(extension, false), names);
}

KTFileUtil::ErrorCodeEnum KTFileUtil::GetFileNamesInFolderAtPathEndingWithGivenExtensionRecursively(
    KTPath const &folder, KTString const &extension, std::vector<KTString> &names) {
    return List(folder, WithExtension(extension, true), names);
}
