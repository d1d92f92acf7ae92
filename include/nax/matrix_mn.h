// CNaxMatrixMN: the general real matrix of run-time size.
//
// Adds to the base container a cache of rank and singular values, norms, shape tests,
// extraction, the Householder QR factorisation, inverses by size, the pseudo-inverse by the
// normal equations, and two singular value decompositions (see detail/svd_members.h).
//
// The cache is written by SV_Decomposition and ThinSVD and by nothing else: changing
// elements does not invalidate it, and CNaxMatrixN::Det trusts it.
#ifndef NAX_MATRIX_MN_H
#define NAX_MATRIX_MN_H

#include <algorithm>
#include <cmath>

#include "nax/base_matrix.h"
#include "nax/scalar.h"
#include "nax/types.h"
#include "nax/vector_n.h"

/// Real matrix of run-time size, row-major, for T = float or double.
template <typename T>
class CNaxMatrixMN : public CNaxBaseMatrix<T> {
  static_assert(nax::detail::kIsReal<T>, "CNaxMatrixMN is instantiated for float and double only");
  using Base = CNaxBaseMatrix<T>;

 public:
  /// n x n zeros.
  explicit CNaxMatrixMN(int32 n) : Base(n) {}
  /// rows x cols zeros.
  CNaxMatrixMN(int32 rows, int32 cols) : Base(rows, cols) {}
  /// n x n copied from source, row-major.
  CNaxMatrixMN(int32 n, const T* source) : Base(n, source) {}
  /// rows x cols copied from source, row-major.
  CNaxMatrixMN(int32 rows, int32 cols, const T* source) : Base(rows, cols, source) {}
  /// Deep copy, with the cache of rank and singular values.
  CNaxMatrixMN(const CNaxMatrixMN& other) : Base(other) { CopyCache(other); }
  /// Deep copy of a base matrix, such as the result of an arithmetic operator; empty cache.
  CNaxMatrixMN(const Base& other) : Base(other) {}  // NOLINT: implicit by design
  ~CNaxMatrixMN() override { delete[] singularNumbers; }

  /// Copies this matrix's count of elements in flat order (see CNaxBaseMatrix); the cache
  /// of singular values is marked as not computed.
  CNaxMatrixMN& operator=(const Base& other) override {
    if (this == &other) return *this;
    Base::operator=(other);
    singCalculated = 0;
    return *this;
  }
  /// Copies the elements as above, and the rank and the cache of singular values.
  virtual CNaxMatrixMN& operator=(const CNaxMatrixMN& other) {
    if (this == &other) return *this;
    Base::operator=(other);
    CopyCache(other);
    return *this;
  }

  /// The stored rank; nothing is computed.
  int32 GetRank() const { return rank; }
  void SetRank(int32 value) { rank = value; }
  /// Counts the singular values above tol, by SV_Decomposition of a copy or, if that fails,
  /// by the thin decomposition; stores and returns the count.
  int32 CalculateRank(T tol);
  /// 1 when the cache holds the singular values of an earlier decomposition.
  int32 IsSingCalculated() const { return singCalculated; }
  /// Copies the min(rows, cols) cached singular values to target; nothing when none cached.
  void GetSingularNumbers(T* target) const {
    if (!singCalculated || !singularNumbers) return;
    std::copy(singularNumbers, singularNumbers + std::min(rows, cols), target);
  }

  /// Matrix norm: one, infinity (-1 without columns or rows), spectral (-1 if the
  /// decomposition fails), largest element times root of the count, or Frobenius (any other
  /// value), which is 0 unless the sum of squares exceeds 1e-6.
  T Norm(naxMatrixNorm norm);

  /// 1 if every |a| <= tol.
  int32 IsAlmostZero(T tol) const;
  /// 1 if every off-diagonal |a| <= tol.
  int32 IsDiagonal(T tol) const;
  /// Lower left triangular: 1 if every |a(i, j)| <= tol for j > i.
  int32 IsLLTriangular(T tol) const;
  /// Upper right triangular: 1 if every |a(i, j)| <= tol for j < i.
  int32 IsURTriangular(T tol) const;
  /// 1 when rows >= cols and every element off the diagonal and the first superdiagonal is
  /// at most 1e-6 in absolute value; tol is not what is compared.
  int32 IsBidiagonal(T tol) const;

