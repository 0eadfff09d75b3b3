// make_course_pictures: draws the pictures of the example course.
//
//     make_course_pictures FOLDER
//
// writes panorama.png, lighthouse.png, crane.png, lifebuoy.png and no_entry.png. Shapes are drawn three times larger
// than needed, then each block of 3 x 3 points becomes one pixel, which gives smooth edges. Colours are flat or plain
// gradients, so that the files stay small.

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

#if defined(__GNUC__)
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wconversion"
#pragma GCC diagnostic ignored "-Wmissing-field-initializers"
#endif
#define STB_IMAGE_WRITE_IMPLEMENTATION
#include <stb_image_write.h>
#if defined(__GNUC__)
#pragma GCC diagnostic pop
#endif

namespace {

constexpr int kFine = 3; // points for each pixel, in both directions

struct Colour {
    int red = 0;
    int green = 0;
    int blue = 0;
    int alpha = 255;
};

Colour Blend(Colour from, Colour to, double share) {
    auto const mix = [share](int a, int b) { return a + static_cast<int>(std::lround((b - a) * share)); };
    return {mix(from.red, to.red), mix(from.green, to.green), mix(from.blue, to.blue), mix(from.alpha, to.alpha)};
}

// A picture in the making; all coordinates are pixels of the finished picture, x to the right and y downwards.
class Canvas {
  public:
    Canvas(int width, int height, Colour background)
        : m_Width(width), m_Height(height),
          m_Points(static_cast<std::size_t>(width) * kFine * static_cast<std::size_t>(height) * kFine, background) {}

    // Colours every point for which `inside(x, y)` is true with `colour(x, y)`.
    template <typename Inside, typename Paint> void Draw(Inside inside, Paint colour) {
        for (int row = 0; row < m_Height * kFine; ++row) {
            double const y = (row + 0.5) / kFine;
            for (int column = 0; column < m_Width * kFine; ++column) {
                double const x = (column + 0.5) / kFine;
                if (inside(x, y)) {
                    At(column, row) = colour(x, y);
                }
            }
        }
    }

    void Rectangle(double left, double top, double right, double bottom, Colour colour) {
        Fill(left, top, right, bottom, colour, [](double, double) { return true; });
    }

    // From `top` at y = top to `bottom` at y = bottom, over the whole width.
    void Gradient(double top, double bottom, Colour upper, Colour lower) {
        Draw([=](double, double y) { return y >= top && y < bottom; },
             [=](double, double y) { return Blend(upper, lower, (y - top) / (bottom - top)); });
    }

    void Disc(double centreX, double centreY, double radius, Colour colour) {
        Fill(centreX - radius, centreY - radius, centreX + radius, centreY + radius, colour,
             [=](double x, double y) { return std::hypot(x - centreX, y - centreY) <= radius; });
    }

    // A straight stroke with square ends.
    void Line(double x1, double y1, double x2, double y2, double thickness, Colour colour) {
        double const length = std::hypot(x2 - x1, y2 - y1);
        double const alongX = (x2 - x1) / length;
        double const alongY = (y2 - y1) / length;
        Fill(std::min(x1, x2) - thickness, std::min(y1, y2) - thickness, std::max(x1, x2) + thickness,
             std::max(y1, y2) + thickness, colour, [=](double x, double y) {
                 double const along = (x - x1) * alongX + (y - y1) * alongY;
                 double const across = (x - x1) * alongY - (y - y1) * alongX;
                 return along >= 0 && along <= length && std::abs(across) <= thickness / 2;
             });
    }

    // A shape with a level top and bottom and straight, leaning sides.
    void Trapezium(double top, double left1, double right1, double bottom, double left2, double right2, Colour colour) {
        Fill(std::min(left1, left2), top, std::max(right1, right2), bottom, colour, [=](double x, double y) {
            double const share = (y - top) / (bottom - top);
            return x >= left1 + (left2 - left1) * share && x < right1 + (right2 - right1) * share;
        });
    }

