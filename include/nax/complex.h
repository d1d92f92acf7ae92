// Complex numbers with a cached trigonometric form, and the free routines on complex scalars.
//
// A CNaxComplex keeps its algebraic form (re, im) always and its trigonometric form
// (modulus, angle in degrees in [0, 360)) as a cache. Each number carries its own
// comparison precision, which starts at the default tolerance (1e-7f / 1e-9):
// assignment from a number closer than that precision leaves the target as it is,
// and operator== compares within it.
#ifndef NAX_COMPLEX_H
#define NAX_COMPLEX_H

#include <algorithm>
#include <cmath>

#include "nax/scalar.h"
#include "nax/types.h"

template <typename T>
class CNaxComplex;

namespace nax::detail {

template <typename T>
inline constexpr bool kIsComplex = false;
template <typename T>
inline constexpr bool kIsComplex<CNaxComplex<T>> = true;

template <typename T>
constexpr T Pi() {
  return T(3.14159265358979323846);
}

/// Reduces an angle in radians to the interval starting at -pi by subtracting 2 pi k,
/// with k the truncated (x + pi) / 2 pi, one less for a negative quotient that is not
/// within the default tolerance of an integer.
template <typename T>
inline T ReduceRadians(T x) {
  const T twoPi = T(2) * Pi<T>();
  const T q = (x + Pi<T>()) / twoPi;
  T k = std::trunc(q);
  if (q < T(0) && !InClosedTol(q - std::round(q), DefaultTol<T>())) k -= T(1);
  return x - twoPi * k;
}

/// Angle of (re, im) in degrees in [0, 360] from the arc cosine of re / modulus.
template <typename T>
inline T AngleDegreesOf(T re, T im, T modulus) {
  const T c = std::clamp(re / modulus, T(-1), T(1));
  const T degrees = std::acos(c) * T(180) / Pi<T>();
  return im < T(0) ? T(360) - degrees : degrees;
}

}  // namespace nax::detail

/// A complex number re + i im for T = float or double.
template <typename T>
class CNaxComplex {
  static_assert(nax::detail::kIsReal<T>, "CNaxComplex is instantiated for float and double only");

 public:
  /// Zero, with the default precision and no cached trigonometric form.
  CNaxComplex() : CNaxComplex(T(0), T(0)) {}
  /// re + i im.
  CNaxComplex(T re, T im)
      : re(re), im(im), magnitude(0), angle(0), precision(nax::detail::DefaultTol<T>()),
        trigCalculated(0) {}
  /// The real number re.
  CNaxComplex(T re) : CNaxComplex(re, T(0)) {}  // NOLINT: implicit by design
  /// Copies the value, the cached form if there is one, and the precision.
  CNaxComplex(const CNaxComplex& other) = default;

  /// New algebraic form; the cache is cleared and the precision kept.
  void Set(T newRe, T newIm) {
    re = newRe;
    im = newIm;
    ClearTrig();
  }

  /// Sets the number from its modulus and its angle in degrees (reduced to [0, 360)).
  void SetInTrigForm(T newMagnitude, T angleDegrees);

  T Real() const { return re; }
  T Imag() const { return im; }

  /// Modulus: the cached one if present; else 0 when precision^2 > re^2 + im^2, else the
  /// root of re^2 + im^2 with the dead zone below the default tolerance.
  T Magn() const {
    if (trigCalculated) return magnitude;
    const T s = re * re + im * im;
    if (precision * precision > s) return T(0);
    if (std::fabs(s) < nax::detail::DefaultTol<T>()) return T(0);
    return std::sqrt(s);
  }

  /// Squared modulus: the cached modulus squared, or re^2 + im^2.
  T SquareMagn() const { return trigCalculated ? magnitude * magnitude : re * re + im * im; }

  /// 1 when the imaginary part is within the default tolerance (closed interval).
  int32 IsReal() const { return nax::detail::InClosedTol(im, nax::detail::DefaultTol<T>()); }
  /// 1 when the real part is within the default tolerance (closed interval).
  int32 IsImag() const { return nax::detail::InClosedTol(re, nax::detail::DefaultTol<T>()); }

  T GetPrecision() const { return precision; }
  void SetPrecision(T value) { precision = value; }
  int32 IsTrigCalculated() const { return trigCalculated; }

