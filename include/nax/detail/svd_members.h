// Singular value decompositions of CNaxMatrixMN. Included by nax/matrix_mn.h.
//
// SV_Decomposition: Householder bidiagonalisation followed by implicit QR sweeps on the
// bidiagonal with zero-diagonal chases, after G. H. Golub and C. Reinsch, "Singular value
// decomposition and least squares solutions", Numer. Math. 14 (1970), with the routine
// structure of C. L. Lawson and R. J. Hanson, "Solving Least Squares Problems" (1974),
// chapter 18. ThinSVD: the classical compact in-place Golub-Reinsch procedure.
//
// The sweeps run on compact arrays. The right factor is kept transposed while the sweeps
// run (each right vector a row), so that every rotation, left or right, walks two
// contiguous rows.
#ifndef NAX_DETAIL_SVD_MEMBERS_H
#define NAX_DETAIL_SVD_MEMBERS_H

#include <vector>

namespace nax::detail {

/// (x, y) <- (c x + s y, -s x + c y) over n pairs of two contiguous rows.
template <typename T>
inline void RotateRows(int32 n, T c, T s, T* __restrict x, T* __restrict y) {
  for (int32 j = 0; j < n; ++j) {
    const T xj = x[j], yj = y[j];
    x[j] = c * xj + s * yj;
    y[j] = c * yj - s * xj;
  }
}

/// Sets the elements with tol > |a| to 0 over n contiguous values.
template <typename T>
inline void AnnulateBelow(int32 n, T* a, T tol) {
  for (int32 i = 0; i < n; ++i) a[i] = tol > std::fabs(a[i]) ? T(0) : a[i];
}

/// Applies the reflection I + v v^T / b, v = (up at pivot, u[first..last)), to count row
/// vectors of c (vector r holds its element i at c[r * ld + i]). A vector whose product with
/// v is exactly 0 is left as it is.
template <typename T>
void ReflectRows(int32 pivot, int32 first, int32 last, T up, const T* u, T b, T* c, int32 ld,
                 int32 count) {
  for (int32 r = 0; r < count; ++r) {
    T* row = c + static_cast<int64>(r) * ld;
    T sum = row[pivot] * up;
    for (int32 i = first; i < last; ++i) sum += row[i] * u[i];
    if (sum == T(0)) continue;
    sum /= b;
    row[pivot] += sum * up;
    for (int32 i = first; i < last; ++i) row[i] += sum * u[i];
  }
}

/// The same reflection on count column vectors of c (vector j holds its element i at
/// c[i * ld + j]); the products are formed row by row so that memory is walked in order.
template <typename T>
void ReflectColumns(int32 pivot, int32 first, int32 last, T up, const T* u, T b, T* c,
                    int32 ld, int32 count) {
  std::vector<T> sums(count);
  const T* p = c + static_cast<int64>(pivot) * ld;
  for (int32 j = 0; j < count; ++j) sums[j] = p[j] * up;
  for (int32 i = first; i < last; ++i) {
    const T* row = c + static_cast<int64>(i) * ld;
    const T ui = u[i];
    for (int32 j = 0; j < count; ++j) sums[j] += row[j] * ui;
  }
  for (int32 j = 0; j < count; ++j) sums[j] /= b;
  T* pw = c + static_cast<int64>(pivot) * ld;
  for (int32 j = 0; j < count; ++j) pw[j] += sums[j] * up;
  for (int32 i = first; i < last; ++i) {
    T* row = c + static_cast<int64>(i) * ld;
    const T ui = u[i];
    for (int32 j = 0; j < count; ++j) row[j] += sums[j] * ui;
  }
}

/// Row i of the result is row perm(i) of m, where the symmetric permutation matrix p holds
/// disjoint exchanges: swaps the rows of each exchange once.
template <typename T>
void PermuteRows(const T* p, int32 n, T* m, int32 cols) {
  for (int32 i = 0; i < n; ++i) {
    int32 k = 0;
    while (k < n && p[i * n + k] == T(0)) ++k;
    if (k > i && k < n)
      std::swap_ranges(m + static_cast<int64>(i) * cols, m + static_cast<int64>(i + 1) * cols,
                       m + static_cast<int64>(k) * cols);
  }
}

}  // namespace nax::detail

