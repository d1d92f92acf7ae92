// Sorting of arrays of ten element types by one algorithm: a recursive Hoare quicksort
// with the middle element as pivot.
//
// Arrays sort ascending or descending, by value or by absolute value, in place or into
// a destination, optionally reporting the original index of each element. The middle
// pivot keeps sorted and all-equal input at O(n log n); equal elements are swapped like
// any others, so the sort is not stable. A float NaN gives no defined order.
//
// Reference: C. A. R. Hoare, "Quicksort", The Computer Journal 5(1), 1962, 10-16; the
// partition loop is the one of N. Wirth, "Algorithms + Data Structures = Programs", 1976.
#ifndef NAX_SORTING_H
#define NAX_SORTING_H

#include <algorithm>
#include <cmath>
#include <memory>
#include <type_traits>

#include "nax/types.h"
#include "nax/vector2.h"

namespace nax::detail {

/// True for the ten element types of the sorting family.
template <typename T>
inline constexpr bool kIsSortable =
    std::is_same_v<T, float> || std::is_same_v<T, double> || std::is_same_v<T, int32> ||
    std::is_same_v<T, uint32> || std::is_same_v<T, signed char> ||
    std::is_same_v<T, unsigned char> || std::is_same_v<T, short> ||
    std::is_same_v<T, unsigned short> || std::is_same_v<T, int64> || std::is_same_v<T, uint64>;

/// Type in which keys are compared: T for floating types, the unsigned type of the same
/// width for integers (so that the magnitude of the most negative value is exact).
template <typename T, bool = std::is_integral_v<T>>
struct SortKeyOf {
  using type = T;
};
template <typename T>
struct SortKeyOf<T, true> {
  using type = std::make_unsigned_t<T>;
};
template <typename T>
using SortKey = typename SortKeyOf<T>::type;

/// Absolute value as stored in a record: |v| for floating types, v for unsigned types,
/// and for signed integers the two's complement negation, which wraps at the minimum and
/// is read back exactly through AbsKey.
template <typename T>
inline T AbsValue(T v) {
  if constexpr (std::is_floating_point_v<T>) {
    return std::fabs(v);
  } else if constexpr (std::is_unsigned_v<T>) {
    return v;
  } else {
    using U = std::make_unsigned_t<T>;
    return v < 0 ? static_cast<T>(static_cast<U>(U(0) - static_cast<U>(v))) : v;
  }
}

/// Comparison key of a stored absolute value.
template <typename T>
inline SortKey<T> AbsKey(T absValue) {
  return static_cast<SortKey<T>>(absValue);
}

/// Order-preserving key of a value: the value for floating and unsigned types, the value
/// with its sign bit flipped (as unsigned) for signed integers, the magnitude when
/// `absolute` is set. Differences of integer keys are exact modulo the type width.
template <typename T>
inline SortKey<T> OrderKey(T v, int32 absolute) {
  if (absolute) return AbsKey(AbsValue(v));
  if constexpr (std::is_integral_v<T> && std::is_signed_v<T>) {
    using U = SortKey<T>;
    return static_cast<U>(static_cast<U>(v) ^ static_cast<U>(U(1) << (8 * sizeof(T) - 1)));
  } else {
    return static_cast<SortKey<T>>(v);
  }
}

/// x > y + tol for two keys, without overflow for integer keys.
template <typename T>
inline bool KeyExceeds(SortKey<T> x, SortKey<T> y, T tol) {
  if constexpr (std::is_floating_point_v<T>) {
    return x > y + tol;
  } else {
    using U = SortKey<T>;
    if constexpr (std::is_signed_v<T>) {
      if (tol < 0) {
        const U magnitude = static_cast<U>(U(0) - static_cast<U>(tol));
        return x >= y || static_cast<U>(y - x) < magnitude;
      }
    }
    return x > y && static_cast<U>(x - y) > static_cast<U>(tol);
  }
}

/// Two keys whose difference lies in [-tol, tol], both ends included.
template <typename T>
inline bool KeysWithin(SortKey<T> x, SortKey<T> y, T tol) {
  if constexpr (std::is_floating_point_v<T>) {
    const T d = x - y;
    return -tol <= d && d <= tol;
  } else {
    return !KeyExceeds<T>(x, y, tol) && !KeyExceeds<T>(y, x, tol);
  }
}

/// Key extractors: a plain value, the value of an index record, the absolute value of an
/// absolute-value record.
struct PlainKey {
  template <typename E>
  E operator()(const E& e) const {
    return e;
  }
};
struct ValueKey {
  template <typename R>
  auto operator()(const R& r) const {
    return r.value;
  }
};
struct AbsRecordKey {
  template <typename R>
  auto operator()(const R& r) const {
    return AbsKey(r.absValue);
  }
};

/// "Comes before" relations of the ascending and descending orders.
struct Less {
  template <typename K>
  bool operator()(const K& a, const K& b) const {
    return a < b;
  }
};
struct Greater {
  template <typename K>
  bool operator()(const K& a, const K& b) const {
    return a > b;
  }
};

/// One Hoare partition pass between i and j with the pivot key of the middle element,
/// read once. On return every element left of i comes no later than the pivot and every
/// element right of j no earlier; j < i.
template <typename E, typename KeyOf, typename Before>
inline void HoarePartition(E* a, int32& i, int32& j, KeyOf key, Before before) {
  const auto pivot = key(a[i + (j - i) / 2]);
  for (;;) {
    while (before(key(a[i]), pivot)) ++i;
    while (before(pivot, key(a[j]))) --j;
    if (i > j) return;
    const E t = a[i];
    a[i] = a[j];
    a[j] = t;
    ++i;
    --j;
    if (i > j) return;
  }
}

/// Quicksort of a[left..right]: recursion on the left part, iteration on the right.
template <typename E, typename KeyOf, typename Before>
void QuickSortRange(E* a, int32 left, int32 right, KeyOf key, Before before) {
  while (left < right) {
    int32 i = left;
    int32 j = right;
    HoarePartition(a, i, j, key, before);
    if (left < j) QuickSortRange(a, left, j, key, before);
    left = i;
  }
}

/// Quicksort of a[left..right], ascending when `ascending` is non-zero.
template <typename E, typename KeyOf>
inline void QuickSortOrdered(E* a, int32 left, int32 right, KeyOf key, int32 ascending) {
  if (ascending) {
    QuickSortRange(a, left, right, key, Less());
  } else {
    QuickSortRange(a, left, right, key, Greater());
  }
}

/// One partition pass, ascending when `ascending` is non-zero.
template <typename E, typename KeyOf>
inline void PartitionRange(E* a, int32& i, int32& j, KeyOf key, int32 ascending) {
  if (ascending) {
    HoarePartition(a, i, j, key, Less());
  } else {
    HoarePartition(a, i, j, key, Greater());
  }
}

template <typename T>
struct IndexRecord {
  T value;
  int32 index;
};
template <typename T>
struct AbsIndexRecord {
  T value;
  T absValue;
  int32 index;
};

/// Sorts a[first..last] in place. By absolute value the elements travel in records with
/// their absolute values (one allocation); unsigned types need none, their absolute
/// value being the value.
template <typename T>
void SortValues(T* a, int32 first, int32 last, int32 ascending, int32 absolute) {
  if (first >= last) return;
  if (!absolute || std::is_unsigned_v<T>) {
    QuickSortOrdered(a, first, last, PlainKey(), ascending);
    return;
  }
  const int32 n = last - first + 1;
  std::unique_ptr<AbsIndexRecord<T>[]> records(new AbsIndexRecord<T>[n]);
  for (int32 k = 0; k < n; ++k) {
    records[k].value = a[first + k];
    records[k].absValue = AbsValue(a[first + k]);
    records[k].index = k;
  }
  QuickSortOrdered(records.get(), 0, n - 1, AbsRecordKey(), ascending);
  for (int32 k = 0; k < n; ++k) a[first + k] = records[k].value;
}

/// Sorts the n values of `source` into records and reads out the original indices and,
/// when `destination` is not null, the sorted values. `source` is left as it is.
template <typename T>
void SortWithIndices(int32 n, const T* source, T* destination, int32* indices,
                     int32 ascending, int32 absolute) {
  if (n < 1) return;
  if (!absolute || std::is_unsigned_v<T>) {
    std::unique_ptr<IndexRecord<T>[]> records(new IndexRecord<T>[n]);
    for (int32 k = 0; k < n; ++k) records[k] = {source[k], k};
    QuickSortOrdered(records.get(), 0, n - 1, ValueKey(), ascending);
    for (int32 k = 0; k < n; ++k) {
      if (destination) destination[k] = records[k].value;
      indices[k] = records[k].index;
    }
  } else {
    std::unique_ptr<AbsIndexRecord<T>[]> records(new AbsIndexRecord<T>[n]);
    for (int32 k = 0; k < n; ++k) records[k] = {source[k], AbsValue(source[k]), k};
    QuickSortOrdered(records.get(), 0, n - 1, AbsRecordKey(), ascending);
    for (int32 k = 0; k < n; ++k) {
      if (destination) destination[k] = records[k].value;
      indices[k] = records[k].index;
    }
  }
}

/// Copies n values unless source and destination are the same array.
template <typename T>
inline void CopyValues(int32 n, const T* source, T* destination) {
  if (n > 0 && source != destination) std::copy(source, source + n, destination);
}

/// View of pairs held as 2-vectors: pair k is (v[k][0], v[k][1]).
template <typename T>
struct VectorPairs {
  CNaxVector2<T>* v;
  T Get(int32 k, int32 component) const { return v[k][component]; }
  void Set(int32 k, int32 component, T value) const { v[k][component] = value; }
};

/// View of `size` pairs stored as interleaved values: pair k is (p[2k], p[2k + 1]).
template <typename T>
struct InterleavedPairs {
  T* p;
  T Get(int32 k, int32 component) const { return p[2 * k + component]; }
  void Set(int32 k, int32 component, T v) const { p[2 * k + component] = v; }
};

/// Sorts pairs by a primary key (component 0 when `byFirst` is non-zero, else 1) and,
/// within each run of pairs whose primary keys lie within `tolerance` of the run's first
/// pair, by the other component. `Source` and `Destination` are pair views with Get and
/// Set; they may address the same storage.
template <typename T, typename Source, typename Destination>
void SortPairs(int32 size, Source source, Destination destination, T tolerance,
               int32 ascending, int32 absolute, int32 byFirst) {
  if (size < 1) return;
  const int32 primary = byFirst ? 0 : 1;
  const int32 secondary = 1 - primary;
  std::unique_ptr<T[]> keys(new T[size]);
  std::unique_ptr<T[]> others(new T[size]);
  std::unique_ptr<T[]> scratch(new T[size]);
  std::unique_ptr<int32[]> order(new int32[size]);
  for (int32 k = 0; k < size; ++k) scratch[k] = source.Get(k, primary);
  SortWithIndices(size, scratch.get(), keys.get(), order.get(), ascending, absolute);
  for (int32 k = 0; k < size; ++k) others[k] = source.Get(order[k], secondary);

  for (int32 head = 0; head < size;) {
    const SortKey<T> headKey = OrderKey(keys[head], absolute);
    int32 end = head + 1;
    while (end < size && KeysWithin<T>(OrderKey(keys[end], absolute), headKey, tolerance)) ++end;
    const int32 run = end - head;
    if (run >= 2) {
      SortWithIndices(run, others.get() + head, scratch.get(), order.get(), ascending, absolute);
      for (int32 k = 0; k < run; ++k) order[k] = head + order[k];
      std::copy(scratch.get(), scratch.get() + run, others.get() + head);
      for (int32 k = 0; k < run; ++k) scratch[k] = keys[order[k]];
      std::copy(scratch.get(), scratch.get() + run, keys.get() + head);
    }
    head = end;
  }
  for (int32 k = 0; k < size; ++k) {
    destination.Set(k, primary, keys[k]);
    destination.Set(k, secondary, others[k]);
  }
}

}  // namespace nax::detail