  /// Each element with tol > |a| becomes 0.
  void AnnulateSmallElements(T tol);
  /// Zeroes the strict upper triangle when upper is 0, else the strict lower one.
  void AnnulateRelativelyDiagonal(int32 upper);
  /// Writes the exchange of rows i and j into a permutation matrix: (i, i) and (j, j)
  /// become 0, (i, j) and (j, i) become 1.
  void SetElementTransposition(int32 i, int32 j);

  /// New matrix of the rectangle [firstRow, lastRow] x [firstCol, lastCol].
  CNaxMatrixMN ExtractMatrix(int32 firstRow, int32 firstCol, int32 lastRow, int32 lastCol) const;
  /// New matrix of the upper left rowCount x colCount corner.
  CNaxMatrixMN ExtractLeftCornerMatrix(int32 rowCount, int32 colCount) const {
    return ExtractMatrix(0, 0, rowCount - 1, colCount - 1);
  }
  /// Overwrites the rectangle of this matrix by part, read from its origin; silent when
  /// firstRow > lastRow.
  void InsertMatrix(const CNaxMatrixMN& part, int32 firstRow, int32 firstCol, int32 lastRow,
                    int32 lastCol);

  /// Sum of all elements over their count (0 for an empty matrix).
  T Mean() const;
  /// Sum of the products of corresponding elements.
  T InnerProduct(const CNaxMatrixMN& other) const;
  /// Pearson correlation of the two element sets taken as paired samples; 0 when either set
  /// is constant.
  T CorrelationCoefficient(const CNaxMatrixMN& other) const;

  /// Householder QR: this = q r, q rows x rows orthogonal, r rows x cols upper triangular.
  /// 0 done, 2 no memory, 6 when cols > rows (q and r untouched).
  int32 QR_Decomposition(CNaxMatrixMN& q, CNaxMatrixMN& r, T tol) const;

  /// Inverse of a square matrix by its size: 1 for sizes 0 and 1 (nothing written); closed
  /// forms for 2 and 3 and CNaxMatrix4::Inverse for 4 (3 when tol > |det|, result untouched);
  /// for 5 and more the singular-value branch, which writes a zero result and returns 3 when
  /// the smallest singular value is below 1e-6.
  int32 Inverse(CNaxMatrixMN& result, T tol);
  /// As Inverse, and condition = Norm(norm) of this times Norm(norm) of the result (for 5 and
  /// more, the ratio of the extreme singular values); the pseudo-infinity when singular.
  int32 Inverse(CNaxMatrixMN& result, naxMatrixNorm norm, T tol, T& condition);
  /// (A^T A)^-1 A^T through the norm form of Inverse with tolerance 1e-6; its status, with
  /// result untouched on failure. condition is that of A^T A times Norm(norm) of A^T.
  int32 PseudoInverse(CNaxMatrixMN& result, naxMatrixNorm norm, T& condition);
  /// solution = pseudo-inverse times rhs, with the status of PseudoInverse.
  int32 PseudoSolveSystem(const CNaxVectorN<T>& rhs, CNaxVectorN<T>& solution,
                          naxMatrixNorm norm, T& condition);

  /// Singular value decomposition this = u diag(w) v^T by Householder bidiagonalisation and
  /// implicit QR sweeps; u is rows x rows, v cols x cols, w has min(rows, cols) values, sorted
  /// in descending order and non-negative. 0 done, 1 no convergence within 30 sweeps, 2 no
  /// memory. Fills the cache of singular values.
  int32 SV_Decomposition(CNaxMatrixMN& u, CNaxMatrixMN& v, CNaxVectorN<T>& w, T tol);
  /// Thin decomposition this = u diag(w) v^T with u rows x cols, v cols x cols and cols
  /// unsorted non-negative values. 0 done, 1 no convergence, 2 no memory. Fills the cache.
  int32 ThinSVD(CNaxMatrixMN& u, CNaxMatrixMN& v, CNaxVectorN<T>& w);

 protected:
  using Base::cols;
  using Base::data;
  using Base::rows;

