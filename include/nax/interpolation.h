// Interpolation of values and vectors, and resampling of two-dimensional arrays.
//
// CNaxInterpolation holds no data: its members are static templates on float and double.
// The node forms take the values at the nodes first, then the node positions, then the
// point of evaluation. Nothing is reported: equal nodes give infinities or not-a-numbers by
// the arithmetic.
//
// The polynomial routines through three and four nodes build the inverse of the
// Vandermonde matrix and evaluate the coefficients by Horner's rule; the polynomial through
// n nodes is Aitken's iterated linear interpolation (A. C. Aitken, "On interpolation by
// iteration of proportional parts, without the use of differences", Proc. Edinburgh Math.
// Soc. 3 (1932), 56-76).
#ifndef NAX_INTERPOLATION_H
#define NAX_INTERPOLATION_H

#include <cmath>

#include "nax/base_vector.h"
#include "nax/complex.h"
#include "nax/matrix3.h"
#include "nax/matrix4.h"
#include "nax/scalar.h"
#include "nax/types.h"
#include "nax/vector2.h"
#include "nax/vector3.h"
#include "nax/vector4.h"
#include "nax/vector_n.h"

/// The axes along which SpreadData2DTwice and SqueezeData2DTwice work. Every value other
/// than 0 and 1 behaves as naxInterpolationBoth.
enum naxInterpolationDirection {
  naxInterpolationVertical = 0,    ///< along the columns: rows doubled or halved
  naxInterpolationHorizontal = 1,  ///< along the rows: columns doubled or halved
  naxInterpolationBoth = 2         ///< both axes
};

namespace nax::detail {

/// The quadratic through three nodes at x, from its inverse Vandermonde matrix m.
template <typename T>
inline T EvaluateQuadratic(const CNaxMatrix3<T>& m, T y0, T y1, T y2, T x) {
  const T a = m(0, 0) * y0 + m(0, 1) * y1 + m(0, 2) * y2;
  const T b = m(1, 0) * y0 + m(1, 1) * y1 + m(1, 2) * y2;
  const T c = m(2, 0) * y0 + m(2, 1) * y1 + m(2, 2) * y2;
  return (a * x + b) * x + c;
}

/// The cubic through four nodes at x, from its inverse Vandermonde matrix m.
template <typename T>
inline T EvaluateCubic(const CNaxMatrix4<T>& m, T y0, T y1, T y2, T y3, T x) {
  const T a = m(0, 0) * y0 + m(0, 1) * y1 + m(0, 2) * y2 + m(0, 3) * y3;
  const T b = m(1, 0) * y0 + m(1, 1) * y1 + m(1, 2) * y2 + m(1, 3) * y3;
  const T c = m(2, 0) * y0 + m(2, 1) * y1 + m(2, 2) * y2 + m(2, 3) * y3;
  const T d = m(3, 0) * y0 + m(3, 1) * y1 + m(3, 2) * y2 + m(3, 3) * y3;
  return ((a * x + b) * x + c) * x + d;
}

/// The exponent rule of the power interpolation: 0 when |t| is below the default
/// tolerance, else t to the power.
template <typename T>
inline T PowerWeight(T t, T power) {
  return std::fabs(t) < DefaultTol<T>() ? T(0) : std::pow(t, power);
}

}  // namespace nax::detail

/// Static interpolation routines over float and double.
class CNaxInterpolation {
 public:
  // ---- Values ---------------------------------------------------------------------------------

  /// y0 + (y1 - y0) t; t is not clamped, so t outside [0, 1] extrapolates.
  template <typename T>
  static T LinearInterpolate(T y0, T y1, T t) {
    return y0 + (y1 - y0) * t;
  }

  /// The quadratic through (x0, y0), (x1, y1), (x2, y2), evaluated at x.
  template <typename T>
  static T QuadraticInterpolate(T y0, T y1, T y2, T x0, T x1, T x2, T x) {
    return nax::detail::EvaluateQuadratic(InverseVandermondeMatrix(x0, x1, x2), y0, y1, y2, x);
  }

