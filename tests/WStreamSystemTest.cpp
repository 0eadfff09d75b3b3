// WStreamSystemTest.cpp: what the file transport asks of the system, call by call, and what becomes of the bytes when the
// system refuses. The library's imports are replaced for a time.
//
// Longer than other files: all of it is played through the same replacements.

#include "CKTStreamRead.h"
#include "CKTStreamReadWrite.h"
#include "CKTStreamWrite.h"
#include "FileXferBytes.h"
#include "KTFileUtil.h"
#include "KTStreamUtil.h"
#include "LogLines.h"
#include "MemXferBytes.h"
#include "StreamSupport.h"
#include "TempFileXferBytes.h"
#include "WChildProcess.h"
#include "WImportHook.h"

#include <windows.h>

#include <memory>
#include <new>
#include <numeric>

namespace {

constexpr wchar_t kLibrary[] = L"KTPublic.dll";
constexpr unsigned int kBuffer = 524288;

using Sizes = std::vector<DWORD>;

// What the system was asked for, and what it is to refuse.
struct Calls {
    std::vector<std::string> moves; // "distance method"
    Sizes reads;
    Sizes writes;
    Sizes opens; // access, share, disposition, flags
    HANDLE handle = nullptr;
    std::wstring path;
    bool hadSecurity = false;
    bool hadTemplate = false;

    long long writeRoom = -1; // bytes until the disk is full; -1: it never is
    bool writesShort = false; // a full disk takes what fits and reports success
    long long readRoom = -1;  // bytes until reading fails; -1: it never does
    bool closeFails = false;
    bool truncateFails = false;
    bool endIsTooFar = false; // the file has 4 GiB or more
};
Calls *calls = nullptr;

bool IsOurs(HANDLE handle) { return handle == calls->handle; }

HANDLE WINAPI HookedCreateFile(LPCWSTR path, DWORD access, DWORD share, LPSECURITY_ATTRIBUTES security,
                               DWORD disposition, DWORD flags, HANDLE source) {
    HANDLE const handle = CreateFileW(path, access, share, security, disposition, flags, source);
    calls->handle = handle;
    calls->path = path;
    calls->opens = {access, share, disposition, flags};
    calls->hadSecurity = security != nullptr;
    calls->hadTemplate = source != nullptr;
    return handle;
}

BOOL WINAPI HookedReadFile(HANDLE handle, LPVOID buffer, DWORD count, LPDWORD moved, LPOVERLAPPED overlapped) {
    if (IsOurs(handle)) {
        calls->reads.push_back(count);
        if (calls->readRoom >= 0) {
            if (count > calls->readRoom) {
                *moved = 0;
                SetLastError(ERROR_CRC);
                return FALSE;
            }
            calls->readRoom -= count;
        }
    }
    return ReadFile(handle, buffer, count, moved, overlapped);
}

BOOL WINAPI HookedWriteFile(HANDLE handle, LPCVOID buffer, DWORD count, LPDWORD moved, LPOVERLAPPED overlapped) {
    if (!IsOurs(handle)) {
        return WriteFile(handle, buffer, count, moved, overlapped);
    }
    calls->writes.push_back(count);
    if (calls->writeRoom < 0 || count <= calls->writeRoom) {
        calls->writeRoom -= calls->writeRoom < 0 ? 0 : count;
        return WriteFile(handle, buffer, count, moved, overlapped);
    }
    *moved = 0;
    if (calls->writesShort && calls->writeRoom > 0) {
        auto const fits = static_cast<DWORD>(calls->writeRoom);
        calls->writeRoom = 0;
        return WriteFile(handle, buffer, fits, moved, overlapped);
    }
    SetLastError(ERROR_DISK_FULL);
    return calls->writesShort ? TRUE : FALSE;
}

DWORD WINAPI HookedSetFilePointer(HANDLE handle, LONG distance, PLONG high, DWORD method) {
    if (IsOurs(handle)) {
        static constexpr char const *kMethods[] = {"begin", "current", "end"};
        long long const distant =
            high == nullptr ? distance : (static_cast<long long>(*high) << 32) | static_cast<DWORD>(distance);
        calls->moves.push_back(std::to_string(distant) + " " + kMethods[method]);
        if (calls->endIsTooFar && method == FILE_END) {
            SetLastError(ERROR_INVALID_PARAMETER);
            return INVALID_SET_FILE_POINTER;
        }
    }
    return SetFilePointer(handle, distance, high, method);
}

BOOL WINAPI HookedCloseHandle(HANDLE handle) {
    BOOL const closed = CloseHandle(handle);
    return IsOurs(handle) && calls->closeFails ? FALSE : closed;
}

BOOL WINAPI HookedSetEndOfFile(HANDLE handle) { return calls->truncateFails ? FALSE : SetEndOfFile(handle); }

class WStreamSystemTest : public StreamFixture {
  protected:
    WStreamSystemTest() { calls = &m_Calls; }

