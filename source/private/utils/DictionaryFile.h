// DictionaryFile.h: where dictionaries meet the file system. A Windows file stands behind it, and a stand-in for the
// native build. Any thread.

#pragma once

#include "DictionaryBytes.h"
#include "OPath.h"

#include <memory>

namespace orvik_private {

/// A file that is being written. It is gone again unless Finish is called.
class NewFile : public ByteSink {
  public:
    /// Writes out what is pending and keeps the file. False when the device fails; the file is then gone, too.
    virtual bool Finish() = 0;
};

/// Opens a file for reading; others may read it meanwhile. Null if that cannot be done, as for a folder.
std::unique_ptr<ByteSource> OpenDictionaryFile(OPath const &path);

/// Creates a file. A file or folder that is there is never touched: null, and `isTaken` becomes true. Null also when
/// the file cannot be created for another reason.
std::unique_ptr<NewFile> CreateDictionaryFile(OPath const &path, bool &isTaken);

} // namespace orvik_private
