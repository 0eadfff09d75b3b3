// KTMatrix4x4f.cpp: matrices. Sums of products are made in double precision and rounded once.

#include "KTGraphicsStructs.h"
#include "KTInterpolator.h"
#include "KTVector3d.h"

#include <cmath>
#include <cstddef>

namespace {

constexpr std::size_t kSide = 4;

// The determinants of all 2 x 2 parts of the upper two rows (`upper`) and of the lower two (`lower`), from which
// Laplace's expansion along pairs of rows makes the determinant and the inverse. In both, the parts are of the columns
// 01, 02, 03, 12, 13, 23.
struct Minors {
    explicit Minors(KTMatrix4x4f const &matrix) {
        std::size_t n = 0;
        for (std::size_t first = 0; first < kSide; ++first) {
            for (std::size_t second = first + 1; second < kSide; ++second, ++n) {
                upper[n] = Part(matrix, 0, first, second);
                lower[n] = Part(matrix, 2, first, second);
            }
        }
    }

    double Determinant() const {
        return upper[0] * lower[5] - upper[1] * lower[4] + upper[2] * lower[3] + upper[3] * lower[2] -
               upper[4] * lower[1] + upper[5] * lower[0];
    }

    std::array<double, 6> upper{};
    std::array<double, 6> lower{};

  private:
    static double Part(KTMatrix4x4f const &matrix, std::size_t row, std::size_t first, std::size_t second) {
        return double{matrix(row, first)} * double{matrix(row + 1, second)} -
               double{matrix(row, second)} * double{matrix(row + 1, first)};
    }
};

// The determinant of the 3 x 3 part of three columns, expanded along one row; `parts` are the minors of the pair of rows
// below or above it.
double Cofactor(KTMatrix4x4f const &matrix, std::size_t row, std::array<double, 6> const &parts, std::size_t column) {
    // For each column that is left out: the three others, and for each of these the minor of the remaining two.
    struct Terms {
        std::array<std::size_t, 3> columns;
        std::array<std::size_t, 3> minors;
    };
    constexpr std::array<Terms, kSide> kTerms = {
        {{{1, 2, 3}, {5, 4, 3}}, {{0, 2, 3}, {5, 2, 1}}, {{0, 1, 3}, {4, 2, 0}}, {{0, 1, 2}, {3, 1, 0}}}};
    Terms const &terms = kTerms[column];
    return double{matrix(row, terms.columns[0])} * parts[terms.minors[0]] -
           double{matrix(row, terms.columns[1])} * parts[terms.minors[1]] +
           double{matrix(row, terms.columns[2])} * parts[terms.minors[2]];
}

KTVector3d TransformedVector(KTMatrix4x4f const &matrix, KTVector3d const &vector) {
    auto const row = [&](std::size_t r) {
        return KTVector3d(double{matrix(r, 0)}, double{matrix(r, 1)}, double{matrix(r, 2)}).Dot(vector);
    };
    return {row(0), row(1), row(2)};
}

} // namespace

KTMatrix4x4f KTMatrix4x4f::Translation(KTVector3f const &offset) {
    KTMatrix4x4f matrix;
    matrix(0, 3) = offset.x;
    matrix(1, 3) = offset.y;
    matrix(2, 3) = offset.z;
    return matrix;
}

KTMatrix4x4f KTMatrix4x4f::Scaling(KTVector3f const &factors) {
    KTMatrix4x4f matrix;
    matrix(0, 0) = factors.x;
    matrix(1, 1) = factors.y;
    matrix(2, 2) = factors.z;
    return matrix;
}

KTMatrix4x4f KTMatrix4x4f::Rotation(KTVector3f const &axis, float radians) {
    double const length = KTVector3d(axis).Length();
    if (length == 0.0) {
        return {};
    }
    KTVector3d const unit = KTVector3d(axis) / length;
    double const cosine = std::cos(double{radians});
    double const sine = std::sin(double{radians});
    // Each column is where an axis goes: v cos + (k x v) sin + k (k . v)(1 - cos).
    KTMatrix4x4f matrix;
    KTVector3d const axes[] = {{1, 0, 0}, {0, 1, 0}, {0, 0, 1}};
    for (std::size_t column = 0; column < 3; ++column) {
        KTVector3d const &vector = axes[column];
        KTVector3f const turned =
            (vector * cosine + unit.Cross(vector) * sine + unit * (unit.Dot(vector) * (1.0 - cosine))).Rounded();
        matrix(0, column) = turned.x;
        matrix(1, column) = turned.y;
        matrix(2, column) = turned.z;
    }
    return matrix;
}

KTMatrix4x4f KTMatrix4x4f::Transposed() const {
    KTMatrix4x4f transposed;
    for (std::size_t row = 0; row < kSide; ++row) {
        for (std::size_t column = 0; column < kSide; ++column) {
            transposed(column, row) = (*this)(row, column);
        }
    }
    return transposed;
}

float KTMatrix4x4f::Determinant() const { return static_cast<float>(Minors(*this).Determinant()); }

bool KTMatrix4x4f::GetInverse(KTMatrix4x4f &inverse) const {
    Minors const minors(*this);
    double const determinant = minors.Determinant();
    if (determinant == 0.0 || !std::isfinite(determinant)) {
        return false;
    }
    KTMatrix4x4f result;
    for (std::size_t row = 0; row < kSide; ++row) {
        bool const isUpper = row < 2;
        std::size_t const otherRow = row ^ 1U; // of the same pair
        for (std::size_t column = 0; column < kSide; ++column) {
            double const sign = (row + column) % 2 == 0 ? 1.0 : -1.0;
            double const cofactor = Cofactor(*this, otherRow, isUpper ? minors.lower : minors.upper, column);
            auto const element = static_cast<float>(sign * cofactor / determinant);
            if (!std::isfinite(element)) {
                return false;
            }
            result(column, row) = element;
        }
    }
    inverse = result;
    return true;
}

KTVector3f KTMatrix4x4f::TransformPoint(KTVector3f const &point) const {
    KTMatrix4x4f const &m = *this;
    KTVector3d const offset(double{m(0, 3)}, double{m(1, 3)}, double{m(2, 3)});
    KTVector3d const bottom(double{m(3, 0)}, double{m(3, 1)}, double{m(3, 2)});
    double const w = bottom.Dot(point) + double{m(3, 3)};
    return ((TransformedVector(m, point) + offset) / w).Rounded();
}

KTVector3f KTMatrix4x4f::TransformVector(KTVector3f const &vector) const {
    return TransformedVector(*this, vector).Rounded();
}

KTMatrix4x4f KTMatrix4x4f::Interpolate(KTMatrix4x4f const &a, KTMatrix4x4f const &b, float const &t) {
    KTMatrix4x4f matrix;
    for (std::size_t i = 0; i < matrix.elements.size(); ++i) {
        matrix.elements[i] = KTInterpolator::Interpolate(a.elements[i], b.elements[i], t);
    }
    return matrix;
}

KTMatrix4x4f KTMatrix4x4f::operator*(KTMatrix4x4f const &other) const {
    KTMatrix4x4f product;
    for (std::size_t row = 0; row < kSide; ++row) {
        for (std::size_t column = 0; column < kSide; ++column) {
            double sum = 0.0;
            for (std::size_t i = 0; i < kSide; ++i) {
                sum += double{(*this)(row, i)} * double{other(i, column)};
            }
            product(row, column) = static_cast<float>(sum);
        }
    }
    return product;
}
