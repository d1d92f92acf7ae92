// Descriptive statistics of a sample array: moments, median, correlation, linear
// regression, confidence intervals, moving average and Gaussian filters; and the normal
// integral by short approximations, with the binomial weights of the Gaussian filter.
//
// The normal integral over [0, a] is taken by its series a - a^3/6 + a^5/40 for small a,
// and otherwise through the approximation of the error function by three exponentials
// erf(a / sqrt 2)^2 ~ 1 - (7 e^(-a^2/2) + (7 + pi a^2/4) e^(-a^2) + 16 e^(-(2 - sqrt 2) a^2)) / 30,
// good to about 1e-5 over the whole line.
#ifndef NAX_STATISTICS_H
#define NAX_STATISTICS_H

#include <algorithm>
#include <cmath>
#include <memory>

#include "nax/scalar.h"
#include "nax/sorting.h"
#include "nax/types.h"
#include "nax/vector2.h"

/// Confidence level of an interval; any value other than 0, 1 and 3 acts as 99 %.
enum naxProbability {
  naxProbability90 = 0,   ///< 90 %
  naxProbability95 = 1,   ///< 95 %
  naxProbability99 = 2,   ///< 99 %
  naxProbability995 = 3   ///< 99.5 %
};

namespace nax::detail {

/// Sample mean and variance (sum x^2 - n m^2) / (n - 1) of n values.
template <typename T>
struct SampleMoments {
  T mean;
  T variance;
};

template <typename T>
inline SampleMoments<T> MomentsOf(int32 n, const T* x) {
  T sum = T(0);
  for (int32 k = 0; k < n; ++k) sum += x[k];
  const T mean = sum / T(n);
  T squares = T(0);
  for (int32 k = 0; k < n; ++k) squares += x[k] * x[k];
  return {mean, (squares - T(n) * mean * mean) / T(n - 1)};
}

/// Standard deviation from a variance: 0 below 1e-6, else the guarded square root.
template <typename T>
inline T DeviationOf(T variance) {
  return variance < T(1e-6) ? T(0) : SafeRoot(variance);
}

/// Sum of the products of the first n pairs.
template <typename T>
inline T ProductSum(int32 n, const T* x, const T* y) {
  T sum = T(0);
  for (int32 k = 0; k < n; ++k) sum += x[k] * y[k];
  return sum;
}

/// 1 / sqrt(2 pi), the peak of the standard normal density.
template <typename T>
constexpr T InvSqrtTwoPi() {
  return T(0.3989422804014327);
}

/// Integral of the standard normal density over [0, a] by its series: the first two
/// terms, with the third added when it exceeds `limit`.
template <typename T>
inline T GaussIntegralSeries(T a, T limit) {
  const T q = a * a;
  const T p = (T(1) - q / T(6)) * a;
  const T c = a * q * q / T(40);
  return std::fabs(c) <= limit ? p * InvSqrtTwoPi<T>() : (p + c) * InvSqrtTwoPi<T>();
}

/// Integral of the standard normal density over [0, a] by three exponentials.
template <typename T>
inline T GaussIntegralExponential(T a) {
  const T q = a * a;
  const T e1 = std::exp(T(-0.5) * q);
  const T e2 = std::exp(-q);
  const T e3 = std::exp(T(-0.5857864376269049) * q);
  const T r = (T(7) * e1 + (T(7) + T(0.7853981633974483) * q) * e2 + T(16) * e3) / T(30);
  const T rest = T(1) - r;
  return T(0.5) * std::sqrt(rest > T(0) ? rest : T(0));
}

/// Series limit of the normal-curve routines: 1e-6 / (1 / sqrt(2 pi)).
template <typename T>
constexpr T NormalCurveSeriesLimit() {
  return std::is_same_v<T, float> ? T(2.506628e-6f) : T(2.5066282746310003e-6);
}

/// Binomial coefficient C(n, k) in floating point: 1, n and n (n - 1) / 2 near the ends,
/// else the product of (n + 1 - i) / i for i from 2 to k.
template <typename T>
inline T Binomial(T n, T k) {
  const T fromEnd = std::fmin(std::fabs(k), std::fabs(n - k));
  if (fromEnd < T(0.5)) return T(1);
  if (fromEnd < T(1.5)) return n;
  if (fromEnd < T(2.5)) return n * (n - T(1)) / T(2);
  T c = n;
  for (int32 i = 2; T(i) < k + T(0.5); ++i) c = (n + T(1) - T(i)) * c / T(i);
  return c;
}

/// Replaces x[0..n) by its moving weighted mean over windows of 2h + 1 samples (h =
/// window / 2 after making the window odd), shrunk symmetrically near the ends so that
/// element k uses 2 min(k, n - 1 - k, h) + 1 samples; the end elements stay. Results
/// wait in a ring of h + 1 values so that every window reads original samples.
/// `weightsOf(m, w)` writes the m weights of a window of m samples.
template <typename T, typename WeightsOf>
void MovingFilter(T* x, int32 n, int32 window, WeightsOf weightsOf) {
  if (window % 2 == 0) ++window;
  const int32 h = window / 2;
  if (h < 1 || n < 3) return;
  std::unique_ptr<T[]> buffer(new T[3 * h + 2]);
  T* pending = buffer.get();
  T* weights = pending + h + 1;
  int32 radius = -1;
  for (int32 p = 0; p < n; ++p) {
    const int32 r = std::min(std::min(p, n - 1 - p), h);
    if (r != radius) {
      radius = r;
      weightsOf(2 * r + 1, weights);
    }
    T sum = T(0);
    const T* centred = x + p - r;
    for (int32 t = 0; t <= 2 * r; ++t) sum += weights[t] * centred[t];
    pending[p % (h + 1)] = r == 0 ? x[p] : sum;
    if (p >= h) x[p - h] = pending[(p - h) % (h + 1)];
  }
  for (int32 q = std::max(0, n - h); q < n; ++q) x[q] = pending[q % (h + 1)];
}

/// Calls emit(k, x, value) for `size` equidistant x from low to high with the tail area
/// of the normal law whose six deviations span [low, high].
template <typename T, typename Emit>
void NormalCurvePoints(T low, T high, int32 size, Emit emit);

}  // namespace nax::detail