    // Averages the points and writes a PNG file, with an alpha channel only if the picture needs one.
    bool Write(std::string const &path) const {
        bool const clear =
            std::any_of(m_Points.begin(), m_Points.end(), [](Colour const &point) { return point.alpha != 255; });
        int const channels = clear ? 4 : 3;
        std::vector<std::uint8_t> pixels;
        for (int y = 0; y < m_Height; ++y) {
            for (int x = 0; x < m_Width; ++x) {
                std::array<std::uint8_t, 4> const pixel = Average(x, y);
                pixels.insert(pixels.end(), pixel.begin(), pixel.begin() + channels);
            }
        }
        return stbi_write_png(path.c_str(), m_Width, m_Height, channels, pixels.data(), m_Width * channels) != 0;
    }

  private:
    Colour &At(int column, int row) {
        return m_Points[static_cast<std::size_t>(row) * static_cast<std::size_t>(m_Width * kFine) +
                        static_cast<std::size_t>(column)];
    }
    Colour const &At(int column, int row) const { return const_cast<Canvas *>(this)->At(column, row); }

    // Draw, limited to a box.
    template <typename Inside>
    void Fill(double left, double top, double right, double bottom, Colour colour, Inside inside) {
        int const lastColumn = std::min(m_Width * kFine - 1, static_cast<int>(right * kFine));
        int const lastRow = std::min(m_Height * kFine - 1, static_cast<int>(bottom * kFine));
        for (int row = std::max(0, static_cast<int>(top * kFine)); row <= lastRow; ++row) {
            double const y = (row + 0.5) / kFine;
            for (int column = std::max(0, static_cast<int>(left * kFine)); column <= lastColumn; ++column) {
                double const x = (column + 0.5) / kFine;
                if (x >= left && x < right && y >= top && y < bottom && inside(x, y)) {
                    At(column, row) = colour;
                }
            }
        }
    }

    // Transparent points count for the alpha channel only, so that edges keep the colour of their shape.
    std::array<std::uint8_t, 4> Average(int x, int y) const {
        int red = 0;
        int green = 0;
        int blue = 0;
        int alpha = 0;
        for (int row = y * kFine; row < (y + 1) * kFine; ++row) {
            for (int column = x * kFine; column < (x + 1) * kFine; ++column) {
                Colour const &point = At(column, row);
                red += point.red * point.alpha;
                green += point.green * point.alpha;
                blue += point.blue * point.alpha;
                alpha += point.alpha;
            }
        }
        int const weight = std::max(alpha, 1);
        return {static_cast<std::uint8_t>(red / weight), static_cast<std::uint8_t>(green / weight),
                static_cast<std::uint8_t>(blue / weight), static_cast<std::uint8_t>(alpha / (kFine * kFine))};
    }

