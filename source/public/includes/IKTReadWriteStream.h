// IKTReadWriteStream.h: a typed stream that is read and written in turns.

#pragma once

#include "IKTStream.h"
#include "KTErrorCodes.h"

#include "KTBeginExports.h"

/// A typed stream with a direction that can be changed. Reading and writing share one position:
///
///     stream.SetMode(IKTReadWriteStream::kModeWrite);
///     stream.XferInt32(number);
///     stream.Seek(0, kKTSeekFromBeginning);
///     stream.SetMode(IKTReadWriteStream::kModeRead);
///     stream.XferInt32(copy);
///
/// One stream belongs to one thread at a time.
class KT_PUBLIC_API IKTReadWriteStream : public IKTStream {
  public:
    /// Which way values go.
    enum Mode : int {
        kModeRead = 0, ///< from the stream
        kModeWrite = 1 ///< to the stream
    };

    IKTReadWriteStream();
    IKTReadWriteStream(IKTReadWriteStream const &other);
    IKTReadWriteStream &operator=(IKTReadWriteStream const &other);
    ~IKTReadWriteStream() override;

    /// Chooses the direction; the position stays. Returns kKTErrorNone.
    virtual KTErrorCodeEnum SetMode(Mode mode) = 0;

    /// The direction.
    virtual Mode GetMode() const = 0;
};

#include "KTEndExports.h"
