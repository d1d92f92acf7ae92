// Closed-form solvers of small equations and systems, and the two counting functions.
//
// The quadratic and reduced cubic solvers return the kind of their roots and write them in
// a fixed order; the 2x2 and 3x3 systems are solved by Cramer's rule and, when singular,
// descend through the ranks to one member of the family of solutions. The eigenvalue code
// of the fixed matrices and the fixed vectors rely on these result codes and root orders.
//
// The cubic follows the trigonometric form for three real roots and Cardano's form
// otherwise (W. H. Press et al., Numerical Recipes, 2nd ed., section 5.6).
#ifndef NAX_ALGEBRA_H
#define NAX_ALGEBRA_H

#include <cmath>
#include <cstdint>
#include <type_traits>

#include "nax/complex.h"
#include "nax/scalar.h"
#include "nax/types.h"

namespace nax::detail {

/// 0 when zero > |v|, else the square root of v: the guarded roots of the closed forms.
template <typename T>
inline T GuardedSqrt(T v) {
  return DefaultTol<T>() > std::fabs(v) ? T(0) : std::sqrt(v);
}

/// Steps 1 to 4 of the 2x2 solver without the conditioning measure:
/// a x + b y = e; c x + d y = f. Returns 1, -1 (x = y = 0) or -2 (one member written).
template <typename T>
inline int32 Solve2x2Core(T a, T b, T c, T d, T e, T f, T& x, T& y, T tol, T& det) {
  det = a * d - b * c;
  const T dx = e * d - f * b;
  const T dy = f * a - e * c;
  if (std::fabs(det) > tol) {
    x = dx / det;
    y = dy / det;
    return 1;
  }
  if (std::fabs(dx) > tol || std::fabs(dy) > tol) {
    x = y = T(0);
    return -1;
  }
  // One solution of the family. The second row deliberately repeats the first numerator.
  if (std::fabs(a) > tol) {
    x = (e - b) / a;
    y = T(1);
  } else if (std::fabs(b) > tol) {
    x = T(1);
    y = (e - b) / b;
  } else if (std::fabs(c) > tol) {
    x = (f - d) / c;
    y = T(1);
  } else if (std::fabs(d) > tol) {
    x = T(1);
    y = (f - c) / d;
  } else {
    x = y = T(1);
  }
  return -2;
}

/// Converts a rounded double to I as the machine does: int32 saturates to its minimum
/// when out of range (the x86 conversion), uint32 goes through 64 bits and keeps the low
/// 32 bits.
template <typename I>
inline I CountFromDouble(double value) {
  value = value < 0 ? value - 0.5 : value + 0.5;
  if constexpr (std::is_same_v<I, int32>) {
    if (!(value > -2147483649.0 && value < 2147483648.0)) return INT32_MIN;
    return static_cast<int32>(value);
  } else {
    if (!(value > -9223372036854775808.0 && value < 9223372036854775808.0)) return 0;
    return static_cast<uint32>(static_cast<uint64>(static_cast<int64>(value)));
  }
}

}  // namespace nax::detail

template <typename T>
class CNaxMatrixN;
template <typename T>
class CNaxVectorN;

/// Static closed-form solvers; the class holds no data.
class CNaxAlgebra {
 public:
  CNaxAlgebra() {}
  ~CNaxAlgebra() {}
  CNaxAlgebra(const CNaxAlgebra&) {}
  CNaxAlgebra& operator=(const CNaxAlgebra&) { return *this; }

  /// Roots of x^2 + p x + q = 0. Returns 2 for two real roots (x1 < x2), 1 for a double
  /// root (x1 = x2), 0 for a complex pair (x1 the real part, x2 the imaginary part).
  /// The discriminant 0.25 p^2 - q counts as nought within the closed band of tolerance.
  template <typename T>
  static int32 SolveReducedQuadratic(T p, T q, T& x1, T& x2, T tolerance) {
    T m, s;
    const int32 kind = ReducedQuadratic(p, q, m, s, tolerance);
    if (kind == 2) {
      x1 = m - s;
      x2 = m + s;
    } else {
      x1 = m;
      x2 = kind == 1 ? m : s;
    }
    return kind;
  }

