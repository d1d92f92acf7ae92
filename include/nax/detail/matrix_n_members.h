// Member bodies of CNaxMatrixN. Included by nax/matrix_n.h.
//
// The symmetric eigenproblem is the cyclic Jacobi method with threshold of H. Rutishauser,
// "The Jacobi method for real symmetric matrices", Numer. Math. 9 (1966); the polar
// decomposition is Newton's iteration of N. J. Higham, "Computing the polar decomposition
// with applications", SIAM J. Sci. Stat. Comput. 7 (1986).
#ifndef NAX_DETAIL_MATRIX_N_MEMBERS_H
#define NAX_DETAIL_MATRIX_N_MEMBERS_H

#include <vector>

namespace nax::detail {

/// Root of x for the Jacobi rotation: 0 when |x| is below 1e-7f / 1e-9.
template <typename T>
inline T JacobiRoot(T x) {
  return std::fabs(x) < DefaultTol<T>() ? T(0) : std::sqrt(x);
}

/// One Jacobi rotation step on a pair of elements: x, y <- x - s (y + x tau), y + s (x - y tau).
template <typename T>
inline void JacobiPair(T& x, T& y, T s, T tau) {
  const T g = x, h = y;
  x = g - s * (h + g * tau);
  y = h + s * (g - h * tau);
}

/// a + b == a after both are rounded to float, in either instantiation.
template <typename T>
inline bool FloatAbsorbs(T a, T b) {
  return static_cast<float>(a + b) == static_cast<float>(a);
}

}  // namespace nax::detail

template <typename T>
T CNaxMatrixN<T>::Det() {
  if (this->singCalculated && this->singularNumbers) {
    // The product of singular values: the sign of the determinant is lost.
    T product = T(1);
    for (int32 i = 0; i < size; ++i) product *= this->singularNumbers[i];
    return product;
  }
  CNaxMatrixN lower(size), upper(size);
  if (LU_Decomposition(lower, upper, T(1e-6))) return upper.DetForTriangular();
  // Product of the diagonal of R alone, without the determinant of Q.
  CNaxMatrixMN<T> q(size), r(size);
  this->QR_Decomposition(q, r, nax::detail::DefaultTol<T>());
  T product = T(1);
  for (int32 i = 0; i < size; ++i) product *= r(i, i);
  return product;
}

template <typename T>
T CNaxMatrixN<T>::DetForTriangular() const {
  T product = T(1);
  for (int32 i = 0; i < size; ++i) product *= data[i * size + i];
  return product;
}

template <typename T>
int32 CNaxMatrixN<T>::IsSymmetric(T tol) const {
  for (int32 i = 0; i < size; ++i)
    for (int32 j = i + 1; j < size; ++j)
      if (std::fabs(data[i * size + j] - data[j * size + i]) > tol) return 0;
  return 1;
}

template <typename T>
int32 CNaxMatrixN<T>::IsUnit(T tol) const {
  for (int32 i = 0; i < size; ++i)
    for (int32 j = 0; j < size; ++j)
      if (std::fabs(data[i * size + j] - (i == j ? T(1) : T(0))) > tol) return 0;
  return 1;
}

template <typename T>
int32 CNaxMatrixN<T>::IsOrthogonal(T tol) const {
  const CNaxMatrixN t(this->Transpose());
  CNaxMatrixN product(size);
  for (int32 pass = 0; pass < 2; ++pass) {
    if (pass == 0)
      nax::detail::MultiplyRaw(data, t.data, product.data, size, size, size);
    else
      nax::detail::MultiplyRaw(t.data, data, product.data, size, size, size);
    if (!product.IsUnit(tol)) return 0;
  }
  return 1;
}

template <typename T>
int32 CNaxMatrixN<T>::IsPositive(T tol) {
  if (size < 1) return 1;
  if (data[0] < tol) return 0;
  for (int32 k = 2; k < size; ++k) {
    CNaxMatrixN block(this->ExtractLeftCornerMatrix(k, k));
    if (block.Det() < tol) return 0;
  }
  return size < 2 || !(Det() < tol);
}

