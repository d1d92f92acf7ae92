// Loops of the fixed matrices over their inline row-major arrays of N x N elements, for
// N = 2, 3, 4: products, norms, shape tests, Doolittle LU, Householder QR, the cyclic
// Jacobi eigenvalue method, a one-sided Jacobi singular value decomposition and the
// Newton iteration of the polar decomposition. Nothing here allocates; the bounds are
// compile-time constants so the loops unroll.
//
// Jacobi eigenvalues: W. H. Press et al., Numerical Recipes, 2nd ed., section 11.1.
// One-sided Jacobi SVD: M. R. Hestenes, J. SIAM 6 (1958) 51-90; J. Demmel and K. Veselic,
// SIAM J. Matrix Anal. Appl. 13 (1992) 1204-1245.
// Polar decomposition by Newton's iteration: N. J. Higham, SIAM J. Sci. Stat. Comput. 7
// (1986) 1160-1174.
#ifndef NAX_DETAIL_FIXED_LINALG_H
#define NAX_DETAIL_FIXED_LINALG_H

#include <cmath>
#include <limits>

#include "nax/detail/fixed_common.h"

namespace nax::detail {

template <typename T, int N>
struct Fixed {
  static constexpr int kSize = N * N;

  static void Identity(T* a) {
    for (int i = 0; i < kSize; ++i) a[i] = T(0);
    for (int i = 0; i < N; ++i) a[i * N + i] = T(1);
  }

  /// out = a * b; out must not alias a or b.
  static void Product(const T* a, const T* b, T* out) {
    for (int r = 0; r < N; ++r)
      for (int c = 0; c < N; ++c) {
        T s = a[r * N] * b[c];
        for (int k = 1; k < N; ++k) s += a[r * N + k] * b[k * N + c];
        out[r * N + c] = s;
      }
  }

  /// out = a^T * b.
  static void TransposeProduct(const T* a, const T* b, T* out) {
    for (int r = 0; r < N; ++r)
      for (int c = 0; c < N; ++c) {
        T s = T(0);
        for (int k = 0; k < N; ++k) s += a[k * N + r] * b[k * N + c];
        out[r * N + c] = s;
      }
  }

  /// out = a * b^T.
  static void ProductTranspose(const T* a, const T* b, T* out) {
    for (int r = 0; r < N; ++r)
      for (int c = 0; c < N; ++c) {
        T s = T(0);
        for (int k = 0; k < N; ++k) s += a[r * N + k] * b[c * N + k];
        out[r * N + c] = s;
      }
  }

  static void Transpose(const T* a, T* out) {
    for (int r = 0; r < N; ++r)
      for (int c = 0; c < N; ++c) out[c * N + r] = a[r * N + c];
  }

  static T NormOne(const T* a) {
    T best = T(0);
    for (int c = 0; c < N; ++c) {
      T s = T(0);
      for (int r = 0; r < N; ++r) s += std::fabs(a[r * N + c]);
      if (c == 0 || s > best) best = s;
    }
    return best;
  }
  static T NormInfinity(const T* a) {
    T best = T(0);
    for (int r = 0; r < N; ++r) {
      T s = T(0);
      for (int c = 0; c < N; ++c) s += std::fabs(a[r * N + c]);
      if (r == 0 || s > best) best = s;
    }
    return best;
  }
  static T MaxAbsElement(const T* a) {
    T m = std::fabs(a[0]);
    for (int i = 1; i < kSize; ++i) m = Max2(m, std::fabs(a[i]));
    return m;
  }
  /// Frobenius norm with its coarse floor: 0 unless the sum of squares exceeds 1e-6.
  static T NormFrobenius(const T* a) {
    T s = T(0);
    for (int i = 0; i < kSize; ++i) s += a[i] * a[i];
    if (!(s > MatrixFloor<T>()) || std::fabs(s) < DefaultTol<T>()) return T(0);
    return std::sqrt(s);
  }