    void Open(KTFile const &file, unsigned int mode) {
        ASSERT_EQ(transport.Open(file, mode, 0, 0), 1);
        m_Calls.moves.clear();
    }

    // The calls since the last time.
    Sizes Reads() { return std::exchange(m_Calls.reads, {}); }
    Sizes Writes() { return std::exchange(m_Calls.writes, {}); }
    std::vector<std::string> Moves() { return std::exchange(m_Calls.moves, {}); }

    Calls m_Calls;
    WImportHook m_Create{kLibrary, "CreateFileW", &HookedCreateFile};
    WImportHook m_Read{kLibrary, "ReadFile", &HookedReadFile};
    WImportHook m_Write{kLibrary, "WriteFile", &HookedWriteFile};
    WImportHook m_Move{kLibrary, "SetFilePointer", &HookedSetFilePointer};
    WImportHook m_Close{kLibrary, "CloseHandle", &HookedCloseHandle};
    WImportHook m_Truncate{kLibrary, "SetEndOfFile", &HookedSetEndOfFile};
    FileXferBytes transport; // goes before the hooks
};

TEST_F(WStreamSystemTest, TheHooksAreInPlace) {
    for (WImportHook const *const hook : {&m_Create, &m_Read, &m_Write, &m_Move, &m_Close, &m_Truncate}) {
        EXPECT_TRUE(hook->IsActive());
    }
}

// ---- open ----

TEST_F(WStreamSystemTest, OpensWithTheAccessAndDispositionOfTheMode) {
    constexpr DWORD kReadWrite = GENERIC_READ | GENERIC_WRITE;
    struct Row {
        unsigned int mode;
        DWORD access;
        DWORD disposition;
        std::vector<std::string> moves;
    };
    Row const rows[] = {
        {0x0, 0, OPEN_EXISTING, {"0 current"}},
        {0x1, GENERIC_READ, OPEN_EXISTING, {"0 current"}},
        {0x2, GENERIC_WRITE, OPEN_ALWAYS, {"0 begin", "0 current"}},
        {0x3, kReadWrite, OPEN_ALWAYS, {"0 begin", "0 current"}},
        {0x4, GENERIC_WRITE, OPEN_ALWAYS, {"0 current"}},
        {0x5, kReadWrite, OPEN_ALWAYS, {"0 current"}},
        {0x6, GENERIC_WRITE, OPEN_ALWAYS, {"0 end", "0 current"}},
        {0x7, kReadWrite, OPEN_ALWAYS, {"0 end", "0 current"}},
        {0x8, 0, TRUNCATE_EXISTING, {"0 current"}},
        {0x9, GENERIC_READ, TRUNCATE_EXISTING, {"0 current"}},
        {0xA, GENERIC_WRITE, CREATE_ALWAYS, {"0 begin", "0 current"}},
        {0xB, kReadWrite, CREATE_ALWAYS, {"0 begin", "0 current"}},
        {0xC, GENERIC_WRITE, OPEN_ALWAYS, {"0 current"}},
        {0xF, kReadWrite, OPEN_ALWAYS, {"0 end", "0 current"}},
    };
    File("file", "x");
    for (Row const &row : rows) {
        SCOPED_TRACE(row.mode);
        transport.Open(File("file"), row.mode, 0x3F3F3F3F, 0x3F3F3F3F);
        DWORD const share = FILE_SHARE_READ;
        EXPECT_EQ(m_Calls.opens, (Sizes{row.access, share, row.disposition, FILE_ATTRIBUTE_NORMAL}));
        EXPECT_FALSE(m_Calls.hadSecurity);
        EXPECT_FALSE(m_Calls.hadTemplate);
        EXPECT_NE(m_Calls.path.find(Path("file").wstring()), std::wstring::npos);
        if (transport.GetStreamState() == kKTStreamStateGood) { // the system may refuse to empty without writing
            EXPECT_EQ(Moves(), row.moves);
        }
        transport.Close();
        Moves();
    }
}

TEST_F(WStreamSystemTest, TemporaryFilesHaveTheirAttribute) {
    TempFileXferBytes temporary;
    ASSERT_EQ(temporary.Open(File("file"), 3, 0, 0), 1);
    DWORD const access = GENERIC_READ | GENERIC_WRITE;
    EXPECT_EQ(m_Calls.opens, (Sizes{access, FILE_SHARE_READ, OPEN_ALWAYS, FILE_ATTRIBUTE_TEMPORARY}));
    temporary.Close();
    CKTTempFileStreamReadWrite const stream;
    EXPECT_EQ(m_Calls.opens, (Sizes{access, FILE_SHARE_READ, OPEN_ALWAYS, FILE_ATTRIBUTE_TEMPORARY}));
    EXPECT_TRUE(m_Calls.path.ends_with(L".ikt"));
    EXPECT_NE(m_Calls.path.find(L"KTSession-"), std::wstring::npos);
}

TEST_F(WStreamSystemTest, ClonesAndSavedFilesAreOrdinaryOnes) {
    Open(File("file", "abc"), 1);
    std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamRead(File("file"), 1, 0, 0));
    std::unique_ptr<IKTStream> const clone(KTStreamUtil::Clone(stream.get()));
    DWORD const access = GENERIC_READ | GENERIC_WRITE;
    EXPECT_EQ(m_Calls.opens, (Sizes{access, FILE_SHARE_READ, OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL}));
    EXPECT_EQ(KTStreamUtil::SaveReadStreamToFile(stream.get(), File("saved")), kKTErrorNone);
    DWORD const write = GENERIC_WRITE;
    EXPECT_EQ(m_Calls.opens, (Sizes{write, FILE_SHARE_READ, OPEN_ALWAYS, FILE_ATTRIBUTE_NORMAL}));
}

