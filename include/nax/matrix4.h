// The 4 x 4 matrix, held inline and row-major, with no virtual table and no heap: the
// homogeneous transform of space, with a closed-form inverse, the decompositions of the
// square matrices, and elementary rotations, scalings and translations. Angles in radians.
#ifndef NAX_MATRIX4_H
#define NAX_MATRIX4_H

#include <cmath>

#include "nax/detail/fixed_common.h"
#include "nax/detail/fixed_linalg.h"
#include "nax/detail/fixed_ops.h"
#include "nax/vector3.h"
#include "nax/vector4.h"

template <typename T>
class CNaxMatrixN;
template <typename T>
class CNaxMatrixMN;

/// A 4 x 4 matrix of float or double, row-major.
template <typename T>
class CNaxMatrix4 {
  static_assert(nax::detail::kIsReal<T>, "CNaxMatrix4 is instantiated for float and double only");
  using Ops = nax::detail::Fixed<T, 4>;
  using Vector = CNaxVector4<T>;

 public:
  /// Zeros.
  CNaxMatrix4() : a{} {}
  /// Sixteen elements in row-major order.
  explicit CNaxMatrix4(const T* source) { Fill(source); }
  /// The elements row by row.
  CNaxMatrix4(T a00, T a01, T a02, T a03, T a10, T a11, T a12, T a13, T a20, T a21, T a22, T a23, T a30, T a31,
              T a32, T a33)
      : a{a00, a01, a02, a03, a10, a11, a12, a13, a20, a21, a22, a23, a30, a31, a32, a33} {}
  CNaxMatrix4(const CNaxMatrix4&) = default;
  CNaxMatrix4& operator=(const CNaxMatrix4&) = default;

  // ---- Accessors -----------------------------------------------------------------------------

  int32 RowsNb() const { return 4; }
  int32 ColsNb() const { return 4; }
  int32 Size() const { return 4; }
  /// Element (row, col), not range-tested.
  T& operator()(int32 row, int32 col) { return a[row * 4 + col]; }
  const T& operator()(int32 row, int32 col) const { return a[row * 4 + col]; }
  /// Element i of the row-major array.
  T& operator[](int32 i) { return a[i]; }
  const T& operator[](int32 i) const { return a[i]; }
  T* Data() { return a; }
  const T* Data() const { return a; }

  void SetElement(int32 row, int32 col, T value) { a[row * 4 + col] = value; }
  void AddToElement(int32 row, int32 col, T value) { a[row * 4 + col] += value; }
  void MulElement(int32 row, int32 col, T value) { a[row * 4 + col] *= value; }
  void SetRow(int32 row, const T* source) { nax::detail::SetRow<4>(a, row, source); }
  void SetColumn(int32 col, const T* source) { nax::detail::SetColumn<4>(a, col, source); }
  void Row(int32 row, T* target) const { nax::detail::GetRow<4>(a, row, target); }
  void Column(int32 col, T* target) const { nax::detail::GetColumn<4>(a, col, target); }
  void SetRowVector(int32 row, const Vector& v) { a[row * 4] = v.x, a[row * 4 + 1] = v.y, a[row * 4 + 2] = v.z, a[row * 4 + 3] = v.w; }
  void SetColVector(int32 col, const Vector& v) { a[col] = v.x, a[4 + col] = v.y, a[8 + col] = v.z, a[12 + col] = v.w; }
  Vector RowVector(int32 row) const { return Vector(a + row * 4); }
  Vector ColVector(int32 col) const { return Vector(a[col], a[4 + col], a[8 + col], a[12 + col]); }
  /// The fourth row and the fourth column.
  Vector LastRow() const { return RowVector(3); }
  Vector LastColumn() const { return ColVector(3); }
  Vector Diagonal() const { return Vector(a[0], a[5], a[10], a[15]); }
  /// The first three diagonal elements.
  CNaxVector3<T> Diagonal3() const { return CNaxVector3<T>(a[0], a[5], a[10]); }
  /// The translation part of the homogeneous matrix: the first three elements of column 3.
  CNaxVector3<T> ExtractTranslation() const { return CNaxVector3<T>(a[3], a[7], a[11]); }

  void Fill(const T* source) { nax::detail::CopyArray<16>(source, a); }
  void Dump(T* target) const { nax::detail::CopyArray<16>(a, target); }
  void SetToZero() { SetConstant(T(0)); }
  void SetConstant(T value) { nax::detail::SetArray<16>(a, value); }
  /// Zeros with value on the diagonal.
  void SetDiagonal(T value) { nax::detail::SetDiagonal<4>(a, value); }
  /// The identity.
  void Unit() { SetDiagonal(T(1)); }
  T Trace() const { return nax::detail::Trace<4>(a); }

