// TempFileXferBytes.h: a byte transport over a temporary file.

#pragma once

#include "FileXferBytes.h"

#include "KTBeginExports.h"

/// A FileXferBytes whose file, when it is created by Open, gets the attribute FILE_ATTRIBUTE_TEMPORARY: the system then
/// keeps it in memory as far as it can. The file is not deleted when it is closed; that is its owner's business. Copies
/// and threads as for FileXferBytes.
class KT_PUBLIC_API TempFileXferBytes : public FileXferBytes {
  public:
    TempFileXferBytes();
    TempFileXferBytes(TempFileXferBytes const &other);
    TempFileXferBytes &operator=(TempFileXferBytes const &other);
    ~TempFileXferBytes() override;
};

#include "KTEndExports.h"