/// Integral of the standard normal density from 0 to |x|. `accuracy` chooses the method:
/// below 5e-5 and |x| < 1 a series whose third term is added when it exceeds `accuracy`;
/// above 0.005 a cheap parabola (0.1 a (4.4 - a) up to 2.2, then 0.49, then 0.5 from 2.6);
/// otherwise an approximation by three exponentials.
template <typename T>
T naxCalculateGaussIntegral(T x, T accuracy) {
  static_assert(nax::detail::kIsReal<T>, "naxCalculateGaussIntegral: float or double only");
  const T a = std::fabs(x);
  if (accuracy < T(5e-5) && a < T(1)) {
    return nax::detail::GaussIntegralSeries(a, accuracy / nax::detail::InvSqrtTwoPi<T>());
  }
  if (accuracy > T(0.005)) {
    if (a <= T(2.2)) return T(0.1) * a * (T(4.4) - a);
    return a < T(2.6) ? T(0.49) : T(0.5);
  }
  return nax::detail::GaussIntegralExponential(a);
}

/// Weights of a window of `size` samples: the binomial weights C(size - 1, k) / 2^(size - 1),
/// except for size 3, which gives the normal masses 0.1587, 0.6826, 0.1587. Nothing is
/// written for a size under 1.
template <typename T>
void naxGetGaussWeights(int32 size, T* weights) {
  static_assert(nax::detail::kIsReal<T>, "naxGetGaussWeights: float or double only");
  if (size < 1) return;
  if (size == 3) {
    weights[0] = weights[2] = T(0.1587);
    weights[1] = T(0.6826);
    return;
  }
  const T n = T(size - 1);
  const T end = std::pow(T(0.5), n);
  weights[0] = weights[size - 1] = end;
  if (size < 10) {
    for (int32 k = 1; k < size - 1; ++k) weights[k] = nax::detail::Binomial(n, T(k)) * end;
    return;
  }
  weights[1] = weights[size - 2] = n * end;
  for (int32 k = 2; k <= (size - 1) / 2; ++k) {
    weights[k] = weights[size - 1 - k] = nax::detail::Binomial(n, T(k)) * end;
  }
}