    int m_Width;
    int m_Height;
    std::vector<Colour> m_Points;
};

constexpr Colour kWhite{250, 250, 245};
constexpr Colour kRed{200, 40, 45};
constexpr Colour kDark{45, 52, 64};
constexpr Colour kQuay{120, 118, 112};
constexpr Colour kSeaFar{96, 150, 184};
constexpr Colour kSeaNear{22, 74, 112};
constexpr Colour kClear{255, 255, 255, 0};

void DrawCrane(Canvas &canvas, double x, double ground, double size, Colour colour) {
    double const top = ground - size;
    double const thick = size * 0.035;
    canvas.Line(x - size * 0.16, ground, x - size * 0.06, top + size * 0.3, thick, colour);
    canvas.Line(x + size * 0.16, ground, x + size * 0.06, top + size * 0.3, thick, colour);
    canvas.Line(x - size * 0.11, ground - size * 0.35, x + size * 0.11, ground - size * 0.35, thick, colour);
    canvas.Rectangle(x - size * 0.09, top + size * 0.2, x + size * 0.09, top + size * 0.32, colour);
    canvas.Line(x, top, x, top + size * 0.22, thick, colour);
    canvas.Line(x - size * 0.34, top + size * 0.22, x + size * 0.62, top + size * 0.12, thick, colour);
    canvas.Line(x, top + size * 0.02, x + size * 0.6, top + size * 0.12, thick * 0.4, colour);
    canvas.Line(x, top + size * 0.02, x - size * 0.32, top + size * 0.21, thick * 0.4, colour);
    canvas.Rectangle(x - size * 0.36, top + size * 0.2, x - size * 0.26, top + size * 0.3, kDark);
    canvas.Line(x + size * 0.48, top + size * 0.14, x + size * 0.48, top + size * 0.5, thick * 0.3, kDark);
}

void DrawShip(Canvas &canvas, double x, double water, double length, Colour hull) {
    double const deck = water - length * 0.09;
    std::array<Colour, 4> const boxes = {Colour{214, 130, 44}, Colour{60, 120, 90}, Colour{70, 100, 160},
                                         Colour{180, 62, 58}};
    for (int stack = 0; stack < 9; ++stack) {
        for (int level = 0; level < 2 + stack % 2; ++level) {
            double const left = x + length * (0.3 + 0.066 * stack);
            double const bottom = deck - length * 0.034 * level;
            canvas.Rectangle(left, bottom - length * 0.032, left + length * 0.062, bottom,
                             boxes[static_cast<std::size_t>(stack * 3 + level) % boxes.size()]);
        }
    }
    canvas.Rectangle(x + length * 0.1, deck - length * 0.14, x + length * 0.22, deck, kWhite);
    canvas.Rectangle(x + length * 0.12, deck - length * 0.2, x + length * 0.17, deck - length * 0.14, kRed);
    for (int window = 0; window < 4; ++window) {
        double const left = x + length * (0.112 + 0.027 * window);
        canvas.Rectangle(left, deck - length * 0.12, left + length * 0.016, deck - length * 0.1, kDark);
    }
    canvas.Trapezium(deck, x, x + length, water, x + length * 0.04, x + length * 0.94, hull);
    canvas.Rectangle(x + length * 0.035, water - length * 0.015, x + length * 0.945, water, kRed);
}

void DrawLighthouse(Canvas &canvas, double x, double ground, double height) {
    double const wide = height * 0.16;
    for (int band = 0; band < 5; ++band) {
        double const upper = ground - height * 0.78 * (5 - band) / 5;
        double const lower = ground - height * 0.78 * (4 - band) / 5;
        double const above = wide * (0.6 + 0.08 * band);
        double const below = wide * (0.68 + 0.08 * band);
        canvas.Trapezium(upper, x - above, x + above, lower, x - below, x + below, band % 2 == 0 ? kRed : kWhite);
    }
    double const gallery = ground - height * 0.78;
    canvas.Rectangle(x - wide * 0.85, gallery - height * 0.03, x + wide * 0.85, gallery, kDark);
    canvas.Rectangle(x - wide * 0.42, gallery - height * 0.14, x + wide * 0.42, gallery - height * 0.03,
                     {255, 222, 120});
    canvas.Rectangle(x - wide * 0.05, gallery - height * 0.14, x + wide * 0.05, gallery - height * 0.03, kDark);
    canvas.Trapezium(gallery - height * 0.22, x - wide * 0.06, x + wide * 0.06, gallery - height * 0.14,
                     x - wide * 0.55, x + wide * 0.55, kRed);
}

// Short, flat strokes that make water of a gradient.
void DrawWaves(Canvas &canvas, double top, double bottom, int width) {
    for (int row = 0; top + row * row * 2.5 + 6 < bottom; ++row) {
        double const y = top + row * row * 2.5 + 6;
        for (double x = (row * 37) % 53; x < width; x += 60 + row * 22) {
            canvas.Rectangle(x, y, x + 10 + row * 5, y + 1.2 + row * 0.2, Blend(kSeaFar, kWhite, 0.35));
        }
    }
}

Canvas DrawPanorama() {
    constexpr int kWidth = 3000;
    Canvas canvas(kWidth, 400, kWhite);
    canvas.Gradient(0, 250, {92, 148, 206}, {250, 222, 184});
    canvas.Disc(2250, 170, 46, {255, 238, 190});
    auto const hills = [](double x) { return 236 - 18 * std::sin(x / 210) - 10 * std::sin(x / 83 + 1); };
    canvas.Draw([&](double x, double y) { return y >= hills(x) && y < 250; },
                [](double, double) { return Colour{122, 140, 150}; });
    canvas.Gradient(250, 400, kSeaFar, kSeaNear);
    DrawWaves(canvas, 252, 360, kWidth);
    DrawShip(canvas, 980, 292, 520, {40, 62, 96});
    DrawShip(canvas, 1720, 270, 230, {70, 44, 52});
    DrawShip(canvas, 2380, 300, 430, {34, 84, 74});
    DrawLighthouse(canvas, 2870, 352, 250);
    canvas.Trapezium(340, 2790, 2960, 400, 2730, 3040, {96, 92, 86});
    canvas.Trapezium(330, 0, 820, 400, 0, 860, kQuay);
    canvas.Rectangle(0, 330, 822, 337, {214, 180, 60});
    for (int crane = 0; crane < 3; ++crane) {
        DrawCrane(canvas, 180 + crane * 240, 331, 210 + crane % 2 * 40, Colour{196, 96, 36});
    }
    for (int bollard = 0; bollard < 7; ++bollard) {
        canvas.Rectangle(60 + bollard * 115, 316, 72 + bollard * 115, 331, kDark);
        canvas.Rectangle(56 + bollard * 115, 312, 76 + bollard * 115, 318, kDark);
    }
    return canvas;
}

Canvas DrawLighthousePicture() {
    Canvas canvas(320, 240, kWhite);
    canvas.Gradient(0, 165, {38, 52, 92}, {226, 140, 104});
    canvas.Gradient(165, 240, {84, 96, 130}, {26, 40, 72});
    DrawWaves(canvas, 168, 238, 320);
    canvas.Draw([](double x, double y) { return x < 196 && std::abs(y - 62) < (196 - x) * 0.16; },
                [](double x, double y) {
                    Colour const sky = Blend({38, 52, 92}, {226, 140, 104}, y / 165);
                    return Blend(sky, {255, 236, 170}, std::max(0.0, x / 196 * 0.55));
                });
    canvas.Trapezium(190, 150, 260, 240, 110, 310, {60, 56, 60});
    DrawLighthouse(canvas, 205, 196, 170);
    return canvas;
}

Canvas DrawCranePicture() {
    Canvas canvas(240, 320, kWhite);
    canvas.Gradient(0, 270, {150, 192, 222}, {244, 240, 226});
    canvas.Rectangle(0, 270, 240, 320, kQuay);
    for (int stripe = 0; stripe < 9; ++stripe) {
        canvas.Trapezium(270, stripe * 28.0, stripe * 28.0 + 14, 280, stripe * 28.0 - 8, stripe * 28.0 + 6,
                         {226, 186, 40});
    }
    DrawCrane(canvas, 84, 271, 220, {196, 96, 36});
    canvas.Rectangle(164, 161, 216, 191, {60, 120, 90});
    for (int rib = 0; rib < 5; ++rib) {
        canvas.Rectangle(171 + rib * 9, 165, 174 + rib * 9, 187, {44, 96, 70});
    }
    canvas.Line(166, 161, 189.6, 146, 1.5, kDark);
    canvas.Line(214, 161, 189.6, 146, 1.5, kDark);
    return canvas;
}

Canvas DrawLifebuoy() {
    Canvas canvas(160, 160, kClear);
    auto const ring = [](double x, double y) {
        double const distance = std::hypot(x - 80, y - 80);
        return distance >= 36 && distance <= 72;
    };
    canvas.Draw(ring, [](double x, double y) {
        double const turn = std::fmod(std::atan2(y - 80, x - 80) / 3.14159265358979 * 4 + 8.5, 2);
        double const shade = std::abs(std::hypot(x - 80, y - 80) - 54) / 18;
        return Blend(turn < 1 ? kRed : kWhite, kDark, shade > 0.86 ? 0.35 : 0.0);
    });
    return canvas;
}

Canvas DrawNoEntry() {
    Canvas canvas(96, 96, kClear);
    canvas.Disc(48, 48, 46, kWhite);
    canvas.Disc(48, 48, 43, kRed);
    canvas.Rectangle(20, 40, 76, 56, kWhite);
    return canvas;
}

} // namespace

int main(int count, char **arguments) {
    if (count != 2) {
        std::fputs("usage: make_course_pictures FOLDER\n", stderr);
        return 2;
    }
    stbi_write_png_compression_level = 40; // the length of the search for repetitions, not zlib's level
    std::string const folder = std::string(arguments[1]) + "/";
    bool const written = DrawPanorama().Write(folder + "panorama.png") &&
                         DrawLighthousePicture().Write(folder + "lighthouse.png") &&
                         DrawCranePicture().Write(folder + "crane.png") &&
                         DrawLifebuoy().Write(folder + "lifebuoy.png") && DrawNoEntry().Write(folder + "no_entry.png");
    if (!written) {
        std::fprintf(stderr, "make_course_pictures: cannot write into %s\n", arguments[1]);
        return 1;
    }
    return 0;
}
