// DictionaryTest.cpp: the process-wide dictionary as hosts use it.

#include "DictionaryFiles.h"
#include "IKTStringDictionary.h"
#include "KTFileUtil.h"
#include "KTPublicUtils.h"
#include "KTStringDictionary.h"
#include "Units.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <atomic>
#include <bit>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>
#include <type_traits>

namespace {

// A fresh dictionary and folder for each test.
class DictionaryTest : public testing::Test {
  protected:
    DictionaryTest() {
        auto const *const info = testing::UnitTest::GetInstance()->current_test_info();
        m_Folder = std::filesystem::temp_directory_path() / (std::string("Dictionary.") + info->name());
        std::filesystem::remove_all(m_Folder);
        std::filesystem::create_directories(m_Folder);
        Forget();
    }
    ~DictionaryTest() override {
        Forget();
        std::filesystem::remove_all(m_Folder);
    }

    static void Forget() { delete KTStringDictionary::m_StringDictionary; }
    static KTStringDictionary &Texts() { return *KTStringDictionary::GetStringDictionary(); }

    KTFile File(char8_t const *name) const {
        std::u8string const path = (m_Folder / name).u8string();
        return KTFile(KTString(reinterpret_cast<char const *>(path.c_str())));
    }
    KTFile File(char8_t const *name, std::string const &content) const {
        std::ofstream(m_Folder / name, std::ios::binary) << content;
        return File(name);
    }
    std::string Content(char8_t const *name) const {
        std::ifstream file(m_Folder / name, std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

  private:
    std::filesystem::path m_Folder;
};

TEST_F(DictionaryTest, IsMadeByTheFirstCallAndKept) {
    EXPECT_EQ(nullptr, KTStringDictionary::m_StringDictionary);
    KTStringDictionary *const texts = KTStringDictionary::GetStringDictionary();
    ASSERT_NE(nullptr, texts);
    EXPECT_EQ(texts, KTStringDictionary::m_StringDictionary);
    EXPECT_EQ(texts, KTStringDictionary::GetStringDictionary());
    EXPECT_EQ(texts, &KTPublicUtils::GetStringDictionary());
    EXPECT_FALSE(std::is_default_constructible_v<KTStringDictionary>);
    Forget();
    EXPECT_EQ(nullptr, KTStringDictionary::m_StringDictionary);
    EXPECT_EQ(&KTPublicUtils::GetStringDictionary(), KTStringDictionary::m_StringDictionary);
}

TEST_F(DictionaryTest, AddsAndFinds) {
    EXPECT_EQ(kKTErrorNone, Texts().AddString(KTString("$$$/A"), KTString("B")));
    EXPECT_EQ(KTString("B"), Texts().GetKeyValue(KTString("$$$/A")));
    EXPECT_EQ(KTString("B"), Texts().GetKeyValue(KTString("/A")));
    EXPECT_EQ(KTString(""), Texts().GetKeyValue(KTString("$$/A")));
    EXPECT_EQ(kKTErrorNone, Texts().AddString(KTString("$$$/A=X"), KTString("C")));
    EXPECT_EQ(KTString("C"), Texts().GetKeyValue(KTString("$$$/A=default")));
    EXPECT_EQ(KTString(""), Texts().GetKeyValue(KTString("")));
    EXPECT_EQ(KTString(""), Texts().GetKeyValue(KTString("/B")));
}

TEST_F(DictionaryTest, ByteStringsAreUtf8AndNullsFail) {
    EXPECT_EQ(kKTErrorNone, Texts().AddString("$$$/\xC3\xA9", "\xE2\x98\xBA"));
    EXPECT_EQ(KTString(U(u"\u263A")), Texts().GetKeyValue(KTString(U(u"/\u00E9"))));
    char const *const none = nullptr;
    EXPECT_EQ(kKTErrorFailed, Texts().AddString(none, "x"));
    EXPECT_EQ(kKTErrorFailed, Texts().AddString("/x", none));
    EXPECT_EQ(kKTErrorFailed, Texts().AddString(none, none));
    EXPECT_EQ(KTString("d"), Texts().GetKeyValue(KTString("/x=d")));
}

TEST_F(DictionaryTest, AddingReportsNothingEvenForWhatIsNoKey) {
    EXPECT_EQ(kKTErrorNone, Texts().AddString(KTString("$A"), KTString("x")));
    EXPECT_EQ(kKTErrorNone, Texts().AddString(KTString(""), KTString("x")));
    EXPECT_EQ(kKTErrorNone, Texts().AddString("$$$=x", "x"));
    EXPECT_EQ(KTString(""), Texts().GetKeyValue(KTString("$A=d")));
    EXPECT_EQ(KTString(""), Texts().GetKeyValue(KTString("$$$=x")));
}

TEST_F(DictionaryTest, DefaultsAreUnescapedAndSignExtended) {
    EXPECT_EQ(KTString("Fall\nback"), Texts().GetKeyValue(KTString("$$$/Missing=Fall\\nback")));
    EXPECT_EQ((Units{0xFFC3, 0xFFA9, 'x'}), UnitsOf(Texts().GetKeyValue(KTString(U(u"/Missing=\u00E9x")))));
    EXPECT_EQ(KTString(U(u"\u00A9\u263A")), Texts().GetKeyValue(KTString("/Missing=#{copy}#{U+263A}")));
    EXPECT_EQ(KTString("a"), Texts().GetKeyValue(KTString("/Missing=a#{U+0}b"))) << "cut at the zero";
}

TEST_F(DictionaryTest, TextsAreCutAtTheirFirstZero) {
    for (std::size_t zero = 0; zero < 70; ++zero) {
        Units units(70, 'x');
        units[zero] = 0;
        units[69] = 0;
        Texts().AddString(KTString("/Z"), FromUnits(units));
        EXPECT_EQ(zero, Texts().GetKeyValue(KTString("/Z")).size());
    }
}

TEST_F(DictionaryTest, LongAndForeignKeysAreFoundToo) {
    for (std::size_t const length : {1U, 15U, 255U, 256U, 257U, 5000U}) {
        for (unsigned short const unit : Units{0x41, 0x7F, 0x80, 0xE9, 0x263A}) {
            KTString const key = FromUnits(Units(length, unit));
            KTString const value = FromUnits({static_cast<unsigned short>(length), unit});
            Texts().AddString(key, value);
            EXPECT_EQ(value, Texts().GetKeyValue(key));
        }
    }
}

TEST_F(DictionaryTest, WritesNewFilesOnly) {
    Texts().AddString("$$$/A", "B");
    KTFile const taken = File(u8"taken", "content");
    for (bool const binary : {false, true}) {
        EXPECT_EQ(kKTErrorFailed, Texts().WriteToFile(taken, binary));
        EXPECT_EQ("content", Content(u8"taken"));
        EXPECT_EQ(kKTErrorFailed, Texts().WriteToFile(File(u8""), binary)) << "a folder";
    }
    EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File(u8"binary"), true));
    EXPECT_EQ(kKTErrorFailed, Texts().WriteToFile(File(u8"binary"), true));
    EXPECT_TRUE(Content(u8"binary").starts_with("LexiStr Binary Format\2\7"));
    EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File(u8"text"), false));
    EXPECT_EQ(std::string("\xFF\xFE\"\0/\0A\0=\0B\0\"\0\r\0\n\0", 18), Content(u8"text"));
}

