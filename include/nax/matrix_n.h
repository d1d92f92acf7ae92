// CNaxMatrixN: the square real matrix of run-time size.
//
// Adds to CNaxMatrixMN what only a square matrix has: determinant, Doolittle LU factors
// without pivoting, inverses, linear systems, condition numbers, a preconditioner, polar and
// spectral decompositions, and the symmetric eigenproblem by cyclic Jacobi rotations.
//
// LU_Decomposition, LowLeftInverse, UpperRightInverse, DiagInverse and InvPreconditioner
// answer in the yes/no form (1 success); Inverse and SolveSystem in the status form (0
// success, 1 failed, 2 no memory, 3 singular).
#ifndef NAX_MATRIX_N_H
#define NAX_MATRIX_N_H

#include "nax/matrix_mn.h"
#include "nax/sorting.h"

/// Square real matrix of run-time size, row-major, for T = float or double.
template <typename T>
class CNaxMatrixN : public CNaxMatrixMN<T> {
  static_assert(nax::detail::kIsReal<T>, "CNaxMatrixN is instantiated for float and double only");
  using Base = CNaxBaseMatrix<T>;
  using MN = CNaxMatrixMN<T>;

 public:
  /// n x n zeros.
  explicit CNaxMatrixN(int32 n) : MN(n), size(n) {}
  /// n x n zeros; the second number is accepted for symmetry with the base and ignored.
  CNaxMatrixN(int32 n, int32 /*m*/) : MN(n), size(n) {}
  /// n x n copied from source, row-major.
  CNaxMatrixN(int32 n, const T* source) : MN(n, source), size(n) {}
  /// Deep copy, with the cache of singular values.
  CNaxMatrixN(const CNaxMatrixN& other) : MN(other), size(other.size) {}
  /// Deep copy of a square base matrix, such as the result of an arithmetic operator.
  CNaxMatrixN(const Base& other) : MN(other), size(other.RowsNb()) {}  // NOLINT: implicit
  ~CNaxMatrixN() override = default;

  /// Copies the elements in flat order; the cache is marked as not computed.
  CNaxMatrixN& operator=(const Base& other) override {
    MN::operator=(other);
    return *this;
  }
  /// Multiplies every element by value.
  CNaxMatrixN& operator*=(T value) override {
    this->Mul(value);
    return *this;
  }
  /// Copies the elements and the cache of rank and singular values.
  CNaxMatrixN& operator=(const MN& other) override {
    MN::operator=(other);
    return *this;
  }
  /// Copies the elements and the cache.
  virtual CNaxMatrixN& operator=(const CNaxMatrixN& other) {
    MN::operator=(other);
    return *this;
  }
  /// Determinant: the product of the cached singular values when a decomposition filled the
  /// cache (so its sign is lost), else the product of the LU pivots (floor 1e-6), else the
  /// product of the diagonal of the QR factor R (without the sign of Q).
  virtual T Det();

  int32 Size() const { return size; }
  /// Becomes the identity.
  void Unit() { this->SetDiagonal(T(1)); }
  /// Product of the diagonal; 1 for size 0.
  T DetForTriangular() const;
  /// 1 if no |a(i, j) - a(j, i)| > tol.
  int32 IsSymmetric(T tol) const;
  /// 1 if every off-diagonal |a| <= tol and every |a(i, i) - 1| <= tol.
  int32 IsUnit(T tol) const;
  /// 1 unless tol < |Det()| (a determinant of exactly tol is singular).
  int32 IsSingular(T tol) { return !(tol < std::fabs(Det())); }
  /// 1 if A A^T and A^T A differ from the identity by at most tol element by element.
  int32 IsOrthogonal(T tol) const;
  /// Sylvester's criterion: 1 if the first element and the determinants of all leading
  /// blocks are at least tol. Symmetry is not tested.
  int32 IsPositive(T tol);
  /// The diagonal to size elements of target.
  void GetDiagElements(T* target) const;
  /// New matrix: this with value subtracted from each diagonal element.
  CNaxMatrixN GetCharacteristicsMatrix(T value) const;
  /// this = other * this.
  CNaxMatrixN& PreMultiply(const CNaxMatrixN& other);
  /// this = this * other.
  CNaxMatrixN& PostMultiply(const CNaxMatrixN& other);
  /// this = this * other.
  CNaxMatrixN& operator*=(const CNaxMatrixN& other) { return PostMultiply(other); }
  /// Integer power by repeated multiplication; the identity for power < 1.
  CNaxMatrixN operator^(int32 power) const;
  CNaxMatrixN& operator^=(int32 power) {
    *this = (*this ^ power);
    return *this;
  }

  /// Doolittle LU without pivoting: lower has a unit diagonal, upper the pivots. 1 done;
  /// 0 when a pivot is below tol in absolute value (factors left as far as they got).
  int32 LU_Decomposition(CNaxMatrixN& lower, CNaxMatrixN& upper, T tol) const;
  /// Inverse of a lower triangular matrix (elements above the diagonal at most 1e-6, product
  /// of the diagonal at least tol in absolute value); 1 done, 0 refused.
  int32 LowLeftInverse(CNaxMatrixN& result, T tol);
  /// Inverse of an upper triangular matrix, as LowLeftInverse mirrored; 1 done, 0 refused.
  int32 UpperRightInverse(CNaxMatrixN& result, T tol);
  /// Inverse of a diagonal matrix (off-diagonal elements at most tol); 1 done, 0 refused.
  int32 DiagInverse(CNaxMatrixN& result, T tol);

