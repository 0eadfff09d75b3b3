// TextMemoryTest.cpp: where the units of texts lie, and that each thread finds its blocks again.

#include "KTString.h"

#include <boost/thread/thread.hpp>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <utility>
#include <vector>

namespace {

constexpr std::size_t kSizes[] = {1, 2, 16, 17, 18, 32, 33, 34, 64, 65, 66, 128, 129, 130, 255, 256, 257, 258, 4096};

KTString Text(std::size_t length, unsigned short unit) {
    KTString text;
    text.assign(length, unit);
    return text;
}

} // namespace

TEST(TextMemory, BlocksOfEverySizeHoldTheirBytesAndDoNotOverlap) {
    constexpr std::size_t kEach = 40; // more than a thread keeps
    for (int round = 0; round < 3; ++round) {
        std::vector<unsigned char *> blocks;
        for (std::size_t const size : kSizes) {
            for (std::size_t i = 0; i < kEach; ++i) {
                auto *const block = static_cast<unsigned char *>(KTAllocateUnits(size));
                EXPECT_EQ(0U, reinterpret_cast<std::uintptr_t>(block) % alignof(std::max_align_t));
                std::memset(block, static_cast<int>(blocks.size() % 251), size);
                blocks.push_back(block);
            }
        }
        for (std::size_t i = 0; i < blocks.size(); ++i) {
            std::size_t const size = kSizes[i / kEach];
            EXPECT_EQ(static_cast<std::ptrdiff_t>(size),
                      std::count(blocks[i], blocks[i] + size, static_cast<unsigned char>(i % 251)));
            KTFreeUnits(blocks[i], size);
        }
    }
}

TEST(TextMemory, TextsOfEveryLengthKeepTheirUnits) {
    for (std::size_t length = 0; length < 300; ++length) {
        KTString const first = Text(length, 'a');
        KTString copy = first;
        copy += "b";
        EXPECT_EQ(Text(length, 'a'), first);
        EXPECT_EQ(length + 1, copy.size());
        EXPECT_EQ(0, copy.c_str()[length + 1]);
        EXPECT_EQ(first, copy.substr(0, length));
    }
}

TEST(TextMemory, TextsMayBeDestroyedByOtherThreads) {
    for (int round = 0; round < 20; ++round) {
        std::vector<KTString> texts;
        texts.reserve(200);
        for (std::size_t i = 0; i < 200; ++i) {
            texts.push_back(Text(i, 'x'));
        }
        boost::thread([&texts] {
            std::vector<KTString> const taken = std::move(texts);
            for (std::size_t i = 0; i < taken.size(); ++i) {
                EXPECT_EQ(Text(i, 'x'), taken[i]);
            }
        }).join();
    }
}

TEST(TextMemory, ThreadsMakeAndDestroyTextsAtTheSameTime) {
    boost::thread_group threads;
    for (unsigned short unit = 'a'; unit < 'e'; ++unit) {
        threads.create_thread([unit] {
            for (std::size_t i = 0; i < 5000; ++i) {
                KTString const text = Text(i % 140, unit);
                std::vector<KTString> const copies(i % 20, text);
                for (KTString const &copy : copies) {
                    ASSERT_EQ(text, copy);
                }
            }
        });
    }
    threads.join_all();
}

TEST(TextMemory, AMovedTextKeepsItsBlock) {
    KTString text = Text(50, 'm');
    unsigned short const *const units = text.c_str();
    KTString const moved = std::move(text);
    EXPECT_EQ(units, moved.c_str());
}
