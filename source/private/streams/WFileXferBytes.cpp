// WFileXferBytes.cpp: the transport over a file.
//
// It names no call of the system: those are behind OFileHandle.h, so that the buffers can be tried natively, too. What is
// where, while the file is read through the buffer and then written:
//
//     file      ...........|########################|...........
//                          ^ base                   ^ file position: where the handle stands
//     read-ahead buffer    |########################|
//                                   ^ cursor        ^ fill
//     write buffer                                  |=======|   goes to where the handle stands
//                                                           ^ fill
//
// To empty the read-ahead buffer sets its cursor and fill to 0 and leaves its base. Bytes "are buffered" as long as the
// fill is not 0, also when all of them have been read.

#include "FileXferBytes.h"

#include "OFileHandle.h"
#include "OFileShortcut.h"
#include "OStreamReport.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <new>

namespace {

constexpr char kReportPath[] = "source/private/streams/WFileXferBytes";
constexpr char kNoHandle[] = "fCoreFileHandle is nil";

// The reports' own numbers.
constexpr int kCloseLine = 181;
constexpr int kReadLine = 209;
constexpr int kWriteLine = 334;
constexpr int kNoBufferLine = 352;
constexpr int kOverflowLine = 353;
constexpr int kWriteBytesLine = 377;
constexpr int kSeekLine = 421;

constexpr unsigned int kNormalAttribute = 128; // FILE_ATTRIBUTE_NORMAL
constexpr unsigned int kBufferCapacity = 0x80000;
constexpr unsigned int kLargestTransfer = 0x10000;
constexpr unsigned int kTransferUnit = 0x1000;
constexpr unsigned int kLargestBufferedRead = 0x3FFFF;
constexpr unsigned int kReadAheadThreshold = 0x10001; // bytes asked for before reading ahead pays
constexpr unsigned int kNearSeek = 0x8000;            // further moves are no sequential reading

// The size of the next call when `rest` bytes are still to be moved.
constexpr unsigned int TransferSize(unsigned int rest) {
    if (rest <= kTransferUnit) {
        return rest;
    }
    return rest > kLargestTransfer ? kLargestTransfer : rest / kTransferUnit * kTransferUnit;
}

// Calls transfer(bytes, size) until all has moved, a call moves nothing, or one fails.
template <typename Bytes, typename Transfer>
OTransfer TransferAll(Bytes *bytes, unsigned int count, Transfer transfer) {
    unsigned int done = 0;
    while (done < count) {
        OTransfer const moved = transfer(bytes + done, TransferSize(count - done));
        done += moved.bytes;
        if (!moved.succeeded || moved.bytes == 0) {
            return {moved.succeeded, done};
        }
    }
    return {true, done};
}

unsigned int AccessOf(unsigned int mode) {
    bool const reads = (mode & FileXferBytes::kOpenRead) != 0;
    bool const writes = (mode & (FileXferBytes::kOpenWrite | FileXferBytes::kOpenAppend)) != 0;
    return (reads ? kOAccessRead : kOAccessNone) | (writes ? kOAccessWrite : kOAccessNone);
}

ODisposition DispositionOf(unsigned int mode) {
    if ((mode & FileXferBytes::kOpenAppend) != 0) {
        return ODisposition::OpenAlways;
    }
    bool const empties = (mode & FileXferBytes::kCreateOrTruncate) != 0;
    if ((mode & FileXferBytes::kOpenWrite) != 0) {
        return empties ? ODisposition::CreateAlways : ODisposition::OpenAlways;
    }
    return empties ? ODisposition::TruncateExisting : ODisposition::OpenExisting;
}

// Whether there was memory for the name.
bool TakeName(KTFile &to, KTFile const &from) {
    try {
        if (&to != &from) {
            to = from;
        }
        return true;
    } catch (std::bad_alloc const &) {
        return false;
    }
}

} // namespace

FileXferBytes::FileXferBytes() : FileXferBytes(kNormalAttribute) {}
FileXferBytes::FileXferBytes(unsigned int createFlags) : m_CreateFlags(createFlags) {}
FileXferBytes::FileXferBytes(FileXferBytes const &other) = default;
FileXferBytes &FileXferBytes::operator=(FileXferBytes const &other) = default;
FileXferBytes::~FileXferBytes() { FileXferBytes::Close(); }

// ---- open and close ----

