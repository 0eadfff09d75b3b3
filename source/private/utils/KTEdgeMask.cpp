// KTEdgeMask.cpp: soft edges, four alpha bytes at a time where the processor can (SSE2, which every 64-bit x86 has). The
// bytes are those of the plain product in double precision, (alpha * column) * row, truncated.

#include "KTEdgeMask.h"

#include "KTInterpolator.h"

#include <algorithm>
#include <array>
#include <cmath>

#if defined(__SSE2__) || defined(_M_X64)
#define KT_EDGE_MASK_SSE2
#include <emmintrin.h>

#include <cstring>
#endif

namespace {

// The picture is worked on in blocks of so many columns and rows, whose factors fit into the processor's cache.
constexpr std::size_t kBlock = 2048;

using Factors = std::array<double, kBlock>;

unsigned char Faded(unsigned char alpha, double column, double row) {
    return static_cast<unsigned char>(alpha * column * row);
}

#ifdef KT_EDGE_MASK_SSE2

// Four alpha values as integers, multiplied by their columns' factors and the row's.
__m128i FadedFour(__m128i alphas, double const *columns, __m128d row) {
    auto const pair = [row](__m128i two, double const *factors) {
        return _mm_cvttpd_epi32(_mm_mul_pd(_mm_mul_pd(_mm_cvtepi32_pd(two), _mm_loadu_pd(factors)), row));
    };
    __m128i const upper = _mm_shuffle_epi32(alphas, _MM_SHUFFLE(3, 2, 3, 2));
    return _mm_unpacklo_epi64(pair(alphas, columns), pair(upper, columns + 2));
}

void FadeFourPixels(unsigned char *pixels, double const *columns, __m128d row) {
    auto *const place = reinterpret_cast<__m128i *>(pixels);
    __m128i const all = _mm_loadu_si128(place);
    __m128i const faded = FadedFour(_mm_srli_epi32(all, 24), columns, row);
    __m128i const colors = _mm_and_si128(all, _mm_set1_epi32(0x00FFFFFF));
    _mm_storeu_si128(place, _mm_or_si128(colors, _mm_slli_epi32(faded, 24)));
}

void FadeFourBytes(unsigned char *bytes, double const *columns, __m128d row) {
    int four = 0;
    std::memcpy(&four, bytes, sizeof four);
    __m128i const zero = _mm_setzero_si128();
    __m128i const alphas = _mm_unpacklo_epi16(_mm_unpacklo_epi8(_mm_cvtsi32_si128(four), zero), zero);
    __m128i const words = _mm_packs_epi32(FadedFour(alphas, columns, row), zero);
    four = _mm_cvtsi128_si32(_mm_packus_epi16(words, zero));
    std::memcpy(bytes, &four, sizeof four);
}

// Fades the first pixels, as many as go in fours, and returns their number.
std::size_t FadeInFours(unsigned char *pixels, std::size_t bytesPerPixel, double const *columns, std::size_t count,
                        double row) {
    __m128d const rows = _mm_set1_pd(row);
    std::size_t done = 0;
    if (bytesPerPixel == 4) {
        for (; done + 4 <= count; done += 4) {
            FadeFourPixels(pixels + 4 * done, columns + done, rows);
        }
    } else {
        for (; done + 4 <= count; done += 4) {
            FadeFourBytes(pixels + done, columns + done, rows);
        }
    }
    return done;
}

#else

std::size_t FadeInFours(unsigned char *, std::size_t, double const *, std::size_t, double) { return 0; }

#endif

void FadePixels(unsigned char *pixels, std::size_t bytesPerPixel, double const *columns, std::size_t count,
                double row) {
    for (std::size_t i = FadeInFours(pixels, bytesPerPixel, columns, count, row); i < count; ++i) {
        unsigned char &alpha = pixels[(i + 1) * bytesPerPixel - 1];
        alpha = Faded(alpha, columns[i], row);
    }
}

// The factors of the positions from `start` on; `clearStart` to `clearEnd` are 1.
struct Span {
    Factors factors{};
    std::size_t count = 0;
    std::size_t clearStart = 0;
    std::size_t clearEnd = 0;

    void Fill(KTEdgeRamps const &ramps, std::size_t start, std::size_t end) {
        count = end - start;
        for (std::size_t i = 0; i < count; ++i) {
            factors[i] = ramps.FactorAt(static_cast<double>(start + i));
        }
        auto const first = factors.begin();
        auto const last = first + static_cast<std::ptrdiff_t>(count);
        auto const isClear = [](double factor) { return factor == 1.0; };
        auto const clear = std::find_if(first, last, isClear);
        clearStart = static_cast<std::size_t>(clear - first);
        clearEnd = static_cast<std::size_t>(std::find_if_not(clear, last, isClear) - first);
    }
};

void FadeBlock(unsigned char *pixels, std::size_t rowBytes, std::size_t bytesPerPixel, Span const &columns,
               Span const &rows) {
    for (std::size_t y = 0; y < rows.count; ++y, pixels += rowBytes) {
        double const row = rows.factors[y];
        if (row != 1.0) {
            FadePixels(pixels, bytesPerPixel, columns.factors.data(), columns.count, row);
            continue;
        }
        FadePixels(pixels, bytesPerPixel, columns.factors.data(), columns.clearStart, row);
        FadePixels(pixels + columns.clearEnd * bytesPerPixel, bytesPerPixel, columns.factors.data() + columns.clearEnd,
                   columns.count - columns.clearEnd, row);
    }
}

double Faded(double distance, double ramp) {
    // Rounding may carry the far end of the ramp beyond it.
    return KTInterpolator::Interpolate(1.0, 0.0, std::min(distance / ramp, 1.0));
}

} // namespace

KTEdgeRamps::KTEdgeRamps(double length, double first, double last)
    : m_Half(length / 2), m_FirstEdge(first * length - m_Half), m_FirstRamp(first * length),
      m_LastEdge(last * length - m_Half), m_LastRamp((1 - last) * length) {}

bool KTEdgeRamps::IsFinite() const {
    return std::isfinite(m_FirstEdge) && std::isfinite(m_FirstRamp) && std::isfinite(m_LastEdge) &&
           std::isfinite(m_LastRamp);
}

double KTEdgeRamps::FactorAt(double position) const {
    double const place = position - m_Half;
    double factor = 1.0;
    if (place <= m_FirstEdge && m_FirstRamp != 0) {
        factor = Faded(m_FirstEdge - place, m_FirstRamp);
    }
    if (place >= m_LastEdge && m_LastRamp != 0) {
        factor = Faded(place - m_LastEdge, m_LastRamp);
    }
    return factor;
}

void KTApplyEdgeRamps(unsigned char *image, std::size_t width, std::size_t height, std::size_t bytesPerPixel,
                      KTEdgeRamps const &horizontal, KTEdgeRamps const &vertical) {
    Span columns;
    Span rows;
    for (std::size_t y = 0; y < height; y += kBlock) {
        rows.Fill(vertical, y, std::min(height, y + kBlock));
        for (std::size_t x = 0; x < width; x += kBlock) {
            columns.Fill(horizontal, x, std::min(width, x + kBlock));
            FadeBlock(image + (y * width + x) * bytesPerPixel, width * bytesPerPixel, bytesPerPixel, columns, rows);
        }
    }
}