  /// Inverse by size: 1 for sizes 0 and 1 (result untouched); sizes 2 to 4 through the fixed
  /// classes; from 5 on by LU (3 when tol > |det|, 1 when a triangular inverse refuses), and
  /// by CNaxMatrixMN::Inverse when LU refuses.
  int32 Inverse(CNaxMatrixN& result, T tol);
  /// As Inverse, with the determinant floor 1e-6 (1 and the pseudo-infinity as condition when
  /// it fails) and condition = Norm(norm) of this times Norm(norm) of the inverse.
  int32 Inverse(CNaxMatrixN& result, naxMatrixNorm norm, T tol, T& condition);
  /// Solves this x = rhs through the whole inverse; the status of Inverse, solution untouched
  /// on failure.
  int32 SolveSystem(const CNaxVectorN<T>& rhs, CNaxVectorN<T>& solution, T tol);
  /// As SolveSystem, through the norm form of Inverse.
  int32 SolveSystem(const CNaxVectorN<T>& rhs, CNaxVectorN<T>& solution, naxMatrixNorm norm,
                    T tol, T& condition);
  /// Condition number: by the extreme singular values for the spectral norm, else through the
  /// norm form of Inverse; 3.4028234663852886e38 for a singular matrix or a failure.
  T ConditionNumber(naxMatrixNorm norm);
  /// Symmetric Gauss-Seidel approximation of the inverse, (D + U)^-1 D (D + L)^-1; 1 done,
  /// 0 when a diagonal element is below 1e-6 or a triangular inverse refuses.
  int32 InvPreconditioner(CNaxMatrixN& result, T tol) const;
  /// this = rotation * stretch (right not 0) or stretch * rotation (right 0), by Newton's
  /// iteration on the rotation, at most size rounds; stretch is symmetric. 1 done; 0 when
  /// |Det()| <= tol or an inner inverse fails (nothing written).
  int32 PolarDecomposition(CNaxMatrixN& rotation, CNaxMatrixN& stretch, int32 right, T tol);
  /// this = vectors * values * vectors^T for a positive matrix, values diagonal (ascending
  /// when sorted is not 0). 1 done, 0 not positive or the Jacobi method did not finish.
  int32 SpectralDecomposition(CNaxMatrixN& vectors, CNaxMatrixN& values, int32 sorted, T tol);
  /// Eigenvalues of a symmetric matrix in ascending order, eigenvectors in the columns of
  /// vectors. naxStatusNotSymmetric when mirrored elements differ by more than tol,
  /// naxStatusTooManyRotations when the rotation count comes out at exactly 50.
  naxStatus SymmetricEigensolve(CNaxVectorN<T>& values, CNaxMatrixN& vectors, T tol);

 protected:
  using MN::cols;
  using MN::data;
  using MN::rows;

  // Cyclic Jacobi with threshold on the upper triangle of work, which it destroys.
  // rotations brings the limit of sweeps and returns the number of rotations made.
  naxStatus DestructiveJacobiUnitOffset(CNaxMatrixN& work, CNaxVectorN<T>& values,
                                        CNaxMatrixN& vectors, int32& rotations, T tol);
  // a(i, j), a(k, l) <- g - s (h + g tau), h + s (g - h tau) for g = a(i, j), h = a(k, l).
  void JacobiRotate(CNaxMatrixN& a, int32 i, int32 j, int32 k, int32 l, T s, T tau) const;

  int32 size;

 private:
  // Jacobi run with the sweep limit 50 on a copy, for the two eigen routines.
  naxStatus RunJacobi(CNaxVectorN<T>& values, CNaxMatrixN& vectors, int32& rotations, T tol);
  // Sorts values ascending and permutes the columns of vectors alike.
  static void SortEigenpairs(CNaxVectorN<T>& values, CNaxMatrixN& vectors);
  // The LU route of both Inverse forms; detFloor is tol or 1e-6.
  int32 InverseByLU(CNaxMatrixN& result, T tol, T detFloor, int32 singularStatus, bool& luFailed);
};

/// 1 when the square matrices have the same size and no elements differ by more than tol.
template <typename T>
int32 naxAreAlmostEqual(const CNaxMatrixN<T>& a, const CNaxMatrixN<T>& b, T tol) {
  if (a.Size() != b.Size()) return 0;
  return naxAreAlmostEqual(static_cast<const CNaxMatrixMN<T>&>(a),
                           static_cast<const CNaxMatrixMN<T>&>(b), tol);
}

#include "nax/detail/matrix_n_members.h"

extern template class CNaxMatrixN<float>;
extern template class CNaxMatrixN<double>;

#endif  // NAX_MATRIX_N_H
