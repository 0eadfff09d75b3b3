// WGuardedPictureTest.cpp: pictures between pages that cannot be touched: a read or write of one byte beside a caller's
// buffer ends the test.

#include "RecordingRenderer.h"

#include "KTGraphicsUtils.h"
#include "KTTexturedQuad.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <cstring>
#include <memory>
#include <stdexcept>

namespace {

using Buffer = std::unique_ptr<unsigned char[]>;

constexpr std::size_t kPage = 4096;

// Bytes with a forbidden page right behind them, or right before them.
class GuardedBytes {
  public:
    enum class Edge { Start, End };

    GuardedBytes(std::size_t size, Edge edge) {
        std::size_t const pages = (size + kPage - 1) / kPage * kPage;
        m_Block.reset(static_cast<unsigned char *>(
            VirtualAlloc(nullptr, pages + 2 * kPage, MEM_RESERVE | MEM_COMMIT, PAGE_READWRITE)));
        DWORD former = 0;
        if (m_Block == nullptr || VirtualProtect(m_Block.get(), kPage, PAGE_NOACCESS, &former) == FALSE ||
            VirtualProtect(m_Block.get() + kPage + pages, kPage, PAGE_NOACCESS, &former) == FALSE) {
            throw std::runtime_error("no guarded memory");
        }
        m_Bytes = m_Block.get() + kPage + (edge == Edge::Start ? 0 : pages - size);
        std::memset(m_Bytes, 77, size);
    }

    unsigned char *Get() const { return m_Bytes; }

  private:
    struct Free {
        void operator()(unsigned char *block) const { VirtualFree(block, 0, MEM_RELEASE); }
    };
    std::unique_ptr<unsigned char, Free> m_Block;
    unsigned char *m_Bytes;
};

constexpr GuardedBytes::Edge kEdges[] = {GuardedBytes::Edge::Start, GuardedBytes::Edge::End};

constexpr struct {
    int width;
    int height;
} kSizes[] = {{1, 1}, {1, 9}, {9, 1}, {64, 64}, {37, 111}};

std::size_t BytesOf(int width, int height, int pixelBytes) {
    return static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * static_cast<std::size_t>(pixelBytes);
}

} // namespace

TEST(GuardedPicture, GuardsHold) {
    // What the other tests rely on: the pages beside the bytes really are forbidden.
    for (auto const edge : kEdges) {
        GuardedBytes const bytes(100, edge);
        MEMORY_BASIC_INFORMATION information{};
        unsigned char const *const beside = bytes.Get() + (edge == GuardedBytes::Edge::Start ? -1 : 100);
        ASSERT_NE(VirtualQuery(beside, &information, sizeof information), 0U);
        EXPECT_EQ(information.Protect, static_cast<DWORD>(PAGE_NOACCESS));
    }
}

TEST(GuardedPicture, IsFramedAndCutInside) {
    for (auto const edge : kEdges) {
        for (auto const &[width, height] : kSizes) {
            for (int format = 0; format < 4; ++format) {
                auto const pixelFormat = static_cast<KTPixelFormatEnum>(format);
                int const pixelBytes = KTGraphicsUtils::GetBytesForPixelFormat(pixelFormat);
                GuardedBytes const image(BytesOf(width, height, pixelBytes), edge);
                EXPECT_NE(Buffer(KTGraphicsUtils::GetBorderedImage(image.Get(), width, height, pixelBytes)), nullptr);
                EXPECT_NE(
                    Buffer(KTGraphicsUtils::GetSubImage(image.Get(), width, height, 0, 0, width, height, pixelFormat)),
                    nullptr);
                EXPECT_NE(Buffer(KTGraphicsUtils::GetSubImage(image.Get(), width, height, width - 1, height - 1, 1, 1,
                                                              pixelFormat)),
                          nullptr);
                EXPECT_ANY_THROW(
                    KTGraphicsUtils::GetSubImage(image.Get(), width, height, width - 1, height - 1, 2, 1, pixelFormat));
                EXPECT_ANY_THROW(
                    KTGraphicsUtils::GetSubImage(image.Get(), width, height, 0, 1, width, height, pixelFormat));
            }
        }
    }
}

TEST(GuardedPicture, IsFadedInside) {
    for (auto const edge : kEdges) {
        for (auto const &[width, height] : kSizes) {
            for (auto const format : {kKTPixelFormatBGRA, kKTPixelFormatAlpha8}) {
                int const pixelBytes = KTGraphicsUtils::GetBytesForPixelFormat(format);
                GuardedBytes const image(BytesOf(width, height, pixelBytes), edge);
                for (KTTextureCoord2D const &region :
                     {KTTextureCoord2D{0.3, 0.3, 0.6, 0.6}, {0.5, 0.5, 0.5, 0.5}, {1, 1, 0, 0}, {-3, 5, 7, -9}}) {
                    KTGraphicsUtils::ApplyEdgeMaskToImage(static_cast<unsigned int>(width),
                                                          static_cast<unsigned int>(height), format, region,
                                                          image.Get());
                }
            }
        }
    }
}

TEST(GuardedPicture, EveryRegionIsTiledInside) {
    // Every region of whole and of half pixels; the renderer reads each byte it is given.
    for (auto const edge : kEdges) {
        constexpr int kWidth = 7;
        constexpr int kHeight = 5;
        GuardedBytes const image(BytesOf(kWidth, kHeight, 4), edge);
        RecordingRenderer const renderer(2);
        renderer.manager.bytesPerPixel = 4;
        for (int left = 0; left <= 2 * kWidth; ++left) {
            for (int right = left + 1; right <= 2 * kWidth; ++right) {
                for (int top = 0; top <= 2 * kHeight; ++top) {
                    for (int bottom = 0; bottom <= 2 * kHeight; ++bottom) {
                        KTTextureCoord2D const region(left / (2.0 * kWidth), top / (2.0 * kHeight),
                                                      right / (2.0 * kWidth), bottom / (2.0 * kHeight));
                        KTLargeTexturedQuad3D large;
                        KTLoadTextureParams params(false, false, true, false, 0, 0, kKTPixelFormatBGRA);
                        large.Load(image.Get(), kWidth, kHeight, kWidth, kHeight, renderer, region, params);
                        renderer.manager.uploads.clear();
                    }
                }
            }
        }
    }
}
