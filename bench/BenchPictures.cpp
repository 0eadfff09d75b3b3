// BenchPictures.cpp: what is done to pictures before they become textures: framed copies and cuts beside a copy of the same
// bytes, soft edges beside the same formula for each pixel, and the cutting into tiles beside the copy that it needs.

#include "Bench.h"

#include "IKTRenderer.h"
#include "KTGraphicsUtils.h"
#include "KTInterpolator.h"
#include "KTTexturedQuad.h"

#include <algorithm>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

namespace bench {

namespace {

constexpr char kCopyGroup[] = "picture-copy";
constexpr char kMaskGroup[] = "edge-mask";
constexpr char kTileGroup[] = "tile-cut";
constexpr char kMemcpy[] = "memcpy";
constexpr char kPerPixel[] = "per-pixel";
constexpr int kBgraBytes = 4;

using Buffer = std::unique_ptr<unsigned char[]>;

std::size_t BytesOf(int side) { return static_cast<std::size_t>(side) * static_cast<std::size_t>(side) * kBgraBytes; }

std::vector<unsigned char> PictureOf(int side) { return std::vector<unsigned char>(BytesOf(side), 200); }

// Larger blocks are mapped anew each time anyway.
HeapRoom RoomFor(std::size_t bytes) { return HeapRoom(std::min(bytes, std::size_t{1} << 20)); }

// A fresh copy of as many bytes, with its allocation, as the library's functions make one.
benchmark::internal::Benchmark *AddMemcpy(Task const &task, std::size_t bytes) {
    return Add(task, kMemcpy, [bytes](benchmark::State &state) {
        std::vector<unsigned char> const source(bytes, 200);
        HeapRoom const room = RoomFor(bytes);
        for (auto _ : state) {
            Buffer const copy(new unsigned char[bytes]);
            std::memcpy(copy.get(), source.data(), bytes);
            benchmark::DoNotOptimize(copy.get());
        }
    });
}

void AddCopies(int side, std::string const &size) {
    Task const framed{kCopyGroup, "bordered", size};
    Add(framed, kOurs, [side](benchmark::State &state) {
        std::vector<unsigned char> const picture = PictureOf(side);
        HeapRoom const room = RoomFor(BytesOf(side + 2));
        for (auto _ : state) {
            benchmark::DoNotOptimize(
                Buffer(KTGraphicsUtils::GetBorderedImage(picture.data(), side, side, kBgraBytes)).get());
        }
    });
    AddMemcpy(framed, BytesOf(side + 2));

    Task const part{kCopyGroup, "sub-image", size};
    int const half = side / 2;
    Add(part, kOurs, [side, half](benchmark::State &state) {
        std::vector<unsigned char> const picture = PictureOf(side);
        HeapRoom const room = RoomFor(BytesOf(half));
        for (auto _ : state) {
            benchmark::DoNotOptimize(Buffer(KTGraphicsUtils::GetSubImage(picture.data(), side, side, half / 2, half / 2,
                                                                         half, half, kKTPixelFormatBGRA))
                                         .get());
        }
    });
    AddMemcpy(part, BytesOf(half));
}

double PlainFactor(double position, double length, double first, double last) {
    double const place = position - length / 2;
    double const firstEdge = first * length - length / 2;
    double const lastEdge = last * length - length / 2;
    double factor = 1;
    if (place <= firstEdge && first * length != 0) {
        factor = KTInterpolator::Interpolate(1.0, 0.0, std::min((firstEdge - place) / (first * length), 1.0));
    }
    if (place >= lastEdge && (1 - last) * length != 0) {
        factor = KTInterpolator::Interpolate(1.0, 0.0, std::min((place - lastEdge) / ((1 - last) * length), 1.0));
    }
    return factor;
}

void PlainMask(int side, KTTextureCoord2D const &region, unsigned char *image) {
    for (int x = 0; x < side; ++x) {
        for (int y = 0; y < side; ++y) {
            double const horizontal = PlainFactor(x, side, region.left, region.right);
            double const vertical = PlainFactor(y, side, region.top, region.bottom);
            unsigned char &alpha =
                image[(static_cast<std::size_t>(side) * static_cast<std::size_t>(y) + static_cast<std::size_t>(x)) *
                          kBgraBytes +
                      3];
            alpha = static_cast<unsigned char>(alpha * horizontal * vertical);
        }
    }
}

void AddMask(char const *name, KTTextureCoord2D const &region) {
    constexpr int kSide = 4096;
    Task const task{kMaskGroup, name, "4096"};
    Add(task, kOurs, [region](benchmark::State &state) {
        std::vector<unsigned char> picture = PictureOf(kSide);
        for (auto _ : state) {
            KTGraphicsUtils::ApplyEdgeMaskToImage(kSide, kSide, kKTPixelFormatBGRA, region, picture.data());
            benchmark::ClobberMemory();
        }
    });
    Add(task, kPerPixel, [region](benchmark::State &state) {
        std::vector<unsigned char> picture = PictureOf(kSide);
        for (auto _ : state) {
            PlainMask(kSide, region, picture.data());
            benchmark::ClobberMemory();
        }
    })->Iterations(1);
}

// Takes textures and does nothing with them.
class NoTextures : public KTTextureManager {
  public:
    unsigned int GetMaxTextureSize() const override { return 1024; }
    void LoadTexture(unsigned char const *pixels, int, int, KTTexture2D &, KTLoadTextureParams const &) override {
        benchmark::DoNotOptimize(pixels);
    }
    void ReleaseTexture(KTTexture2D const &, bool) override {}
};

class NoRenderer : public IKTRenderer {
  public:
    bool IsFeatureSupported(KTRendererFeatureEnum) const override { return true; }
    KTTextureManager &GetTextureManager() const override { return m_Textures; }

  private:
    mutable NoTextures m_Textures;
};

void AddTiles(int side, std::string const &size) {
    Task const task{kTileGroup, "whole", size};
    Add(task, kOurs, [side](benchmark::State &state) {
        std::vector<unsigned char> const picture = PictureOf(side);
        NoRenderer const renderer;
        for (auto _ : state) {
            KTLargeTexturedQuad3D large;
            KTLoadTextureParams params(true, false, true, false, 0, 0, kKTPixelFormatBGRA);
            large.Load(picture.data(), side, side, side, side, renderer, {}, params);
            benchmark::DoNotOptimize(large.quads.data());
        }
    })->Iterations(1);
    AddMemcpy(task, BytesOf(side + 2))->Iterations(1);
}

} // namespace

void AddPictureBenchmarks() {
    DescribeGroup(kCopyGroup, "GetBorderedImage and GetSubImage beside a copy of the bytes of their result");
    ExpectSpeed(kCopyGroup, kMemcpy, 0.8);
    AddCopies(256, "256");
    AddCopies(1024, "1024");
    AddCopies(4096, "4096");
    DescribeGroup(kMaskGroup, "ApplyEdgeMaskToImage beside the same formula for each pixel");
    ExpectSpeed(kMaskGroup, kPerPixel, 10.0);
    AddMask("quarters", {0.25, 0.25, 0.75, 0.75});
    AddMask("everywhere", {0.5, 0.5, 0.5, 0.5});
    DescribeGroup(kTileGroup, "KTLargeTexturedQuad3D::Load, uploads left out, beside the one copy that it makes");
    ExpectSpeed(kTileGroup, kMemcpy, 0.8);
    AddTiles(4096, "4096");
    AddTiles(16'384, "16384");
}

} // namespace bench
