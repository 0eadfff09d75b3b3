// Canvas.h: a picture in memory, and PNG files of it.

#pragma once

#include <array>
#include <cstddef>
#include <optional>
#include <string>
#include <vector>

namespace soft {

/// Red, green, blue, alpha; not premultiplied.
using Pixel = std::array<unsigned char, 4>;

/// Pixels row by row from the top.
class Canvas {
  public:
    Canvas() = default;
    Canvas(int width, int height, Pixel const &background = {})
        : m_Width(width), m_Height(height),
          m_Pixels(static_cast<std::size_t>(width) * static_cast<std::size_t>(height), background) {}

    int Width() const { return m_Width; }
    int Height() const { return m_Height; }
    Pixel &At(int x, int y) { return m_Pixels[Index(x, y)]; }
    Pixel const &At(int x, int y) const { return m_Pixels[Index(x, y)]; }
    unsigned char const *Bytes() const { return m_Pixels.data()->data(); }

    friend bool operator==(Canvas const &a, Canvas const &b) = default;

  private:
    std::size_t Index(int x, int y) const {
        return static_cast<std::size_t>(y) * static_cast<std::size_t>(m_Width) + static_cast<std::size_t>(x);
    }

    int m_Width = 0;
    int m_Height = 0;
    std::vector<Pixel> m_Pixels;
};

/// The canvas with each factor x factor pixels made one, the average of their premultiplied colours.
Canvas Reduced(Canvas const &canvas, int factor);

/// A PNG file of the canvas; empty if it cannot be made.
std::string EncodePng(Canvas const &canvas);

/// The picture in a PNG file of up to 8 bits a channel; nothing if there is none.
std::optional<Canvas> DecodePng(std::string const &file);

} // namespace soft
