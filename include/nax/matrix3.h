// The 3 x 3 matrix, held inline and row-major, with no virtual table and no heap.
//
// It serves two roles: a general small matrix with closed forms, eigenvalues and
// eigenvectors and its decompositions; and both the rotation of space (Euler angles,
// angle and axis) and the homogeneous transform of the plane (IsRotation, Rotate, Scale,
// Translate). Setters of rotations take degrees; Rotate of the plane takes radians.
#ifndef NAX_MATRIX3_H
#define NAX_MATRIX3_H

#include <cmath>

#include "nax/algebra.h"
#include "nax/base_vector.h"
#include "nax/complex.h"
#include "nax/detail/fixed_common.h"
#include "nax/detail/fixed_linalg.h"
#include "nax/detail/fixed_ops.h"
#include "nax/rotations_order.h"
#include "nax/vector3.h"
#include "nax/vector_routines.h"

template <typename T>
class CNaxMatrixN;
template <typename T>
class CNaxMatrixMN;

namespace nax::detail {

/// An angle in radians from its sine s and cosine k, both clamped to [-1, 1], by the
/// better-conditioned function: the arc sine (mirrored when k < 0) where |k| > 1/sqrt(2),
/// else the arc cosine (negated when s < 0).
template <typename T>
inline T AngleFromSineCosine(T s, T k) {
  s = s < T(-1) ? T(-1) : (s > T(1) ? T(1) : s);
  k = k < T(-1) ? T(-1) : (k > T(1) ? T(1) : k);
  if (std::fabs(k) > T(0.707106781)) {
    const T a = std::asin(s);
    if (k < T(0)) return a >= T(0) ? Pi<T>() - a : -Pi<T>() - a;
    return a;
  }
  const T a = std::acos(k);
  return s < T(0) ? -a : a;
}

/// Rotation R_K R_J R_I (axis I applied first) with the angle of each axis in radians,
/// written into a row-major 3 x 3 array. Odd sequences negate the angles so that one
/// closed form serves all six orders.
template <typename T, int I, int J, int K, bool Odd>
inline void EulerToMatrix(const T (&angle)[3], T* m) {
  const T sign = Odd ? T(-1) : T(1);
  const T ti = sign * angle[I], tj = sign * angle[J], th = sign * angle[K];
  const T ci = std::cos(ti), si = std::sin(ti), cj = std::cos(tj), sj = std::sin(tj);
  const T ch = std::cos(th), sh = std::sin(th);
  const T cc = ci * ch, cs = ci * sh, sc = si * ch, ss = si * sh;
  m[I * 3 + I] = cj * ch;
  m[I * 3 + J] = sj * sc - cs;
  m[I * 3 + K] = sj * cc + ss;
  m[J * 3 + I] = cj * sh;
  m[J * 3 + J] = sj * ss + cc;
  m[J * 3 + K] = sj * cs - sc;
  m[K * 3 + I] = -sj;
  m[K * 3 + J] = cj * si;
  m[K * 3 + K] = cj * ci;
}

/// The inverse of EulerToMatrix: angles in radians, indexed by axis. At the poles the
/// combined outer angle is split evenly between the first and the last rotation.
template <typename T, int I, int J, int K, bool Odd>
inline void MatrixToEuler(const T* m, T (&angle)[3]) {
  const T e = Odd ? T(-1) : T(1);
  T sb = -e * m[K * 3 + I];
  sb = sb < T(-1) ? T(-1) : (sb > T(1) ? T(1) : sb);
  const T beta = std::asin(sb);
  const T c = std::cos(beta);
  angle[J] = beta;
  if (std::fabs(c) > T(1e-6)) {
    angle[I] = AngleFromSineCosine(e * m[K * 3 + J] / c, m[K * 3 + K] / c);
    angle[K] = AngleFromSineCosine(e * m[J * 3 + I] / c, m[I * 3 + I] / c);
    return;
  }
  // Gimbal lock: only the difference (or the sum) of the outer angles is defined.
  const T phi = AngleFromSineCosine(-e * m[J * 3 + K], m[J * 3 + J]);
  angle[I] = T(0.5) * phi;
  angle[K] = e * beta > T(0) ? T(-0.5) * phi : T(0.5) * phi;
}

}  // namespace nax::detail

/// A 3 x 3 matrix of float or double, row-major.
template <typename T>
class CNaxMatrix3 {
  static_assert(nax::detail::kIsReal<T>, "CNaxMatrix3 is instantiated for float and double only");
  using Ops = nax::detail::Fixed<T, 3>;
  using Vector = CNaxVector3<T>;

 public:
  /// Zeros.
  CNaxMatrix3() : a{} {}
  /// Nine elements in row-major order.
  explicit CNaxMatrix3(const T* source) { Fill(source); }
  /// The elements row by row.
  CNaxMatrix3(T a00, T a01, T a02, T a10, T a11, T a12, T a20, T a21, T a22)
      : a{a00, a01, a02, a10, a11, a12, a20, a21, a22} {}
  CNaxMatrix3(const CNaxMatrix3&) = default;
  CNaxMatrix3& operator=(const CNaxMatrix3&) = default;

  // ---- Accessors -----------------------------------------------------------------------------