  static int32 IsAlmostZero(const T* a, T tol) {
    for (int i = 0; i < kSize; ++i)
      if (std::fabs(a[i]) > tol) return 0;
    return 1;
  }
  static int32 IsDiagonal(const T* a, T tol) {
    for (int r = 0; r < N; ++r)
      for (int c = 0; c < N; ++c)
        if (r != c && std::fabs(a[r * N + c]) > tol) return 0;
    return 1;
  }
  static int32 IsUnit(const T* a, T tol) {
    for (int r = 0; r < N; ++r)
      for (int c = 0; c < N; ++c)
        if (std::fabs(a[r * N + c] - (r == c ? T(1) : T(0))) > tol) return 0;
    return 1;
  }
  static int32 IsSymmetric(const T* a, T tol) {
    for (int r = 0; r < N; ++r)
      for (int c = r + 1; c < N; ++c)
        if (std::fabs(a[r * N + c] - a[c * N + r]) > tol) return 0;
    return 1;
  }
  /// Lower left triangular: nothing above the diagonal.
  static int32 IsLLTriangular(const T* a, T tol) {
    for (int r = 0; r < N; ++r)
      for (int c = r + 1; c < N; ++c)
        if (std::fabs(a[r * N + c]) > tol) return 0;
    return 1;
  }
  /// Upper right triangular: nothing below the diagonal.
  static int32 IsURTriangular(const T* a, T tol) {
    for (int r = 0; r < N; ++r)
      for (int c = 0; c < r; ++c)
        if (std::fabs(a[r * N + c]) > tol) return 0;
    return 1;
  }
  /// a a^T is the identity within tol, element by element.
  static int32 IsOrthogonal(const T* a, T tol) {
    T p[kSize];
    ProductTranspose(a, a, p);
    return IsUnit(p, tol);
  }

  static T Mean(const T* a) {
    T s = T(0);
    for (int i = 0; i < kSize; ++i) s += a[i];
    return s / T(kSize);
  }
  static T InnerProduct(const T* a, const T* b) {
    T s = T(0);
    for (int i = 0; i < kSize; ++i) s += a[i] * b[i];
    return s;
  }
  /// Pearson correlation of the two element sets; 0 when either set is constant.
  static T Correlation(const T* a, const T* b) {
    const T ma = Mean(a), mb = Mean(b);
    T sab = T(0), saa = T(0), sbb = T(0);
    for (int i = 0; i < kSize; ++i) {
      const T da = a[i] - ma, db = b[i] - mb;
      sab += da * db;
      saa += da * da;
      sbb += db * db;
    }
    const T d = std::sqrt(saa * sbb);
    return d > T(0) ? sab / d : T(0);
  }

  static void AnnulateSmall(T* a, T tol) {
    for (int i = 0; i < kSize; ++i)
      if (tol > std::fabs(a[i])) a[i] = T(0);
  }

  /// Inverse of a diagonal matrix: 1, or 0 when an off-diagonal element exceeds tol or the
  /// product of the diagonal is below tol.
  static int32 DiagInverse(const T* a, T* out, T tol) {
    if (!IsDiagonal(a, tol)) return 0;
    T det = T(1);
    for (int i = 0; i < N; ++i) det *= a[i * N + i];
    if (!(tol <= std::fabs(det))) return 0;
    for (int i = 0; i < kSize; ++i) out[i] = T(0);
    for (int i = 0; i < N; ++i) out[i * N + i] = T(1) / a[i * N + i];
    return 1;
  }

  /// Doolittle without pivoting: lower has a unit diagonal. Returns 1, or 0 at a pivot below
  /// tol, with the factors as far as they got.
  static int32 LU(const T* a, T* lower, T* upper, T tol) {
    for (int i = 0; i < kSize; ++i) lower[i] = upper[i] = T(0);
    if (std::fabs(a[0]) < tol) return 0;
    lower[0] = T(1);
    upper[0] = a[0];
    for (int j = 1; j < N; ++j) {
      lower[j * N + j] = T(1);
      upper[j] = a[j];
      lower[j * N] = a[j * N] / a[0];
    }
    for (int k = 1; k < N; ++k) {
      T s = a[k * N + k];
      for (int m = 0; m < k; ++m) s -= lower[k * N + m] * upper[m * N + k];
      upper[k * N + k] = s;
      if (std::fabs(s) < tol) return 0;
      for (int j = k + 1; j < N; ++j) {
        T u = a[k * N + j], l = a[j * N + k];
        for (int m = 0; m < k; ++m) {
          u -= lower[k * N + m] * upper[m * N + j];
          l -= lower[j * N + m] * upper[m * N + k];
        }
        upper[k * N + j] = u;
        lower[j * N + k] = l / s;
      }
    }
    return 1;
  }

