// The 2 x 2 matrix, held inline and row-major, with no virtual table and no heap: closed
// forms of the inverse, eigenvalues, eigenvectors and polar decomposition.
#ifndef NAX_MATRIX2_H
#define NAX_MATRIX2_H

#include <cmath>

#include "nax/algebra.h"
#include "nax/base_vector.h"
#include "nax/complex.h"
#include "nax/detail/fixed_common.h"
#include "nax/detail/fixed_linalg.h"
#include "nax/detail/fixed_ops.h"
#include "nax/vector2.h"

template <typename T>
class CNaxMatrixN;
template <typename T>
class CNaxMatrixMN;

/// A 2 x 2 matrix of float or double, row-major.
template <typename T>
class CNaxMatrix2 {
  static_assert(nax::detail::kIsReal<T>, "CNaxMatrix2 is instantiated for float and double only");
  using Ops = nax::detail::Fixed<T, 2>;
  using Vector = CNaxVector2<T>;

 public:
  /// Zeros.
  CNaxMatrix2() : a{} {}
  /// Four elements in row-major order.
  explicit CNaxMatrix2(const T* source) : a{source[0], source[1], source[2], source[3]} {}
  /// The elements row by row.
  CNaxMatrix2(T a00, T a01, T a10, T a11) : a{a00, a01, a10, a11} {}
  CNaxMatrix2(const CNaxMatrix2&) = default;
  CNaxMatrix2& operator=(const CNaxMatrix2&) = default;

  // ---- Accessors -----------------------------------------------------------------------------

  int32 RowsNb() const { return 2; }
  int32 ColsNb() const { return 2; }
  int32 Size() const { return 2; }
  /// Element (row, col), not range-tested.
  T& operator()(int32 row, int32 col) { return a[row * 2 + col]; }
  const T& operator()(int32 row, int32 col) const { return a[row * 2 + col]; }
  /// Element i of the row-major array.
  T& operator[](int32 i) { return a[i]; }
  const T& operator[](int32 i) const { return a[i]; }
  T* Data() { return a; }
  const T* Data() const { return a; }

  void SetElement(int32 row, int32 col, T value) { a[row * 2 + col] = value; }
  void AddToElement(int32 row, int32 col, T value) { a[row * 2 + col] += value; }
  void MulElement(int32 row, int32 col, T value) { a[row * 2 + col] *= value; }
  void SetRow(int32 row, const T* source) { nax::detail::SetRow<2>(a, row, source); }
  void SetColumn(int32 col, const T* source) { nax::detail::SetColumn<2>(a, col, source); }
  void Row(int32 row, T* target) const { nax::detail::GetRow<2>(a, row, target); }
  void Column(int32 col, T* target) const { nax::detail::GetColumn<2>(a, col, target); }
  void SetRowVector(int32 row, const Vector& v) { a[row * 2] = v.x, a[row * 2 + 1] = v.y; }
  void SetColVector(int32 col, const Vector& v) { a[col] = v.x, a[2 + col] = v.y; }
  Vector RowVector(int32 row) const { return Vector(a[row * 2], a[row * 2 + 1]); }
  Vector ColVector(int32 col) const { return Vector(a[col], a[2 + col]); }
  Vector Diagonal() const { return Vector(a[0], a[3]); }

  void Fill(const T* source) { nax::detail::CopyArray<4>(source, a); }
  void Dump(T* target) const { nax::detail::CopyArray<4>(a, target); }
  void SetToZero() { SetConstant(T(0)); }
  void SetConstant(T value) { nax::detail::SetArray<4>(a, value); }
  /// Zeros with value on the diagonal.
  void SetDiagonal(T value) { nax::detail::SetDiagonal<2>(a, value); }
  /// The identity.
  void Unit() { SetDiagonal(T(1)); }
  T Trace() const { return nax::detail::Trace<2>(a); }

  // ---- Element-wise arithmetic and products --------------------------------------------------

