// The two-component vector of plane geometry: components held inline, no virtual table,
// no heap.
//
// Lengths go through the safe root, so a vector shorter than about 3.2e-5 (double) or
// 3.2e-4 (float) has length exactly 0 and cannot be normalised.
#ifndef NAX_VECTOR2_H
#define NAX_VECTOR2_H

#include <cmath>
#include <type_traits>

#include "nax/algebra.h"
#include "nax/detail/fixed_common.h"
#include "nax/vector_n.h"

/// A vector (x, y) of float or double.
template <typename T>
class CNaxVector2 {
  static_assert(nax::detail::kIsReal<T>, "CNaxVector2 is instantiated for float and double only");

 public:
  T x, y;

  /// Zeros.
  CNaxVector2() : x(0), y(0) {}
  /// Zeros: the integer argument deliberately has no effect.
  explicit CNaxVector2(int32 /*ignored*/) : x(0), y(0) {}
  /// Every component value.
  explicit CNaxVector2(T value) : x(value), y(value) {}
  /// Every component value, from the other floating type.
  template <typename U, typename = std::enable_if_t<std::is_floating_point_v<U> && !std::is_same_v<U, T>>>
  explicit CNaxVector2(U value) : x(T(value)), y(T(value)) {}
  CNaxVector2(T x, T y) : x(x), y(y) {}
  /// The first two elements of source.
  explicit CNaxVector2(const T* source) : x(source[0]), y(source[1]) {}
  /// The first two components of v; its dimension is not measured.
  explicit CNaxVector2(const CNaxVectorN<T>& v) : x(v[0]), y(v[1]) {}
  CNaxVector2(const CNaxVector2&) = default;

  CNaxVector2& operator=(const CNaxVector2&) = default;
  /// Takes the first two components of v.
  CNaxVector2& operator=(const CNaxVectorN<T>& v) {
    x = v[0], y = v[1];
    return *this;
  }

  /// Component i (0, 1), not range-tested.
  T& operator[](int32 i) { return i == 0 ? x : y; }
  const T& operator[](int32 i) const { return i == 0 ? x : y; }
  int32 Dim() const { return 2; }

  void Fill(T newX, T newY) { x = newX, y = newY; }
  void Fill(const T* source) { x = source[0], y = source[1]; }
  void Dump(T* target) const { target[0] = x, target[1] = y; }

  void Add(const CNaxVector2& v) { x += v.x, y += v.y; }
  void Sub(const CNaxVector2& v) { x -= v.x, y -= v.y; }
  void Mul(T value) { x *= value, y *= value; }
  /// Divides by value, unguarded.
  void Div(T value) { x /= value, y /= value; }
  CNaxVector2& operator+=(const CNaxVector2& v) { return Add(v), *this; }
  CNaxVector2& operator-=(const CNaxVector2& v) { return Sub(v), *this; }
  CNaxVector2& operator*=(T value) { return Mul(value), *this; }
  CNaxVector2& operator/=(T value) { return Div(value), *this; }
  CNaxVector2 operator+(const CNaxVector2& v) const { return CNaxVector2(x + v.x, y + v.y); }
  CNaxVector2 operator-(const CNaxVector2& v) const { return CNaxVector2(x - v.x, y - v.y); }
  CNaxVector2 operator*(T value) const { return CNaxVector2(x * value, y * value); }
  CNaxVector2 operator/(T value) const { return CNaxVector2(x / value, y / value); }
  CNaxVector2 operator-() const { return CNaxVector2(-x, -y); }
  /// A new vector of the negated components; this one stays as it is.
  CNaxVector2 Negate() const { return CNaxVector2(-x, -y); }
  T Dot(const CNaxVector2& v) const { return x * v.x + y * v.y; }