  /// Angle in degrees in [0, 360); 0 for a zero modulus.
  T AngleInDegrees() const;
  /// Angle in radians: from the cache reduced to [-pi, pi), otherwise in [0, 2 pi).
  T AngleInRadians() const;

  /// Fills the cache: modulus and angle in degrees.
  void CalculateTrigonForm();
  /// Recomputes re and im from the cached modulus and angle.
  void CalculateAlgebrForm();

  CNaxComplex operator-() const { return CNaxComplex(-re, -im); }
  CNaxComplex operator+(const CNaxComplex& b) const { return CNaxComplex(re + b.re, im + b.im); }
  CNaxComplex operator-(const CNaxComplex& b) const { return CNaxComplex(re - b.re, im - b.im); }
  CNaxComplex operator*(const CNaxComplex& b) const {
    return CNaxComplex(re * b.re - im * b.im, re * b.im + im * b.re);
  }
  /// Quotient; both parts are 3.4028234663852886e38 when |b|^2 is below the default tolerance.
  CNaxComplex operator/(const CNaxComplex& b) const;
  CNaxComplex operator+(T value) const { return CNaxComplex(re + value, im); }
  CNaxComplex operator-(T value) const { return CNaxComplex(re - value, im); }
  CNaxComplex operator*(T value) const { return CNaxComplex(re * value, im * value); }
  /// Quotient; both parts are the pseudo-infinity when |value| <= the default tolerance.
  CNaxComplex operator/(T value) const;

  CNaxComplex& operator+=(const CNaxComplex& b) { return Update(*this + b); }
  CNaxComplex& operator-=(const CNaxComplex& b) { return Update(*this - b); }
  CNaxComplex& operator*=(const CNaxComplex& b) { return Update(*this * b); }
  CNaxComplex& operator/=(const CNaxComplex& b) { return Update(*this / b); }
  CNaxComplex& operator+=(T value) { return Update(*this + value); }
  CNaxComplex& operator-=(T value) { return Update(*this - value); }
  CNaxComplex& operator*=(T value) { return Update(*this * value); }
  CNaxComplex& operator/=(T value) { return Update(*this / value); }

  /// Takes other's value (and cached form) unless the two are within this number's
  /// precision, in which case nothing at all is assigned. The precision is kept.
  CNaxComplex& operator=(const CNaxComplex& other);
  /// Becomes the real number value, with its trigonometric form set at once.
  CNaxComplex& operator=(const T& value);

  /// 1 when the distance to other is below this number's precision, strictly.
  int32 operator==(const CNaxComplex& other) const {
    return nax::detail::SafeRoot(DistanceSquared(other)) < precision;
  }
  int32 operator!=(const CNaxComplex& other) const { return !(*this == other); }

  /// 1 / this, guarded as operator/.
  CNaxComplex Invert() const { return CNaxComplex(T(1), T(0)) / *this; }
  CNaxComplex Conjugate() const { return CNaxComplex(re, -im); }
  CNaxComplex Round() const { return CNaxComplex(std::round(re), std::round(im)); }
  CNaxComplex Ceil() const { return CNaxComplex(std::ceil(re), std::ceil(im)); }
  CNaxComplex Floor() const { return CNaxComplex(std::floor(re), std::floor(im)); }

  /// Integer power through the trigonometric form; this^0 is 1, a zero base gives 0 for
  /// n > 0 and the pseudo-infinity for n < 0.
  CNaxComplex Power(int32 n) const;
  /// Writes the n roots of order n (angles (angle + 360 k) / n); 1 on success, 0 for n < 1.
  int32 Roots(int32 n, CNaxComplex* roots) const;

 private:
  T DistanceSquared(const CNaxComplex& other) const {
    const T dr = re - other.re, di = im - other.im;
    return dr * dr + di * di;
  }
  void ClearTrig() {
    magnitude = T(0);
    angle = T(0);
    trigCalculated = 0;
  }
  void SetAlgebraicFromTrig() {
    const T radians = nax::detail::ReduceRadians(angle * nax::detail::Pi<T>() / T(180));
    re = magnitude * std::cos(radians);
    im = magnitude * std::sin(radians);
  }
  // Compound operators keep the cache only when the value does not change.
  CNaxComplex& Update(const CNaxComplex& result) {
    if (result.re != re || result.im != im) {
      re = result.re;
      im = result.im;
      ClearTrig();
    }
    return *this;
  }

  T re;
  T im;
  T magnitude;
  T angle;
  T precision;
  int32 trigCalculated;
};