template <typename T>
T CNaxMatrixMN<T>::Pythagoras(T a, T b) const {
  const T p = std::fabs(a), q = std::fabs(b);
  if (p > q) {
    const T r = q / p;
    return p * nax::detail::RootNoFloor(T(1) + r * r);
  }
  if (nax::detail::InClosedTol(q, nax::detail::DefaultTol<T>())) return T(0);
  const T r = p / q;
  return q * nax::detail::RootNoFloor(T(1) + r * r);
}

template <typename T>
void CNaxMatrixMN<T>::Givens1(T a, T b, T& cosine, T& sine, T& radius, T tol) {
  const T absA = std::fabs(a), absB = std::fabs(b);
  if (absA >= absB && absA > tol) {
    const T r = b / a;
    radius = absA * nax::detail::RootNoFloor(T(1) + r * r);
  } else if (absB > absA && absB > tol) {
    const T r = a / b;
    radius = absB * nax::detail::RootNoFloor(T(1) + r * r);
  } else {
    radius = T(0);
  }
  // The factor 1.5 keeps rotations of a radius near the tolerance from amplifying noise.
  if (radius < T(1.5) * tol) {
    cosine = T(1);
    sine = T(0);
  } else {
    cosine = a / radius;
    sine = b / radius;
  }
}

template <typename T>
void CNaxMatrixMN<T>::Givens2(T cosine, T sine, T& x, T& y) {
  const T xx = x;
  x = cosine * xx + sine * y;
  y = -sine * xx + cosine * y;
}

// Constructs the reflection that zeroes u[first..last) against u[pivot]; with vectors > 0
// applies it to that many column vectors of c (element i of vector j at c[i * ldc + j], ldc
// defaulting to vectors). Returns 1 when a reflection was constructed (and applied), else 0;
// a negative vectors constructs and reports without applying.
template <typename T>
int32 CNaxMatrixMN<T>::Householder1(int32 pivot, int32 first, int32 last, int32 vectors, T& up,
                                    T* u, T* c, T tol, int32 ldc) {
  if (pivot >= last) return 0;
  if (pivot == last - 1) {
    const T s = SignA(u[pivot], u[pivot]);
    up = u[pivot] - s;
    u[pivot] = s;
    return 0;
  }
  T scale = std::fabs(u[pivot]);
  for (int32 i = first; i < last; ++i) scale = std::max(scale, std::fabs(u[i]));
  if (tol > scale) return 0;
  T sum = (u[pivot] / scale) * (u[pivot] / scale);
  for (int32 i = first; i < last; ++i) sum += (u[i] / scale) * (u[i] / scale);
  // The sign is that of the pivot itself (0 counting as positive).
  T s = scale * nax::detail::RootNoFloor(sum);
  if (u[pivot] < T(0)) s = -s;
  up = u[pivot] - s;
  u[pivot] = s;
  if (vectors == 0) return 0;
  const T b = s * up;
  if (b > -tol) return 0;
  if (vectors < 1) return 1;
  nax::detail::ReflectColumns(pivot, first, last, up, u, b, c, ldc > 0 ? ldc : vectors, vectors);
  return 1;
}

template <typename T>
void CNaxMatrixMN<T>::Householder2(int32 pivot, int32 first, int32 last, T up, T* u,
                                   CNaxMatrixMN& c, T tol) {
  if (pivot >= last || last == 0) return;
  const T b = u[pivot] * up;
  if (!(b < -tol)) return;
  nax::detail::ReflectColumns(pivot, first, last, up, u, b, c.data, c.cols, c.cols);
}