  /// The cubic through (x0, y0) ... (x3, y3), evaluated at x.
  template <typename T>
  static T CubicInterpolate(T y0, T y1, T y2, T y3, T x0, T x1, T x2, T x3, T x) {
    return nax::detail::EvaluateCubic(InverseVandermondeMatrix(x0, x1, x2, x3), y0, y1, y2, y3, x);
  }

  /// y0 + (y1 - y0) p with t = (x - x0) / (x1 - x0) and p = t^power, except p = 0 when |t|
  /// is below 1e-7f (float) or 1e-9 (double): at x = x0 the result is y0 for any power.
  template <typename T>
  static T PowerInterpolate(T x0, T x1, T y0, T y1, T x, T power) {
    return y0 + (y1 - y0) * nax::detail::PowerWeight((x - x0) / (x1 - x0), power);
  }

  /// The polynomial of degree n - 1 through the nodes (x[i], y[i]), evaluated at `at`, by
  /// Aitken's scheme on a heap copy of y. n must be positive; for n < 1 the result is 0.
  template <typename T>
  static T PolynomialInterpolate(int32 n, const T* x, const T* y, T at);

  /// The same operation as PolynomialInterpolate, by the same steps.
  template <typename T>
  static T LagrangeInterpolation(int32 n, const T* x, const T* y, T at);

  /// The inverse of the Vandermonde matrix of three nodes: it turns the values at the nodes
  /// into the coefficients (a, b, c) of a x^2 + b x + c, highest first. Equal nodes are not
  /// tested and give infinities.
  template <typename T>
  static CNaxMatrix3<T> InverseVandermondeMatrix(T x0, T x1, T x2) {
    const T a = x1 - x0, b = x2 - x0, c = x2 - x1;
    const T d0 = a * b, d1 = a * c, d2 = b * c;
    return CNaxMatrix3<T>(T(1) / d0, T(-1) / d1, T(1) / d2,                            //
                          -(x1 + x2) / d0, (x2 + x0) / d1, -(x1 + x0) / d2,            //
                          x1 * x2 / d0, -(x2 * x0) / d1, x1 * x0 / d2);
  }

  /// The inverse of the Vandermonde matrix of four nodes: it turns the values at the nodes
  /// into the coefficients of the cubic, highest first. Equal nodes give infinities.
  template <typename T>
  static CNaxMatrix4<T> InverseVandermondeMatrix(T x0, T x1, T x2, T x3) {
    const T d0 = (x1 - x0) * (x2 - x0) * (x3 - x0);
    const T d1 = (x1 - x0) * (x2 - x1) * (x3 - x1);
    const T d2 = (x2 - x0) * (x2 - x1) * (x3 - x2);
    const T d3 = (x3 - x0) * (x3 - x1) * (x3 - x2);
    const T nodes[4] = {x0, x1, x2, x3};
    const T scale[4] = {T(-1) / d0, T(1) / d1, T(-1) / d2, T(1) / d3};
    CNaxMatrix4<T> m;
    // Column i: the coefficients of the product of (x - xj) over the other nodes j, that is
    // 1, -e1, e2, -e3 of their elementary symmetric functions, over the signed d_i.
    for (int32 i = 0; i < 4; ++i) {
      const T p = nodes[(i + 1) % 4], q = nodes[(i + 2) % 4], r = nodes[(i + 3) % 4];
      const T s = scale[i];
      m(0, i) = s;
      m(1, i) = -(p + q + r) * s;
      m(2, i) = (p * q + p * r + q * r) * s;
      m(3, i) = -(p * q * r) * s;
    }
    return m;
  }