  // Singular value machinery (detail/svd_members.h).
  int32 ThinSVDUnitOffsetInPlace(CNaxMatrixMN& a, int32 m, int32 n, CNaxVectorN<T>& w,
                                 CNaxMatrixMN& v) const;
  void TestZeroRowsColumns(int32& zeroRows, int32& zeroCols, T tol) const;
  int32 MoveZeroRows(int32 count, CNaxMatrixMN& permutation, T tol);
  int32 MoveZeroColumns(int32 count, CNaxMatrixMN& permutation, T tol);
  int32 QRT_2D(CNaxMatrixMN& q, CNaxMatrixMN& b, CNaxMatrixMN& w, T tol);
  int32 SingDecomp2D(CNaxMatrixMN& u, CNaxMatrixMN& v, CNaxVectorN<T>& w, T tol);
  int32 Apply_QRBD(int32& first, int32& last, T* work, CNaxMatrixMN& u, CNaxMatrixMN& vt,
                   int32& converged, T tol);
  int32 QRBD(int32 n, int32 vRows, int32 cCols, int32& split, T* d, T* e, T* v, T* c, T tol);
  void ZeroRightTransform(int32 n, int32 k, T* work, CNaxMatrixMN& u, T tol);
  void ZeroUpperTransform(int32 n, int32 k, T* work, CNaxMatrixMN& vt, T tol);
  int32 Householder1(int32 pivot, int32 first, int32 last, int32 vectors, T& up, T* u, T* c,
                     T tol, int32 ldc = 0);
  void Householder2(int32 pivot, int32 first, int32 last, T up, T* u, CNaxMatrixMN& c, T tol);
  void Givens1(T a, T b, T& cosine, T& sine, T& radius, T tol);
  void Givens2(T cosine, T sine, T& x, T& y);
  T Pythagoras(T a, T b) const;
  T SignA(T a, T b) const { return b >= T(0) ? std::fabs(a) : -std::fabs(a); }

  // Stores the cols values of w (min(rows, cols) of them) in the cache.
  void StoreSingularNumbers(const CNaxVectorN<T>& w);

  int32 rank = 0;
  T* singularNumbers = nullptr;
  int32 singCalculated = 0;

 private:
  void CopyCache(const CNaxMatrixMN& other);
  // Closed-form inverses of the 2 x 2 and 3 x 3 sizes; det receives the determinant.
  int32 InverseClosedForm(CNaxMatrixMN& result, T tol, T& det) const;
  // The singular-value branch of Inverse for 5 rows and more.
  int32 InverseBySingularValues(CNaxMatrixMN& result, T tol, T& smallest, T& largest);
};

/// 1 when the matrices have the same shape and no elements differ by more than tol
/// (a difference of exactly tol is equal); 1 for two empty matrices.
template <typename T>
int32 naxAreAlmostEqual(const CNaxMatrixMN<T>& a, const CNaxMatrixMN<T>& b, T tol);

/// Compares the rectangle of a with the rectangle of b: 0 when their heights or widths
/// differ, else 0 at the first elements that differ by more than tol, else 1.
template <typename T>
int32 naxArePartsMatricesEqual(const CNaxMatrixMN<T>& a, int32 firstRowA, int32 firstColA,
                               int32 lastRowA, int32 lastColA, const CNaxMatrixMN<T>& b,
                               int32 firstRowB, int32 firstColB, int32 lastRowB, int32 lastColB,
                               T tol);

/// Compares all of a with the rectangle of b: 0 when the shapes differ, else as above.
template <typename T>
int32 naxIsMatrixEqualPartOfMatrix(const CNaxMatrixMN<T>& a, const CNaxMatrixMN<T>& b,
                                   int32 firstRow, int32 firstCol, int32 lastRow, int32 lastCol,
                                   T tol);

#include "nax/detail/matrix_mn_members.h"
#include "nax/detail/svd_members.h"

#define NAX_MATRIX_MN_EXTERN(T)                                                              \
  extern template class CNaxMatrixMN<T>;                                                     \
  extern template int32 naxAreAlmostEqual<T>(const CNaxMatrixMN<T>&, const CNaxMatrixMN<T>&, \
                                             T);                                             \
  extern template int32 naxArePartsMatricesEqual<T>(const CNaxMatrixMN<T>&, int32, int32,    \
                                                    int32, int32, const CNaxMatrixMN<T>&,    \
                                                    int32, int32, int32, int32, T);          \
  extern template int32 naxIsMatrixEqualPartOfMatrix<T>(                                     \
      const CNaxMatrixMN<T>&, const CNaxMatrixMN<T>&, int32, int32, int32, int32, T);
NAX_MATRIX_MN_EXTERN(float)
NAX_MATRIX_MN_EXTERN(double)
#undef NAX_MATRIX_MN_EXTERN

#endif  // NAX_MATRIX_MN_H