  // ---- Element-wise arithmetic and products --------------------------------------------------

  void Add(const CNaxMatrix4& m) { nax::detail::AddArray<16>(a, m.a); }
  void Sub(const CNaxMatrix4& m) { nax::detail::SubArray<16>(a, m.a); }
  void Mul(T value) { nax::detail::MulArray<16>(a, value); }
  /// Divides by value, unguarded.
  void Div(T value) { nax::detail::DivArray<16>(a, value); }
  CNaxMatrix4& operator+=(const CNaxMatrix4& m) { return Add(m), *this; }
  CNaxMatrix4& operator-=(const CNaxMatrix4& m) { return Sub(m), *this; }
  CNaxMatrix4& operator*=(T value) { return Mul(value), *this; }
  CNaxMatrix4& operator/=(T value) { return Div(value), *this; }
  CNaxMatrix4 operator+(const CNaxMatrix4& m) const { return CNaxMatrix4(*this) += m; }
  CNaxMatrix4 operator-(const CNaxMatrix4& m) const { return CNaxMatrix4(*this) -= m; }
  CNaxMatrix4 operator*(T value) const { return CNaxMatrix4(*this) *= value; }
  CNaxMatrix4 operator/(T value) const { return CNaxMatrix4(*this) /= value; }
  /// Matrix product.
  CNaxMatrix4 operator*(const CNaxMatrix4& m) const {
    T out[16];  // a local array: the result may alias an operand
    Ops::Product(a, m.a, out);
    return CNaxMatrix4(out);
  }
  /// Product with a column vector.
  Vector operator*(const Vector& v) const {
    const T in[4] = {v.x, v.y, v.z, v.w};
    T out[4];
    nax::detail::ProductVector<4>(a, in, out);
    return Vector(out);
  }
  /// this = this * m.
  CNaxMatrix4& operator*=(const CNaxMatrix4& m) { return *this = *this * m; }
  /// this = m * this.
  CNaxMatrix4& PreMultiply(const CNaxMatrix4& m) { return *this = m * *this; }
  /// this = this * m.
  CNaxMatrix4& PostMultiply(const CNaxMatrix4& m) { return *this = *this * m; }
  CNaxMatrix4 Transpose() const {
    CNaxMatrix4 r;
    Ops::Transpose(a, r.a);
    return r;
  }
  /// A new matrix of the negated elements; this one stays as it is.
  CNaxMatrix4 Negate() const { return *this * T(-1); }
  CNaxMatrix4 operator-() const { return Negate(); }

  /// 1 when no element differs by more than the default tolerance.
  int32 operator==(const CNaxMatrix4& m) const {
    return nax::detail::ArraysAlmostEqual(16, a, m.a, nax::detail::DefaultTol<T>());
  }
  int32 operator!=(const CNaxMatrix4& m) const { return !(*this == m); }

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
  /// Sylvester's criterion on the leading minors (symmetry is not tested).
  int32 IsPositive(T tol) const {
    if (tol > a[0] || tol > a[0] * a[5] - a[1] * a[4]) return 0;
    const T m3 = a[0] * (a[5] * a[10] - a[6] * a[9]) - a[1] * (a[4] * a[10] - a[6] * a[8]) +
                 a[2] * (a[4] * a[9] - a[5] * a[8]);
    return !(tol > m3 || Det() < tol);
  }
  T Mean() const { return Ops::Mean(a); }
  T InnerProduct(const CNaxMatrix4& m) const { return Ops::InnerProduct(a, m.a); }
  T CorrelationCoefficient(const CNaxMatrix4& m) const { return Ops::Correlation(a, m.a); }

  // ---- Determinant, rank, norms, inverses ----------------------------------------------------

  /// Determinant by the 2 x 2 minors of the upper and the lower pair of rows.
  T Det() const {
    T s[6], c[6];
    Minors(s, c);
    return s[0] * c[5] - s[1] * c[4] + s[2] * c[3] + s[3] * c[2] - s[4] * c[1] + s[5] * c[0];
  }
  /// 4 if |det| >= tol, 3 if any |a| > tol, else 0: deliberately coarse, so a singular
  /// matrix with a non-zero element is of rank 3 whatever its true rank.
  int32 CalculateRank(T tol) const {
    if (std::fabs(Det()) >= tol) return 4;
    return Ops::IsAlmostZero(a, tol) ? 0 : 3;
  }