/// Tail area of the normal law with the given mean and deviation beyond x: 0.5 minus the
/// integral from the mean to x, the same on both sides of the mean (not the signed
/// distribution function).
template <typename T>
T naxGetPointOnNormalCurveGivenParams(T mean, T deviation, T x) {
  static_assert(nax::detail::kIsReal<T>, "naxGetPointOnNormalCurve: float or double only");
  const T a = std::fabs(x - mean) / deviation;
  const T integral = a < T(1) ? nax::detail::GaussIntegralSeries(
                                    a, nax::detail::NormalCurveSeriesLimit<T>())
                              : nax::detail::GaussIntegralExponential(a);
  return T(0.5) - integral;
}

/// The same with mean (low + high) / 2 and deviation (high - low) / 6: the range spans
/// six deviations.
template <typename T>
T naxGetPointOnNormalCurveGivenEdges(T low, T high, T x) {
  return naxGetPointOnNormalCurveGivenParams((low + high) / T(2), (high - low) / T(6), x);
}

/// Values of naxGetPointOnNormalCurveGivenEdges at `size` equidistant points from low
/// to high, both included.
template <typename T>
void naxGetPointsOnNormalCurveGivenEdges(T low, T high, int32 size, T* values) {
  nax::detail::NormalCurvePoints(low, high, size,
                                 [values](int32 k, T, T value) { values[k] = value; });
}

/// The same points as (x, value) pairs.
template <typename T>
void naxGetPointsOnNormalCurveGivenEdges(T low, T high, int32 size, CNaxVector2<T>* points) {
  nax::detail::NormalCurvePoints(low, high, size, [points](int32 k, T x, T value) {
    points[k][0] = x;
    points[k][1] = value;
  });
}

template <typename T, typename Emit>
void nax::detail::NormalCurvePoints(T low, T high, int32 size, Emit emit) {
  const T step = size > 1 ? (high - low) / T(size - 1) : T(0);
  for (int32 k = 0; k < size; ++k) {
    const T x = low + T(k) * step;
    emit(k, x, naxGetPointOnNormalCurveGivenEdges(low, high, x));
  }
}

/// Statistics of `size` samples held by the caller: the object is a view and owns nothing.
/// The filters overwrite the caller's samples.
template <typename T>
class CNaxStatistics {
  static_assert(nax::detail::kIsReal<T>,
                "CNaxStatistics is instantiated for float and double only");

 public:
  /// No samples.
  CNaxStatistics() = default;
  /// A view on n samples.
  CNaxStatistics(int32 n, T* samples) : size(n), data(samples) {}
  /// A view on n samples.
  void SetData(int32 n, T* samples) {
    size = n;
    data = samples;
  }
  /// Changes the number of samples only.
  void SetSize(int32 n) { size = n; }

