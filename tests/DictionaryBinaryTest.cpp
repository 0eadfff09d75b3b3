// DictionaryBinaryTest.cpp: the binary form, field by field, as files put together by hand.

#include "DictionaryFiles.h"

#include <gtest/gtest.h>

#include <stdexcept>

using namespace dictionary_files;
using namespace orvik_private;

namespace {

DictionaryReader const &Filled(DictionaryReader &dictionary) {
    dictionary.Add("$$$/A", V(u"B"));
    dictionary.Add("$$$/Bc", V(u"H\u00E9"));
    return dictionary;
}

std::string Dump(std::string_view bytes) {
    std::string text;
    constexpr char kDigits[] = "0123456789abcdef";
    for (char const byte : bytes) {
        text.push_back(kDigits[static_cast<unsigned char>(byte) >> 4]);
        text.push_back(kDigits[byte & 0xF]);
        text.push_back(' ');
    }
    return text;
}

TEST(DictionaryBinaryTest, ASmallFileHasExactlyTheseBytes) {
    DictionaryReader dictionary;
    EXPECT_EQ("4c 65 78 69 53 74 72 20 42 69 6e 61 72 79 20 46 6f 72 6d 61 74 " // LexiStr Binary Format
              "02 07 "                                                          // version
              "00 "                                                             // UTF-16
              "00 "                                                             // little-endian
              "05 00 00 00 65 6e 5f 55 53 "                                     // locale en_US
              "00 00 00 00 "                                                    // base index
              "59 "                                                             // Y
              "02 00 00 00 "                                                    // entries
              "02 00 00 00 "                                                    // second count
              "02 00 00 00 "                                                    // buckets
              "05 00 00 00 "                                                    // bytes of keys
              "06 00 00 00 "                                                    // bytes of texts
              "00 00 00 00 02 00 00 00 02 00 03 00 "                            // keys' offsets and lengths
              "00 00 00 00 02 00 00 00 02 00 04 00 "                            // texts' offsets and lengths
              "2f 41 2f 42 63 "                                                 // /A/Bc
              "42 00 48 00 e9 00 "                                              // B, H, U+00E9
              "36 01 24 02 "                                                    // buckets 310 and 548
              "01 00 00 00 01 00 00 00 "                                        // an entry in each
              "01 00 00 00 00 00 00 00 ",                                       // entries 1 and 0
              Dump(WriteBytes(Filled(dictionary))));
    EXPECT_EQ(SmallFile().Bytes(), WriteBytes(dictionary)) << "the tests' own small file is the same";
}

TEST(DictionaryBinaryTest, ABigEndianFileSwapsEveryField) {
    DictionaryReader dictionary;
    DictionaryForm form;
    form.order = std::endian::big;
    SmallFile file;
    file.isBig = true;
    EXPECT_EQ(file.Bytes(), WriteBytes(Filled(dictionary), form));
    EXPECT_EQ(B("\0\0\0\5en_US\0\0\0\0Y\0\0\0\2\0\0\0\2\0\0\0\2\0\0\0\5\0\0\0\6"), file.Bytes().substr(25, 34));
    DictionaryReader read;
    ReadBytes(read, file.Bytes());
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("/A=B /Bc=H<00E9>", List(read));
}

TEST(DictionaryBinaryTest, WithAnEncodingTextsAreUtf8) {
    DictionaryReader dictionary;
    SmallFile file;
    file.encoding = 1;
    file.valueBytes = 4;
    file.valueOffsets = {0, 1};
    file.valueLengths = {1, 3};
    file.rawValues = "BH\xC3\xA9";
    for (int const encoding : {kEncodingUtf8, kEncodingAnsi}) { // the header can only say 1
        DictionaryForm form;
        form.encoding = encoding;
        EXPECT_EQ(file.Bytes(), WriteBytes(Filled(dictionary), form));
    }
    DictionaryReader read;
    ReadBytes(read, file.Bytes());
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("/A=B /Bc=H<00E9>", List(read));
    EXPECT_EQ("H<00E9>", Look(read, "$$$/Bc"));
}

TEST(DictionaryBinaryTest, AnyOtherEncodingIsTheAnsiCodePage) {
    for (unsigned const encoding : {2U, 77U, 255U}) {
        SmallFile file;
        file.encoding = encoding;
        file.valueBytes = 3;
        file.valueOffsets = {0, 1};
        file.valueLengths = {1, 2};
        file.rawValues = "BH\xE9";
        DictionaryReader read;
        ReadBytes(read, file.Bytes());
        EXPECT_TRUE(read.IsValid());
        EXPECT_EQ("/A=B /Bc=H" + Show(MultibyteToUnits(kEncodingAnsi, "\xE9")), List(read));
    }
}

TEST(DictionaryBinaryTest, EveryFormReadsBackWhatWasWritten) {
    DictionaryReader dictionary;
    dictionary.SetLocale("de_DE");
    for (int i = 0; i < 3000; ++i) {
        KTUnits value(static_cast<std::size_t>(i % 40), static_cast<unsigned short>(0x20 + i));
        dictionary.Add("/Key/" + std::to_string(i * 7919 % 3001), value);
    }
    dictionary.Add("/Key/5", V(u"replaced"));
    std::string const all = List(dictionary);
    for (bool const isBig : {false, true}) {
        for (int const encoding : {kEncodingNone, kEncodingUtf8}) {
            DictionaryForm form;
            form.order = isBig ? std::endian::big : std::endian::little;
            form.encoding = encoding;
            std::string const bytes = WriteBytes(dictionary, form);
            DictionaryReader read;
            Problems problems;
            ReadBytes(read, bytes, &problems);
            EXPECT_TRUE(read.IsValid());
            EXPECT_EQ("", problems.Text());
            EXPECT_EQ("de_DE", read.Locale());
            EXPECT_EQ(all, List(read));
            EXPECT_EQ(bytes, WriteBytes(read, form)) << "and is written as the same bytes";
            EXPECT_EQ("replaced", Look(read, "/Key/5"));
        }
    }
}

TEST(DictionaryBinaryTest, TheByteOrderByteIsThereFromMinor1On) {
    SmallFile file;
    file.minor = 0;
    EXPECT_EQ(SmallFile().Bytes().size() - 1, file.Bytes().size());
    DictionaryReader read;
    ReadBytes(read, file.Bytes());
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("/A=B /Bc=H<00E9>", List(read));
    EXPECT_EQ((DictionaryVersion{2, 7}), read.Version());
    for (unsigned const minor : {1U, 6U, 8U, 255U}) {
        SmallFile other;
        other.minor = minor;
        DictionaryReader another;
        ReadBytes(another, other.Bytes());
        EXPECT_EQ("/A=B /Bc=H<00E9>", List(another)) << minor;
        EXPECT_EQ((DictionaryVersion{2, 7}), another.Version());
    }
}

TEST(DictionaryBinaryTest, ReadingVersion2MakesAnOldDictionaryANewOne) {
    DictionaryReader read({1, 5});
    ReadBytes(read, SmallFile().Bytes());
    EXPECT_EQ((DictionaryVersion{2, 7}), read.Version());
    EXPECT_EQ("B", Look(read, "/A"));
}

TEST(DictionaryBinaryTest, OtherVersionsAreNotLoaded) {
    for (auto const &[major, minor] :
         {std::pair{3U, 0U}, {3U, 7U}, {0U, 0U}, {1U, 1U}, {1U, 4U}, {1U, 6U}, {255U, 0U}}) {
        SmallFile file;
        file.major = major;
        file.minor = minor;
        DictionaryReader read;
        Problems problems;
        ReadBytes(read, file.Bytes(), &problems);
        EXPECT_FALSE(read.IsValid()) << major << '.' << minor;
        EXPECT_EQ("", List(read));
        EXPECT_EQ("0:damaged:", problems.Text());
        EXPECT_EQ(21U, problems.all[0].offset);
    }
}

TEST(DictionaryBinaryTest, LocalesAreReplacedByLaterFiles) {
    DictionaryReader read;
    SmallFile file;
    file.locale = "de_DE";
    ReadBytes(read, file.Bytes());
    EXPECT_EQ("de_DE", read.Locale());
    file.locale = B("fr\0xx");
    ReadBytes(read, file.Bytes());
    EXPECT_EQ("fr", read.Locale()) << "the name ends with its first zero";
    file.locale = "";
    file.localeLength = 0;
    ReadBytes(read, file.Bytes());
    EXPECT_EQ("", read.Locale());
    EXPECT_EQ(B("\0\0\0\0"), WriteBytes(read).substr(25, 4)) << "an empty name is a name";
}

TEST(DictionaryBinaryTest, TextFilesBringNoLocale) {
    DictionaryReader read;
    ReadBytes(read, "\"/A=b\"");
    EXPECT_FALSE(read.Locale().has_value());
}

TEST(DictionaryBinaryTest, ABlockWithoutKeysHasTextsOnly) {
    SmallFile file;
    file.keysPresent = 'N';
    file.hasKeys = false;
    file.buckets = 0;
    DictionaryReader read;
    ReadBytes(read, file.Bytes());
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("=B =H<00E9>", List(read));
    EXPECT_EQ(2U, read.Array().EntryTotal());
    EXPECT_EQ("-", Look(read, "/A"));
    EXPECT_EQ(file.Bytes(), WriteBytes(read));

    EXPECT_EQ(2, read.Add("/A", V(u"added")));
    EXPECT_EQ("added", Look(read, "/A"));
    EXPECT_EQ(2U, read.Array().BlockCount()) << "a key does not go into a block without keys";
    DictionaryReader again;
    ReadBytes(again, WriteBytes(read));
    EXPECT_TRUE(again.IsValid());
    EXPECT_EQ("=B =H<00E9> /A=added", List(again)) << "with one key, the others are there and empty";
}

TEST(DictionaryBinaryTest, AnyOtherFlagLeavesTheOneBefore) {
    SmallFile unknown;
    unknown.keysPresent = '?';
    DictionaryReader read;
    ReadBytes(read, unknown.Bytes());
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("/A=B /Bc=H<00E9>", List(read)) << "at first there are keys";

    SmallFile none;
    none.keysPresent = 'N';
    none.hasKeys = false;
    none.buckets = 0;
    DictionaryReader other;
    ReadBytes(other, none.Bytes());
    none.keysPresent = 'y';
    ReadBytes(other, none.Bytes());
    EXPECT_TRUE(other.IsValid());
    EXPECT_EQ("=B =H<00E9> =B =H<00E9>", List(other));
    ReadBytes(other, SmallFile().Bytes());
    ReadBytes(other, unknown.Bytes());
    EXPECT_TRUE(other.IsValid());
    EXPECT_EQ("B", Look(other, "/A"));
}

TEST(DictionaryBinaryTest, AnEmptyDictionaryIsWrittenAndRead) {
    DictionaryReader const dictionary;
    std::string const expected = Header(2, 7, 0).U32(5).Raw("en_US").U32(0).U8('N').U32s({0, 0, 0, 0}).Bytes();
    EXPECT_EQ(expected, WriteBytes(dictionary));
    DictionaryReader read;
    ReadBytes(read, expected);
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("", List(read));
}

TEST(DictionaryBinaryTest, TheSecondCountIsAddedUpAndZeroDropsTheBlock) {
    SmallFile file;
    file.second = 40;
    DictionaryReader read;
    ReadBytes(read, file.Bytes());
    read.Add("/New", V(u"n"));
    EXPECT_EQ(41U, read.Array().SecondTotal());
    EXPECT_EQ(41, static_cast<unsigned char>(WriteBytes(read)[25 + 9 + 9]));

    SmallFile dropped;
    dropped.second = 0;
    ReadBytes(read, dropped.Bytes());
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ(41U, read.Array().SecondTotal());
    EXPECT_EQ(3U, read.Array().EntryTotal());
    DictionaryReader other;
    ReadBytes(other, dropped.Bytes());
    EXPECT_TRUE(other.IsValid());
    EXPECT_EQ("", List(other));

    file.second = 0xFFFFFFFF; // never back to 0, which would drop everything
    ReadBytes(read, file.Bytes());
    read.Add("/Newer", V(u"n"));
    EXPECT_EQ(0xFFFFFFFFU, read.Array().SecondTotal());
}

TEST(DictionaryBinaryTest, BaseIndicesMustFollowOneAnother) {
    SmallFile file;
    file.base = 17;
    DictionaryReader read;
    ReadBytes(read, file.Bytes());
    EXPECT_TRUE(read.IsValid()) << "the first block's is not checked";
    EXPECT_EQ("/A=B /Bc=H<00E9>", List(read));

    SmallFile next;
    next.base = 2;
    next.keys = "/X/Yz";
    next.numbers = {ByteRunKey::HashOf("/X", kBucketCount), ByteRunKey::HashOf("/Yz", kBucketCount)};
    next.indices = {0, 1};
    ReadBytes(read, next.Bytes());
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("/A=B /Bc=H<00E9> /X=B /Yz=H<00E9>", List(read));
    EXPECT_EQ(2U, read.Array().BlockCount());
    EXPECT_EQ(3, read.Find("/Yz"));

    for (std::uint32_t const wrong : {1U, 2U, 3U, 5U, 0xFFFFFFFFU}) {
        DictionaryReader other;
        ReadBytes(other, file.Bytes());
        ReadBytes(other, SmallFile().Bytes()); // four entries, two of them dead
        next.base = wrong;
        ReadBytes(other, next.Bytes());
        EXPECT_FALSE(other.IsValid()) << wrong;
        EXPECT_EQ("/A=B /Bc=H<00E9>", List(other));
    }
}

TEST(DictionaryBinaryTest, ALaterFilesKeysReplaceTheEarlierOnes) {
    DictionaryReader read;
    read.Add("/A", V(u"old"));
    read.Add("/Kept", V(u"kept"));
    read.Add("/A", V(u"old, replaced"));
    Problems problems;
    ReadBytes(read, SmallFile().Bytes(), &problems);
    EXPECT_EQ("0:duplicate-key:/A", problems.Text());
    EXPECT_EQ("B", Look(read, "/A"));
    EXPECT_EQ("/Kept=kept /A=B /Bc=H<00E9>", List(read));
    EXPECT_FALSE(read.Array().IsAlive(0));
    EXPECT_EQ(3U, read.Array().LivingCount());
    EXPECT_EQ(4U, read.Array().EntryTotal());
    EXPECT_EQ(2, read.Add("/A", V(u"newest")));
    EXPECT_EQ("/Kept=kept /A=newest /Bc=H<00E9>", List(read));
    EXPECT_EQ(4, read.Add("/Last", V(u"l"))) << "goes on behind the file's entries";
    EXPECT_EQ(2U, read.Array().BlockCount());
    DictionaryReader again;
    ReadBytes(again, WriteBytes(read));
    EXPECT_TRUE(again.IsValid());
    EXPECT_EQ("/Kept=kept /A=newest /Bc=H<00E9> /Last=l", List(again));
    EXPECT_EQ(0, again.Find("/Kept"));
}

TEST(DictionaryBinaryTest, OfEqualKeysInAFileTheLastOneCounts) {
    SmallFile file;
    file.keys = "/A/AX";
    file.keyLengths = {2, 2};
    file.numbers = {548};
    file.buckets = 1;
    file.counts = {2};
    file.indices = {0, 1};
    DictionaryReader read;
    Problems problems;
    ReadBytes(read, file.Bytes(), &problems);
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("0:duplicate-key:/A", problems.Text());
    EXPECT_EQ("/A=H<00E9>", List(read));
}

TEST(DictionaryBinaryTest, TextsAreReadAtOddAddressesToo) {
    for (std::size_t padding = 0; padding < 4; ++padding) {
        for (bool const isBig : {false, true}) {
            SmallFile file;
            file.isBig = isBig;
            file.localeLength = static_cast<std::uint32_t>(padding);
            file.locale = std::string(padding, 'l');
            DictionaryReader read;
            ReadBytes(read, file.Bytes());
            EXPECT_TRUE(read.IsValid());
            EXPECT_EQ("/A=B /Bc=H<00E9>", List(read));
            SmallFile odd = file; // texts that begin in the middle of a unit, as no writer makes them
            odd.valueOffsets = {1, 2};
            DictionaryReader other;
            ReadBytes(other, odd.Bytes());
            EXPECT_TRUE(other.IsValid());
            EXPECT_EQ("<4800>", Look(other, "/A").substr(0, 6));
            EXPECT_EQ("H<00E9>", Look(other, "/Bc"));
        }
    }
}

TEST(DictionaryBinaryTest, WhatTheFormCannotHoldIsNotWrittenAtAll) {
    DictionaryReader dictionary;
    Filled(dictionary);
    dictionary.Add("/Limit", KTUnits(0x7FFF, 'v'));
    dictionary.Add(std::string(0xFFFF, 'k'), V(u"limit"));
    DictionaryReader read;
    ReadBytes(read, WriteBytes(dictionary));
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ(List(dictionary), List(read));

    dictionary.Add("/Long", KTUnits(0x8000, 'v'));
    Problems problems;
    MemorySink sink;
    bool isComplete = true;
    testing::internal::CaptureStderr();
    EXPECT_EQ(34U, dictionary.Write(sink, {}, &isComplete, &problems)) << "header and locale";
    EXPECT_EQ("Serialize2: Caught exception\n", testing::internal::GetCapturedStderr());
    EXPECT_FALSE(isComplete);
    EXPECT_EQ("0:too-long:/Long", problems.Text());

    DictionaryForm utf8;
    utf8.encoding = kEncodingUtf8; // half as long there
    DictionaryReader again;
    ReadBytes(again, WriteBytes(dictionary, utf8));
    EXPECT_EQ(List(dictionary), List(again));

    DictionaryReader longKey;
    longKey.Add(std::string(0x10000, 'k'), V(u"v"));
    testing::internal::CaptureStderr();
    longKey.Write(sink, {}, &isComplete);
    testing::internal::GetCapturedStderr();
    EXPECT_FALSE(isComplete);
}

// Fails after some bytes.
class FailingSink final : public ByteSink {
  public:
    explicit FailingSink(std::size_t room) : m_Room(room) {}
    void Write(void const *, std::size_t count) override {
        if (count > m_Room) {
            throw std::runtime_error("full");
        }
        m_Room -= count;
    }

