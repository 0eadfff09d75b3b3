// DictionaryMemoryTest.cpp: how much memory dictionaries take beside their files, counted at the allocation operators of
// this program, in which the engine is linked; and that allocations do not follow what a damaged file claims.

#include "DictionaryFiles.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <new>

#include <malloc.h>

using namespace dictionary_files;
using namespace orvik_private;

namespace {

// One thread: the program's own and no other allocates while a test counts.
struct Counts {
    std::size_t now = 0;
    std::size_t most = 0;
    std::size_t largest = 0;
};
Counts counts;

std::size_t SizeOf(void *block) {
#ifdef _WIN32
    return _msize(block);
#else
    return malloc_usable_size(block);
#endif
}

} // namespace

void *operator new(std::size_t size) {
    void *const block = std::malloc(size == 0 ? 1 : size);
    if (block == nullptr) {
        throw std::bad_alloc();
    }
    std::size_t const taken = SizeOf(block);
    counts.now += taken;
    counts.most = std::max(counts.most, counts.now);
    counts.largest = std::max(counts.largest, taken);
    return block;
}
void operator delete(void *block) noexcept {
    if (block != nullptr) {
        counts.now -= SizeOf(block);
        std::free(block);
    }
}
void *operator new[](std::size_t size) { return ::operator new(size); }
void operator delete[](void *block) noexcept { ::operator delete(block); }
void operator delete(void *block, std::size_t) noexcept { ::operator delete(block); }
void operator delete[](void *block, std::size_t) noexcept { ::operator delete(block); }

namespace {

struct Usage {
    double kept;    ///< bytes that stay allocated, for each byte of the file
    double most;    ///< bytes at the worst moment of reading
    double largest; ///< largest single allocation
    bool isValid;
};

Usage Measure(std::string const &file) {
    std::size_t const before = counts.now;
    counts.most = counts.now;
    counts.largest = 0;
    DictionaryReader dictionary;
    ReadBytes(dictionary, file);
    double const size = static_cast<double>(file.size());
    return {static_cast<double>(counts.now - before) / size, static_cast<double>(counts.most - before) / size,
            static_cast<double>(counts.largest) / size, dictionary.IsValid()};
}

// Dictionaries of many entries with keys and texts of about these lengths.
std::string MakeFile(unsigned entries, std::size_t keyLength, std::size_t textLength, DictionaryForm const &form) {
    DictionaryReader dictionary;
    for (unsigned i = 0; i < entries; ++i) {
        std::string key;
        for (unsigned rest = i; key.size() < 3 || rest != 0; rest /= 200) { // as short as so many can be
            key.push_back(static_cast<char>(0x30 + rest % 200));
        }
        key.resize(std::max(key.size(), keyLength), 'k');
        dictionary.Add("/" + key, KTUnits(textLength, 'v'));
    }
    return WriteBytes(dictionary, form);
}

TEST(DictionaryMemoryTest, ABinaryFileTakesAtMostThreeTimesItsBytes) {
    // 393,217 entries are one more than the index holds before it doubles, its worst case.
    for (unsigned const entries : {2000U, 100'000U, 393'217U}) {
        for (auto const &[key, text] : {std::pair{0U, 0U}, {10U, 5U}, {25U, 40U}}) {
            for (std::endian const order : {std::endian::little, std::endian::big}) {
                Usage const usage = Measure(MakeFile(entries, key, text, {true, kEncodingNone, order}));
                EXPECT_TRUE(usage.isValid);
                EXPECT_LE(usage.kept, 3.0) << entries << " entries, keys " << key << ", texts " << text;
                EXPECT_LE(usage.most, 3.0) << entries << " entries, keys " << key << ", texts " << text;
                if (order == std::endian::little) {
                    std::printf("%6u entries, keys of %2u, texts of %2u: keeps %.2f, at most %.2f times the file\n",
                                entries, key, text, usage.kept, usage.most);
                }
            }
        }
    }
}

TEST(DictionaryMemoryTest, AMultibyteFileTakesNoMore) {
    Usage const usage = Measure(MakeFile(100'000, 25, 40, {true, kEncodingUtf8, std::endian::little}));
    EXPECT_TRUE(usage.isValid);
    EXPECT_LE(usage.most, 3.0);
}

TEST(DictionaryMemoryTest, ATextFileTakesAtMostThreeTimesItsBytes) {
    for (auto const &[key, text] : {std::pair{10U, 10U}, {25U, 40U}}) {
        Usage const usage = Measure(MakeFile(100'000, key, text, {false, kEncodingNone, std::endian::little}));
        EXPECT_TRUE(usage.isValid);
        EXPECT_LE(usage.kept, 3.0);
        EXPECT_LE(usage.most, 3.0);
        std::printf("UTF-16 text, keys of %2u, texts of %2u: keeps %.2f, at most %.2f times the file\n", key, text,
                    usage.kept, usage.most);
    }
}

TEST(DictionaryMemoryTest, DamagedFilesTakeNoMoreThanTheirSizeAllows) {
    std::string const whole = MakeFile(2000, 10, 10, {});
    for (std::size_t at = 21; at < 80; ++at) {
        for (std::uint32_t const value : {0xFFFFFFFFU, 0x7FFFFFFFU, 0x01000000U, 0x00010000U}) {
            std::string changed = whole;
            changed.replace(at, 4, Fields().U32(value).Bytes());
            EXPECT_LE(Measure(changed).most, 8.0) << at; // some claim to be of another kind, such as multibyte
        }
    }
    for (unsigned const minor : {0U, 5U}) {
        for (std::uint32_t const value : {0xFFFFFFFFU, 0x10000000U, 0xFFFFU}) {
            std::string file = Header(1, minor, 0).U32(value).Bytes();
            file.resize(100'000);
            EXPECT_LE(Measure(file).most, 16.0); // an object for each entry of 8 bytes
        }
    }
}

TEST(DictionaryMemoryTest, ReplacingATextAgainAndAgainDoesNotGrow) {
    DictionaryReader dictionary;
    dictionary.Add("/A", KTUnits(100, 'x'));
    dictionary.Add("/A", KTUnits(100, 'y'));
    std::size_t const before = counts.now;
    for (int i = 0; i < 10'000; ++i) {
        dictionary.Add("/A", KTUnits(100, 'z'));
    }
    EXPECT_LE(counts.now, before + 1000);
}

} // namespace
