// WOCopy.cpp: copies under another name that then take the target's place.

#include "OCopy.h"

#include "OCaseFold.h"
#include "OFolder.h"
#include "OTempFiles.h"
#include "OUtf.h"
#include "WOError.h"
#include "WOFind.h"
#include "WOHandle.h"
#include "WOLongPath.h"

#include <windows.h>

#include <utility>
#include <vector>

namespace {

constexpr int kMostAttempts = 1000;
constexpr DWORD kShareAll = FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE;

// What becomes of the original. One that is deleted lives on in the copy alone, which then has to be whole and safe on
// the disk.
enum class Original { Stays, IsDeleted };

// A path beside the target that nobody has.
OPath StagingPath(OPath const &fullTarget) {
    KTUnits name = {'~', 'k', 't', '-'};
    name.append(OMakeUniqueText().GetUnits());
    OPath path = fullTarget.GetParent();
    path.Append(OString(std::move(name)));
    return path;
}

// Whether something may take the target's place. `exists` tells whether there is a target.
OError CheckTarget(OPath const &target, bool replace, bool &exists) {
    OFileFacts facts;
    OError const error = OGetFacts(target, facts);
    exists = error == OError::None;
    if (!exists) {
        return error == OError::NotFound ? OError::None : error;
    }
    if (facts.isFolder) {
        return OError::IsAFolder;
    }
    if (!replace) {
        return OError::AlreadyExists;
    }
    if (facts.isReadOnly) {
        return OError::AccessDenied;
    }
    // Found out before much is copied; the system would also call it a missing permission.
    WOHandle const probe(
        CreateFileW(WOLongPath(target).c_str(), DELETE, kShareAll, nullptr, OPEN_EXISTING, 0, nullptr));
    return probe.IsValid() ? OError::None : WOLastError();
}

// Sends the content of a copy to the disk. A read-only one cannot be opened for this, so it is writable meanwhile.
OError Flush(WOLongPath const &name) {
    DWORD const attributes = GetFileAttributesW(name.c_str());
    bool const isReadOnly = attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_READONLY) != 0;
    if (isReadOnly && SetFileAttributesW(name.c_str(), attributes & ~DWORD{FILE_ATTRIBUTE_READONLY}) == FALSE) {
        return WOLastError();
    }
    WOHandle file(CreateFileW(name.c_str(), GENERIC_WRITE, kShareAll, nullptr, OPEN_EXISTING, 0, nullptr));
    OError error = file.IsValid() && FlushFileBuffers(file.Get()) != FALSE ? OError::None : WOLastError();
    file.Close();
    if (isReadOnly && SetFileAttributesW(name.c_str(), attributes) == FALSE && error == OError::None) {
        error = WOLastError();
    }
    return error;
}

OError Rename(OPath const &from, OPath const &to, bool replace, Original original) {
    DWORD const flags = (replace ? MOVEFILE_REPLACE_EXISTING : 0) |
                        (original == Original::IsDeleted ? MOVEFILE_WRITE_THROUGH : 0); // the name, too, is on the disk
    return MoveFileExW(WOLongPath(from).c_str(), WOLongPath(to).c_str(), flags) != FALSE ? OError::None : WOLastError();
}

// Copies to a new name beside the target, which is set in `staging`.
OError CopyBeside(WOLongPath const &from, OPath const &fullTarget, OPath &staging) {
    for (int attempt = 0; attempt < kMostAttempts; ++attempt) {
        staging = StagingPath(fullTarget);
        WOLongPath const name(staging);
        if (!name.IsValid()) {
            return OError::InvalidName;
        }
        if (CopyFileW(from.c_str(), name.c_str(), TRUE) != FALSE) {
            return OError::None;
        }
        DWORD const code = GetLastError();
        if (code != ERROR_FILE_EXISTS && code != ERROR_ALREADY_EXISTS) {
            ODelete(staging); // what there is of it
            return WOErrorOf(code);
        }
    }
    return OError::Failed;
}

bool IsSamePlace(OPath const &a, OPath const &b) {
    return OFoldCase(a.GetString().GetUnits()) == OFoldCase(b.GetString().GetUnits());
}

// Whether `inner` lies below `outer`. Both are full paths.
bool IsBelow(OPath const &inner, OPath const &outer) {
    for (OPath place = inner.GetParent(); !place.IsEmpty(); place = place.GetParent()) {
        if (IsSamePlace(place, outer)) {
            return true;
        }
    }
    return false;
}

OError CopyOneFile(OPath const &from, OPath const &to, Original original) {
    WOLongPath const source(from);
    WOLongPath const name(to);
    if (!source.IsValid() || !name.IsValid()) {
        return OError::InvalidName; // others may have given it: with a dot at its end, for one
    }
    if (CopyFileW(source.c_str(), name.c_str(), TRUE) == FALSE) {
        return WOLastError();
    }
    return original == Original::IsDeleted ? Flush(name) : OError::None;
}

