// AbiStreamLayoutTest.cpp: the fields of transports, streams and data providers, and the numbers of their enumerations.
//
//     MemXferBytes, 88 bytes            FileXferBytes and TempFileXferBytes, 120 bytes
//          0  virtual table                  0  virtual table
//          8  u8 *   buffer                  8  void *  handle
//         16  u32    capacity               16  KTFile  file, up to 56
//         20  u32    position               56  i32     state
//         24  u32    length                 64  u8 *    write buffer
//         28  i32    state                  72  i32     write fill
//         32  i16    owns the buffer        76  u32     write capacity
//         34  i16    backing store active   80  u8 *    read-ahead buffer
//         40  KTFile backing file           88  u32     read-ahead capacity
//         80  FileXferBytes *               92  u32     read-ahead cursor
//                                           96  u32     read-ahead fill
//     CKTStreamRead, CKTStreamWrite, 24    100  u32     sequential-read total
//          0  virtual table                104  u32     file position
//          8  IKTXferBytes *               108  u32     create flags
//         16  i16    swapping              112  u32     read-ahead base
//
//     CKTStreamReadWrite, 48               KTMemoryDataProvider, 32
//          0  virtual table                  0  virtual table
//          8  IKTXferBytes *                 8  void *  data
//         16  CKTStreamRead *               16  u64     size
//         24  CKTStreamWrite *              24  u64     offset
//         32  IKTStream *    current
//         40  i16    swapping              CKTTempFileStreamReadWrite, 88
//         44  i32    mode                   48  KTFile  file

#include "KTPublic.h"
#include "VTable.h"

#include <gtest/gtest.h>

#include <cstring>
#include <memory>
#include <new>

using namespace ktabi;

