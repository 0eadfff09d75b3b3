// KTStreamUtil.cpp: makes streams, and copies, saves, clones and compares them whole.

#include "KTStreamUtil.h"

#include "CKTStreamRead.h"
#include "CKTStreamReadWrite.h"
#include "CKTStreamWrite.h"
#include "FileXferBytes.h"
#include "KTFileUtil.h"
#include "MemXferBytes.h"
#include "OStreamReport.h"

#include <algorithm>
#include <cstring>
#include <memory>

namespace {

constexpr char kReportPath[] = "source/private/streams/KTStreamUtil";
constexpr int kNullStreamLine = 163;
constexpr int kWrongStreamLine = 169;
constexpr int kRemainderLine = 196;
constexpr int kCreationLine = 229;

constexpr unsigned int kReadAndWrite = FileXferBytes::kOpenRead | FileXferBytes::kOpenWrite;
constexpr unsigned int kIgnored = 0x3F3F3F3F;
constexpr unsigned int kBlock = 4096;
constexpr char kCloneExtension[] = ".ikt";

enum class WhenDenied { ReturnNull, ReturnStream };

template <typename Stream> std::unique_ptr<Stream> OnTransport(std::unique_ptr<IKTXferBytes> transport) {
    auto stream = std::make_unique<Stream>();
    stream->SetXferBytes(transport.release());
    return stream;
}

template <typename Stream> Stream *OnFile(KTFile const &file, unsigned int mode, unsigned int ignored,
                                          unsigned int ignoredToo, WhenDenied denied) {
    auto transport = std::make_unique<FileXferBytes>();
    bool const opened = transport->Open(file, mode, ignored, ignoredToo) != 0;
    if (!opened && denied == WhenDenied::ReturnNull) {
        return nullptr;
    }
    return OnTransport<Stream>(std::move(transport)).release();
}

template <typename Stream> Stream *OnMemory() {
    return OnTransport<Stream>(std::make_unique<MemXferBytes>()).release();
}

// What both streams' bytes pass through; cleared, so that a source that ends early gives away nothing of ours.
struct Block {
    unsigned char bytes[kBlock] = {};
};

bool CopyCheck(bool isGood, char const *message, int line) {
    if (!isGood) {
        OStreamReport(message, kReportPath, line);
    }
    return isGood;
}

bool AreGiven(bool given) { return CopyCheck(given, "null input stream in Stream copy", kNullStreamLine); }
bool FitTheirParts(bool fit) { return CopyCheck(fit, "incorrect streams passed to stream copy", kWrongStreamLine); }

unsigned int SizeOf(IKTStream &stream) {
    stream.Seek(0, kKTSeekFromEnd);
    return stream.Tell();
}

// All of the block goes to the target, whatever came from the source.
void CopyBlock(IKTStream &source, IKTStream &target, Block &block, unsigned int size) {
    if (size != 0) {
        source.XferByte(block.bytes, static_cast<int>(size));
        target.XferByte(block.bytes, static_cast<int>(size));
    }
}

// Goes back to a position that Tell gave; above 2 GiB it is a negative offset, which the file transport understands.
void SeekBack(IKTStream &stream, unsigned int position) {
    stream.Seek(static_cast<int>(position), kKTSeekFromBeginning);
}

bool AreEqual(IKTStream &first, IKTStream &second, unsigned int size) {
    Block blocks[2];
    while (size != 0) {
        int const wanted = static_cast<int>(std::min(size, kBlock));
        int const count = first.XferByte(blocks[0].bytes, wanted);
        if (second.XferByte(blocks[1].bytes, wanted) != count || count < 0 || count > wanted || // a host's may say so
            std::memcmp(blocks[0].bytes, blocks[1].bytes, static_cast<unsigned int>(count)) != 0) {
            return false;
        }
        size -= static_cast<unsigned int>(count);
    }
    return true;
}

} // namespace

// ---- streams ----

IKTStream *KTStreamUtil::CreateFileStreamRead(KTFile const &file, unsigned int mode, unsigned int ignored,
                                              unsigned int ignoredToo) {
    return OnFile<CKTStreamRead>(file, mode, ignored, ignoredToo, WhenDenied::ReturnNull);
}

IKTStream *KTStreamUtil::CreateFileStreamReadLazy(KTFile const &file, unsigned int mode, unsigned int ignored,
                                                  unsigned int ignoredToo) {
    return OnFile<CKTStreamRead>(file, mode, ignored, ignoredToo, WhenDenied::ReturnStream);
}

IKTStream *KTStreamUtil::CreateFileStreamWrite(KTFile const &file, unsigned int mode, unsigned int ignored,
                                               unsigned int ignoredToo) {
    return OnFile<CKTStreamWrite>(file, mode, ignored, ignoredToo, WhenDenied::ReturnStream);
}

IKTStream *KTStreamUtil::CreateFileStreamWriteLazy(KTFile const &file, unsigned int mode, unsigned int ignored,
                                                   unsigned int ignoredToo) {
    return CreateFileStreamWrite(file, mode, ignored, ignoredToo);
}