  /// Linear interpolation between (x0, y0) and (x1, y1) at the integers from ceil(x0) to
  /// floor(x1), written to out; returns their count, 0 when there is none. The first value
  /// is computed directly and each following one adds the step (y1 - y0) / (x1 - x0) to the
  /// one before, so the rounding error accumulates along the run.
  template <typename T>
  static int32 LinearInterpolateAtIntegerNodes(T x0, T x1, T y0, T y1, T* out) {
    const T first = std::ceil(x0), last = std::floor(x1);
    if (!(last >= first)) return 0;  // also for not-a-number ends
    const int32 count = int32(last - first) + 1;
    const T step = (y1 - y0) / (x1 - x0);
    T value = y0 + (first - x0) * (y1 - y0) / (x1 - x0);
    out[0] = value;
    for (int32 k = 1; k < count; ++k) out[k] = value = value + step;
    return count;
  }

  /// PowerInterpolate at the integers from ceil(x0) to floor(x1), written to out; returns
  /// their count, 0 when there is none.
  template <typename T>
  static int32 PowerInterpolateAtIntegerNodes(T x0, T x1, T y0, T y1, T power, T* out) {
    const T first = std::ceil(x0), last = std::floor(x1);
    if (!(last >= first)) return 0;  // also for not-a-number ends
    const int32 count = int32(last - first) + 1;
    for (int32 k = 0; k < count; ++k)
      out[k] = y0 + (y1 - y0) * nax::detail::PowerWeight((first + T(k) - x0) / (x1 - x0), power);
    return count;
  }

  /// Bilinear interpolation in a rectangle with the values a (left bottom), b (right
  /// bottom), c (left top) and d (right top), at the point whose distances are p from the
  /// left side, q from the right, r from the bottom and s from the top. A rectangle no wider
  /// (or no higher) than 1e-6 interpolates along its left (or bottom) side; a point within
  /// tol of a corner takes that corner's value.
  template <typename T>
  static T InterpolateBilinearInRectangle(T a, T b, T c, T d, T p, T q, T r, T s, T tol) {
    const T degenerate = T(1e-6);
    if (p + q <= degenerate) return a + (c - a) * r / (r + s);
    if (r + s <= degenerate) return a + (b - a) * p / (p + q);
    if (p <= tol) {
      if (r <= tol) return a;
      if (s <= tol) return c;
    }
    if (q <= tol) {
      if (r <= tol) return b;
      if (s <= tol) return d;
    }
    return (q * (c * r + a * s) + p * (d * r + b * s)) / ((p + q) * (r + s));
  }

  /// InterpolateBilinearInRectangle on each component.
  template <typename T>
  static CNaxVector3<T> InterpolateVectorBilinearInRectangle(const CNaxVector3<T>& a, const CNaxVector3<T>& b,
                                                             const CNaxVector3<T>& c, const CNaxVector3<T>& d,
                                                             T p, T q, T r, T s, T tol) {
    return BilinearComponents(a, b, c, d, p, q, r, s, tol);
  }
  /// InterpolateBilinearInRectangle on each component.
  template <typename T>
  static CNaxVector4<T> InterpolateVectorBilinearInRectangle(const CNaxVector4<T>& a, const CNaxVector4<T>& b,
                                                             const CNaxVector4<T>& c, const CNaxVector4<T>& d,
                                                             T p, T q, T r, T s, T tol) {
    return BilinearComponents(a, b, c, d, p, q, r, s, tol);
  }
  /// InterpolateBilinearInRectangle on each component; the result has the dimension of a.
  template <typename T>
  static CNaxVectorN<T> InterpolateVectorBilinearInRectangle(const CNaxVectorN<T>& a, const CNaxVectorN<T>& b,
                                                             const CNaxVectorN<T>& c, const CNaxVectorN<T>& d,
                                                             T p, T q, T r, T s, T tol) {
    return BilinearComponents(a, b, c, d, p, q, r, s, tol);
  }

  // ---- Vectors --------------------------------------------------------------------------------

