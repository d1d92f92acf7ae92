// Fixed-width integer types and the enumerations shared by several subsystems.
//
// Sizes, indices, counts and yes/no results are int32 throughout the library.
// A routine in the yes/no form returns 1 for yes or success and 0 for no or failure;
// one in the status form returns 0 for success and otherwise 1 (failed), 2 (no memory),
// 3 (singular) or 6 (unsuitable shape).
#ifndef NAX_TYPES_H
#define NAX_TYPES_H

#include <cstdint>
#include <type_traits>

typedef std::int32_t int32;
typedef std::uint32_t uint32;
typedef std::int64_t int64;
typedef std::uint64_t uint64;

/// Outcome of an eigenvalue computation.
enum naxStatus {
  naxStatusOk = 0,                ///< finished
  naxStatusOutOfMemory = 2,       ///< a work array could not be obtained
  naxStatusTooManyRotations = 5,  ///< the Jacobi rotation count reached the sweep limit
  naxStatusNotSymmetric = 6       ///< two mirrored elements differ by more than the tolerance
};

/// The matrix norm taken by Norm, ConditionNumber and the norm-taking solvers.
/// Any value other than 0, 1, 3 and 4 behaves as naxMatrixNormFrobenius.
enum naxMatrixNorm {
  naxMatrixNormOne = 0,         ///< largest column sum of absolute values
  naxMatrixNormInfinity = 1,    ///< largest row sum of absolute values
  naxMatrixNormFrobenius = 2,   ///< root of the sum of squares
  naxMatrixNormSpectral = 3,    ///< largest singular value
  naxMatrixNormMaxElement = 4   ///< largest absolute element times the root of the element count
};

/// Where a point or a figure lies against a line, a box or a polygon.
enum naxRelativeLocation {
  naxLocationInside = 0,    ///< inside; same side of a line; wholly visible
  naxLocationOutside = 1,   ///< outside; different sides of a line; wholly invisible
  naxLocationOnBorder = 2   ///< on the border within the tolerance; clipped
};

namespace nax::detail {

/// True for the element types of the real-valued templates: float and double.
template <typename T>
inline constexpr bool kIsReal = std::is_same_v<T, float> || std::is_same_v<T, double>;

}  // namespace nax::detail

#endif  // NAX_TYPES_H
