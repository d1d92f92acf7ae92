// Member bodies of CNaxMatrixMN other than the singular value decompositions: cache, norms,
// shape tests, extraction, QR, inverses and the pseudo-inverse. Included by nax/matrix_mn.h.
//
// QR by Householder reflections as in Golub and Van Loan, "Matrix Computations", 5.2.
#ifndef NAX_DETAIL_MATRIX_MN_MEMBERS_H
#define NAX_DETAIL_MATRIX_MN_MEMBERS_H

#include <vector>

#include "nax/detail/array_ops.h"

namespace nax::detail {

/// Root of x, taken as 0 when |x| is below the default tolerance (the safe root without
/// its squared floor).
template <typename T>
inline T RootNoFloor(T x) {
  return std::fabs(x) < DefaultTol<T>() ? T(0) : std::sqrt(x);
}

/// Smallest and largest of n values (n >= 1).
template <typename T>
inline void MinMax(int32 n, const T* values, T& smallest, T& largest) {
  smallest = largest = values[0];
  for (int32 i = 1; i < n; ++i) {
    smallest = std::min(smallest, values[i]);
    largest = std::max(largest, values[i]);
  }
}

}  // namespace nax::detail

template <typename T>
void CNaxMatrixMN<T>::CopyCache(const CNaxMatrixMN& other) {
  rank = other.rank;
  singCalculated = other.singCalculated;
  if (!other.singularNumbers) return;
  const int32 n = std::min(rows, cols);
  if (!singularNumbers) singularNumbers = new T[std::max(n, 1)]();
  std::copy(other.singularNumbers,
              other.singularNumbers + std::min(n, std::min(other.rows, other.cols)),
              singularNumbers);
}

template <typename T>
void CNaxMatrixMN<T>::StoreSingularNumbers(const CNaxVectorN<T>& w) {
  const int32 n = std::min(rows, cols);
  if (!singularNumbers) singularNumbers = new T[std::max(n, 1)]();
  for (int32 i = 0; i < n; ++i) singularNumbers[i] = w[i];
  singCalculated = 1;
}

template <typename T>
int32 CNaxMatrixMN<T>::CalculateRank(T tol) {
  CNaxMatrixMN a(*this);
  CNaxMatrixMN u(rows, rows), v(cols, cols);
  CNaxVectorN<T> w(cols);
  if (a.SV_Decomposition(u, v, w, tol) != 0) {
    CNaxMatrixMN thin(*this);
    thin.ThinSVDUnitOffsetInPlace(thin, rows, cols, w, v);
  }
  // The thin fallback leaves its values unsorted, so all of w is counted.
  int32 count = 0;
  for (int32 i = 0; i < w.Dim(); ++i)
    if (w[i] > tol) ++count;
  rank = count;
  return rank;
}

template <typename T>
T CNaxMatrixMN<T>::Norm(naxMatrixNorm norm) {
  switch (norm) {
    case naxMatrixNormOne: {
      if (cols < 1) return T(-1);
      std::vector<T> sums(cols, T(0));
      for (int32 r = 0; r < rows; ++r)
        for (int32 c = 0; c < cols; ++c) sums[c] += std::fabs(data[r * cols + c]);
      return *std::max_element(sums.begin(), sums.end());
    }
    case naxMatrixNormInfinity: {
      if (rows < 1) return T(-1);
      T best = T(0);
      for (int32 r = 0; r < rows; ++r) best = std::max(best, nax::detail::SumAbs(cols, data + r * cols));
      return best;
    }
    case naxMatrixNormSpectral: {
      CNaxMatrixMN u(rows, rows), v(cols, cols);
      CNaxVectorN<T> w(std::min(rows, cols));
      if (SV_Decomposition(u, v, w, nax::detail::DefaultTol<T>()) != 0) return T(-1);
      T largest = T(0);
      for (int32 i = 0; i < w.Dim(); ++i) largest = std::max(largest, w[i]);
      return largest;
    }
    case naxMatrixNormMaxElement: {
      T largest = T(0);
      for (int32 i = 0, n = rows * cols; i < n; ++i) largest = std::max(largest, std::fabs(data[i]));
      return largest * nax::detail::RootNoFloor(T(rows * cols));
    }
    default: {
      const T s = nax::detail::SumSquares(rows * cols, data);
      // The floor 1e-6 under the sum is deliberately coarse, in both precisions.
      if (s > T(1e-6) && std::fabs(s) >= nax::detail::DefaultTol<T>()) return std::sqrt(s);
      return T(0);
    }
  }
}