template <typename T>
void CNaxMatrixMN<T>::TestZeroRowsColumns(int32& zeroRows, int32& zeroCols, T tol) const {
  zeroRows = 0;
  zeroCols = 0;
  std::vector<char> colNonZero(cols, 0);
  for (int32 r = 0; r < rows; ++r) {
    bool nonZero = false;
    for (int32 c = 0; c < cols; ++c) {
      if (std::fabs(data[r * cols + c]) > tol) {
        nonZero = true;
        colNonZero[c] = 1;
      }
    }
    if (!nonZero) ++zeroRows;
  }
  for (int32 c = 0; c < cols; ++c)
    if (!colNonZero[c]) ++zeroCols;
}

// Moves zero rows to the end by exchanges with the last non-zero rows; each exchange is
// written into permutation (an identity on entry), so this becomes permutation * this.
template <typename T>
int32 CNaxMatrixMN<T>::MoveZeroRows(int32 count, CNaxMatrixMN& permutation, T tol) {
  auto isZero = [&](int32 r) {
    for (int32 c = 0; c < cols; ++c)
      if (std::fabs(data[r * cols + c]) > tol) return false;
    return true;
  };
  int32 i = 0, j = rows - 1;
  for (int32 moved = 0; moved < count; ++moved) {
    while (i < j && !isZero(i)) ++i;
    while (j > i && isZero(j)) --j;
    if (i >= j) break;
    std::swap_ranges(data + i * cols, data + (i + 1) * cols, data + j * cols);
    permutation.SetElementTransposition(i, j);
    ++i;
    --j;
  }
  return 0;
}

// Moves zero columns to the end likewise: this becomes this * permutation.
template <typename T>
int32 CNaxMatrixMN<T>::MoveZeroColumns(int32 count, CNaxMatrixMN& permutation, T tol) {
  auto isZero = [&](int32 c) {
    for (int32 r = 0; r < rows; ++r)
      if (std::fabs(data[r * cols + c]) > tol) return false;
    return true;
  };
  int32 i = 0, j = cols - 1;
  for (int32 moved = 0; moved < count; ++moved) {
    while (i < j && !isZero(i)) ++i;
    while (j > i && isZero(j)) --j;
    if (i >= j) break;
    for (int32 r = 0; r < rows; ++r) std::swap(data[r * cols + i], data[r * cols + j]);
    permutation.SetElementTransposition(i, j);
    ++i;
    --j;
  }
  return 0;
}

template <typename T>
int32 CNaxMatrixMN<T>::QRT_2D(CNaxMatrixMN& q, CNaxMatrixMN& b, CNaxMatrixMN& w, T tol) {
  if (rows < cols) return 6;
  const int32 m = rows, n = cols;
  q.SetDiagonal(T(1));
  w.SetDiagonal(T(1));
  b.Base::operator=(*this);
  T* bd = b.data;
  // Elements of the orthogonal factors below this fixed floor are dropped after each
  // accumulation, whatever tol is.
  const T floor = T(1e-6);
  std::vector<T> column(m), row(n);
  for (int32 k = 0; k < n; ++k) {
    // Left reflection: column k below the diagonal, applied to the columns after k.
    for (int32 i = k; i < m; ++i) column[i] = bd[i * n + k];
    T up = T(0);
    const int32 rest = n - k - 1;
    if (Householder1(k, k + 1, m, rest > 0 ? rest : -1, up, column.data(), bd + k + 1, tol, n)) {
      bd[k * n + k] = column[k];
      for (int32 i = k + 1; i < m; ++i) bd[i * n + k] = T(0);
      nax::detail::ReflectRows(k, k + 1, m, up, column.data(), column[k] * up, q.data, m, m);
      for (int32 i = 0; i < m; ++i) nax::detail::AnnulateBelow(m - k, q.data + i * m + k, floor);
    }
    // Right reflection: row k beyond the superdiagonal, applied to the rows below k.
    if (k + 1 >= n) continue;
    std::copy(bd + k * n, bd + (k + 1) * n, row.begin());
    if (Householder1(k + 1, k + 2, n, -1, up, row.data(), nullptr, tol)) {
      const T beta = row[k + 1] * up;
      nax::detail::ReflectRows(k + 1, k + 2, n, up, row.data(), beta, bd + (k + 1) * n, n,
                               m - k - 1);
      bd[k * n + k + 1] = row[k + 1];
      for (int32 j = k + 2; j < n; ++j) bd[k * n + j] = T(0);
      nax::detail::ReflectRows(k + 1, k + 2, n, up, row.data(), beta, w.data, n, n);
      for (int32 i = 0; i < n; ++i)
        nax::detail::AnnulateBelow(n - k - 1, w.data + i * n + k + 1, floor);
    }
  }
  b.AnnulateSmallElements(tol);
  return 0;
}

