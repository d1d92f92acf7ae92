// Complex numbers: arithmetic against std::complex, the cached trigonometric form,
// the assignment threshold, guarded division and the free scalar routines.
#include <gtest/gtest.h>

#include <complex>
#include <random>

#include "nax/complex.h"

namespace {

template <typename T>
class ComplexTest : public ::testing::Test {};
using RealTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(ComplexTest, RealTypes);

constexpr double kPseudoInfinity = 3.4028234663852886e38;

TYPED_TEST(ComplexTest, ArithmeticMatchesStdComplex) {
  using T = TypeParam;
  std::mt19937 rng(7);
  std::uniform_real_distribution<T> u(-10, 10);
  const T tol = std::is_same_v<T, float> ? T(1e-4) : T(1e-12);
  for (int i = 0; i < 200; ++i) {
    const CNaxComplex<T> a(u(rng), u(rng)), b(u(rng), u(rng));
    const std::complex<T> sa(a.Real(), a.Imag()), sb(b.Real(), b.Imag());
    const std::complex<T> expected[] = {sa + sb, sa - sb, sa * sb, sa / sb};
    const CNaxComplex<T> got[] = {a + b, a - b, a * b, a / b};
    for (int k = 0; k < 4; ++k) {
      EXPECT_NEAR(got[k].Real(), expected[k].real(), tol * (1 + std::abs(expected[k])));
      EXPECT_NEAR(got[k].Imag(), expected[k].imag(), tol * (1 + std::abs(expected[k])));
      EXPECT_EQ(got[k].IsTrigCalculated(), 0);
    }
    CNaxComplex<T> c = a;
    c *= b;
    c /= b;
    EXPECT_NEAR(c.Real(), a.Real(), tol * 10);
    EXPECT_NEAR(c.Imag(), a.Imag(), tol * 10);
  }
}

TYPED_TEST(ComplexTest, DivisionByAlmostZeroGivesPseudoInfinity) {
  using T = TypeParam;
  const CNaxComplex<T> a(1, 2);
  for (const CNaxComplex<T>& q : {a / CNaxComplex<T>(0, 0), a / T(0), CNaxComplex<T>(0, 0).Invert()}) {
    EXPECT_EQ(q.Real(), T(kPseudoInfinity));
    EXPECT_EQ(q.Imag(), T(kPseudoInfinity));
  }
  CNaxComplex<T> c = a;
  c /= T(0);
  EXPECT_EQ(c.Real(), T(kPseudoInfinity));
  // A divisor whose squared modulus is below the default tolerance also counts as zero.
  const T tiny = std::is_same_v<T, float> ? T(2e-4) : T(2e-5);
  EXPECT_EQ((a / CNaxComplex<T>(tiny, 0)).Real(), T(kPseudoInfinity));
}

TYPED_TEST(ComplexTest, AssignmentSkipsNumbersWithinPrecision) {
  using T = TypeParam;
  CNaxComplex<T> target(1, 1);
  target.CalculateTrigonForm();
  target = CNaxComplex<T>(T(1) + T(1e-10), 1);
  EXPECT_EQ(target.Real(), T(1));
  EXPECT_EQ(target.IsTrigCalculated(), 1);  // not even the cache is touched

  // The distance goes through the safe root, so differences inside its dead zone are
  // skipped too: accumulating small corrections by assignment stops changing the value.
  CNaxComplex<T> sum(0, 0);
  const T step = std::is_same_v<T, float> ? T(1e-4) : T(1e-5);
  for (int i = 0; i < 10; ++i) sum = sum + CNaxComplex<T>(step, 0);
  EXPECT_EQ(sum.Real(), T(0));

  target = CNaxComplex<T>(5, -2);
  EXPECT_EQ(target.Real(), T(5));
  EXPECT_EQ(target.IsTrigCalculated(), 0);
  EXPECT_EQ(target.GetPrecision(), nax::detail::DefaultTol<T>());
}

TYPED_TEST(ComplexTest, AssignmentFromRealSetsTrigForm) {
  using T = TypeParam;
  CNaxComplex<T> c(1, 2);
  c = T(-3);
  EXPECT_EQ(c.Real(), T(-3));
  EXPECT_EQ(c.Imag(), T(0));
  EXPECT_EQ(c.IsTrigCalculated(), 1);
  EXPECT_EQ(c.Magn(), T(3));
  EXPECT_EQ(c.AngleInDegrees(), T(180));
  CNaxComplex<T> zero;
  zero = T(0);  // already that value: unchanged, no cache
  EXPECT_EQ(zero.IsTrigCalculated(), 0);
}

TYPED_TEST(ComplexTest, EqualityUsesOwnPrecision) {
  using T = TypeParam;
  CNaxComplex<T> a(1, 1), b(1, 1);
  EXPECT_TRUE(a == b);  // the safe root of 0 is 0 < precision
  a.SetPrecision(0);
  EXPECT_FALSE(a == b);
  EXPECT_TRUE(a != b);
  CNaxComplex<T> c(1, 1);
  c.SetPrecision(T(0.5));
  EXPECT_TRUE(c == CNaxComplex<T>(T(1.3), 1));
  EXPECT_FALSE(c == CNaxComplex<T>(T(1.6), 1));
}

TYPED_TEST(ComplexTest, MagnitudeAndAngles) {
  using T = TypeParam;
  const T tol = std::is_same_v<T, float> ? T(1e-4) : T(1e-10);
  EXPECT_EQ(CNaxComplex<T>(3, 4).Magn(), T(5));
  EXPECT_EQ(CNaxComplex<T>(0, -1).AngleInDegrees(), T(270));
  EXPECT_EQ(CNaxComplex<T>(0, 0).AngleInDegrees(), T(0));
  EXPECT_EQ(CNaxComplex<T>(3, 4).SquareMagn(), T(25));
  // Uncached radians lie in [0, 2 pi), cached ones around zero: they differ above 180 degrees.
  CNaxComplex<T> c(0, -1);
  EXPECT_NEAR(c.AngleInRadians(), T(1.5 * M_PI), tol);
  c.CalculateTrigonForm();
  EXPECT_NEAR(c.AngleInRadians(), T(-0.5 * M_PI), tol);
  EXPECT_NEAR(c.AngleInDegrees(), T(270), tol);
  EXPECT_NEAR(c.Magn(), T(1), tol);
}

TEST(ComplexQuirks, MagnitudeDeadZone) {
  EXPECT_EQ(CNaxComplex<double>(1e-5, 0).Magn(), 0.0);
  EXPECT_EQ(naxAbs(CNaxComplex<double>(2e-5, 2e-5)), 0.0);  // 8e-10 < 1e-9
  EXPECT_GT(naxAbs(CNaxComplex<double>(4e-5, 0)), 0.0);
  CNaxComplex<double> coarse(0.1, 0);
  coarse.SetPrecision(0.5);  // Magn compares re^2 + im^2 with precision^2
  EXPECT_EQ(coarse.Magn(), 0.0);
}

TYPED_TEST(ComplexTest, TrigFormRoundTrip) {
  using T = TypeParam;
  const T tol = std::is_same_v<T, float> ? T(1e-4) : T(1e-10);
  for (T degrees : {T(-725), T(-90), T(0), T(45), T(180), T(359), T(360), T(1000)}) {
    CNaxComplex<T> c;
    c.SetInTrigForm(2, degrees);
    EXPECT_GE(c.AngleInDegrees(), T(0));
    EXPECT_LT(c.AngleInDegrees(), T(360));
    const T radians = degrees * T(M_PI) / 180;
    EXPECT_NEAR(c.Real(), 2 * std::cos(radians), tol);
    EXPECT_NEAR(c.Imag(), 2 * std::sin(radians), tol);
    CNaxComplex<T> fresh(c.Real(), c.Imag());
    fresh.CalculateTrigonForm();
    EXPECT_NEAR(fresh.Magn(), T(2), tol);
    EXPECT_NEAR(std::remainder(fresh.AngleInDegrees() - c.AngleInDegrees(), T(360)), T(0), tol * 100);
  }
}

TYPED_TEST(ComplexTest, CompoundArithmeticKeepsCacheOnlyWhenValueUnchanged) {
  using T = TypeParam;
  CNaxComplex<T> c(3, 4);
  c.CalculateTrigonForm();
  c += CNaxComplex<T>(0, 0);
  EXPECT_EQ(c.IsTrigCalculated(), 1);
  c *= T(2);
  EXPECT_EQ(c.IsTrigCalculated(), 0);
  EXPECT_EQ(c.Real(), T(6));
}

TYPED_TEST(ComplexTest, PowerAndRoots) {
  using T = TypeParam;
  const T tol = std::is_same_v<T, float> ? T(1e-3) : T(1e-9);
  const CNaxComplex<T> z(T(1.2), T(-0.7));
  const std::complex<T> sz(z.Real(), z.Imag());
  for (int n : {-3, -1, 1, 2, 5}) {
    const CNaxComplex<T> p = z.Power(n);
    const std::complex<T> e = std::pow(sz, T(n));
    EXPECT_NEAR(p.Real(), e.real(), tol) << n;
    EXPECT_NEAR(p.Imag(), e.imag(), tol) << n;
  }
  EXPECT_EQ(z.Power(0).Real(), T(1));
  EXPECT_EQ(CNaxComplex<T>(0, 0).Power(3).Real(), T(0));

  CNaxComplex<T> roots[5];
  EXPECT_EQ(z.Roots(5, roots), 1);
  for (const CNaxComplex<T>& r : roots) {
    const CNaxComplex<T> back = r.Power(5);
    EXPECT_NEAR(back.Real(), z.Real(), tol);
    EXPECT_NEAR(back.Imag(), z.Imag(), tol);
  }
  EXPECT_EQ(z.Roots(0, roots), 0);
}

TYPED_TEST(ComplexTest, FreeScalarRoutines) {
  using T = TypeParam;
  const CNaxComplex<T> values[] = {CNaxComplex<T>(3, 4), CNaxComplex<T>(0, 5), CNaxComplex<T>(1, 0),
                                   CNaxComplex<T>(-1, 0)};
  T result;
  int32 index;
  naxAbsMaxInArray(4, values, result, index);
  EXPECT_EQ(result, T(5));
  EXPECT_EQ(index, 0);  // first of equal magnitudes
  naxAbsMinInArray(4, values, result, index);
  EXPECT_EQ(result, T(1));
  EXPECT_EQ(index, 2);
  EXPECT_EQ(naxAbsMax(values[2], values[0], values[3]), T(5));
  EXPECT_EQ(naxAbsMin(values[0], values[1]), T(5));
  EXPECT_EQ(naxAbsMin(values[0], values[1], values[2]), T(1));

  EXPECT_EQ(naxIsAlmostZero(CNaxComplex<T>(3, 4), T(5)), 0);  // strictly below
  EXPECT_EQ(naxIsAlmostZero(CNaxComplex<T>(3, 4), T(5.01)), 1);
  EXPECT_EQ(naxIsAlmostZero(CNaxComplex<T>(0, 0)), 1);
  EXPECT_EQ(naxAreAlmostEqual(values[0], values[0], T(0)), 0);  // non-positive tolerance
  EXPECT_EQ(naxAreAlmostEqual(values[0], values[0]), 1);
  EXPECT_EQ(naxAreAlmostEqual(values[0], values[1]), 0);
}

TEST(ComplexQuirks, DefaultToleranceEqualityIsOnTheSquaredDistance) {
  // True exactly when |a - b|^2 < 1e-9: a distance of 3e-5 is equal, 4e-5 is not.
  const CNaxComplex<double> a(1, 0);
  EXPECT_EQ(naxAreAlmostEqual(a, CNaxComplex<double>(1 + 3e-5, 0)), 1);
  EXPECT_EQ(naxAreAlmostEqual(a, CNaxComplex<double>(1 + 4e-5, 0)), 0);
}

}  // namespace
