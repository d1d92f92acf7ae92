#include "nax/random.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <ctime>
#include <vector>

namespace {

// Reference steps, written from the generator definitions.
struct Xor32 {
  uint32 x, y, z, w;
  uint32 Next() {
    const uint32 t = x ^ (x << 11);
    x = y;
    y = z;
    z = w;
    w = w ^ (w >> 19) ^ t ^ (t >> 8);
    return w;
  }
};
struct Xor64 {
  uint64 a, b, c, d;
  uint64 Next() {
    const uint64 t = a ^ (a << 13);
    a = b;
    b = c;
    c = d;
    d = d ^ (d >> 17) ^ t ^ (t >> 7);
    return d;
  }
};

Xor32 FixedXor32() { return {123456789u, 362436069u, 521288629u, 88675123u}; }
Xor64 FixedXor64() {
  return {88172645463325252ull, 0x7f4809ed9054adfull, 0x62c6c85408a4c66cull,
          0x908fac67fa2a9a82ull};
}

template <typename T>
class RandomTest : public ::testing::Test {};
using RealTypes = ::testing::Types<float, double>;
TYPED_TEST_SUITE(RandomTest, RealTypes);

TYPED_TEST(RandomTest, RawStepsFollowTheGeneratorRules) {
  using T = TypeParam;
  CNaxRandom<T> random;
  Xor32 r32 = FixedXor32();
  Xor64 r64 = FixedXor64();
  for (int k = 0; k < 1000; ++k) {
    ASSERT_EQ(random.Xorshift32(), r32.Next());
    ASSERT_EQ(random.Xorshift64(), r64.Next());
  }
  // Subtract with borrow: ring[i] = ring[i - 12] - ring[i - 27] - carry, +1 on a borrow.
  std::vector<T> ring(32);
  for (int k = 0; k < 32; ++k) ring[k] = T((k * 37 % 32 + 1) / 33.0);
  random.SetSWBSeeds(ring.data());
  random.SetSWBState(0, T(0));
  int index = 0;
  for (int k = 0; k < 1000; ++k) {
    T t = ring[(index + 20) % 32] - ring[(index + 5) % 32];  // float carry is always 0
    if (!(t > T(0))) t += T(1);
    ring[index] = t;
    index = (index + 1) % 32;
    const T drawn = random.SWB();
    if (std::is_same_v<T, float>) {
      ASSERT_EQ(drawn, t) << k;
    }
    ASSERT_NEAR(drawn, t, 1e-12) << k;
    ASSERT_GT(drawn, T(0));
    ASSERT_LE(drawn, T(1));
  }
  std::vector<T> back(32);
  random.GetSWBSeeds(back.data());
  EXPECT_EQ(back, ring);
}

// The branch-free conversion of 64-bit raw numbers must round exactly as a cast does,
// or seeded float and double sequences would differ from the defined ones.
TEST(Random, RawConversionRoundsLikeTheCast) {
  std::vector<uint64> values = {0, 1, 3, (1ull << 24) + 1, (1ull << 53) + 1, (1ull << 63) - 1,
                                1ull << 63, (1ull << 63) + 1, ~0ull, 0x8000008000000000ull,
                                0x8000018000000000ull, 0x0000000100000801ull};
  Xor64 r = FixedXor64();
  for (int k = 0; k < 100000; ++k) values.push_back(r.Next() >> (k % 64));
  for (uint64 v : values) {
    ASSERT_EQ(nax::detail::ToReal(v, 0.0), static_cast<double>(v)) << v;
    ASSERT_EQ(nax::detail::ToReal(v, 0.0f), static_cast<float>(v)) << v;
  }
  CNaxRandom<float> random;
  r = FixedXor64();
  for (int k = 0; k < 1000; ++k) {
    ASSERT_EQ(random.GetXorshift64(), static_cast<float>(r.Next()) * 5.421010862427522e-20f);
  }
}

// The borrow unit is 2^-153 in double; in float it underflows to nought, as it must.
TYPED_TEST(RandomTest, BorrowUnitIsTwoToMinus153OnlyInDouble) {
  using T = TypeParam;
  CNaxRandom<T> random;
  std::vector<T> ring(32, T(0.5));
  random.SetSWBSeeds(ring.data());
  random.SetSWBState(0, T(0));
  EXPECT_EQ(random.SWB(), T(1));  // 0.5 - 0.5 is not positive: borrow, +1
  int32 index;
  T carry;
  random.GetSWBState(index, carry);
  EXPECT_EQ(index, 1);
  if (std::is_same_v<T, double>) {
    std::uint64_t bits;
    const double c = double(carry);
    std::memcpy(&bits, &c, sizeof bits);
    EXPECT_EQ(bits, 0x3660000000000000ull);
  } else {
    EXPECT_EQ(carry, T(0));
  }
  random.SetSWBState(-33, T(0));
  random.GetSWBState(index, carry);
  EXPECT_EQ(index, -1);  // truncating remainder, not repaired
  random.SWB();          // and still addresses the ring
}

TYPED_TEST(RandomTest, OneWordSeedsMixThroughThePrimeTable) {
  using T = TypeParam;
  const uint64 primes[13] = {3, 5, 7, 13, 17, 19, 23, 37, 47, 59, 61, 67, 71};
  CNaxRandom<T> random;
  for (uint64 seed : {0ull, 1ull, 12ull, 4000000000ull, 0xdeadbeefcafef00dull}) {
    const uint64 m = 2971215073ull * seed * primes[seed % 13];
    random.SetXorshift32Seed(uint32(seed));
    const uint64 m32s = 2971215073ull * uint32(seed) * primes[uint32(seed) % 13];
    const uint32 m32 = uint32(m32s);
    uint32 x, y, z, w;
    random.GetXorshift32Seeds(x, y, z, w);
    EXPECT_EQ(x, m32);
    EXPECT_EQ(y, (m32 << 5) ^ 0x75bcd15u);
    EXPECT_EQ(z, (m32 << 7) ^ 0x159a55e5u);
    EXPECT_EQ(w, (m32 >> 15) ^ 0x1f123bb5u);
    EXPECT_EQ(random.GetXorshift32Seed(), m32);
    random.SetXorshift64Seed(seed);
    uint64 a, b, c, d;
    random.GetXorshift64Seeds(a, b, c, d);
    EXPECT_EQ(a, m);
    EXPECT_EQ(b, (m << 13) ^ 0x139408dcbbf7a44ull);
    EXPECT_EQ(c, (m << 21) ^ 0x139408dcbbf7a44ull);
    EXPECT_EQ(d, (m << 9) ^ 0x7f4809ed9054adfull);
  }
  random.SetXorshift32Seed(0);
  uint32 x, y, z, w;
  random.GetXorshift32Seeds(x, y, z, w);
  EXPECT_EQ(x, 0u);
  EXPECT_EQ(y, 123456789u);
  EXPECT_EQ(z, 362436069u);
  EXPECT_EQ(w, 521288629u);
}

TYPED_TEST(RandomTest, NewObjectDrawsTheFixedUniformSequenceOnceInitialized) {
  using T = TypeParam;
  CNaxRandom<T> random;
  EXPECT_EQ(random.GetNumber(), T(0));
  EXPECT_EQ(random.GetBoolean(), 1);  // value 0 is below 0.5
  random.Initialize();
  Xor32 r32 = FixedXor32();
  for (int k = 0; k < 100; ++k) {
    const uint32 raw = r32.Next();
    const T expected = std::is_same_v<T, double> ? T(double(raw) * 1.0 / 4294967295.0)
                                                 : T(float(raw) * 1.0f * 2.3283064365386963e-10f);
    ASSERT_EQ(random.GetNumber(), expected) << k;
  }
  random.SetUniform(T(-2), T(6));
  EXPECT_EQ(random.GetNumber(), T(0));  // a setter clears the initialization
  random.Initialize();
  const uint32 raw = r32.Next();
  const T expected = std::is_same_v<T, double> ? T(double(raw) * 8.0 / 4294967295.0 - 2.0)
                                               : T(float(raw) * 8.0f * 2.3283064365386963e-10f - 2.0f);
  EXPECT_EQ(random.GetNumber(), expected);
}

// GetArrayNumbers runs a loop of its own for speed; it must give exactly the numbers of
// the same count of GetNumber calls, for every generator and distribution.
TYPED_TEST(RandomTest, ArrayDrawsEqualSingleDrawsForAllNinePairs) {
  using T = TypeParam;
  for (int32 algorithm = 0; algorithm < 3; ++algorithm) {
    for (int32 distribution = 0; distribution < 3; ++distribution) {
      CNaxRandom<T> random;
      random.SetAlgorithm(algorithm);
      if (distribution == 0) random.SetUniform(T(1), T(3));
      if (distribution == 1) random.SetNormal(T(2), T(0.5));
      if (distribution == 2) random.SetExponential(T(4));
      random.SetXorshift32Seed(77);
      random.SetXorshift64Seed(78);
      random.SetRandomSWBSeeds();  // Xorshift32 / 64 reseeded from the clock, ring filled
      random.Initialize();
      EXPECT_EQ(random.GetAlgorithm(), algorithm);
      EXPECT_EQ(random.GetDistribution(), distribution);
      CNaxRandom<T> copy = random;
      std::vector<T> many(3000), single(3000);
      random.GetArrayNumbers(3000, many.data());
      for (auto& v : single) v = copy.GetNumber();
      ASSERT_EQ(many, single) << algorithm << " " << distribution;
      EXPECT_EQ(random.Xorshift32(), copy.Xorshift32());
      EXPECT_EQ(random.Xorshift64(), copy.Xorshift64());
      EXPECT_EQ(random.SWB(), copy.SWB());
      random.GetArrayNumbers(0, many.data());
      random.GetArrayNumbers(-4, many.data());
      EXPECT_EQ(random.GetNumber(), copy.GetNumber());
    }
  }
}

struct Moments {
  double mean = 0, variance = 0;
};
template <typename T>
Moments MomentsOf(const std::vector<T>& v) {
  Moments m;
  for (T x : v) m.mean += x;
  m.mean /= v.size();
  for (T x : v) m.variance += (x - m.mean) * (x - m.mean);
  m.variance /= v.size() - 1;
  return m;
}

TYPED_TEST(RandomTest, DistributionsHaveTheirMomentsForEveryGenerator) {
  using T = TypeParam;
  const int n = 200000;
  for (int32 algorithm = 0; algorithm < 3; ++algorithm) {
    CNaxRandom<T> random;
    random.SetAlgorithm(algorithm);
    random.SetRandomSWBSeeds(uint32(algorithm));
    std::vector<T> v(n);

    random.SetUniform(T(-1), T(3));
    random.Initialize();
    random.GetArrayNumbers(n, v.data());
    Moments m = MomentsOf(v);
    EXPECT_NEAR(m.mean, 1.0, 5 * std::sqrt(16.0 / 12 / n)) << algorithm;
    EXPECT_NEAR(m.variance, 16.0 / 12, 0.02) << algorithm;
    for (T x : v) ASSERT_TRUE(x >= T(-1) && x <= T(3));

    random.SetNormal(T(3), T(2));
    random.Initialize();
    random.GetArrayNumbers(n, v.data());
    m = MomentsOf(v);
    EXPECT_NEAR(m.mean, 3.0, 5 * 2.0 / std::sqrt(double(n))) << algorithm;
    // The 64-bit member's unscaled wedge draw accepts nearly every wedge point, which
    // widens its distribution a little; the others are exact.
    EXPECT_NEAR(m.variance, 4.0, algorithm == 1 ? 0.2 : 0.05) << algorithm;
    if (algorithm != 1) {
      int below = 0, farOut = 0;
      for (T x : v) {
        below += (x - T(3)) / T(2) < T(1);
        farOut += std::fabs((x - T(3)) / T(2)) > T(3.442619855899);  // the tail beyond R
      }
      EXPECT_NEAR(below / double(n), 0.841345, 0.004) << algorithm;
      EXPECT_NEAR(farOut / double(n), 5.76e-4, 2.5e-4) << algorithm;
    }

    random.SetExponential(T(4));
    random.Initialize();
    random.GetArrayNumbers(n, v.data());
    m = MomentsOf(v);
    EXPECT_NEAR(m.mean, 0.25, 5 * 0.25 / std::sqrt(double(n))) << algorithm;
    EXPECT_NEAR(m.variance, 1.0 / 16, 0.003) << algorithm;
    for (T x : v) ASSERT_GE(x, T(0));
  }
}

TYPED_TEST(RandomTest, IntegerDrawsKeepTheirShares) {
  using T = TypeParam;
  CNaxRandom<T> random;
  EXPECT_EQ(random.GetIntegerNumber32(5, 5), 5);
  const uint32 before = random.GetXorshift32Seed();
  EXPECT_EQ(random.GetIntegerNumber32(5, 4), 5);
  EXPECT_EQ(random.GetIntegerNumber64(5, 4), 5);
  EXPECT_EQ(random.GetXorshift32Seed(), before);  // nothing drawn

  const int n = 120000;
  for (int32 algorithm = 0; algorithm < 3; ++algorithm) {
    random.SetAlgorithm(algorithm);
    std::vector<int> scalar32(5), scalar64(5), array32(5), array64(5);
    for (int k = 0; k < n; ++k) {
      const int32 a = random.GetIntegerNumber32(-2, 1);
      const int64 b = random.GetIntegerNumber64(-2, 1);
      ASSERT_TRUE(a >= -2 && a <= 2 && b >= -2 && b <= 1);
      ++scalar32[a + 2];
      ++scalar64[b + 2];
    }
    std::vector<int32> v32(n);
    std::vector<int64> v64(n);
    random.GetArrayIntegerNumbers32(-2, 1, n, v32.data());
    random.GetArrayIntegerNumbers64(-2, 1, n, v64.data());
    for (int k = 0; k < n; ++k) {
      ASSERT_TRUE(v32[k] >= -2 && v32[k] <= 1 && v64[k] >= -2 && v64[k] <= 1);
      ++array32[v32[k] + 2];
      ++array64[v64[k] + 2];
    }
    const double tol = 0.01;
    for (int k = 0; k < 4; ++k) EXPECT_NEAR(scalar32[k] / double(n), 0.25, tol) << algorithm;
    for (auto* counts : {&scalar64, &array32, &array64}) {  // ends at half a share
      EXPECT_NEAR((*counts)[0] / double(n), 1.0 / 6, tol) << algorithm;
      EXPECT_NEAR((*counts)[1] / double(n), 1.0 / 3, tol) << algorithm;
      EXPECT_NEAR((*counts)[2] / double(n), 1.0 / 3, tol) << algorithm;
      EXPECT_NEAR((*counts)[3] / double(n), 1.0 / 6, tol) << algorithm;
    }
  }
  std::vector<int32> same(10, 0);
  random.GetArrayIntegerNumbers32(7, 7, 10, same.data());
  for (int32 v : same) EXPECT_EQ(v, 7);
}

TEST(Random, IntegerDrawsFollowTheRoundingFormulas) {
  CNaxRandom<double> random, reference;
  for (int k = 0; k < 1000; ++k) {
    const double u = reference.GetXorshift32();
    const double s = (10 - 0.5) + u * 91;  // [10, 100]
    const int32 expected = int32(s >= 0 ? s + 0.5 : s - 0.5);
    ASSERT_EQ(random.GetIntegerNumber32(10, 100), expected);
    const double u64 = reference.GetXorshift64();
    ASSERT_EQ(random.GetIntegerNumber64(-50, 50), -50 + int64(u64 * 100 + 0.5));
  }
}

TEST(Random, ClockSeedingFollowsTheAlgorithmTable) {
  for (int attempt = 0; attempt < 3; ++attempt) {
    const std::time_t start = std::time(nullptr);
    CNaxRandom<double> random;
    random.SetXorshift32Seeds(1, 2, 3, 4);
    random.SetRandomSeeds(uint32(1000));
    const uint32 v = 1000u - uint32(std::time(nullptr));
    uint32 x, y, z, w;
    random.GetXorshift32Seeds(x, y, z, w);
    if (std::time(nullptr) != start) continue;  // the second changed under us
    EXPECT_EQ(x, v + 4u);
    EXPECT_EQ(y, x ^ (x << 5));
    EXPECT_EQ(z, (x >> 7) ^ (y << 13));
    EXPECT_EQ(w, (y << 11) ^ (z >> 3));

    // For Xorshift64 the ring comes from the untouched 32-bit generator.
    random.SetAlgorithm(naxRandomAlgorithmXorshift64);
    CNaxRandom<double> copy = random;
    random.SetXorshift64Seeds(9, 8, 7, 6);
    random.SetRandomSWBSeeds();
    uint64 a, b, c, d;
    random.GetXorshift64Seeds(a, b, c, d);
    if (std::time(nullptr) != start) continue;
    EXPECT_EQ(a, 6ull - uint64(start));
    EXPECT_EQ(d, (b << 21) ^ (c >> 7));
    std::vector<double> ring(32);
    random.GetSWBSeeds(ring.data());
    for (int k = 0; k < 32; ++k) EXPECT_EQ(ring[k], copy.GetXorshift32());

    // For SWB the xorshift forms do nothing and the others only refill the ring.
    random.SetAlgorithm(naxRandomAlgorithmSWB);
    copy = random;
    random.SetRandomXorshiftSeeds();
    random.SetRandomSeeds();
    random.GetSWBSeeds(ring.data());
    for (int k = 0; k < 32; ++k) EXPECT_EQ(ring[k], copy.GetXorshift32());
    EXPECT_EQ(random.GetXorshift64Seed(), copy.GetXorshift64Seed());
    return;
  }
  GTEST_SKIP() << "the clock kept changing";
}

TEST(Random, BooleanComparesWithOneHalfWhateverTheDistribution) {
  CNaxRandom<double> random;
  random.SetNormal(10, 1);  // values far above 0.5
  random.Initialize();
  int ones = 0;
  for (int k = 0; k < 1000; ++k) ones += random.GetBoolean();
  EXPECT_EQ(ones, 0);
  random.SetUniform(0, 1);
  random.Initialize();
  for (int k = 0; k < 10000; ++k) ones += random.GetBoolean();
  EXPECT_NEAR(ones / 10000.0, 0.5, 0.03);
}

}  // namespace