namespace {

template <typename T> T ValueAt(void const *object, std::size_t offset) {
    T value{};
    std::memcpy(static_cast<void *>(&value), static_cast<std::byte const *>(object) + offset, sizeof value);
    return value;
}

// Whether two objects have the same bytes, the address of their virtual table among them.
bool IsSame(void const *one, void const *other, std::size_t size) { return std::memcmp(one, other, size) == 0; }

unsigned int NumberAt(void const *object, std::size_t offset) { return ValueAt<unsigned int>(object, offset); }
short FlagAt(void const *object, std::size_t offset) { return ValueAt<short>(object, offset); }
void *PointerAt(void const *object, std::size_t offset) { return ValueAt<void *>(object, offset); }

TEST(AbiStreamLayoutTest, MemoryTransport) {
    MemXferBytes transport;
    EXPECT_EQ(88U, sizeof transport);
    EXPECT_NE(nullptr, PointerAt(&transport, 8));
    EXPECT_EQ(262144U, NumberAt(&transport, 16));
    EXPECT_EQ(0U, NumberAt(&transport, 20));
    EXPECT_EQ(0U, NumberAt(&transport, 24));
    EXPECT_EQ(0U, NumberAt(&transport, 28));
    EXPECT_EQ(1, FlagAt(&transport, 32));
    EXPECT_EQ(0, FlagAt(&transport, 34));
    EXPECT_EQ(ExportedTable<KTFile>(), PointerAt(&transport, 40));
    EXPECT_EQ(nullptr, PointerAt(&transport, 80));

    unsigned char bytes[10] = {7};
    transport.Write(bytes, 10);
    transport.Seek(4, kKTSeekFromBeginning);
    transport.Read(bytes, 10);
    transport.Seek(4, kKTSeekFromBeginning);
    transport.Read(bytes, 7);
    transport.Seek(3, kKTSeekFromBeginning);
    EXPECT_EQ(3U, NumberAt(&transport, 20));
    EXPECT_EQ(10U, NumberAt(&transport, 24));
    transport.Read(bytes, 8);
    EXPECT_EQ(1U, NumberAt(&transport, 28));
    EXPECT_EQ(7, *static_cast<unsigned char *>(PointerAt(&transport, 8)));
}

void ExpectFieldsOfFile(FileXferBytes &transport, unsigned int createFlags) {
    EXPECT_EQ(nullptr, PointerAt(&transport, 8));
    EXPECT_EQ(ExportedTable<KTFile>(), PointerAt(&transport, 16));
    EXPECT_EQ(2U, NumberAt(&transport, 56));
    EXPECT_EQ(nullptr, PointerAt(&transport, 64));
    EXPECT_EQ(nullptr, PointerAt(&transport, 80));
    for (std::size_t const offset : {72U, 76U, 88U, 92U, 96U, 100U, 104U, 112U}) {
        EXPECT_EQ(0U, NumberAt(&transport, offset)) << offset;
    }
    EXPECT_EQ(createFlags, NumberAt(&transport, 108));

    KTFile const file = KTFileUtil::GetUniqueTemporaryFile(".ikt");
    ASSERT_EQ(1, transport.Open(file, 3, 0, 0));
    EXPECT_NE(nullptr, PointerAt(&transport, 8));
    EXPECT_TRUE(*reinterpret_cast<KTFile const *>(reinterpret_cast<std::byte const *>(&transport) + 16) == file);
    EXPECT_EQ(0U, NumberAt(&transport, 56));
    EXPECT_NE(nullptr, PointerAt(&transport, 64));
    EXPECT_EQ(0x80000U, NumberAt(&transport, 76));

    unsigned char bytes[1000] = {};
    for (int i = 0; i < 700; ++i) {
        transport.Write(bytes, sizeof bytes);
    }
    EXPECT_EQ(700000U - 524000U, NumberAt(&transport, 72));
    EXPECT_EQ(524000U, NumberAt(&transport, 104));
    transport.Seek(0, kKTSeekFromBeginning);
    for (int i = 0; i < 70; ++i) {
        transport.Read(bytes, sizeof bytes);
    }
    EXPECT_NE(nullptr, PointerAt(&transport, 80));
    EXPECT_EQ(0x80000U, NumberAt(&transport, 88));
    EXPECT_EQ(5000U, NumberAt(&transport, 92)); // the sixty-sixth read was the first through the buffer
    EXPECT_EQ(0x80000U, NumberAt(&transport, 96));
    EXPECT_EQ(70000U, NumberAt(&transport, 100));
    EXPECT_EQ(65000U + 0x80000U, NumberAt(&transport, 104));
    EXPECT_EQ(65000U, NumberAt(&transport, 112));
    transport.Close();
    EXPECT_EQ(nullptr, PointerAt(&transport, 8));
    EXPECT_EQ(3U, NumberAt(&transport, 56));
    EXPECT_EQ(nullptr, PointerAt(&transport, 64));
    EXPECT_EQ(nullptr, PointerAt(&transport, 80));
    for (std::size_t const offset : {72U, 88U, 92U, 96U}) {
        EXPECT_EQ(0U, NumberAt(&transport, offset)) << offset;
    }
    EXPECT_TRUE(file.Delete());
}

TEST(AbiStreamLayoutTest, FileTransports) {
    FileXferBytes transport;
    TempFileXferBytes temporary;
    EXPECT_EQ(120U, sizeof transport);
    EXPECT_EQ(120U, sizeof temporary);
    ExpectFieldsOfFile(transport, 128);
    ExpectFieldsOfFile(temporary, 256);
}

// An Open that fails keeps the system's invalid handle.
TEST(AbiStreamLayoutTest, DeniedOpenKeepsTheInvalidHandle) {
    FileXferBytes transport;
    EXPECT_EQ(0, transport.Open(KTFile(KTString("C:\\no such folder\\file")), 1, 0, 0));
    EXPECT_EQ(INVALID_HANDLE_VALUE, PointerAt(&transport, 8));
    EXPECT_EQ(3U, NumberAt(&transport, 56));
}

// Copies are member-wise: all after the table is the source's.
template <typename Object> void ExpectMemberwiseCopies(Object &object, Object &other, std::size_t end) {
    alignas(Object) std::byte place[sizeof(Object)];
    auto *const copy = ::new (place) Object(object);
    EXPECT_EQ(0, std::memcmp(place + 8, reinterpret_cast<std::byte const *>(&object) + 8, end - 8));
    EXPECT_EQ(copy, &(*copy = other));
    EXPECT_EQ(0, std::memcmp(place + 8, reinterpret_cast<std::byte const *>(&other) + 8, end - 8));
}

TEST(AbiStreamLayoutTest, CopiesShare) {
    MemXferBytes memory[2];
    memory[0].Write(memory, 10);
    ExpectMemberwiseCopies(memory[0], memory[1], 36);
    CKTStreamRead readers[2];
    readers[0].SetXferBytes(new MemXferBytes);
    readers[0].SetSwapping(1);
    ExpectMemberwiseCopies(readers[0], readers[1], 18);
    CKTStreamWrite writers[2];
    writers[0].SetXferBytes(new MemXferBytes);
    writers[0].SetSwapping(1);
    ExpectMemberwiseCopies(writers[0], writers[1], 18);
    CKTStreamReadWrite both[2];
    both[0].SetXferBytes(new MemXferBytes);
    both[0].SetMode(IKTReadWriteStream::kModeWrite);
    ExpectMemberwiseCopies(both[0], both[1], 42);
    CKTTempFileStreamReadWrite temporary[2];
    ExpectMemberwiseCopies(temporary[0], temporary[1], 42);
    FileXferBytes files[2];
    KTFile const file = KTFileUtil::GetUniqueTemporaryFile(".ikt");
    files[0].Open(file, 3, 0, 0);
    files[0].Write(files, 10);
    alignas(FileXferBytes) std::byte place[sizeof(FileXferBytes)];
    ::new (place) FileXferBytes(files[0]);
    EXPECT_EQ(0, std::memcmp(place + 64, reinterpret_cast<std::byte const *>(&files[0]) + 64, 52));
    EXPECT_EQ(PointerAt(&files[0], 8), PointerAt(place, 8));
    EXPECT_EQ(NumberAt(&files[0], 56), NumberAt(place, 56));
    files[0].Close();
    EXPECT_TRUE(file.Delete());
}

TEST(AbiStreamLayoutTest, ReaderAndWriter) {
    CKTStreamRead reader;
    CKTStreamWrite writer;
    auto *const source = new MemXferBytes;
    auto *const target = new MemXferBytes;
    EXPECT_EQ(24U, sizeof reader);
    EXPECT_EQ(24U, sizeof writer);
    EXPECT_EQ(nullptr, PointerAt(&reader, 8));
    EXPECT_EQ(nullptr, PointerAt(&writer, 8));
    reader.SetXferBytes(source);
    writer.SetXferBytes(target);
    EXPECT_EQ(source, PointerAt(&reader, 8));
    EXPECT_EQ(target, PointerAt(&writer, 8));
    reader.SetSwapping(0x1234);
    writer.SetSwapping(0x1234);
    EXPECT_EQ(0x1234, FlagAt(&reader, 16));
    EXPECT_EQ(0x1234, FlagAt(&writer, 16));
}

TEST(AbiStreamLayoutTest, ReadWriteStreams) {
    CKTStreamReadWrite stream;
    CKTTempFileStreamReadWrite const temporary;
    auto *const transport = new MemXferBytes;
    EXPECT_EQ(48U, sizeof stream);
    EXPECT_EQ(88U, sizeof temporary);
    stream.SetXferBytes(transport);
    EXPECT_EQ(transport, PointerAt(&stream, 8));
    void *const reader = PointerAt(&stream, 16);
    void *const writer = PointerAt(&stream, 24);
    EXPECT_EQ(ExportedTable<CKTStreamRead>(), TableOfObject(reader));
    EXPECT_EQ(ExportedTable<CKTStreamWrite>(), TableOfObject(writer));
    EXPECT_EQ(transport, PointerAt(reader, 8));
    EXPECT_EQ(transport, PointerAt(writer, 8));
    EXPECT_EQ(reader, PointerAt(&stream, 32));
    EXPECT_EQ(0U, NumberAt(&stream, 44));
    stream.SetMode(static_cast<IKTReadWriteStream::Mode>(7));
    stream.SetSwapping(0x1234);
    EXPECT_EQ(writer, PointerAt(&stream, 32));
    EXPECT_EQ(0x1234, FlagAt(&stream, 40));
    EXPECT_EQ(0, FlagAt(reader, 16));
    EXPECT_EQ(0, FlagAt(writer, 16));
    EXPECT_EQ(7U, NumberAt(&stream, 44));
    EXPECT_EQ(ExportedTable<KTFile>(), PointerAt(&temporary, 48));
    EXPECT_EQ(ExportedTable<TempFileXferBytes>(), TableOfObject(PointerAt(&temporary, 8)));
}

TEST(AbiStreamLayoutTest, DataProvider) {
    char data[5] = {};
    alignas(KTMemoryDataProvider) std::byte place[sizeof(KTMemoryDataProvider)];
    auto *const provider = ::new (place) KTMemoryDataProvider(data, 5);
    void *chunk = nullptr;
    unsigned long long size = 0;
    provider->GetNextData(3, &chunk, size);
    EXPECT_EQ(32U, sizeof *provider);
    EXPECT_EQ(data, PointerAt(place, 8));
    EXPECT_EQ(5U, ValueAt<unsigned long long>(place, 16));
    EXPECT_EQ(3U, ValueAt<unsigned long long>(place, 24));
    KTMemoryDataProvider const copy(*provider);
    EXPECT_TRUE(IsSame(place, &copy, sizeof copy));
    KTMemoryDataProvider assigned(&size, 8);
    assigned = copy;
    EXPECT_TRUE(IsSame(place, &assigned, sizeof assigned));
    CallEntry(provider, 0);
    for (std::size_t const offset : {8U, 16U, 24U}) {
        EXPECT_EQ(nullptr, PointerAt(place, offset)) << offset;
    }
}

TEST(AbiStreamLayoutTest, NumbersAreFixed) {
    EXPECT_EQ(1, static_cast<int>(kKTSeekFromBeginning));
    EXPECT_EQ(2, static_cast<int>(kKTSeekFromCurrent));
    EXPECT_EQ(4, static_cast<int>(kKTSeekFromEnd));
    EXPECT_EQ(0, static_cast<int>(kKTStreamStateGood));
    EXPECT_EQ(1, static_cast<int>(kKTStreamStateEndOfStream));
    EXPECT_EQ(2, static_cast<int>(kKTStreamStateError));
    EXPECT_EQ(3, static_cast<int>(kKTStreamStateClosed));
    EXPECT_EQ(0, static_cast<int>(IKTReadWriteStream::kModeRead));
    EXPECT_EQ(1, static_cast<int>(IKTReadWriteStream::kModeWrite));
    EXPECT_EQ(0, static_cast<int>(KTStreamUtil::kCompareByteByByte));
    EXPECT_EQ(0, static_cast<int>(IKTDataProvider::kKTDataProviderNoError));
    EXPECT_EQ(2, static_cast<int>(IKTDataProvider::kKTDataProviderBadArgument));
    EXPECT_EQ(3, static_cast<int>(IKTDataProvider::kKTDataProviderEndOfData));
    EXPECT_EQ(1U, static_cast<unsigned int>(FileXferBytes::kOpenRead));
    EXPECT_EQ(2U, static_cast<unsigned int>(FileXferBytes::kOpenWrite));
    EXPECT_EQ(4U, static_cast<unsigned int>(FileXferBytes::kOpenAppend));
    EXPECT_EQ(8U, static_cast<unsigned int>(FileXferBytes::kCreateOrTruncate));
    EXPECT_EQ(4U, sizeof(KTSeekFromWhere));
    EXPECT_EQ(4U, sizeof(KTStreamState));
    EXPECT_EQ(4U, sizeof(IKTReadWriteStream::Mode));
    EXPECT_EQ(4U, sizeof(KTStreamUtil::StreamCompareStrategies));
    EXPECT_EQ(4U, sizeof(IKTDataProvider::KTDataProviderError));
}

} // namespace
