// KTFileUtil.h: the static toolbox for files and folders.
//
// Paths may be full or relative, with "\" or "/", with separators at their ends, longer than 260 characters, on a share
// (\\server\share\a), or a URL (file:///C:/a, file://server/share/a). A name that Windows cannot hold is refused: the
// operation fails, nothing is altered. docs/files.md tells more.
//
//     std::vector<KTString> pictures;
//     auto const error = KTFileUtil::GetFileNamesInFolderAtPathEndingWithGivenExtension(folder, ".png", pictures);
//     if (error != KTFileUtil::kErrorNone)
//         ... the folder could not be read; pictures being empty would only mean that there are none
//
// Threads: every operation may be called on any thread, but the first use of the session folder (GetSessionTempFolder
// and what creates files in it) is not locked and comes before several threads use it. Two operations on one path at
// the same time do as two programs would. Nothing throws but std::bad_alloc.

#pragma once

#include "KTFile.h"
#include "KTPath.h"
#include "KTString.h"
#include "KTTime.h"
#include "KTTypes.h"

#include <vector>

#include "KTBeginExports.h"

class KT_PUBLIC_API KTFileUtil {
  public:
    /// What became of an operation. Test against kErrorNone (0).
    enum ErrorCodeEnum : int {
        kErrorNone = 0,           ///< success
        kErrorFailed = 1,         ///< none of the reasons below
        kErrorNotFound = 2,       ///< nothing is at the path, or a folder on the way is missing
        kErrorInvalidName = 3,    ///< the path is empty, too long, or has a name that Windows cannot hold
        kErrorNotAFolder = 4,     ///< a file is where a folder is needed
        kErrorIsAFolder = 5,      ///< a folder is where a file is needed
        kErrorAlreadyExists = 6,  ///< something is at the target already
        kErrorAccessDenied = 7,   ///< no permission, or the file is read-only
        kErrorInUse = 8,          ///< another handle holds the file
        kErrorDiskFull = 9,       ///< no room left, or no quota
        kErrorNotReady = 10,      ///< the drive or the share is gone
        kErrorNotEmpty = 11,      ///< something in the folder could not be deleted
        kErrorNoApplication = 12, ///< no program is registered for the file's type
    };

    KTFileUtil() = delete;

    // ---- temporary files and folders ----

    /// The system's temporary folder, without a trailing separator; a value that names nothing if the system has none
    /// to offer.
    static KTFile GetSystemTempFolder();

    /// This process's own temporary folder, "KTSession-..." in the system's. The first call creates it; every call
    /// returns the same path, also when the folder was deleted meanwhile. Empty if it could not be created then.
    static KTPath GetSessionTempFolder();

    /// Creates an empty file "data-" + unique part + `extension` (with its dot: ".ikt") in the session folder. Names
    /// nothing if the session folder is gone or the extension cannot be part of a name.
    static KTFile GetUniqueTemporaryFile(KTString const &extension);

    /// The same in the given folder, with `prefix` instead of "data-".
    static KTFile GetUniqueTemporaryFile(KTPath const &folder, KTString const &prefix, KTString const &extension);

    /// Creates an empty file "data-" + unique part + `extension` in the folder. The name is new among all processes:
    /// creating it fails if it is there. Names nothing if the folder is missing, is a file or may not be written, the
    /// disk is full, the path is empty, or the extension cannot be part of a name.
    static KTFile GetUniqueFile(KTPath const &folder, KTString const &extension);

    /// The same with `prefix` instead of "data-".
    static KTFile CreateUniqueFile(KTPath const &folder, KTString const &prefix, KTString const &extension);

    /// Deletes the session folder and all in it, never following a link. True if it is gone afterwards, or was never
    /// created; false if something in it is held by a handle: the rest is gone then.
    static bool DeleteAllTempFilesCreated();

    /// The file `name` in the session folder; nothing is created. Names nothing if `name` is no single valid name.
    static KTFile GetTempFileWithName(KTString const &name);

    /// The folder `name` in the session folder, created if it is not there. Empty if `name` is no single valid name, a
    /// file has it, or the session folder is gone.
    static KTPath CreateTempDir(KTString const &name);

    /// Creates a folder `prefix` + "-" + unique part in the session folder. Empty if that is gone or the prefix is no
    /// part of a name; an empty prefix is allowed, and gives the unique part alone.
    static KTPath CreateUniqueTempDir(KTString const &prefix);

    /// The same in the given folder. Empty also if the folder is missing, is a file, or may not be written.
    static KTPath CreateUniqueDir(KTPath const &folder, KTString const &prefix);

    // ---- the program and well-known folders ----