  int32 RowsNb() const { return 3; }
  int32 ColsNb() const { return 3; }
  int32 Size() const { return 3; }
  /// Element (row, col), not range-tested.
  T& operator()(int32 row, int32 col) { return a[row * 3 + col]; }
  const T& operator()(int32 row, int32 col) const { return a[row * 3 + col]; }
  /// Element i of the row-major array.
  T& operator[](int32 i) { return a[i]; }
  const T& operator[](int32 i) const { return a[i]; }
  /// The row-major array of nine elements.
  T* Data() { return a; }
  const T* Data() const { return a; }

  void SetElement(int32 row, int32 col, T value) { a[row * 3 + col] = value; }
  void AddToElement(int32 row, int32 col, T value) { a[row * 3 + col] += value; }
  void MulElement(int32 row, int32 col, T value) { a[row * 3 + col] *= value; }
  void SetRow(int32 row, const T* source) { nax::detail::SetRow<3>(a, row, source); }
  void SetColumn(int32 col, const T* source) { nax::detail::SetColumn<3>(a, col, source); }
  void Row(int32 row, T* target) const { nax::detail::GetRow<3>(a, row, target); }
  void Column(int32 col, T* target) const { nax::detail::GetColumn<3>(a, col, target); }
  void SetRowVector(int32 row, const Vector& v) { a[row * 3] = v.x, a[row * 3 + 1] = v.y, a[row * 3 + 2] = v.z; }
  void SetColVector(int32 col, const Vector& v) { a[col] = v.x, a[3 + col] = v.y, a[6 + col] = v.z; }
  Vector RowVector(int32 row) const { return Vector(a[row * 3], a[row * 3 + 1], a[row * 3 + 2]); }
  Vector ColVector(int32 col) const { return Vector(a[col], a[3 + col], a[6 + col]); }
  /// The third row and the third column.
  Vector LastRow() const { return RowVector(2); }
  Vector LastColumn() const { return ColVector(2); }
  Vector Diagonal() const { return Vector(a[0], a[4], a[8]); }

  void Fill(const T* source) { nax::detail::CopyArray<9>(source, a); }
  void Dump(T* target) const { nax::detail::CopyArray<9>(a, target); }
  void SetToZero() { SetConstant(T(0)); }
  void SetConstant(T value) { nax::detail::SetArray<9>(a, value); }
  /// Zeros with value on the diagonal.
  void SetDiagonal(T value) { nax::detail::SetDiagonal<3>(a, value); }
  /// The identity.
  void Unit() { SetDiagonal(T(1)); }
  T Trace() const { return nax::detail::Trace<3>(a); }

  // ---- Element-wise arithmetic and products --------------------------------------------------

  void Add(const CNaxMatrix3& m) { nax::detail::AddArray<9>(a, m.a); }
  void Sub(const CNaxMatrix3& m) { nax::detail::SubArray<9>(a, m.a); }
  void Mul(T value) { nax::detail::MulArray<9>(a, value); }
  /// Divides by value, unguarded.
  void Div(T value) { nax::detail::DivArray<9>(a, value); }
  CNaxMatrix3& operator+=(const CNaxMatrix3& m) { return Add(m), *this; }
  CNaxMatrix3& operator-=(const CNaxMatrix3& m) { return Sub(m), *this; }
  CNaxMatrix3& operator*=(T value) { return Mul(value), *this; }
  CNaxMatrix3& operator/=(T value) { return Div(value), *this; }
  CNaxMatrix3 operator+(const CNaxMatrix3& m) const { return CNaxMatrix3(*this) += m; }
  CNaxMatrix3 operator-(const CNaxMatrix3& m) const { return CNaxMatrix3(*this) -= m; }
  CNaxMatrix3 operator*(T value) const { return CNaxMatrix3(*this) *= value; }
  CNaxMatrix3 operator/(T value) const { return CNaxMatrix3(*this) /= value; }
  /// Matrix product.
  CNaxMatrix3 operator*(const CNaxMatrix3& m) const {
    T out[9];  // a local array: the result may alias an operand
    Ops::Product(a, m.a, out);
    return CNaxMatrix3(out);
  }
  /// Product with a column vector.
  Vector operator*(const Vector& v) const {
    const T x = v.x, y = v.y, z = v.z;
    return Vector(a[0] * x + a[1] * y + a[2] * z, a[3] * x + a[4] * y + a[5] * z, a[6] * x + a[7] * y + a[8] * z);
  }
  /// this = this * m.
  CNaxMatrix3& operator*=(const CNaxMatrix3& m) { return *this = *this * m; }
  /// this = m * this.
  CNaxMatrix3& PreMultiply(const CNaxMatrix3& m) { return *this = m * *this; }
  /// this = this * m.
  CNaxMatrix3& PostMultiply(const CNaxMatrix3& m) { return *this = *this * m; }
  CNaxMatrix3 Transpose() const {
    CNaxMatrix3 r;
    Ops::Transpose(a, r.a);
    return r;
  }
  /// A new matrix of the negated elements; this one stays as it is.
  CNaxMatrix3 Negate() const { return *this * T(-1); }
  CNaxMatrix3 operator-() const { return Negate(); }

  /// 1 when no element differs by more than the default tolerance.
  int32 operator==(const CNaxMatrix3& m) const {
    return nax::detail::ArraysAlmostEqual(9, a, m.a, nax::detail::DefaultTol<T>());
  }
  int32 operator!=(const CNaxMatrix3& m) const { return !(*this == m); }

  // ---- Shape tests and element statistics ----------------------------------------------------

