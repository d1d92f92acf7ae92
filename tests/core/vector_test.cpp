// Run-time sized vectors: storage and part copies, arithmetic, equality by element type,
// lengths through the safe root, normalising and component search.
#include <gtest/gtest.h>

#include <cmath>
#include <numeric>
#include <random>
#include <vector>

#include "nax/vector_n.h"

namespace {

template <typename T>
class VectorNTest : public ::testing::Test {};
using RealTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(VectorNTest, RealTypes);

template <typename T>
std::vector<T> RandomValues(int n, unsigned seed) {
  std::mt19937 rng(seed);
  std::uniform_real_distribution<T> u(-1, 1);
  std::vector<T> v(n);
  for (T& x : v) x = u(rng);
  return v;
}

TYPED_TEST(VectorNTest, ReductionsMatchPlainSums) {
  using T = TypeParam;
  const T rel = std::is_same_v<T, float> ? T(1e-4) : T(1e-12);
  for (int n : {1, 2, 7, 8, 9, 31, 1000}) {
    const std::vector<T> a = RandomValues<T>(n, n), b = RandomValues<T>(n, n + 100);
    const CNaxVectorN<T> va(n, a.data()), vb(n, b.data());
    long double dot = 0, sq = 0, abs = 0;
    for (int i = 0; i < n; ++i) {
      dot += (long double)a[i] * b[i];
      sq += (long double)a[i] * a[i];
      abs += std::fabs((long double)a[i]);
    }
    EXPECT_NEAR(va.Dot(vb), (T)dot, rel * n);
    EXPECT_NEAR(va.SquareLength(), (T)sq, rel * n);
    EXPECT_NEAR(va.Length(), (T)std::sqrt(sq), rel * n);
    EXPECT_EQ(va.NormEuclidean(), va.Length());
    EXPECT_NEAR(va.Norm1(), (T)abs, rel * n);
    long double part = 0;
    for (int i = n / 3; i <= n - 1; ++i) part += (long double)a[i] * b[i];
    EXPECT_NEAR(va.DotForPart(n / 3, n - 1, vb), (T)part, rel * n);
  }
  const CNaxVectorN<T> empty;
  EXPECT_EQ(empty.Dot(empty), T(0));
  EXPECT_EQ(empty.NormInf(), T(0));
  EXPECT_EQ(CNaxVectorN<T>(3, T(1)).DotForPart(2, 1, CNaxVectorN<T>(3, T(1))), T(0));
}

TYPED_TEST(VectorNTest, ArithmeticOperatorsAndInPlaceForms) {
  using T = TypeParam;
  const T av[] = {1, 2, 3}, bv[] = {4, -5, 6};
  const CNaxVectorN<T> a(3, av), b(3, bv);
  const CNaxVectorN<T> sum = a + b, diff = a - b, scaled = a * T(2), halved = a / T(2), neg = a.Negate();
  for (int i = 0; i < 3; ++i) {
    EXPECT_EQ(sum[i], av[i] + bv[i]);
    EXPECT_EQ(diff[i], av[i] - bv[i]);
    EXPECT_EQ(scaled[i], av[i] * 2);
    EXPECT_EQ(halved[i], av[i] / 2);
    EXPECT_EQ(neg[i], -av[i]);
    EXPECT_EQ(a[i], av[i]);  // Negate leaves its operand alone
  }
  CNaxVectorN<T> c(a);
  c += b;
  c -= b;
  c *= T(3);
  c /= T(3);
  EXPECT_TRUE(c == a);
  c.Add(b);
  c.Sub(a);
  EXPECT_TRUE(c == b);
  // Division does not test its divisor: infinities propagate.
  const CNaxVectorN<T> inf = a / T(0);
  EXPECT_TRUE(std::isinf(inf[0]));
}

TYPED_TEST(VectorNTest, AssignmentKeepsTheTargetDimension) {
  using T = TypeParam;
  const T five[] = {1, 2, 3, 4, 5};
  CNaxVectorN<T> target(3);
  target = CNaxVectorN<T>(5, five);
  EXPECT_EQ(target.Dim(), 3);
  EXPECT_EQ(target[2], T(3));
  CNaxBaseVector<T>& asBase = target;
  asBase = CNaxBaseVector<T>(5, T(7));  // through the virtual slot
  EXPECT_EQ(target.Dim(), 3);
  EXPECT_EQ(target[0], T(7));
  target.SetDimension(5);
  EXPECT_EQ(target.Dim(), 5);
  EXPECT_EQ(target.SquareLength(), T(0));
  target.SetDimension(0);
  target.SetDimension(2);  // an empty array in between is released cleanly
  EXPECT_EQ(target.Dim(), 2);
}

TYPED_TEST(VectorNTest, PartCopies) {
  using T = TypeParam;
  const T src[] = {10, 20, 30, 40};
  CNaxVectorN<T> v(5, T(1));
  v.FillPart(src, 5, 4);  // start == dim: nothing
  EXPECT_EQ(v.Norm1(), T(5));
  v.FillPart(src, 3, 4);  // stops at the end
  EXPECT_EQ(v[3], T(10));
  EXPECT_EQ(v[4], T(20));
  T out[4] = {0, 0, 0, 0};
  v.DumpPart(3, 4, out);
  EXPECT_EQ(out[0], T(10));
  EXPECT_EQ(out[1], T(20));
  EXPECT_EQ(out[2], T(0));
  CNaxVectorN<T> w(4, src);
  v.ReplacePart(0, 1, 2, w);
  EXPECT_EQ(v[0], T(20));
  EXPECT_EQ(v[1], T(30));
  v.ReplacePart(0, 0, 0, w);
  EXPECT_EQ(v[0], T(20));
  T all[5];
  v.Dump(all);
  CNaxVectorN<T> u(5);
  u.Fill(all);
  EXPECT_TRUE(u == v);
}

TYPED_TEST(VectorNTest, EqualityToleranceAndDimensions) {
  using T = TypeParam;
  const T tol = nax::detail::DefaultTol<T>();
  CNaxVectorN<T> a(2, T(0)), b(2, T(0));
  b[1] = tol;  // exactly the tolerance: equal
  EXPECT_TRUE(a == b);
  EXPECT_FALSE(a != b);
  b[1] = tol * 3;
  EXPECT_FALSE(a == b);
  EXPECT_TRUE(CNaxVectorN<T>() == CNaxVectorN<T>());
  EXPECT_FALSE(CNaxVectorN<T>() == CNaxVectorN<T>(1));
  EXPECT_TRUE(CNaxVectorN<T>(2) != CNaxVectorN<T>(3));
}

TEST(VectorQuirks, LengthDeadZoneBlocksNormalize) {
  const double tiny[] = {1e-5, 0, 0};
  CNaxVectorN<double> v(3, tiny);
  EXPECT_EQ(v.Length(), 0.0);
  EXPECT_DOUBLE_EQ(v.SquareLength(), 1e-10);
  EXPECT_EQ(v.Normalize(), 0);
  EXPECT_EQ(v[0], 1e-5);
  EXPECT_EQ(v.IsAlmostZero(0.0), 1);

  const double small[] = {0, 0, 4e-5};
  CNaxVectorN<double> w(3, small);
  EXPECT_EQ(w.Length(), 4e-5);
  EXPECT_EQ(w.Normalize(), 1);
  EXPECT_DOUBLE_EQ(w[2], 1.0);
  EXPECT_EQ(w.IsAlmostUnit(1e-12), 1);
}

TYPED_TEST(VectorNTest, NormalizeGivesUnitVectors) {
  using T = TypeParam;
  for (int n : {1, 3, 17, 100}) {
    CNaxVectorN<T> v(n, RandomValues<T>(n, 3 * n).data());
    const CNaxVectorN<T> original(v);
    ASSERT_EQ(v.Normalize(), 1);
    EXPECT_EQ(v.IsAlmostUnit(T(1e-5)), 1);
    const T length = original.Length();
    for (int i = 0; i < n; ++i) EXPECT_NEAR(v[i] * length, original[i], T(1e-5));
  }
}

TYPED_TEST(VectorNTest, ComponentSearchTakesTheFirstExtreme) {
  using T = TypeParam;
  const T a[] = {3, 3, 1}, b[] = {1, -3, 3}, c[] = {2, -7, 5, -7, 7, 0};
  EXPECT_EQ(CNaxVectorN<T>(3, a).GetIndexOfMaxComponent(0), 0);
  EXPECT_EQ(CNaxVectorN<T>(3, b).GetIndexOfMaxComponent(1), 1);
  EXPECT_EQ(CNaxVectorN<T>(3, b).GetIndexOfMaxComponent(0), 2);
  const CNaxVectorN<T> v(6, c);
  EXPECT_EQ(v.GetMaxComponent(0), T(7));
  EXPECT_EQ(v.GetMinComponent(0), T(-7));
  EXPECT_EQ(v.GetIndexOfMinComponent(0), 1);
  EXPECT_EQ(v.GetMaxComponent(1), T(7));
  EXPECT_EQ(v.GetIndexOfMaxComponent(1), 1);
  EXPECT_EQ(v.GetMinComponent(1), T(0));
  EXPECT_EQ(v.NormInf(), T(7));
  EXPECT_EQ(CNaxVectorN<T>().GetIndexOfMaxComponent(0), 0);
  EXPECT_EQ(CNaxVectorN<T>().GetMinComponent(1), T(0));
}

TYPED_TEST(VectorNTest, AnnulateAndConstants) {
  using T = TypeParam;
  const T values[] = {T(0.5), T(-0.25), T(0.1), T(-2)};
  CNaxVectorN<T> v(4, values);
  v.AnnulateSmallComponents(T(0.25));  // exactly the tolerance stays
  EXPECT_EQ(v[1], T(-0.25));
  EXPECT_EQ(v[2], T(0));
  v.SetToConstant(T(4));
  EXPECT_EQ(v.Norm1(), T(16));
  v.SetToZero();
  EXPECT_EQ(v.Norm1(), T(0));
}

TEST(BaseVector, IntegerVectorsCompareExactly) {
  const int32 a[] = {1, 2, 3};
  CNaxBaseVector<int32> u(3, a), v(3, a);
  EXPECT_TRUE(u == v);
  v[2] = 4;
  EXPECT_TRUE(u != v);
  EXPECT_EQ(u.Dot(v), 1 + 4 + 12);
  const CNaxBaseVector<int32> w = (u + v) * 2;
  EXPECT_EQ(w[2], 14);
}

TEST(BaseVector, ComplexElementsAreConstructedObjects) {
  using C = CNaxComplex<double>;
  const C src[] = {C(1, 2), C(3, -1)};
  CNaxBaseVector<C> u(2, src), v(u);
  EXPECT_TRUE(u == v);
  EXPECT_EQ(u.Dot(v).Real(), (C(1, 2) * C(1, 2) + C(3, -1) * C(3, -1)).Real());
  // Components closer than the dead zone of the safe root compare equal.
  v[0] = C(1 + 2e-5, 2);
  v[0].Set(1 + 2e-5, 2);
  EXPECT_TRUE(u == v);
  v[0].Set(1 + 1e-3, 2);
  EXPECT_TRUE(u != v);
  u.SetToZero();
  EXPECT_EQ(naxAbs(u[1]), 0.0);
  const CNaxBaseVector<C> scaled = v * C(0, 1);
  EXPECT_EQ(scaled[1].Real(), 1.0);
  EXPECT_EQ(scaled[1].Imag(), 3.0);
}

}  // namespace