  /// v0 + (v1 - v0) t, with the dimension of v0.
  template <typename T>
  static CNaxBaseVector<T> VectorsLinear(const CNaxBaseVector<T>& v0, const CNaxBaseVector<T>& v1, T t) {
    return LinearComponents(v0, v1, t);
  }
  /// v0 + (v1 - v0) t for complex vectors and a real t, with the dimension of v0.
  template <typename T>
  static CNaxBaseVector<CNaxComplex<T>> VectorsLinear(const CNaxBaseVector<CNaxComplex<T>>& v0,
                                                      const CNaxBaseVector<CNaxComplex<T>>& v1, T t) {
    return LinearComponents(v0, v1, t);
  }
  /// v0 + (v1 - v0) t, with the dimension of v0.
  template <typename T>
  static CNaxVectorN<T> VectorsLinear(const CNaxVectorN<T>& v0, const CNaxVectorN<T>& v1, T t) {
    return LinearComponents(v0, v1, t);
  }
  /// v0 + (v1 - v0) t.
  template <typename T>
  static CNaxVector2<T> VectorsLinear(const CNaxVector2<T>& v0, const CNaxVector2<T>& v1, T t) {
    return LinearComponents(v0, v1, t);
  }
  /// v0 + (v1 - v0) t.
  template <typename T>
  static CNaxVector3<T> VectorsLinear(const CNaxVector3<T>& v0, const CNaxVector3<T>& v1, T t) {
    return LinearComponents(v0, v1, t);
  }
  /// v0 + (v1 - v0) t.
  template <typename T>
  static CNaxVector4<T> VectorsLinear(const CNaxVector4<T>& v0, const CNaxVector4<T>& v1, T t) {
    return LinearComponents(v0, v1, t);
  }

  /// The quadratic through (x0, v0), (x1, v1), (x2, v2) at x, per component, with one
  /// inverse Vandermonde matrix.
  template <typename T>
  static CNaxVector2<T> VectorsQuadratic(const CNaxVector2<T>& v0, const CNaxVector2<T>& v1,
                                         const CNaxVector2<T>& v2, T x0, T x1, T x2, T x) {
    return QuadraticComponents(v0, v1, v2, InverseVandermondeMatrix(x0, x1, x2), x);
  }
  /// The quadratic through three nodes at x, per component.
  template <typename T>
  static CNaxVector3<T> VectorsQuadratic(const CNaxVector3<T>& v0, const CNaxVector3<T>& v1,
                                         const CNaxVector3<T>& v2, T x0, T x1, T x2, T x) {
    return QuadraticComponents(v0, v1, v2, InverseVandermondeMatrix(x0, x1, x2), x);
  }
  /// The quadratic through three nodes at x, per component.
  template <typename T>
  static CNaxVector4<T> VectorsQuadratic(const CNaxVector4<T>& v0, const CNaxVector4<T>& v1,
                                         const CNaxVector4<T>& v2, T x0, T x1, T x2, T x) {
    return QuadraticComponents(v0, v1, v2, InverseVandermondeMatrix(x0, x1, x2), x);
  }
  /// The quadratic through three nodes at x, per component, with the dimension of v0.
  template <typename T>
  static CNaxVectorN<T> VectorsQuadratic(const CNaxVectorN<T>& v0, const CNaxVectorN<T>& v1,
                                         const CNaxVectorN<T>& v2, T x0, T x1, T x2, T x) {
    return QuadraticComponents(v0, v1, v2, InverseVandermondeMatrix(x0, x1, x2), x);
  }

  /// The cubic through (x0, v0) ... (x3, v3) at x, per component, with one inverse
  /// Vandermonde matrix.
  template <typename T>
  static CNaxVector2<T> VectorsCubic(const CNaxVector2<T>& v0, const CNaxVector2<T>& v1, const CNaxVector2<T>& v2,
                                     const CNaxVector2<T>& v3, T x0, T x1, T x2, T x3, T x) {
    return CubicComponents(v0, v1, v2, v3, InverseVandermondeMatrix(x0, x1, x2, x3), x);
  }
  /// The cubic through four nodes at x, per component.
  template <typename T>
  static CNaxVector3<T> VectorsCubic(const CNaxVector3<T>& v0, const CNaxVector3<T>& v1, const CNaxVector3<T>& v2,
                                     const CNaxVector3<T>& v3, T x0, T x1, T x2, T x3, T x) {
    return CubicComponents(v0, v1, v2, v3, InverseVandermondeMatrix(x0, x1, x2, x3), x);
  }
  /// The cubic through four nodes at x, per component.
  template <typename T>
  static CNaxVector4<T> VectorsCubic(const CNaxVector4<T>& v0, const CNaxVector4<T>& v1, const CNaxVector4<T>& v2,
                                     const CNaxVector4<T>& v3, T x0, T x1, T x2, T x3, T x) {
    return CubicComponents(v0, v1, v2, v3, InverseVandermondeMatrix(x0, x1, x2, x3), x);
  }
  /// The cubic through four nodes at x, per component, with the dimension of v0.
  template <typename T>
  static CNaxVectorN<T> VectorsCubic(const CNaxVectorN<T>& v0, const CNaxVectorN<T>& v1, const CNaxVectorN<T>& v2,
                                     const CNaxVectorN<T>& v3, T x0, T x1, T x2, T x3, T x) {
    return CubicComponents(v0, v1, v2, v3, InverseVandermondeMatrix(x0, x1, x2, x3), x);
  }