TEST_F(DictionaryTest, ReadsBackBothForms) {
    Texts().AddString("$$$/A", "say \"hi\"\n\t");
    Texts().AddString(KTString(U(u"/\u00E9")), KTString(U(u"\u263A\u65E5")));
    KTFile const binary = File(u8"strings \u263A.lxdc"); // the name may have any character
    KTFile const text = File(u8"strings \u00E9.txt");
    Texts().WriteToFile(binary, true);
    Texts().WriteToFile(text, false);
    for (KTFile const &file : {binary, text}) {
        Forget();
        ASSERT_TRUE(file.Exists());
        EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(file));
        EXPECT_EQ(KTString("say \"hi\"\n\t"), Texts().GetKeyValue(KTString("/A")));
        EXPECT_EQ(KTString(U(u"\u263A\u65E5")), Texts().GetKeyValue(KTString(U(u"$$$/\u00E9"))));
    }
}

TEST_F(DictionaryTest, ReadingTellsOnlyThatTheFileIsMissing) {
    EXPECT_EQ(kKTErrorFailed, Texts().ReadFromFile(File(u8"missing")));
    EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(File(u8""))) << "a folder is there, and has nothing to read";
    EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(File(u8"bad", "LexiStr Binary Format\3")));
    EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(File(u8"lone", "\"$x\"\n\"/A=a\"")));
    EXPECT_EQ(KTString("a"), Texts().GetKeyValue(KTString("/A")));
}

