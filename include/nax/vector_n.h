// The run-time sized real vector: CNaxBaseVector with lengths, norms, normalising and
// component search, for float and double.
//
// Lengths go through the safe root, so a vector shorter than about 3.2e-5 (double) or
// 3.2e-4 (float) has length exactly 0 and cannot be normalised.
#ifndef NAX_VECTOR_N_H
#define NAX_VECTOR_N_H

#include <cmath>

#include "nax/base_vector.h"

/// A run-time sized vector of float or double.
template <typename T>
class CNaxVectorN : public CNaxBaseVector<T> {
  static_assert(nax::detail::kIsReal<T>, "CNaxVectorN is instantiated for float and double only");
  using Base = CNaxBaseVector<T>;
  using Base::data;
  using Base::dim;

 public:
  /// Dimension 0, no array.
  CNaxVectorN() = default;
  /// n zeros.
  explicit CNaxVectorN(int32 n) : Base(n) {}
  /// n copies of value.
  CNaxVectorN(int32 n, T value) : Base(n, value) {}
  /// n elements copied from source.
  CNaxVectorN(int32 n, const T* source) : Base(n, source) {}
  /// Deep copy.
  CNaxVectorN(const CNaxVectorN& other) : Base(other) {}
  /// Deep copy of a base vector, such as the result of an arithmetic operator.
  CNaxVectorN(const Base& other) : Base(other) {}  // NOLINT: implicit by design
  ~CNaxVectorN() override = default;

  /// Copies this vector's dimension of elements from other, whatever other's dimension.
  CNaxVectorN& operator=(const Base& other) override {
    Base::operator=(other);
    return *this;
  }
  /// Copies this vector's dimension of elements from other, whatever other's dimension.
  virtual CNaxVectorN& operator=(const CNaxVectorN& other) {
    Base::operator=(other);
    return *this;
  }

  /// Discards the contents and takes a new array of n zeros.
  void SetDimension(int32 n) { Base::SetDimension(n); }

  /// Element-wise equality within the default tolerance; 0 on different dimensions.
  int32 operator==(const CNaxVectorN& other) const { return this->EqualTo(other); }
  int32 operator!=(const CNaxVectorN& other) const { return !this->EqualTo(other); }

  /// Euclidean length by the safe root of the sum of squares.
  T Length() const { return nax::detail::SafeRoot(SquareLength()); }
  /// The same computation as Length.
  T NormEuclidean() const { return Length(); }
  /// Plain sum of squares, without any floor.
  T SquareLength() const { return nax::detail::SumSquares(dim, data); }
  /// Sum of absolute values.
  T Norm1() const { return nax::detail::SumAbs(dim, data); }
  /// Largest absolute value; 0 for dimension 0.
  T NormInf() const { return GetMaxComponent(1); }

  /// Scales to unit length and returns 1; returns 0 and leaves the vector unchanged when
  /// the length is below the default tolerance.
  int32 Normalize() {
    const T length = Length();
    if (length < nax::detail::DefaultTol<T>()) return 0;
    this->Mul(T(1) / length);
    return 1;
  }

  /// Largest component (of the absolute values when useAbs is not 0); 0 for dimension 0.
  T GetMaxComponent(int32 useAbs) const { return dim < 1 ? T(0) : Value(IndexOfMax(useAbs), useAbs); }
  /// Smallest component (of the absolute values when useAbs is not 0); 0 for dimension 0.
  T GetMinComponent(int32 useAbs) const { return dim < 1 ? T(0) : Value(IndexOfMin(useAbs), useAbs); }
  /// Index of the first largest component; 0 for dimension 0 or 1.
  int32 GetIndexOfMaxComponent(int32 useAbs) const { return dim < 1 ? 0 : IndexOfMax(useAbs); }
  /// Index of the first smallest component; 0 for dimension 0 or 1.
  int32 GetIndexOfMinComponent(int32 useAbs) const { return dim < 1 ? 0 : IndexOfMin(useAbs); }

  /// 1 when -tol <= Length() <= tol.
  int32 IsAlmostZero(T tol) const { return nax::detail::InClosedTol(Length(), tol); }
  /// 1 when -tol <= Length() - 1 <= tol.
  int32 IsAlmostUnit(T tol) const { return nax::detail::InClosedTol(Length() - T(1), tol); }

  /// Sets to 0 each component with tol > |x|; a component of exactly tol stays.
  void AnnulateSmallComponents(T tol) {
    for (int32 i = 0; i < dim; ++i)
      if (tol > std::fabs(data[i])) data[i] = T(0);
  }

  /// Every component becomes value.
  void SetToConstant(T value) { nax::detail::SetElements(dim, data, value); }

 private:
  T Value(int32 i, int32 useAbs) const { return useAbs ? std::fabs(data[i]) : data[i]; }

  // Strict comparisons, so the first of equal extremes wins.
  int32 IndexOfMax(int32 useAbs) const {
    int32 best = 0;
    for (int32 i = 1; i < dim; ++i)
      if (Value(i, useAbs) > Value(best, useAbs)) best = i;
    return best;
  }
  int32 IndexOfMin(int32 useAbs) const {
    int32 best = 0;
    for (int32 i = 1; i < dim; ++i)
      if (Value(i, useAbs) < Value(best, useAbs)) best = i;
    return best;
  }
};

extern template class CNaxVectorN<float>;
extern template class CNaxVectorN<double>;

#endif  // NAX_VECTOR_N_H