  /// Householder QR, a = q r. The reflection takes the sign of the pivot itself, so r's
  /// diagonal keeps the signs of the columns. Returns 0.
  static int32 QR(const T* a, T* q, T* r, T tol) {
    Identity(q);
    for (int i = 0; i < kSize; ++i) r[i] = a[i];
    for (int k = 0; k < N; ++k) {
      T v[N];
      for (int i = k; i < N; ++i) v[i] = r[i * N + k];
      const T x0 = v[k];
      T scale = std::fabs(x0);
      for (int i = k + 1; i < N; ++i) scale = Max2(scale, std::fabs(v[i]));
      if (tol > scale) continue;
      T sum = T(0);
      for (int i = k; i < N; ++i) sum += (v[i] / scale) * (v[i] / scale);
      T alpha = scale * (std::fabs(sum) < DefaultTol<T>() ? T(0) : std::sqrt(sum));
      if (x0 < T(0)) alpha = -alpha;
      v[k] = x0 - alpha;
      r[k * N + k] = alpha;
      const T beta = alpha * v[k];
      if (k + 1 >= N || !(beta <= -tol)) continue;
      for (int c = k + 1; c < N; ++c) {
        T s = T(0);
        for (int i = k; i < N; ++i) s += v[i] * r[i * N + c];
        s /= beta;
        for (int i = k; i < N; ++i) r[i * N + c] += s * v[i];
      }
      for (int row = 0; row < N; ++row) {
        T s = T(0);
        for (int i = k; i < N; ++i) s += q[row * N + i] * v[i];
        s /= beta;
        for (int i = k; i < N; ++i) q[row * N + i] += s * v[i];
      }
    }
    for (int row = 1; row < N; ++row)
      for (int c = 0; c < row; ++c) r[row * N + c] = T(0);
    AnnulateSmall(r, tol);
    return 0;
  }

  // One rotation step of the Jacobi method on two elements.
  static void Rotate(T* a, int i, int j, int k, int l, T s, T tau) {
    const T g = a[i * N + j], h = a[k * N + l];
    a[i * N + j] = g - s * (h + g * tau);
    a[k * N + l] = h + s * (g - h * tau);
  }

  static bool SameInFloat(T big, T small) {
    return static_cast<float>(big) + static_cast<float>(small) == static_cast<float>(big);
  }

