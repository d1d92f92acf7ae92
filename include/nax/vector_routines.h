// Free routines on vectors: distances, relative tests of orthogonality, collinearity and
// coplanarity, Gram-Schmidt orthonormalising, angles, weighted sums, array helpers, and the
// conversions between the fixed vectors.
//
// The relative tests share one form: vectors too small to measure (scale below tol) pass;
// otherwise tol * scale > |quantity|, strictly.
#ifndef NAX_VECTOR_ROUTINES_H
#define NAX_VECTOR_ROUTINES_H

#include <cmath>

#include "nax/base_vector.h"
#include "nax/detail/array_ops.h"
#include "nax/detail/fixed_common.h"
#include "nax/vector2.h"
#include "nax/vector3.h"
#include "nax/vector4.h"
#include "nax/vector_n.h"

namespace nax::detail {

template <typename T>
inline T MaxAbsComponent(const CNaxVector2<T>& a) {
  return a.NormInf();
}
template <typename T>
inline T MaxAbsComponent(const CNaxVector3<T>& a) {
  return a.NormInf();
}

/// The shared form of the relative tests: 1 if tol > scale, else tol * scale > |quantity|.
template <typename T>
inline int32 RelativeTest(T scale, T quantity, T tol) {
  if (tol > scale) return 1;
  return tol * scale > std::fabs(quantity);
}

/// Root of x, 0 when |x| is below the default tolerance.
template <typename T>
inline T DeadZoneRoot(T x) {
  return std::fabs(x) < DefaultTol<T>() ? T(0) : std::sqrt(x);
}

}  // namespace nax::detail

// ---------------------------------------------------------------------------------------------
// Distances.

/// Distance by the safe root of the squared distance.
template <typename T>
inline T naxDist(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return (a - b).Length();
}
template <typename T>
inline T naxDist(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return (a - b).Length();
}
template <typename T>
inline T naxDist(const CNaxVector4<T>& a, const CNaxVector4<T>& b) {
  return (a - b).Length();
}

/// Plain sum of squared differences.
template <typename T>
inline T naxSquareDist(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return (a - b).SquareLength();
}
template <typename T>
inline T naxSquareDist(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return (a - b).SquareLength();
}
template <typename T>
inline T naxSquareDist(const CNaxVector4<T>& a, const CNaxVector4<T>& b) {
  return (a - b).SquareLength();
}
/// Sum of squared differences over a's dimension.
template <typename T>
inline T naxSquareDist(const CNaxVectorN<T>& a, const CNaxVectorN<T>& b) {
  T sum = T(0);
  for (int32 i = 0; i < a.Dim(); ++i) {
    const T d = a[i] - b[i];
    sum += d * d;
  }
  return sum;
}
template <typename T>
inline T naxDist(const CNaxVectorN<T>& a, const CNaxVectorN<T>& b) {
  return nax::detail::SafeRoot(naxSquareDist(a, b));
}

/// (a + b) * 0.5.
template <typename T>
inline CNaxVector2<T> naxFindMidpoint(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return (a + b) * T(0.5);
}
template <typename T>
inline CNaxVector3<T> naxFindMidpoint(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return (a + b) * T(0.5);
}
/// (a + b) * 0.5 of run-time sized vectors, also complex ones; a new vector of a's dimension.
template <typename T>
inline CNaxBaseVector<T> naxFindMidpoint(const CNaxBaseVector<T>& a, const CNaxBaseVector<T>& b) {
  return (a + b) * T(nax::detail::ScalarOf<T>(0.5));
}

// ---------------------------------------------------------------------------------------------
// Relative tests.

/// Orthogonality relative to the product of the safe lengths; vectors too small to measure
/// are orthogonal to anything.
template <typename T>
inline int32 naxAreOrthogonal(const CNaxVector2<T>& a, const CNaxVector2<T>& b, T tol) {
  return nax::detail::RelativeTest(a.Length() * b.Length(), a.Dot(b), tol);
}
template <typename T>
inline int32 naxAreOrthogonal(const CNaxVector3<T>& a, const CNaxVector3<T>& b, T tol) {
  return nax::detail::RelativeTest(a.Length() * b.Length(), a.Dot(b), tol);
}
template <typename T>
inline int32 naxAreOrthogonal(const CNaxVector4<T>& a, const CNaxVector4<T>& b, T tol) {
  return nax::detail::RelativeTest(a.Length() * b.Length(), a.Dot(b), tol);
}
template <typename T>
inline int32 naxAreOrthogonal(const CNaxVectorN<T>& a, const CNaxVectorN<T>& b, T tol) {
  return nax::detail::RelativeTest(a.Length() * b.Length(), a.Dot(b), tol);
}