/// Quicksort of an array of T (float, double, and signed and unsigned integers of 8, 16,
/// 32 and 64 bits), ascending or descending, by value or by absolute value.
///
/// The array is either the caller's (external: sorted in place) or a private copy owned
/// by the object.
template <typename T>
class CNaxSorting {
  static_assert(nax::detail::kIsSortable<T>,
                "CNaxSorting is instantiated for float, double and the eight integer types only");

 public:
  /// An element with its original index.
  struct naxSortIndexData {
    T value;
    int32 index;
  };
  /// An element with its absolute value and its original index.
  struct naxSortAbsIndexData {
    T value;
    T absValue;
    int32 index;
  };

  /// No data: size 0, null array, ascending by value.
  CNaxSorting() = default;
  /// Takes `n` elements of `data`: in place when `isExternal` is non-zero, else as a
  /// private copy. A negative `n` is stored as 0.
  CNaxSorting(int32 n, T* data, int32 isExternal, int32 isAscending, int32 isAbsolute) {
    SetData(n, data, isExternal, isAscending, isAbsolute);
  }
  /// Copies the settings; a private array is copied, an external one shared.
  CNaxSorting(const CNaxSorting& other) { *this = other; }
  /// Releases the array when it is the object's own.
  ~CNaxSorting() { Release(); }
  /// Member-wise copy, except that a private array is copied, so that each object
  /// releases only its own.
  CNaxSorting& operator=(const CNaxSorting& other);

