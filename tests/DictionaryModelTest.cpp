// DictionaryModelTest.cpp: the dictionary against a plain list of keys and texts, with random operations. The seed is
// printed; KT_SEED runs it again.

#include "DictionaryFiles.h"
#include "DictionaryUnescape.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <map>
#include <random>
#include <vector>

using namespace dictionary_files;
using namespace orvik_private;

namespace {

// Keys in the order of their entries, and their texts. A text that is replaced by Add or a line stays where it is; a
// binary file's entries all go to the end.
struct Model {
    std::vector<std::string> order;
    std::map<std::string, KTUnits> texts;

    void Put(std::string const &key, KTUnits const &text) {
        if (!texts.contains(key)) {
            order.push_back(key);
        }
        texts[key] = text;
    }
    void PutLast(std::string const &key, KTUnits const &text) {
        std::erase(order, key);
        order.push_back(key);
        texts[key] = text;
    }
};

class RandomRun {
  public:
    explicit RandomRun(unsigned seed) : m_Random(seed) {}

    void Step() {
        switch (Below(12)) {
        case 0:
            ReadFile();
            break;
        case 1:
            RoundTrip();
            break;
        case 2:
        case 3:
            LookUp();
            break;
        default:
            AddOne();
        }
    }

    void CheckAll() {
        std::size_t at = 0;
        m_Dictionary->Array().ForEach([&](ListedEntry const &entry) {
            ASSERT_LT(at, m_Model.order.size());
            EXPECT_EQ(m_Model.order[at], entry.key);
            EXPECT_EQ(Show(m_Model.texts[m_Model.order[at]]), Show(entry.value));
            ++at;
        });
        EXPECT_EQ(m_Model.order.size(), at);
        EXPECT_EQ(m_Model.order.size(), m_Dictionary->Array().LivingCount());
        EXPECT_TRUE(m_Dictionary->IsValid());
    }

  private:
    std::size_t Below(std::size_t limit) { return std::uniform_int_distribution<std::size_t>(0, limit - 1)(m_Random); }

    std::string Key() { return "/K" + std::to_string(Below(Below(10) == 0 ? 2000 : 60)); }

    KTUnits Text() {
        KTUnits text;
        for (std::size_t i = Below(Below(20) == 0 ? 1000 : 12); i > 0; --i) {
            text.push_back(static_cast<unsigned short>(Below(3) == 0 ? 0x100 + Below(0xD700) : 'a' + Below(26)));
        }
        return text;
    }

    void AddOne() {
        std::string const key = Key();
        KTUnits const text = Text();
        m_Dictionary->Add((Below(2) == 0 ? "$$$" : "") + key + (Below(3) == 0 ? "=default" : ""), text);
        m_Model.Put(key, text);
    }

    void LookUp() {
        std::string const key = Key();
        auto const found = m_Model.texts.find(key);
        std::string const expected = found == m_Model.texts.end() ? "none" : Show(found->second);
        EXPECT_EQ(expected, Look(*m_Dictionary, "$$$" + key + "=none"));
    }

    DictionaryForm Form() {
        return {Below(2) == 0, Below(2) == 0 ? kEncodingNone : kEncodingUtf8,
                Below(2) == 0 ? std::endian::little : std::endian::big};
    }

    // Adds a file with some entries of its own, in any form.
    void ReadFile() {
        DictionaryReader other;
        Model entries;
        for (std::size_t i = Below(30); i > 0; --i) {
            std::string const key = Key();
            KTUnits const text = Text();
            other.Add(key, text);
            entries.Put(key, text);
        }
        DictionaryForm form = Form();
        if (!form.isBinary) {
            form.encoding = kEncodingNone; // the code page has not all characters
        }
        ReadBytes(*m_Dictionary, WriteBytes(other, form));
        for (std::string const &key : entries.order) {
            if (form.isBinary) {
                m_Model.PutLast(key, entries.texts[key]);
            } else {
                m_Model.Put(key, entries.texts[key]);
            }
        }
    }

    // Goes on with what writing and reading gives.
    void RoundTrip() {
        DictionaryForm form = Form();
        form.encoding = form.isBinary ? form.encoding : kEncodingNone;
        std::string const bytes = WriteBytes(*m_Dictionary, form);
        m_Dictionary = std::make_unique<DictionaryReader>();
        ReadBytes(*m_Dictionary, bytes);
    }

    std::mt19937 m_Random;
    std::unique_ptr<DictionaryReader> m_Dictionary = std::make_unique<DictionaryReader>();
    Model m_Model;
};

unsigned Seed() {
    char const *const fixed = std::getenv("KT_SEED");
    return fixed != nullptr ? static_cast<unsigned>(std::strtoul(fixed, nullptr, 10)) : std::random_device()();
}

TEST(DictionaryModelTest, BehavesAsAPlainListOfKeysAndTexts) {
    unsigned const seed = Seed();
    std::printf("KT_SEED=%u\n", seed);
    for (unsigned round = 0; round < 20; ++round) {
        RandomRun run(seed + round);
        for (int step = 0; step < 400; ++step) {
            run.Step();
        }
        run.CheckAll();
        ASSERT_FALSE(testing::Test::HasFailure()) << "seed " << seed + round;
    }
}

TEST(DictionaryModelTest, FindsEachOfManyEntriesAndNoOther) {
    constexpr unsigned kEntries = 200'000;
    auto const key = [](unsigned i) { return "/Some/Key/" + std::to_string(i * 2654435761U); };
    DictionaryReader dictionary;
    for (unsigned i = 0; i < kEntries; ++i) {
        ASSERT_EQ(i, dictionary.Add(key(i), V(u"v")));
    }
    DictionaryReader read;
    ReadBytes(read, WriteBytes(dictionary));
    EXPECT_TRUE(read.IsValid());
    for (unsigned i = 0; i < kEntries; ++i) {
        ASSERT_EQ(i, dictionary.Find(key(i)));
        ASSERT_EQ(i, read.Find(key(i)));
        ASSERT_EQ(-1, read.Find(key(i + kEntries)));
    }
}

} // namespace