template <typename T>
int32 CNaxMatrixMN<T>::IsAlmostZero(T tol) const {
  for (int32 i = 0, n = rows * cols; i < n; ++i)
    if (std::fabs(data[i]) > tol) return 0;
  return 1;
}

template <typename T>
int32 CNaxMatrixMN<T>::IsDiagonal(T tol) const {
  for (int32 r = 0; r < rows; ++r)
    for (int32 c = 0; c < cols; ++c)
      if (r != c && std::fabs(data[r * cols + c]) > tol) return 0;
  return 1;
}

template <typename T>
int32 CNaxMatrixMN<T>::IsLLTriangular(T tol) const {
  for (int32 r = 0; r < rows; ++r)
    for (int32 c = r + 1; c < cols; ++c)
      if (std::fabs(data[r * cols + c]) > tol) return 0;
  return 1;
}

template <typename T>
int32 CNaxMatrixMN<T>::IsURTriangular(T tol) const {
  for (int32 r = 1; r < rows; ++r)
    for (int32 c = 0; c < std::min(r, cols); ++c)
      if (std::fabs(data[r * cols + c]) > tol) return 0;
  return 1;
}

template <typename T>
int32 CNaxMatrixMN<T>::IsBidiagonal(T /*tol*/) const {
  if (rows < cols) return 0;
  for (int32 r = 0; r < rows; ++r)
    for (int32 c = 0; c < cols; ++c)
      if ((c < r || c > r + 1) && std::fabs(data[r * cols + c]) > T(1e-6)) return 0;
  return 1;
}

template <typename T>
void CNaxMatrixMN<T>::AnnulateSmallElements(T tol) {
  for (int32 i = 0, n = rows * cols; i < n; ++i)
    if (tol > std::fabs(data[i])) data[i] = T(0);
}

template <typename T>
void CNaxMatrixMN<T>::AnnulateRelativelyDiagonal(int32 upper) {
  for (int32 r = 0; r < rows; ++r)
    for (int32 c = 0; c < cols; ++c)
      if (upper == 0 ? c > r : c < r) data[r * cols + c] = T(0);
}

template <typename T>
void CNaxMatrixMN<T>::SetElementTransposition(int32 i, int32 j) {
  data[i * cols + i] = T(0);
  data[j * cols + j] = T(0);
  data[i * cols + j] = T(1);
  data[j * cols + i] = T(1);
}

template <typename T>
CNaxMatrixMN<T> CNaxMatrixMN<T>::ExtractMatrix(int32 firstRow, int32 firstCol, int32 lastRow,
                                               int32 lastCol) const {
  const int32 h = lastRow - firstRow + 1, w = lastCol - firstCol + 1;
  CNaxMatrixMN part(h, w);
  for (int32 r = 0; r < h; ++r)
    std::copy(data + (firstRow + r) * cols + firstCol,
              data + (firstRow + r) * cols + firstCol + w, part.data + r * w);
  return part;
}

template <typename T>
void CNaxMatrixMN<T>::InsertMatrix(const CNaxMatrixMN& part, int32 firstRow, int32 firstCol,
                                   int32 lastRow, int32 lastCol) {
  if (firstRow > lastRow) return;
  const int32 w = lastCol - firstCol + 1;
  if (w < 1) return;
  for (int32 r = firstRow; r <= lastRow; ++r)
    std::copy(part.data + (r - firstRow) * part.cols, part.data + (r - firstRow) * part.cols + w,
              data + r * cols + firstCol);
}

template <typename T>
T CNaxMatrixMN<T>::Mean() const {
  const int32 n = rows * cols;
  if (n < 1) return T(0);
  T sum = T(0);
  for (int32 i = 0; i < n; ++i) sum += data[i];
  return sum / T(n);
}

template <typename T>
T CNaxMatrixMN<T>::InnerProduct(const CNaxMatrixMN& other) const {
  return nax::detail::DotArrays(rows * cols, data, other.data);
}

template <typename T>
T CNaxMatrixMN<T>::CorrelationCoefficient(const CNaxMatrixMN& other) const {
  const int32 n = rows * cols;
  if (n < 1) return T(0);
  const T meanA = Mean(), meanB = other.Mean();
  T sab = T(0), saa = T(0), sbb = T(0);
  for (int32 i = 0; i < n; ++i) {
    const T da = data[i] - meanA, db = other.data[i] - meanB;
    sab += da * db;
    saa += da * da;
    sbb += db * db;
  }
  const T denominator = std::sqrt(saa * sbb);
  return denominator > T(0) ? sab / denominator : T(0);
}

