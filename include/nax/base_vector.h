// The run-time sized vector container: a dimension and one owned heap array.
//
// CNaxBaseVector gives storage, element access, part copies and element-wise arithmetic
// for float, double, int32 and both complex types. Assignment never resizes: it copies
// this vector's dimension of elements from the source. Indices and dimensions of operands
// are not checked, except by the equality tests.
#ifndef NAX_BASE_VECTOR_H
#define NAX_BASE_VECTOR_H

#include <algorithm>

#include "nax/complex.h"
#include "nax/detail/array_ops.h"
#include "nax/scalar.h"
#include "nax/types.h"

namespace nax::detail {

template <typename T>
inline constexpr bool kIsVectorElement = std::is_same_v<T, float> || std::is_same_v<T, double> ||
                                         std::is_same_v<T, int32> ||
                                         std::is_same_v<T, CNaxComplex<float>> ||
                                         std::is_same_v<T, CNaxComplex<double>>;

/// Tolerance of the element-wise equality: the default tolerance for float and double,
/// 0 for int32 (exact) and for the complex types (whose |a - b| has the safe-root dead zone).
template <typename T>
constexpr auto EqualityTol() {
  if constexpr (kIsComplex<T>) {
    return ScalarOf<T>(0);
  } else if constexpr (kIsFloat<T>) {
    return DefaultTol<T>();
  } else {
    return T(0);
  }
}

}  // namespace nax::detail

/// A run-time sized vector of T = float, double, int32, CNaxComplex<float> or
/// CNaxComplex<double>.
template <typename T>
class CNaxBaseVector {
  static_assert(nax::detail::kIsVectorElement<T>,
                "CNaxBaseVector is instantiated for float, double, int32 and the complex types");

 public:
  /// Dimension 0, no array.
  CNaxBaseVector() : dim(0), data(nullptr) {}
  /// n zeros.
  explicit CNaxBaseVector(int32 n) : dim(n), data(nax::detail::AllocateZeroed<T>(n)) {}
  /// n copies of value.
  CNaxBaseVector(int32 n, T value) : CNaxBaseVector(n) { std::fill(data, data + std::max(n, 0), value); }
  /// n elements copied from source.
  CNaxBaseVector(int32 n, const T* source) : dim(n), data(nax::detail::AllocateCopy(n, source)) {}
  /// Deep copy.
  CNaxBaseVector(const CNaxBaseVector& other)
      : dim(other.dim), data(nax::detail::AllocateCopy(other.dim, other.data)) {}
  virtual ~CNaxBaseVector() { nax::detail::Release(data); }

  /// Copies this vector's dimension of elements from other, whatever other's dimension.
  virtual CNaxBaseVector& operator=(const CNaxBaseVector& other) {
    if (this != &other && dim >= 1) nax::detail::CopyElements(dim, other.data, data);
    return *this;
  }

  int32 Dim() const { return dim; }

  /// Discards the contents and takes a new array of n zeros (an empty array for n = 0).
  void SetDimension(int32 n) {
    nax::detail::Release(data);
    dim = n;
    data = nax::detail::AllocateZeroedAlways<T>(n);
  }

  T& operator[](int32 i) { return data[i]; }
  const T& operator[](int32 i) const { return data[i]; }

  /// Copies dim elements in from source.
  void Fill(const T* source) { nax::detail::CopyElements(dim, source, data); }
  /// Copies min(dim - start, count) elements of source to positions start, start + 1, ...
  void FillPart(const T* source, int32 start, int32 count) {
    nax::detail::CopyElements(std::min(dim - start, count), source, data + start);
  }
  /// Copies dim elements out to target.
  void Dump(T* target) const { nax::detail::CopyElements(dim, data, target); }
  /// Copies min(dim - start, count) elements from position start to target.
  void DumpPart(int32 start, int32 count, T* target) const {
    nax::detail::CopyElements(std::min(dim - start, count), data + start, target);
  }
  /// this[start + i] = other[otherStart + i] for i < count; ranges are not checked.
  void ReplacePart(int32 start, int32 otherStart, int32 count, const CNaxBaseVector& other) {
    nax::detail::CopyElements(count, other.data + otherStart, data + start);
  }

  void SetToZero() { nax::detail::SetElements(dim, data, nax::detail::ScalarOf<T>(0)); }

  void Add(const CNaxBaseVector& other) {
    for (int32 i = 0; i < dim; ++i) data[i] += other.data[i];
  }
  void Sub(const CNaxBaseVector& other) {
    for (int32 i = 0; i < dim; ++i) data[i] -= other.data[i];
  }
  void Mul(T value) {
    for (int32 i = 0; i < dim; ++i) data[i] *= value;
  }
  /// Divides every element; the divisor is not tested.
  void Div(T value) {
    for (int32 i = 0; i < dim; ++i) data[i] /= value;
  }

  CNaxBaseVector& operator+=(const CNaxBaseVector& other) {
    Add(other);
    return *this;
  }
  CNaxBaseVector& operator-=(const CNaxBaseVector& other) {
    Sub(other);
    return *this;
  }
  CNaxBaseVector& operator*=(const T& value) {
    Mul(value);
    return *this;
  }
  CNaxBaseVector& operator/=(const T& value) {
    Div(value);
    return *this;
  }

  /// New vector of this vector's dimension.
  CNaxBaseVector operator+(const CNaxBaseVector& other) const { return CNaxBaseVector(*this) += other; }
  CNaxBaseVector operator-(const CNaxBaseVector& other) const { return CNaxBaseVector(*this) -= other; }
  CNaxBaseVector operator*(T value) const { return CNaxBaseVector(*this) *= value; }
  CNaxBaseVector operator/(T value) const { return CNaxBaseVector(*this) /= value; }

  /// New vector of the negated components; this vector is unchanged.
  CNaxBaseVector Negate() const {
    CNaxBaseVector result(dim);
    for (int32 i = 0; i < dim; ++i) result.data[i] = -data[i];
    return result;
  }

  /// 0 when the dimensions differ, 1 when both are empty, else 0 at the first component
  /// with |a - b| > tolerance (default tolerance for float and double, exact for int32,
  /// naxAbs(a - b) > 0 for complex).
  int32 operator==(const CNaxBaseVector& other) const { return EqualTo(other); }
  int32 operator!=(const CNaxBaseVector& other) const { return !EqualTo(other); }

  /// Sum of this[i] * other[i] over this vector's dimension; 0 when it is below 1.
  T Dot(const CNaxBaseVector& other) const { return nax::detail::DotArrays(dim, data, other.data); }
  /// Sum of this[i] * other[i] for i from first to last inclusive; 0 when first > last.
  T DotForPart(int32 first, int32 last, const CNaxBaseVector& other) const {
    if (first > last) return T(0);
    return nax::detail::DotArrays(last - first + 1, data + first, other.data + first);
  }

 protected:
  int32 EqualTo(const CNaxBaseVector& other) const {
    if (dim != other.dim) return 0;
    if (dim < 1) return 1;
    return nax::detail::ArraysAlmostEqual(dim, data, other.data, nax::detail::EqualityTol<T>());
  }

  int32 dim;
  T* data;
};

extern template class CNaxBaseVector<float>;
extern template class CNaxBaseVector<double>;
extern template class CNaxBaseVector<int32>;
extern template class CNaxBaseVector<CNaxComplex<float>>;
extern template class CNaxBaseVector<CNaxComplex<double>>;

#endif  // NAX_BASE_VECTOR_H
