// KTEdgeMask.h: the soft edges of a picture. The mask is the product of a factor for the column and one for the row, so
// that each is computed once and not for every pixel.

#pragma once

#include <cstddef>

/// One axis of the mask: the ramps at its two ends.
///
///     factor
///       1 |     ____________
///         |   /              \                          (straight here; eased under that mode)
///       0 | /                  \_
///         +-----+-----------+-----
///         0    first       last  length        first and last as parts of the length
class KTEdgeRamps {
  public:
    KTEdgeRamps(double length, double first, double last);

    /// Whether the ramps' edges and lengths are finite.
    bool IsFinite() const;

    /// The factor of the pixel at that position. Throws what KTInterpolator::Interpolate throws.
    double FactorAt(double position) const;

  private:
    double m_Half;
    double m_FirstEdge;
    double m_FirstRamp;
    double m_LastEdge;
    double m_LastRamp;
};

/// Multiplies the alpha bytes of a picture by the factors of column and row and truncates the products. A pixel has 4
/// bytes, of which the last is its alpha, or 1 byte. Throws what KTInterpolator::Interpolate throws.
void KTApplyEdgeRamps(unsigned char *image, std::size_t width, std::size_t height, std::size_t bytesPerPixel,
                      KTEdgeRamps const &horizontal, KTEdgeRamps const &vertical);
