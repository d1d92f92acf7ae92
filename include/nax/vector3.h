// The three-component vector of geometry: components held inline, no virtual table, no heap.
//
// Lengths go through the safe root, so a vector shorter than about 3.2e-5 (double) or
// 3.2e-4 (float) has length exactly 0 and cannot be normalised.
#ifndef NAX_VECTOR3_H
#define NAX_VECTOR3_H

#include <cmath>
#include <type_traits>

#include "nax/algebra.h"
#include "nax/detail/fixed_common.h"
#include "nax/vector_n.h"

/// A vector (x, y, z) of float or double.
template <typename T>
class CNaxVector3 {
  static_assert(nax::detail::kIsReal<T>, "CNaxVector3 is instantiated for float and double only");

 public:
  T x, y, z;

  /// Zeros.
  CNaxVector3() : x(0), y(0), z(0) {}
  /// Zeros: the integer argument deliberately has no effect.
  explicit CNaxVector3(int32 /*ignored*/) : x(0), y(0), z(0) {}
  /// Every component value.
  explicit CNaxVector3(T value) : x(value), y(value), z(value) {}
  /// Every component value, from the other floating type.
  template <typename U, typename = std::enable_if_t<std::is_floating_point_v<U> && !std::is_same_v<U, T>>>
  explicit CNaxVector3(U value) : x(T(value)), y(T(value)), z(T(value)) {}
  CNaxVector3(T x, T y, T z) : x(x), y(y), z(z) {}
  /// The first three elements of source.
  explicit CNaxVector3(const T* source) : x(source[0]), y(source[1]), z(source[2]) {}
  /// The first three components of v; its dimension is not measured.
  explicit CNaxVector3(const CNaxVectorN<T>& v) : x(v[0]), y(v[1]), z(v[2]) {}
  CNaxVector3(const CNaxVector3&) = default;

  CNaxVector3& operator=(const CNaxVector3&) = default;
  /// Takes the first three components of v.
  CNaxVector3& operator=(const CNaxVectorN<T>& v) {
    x = v[0], y = v[1], z = v[2];
    return *this;
  }

  /// Component i (0, 1, 2), not range-tested.
  T& operator[](int32 i) { return i == 0 ? x : (i == 1 ? y : z); }
  const T& operator[](int32 i) const { return i == 0 ? x : (i == 1 ? y : z); }
  int32 Dim() const { return 3; }

  void Fill(const T* source) { x = source[0], y = source[1], z = source[2]; }
  void Fill(T newX, T newY, T newZ) { x = newX, y = newY, z = newZ; }
  void Dump(T* target) const { target[0] = x, target[1] = y, target[2] = z; }

  void Add(const CNaxVector3& v) { x += v.x, y += v.y, z += v.z; }
  void Sub(const CNaxVector3& v) { x -= v.x, y -= v.y, z -= v.z; }
  void Mul(T value) { x *= value, y *= value, z *= value; }
  /// Divides by value, unguarded.
  void Div(T value) { x /= value, y /= value, z /= value; }
  CNaxVector3& operator+=(const CNaxVector3& v) { return Add(v), *this; }
  CNaxVector3& operator-=(const CNaxVector3& v) { return Sub(v), *this; }
  CNaxVector3& operator*=(T value) { return Mul(value), *this; }
  CNaxVector3& operator/=(T value) { return Div(value), *this; }
  CNaxVector3 operator+(const CNaxVector3& v) const { return CNaxVector3(x + v.x, y + v.y, z + v.z); }
  CNaxVector3 operator-(const CNaxVector3& v) const { return CNaxVector3(x - v.x, y - v.y, z - v.z); }
  CNaxVector3 operator*(T value) const { return CNaxVector3(x * value, y * value, z * value); }
  CNaxVector3 operator/(T value) const { return CNaxVector3(x / value, y / value, z / value); }
  CNaxVector3 operator-() const { return CNaxVector3(-x, -y, -z); }
  /// A new vector of the negated components; this one stays as it is.
  CNaxVector3 Negate() const { return CNaxVector3(-x, -y, -z); }
  T Dot(const CNaxVector3& v) const { return x * v.x + y * v.y + z * v.z; }
  /// Right-handed cross product this x other.
  CNaxVector3 Cross(const CNaxVector3& v) const {
    return CNaxVector3(y * v.z - z * v.y, z * v.x - x * v.z, x * v.y - y * v.x);
  }

  /// Euclidean length by the safe root.
  T Length() const { return nax::detail::SafeRoot(SquareLength()); }
  T NormEuclidean() const { return Length(); }
  T SquareLength() const { return x * x + y * y + z * z; }
  T Norm1() const { return std::fabs(x) + std::fabs(y) + std::fabs(z); }
  T NormInf() const { return nax::detail::Max3(std::fabs(x), std::fabs(y), std::fabs(z)); }
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
  int32 GetIndexOfMaxComponent(int32 useAbs) const {
    const T a = Pick(0, useAbs), b = Pick(1, useAbs), c = Pick(2, useAbs);
    return b > a ? (c > b ? 2 : 1) : (c > a ? 2 : 0);
  }
  /// Index of the first smallest component.
  int32 GetIndexOfMinComponent(int32 useAbs) const {
    const T a = Pick(0, useAbs), b = Pick(1, useAbs), c = Pick(2, useAbs);
    return b < a ? (c < b ? 2 : 1) : (c < a ? 2 : 0);
  }

  /// 1 when -tol <= Length() <= tol.
  int32 IsAlmostZero(T tol) const { return nax::detail::InClosedTol(Length(), tol); }
  /// 1 when -tol <= Length() - 1 <= tol.
  int32 IsAlmostUnit(T tol) const { return nax::detail::InClosedTol(Length() - T(1), tol); }
  /// Sets to 0 each component with tol > |c|.
  void AnnulateSmallComponents(T tol) {
    if (tol > std::fabs(x)) x = T(0);
    if (tol > std::fabs(y)) y = T(0);
    if (tol > std::fabs(z)) z = T(0);
  }
  void SetToConstant(T value) { x = y = z = value; }
  void SetToZero() { x = y = z = T(0); }

  /// 1 when no component differs by more than the default tolerance.
  int32 operator==(const CNaxVector3& v) const {
    const T tol = nax::detail::DefaultTol<T>();
    return !(std::fabs(x - v.x) > tol || std::fabs(y - v.y) > tol || std::fabs(z - v.z) > tol);
  }
  int32 operator!=(const CNaxVector3& v) const { return !(*this == v); }

  /// Solves cx a + cy b + cz c = this by CNaxAlgebra::Solve3x3System; returns 1 only for a
  /// unique, well conditioned solution.
  int32 DecomposeInBasis(const CNaxVector3& a, const CNaxVector3& b, const CNaxVector3& c, T& cx, T& cy,
                         T& cz, T tol) const {
    int32 quality;
    const int32 result = CNaxAlgebra::Solve3x3System(a.x, b.x, c.x, a.y, b.y, c.y, a.z, b.z, c.z, x, y, z,
                                                     cx, cy, cz, quality, tol);
    return result == 1 && quality == 1;
  }

 private:
  T Pick(int32 i, int32 useAbs) const { return useAbs ? std::fabs((*this)[i]) : (*this)[i]; }
};

/// value * v.
template <typename T>
inline CNaxVector3<T> operator*(T value, const CNaxVector3<T>& v) {
  return v * value;
}

extern template class CNaxVector3<float>;
extern template class CNaxVector3<double>;

#endif  // NAX_VECTOR3_H