template <typename T>
void CNaxMatrixMN<T>::ZeroRightTransform(int32 n, int32 k, T* work, CNaxMatrixMN& u, T tol) {
  T* d = work;
  T* e = work + n;
  T f = e[k + 1];
  e[k + 1] = T(0);
  for (int32 j = k + 1; j < n; ++j) {
    T c, s, r;
    Givens1(d[j], f, c, s, r, tol);
    d[j] = r;
    if (j < n - 1) {
      f = -s * e[j + 1];
      e[j + 1] *= c;
    } else {
      f = T(0);
    }
    nax::detail::RotateRows(u.cols, c, s, u.data + j * u.cols, u.data + k * u.cols);
  }
  nax::detail::AnnulateBelow((n - k) * u.cols, u.data + k * u.cols, tol);
  for (int32 i = 0; i < 2 * n; ++i)
    if (tol >= std::fabs(work[i])) work[i] = T(0);
}

// vt is the right factor transposed: rotating columns j and k of the factor rotates rows
// j and k of vt.
template <typename T>
void CNaxMatrixMN<T>::ZeroUpperTransform(int32 n, int32 k, T* work, CNaxMatrixMN& vt, T tol) {
  T* d = work;
  T* e = work + n;
  T f = e[k];
  e[k] = T(0);
  for (int32 j = k - 1; j >= 0; --j) {
    T c, s, r;
    Givens1(d[j], f, c, s, r, tol);
    d[j] = r;
    if (j > 0) {
      f = -s * e[j];
      e[j] *= c;
    }
    nax::detail::RotateRows(vt.cols, c, s, vt.data + j * vt.cols, vt.data + k * vt.cols);
  }
  nax::detail::AnnulateBelow((k + 1) * vt.cols, vt.data, tol);
  for (int32 i = 0; i < 2 * n; ++i)
    if (tol >= std::fabs(work[i])) work[i] = T(0);
}

// Sweeps the unreduced block of n values d[0..n), e[1..n) until a coupling falls to tol or
// below (split is its index) or the bottom value converges (split = n - 1). The right
// rotations act on the n rows of v (the transposed right vectors, vRows values each), the
// left ones on the n rows of c (cCols values each). 1 when 30 sweeps do not suffice.
template <typename T>
int32 CNaxMatrixMN<T>::QRBD(int32 n, int32 vRows, int32 cCols, int32& split, T* d, T* e, T* v,
                            T* c, T tol) {
  const int32 m = n - 1;
  split = -1;
  if (n < 2) {
    split = m;
    return 0;
  }
  int32 sweeps = 0;
  for (;;) {
    for (int32 l = m; l >= 1; --l) {
      if (tol >= std::fabs(e[l])) {
        split = l;
        return 0;
      }
    }
    // Shift from the trailing 2 x 2 block; the fixed 1e15 stands in when 2 h y vanishes.
    e[0] = T(0);
    const T x = d[0], y = d[m - 1], z = d[m], g = e[m - 1], h = e[m];
    const T f = std::fabs(T(2) * h * y) > tol
                    ? ((z - y) * (z + y) + (h - g) * (h + g)) / (T(2) * h * y)
                    : T(1e15);
    const T r = nax::detail::RootNoFloor(f * f + T(1));
    const T t = f < T(0) ? f + r : f - r;
    e[0] = x - (z * z + h * (h - y * t)) / x;
    // Chase the bulge down the block.
    T bulge = e[1];
    for (int32 i = 1; i <= m; ++i) {
      T cs, sn, radius;
      Givens1(e[i - 1], bulge, cs, sn, radius, tol);
      e[i - 1] = radius;
      Givens2(cs, sn, d[i - 1], e[i]);
      nax::detail::RotateRows(vRows, cs, sn, v + (i - 1) * vRows, v + i * vRows);
      bulge = sn * d[i];
      d[i] = cs * d[i];
      Givens1(d[i - 1], bulge, cs, sn, radius, tol);
      d[i - 1] = radius;
      Givens2(cs, sn, e[i], d[i]);
      nax::detail::RotateRows(cCols, cs, sn, c + (i - 1) * cCols, c + i * cCols);
      if (i < m) {
        bulge = sn * e[i + 1];
        e[i + 1] = cs * e[i + 1];
      }
    }
    ++sweeps;
    // Written so that a NaN counts as not converged and the sweep limit ends the loop.
    if (!(std::fabs(e[m]) <= tol)) {
      if (sweeps == 30) return 1;
      continue;
    }
    break;
  }
  // Convergence on exactly the thirtieth sweep still counts as failure.
  if (sweeps >= 30) return 1;
  for (int32 i = 0; i < n; ++i) {
    if (tol >= std::fabs(e[i])) e[i] = T(0);
    if (tol >= std::fabs(d[i])) d[i] = T(0);
  }
  e[n - 1] = T(0);
  split = m;
  return 0;
}