TEST_F(WStreamSystemTest, OthersMayReadWhatIsOpen) {
    Open(File("file", "abc"), 3);
    FileXferBytes other;
    EXPECT_EQ(other.Open(File("file"), 2, 0, 0), 0);
    EXPECT_EQ(other.GetStreamState(), kKTStreamStateClosed);
    transport.Close();
    EXPECT_EQ(transport.Open(File("file"), 1, 0, 0), 1);
    EXPECT_EQ(other.Open(File("file"), 1, 0, 0), 1);
}

TEST_F(WStreamSystemTest, ADeniedOpenIsClosed) {
    File("file", "old");
    HANDLE const holder =
        CreateFileW(Path("file").c_str(), GENERIC_READ, FILE_SHARE_READ, nullptr, OPEN_EXISTING, 0, nullptr);
    ASSERT_NE(holder, INVALID_HANDLE_VALUE);
    EXPECT_EQ(transport.Open(File("file"), 2, 0, 0), 0);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
    std::unique_ptr<IKTStream> writer(KTStreamUtil::CreateFileStreamWrite(File("file"), 0xA, 0, 0));
    ASSERT_NE(writer, nullptr);
    EXPECT_EQ(writer->GetStreamState(), kKTStreamStateClosed);
    int number = 1;
    writer->XferInt32(number);
    writer->Flush();
    EXPECT_EQ(writer->GetStreamState(), kKTStreamStateError);
    writer.reset();
    EXPECT_EQ(Content("file"), "old");
    CloseHandle(holder);
    EXPECT_EQ(transport.Open(KTFile(), 1, 0, 0), 0); // names nothing
    EXPECT_EQ(transport.Open(File(""), 1, 0, 0), 0); // a folder
}