  // ---- Two-dimensional arrays (row-major, source and target in separate buffers) --------------

  /// Resamples src (srcRows x srcColumns) into dst (dstRows x dstColumns). An axis that
  /// exactly doubles repeats each sample, as SpreadData2DTwice; one that exactly halves
  /// averages each pair, as SqueezeData2DTwice along one axis (halving both axes averages
  /// each 2 x 2 block of the source); otherwise a target sample is the bilinear
  /// blend of its four source neighbours, sample centres aligned: target sample i of an axis
  /// lies at (i + 0.5) src / dst - 0.5 on the source, clamped to the end samples. Nothing
  /// is written when a size is below 1.
  template <typename T>
  static void InterpolateData2DBilinear(int32 srcRows, int32 srcColumns, int32 dstRows, int32 dstColumns,
                                        const T* src, T* dst);

  /// InterpolateData2DBilinear over an array of vectors, per component.
  template <typename T>
  static void InterpolateVectorData2DBilinear(int32 srcRows, int32 srcColumns, int32 dstRows, int32 dstColumns,
                                              const CNaxVector3<T>* src, CNaxVector3<T>* dst);
  /// InterpolateData2DBilinear over an array of vectors, per component.
  template <typename T>
  static void InterpolateVectorData2DBilinear(int32 srcRows, int32 srcColumns, int32 dstRows, int32 dstColumns,
                                              const CNaxVector4<T>* src, CNaxVector4<T>* dst);

  /// Doubles src (rows x columns) by repetition: vertical writes each row twice (2 rows x
  /// columns), horizontal each sample twice along its row (rows x 2 columns), both a 2 x 2
  /// block per sample (2 rows x 2 columns). No averaging.
  template <typename T>
  static void SpreadData2DTwice(int32 rows, int32 columns, naxInterpolationDirection direction, const T* src,
                                T* dst);

  /// Halves by averaging into dst of rows x columns (the output's size). Horizontal:
  /// dst[r][c] = (src[r][2c] + src[r][2c + 1]) / 2 over source rows of 2 columns; vertical:
  /// the mean of source rows 2r and 2r + 1 of columns samples. Both: the mean of the pairs
  /// (2c, 2c + 1) of two source runs, the second starting `columns` samples after the first
  /// and the first of output row r starting at 3 r columns; this stride is kept as it is,
  /// so it is not the inverse of the doubling of both axes.
  template <typename T>
  static void SqueezeData2DTwice(int32 rows, int32 columns, naxInterpolationDirection direction, const T* src,
                                 T* dst);