  /// Sets to 0 each element with tol > |a|.
  void AnnulateSmallElements(T tol) { Ops::AnnulateSmall(a, tol); }
  /// 1 if every |a| <= tol.
  int32 IsAlmostZero(T tol) const { return Ops::IsAlmostZero(a, tol); }
  /// 1 if every off-diagonal |a| <= tol.
  int32 IsDiagonal(T tol) const { return Ops::IsDiagonal(a, tol); }
  /// 1 if no |a(i,j) - a(j,i)| > tol.
  int32 IsSymmetric(T tol) const { return Ops::IsSymmetric(a, tol); }
  /// 1 if the matrix is the identity within tol, element by element.
  int32 IsUnit(T tol) const { return Ops::IsUnit(a, tol); }
  /// Lower left triangular within tol.
  int32 IsLLTriangular(T tol) const { return Ops::IsLLTriangular(a, tol); }
  /// Upper right triangular within tol.
  int32 IsURTriangular(T tol) const { return Ops::IsURTriangular(a, tol); }
  /// 1 if this times its transpose is the identity within tol.
  int32 IsOrthogonal(T tol) const { return Ops::IsOrthogonal(a, tol); }
  /// tol >= |det|.
  int32 IsSingular(T tol) const { return tol >= std::fabs(Det()); }
  /// Sylvester's criterion on the leading minors (symmetry is not tested): 0 if tol > a(0,0),
  /// tol > the leading 2 x 2 minor or det < tol.
  int32 IsPositive(T tol) const {
    if (tol > a[0] || tol > CalculateMinor(0, 1, 0, 1) || Det() < tol) return 0;
    return 1;
  }
  T Mean() const { return Ops::Mean(a); }
  /// Sum of the products of corresponding elements.
  T InnerProduct(const CNaxMatrix3& m) const { return Ops::InnerProduct(a, m.a); }
  /// Correlation coefficient of the two sets of nine elements; 0 for a constant set.
  T CorrelationCoefficient(const CNaxMatrix3& m) const { return Ops::Correlation(a, m.a); }

  // ---- Determinant, rank, norms, inverses ----------------------------------------------------

  /// Cofactor expansion along the first row.
  T Det() const {
    return a[0] * (a[4] * a[8] - a[5] * a[7]) - a[1] * (a[3] * a[8] - a[5] * a[6]) +
           a[2] * (a[3] * a[7] - a[4] * a[6]);
  }
  /// a(r1,c1) a(r2,c2) - a(r1,c2) a(r2,c1).
  T CalculateMinor(int32 r1, int32 r2, int32 c1, int32 c2) const {
    return a[r1 * 3 + c1] * a[r2 * 3 + c2] - a[r1 * 3 + c2] * a[r2 * 3 + c1];
  }
  /// 3 if |det| >= tol; 0 if no |a| > tol; 2 if a 2 x 2 minor reaches tol; else 1.
  int32 CalculateRank(T tol) const {
    if (std::fabs(Det()) >= tol) return 3;
    if (Ops::IsAlmostZero(a, tol)) return 0;
    for (int32 r1 = 0; r1 < 2; ++r1)
      for (int32 r2 = r1 + 1; r2 < 3; ++r2)
        for (int32 c1 = 0; c1 < 2; ++c1)
          for (int32 c2 = c1 + 1; c2 < 3; ++c2)
            if (std::fabs(CalculateMinor(r1, r2, c1, c2)) >= tol) return 2;
    return 1;
  }

  /// The norm of the given kind; the max-element form multiplies by 3, the root of 9; the
  /// Frobenius form is 0 below the floor 1e-6 of its sum of squares; -1 if the singular value
  /// decomposition of the spectral form fails.
  T Norm(naxMatrixNorm norm) const { return nax::detail::FixedNorm<3>(a, norm, T(3)); }

  /// Condition number in the given norm; 3.4028234663852886e38 for a singular matrix.
  T ConditionNumber(naxMatrixNorm norm) const { return nax::detail::FixedConditionNumber<3>(*this, a, norm); }

  /// Inverse by the adjugate: 0, or 3 with result unchanged when tol > |det|.
  int32 Inverse(CNaxMatrix3& result, T tol) const {
    const T c00 = a[4] * a[8] - a[5] * a[7], c01 = a[5] * a[6] - a[3] * a[8], c02 = a[3] * a[7] - a[4] * a[6];
    const T det = a[0] * c00 + a[1] * c01 + a[2] * c02;
    if (tol > std::fabs(det)) return 3;
    const T f = T(1) / det;
    const T r[9] = {c00 * f,
                    (a[2] * a[7] - a[1] * a[8]) * f,
                    (a[1] * a[5] - a[2] * a[4]) * f,
                    c01 * f,
                    (a[0] * a[8] - a[2] * a[6]) * f,
                    (a[2] * a[3] - a[0] * a[5]) * f,
                    c02 * f,
                    (a[1] * a[6] - a[0] * a[7]) * f,
                    (a[0] * a[4] - a[1] * a[3]) * f};
    result.Fill(r);
    return 0;
  }
  /// Inverse with the condition number Norm(norm) of this times Norm(norm) of the inverse;
  /// on 3 the condition is 3.4028234663852886e38 and result is unchanged.
  int32 Inverse(CNaxMatrix3& result, naxMatrixNorm norm, T tol, T& condition) const {
    return nax::detail::InverseWithCondition(*this, result, norm, tol, condition);
  }
  /// Inverse of a diagonal matrix: 1, or 0 when an off-diagonal |a| > tol or the product of
  /// the diagonal is below tol.
  int32 DiagInverse(CNaxMatrix3& result, T tol) const { return Ops::DiagInverse(a, result.a, tol); }