template <typename T>
int32 CNaxMatrixMN<T>::QR_Decomposition(CNaxMatrixMN& q, CNaxMatrixMN& r, T tol) const {
  if (cols > rows) return 6;
  const int32 m = rows, n = cols;
  std::vector<T> x(m), sums(std::max(m, n));  // current column, per-vector sums
  q.SetDiagonal(T(1));
  r.Base::operator=(*this);
  T* rd = r.data;
  T* qd = q.data;
  for (int32 k = 0; k < n; ++k) {
    for (int32 i = 0; i < m; ++i) x[i] = rd[i * n + k];
    const T x0 = x[k];
    T scale = std::fabs(x0);
    for (int32 i = k + 1; i < m; ++i) scale = std::max(scale, std::fabs(x[i]));
    if (tol > scale) continue;
    T sum = T(0);
    for (int32 i = k; i < m; ++i) sum += (x[i] / scale) * (x[i] / scale);
    // The sign is that of x0 itself, not the opposite one of the textbooks.
    T alpha = scale * nax::detail::RootNoFloor(sum);
    if (x0 < T(0)) alpha = -alpha;
    const T u0 = x0 - alpha;
    rd[k * n + k] = alpha;
    const T beta = alpha * u0;
    if (!(beta <= -tol)) continue;
    x[k] = u0;  // x[k..m) is now the Householder vector v; H = I + v v^T / beta
    // Remaining columns of r: sums[j] = v . r(:, j), then r(:, j) += v sums[j] / beta.
    if (k + 1 < n) {
      const int32 w = n - k - 1;
      std::fill(sums.begin(), sums.begin() + w, T(0));
      for (int32 i = k; i < m; ++i) {
        const T vi = x[i];
        const T* row = rd + i * n + k + 1;
        for (int32 j = 0; j < w; ++j) sums[j] += vi * row[j];
      }
      for (int32 j = 0; j < w; ++j) sums[j] /= beta;
      for (int32 i = k; i < m; ++i) {
        const T vi = x[i];
        T* row = rd + i * n + k + 1;
        for (int32 j = 0; j < w; ++j) row[j] += vi * sums[j];
      }
    }
    // q = q H, row by row.
    for (int32 i = 0; i < m; ++i) {
      T* row = qd + i * m;
      T s = T(0);
      for (int32 j = k; j < m; ++j) s += row[j] * x[j];
      s /= beta;
      for (int32 j = k; j < m; ++j) row[j] += s * x[j];
    }
  }
  for (int32 i = 1; i < m; ++i)
    for (int32 j = 0; j < std::min(i, n); ++j) rd[i * n + j] = T(0);
  r.AnnulateSmallElements(tol);
  return 0;
}

template <typename T>
int32 CNaxMatrixMN<T>::InverseClosedForm(CNaxMatrixMN& result, T tol, T& det) const {
  const T* a = data;
  if (rows == 2) {
    det = a[0] * a[3] - a[1] * a[2];
    if (tol > std::fabs(det)) return 3;
    const T inv[4] = {a[3] / det, -a[1] / det, -a[2] / det, a[0] / det};
    std::copy(inv, inv + 4, result.data);
    return 0;
  }
  // 3 x 3: cofactors along the first row.
  const T c00 = a[4] * a[8] - a[5] * a[7];
  const T c01 = -(a[3] * a[8] - a[5] * a[6]);
  const T c02 = a[3] * a[7] - a[4] * a[6];
  det = a[0] * c00 + a[1] * c01 + a[2] * c02;
  if (tol > std::fabs(det)) return 3;
  const T inv[9] = {c00 / det,
                    -(a[1] * a[8] - a[2] * a[7]) / det,
                    (a[1] * a[5] - a[2] * a[4]) / det,
                    c01 / det,
                    (a[0] * a[8] - a[2] * a[6]) / det,
                    -(a[0] * a[5] - a[2] * a[3]) / det,
                    c02 / det,
                    -(a[0] * a[7] - a[1] * a[6]) / det,
                    (a[0] * a[4] - a[1] * a[3]) / det};
  std::copy(inv, inv + 9, result.data);
  return 0;
}

template <typename T>
int32 CNaxMatrixMN<T>::InverseBySingularValues(CNaxMatrixMN& result, T tol, T& smallest,
                                               T& largest) {
  CNaxMatrixMN u(rows, rows), v(cols, cols);
  CNaxVectorN<T> w(std::min(rows, cols));
  const int32 status = SV_Decomposition(u, v, w, tol);
  if (status != 0) return status;
  // The result is v d u^T with d a rows x rows matrix whose diagonal is never filled: the
  // zero matrix, by design of this branch. No reciprocal of a singular value is taken.
  result.SetToZero();
  nax::detail::MinMax(w.Dim(), &w[0], smallest, largest);
  return smallest < T(1e-6) ? 3 : 0;
}