/// Right-handed cross product.
template <typename T>
inline CNaxVector3<T> naxCross(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return a.Cross(b);
}
/// a.x b.y - a.y b.x.
template <typename T>
inline T naxCross2D(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return a.x * b.y - a.y * b.x;
}
/// a . (b x c).
template <typename T>
inline T naxMixedProduct(const CNaxVector3<T>& a, const CNaxVector3<T>& b, const CNaxVector3<T>& c) {
  return a.Dot(b.Cross(c));
}

/// Collinearity: the 2D cross product against the largest absolute component of a and b
/// (a component, deliberately, and used only once).
template <typename T>
inline int32 naxAreColinear(const CNaxVector2<T>& a, const CNaxVector2<T>& b, T tol) {
  return nax::detail::RelativeTest(nax::detail::Max2(a.NormInf(), b.NormInf()), naxCross2D(a, b), tol);
}
/// Collinearity: the safe length of the cross product against the largest absolute
/// component of a and b.
template <typename T>
inline int32 naxAreColinear(const CNaxVector3<T>& a, const CNaxVector3<T>& b, T tol) {
  return nax::detail::RelativeTest(nax::detail::Max2(a.NormInf(), b.NormInf()), a.Cross(b).Length(), tol);
}

/// Collinearity of three points by the edges from p.
template <typename T>
inline int32 naxArePointsCollinear(const CNaxVector3<T>& p, const CNaxVector3<T>& q, const CNaxVector3<T>& r,
                                   T tol) {
  return naxAreColinear(q - p, r - p, tol);
}
/// Coplanarity of three vectors: the mixed product against their largest absolute component.
template <typename T>
inline int32 naxAreVectorsCoplanar(const CNaxVector3<T>& a, const CNaxVector3<T>& b, const CNaxVector3<T>& c,
                                   T tol) {
  return nax::detail::RelativeTest(nax::detail::Max3(a.NormInf(), b.NormInf(), c.NormInf()),
                                   naxMixedProduct(a, b, c), tol);
}
/// Coplanarity of four points by the edges from p.
template <typename T>
inline int32 naxArePointsCoplanar(const CNaxVector3<T>& p, const CNaxVector3<T>& q, const CNaxVector3<T>& r,
                                  const CNaxVector3<T>& s, T tol) {
  return naxAreVectorsCoplanar(q - p, r - p, s - p, tol);
}

/// (a - b).IsAlmostZero(tol): the safe distance within the closed interval of tol.
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxVector2<T>& a, const CNaxVector2<T>& b, T tol) {
  return (a - b).IsAlmostZero(tol);
}
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxVector3<T>& a, const CNaxVector3<T>& b, T tol) {
  return (a - b).IsAlmostZero(tol);
}
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxVector4<T>& a, const CNaxVector4<T>& b, T tol) {
  return (a - b).IsAlmostZero(tol);
}
/// The same for run-time sized vectors; 0 when the dimensions differ.
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxVectorN<T>& a, const CNaxVectorN<T>& b, T tol) {
  if (a.Dim() != b.Dim()) return 0;
  return nax::detail::InClosedTol(naxDist(a, b), tol);
}
/// naxAreAlmostEqual with the default tolerance.
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return naxAreAlmostEqual(a, b, nax::detail::DefaultTol<T>());
}
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return naxAreAlmostEqual(a, b, nax::detail::DefaultTol<T>());
}
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxVector4<T>& a, const CNaxVector4<T>& b) {
  return naxAreAlmostEqual(a, b, nax::detail::DefaultTol<T>());
}
template <typename T>
inline int32 naxAreAlmostEqual(const CNaxVectorN<T>& a, const CNaxVectorN<T>& b) {
  return naxAreAlmostEqual(a, b, nax::detail::DefaultTol<T>());
}