  /// As the constructor; a private array held before is released.
  void SetData(int32 n, T* data, int32 isExternal, int32 isAscending, int32 isAbsolute);
  /// Stores the size and the flags only; the array pointer and its ownership stay.
  void SetData(int32 n, int32 isExternal, int32 isAscending, int32 isAbsolute) {
    size = n < 0 ? 0 : n;
    external = isExternal;
    ascending = isAscending;
    byAbsoluteValue = isAbsolute;
  }
  /// Stores the order: ascending when non-zero, by absolute value when non-zero.
  void SetSortingType(int32 isAscending, int32 isAbsolute) {
    ascending = isAscending;
    byAbsoluteValue = isAbsolute;
  }
  /// Reads the size and the flags.
  void GetData(int32& n, int32& isExternal, int32& isAscending, int32& isAbsolute) const {
    n = size;
    isExternal = external;
    isAscending = ascending;
    isAbsolute = byAbsoluteValue;
  }
  /// New data with the current flags: taken in place when external, else copied.
  void SetArray(int32 n, T* data) { SetData(n, data, external, ascending, byAbsoluteValue); }
  /// The array being sorted.
  T* GetArray() { return array; }

  /// Sorts the whole array in place.
  void Sort();
  /// Sorts elements first..last, both inclusive, in place.
  void Sort(int32 first, int32 last);
  /// Copies the array to `destination` (size elements) and sorts the copy.
  void Sort(T* destination);
  /// Copies the array to `destination` (size elements) and sorts elements first..last.
  void Sort(int32 first, int32 last, T* destination);
  /// Leaves the array as it is; indices[k] is the original index of the element of rank k.
  void SortReturnIndices(int32* indices) const {
    nax::detail::SortWithIndices<T>(size, array, nullptr, indices, ascending, byAbsoluteValue);
  }
  /// Sorted values into `destination` and their original indices into `indices`.
  void Sort(T* destination, int32* indices) const {
    nax::detail::SortWithIndices<T>(size, array, destination, indices, ascending,
                                    byAbsoluteValue);
  }
  /// 1 when the array is in the given order, compared without tolerance; else 0.
  int32 IsArraySorted(int32 isAscending, int32 isAbsolute) const;