// Runs QRBD on the block first..last of work (d in its first half, e in its second), on the
// rows first..last of u and of vt (the transposed right factor). converged is 1 when the
// bottom value of the block converged; a split higher up is left for the caller to find.
template <typename T>
int32 CNaxMatrixMN<T>::Apply_QRBD(int32& first, int32& last, T* work, CNaxMatrixMN& u,
                                  CNaxMatrixMN& vt, int32& converged, T tol) {
  converged = 0;
  const int32 size = last - first + 1;
  if (size < 1) return 0;
  const int32 n = cols;
  T* d = work + first;
  T* e = work + n + first;
  // e[first] couples the block to the one above; QRBD uses that slot as scratch.
  const T above = e[0];
  int32 split = -1;
  const int32 status =
      QRBD(size, vt.cols, u.cols, split, d, e, vt.data + first * vt.cols, u.data + first * u.cols, tol);
  e[0] = above;
  nax::detail::AnnulateBelow(size * u.cols, u.data + first * u.cols, tol);
  nax::detail::AnnulateBelow(size * vt.cols, vt.data + first * vt.cols, tol);
  if (status == 0 && split == size - 1) converged = 1;
  return status;
}

template <typename T>
int32 CNaxMatrixMN<T>::SingDecomp2D(CNaxMatrixMN& u, CNaxMatrixMN& v, CNaxVectorN<T>& w, T tol) {
  const int32 n = cols;
  u.SetDiagonal(T(1));
  CNaxMatrixMN vt(n, n);
  vt.SetDiagonal(T(1));
  std::vector<T> work(2 * static_cast<size_t>(std::max(n, 1)), T(0));
  T* d = work.data();
  T* e = d + n;
  for (int32 i = 0; i < n; ++i) {
    d[i] = data[i * cols + i];
    if (i > 0) e[i] = data[(i - 1) * cols + i];
  }
  bool coupled = false;
  for (int32 i = 1; i < n; ++i) coupled = coupled || std::fabs(e[i]) > tol;
  if (!coupled) {
    std::fill(e, e + n, T(0));
  } else {
    int32 last = n - 1;
    while (last >= 0) {
      if (last == 0 || tol >= std::fabs(e[last])) {
        --last;  // the bottom value is decoupled
        continue;
      }
      int32 first = last - 1;
      while (first > 0 && tol < std::fabs(e[first])) --first;
      int32 zero = -1;
      for (int32 k = last; k >= first; --k) {
        if (tol >= std::fabs(d[k])) {
          zero = k;
          break;
        }
      }
      if (zero == last) {
        ZeroUpperTransform(n, last, d, vt, tol);
        continue;
      }
      if (zero >= 0) {
        ZeroRightTransform(n, zero, d, u, tol);
        continue;
      }
      int32 converged = 0;
      const int32 status = Apply_QRBD(first, last, d, u, vt, converged, tol);
      if (status != 0) {
        v.Base::operator=(vt.Transpose());
        return status;
      }
    }
  }
  // Non-negative values: the sign moves into the right factor.
  for (int32 i = 0; i < n; ++i) {
    if (d[i] < T(0)) {
      d[i] = -d[i];
      for (int32 j = 0; j < n; ++j) vt.data[i * n + j] = -vt.data[i * n + j];
    }
  }
  // Descending order by selection; the first of equal values stays first.
  for (int32 i = 0; i < n; ++i) {
    int32 k = i;
    for (int32 j = i + 1; j < n; ++j)
      if (d[j] > d[k]) k = j;
    if (k != i) {
      std::swap(d[i], d[k]);
      std::swap_ranges(u.data + i * u.cols, u.data + (i + 1) * u.cols, u.data + k * u.cols);
      std::swap_ranges(vt.data + i * n, vt.data + (i + 1) * n, vt.data + k * n);
    }
    w[i] = d[i];
  }
  v.Base::operator=(vt.Transpose());
  return 0;
}

