// The four-component vector of homogeneous space: components held inline, no virtual
// table, no heap.
//
// Lengths go through the safe root, so a vector shorter than about 3.2e-5 (double) or
// 3.2e-4 (float) has length exactly 0 and cannot be normalised.
#ifndef NAX_VECTOR4_H
#define NAX_VECTOR4_H

#include <cmath>
#include <type_traits>

#include "nax/detail/fixed_common.h"
#include "nax/vector_n.h"

/// A vector (x, y, z, w) of float or double.
template <typename T>
class CNaxVector4 {
  static_assert(nax::detail::kIsReal<T>, "CNaxVector4 is instantiated for float and double only");

 public:
  T x, y, z, w;

  /// Zeros.
  CNaxVector4() : x(0), y(0), z(0), w(0) {}
  /// Zeros: the integer argument deliberately has no effect.
  explicit CNaxVector4(int32 /*ignored*/) : x(0), y(0), z(0), w(0) {}
  /// Every component value.
  explicit CNaxVector4(T value) : x(value), y(value), z(value), w(value) {}
  /// Every component value, from the other floating type.
  template <typename U, typename = std::enable_if_t<std::is_floating_point_v<U> && !std::is_same_v<U, T>>>
  explicit CNaxVector4(U value) : x(T(value)), y(T(value)), z(T(value)), w(T(value)) {}
  CNaxVector4(T x, T y, T z, T w) : x(x), y(y), z(z), w(w) {}
  /// The first four elements of source.
  explicit CNaxVector4(const T* source) : x(source[0]), y(source[1]), z(source[2]), w(source[3]) {}
  /// The first four components of v; its dimension is not measured.
  explicit CNaxVector4(const CNaxVectorN<T>& v) : x(v[0]), y(v[1]), z(v[2]), w(v[3]) {}
  CNaxVector4(const CNaxVector4&) = default;

  CNaxVector4& operator=(const CNaxVector4&) = default;
  /// Takes the first four components of v.
  CNaxVector4& operator=(const CNaxVectorN<T>& v) {
    x = v[0], y = v[1], z = v[2], w = v[3];
    return *this;
  }

  /// Component i (0 to 3), not range-tested.
  T& operator[](int32 i) { return i == 0 ? x : (i == 1 ? y : (i == 2 ? z : w)); }
  const T& operator[](int32 i) const { return i == 0 ? x : (i == 1 ? y : (i == 2 ? z : w)); }
  int32 Dim() const { return 4; }

  void Fill(const T* source) { x = source[0], y = source[1], z = source[2], w = source[3]; }
  void Fill(T newX, T newY, T newZ, T newW) { x = newX, y = newY, z = newZ, w = newW; }
  void Dump(T* target) const { target[0] = x, target[1] = y, target[2] = z, target[3] = w; }

  void Add(const CNaxVector4& v) { x += v.x, y += v.y, z += v.z, w += v.w; }
  void Sub(const CNaxVector4& v) { x -= v.x, y -= v.y, z -= v.z, w -= v.w; }
  void Mul(T value) { x *= value, y *= value, z *= value, w *= value; }
  /// Divides by value, unguarded.
  void Div(T value) { x /= value, y /= value, z /= value, w /= value; }
  CNaxVector4& operator+=(const CNaxVector4& v) { return Add(v), *this; }
  CNaxVector4& operator-=(const CNaxVector4& v) { return Sub(v), *this; }
  CNaxVector4& operator*=(T value) { return Mul(value), *this; }
  CNaxVector4& operator/=(T value) { return Div(value), *this; }
  CNaxVector4 operator+(const CNaxVector4& v) const { return CNaxVector4(x + v.x, y + v.y, z + v.z, w + v.w); }
  CNaxVector4 operator-(const CNaxVector4& v) const { return CNaxVector4(x - v.x, y - v.y, z - v.z, w - v.w); }
  CNaxVector4 operator*(T value) const { return CNaxVector4(x * value, y * value, z * value, w * value); }
  CNaxVector4 operator/(T value) const { return CNaxVector4(x / value, y / value, z / value, w / value); }
  CNaxVector4 operator-() const { return CNaxVector4(-x, -y, -z, -w); }
  /// A new vector of the negated components; this one stays as it is.
  CNaxVector4 Negate() const { return CNaxVector4(-x, -y, -z, -w); }
  T Dot(const CNaxVector4& v) const { return x * v.x + y * v.y + z * v.z + w * v.w; }

  /// Euclidean length by the safe root.
  T Length() const { return nax::detail::SafeRoot(SquareLength()); }
  T NormEuclidean() const { return Length(); }
  T SquareLength() const { return x * x + y * y + z * z + w * w; }
  T Norm1() const { return std::fabs(x) + std::fabs(y) + std::fabs(z) + std::fabs(w); }
  T NormInf() const { return nax::detail::Max4(std::fabs(x), std::fabs(y), std::fabs(z), std::fabs(w)); }
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
    int32 best = 0;
    for (int32 i = 1; i < 4; ++i)
      if (Pick(i, useAbs) > Pick(best, useAbs)) best = i;
    return best;
  }
  /// Index of the first smallest component.
  int32 GetIndexOfMinComponent(int32 useAbs) const {
    int32 best = 0;
    for (int32 i = 1; i < 4; ++i)
      if (Pick(i, useAbs) < Pick(best, useAbs)) best = i;
    return best;
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
    if (tol > std::fabs(w)) w = T(0);
  }
  void SetToConstant(T value) { x = y = z = w = value; }
  void SetToZero() { x = y = z = w = T(0); }

  /// 1 when no component differs by more than the default tolerance.
  int32 operator==(const CNaxVector4& v) const {
    const T tol = nax::detail::DefaultTol<T>();
    return !(std::fabs(x - v.x) > tol || std::fabs(y - v.y) > tol || std::fabs(z - v.z) > tol ||
             std::fabs(w - v.w) > tol);
  }
  int32 operator!=(const CNaxVector4& v) const { return !(*this == v); }

 private:
  T Pick(int32 i, int32 useAbs) const { return useAbs ? std::fabs((*this)[i]) : (*this)[i]; }
};

/// value * v.
template <typename T>
inline CNaxVector4<T> operator*(T value, const CNaxVector4<T>& v) {
  return v * value;
}

extern template class CNaxVector4<float>;
extern template class CNaxVector4<double>;

#endif  // NAX_VECTOR4_H