  /// Euclidean length by the safe root.
  T Length() const { return nax::detail::SafeRoot(SquareLength()); }
  T NormEuclidean() const { return Length(); }
  T SquareLength() const { return x * x + y * y; }
  T Norm1() const { return std::fabs(x) + std::fabs(y); }
  T NormInf() const { return nax::detail::Max2(std::fabs(x), std::fabs(y)); }
  /// Scales to unit length and returns 1, or returns 0 with no change when the safe length
  /// is below the default tolerance.
  int32 Normalize() {
    const T length = Length();
    if (length < nax::detail::DefaultTol<T>()) return 0;
    Mul(T(1) / length);
    return 1;
  }

  /// Largest component, or largest absolute value when useAbs is not 0.
  T GetMaxComponent(int32 useAbs) const { return Pick(GetIndexOfMaxComponent(useAbs), useAbs); }
  /// Smallest component, or smallest absolute value when useAbs is not 0.
  T GetMinComponent(int32 useAbs) const { return Pick(GetIndexOfMinComponent(useAbs), useAbs); }
  /// Index of the first largest component.
  int32 GetIndexOfMaxComponent(int32 useAbs) const { return Pick(1, useAbs) > Pick(0, useAbs) ? 1 : 0; }
  /// Index of the first smallest component.
  int32 GetIndexOfMinComponent(int32 useAbs) const { return Pick(1, useAbs) < Pick(0, useAbs) ? 1 : 0; }

  /// 1 when -tol <= Length() <= tol.
  int32 IsAlmostZero(T tol) const { return nax::detail::InClosedTol(Length(), tol); }
  /// 1 when -tol <= Length() - 1 <= tol.
  int32 IsAlmostUnit(T tol) const { return nax::detail::InClosedTol(Length() - T(1), tol); }
  /// Sets to 0 each component with tol > |c|.
  void AnnulateSmallComponents(T tol) {
    if (tol > std::fabs(x)) x = T(0);
    if (tol > std::fabs(y)) y = T(0);
  }
  void SetToConstant(T value) { x = y = value; }
  void SetToZero() { x = y = T(0); }

  /// 1 when no component differs by more than the default tolerance.
  int32 operator==(const CNaxVector2& v) const {
    const T tol = nax::detail::DefaultTol<T>();
    return !(std::fabs(x - v.x) > tol || std::fabs(y - v.y) > tol);
  }
  int32 operator!=(const CNaxVector2& v) const { return !(*this == v); }

  /// Turns this vector by 90 degrees counter-clockwise, to (-y, x), and returns it.
  CNaxVector2 Rotate90DegsCCW() {
    const T oldX = x;
    x = -y;
    y = oldX;
    return *this;
  }
  /// Angle from the x-axis in degrees, in [0, 360).
  T Angle_0_360() const {
    const T a = Angle_MINUS_180_180();
    return a < T(0) ? a + T(360) : a;
  }
  /// Angle from the x-axis in degrees, in [-180, 180], by the two-argument arc tangent.
  T Angle_MINUS_180_180() const { return std::atan2(y, x) * nax::detail::RadToDeg<T>(); }

  /// Solves cx a + cy b = this by CNaxAlgebra::Solve2x2System; returns 1 only for a unique,
  /// well conditioned solution.
  int32 DecomposeInBasis(const CNaxVector2& a, const CNaxVector2& b, T& cx, T& cy, T tol) const {
    int32 quality;
    const int32 result = CNaxAlgebra::Solve2x2System(a.x, b.x, a.y, b.y, x, y, cx, cy, quality, tol);
    return result == 1 && quality == 1;
  }

 private:
  T Pick(int32 i, int32 useAbs) const { return useAbs ? std::fabs((*this)[i]) : (*this)[i]; }
};

/// value * v.
template <typename T>
inline CNaxVector2<T> operator*(T value, const CNaxVector2<T>& v) {
  return v * value;
}

extern template class CNaxVector2<float>;
extern template class CNaxVector2<double>;

#endif  // NAX_VECTOR2_H