  /// Cyclic Jacobi with threshold on a symmetric work matrix, which it destroys. The
  /// eigenvectors stand in the columns of vectors; rotations receives their count.
  static void Jacobi(T* work, T* values, T* vectors, int32 sweeps, int32& rotations, T tol) {
    const T root = DefaultTol<T>();
    T b[N], z[N];
    Identity(vectors);
    for (int i = 0; i < N; ++i) b[i] = values[i] = work[i * N + i], z[i] = T(0);
    rotations = 0;
    for (int32 sweep = 1; sweep <= sweeps; ++sweep) {
      T sum = T(0);
      for (int p = 0; p < N - 1; ++p)
        for (int q = p + 1; q < N; ++q) sum += std::fabs(work[p * N + q]);
      if (tol > sum) return;
      const T threshold = sweep < 4 ? T(0.2) * sum / T(N * N) : T(0);
      for (int p = 0; p < N - 1; ++p)
        for (int q = p + 1; q < N; ++q) {
          const T apq = work[p * N + q];
          const T g = T(100) * std::fabs(apq);
          if (sweep > 4 && SameInFloat(std::fabs(values[p]), g) && SameInFloat(std::fabs(values[q]), g)) {
            work[p * N + q] = T(0);
            continue;
          }
          if (!(std::fabs(apq) > threshold)) continue;
          T h = values[q] - values[p];
          T t;
          if (SameInFloat(std::fabs(h), g)) {
            t = apq / h;
          } else {
            const T theta = T(0.5) * h / apq;
            const T r = std::fabs(theta * theta + T(1)) < root ? T(0) : std::sqrt(theta * theta + T(1));
            t = T(1) / (std::fabs(theta) + r);
            if (theta < T(0)) t = -t;
          }
          const T rc = std::fabs(t * t + T(1)) < root ? T(0) : std::sqrt(t * t + T(1));
          const T c = T(1) / rc, s = t * c, tau = s / (T(1) + c);
          h = t * apq;
          z[p] -= h;
          z[q] += h;
          values[p] -= h;
          values[q] += h;
          work[p * N + q] = T(0);
          for (int j = 0; j < p; ++j) Rotate(work, j, p, j, q, s, tau);
          for (int j = p + 1; j < q; ++j) Rotate(work, p, j, j, q, s, tau);
          for (int j = q + 1; j < N; ++j) Rotate(work, p, j, q, j, s, tau);
          for (int j = 0; j < N; ++j) Rotate(vectors, j, p, j, q, s, tau);
          ++rotations;
        }
      for (int i = 0; i < N; ++i) {
        b[i] += z[i];
        values[i] = b[i];
        z[i] = T(0);
      }
    }
  }

  /// Sorts the values in ascending order (stable) and permutes the columns of vectors.
  static void SortAscending(T* values, T* vectors) {
    for (int i = 1; i < N; ++i)
      for (int j = i; j > 0 && values[j] < values[j - 1]; --j) {
        const T t = values[j];
        values[j] = values[j - 1];
        values[j - 1] = t;
        for (int r = 0; r < N; ++r) {
          const T e = vectors[r * N + j];
          vectors[r * N + j] = vectors[r * N + j - 1];
          vectors[r * N + j - 1] = e;
        }
      }
  }

  /// Eigenvalues in ascending order with their vectors in the columns; the symmetry test,
  /// the 50-sweep limit and the rotation-count test of the run-time sized matrix.
  static naxStatus SymmetricEigensolve(const T* a, T* values, T* vectors, T tol) {
    if (!IsSymmetric(a, tol)) return naxStatusNotSymmetric;
    T work[kSize];
    for (int i = 0; i < kSize; ++i) work[i] = a[i];
    int32 rotations;
    Jacobi(work, values, vectors, 50, rotations, tol);
    if (rotations == 50) return naxStatusTooManyRotations;
    SortAscending(values, vectors);
    return naxStatusOk;
  }