  /// Solves this x = rhs through the inverse; the status of Inverse, solution unchanged
  /// unless 0.
  int32 SolveSystem(const Vector& rhs, Vector& solution, T tol) const {
    return nax::detail::SolveByInverse(*this, rhs, solution, tol);
  }
  /// SolveSystem with the condition number of the norm form of Inverse.
  int32 SolveSystem(const Vector& rhs, Vector& solution, naxMatrixNorm norm, T tol, T& condition) const {
    return nax::detail::SolveByInverse(*this, rhs, solution, norm, tol, condition);
  }

  // ---- Decompositions ------------------------------------------------------------------------

  /// Doolittle LU without pivoting (lower has a unit diagonal): 1, or 0 at a pivot below tol.
  int32 LU_Decomposition(CNaxMatrix3& lower, CNaxMatrix3& upper, T tol) const {
    return Ops::LU(a, lower.a, upper.a, tol);
  }
  /// Householder QR, this = q r; columns whose tail is below tol are skipped. Returns 0.
  int32 QR_Decomposition(CNaxMatrix3& q, CNaxMatrix3& r, T tol) const { return Ops::QR(a, q.a, r.a, tol); }
  /// this = u diag(w) v^T with w non-negative and descending; 0, or 1 without convergence.
  int32 SV_Decomposition(CNaxMatrix3& u, CNaxMatrix3& v, Vector& w, T /*tol*/) const {
    T values[3];
    const int32 status = Ops::SVD(a, u.a, values, v.a);
    w = Vector(values);
    return status;
  }
  /// The singular values alone, in descending order.
  void CalculateSingularNumbers(Vector& values) const {
    T u[9], w[3], v[9];
    Ops::SVD(a, u, w, v);
    values = Vector(w);
  }
  /// this = rotation stretch (right not 0) or stretch rotation (right 0), stretch symmetric.
  /// Returns 0 with nothing written when |det| <= tol or an inverse fails, 0 with the
  /// outputs written when the Newton iteration takes 15 rounds, else 1.
  int32 PolarDecomposition(CNaxMatrix3& rotation, CNaxMatrix3& stretch, int32 right, T tol) const {
    return nax::detail::PolarNewton(*this, rotation, stretch, right, tol, 15, true);
  }
  /// this = vectors values vectors^T for a positive matrix, values diagonal (ascending when
  /// sorted is not 0). Returns 1, or 0 when not positive or the Jacobi method needs 50
  /// rotations.
  int32 SpectralDecomposition(CNaxMatrix3& vectors, CNaxMatrix3& values, int32 sorted, T tol) const {
    if (!IsPositive(tol)) return 0;
    T work[9], d[3];
    for (int32 i = 0; i < 9; ++i) work[i] = a[i];
    int32 rotations;
    Ops::Jacobi(work, d, vectors.a, 50, rotations, tol);
    if (rotations == 50) return 0;
    if (sorted) Ops::SortAscending(d, vectors.a);
    values.SetToZero();
    values.a[0] = d[0], values.a[4] = d[1], values.a[8] = d[2];
    return 1;
  }
  /// Eigenvalues of a symmetric matrix in ascending order, their vectors in the columns.
  naxStatus SymmetricEigensolve(Vector& values, CNaxMatrix3& vectors, T tol) const {
    T d[3] = {};
    const naxStatus status = Ops::SymmetricEigensolve(a, d, vectors.a, tol);
    values = Vector(d);
    return status;
  }

  // ---- Eigenvalues and eigenvectors ----------------------------------------------------------

  /// This matrix with value subtracted from the diagonal.
  CNaxMatrix3 GetCharacteristicsMatrix(T value) const {
    CNaxMatrix3 m(*this);
    m.a[0] -= value, m.a[4] -= value, m.a[8] -= value;
    return m;
  }

  /// Roots of the characteristic polynomial by CNaxAlgebra::SolveReducedCubic, whose result
  /// it returns: 3 real, 2 real with l2 = l3 double, 1 real l1 and l2 +- i l3. Roots with
  /// tol >= |root| become exactly 0.
  int32 FindEigenvalues(T& l1, T& l2, T& l3, T tol) const {
    const T b = CalculateMinor(0, 1, 0, 1) + CalculateMinor(0, 2, 0, 2) + CalculateMinor(1, 2, 1, 2);
    const int32 kind = CNaxAlgebra::SolveReducedCubic(-Trace(), b, -Det(), l1, l2, l3, tol);
    for (T* l : {&l1, &l2, &l3})
      if (tol >= std::fabs(*l)) *l = T(0);
    return kind;
  }

  /// The eigenspace of the real eigenvalue value: writes its basis (unnormalised, three
  /// values per vector) to vectors and returns their number, 1, 2 or 3.
  int32 FindEigenvectorsReal(T value, T* vectors, T tol) const {
    CNaxMatrix3 m = GetCharacteristicsMatrix(value);
    m.AnnulateSmallElements(tol);
    int32 zero[3];
    const int32 zeroCount = m.FindZeroRows(zero, tol);
    if (zeroCount == 3) {
      for (int32 i = 0; i < 9; ++i) vectors[i] = (i % 4 == 0) ? T(1) : T(0);
      return 3;
    }
    if (zeroCount == 2) return FindEigenvectorsFromRow(m.RowVector(GetThirdIndex(zero[0], zero[1])), vectors);
    if (zeroCount == 1) {
      int32 first, second;
      GetPairOfIndices(zero[0], first, second);
      const Vector x = m.RowVector(first), y = m.RowVector(second);
      if (naxAreColinear(x, y, tol)) return FindEigenvectorsFromRow(x, vectors);
      NullVector(x, y).Dump(vectors);
      return 1;
    }
    constexpr int32 kPairs[3][2] = {{0, 1}, {0, 2}, {1, 2}};
    for (const auto& pair : kPairs) {
      const Vector x = m.RowVector(pair[0]), y = m.RowVector(pair[1]);
      if (naxAreColinear(x, y, tol)) continue;
      NullVector(x, y).Dump(vectors);
      return 1;
    }
    return FindEigenvectorsFromRow(m.RowVector(0), vectors);
  }