template <typename T>
void CNaxMatrixN<T>::GetDiagElements(T* target) const {
  for (int32 i = 0; i < size; ++i) target[i] = data[i * size + i];
}

template <typename T>
CNaxMatrixN<T> CNaxMatrixN<T>::GetCharacteristicsMatrix(T value) const {
  CNaxMatrixN result(static_cast<const Base&>(*this));
  for (int32 i = 0; i < size; ++i) result.data[i * size + i] -= value;
  return result;
}

template <typename T>
CNaxMatrixN<T>& CNaxMatrixN<T>::PreMultiply(const CNaxMatrixN& other) {
  CNaxMatrixN product(size);
  nax::detail::MultiplyRaw(other.data, data, product.data, size, size, size);
  Base::operator=(product);
  return *this;
}

template <typename T>
CNaxMatrixN<T>& CNaxMatrixN<T>::PostMultiply(const CNaxMatrixN& other) {
  CNaxMatrixN product(size);
  nax::detail::MultiplyRaw(data, other.data, product.data, size, size, size);
  Base::operator=(product);
  return *this;
}

template <typename T>
CNaxMatrixN<T> CNaxMatrixN<T>::operator^(int32 power) const {
  CNaxMatrixN result(size);
  result.Unit();
  if (power < 1) return result;
  result.Base::operator=(*this);
  CNaxMatrixN product(size);
  for (int32 p = 1; p < power; ++p) {
    nax::detail::MultiplyRaw(result.data, data, product.data, size, size, size);
    std::swap(result.data, product.data);
  }
  return result;
}

template <typename T>
int32 CNaxMatrixN<T>::LU_Decomposition(CNaxMatrixN& lower, CNaxMatrixN& upper, T tol) const {
  const int32 n = size;
  lower.SetToZero();
  upper.SetToZero();
  if (n < 1) return 1;
  const T* a = data;
  T* L = lower.data;
  T* U = upper.data;
  if (std::fabs(a[0]) < tol) return 0;
  L[0] = T(1);
  U[0] = a[0];
  for (int32 j = 1; j < n; ++j) {
    L[j * n + j] = T(1);
    U[j] = a[j];
    L[j * n] = a[j * n] / a[0];
  }
  // Sums run over m in increasing order; the rows of U and L are walked contiguously, and
  // column k of U is gathered once per step.
  std::vector<T> sums(n), columnK(n);
  for (int32 k = 1; k < n; ++k) {
    for (int32 m = 0; m < k; ++m) columnK[m] = U[m * n + k];
    T s = T(0);
    for (int32 m = 0; m < k; ++m) s += L[k * n + m] * columnK[m];
    const T pivot = a[k * n + k] - s;
    U[k * n + k] = pivot;
    if (std::fabs(pivot) < tol) return 0;
    std::fill(sums.begin() + k + 1, sums.end(), T(0));
    for (int32 m = 0; m < k; ++m) {
      const T lkm = L[k * n + m];
      const T* um = U + m * n;
      for (int32 j = k + 1; j < n; ++j) sums[j] += lkm * um[j];
    }
    for (int32 j = k + 1; j < n; ++j) U[k * n + j] = a[k * n + j] - sums[j];
    for (int32 j = k + 1; j < n; ++j) {
      T t = T(0);
      const T* lj = L + j * n;
      for (int32 m = 0; m < k; ++m) t += lj[m] * columnK[m];
      L[j * n + k] = (a[j * n + k] - t) / pivot;
    }
  }
  return 1;
}