template <typename T>
void CNaxComplex<T>::SetInTrigForm(T newMagnitude, T angleDegrees) {
  magnitude = newMagnitude;
  if (angleDegrees < T(0)) angleDegrees += T(360) * (std::trunc(-angleDegrees / T(360)) + T(1));
  if (angleDegrees >= T(360)) angleDegrees -= T(360) * std::trunc(angleDegrees / T(360));
  angle = angleDegrees;
  trigCalculated = 1;
  SetAlgebraicFromTrig();
}

template <typename T>
T CNaxComplex<T>::AngleInDegrees() const {
  if (trigCalculated) return angle;
  const T modulus = nax::detail::SafeRoot(re * re + im * im);
  if (nax::detail::InClosedTol(modulus, nax::detail::DefaultTol<T>())) return T(0);
  return nax::detail::AngleDegreesOf(re, im, modulus);
}

template <typename T>
T CNaxComplex<T>::AngleInRadians() const {
  using nax::detail::Pi;
  if (trigCalculated) return nax::detail::ReduceRadians(angle * Pi<T>() / T(180));
  const T modulus = nax::detail::SafeRoot(re * re + im * im);
  if (nax::detail::InClosedTol(modulus, nax::detail::DefaultTol<T>())) return T(0);
  const T radians = std::acos(std::clamp(re / modulus, T(-1), T(1)));
  return im < T(0) ? T(2) * Pi<T>() - radians : radians;
}

template <typename T>
void CNaxComplex<T>::CalculateTrigonForm() {
  const T s = re * re + im * im;
  if (nax::detail::InClosedTol(s, nax::detail::DefaultTol<T>())) {
    magnitude = T(0);
    angle = T(0);
  } else {
    magnitude = nax::detail::SafeRoot(s);
    angle = nax::detail::AngleDegreesOf(re, im, magnitude);
  }
  trigCalculated = 1;
}

template <typename T>
void CNaxComplex<T>::CalculateAlgebrForm() {
  SetAlgebraicFromTrig();
}

template <typename T>
CNaxComplex<T> CNaxComplex<T>::operator/(const CNaxComplex& b) const {
  const T s = b.trigCalculated ? b.magnitude * b.magnitude : b.re * b.re + b.im * b.im;
  if (s < nax::detail::DefaultTol<T>()) {
    const T inf = nax::detail::PseudoInfinity<T>();
    return CNaxComplex(inf, inf);
  }
  return CNaxComplex((re * b.re + im * b.im) / s, (im * b.re - re * b.im) / s);
}

template <typename T>
CNaxComplex<T> CNaxComplex<T>::operator/(T value) const {
  if (nax::detail::InClosedTol(value, nax::detail::DefaultTol<T>())) {
    const T inf = nax::detail::PseudoInfinity<T>();
    return CNaxComplex(inf, inf);
  }
  return CNaxComplex(re / value, im / value);
}

template <typename T>
CNaxComplex<T>& CNaxComplex<T>::operator=(const CNaxComplex& other) {
  if (this == &other) return *this;
  if (nax::detail::SafeRoot(DistanceSquared(other)) <= precision) return *this;
  re = other.re;
  im = other.im;
  magnitude = other.trigCalculated ? other.magnitude : T(0);
  angle = other.trigCalculated ? other.angle : T(0);
  trigCalculated = other.trigCalculated;
  return *this;
}

template <typename T>
CNaxComplex<T>& CNaxComplex<T>::operator=(const T& value) {
  if (nax::detail::InClosedTol(im, nax::detail::DefaultTol<T>()) && re == value) return *this;
  re = value;
  im = T(0);
  magnitude = std::fabs(value);
  angle = value >= T(0) ? T(0) : T(180);
  trigCalculated = 1;
  return *this;
}

template <typename T>
CNaxComplex<T> CNaxComplex<T>::Power(int32 n) const {
  if (n == 0) return CNaxComplex(T(1), T(0));
  const T modulus = Magn();
  if (modulus == T(0)) {
    const T zero = n > 0 ? T(0) : nax::detail::PseudoInfinity<T>();
    return CNaxComplex(zero, zero);
  }
  CNaxComplex result;
  result.SetInTrigForm(std::pow(modulus, T(n)), AngleInDegrees() * T(n));
  return result;
}

