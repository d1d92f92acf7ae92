// Singular value decompositions of CNaxMatrixMN: factor properties over many shapes, and
// the stated behaviour of the helpers.
#include <gtest/gtest.h>

#include "matrix/matrix_test_support.h"

namespace {

using nax::test::MaxDifference;
using nax::test::OrthogonalityError;
using nax::test::RandomMatrix;
using nax::test::RandomOfRank;

// Opens the protected machinery to the tests.
template <typename T>
class SvdProbe : public CNaxMatrixMN<T> {
 public:
  using CNaxMatrixMN<T>::CNaxMatrixMN;
  using CNaxMatrixMN<T>::TestZeroRowsColumns;
  using CNaxMatrixMN<T>::Givens1;
  using CNaxMatrixMN<T>::Householder1;
  using CNaxMatrixMN<T>::Pythagoras;
  using CNaxMatrixMN<T>::QRBD;
  using CNaxMatrixMN<T>::QRT_2D;
};

// u [diag(w); 0] v^T for u rows x rows (or rows x k), v cols x cols.
template <typename T>
CNaxMatrixMN<T> Recompose(const CNaxMatrixMN<T>& u, const CNaxVectorN<T>& w,
                          const CNaxMatrixMN<T>& v, int32 rows, int32 cols, int32 k) {
  CNaxMatrixMN<T> a(rows, cols);
  for (int32 i = 0; i < rows; ++i)
    for (int32 j = 0; j < cols; ++j) {
      double s = 0.0;
      for (int32 p = 0; p < k; ++p) s += double(u(i, p)) * double(w[p]) * double(v(j, p));
      a(i, j) = T(s);
    }
  return a;
}

// Checks this = u diag(w) v^T with orthogonal factors and sorted non-negative values.
template <typename T>
void ExpectValidSvd(const CNaxMatrixMN<T>& a, double tolerance) {
  const int32 m = a.RowsNb(), n = a.ColsNb(), k = std::min(m, n);
  CNaxMatrixMN<T> copy(a), u(m, m), v(n, n);
  CNaxVectorN<T> w(k);
  ASSERT_EQ(copy.SV_Decomposition(u, v, w, T(1e-9)), 0) << m << "x" << n;
  EXPECT_LT(MaxDifference(Recompose(u, w, v, m, n, k), a), tolerance) << m << "x" << n;
  EXPECT_LT(OrthogonalityError(u), tolerance) << m << "x" << n;
  EXPECT_LT(OrthogonalityError(v), tolerance) << m << "x" << n;
  for (int32 i = 0; i < k; ++i) {
    EXPECT_GE(w[i], T(0));
    if (i + 1 < k) {
      EXPECT_GE(w[i], w[i + 1]);
    }
  }
}

TEST(SvDecomposition, RandomShapesRecomposeWithOrthogonalFactors) {
  std::mt19937 generator(7);
  const int32 shapes[][2] = {{1, 1}, {1, 4}, {4, 1}, {2, 2}, {3, 3}, {5, 5}, {4, 2}, {2, 4},
                             {7, 3}, {3, 7}, {9, 9}, {16, 11}, {11, 16}, {40, 40}, {60, 25}};
  for (const auto& s : shapes)
    for (int32 trial = 0; trial < 3; ++trial)
      ExpectValidSvd(RandomMatrix<double>(s[0], s[1], generator), 1e-5);
  for (int32 n : {3, 6, 12}) ExpectValidSvd(RandomMatrix<float>(n + 2, n, generator), 2e-3);
}

TEST(SvDecomposition, RankDeficientAndZeroLines) {
  std::mt19937 generator(9);
  for (int32 rank : {1, 2, 4}) {
    const CNaxMatrixMN<double> a = RandomOfRank<double>(8, 6, rank, generator);
    ExpectValidSvd(a, 1e-5);
    CNaxMatrixMN<double> copy(a);
    EXPECT_EQ(copy.CalculateRank(1e-6), rank);
  }
  // Zero rows and columns in the middle are moved aside and the permutations undone.
  CNaxMatrixMN<double> a = RandomMatrix<double>(7, 5, generator);
  for (int32 c = 0; c < 5; ++c) a(1, c) = a(4, c) = 0.0;
  for (int32 r = 0; r < 7; ++r) a(r, 0) = a(r, 2) = 0.0;
  ExpectValidSvd(a, 1e-5);
  ExpectValidSvd(CNaxMatrixMN<double>(a.Transpose()), 1e-5);
}

TEST(SvDecomposition, ZeroMatrixHasZeroValuesAndAllLinesZero) {
  SvdProbe<double> a(4, 3);
  int32 zeroRows = -1, zeroCols = -1;
  a.TestZeroRowsColumns(zeroRows, zeroCols, 1e-9);
  EXPECT_EQ(zeroRows, 4);
  EXPECT_EQ(zeroCols, 3);
  CNaxMatrixMN<double> u(4, 4), v(3, 3);
  CNaxVectorN<double> w(3, 5.0);
  ASSERT_EQ(a.SV_Decomposition(u, v, w, 1e-9), 0);
  for (int32 i = 0; i < 3; ++i) EXPECT_EQ(w[i], 0.0);
  EXPECT_LT(OrthogonalityError(u), 1e-12);
}

TEST(SvDecomposition, NegativeDiagonalGivesSortedPositiveValuesWithSignsInV) {
  const double d[9] = {-2, 0, 0, 0, 5, 0, 0, 0, -3};
  CNaxMatrixMN<double> a(3, 3, d), u(3), v(3);
  CNaxVectorN<double> w(3);
  ASSERT_EQ(a.SV_Decomposition(u, v, w, 1e-9), 0);
  EXPECT_EQ(w[0], 5.0);
  EXPECT_EQ(w[1], 3.0);
  EXPECT_EQ(w[2], 2.0);
  // The left factor stays a permutation; the signs went into v.
  EXPECT_EQ(u(1, 0), 1.0);
  EXPECT_EQ(u(2, 1), 1.0);
  EXPECT_EQ(u(0, 2), 1.0);
  EXPECT_EQ(v(2, 1), -1.0);
  EXPECT_EQ(v(0, 2), -1.0);
}

TEST(SvDecomposition, EqualValuesKeepTheirOrder) {
  const double d[9] = {2, 0, 0, 0, 3, 0, 0, 0, 2};
  CNaxMatrixMN<double> a(3, 3, d), u(3), v(3);
  CNaxVectorN<double> w(3);
  ASSERT_EQ(a.SV_Decomposition(u, v, w, 1e-9), 0);
  EXPECT_EQ(w[1], 2.0);
  EXPECT_EQ(w[2], 2.0);
  EXPECT_EQ(std::fabs(v(0, 1)), 1.0);  // the first 2 stays ahead of the second
  EXPECT_EQ(std::fabs(v(2, 2)), 1.0);
}

TEST(SvDecomposition, WideMatrixMatchesItsTransposeWithFactorsExchanged) {
  std::mt19937 generator(10);
  const CNaxMatrixMN<double> a = RandomMatrix<double>(3, 5, generator);
  CNaxMatrixMN<double> wide(a), tall(a.Transpose());
  CNaxMatrixMN<double> u1(3, 3), v1(5, 5), u2(5, 5), v2(3, 3);
  CNaxVectorN<double> w1(3), w2(3);
  ASSERT_EQ(wide.SV_Decomposition(u1, v1, w1, 1e-9), 0);
  ASSERT_EQ(tall.SV_Decomposition(u2, v2, w2, 1e-9), 0);
  for (int32 i = 0; i < 3; ++i) EXPECT_EQ(w1[i], w2[i]);
  EXPECT_EQ(MaxDifference(u1, v2), 0.0);
  EXPECT_EQ(MaxDifference(v1, u2), 0.0);
}

TEST(SvDecomposition, FillsTheCacheThatElementChangesDoNotClear) {
  std::mt19937 generator(11);
  CNaxMatrixMN<double> a = RandomMatrix<double>(6, 4, generator), u(6, 6), v(4, 4);
  CNaxVectorN<double> w(4);
  EXPECT_EQ(a.IsSingCalculated(), 0);
  ASSERT_EQ(a.SV_Decomposition(u, v, w, 1e-9), 0);
  a(0, 0) += 100.0;
  EXPECT_EQ(a.IsSingCalculated(), 1);
  double cached[4];
  a.GetSingularNumbers(cached);
  for (int32 i = 0; i < 4; ++i) EXPECT_EQ(cached[i], w[i]);
  CNaxMatrixMN<double> copy(a);
  EXPECT_EQ(copy.IsSingCalculated(), 1);
}

TEST(SvDecomposition, NoConvergenceReportsOneAndLeavesTheCache) {
  std::mt19937 generator(14);
  // With a negative tolerance no coupling ever counts as small, so the sweeps run out.
  SvdProbe<double> p(1);
  double d[3] = {3.0, 2.0, 1.0}, e[3] = {0.0, 0.5, 0.25};
  double v[9] = {1, 0, 0, 0, 1, 0, 0, 0, 1}, c[9] = {1, 0, 0, 0, 1, 0, 0, 0, 1};
  int32 split = 0;
  EXPECT_EQ(p.QRBD(3, 3, 3, split, d, e, v, c, -1.0), 1);
  CNaxMatrixMN<double> a = RandomMatrix<double>(5, 4, generator), u(5), w4(4);
  CNaxVectorN<double> w(4);
  EXPECT_EQ(a.SV_Decomposition(u, w4, w, -1.0), 1);
  EXPECT_EQ(a.IsSingCalculated(), 0);
}

// The sweeps once took a NaN coupling for convergence and the driver looped for ever.
TEST(SvDecomposition, RegressionNanCouplingEndsTheSweeps) {
  std::mt19937 generator(15);
  CNaxMatrixMN<double> a = RandomMatrix<double>(6, 6, generator), u(6), v(6);
  a(2, 3) = std::nan("");
  CNaxVectorN<double> w(6);
  const int32 status = a.SV_Decomposition(u, v, w, 1e-9);  // returns at all
  EXPECT_TRUE(status == 0 || status == 1) << status;
}

TEST(ThinSvd, RecomposesWithNonNegativeValues) {
  std::mt19937 generator(12);
  for (const auto& s : {std::pair<int32, int32>{5, 5}, {9, 4}, {30, 12}}) {
    CNaxMatrixMN<double> a = RandomMatrix<double>(s.first, s.second, generator);
    CNaxMatrixMN<double> u(s.first, s.second), v(s.second, s.second);
    CNaxVectorN<double> w(s.second);
    ASSERT_EQ(a.ThinSVD(u, v, w), 0);
    EXPECT_LT(MaxDifference(Recompose(u, w, v, s.first, s.second, s.second), a), 1e-12);
    EXPECT_LT(OrthogonalityError(u), 1e-12);
    EXPECT_LT(OrthogonalityError(v), 1e-12);
    for (int32 i = 0; i < s.second; ++i) EXPECT_GE(w[i], 0.0);
    EXPECT_EQ(a.IsSingCalculated(), 1);
  }
}

TEST(SvdHelpers, GivensAndPythagorasFloors) {
  SvdProbe<double> p(1);
  double c, s, r;
  p.Givens1(3.0, 4.0, c, s, r, 1e-9);
  EXPECT_DOUBLE_EQ(r, 5.0);
  EXPECT_DOUBLE_EQ(c, 0.6);
  EXPECT_DOUBLE_EQ(s, 0.8);
  // A radius below 1.5 tol gives the identity rotation.
  p.Givens1(1.2e-3, 0.0, c, s, r, 1e-3);
  EXPECT_EQ(c, 1.0);
  EXPECT_EQ(s, 0.0);
  EXPECT_EQ(p.Pythagoras(0.0, 1e-10), 0.0);
  EXPECT_DOUBLE_EQ(p.Pythagoras(-3.0, 4.0), 5.0);
}

TEST(SvdHelpers, HouseholderKeepsThePivotSign) {
  SvdProbe<double> p(1);
  double u[3] = {3.0, 4.0, 0.0}, up = 0.0;
  EXPECT_EQ(p.Householder1(0, 1, 3, -1, up, u, nullptr, 1e-9), 1);
  EXPECT_DOUBLE_EQ(u[0], 5.0);  // same sign as the pivot 3
  EXPECT_DOUBLE_EQ(up, -2.0);
  double v[3] = {-3.0, 4.0, 0.0};
  EXPECT_EQ(p.Householder1(0, 1, 3, -1, up, v, nullptr, 1e-9), 1);
  EXPECT_DOUBLE_EQ(v[0], -5.0);
  EXPECT_EQ(p.Householder1(0, 1, 3, 0, up, v, nullptr, 1e-9), 0);  // vectors 0 answers 0
}

TEST(SvdHelpers, QrtRefusesWideAndRecomposesTall) {
  std::mt19937 generator(13);
  SvdProbe<double> wide(3, 4), tall(7, 4);
  CNaxMatrixMN<double> q(3, 3), b(3, 4), w(4, 4);
  EXPECT_EQ(wide.QRT_2D(q, b, w, 1e-9), 6);
  CNaxMatrixMN<double> random = RandomMatrix<double>(7, 4, generator);
  tall.Fill(&random[0]);
  CNaxMatrixMN<double> q7(7, 7), b7(7, 4), w4(4, 4);
  ASSERT_EQ(tall.QRT_2D(q7, b7, w4, 1e-9), 0);
  EXPECT_EQ(b7.IsBidiagonal(0.0), 1);
  const CNaxMatrixMN<double> product(CNaxMatrixMN<double>(q7 * b7) * w4.Transpose());
  EXPECT_LT(MaxDifference(product, random), 1e-5);
}

TEST(SvdHelpers, QrbdSplitsAtASmallCoupling) {
  SvdProbe<double> p(1);
  double d[3] = {3.0, 2.0, 1.0}, e[3] = {0.0, 0.5, 1e-12};
  double v[9] = {1, 0, 0, 0, 1, 0, 0, 0, 1}, c[9] = {1, 0, 0, 0, 1, 0, 0, 0, 1};
  int32 split = -7;
  EXPECT_EQ(p.QRBD(3, 3, 3, split, d, e, v, c, 1e-9), 0);
  EXPECT_EQ(split, 2);
  EXPECT_EQ(d[0], 3.0);  // returned before any sweep
}

}  // namespace