template <typename T>
int32 CNaxMatrixN<T>::LowLeftInverse(CNaxMatrixN& result, T tol) {
  const int32 n = size;
  for (int32 i = 0; i < n; ++i)
    for (int32 j = i + 1; j < n; ++j)
      if (std::fabs(data[i * n + j]) > T(1e-6)) return 0;
  if (tol > std::fabs(DetForTriangular())) return 0;
  result.SetToZero();
  T* X = result.data;
  std::vector<T> sums(std::max(n, 1));
  // Row i: X(i, j) = -(sum over m = j..i-1 of a(i, m) X(m, j)) / a(i, i), summed in m order.
  for (int32 i = 0; i < n; ++i) {
    const T aii = data[i * n + i];
    X[i * n + i] = T(1) / aii;
    std::fill(sums.begin(), sums.begin() + i, T(0));
    for (int32 m = 0; m < i; ++m) {
      const T aim = data[i * n + m];
      const T* xm = X + m * n;
      for (int32 j = 0; j <= m; ++j) sums[j] += aim * xm[j];
    }
    for (int32 j = 0; j < i; ++j) X[i * n + j] = -sums[j] / aii;
  }
  return 1;
}

template <typename T>
int32 CNaxMatrixN<T>::UpperRightInverse(CNaxMatrixN& result, T tol) {
  const int32 n = size;
  for (int32 i = 1; i < n; ++i)
    for (int32 j = 0; j < i; ++j)
      if (std::fabs(data[i * n + j]) > T(1e-6)) return 0;
  if (tol > std::fabs(DetForTriangular())) return 0;
  result.SetToZero();
  T* X = result.data;
  std::vector<T> sums(std::max(n, 1));
  // Row i from the bottom: X(i, j) = -(sum over m = i+1..j of a(i, m) X(m, j)) / a(i, i).
  for (int32 i = n - 1; i >= 0; --i) {
    const T aii = data[i * n + i];
    X[i * n + i] = T(1) / aii;
    std::fill(sums.begin() + i + 1, sums.end(), T(0));
    for (int32 m = i + 1; m < n; ++m) {
      const T aim = data[i * n + m];
      const T* xm = X + m * n;
      for (int32 j = m; j < n; ++j) sums[j] += aim * xm[j];
    }
    for (int32 j = i + 1; j < n; ++j) X[i * n + j] = -sums[j] / aii;
  }
  return 1;
}

template <typename T>
int32 CNaxMatrixN<T>::DiagInverse(CNaxMatrixN& result, T tol) {
  if (!this->IsDiagonal(tol)) return 0;
  if (tol > std::fabs(DetForTriangular())) return 0;
  result.SetToZero();
  for (int32 i = 0; i < size; ++i) result.data[i * size + i] = T(1) / data[i * size + i];
  return 1;
}

template <typename T>
int32 CNaxMatrixN<T>::InverseByLU(CNaxMatrixN& result, T tol, T detFloor, int32 singularStatus,
                                  bool& luFailed) {
  CNaxMatrixN lower(size), upper(size);
  luFailed = !LU_Decomposition(lower, upper, tol);
  if (luFailed) return 1;
  if (detFloor > std::fabs(upper.DetForTriangular())) return singularStatus;
  CNaxMatrixN lowerInverse(size), upperInverse(size);
  if (!lower.LowLeftInverse(lowerInverse, tol)) return 1;
  if (!upper.UpperRightInverse(upperInverse, tol)) return 1;
  nax::detail::MultiplyRaw(upperInverse.data, lowerInverse.data, result.data, size, size, size);
  return 0;
}

template <typename T>
int32 CNaxMatrixN<T>::Inverse(CNaxMatrixN& result, T tol) {
  if (size < 2) return 1;
  // Sizes 2 to 4: the closed forms of CNaxMatrix2, CNaxMatrix3 and CNaxMatrix4.
  if (size <= 4) return nax::detail::FixedInverse(size, data, result.data, tol);
  bool luFailed = false;
  const int32 status = InverseByLU(result, tol, tol, 3, luFailed);
  if (luFailed) return MN::Inverse(result, tol);
  return status;
}