template <typename T>
int32 CNaxMatrixMN<T>::Inverse(CNaxMatrixMN& result, T tol) {
  T det, smallest, largest;
  switch (rows) {
    case 0:
    case 1:
      return 1;
    case 2:
    case 3:
      return InverseClosedForm(result, tol, det);
    case 4:
      return nax::detail::FixedInverse(4, data, result.data, tol);
    default:
      return InverseBySingularValues(result, tol, smallest, largest);
  }
}

template <typename T>
int32 CNaxMatrixMN<T>::Inverse(CNaxMatrixMN& result, naxMatrixNorm norm, T tol, T& condition) {
  T det, smallest, largest;
  switch (rows) {
    case 0:
    case 1:
      return 1;
    case 2:
    case 3:
    case 4: {
      const int32 status = rows == 4 ? nax::detail::FixedInverse(4, data, result.data, tol)
                                     : InverseClosedForm(result, tol, det);
      if (status == 3) condition = nax::detail::PseudoInfinity<T>();
      if (status != 0) return status;
      condition = Norm(norm) * result.Norm(norm);
      return 0;
    }
    default: {
      const int32 status = InverseBySingularValues(result, tol, smallest, largest);
      if (status == 0 || status == 3)
        condition = smallest < T(1e-6) ? nax::detail::PseudoInfinity<T>() : largest / smallest;
      return status;
    }
  }
}

template <typename T>
int32 CNaxMatrixMN<T>::PseudoInverse(CNaxMatrixMN& result, naxMatrixNorm norm, T& condition) {
  CNaxMatrixMN t(this->Transpose());
  CNaxMatrixMN g(cols, cols);
  nax::detail::MultiplyRaw(t.data, data, g.data, cols, rows, cols);
  CNaxMatrixMN gInverse(cols, cols);
  const int32 status = g.Inverse(gInverse, norm, T(1e-6), condition);
  if (status != 0) return status;
  nax::detail::MultiplyRaw(gInverse.data, t.data, result.data, cols, cols, rows);
  condition *= t.Norm(norm);
  return 0;
}

template <typename T>
int32 CNaxMatrixMN<T>::PseudoSolveSystem(const CNaxVectorN<T>& rhs, CNaxVectorN<T>& solution,
                                         naxMatrixNorm norm, T& condition) {
  CNaxMatrixMN pseudo(cols, rows);
  const int32 status = PseudoInverse(pseudo, norm, condition);
  if (status != 0) return status;
  solution = pseudo * rhs;
  return 0;
}

template <typename T>
int32 naxAreAlmostEqual(const CNaxMatrixMN<T>& a, const CNaxMatrixMN<T>& b, T tol) {
  if (a.RowsNb() != b.RowsNb() || a.ColsNb() != b.ColsNb()) return 0;
  const int32 n = a.RowsNb() * a.ColsNb();
  if (n < 1) return 1;
  return nax::detail::ArraysAlmostEqual(n, &a[0], &b[0], tol);
}

template <typename T>
int32 naxArePartsMatricesEqual(const CNaxMatrixMN<T>& a, int32 firstRowA, int32 firstColA,
                               int32 lastRowA, int32 lastColA, const CNaxMatrixMN<T>& b,
                               int32 firstRowB, int32 firstColB, int32 lastRowB, int32 lastColB,
                               T tol) {
  if (lastRowA - firstRowA != lastRowB - firstRowB) return 0;
  if (lastColA - firstColA != lastColB - firstColB) return 0;
  const CNaxMatrixMN<T> partA = a.ExtractMatrix(firstRowA, firstColA, lastRowA, lastColA);
  const CNaxMatrixMN<T> partB = b.ExtractMatrix(firstRowB, firstColB, lastRowB, lastColB);
  const int32 n = partA.RowsNb() * partA.ColsNb();
  return n < 1 ? 1 : nax::detail::ArraysAlmostEqual(n, &partA[0], &partB[0], tol);
}

template <typename T>
int32 naxIsMatrixEqualPartOfMatrix(const CNaxMatrixMN<T>& a, const CNaxMatrixMN<T>& b,
                                   int32 firstRow, int32 firstCol, int32 lastRow, int32 lastCol,
                                   T tol) {
  if (a.RowsNb() != lastRow - firstRow + 1 || a.ColsNb() != lastCol - firstCol + 1) return 0;
  return naxArePartsMatricesEqual(a, 0, 0, a.RowsNb() - 1, a.ColsNb() - 1, b, firstRow,
                                  firstCol, lastRow, lastCol, tol);
}

#endif  // NAX_DETAIL_MATRIX_MN_MEMBERS_H