IKTReadWriteStream *KTStreamUtil::CreateFileStreamReadWrite(KTFile const &file, unsigned int mode, unsigned int ignored,
                                                            unsigned int ignoredToo) {
    return OnFile<CKTStreamReadWrite>(file, mode, ignored, ignoredToo, WhenDenied::ReturnNull);
}

IKTReadWriteStream *KTStreamUtil::CreateFileStreamReadWriteLazy(KTFile const &file, unsigned int mode,
                                                                unsigned int ignored, unsigned int ignoredToo) {
    return OnFile<CKTStreamReadWrite>(file, mode, ignored, ignoredToo, WhenDenied::ReturnStream);
}

IKTStream *KTStreamUtil::CreateMemoryStreamRead() { return OnMemory<CKTStreamRead>(); }
IKTStream *KTStreamUtil::CreateMemoryStreamWrite() { return OnMemory<CKTStreamWrite>(); }
IKTReadWriteStream *KTStreamUtil::CreateMemoryStreamReadWrite() { return OnMemory<CKTStreamReadWrite>(); }

// ---- whole streams ----

KTErrorCodeEnum KTStreamUtil::StreamCopy(IKTStream *source, IKTStream *target) {
    if (!AreGiven(source != nullptr && target != nullptr) ||
        !FitTheirParts(source->IsReading() != 0 && target->IsWriting() != 0)) {
        return kKTErrorFailed;
    }
    unsigned int const before = source->Tell();
    unsigned int rest = SizeOf(*source);
    source->Seek(0, kKTSeekFromBeginning);
    Block block;
    for (; rest >= kBlock; rest -= kBlock) {
        CopyBlock(*source, *target, block, kBlock);
    }
    if (rest >= kBlock) {
        OStreamReport("something is wrong", kReportPath, kRemainderLine);
    }
    CopyBlock(*source, *target, block, rest);
    SeekBack(*source, before);
    return kKTErrorNone;
}

KTErrorCodeEnum KTStreamUtil::SaveReadStreamToFile(IKTStream *stream, KTFile const &file) {
    // Asked before the file is touched, so that it does not lose its content for a stream that cannot be copied.
    if (!AreGiven(stream != nullptr) || !FitTheirParts(stream->IsReading() != 0)) {
        return kKTErrorFailed;
    }
    std::unique_ptr<IKTStream> const writer(CreateFileStreamWrite(file, FileXferBytes::kOpenWrite, kIgnored, kIgnored));
    if (writer == nullptr || writer->GetStreamState() == kKTStreamStateError) {
        OStreamReport("stream creation failed", kReportPath, kCreationLine);
        return kKTErrorFailed;
    }
    writer->Seek(0, kKTSeekFromBeginning);
    writer->SetEndOfStream();
    return StreamCopy(stream, writer.get());
}

KTErrorCodeEnum KTStreamUtil::SaveReadStreamToFile(IKTStream *stream, KTString const &path) {
    return SaveReadStreamToFile(stream, KTFile(path));
}

IKTStream *KTStreamUtil::Clone(IKTStream *stream) {
    if (stream == nullptr || stream->IsReading() == 0) {
        return nullptr; // a writer would be written to instead of being read
    }
    KTFile const file = KTFileUtil::GetUniqueTemporaryFile(KTString(kCloneExtension));
    std::unique_ptr<IKTReadWriteStream> clone(CreateFileStreamReadWrite(file, kReadAndWrite, kIgnored, kIgnored));
    if (clone == nullptr) {
        return nullptr;
    }
    clone->SetMode(IKTReadWriteStream::kModeWrite);
    clone->Seek(0, kKTSeekFromBeginning);
    clone->SetEndOfStream();
    unsigned int const before = stream->Tell();
    unsigned int rest = SizeOf(*stream);
    stream->Seek(0, kKTSeekFromBeginning);
    Block block;
    for (; rest > kBlock; rest -= kBlock) {
        CopyBlock(*stream, *clone, block, kBlock);
    }
    CopyBlock(*stream, *clone, block, rest);
    SeekBack(*stream, before);
    clone->SetMode(IKTReadWriteStream::kModeRead);
    clone->Close();
    return clone.release();
}

KTBool16 KTStreamUtil::Compare(IKTStream *first, IKTStream *second, StreamCompareStrategies strategy) {
    if (strategy != kCompareByteByByte) {
        return 1;
    }
    if (first == nullptr || second == nullptr || first->IsReading() == 0 || second->IsReading() == 0) {
        return 0; // a writer would be written to instead of being read
    }
    unsigned int const size = SizeOf(*first);
    if (SizeOf(*second) != size) {
        return 0;
    }
    first->Seek(0, kKTSeekFromBeginning);
    second->Seek(0, kKTSeekFromBeginning);
    return AreEqual(*first, *second, size) ? 1 : 0;
}