template <typename T>
int32 CNaxMatrixN<T>::Inverse(CNaxMatrixN& result, naxMatrixNorm norm, T tol, T& condition) {
  if (size < 2) return 1;
  if (size <= 4) return nax::detail::FixedInverse(size, data, result.data, norm, tol, condition);
  bool luFailed = false;
  const int32 status = InverseByLU(result, tol, T(1e-6), 1, luFailed);
  if (luFailed) return MN::Inverse(result, norm, tol, condition);
  if (status != 0) {
    condition = nax::detail::PseudoInfinity<T>();
    return status;
  }
  condition = this->Norm(norm) * result.Norm(norm);
  return 0;
}

template <typename T>
int32 CNaxMatrixN<T>::SolveSystem(const CNaxVectorN<T>& rhs, CNaxVectorN<T>& solution, T tol) {
  CNaxMatrixN inverse(size);
  const int32 status = Inverse(inverse, tol);
  if (status != 0) return status;
  const CNaxVectorN<T> product(inverse * rhs);
  solution = product;
  return 0;
}

template <typename T>
int32 CNaxMatrixN<T>::SolveSystem(const CNaxVectorN<T>& rhs, CNaxVectorN<T>& solution,
                                  naxMatrixNorm norm, T tol, T& condition) {
  CNaxMatrixN inverse(size);
  const int32 status = Inverse(inverse, norm, tol, condition);
  if (status != 0) return status;
  const CNaxVectorN<T> product(inverse * rhs);
  solution = product;
  return 0;
}

template <typename T>
T CNaxMatrixN<T>::ConditionNumber(naxMatrixNorm norm) {
  const T infinity = nax::detail::PseudoInfinity<T>();
  if (norm == naxMatrixNormSpectral) {
    MN u(size), v(size);
    CNaxVectorN<T> w(size);
    if (size < 1 || this->SV_Decomposition(u, v, w, nax::detail::DefaultTol<T>()) != 0)
      return infinity;
    T smallest = std::fabs(w[0]), largest = smallest;
    for (int32 i = 1; i < size; ++i) {
      smallest = std::min(smallest, std::fabs(w[i]));
      largest = std::max(largest, std::fabs(w[i]));
    }
    return smallest < T(1e-6) ? infinity : largest / smallest;
  }
  CNaxMatrixN inverse(size);
  T condition = infinity;
  if (Inverse(inverse, norm, nax::detail::DefaultTol<T>(), condition) != 0) return infinity;
  return condition;
}

template <typename T>
int32 CNaxMatrixN<T>::InvPreconditioner(CNaxMatrixN& result, T tol) const {
  const int32 n = size;
  CNaxMatrixN lowerPart(n), upperPart(n);
  for (int32 i = 0; i < n; ++i) {
    if (std::fabs(data[i * n + i]) < T(1e-6)) return 0;
    for (int32 j = 0; j < n; ++j) {
      if (j <= i) lowerPart.data[i * n + j] = data[i * n + j];
      if (j >= i) upperPart.data[i * n + j] = data[i * n + j];
    }
  }
  CNaxMatrixN lowerInverse(n), upperInverse(n);
  if (!lowerPart.LowLeftInverse(lowerInverse, tol)) return 0;
  if (!upperPart.UpperRightInverse(upperInverse, tol)) return 0;
  // (D + U)^-1 D (D + L)^-1: scale the rows of (D + L)^-1 by D, then multiply.
  for (int32 i = 0; i < n; ++i)
    for (int32 j = 0; j < n; ++j) lowerInverse.data[i * n + j] *= data[i * n + i];
  nax::detail::MultiplyRaw(upperInverse.data, lowerInverse.data, result.data, n, n, n);
  return 1;
}