  /// SolveReducedQuadratic with complex roots; the 0 case gives the pair (m, s), (m, -s).
  template <typename T>
  static int32 SolveReducedQuadratic(T p, T q, CNaxComplex<T>& x1, CNaxComplex<T>& x2,
                                     T tolerance) {
    T m, s;
    const int32 kind = ReducedQuadratic(p, q, m, s, tolerance);
    SetQuadraticRoots(kind, m, s, x1, x2);
    return kind;
  }

  /// Roots of a x^2 + b x + c = 0. Codes as SolveReducedQuadratic, and -1 (no solution)
  /// or -2 (every number solves it) when a and b are below tolerance, with x1 = x2 = 0.
  /// The band around a nil discriminant is the fixed 1e-6, not the tolerance.
  template <typename T>
  static int32 SolveQuadratic(T a, T b, T c, T& x1, T& x2, T tolerance) {
    T m, s;
    const int32 kind = Quadratic(a, b, c, m, s, tolerance);
    if (kind == 2) {
      x1 = m - s;
      x2 = m + s;
    } else if (kind < 0) {
      x1 = x2 = T(0);
    } else {
      x1 = m;
      x2 = kind == 1 ? m : s;
    }
    return kind;
  }

  /// SolveQuadratic with complex roots.
  template <typename T>
  static int32 SolveQuadratic(T a, T b, T c, CNaxComplex<T>& x1, CNaxComplex<T>& x2,
                              T tolerance) {
    T m, s;
    const int32 kind = Quadratic(a, b, c, m, s, tolerance);
    if (kind < 0) {
      x1.Set(T(0), T(0));
      x2.Set(T(0), T(0));
    } else {
      SetQuadraticRoots(kind, m, s, x1, x2);
    }
    return kind;
  }

  /// Roots of x^3 + a x^2 + b x + c = 0, not sorted. Returns 3 for three real roots;
  /// 2 for a single root x1 and a double one x2 = x3; 1 for one real root x1 and a complex
  /// pair with x2 its real part and x3 its positive imaginary part.
  template <typename T>
  static int32 SolveReducedCubic(T a, T b, T c, T& x1, T& x2, T& x3, T tolerance) {
    return ReducedCubic(a, b, c, x1, x2, x3, tolerance);
  }

  /// SolveReducedCubic with complex roots; in case 1, x2 has the positive and x3 the
  /// negative imaginary part.
  template <typename T>
  static int32 SolveReducedCubic(T a, T b, T c, CNaxComplex<T>& x1, CNaxComplex<T>& x2,
                                 CNaxComplex<T>& x3, T tolerance) {
    T r1, r2, r3;
    const int32 kind = ReducedCubic(a, b, c, r1, r2, r3, tolerance);
    x1.Set(r1, T(0));
    if (kind == 1) {
      x2.Set(r2, r3);
      x3.Set(r2, -r3);
    } else {
      x2.Set(r2, T(0));
      x3.Set(r3, T(0));
    }
    return kind;
  }

  /// Solves a x + b y = e, c x + d y = f by Cramer's rule. Returns 1 for the unique
  /// solution, -1 for none (x = y = 0), -2 for infinitely many (one of them is written).
  /// quality is 1, or 2 when a unique solution is ill conditioned.
  template <typename T>
  static int32 Solve2x2System(T a, T b, T c, T d, T e, T f, T& x, T& y, int32& quality,
                              T tolerance) {
    quality = 1;
    T det;
    const int32 result = nax::detail::Solve2x2Core(a, b, c, d, e, f, x, y, tolerance, det);
    if (result == 1 && (a * a + b * b + c * c + d * d) / std::fabs(det) * tolerance > T(1))
      quality = 2;
    return result;
  }