// ---- sizes ----

TEST_F(WStreamSystemTest, WritesGatherAndGoOutInChunks) {
    Open(File("file", ""), 2);
    for (int i = 0; i < 100000; ++i) {
        WriteText(transport, "12345");
    }
    EXPECT_EQ(Writes(), Sizes{});
    WriteText(transport, std::string(30000, 'x')); // 500,000 bytes are gathered
    EXPECT_EQ(Writes(), (Sizes{65536, 65536, 65536, 65536, 65536, 65536, 65536, 40960, 288}));
    transport.Flush();
    EXPECT_EQ(Writes(), (Sizes{28672, 1328}));
    transport.Flush();
    EXPECT_EQ(Writes(), Sizes{});
    EXPECT_EQ(WriteText(transport, std::string(kBuffer + 4097, 'x')), kBuffer + 4097);
    EXPECT_EQ(Writes(), (Sizes{65536, 65536, 65536, 65536, 65536, 65536, 65536, 65536, 4096, 1}));
    WriteText(transport, std::string(4096, 'x'));
    transport.Close();
    EXPECT_EQ(Writes(), Sizes{4096});
    EXPECT_EQ(Moves(), std::vector<std::string>{});
}

TEST_F(WStreamSystemTest, ReadsGoOutInChunks) {
    Open(File("file", Pattern(1000000)), 1);
    ReadText(transport, 5000);
    EXPECT_EQ(Reads(), (Sizes{4096, 904}));
    ReadText(transport, 60000);
    EXPECT_EQ(Reads(), (Sizes{57344, 2656}));
    transport.Seek(0, kKTSeekFromEnd);
    transport.Seek(0, kKTSeekFromBeginning);
    Moves();
    ReadText(transport, 200000); // the first read after a far seek: nothing ahead
    EXPECT_EQ(Reads(), (Sizes{65536, 65536, 65536, 3392}));
    ReadText(transport, 70000);
    EXPECT_EQ(Reads(), (Sizes{65536, 65536, 65536, 65536, 65536, 65536, 65536, 65536, 65536}));
    ReadText(transport, 1000); // from the buffer
    EXPECT_EQ(Reads(), Sizes{});
    EXPECT_EQ(Moves(), std::vector<std::string>{});
    transport.Seek(1000, kKTSeekFromCurrent);
    EXPECT_EQ(Moves(), std::vector<std::string>{}); // inside the buffer
    ReadText(transport, 400000);
    EXPECT_EQ(Reads(), Sizes{});
    ReadText(transport, 300000); // what is buffered, then what there is
    EXPECT_EQ(Reads(), (Sizes{65536, 65536, 65536, 65536, 65536}));
    EXPECT_EQ(ReadText(transport, 28000).size(), 28000U);
    EXPECT_EQ(Reads(), Sizes{});
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(ReadText(transport, 1), "");
    EXPECT_EQ(Reads(), Sizes{65536});
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
}

TEST_F(WStreamSystemTest, SmallReadsSwitchReadingAheadOn) {
    Open(File("file", Pattern(1000000)), 1);
    for (int i = 0; i < 8192; ++i) {
        ReadText(transport, 8);
    }
    EXPECT_EQ(Reads(), Sizes(8192, 8)); // 65,536 bytes, as they come
    for (int i = 0; i < 65536; ++i) {
        ReadText(transport, 8);
    }
    EXPECT_EQ(Reads(), Sizes(8, 65536)); // 524,288 bytes in eight calls
    ReadText(transport, 8);
    EXPECT_EQ(Reads().size(), 8U); // 410,176 bytes are left: six calls, one of them short, and the end
}