  void Add(const CNaxMatrix2& m) { nax::detail::AddArray<4>(a, m.a); }
  void Sub(const CNaxMatrix2& m) { nax::detail::SubArray<4>(a, m.a); }
  void Mul(T value) { nax::detail::MulArray<4>(a, value); }
  /// Divides by value, unguarded.
  void Div(T value) { nax::detail::DivArray<4>(a, value); }
  CNaxMatrix2& operator+=(const CNaxMatrix2& m) { return Add(m), *this; }
  CNaxMatrix2& operator-=(const CNaxMatrix2& m) { return Sub(m), *this; }
  CNaxMatrix2& operator*=(T value) { return Mul(value), *this; }
  CNaxMatrix2& operator/=(T value) { return Div(value), *this; }
  CNaxMatrix2 operator+(const CNaxMatrix2& m) const { return CNaxMatrix2(*this) += m; }
  CNaxMatrix2 operator-(const CNaxMatrix2& m) const { return CNaxMatrix2(*this) -= m; }
  CNaxMatrix2 operator*(T value) const { return CNaxMatrix2(*this) *= value; }
  CNaxMatrix2 operator/(T value) const { return CNaxMatrix2(*this) /= value; }
  /// Matrix product.
  CNaxMatrix2 operator*(const CNaxMatrix2& m) const {
    T out[4];  // a local array: the result may alias an operand
    Ops::Product(a, m.a, out);
    return CNaxMatrix2(out);
  }
  /// Product with a column vector.
  Vector operator*(const Vector& v) const { return Vector(a[0] * v.x + a[1] * v.y, a[2] * v.x + a[3] * v.y); }
  /// this = this * m.
  CNaxMatrix2& operator*=(const CNaxMatrix2& m) { return *this = *this * m; }
  /// this = m * this.
  CNaxMatrix2& PreMultiply(const CNaxMatrix2& m) { return *this = m * *this; }
  /// this = this * m.
  CNaxMatrix2& PostMultiply(const CNaxMatrix2& m) { return *this = *this * m; }
  CNaxMatrix2 Transpose() const { return CNaxMatrix2(a[0], a[2], a[1], a[3]); }
  /// A new matrix of the negated elements; this one stays as it is.
  CNaxMatrix2 Negate() const { return CNaxMatrix2(-a[0], -a[1], -a[2], -a[3]); }
  CNaxMatrix2 operator-() const { return Negate(); }

  /// 1 when no element differs by more than the default tolerance.
  int32 operator==(const CNaxMatrix2& m) const {
    return nax::detail::ArraysAlmostEqual(4, a, m.a, nax::detail::DefaultTol<T>());
  }
  int32 operator!=(const CNaxMatrix2& m) const { return !(*this == m); }

  // ---- Shape tests and element statistics ----------------------------------------------------

  void AnnulateSmallElements(T tol) { Ops::AnnulateSmall(a, tol); }
  int32 IsAlmostZero(T tol) const { return Ops::IsAlmostZero(a, tol); }
  int32 IsDiagonal(T tol) const { return Ops::IsDiagonal(a, tol); }
  int32 IsSymmetric(T tol) const { return Ops::IsSymmetric(a, tol); }
  int32 IsUnit(T tol) const { return Ops::IsUnit(a, tol); }
  int32 IsLLTriangular(T tol) const { return Ops::IsLLTriangular(a, tol); }
  int32 IsURTriangular(T tol) const { return Ops::IsURTriangular(a, tol); }
  /// 1 if this times its transpose is the identity within tol.
  int32 IsOrthogonal(T tol) const { return Ops::IsOrthogonal(a, tol); }
  /// tol >= |det|.
  int32 IsSingular(T tol) const { return tol >= std::fabs(Det()); }
  /// Sylvester's criterion (symmetry is not tested): 0 if tol > a(0,0) or det < tol.
  int32 IsPositive(T tol) const { return !(tol > a[0] || Det() < tol); }
  T Mean() const { return Ops::Mean(a); }
  T InnerProduct(const CNaxMatrix2& m) const { return Ops::InnerProduct(a, m.a); }
  T CorrelationCoefficient(const CNaxMatrix2& m) const { return Ops::Correlation(a, m.a); }

  // ---- Determinant, rank, norms, inverses ----------------------------------------------------