  /// Solves the 3x3 system with rows (a, b, c | r1), (d, e, f | r2), (g, h, i | r3) by
  /// Cramer's rule. Returns 1, -1 (x = y = z = 0) or -2 (one member of the family, found
  /// by a descent through the ranks); quality as for Solve2x2System.
  template <typename T>
  static int32 Solve3x3System(T a, T b, T c, T d, T e, T f, T g, T h, T i, T r1, T r2, T r3,
                              T& x, T& y, T& z, int32& quality, T tolerance) {
    quality = 1;
    const T ei_fh = e * i - f * h, di_fg = d * i - f * g, dh_eg = d * h - e * g;
    const T det = a * ei_fh - b * di_fg + c * dh_eg;
    const T dx = r1 * ei_fh - b * (r2 * i - f * r3) + c * (r2 * h - e * r3);
    const T dy = a * (r2 * i - f * r3) - r1 * di_fg + c * (d * r3 - r2 * g);
    const T dz = a * (e * r3 - r2 * h) - b * (d * r3 - r2 * g) + r1 * dh_eg;
    const T absDet = std::fabs(det);
    if (absDet > tolerance) {
      const T inv = T(1) / det;
      x = dx * inv;
      y = dy * inv;
      z = dz * inv;
      const T squares = a * a + b * b + c * c + d * d + e * e + f * f + g * g + h * h + i * i;
      if (squares / absDet * tolerance > T(1)) quality = 2;
      return 1;
    }
    if (std::fabs(dx) > tolerance || std::fabs(dy) > tolerance || std::fabs(dz) > tolerance) {
      x = y = z = T(0);
      return -1;
    }
    const T m[3][4] = {{a, b, c, r1}, {d, e, f, r2}, {g, h, i, r3}};
    T out[3];
    SingularSystem3x3(m, out, tolerance);
    x = out[0];
    y = out[1];
    z = out[2];
    return -2;
  }

  /// Preconditioned conjugate gradients for matrix x = rhs; a matrix that is not symmetric
  /// and positive goes through the normal equations. x holds the start on entry and the
  /// answer on return. Returns 1 when converged, 0 otherwise (x then holds the best iterate).
  template <typename T>
  static int32 SolveByCongugateGradient(const CNaxMatrixN<T>& matrix, const CNaxVectorN<T>& rhs,
                                        CNaxVectorN<T>& x, T tolerance, T regularisation);

  /// n! computed in double; 1 for every n below 2. I is int32 or uint32.
  template <typename I>
  static I Permutations(I n) {
    static_assert(std::is_same_v<I, int32> || std::is_same_v<I, uint32>,
                  "Permutations is instantiated for int32 and uint32 only");
    const double dn = static_cast<double>(n);
    double value = 1.0;
    if (!(1.5 > dn))
      for (double factor = 2.0; factor < dn + 0.5; factor += 1.0) value *= factor;
    return nax::detail::CountFromDouble<I>(value);
  }

  /// Binomial coefficient computed in double; 1 when k <= 0 or k >= n (so also for k > n).
  template <typename I>
  static I Combinations(I n, I k) {
    static_assert(std::is_same_v<I, int32> || std::is_same_v<I, uint32>,
                  "Combinations is instantiated for int32 and uint32 only");
    const double dn = static_cast<double>(n), dk = static_cast<double>(k);
    double value;
    if (dk > dn - 0.5 || 0.5 > dk) {
      value = 1.0;
    } else if (1.5 > dk || dk > dn - 1.5) {
      value = dn;
    } else if (2.5 > dk || dk > dn - 2.5) {
      value = (dn - 1.0) * (0.5 * dn);
    } else {
      value = dn;
      for (double j = 2.0; j < dk + 0.5; j += 1.0) value = (dn + 1.0 - j) * value / j;
    }
    return nax::detail::CountFromDouble<I>(value);
  }

