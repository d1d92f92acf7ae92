#include "nax/sorting.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <limits>
#include <random>
#include <vector>

namespace {

template <typename T>
class SortingTest : public ::testing::Test {};

using SortTypes = ::testing::Types<float, double, int32, uint32, signed char, unsigned char,
                                   short, unsigned short, int64, uint64>;
TYPED_TEST_SUITE(SortingTest, SortTypes);

// Values spread over the type's range, or drawn from a handful of values (many ties).
template <typename T>
std::vector<T> RandomValues(int n, bool fewDistinct, std::uint64_t seed) {
  std::mt19937_64 gen(seed);
  std::vector<T> v(n);
  for (auto& x : v) {
    if (fewDistinct) {
      x = static_cast<T>(static_cast<int>(gen() % 7) - (std::is_signed_v<T> ? 3 : 0));
    } else if constexpr (std::is_floating_point_v<T>) {
      x = static_cast<T>(std::uniform_real_distribution<double>(-1e3, 1e3)(gen));
    } else {
      x = static_cast<T>(gen());  // every bit pattern, extremes included
    }
  }
  return v;
}

template <typename T>
auto Key(T v, int absolute) {
  return nax::detail::OrderKey(v, absolute);
}

// The expected order of keys, by std::sort.
template <typename T>
std::vector<nax::detail::SortKey<T>> ExpectedKeys(const std::vector<T>& v, int ascending,
                                                  int absolute) {
  std::vector<nax::detail::SortKey<T>> keys;
  for (T x : v) keys.push_back(Key(x, absolute));
  if (ascending) {
    std::sort(keys.begin(), keys.end());
  } else {
    std::sort(keys.begin(), keys.end(), std::greater<>());
  }
  return keys;
}

template <typename T>
void ExpectSortedLike(const std::vector<T>& sorted, const std::vector<T>& original,
                      int ascending, int absolute) {
  ASSERT_EQ(sorted.size(), original.size());
  const auto expected = ExpectedKeys(original, ascending, absolute);
  for (size_t k = 0; k < sorted.size(); ++k) {
    ASSERT_EQ(Key(sorted[k], absolute), expected[k]) << "rank " << k;
  }
  std::vector<T> a = sorted, b = original;  // the same multiset of values
  std::sort(a.begin(), a.end());
  std::sort(b.begin(), b.end());
  EXPECT_EQ(a, b);
}

TYPED_TEST(SortingTest, SortAgreesWithStdSortForEveryOrder) {
  using T = TypeParam;
  for (int few = 0; few < 2; ++few) {
    for (int n : {0, 1, 2, 3, 17, 1000}) {
      const auto original = RandomValues<T>(n, few, 11 + n);
      for (int ascending = 0; ascending < 2; ++ascending) {
        for (int absolute = 0; absolute < 2; ++absolute) {
          std::vector<T> data = original;
          CNaxSorting<T> sorting(n, data.data(), 1, ascending, absolute);
          sorting.Sort();
          ExpectSortedLike(data, original, ascending, absolute);
          EXPECT_EQ(sorting.IsArraySorted(ascending, absolute), 1);

          std::vector<T> destination(n);
          naxSort(n, original.data(), destination.data(), ascending, absolute);
          ExpectSortedLike(destination, original, ascending, absolute);
        }
      }
    }
  }
}

TYPED_TEST(SortingTest, IndexFormsPermuteTheSourceAndLeaveItAlone) {
  using T = TypeParam;
  for (int few = 0; few < 2; ++few) {
    const int n = 500;
    auto original = RandomValues<T>(n, few, 5);
    for (int ascending = 0; ascending < 2; ++ascending) {
      for (int absolute = 0; absolute < 2; ++absolute) {
        std::vector<T> values(n), fromClass(n);
        std::vector<int32> indices(n), classIndices(n), onlyIndices(n);
        naxSort(n, original.data(), values.data(), indices.data(), ascending, absolute);
        ExpectSortedLike(values, original, ascending, absolute);
        std::vector<int32> seen(n, 0);
        for (int k = 0; k < n; ++k) {
          ASSERT_EQ(values[k], original[indices[k]]);
          ++seen[indices[k]];
        }
        EXPECT_EQ(std::count(seen.begin(), seen.end(), 1), n);

        std::vector<T> copy = original;
        CNaxSorting<T> sorting(n, copy.data(), 1, ascending, absolute);
        sorting.Sort(fromClass.data(), classIndices.data());
        sorting.SortReturnIndices(onlyIndices.data());
        EXPECT_EQ(copy, original);
        EXPECT_EQ(fromClass, values);
        EXPECT_EQ(classIndices, indices);
        EXPECT_EQ(onlyIndices, indices);
      }
    }
  }
}

TYPED_TEST(SortingTest, PartialSortTouchesOnlyItsRange) {
  using T = TypeParam;
  const auto original = RandomValues<T>(200, false, 3);
  for (int absolute = 0; absolute < 2; ++absolute) {
    std::vector<T> destination(200);
    naxSort(200, 50, 149, original.data(), destination.data(), 0, absolute);
    std::vector<T> middle(original.begin() + 50, original.begin() + 150);
    ExpectSortedLike(std::vector<T>(destination.begin() + 50, destination.begin() + 150), middle,
                     0, absolute);
    EXPECT_TRUE(std::equal(original.begin(), original.begin() + 50, destination.begin()));
    EXPECT_TRUE(std::equal(original.begin() + 150, original.end(), destination.begin() + 150));

    std::vector<T> data = original;
    CNaxSorting<T> sorting(200, data.data(), 1, 0, absolute);
    sorting.Sort(50, 149);
    EXPECT_EQ(data, destination);
  }
}

// Sorted, reverse-sorted and all-equal input must stay O(n log n): with a first- or
// last-element pivot these would take seconds (and overflow the stack).
TYPED_TEST(SortingTest, StructuredLargeInputsStayFast) {
  using T = TypeParam;
  const int n = 100000;
  std::vector<T> equal(n, T(1)), increasing(n), decreasing(n);
  for (int k = 0; k < n; ++k) increasing[k] = static_cast<T>(k % 100 + k / 1000);
  std::sort(increasing.begin(), increasing.end());
  decreasing.assign(increasing.rbegin(), increasing.rend());
  for (auto* input : {&equal, &increasing, &decreasing}) {
    for (int ascending = 0; ascending < 2; ++ascending) {
      std::vector<T> data = *input;
      CNaxSorting<T> sorting(n, data.data(), 1, ascending, 0);
      sorting.Sort();
      ExpectSortedLike(data, *input, ascending, 0);
    }
  }
}

TYPED_TEST(SortingTest, PrivateCopyIsSortedAndCopiedDeeply) {
  using T = TypeParam;
  const auto original = RandomValues<T>(64, false, 9);
  std::vector<T> data = original;
  CNaxSorting<T> owner(64, data.data(), 0, 1, 0);
  EXPECT_NE(owner.GetArray(), data.data());
  CNaxSorting<T> copy(owner);
  owner.Sort();
  EXPECT_EQ(data, original);  // the caller's array stays
  EXPECT_EQ(owner.IsArraySorted(1, 0), 1);
  EXPECT_NE(copy.GetArray(), owner.GetArray());
  EXPECT_TRUE(std::equal(original.begin(), original.end(), copy.GetArray()));
  copy = owner;
  EXPECT_TRUE(std::equal(owner.GetArray(), owner.GetArray() + 64, copy.GetArray()));
}

TEST(Sorting, NegativeSizeIsStoredAsZero) {
  double value = 1;
  CNaxSorting<double> sorting(-5, &value, 0, 1, 0);
  int32 size, external, ascending, absolute;
  sorting.GetData(size, external, ascending, absolute);
  EXPECT_EQ(size, 0);
  EXPECT_EQ(external, 0);
  sorting.Sort();
  sorting.SetData(-1, 1, 0, 1);
  sorting.GetData(size, external, ascending, absolute);
  EXPECT_EQ(size, 0);
  EXPECT_EQ(ascending, 0);
  EXPECT_EQ(absolute, 1);
}

TEST(Sorting, DescendingByAbsoluteValue) {
  int32 values[] = {1, -3, 2};
  CNaxSorting<int32> sorting(3, values, 1, 0, 1);
  sorting.Sort();
  EXPECT_EQ(values[0], -3);
  EXPECT_EQ(values[1], 2);
  EXPECT_EQ(values[2], 1);
  EXPECT_EQ(sorting.IsArraySorted(0, 1), 1);
  EXPECT_EQ(sorting.IsArraySorted(0, 0), 0);
}

// |INT_MIN| does not fit the signed type: it once sorted as the smallest magnitude.
TEST(Sorting, MostNegativeValueHasTheLargestMagnitude) {
  const int64 lowest = std::numeric_limits<int64>::min();
  int64 values[] = {5, lowest, -7, std::numeric_limits<int64>::max()};
  naxSort(4, values, values, 1, 1);
  EXPECT_EQ(values[3], lowest);
  EXPECT_EQ(naxIsArraySorted<int64>(4, values, 0, 1, 1), 1);
  signed char small[] = {-128, 127, -1};
  naxSort<signed char>(3, small, small, 0, 1);
  EXPECT_EQ(small[0], -128);
}

TEST(Sorting, IsArraySortedHonoursTheTolerance) {
  const double up[] = {1.0, 0.95, 2.0};
  EXPECT_EQ(naxIsArraySorted(3, up, 0.0, 1, 0), 0);
  EXPECT_EQ(naxIsArraySorted(3, up, 0.1, 1, 0), 1);
  const double down[] = {2.0, 2.05, 1.0};
  EXPECT_EQ(naxIsArraySorted(3, down, 0.0, 0, 0), 0);
  EXPECT_EQ(naxIsArraySorted(3, down, 0.1, 0, 0), 1);
  EXPECT_EQ(naxIsArraySorted(1, down, 0.0, 1, 0), 1);
  // Integer tolerances near the ends of the range do not overflow.
  const int32 extremes[] = {std::numeric_limits<int32>::max(), std::numeric_limits<int32>::min()};
  EXPECT_EQ(naxIsArraySorted<int32>(2, extremes, std::numeric_limits<int32>::max(), 1, 0), 0);
  EXPECT_EQ(naxIsArraySorted<int32>(2, extremes, -1, 0, 0), 1);
  const int32 pair[] = {4, 4};
  EXPECT_EQ(naxIsArraySorted<int32>(2, pair, -1, 1, 0), 0);
  const uint32 unsignedPair[] = {7, 5};
  EXPECT_EQ(naxIsArraySorted<uint32>(2, unsignedPair, 2, 1, 0), 1);
  EXPECT_EQ(naxIsArraySorted<uint32>(2, unsignedPair, 1, 1, 0), 0);
}

TEST(Sorting, Sort2DArrayGroupsTiesWithinTheTolerance) {
  // (key, other) pairs; keys 1.0 and 1.05 form one run at tolerance 0.1.
  const double source[] = {2.0, 9.0, 1.05, 3.0, 1.0, 5.0, 2.0, 1.0, 1.0, 4.0};
  double exact[10], loose[10];
  naxSort2DArray(5, source, exact, 0.0, 1, 0, 1);
  const double expectExact[] = {1.0, 4.0, 1.0, 5.0, 1.05, 3.0, 2.0, 1.0, 2.0, 9.0};
  for (int k = 0; k < 10; ++k) EXPECT_EQ(exact[k], expectExact[k]) << k;
  naxSort2DArray(5, source, loose, 0.1, 1, 0, 1);
  const double expectLoose[] = {1.05, 3.0, 1.0, 4.0, 1.0, 5.0, 2.0, 1.0, 2.0, 9.0};
  for (int k = 0; k < 10; ++k) EXPECT_EQ(loose[k], expectLoose[k]) << k;

  // By the second value, descending, in place.
  int32 pairs[] = {1, 7, 3, 7, 2, 8, 5, 7};
  naxSort2DArray<int32>(4, pairs, pairs, 0, 0, 0, 0);
  const int32 expectPairs[] = {2, 8, 5, 7, 3, 7, 1, 7};
  for (int k = 0; k < 8; ++k) EXPECT_EQ(pairs[k], expectPairs[k]) << k;
}

TEST(Sorting, Sort2DArrayMatchesLexicographicOrderOnIntegers) {
  std::mt19937 gen(4);
  const int n = 3000;
  std::vector<short> source(2 * n), destination(2 * n);
  for (auto& v : source) v = static_cast<short>(static_cast<int>(gen() % 41) - 20);
  for (int absolute = 0; absolute < 2; ++absolute) {
    naxSort2DArray<short>(n, source.data(), destination.data(), 0, 1, absolute, 1);
    std::vector<std::pair<int, int>> expected, got;
    for (int k = 0; k < n; ++k) {
      const auto key = [&](short v) { return absolute ? std::abs(int(v)) : int(v); };
      expected.emplace_back(key(source[2 * k]), key(source[2 * k + 1]));
      got.emplace_back(key(destination[2 * k]), key(destination[2 * k + 1]));
    }
    std::sort(expected.begin(), expected.end());
    EXPECT_EQ(got, expected);
  }
}

}  // namespace

namespace {

TEST(Sort2DVectors, MatchesTheInterleavedForm) {
  std::mt19937 rng(11);
  std::uniform_int_distribution<int> u(-4, 4);
  const int32 n = 200;
  std::vector<double> flat(2 * n), flatOut(2 * n);
  std::vector<CNaxVector2<double>> vectors(n), vectorsOut(n);
  for (int32 k = 0; k < n; ++k) {
    flat[2 * k] = u(rng);
    flat[2 * k + 1] = u(rng) * 0.5;
    vectors[k][0] = flat[2 * k];
    vectors[k][1] = flat[2 * k + 1];
  }
  for (int32 byFirst : {0, 1}) {
    naxSort2DArray(n, flat.data(), flatOut.data(), 0.0, 1, 0, byFirst);
    naxSort2DVectors(n, byFirst, vectors.data(), vectorsOut.data(), 0.0, 1, 0);
    for (int32 k = 0; k < n; ++k) {
      EXPECT_EQ(vectorsOut[k][0], flatOut[2 * k]);
      EXPECT_EQ(vectorsOut[k][1], flatOut[2 * k + 1]);
    }
  }
}

}  // namespace