    /// The path of the host's executable file. Empty, with an assertion in the log, if the system does not tell.
    static KTPath GetCurrentExecutablePath();

    /// The folder of the executable file.
    static KTPath GetResourcesFolderPath();

    /// The dictionary file of localised texts, "en_US\strings.lxdc" beside the executable file. It need not exist.
    static KTFile GetApplicationLocaleFolder();

    /// The certificates of the authorities that connections trust, "cacert\cacert.pem" beside the executable file.
    static KTString GetSSLCACertificatePath();

    /// The signed-in user's documents.
    static KTPath GetUserDocumentsFolder();

    /// The documents that all users share.
    static KTPath GetSharedDocumentsFolder();

    /// Where programs keep the user's data that follows the user to other machines.
    static KTPath GetUserApplicationDataFolder();

    /// Where programs keep what they share among each other on this machine.
    static KTPath GetCommonFilesFolder();

    /// Where programs keep the user's settings that stay on this machine. All five are empty if the system has no such
    /// folder.
    static KTPath GetUserPreferenceFolder();

    // ---- the parts of a path; text only, the disk is not asked ----

    /// The last element without its extension: "notes" for "C:\a\notes.txt", "a.tar" for "a.tar.gz", ".profile" as it is.
    static KTString GetBaseFileName(KTFile const &file);
    static KTString GetBaseFileName(KTString const &path);

    /// The extension of the last element with its dot, ".txt", so that base name and extension give the name again;
    /// empty if there is none.
    static KTString GetExtension(KTFile const &file);
    static KTString GetExtension(KTString const &path);

    /// The last element; empty for a root and for the empty path.
    static KTString GetFileName(KTFile const &file);
    static KTString GetFileName(KTString const &path);

    /// The path without its last element; with `withSeparator` not 0 it ends with a separator, so that a name may follow,
    /// but for the current folder of a drive ("C:"), which one would make its root. Empty if there is none.
    static KTString GetPathOnly(KTFile const &file, short withSeparator);

    /// The path from its root on: relative paths are completed from the current folder, "." and ".." worked out, "/"
    /// and URLs turned into "\". Empty for a path that is empty or not valid.
    static KTString GetFullPath(KTFile const &file);

    /// The path of `file` from `folder` on, without a separator in front; empty if both are the same. Letters match in
    /// either case. A file that is not below the folder keeps its path. A folder with more elements than the file is
    /// reported as an assertion, and the file keeps its path, too.
    static KTString GetRelativePathIfPossible(KTPath const &folder, KTPath const &file);

    /// Whether the system could be called with the path: not empty, not too long, every name valid. Nothing needs to be
    /// there.
    static bool IsValidPath(KTPath const &path);

    /// "\".
    static KTString GetDirectorySeparator();

    /// Whether the path's text names a place on a drive: false for a share, however it is written, for an invalid path
    /// and for the empty one. A drive letter that a share has counts as a drive; IsLocalPath2 looks behind it.
    static bool IsLocalPath(KTPath const &path);

    /// Whether the path is on a disk of this machine: as IsLocalPath, but false for a drive letter that a share has.
    /// Nothing needs to be there.
    static bool IsLocalPath2(KTPath const &path);

    /// Whether the path is on a share, also one that has a drive letter. False for the empty and for an invalid path.
    static bool OnServerVolume(KTPath const &path);

    // ---- one file or folder ----

    /// Whether a folder is there. False for a file, a missing path, and the empty path.
    static bool IsFolder(KTFile const &file);

    /// Bytes in the file, read-only or held by others all the same; 0 for a folder, a missing path and the empty path.
    static KTUInt64 GetFileSize(KTFile const &file);

    /// When the file or folder was changed, created, or read last; the system may write the last one late, or never.
    /// The beginning of 1601 (a count of 0) for a missing path, the empty path, and a disk that keeps no such time.
    static KTTime GetFileModificationDate(KTFile const &file);
    static KTTime GetFileCreationDate(KTFile const &file);
    static KTTime GetFileLastAccessedDate(KTFile const &file);

    /// Creates a folder; with `withParents` also those on the way to it. kErrorAlreadyExists if a file or folder is
    /// there, but a folder that is there is success with `withParents`. kErrorNotFound if the parent is missing and not
    /// wanted, kErrorInvalidName for the empty path.
    static ErrorCodeEnum CreateDirectoryW(KTPath const &folder, bool withParents = false);

    /// Deletes a folder and all in it, read-only files too. Links and junctions are deleted, never what they lead to.
    /// Goes on after a failure and returns the first one: kErrorInUse for a file that a handle holds. kErrorNotFound for
    /// a missing path, kErrorNotAFolder for a file, kErrorInvalidName for the empty path.
    static ErrorCodeEnum DeleteDirectory(KTPath const &folder);