/// 1 when a and b are orthogonal, of unit length within tol, and a . b is not below 0
/// (the dot product, not a handedness test).
template <typename T>
inline int32 naxAreOrthonormalized(const CNaxVector2<T>& a, const CNaxVector2<T>& b, T tol) {
  if (!naxAreOrthogonal(a, b, tol)) return 0;
  if (!a.IsAlmostUnit(tol) || !b.IsAlmostUnit(tol)) return 0;
  return !(a.Dot(b) < T(0));
}
template <typename T>
inline int32 naxAreOrthonormalized(const CNaxVector3<T>& a, const CNaxVector3<T>& b, T tol) {
  if (!naxAreOrthogonal(a, b, tol)) return 0;
  if (!a.IsAlmostUnit(tol) || !b.IsAlmostUnit(tol)) return 0;
  return !(a.Dot(b) < T(0));
}
/// 1 when the three are pairwise orthogonal, of unit length within tol, and right-handed.
template <typename T>
inline int32 naxAreOrthonormalized(const CNaxVector3<T>& a, const CNaxVector3<T>& b, const CNaxVector3<T>& c,
                                   T tol) {
  if (!naxAreOrthogonal(a, b, tol) || !naxAreOrthogonal(b, c, tol) || !naxAreOrthogonal(a, c, tol)) return 0;
  if (!a.IsAlmostUnit(tol) || !b.IsAlmostUnit(tol) || !c.IsAlmostUnit(tol)) return 0;
  return !(naxMixedProduct(a, b, c) < T(0));
}

namespace nax::detail {

// Gram-Schmidt on two vectors, normalising last: a keeps its direction.
template <typename V, typename T>
inline int32 OrthonormalizePair(V& a, V& b, T tol) {
  if (tol > Max2(a.NormInf(), b.NormInf())) return 0;
  if (naxAreColinear(a, b, tol)) return 0;
  V wa = a, wb = b;
  const T aa = wa.Dot(wa);
  wb -= wa * (wa.Dot(wb) / aa);
  wa /= DeadZoneRoot(aa);
  wb.Normalize();
  a = wa;
  b = wb;
  return 1;
}

}  // namespace nax::detail

/// Gram-Schmidt: a keeps its direction, b is made orthogonal to it, both are normalised.
/// Returns 0 with no change when both are below tol or they are collinear.
template <typename T>
inline int32 naxOrthonormalize(CNaxVector2<T>& a, CNaxVector2<T>& b, T tol) {
  return nax::detail::OrthonormalizePair(a, b, tol);
}
template <typename T>
inline int32 naxOrthonormalize(CNaxVector3<T>& a, CNaxVector3<T>& b, T tol) {
  return nax::detail::OrthonormalizePair(a, b, tol);
}
/// Gram-Schmidt on three vectors; returns 0 with no change when they are coplanar.
template <typename T>
inline int32 naxOrthonormalize(CNaxVector3<T>& a, CNaxVector3<T>& b, CNaxVector3<T>& c, T tol) {
  if (naxAreVectorsCoplanar(a, b, c, tol)) return 0;
  CNaxVector3<T> wa = a, wb = b, wc = c;
  const T aa = wa.Dot(wa);
  wb -= wa * (wa.Dot(wb) / aa);
  const T bb = wb.Dot(wb);
  wc -= wa * (wa.Dot(wc) / aa) + wb * (wb.Dot(wc) / bb);
  wa.Normalize();
  wb.Normalize();
  wc.Normalize();
  a = wa;
  b = wb;
  c = wc;
  return 1;
}

// ---------------------------------------------------------------------------------------------
// Angles. The ratios are not clamped: nearly parallel vectors may give a NaN.

/// Unsigned angle in radians in [0, pi]; 0 when either safe length is within 1e-6.
template <typename T>
inline T naxFindAngleInRadians(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  const T la = a.Length(), lb = b.Length();
  if (nax::detail::InClosedTol(la, T(1e-6)) || nax::detail::InClosedTol(lb, T(1e-6))) return T(0);
  return std::acos(a.Dot(b) / (la * lb));
}
template <typename T>
inline T naxFindAngleInRadians(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  const T la = a.Length(), lb = b.Length();
  if (nax::detail::InClosedTol(la, T(1e-6)) || nax::detail::InClosedTol(lb, T(1e-6))) return T(0);
  return std::acos(a.Dot(b) / (la * lb));
}
/// Unsigned angle in degrees in [0, 180].
template <typename T>
inline T naxFindAngleInDegrees(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return naxFindAngleInRadians(a, b) * nax::detail::RadToDeg<T>();
}
template <typename T>
inline T naxFindAngleInDegrees(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return naxFindAngleInRadians(a, b) * nax::detail::RadToDeg<T>();
}