TEST_F(DictionaryTest, EntriesOfSeveralFilesAddUp) {
    Texts().AddString("/A", "0");
    Texts().ReadFromFile(File(u8"one", "/A=1\n/B=1\n"));
    Texts().ReadFromFile(File(u8"two", "/B=2\n/C=2\n"));
    EXPECT_EQ(KTString("1"), Texts().GetKeyValue(KTString("/A")));
    EXPECT_EQ(KTString("2"), Texts().GetKeyValue(KTString("/B")));
    EXPECT_EQ(KTString("2"), Texts().GetKeyValue(KTString("/C")));
}

TEST_F(DictionaryTest, AFileIsFreeAgainOnceItIsRead) {
    Texts().AddString("/A", "text");
    KTFile const file = File(u8"file");
    Texts().WriteToFile(file, true);
    Forget();
    Texts().ReadFromFile(file);
    EXPECT_TRUE(file.Delete());
    EXPECT_EQ(KTString("text"), Texts().GetKeyValue(KTString("/A")));
}

// Large files stay where they are and are looked into there.
class LargeDictionaryTest : public DictionaryTest {
  protected:
    static constexpr int kEntries = 20'000;

    static std::string Key(int i) { return "/Large/Key" + std::to_string(i); }
    static std::string Text(int i) { return "A text of some length with the number " + std::to_string(i); }

    // With a key more, texts begin at an odd place instead of an even one, or the other way round.
    static std::string LargeFile(bool hasOneMore, std::endian order) {
        orvik_private::DictionaryReader dictionary;
        for (int i = 0; i < kEntries; ++i) {
            std::string const text = Text(i);
            dictionary.Add(Key(i), KTUnits(text.begin(), text.end()));
        }
        if (hasOneMore) {
            dictionary.Add("x", {});
        }
        return dictionary_files::WriteBytes(dictionary, {true, orvik_private::kEncodingNone, order});
    }
    static void ExpectAll() {
        for (int i = 0; i < kEntries; ++i) {
            ASSERT_EQ(KTString(Text(i).c_str()), Texts().GetKeyValue(KTString(Key(i).c_str())));
        }
        EXPECT_EQ(KTString("none"), Texts().GetKeyValue(KTString("/Large/Key=none")));
    }
};

TEST_F(LargeDictionaryTest, IsFoundWhereverItsTextsBegin) {
    for (bool const hasOneMore : {false, true}) {
        for (std::endian const order : {std::endian::little, std::endian::big}) {
            Forget();
            std::string const bytes = LargeFile(hasOneMore, order);
            EXPECT_LT(std::size_t{1} << 20, bytes.size());
            EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(File(u8"large", bytes)));
            ExpectAll();
            EXPECT_EQ(bytes, Content(u8"large")) << "its units were swapped in memory alone";
        }
    }
}

TEST_F(LargeDictionaryTest, OutlivesItsFile) {
    KTFile const file = File(u8"large", LargeFile(false, std::endian::little));
    Texts().ReadFromFile(file);
    Texts().AddString("/Added", "later");
    EXPECT_TRUE(file.Delete());
    ExpectAll();
    EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File(u8"copy"), true)) << "under another name at any time";
    ExpectAll();
    Forget();
    EXPECT_FALSE(file.Exists());
    Texts().ReadFromFile(File(u8"copy"));
    ExpectAll();
    EXPECT_EQ(KTString("later"), Texts().GetKeyValue(KTString("/Added")));
}

#ifdef _WIN32
TEST_F(LargeDictionaryTest, KeepsItsFilesNameUntilItGoes) {
    KTFile const file = File(u8"large", LargeFile(false, std::endian::little));
    Texts().ReadFromFile(file);
    EXPECT_TRUE(file.Delete());
    EXPECT_EQ(kKTErrorFailed, Texts().WriteToFile(file, true)) << "never a silent loss";
    ExpectAll();
}
#endif

TEST_F(LargeDictionaryTest, StaysAsItWasRead) {
    KTFile const file = File(u8"large", LargeFile(false, std::endian::little));
    Texts().ReadFromFile(file);
    EXPECT_EQ(kKTErrorFailed, Texts().WriteToFile(file, true)) << "it is there";
    Forget();
    Texts().ReadFromFile(file);
    Texts().ReadFromFile(file);
    ExpectAll();
    Forget();
    EXPECT_TRUE(file.Delete());
    EXPECT_FALSE(file.Exists());
}

