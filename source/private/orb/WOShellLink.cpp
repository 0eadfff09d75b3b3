// WOShellLink.cpp: shell links, read by the shell itself.

#include "OFileSystem.h"

#include "OCaseFold.h"
#include "WOCom.h"
#include "WOLongPath.h"

#include <objidl.h>
#include <shlobj.h>
#include <windows.h>

#include <algorithm>
#include <cwchar>
#include <string>
#include <string_view>

namespace {

constexpr int kMostLinks = 16; // in a row; more are a circle
constexpr std::size_t kBuffer = 32'767;

bool IsShellLink(OPath const &path) {
    KTUnits const &text = path.GetString().GetUnits();
    constexpr std::wstring_view kExtension = L".lnk";
    if (text.size() <= kExtension.size()) {
        return false;
    }
    KTUnits const end = OFoldCase(text.substr(text.size() - kExtension.size()));
    return std::equal(kExtension.begin(), kExtension.end(), end.begin());
}

OError ReadTarget(OPath &path) {
    WOComScope const com;
    WOComPointer<IShellLinkW> link;
    WOComPointer<IPersistFile> file;
    if (FAILED(CoCreateInstance(CLSID_ShellLink, nullptr, CLSCTX_INPROC_SERVER, IID_IShellLinkW, link.Receive())) ||
        FAILED(link->QueryInterface(IID_IPersistFile, file.Receive()))) {
        return OError::Failed;
    }
    if (FAILED(file->Load(WOLongPath(path).c_str(), STGM_READ | STGM_SHARE_DENY_NONE))) {
        return OError::Failed;
    }
    std::wstring target(kBuffer, L'\0');
    if (link->GetPath(target.data(), static_cast<int>(target.size()), nullptr, 0) != S_OK) {
        return OError::Failed; // to something that is no file, such as a control panel
    }
    target.resize(std::wcslen(target.c_str()));
    if (target.empty()) {
        return OError::Failed;
    }
    path = WOMakePath(target.data(), target.size());
    return OError::None;
}

} // namespace

OError OResolveAlias(OPath &path) {
    OPath target = path;
    for (int links = 0; IsShellLink(target); ++links) {
        OFileFacts facts;
        OError error = OGetFacts(target, facts);
        if (error == OError::None && facts.isFolder) {
            break; // a folder may have such a name, too
        }
        if (error == OError::None) {
            error = links < kMostLinks ? ReadTarget(target) : OError::Failed;
        }
        if (error != OError::None) {
            return error;
        }
    }
    path = target;
    return OError::None;
}