  T Det() const { return a[0] * a[3] - a[1] * a[2]; }
  /// 2 if |det| >= tol, 1 if any |a| > tol, else 0.
  int32 CalculateRank(T tol) const {
    if (std::fabs(Det()) >= tol) return 2;
    return Ops::IsAlmostZero(a, tol) ? 0 : 1;
  }
  /// The norm of the given kind. The max-element form deliberately multiplies by 3, the
  /// factor of the 3 x 3 matrix, not by 2; the Frobenius form is 0 below the floor 1e-6 of
  /// its sum of squares; -1 if the decomposition of the spectral form fails.
  T Norm(naxMatrixNorm norm) const { return nax::detail::FixedNorm<2>(a, norm, T(3)); }
  /// Condition number in the given norm; 3.4028234663852886e38 for a singular matrix.
  T ConditionNumber(naxMatrixNorm norm) const { return nax::detail::FixedConditionNumber<2>(*this, a, norm); }

  /// Inverse by the adjugate: 0, or 3 with result unchanged when tol > |det|.
  int32 Inverse(CNaxMatrix2& result, T tol) const {
    const T det = a[0] * a[3] - a[1] * a[2];
    if (tol > std::fabs(det)) return 3;
    const T f = T(1) / det;
    result = CNaxMatrix2(a[3] * f, -a[1] * f, -a[2] * f, a[0] * f);
    return 0;
  }
  /// Inverse with the condition number Norm(norm) of this times Norm(norm) of the inverse;
  /// on 3 the condition is 3.4028234663852886e38 and result is unchanged.
  int32 Inverse(CNaxMatrix2& result, naxMatrixNorm norm, T tol, T& condition) const {
    return nax::detail::InverseWithCondition(*this, result, norm, tol, condition);
  }
  /// Inverse of a diagonal matrix: 1, or 0 on refusal.
  int32 DiagInverse(CNaxMatrix2& result, T tol) const { return Ops::DiagInverse(a, result.a, tol); }
  /// Solves this x = rhs through the inverse; the status of Inverse.
  int32 SolveSystem(const Vector& rhs, Vector& solution, T tol) const {
    return nax::detail::SolveByInverse(*this, rhs, solution, tol);
  }
  /// SolveSystem with the condition number of the norm form of Inverse.
  int32 SolveSystem(const Vector& rhs, Vector& solution, naxMatrixNorm norm, T tol, T& condition) const {
    return nax::detail::SolveByInverse(*this, rhs, solution, norm, tol, condition);
  }

  // ---- Decompositions ------------------------------------------------------------------------

  /// Doolittle LU without pivoting: 1, or 0 at a pivot below tol.
  int32 LU_Decomposition(CNaxMatrix2& lower, CNaxMatrix2& upper, T tol) const { return Ops::LU(a, lower.a, upper.a, tol); }
  /// Householder QR, this = q r. Returns 0.
  int32 QR_Decomposition(CNaxMatrix2& q, CNaxMatrix2& r, T tol) const { return Ops::QR(a, q.a, r.a, tol); }
  /// this = u diag(w) v^T with w non-negative and descending; 0, or 1 without convergence.
  int32 SV_Decomposition(CNaxMatrix2& u, CNaxMatrix2& v, Vector& w, T /*tol*/) const {
    T values[2];
    const int32 status = Ops::SVD(a, u.a, values, v.a);
    w = Vector(values);
    return status;
  }
  /// Closed-form polar decomposition: rotation = this + sign(det) C (C the cofactor matrix)
  /// normalised by the length of its first column; stretch the symmetric part of
  /// rotation^T this (right not 0) or this rotation^T (right 0). Returns 1, or 0 with
  /// nothing written when tol > |det|.
  int32 PolarDecomposition(CNaxMatrix2& rotation, CNaxMatrix2& stretch, int32 right, T tol) const {
    const T det = Det();
    if (tol > std::fabs(det)) return 0;
    const T sign = det > T(0) ? T(1) : T(-1);
    CNaxMatrix2 r(a[0] + sign * a[3], a[1] - sign * a[2], a[2] - sign * a[1], a[3] + sign * a[0]);
    const T s = r.a[0] * r.a[0] + r.a[2] * r.a[2];
    const T n = s < nax::detail::DefaultTol<T>() ? T(0) : std::sqrt(s);
    r.Div(n);
    const CNaxMatrix2 p = right ? r.Transpose() * *this : *this * r.Transpose();
    rotation = r;
    stretch = (p + p.Transpose()) * T(0.5);
    return 1;
  }
  /// this = vectors values vectors^T for a positive matrix (Jacobi, 50 rotations at most).
  int32 SpectralDecomposition(CNaxMatrix2& vectors, CNaxMatrix2& values, int32 sorted, T tol) const {
    if (!IsPositive(tol)) return 0;
    T work[4] = {a[0], a[1], a[2], a[3]}, d[2];
    int32 rotations;
    Ops::Jacobi(work, d, vectors.a, 50, rotations, tol);
    if (rotations == 50) return 0;
    if (sorted) Ops::SortAscending(d, vectors.a);
    values = CNaxMatrix2(d[0], 0, 0, d[1]);
    return 1;
  }
  /// Eigenvalues of a symmetric matrix in ascending order, their vectors in the columns.
  naxStatus SymmetricEigensolve(Vector& values, CNaxMatrix2& vectors, T tol) const {
    T d[2] = {};
    const naxStatus status = Ops::SymmetricEigensolve(a, d, vectors.a, tol);
    values = Vector(d);
    return status;
  }