  /// The norm of the given kind; the max-element form multiplies by 4, the root of 16; the
  /// Frobenius form is 0 below the floor 1e-6 of its sum of squares; -1 if the decomposition
  /// of the spectral form fails.
  T Norm(naxMatrixNorm norm) const { return nax::detail::FixedNorm<4>(a, norm, T(4)); }
  /// Condition number in the given norm; 3.4028234663852886e38 for a singular matrix.
  T ConditionNumber(naxMatrixNorm norm) const { return nax::detail::FixedConditionNumber<4>(*this, a, norm); }

  /// Inverse by the adjugate: 0, or 3 with result unchanged when tol > |det|.
  int32 Inverse(CNaxMatrix4& result, T tol) const {
    T s[6], c[6];
    Minors(s, c);
    const T det = s[0] * c[5] - s[1] * c[4] + s[2] * c[3] + s[3] * c[2] - s[4] * c[1] + s[5] * c[0];
    if (tol > std::fabs(det)) return 3;
    const T f = T(1) / det;
    T r[16];  // a local array: result may alias this
    r[0] = (a[5] * c[5] - a[6] * c[4] + a[7] * c[3]) * f;
    r[1] = (-a[1] * c[5] + a[2] * c[4] - a[3] * c[3]) * f;
    r[2] = (a[13] * s[5] - a[14] * s[4] + a[15] * s[3]) * f;
    r[3] = (-a[9] * s[5] + a[10] * s[4] - a[11] * s[3]) * f;
    r[4] = (-a[4] * c[5] + a[6] * c[2] - a[7] * c[1]) * f;
    r[5] = (a[0] * c[5] - a[2] * c[2] + a[3] * c[1]) * f;
    r[6] = (-a[12] * s[5] + a[14] * s[2] - a[15] * s[1]) * f;
    r[7] = (a[8] * s[5] - a[10] * s[2] + a[11] * s[1]) * f;
    r[8] = (a[4] * c[4] - a[5] * c[2] + a[7] * c[0]) * f;
    r[9] = (-a[0] * c[4] + a[1] * c[2] - a[3] * c[0]) * f;
    r[10] = (a[12] * s[4] - a[13] * s[2] + a[15] * s[0]) * f;
    r[11] = (-a[8] * s[4] + a[9] * s[2] - a[11] * s[0]) * f;
    r[12] = (-a[4] * c[3] + a[5] * c[1] - a[6] * c[0]) * f;
    r[13] = (a[0] * c[3] - a[1] * c[1] + a[2] * c[0]) * f;
    r[14] = (-a[12] * s[3] + a[13] * s[1] - a[14] * s[0]) * f;
    r[15] = (a[8] * s[3] - a[9] * s[1] + a[10] * s[0]) * f;
    result.Fill(r);
    return 0;
  }
  /// Inverse with the condition number Norm(norm) of this times Norm(norm) of the inverse;
  /// on 3 the condition is 3.4028234663852886e38 and result is unchanged.
  int32 Inverse(CNaxMatrix4& result, naxMatrixNorm norm, T tol, T& condition) const {
    return nax::detail::InverseWithCondition(*this, result, norm, tol, condition);
  }
  /// Inverse of a diagonal matrix: 1, or 0 on refusal.
  int32 DiagInverse(CNaxMatrix4& result, T tol) const { return Ops::DiagInverse(a, result.a, tol); }
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
  int32 LU_Decomposition(CNaxMatrix4& lower, CNaxMatrix4& upper, T tol) const { return Ops::LU(a, lower.a, upper.a, tol); }
  /// Householder QR, this = q r. Returns 0.
  int32 QR_Decomposition(CNaxMatrix4& q, CNaxMatrix4& r, T tol) const { return Ops::QR(a, q.a, r.a, tol); }
  /// this = u diag(w) v^T with w non-negative and descending; 0, or 1 without convergence.
  int32 SV_Decomposition(CNaxMatrix4& u, CNaxMatrix4& v, Vector& w, T /*tol*/) const {
    T values[4];
    const int32 status = Ops::SVD(a, u.a, values, v.a);
    w = Vector(values);
    return status;
  }
  /// The singular values alone, in descending order.
  void CalculateSingularNumbers(Vector& values) const {
    T u[16], w[4], v[16];
    Ops::SVD(a, u, w, v);
    values = Vector(w);
  }
  /// this = rotation stretch (right not 0) or stretch rotation (right 0) by the Newton
  /// iteration of the square matrices, at most 4 rounds (the size). Returns 1, or 0 with
  /// nothing written when |det| <= tol or an inverse fails.
  int32 PolarDecomposition(CNaxMatrix4& rotation, CNaxMatrix4& stretch, int32 right, T tol) const {
    return nax::detail::PolarNewton(*this, rotation, stretch, right, tol, 4, false);
  }
  /// this = vectors values vectors^T for a positive matrix (Jacobi, 50 rotations at most).
  int32 SpectralDecomposition(CNaxMatrix4& vectors, CNaxMatrix4& values, int32 sorted, T tol) const {
    if (!IsPositive(tol)) return 0;
    T work[16], d[4];
    Dump(work);
    int32 rotations;
    Ops::Jacobi(work, d, vectors.a, 50, rotations, tol);
    if (rotations == 50) return 0;
    if (sorted) Ops::SortAscending(d, vectors.a);
    values.SetToZero();
    values.a[0] = d[0], values.a[5] = d[1], values.a[10] = d[2], values.a[15] = d[3];
    return 1;
  }
  /// Eigenvalues of a symmetric matrix in ascending order, their vectors in the columns:
  /// the Jacobi method with 50 sweeps; naxStatusTooManyRotations when exactly 50 rotations
  /// were made, naxStatusNotSymmetric when mirrored elements differ by more than tol.
  naxStatus SymmetricEigensolve(Vector& values, CNaxMatrix4& vectors, T tol) const {
    T d[4] = {};
    const naxStatus status = Ops::SymmetricEigensolve(a, d, vectors.a, tol);
    values = Vector(d);
    return status;
  }
  /// This matrix with value subtracted from the diagonal.
  CNaxMatrix4 GetCharacteristicsMatrix(T value) const {
    CNaxMatrix4 m(*this);
    m.a[0] -= value, m.a[5] -= value, m.a[10] -= value, m.a[15] -= value;
    return m;
  }

