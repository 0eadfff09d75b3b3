// ProtectedStreamTest.cpp: protected texts in the library's own streams, in memory and in a file.

#include "FileXferBytes.h"
#include "KTFile.h"
#include "KTFileUtil.h"
#include "KTStreamUtil.h"
#include "KTSystemUtils.h"

#include <gtest/gtest.h>

#include <memory>
#include <string>

namespace {

KTString Repeated(std::size_t count) { return KTString(std::string(count, 'x').c_str()); }

KTErrorCodeEnum Encrypt(KTString const &text, IKTStream &stream) {
    return KTSystemUtils::EncryptStringUsingSystemCredentials(text, stream);
}

void ExpectNext(KTString const &text, IKTStream &stream) {
    KTString read;
    EXPECT_EQ(kKTErrorNone, KTSystemUtils::DecryptStringUsingSystemCredentials(stream, read));
    EXPECT_EQ(text, read);
}

void ExpectNoMore(IKTStream &stream) {
    KTString read;
    EXPECT_EQ(kKTErrorFailed, KTSystemUtils::DecryptStringUsingSystemCredentials(stream, read));
}

TEST(ProtectedTextInStreams, ComesBackFromMemory) {
    std::unique_ptr<IKTReadWriteStream> const stream(KTStreamUtil::CreateMemoryStreamReadWrite());
    stream->SetMode(IKTReadWriteStream::kModeWrite);
    for (KTString const &text : {KTString("one"), KTString(), Repeated(60'000)}) {
        EXPECT_EQ(kKTErrorNone, Encrypt(text, *stream));
    }
    stream->Seek(0, kKTSeekFromBeginning);
    stream->SetMode(IKTReadWriteStream::kModeRead);
    for (KTString const &text : {KTString("one"), KTString(), Repeated(60'000)}) {
        ExpectNext(text, *stream);
    }
    ExpectNoMore(*stream);
}

TEST(ProtectedTextInStreams, FailsIfMemoryTakesNoMore) {
    std::unique_ptr<IKTReadWriteStream> const stream(KTStreamUtil::CreateMemoryStreamReadWrite());
    stream->SetMode(IKTReadWriteStream::kModeWrite);
    EXPECT_EQ(kKTErrorFailed, Encrypt(Repeated(300'000), *stream));
}

TEST(ProtectedTextInStreams, ComesBackFromAFile) {
    KTFile const file = KTFileUtil::GetUniqueTemporaryFile(".ikt");
    {
        std::unique_ptr<IKTStream> const writer(
            KTStreamUtil::CreateFileStreamWrite(file, FileXferBytes::kOpenWrite, 0, 0));
        EXPECT_EQ(kKTErrorNone, Encrypt("one", *writer));
        EXPECT_EQ(kKTErrorNone, Encrypt(Repeated(600'000), *writer)); // more than a buffer holds
    }
    {
        std::unique_ptr<IKTStream> const reader(
            KTStreamUtil::CreateFileStreamRead(file, FileXferBytes::kOpenRead, 0, 0));
        ASSERT_NE(nullptr, reader);
        ExpectNext("one", *reader);
        ExpectNext(Repeated(600'000), *reader);
        ExpectNoMore(*reader);
    }
    file.Delete();
}

} // namespace