template <typename T>
int32 CNaxMatrixN<T>::PolarDecomposition(CNaxMatrixN& rotation, CNaxMatrixN& stretch, int32 right,
                                         T tol) {
  const int32 n = size;
  if (std::fabs(Det()) <= tol) return 0;
  if (this->IsDiagonal(tol)) {
    rotation.Unit();
    stretch.Base::operator=(*this);
    return 1;
  }
  if (IsOrthogonal(tol)) {
    rotation.Base::operator=(*this);
    stretch.Unit();
    return 1;
  }
  // Newton's iteration Q <- (Q + Q^-T) / 2, at most size rounds.
  CNaxMatrixN q(static_cast<const Base&>(*this)), inverse(n), next(n);
  for (int32 round = 0; round < n; ++round) {
    T condition = T(0);
    if (q.Inverse(inverse, naxMatrixNormFrobenius, tol, condition) != 0) return 0;
    bool settled = true;
    for (int32 i = 0; i < n; ++i) {
      for (int32 j = 0; j < n; ++j) {
        const T value = T(0.5) * (q.data[i * n + j] + inverse.data[j * n + i]);
        settled = settled && std::fabs(value - q.data[i * n + j]) <= tol;
        next.data[i * n + j] = value;
      }
    }
    if (settled) break;
    std::swap(q.data, next.data);
  }
  rotation.Base::operator=(q);
  const CNaxMatrixN qt(q.Transpose());
  CNaxMatrixN p(n);
  if (right)
    nax::detail::MultiplyRaw(qt.data, data, p.data, n, n, n);
  else
    nax::detail::MultiplyRaw(data, qt.data, p.data, n, n, n);
  for (int32 i = 0; i < n; ++i)
    for (int32 j = 0; j < n; ++j)
      stretch.data[i * n + j] = T(0.5) * (p.data[i * n + j] + p.data[j * n + i]);
  return 1;
}

template <typename T>
void CNaxMatrixN<T>::SortEigenpairs(CNaxVectorN<T>& values, CNaxMatrixN& vectors) {
  const int32 n = values.Dim();
  if (n < 2) return;
  std::vector<int32> indices(n);
  CNaxSorting<T> sorter(n, &values[0], 1, 1, 0);
  sorter.Sort(&values[0], indices.data());
  const CNaxMatrixN original(vectors);
  for (int32 r = 0; r < n; ++r)
    for (int32 c = 0; c < n; ++c) vectors.data[r * n + c] = original.data[r * n + indices[c]];
}

template <typename T>
naxStatus CNaxMatrixN<T>::RunJacobi(CNaxVectorN<T>& values, CNaxMatrixN& vectors,
                                    int32& rotations, T tol) {
  CNaxMatrixN work(static_cast<const Base&>(*this));
  rotations = 50;
  return DestructiveJacobiUnitOffset(work, values, vectors, rotations, tol);
}

template <typename T>
naxStatus CNaxMatrixN<T>::SymmetricEigensolve(CNaxVectorN<T>& values, CNaxMatrixN& vectors,
                                              T tol) {
  if (!IsSymmetric(tol)) return naxStatusNotSymmetric;
  int32 rotations = 0;
  const naxStatus status = RunJacobi(values, vectors, rotations, tol);
  if (status == naxStatusOutOfMemory) return status;
  // The test is on the count of rotations, not of sweeps, and it stays so.
  if (rotations == 50) return naxStatusTooManyRotations;
  SortEigenpairs(values, vectors);
  return naxStatusOk;
}

template <typename T>
int32 CNaxMatrixN<T>::SpectralDecomposition(CNaxMatrixN& vectors, CNaxMatrixN& values,
                                            int32 sorted, T tol) {
  if (!IsPositive(tol)) return 0;
  CNaxVectorN<T> eigen(size);
  int32 rotations = 0;
  if (RunJacobi(eigen, vectors, rotations, tol) != naxStatusOk || rotations == 50) return 0;
  if (sorted) SortEigenpairs(eigen, vectors);
  values.SetToZero();
  for (int32 i = 0; i < size; ++i) values.data[i * size + i] = eigen[i];
  return 1;
}

