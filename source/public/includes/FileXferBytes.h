// FileXferBytes.h: a byte transport over a file of the system, with a buffer for writing and one for reading ahead.
//
// Writes are gathered in a buffer of 524,288 bytes. Reads go straight to the file at first; when small reads (below
// 262,144 bytes each) that follow one another have asked for 65,537 bytes in all, a second buffer of 524,288 bytes reads
// ahead for them. A seek further than 32,768 bytes starts that count anew. Reads of 65,536 bytes and more pass all
// buffers by.
//
// Each call of the system moves, of r bytes that are still to be moved,
//
//     r                                      if r <= 4,096
//     r rounded down to a multiple of 4,096  if r <= 65,536
//     65,536                                 otherwise

#pragma once

#include "IKTXferBytes.h"
#include "KTFile.h"

#include "KTBeginExports.h"

struct OTransfer;

/// Reads and writes a file. Nothing throws. What the system refuses puts the state to error and shows as a short count; a
/// later end-of-stream may replace that state and a seek then clear it, so look at the state after each piece of work
/// that must not be lost. Bytes that are gathered when the system takes no more of them (a full disk) are gone then: the
/// call that wrote them out tells, by its count or by the state.
///
/// A copy, and a target of an assignment, shares the handle and the buffers of its source: only one of the two may be
/// used and destroyed while they hold any. One transport belongs to one thread at a time.
///
/// A transport without a file has a null handle. To read, write, seek or close then is reported as the assertion
/// "fCoreFileHandle is nil", and fails as the system's calls do.
class KT_PUBLIC_API FileXferBytes : public IKTXferBytes {
  public:
    /// Bits of the mode of Open; they may be combined. What becomes of the file:
    ///
    ///     append                     opened, or created if it is missing
    ///     write                      the same; emptied with kCreateOrTruncate
    ///     neither, to read           opened; emptied with kCreateOrTruncate. It must be there, and emptying it is left
    ///                                to the system, which may refuse it without the right to write.
    enum OpenMode : unsigned int {
        kOpenRead = 0x1,        ///< may be read
        kOpenWrite = 0x2,       ///< may be written, from the beginning on, or with kOpenAppend from the end on
        kOpenAppend = 0x4,      ///< may be written; alone, it does not move to the end
        kCreateOrTruncate = 0x8 ///< what was in the file goes; without effect when appending
    };

    /// No file is open: the state is error.
    FileXferBytes();
    FileXferBytes(FileXferBytes const &other);
    FileXferBytes &operator=(FileXferBytes const &other);

    /// Closes the file.
    ~FileXferBytes() override;

    /// First writes out what is gathered. Reads `count` bytes, or what there is of them. Returns the number of bytes
    /// read. The state becomes end-of-stream if there were fewer than `count`, or if reading ahead ended exactly with
    /// them; and error if the system failed, or took less than all of what was gathered.
    unsigned int Read(void *buffer, unsigned int count) override;

    /// Gathers the bytes, or writes more than 524,288 of them straight to the file. Returns the number of bytes accepted:
    /// 0 if what was gathered before could not be written out, or if the file was not opened for writing.
    unsigned int Write(void *buffer, unsigned int count) override;

    /// First writes out what is gathered. Moves to `offset` bytes from `origin` and returns the new position.
    /// End-of-stream becomes good. A place before the beginning leaves the position as it is, and the state becomes
    /// error; a place behind the end is one, as for the system. From the beginning, offsets count as unsigned where the
    /// file is large enough for that: a position above 2 GiB, given as an int, is found again.
    ///
    /// While bytes are buffered for reading, a relative move that leaves them starts from the file position behind all
    /// of them, less their number: the bytes of them that have been read are not counted. Seek from the beginning where
    /// that matters.
    unsigned int Seek(int offset, KTSeekFromWhere origin) override;

    /// The position, but behind a read-ahead as far beyond it as the bytes read ahead reach:
    /// Seek(0, kKTSeekFromCurrent) then tells the place of the next byte.
    unsigned int Tell() override;

    /// Writes out what is gathered. The system may still hold it in its cache.
    void Flush() override;

    KTStreamState GetStreamState() override;

    /// Ends the file at the system's position: behind the bytes read ahead, and before the bytes gathered, which are not
    /// written out first.
    void SetEndOfStream() override;

    /// Opens a file; one that is open is closed first. `mode` is made of the bits of OpenMode; the other two numbers are
    /// ignored. Others may read the file meanwhile. Returns 1 and state good, or 0 and state closed: also without memory
    /// for the name, and for a file to be appended to that ends at 4 GiB or beyond.
    virtual KTBool16 Open(KTFile const &file, unsigned int mode, unsigned int ignored, unsigned int ignoredToo);

    /// Writes out what is gathered and closes the file; does nothing more to a closed one. The state is closed then, so
    /// to learn whether all was written, call Flush and look at the state before.
    virtual void Close();

  protected:
    /// The same as the default constructor, for files that are to be opened with other flags and attributes of
    /// CreateFileW than FILE_ATTRIBUTE_NORMAL (128).
    explicit FileXferBytes(unsigned int createFlags);

    /// Makes room for `count` bytes: writes out what is gathered, unless they fit behind it. Returns 0 if not all of it
    /// was written; the buffer is empty then as well.
    KTBool16 FlushBuffer(unsigned int count);

    /// Writes straight to the file and returns the number of bytes written; the state becomes error if that is not all.
    unsigned int WriteBytes(void *buffer, unsigned int count);

  private:
    friend class OFileShortcut; // the typed streams' way to the buffers

    void AssertHandle(int line) const;
    bool WriteOutBuffer();
    unsigned int WriteSlowly(void *buffer, unsigned int count);
    unsigned int ReadSlowly(unsigned char *buffer, unsigned int count);
    void AllocateReadAhead(unsigned int count);
    void EmptyReadAhead();
    unsigned int TakeBuffered(unsigned char *buffer, unsigned int count);
    unsigned int ReadUnbuffered(unsigned char *buffer, unsigned int count);
    bool ReadWholeBlocks(unsigned char *buffer, unsigned int count, unsigned int &done);
    unsigned int ReadThroughBuffer(unsigned char *buffer, unsigned int count);
    unsigned int ReadStraight(unsigned char *buffer, unsigned int count);
    OTransfer ReadFromFile(unsigned char *buffer, unsigned int count);
    unsigned int SeekFromBeginning(int offset);
    unsigned int SeekFromEnd(int offset);
    unsigned int SeekRelative(long long offset);
    unsigned int MoveHandle(long long distance, KTSeekFromWhere origin);
    unsigned int RereadPosition();
    bool ReachesTo(unsigned int position) const;

    // The order of the fields is part of the binary interface.
    void *m_Handle = nullptr; // null, or the system's handle, its invalid one included
    KTFile m_File;
    KTStreamState m_State = kKTStreamStateError;
    unsigned char *m_WriteBuffer = nullptr;
    int m_WriteFill = 0;
    unsigned int m_WriteCapacity = 0;
    unsigned char *m_ReadAheadBuffer = nullptr;
    unsigned int m_ReadAheadCapacity = 0;
    unsigned int m_ReadAheadCursor = 0;     // the next byte of the buffer to be read
    unsigned int m_ReadAheadFill = 0;       // bytes in the buffer
    unsigned int m_SequentialReadTotal = 0; // bytes asked for since the file was opened, or since the last far seek
    unsigned int m_FilePosition = 0;        // the handle's position, as far as this object moved it
    unsigned int m_CreateFlags;
    unsigned int m_ReadAheadBase = 0; // the file's position at which the buffer begins
};

#include "KTEndExports.h"