TEST_F(WStreamSystemTest, SeeksMoveTheHandleOnce) {
    Open(File("file", Pattern(1000000)), 3);
    using Text = std::vector<std::string>;
    transport.Seek(500, kKTSeekFromBeginning);
    EXPECT_EQ(Moves(), (Text{"500 current", "0 current"}));
    transport.Seek(100, kKTSeekFromBeginning);
    EXPECT_EQ(Moves(), (Text{"100 begin", "0 current"}));
    transport.Seek(-10, kKTSeekFromEnd);
    EXPECT_EQ(Moves(), (Text{"-10 end", "0 current"}));
    transport.Seek(0, kKTSeekFromCurrent);
    EXPECT_EQ(Moves(), Text{"0 current"});
    transport.Seek(-7, kKTSeekFromCurrent);
    EXPECT_EQ(Moves(), (Text{"-7 current", "0 current"}));
    transport.Seek(0, kKTSeekFromBeginning);
    ReadText(transport, 65536);
    ReadText(transport, 100);
    Moves();
    transport.Seek(0, kKTSeekFromCurrent);
    EXPECT_EQ(Moves(), Text{});
    transport.Seek(-150, kKTSeekFromCurrent);
    EXPECT_EQ(Moves(), (Text{"-524438 current", "0 current"})); // less the fill, whatever was read of it
}

TEST_F(WStreamSystemTest, CopiesAndComparisonsGoBlockByBlock) {
    std::unique_ptr<IKTStream> const source(KTStreamUtil::CreateFileStreamRead(File("from", Pattern(10000)), 1, 0, 0));
    Reads();
    std::unique_ptr<IKTStream> const memory(KTStreamUtil::CreateMemoryStreamWrite());
    EXPECT_EQ(KTStreamUtil::StreamCopy(source.get(), memory.get()), kKTErrorNone);
    EXPECT_EQ(Reads(), (Sizes{4096, 4096, 1808}));
}

// ---- beyond 2 GiB ----

TEST_F(WStreamSystemTest, PositionsAboveTwoGigabytesAreFoundAgain) {
    HANDLE const file = CreateFileW(Path("file").c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, 0, nullptr);
    LONG high = 0;
    SetFilePointer(file, static_cast<LONG>(3U << 30), &high, FILE_BEGIN);
    bool const isSparse = SetEndOfFile(file) != FALSE;
    CloseHandle(file);
    ASSERT_TRUE(isSparse);
    Open(File("file"), 1);
    unsigned int const distant = transport.Seek(-10, kKTSeekFromEnd);
    EXPECT_EQ(distant, (3U << 30) - 10);
    EXPECT_EQ(transport.Seek(0, kKTSeekFromBeginning), 0U);
    EXPECT_EQ(transport.Seek(static_cast<int>(distant), kKTSeekFromBeginning), distant);
    EXPECT_EQ(ReadText(transport, 20).size(), 10U);
    EXPECT_EQ(transport.Seek(static_cast<int>(distant - 1000), kKTSeekFromBeginning), distant - 1000);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(transport.Seek(-1, kKTSeekFromBeginning), distant - 1000); // 4 GiB - 1 is not in the file
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
}

TEST_F(WStreamSystemTest, NothingIsAppendedWhereTheEndIsOutOfReach) {
    File("file", "precious");
    m_Calls.endIsTooFar = true;
    EXPECT_EQ(transport.Open(File("file"), 6, 0, 0), 0);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
    LogLines log;
    EXPECT_EQ(WriteText(transport, "more"), 0U);
    transport.Close();
    EXPECT_EQ(Content("file"), "precious");
    EXPECT_EQ(transport.Open(File("file"), 2, 0, 0), 1); // nobody holds it
}

// ---- a system that refuses ----

