// DictionaryEngineTest.cpp: keys, adding, looking up, and the stores behind them.

#include "DictionaryFiles.h"

#include "SipHash.h"

#include <gtest/gtest.h>

using namespace dictionary_files;
using namespace orvik_private;

namespace {

// The hash that files rely on, in other words: Horner's scheme over the sampled bytes.
std::uint32_t PlainHash(std::string_view key, std::uint32_t modulus) {
    std::size_t const step = key.size() / 5 == 0 ? 1 : key.size() / 5;
    std::uint32_t hash = 0;
    for (std::size_t at = 0; at < key.size(); at += step) {
        hash = (hash * 32 + static_cast<unsigned char>(key[at])) % modulus;
    }
    return hash;
}

// The vector of the paper's appendix A, and vectors of SipHash-1-3 under a secret of zeros, which other implementations
// give for these bytes.
TEST(SipHashTest, PublishedVectors) {
    std::string bytes;
    for (char byte = 0; byte < 15; ++byte) {
        bytes.push_back(byte);
    }
    EXPECT_EQ(0xA129CA6149BE45E5U, (SipHash<2, 4>({0x0706050403020100, 0x0F0E0D0C0B0A0908}, bytes)));
    struct Vector {
        char const *bytes;
        std::uint64_t hash;
    };
    for (Vector const &vector :
         {Vector{"a", 0x407448D2B89B1813}, Vector{"/A/Bc", 0xFB15AF11E58A4D65}, Vector{"1234567", 0xA33D651594FDAE81},
          Vector{"12345678", 0x3489982430560A87}, Vector{"123456789", 0x0FBC0F0007965FCF},
          Vector{"/Area12/Dialog34/Control567", 0x04CF076066C44935}, Vector{"0123456789abcdef", 0x1D42B30F7E060C24}}) {
        EXPECT_EQ(vector.hash, (SipHash<1, 3>({}, vector.bytes))) << vector.bytes;
    }
}

TEST(DictionaryKeyTest, HashesSampledBytes) {
    EXPECT_EQ(0U, ByteRunKey::HashOf("", kBucketCount));
    EXPECT_EQ(47U, ByteRunKey::HashOf("/", kBucketCount));
    EXPECT_EQ(548U, ByteRunKey::HashOf("/A", kBucketCount));
    EXPECT_EQ(310U, ByteRunKey::HashOf("/Bc", kBucketCount));
    EXPECT_EQ(255U, ByteRunKey::HashOf("\xFF", kBucketCount)) << "bytes are unsigned";
    // 10 bytes: each second one; 14 bytes: each second one too, seven of them.
    EXPECT_EQ(ByteRunKey::HashOf("abcdefghij", kBucketCount), ByteRunKey::HashOf("aXcXeXgXiX", kBucketCount));
    EXPECT_EQ(ByteRunKey::HashOf("abcdefghijklmn", kBucketCount), ByteRunKey::HashOf("aXcXeXgXiXkXmX", kBucketCount));
    std::string key;
    for (int i = 0; i < 100; ++i) {
        EXPECT_EQ(PlainHash(key, kBucketCount), ByteRunKey::HashOf(key, kBucketCount)) << key;
        EXPECT_EQ(PlainHash(key, 7), ByteRunKey::HashOf(key, 7)) << key;
        key.push_back(static_cast<char>('0' + i * 7 % 200));
    }
}

TEST(DictionaryKeyTest, OwnsItsBytesOrPointsAtThem) {
    std::string bytes = "key";
    ByteRunKey const owning(bytes, true);
    ByteRunKey const pointing(bytes, false);
    EXPECT_TRUE(owning.OwnsBytes());
    EXPECT_FALSE(pointing.OwnsBytes());
    EXPECT_TRUE(owning.Equals(pointing));
    bytes[0] = 'K';
    EXPECT_EQ("key", owning.Bytes());
    EXPECT_EQ("Key", pointing.Bytes());
    EXPECT_FALSE(owning.Equals(pointing));
    EXPECT_TRUE(ByteRunKey("", true).Equals(ByteRunKey({}, false)));
    EXPECT_FALSE(ByteRunKey("", true).Equals(owning));
    EXPECT_EQ(owning.Hash(kBucketCount), ByteRunKey::HashOf("key", kBucketCount));
}

TEST(DictionaryKeyTest, ItemsAreWrittenAsVersion1StoresThem) {
    MemorySink sink;
    DictionaryEntry const entry("k", true, ByteRunValue(V(u"\u0102")));
    HashItem const &item = entry;
    item.Write(sink);
    EXPECT_EQ(B("\1\0\0\0k\2\0\0\0\2\1"), sink.Bytes());
}

TEST(DictionaryKeyTest, ValuesCountWholeUnits) {
    ByteRunValue const odd("abc", true);
    EXPECT_EQ(1U, odd.UnitLength());
    EXPECT_EQ("<6261>", Show(odd.Units()));
    EXPECT_EQ(0U, ByteRunValue("a", false).UnitLength());
}

TEST(DictionaryKeyTest, SplitsKeyTexts) {
    EXPECT_EQ("/A", SplitKeyText("$$$/A").name);
    EXPECT_EQ("/A", SplitKeyText("/A").name);
    EXPECT_EQ("/A", SplitKeyText("$$$/A=X=Y").name);
    EXPECT_EQ("X=Y", SplitKeyText("$$$/A=X=Y").defaultText);
    EXPECT_TRUE(SplitKeyText("/A=").hasDefault);
    EXPECT_FALSE(SplitKeyText("/A").hasDefault);
    EXPECT_EQ("$x", SplitKeyText("$$$$x").name);
    for (char const *malformed : {"$", "$$", "$A", "$$/A", "$$=x"}) {
        EXPECT_TRUE(SplitKeyText(malformed).isMalformed) << malformed;
        EXPECT_EQ("", SplitKeyText(malformed).name) << malformed;
    }
    for (char const *empty : {"", "$$$", "=x", "$$$=x"}) {
        EXPECT_FALSE(SplitKeyText(empty).isMalformed) << empty;
        EXPECT_EQ("", SplitKeyText(empty).name) << empty;
    }
}

TEST(DictionaryEngineTest, StartsValidAndEmptyAsVersion27) {
    DictionaryReader const dictionary;
    EXPECT_TRUE(dictionary.IsValid());
    EXPECT_EQ((DictionaryVersion{2, 7}), dictionary.Version());
    EXPECT_FALSE(dictionary.Locale().has_value());
    EXPECT_EQ(0U, dictionary.Array().EntryTotal());
    EXPECT_EQ(0U, dictionary.Array().SecondTotal());
    EXPECT_EQ(0U, dictionary.Array().BlockCount());
    EXPECT_EQ(0U, dictionary.Legacy().Count());
    EXPECT_EQ(1U, dictionary.Array().RefCount());
    EXPECT_EQ(-1, dictionary.Find("x"));
    EXPECT_EQ(-1, dictionary.Find(""));
}

TEST(DictionaryEngineTest, AddsUnderTheNameAndIgnoresDefaults) {
    DictionaryReader dictionary;
    EXPECT_EQ(0, dictionary.Add("$$$/A", V(u"B")));
    EXPECT_EQ(1, dictionary.Add("/C", V(u"\\n^T#{copy}")));
    EXPECT_EQ(2, dictionary.Add("$$$/D=ignored", V(u"")));
    EXPECT_EQ("/A=B /C=\\n^T#{copy} /D=", List(dictionary)) << "nothing is unescaped";
    EXPECT_EQ(0, dictionary.Find("/A"));
    EXPECT_EQ(2, dictionary.Find("/D"));
    EXPECT_EQ(-1, dictionary.Find("$$$/A")) << "a name, not a key text";
    EXPECT_EQ(3U, dictionary.Array().EntryTotal());
    EXPECT_EQ(3U, dictionary.Array().SecondTotal());
    EXPECT_EQ(1U, dictionary.Array().BlockCount());
}

TEST(DictionaryEngineTest, RefusesWhatIsNoKey) {
    DictionaryReader dictionary;
    for (char const *key : {"", "$", "$$", "$A", "$$/A", "$$$", "=x", "$$$=x"}) {
        EXPECT_EQ(-1, dictionary.Add(key, V(u"B"))) << key;
    }
    EXPECT_EQ(-1, dictionary.Add({}, V(u"B")));
    EXPECT_EQ("", List(dictionary));
    DictionaryReader old({1, 5});
    EXPECT_EQ(-1, old.Add("/A", V(u"B")));
    EXPECT_TRUE(dictionary.IsValid());
}

TEST(DictionaryEngineTest, ReplacesTheTextAndKeepsTheIndex) {
    DictionaryReader dictionary;
    dictionary.Add("/A", V(u"first"));
    dictionary.Add("/B", V(u"b"));
    EXPECT_EQ(0, dictionary.Add("$$$/A=default", V(u"a much longer second text")));
    EXPECT_EQ("a much longer second text", Look(dictionary, "/A"));
    EXPECT_EQ(0, dictionary.Add("/A", V(u"3")));
    EXPECT_EQ(0, dictionary.Add("/A", {}));
    EXPECT_EQ("", Look(dictionary, "/A=x"));
    EXPECT_EQ(0, dictionary.Add("/A", V(u"4")));
    EXPECT_EQ("/A=4 /B=b", List(dictionary));
    EXPECT_EQ(2U, dictionary.Array().EntryTotal());
    EXPECT_EQ(2U, dictionary.Array().SecondTotal());
}

TEST(DictionaryEngineTest, KeysAreComparedByteByByte) {
    DictionaryReader dictionary;
    dictionary.Add("/a", V(u"lower"));
    dictionary.Add("/A", V(u"upper"));
    dictionary.Add(B("/A\0B"), V(u"zero inside"));
    dictionary.Add("/\xC3\xA9", V(u"accent"));
    EXPECT_EQ("lower", Look(dictionary, "$$$/a"));
    EXPECT_EQ("upper", Look(dictionary, "/A"));
    EXPECT_EQ("zero inside", Look(dictionary, B("/A\0B")));
    EXPECT_EQ("accent", Look(dictionary, "/\xC3\xA9"));
    EXPECT_EQ("-", Look(dictionary, "/A "));
}

TEST(DictionaryEngineTest, LooksUp) {
    DictionaryReader dictionary;
    dictionary.Add("$$$/A", V(u"B"));
    EXPECT_EQ("B", Look(dictionary, "$$$/A"));
    EXPECT_EQ("B", Look(dictionary, "/A"));
    EXPECT_EQ("B", Look(dictionary, "$$$/A=default"));
    for (char const *nothing : {"", "$", "$$/A", "$$/A=x", "$/A", "$$$", "$$$=x", "=x", "/B", "$$$/B"}) {
        EXPECT_EQ("-", Look(dictionary, nothing)) << nothing;
    }
}

TEST(DictionaryEngineTest, GivesTheDefaultUnescaped) {
    DictionaryReader const dictionary;
    EXPECT_EQ("Fall<000A>back", Look(dictionary, "$$$/Missing=Fall\\nback"));
    EXPECT_EQ("<00A9><2122>=x", Look(dictionary, "/Missing=#{copy}^T=x"));
    EXPECT_EQ("", Look(dictionary, "/Missing="));
    EXPECT_EQ("-", Look(dictionary, "/Missing"));
}

TEST(DictionaryEngineTest, DefaultsAreSignExtendedWithoutAnEncodingAndConvertedWithOne) {
    DictionaryReader const dictionary;
    EXPECT_EQ("<FF80><FFFF>A<007F>", Look(dictionary, "/M=\x80\xFF\x41\x7F"));
    EXPECT_EQ("<FFC3><FFA9>", Look(dictionary, "/M=\xC3\xA9"));
    EXPECT_EQ("<00E9>", Look(dictionary, "/M=\xC3\xA9", kEncodingUtf8));
    EXPECT_EQ("<00E9><000A>", Look(dictionary, "/M=\xC3\xA9\\n", kEncodingUtf8));
    EXPECT_EQ(Show(MultibyteToUnits(kEncodingAnsi, "\xE9")), Look(dictionary, "/M=\xE9", kEncodingAnsi));
}

TEST(DictionaryEngineTest, AsksTheDefaultDictionary) {
    EXPECT_EQ(nullptr, DictionaryReader::GetDefault());
    DictionaryReader dictionary;
    dictionary.Add("/A", V(u"own"));
    {
        DictionaryReader other;
        other.Add("/A", V(u"other's"));
        other.Add("/B", V(u"only the other's"));
        DictionaryReader::SetDefault(&other);
        EXPECT_EQ("own", Look(dictionary, "$$$/A"));
        EXPECT_EQ("only the other's", Look(dictionary, "$$$/B=default"));
        EXPECT_EQ("default", Look(dictionary, "$$$/C=default"));
        EXPECT_EQ("default", Look(other, "$$$/C=default")) << "it does not ask itself";
        {
            DictionaryReader const unrelated;
        }
        EXPECT_EQ(&other, DictionaryReader::GetDefault());
    }
    EXPECT_EQ(nullptr, DictionaryReader::GetDefault()) << "the slot is cleared with the dictionary";
    EXPECT_EQ("default", Look(dictionary, "$$$/B=default"));
}

TEST(DictionaryEngineTest, AnOldDictionaryLooksIntoTheOldTable) {
    DictionaryReader old({1, 5});
    ReadBytes(old, "\"$$$/A=raw \\n\"\r\n\"/B=b\"\r\n\"/A=again \\t\"\r\n");
    EXPECT_EQ("again \\t", Look(old, "$$$/A=default")) << "neither unescaped nor doubled";
    EXPECT_EQ("b", Look(old, "/B"));
    EXPECT_EQ("default", Look(old, "/C=default"));
    EXPECT_EQ(2U, old.Legacy().Count());
    EXPECT_EQ(0U, old.Array().EntryTotal());
    DictionaryReader dictionary;
    DictionaryReader::SetDefault(&old);
    EXPECT_EQ("b", Look(dictionary, "/B"));
}

TEST(DictionaryEngineTest, TheOldTableReplacesEqualKeysAnywhereInAChain) {
    // All in bucket 0 of 1021: two bytes a, b with 32 a + b = 1021 n.
    std::vector<std::string> keys;
    for (int first = 1; first < 256 && keys.size() < 3; ++first) {
        for (int second = 1; second < 256 && keys.size() < 3; ++second) {
            if ((32 * first + second) % 1021 == 0) {
                keys.push_back({static_cast<char>(first), static_cast<char>(second)});
            }
        }
    }
    ASSERT_EQ(3U, keys.size());
    auto const entry = [](std::string const &key, char16_t value) {
        unsigned short const unit = value;
        return std::make_unique<DictionaryEntry>(key, true, ByteRunValue(UnitsView(&unit, 1)));
    };
    LegacyTable table;
    for (std::string const &key : keys) {
        table.Replace(entry(key, u'1'));
    }
    EXPECT_EQ(keys[2], table.First(0)->Bytes()) << "a new entry goes ahead";
    for (std::string const &key : keys) {
        table.Replace(entry(key, u'2'));
        EXPECT_EQ("2", Show(table.Find(key)->Value().Units()));
        EXPECT_EQ(3U, table.Count());
    }
    EXPECT_EQ(keys[2], table.First(0)->Bytes());
    EXPECT_EQ(keys[0], table.First(0)->NextEntry()->NextEntry()->Bytes());
    EXPECT_EQ(nullptr, table.Find("other"));
}

TEST(DictionaryEngineTest, KeepsTextsOfAllSizes) {
    DictionaryReader dictionary;
    KTUnits longText(200'000, 'x');
    longText[0] = 0x263A;
    std::string const longKey(100'001, 'k');
    for (int i = 0; i < 600; ++i) { // over several pieces of records and texts
        std::string const name = "/Key/" + std::to_string(i);
        EXPECT_EQ(i, dictionary.Add(name, KTUnits(static_cast<std::size_t>(i), 'v')));
    }
    EXPECT_EQ(600, dictionary.Add(longKey, longText));
    for (int i = 0; i < 600; ++i) {
        EXPECT_EQ(std::string(static_cast<std::size_t>(i), 'v'), Look(dictionary, "/Key/" + std::to_string(i)));
    }
    EXPECT_EQ(Show(longText), Look(dictionary, longKey));
}

TEST(DictionaryEngineTest, EveryProblemHasAName) {
    for (int kind = 0; kind <= static_cast<int>(DictionaryProblemKind::TooLong); ++kind) {
        EXPECT_STRNE("", DictionaryProblemName(static_cast<DictionaryProblemKind>(kind)));
    }
    EXPECT_STREQ("", DictionaryProblemName(static_cast<DictionaryProblemKind>(99)));
}

} // namespace