  /// Quicksort of array[left..right] by value in the object's direction.
  void QuickSort(int32 left, int32 right) {
    nax::detail::QuickSortOrdered(array, left, right, nax::detail::PlainKey(), ascending);
  }
  /// Quicksort of index records by value in the object's direction.
  void QuickSort(int32 left, int32 right, naxSortIndexData* data) const {
    nax::detail::QuickSortOrdered(data, left, right, nax::detail::ValueKey(), ascending);
  }
  /// Quicksort of absolute-value records by absolute value in the object's direction.
  void QuickSort(int32 left, int32 right, naxSortAbsIndexData* data) const {
    nax::detail::QuickSortOrdered(data, left, right, nax::detail::AbsRecordKey(), ascending);
  }

  /// One ascending partition pass of array[i..j] about its middle element; on return
  /// j < i and the two parts are array[left..j] and array[i..right].
  void AscendingPartition(int32& i, int32& j) {
    nax::detail::HoarePartition(array, i, j, nax::detail::PlainKey(), nax::detail::Less());
  }
  /// One descending partition pass of array[i..j].
  void DescendingPartition(int32& i, int32& j) {
    nax::detail::HoarePartition(array, i, j, nax::detail::PlainKey(), nax::detail::Greater());
  }
  /// Ascending partition pass of index records by value.
  void AscendingPartition(int32& i, int32& j, naxSortIndexData* data) const {
    nax::detail::HoarePartition(data, i, j, nax::detail::ValueKey(), nax::detail::Less());
  }
  /// Descending partition pass of index records by value.
  void DescendingPartition(int32& i, int32& j, naxSortIndexData* data) const {
    nax::detail::HoarePartition(data, i, j, nax::detail::ValueKey(), nax::detail::Greater());
  }
  /// Ascending partition pass of absolute-value records by absolute value.
  void AscendingPartition(int32& i, int32& j, naxSortAbsIndexData* data) const {
    nax::detail::HoarePartition(data, i, j, nax::detail::AbsRecordKey(), nax::detail::Less());
  }
  /// Descending partition pass of absolute-value records by absolute value.
  void DescendingPartition(int32& i, int32& j, naxSortAbsIndexData* data) const {
    nax::detail::HoarePartition(data, i, j, nax::detail::AbsRecordKey(),
                                nax::detail::Greater());
  }