KTBool16 FileXferBytes::Open(KTFile const &file, unsigned int mode, unsigned int, unsigned int) {
    bool const isNamed = TakeName(m_File, file);
    if (m_Handle != nullptr && m_State != kKTStreamStateClosed) {
        Close();
    }
    if (!isNamed) {
        m_State = kKTStreamStateClosed;
        return 0;
    }
    bool const writes = (mode & kOpenWrite) != 0;
    bool const appends = (mode & kOpenAppend) != 0;
    if (writes || appends) {
        // An earlier buffer, which an Open that failed has left, is not freed: a copy of this object may share it. What
        // was gathered there was meant for a file that never opened, and does not go to this one.
        m_WriteCapacity = kBufferCapacity;
        m_WriteBuffer = new (std::nothrow) unsigned char[kBufferCapacity];
        m_WriteFill = 0;
    }
    m_Handle = OOpenFile(m_File.GetOPath(), AccessOf(mode), DispositionOf(mode), m_CreateFlags);
    if (!OIsOpen(m_Handle)) {
        m_State = kKTStreamStateClosed;
        return 0;
    }
    m_SequentialReadTotal = 0;
    m_State = kKTStreamStateGood;
    if (writes) {
        MoveHandle(0, appends ? kKTSeekFromEnd : kKTSeekFromBeginning);
    } else {
        RereadPosition();
    }
    if (writes && appends && m_State != kKTStreamStateGood) {
        FileXferBytes::Close(); // the end is out of reach: what is to be appended would go to the beginning
        return 0;
    }
    m_State = kKTStreamStateGood; // others may have no position, as a pipe
    return 1;
}

void FileXferBytes::Close() {
    if (m_WriteFill != 0) {
        WriteOutBuffer();
    }
    delete[] m_WriteBuffer;
    m_WriteBuffer = nullptr;
    delete[] m_ReadAheadBuffer;
    m_ReadAheadBuffer = nullptr;
    m_ReadAheadCapacity = 0;
    EmptyReadAhead();
    if (m_State == kKTStreamStateClosed) {
        return;
    }
    AssertHandle(kCloseLine);
    if (!OCloseFile(m_Handle)) {
        m_State = kKTStreamStateError;
    }
    m_State = kKTStreamStateClosed;
    m_Handle = nullptr;
}

KTStreamState FileXferBytes::GetStreamState() { return m_State; }

void FileXferBytes::SetEndOfStream() {
    if (!OSetEndOfFile(m_Handle)) {
        m_State = kKTStreamStateError;
    }
}

void FileXferBytes::AssertHandle(int line) const {
    if (m_Handle == nullptr) {
        OStreamReport(kNoHandle, kReportPath, line);
    }
}

// ---- writing ----

unsigned int FileXferBytes::Write(void *buffer, unsigned int count) {
    auto const copy = [=](unsigned char *to) { OCopyBytes(to, static_cast<unsigned char const *>(buffer), count); };
    return OFileShortcut::Put(*this, count, copy) ? count : WriteSlowly(buffer, count);
}

[[gnu::noinline]] unsigned int FileXferBytes::WriteSlowly(void *buffer, unsigned int count) {
    AssertHandle(kWriteLine);
    if (FlushBuffer(count) == 0) {
        return 0;
    }
    if (count > m_WriteCapacity) {
        return WriteBytes(buffer, count);
    }
    if (m_WriteBuffer == nullptr) {
        OStreamReport("FileXferBytes::Write - nil buffer", kReportPath, kNoBufferLine);
        return 0; // there is nowhere to put the bytes
    }
    if (count > m_WriteCapacity - static_cast<unsigned int>(m_WriteFill)) {
        OStreamReport("FileXferBytes::Write - overflowing buffer", kReportPath, kOverflowLine);
        return 0; // nothing is written behind the buffer
    }
    OCopyBytes(m_WriteBuffer + m_WriteFill, static_cast<unsigned char const *>(buffer), count);
    m_WriteFill += static_cast<int>(count);
    return count;
}

KTBool16 FileXferBytes::FlushBuffer(unsigned int count) {
    if (m_WriteFill == 0 || count <= m_WriteCapacity - static_cast<unsigned int>(m_WriteFill)) {
        return 1;
    }
    return WriteOutBuffer() ? 1 : 0;
}

void FileXferBytes::Flush() {
    if (m_WriteFill != 0) {
        WriteOutBuffer();
    }
}

// What the system does not take is gone: the buffer is empty afterwards in any case.
bool FileXferBytes::WriteOutBuffer() {
    auto const fill = static_cast<unsigned int>(m_WriteFill);
    unsigned int const written = WriteBytes(m_WriteBuffer, fill);
    m_WriteFill = 0;
    return written == fill;
}