  /// Sum / size (0 / 0 for no samples).
  T Mean() const { return nax::detail::MomentsOf(size, data).mean; }
  /// Sample variance (sum x^2 - size m^2) / (size - 1), not clamped at 0.
  T Variance() const { return nax::detail::MomentsOf(size, data).variance; }
  /// Sample variance about a known mean, by the same formula.
  T Variance(T mean) const;
  /// Square root of Variance(); 0 when that is below 1e-6.
  T StandardDeviation() const { return nax::detail::DeviationOf(Variance()); }
  /// Square root of Variance(mean); 0 when that is below 1e-6.
  T StandardDeviation(T mean) const { return nax::detail::DeviationOf(Variance(mean)); }
  /// Middle element of a sorted copy, or the mean of the two middle ones; 0 for no samples.
  T Median() const;
  /// Sum of squares; 0 for no samples.
  T Momentum2() const { return nax::detail::ProductSum(size, data, data); }
  /// Sum of the products of the first n pairs of samples and `other`; 0 when n < 1.
  T MixMomentum(int32 n, const T* other) const { return nax::detail::ProductSum(n, data, other); }
  /// Correlation with `other` over the first min(size, n) pairs: (sum of products / n -
  /// mean1 mean2) / (d1 d2), the deviations taken with n - 1. Both deviations under 1e-6
  /// give 1, one of them 0.
  T CorrelationCoefficient(int32 n, T* other);
  /// Fits dependent = a + b explanatory over the first min(size, n) pairs; `other` is the
  /// explanatory variable when `direct` is non-zero, else the samples are. b = (sum of
  /// products / n - mean1 mean2) / variance. Returns 0 (a, b untouched) when the
  /// explanatory variance is below 1e-6, else 1.
  int32 LinearRegression(int32 n, T* other, int32 direct, T& a, T& b);
  /// mean -+ z deviation / sqrt(size), z = 1.645, 1.96, 2.58, 2.81 for 90 to 99.5 %.
  void MeanConfidenceInterval(naxProbability level, T mean, T deviation, T& low, T& high) const;
  /// Interval of the variance by the normal approximation of chi-square:
  /// variance (size - 1) / (0.5 (sqrt(2 size - 3) +- z)^2), z = 1.28, 1.645, 2.33, 2.58.
  void VarianceConfidenceInterval(naxProbability level, T variance, T& low, T& high) const;
  /// mean -+ k deviation with k = sqrt(1 / (1 - probability)), or 1000 for a probability
  /// above 0.999999: the bounds of Chebyshev's inequality.
  void ChebyshevLimits(T probability, T mean, T deviation, T& low, T& high) const;

  /// Moving mean over windows of `window` samples (made odd), in place.
  void AverageFiltering(int32 window) const { AverageFiltering(window, 0, size - 1); }
  /// Moving mean of samples first..last only, which is all the filter sees.
  void AverageFiltering(int32 window, int32 first, int32 last) const;
  /// Moving binomial-weighted mean over windows of `window` samples (made odd), in place.
  void GaussFiltering(int32 window) const { GaussFiltering(window, 0, size - 1); }
  /// Moving binomial-weighted mean of samples first..last only.
  void GaussFiltering(int32 window, int32 first, int32 last) const;

 private:
  int32 size = 0;
  T* data = nullptr;
};

template <typename T>
T CNaxStatistics<T>::Variance(T mean) const {
  const T squares = nax::detail::ProductSum(size, data, data);
  return (squares - T(size) * mean * mean) / T(size - 1);
}

template <typename T>
T CNaxStatistics<T>::Median() const {
  if (size < 1) return T(0);
  std::unique_ptr<T[]> copy(new T[size]);
  CNaxSorting<T> sorting(size, data, 1, 1, 0);
  sorting.Sort(copy.get());
  const int32 middle = (size - 1) / 2;
  return size % 2 ? copy[middle] : (copy[middle] + copy[middle + 1]) / T(2);
}

template <typename T>
T CNaxStatistics<T>::CorrelationCoefficient(int32 n, T* other) {
  const int32 s = std::min(size, n);
  const auto m1 = nax::detail::MomentsOf(s, data);
  const auto m2 = nax::detail::MomentsOf(s, other);
  const T d1 = nax::detail::DeviationOf(m1.variance);
  const T d2 = nax::detail::DeviationOf(m2.variance);
  const bool flat1 = d1 < T(1e-6);
  const bool flat2 = d2 < T(1e-6);
  if (flat1 && flat2) return T(1);
  if (flat1 || flat2) return T(0);
  const T products = nax::detail::ProductSum(s, data, other);
  return (products / T(n) - m1.mean * m2.mean) / (d1 * d2);
}