 private:
  // m = -p/2 and s as the reduced form defines them; returns the kind of roots.
  template <typename T>
  static int32 ReducedQuadratic(T p, T q, T& m, T& s, T tolerance) {
    const T disc = T(0.25) * p * p - q;
    m = T(-0.5) * p;
    if (disc > tolerance) {
      s = nax::detail::GuardedSqrt(disc);
      return 2;
    }
    if (-tolerance > disc) {
      s = nax::detail::DefaultTol<T>() > std::fabs(disc) ? T(0) : std::sqrt(-disc);
      return 0;
    }
    s = T(0);
    return 1;
  }

  template <typename T>
  static int32 Quadratic(T a, T b, T c, T& m, T& s, T tolerance) {
    if (tolerance > std::fabs(a)) {
      if (tolerance > std::fabs(b)) return std::fabs(c) < tolerance ? -2 : -1;
      m = -c / b;
      s = T(0);
      return 1;
    }
    const T p = b / a;
    const T disc = T(0.25) * p * p - c / a;
    const T band = nax::detail::MatrixFloor<T>();
    m = T(-0.5) * p;
    if (disc > band) {
      s = std::sqrt(disc);
      return 2;
    }
    if (-band > disc) {
      s = std::sqrt(-disc);
      return 0;
    }
    s = T(0);
    return 1;
  }

  template <typename T>
  static void SetQuadraticRoots(int32 kind, T m, T s, CNaxComplex<T>& x1, CNaxComplex<T>& x2) {
    if (kind == 2) {
      x1.Set(m - s, T(0));
      x2.Set(m + s, T(0));
    } else if (kind == 0) {
      x1.Set(m, s);
      x2.Set(m, -s);
    } else {
      x1.Set(m, T(0));
      x2.Set(m, T(0));
    }
  }

  template <typename T>
  static int32 ReducedCubic(T a, T b, T c, T& x1, T& x2, T& x3, T tolerance) {
    using nax::detail::DefaultTol;
    const T zero = DefaultTol<T>();
    const T Q = (a * a - T(3) * b) / T(9);
    const T R = (((T(2) * a) * a - T(9) * b) * a + T(27) * c) / T(54);
    const T s = a * (T(1) / T(3));
    const T Q3 = Q * Q * Q, R2 = R * R;
    if (Q3 > R2) {
      const T w = zero > std::fabs(Q3) ? T(0) : std::sqrt(Q3);
      const T theta = std::acos(R / w) / T(3);
      const T v = T(-2) * (zero > std::fabs(Q) ? T(0) : std::sqrt(Q));
      const T third = T(2) * nax::detail::Pi<T>() / T(3);
      x1 = v * std::cos(theta) - s;
      x2 = v * std::cos(theta + third) - s;
      x3 = v * std::cos(theta - third) - s;
      return 3;
    }
    const T E = R2 - Q3;
    const T t = zero > std::fabs(E) ? T(0) : std::sqrt(E);
    const T u = std::fabs(R) + t;
    T A = zero > std::fabs(u) ? T(0) : std::pow(u, T(1) / T(3));
    if (!(T(0) > R)) A = -A;
    const T B = tolerance > std::fabs(A) ? T(0) : Q / A;
    x1 = A + B - s;
    if (tolerance > std::fabs(A - B)) {
      x2 = x3 = -(A + s);
      return 2;
    }
    x2 = T(-0.5) * (A + B) - s;
    x3 = (std::sqrt(T(3)) / T(2)) * std::fabs(A - B);
    return 1;
  }