unsigned int FileXferBytes::WriteBytes(void *buffer, unsigned int count) {
    AssertHandle(kWriteBytesLine);
    OTransfer const written =
        TransferAll(static_cast<unsigned char const *>(buffer), count,
                    [this](void const *bytes, unsigned int size) { return OWriteFile(m_Handle, bytes, size); });
    m_FilePosition += written.bytes;
    if (!written.succeeded || written.bytes != count) {
        m_State = kKTStreamStateError;
    }
    return written.bytes;
}

// ---- reading ----

unsigned int FileXferBytes::Read(void *buffer, unsigned int count) {
    auto const copy = [=](unsigned char const *from) { OCopyBytes(static_cast<unsigned char *>(buffer), from, count); };
    bool const isTaken = count != 0 && OFileShortcut::Take(*this, count, copy);
    return isTaken ? count : ReadSlowly(static_cast<unsigned char *>(buffer), count);
}

[[gnu::noinline]] unsigned int FileXferBytes::ReadSlowly(unsigned char *buffer, unsigned int count) {
    AssertHandle(kReadLine);
    bool const isLost = m_WriteFill != 0 && !WriteOutBuffer();
    OFileShortcut::CountRead(*this, count);
    AllocateReadAhead(count);
    unsigned int const available = m_ReadAheadFill - m_ReadAheadCursor;
    unsigned int read = available == 0 ? 0 : TakeBuffered(buffer, std::min(count, available));
    if (available == 0 || count > available) {
        read += ReadUnbuffered(buffer + read, count - read);
    }
    if (isLost) {
        m_State = kKTStreamStateError; // the end of the file must not hide that bytes were lost
    }
    return read;
}

// Small reads that follow one another get the buffer; one large first read does not.
void FileXferBytes::AllocateReadAhead(unsigned int count) {
    if (m_ReadAheadBuffer == nullptr && m_SequentialReadTotal >= kReadAheadThreshold &&
        count != m_SequentialReadTotal && count <= kLargestBufferedRead) {
        m_ReadAheadBuffer = new (std::nothrow) unsigned char[kBufferCapacity]; // without it, nothing is read ahead
        m_ReadAheadCapacity = m_ReadAheadBuffer == nullptr ? 0 : kBufferCapacity;
    }
}

void FileXferBytes::EmptyReadAhead() {
    m_ReadAheadCursor = 0;
    m_ReadAheadFill = 0;
}

unsigned int FileXferBytes::TakeBuffered(unsigned char *buffer, unsigned int count) {
    OCopyBytes(buffer, m_ReadAheadBuffer + m_ReadAheadCursor, count);
    m_ReadAheadCursor += count;
    return count;
}

// Reads when nothing unread is buffered.
unsigned int FileXferBytes::ReadUnbuffered(unsigned char *buffer, unsigned int count) {
    unsigned int done = 0;
    if (count >= kLargestTransfer && !ReadWholeBlocks(buffer, count, done)) {
        return done;
    }
    EmptyReadAhead();
    unsigned int const rest = count - done;
    bool const isBuffered = m_ReadAheadBuffer != nullptr && rest >= 1 && rest <= kLargestBufferedRead &&
                            m_SequentialReadTotal >= kReadAheadThreshold;
    return done + (isBuffered ? ReadThroughBuffer(buffer + done, rest) : ReadStraight(buffer + done, rest));
}

// Reads as many blocks of the largest size as `count` holds. Whether there is more to read.
bool FileXferBytes::ReadWholeBlocks(unsigned char *buffer, unsigned int count, unsigned int &done) {
    EmptyReadAhead();
    while (count - done >= kLargestTransfer) {
        OTransfer const read = OReadFile(m_Handle, buffer + done, kLargestTransfer);
        done += read.bytes;
        m_FilePosition += read.bytes;
        if (!read.succeeded || read.bytes < kLargestTransfer) {
            m_State = read.succeeded ? kKTStreamStateEndOfStream : kKTStreamStateError;
            return false;
        }
    }
    return done < count;
}

unsigned int FileXferBytes::ReadThroughBuffer(unsigned char *buffer, unsigned int count) {
    m_ReadAheadBase = m_FilePosition;
    OTransfer const filled = ReadFromFile(m_ReadAheadBuffer, m_ReadAheadCapacity);
    m_ReadAheadFill = filled.bytes;
    if (filled.bytes <= count) {
        m_State = kKTStreamStateEndOfStream; // also when the file ends exactly with what was asked for
        count = filled.bytes;
    }
    if (!filled.succeeded) {
        m_State = kKTStreamStateError;
    }
    return TakeBuffered(buffer, count);
}