  /// The plane orthogonal to row (a, b, c), by dividing by its element of largest magnitude
  /// (a wins ties, then b): two unnormalised vectors, and the result 2.
  int32 FindEigenvectorsFromRow(const Vector& row, T* vectors) const {
    const T fa = std::fabs(row.x), fb = std::fabs(row.y), fc = std::fabs(row.z);
    T v[6] = {};
    if (fa >= fb && fa >= fc) {
      v[0] = -row.y / row.x, v[1] = T(1);
      v[3] = -row.z / row.x, v[5] = T(1);
    } else if (fb >= fc) {
      v[0] = T(1), v[1] = -row.x / row.y;
      v[4] = -row.z / row.y, v[5] = T(1);
    } else {
      v[0] = T(1), v[2] = -row.x / row.z;
      v[4] = T(1), v[5] = -row.y / row.z;
    }
    for (int32 i = 0; i < 6; ++i) vectors[i] = v[i];
    return 2;
  }

  /// The eigenvector of the complex eigenvalue value: the complex cross product of two
  /// independent rows of this matrix minus value on the diagonal, unnormalised. vector must
  /// have three components.
  void FindEigenvectorComplex(const CNaxComplex<T>& value, CNaxBaseVector<CNaxComplex<T>>& vector, T /*tol*/) const {
    constexpr int32 kPairs[3][2] = {{0, 1}, {0, 2}, {1, 2}};
    int32 first = 0, second = 1;
    for (const auto& pair : kPairs)
      if (!TestComplexRowsForDependence(pair[0], pair[1], value.Real(), value.Imag())) {
        first = pair[0], second = pair[1];
        break;
      }
    CNaxComplex<T> x[3], y[3];
    ComplexRow(first, value.Real(), value.Imag(), x);
    ComplexRow(second, value.Real(), value.Imag(), y);
    const CNaxComplex<T> c[3] = {x[1] * y[2] - x[2] * y[1], x[2] * y[0] - x[0] * y[2], x[0] * y[1] - x[1] * y[0]};
    for (int32 k = 0; k < 3; ++k) vector[k].Set(c[k].Real(), c[k].Imag());
  }

  /// Lists in rows the rows with no element above tol and returns their number.
  int32 FindZeroRows(int32* rows, T tol) const {
    int32 count = 0;
    for (int32 r = 0; r < 3; ++r)
      if (!(std::fabs(a[r * 3]) > tol || std::fabs(a[r * 3 + 1]) > tol || std::fabs(a[r * 3 + 2]) > tol))
        rows[count++] = r;
    return count;
  }
  /// 1 if row i is a multiple of row j (collinear within tol).
  int32 TestRowsForDependence(int32 i, int32 j, T tol) const { return naxAreColinear(RowVector(i), RowVector(j), tol); }
  /// 1 if rows i and j of this matrix minus (re + i im) on the diagonal are dependent: their
  /// complex cross product is small against the product of their lengths.
  int32 TestComplexRowsForDependence(int32 i, int32 j, T re, T im) const {
    CNaxComplex<T> x[3], y[3];
    ComplexRow(i, re, im, x);
    ComplexRow(j, re, im, y);
    const CNaxComplex<T> c[3] = {x[1] * y[2] - x[2] * y[1], x[2] * y[0] - x[0] * y[2], x[0] * y[1] - x[1] * y[0]};
    T cross = T(0), nx = T(0), ny = T(0);
    for (int32 k = 0; k < 3; ++k) {
      cross += c[k].SquareMagn();
      nx += x[k].SquareMagn();
      ny += y[k].SquareMagn();
    }
    const T floor = nax::detail::MatrixFloor<T>();
    return cross <= floor * floor * nx * ny;
  }
  /// The two row indices other than row, in increasing order.
  void GetPairOfIndices(int32 row, int32& first, int32& second) const {
    first = row == 0 ? 1 : 0;
    second = row == 2 ? 1 : 2;
  }
  /// The index among 0, 1, 2 that is neither i nor j.
  int32 GetThirdIndex(int32 i, int32 j) const { return 3 - i - j; }