  private:
    std::size_t m_Room;
};

TEST(DictionaryBinaryTest, AFailedWriteIsSaidAndCounted) {
    DictionaryReader dictionary;
    Filled(dictionary);
    FailingSink sink(40);
    bool isComplete = true;
    testing::internal::CaptureStderr();
    EXPECT_EQ(34U, dictionary.Write(sink, {}, &isComplete));
    EXPECT_EQ("Serialize2: Caught exception\n", testing::internal::GetCapturedStderr());
    EXPECT_FALSE(isComplete);
    FailingSink none(0);
    DictionaryForm text;
    text.isBinary = false;
    testing::internal::CaptureStderr();
    EXPECT_EQ(0U, dictionary.Write(none, text, &isComplete));
    EXPECT_EQ("Serialize2: Caught exception\n", testing::internal::GetCapturedStderr());
    MemorySink whole;
    EXPECT_EQ(SmallFile().Bytes().size(), dictionary.Write(whole, {}, &isComplete));
    EXPECT_TRUE(isComplete);
}

// ---- version 1 ----

// Two used buckets: 548 with "/A" = "x" and "/A" = "y", 310 with "/Bc" = "H\u00E9".
Fields Version15(unsigned encoding = 0) {
    Fields file = Header(1, 5, encoding);
    file.U32(2).U32s({4, 6});
    if (encoding == 0) {
        file.U32s({2, 2, 2, 2, 3, 4}).U16s({548, 310});
        file.Raw("/A").Units(V(u"x")).Raw("/A").Units(V(u"y")).Raw("/Bc").Units(V(u"H\u00E9"));
    } else {
        file.U32s({2, 1, 2, 1, 3, 3}).U16s({548, 310});
        file.Raw("/Ax/Ay/BcH\xC3\xA9");
    }
    return file;
}

std::string Chain(DictionaryReader const &dictionary, std::uint32_t bucket) {
    std::string text;
    for (DictionaryEntry const *entry = dictionary.Legacy().First(bucket); entry != nullptr;
         entry = entry->NextEntry()) {
        text += text.empty() ? "" : " ";
        text += std::string(entry->Bytes()) + "=" + Show(entry->Value().Units());
    }
    return text;
}

TEST(DictionaryBinaryTest, Version15GoesIntoTheOldTable) {
    for (unsigned const encoding : {0U, 1U}) {
        DictionaryReader read;
        ReadBytes(read, Version15(encoding).Bytes());
        EXPECT_TRUE(read.IsValid());
        EXPECT_EQ("/A=x /A=y", Chain(read, 548));
        EXPECT_EQ("/Bc=H<00E9>", Chain(read, 310));
        EXPECT_EQ(3U, read.Legacy().Count());
        EXPECT_EQ("", List(read));
        EXPECT_EQ("-", Look(read, "/A")) << "a new dictionary does not look there";
        EXPECT_EQ((DictionaryVersion{2, 7}), read.Version());
        EXPECT_FALSE(read.Locale().has_value());
        ReadBytes(read, Version15(encoding).Bytes());
        EXPECT_EQ("/A=x /A=y /A=x /A=y", Chain(read, 548)) << "ahead of what was there, in the file's order";

        DictionaryReader old({1, 5});
        ReadBytes(old, Version15(encoding).Bytes());
        EXPECT_EQ("x", Look(old, "$$$/A"));
        EXPECT_EQ("H<00E9>", Look(old, "$$$/Bc"));
    }
}

TEST(DictionaryBinaryTest, Version15MayBeEmpty) {
    DictionaryReader read;
    ReadBytes(read, Header(1, 5, 0).U32(0).Bytes());
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ(0U, read.Legacy().Count());
}

Fields Version10(unsigned encoding = 0) {
    Fields file = Header(1, 0, encoding);
    file.U16(3);
    if (encoding == 0) { // the positions count from 100 on
        file.U16(548).U32(100).U16(310).U32(124).U16(0).U32(139);
        file.U32(2).Raw("/A").U32(2).Units(V(u"x")).U32(2).Raw("/A").U32(2).Units(V(u"y"));
        file.U32(3).Raw("/Bc").U32(4).Units(V(u"H\u00E9"));
    } else {
        file.U16(548).U32(0).U16(310).U32(22).U16(0).U32(36);
        file.U32(2).Raw("/A").U32(1).Raw("x").U32(2).Raw("/A").U32(1).Raw("y");
        file.U32(3).Raw("/Bc").U32(3).Raw("H\xC3\xA9");
    }
    return file;
}

TEST(DictionaryBinaryTest, Version10GoesIntoTheOldTable) {
    for (unsigned const encoding : {0U, 1U}) {
        DictionaryReader read;
        ReadBytes(read, Version10(encoding).Bytes());
        EXPECT_TRUE(read.IsValid());
        EXPECT_EQ("/A=x /A=y", Chain(read, 548));
        EXPECT_EQ("/Bc=H<00E9>", Chain(read, 310));
        EXPECT_EQ("-", Look(read, "/A"));
        DictionaryReader old({1, 0});
        ReadBytes(old, Version10(encoding).Bytes());
        EXPECT_EQ("H<00E9>", Look(old, "/Bc"));
    }
    for (unsigned const count : {0U, 1U}) {
        DictionaryReader read;
        ReadBytes(read, Header(1, 0, 0).U16(count).U16(5).U32(9).Bytes());
        EXPECT_TRUE(read.IsValid());
        EXPECT_EQ(0U, read.Legacy().Count());
    }
}

TEST(DictionaryBinaryTest, Version1TextsOfAnyOtherEncodingAreOfTheAnsiCodePage) {
    for (unsigned const encoding : {2U, 255U}) {
        for (std::string const &file :
             {Header(1, 5, encoding).U32(1).U32(2).U32s({2, 2}).U16(548).Raw("/AH\xE9").Bytes(), Header(1, 0, encoding)
                                                                                                     .U16(2)
                                                                                                     .U16(548)
                                                                                                     .U32(0)
                                                                                                     .U16(0)
                                                                                                     .U32(12)
                                                                                                     .U32(2)
                                                                                                     .Raw("/A")
                                                                                                     .U32(2)
                                                                                                     .Raw("H\xE9")
                                                                                                     .Bytes()}) {
            DictionaryReader read;
            ReadBytes(read, file);
            EXPECT_TRUE(read.IsValid());
            EXPECT_EQ("/A=H" + Show(MultibyteToUnits(kEncodingAnsi, "\xE9")), Chain(read, 548));
        }
    }
}

TEST(DictionaryBinaryTest, Version1KeepsWhatWasReadBeforeTheDamage) {
    for (std::string const &whole : {Version15().Bytes(), Version10().Bytes()}) {
        std::string const cut = whole.substr(0, whole.size() - 1);
        DictionaryReader read;
        ReadBytes(read, cut);
        EXPECT_FALSE(read.IsValid());
        EXPECT_EQ("/A=x /A=y", Chain(read, 548));
        EXPECT_EQ("", Chain(read, 310));
    }
}

TEST(DictionaryBinaryTest, Version1DamageIsFound) {
    std::string const bad[] = {
        Header(1, 5, 0).U32(1).U32(2).U32s({1, 0}).U16(1021).Raw("k").Bytes(),                // bucket
        Header(1, 5, 0).U32(1).U32(1).U32(1).U16(0).Raw("k").Bytes(),                         // a key without a text
        Header(1, 5, 0).U32(2).U32s({2, 0}).U16s({0, 0}).Bytes(),                             // counts go down
        Header(1, 5, 0).U32(2).U32s({4, 2}).U32s({0, 0}).U16s({0, 0}).Bytes(),                // and up over the last
        Header(1, 5, 0).U32(0xFFFFFFFF).Bytes(),                                              // more than there is
        Header(1, 5, 0).U32(1).U32(0xFFFFFFFE).U32(0).U16(0).Bytes(),                         //
        Header(1, 5, 0).U32(1).U32(2).U32s({0xFFFFFFFF, 0}).U16(0).Raw("k").Bytes(),          //
        Header(1, 0, 0).U16(2).U16(1021).U32(0).U16(0).U32(9).U32(1).Raw("k").U32(0).Bytes(), // bucket
        Header(1, 0, 0).U16(2).U16(1).U32(0).U16(0).U32(8).U32(1).Raw("k").U32(0).Bytes(),    // past the record's end
        Header(1, 0, 0).U16(2).U16(1).U32(9).U16(0).U32(0).Bytes(),                           // positions go down
        Header(1, 0, 0).U16(0xFFFF).Bytes(),                                                  //
        Header(1, 0, 0).U16(2).U16(1).U32(0).U16(0).U32(9).U32(0xFFFFFFFF).Raw("k").Bytes(),
    };
    for (std::string const &file : bad) {
        DictionaryReader read;
        Problems problems;
        ReadBytes(read, file, &problems);
        EXPECT_FALSE(read.IsValid()) << Dump(file);
        EXPECT_EQ("0:damaged:", problems.Text()) << Dump(file);
    }
}

} // namespace