TEST_F(WStreamSystemTest, AFullDiskIsAnErrorAndAShortCount) {
    for (bool const isShort : {false, true}) {
        SCOPED_TRACE(isShort);
        m_Calls.writesShort = isShort;
        m_Calls.writeRoom = 100000;
        Open(File("file"), 0xA);
        std::string const bytes = Pattern(kBuffer + 10);
        unsigned int const fits = isShort ? 100000 : 65536; // the system takes all of a call or nothing, or what fits
        EXPECT_EQ(WriteText(transport, bytes), fits);
        EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
        EXPECT_EQ(transport.Tell(), fits);
        transport.Close();
        EXPECT_EQ(Content("file"), bytes.substr(0, fits));
    }
}

TEST_F(WStreamSystemTest, GatheredBytesThatDoNotFitAreGoneAndTold) {
    std::string const bytes = Pattern(kBuffer);
    Open(File("file", ""), 3);
    WriteText(transport, bytes);
    m_Calls.writeRoom = 65536;
    EXPECT_EQ(WriteText(transport, "x"), 0U); // could not be written out: nothing is accepted
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
    EXPECT_EQ(transport.Tell(), 65536U);
    m_Calls.writeRoom = -1;
    EXPECT_EQ(WriteText(transport, "y"), 1U); // goes on where the disk was full
    transport.Flush();
    EXPECT_EQ(Content("file"), bytes.substr(0, 65536) + "y");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError); // and stays told

    WriteText(transport, "z");
    m_Calls.writeRoom = 0;
    EXPECT_EQ(ReadText(transport, 5), "");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError); // the end of the file does not hide it
    m_Calls.writeRoom = -1;
    EXPECT_EQ(transport.Seek(0, kKTSeekFromBeginning), 0U);
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError); // nor does a seek
}

TEST_F(WStreamSystemTest, StreamsTellThatTheDiskIsFull) {
    m_Calls.writeRoom = 10;
    std::unique_ptr<IKTStream> const stream(KTStreamUtil::CreateFileStreamWrite(File("file"), 2, 0, 0));
    std::vector<int> numbers(200000, 7);
    EXPECT_EQ(stream->XferInt32(numbers.data(), 200000), 0);
    EXPECT_EQ(stream->GetStreamState(), kKTStreamStateError);
}

TEST_F(WStreamSystemTest, AReadErrorIsAnErrorWhereverItHappens) {
    File("file", Pattern(1000000));
    struct Row {
        long long room;
        std::vector<unsigned int> reads;
        unsigned int last;
    };
    Row const rows[] = {
        {0, {100}, 0},             // straight
        {4096, {5000}, 4096},      //
        {65536, {200000}, 65536},  // whole blocks
        {65536, {65536, 10}, 0},   // into the buffer, at its beginning
        {131072, {65536, 10}, 10}, // and later: the bytes before it are there
    };
    for (Row const &row : rows) {
        SCOPED_TRACE(row.room);
        m_Calls.readRoom = row.room;
        Open(File("file"), 1);
        unsigned int last = 0;
        for (unsigned int const count : row.reads) {
            last = static_cast<unsigned int>(ReadText(transport, count).size());
        }
        EXPECT_EQ(last, row.last);
        EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
    }
}

TEST_F(WStreamSystemTest, AFileCutBehindOurBackEndsEarly) {
    Open(File("file", Pattern(1000000)), 3);
    ReadText(transport, 65536);
    ReadText(transport, 10);
    // Others may not write, so the cut is made by the transport's own handle.
    SetFilePointer(m_Calls.handle, 300000, nullptr, FILE_BEGIN);
    SetEndOfFile(m_Calls.handle);
    SetFilePointer(m_Calls.handle, 65536 + static_cast<LONG>(kBuffer), nullptr, FILE_BEGIN);
    EXPECT_EQ(ReadText(transport, kBuffer - 10).size(), kBuffer - 10); // what was read ahead is still there
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateGood);
    EXPECT_EQ(ReadText(transport, 10), "");
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateEndOfStream);
    EXPECT_EQ(transport.Seek(-5, kKTSeekFromEnd), 299995U);
    EXPECT_EQ(ReadText(transport, 10).size(), 5U);
}