template <typename T>
int32 CNaxComplex<T>::Roots(int32 n, CNaxComplex* roots) const {
  if (n < 1) return 0;
  const T modulus = std::pow(Magn(), T(1) / T(n));
  const T base = AngleInDegrees();
  for (int32 k = 0; k < n; ++k) roots[k].SetInTrigForm(modulus, (base + T(360) * T(k)) / T(n));
  return 1;
}

// ---------------------------------------------------------------------------------------------
// Free routines on complex scalars.

/// Modulus by the safe root of re^2 + im^2 (0 below the floors); ignores the cache and the
/// number's precision.
template <typename T>
inline T naxAbs(const CNaxComplex<T>& value) {
  return nax::detail::SafeRoot(value.Real() * value.Real() + value.Imag() * value.Imag());
}

/// The larger Magn of two numbers.
template <typename T>
inline T naxAbsMax(CNaxComplex<T> a, CNaxComplex<T> b) {
  const T ma = a.Magn(), mb = b.Magn();
  return mb > ma ? mb : ma;
}

/// The largest Magn of three numbers.
template <typename T>
inline T naxAbsMax(CNaxComplex<T> a, CNaxComplex<T> b, CNaxComplex<T> c) {
  T result = c.Magn();
  if (b.Magn() > result) result = b.Magn();
  if (a.Magn() > result) result = a.Magn();
  return result;
}

/// The smaller Magn of two numbers.
template <typename T>
inline T naxAbsMin(CNaxComplex<T> a, CNaxComplex<T> b) {
  const T ma = a.Magn(), mb = b.Magn();
  return mb < ma ? mb : ma;
}

/// The smallest Magn of three numbers.
template <typename T>
inline T naxAbsMin(CNaxComplex<T> a, CNaxComplex<T> b, CNaxComplex<T> c) {
  T result = c.Magn();
  if (b.Magn() < result) result = b.Magn();
  if (a.Magn() < result) result = a.Magn();
  return result;
}

/// Largest Magn of values[0..n) and the index of its first occurrence; n must be >= 1.
template <typename T>
void naxAbsMaxInArray(int32 n, const CNaxComplex<T>* values, T& result, int32& index) {
  result = values[0].Magn();
  index = 0;
  for (int32 i = 1; i < n; ++i) {
    const T m = values[i].Magn();
    if (m > result) {
      result = m;
      index = i;
    }
  }
}

/// Smallest Magn of values[0..n) and the index of its first occurrence; n must be >= 1.
template <typename T>
void naxAbsMinInArray(int32 n, const CNaxComplex<T>* values, T& result, int32& index) {
  result = values[0].Magn();
  index = 0;
  for (int32 i = 1; i < n; ++i) {
    const T m = values[i].Magn();
    if (m < result) {
      result = m;
      index = i;
    }
  }
}

/// 1 if Magn is below tol, strictly.
template <typename T>
inline int32 naxIsAlmostZero(const CNaxComplex<T>& value, T tol) {
  return value.Magn() < tol;
}

/// 1 if Magn is below the default tolerance, strictly.
template <typename T>
inline int32 naxIsAlmostZero(const CNaxComplex<T>& value) {
  return naxIsAlmostZero(value, nax::detail::DefaultTol<T>());
}

/// 1 if the safe root of the squared distance is below tol, strictly; a non-positive tol
/// makes even identical numbers different.
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxComplex<T>& a, const CNaxComplex<T>& b, T tol) {
  const T dr = a.Real() - b.Real(), di = a.Imag() - b.Imag();
  return nax::detail::SafeRoot(dr * dr + di * di) < tol;
}

/// naxAreAlmostEqual with the default tolerance: in effect |a - b|^2 < 1e-7f / 1e-9.
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxComplex<T>& a, const CNaxComplex<T>& b) {
  return naxAreAlmostEqual(a, b, nax::detail::DefaultTol<T>());
}

#define NAX_COMPLEX_EXTERN(T)                                                                 \
  extern template class CNaxComplex<T>;                                                       \
  extern template void naxAbsMaxInArray<T>(int32, const CNaxComplex<T>*, T&, int32&);         \
  extern template void naxAbsMinInArray<T>(int32, const CNaxComplex<T>*, T&, int32&);
NAX_COMPLEX_EXTERN(float)
NAX_COMPLEX_EXTERN(double)
#undef NAX_COMPLEX_EXTERN

#endif  // NAX_COMPLEX_H
