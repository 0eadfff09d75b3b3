// KTTempFileHolder.h: a list of files that are temporary.

#pragma once

#include "KTErrorCodes.h"
#include "KTFile.h"

#include <vector>

#include "KTBeginExports.h"

/// Remembers which files are temporary, in the order in which they were added. It deletes none of them: the session
/// folder goes as a whole (KTFileUtil::DeleteAllTempFilesCreated). Distinct values may be used from any thread; one
/// value is not locked.
class KT_PUBLIC_API KTTempFileHolder {
  public:
    /// Holds no file.
    KTTempFileHolder();

    /// Holds this one.
    explicit KTTempFileHolder(KTFile const &file);

    /// Holds these.
    explicit KTTempFileHolder(std::vector<KTFile> const &files);

    /// Adds a file at the end. Returns kKTErrorFailed, and changes nothing, if its path is held already. Throws
    /// std::bad_alloc.
    KTErrorCodeEnum AddFile(KTFile const &file);

    /// Adds the files that are not held yet, in order. Returns kKTErrorFailed if any was. Throws std::bad_alloc.
    KTErrorCodeEnum AddFile(std::vector<KTFile> const &files);

    /// A copy of the list.
    std::vector<KTFile> GetFileList() const;

  private:
    std::vector<KTFile> m_Files;
};

#include "KTEndExports.h"
