// KTFile.h: a file or folder on disk, named by its path.
//
//     KTFile const notes(KTString("C:\\Courses\\Harbour\\notes.txt"));
//     if (notes.Exists() && notes.CanOpen(KTFile::kAccessRead, KTFile::kShareRead))
//         bytes = notes.GetSize();
//
// Nothing here opens a file for its content; that is the streams' business.

#pragma once

#include "KTPath.h"
#include "KTTypes.h"
#include "OFile.h"

#include <cstddef>

#include "KTBeginExports.h"

/// Names a file-system object. Copying and assignment copy the path. Objects are allocated with the library's
/// Allocate and Deallocate, so that they may be created on one side of the library boundary and deleted on the other.
/// Paths may have every form that OFile describes. Distinct values may be used from any thread; one value is not locked.
class KT_PUBLIC_API KTFile {
  public:
    /// What CanOpen asks for, and which time stamp is meant: see OFile for the values.
    using AccessMode = OFile::AccessMode;
    using ShareMode = OFile::ShareMode;
    using TimeAttribute = OFile::TimeAttribute;
    using enum OFile::AccessMode;
    using enum OFile::ShareMode;
    using enum OFile::TimeAttribute;

    /// Names nothing.
    KTFile();

    /// Names what is, or will be, at that path.
    KTFile(KTPath const &path);
    KTFile(KTString const &path);
    KTFile(OFile file);
    KTFile(OPath path);
    KTFile(OString path);

    KTFile(KTFile const &other);
    KTFile &operator=(KTFile const &other);
    virtual ~KTFile();

    /// Whether a file or folder is there; both are one operation. False for an empty path.
    bool Exists() const;
    bool DoesFileExist() const;

    /// Whether the folder that holds the path exists; see OFile::ParentExists.
    bool ParentExists() const;

    /// Deletes a file, a read-only one too, or an empty folder; both are one operation. False if nothing was there, if
    /// the folder is not empty (KTFileUtil::DeleteDirectory deletes it), or if another handle holds the file.
    bool Delete() const;
    bool ForceDelete() const;

    /// Creates an empty file. One that is there is emptied with `replace`, else it stays and the result is false. False
    /// also for a folder, a missing parent folder, and with `replace` for a file that is read-only or held by others.
    bool MakeFile(bool replace) const;

    /// Sets the times of the last change and access of a file or folder to now. False if nothing is there.
    bool Touch() const;

    /// If the path names a shell link (".lnk"), names the link's target instead; see OFile::ResolveAlias.
    bool ResolveAlias();

    /// Whether the file could be opened so right now; see OFile::CanOpen.
    bool CanOpen(AccessMode access, ShareMode share) const;

    /// Bytes in the file; 0 for a folder and if nothing is there.
    KTUInt64 GetSize() const;

    /// The time stamp in units of 100 ns since the beginning of 1601, UTC; 0 if nothing is there.
    KTUInt64 GetTimeAttribute(TimeAttribute attribute) const;

    /// The path as a path value.
    KTPath GetPath() const;

    /// The file layer's path; valid until this value changes.
    OPath const &GetOPath() const { return m_File.GetPath(); }

    /// The path as text.
    KTString GetPathString() const;

    /// The path as the system's wide characters, zero-terminated; the text is this object's and valid until it changes.
    wchar_t const *GrabTString() const;

    /// Moves the file or folder that this value names, and names the new path. Where nothing is at the old path, only
    /// the value changes. Nothing is ever replaced: false, and no change, if the new path is taken or not valid, its
    /// folder is missing, or others hold the file.
    bool SetPath(KTPath const &path);
    bool SetPath(KTString const &path);

    /// Whether both name the same path, unit by unit.
    bool operator==(KTFile const &other) const;
    bool operator!=(KTFile const &other) const;

    static void *operator new(std::size_t size);
    static void operator delete(void *block);
    static void *operator new(std::size_t, void *place) noexcept { return place; }
    static void operator delete(void *, void *) noexcept {}

  private:
    /// Called when the path has changed; does nothing here.
    virtual void PathChanged(OString const &path);

    OFile m_File;
};

#include "KTEndExports.h"