 private:
  void Release() {
    if (!external) delete[] array;
    array = nullptr;
  }

  int32 size = 0;
  T* array = nullptr;
  int32 external = 1;
  int32 ascending = 1;
  int32 byAbsoluteValue = 0;
};

/// 1 when size values of `data` are in order within `tolerance`: ascending fails where
/// a[k] > a[k+1] + tolerance, descending where a[k+1] - tolerance > a[k]; by absolute
/// value the same on |a[k]|. Fewer than two values are in order.
template <typename T>
int32 naxIsArraySorted(int32 size, const T* data, T tolerance, int32 ascending, int32 absolute) {
  static_assert(nax::detail::kIsSortable<T>, "naxIsArraySorted: unsupported element type");
  for (int32 k = 0; k + 1 < size; ++k) {
    bool outOfOrder;
    if constexpr (std::is_floating_point_v<T>) {
      const T a = absolute ? std::fabs(data[k]) : data[k];
      const T b = absolute ? std::fabs(data[k + 1]) : data[k + 1];
      outOfOrder = ascending ? a > b + tolerance : b - tolerance > a;
    } else {
      const auto a = nax::detail::OrderKey(data[k], absolute);
      const auto b = nax::detail::OrderKey(data[k + 1], absolute);
      outOfOrder = ascending ? nax::detail::KeyExceeds<T>(a, b, tolerance)
                             : nax::detail::KeyExceeds<T>(b, a, tolerance);
    }
    if (outOfOrder) return 0;
  }
  return 1;
}

/// Copies `size` values from `source` to `destination` and sorts them there.
template <typename T>
void naxSort(int32 size, const T* source, T* destination, int32 ascending, int32 absolute) {
  nax::detail::CopyValues(size, source, destination);
  nax::detail::SortValues(destination, 0, size - 1, ascending, absolute);
}

/// Copies all `size` values and sorts destination[first..last], both inclusive.
template <typename T>
void naxSort(int32 size, int32 first, int32 last, const T* source, T* destination,
             int32 ascending, int32 absolute) {
  nax::detail::CopyValues(size, source, destination);
  nax::detail::SortValues(destination, first, last, ascending, absolute);
}

/// Sorted values into `destination` and, in `indices`, the index in `source` of each.
template <typename T>
void naxSort(int32 size, const T* source, T* destination, int32* indices, int32 ascending,
             int32 absolute) {
  nax::detail::SortWithIndices(size, source, destination, indices, ascending, absolute);
}

/// Sorts `size` pairs stored interleaved (x0, y0, x1, y1, ...) by their first value when
/// `byFirst` is non-zero, else by their second; pairs whose keys lie within `tolerance`
/// of the first pair of their run are ordered by the other value, in the same order.
template <typename T>
void naxSort2DArray(int32 size, const T* source, T* destination, T tolerance, int32 ascending,
                    int32 absolute, int32 byFirst) {
  nax::detail::SortPairs(size, nax::detail::InterleavedPairs<T>{const_cast<T*>(source)},
                         nax::detail::InterleavedPairs<T>{destination}, tolerance, ascending,
                         absolute, byFirst);
}

