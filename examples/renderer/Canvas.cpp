// Canvas.cpp: pictures made smaller, and PNG files by stb.

#include "Canvas.h"

#include <cstring>
#include <limits>
#include <memory>

#define STBI_NO_STDIO
#define STBI_WRITE_NO_STDIO
#include <stb_image.h>
#include <stb_image_write.h>

namespace soft {

namespace {

constexpr int kChannels = 4;

Pixel AverageOf(Canvas const &canvas, int left, int top, int factor) {
    int sums[3] = {};
    int alphas = 0;
    for (int y = top; y < top + factor; ++y) {
        for (int x = left; x < left + factor; ++x) {
            Pixel const &pixel = canvas.At(x, y);
            for (std::size_t i = 0; i < 3; ++i) {
                sums[i] += pixel[i] * pixel[3];
            }
            alphas += pixel[3];
        }
    }
    if (alphas == 0) {
        return {};
    }
    auto const rounded = [](int sum, int parts) { return static_cast<unsigned char>((sum + parts / 2) / parts); };
    return {rounded(sums[0], alphas), rounded(sums[1], alphas), rounded(sums[2], alphas),
            rounded(alphas, factor * factor)};
}

} // namespace

Canvas Reduced(Canvas const &canvas, int factor) {
    Canvas reduced(canvas.Width() / factor, canvas.Height() / factor);
    for (int y = 0; y < reduced.Height(); ++y) {
        for (int x = 0; x < reduced.Width(); ++x) {
            reduced.At(x, y) = AverageOf(canvas, x * factor, y * factor, factor);
        }
    }
    return reduced;
}

std::string EncodePng(Canvas const &canvas) {
    std::string file;
    auto const append = [](void *to, void *bytes, int count) {
        static_cast<std::string *>(to)->append(static_cast<char const *>(bytes), static_cast<std::size_t>(count));
    };
    if (canvas.Width() > 0 && canvas.Height() > 0) {
        stbi_write_png_to_func(append, &file, canvas.Width(), canvas.Height(), kChannels, canvas.Bytes(),
                               canvas.Width() * kChannels);
    }
    return file;
}

std::optional<Canvas> DecodePng(std::string const &file) {
    if (file.size() > static_cast<std::size_t>(std::numeric_limits<int>::max())) {
        return std::nullopt;
    }
    int width = 0;
    int height = 0;
    int channels = 0;
    std::unique_ptr<stbi_uc, void (*)(void *)> const pixels(
        stbi_load_from_memory(reinterpret_cast<stbi_uc const *>(file.data()), static_cast<int>(file.size()), &width,
                              &height, &channels, kChannels),
        &stbi_image_free);
    if (pixels == nullptr) {
        return std::nullopt;
    }
    Canvas canvas(width, height);
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            std::size_t const index =
                static_cast<std::size_t>(y) * static_cast<std::size_t>(width) + static_cast<std::size_t>(x);
            std::memcpy(canvas.At(x, y).data(), pixels.get() + index * kChannels, kChannels);
        }
    }
    return canvas;
}

} // namespace soft