template <typename T>
int32 CNaxMatrixMN<T>::SV_Decomposition(CNaxMatrixMN& u, CNaxMatrixMN& v, CNaxVectorN<T>& w,
                                        T tol) {
  if (rows < cols) {
    CNaxMatrixMN a(this->Transpose());
    return a.SV_Decomposition(v, u, w, tol);
  }
  const int32 m = rows, n = cols;
  int32 zeroRows = 0, zeroCols = 0;
  TestZeroRowsColumns(zeroRows, zeroCols, tol);
  CNaxMatrixMN a(static_cast<const Base&>(*this));
  CNaxMatrixMN rowPermutation(zeroRows > 0 ? m : 0), colPermutation(zeroCols > 0 ? n : 0);
  if (zeroRows > 0) {
    rowPermutation.SetDiagonal(T(1));
    a.MoveZeroRows(zeroRows, rowPermutation, tol);
  }
  if (zeroCols > 0) {
    colPermutation.SetDiagonal(T(1));
    a.MoveZeroColumns(zeroCols, colPermutation, tol);
  }
  CNaxMatrixMN q(m, m), b(m, n), right(n, n);
  if (a.IsBidiagonal(tol)) {
    q.SetDiagonal(T(1));
    right.SetDiagonal(T(1));
    b.Base::operator=(a);
  } else {
    const int32 status = a.QRT_2D(q, b, right, tol);
    if (status != 0) return status;
  }
  CNaxMatrixMN u2(n, n), v2(n, n);
  const int32 status = b.SingDecomp2D(u2, v2, w, tol);
  if (status != 0) return status;
  // this = q [u2^T diag(w) v2^T; 0] right^T, so u = q blockdiag(u2^T, I), v = right v2.
  const CNaxMatrixMN u2t(u2.Transpose());
  if (m == n) {
    nax::detail::MultiplyRaw(q.data, u2t.data, u.data, m, n, n);
  } else {
    CNaxMatrixMN left(m, n), product(m, n);
    for (int32 i = 0; i < m; ++i) std::copy(q.data + i * m, q.data + i * m + n, left.data + i * n);
    nax::detail::MultiplyRaw(left.data, u2t.data, product.data, m, n, n);
    for (int32 i = 0; i < m; ++i) {
      std::copy(product.data + i * n, product.data + (i + 1) * n, u.data + i * m);
      std::copy(q.data + i * m + n, q.data + (i + 1) * m, u.data + i * m + n);
    }
  }
  nax::detail::MultiplyRaw(right.data, v2.data, v.data, n, n, n);
  if (zeroRows > 0) nax::detail::PermuteRows(rowPermutation.data, m, u.data, m);
  if (zeroCols > 0) nax::detail::PermuteRows(colPermutation.data, n, v.data, n);
  StoreSingularNumbers(w);
  return 0;
}