    /// Copies a file with its times and attributes. The target is the whole old or the whole new file at every moment.
    /// kErrorNotFound if the file or the target's folder is missing, kErrorIsAFolder if either is a folder,
    /// kErrorAlreadyExists if the target is there and not to be replaced, kErrorAccessDenied if it is read-only,
    /// kErrorInUse if a handle holds either so that it cannot be read or replaced, kErrorDiskFull,
    /// kErrorInvalidName for an empty path.
    static ErrorCodeEnum FileCopy(KTFile const &from, KTFile const &to, bool replaceExisting = false);

    /// Copies a folder and all in it to a path where nothing is; the target appears when all is copied. Links to folders
    /// are left out, links to files become the files. kErrorNotFound for a missing folder or target's parent,
    /// kErrorNotAFolder for a file, kErrorAlreadyExists if anything is at the target, kErrorFailed if it lies in the
    /// folder itself, kErrorInvalidName if something in it has a name that only others can have given, else what kept a
    /// file from being copied; nothing stays at the target then.
    static ErrorCodeEnum FolderCopy(KTPath const &from, KTPath const &to);

    /// Moves a file or a folder, also to another drive. Errors as for FileCopy; a folder's target must not be there.
    /// A read-only file can be moved. To another drive it is copied, and deleted once the copy is on the disk; a folder
    /// with links to folders in it stays where it is then, as they would be lost: kErrorFailed. The copy stays if the
    /// original could not be deleted, which is an error.
    static ErrorCodeEnum MoveFileW(KTFile const &from, KTFile const &to, bool replaceExisting = false);

    /// Gives a file or folder another name in its folder. kErrorInvalidName if that is no single valid name,
    /// kErrorAlreadyExists or kErrorIsAFolder if another file or folder has it, kErrorNotFound for a missing path.
    static ErrorCodeEnum RenameFile(KTFile const &file, KTString const &newName);

    /// Bytes that the user may still write to the disk that holds the path, or would hold it. 0 if it cannot be told,
    /// and for the empty path.
    static KTUInt64 GetFileFreeSpace(KTPath const &path);

    // ---- listing ----
    //
    // Each replaces `names` by the files (not the folders) of the folder, in the system's order; the recursive ones by
    // paths from the folder on, joined with "\". Links to folders are not entered. An empty folder is success.
    // kErrorNotFound for a missing path, kErrorNotAFolder for a file, kErrorInvalidName for the empty path. If a folder
    // below cannot be read, the rest is listed and the reason returned. `extension` is compared in either case, with or
    // without its dot; an empty one stands for the files without any.

    static ErrorCodeEnum GetFileNamesInFolderAtPath(KTPath const &folder, std::vector<KTString> &names);
    static ErrorCodeEnum GetFileNamesInFolderAtPathRecursively(KTPath const &folder, std::vector<KTString> &names);
    static ErrorCodeEnum GetFileNamesInFolderAtPathEndingWithGivenExtension(KTPath const &folder,
                                                                            KTString const &extension,
                                                                            std::vector<KTString> &names);
    static ErrorCodeEnum GetFileNamesInFolderAtPathEndingWithGivenExtensionRecursively(KTPath const &folder,
                                                                                       KTString const &extension,
                                                                                       std::vector<KTString> &names);

    // ---- documents and their applications ----

    /// The program that opens the document, as the system would choose it. Empty for a missing path, a folder, the empty
    /// path, and a file without an application.
    static KTPath FindExecutableForFile(KTFile const &file);

    /// The program registered to open files with the extension, with or without its dot; where none is, the one to edit
    /// them. Empty for an empty extension and for one that is not registered.
    static KTPath GetAppForFileExtension(KTString const &extension);

    /// Opens the document with its application and does not wait for that. A folder is opened in the shell.
    /// kErrorNotFound for a missing path, kErrorNoApplication if none is registered, kErrorInvalidName for the empty
    /// path, kErrorAccessDenied or kErrorInUse if the system cannot start it.
    static ErrorCodeEnum FileOpen(KTFile const &file);

    /// The same with the application that edits the document, if `forEditing` says so.
    static ErrorCodeEnum FileOpen2(KTFile const &file, bool forEditing);

    /// The same for several documents. Goes on after a failure and returns the first; no document is success.
    static ErrorCodeEnum FileOpenMultiple(std::vector<KTFile> const &files, bool forEditing = false);

  private:
    static KTPath m_SessionTempFolderPath; // empty until the session folder was created
    static bool m_SessionFolderInited;     // whether that was tried
};

#include "KTEndExports.h"