  // The rank descent of Solve3x3System for a singular, consistent system; m holds the
  // augmented rows.
  template <typename T>
  static void SingularSystem3x3(const T (&m)[3][4], T (&out)[3], T tolerance) {
    constexpr int32 kPairs[3][2] = {{0, 1}, {0, 2}, {1, 2}};
    for (const auto& pair : kPairs) {
      const T* p = m[pair[0]];
      const T* q = m[pair[1]];
      const T xy = p[0] * q[1] - p[1] * q[0];
      const T xz = p[0] * q[2] - p[2] * q[0];
      const T yz = p[1] * q[2] - p[2] * q[1];
      const T axy = std::fabs(xy), axz = std::fabs(xz), ayz = std::fabs(yz);
      T largest = axy > axz ? axy : axz;
      if (ayz > largest) largest = ayz;
      if (!(largest > tolerance)) continue;
      // The two columns solved for, and the one set to 1.
      int32 c0, c1, fixed;
      if (axz >= axy) {
        if (ayz < axz) {
          c0 = 0, c1 = 2, fixed = 1;
        } else {
          c0 = 1, c1 = 2, fixed = 0;
        }
      } else if (ayz < axy) {
        c0 = 0, c1 = 1, fixed = 2;
      } else {
        c0 = 1, c1 = 2, fixed = 0;
      }
      T u, v, det;
      nax::detail::Solve2x2Core(p[c0], p[c1], q[c0], q[c1], p[3] - p[fixed], q[3] - q[fixed], u, v,
                                tolerance, det);
      out[fixed] = T(1);
      out[c0] = u;
      out[c1] = v;
      return;
    }
    for (const auto& row : m) {
      const T a0 = std::fabs(row[0]), a1 = std::fabs(row[1]), a2 = std::fabs(row[2]);
      if (!(a0 > tolerance || a1 > tolerance || a2 > tolerance)) continue;
      const int32 pick = (a0 >= a1 && a0 >= a2) ? 0 : (a1 >= a2 ? 1 : 2);
      out[0] = out[1] = out[2] = T(1);
      out[pick] = (row[3] - (row[0] + row[1] + row[2] - row[pick])) / row[pick];
      return;
    }
    out[0] = out[1] = out[2] = T(1);
  }
};

#define NAX_ALGEBRA_DECLARE(EXTERN, T)                                                          \
  EXTERN template int32 CNaxAlgebra::SolveReducedQuadratic<T>(T, T, T&, T&, T);                 \
  EXTERN template int32 CNaxAlgebra::SolveReducedQuadratic<T>(T, T, CNaxComplex<T>&,            \
                                                              CNaxComplex<T>&, T);              \
  EXTERN template int32 CNaxAlgebra::SolveQuadratic<T>(T, T, T, T&, T&, T);                     \
  EXTERN template int32 CNaxAlgebra::SolveQuadratic<T>(T, T, T, CNaxComplex<T>&,                \
                                                       CNaxComplex<T>&, T);                     \
  EXTERN template int32 CNaxAlgebra::SolveReducedCubic<T>(T, T, T, T&, T&, T&, T);              \
  EXTERN template int32 CNaxAlgebra::SolveReducedCubic<T>(T, T, T, CNaxComplex<T>&,             \
                                                          CNaxComplex<T>&, CNaxComplex<T>&, T); \
  EXTERN template int32 CNaxAlgebra::Solve2x2System<T>(T, T, T, T, T, T, T&, T&, int32&, T);    \
  EXTERN template int32 CNaxAlgebra::Solve3x3System<T>(T, T, T, T, T, T, T, T, T, T, T, T, T&,  \
                                                       T&, T&, int32&, T);                     \
  EXTERN template int32 CNaxAlgebra::SolveByCongugateGradient<T>(                                \
      const CNaxMatrixN<T>&, const CNaxVectorN<T>&, CNaxVectorN<T>&, T, T);

NAX_ALGEBRA_DECLARE(extern, float)
NAX_ALGEBRA_DECLARE(extern, double)
extern template int32 CNaxAlgebra::Permutations<int32>(int32);
extern template uint32 CNaxAlgebra::Permutations<uint32>(uint32);
extern template int32 CNaxAlgebra::Combinations<int32>(int32, int32);
extern template uint32 CNaxAlgebra::Combinations<uint32>(uint32, uint32);

#endif  // NAX_ALGEBRA_H
