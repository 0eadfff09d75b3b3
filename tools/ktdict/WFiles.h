// WFiles.h: the tool's files on the disk.
//
// Not the library's file layer: to load the library is to empty its log, and the application whose texts are looked at
// may be running. One thread.

#pragma once

#include "DictionaryBytes.h"

#include <memory>
#include <string>

/// A file to read, others may read it meanwhile. Null, and the reason in `why`, when it cannot be opened.
std::unique_ptr<orvik_private::ByteSource> OpenInput(std::string const &path, std::string &why);

/// Whether there is a file or folder of that name.
bool IsThere(std::string const &path);

/// Whether both names lead to one file, by whatever way.
bool AreSameFile(std::string const &a, std::string const &b);

/// A file in the making. It is written under a name of its own in the target's folder and gets the target's name when it
/// is whole; until then whatever has that name stays as it is, and without Publish nothing of it remains.
class OutputFile : public orvik_private::ByteSink {
  public:
    /// Null, and the reason in `why`, when it cannot be created.
    static std::unique_ptr<OutputFile> Create(std::string const &target, std::string &why);

    /// Writes out what is pending, down to the disk. False, and the reason in `why`, when that fails.
    virtual bool Close(std::string &why) = 0;

    /// Opens it under its own name, to read back what was written. REQUIRES: Close has succeeded.
    virtual std::unique_ptr<orvik_private::ByteSource> Reopen(std::string &why) const = 0;

    /// Gives it the target's name, in one step. A file of that name is replaced only if `overwrites`. False, and the
    /// reason in `why`, when that fails. REQUIRES: Close has succeeded.
    virtual bool Publish(bool overwrites, std::string &why) = 0;
};