 private:
  template <typename V, typename T>
  static V LinearComponents(const V& v0, const V& v1, T t) {
    V result(v0.Dim());
    for (int32 i = 0; i < v0.Dim(); ++i) result[i] = v0[i] + (v1[i] - v0[i]) * t;
    return result;
  }
  template <typename V, typename T>
  static V QuadraticComponents(const V& v0, const V& v1, const V& v2, const CNaxMatrix3<T>& m, T x) {
    V result(v0.Dim());
    for (int32 i = 0; i < v0.Dim(); ++i) result[i] = nax::detail::EvaluateQuadratic(m, v0[i], v1[i], v2[i], x);
    return result;
  }
  template <typename V, typename T>
  static V CubicComponents(const V& v0, const V& v1, const V& v2, const V& v3, const CNaxMatrix4<T>& m, T x) {
    V result(v0.Dim());
    for (int32 i = 0; i < v0.Dim(); ++i)
      result[i] = nax::detail::EvaluateCubic(m, v0[i], v1[i], v2[i], v3[i], x);
    return result;
  }
  template <typename V, typename T>
  static V BilinearComponents(const V& a, const V& b, const V& c, const V& d, T p, T q, T r, T s, T tol) {
    V result(a.Dim());
    for (int32 i = 0; i < a.Dim(); ++i)
      result[i] = InterpolateBilinearInRectangle(a[i], b[i], c[i], d[i], p, q, r, s, tol);
    return result;
  }
};