TEST_F(WStreamSystemTest, FailuresToCutAndToClose) {
    Open(File("file", "abc"), 3);
    m_Calls.truncateFails = true;
    transport.SetEndOfStream();
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateError);
    m_Calls.closeFails = true;
    transport.Close();
    EXPECT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
}

// ---- short of memory ----

// Small blocks are there: the report needs some.
void *ThrowingNew(std::size_t size) {
    if (size > 2000) {
        throw std::bad_alloc();
    }
    return ::operator new(size);
}
void *FailingNew(std::size_t, std::nothrow_t const &) { return nullptr; }

TEST_F(WStreamSystemTest, WithoutMemoryForBuffersNothingIsGatheredOrReadAhead) {
    LogLines log;
    WImportHook const noMemory(kLibrary, "_ZnayRKSt9nothrow_t", &FailingNew);
    ASSERT_TRUE(noMemory.IsActive());
    std::string const bytes = Pattern(200000);
    Open(File("file", bytes), 3);
    EXPECT_EQ(WriteText(transport, "x"), 0U);
    EXPECT_EQ(log.Take(), std::vector<std::string>{"Assert failed: FileXferBytes::Write - nil buffer at "
                                                   "source/private/streams/WFileXferBytes:352"});
    ReadText(transport, 65536);
    EXPECT_EQ(ReadText(transport, 100), bytes.substr(65536, 100));
    EXPECT_EQ(transport.Tell(), 65636U);
}

TEST_F(WStreamSystemTest, TextThatNeedsMemoryIsReportedNotThrown) {
    auto *const transportOfReader = new RecordingTransport(std::vector<unsigned char>(5000, 'x'));
    transportOfReader->data[0] = 0;
    transportOfReader->data[1] = 0x10; // 4,096 bytes and more
    transportOfReader->data[2] = 0;
    transportOfReader->data[3] = 0;
    CKTStreamRead reader;
    reader.SetXferBytes(transportOfReader);
    CKTStreamWrite writer;
    writer.SetXferBytes(new RecordingTransport);
    KTString text("short");
    KTString longText;
    longText.assign(1000, 0x20AC);
    LogLines log;
    KTString read;
    KTString written;
    {
        WImportHook const one(kLibrary, "_Znwy", &ThrowingNew);
        WImportHook const many(kLibrary, "_Znay", &ThrowingNew);
        ASSERT_TRUE(one.IsActive() || many.IsActive());
        EXPECT_NO_THROW(read = reader.XferString(text, true, true));
        EXPECT_NO_THROW(written = writer.XferString(longText, true, true));
    }
    EXPECT_TRUE(read.empty());
    EXPECT_TRUE(written.empty());
    EXPECT_EQ(log.Take(), (std::vector<std::string>{"Assert failed: CKTStreamRead::XferString - out of memory at "
                                                    "source/private/streams/CKTStreamRead:92",
                                                    "Assert failed: CKTStreamWrite::XferString - out of memory at "
                                                    "source/private/streams/CKTStreamWrite:84"}));
}

void *NoNew(std::size_t) { throw std::bad_alloc(); }

TEST_F(WStreamSystemTest, OpeningWithoutMemoryFailsAndThrowsNothing) {
    std::string const name = Path(std::string(1500, 'x')).string(); // too long for a name, and for every small block
    KTFile const other{KTString(name.c_str())};
    Open(File("file", ""), 2);
    WriteText(transport, "kept");
    for (int i = 0; i < 2; ++i) { // at first the name needs memory, then the call of the system
        if (i != 0) {
            EXPECT_EQ(transport.Open(other, 2, 0, 0), 0);
        }
        WImportHook const one(kLibrary, "_Znwy", &ThrowingNew);
        ASSERT_TRUE(one.IsActive());
        KTBool16 opened = 1;
        EXPECT_NO_THROW(opened = transport.Open(other, 2, 0, 0));
        EXPECT_EQ(opened, 0);
        EXPECT_EQ(transport.GetStreamState(), kKTStreamStateClosed);
        EXPECT_EQ(Content("file"), "kept");
    }
}

