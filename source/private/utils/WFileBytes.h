// WFileBytes.h: the bytes of open files on Windows, for the dictionary's engine and the tools beside it.

#pragma once

#include "DictionaryBytes.h"
#include "WOHandle.h"

#include <cstddef>
#include <cstdint>

namespace orvik_private {

/// A file that is read from its beginning to its end.
class WFileSource : public ByteSource {
  public:
    WFileSource(WOHandle handle, std::uint64_t size);

    std::uint64_t Size() const override { return m_Size; }
    std::size_t Read(void *bytes, std::size_t count) override;
    bool Failed() const override { return m_Failed; }

  protected:
    WOHandle &Handle() { return m_Handle; }

  private:
    WOHandle m_Handle;
    std::uint64_t m_Size;
    bool m_Failed = false;
};

/// Opens a file by its extended name; others may read it meanwhile. Sets `size` to its bytes. Where that cannot be done
/// the handle is invalid, and the thread's last error says why.
WOHandle OpenToRead(wchar_t const *name, std::uint64_t &size);

/// Writes all the bytes at the handle's position. False when the device fails; the thread's last error says why.
bool WriteWhole(WOHandle const &handle, char const *bytes, std::size_t count);

} // namespace orvik_private