template <typename T>
int32 CNaxStatistics<T>::LinearRegression(int32 n, T* other, int32 direct, T& a, T& b) {
  const int32 s = std::min(size, n);
  const T* x = direct ? other : data;
  const T* y = direct ? data : other;
  const auto mx = nax::detail::MomentsOf(s, x);
  if (mx.variance < T(1e-6)) return 0;
  const auto my = nax::detail::MomentsOf(s, y);
  b = (nax::detail::ProductSum(s, x, y) / T(n) - mx.mean * my.mean) / mx.variance;
  a = my.mean - b * mx.mean;
  return 1;
}

template <typename T>
void CNaxStatistics<T>::MeanConfidenceInterval(naxProbability level, T mean, T deviation,
                                               T& low, T& high) const {
  const T z = level == naxProbability90    ? T(1.645)
              : level == naxProbability95  ? T(1.96)
              : level == naxProbability995 ? T(2.81)
                                           : T(2.58);
  const T w = z * deviation / std::sqrt(T(size));
  low = mean - w;
  high = mean + w;
}

template <typename T>
void CNaxStatistics<T>::VarianceConfidenceInterval(naxProbability level, T variance, T& low,
                                                   T& high) const {
  const T z = level == naxProbability90    ? T(1.28)
              : level == naxProbability95  ? T(1.645)
              : level == naxProbability995 ? T(2.58)
                                           : T(2.33);
  const T q = std::sqrt(T(2 * size - 3));
  const T s = variance * T(size - 1);
  low = s / (T(0.5) * (q + z) * (q + z));
  high = s / (T(0.5) * (q - z) * (q - z));
}

template <typename T>
void CNaxStatistics<T>::ChebyshevLimits(T probability, T mean, T deviation, T& low,
                                        T& high) const {
  const T k = probability > T(0.999999) ? T(1000) : std::sqrt(T(1) / (T(1) - probability));
  low = mean - k * deviation;
  high = mean + k * deviation;
}

template <typename T>
void CNaxStatistics<T>::AverageFiltering(int32 window, int32 first, int32 last) const {
  if (first < 0 || last >= size || first > last) return;
  nax::detail::MovingFilter(data + first, last - first + 1, window, [](int32 m, T* w) {
    for (int32 k = 0; k < m; ++k) w[k] = T(1) / T(m);
  });
}

template <typename T>
void CNaxStatistics<T>::GaussFiltering(int32 window, int32 first, int32 last) const {
  if (first < 0 || last >= size || first > last) return;
  nax::detail::MovingFilter(data + first, last - first + 1, window,
                            [](int32 m, T* w) { naxGetGaussWeights(m, w); });
}

#define NAX_STATISTICS_DECLARE(T)                                                    \
  extern template class CNaxStatistics<T>;                                           \
  extern template T naxCalculateGaussIntegral<T>(T, T);                              \
  extern template void naxGetGaussWeights<T>(int32, T*);                             \
  extern template T naxGetPointOnNormalCurveGivenParams<T>(T, T, T);                 \
  extern template T naxGetPointOnNormalCurveGivenEdges<T>(T, T, T);                  \
  extern template void naxGetPointsOnNormalCurveGivenEdges<T>(T, T, int32, T*);           \
  extern template void naxGetPointsOnNormalCurveGivenEdges<T>(T, T, int32, CNaxVector2<T>*);
NAX_STATISTICS_DECLARE(float)
NAX_STATISTICS_DECLARE(double)
#undef NAX_STATISTICS_DECLARE

#endif  // NAX_STATISTICS_H