// clang-format off
#define NAX_INTERPOLATION_INSTANTIATE(EXTERN, T)                                                                  \
  EXTERN template T CNaxInterpolation::LinearInterpolate<T>(T, T, T);                                           \
  EXTERN template T CNaxInterpolation::QuadraticInterpolate<T>(T, T, T, T, T, T, T);                            \
  EXTERN template T CNaxInterpolation::CubicInterpolate<T>(T, T, T, T, T, T, T, T, T);                          \
  EXTERN template T CNaxInterpolation::PowerInterpolate<T>(T, T, T, T, T, T);                                   \
  EXTERN template T CNaxInterpolation::PolynomialInterpolate<T>(int32, const T*, const T*, T);                  \
  EXTERN template T CNaxInterpolation::LagrangeInterpolation<T>(int32, const T*, const T*, T);                  \
  EXTERN template CNaxMatrix3<T> CNaxInterpolation::InverseVandermondeMatrix<T>(T, T, T);                       \
  EXTERN template CNaxMatrix4<T> CNaxInterpolation::InverseVandermondeMatrix<T>(T, T, T, T);                    \
  EXTERN template int32 CNaxInterpolation::LinearInterpolateAtIntegerNodes<T>(T, T, T, T, T*);                  \
  EXTERN template int32 CNaxInterpolation::PowerInterpolateAtIntegerNodes<T>(T, T, T, T, T, T*);                \
  EXTERN template T CNaxInterpolation::InterpolateBilinearInRectangle<T>(T, T, T, T, T, T, T, T, T);            \
  EXTERN template CNaxVector3<T> CNaxInterpolation::InterpolateVectorBilinearInRectangle<T>(                    \
      const CNaxVector3<T>&, const CNaxVector3<T>&, const CNaxVector3<T>&, const CNaxVector3<T>&,               \
      T, T, T, T, T);                                                                                           \
  EXTERN template CNaxVector4<T> CNaxInterpolation::InterpolateVectorBilinearInRectangle<T>(                    \
      const CNaxVector4<T>&, const CNaxVector4<T>&, const CNaxVector4<T>&, const CNaxVector4<T>&,               \
      T, T, T, T, T);                                                                                           \
  EXTERN template CNaxVectorN<T> CNaxInterpolation::InterpolateVectorBilinearInRectangle<T>(                    \
      const CNaxVectorN<T>&, const CNaxVectorN<T>&, const CNaxVectorN<T>&, const CNaxVectorN<T>&,               \
      T, T, T, T, T);                                                                                           \
  EXTERN template CNaxBaseVector<T> CNaxInterpolation::VectorsLinear<T>(                                        \
      const CNaxBaseVector<T>&, const CNaxBaseVector<T>&, T);                                                   \
  EXTERN template CNaxBaseVector<CNaxComplex<T>> CNaxInterpolation::VectorsLinear<T>(                           \
      const CNaxBaseVector<CNaxComplex<T>>&, const CNaxBaseVector<CNaxComplex<T>>&, T);                         \
  EXTERN template CNaxVectorN<T> CNaxInterpolation::VectorsLinear<T>(const CNaxVectorN<T>&,                     \
                                                                     const CNaxVectorN<T>&, T);                 \
  EXTERN template CNaxVector2<T> CNaxInterpolation::VectorsLinear<T>(const CNaxVector2<T>&,                     \
                                                                     const CNaxVector2<T>&, T);                 \
  EXTERN template CNaxVector3<T> CNaxInterpolation::VectorsLinear<T>(const CNaxVector3<T>&,                     \
                                                                     const CNaxVector3<T>&, T);                 \
  EXTERN template CNaxVector4<T> CNaxInterpolation::VectorsLinear<T>(const CNaxVector4<T>&,                     \
                                                                     const CNaxVector4<T>&, T);                 \
  EXTERN template CNaxVector2<T> CNaxInterpolation::VectorsQuadratic<T>(                                        \
      const CNaxVector2<T>&, const CNaxVector2<T>&, const CNaxVector2<T>&, T, T, T, T);                         \
  EXTERN template CNaxVector3<T> CNaxInterpolation::VectorsQuadratic<T>(                                        \
      const CNaxVector3<T>&, const CNaxVector3<T>&, const CNaxVector3<T>&, T, T, T, T);                         \
  EXTERN template CNaxVector4<T> CNaxInterpolation::VectorsQuadratic<T>(                                        \
      const CNaxVector4<T>&, const CNaxVector4<T>&, const CNaxVector4<T>&, T, T, T, T);                         \
  EXTERN template CNaxVectorN<T> CNaxInterpolation::VectorsQuadratic<T>(                                        \
      const CNaxVectorN<T>&, const CNaxVectorN<T>&, const CNaxVectorN<T>&, T, T, T, T);                         \
  EXTERN template CNaxVector2<T> CNaxInterpolation::VectorsCubic<T>(                                            \
      const CNaxVector2<T>&, const CNaxVector2<T>&, const CNaxVector2<T>&, const CNaxVector2<T>&,               \
      T, T, T, T, T);                                                                                           \
  EXTERN template CNaxVector3<T> CNaxInterpolation::VectorsCubic<T>(                                            \
      const CNaxVector3<T>&, const CNaxVector3<T>&, const CNaxVector3<T>&, const CNaxVector3<T>&,               \
      T, T, T, T, T);                                                                                           \
  EXTERN template CNaxVector4<T> CNaxInterpolation::VectorsCubic<T>(                                            \
      const CNaxVector4<T>&, const CNaxVector4<T>&, const CNaxVector4<T>&, const CNaxVector4<T>&,               \
      T, T, T, T, T);                                                                                           \
  EXTERN template CNaxVectorN<T> CNaxInterpolation::VectorsCubic<T>(                                            \
      const CNaxVectorN<T>&, const CNaxVectorN<T>&, const CNaxVectorN<T>&, const CNaxVectorN<T>&,               \
      T, T, T, T, T);                                                                                           \
  EXTERN template void CNaxInterpolation::InterpolateData2DBilinear<T>(int32, int32, int32, int32,              \
                                                                       const T*, T*);                           \
  EXTERN template void CNaxInterpolation::InterpolateVectorData2DBilinear<T>(                                   \
      int32, int32, int32, int32, const CNaxVector3<T>*, CNaxVector3<T>*);                                      \
  EXTERN template void CNaxInterpolation::InterpolateVectorData2DBilinear<T>(                                   \
      int32, int32, int32, int32, const CNaxVector4<T>*, CNaxVector4<T>*);                                      \
  EXTERN template void CNaxInterpolation::SpreadData2DTwice<T>(int32, int32, naxInterpolationDirection,         \
                                                               const T*, T*);                                   \
  EXTERN template void CNaxInterpolation::SqueezeData2DTwice<T>(int32, int32, naxInterpolationDirection,        \
                                                                const T*, T*);
// clang-format on

NAX_INTERPOLATION_INSTANTIATE(extern, float)
NAX_INTERPOLATION_INSTANTIATE(extern, double)

#endif  // NAX_INTERPOLATION_H
