// KTStreamUtil.h: makes streams, and copies, saves, clones and compares them whole.
//
//     std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamWrite(file, 0x2 | 0x8, 0, 0));
//     document.Xfer(*stream);
//     stream->Flush();
//     if (stream->GetStreamState() != kKTStreamStateGood)
//         ... the document is not on the disk
//
// Threads: operations may run on any thread, one at a time for each stream. Clone uses the session folder, whose first
// use is not locked: see KTFileUtil. Nothing is thrown but std::bad_alloc, by what makes streams.

#pragma once

#include "IKTReadWriteStream.h"
#include "IKTStream.h"
#include "KTErrorCodes.h"
#include "KTFile.h"
#include "KTString.h"

#include "KTBeginExports.h"

class KT_PUBLIC_API KTStreamUtil {
  public:
    /// How streams are compared.
    enum StreamCompareStrategies : int {
        kCompareByteByByte = 0 ///< all bytes; any other value compares nothing
    };

    KTStreamUtil() = delete;

    // ---- streams ----
    //
    // Each makes a stream with a transport of its own; the caller deletes the stream. Those on files pass their numbers
    // to FileXferBytes::Open: the mode, made of FileXferBytes::OpenMode, and two that are ignored. A stream whose file
    // could not be opened has the state closed; the factories that say so return null instead. The others return it on
    // purpose: ask for its state.

    /// Reads a file. Null if it could not be opened.
    static IKTStream *CreateFileStreamRead(KTFile const &file, unsigned int mode, unsigned int ignored,
                                           unsigned int ignoredToo);

    /// Reads a file. Returns a stream also if the file could not be opened.
    static IKTStream *CreateFileStreamReadLazy(KTFile const &file, unsigned int mode, unsigned int ignored,
                                               unsigned int ignoredToo);

    /// Writes a file. Both are one operation, and return a stream also if the file could not be opened.
    static IKTStream *CreateFileStreamWrite(KTFile const &file, unsigned int mode, unsigned int ignored,
                                            unsigned int ignoredToo);
    static IKTStream *CreateFileStreamWriteLazy(KTFile const &file, unsigned int mode, unsigned int ignored,
                                                unsigned int ignoredToo);

    /// Reads and writes a file. Null if it could not be opened.
    static IKTReadWriteStream *CreateFileStreamReadWrite(KTFile const &file, unsigned int mode, unsigned int ignored,
                                                         unsigned int ignoredToo);

    /// Reads and writes a file. Returns a stream also if the file could not be opened.
    static IKTReadWriteStream *CreateFileStreamReadWriteLazy(KTFile const &file, unsigned int mode,
                                                             unsigned int ignored, unsigned int ignoredToo);

    /// Reads, writes, or does both in memory: at most 262,144 bytes (MemXferBytes). What only reads starts empty and
    /// stays so.
    static IKTStream *CreateMemoryStreamRead();
    static IKTStream *CreateMemoryStreamWrite();
    static IKTReadWriteStream *CreateMemoryStreamReadWrite();

    // ---- whole streams ----

    /// Writes everything in `source`, from its beginning to its end, to `target` at its position, in blocks of 4,096
    /// bytes. The source goes back to where its Tell was before; the target is neither flushed nor moved back. Returns
    /// kKTErrorFailed, with an assertion, if either is null, the source is not reading or the target not writing; else
    /// kKTErrorNone, also if the target did not take all: ask for its state. A source that ends before its size is made
    /// up with bytes of no meaning.
    static KTErrorCodeEnum StreamCopy(IKTStream *source, IKTStream *target);

    /// Makes the file, created if it is missing, hold what the stream holds. Returns what StreamCopy does, which does not
    /// tell whether the file could be opened and written, or kKTErrorFailed, with an assertion, if no writer could be
    /// made. The file stays as it is if `stream` is null or not reading.
    static KTErrorCodeEnum SaveReadStreamToFile(IKTStream *stream, KTFile const &file);
    static KTErrorCodeEnum SaveReadStreamToFile(IKTStream *stream, KTString const &path);

    /// A copy of the stream's bytes in a temporary file ".ikt" in the session folder, which stays until the session
    /// folder is deleted. The copy reads, and stands at its end: seek to the beginning first. The source goes back to
    /// where its Tell was before. Null if the file could not be made, or `stream` is null or not reading; the caller
    /// deletes the copy. That the disk did not take all of it shows in the copy's state alone, after Flush or Seek.
    static IKTStream *Clone(IKTStream *stream);

    /// Whether both hold the same bytes: 1 or 0. Any other strategy gives 1 without looking at them, null included. A
    /// stream that is null or not reading is equal to none. Both are left where the comparison ended. WRONG: two streams
    /// that both end before their sizes, as others have cut their files: the call then never returns.
    static KTBool16 Compare(IKTStream *first, IKTStream *second, StreamCompareStrategies strategy);
};

#include "KTEndExports.h"