template <typename T>
int32 CNaxMatrixMN<T>::ThinSVD(CNaxMatrixMN& u, CNaxMatrixMN& v, CNaxVectorN<T>& w) {
  u.Base::operator=(*this);
  if (ThinSVDUnitOffsetInPlace(u, rows, cols, w, v) != 0) return 1;
  StoreSingularNumbers(w);
  return 0;
}

// The compact Golub-Reinsch procedure on a (m x n, row stride n), overwritten by the left
// factor; w receives n values and v (n x n) the right factor. Negligibility is tested
// against the running norm of the bidiagonal, (|x| + anorm) == anorm.
template <typename T>
int32 CNaxMatrixMN<T>::ThinSVDUnitOffsetInPlace(CNaxMatrixMN& a, int32 m, int32 n,
                                                CNaxVectorN<T>& w, CNaxMatrixMN& v) const {
  using nax::detail::RootNoFloor;
  T* A = a.data;
  T* V = v.data;
  auto at = [&](int32 i, int32 j) -> T& { return A[i * n + j]; };
  auto vat = [&](int32 i, int32 j) -> T& { return V[i * n + j]; };
  std::vector<T> rv1(std::max(n, 1));
  T g = 0, scale = 0, anorm = 0, s, f, h;
  int32 l = 0;
  // Householder reduction to bidiagonal form.
  for (int32 i = 0; i < n; ++i) {
    l = i + 1;
    rv1[i] = scale * g;
    g = s = scale = 0;
    if (i < m) {
      for (int32 k = i; k < m; ++k) scale += std::fabs(at(k, i));
      if (scale != T(0)) {
        for (int32 k = i; k < m; ++k) {
          at(k, i) /= scale;
          s += at(k, i) * at(k, i);
        }
        f = at(i, i);
        g = -SignA(RootNoFloor(s), f);
        h = f * g - s;
        at(i, i) = f - g;
        for (int32 j = l; j < n; ++j) {
          s = 0;
          for (int32 k = i; k < m; ++k) s += at(k, i) * at(k, j);
          f = s / h;
          for (int32 k = i; k < m; ++k) at(k, j) += f * at(k, i);
        }
        for (int32 k = i; k < m; ++k) at(k, i) *= scale;
      }
    }
    w[i] = scale * g;
    g = s = scale = 0;
    if (i < m && i != n - 1) {
      for (int32 k = l; k < n; ++k) scale += std::fabs(at(i, k));
      if (scale != T(0)) {
        for (int32 k = l; k < n; ++k) {
          at(i, k) /= scale;
          s += at(i, k) * at(i, k);
        }
        f = at(i, l);
        g = -SignA(RootNoFloor(s), f);
        h = f * g - s;
        at(i, l) = f - g;
        for (int32 k = l; k < n; ++k) rv1[k] = at(i, k) / h;
        for (int32 j = l; j < m; ++j) {
          s = 0;
          for (int32 k = l; k < n; ++k) s += at(j, k) * at(i, k);
          for (int32 k = l; k < n; ++k) at(j, k) += s * rv1[k];
        }
        for (int32 k = l; k < n; ++k) at(i, k) *= scale;
      }
    }
    anorm = std::max(anorm, std::fabs(w[i]) + std::fabs(rv1[i]));
  }
  // Accumulation of the right-hand transformations.
  for (int32 i = n - 1; i >= 0; --i) {
    if (i < n - 1) {
      if (g != T(0)) {
        for (int32 j = l; j < n; ++j) vat(j, i) = (at(i, j) / at(i, l)) / g;
        for (int32 j = l; j < n; ++j) {
          s = 0;
          for (int32 k = l; k < n; ++k) s += at(i, k) * vat(k, j);
          for (int32 k = l; k < n; ++k) vat(k, j) += s * vat(k, i);
        }
      }
      for (int32 j = l; j < n; ++j) vat(i, j) = vat(j, i) = 0;
    }
    vat(i, i) = 1;
    g = rv1[i];
    l = i;
  }
  // Accumulation of the left-hand transformations.
  for (int32 i = std::min(m, n) - 1; i >= 0; --i) {
    l = i + 1;
    g = w[i];
    for (int32 j = l; j < n; ++j) at(i, j) = 0;
    if (g != T(0)) {
      g = T(1) / g;
      for (int32 j = l; j < n; ++j) {
        s = 0;
        for (int32 k = l; k < m; ++k) s += at(k, i) * at(k, j);
        f = (s / at(i, i)) * g;
        for (int32 k = i; k < m; ++k) at(k, j) += f * at(k, i);
      }
      for (int32 j = i; j < m; ++j) at(j, i) *= g;
    } else {
      for (int32 j = i; j < m; ++j) at(j, i) = 0;
    }
    at(i, i) += T(1);
  }
  // Diagonalisation of the bidiagonal form: 30 sweeps per value at most.
  for (int32 k = n - 1; k >= 0; --k) {
    for (int32 its = 1; its <= 30; ++its) {
      bool flag = true;
      int32 nm = 0;
      for (l = k; l >= 0; --l) {
        nm = l - 1;
        if (std::fabs(rv1[l]) + anorm == anorm) {
          flag = false;
          break;
        }
        if (std::fabs(w[nm]) + anorm == anorm) break;
      }
      T c, y, z, x;
      if (flag) {
        c = 0;
        s = 1;
        for (int32 i = l; i <= k; ++i) {
          f = s * rv1[i];
          rv1[i] = c * rv1[i];
          if (std::fabs(f) + anorm == anorm) break;
          g = w[i];
          h = Pythagoras(f, g);
          w[i] = h;
          h = T(1) / h;
          c = g * h;
          s = -f * h;
          for (int32 j = 0; j < m; ++j) {
            y = at(j, nm);
            z = at(j, i);
            at(j, nm) = y * c + z * s;
            at(j, i) = z * c - y * s;
          }
        }
      }
      z = w[k];
      if (l == k) {
        if (z < T(0)) {
          w[k] = -z;
          for (int32 j = 0; j < n; ++j) vat(j, k) = -vat(j, k);
        }
        break;
      }
      if (its == 30) return 1;
      x = w[l];
      nm = k - 1;
      y = w[nm];
      g = rv1[nm];
      h = rv1[k];
      f = ((y - z) * (y + z) + (g - h) * (g + h)) / (T(2) * h * y);
      g = Pythagoras(f, T(1));
      f = ((x - z) * (x + z) + h * ((y / (f + SignA(g, f))) - h)) / x;
      c = s = 1;
      for (int32 j = l; j <= nm; ++j) {
        const int32 i = j + 1;
        g = rv1[i];
        y = w[i];
        h = s * g;
        g = c * g;
        z = Pythagoras(f, h);
        rv1[j] = z;
        c = f / z;
        s = h / z;
        f = x * c + g * s;
        g = g * c - x * s;
        h = y * s;
        y *= c;
        for (int32 jj = 0; jj < n; ++jj) {
          x = vat(jj, j);
          z = vat(jj, i);
          vat(jj, j) = x * c + z * s;
          vat(jj, i) = z * c - x * s;
        }
        z = Pythagoras(f, h);
        w[j] = z;
        if (z != T(0)) {
          z = T(1) / z;
          c = f * z;
          s = h * z;
        }
        f = c * g + s * y;
        x = c * y - s * g;
        for (int32 jj = 0; jj < m; ++jj) {
          y = at(jj, j);
          z = at(jj, i);
          at(jj, j) = y * c + z * s;
          at(jj, i) = z * c - y * s;
        }
      }
      rv1[l] = 0;
      rv1[k] = f;
      w[k] = x;
    }
  }
  return 0;
}

#endif  // NAX_DETAIL_SVD_MEMBERS_H
