// Tolerances and the safe root that every length in the library is taken through.
//
// The float and double bodies of a routine share one algorithm and differ only in the
// constants below: the default tolerance (1e-7f / 1e-9), its square (1e-14f / 1e-18) and
// the fixed 1e-6 floor of the matrix routines.
#ifndef NAX_SCALAR_H
#define NAX_SCALAR_H

#include <cmath>

#include "nax/types.h"

namespace nax::detail {

/// Default tolerance: 1e-7f for float, 1e-9 for double.
template <typename T>
constexpr T DefaultTol() {
  return std::is_same_v<T, float> ? T(1e-7f) : T(1e-9);
}

/// Square of the default tolerance, the floor under a sum of squares: 1e-14f / 1e-18.
template <typename T>
constexpr T SquareTol() {
  return std::is_same_v<T, float> ? T(1e-14f) : T(1e-18);
}

/// Fixed floor of the Frobenius norm and of several pivot and determinant tests.
template <typename T>
constexpr T MatrixFloor() {
  return T(1e-6);
}

/// Result of a division by almost zero: the largest float, in both instantiations.
template <typename T>
constexpr T PseudoInfinity() {
  return T(3.4028234663852886e38);
}

/// Root of a non-negative sum of squares with its dead zone: 0 below the squared floor,
/// 0 below the default tolerance, else the square root. The second step decides in
/// practice, so lengths below about 3.2e-5 (double) or 3.2e-4 (float) are exactly 0.
template <typename T>
inline T SafeRoot(T s) {
  if (s < SquareTol<T>()) return T(0);
  if (std::fabs(s) < DefaultTol<T>()) return T(0);
  return std::sqrt(s);
}

/// -tol <= x <= tol, both ends closed.
template <typename T>
inline bool InClosedTol(T x, T tol) {
  return -tol <= x && x <= tol;
}

}  // namespace nax::detail

#endif  // NAX_SCALAR_H
