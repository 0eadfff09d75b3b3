// TileMemoryTest.cpp: how much memory the loading of a picture takes, counted by allocation operators of this program's own.
// Natively only: on Windows the library has the run-time's. KT_PICTURE_SIDE sets the side of the picture, in pixels.

#include "RecordingRenderer.h"

#include "KTTexturedQuad.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstdlib>
#include <memory>
#include <new>

namespace {

std::atomic<std::size_t> g_LargeBlocks = 0;
std::atomic<std::size_t> g_SmallBytes = 0;
std::atomic<std::size_t> g_LargeBytes = 0;

constexpr std::size_t kLarge = std::size_t{1} << 20;

void *Counted(std::size_t size) noexcept {
    if (size >= kLarge) {
        ++g_LargeBlocks;
        g_LargeBytes += size;
    } else {
        g_SmallBytes += size;
    }
    return std::malloc(size == 0 ? 1 : size);
}

void *CountedOrThrow(std::size_t size) {
    void *const block = Counted(size);
    if (block == nullptr) {
        throw std::bad_alloc();
    }
    return block;
}

} // namespace

// NOLINTBEGIN(misc-new-delete-overloads)
void *operator new(std::size_t size) { return CountedOrThrow(size); }
void *operator new[](std::size_t size) { return CountedOrThrow(size); }
void *operator new(std::size_t size, std::nothrow_t const &) noexcept { return Counted(size); }
void *operator new[](std::size_t size, std::nothrow_t const &) noexcept { return Counted(size); }
void operator delete(void *block) noexcept { std::free(block); }
void operator delete[](void *block) noexcept { std::free(block); }
void operator delete(void *block, std::size_t) noexcept { std::free(block); }
void operator delete[](void *block, std::size_t) noexcept { std::free(block); }
// NOLINTEND(misc-new-delete-overloads)

namespace {

struct Counts {
    std::size_t blocks;
    std::size_t bytes;
    std::size_t smallBytes;
};

// What loading the region of a BGRA picture allocates, the writing down of the renderer included.
Counts AllocatedBy(std::size_t side, KTTextureCoord2D const &region) {
    std::unique_ptr<unsigned char, decltype(&std::free)> const image(
        static_cast<unsigned char *>(std::calloc(side * side, 4)), &std::free);
    RecordingRenderer const renderer(1024, kOnlyBorders);
    KTLargeTexturedQuad3D large;
    KTLoadTextureParams params(true, false, true, false, 0, 0, kKTPixelFormatBGRA);
    int const length = static_cast<int>(side);
    g_LargeBlocks = g_LargeBytes = g_SmallBytes = 0;
    large.Load(image.get(), length, length, length, length, renderer, region, params);
    EXPECT_GT(large.quads.size(), 1U);
    return {g_LargeBlocks, g_LargeBytes, g_SmallBytes};
}

std::size_t Side() {
    char const *const set = std::getenv("KT_PICTURE_SIDE"); // NOLINT(concurrency-mt-unsafe)
    return set == nullptr ? 4096 : std::strtoul(set, nullptr, 10);
}

} // namespace

TEST(TileMemory, AFramedPictureIsCopiedOnce) {
    std::size_t const side = Side();
    Counts const counts = AllocatedBy(side, {});
    EXPECT_EQ(counts.blocks, 1U);
    EXPECT_EQ(counts.bytes, (side + 2) * (side + 2) * 4);
    EXPECT_LT(counts.smallBytes, kLarge);
}

TEST(TileMemory, APartAwayFromTheEdgesIsNotCopied) {
    Counts const counts = AllocatedBy(Side(), {0.25, 0.25, 0.8, 0.75});
    EXPECT_EQ(counts.blocks, 0U);
    EXPECT_LT(counts.smallBytes, kLarge);
}