  // ---- Transforms of space -------------------------------------------------------------------

  /// A rotation of space: last row (0, 0, 0, 1) and the upper left 3 x 3 block orthogonal
  /// with determinant 1, within tol.
  int32 IsRotation(T tol) const {
    if (!LastRowIsUnit(tol) || !BlockIsOrthogonal(tol)) return 0;
    return std::fabs(Block().Det() - T(1)) <= tol;
  }
  /// A translation: the identity apart from column 3, within tol.
  int32 IsTranslation(T tol) const {
    T t[16];
    Dump(t);
    t[3] = t[7] = t[11] = T(0);
    return Ops::IsUnit(t, tol);
  }
  /// A scaling: diagonal within tol with a(3,3) = 1 within tol.
  int32 IsScaling(T tol) const { return Ops::IsDiagonal(a, tol) && std::fabs(a[15] - T(1)) <= tol; }
  /// A coordinate system: last row (0, 0, 0, 1) and an orthogonal 3 x 3 block, within tol.
  int32 IsCoordinateMatrix(T tol) const { return LastRowIsUnit(tol) && BlockIsOrthogonal(tol); }
  /// Inverts a coordinate matrix (tested within 1e-6) by transposing its block and moving the
  /// translation through it. Returns 1, or 0 with result unchanged.
  int32 InverseCoordinateMatrix(CNaxMatrix4& result) const {
    if (!IsCoordinateMatrix(nax::detail::MatrixFloor<T>())) return 0;
    const T tx = a[3], ty = a[7], tz = a[11];
    result = CNaxMatrix4(a[0], a[4], a[8], -(a[0] * tx + a[4] * ty + a[8] * tz), a[1], a[5], a[9],
                         -(a[1] * tx + a[5] * ty + a[9] * tz), a[2], a[6], a[10], -(a[2] * tx + a[6] * ty + a[10] * tz),
                         0, 0, 0, 1);
    return 1;
  }

