// OFile.h: the file-system object that KTFile holds: a name on disk and what can be done to it.

#pragma once

#include "KTTypes.h"
#include "OPath.h"

#include "KTBeginExports.h"

/// A file or folder named by a path. The object itself is a value: copying copies the name. Every operation asks the
/// disk anew. Paths may be full or relative, with "\" or "/", longer than 260 characters, on a share (\\server\share),
/// or a "file:" URL; a name that Windows cannot hold is refused by every operation. Nothing throws but std::bad_alloc.
/// Distinct values may be used from any thread; one value is not locked.
class KT_PUBLIC_API OFile {
  public:
    /// What a file would be opened for; values may be combined.
    enum AccessMode : int {
        kAccessRead = 1,     ///< reading
        kAccessWrite = 2,    ///< writing
        kAccessReadWrite = 3 ///< both
    };

    /// What others may do to the file meanwhile; values may be combined.
    enum ShareMode : int {
        kShareNone = 0,      ///< nothing
        kShareRead = 1,      ///< read
        kShareWrite = 2,     ///< write
        kShareReadWrite = 3, ///< read and write
        kShareDelete = 4,    ///< delete and rename
        kShareAll = 7        ///< everything
    };

    /// One of the time stamps that the system keeps.
    enum TimeAttribute : int {
        kTimeCreated = 0,  ///< when it was created
        kTimeModified = 1, ///< when its content was changed
        kTimeAccessed = 2  ///< when it was read; the system may write this one late, or never
    };

    /// Names nothing.
    OFile() = default;

    /// Names what is, or will be, at that path.
    explicit OFile(OPath path);

    /// The path given at construction, or by Rename or ResolveAlias since.
    OPath const &GetPath() const { return m_Path; }

    /// Whether a file or folder is there. False for an empty path and for one that cannot be looked up.
    bool Exists() const;

    /// Whether the folder that holds the path exists. The root of a drive or share has none: false.
    bool ParentExists() const;

    /// Deletes a file, a read-only one too, or an empty folder; of a link, the link. False if nothing was there, if the
    /// folder is not empty, or if another handle holds the file.
    bool Delete() const;

    /// Creates an empty file. One that is there is emptied with `replace`, else it stays and the result is false. False
    /// also for a folder, a missing parent folder, and with `replace` for a file that is read-only or held by others.
    bool MakeFile(bool replace) const;

    /// Sets the times of the last change and access of a file or folder to now, of a read-only one too. False if
    /// nothing is there.
    bool Touch() const;

    /// If the path names a shell link (".lnk"), takes the path of its target instead, which need not exist. Other paths
    /// stay: true. False, and no change, if the link is missing, cannot be read, or leads to no file.
    bool ResolveAlias();

    /// Whether the file could be opened so right now. False for a folder, a missing file, a read-only file that is to
    /// be written, and one that others hold in a way that does not fit.
    bool CanOpen(AccessMode access, ShareMode share) const;

    /// Bytes in the file; 0 for a folder and if nothing is there.
    KTUInt64 GetSize() const;

    /// The time stamp of the file or folder in units of 100 ns since the beginning of 1601, UTC; 0 if nothing is there
    /// or the disk does not keep it.
    KTUInt64 GetTimeAttribute(TimeAttribute attribute) const;

    /// Moves the file or folder to another path, never over anything that is there, and names it from then on; where
    /// nothing is at the old path, only the name changes. False, and no change, if the new path is not valid or taken,
    /// its folder is missing, or others hold the file.
    bool Rename(OPath const &path);

    /// Whether both name the same path text.
    friend bool operator==(OFile const &a, OFile const &b) { return a.m_Path == b.m_Path; }
    friend bool operator!=(OFile const &a, OFile const &b) { return a.m_Path != b.m_Path; }

  private:
    OPath m_Path;
};

#include "KTEndExports.h"
