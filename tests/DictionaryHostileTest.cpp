// DictionaryHostileTest.cpp: files that are cut off, changed or made to do harm. The native build runs this under the
// sanitizers, which see every read outside the file's bytes.

#include "DictionaryFiles.h"

#include <gtest/gtest.h>

#include <array>
#include <memory>
#include <vector>

using namespace dictionary_files;
using namespace orvik_private;

namespace {

// Entries that overlap may be too much to write, which is said on the standard error: kept for each test as a whole.
class DictionaryHostileTest : public testing::Test {
  protected:
    DictionaryHostileTest() { testing::internal::CaptureStderr(); }
    ~DictionaryHostileTest() override { testing::internal::GetCapturedStderr(); }
};

// Reads bytes that end where the allocation ends, looks everything up that is there, and writes it in each form.
void Exercise(std::string_view bytes, DictionaryReader &dictionary) {
    std::vector<char> const exact(bytes.begin(), bytes.end());
    dictionary.Add("/Before", V(u"before"));
    Problems problems;
    ReadBytes(dictionary, {exact.data(), exact.size()}, &problems);
    EXPECT_EQ("before", Look(dictionary, "/Before"));
    std::size_t units = 0;
    dictionary.Array().ForEach([&](ListedEntry const &entry) {
        for (unsigned short const unit : entry.value) {
            units += unit;
        }
        if (!entry.key.empty()) {
            EXPECT_EQ(entry.index, dictionary.Array().Find(entry.key));
        }
    });
    for (DictionaryForm const form :
         {DictionaryForm{true, 0, std::endian::big}, DictionaryForm{true, 1, std::endian::little},
          DictionaryForm{false, 0, std::endian::little}, DictionaryForm{false, 2, std::endian::little}}) {
        WriteBytes(dictionary, form);
    }
}

std::string Version15() {
    Fields file = Header(1, 5, 0);
    file.U32(2).U32s({4, 6}).U32s({2, 2, 2, 2, 3, 4}).U16s({548, 310});
    return file.Raw("/Ax_/Ay_/BcH_\xE9_").Bytes();
}

std::string Version10() {
    Fields file = Header(1, 0, 1);
    file.U16(3).U16(548).U32(0).U16(310).U32(22).U16(0).U32(36);
    file.U32(2).Raw("/A").U32(1).Raw("x").U32(2).Raw("/A").U32(1).Raw("y");
    return file.U32(3).Raw("/Bc").U32(3).Raw("H\xC3\xA9").Bytes();
}

std::vector<std::string> WholeFiles() {
    SmallFile big;
    big.isBig = true;
    SmallFile none;
    none.keysPresent = 'N';
    none.hasKeys = false;
    none.buckets = 0;
    return {SmallFile().Bytes(),
            big.Bytes(),
            none.Bytes(),
            Version15(),
            Version10(),
            Fields().Raw("\xFF\xFE").Units(V(u"\"$$$/A=x\\n\"\r\n\"/B=#{copy}\"\r\n")).Bytes(),
            Fields(true).Raw("\xFE\xFF").Units(V(u"\"$$$/A=x\\n\"\r\n\"/B=#{copy}\"\r\n")).Bytes(),
            "\"$$$/A=x\\n\"\r\n\"/B=#{copy}\"\r\n"};
}

TEST_F(DictionaryHostileTest, CutOffAtEveryByte) {
    for (std::string const &whole : WholeFiles()) {
        for (std::size_t length = 0; length < whole.size(); ++length) {
            SCOPED_TRACE(length);
            DictionaryReader dictionary;
            Exercise(std::string_view(whole).substr(0, length), dictionary);
            if (whole.starts_with("Lexi") && length >= 21) {
                EXPECT_FALSE(dictionary.IsValid());
            }
        }
    }
}

TEST_F(DictionaryHostileTest, EntriesStayWhenOnlyTheBucketsAreCutOff) {
    std::string const whole = SmallFile().Bytes();
    constexpr std::size_t kLists = std::size_t{2} * (2 + 4 + 4);
    for (std::size_t length = whole.size() - kLists; length < whole.size(); ++length) {
        DictionaryReader dictionary;
        ReadBytes(dictionary, whole.substr(0, length));
        EXPECT_FALSE(dictionary.IsValid());
        EXPECT_EQ("/A=B /Bc=H<00E9>", List(dictionary)) << length;
        EXPECT_EQ("H<00E9>", Look(dictionary, "/Bc"));
    }
    DictionaryReader dictionary;
    ReadBytes(dictionary, whole.substr(0, whole.size() - kLists - 1));
    EXPECT_EQ("", List(dictionary)) << "the texts themselves are cut off";
}

TEST_F(DictionaryHostileTest, EveryByteChangedInManyWays) {
    for (std::string const &whole : WholeFiles()) {
        for (std::size_t at = 0; at < whole.size(); ++at) {
            SCOPED_TRACE(at);
            for (int const value : {0, 1, 2, 0x7F, 0x80, 0xFE, 0xFF, whole[at] ^ 1, whole[at] + 1}) {
                std::string changed = whole;
                changed[at] = static_cast<char>(value);
                DictionaryReader dictionary;
                Exercise(changed, dictionary);
            }
        }
    }
}

// Each 32-bit value at each place: counts near 2^32, offsets just outside.
TEST_F(DictionaryHostileTest, EveryFourBytesChanged) {
    for (std::string const &whole : WholeFiles()) {
        for (std::size_t at = 21; at + 4 <= whole.size(); ++at) {
            SCOPED_TRACE(at);
            for (std::uint32_t const value : {0xFFFFFFFFU, 0xFFFFFFFEU, 0x80000000U, 0x7FFFFFFFU, 0xFFFFU, 7U, 0U}) {
                std::string changed = whole;
                changed.replace(at, 4, Fields().U32(value).Bytes());
                DictionaryReader dictionary;
                Exercise(changed, dictionary);
            }
        }
    }
}

struct Corruption {
    char const *name;
    void (*apply)(SmallFile &);
    char const *entries; ///< what is there afterwards
};

constexpr Corruption kCorruptions[] = {
    {"a locale of 4 GiB", [](SmallFile &file) { file.localeLength = 0xFFFFFFFF; }, ""},
    {"entries near 2^32", [](SmallFile &file) { file.entries = 0xFFFFFFFF; }, ""},
    {"entries that no table can count", [](SmallFile &file) { file.entries = 0xFFFFFFFE; }, ""},
    {"more entries than there is room for", [](SmallFile &file) { file.entries = 0x20000000; }, ""},
    {"key bytes near 2^32", [](SmallFile &file) { file.keyBytes = 0xFFFFFFFF; }, ""},
    {"text bytes near 2^32", [](SmallFile &file) { file.valueBytes = 0xFFFFFFFF; }, ""},
    {"buckets near 2^32", [](SmallFile &file) { file.buckets = 0xFFFFFFFF; }, "/A=B /Bc=H<00E9>"},
    {"a list near 2^32", [](SmallFile &file) { file.counts = {0xFFFFFFFF, 1}; }, "/A=B /Bc=H<00E9>"},
    {"a bucket beyond 1020", [](SmallFile &file) { file.numbers = {310, 1021}; }, "/A=B /Bc=H<00E9>"},
    {"another bucket", [](SmallFile &file) { file.numbers = {310, 547}; }, "/A=B /Bc=H<00E9>"},
    {"a bucket of 65535 with an entry that is not there",
     [](SmallFile &file) {
         file.numbers = {310, 0xFFFF};
         file.indices = {1, 0x10000000};
     },
     "/A=B /Bc=H<00E9>"},
    {"a bucket of 65534 with a key of no bytes",
     [](SmallFile &file) {
         file.keyLengths = {0, 3};
         file.numbers = {310, 0xFFFE};
     },
     "=B /Bc=H<00E9>"},
    {"an index beyond the entries", [](SmallFile &file) { file.indices = {1, 2}; }, "/A=B /Bc=H<00E9>"},
    {"an index near 2^32", [](SmallFile &file) { file.indices = {1, 0xFFFFFFFF}; }, "/A=B /Bc=H<00E9>"},
    {"an index twice", [](SmallFile &file) { file.indices = {1, 1}; }, "/A=B /Bc=H<00E9>"},
    {"an entry in no list",
     [](SmallFile &file) {
         file.counts = {1, 0};
         file.indices = {1};
     },
     "/A=B /Bc=H<00E9>"},
    {"the second key just outside", [](SmallFile &file) { file.keyOffsets = {0, 3}; }, "/A=B"},
    {"the second key far outside", [](SmallFile &file) { file.keyOffsets = {0, 0xFFFFFFFF}; }, "/A=B"},
    {"the first key too long", [](SmallFile &file) { file.keyLengths = {6, 3}; }, ""},
    {"the second text just outside", [](SmallFile &file) { file.valueOffsets = {0, 3}; }, "/A=B"},
    {"the second text far outside", [](SmallFile &file) { file.valueOffsets = {0, 0xFFFFFFFE}; }, "/A=B"},
    {"the first text too long", [](SmallFile &file) { file.valueLengths = {7, 4}; }, ""},
};

TEST_F(DictionaryHostileTest, EveryFieldDamaged) {
    for (Corruption const &corruption : kCorruptions) {
        for (bool const isBig : {false, true}) {
            SCOPED_TRACE(corruption.name);
            SmallFile file;
            file.isBig = isBig;
            corruption.apply(file);
            DictionaryReader dictionary;
            Problems problems;
            ReadBytes(dictionary, file.Bytes(), &problems);
            EXPECT_FALSE(dictionary.IsValid());
            EXPECT_EQ(corruption.entries, List(dictionary));
            EXPECT_EQ(1U, problems.all.size());
            DictionaryReader filled;
            Exercise(file.Bytes(), filled);
        }
    }
    SmallFile order;
    std::string bytes = order.Bytes();
    bytes[24] = 2;
    DictionaryReader dictionary;
    ReadBytes(dictionary, bytes);
    EXPECT_FALSE(dictionary.IsValid());
    EXPECT_EQ("", List(dictionary));
}

TEST_F(DictionaryHostileTest, RunsMayOverlapAndHaveOddLengths) {
    SmallFile file;
    file.valueOffsets = {0, 0};
    file.valueLengths = {6, 5};
    DictionaryReader dictionary;
    ReadBytes(dictionary, file.Bytes());
    EXPECT_TRUE(dictionary.IsValid());
    EXPECT_EQ("/A=BH<00E9> /Bc=BH", List(dictionary)) << "an odd byte at the end counts for nothing";
    file.valueLengths = {1, 0};
    DictionaryReader other;
    ReadBytes(other, file.Bytes());
    EXPECT_EQ("/A= /Bc=", List(other));
}

TEST_F(DictionaryHostileTest, RunsOfNoBytesMayStandAnywhere) {
    SmallFile file;
    file.valueOffsets = {0xFFFFFFFF, 0xFFFFFFFE};
    file.valueLengths = {0, 0};
    DictionaryReader dictionary;
    ReadBytes(dictionary, file.Bytes());
    EXPECT_TRUE(dictionary.IsValid());
    EXPECT_EQ("/A= /Bc=", List(dictionary));
}

// 40,000 entries that all have the same 64 KiB of multibyte text: converted at once they would fill 5 GB.
TEST_F(DictionaryHostileTest, OverlappingMultibyteTextsAreConvertedAsTheyAreAskedFor) {
    constexpr std::uint32_t kEntries = 40'000;
    constexpr std::uint32_t kText = 0xFFFF;
    Fields file = Header(2, 7, 1);
    file.U32(0).U32(0).U8('N').U32s({kEntries, 1, 0, kText});
    for (std::uint32_t i = 0; i < kEntries; ++i) {
        file.U32(0);
    }
    for (std::uint32_t i = 0; i < kEntries; ++i) {
        file.U16(kText);
    }
    file.Raw(std::string(kText, 'v'));
    DictionaryReader dictionary;
    ReadBytes(dictionary, file.Bytes());
    EXPECT_TRUE(dictionary.IsValid());
    EXPECT_EQ(kEntries, dictionary.Array().EntryTotal());
    KTUnits scratch;
    EXPECT_EQ(kText, dictionary.Array().Value(kEntries - 1, scratch).size());
}

TEST_F(DictionaryHostileTest, KeysOfOneBucketDoNotSlowLookupsDown) {
    // Only bytes that the file's own hash does not look at differ: without the index this would take minutes.
    constexpr int kEntries = 60'000;
    DictionaryReader dictionary;
    std::string key(100, 'k');
    for (int i = 0; i < kEntries; ++i) {
        for (std::size_t digit = 0; digit < 5; ++digit) {
            key[digit * 20 + 1] =
                static_cast<char>('0' + i / static_cast<int>(std::array{1, 10, 100, 1000, 10000}[digit]) % 10);
        }
        dictionary.Add(key, V(u"v"));
    }
    EXPECT_EQ(static_cast<std::uint32_t>(kEntries), dictionary.Array().EntryTotal());
    DictionaryReader read;
    ReadBytes(read, WriteBytes(dictionary));
    EXPECT_TRUE(read.IsValid());
    EXPECT_EQ("v", Look(read, key));
    EXPECT_EQ(B("\1\0\0\0"), WriteBytes(dictionary).substr(34 + 13, 4)) << "all are in one bucket";
}

TEST_F(DictionaryHostileTest, ZerosEverywhere) {
    DictionaryReader dictionary;
    Exercise(std::string(100'000, '\0'), dictionary);
    EXPECT_TRUE(dictionary.IsValid()) << "an empty text";
    for (unsigned const minor : {0U, 5U, 7U}) {
        for (unsigned const major : {1U, 2U}) {
            DictionaryReader other;
            Exercise(Header(major, minor, 0).Raw(std::string(1000, '\0')).Bytes(), other);
        }
    }
    DictionaryReader wide;
    Exercise("\xFF\xFE" + std::string(1000, '\0'), wide);
}

// A device that fails in the middle.
class FailingSource final : public ByteSource {
  public:
    FailingSource(std::string bytes, std::uint64_t size) : m_Bytes(std::move(bytes)), m_Size(size) {}
    std::uint64_t Size() const override { return m_Size; }
    bool Failed() const override { return m_Failed; }
    std::size_t Read(void *bytes, std::size_t count) override {
        count = std::min<std::size_t>({count, m_Bytes.size() - m_At, 7}); // in small pieces
        m_Bytes.copy(static_cast<char *>(bytes), count, m_At);
        m_At += count;
        m_Failed = count == 0;
        return count;
    }

  private:
    std::string m_Bytes;
    std::uint64_t m_Size;
    std::size_t m_At = 0;
    bool m_Failed = false;
};

TEST_F(DictionaryHostileTest, AFailingDeviceClearsTheFlag) {
    std::string const whole = SmallFile().Bytes();
    DictionaryReader dictionary;
    FailingSource binary(whole.substr(0, whole.size() - 3), whole.size());
    Problems problems;
    dictionary.Read(binary, &problems);
    EXPECT_FALSE(dictionary.IsValid());
    EXPECT_EQ("0:damaged: 0:read-failed:", problems.Text());
    EXPECT_EQ("/A=B /Bc=H<00E9>", List(dictionary));

    DictionaryReader other;
    FailingSource text("/A=x\n/B=y", 100);
    other.Read(text);
    EXPECT_FALSE(other.IsValid());
    EXPECT_EQ("/A=x /B=y", List(other));

    DictionaryReader longer; // a file that grew after it was opened is read up to its size then
    FailingSource grown(whole + "more and more", whole.size());
    longer.Read(grown);
    EXPECT_EQ("/A=B /Bc=H<00E9>", List(longer));
}

} // namespace
