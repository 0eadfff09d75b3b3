// IKTXferBytes.h: the transport of untyped bytes underneath a typed stream (IKTStream.h).
//
//     host object  --Xfer...-->  IKTStream  --Read, Write-->  IKTXferBytes  -->  memory (MemXferBytes.h)
//                                                                           -->  file (FileXferBytes.h)
//                                                                           -->  temporary file (TempFileXferBytes.h)
//
// A transport knows nothing of the values that its bytes stand for. A stream owns the transport that it was given. Hosts
// may derive transports of their own.
//
// Positions, sizes and counts are bytes in unsigned 32-bit numbers: no transport addresses 4 GiB or more.

#pragma once

#include "KTTypes.h"

#include "KTBeginExports.h"

/// Where a seek's offset counts from. The value 3 is not used.
enum KTSeekFromWhere : int {
    kKTSeekFromBeginning = 1, ///< the offset is the position itself
    kKTSeekFromCurrent = 2,   ///< the offset is added to the current position
    kKTSeekFromEnd = 4        ///< the offset is added to the end
};

/// How a transport is doing.
enum KTStreamState : int {
    kKTStreamStateGood = 0,        ///< nothing has gone wrong
    kKTStreamStateEndOfStream = 1, ///< a read asked for more bytes than remained; a seek clears it
    kKTStreamStateError = 2,       ///< the operating system reported a failure
    kKTStreamStateClosed = 3       ///< the transport is closed, or could not be opened
};

/// Moves bytes between a stream and where they are kept. Nothing is thrown; failures show in the counts and in the state.
/// One transport belongs to one thread at a time.
class KT_PUBLIC_API IKTXferBytes {
  public:
    IKTXferBytes();
    IKTXferBytes(IKTXferBytes const &other);
    IKTXferBytes &operator=(IKTXferBytes const &other);
    virtual ~IKTXferBytes();

    /// Reads `count` bytes from the current position into `buffer` and moves on behind them. Returns the number of bytes
    /// read; fewer than `count` at the end of the data or after a failure. REQUIRES: room for `count` bytes.
    virtual unsigned int Read(void *buffer, unsigned int count) = 0;

    /// Writes `count` bytes from `buffer` at the current position and moves on behind them. Returns the number of bytes
    /// accepted. REQUIRES: `count` readable bytes.
    virtual unsigned int Write(void *buffer, unsigned int count) = 0;

    /// Moves to `offset` bytes from `origin` and returns the new position in bytes. End-of-stream becomes good again.
    virtual unsigned int Seek(int offset, KTSeekFromWhere origin) = 0;

    /// The current position in bytes from the beginning.
    virtual unsigned int Tell() = 0;

    /// Passes on what the transport still holds back.
    virtual void Flush() = 0;

    /// How the transport is doing.
    virtual KTStreamState GetStreamState() = 0;

    /// Ends the data at the current position.
    virtual void SetEndOfStream() = 0;
};

#include "KTEndExports.h"