template <typename T>
void CNaxMatrixN<T>::JacobiRotate(CNaxMatrixN& a, int32 i, int32 j, int32 k, int32 l, T s,
                                  T tau) const {
  nax::detail::JacobiPair(a.data[i * a.size + j], a.data[k * a.size + l], s, tau);
}

template <typename T>
naxStatus CNaxMatrixN<T>::DestructiveJacobiUnitOffset(CNaxMatrixN& work, CNaxVectorN<T>& values,
                                                      CNaxMatrixN& vectors, int32& rotations,
                                                      T tol) {
  using nax::detail::FloatAbsorbs;
  using nax::detail::JacobiRoot;
  const int32 n = size;
  const int32 limit = rotations;
  rotations = 0;
  std::vector<T> b(n + 1), z(n + 1, T(0));
  // The eigenvectors are kept as the rows of vt while rotating, so that each rotation walks
  // two contiguous rows; they go to the columns of vectors at the end.
  std::vector<T> vt(static_cast<size_t>(n) * n, T(0));
  T* a = work.data;
  for (int32 i = 0; i < n; ++i) {
    vt[i * n + i] = T(1);
    b[i] = values[i] = a[i * n + i];
  }
  auto finish = [&]() {
    for (int32 r = 0; r < n; ++r)
      for (int32 c = 0; c < n; ++c) vectors.data[r * n + c] = vt[c * n + r];
    return naxStatusOk;
  };
  constexpr auto rotate = nax::detail::JacobiPair<T>;
  for (int32 sweep = 1; sweep <= limit; ++sweep) {
    T sum = T(0);
    for (int32 p = 0; p < n - 1; ++p)
      for (int32 q = p + 1; q < n; ++q) sum += std::fabs(a[p * n + q]);
    if (tol > sum) return finish();
    const T threshold = sweep < 4 ? T(0.2) * sum / T(n * n) : T(0);
    for (int32 p = 0; p < n - 1; ++p) {
      for (int32 q = p + 1; q < n; ++q) {
        T& apq = a[p * n + q];
        const T g = T(100) * std::fabs(apq);
        if (sweep > 4 && FloatAbsorbs(std::fabs(values[p]), g) &&
            FloatAbsorbs(std::fabs(values[q]), g)) {
          apq = T(0);
          continue;
        }
        if (!(std::fabs(apq) > threshold)) continue;
        T h = values[q] - values[p];
        T t;
        if (FloatAbsorbs(std::fabs(h), g)) {
          t = apq / h;
        } else {
          const T theta = T(0.5) * h / apq;
          t = T(1) / (std::fabs(theta) + JacobiRoot(theta * theta + T(1)));
          if (theta < T(0)) t = -t;
        }
        const T c = T(1) / JacobiRoot(t * t + T(1));
        const T s = t * c;
        const T tau = s / (T(1) + c);
        h = t * apq;
        z[p] -= h;
        z[q] += h;
        values[p] -= h;
        values[q] += h;
        apq = T(0);
        for (int32 j = 0; j < p; ++j) rotate(a[j * n + p], a[j * n + q], s, tau);
        for (int32 j = p + 1; j < q; ++j) rotate(a[p * n + j], a[j * n + q], s, tau);
        for (int32 j = q + 1; j < n; ++j) rotate(a[p * n + j], a[q * n + j], s, tau);
        T* vp = vt.data() + p * n;
        T* vq = vt.data() + q * n;
        for (int32 j = 0; j < n; ++j) rotate(vp[j], vq[j], s, tau);
        ++rotations;
      }
    }
    for (int32 i = 0; i < n; ++i) {
      b[i] += z[i];
      values[i] = b[i];
      z[i] = T(0);
    }
  }
  return finish();
}

#endif  // NAX_DETAIL_MATRIX_N_MEMBERS_H