  /// Multiplies by the rotation about X by angle radians: on the left when left is not 0
  /// (rows 1 and 2 change), on the right when it is 0 (columns 1 and 2).
  void RotateXAxis(T angle, int32 left) { Turn(angle, left, 1, 2); }
  /// Multiplies by the rotation about Y (rows or columns 2 and 0).
  void RotateYAxis(T angle, int32 left) { Turn(angle, left, 2, 0); }
  /// Multiplies by the rotation about Z (rows or columns 0 and 1).
  void RotateZAxis(T angle, int32 left) { Turn(angle, left, 0, 1); }
  /// Multiplies by the scaling (sx, sy, sz): rows 0 to 2 when left is not 0, columns 0 to 2
  /// when it is 0.
  void Scale(T sx, T sy, T sz, int32 left) {
    if (left) {
      for (int32 j = 0; j < 4; ++j) a[j] *= sx, a[4 + j] *= sy, a[8 + j] *= sz;
    } else {
      for (int32 i = 0; i < 4; ++i) a[i * 4] *= sx, a[i * 4 + 1] *= sy, a[i * 4 + 2] *= sz;
    }
  }
  /// With left not 0, multiplies by the translation (dx, dy, dz) on the left. With left 0 it
  /// deliberately departs from the product: element (r, 3) of rows 0 to 2 grows by
  /// a(r,0) dx + a(r,1) dy + a(r,2) dz + a(3,3), and a(3,3) becomes
  /// a(3,0) dx + a(3,1) dy + a(3,2) dz + 2 a(3,3), the old a(3,3) being read once.
  void Translate(T dx, T dy, T dz, int32 left) {
    if (left) {
      for (int32 j = 0; j < 4; ++j) a[j] += dx * a[12 + j], a[4 + j] += dy * a[12 + j], a[8 + j] += dz * a[12 + j];
    } else {
      const T a33 = a[15];
      for (int32 r = 0; r < 4; ++r) {
        const T grow = a[r * 4] * dx + a[r * 4 + 1] * dy + a[r * 4 + 2] * dz + a33;
        a[r * 4 + 3] += grow;
      }
    }
  }

  // ---- Conversions -----------------------------------------------------------------------------

  /// A heap copy as a run-time sized square matrix.
  CNaxMatrixN<T> ConvertToMatrixN() const;
  /// A heap copy as a run-time sized rectangular matrix.
  CNaxMatrixMN<T> ConvertToMatrixMN() const;

 private:
  // The six 2 x 2 minors of rows 0, 1 (s) and of rows 2, 3 (c), over the column pairs
  // (0,1), (0,2), (0,3), (1,2), (1,3), (2,3).
  void Minors(T* s, T* c) const {
    s[0] = a[0] * a[5] - a[4] * a[1];
    s[1] = a[0] * a[6] - a[4] * a[2];
    s[2] = a[0] * a[7] - a[4] * a[3];
    s[3] = a[1] * a[6] - a[5] * a[2];
    s[4] = a[1] * a[7] - a[5] * a[3];
    s[5] = a[2] * a[7] - a[6] * a[3];
    c[0] = a[8] * a[13] - a[12] * a[9];
    c[1] = a[8] * a[14] - a[12] * a[10];
    c[2] = a[8] * a[15] - a[12] * a[11];
    c[3] = a[9] * a[14] - a[13] * a[10];
    c[4] = a[9] * a[15] - a[13] * a[11];
    c[5] = a[10] * a[15] - a[14] * a[11];
  }

  // Left: rows p, q become c p - s q and s p + c q. Right: the product with the same
  // rotation on the right, on columns p and q.
  void Turn(T angle, int32 left, int32 p, int32 q) {
    const T c = std::cos(angle), s = std::sin(angle);
    if (left) {
      for (int32 j = 0; j < 4; ++j) {
        const T rp = a[p * 4 + j], rq = a[q * 4 + j];
        a[p * 4 + j] = c * rp - s * rq;
        a[q * 4 + j] = s * rp + c * rq;
      }
    } else {
      for (int32 i = 0; i < 4; ++i) {
        const T cp = a[i * 4 + p], cq = a[i * 4 + q];
        a[i * 4 + p] = c * cp + s * cq;
        a[i * 4 + q] = -s * cp + c * cq;
      }
    }
  }

  int32 LastRowIsUnit(T tol) const {
    return std::fabs(a[12]) <= tol && std::fabs(a[13]) <= tol && std::fabs(a[14]) <= tol &&
           std::fabs(a[15] - T(1)) <= tol;
  }
  struct Block3 {
    T m[9];
    T Det() const {
      return m[0] * (m[4] * m[8] - m[5] * m[7]) - m[1] * (m[3] * m[8] - m[5] * m[6]) + m[2] * (m[3] * m[7] - m[4] * m[6]);
    }
  };
  Block3 Block() const { return Block3{{a[0], a[1], a[2], a[4], a[5], a[6], a[8], a[9], a[10]}}; }
  int32 BlockIsOrthogonal(T tol) const { return nax::detail::Fixed<T, 3>::IsOrthogonal(Block().m, tol); }

  T a[16];
};

extern template class CNaxMatrix4<float>;
extern template class CNaxMatrix4<double>;

#endif  // NAX_MATRIX4_H