/// Sine of the angle, never negative: |a x b| / (|a| |b|), unguarded.
template <typename T>
inline T naxSin(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return std::fabs(naxCross2D(a, b)) / (a.Length() * b.Length());
}
template <typename T>
inline T naxSin(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return a.Cross(b).Length() / (a.Length() * b.Length());
}
/// Cosine of the angle: a . b / (|a| |b|), unguarded.
template <typename T>
inline T naxCos(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return a.Dot(b) / (a.Length() * b.Length());
}
template <typename T>
inline T naxCos(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return a.Dot(b) / (a.Length() * b.Length());
}
/// Tangent of the angle: |a x b| / (a . b), unguarded.
template <typename T>
inline T naxTan(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return std::fabs(naxCross2D(a, b)) / a.Dot(b);
}
template <typename T>
inline T naxTan(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return a.Cross(b).Length() / a.Dot(b);
}
/// Cotangent of the angle: (a . b) / |a x b|, unguarded.
template <typename T>
inline T naxCot(const CNaxVector2<T>& a, const CNaxVector2<T>& b) {
  return a.Dot(b) / std::fabs(naxCross2D(a, b));
}
template <typename T>
inline T naxCot(const CNaxVector3<T>& a, const CNaxVector3<T>& b) {
  return a.Dot(b) / a.Cross(b).Length();
}

/// Area of the triangle a, b, c: half the absolute cross product of the edges from a.
template <typename T>
inline T naxGetTriangleArea(const CNaxVector2<T>& a, const CNaxVector2<T>& b, const CNaxVector2<T>& c) {
  return T(0.5) * std::fabs(naxCross2D(b - a, c - a));
}

// ---------------------------------------------------------------------------------------------
// Weighted sums and arrays.

/// Exchanges the contents of a and b.
template <typename T>
inline void naxSwapVectors(CNaxVector2<T>& a, CNaxVector2<T>& b) {
  const CNaxVector2<T> t = a;
  a = b;
  b = t;
}
template <typename T>
inline void naxSwapVectors(CNaxVector3<T>& a, CNaxVector3<T>& b) {
  const CNaxVector3<T> t = a;
  a = b;
  b = t;
}

/// wa a + wb b.
template <typename T>
inline CNaxVector2<T> naxCombine2(CNaxVector2<T> a, CNaxVector2<T> b, T wa, T wb) {
  return a * wa + b * wb;
}
template <typename T>
inline CNaxVector3<T> naxCombine2(CNaxVector3<T> a, CNaxVector3<T> b, T wa, T wb) {
  return a * wa + b * wb;
}
/// wa a + wb b + wc c.
template <typename T>
inline CNaxVector2<T> naxCombine3(CNaxVector2<T> a, CNaxVector2<T> b, CNaxVector2<T> c, T wa, T wb, T wc) {
  return a * wa + b * wb + c * wc;
}
template <typename T>
inline CNaxVector3<T> naxCombine3(CNaxVector3<T> a, CNaxVector3<T> b, CNaxVector3<T> c, T wa, T wb, T wc) {
  return a * wa + b * wb + c * wc;
}
/// wa a + wb b + wc c + wd d.
template <typename T>
inline CNaxVector2<T> naxCombine4(CNaxVector2<T> a, CNaxVector2<T> b, CNaxVector2<T> c, CNaxVector2<T> d, T wa,
                                  T wb, T wc, T wd) {
  return a * wa + b * wb + c * wc + d * wd;
}
template <typename T>
inline CNaxVector3<T> naxCombine4(CNaxVector3<T> a, CNaxVector3<T> b, CNaxVector3<T> c, CNaxVector3<T> d, T wa,
                                  T wb, T wc, T wd) {
  return a * wa + b * wb + c * wc + d * wd;
}

/// Weighted sum of n vectors.
template <typename T>
inline CNaxVector2<T> naxCombine(int32 n, const CNaxVector2<T>* vectors, const T* weights) {
  CNaxVector2<T> sum;
  for (int32 i = 0; i < n; ++i) sum += vectors[i] * weights[i];
  return sum;
}
template <typename T>
inline CNaxVector3<T> naxCombine(int32 n, const CNaxVector3<T>* vectors, const T* weights) {
  CNaxVector3<T> sum;
  for (int32 i = 0; i < n; ++i) sum += vectors[i] * weights[i];
  return sum;
}

/// Sum of n vectors times 1 / n; n isn't tested.
template <typename T>
inline CNaxVector2<T> naxFindMean(const CNaxVector2<T>* vectors, int32 n) {
  CNaxVector2<T> sum;
  for (int32 i = 0; i < n; ++i) sum += vectors[i];
  return sum * (T(1) / T(n));
}
template <typename T>
inline CNaxVector3<T> naxFindMean(const CNaxVector3<T>* vectors, int32 n) {
  CNaxVector3<T> sum;
  for (int32 i = 0; i < n; ++i) sum += vectors[i];
  return sum * (T(1) / T(n));
}