/// naxSort2DArray on 2-vectors: sorts by component 0 when `byFirst` is non-zero, else by
/// component 1, ordering runs of near-equal keys by the other component.
template <typename T>
void naxSort2DVectors(int32 size, int32 byFirst, const CNaxVector2<T>* source,
                      CNaxVector2<T>* destination, T tolerance, int32 ascending, int32 absolute) {
  nax::detail::SortPairs(size, nax::detail::VectorPairs<T>{const_cast<CNaxVector2<T>*>(source)},
                         nax::detail::VectorPairs<T>{destination}, tolerance, ascending, absolute,
                         byFirst);
}

template <typename T>
CNaxSorting<T>& CNaxSorting<T>::operator=(const CNaxSorting& other) {
  if (this != &other) SetData(other.size, other.array, other.external, other.ascending,
                              other.byAbsoluteValue);
  return *this;
}

template <typename T>
void CNaxSorting<T>::SetData(int32 n, T* data, int32 isExternal, int32 isAscending,
                             int32 isAbsolute) {
  T* owned = nullptr;
  n = n < 0 ? 0 : n;
  if (!isExternal && n > 0) {
    owned = new T[n];
    std::copy(data, data + n, owned);
  }
  Release();
  size = n;
  array = isExternal ? data : owned;
  external = isExternal;
  ascending = isAscending;
  byAbsoluteValue = isAbsolute;
}

template <typename T>
void CNaxSorting<T>::Sort() {
  if (size < 1) return;
  if (byAbsoluteValue) {
    nax::detail::SortValues(array, 0, size - 1, ascending, byAbsoluteValue);
    return;
  }
  int32 i = 0;
  int32 j = size - 1;
  nax::detail::PartitionRange(array, i, j, nax::detail::PlainKey(), ascending);
  QuickSort(0, j);
  QuickSort(i, size - 1);
}

template <typename T>
void CNaxSorting<T>::Sort(int32 first, int32 last) {
  nax::detail::SortValues(array, first, last, ascending, byAbsoluteValue);
}

template <typename T>
void CNaxSorting<T>::Sort(T* destination) {
  nax::detail::CopyValues(size, array, destination);
  nax::detail::SortValues(destination, 0, size - 1, ascending, byAbsoluteValue);
}

template <typename T>
void CNaxSorting<T>::Sort(int32 first, int32 last, T* destination) {
  nax::detail::CopyValues(size, array, destination);
  nax::detail::SortValues(destination, first, last, ascending, byAbsoluteValue);
}

template <typename T>
int32 CNaxSorting<T>::IsArraySorted(int32 isAscending, int32 isAbsolute) const {
  return naxIsArraySorted<T>(size, array, T(0), isAscending, isAbsolute);
}

#define NAX_SORTING_FOR_EACH_TYPE(X) \
  X(float)                           \
  X(double)                          \
  X(int32)                           \
  X(uint32)                          \
  X(signed char)                     \
  X(unsigned char)                   \
  X(short)                           \
  X(unsigned short)                  \
  X(int64)                           \
  X(uint64)

#define NAX_SORTING_DECLARE(T)                                                                \
  extern template class CNaxSorting<T>;                                                       \
  extern template int32 naxIsArraySorted<T>(int32, const T*, T, int32, int32);                \
  extern template void naxSort<T>(int32, const T*, T*, int32, int32);                         \
  extern template void naxSort<T>(int32, int32, int32, const T*, T*, int32, int32);           \
  extern template void naxSort<T>(int32, const T*, T*, int32*, int32, int32);                 \
  extern template void naxSort2DArray<T>(int32, const T*, T*, T, int32, int32, int32);
NAX_SORTING_FOR_EACH_TYPE(NAX_SORTING_DECLARE)
#undef NAX_SORTING_DECLARE
extern template void naxSort2DVectors<float>(int32, int32, const CNaxVector2<float>*,
                                             CNaxVector2<float>*, float, int32, int32);
extern template void naxSort2DVectors<double>(int32, int32, const CNaxVector2<double>*,
                                              CNaxVector2<double>*, double, int32, int32);

#endif  // NAX_SORTING_H
