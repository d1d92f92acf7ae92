// Small helpers shared by the fixed vectors and matrices.
#ifndef NAX_DETAIL_FIXED_COMMON_H
#define NAX_DETAIL_FIXED_COMMON_H

#include <cmath>

#include "nax/complex.h"
#include "nax/scalar.h"
#include "nax/types.h"

namespace nax::detail {

template <typename T>
inline T Max2(T a, T b) {
  return b > a ? b : a;
}
template <typename T>
inline T Max3(T a, T b, T c) {
  return Max2(Max2(a, b), c);
}
template <typename T>
inline T Max4(T a, T b, T c, T d) {
  return Max2(Max2(a, b), Max2(c, d));
}

/// Largest absolute value of n elements.
template <typename T, int N>
inline T MaxAbs(const T (&a)[N]) {
  T m = std::fabs(a[0]);
  for (int i = 1; i < N; ++i) m = Max2(m, std::fabs(a[i]));
  return m;
}

/// Degrees to radians and back.
template <typename T>
constexpr T DegToRad() {
  return Pi<T>() / T(180);
}
template <typename T>
constexpr T RadToDeg() {
  return T(180) / Pi<T>();
}

/// An angle in degrees reduced to the interval from -180 to 180, through ReduceRadians.
template <typename T>
inline T ReduceDegrees(T degrees) {
  return ReduceRadians(degrees * DegToRad<T>()) * RadToDeg<T>();
}

}  // namespace nax::detail

#endif  // NAX_DETAIL_FIXED_COMMON_H