  /// Finds the rows of this matrix that are zero within tol and a combination
  /// weights[0] a + weights[1] b that vanishes at those components, written to result.
  /// Returns 1, or 0 when no row or every row is zero, or no non-trivial combination exists.
  int32 FindProperCombination(const Vector& va, const Vector& vb, T* weights, Vector& result, T tol) const {
    int32 zero[3];
    const int32 count = FindZeroRows(zero, tol);
    if (count == 0 || count == 3) return 0;
    T wa, wb;
    const T a0 = va[zero[0]], b0 = vb[zero[0]];
    if (count == 1) {
      if (std::fabs(a0) <= tol && std::fabs(b0) <= tol) {
        wa = T(1), wb = T(0);
      } else {
        wa = b0, wb = -a0;
      }
    } else {
      const T a1 = va[zero[1]], b1 = vb[zero[1]];
      if (std::fabs(a0 * b1 - a1 * b0) > tol) return 0;
      // The null vector of [[a0, b0], [a1, b1]] from its larger row.
      if (std::fabs(a0) + std::fabs(b0) >= std::fabs(a1) + std::fabs(b1)) {
        wa = b0, wb = -a0;
      } else {
        wa = b1, wb = -a1;
      }
      if (std::fabs(wa) <= tol && std::fabs(wb) <= tol) wa = T(1), wb = T(0);
    }
    weights[0] = wa;
    weights[1] = wb;
    result = va * wa + vb * wb;
    return 1;
  }

  /// A solution of this x = rhs for a rank-deficient matrix: the least-squares solution of
  /// least length, singular values up to tol counting as zero.
  void FindAnySolution(const Vector& rhs, Vector& solution, T tol) const {
    T u[9], w[3], v[9];
    Ops::SVD(a, u, w, v);
    T y[3];
    for (int32 j = 0; j < 3; ++j) {
      const T d = u[j] * rhs.x + u[3 + j] * rhs.y + u[6 + j] * rhs.z;
      y[j] = w[j] > tol ? d / w[j] : T(0);
    }
    solution = Vector(v[0] * y[0] + v[1] * y[1] + v[2] * y[2], v[3] * y[0] + v[4] * y[1] + v[5] * y[2],
                      v[6] * y[0] + v[7] * y[1] + v[8] * y[2]);
  }

  // ---- Rotations of space ----------------------------------------------------------------------

  /// The Euler angles about X, Y, Z in degrees, each in [-180, 180), of this rotation for the
  /// given sequence. At the poles the middle angle is +-90 and the outer rotation is split
  /// evenly. An order above 5 only reduces the values passed in.
  void ExtractEulerAngles(naxRotationsOrder order, T& a1, T& a2, T& a3) const {
    using namespace nax::detail;
    T angle[3] = {};
    switch (order) {
      case naxRotationsOrderXYZ: MatrixToEuler<T, 0, 1, 2, false>(a, angle); break;
      case naxRotationsOrderXZY: MatrixToEuler<T, 0, 2, 1, true>(a, angle); break;
      case naxRotationsOrderYXZ: MatrixToEuler<T, 1, 0, 2, true>(a, angle); break;
      case naxRotationsOrderYZX: MatrixToEuler<T, 1, 2, 0, false>(a, angle); break;
      case naxRotationsOrderZYX: MatrixToEuler<T, 2, 1, 0, true>(a, angle); break;
      case naxRotationsOrderZXY: MatrixToEuler<T, 2, 0, 1, false>(a, angle); break;
      default:
        angle[0] = a1 * DegToRad<T>(), angle[1] = a2 * DegToRad<T>(), angle[2] = a3 * DegToRad<T>();
        break;
    }
    a1 = ReduceRadians(angle[0]) * RadToDeg<T>();
    a2 = ReduceRadians(angle[1]) * RadToDeg<T>();
    a3 = ReduceRadians(angle[2]) * RadToDeg<T>();
  }

  /// Becomes the rotation by a1, a2, a3 degrees about X, Y, Z, applied in the given
  /// sequence (naxRotationsOrderXYZ gives Rz Ry Rx). An order above 5 changes nothing.
  void SetRotationByEulerAngles(T a1, T a2, T a3, naxRotationsOrder order) {
    using namespace nax::detail;
    const T angle[3] = {ReduceRadians(a1 * DegToRad<T>()), ReduceRadians(a2 * DegToRad<T>()),
                        ReduceRadians(a3 * DegToRad<T>())};
    switch (order) {
      case naxRotationsOrderXYZ: EulerToMatrix<T, 0, 1, 2, false>(angle, a); break;
      case naxRotationsOrderXZY: EulerToMatrix<T, 0, 2, 1, true>(angle, a); break;
      case naxRotationsOrderYXZ: EulerToMatrix<T, 1, 0, 2, true>(angle, a); break;
      case naxRotationsOrderYZX: EulerToMatrix<T, 1, 2, 0, false>(angle, a); break;
      case naxRotationsOrderZYX: EulerToMatrix<T, 2, 1, 0, true>(angle, a); break;
      case naxRotationsOrderZXY: EulerToMatrix<T, 2, 0, 1, false>(angle, a); break;
      default: break;
    }
  }

