#include "nax/interpolation.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <vector>

namespace {

using I = CNaxInterpolation;

template <typename T>
class InterpolationTest : public ::testing::Test {
 protected:
  // Tolerance for results that lose a few digits to cancellation in the node differences.
  static T Loose() { return std::is_same_v<T, float> ? T(2e-3) : T(1e-9); }
  T Uniform(double lo, double hi) { return T(std::uniform_real_distribution<double>(lo, hi)(rng_)); }
  // Nodes in [-2, 2] at least 0.4 apart, so the Vandermonde systems stay well conditioned.
  std::vector<T> Nodes(int n) {
    std::vector<T> x(n);
    for (int i = 0; i < n; ++i) x[i] = T(-2 + 4.0 * i / (n - 1 + 0.5)) + Uniform(0, 0.2);
    std::shuffle(x.begin(), x.end(), rng_);
    return x;
  }
  std::mt19937 rng_{7};
};
using Reals = ::testing::Types<float, double>;
TYPED_TEST_SUITE(InterpolationTest, Reals);

// A random polynomial of the given degree, highest coefficient first.
template <typename T>
T Poly(const std::vector<T>& c, T x) {
  T v = 0;
  for (T a : c) v = v * x + a;
  return v;
}

TYPED_TEST(InterpolationTest, PolynomialRoutinesReproducePolynomialsOfTheirDegree) {
  using T = TypeParam;
  for (int trial = 0; trial < 50; ++trial) {
    std::vector<T> c(6);
    for (T& a : c) a = this->Uniform(-1, 1);
    const T at = this->Uniform(-2, 2);
    // Degree 2 through three nodes, degree 3 through four, degree 5 through six.
    std::vector<T> c2(c.begin() + 3, c.end()), c3(c.begin() + 2, c.end());
    auto x = this->Nodes(6);
    EXPECT_NEAR(I::QuadraticInterpolate(Poly(c2, x[0]), Poly(c2, x[1]), Poly(c2, x[2]), x[0], x[1], x[2], at),
                Poly(c2, at), this->Loose());
    EXPECT_NEAR(I::CubicInterpolate(Poly(c3, x[0]), Poly(c3, x[1]), Poly(c3, x[2]), Poly(c3, x[3]), x[0], x[1],
                                    x[2], x[3], at),
                Poly(c3, at), this->Loose());
    std::vector<T> y(6);
    for (int i = 0; i < 6; ++i) y[i] = Poly(c, x[i]);
    const T aitken = I::PolynomialInterpolate(6, x.data(), y.data(), at);
    EXPECT_NEAR(aitken, Poly(c, at), 4 * this->Loose());
    EXPECT_EQ(I::LagrangeInterpolation(6, x.data(), y.data(), at), aitken);  // the same steps
    // At a node the scheme returns the node's value.
    EXPECT_NEAR(I::PolynomialInterpolate(6, x.data(), y.data(), x[3]), y[3], this->Loose());
  }
  const T one[1] = {T(2)}, value[1] = {T(5)};
  EXPECT_EQ(I::PolynomialInterpolate(1, one, value, T(-7)), T(5));
}

TYPED_TEST(InterpolationTest, InverseVandermondeTimesVandermondeIsIdentity) {
  using T = TypeParam;
  for (int trial = 0; trial < 50; ++trial) {
    const auto x = this->Nodes(4);
    const CNaxMatrix3<T> m3 = I::InverseVandermondeMatrix(x[0], x[1], x[2]);
    const CNaxMatrix4<T> m4 = I::InverseVandermondeMatrix(x[0], x[1], x[2], x[3]);
    for (int i = 0; i < 3; ++i)
      for (int j = 0; j < 3; ++j) {
        T s = 0;  // row i of the inverse times column j of V, V(k, j) = x[k]^(2 - j)
        for (int k = 0; k < 3; ++k) s += m3(i, k) * std::pow(x[k], T(2 - j));
        EXPECT_NEAR(s, i == j ? T(1) : T(0), this->Loose());
      }
    for (int i = 0; i < 4; ++i)
      for (int j = 0; j < 4; ++j) {
        T s = 0;
        for (int k = 0; k < 4; ++k) s += m4(i, k) * std::pow(x[k], T(3 - j));
        EXPECT_NEAR(s, i == j ? T(1) : T(0), 4 * this->Loose());
      }
  }
  // Coefficients come highest first: y = x^2 + 3 at 0, 1, 2.
  const CNaxMatrix3<T> m = I::InverseVandermondeMatrix(T(0), T(1), T(2));
  EXPECT_NEAR(m(0, 0) * 3 + m(0, 1) * 4 + m(0, 2) * 7, T(1), 1e-6);
  EXPECT_NEAR(m(2, 0) * 3 + m(2, 1) * 4 + m(2, 2) * 7, T(3), 1e-6);
  // Equal nodes are not caught: they give infinities.
  EXPECT_FALSE(std::isfinite(I::InverseVandermondeMatrix(T(1), T(1), T(2))(0, 0)));
}

TYPED_TEST(InterpolationTest, LinearAndPowerInterpolation) {
  using T = TypeParam;
  EXPECT_EQ(I::LinearInterpolate(T(1), T(3), T(2)), T(5));  // t is not clamped
  EXPECT_EQ(I::LinearInterpolate(T(1), T(3), T(-1)), T(-1));
  // At x = x0 the 1e-9 (1e-7f) rule gives y0 whatever the power, also a negative one.
  EXPECT_EQ(I::PowerInterpolate(T(2), T(4), T(5), T(9), T(2), T(-2)), T(5));
  EXPECT_EQ(I::PowerInterpolate(T(2), T(4), T(5), T(9), T(2), T(0)), T(5));
  EXPECT_NEAR(I::PowerInterpolate(T(2), T(4), T(5), T(9), T(3), T(2)), T(6), 1e-6);  // 5 + 4 / 4
  EXPECT_NEAR(I::PowerInterpolate(T(2), T(4), T(5), T(9), T(4), T(3.7)), T(9), 1e-6);
}

TYPED_TEST(InterpolationTest, InterpolationAtIntegerNodes) {
  using T = TypeParam;
  T out[64];
  EXPECT_EQ(I::LinearInterpolateAtIntegerNodes(T(0.2), T(0.8), T(1), T(2), out), 0);
  EXPECT_EQ(I::PowerInterpolateAtIntegerNodes(T(0.2), T(0.8), T(1), T(2), T(2), out), 0);
  ASSERT_EQ(I::LinearInterpolateAtIntegerNodes(T(1), T(1), T(3), T(4), out), 1);
  EXPECT_TRUE(std::isnan(out[0]));  // 0 / 0
  ASSERT_EQ(I::LinearInterpolateAtIntegerNodes(T(-2.5), T(-0.5), T(0), T(4), out), 2);
  EXPECT_NEAR(out[0], T(1), 1e-6);
  EXPECT_NEAR(out[1], T(3), 1e-6);

  // A long run: each value is the one before plus the step, so the rounding error
  // accumulates along the run instead of being recomputed per node.
  const T x0 = T(0.3), x1 = T(60.7), y0 = T(0.1), y1 = T(7.3);
  const int32 n = I::LinearInterpolateAtIntegerNodes(x0, x1, y0, y1, out);
  ASSERT_EQ(n, 60);
  const T step = (y1 - y0) / (x1 - x0);
  EXPECT_NEAR(out[0], y0 + (1 - x0) * step, 1e-6);
  for (int32 k = 1; k < n; ++k) {
    EXPECT_EQ(out[k], out[k - 1] + step);
    EXPECT_NEAR(out[k], y0 + (T(k + 1) - x0) * step, 1e-4);
  }
  T powered[64];
  ASSERT_EQ(I::PowerInterpolateAtIntegerNodes(T(3), T(7.5), y0, y1, T(-1.5), powered), 5);
  EXPECT_EQ(powered[0], y0);  // node at x0 with a negative power
  for (int32 k = 1; k < 5; ++k)
    EXPECT_EQ(powered[k], I::PowerInterpolate(T(3), T(7.5), y0, y1, T(3 + k), T(-1.5)));
}

TYPED_TEST(InterpolationTest, BilinearInRectangle) {
  using T = TypeParam;
  const T tol = T(1e-4);
  for (int trial = 0; trial < 100; ++trial) {
    // f(u, v) = e + f u + g v + h u v over [0, w] x [0, hgt] is reproduced exactly.
    const T e = this->Uniform(-1, 1), f = this->Uniform(-1, 1), g = this->Uniform(-1, 1), h = this->Uniform(-1, 1);
    const T w = this->Uniform(0.5, 2), hgt = this->Uniform(0.5, 2);
    auto fn = [&](T u, T v) { return e + f * u + g * v + h * u * v; };
    const T u = this->Uniform(0.01, 0.99) * w, v = this->Uniform(0.01, 0.99) * hgt;
    EXPECT_NEAR(I::InterpolateBilinearInRectangle(fn(0, 0), fn(w, 0), fn(0, hgt), fn(w, hgt), u, w - u, v,
                                                  hgt - v, tol),
                fn(u, v), 10 * this->Loose());
  }
  const T a = 1, b = 2, c = 4, d = 8;
  // Within tol of a corner: the corner's value.
  EXPECT_EQ(I::InterpolateBilinearInRectangle(a, b, c, d, tol, T(1), tol / 2, T(1), tol), a);
  EXPECT_EQ(I::InterpolateBilinearInRectangle(a, b, c, d, T(0), T(1), T(1), T(0), tol), c);
  EXPECT_EQ(I::InterpolateBilinearInRectangle(a, b, c, d, T(1), T(0), T(0), T(1), tol), b);
  EXPECT_EQ(I::InterpolateBilinearInRectangle(a, b, c, d, T(1), T(0), T(1), tol, tol), d);
  // On the left side away from the corners: the blend, not a corner.
  EXPECT_NEAR(I::InterpolateBilinearInRectangle(a, b, c, d, T(0), T(1), T(1), T(3), tol), T(1.75), 1e-6);
  // Degenerate rectangles interpolate along the left or the bottom side.
  EXPECT_NEAR(I::InterpolateBilinearInRectangle(a, b, c, d, T(0), T(5e-7), T(1), T(1), tol), T(2.5), 1e-6);
  EXPECT_NEAR(I::InterpolateBilinearInRectangle(a, b, c, d, T(3), T(1), T(5e-7), T(0), tol), T(1.75), 1e-6);
  // A point rectangle divides 0 by 0.
  EXPECT_TRUE(std::isnan(I::InterpolateBilinearInRectangle(a, b, c, d, T(0), T(0), T(0), T(0), tol)));
}

TYPED_TEST(InterpolationTest, VectorFormsWorkPerComponent) {
  using T = TypeParam;
  CNaxVector4<T> v[4];
  CNaxVectorN<T> n[4];
  for (int k = 0; k < 4; ++k) {
    v[k] = CNaxVector4<T>(this->Uniform(-1, 1), this->Uniform(-1, 1), this->Uniform(-1, 1), this->Uniform(-1, 1));
    n[k].SetDimension(5);
    for (int i = 0; i < 5; ++i) n[k][i] = this->Uniform(-1, 1);
  }
  const T x0 = T(-1), x1 = T(0.5), x2 = T(1.25), x3 = T(3), x = T(0.8), t = T(0.3);
  // Each vector form gives, component by component, exactly the scalar routine's value.
  auto check = [&](const auto& w) {
    const auto q = I::VectorsQuadratic(w[0], w[1], w[2], x0, x1, x2, x);
    const auto c = I::VectorsCubic(w[0], w[1], w[2], w[3], x0, x1, x2, x3, x);
    const auto l = I::VectorsLinear(w[0], w[1], t);
    const auto b = I::InterpolateVectorBilinearInRectangle(w[0], w[1], w[2], w[3], T(1), T(2), T(3), T(0.5), T(0));
    ASSERT_EQ(b.Dim(), w[0].Dim());
    for (int i = 0; i < w[0].Dim(); ++i) {
      EXPECT_EQ(q[i], I::QuadraticInterpolate(w[0][i], w[1][i], w[2][i], x0, x1, x2, x));
      EXPECT_EQ(c[i], I::CubicInterpolate(w[0][i], w[1][i], w[2][i], w[3][i], x0, x1, x2, x3, x));
      EXPECT_EQ(l[i], I::LinearInterpolate(w[0][i], w[1][i], t));
      EXPECT_EQ(b[i], I::InterpolateBilinearInRectangle(w[0][i], w[1][i], w[2][i], w[3][i], T(1), T(2), T(3),
                                                        T(0.5), T(0)));
    }
  };
  check(v);
  check(n);
  // The quadratic of a vector curve reproduces it: p(x) = (x^2, 1 - x, 2 x^2 + x).
  auto p = [](T s) { return CNaxVector3<T>(s * s, 1 - s, 2 * s * s + s); };
  const CNaxVector3<T> q3 = I::VectorsQuadratic(p(x0), p(x1), p(x2), x0, x1, x2, x);
  EXPECT_NEAR((q3 - p(x)).Length(), T(0), this->Loose());
  const CNaxVector2<T> l2 = I::VectorsLinear(CNaxVector2<T>(1, 2), CNaxVector2<T>(3, 6), T(1.5));
  EXPECT_EQ(l2.x, T(4));
  EXPECT_EQ(l2.y, T(8));
  // Base vectors, also complex, take the dimension of the first operand.
  const T re[3] = {1, 2, 3}, re1[3] = {3, 2, 1};
  const CNaxBaseVector<T> lb = I::VectorsLinear(CNaxBaseVector<T>(3, re), CNaxBaseVector<T>(3, re1), T(0.5));
  EXPECT_EQ(lb[0], T(2));
  EXPECT_EQ(lb[2], T(2));
  const CNaxComplex<T> z0[2] = {{T(1), T(2)}, {T(0), T(-4)}}, z1[2] = {{T(3), T(-2)}, {T(8), T(4)}};
  const CNaxBaseVector<CNaxComplex<T>> lz =
      I::VectorsLinear(CNaxBaseVector<CNaxComplex<T>>(2, z0), CNaxBaseVector<CNaxComplex<T>>(2, z1), T(0.25));
  ASSERT_EQ(lz.Dim(), 2);
  EXPECT_EQ(lz[0].Real(), T(1.5));
  EXPECT_EQ(lz[0].Imag(), T(1));
  EXPECT_EQ(lz[1].Real(), T(2));
  EXPECT_EQ(lz[1].Imag(), T(-2));
}

// ---- Two-dimensional arrays ----------------------------------------------------------------

template <typename T>
std::vector<T> Iota(int n) {
  std::vector<T> v(n);
  for (int i = 0; i < n; ++i) v[i] = T(i);
  return v;
}

TYPED_TEST(InterpolationTest, SpreadThenSqueezeRestoresTheData) {
  using T = TypeParam;
  const int rows = 3, cols = 5;
  const std::vector<T> src = Iota<T>(rows * cols);
  std::vector<T> big(4 * rows * cols), back(rows * cols);
  for (naxInterpolationDirection dir : {naxInterpolationHorizontal, naxInterpolationVertical}) {
    I::SpreadData2DTwice(rows, cols, dir, src.data(), big.data());
    I::SqueezeData2DTwice(rows, cols, dir, big.data(), back.data());
    EXPECT_EQ(back, src) << "direction " << dir;
  }
  I::SpreadData2DTwice(rows, cols, naxInterpolationHorizontal, src.data(), big.data());
  EXPECT_EQ(big[2 * 7], T(7));
  EXPECT_EQ(big[2 * 7 + 1], T(7));
  I::SpreadData2DTwice(rows, cols, naxInterpolationVertical, src.data(), big.data());
  EXPECT_EQ(big[1 * cols + 3], T(3));  // row 0 written again as row 1
  EXPECT_EQ(big[4 * cols + 2], T(2 * cols + 2));
  I::SpreadData2DTwice(rows, cols, naxInterpolationDirection(7), src.data(), big.data());  // as both
  for (int r = 0; r < 2 * rows; ++r)
    for (int c = 0; c < 2 * cols; ++c) ASSERT_EQ(big[r * 2 * cols + c], src[(r / 2) * cols + c / 2]);
}

TYPED_TEST(InterpolationTest, SqueezeBothKeepsItsStride) {
  using T = TypeParam;
  // Output 2 x 3: the second run starts 3 samples after the first, and the first run of
  // output row r at 9 r, whatever the source layout.
  const int rows = 2, cols = 3;
  const std::vector<T> src = Iota<T>(4 * rows * cols);
  std::vector<T> dst(rows * cols);
  I::SqueezeData2DTwice(rows, cols, naxInterpolationBoth, src.data(), dst.data());
  for (int r = 0; r < rows; ++r)
    for (int c = 0; c < cols; ++c) {
      const int a = 3 * cols * r + 2 * c, b = a + cols;
      EXPECT_EQ(dst[r * cols + c], T(0.25) * (src[a] + src[a + 1] + src[b] + src[b + 1]));
    }
}

TYPED_TEST(InterpolationTest, BilinearResamplingReproducesRamps) {
  using T = TypeParam;
  // f(r, c) = 3 + 0.5 r - 0.25 c on the source grid; a target sample away from the clamped
  // border equals f at its sample-centre position.
  const int sizes[][4] = {{7, 9, 13, 20}, {20, 30, 11, 7}, {6, 6, 13, 6}, {8, 5, 16, 12}, {5, 8, 5, 3}};
  for (const auto& s : sizes) {
    const int sr = s[0], sc = s[1], dr = s[2], dc = s[3];
    std::vector<T> src(sr * sc), dst(dr * dc, T(-99));
    for (int r = 0; r < sr; ++r)
      for (int c = 0; c < sc; ++c) src[r * sc + c] = T(3 + 0.5 * r - 0.25 * c);
    I::InterpolateData2DBilinear(sr, sc, dr, dc, src.data(), dst.data());
    auto at = [](int i, int from, int to) {
      const double p = (i + 0.5) * from / to - 0.5;
      return p < 0 ? 0.0 : (p > from - 1 ? from - 1.0 : p);
    };
    for (int r = 0; r < dr; ++r)
      for (int c = 0; c < dc; ++c) {
        // A doubled axis repeats its samples.
        const double pr = dr == 2 * sr ? r / 2 : at(r, sr, dr), pc = dc == 2 * sc ? c / 2 : at(c, sc, dc);
        EXPECT_NEAR(dst[r * dc + c], 3 + 0.5 * pr - 0.25 * pc, 1e-5) << sr << "x" << sc << " to " << dr << "x" << dc
                                                                     << " at " << r << "," << c;
      }
  }
}

TYPED_TEST(InterpolationTest, ResamplingAtTwiceAndHalfSizes) {
  using T = TypeParam;
  const int rows = 4, cols = 6;
  std::vector<T> src(rows * cols);
  for (T& x : src) x = this->Uniform(-1, 1);
  std::vector<T> big(4 * rows * cols), expect(4 * rows * cols), small(rows * cols / 4);
  // Doubling both axes is the spread of both.
  I::InterpolateData2DBilinear(rows, cols, 2 * rows, 2 * cols, src.data(), big.data());
  I::SpreadData2DTwice(rows, cols, naxInterpolationBoth, src.data(), expect.data());
  EXPECT_EQ(big, expect);
  // Halving both axes averages the true 2 x 2 blocks.
  I::InterpolateData2DBilinear(rows, cols, rows / 2, cols / 2, src.data(), small.data());
  for (int r = 0; r < rows / 2; ++r)
    for (int c = 0; c < cols / 2; ++c) {
      const T* a = &src[2 * r * cols + 2 * c];
      EXPECT_NEAR(small[r * cols / 2 + c], (a[0] + a[1] + a[cols] + a[cols + 1]) / 4, 1e-6);
    }
  // Equal sizes copy; a single source row or column is spread without reading past it.
  std::vector<T> same(rows * cols);
  I::InterpolateData2DBilinear(rows, cols, rows, cols, src.data(), same.data());
  EXPECT_EQ(same, src);
  std::vector<T> wide(5 * 13);
  I::InterpolateData2DBilinear(1, 1, 5, 7, src.data(), wide.data());
  for (int i = 0; i < 5 * 7; ++i) EXPECT_EQ(wide[i], src[0]);
  I::InterpolateData2DBilinear(1, cols, 3, 13, src.data(), wide.data());
  for (int c = 0; c < 13; ++c) EXPECT_EQ(wide[c], wide[26 + c]);
}

TYPED_TEST(InterpolationTest, VectorArraysResampleLikeTheirComponents) {
  using T = TypeParam;
  const int sizes[][4] = {{5, 7, 9, 4}, {5, 7, 10, 14}, {6, 8, 3, 4}};
  for (const auto& s : sizes) {
    const int sr = s[0], sc = s[1], dr = s[2], dc = s[3];
    std::vector<CNaxVector3<T>> src(sr * sc), dst(dr * dc);
    std::vector<CNaxVector4<T>> src4(sr * sc), dst4(dr * dc);
    std::vector<T> plane[4], out[4];
    for (int k = 0; k < 4; ++k) {
      plane[k].resize(sr * sc);
      out[k].resize(dr * dc);
      for (T& x : plane[k]) x = this->Uniform(-1, 1);
    }
    for (int i = 0; i < sr * sc; ++i) {
      src[i] = CNaxVector3<T>(plane[0][i], plane[1][i], plane[2][i]);
      src4[i] = CNaxVector4<T>(plane[0][i], plane[1][i], plane[2][i], plane[3][i]);
    }
    I::InterpolateVectorData2DBilinear(sr, sc, dr, dc, src.data(), dst.data());
    I::InterpolateVectorData2DBilinear(sr, sc, dr, dc, src4.data(), dst4.data());
    for (int k = 0; k < 4; ++k) I::InterpolateData2DBilinear(sr, sc, dr, dc, plane[k].data(), out[k].data());
    for (int i = 0; i < dr * dc; ++i)
      for (int k = 0; k < 4; ++k) {
        if (k < 3) {
          EXPECT_NEAR(dst[i][k], out[k][i], 1e-6);
        }
        EXPECT_NEAR(dst4[i][k], out[k][i], 1e-6);
      }
  }
}

}  // namespace