TEST_F(WStreamSystemTest, RefusedWritesAndReportsNeedNoMemory) {
    MemXferBytes memory;
    std::string bytes(262144, 'x');
    memory.Write(bytes.data(), 262144);
    FileXferBytes unopened;
    CKTStreamRead reader;
    reader.SetXferBytes(new RecordingTransport(std::vector<unsigned char>(2, 2)));
    CKTStreamWrite writer;
    writer.SetXferBytes(new RecordingTransport(std::vector<unsigned char>(100, 0)));
    KTBool16 flag = 2;
    char byte = 0;
    WImportHook const one(kLibrary, "_Znwy", &NoNew);
    WImportHook const many(kLibrary, "_Znay", &NoNew);
    ASSERT_TRUE(one.IsActive() || many.IsActive());
    EXPECT_NO_THROW(EXPECT_EQ(memory.Write(&byte, 1), 0U));
    EXPECT_NO_THROW(EXPECT_EQ(unopened.Read(&byte, 1), 0U));
    EXPECT_NO_THROW(EXPECT_EQ(unopened.Write(&byte, 1), 0U));
    EXPECT_NO_THROW(unopened.Close());
    EXPECT_NO_THROW(EXPECT_EQ(reader.XferBool(flag), 0x0202));
    EXPECT_NO_THROW(EXPECT_EQ(writer.XferBool(flag), 1));
    EXPECT_NO_THROW(EXPECT_EQ(KTStreamUtil::StreamCopy(nullptr, nullptr), kKTErrorFailed));
}

int buffers = 0;
void *CountingNew(std::size_t size, std::nothrow_t const &) {
    buffers += size == kBuffer ? 1 : 1000;
    return ::operator new[](size, std::nothrow);
}

// One buffer for writing and one for reading ahead, however much goes through them.
TEST_F(WStreamSystemTest, MemoryDoesNotGrowWithTheFile) {
    WImportHook const counting(kLibrary, "_ZnayRKSt9nothrow_t", &CountingNew);
    ASSERT_TRUE(counting.IsActive());
    buffers = 0;
    Open(File("file", ""), 3);
    for (int i = 0; i < 1000000; ++i) {
        unsigned char bytes[8] = {};
        transport.Write(bytes, sizeof bytes);
    }
    EXPECT_EQ(buffers, 1);
    transport.Seek(0, kKTSeekFromBeginning);
    for (int i = 0; i < 1000000; ++i) {
        unsigned char bytes[8] = {};
        ASSERT_EQ(transport.Read(bytes, sizeof bytes), sizeof bytes);
    }
    EXPECT_EQ(buffers, 2);
}

// ---- without end ----

// Its size is there, its bytes are not.
class HollowTransport : public RecordingTransport {
  public:
    unsigned int Tell() override { return 100; }
};

TEST(WStreamCompareTest, DISABLED_ComparesTwoHollowStreams) {
    CKTStreamRead streams[2];
    streams[0].SetXferBytes(new HollowTransport);
    streams[1].SetXferBytes(new HollowTransport);
    WSignal(WChildProcess::Argument()).Set();
    KTStreamUtil::Compare(&streams[0], &streams[1], KTStreamUtil::kCompareByteByByte);
}

TEST(WStreamCompareTest, NeverEndsWhenBothStreamsEndEarly) {
    std::wstring const name = L"KTStreamCompare" + std::to_wstring(GetCurrentProcessId());
    WSignal begun(name);
    WChildProcess::Options options;
    options.argument = name;
    WChildProcess child("WStreamCompareTest.DISABLED_ComparesTwoHollowStreams", options);
    ASSERT_TRUE(child.Started());
    ASSERT_TRUE(begun.IsSetWithin(60000));
    EXPECT_FALSE(child.EndsWithin(1000));
}

} // namespace