  /// Angle in degrees (in [-180, 180)) and unit axis of this rotation, through its
  /// quaternion taken from the largest diagonal element, so that it stays accurate near 180
  /// degrees. A rotation closer to the identity than the half-angle sine 1e-6 gives the
  /// angle 0 and the axis (1, 0, 0).
  void ExtractRotationAngleAxis(T& angle, Vector& axis) const {
    const T trace = Trace();
    const T half = T(0.5) * Root(T(3) - trace);  // sine of the half angle
    T w, q[3];
    if (!(trace < T(0))) {
      const T s = Root(trace + T(1));  // 2 cos(angle / 2)
      w = T(0.5) * s;
      q[0] = (a[7] - a[5]) * T(0.5) / s;
      q[1] = (a[2] - a[6]) * T(0.5) / s;
      q[2] = (a[3] - a[1]) * T(0.5) / s;
    } else {
      const int32 i = (a[4] > a[0]) ? (a[8] > a[4] ? 2 : 1) : (a[8] > a[0] ? 2 : 0);
      const int32 j = (i + 1) % 3, k = (i + 2) % 3;
      const T s = Root(a[i * 4] + T(1) - a[j * 4] - a[k * 4]);  // 2 |q_i|
      q[i] = T(0.5) * s;
      q[j] = (a[j * 3 + i] + a[i * 3 + j]) * T(0.5) / s;
      q[k] = (a[k * 3 + i] + a[i * 3 + k]) * T(0.5) / s;
      w = (a[k * 3 + j] - a[j * 3 + k]) * T(0.5) / s;
      if (w < T(0)) w = -w, q[0] = -q[0], q[1] = -q[1], q[2] = -q[2];  // angle in [0, 180]
    }
    if (half < T(1e-6)) {
      angle = T(0);
      axis = Vector(T(1), T(0), T(0));
      return;
    }
    w = w > T(1) ? T(1) : (w < T(-1) ? T(-1) : w);
    angle = nax::detail::ReduceDegrees(T(2) * std::acos(w) * nax::detail::RadToDeg<T>());
    axis = Vector(q[0] / half, q[1] / half, q[2] / half);
  }

  /// Becomes the rotation by angle degrees about axis (normalised on a copy; a failed
  /// normalising is ignored), by the Rodrigues formula.
  void SetRotationByAngleAxis(T angle, const Vector& axis) {
    Vector n = axis;
    n.Normalize();
    const T t = nax::detail::ReduceRadians(angle * nax::detail::DegToRad<T>());
    const T c = std::cos(t), s = std::sin(t), k = T(1) - c;
    a[0] = c + k * n.x * n.x, a[1] = k * n.x * n.y - s * n.z, a[2] = k * n.x * n.z + s * n.y;
    a[3] = k * n.y * n.x + s * n.z, a[4] = c + k * n.y * n.y, a[5] = k * n.y * n.z - s * n.x;
    a[6] = k * n.z * n.x - s * n.y, a[7] = k * n.z * n.y + s * n.x, a[8] = c + k * n.z * n.z;
  }

  /// Completes column (normalised) at position index to a right-handed orthonormal frame
  /// in result. Returns 1, or 0 when column is too short to normalise or below tol.
  int32 ExtractOrthogonal(Vector column, int32 index, T tol, CNaxMatrix3& result) const {
    if (column.Length() < tol || !column.Normalize()) return 0;
    const T fx = std::fabs(column.x), fy = std::fabs(column.y), fz = std::fabs(column.z);
    const Vector e = (fx <= fy && fx <= fz) ? Vector(1, 0, 0) : (fy <= fz ? Vector(0, 1, 0) : Vector(0, 0, 1));
    Vector u = column.Cross(e);
    u.Normalize();
    const Vector v = column.Cross(u);
    result.SetColVector(index, column);
    result.SetColVector((index + 1) % 3, u);
    result.SetColVector((index + 2) % 3, v);
    return 1;
  }

  /// Splits this matrix by PolarDecomposition (right, tol) into rotation and a symmetric
  /// stretch, and the stretch into shear scale shear^T: scale diagonal, shear the rotation
  /// of the scaling axes. So this = rotation shear scale shear^T when right is not 0, and
  /// shear scale shear^T rotation when it is 0. reflected is 1 when the rotation has
  /// determinant -1; status is 1 when the scaling axes are needed (the stretch isn't
  /// diagonal within tol), else 0 with shear the identity. Returns 1, or 0 on failure.
  int32 ExtractScaleRotation(CNaxMatrix3& scale, CNaxMatrix3& rotation, CNaxMatrix3& shear, int32 right, T tol,
                             int32& reflected, int32& status) const {
    reflected = 0;
    status = 0;
    if (!(std::fabs(Det()) > tol)) return 0;
    CNaxMatrix3 stretch;
    rotation.SetToZero();
    if (!PolarDecomposition(rotation, stretch, right, tol) && !rotation.IsOrthogonal(T(1e-3))) return 0;
    reflected = rotation.Det() < T(0);
    if (stretch.IsDiagonal(tol)) {
      scale.SetToZero();
      scale.a[0] = stretch.a[0], scale.a[4] = stretch.a[4], scale.a[8] = stretch.a[8];
      shear.Unit();
      return 1;
    }
    T d[3];
    if (Ops::SymmetricEigensolve(stretch.a, d, shear.a, nax::detail::DefaultTol<T>()) == naxStatusNotSymmetric) return 0;
    if (shear.Det() < T(0)) shear.SetColVector(2, -shear.ColVector(2));
    scale.SetToZero();
    scale.a[0] = d[0], scale.a[4] = d[1], scale.a[8] = d[2];
    status = 1;
    return 1;
  }

  // ---- Transforms of the plane -----------------------------------------------------------------