unsigned int FileXferBytes::ReadStraight(unsigned char *buffer, unsigned int count) {
    OTransfer const read = ReadFromFile(buffer, count);
    if (read.bytes < count) {
        m_State = kKTStreamStateEndOfStream;
    }
    if (!read.succeeded) {
        m_State = kKTStreamStateError;
    }
    return read.bytes;
}

OTransfer FileXferBytes::ReadFromFile(unsigned char *buffer, unsigned int count) {
    OTransfer const read =
        TransferAll(buffer, count, [this](void *bytes, unsigned int size) { return OReadFile(m_Handle, bytes, size); });
    m_FilePosition += read.bytes;
    return read;
}

// ---- position ----

unsigned int FileXferBytes::Tell() {
    return m_FilePosition + (m_WriteFill != 0 ? static_cast<unsigned int>(m_WriteFill) : m_ReadAheadCursor);
}

unsigned int FileXferBytes::Seek(int offset, KTSeekFromWhere origin) {
    AssertHandle(kSeekLine);
    Flush();
    if (m_State == kKTStreamStateEndOfStream) {
        m_State = kKTStreamStateGood;
    }
    switch (origin) {
    case kKTSeekFromBeginning:
        return SeekFromBeginning(offset);
    case kKTSeekFromCurrent:
        return SeekRelative(offset);
    case kKTSeekFromEnd:
        return SeekFromEnd(offset);
    }
    return SeekRelative(0); // no origin: the position stays
}

unsigned int FileXferBytes::SeekFromBeginning(int offset) {
    auto const position = static_cast<unsigned int>(offset);
    long long const target = offset < 0 && !ReachesTo(position) ? offset : static_cast<long long>(position);
    long long const next = static_cast<long long>(m_ReadAheadBase) + m_ReadAheadCursor;
    if (target >= m_FilePosition) {
        if (target > next + kNearSeek) {
            m_SequentialReadTotal = 0;
        }
        EmptyReadAhead();
        return SeekRelative(target - m_FilePosition);
    }
    if (m_ReadAheadFill != 0 && target >= m_ReadAheadBase) {
        return SeekRelative(target - next);
    }
    m_SequentialReadTotal = 0;
    EmptyReadAhead();
    return MoveHandle(target, kKTSeekFromBeginning);
}

unsigned int FileXferBytes::SeekFromEnd(int offset) {
    m_SequentialReadTotal = 0;
    EmptyReadAhead();
    return MoveHandle(offset, kKTSeekFromEnd);
}

unsigned int FileXferBytes::SeekRelative(long long offset) {
    bool const isBuffered = m_ReadAheadFill != 0;
    if (offset == 0) {
        return isBuffered ? m_ReadAheadBase + m_ReadAheadCursor : RereadPosition();
    }
    long long const cursor = m_ReadAheadCursor + offset;
    if (isBuffered && cursor >= 0 && cursor <= m_ReadAheadFill) { // on the very end of the buffered bytes, too
        m_ReadAheadCursor = static_cast<unsigned int>(cursor);
        return m_ReadAheadBase + m_ReadAheadCursor;
    }
    // From behind the buffered bytes; how many of them have been read is left out on purpose.
    long long const distance = offset - m_ReadAheadFill;
    if (distance > kNearSeek) {
        m_SequentialReadTotal = 0;
    }
    EmptyReadAhead();
    return MoveHandle(distance, kKTSeekFromCurrent);
}

// Moves the handle, and returns where it is then: where it was, if the system refuses.
unsigned int FileXferBytes::MoveHandle(long long distance, KTSeekFromWhere origin) {
    OMoveFrom const from = origin == kKTSeekFromBeginning ? OMoveFrom::Beginning
                           : origin == kKTSeekFromEnd     ? OMoveFrom::End
                                                          : OMoveFrom::Current;
    std::uint32_t position = 0;
    if (!OMoveFilePointer(m_Handle, distance, from, position)) {
        m_State = kKTStreamStateError;
    }
    return RereadPosition();
}

unsigned int FileXferBytes::RereadPosition() {
    std::uint32_t position = 0;
    if (OMoveFilePointer(m_Handle, 0, OMoveFrom::Current, position)) {
        m_FilePosition = position;
    } else {
        m_State = kKTStreamStateError;
    }
    return m_FilePosition;
}

// Whether the position lies in the file, or at its end.
bool FileXferBytes::ReachesTo(unsigned int position) const {
    std::uint64_t size = 0;
    return OGetOpenFileSize(m_Handle, size) && position <= size;
}
