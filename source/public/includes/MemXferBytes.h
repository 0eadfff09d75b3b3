// MemXferBytes.h: a byte transport over one block of memory.

#pragma once

#include "IKTXferBytes.h"
#include "KTFile.h"

#include "KTBeginExports.h"

class FileXferBytes;

/// Keeps up to 262,144 (0x40000) bytes in memory; a writer that needs more takes a file. It is empty and ready for use
/// once created, and is never in any state but good and end-of-stream.
///
/// A copy, and a target of an assignment, shares the block of its source: only one of the two may be destroyed while it
/// owns the block. One transport belongs to one thread at a time.
class KT_PUBLIC_API MemXferBytes : public IKTXferBytes {
  public:
    /// Allocates the block; throws std::bad_alloc.
    MemXferBytes();
    MemXferBytes(MemXferBytes const &other);
    MemXferBytes &operator=(MemXferBytes const &other);
    ~MemXferBytes() override;

    /// Copies the bytes between the position and the end of the data, at most `count`. When there are fewer, the state
    /// becomes end-of-stream. Returns the number of bytes copied.
    unsigned int Read(void *buffer, unsigned int count) override;

    /// Stores all `count` bytes and returns `count`; or, when the block has no room for all of them, stores nothing and
    /// returns 0.
    unsigned int Write(void *buffer, unsigned int count) override;

    /// Moves the position, in unsigned 32-bit arithmetic; past the end of the data (so also before the beginning) it
    /// becomes the end. An origin of no KTSeekFromWhere leaves it where it is. End-of-stream becomes good. Returns the
    /// position.
    unsigned int Seek(int offset, KTSeekFromWhere origin) override;

    unsigned int Tell() override;

    /// Does nothing.
    void Flush() override;

    KTStreamState GetStreamState() override;
    void SetEndOfStream() override;

  private:
    void CreateFileBackingStore();

    // The order of the fields is part of the binary interface.
    unsigned char *m_Buffer;
    unsigned int m_Capacity;
    unsigned int m_Position = 0;
    unsigned int m_Length = 0; // end of the data: the position behind the last byte written
    KTStreamState m_State = kKTStreamStateGood;
    KTBool16 m_OwnsBuffer = 1;
    KTBool16 m_BackingStoreActive = 0; // calls would be forwarded to the backing store; nothing sets it
    KTFile m_BackingFile;
    FileXferBytes *m_BackingStore = nullptr;
};

#include "KTEndExports.h"