  /// A rotation of the plane: |a(2,0)|, |a(2,1)| and |a(2,2) - 1| within tol, and the upper
  /// left 2 x 2 block orthogonal with determinant 1 within tol.
  int32 IsRotation(T tol) const {
    if (std::fabs(a[6]) > tol || std::fabs(a[7]) > tol || std::fabs(a[8] - T(1)) > tol) return 0;
    if (!BlockIsOrthogonal(tol)) return 0;
    return std::fabs(a[0] * a[4] - a[1] * a[3] - T(1)) <= tol;
  }
  /// A translation of the plane: the identity apart from a(0,2) and a(1,2), within tol.
  int32 IsTranslation(T tol) const {
    const T t[9] = {a[0], a[1], 0, a[3], a[4], 0, a[6], a[7], a[8]};
    return Ops::IsUnit(t, tol);
  }
  /// A scaling of the plane: diagonal within tol with a(2,2) = 1 within tol.
  int32 IsScaling(T tol) const { return Ops::IsDiagonal(a, tol) && std::fabs(a[8] - T(1)) <= tol; }
  /// A coordinate system of the plane: last row (0, 0, 1) and an orthogonal 2 x 2 block,
  /// within tol.
  int32 IsCoordinateMatrix(T tol) const {
    if (std::fabs(a[6]) > tol || std::fabs(a[7]) > tol || std::fabs(a[8] - T(1)) > tol) return 0;
    return BlockIsOrthogonal(tol);
  }
  /// Inverts a coordinate matrix (tested within 1e-6) by transposing its block and moving the
  /// translation through it. Returns 1, or 0 with result unchanged.
  int32 InverseCoordinateMatrix(CNaxMatrix3& result) const {
    if (!IsCoordinateMatrix(nax::detail::MatrixFloor<T>())) return 0;
    const T tx = a[2], ty = a[5];
    result = CNaxMatrix3(a[0], a[3], -(a[0] * tx + a[3] * ty), a[1], a[4], -(a[1] * tx + a[4] * ty), 0, 0, 1);
    return 1;
  }

  /// Multiplies by the rotation of the plane by angle radians: on the left when left is not
  /// 0, on the right when it is 0.
  void Rotate(T angle, int32 left) {
    const T c = std::cos(angle), s = std::sin(angle);
    if (left) {
      for (int32 j = 0; j < 3; ++j) {
        const T r0 = a[j], r1 = a[3 + j];
        a[j] = c * r0 - s * r1;
        a[3 + j] = s * r0 + c * r1;
      }
    } else {
      for (int32 i = 0; i < 3; ++i) {
        const T c0 = a[i * 3], c1 = a[i * 3 + 1];
        a[i * 3] = c * c0 + s * c1;
        a[i * 3 + 1] = -s * c0 + c * c1;
      }
    }
  }
  /// Multiplies by the scaling (sx, sy) of the plane: rows 0 and 1 when left is not 0,
  /// columns 0 and 1 when it is 0.
  void Scale(T sx, T sy, int32 left) {
    if (left) {
      for (int32 j = 0; j < 3; ++j) a[j] *= sx, a[3 + j] *= sy;
    } else {
      for (int32 i = 0; i < 3; ++i) a[i * 3] *= sx, a[i * 3 + 1] *= sy;
    }
  }
  /// With left not 0, multiplies by the translation (dx, dy) on the left. With left 0 it
  /// deliberately departs from the product: a(0,2) grows by a(0,0) dx + a(0,1) dy + a(2,2)
  /// and a(1,2) by a(1,0) dx + a(1,1) dy + a(2,2), so each component gains a(2,2).
  void Translate(T dx, T dy, int32 left) {
    if (left) {
      for (int32 j = 0; j < 3; ++j) a[j] += dx * a[6 + j], a[3 + j] += dy * a[6 + j];
    } else {
      const T a22 = a[8];
      a[2] += a[0] * dx + a[1] * dy + a22;
      a[5] += a[3] * dx + a[4] * dy + a22;
    }
  }
  /// This transform followed by the reflection of the plane through the origin: rows 0 and
  /// 1 change sign.
  CNaxMatrix3 Reflect() const {
    return CNaxMatrix3(-a[0], -a[1], -a[2], -a[3], -a[4], -a[5], a[6], a[7], a[8]);
  }

  // ---- Conversions -----------------------------------------------------------------------------

  /// A heap copy as a run-time sized square matrix.
  CNaxMatrixN<T> ConvertToMatrixN() const;
  /// A heap copy as a run-time sized rectangular matrix.
  CNaxMatrixMN<T> ConvertToMatrixMN() const;

 private:
  static T Root(T x) { return std::fabs(x) < nax::detail::DefaultTol<T>() ? T(0) : std::sqrt(x); }

  int32 BlockIsOrthogonal(T tol) const {
    const T p00 = a[0] * a[0] + a[1] * a[1], p01 = a[0] * a[3] + a[1] * a[4], p11 = a[3] * a[3] + a[4] * a[4];
    return std::fabs(p00 - T(1)) <= tol && std::fabs(p01) <= tol && std::fabs(p11 - T(1)) <= tol;
  }

  void ComplexRow(int32 r, T re, T im, CNaxComplex<T>* row) const {
    for (int32 c = 0; c < 3; ++c) row[c].Set(r == c ? a[r * 3 + c] - re : a[r * 3 + c], r == c ? -im : T(0));
  }

  // The null vector of two independent rows through their 2 x 2 minors: the component
  // outside the columns of the largest minor (m01 wins ties, then m02) is -1.
  static Vector NullVector(const Vector& x, const Vector& y) {
    const Vector c = x.Cross(y);  // (m12, -m02, m01)
    const T m01 = std::fabs(c.z), m02 = std::fabs(c.y), m12 = std::fabs(c.x);
    const int32 p = (m01 >= m02 && m01 >= m12) ? 2 : (m02 >= m12 ? 1 : 0);
    return c * (T(-1) / c[p]);
  }

  T a[9];
};

extern template class CNaxMatrix3<float>;
extern template class CNaxMatrix3<double>;

#endif  // NAX_MATRIX3_H
