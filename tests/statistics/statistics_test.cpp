#include "nax/statistics.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

namespace {

template <typename T>
class StatisticsTest : public ::testing::Test {};
using RealTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(StatisticsTest, RealTypes);

template <typename T>
std::vector<T> RandomSamples(int n, unsigned seed, double low = -5, double high = 5) {
  std::mt19937 gen(seed);
  std::uniform_real_distribution<double> d(low, high);
  std::vector<T> v(n);
  for (auto& x : v) x = T(d(gen));
  return v;
}

double MeanOf(const std::vector<double>& v) {
  double s = 0;
  for (double x : v) s += x;
  return s / v.size();
}
double CentredVariance(const std::vector<double>& v) {  // two-pass, about the mean
  const double m = MeanOf(v);
  double s = 0;
  for (double x : v) s += (x - m) * (x - m);
  return s / (v.size() - 1);
}

TYPED_TEST(StatisticsTest, MomentsAgreeWithTwoPassFormulas) {
  using T = TypeParam;
  const double tol = std::is_same_v<T, float> ? 1e-4 : 1e-11;
  for (int n : {2, 3, 10, 1001}) {
    auto v = RandomSamples<T>(n, n, 1, 4);
    const std::vector<double> d(v.begin(), v.end());
    CNaxStatistics<T> stats(n, v.data());
    EXPECT_NEAR(stats.Mean(), MeanOf(d), tol * 4);
    EXPECT_NEAR(stats.Variance(), CentredVariance(d), tol * 20);
    EXPECT_NEAR(stats.StandardDeviation(), std::sqrt(CentredVariance(d)), tol * 20);
    double squares = 0, products = 0;
    for (double x : d) squares += x * x;
    for (int k = 0; k < n / 2; ++k) products += d[k] * d[n - 1 - k];
    EXPECT_NEAR(stats.Momentum2(), squares, tol * squares);
    // About a given mean: (sum x^2 - n m^2) / (n - 1), which is not the spread about m.
    EXPECT_NEAR(stats.Variance(T(2)), (squares - n * 4.0) / (n - 1), tol * squares);
    EXPECT_NEAR(stats.StandardDeviation(T(2)), std::sqrt((squares - n * 4.0) / (n - 1)),
                tol * squares);
    std::vector<T> reversed(v.rbegin(), v.rend());
    EXPECT_NEAR(stats.MixMomentum(n / 2, reversed.data()), products, tol * squares);
    EXPECT_EQ(stats.MixMomentum(0, reversed.data()), T(0));
  }
  std::vector<T> constant(7, T(0.1));
  EXPECT_EQ(CNaxStatistics<T>(7, constant.data()).StandardDeviation(), T(0));
  EXPECT_EQ(CNaxStatistics<T>().Momentum2(), T(0));
}

TYPED_TEST(StatisticsTest, MedianIsTheMiddleOfTheSortedSamples) {
  using T = TypeParam;
  T four[] = {1, 3, 2, 4};
  EXPECT_EQ(CNaxStatistics<T>(4, four).Median(), T(2.5));
  EXPECT_EQ(four[1], T(3));  // the samples stay as they were
  for (int n : {1, 2, 5, 600, 601}) {
    auto v = RandomSamples<T>(n, 40 + n);
    CNaxStatistics<T> stats(n, v.data());
    auto sorted = v;
    std::sort(sorted.begin(), sorted.end());
    const T expected = n % 2 ? sorted[n / 2] : (sorted[n / 2 - 1] + sorted[n / 2]) / T(2);
    EXPECT_EQ(stats.Median(), expected) << n;
  }
}

// The product sum is divided by n while the deviations use n - 1, so a perfect linear
// relation gives (n - 1) / n, and the regression slope is shrunk by the same factor.
TYPED_TEST(StatisticsTest, CorrelationAndRegressionKeepTheirMixedDenominators) {
  using T = TypeParam;
  const double tol = std::is_same_v<T, float> ? 2e-4 : 1e-10;
  const int n = 50;
  auto x = RandomSamples<T>(n, 1);
  auto noise = RandomSamples<T>(n, 2);
  std::vector<T> y(n);
  for (int k = 0; k < n; ++k) y[k] = T(3) * x[k] + T(1) + noise[k];
  const std::vector<double> dx(x.begin(), x.end()), dy(y.begin(), y.end());
  double cov = 0;
  for (int k = 0; k < n; ++k) cov += (dx[k] - MeanOf(dx)) * (dy[k] - MeanOf(dy));
  const double pearson = cov / std::sqrt(CentredVariance(dx) * CentredVariance(dy)) / (n - 1);
  const double shrink = (n - 1.0) / n;

  CNaxStatistics<T> stats(n, y.data());
  EXPECT_NEAR(stats.CorrelationCoefficient(n, x.data()), shrink * pearson, tol);
  // Only min(size, n) pairs are used, but the product sum is still divided by n.
  const int s = n / 2;
  CNaxStatistics<T> shorter(s, y.data());
  const std::vector<double> hx(dx.begin(), dx.begin() + s), hy(dy.begin(), dy.begin() + s);
  double products = 0;
  for (int k = 0; k < s; ++k) products += hx[k] * hy[k];
  EXPECT_NEAR(shorter.CorrelationCoefficient(n, x.data()),
              (products / n - MeanOf(hx) * MeanOf(hy)) /
                  std::sqrt(CentredVariance(hx) * CentredVariance(hy)),
              tol);
  T a = 0, b = 0;
  ASSERT_EQ(stats.LinearRegression(n, x.data(), 1, a, b), 1);  // y on x
  const double slope = shrink * cov / (n - 1) / CentredVariance(dx);
  EXPECT_NEAR(b, slope, tol * 10);
  EXPECT_NEAR(a, MeanOf(dy) - slope * MeanOf(dx), tol * 10);
  ASSERT_EQ(stats.LinearRegression(n, x.data(), 0, a, b), 1);  // x on y
  const double inverse = shrink * cov / (n - 1) / CentredVariance(dy);
  EXPECT_NEAR(b, inverse, tol);
  EXPECT_NEAR(a, MeanOf(dx) - inverse * MeanOf(dy), tol * 10);

  std::vector<T> flat(n, T(2)), flat2(n, T(-1));
  CNaxStatistics<T> flatStats(n, flat.data());
  EXPECT_EQ(flatStats.CorrelationCoefficient(n, flat2.data()), T(1));
  EXPECT_EQ(flatStats.CorrelationCoefficient(n, x.data()), T(0));
  EXPECT_EQ(stats.CorrelationCoefficient(n, flat.data()), T(0));
  a = T(7);
  b = T(8);
  EXPECT_EQ(stats.LinearRegression(n, flat.data(), 1, a, b), 0);
  EXPECT_EQ(a, T(7));
  EXPECT_EQ(b, T(8));
}

TYPED_TEST(StatisticsTest, IntervalsUseTheirTables) {
  using T = TypeParam;
  std::vector<T> v(25, T(0));
  CNaxStatistics<T> stats(25, v.data());
  const double meanZ[] = {1.645, 1.96, 2.58, 2.81, 2.58};
  const double varZ[] = {1.28, 1.645, 2.33, 2.58, 2.33};
  for (int level = 0; level < 5; ++level) {
    T low, high;
    stats.MeanConfidenceInterval(naxProbability(level), T(10), T(2), low, high);
    EXPECT_NEAR(low, 10 - meanZ[level] * 2 / 5.0, 1e-5);
    EXPECT_NEAR(high, 10 + meanZ[level] * 2 / 5.0, 1e-5);
    stats.VarianceConfidenceInterval(naxProbability(level), T(4), low, high);
    const double q = std::sqrt(47.0);
    EXPECT_NEAR(low, 96 / (0.5 * (q + varZ[level]) * (q + varZ[level])), 1e-5);
    EXPECT_NEAR(high, 96 / (0.5 * (q - varZ[level]) * (q - varZ[level])), 1e-5);
    EXPECT_LT(low, T(4));
    EXPECT_GT(high, T(4));
  }
  T low, high;
  stats.ChebyshevLimits(T(0.75), T(1), T(3), low, high);
  EXPECT_NEAR(low, -5, 1e-5);
  EXPECT_NEAR(high, 7, 1e-5);
  stats.ChebyshevLimits(T(1), T(0), T(1), low, high);
  EXPECT_EQ(high, T(1000));
}

TYPED_TEST(StatisticsTest, GaussIntegralFollowsItsThreeMethods) {
  using T = TypeParam;
  const auto exact = [](double x) { return 0.5 * std::erf(std::fabs(x) / std::sqrt(2.0)); };
  for (double x = -4; x <= 4; x += 0.05) {
    // Three exponentials: within 1e-4 everywhere (about 1e-5 in fact).
    EXPECT_NEAR(naxCalculateGaussIntegral(T(x), T(1e-4)), exact(x), 1e-4) << x;
    EXPECT_EQ(naxCalculateGaussIntegral(T(x), T(1e-4)), naxCalculateGaussIntegral(T(-x), T(1e-4)));
    // Cheap parabola.
    const T a = std::fabs(T(x));
    const double cheap = a <= T(2.2) ? 0.1 * a * (4.4 - a) : (a < T(2.6) ? 0.49 : 0.5);
    EXPECT_NEAR(naxCalculateGaussIntegral(T(x), T(0.01)), cheap, 1e-6) << x;
  }
  // The series below 1: the third term is added only above the accuracy.
  const double k = 0.3989422804014327;
  EXPECT_NEAR(naxCalculateGaussIntegral(T(0.1), T(1e-5)), (1 - 0.01 / 6) * 0.1 * k, 1e-7);
  EXPECT_NEAR(naxCalculateGaussIntegral(T(0.9), T(1e-6)),
              ((1 - 0.81 / 6) * 0.9 + 0.9 * 0.81 * 0.81 / 40) * k, 1e-6);
  EXPECT_NEAR(naxCalculateGaussIntegral(T(0.2), T(1e-6)), exact(0.2), 1e-6);
}

TYPED_TEST(StatisticsTest, NormalCurveGivesTheTailArea) {
  using T = TypeParam;
  EXPECT_NEAR(naxGetPointOnNormalCurveGivenParams(T(3), T(2), T(3)), 0.5, 1e-7);
  EXPECT_NEAR(naxGetPointOnNormalCurveGivenParams(T(3), T(2), T(1)), 0.158655, 1e-4);
  EXPECT_NEAR(naxGetPointOnNormalCurveGivenParams(T(3), T(2), T(7)), 0.0227501, 1e-4);
  EXPECT_EQ(naxGetPointOnNormalCurveGivenParams(T(3), T(2), T(1.5)),
            naxGetPointOnNormalCurveGivenParams(T(3), T(2), T(4.5)));
  EXPECT_EQ(naxGetPointOnNormalCurveGivenEdges(T(-1), T(5), T(0.5)),
            naxGetPointOnNormalCurveGivenParams(T(2), T(1), T(0.5)));
  T values[7];
  naxGetPointsOnNormalCurveGivenEdges(T(-1), T(5), 7, values);
  for (int k = 0; k < 7; ++k) {
    EXPECT_EQ(values[k], naxGetPointOnNormalCurveGivenEdges(T(-1), T(5), T(-1 + k)));
  }
  EXPECT_NEAR(values[0], 0.00135, 1e-4);  // three deviations out
}

TYPED_TEST(StatisticsTest, GaussWeightsAreBinomialExceptForThree) {
  using T = TypeParam;
  std::vector<double> pascal = {1};
  for (int size = 1; size <= 40; ++size) {
    std::vector<T> w(size);
    naxGetGaussWeights(size, w.data());
    double sum = 0;
    for (int k = 0; k < size; ++k) {
      sum += w[k];
      EXPECT_EQ(w[k], w[size - 1 - k]);
      if (size != 3) {
        EXPECT_NEAR(w[k], pascal[k] / std::pow(2.0, size - 1), 1e-6 * w[k]) << size << " " << k;
      }
    }
    EXPECT_NEAR(sum, 1.0, 1e-5);
    std::vector<double> next(size + 1, 1);
    for (int k = 1; k < size; ++k) next[k] = pascal[k - 1] + pascal[k];
    pascal = next;
  }
  T three[3];
  naxGetGaussWeights(3, three);
  EXPECT_EQ(three[0], T(0.1587));
  EXPECT_EQ(three[1], T(0.6826));
  T untouched = T(9);
  naxGetGaussWeights(0, &untouched);
  EXPECT_EQ(untouched, T(9));
}

// Direct evaluation from a copy of the originals, shrinking the window near the ends.
template <typename T>
std::vector<double> Filtered(const std::vector<T>& x, int window, bool gauss) {
  const int n = int(x.size());
  const int h = (window % 2 ? window : window + 1) / 2;
  std::vector<double> out(x.begin(), x.end());
  for (int p = 0; p < n; ++p) {
    const int r = std::min({p, n - 1 - p, h});
    std::vector<T> w(2 * r + 1, T(1) / T(2 * r + 1));
    if (gauss) naxGetGaussWeights(2 * r + 1, w.data());
    double s = 0;
    for (int t = -r; t <= r; ++t) s += w[t + r] * double(x[p + t]);
    out[p] = s;
  }
  return out;
}

TYPED_TEST(StatisticsTest, FiltersReadOnlyOriginalSamples) {
  using T = TypeParam;
  const double tol = std::is_same_v<T, float> ? 1e-5 : 1e-13;
  for (int gauss = 0; gauss < 2; ++gauss) {
    for (int window : {1, 2, 3, 4, 5, 8, 11, 40}) {
      for (int n : {1, 2, 3, 9, 100}) {
        auto original = RandomSamples<T>(n, 100 * window + n);
        auto v = original;
        CNaxStatistics<T> stats(n, v.data());
        if (gauss) {
          stats.GaussFiltering(window);
        } else {
          stats.AverageFiltering(window);
        }
        const auto expected = Filtered(original, window, gauss);
        for (int k = 0; k < n; ++k) ASSERT_NEAR(v[k], expected[k], tol) << window << " " << n;
        if (n > 0) {
          EXPECT_EQ(v[0], original[0]);
          EXPECT_EQ(v[n - 1], original[n - 1]);
        }
      }
    }
  }
  // GaussFiltering(4) acts as 5.
  auto a = RandomSamples<T>(30, 7), b = a;
  CNaxStatistics<T>(30, a.data()).GaussFiltering(4);
  CNaxStatistics<T>(30, b.data()).GaussFiltering(5);
  EXPECT_EQ(a, b);
}

TYPED_TEST(StatisticsTest, RangeFiltersSeeOnlyTheirRange) {
  using T = TypeParam;
  auto original = RandomSamples<T>(60, 3);
  for (int k = 0; k < 10; ++k) original[k] = original[59 - k] = T(1e6);  // must not leak in
  auto v = original;
  CNaxStatistics<T> stats(60, v.data());
  stats.AverageFiltering(7, 10, 49);
  const auto expected =
      Filtered(std::vector<T>(original.begin() + 10, original.begin() + 50), 7, false);
  for (int k = 0; k < 60; ++k) {
    if (k < 10 || k > 49) {
      EXPECT_EQ(v[k], original[k]);
    } else {
      EXPECT_NEAR(v[k], expected[k - 10], 1e-5);
    }
  }
}

}  // namespace

namespace {

TEST(NormalCurvePoints, VectorFormPairsPositionsWithValues) {
  double values[7];
  CNaxVector2<double> points[7];
  naxGetPointsOnNormalCurveGivenEdges(-3.0, 3.0, 7, values);
  naxGetPointsOnNormalCurveGivenEdges(-3.0, 3.0, 7, points);
  for (int32 k = 0; k < 7; ++k) {
    EXPECT_DOUBLE_EQ(points[k][0], -3.0 + k);
    EXPECT_EQ(points[k][1], values[k]);
  }
}

}  // namespace