  // ---- Eigenvalues and eigenvectors ----------------------------------------------------------

  /// This matrix with value subtracted from the diagonal.
  CNaxMatrix2 GetCharacteristicsMatrix(T value) const { return CNaxMatrix2(a[0] - value, a[1], a[2], a[3] - value); }

  /// Roots of l^2 - trace l + det by CNaxAlgebra::SolveReducedQuadratic, whose result it
  /// returns: 2 real (l1 < l2), 1 double, 0 complex (l1 real part, l2 imaginary part).
  /// Roots with tol >= |root| become exactly 0.
  int32 FindEigenvalues(T& l1, T& l2, T tol) const {
    const int32 kind = CNaxAlgebra::SolveReducedQuadratic(-Trace(), Det(), l1, l2, tol);
    if (tol >= std::fabs(l1)) l1 = T(0);
    if (tol >= std::fabs(l2)) l2 = T(0);
    return kind;
  }
  /// Eigenvectors of the real eigenvalue value, two values per vector: (1, 0) and (0, 1)
  /// when this minus value is below tol everywhere (result 2), else the one vector from
  /// the row of its largest element (result 1).
  int32 FindEigenvectorsReal(T value, T* vectors, T tol) const {
    const CNaxMatrix2 m = GetCharacteristicsMatrix(value);
    int32 big = 0;
    for (int32 i = 1; i < 4; ++i)
      if (std::fabs(m.a[i]) > std::fabs(m.a[big])) big = i;
    if (std::fabs(m.a[big]) < tol) {
      vectors[0] = T(1), vectors[1] = T(0), vectors[2] = T(0), vectors[3] = T(1);
      return 2;
    }
    const T q = m.a[big], p = m.a[big ^ 1];
    if (big % 2 == 0) {
      vectors[0] = -p / q, vectors[1] = T(1);
    } else {
      vectors[0] = T(1), vectors[1] = -p / q;
    }
    return 1;
  }
  /// The eigenvector of the complex eigenvalue value from the longer row (p, q) of this
  /// matrix minus value on the diagonal: (-q, p), unnormalised. vector must have two
  /// components.
  void FindEigenvectorComplex(const CNaxComplex<T>& value, CNaxBaseVector<CNaxComplex<T>>& vector, T /*tol*/) const {
    const CNaxComplex<T> r0[2] = {CNaxComplex<T>(a[0] - value.Real(), -value.Imag()), CNaxComplex<T>(a[1], 0)};
    const CNaxComplex<T> r1[2] = {CNaxComplex<T>(a[2], 0), CNaxComplex<T>(a[3] - value.Real(), -value.Imag())};
    const bool first = r0[0].SquareMagn() + r0[1].SquareMagn() >= r1[0].SquareMagn() + r1[1].SquareMagn();
    const CNaxComplex<T>* row = first ? r0 : r1;
    vector[0].Set(-row[1].Real(), -row[1].Imag());
    vector[1].Set(row[0].Real(), row[0].Imag());
  }

  // ---- Conversions -----------------------------------------------------------------------------

  /// A heap copy as a run-time sized square matrix.
  CNaxMatrixN<T> ConvertToMatrixN() const;
  /// A heap copy as a run-time sized rectangular matrix.
  CNaxMatrixMN<T> ConvertToMatrixMN() const;

 private:
  T a[4];
};

extern template class CNaxMatrix2<float>;
extern template class CNaxMatrix2<double>;

#endif  // NAX_MATRIX2_H