/// Copies n vectors from source to target.
template <typename T>
inline void naxCopyVectorArray(int32 n, const CNaxVector2<T>* source, CNaxVector2<T>* target) {
  for (int32 i = 0; i < n; ++i) target[i] = source[i];
}
template <typename T>
inline void naxCopyVectorArray(int32 n, const CNaxVector3<T>* source, CNaxVector3<T>* target) {
  for (int32 i = 0; i < n; ++i) target[i] = source[i];
}

/// Copies extra vectors of source to target[count...]; returns count + extra.
template <typename T>
inline int32 naxAppendVectorArray(int32 count, CNaxVector2<T>* target, int32 extra, const CNaxVector2<T>* source) {
  naxCopyVectorArray(extra, source, target + count);
  return count + extra;
}
template <typename T>
inline int32 naxAppendVectorArray(int32 count, CNaxVector3<T>* target, int32 extra, const CNaxVector3<T>* source) {
  naxCopyVectorArray(extra, source, target + count);
  return count + extra;
}

/// Sum of a[firstA + i] * b[firstB + i] for i < count; 0 when count < 1.
template <typename T>
inline T naxPartialDotProduct(int32 firstA, int32 firstB, int32 count, const CNaxBaseVector<T>& a,
                              const CNaxBaseVector<T>& b) {
  T sum = T(nax::detail::ScalarOf<T>(0));
  for (int32 i = 0; i < count; ++i) sum += a[firstA + i] * b[firstB + i];
  return sum;
}

// ---------------------------------------------------------------------------------------------
// Conversions.

/// (x, y, z).
template <typename T>
inline CNaxVector3<T> naxVector2To3(const CNaxVector2<T>& v, T z) {
  return CNaxVector3<T>(v.x, v.y, z);
}
/// (x, y, 1).
template <typename T>
inline CNaxVector3<T> naxVector2To3(const CNaxVector2<T>& v) {
  return CNaxVector3<T>(v.x, v.y, T(1));
}
/// (x, y, z, w).
template <typename T>
inline CNaxVector4<T> naxVector3To4(const CNaxVector3<T>& v, T w) {
  return CNaxVector4<T>(v.x, v.y, v.z, w);
}
/// (x, y, z, 1).
template <typename T>
inline CNaxVector4<T> naxVector3To4(const CNaxVector3<T>& v) {
  return CNaxVector4<T>(v.x, v.y, v.z, T(1));
}
/// The first three components, without division.
template <typename T>
inline CNaxVector3<T> naxAffineVector4To3(const CNaxVector4<T>& v) {
  return CNaxVector3<T>(v.x, v.y, v.z);
}
template <typename T>
inline CNaxVector3<T> naxCutVector4To3(const CNaxVector4<T>& v) {
  return CNaxVector3<T>(v.x, v.y, v.z);
}
/// The first two components, without division.
template <typename T>
inline CNaxVector2<T> naxAffineVector3To2(const CNaxVector3<T>& v) {
  return CNaxVector2<T>(v.x, v.y);
}
template <typename T>
inline CNaxVector2<T> naxCutVector3To2(const CNaxVector3<T>& v) {
  return CNaxVector2<T>(v.x, v.y);
}
/// The first three components; w receives the fourth, with no division.
template <typename T>
inline CNaxVector3<T> naxVector4To3(const CNaxVector4<T>& v, T& w) {
  w = v.w;
  return CNaxVector3<T>(v.x, v.y, v.z);
}
/// The first two components; w receives the third, with no division.
template <typename T>
inline CNaxVector2<T> naxVector3To2(const CNaxVector3<T>& v, T& w) {
  w = v.z;
  return CNaxVector2<T>(v.x, v.y);
}
/// Homogeneous division: w receives the fourth component; returns 0 with result unchanged
/// when tol > |w|, else result = first three / w and 1.
template <typename T>
inline int32 naxVector4To3(const CNaxVector4<T>& v, T tol, CNaxVector3<T>& result, T& w) {
  w = v.w;
  if (tol > std::fabs(w)) return 0;
  result = CNaxVector3<T>(v.x / w, v.y / w, v.z / w);
  return 1;
}
/// Homogeneous division in the plane: w receives the third component.
template <typename T>
inline int32 naxVector3To2(const CNaxVector3<T>& v, T tol, CNaxVector2<T>& result, T& w) {
  w = v.z;
  if (tol > std::fabs(w)) return 0;
  result = CNaxVector2<T>(v.x / w, v.y / w);
  return 1;
}

#endif  // NAX_VECTOR_ROUTINES_H