  /// Singular value decomposition a = u diag(w) v^T by one-sided Jacobi rotations: values
  /// non-negative and in descending order, u and v orthogonal. Returns 0, or 1 when 30
  /// sweeps do not converge.
  static int32 SVD(const T* a, T* u, T* w, T* v) {
    const T eps = std::numeric_limits<T>::epsilon();
    for (int i = 0; i < kSize; ++i) u[i] = a[i];
    Identity(v);
    int32 status = 1;
    for (int sweep = 0; sweep < 30; ++sweep) {
      bool rotated = false;
      for (int p = 0; p < N - 1; ++p)
        for (int q = p + 1; q < N; ++q) {
          T alpha = T(0), beta = T(0), gamma = T(0);
          for (int i = 0; i < N; ++i) {
            alpha += u[i * N + p] * u[i * N + p];
            beta += u[i * N + q] * u[i * N + q];
            gamma += u[i * N + p] * u[i * N + q];
          }
          if (gamma == T(0) || std::fabs(gamma) <= eps * std::sqrt(alpha * beta)) continue;
          rotated = true;
          const T zeta = (beta - alpha) / (T(2) * gamma);
          T t = T(1) / (std::fabs(zeta) + std::sqrt(T(1) + zeta * zeta));
          if (zeta < T(0)) t = -t;
          const T c = T(1) / std::sqrt(T(1) + t * t), s = c * t;
          for (int i = 0; i < N; ++i) {
            const T up = u[i * N + p], uq = u[i * N + q];
            u[i * N + p] = c * up - s * uq;
            u[i * N + q] = s * up + c * uq;
            const T vp = v[i * N + p], vq = v[i * N + q];
            v[i * N + p] = c * vp - s * vq;
            v[i * N + q] = s * vp + c * vq;
          }
        }
      if (!rotated) {
        status = 0;
        break;
      }
    }
    for (int j = 0; j < N; ++j) {
      T s = T(0);
      for (int i = 0; i < N; ++i) s += u[i * N + j] * u[i * N + j];
      w[j] = std::sqrt(s);
    }
    // Descending order by selection; the first of equal values stays in front.
    for (int i = 0; i < N - 1; ++i) {
      int k = i;
      for (int j = i + 1; j < N; ++j)
        if (w[j] > w[k]) k = j;
      if (k == i) continue;
      const T t = w[i];
      w[i] = w[k];
      w[k] = t;
      for (int r = 0; r < N; ++r) {
        T e = u[r * N + i];
        u[r * N + i] = u[r * N + k];
        u[r * N + k] = e;
        e = v[r * N + i];
        v[r * N + i] = v[r * N + k];
        v[r * N + k] = e;
      }
    }
    // Normalise the columns of u; those of vanishing values are completed to an
    // orthonormal basis by Gram-Schmidt on the unit vectors.
    const T floor = w[0] * eps * T(N) + std::numeric_limits<T>::min();
    int e = 0;
    for (int j = 0; j < N; ++j) {
      if (w[j] > floor) {
        for (int i = 0; i < N; ++i) u[i * N + j] /= w[j];
        continue;
      }
      w[j] = w[j] > T(0) ? w[j] : T(0);
      for (; e < N; ++e) {
        T col[N];
        for (int i = 0; i < N; ++i) col[i] = i == e ? T(1) : T(0);
        for (int pass = 0; pass < 2; ++pass)
          for (int k = 0; k < j; ++k) {
            T d = T(0);
            for (int i = 0; i < N; ++i) d += u[i * N + k] * col[i];
            for (int i = 0; i < N; ++i) col[i] -= d * u[i * N + k];
          }
        T n = T(0);
        for (int i = 0; i < N; ++i) n += col[i] * col[i];
        if (n > T(0.25)) {
          n = std::sqrt(n);
          for (int i = 0; i < N; ++i) u[i * N + j] = col[i] / n;
          ++e;
          break;
        }
      }
    }
    return status;
  }
};

/// Polar decomposition of a fixed matrix by Newton's iteration Q <- (Q + Q^-T) / 2, after
/// the determinant test and the diagonal and orthogonal shortcuts. this = rotation * stretch
/// when right is not 0, stretch * rotation when it is 0; the stretch is symmetrised.
/// Returns 0 with nothing written when |det| <= tol or an inverse fails; when
/// exhaustFails is set, also 0 (with the outputs written) after maxRounds rounds.
template <typename M, typename T>
int32 PolarNewton(const M& a, M& rotation, M& stretch, int32 right, T tol, int32 maxRounds, bool exhaustFails) {
  if (!(std::fabs(a.Det()) > tol)) return 0;
  if (a.IsDiagonal(tol)) {
    rotation.Unit();
    stretch = a;
    return 1;
  }
  if (a.IsOrthogonal(tol)) {
    rotation = a;
    stretch.Unit();
    return 1;
  }
  M q = a;
  int32 round = 0;
  for (; round < maxRounds; ++round) {
    M inverse;
    T condition;
    if (q.Inverse(inverse, naxMatrixNormFrobenius, tol, condition) != 0) return 0;
    const M next = (q + inverse.Transpose()) * T(0.5);
    const bool done = (next - q).IsAlmostZero(tol);
    q = next;
    if (done) break;
  }
  rotation = q;
  const M p = right ? q.Transpose() * a : a * q.Transpose();
  stretch = (p + p.Transpose()) * T(0.5);
  return exhaustFails && round == maxRounds ? 0 : 1;
}

}  // namespace nax::detail

#endif  // NAX_DETAIL_FIXED_LINALG_H