TEST_F(DictionaryTest, WhatCannotBeWrittenLeavesNoFile) {
    Texts().AddString(KTString("/Long"), FromUnits(Units(0x8000, 'x')));
    testing::internal::CaptureStderr();
    EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File(u8"binary"), true));
    testing::internal::GetCapturedStderr();
    EXPECT_FALSE(File(u8"binary").Exists());
    EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File(u8"text"), false));
    EXPECT_EQ(2U + 2 * (0x8000 + 10), File(u8"text").GetSize());
    EXPECT_EQ(kKTErrorNone, Texts().WriteToFile(File(u8"missing folder/file"), true)) << "as if the stream had failed";
    EXPECT_FALSE(File(u8"missing folder/file").Exists());
}

TEST_F(DictionaryTest, EntriesOfVersion1AreNotFound) {
    std::string file("LexiStr Binary Format\1\5\0\1\0\0\0\2\0\0\0\2\0\0\0\2\0\0\0\x24\2/Ax\0", 24 + 22);
    EXPECT_EQ(kKTErrorNone, Texts().ReadFromFile(File(u8"old", file)));
    EXPECT_EQ(KTString("default"), Texts().GetKeyValue(KTString("/A=default")));
}

// Filled on one thread, then asked and written by several; ThreadSanitizer watches in the native build.
TEST_F(DictionaryTest, SeveralThreadsMayLookUpAndWrite) {
    dictionary_files::SmallFile multibyte; // converted anew by each lookup
    multibyte.encoding = 1;
    multibyte.rawValues = "BHello!";
    multibyte.valueBytes = 7;
    multibyte.valueOffsets = {0, 1};
    multibyte.valueLengths = {1, 6};
    Texts().ReadFromFile(File(u8"multibyte", multibyte.Bytes()));
    Texts().ReadFromFile(File(u8"text", "/T=a\\nb\n"));
    Texts().AddString("/Added", "added");
    Texts().AddString("/Added", "replaced");
    boost::thread_group threads;
    std::atomic<int> wrong = 0;
    for (int thread = 0; thread < 4; ++thread) {
        KTFile const copy = File((u8"copy" + std::u8string(1, static_cast<char8_t>('0' + thread))).c_str());
        threads.create_thread([copy, &wrong] {
            for (int i = 0; i < 200; ++i) {
                bool const isRight = Texts().GetKeyValue("/A") == "B" && Texts().GetKeyValue("/Bc=x") == "Hello!" &&
                                     Texts().GetKeyValue("/T") == "a\nb" &&
                                     Texts().GetKeyValue("/Added") == "replaced" &&
                                     Texts().GetKeyValue("/None=x#{copy}") == KTString("x\xC2\xA9");
                wrong += isRight ? 0 : 1;
            }
            wrong += Texts().WriteToFile(copy, true) == kKTErrorNone && copy.Exists() ? 0 : 1;
        });
    }
    threads.join_all();
    EXPECT_EQ(0, wrong);
    EXPECT_EQ(Content(u8"copy0"), Content(u8"copy3"));
}

// A host's own dictionary behind the same interface.
class HostDictionary final : public IKTStringDictionary {
  public:
    explicit HostDictionary(bool &isDestroyed) : m_IsDestroyed(isDestroyed) {}
    HostDictionary(HostDictionary const &) = delete;
    HostDictionary &operator=(HostDictionary const &) = delete;
    ~HostDictionary() override { m_IsDestroyed = true; }

    KTErrorCodeEnum AddString(KTString const &, KTString const &) override { return kKTErrorNone; }
    KTErrorCodeEnum AddString(char const *, char const *) override { return kKTErrorFailed; }
    KTString GetKeyValue(KTString const &key) override { return key; }
    KTErrorCodeEnum WriteToFile(KTFile const &, bool) override { return kKTErrorFailed; }
    KTErrorCodeEnum ReadFromFile(KTFile const &) override { return kKTErrorFailed; }

  private:
    bool &m_IsDestroyed;
};

TEST_F(DictionaryTest, HostsMayImplementTheInterface) {
    bool isDestroyed = false;
    std::unique_ptr<IKTStringDictionary> const host = std::make_unique<HostDictionary>(isDestroyed);
    EXPECT_EQ(KTString("k"), host->GetKeyValue(KTString("k")));
    EXPECT_EQ(kKTErrorFailed, host->AddString("a", "b"));
    const_cast<std::unique_ptr<IKTStringDictionary> &>(host).reset();
    EXPECT_TRUE(isDestroyed);
}

} // namespace