// Copies what is in one folder into another, which is empty and has a name that nothing else has.
OError CopyContent(OPath const &source, OPath const &target, Original original) {
    OString const targetName = target.GetFileName();
    std::vector<std::pair<OPath, OPath>> pending = {{source, target}};
    while (!pending.empty()) {
        auto const [from, to] = std::move(pending.back());
        pending.pop_back();
        WOLongPath const folder(from);
        if (!folder.IsValid()) {
            return OError::InvalidName; // too long a way
        }
        WOFind find(folder.c_str());
        while (find.Next()) {
            OString const name(OWideToUnits(find.Name(), OWideLength(find.Name())));
            OPath fromEntry(from);
            OPath toEntry(to);
            fromEntry.Append(name);
            toEntry.Append(name);
            if (find.IsFolder() && find.IsLink()) {
                if (original == Original::IsDeleted) {
                    return OError::Failed; // the link would be lost
                }
                continue;
            }
            if (name == targetName) {
                return OError::Failed; // the copy itself: its path leads here, a link or a mapped drive on the way
            }
            OError error = OError::None;
            if (find.IsFolder()) {
                error = OMakeFolder(toEntry, false);
                pending.emplace_back(std::move(fromEntry), std::move(toEntry));
            } else {
                error = CopyOneFile(fromEntry, toEntry, original);
            }
            if (error != OError::None) {
                return error;
            }
        }
        if (find.Error() != OError::None) {
            return find.Error();
        }
    }
    return OError::None;
}

OError CopyFileTo(OPath const &from, OPath const &to, bool replace, Original original) {
    OFileFacts facts;
    OError error = OGetFacts(from, facts);
    if (error == OError::None && facts.isFolder) {
        error = OError::IsAFolder;
    }
    bool exists = false;
    if (error == OError::None) {
        error = CheckTarget(to, replace, exists);
    }
    if (error != OError::None) {
        return error;
    }
    OPath const target = OGetFullPath(to);
    OPath staging;
    error = CopyBeside(WOLongPath(from), target, staging);
    if (error != OError::None) {
        return error;
    }
    // The content reaches the disk before the name does, or a power failure could leave the name of an empty file.
    if (exists || original == Original::IsDeleted) {
        error = Flush(WOLongPath(staging));
    }
    if (error == OError::None) {
        error = Rename(staging, target, replace, original);
    }
    if (error != OError::None) {
        ODelete(staging);
    }
    return error;
}

OError CopyFolderTo(OPath const &from, OPath const &to, Original original) {
    OPath const source = OGetFullPath(from);
    OPath const target = OGetFullPath(to);
    OError const error = OCheckFolder(source);
    if (error != OError::None) {
        return error;
    }
    if (target.IsEmpty()) {
        return OError::InvalidName;
    }
    if (OExists(target)) {
        return OError::AlreadyExists;
    }
    if (IsBelow(target, source)) {
        return OError::Failed; // the copy would hold itself
    }
    OPath const staging = StagingPath(target);
    OError copied = OMakeFolder(staging, false);
    if (copied != OError::None) {
        return copied;
    }
    copied = CopyContent(source, staging, original);
    if (copied == OError::None) {
        copied = Rename(staging, target, false, original);
    }
    if (copied != OError::None) {
        ODeleteFolder(staging);
    }
    return copied;
}

// Rename could not do it: copy, then delete the original.
OError MoveToOtherDrive(OPath const &from, OPath const &to, bool isFolder, bool replace) {
    OError const copied =
        isFolder ? CopyFolderTo(from, to, Original::IsDeleted) : CopyFileTo(from, to, replace, Original::IsDeleted);
    if (copied != OError::None) {
        return copied;
    }
    return isFolder ? ODeleteFolder(from) : ODelete(from);
}

} // namespace

OError OCopyFile(OPath const &from, OPath const &to, bool replace) {
    return CopyFileTo(from, to, replace, Original::Stays);
}

OError OCopyFolder(OPath const &from, OPath const &to) { return CopyFolderTo(from, to, Original::Stays); }

OError OMove(OPath const &from, OPath const &to, bool replace) {
    OFileFacts facts;
    OError error = OGetFacts(from, facts);
    if (error != OError::None) {
        return error;
    }
    OPath const source = OGetFullPath(from);
    OPath const target = OGetFullPath(to);
    if (target.IsEmpty()) {
        return OError::InvalidName;
    }
    bool exists = false;
    // A name may change its case where the system finds the same file under both.
    error = IsSamePlace(source, target) ? OError::None : CheckTarget(target, replace && !facts.isFolder, exists);
    if (error != OError::None) {
        return error;
    }
    DWORD const flags = exists ? MOVEFILE_REPLACE_EXISTING : 0;
    if (MoveFileExW(WOLongPath(source).c_str(), WOLongPath(target).c_str(), flags) != FALSE) {
        return OError::None;
    }
    DWORD const code = GetLastError();
    return code == ERROR_NOT_SAME_DEVICE ? MoveToOtherDrive(source, target, facts.isFolder, replace) : WOErrorOf(code);
}
