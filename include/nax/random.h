// Pseudo-random numbers: three generators (xorshift of 32 and 64 bits, subtract with
// borrow) and three distributions (uniform, normal, exponential), for float and double.
//
// A seeded generator gives the same sequence on every machine. The drawing function of
// the chosen generator and distribution is picked once by Initialize and called through
// a member pointer, so that drawing has no branch on the choice.
//
// References: G. Marsaglia, "Xorshift RNGs", Journal of Statistical Software 8(14), 2003;
// G. Marsaglia and A. Zaman, "A new class of random number generators", The Annals of
// Applied Probability 1(3), 1991, 462-480; G. Marsaglia and W. W. Tsang, "The ziggurat
// method for generating random variables", Journal of Statistical Software 5(8), 2000;
// J. A. Doornik, "An improved ziggurat method to generate normal random samples", 2005.
#ifndef NAX_RANDOM_H
#define NAX_RANDOM_H

#include <cmath>
#include <ctime>

#include "nax/types.h"

/// Generators of CNaxRandom, passed as int32.
enum naxRandomAlgorithm {
  naxRandomAlgorithmXorshift32 = 0,  ///< xorshift on four 32-bit words (the default)
  naxRandomAlgorithmXorshift64 = 1,  ///< xorshift on four 64-bit words
  naxRandomAlgorithmSWB = 2          ///< subtract with borrow on a ring of 32 values
};

/// Distributions of CNaxRandom, passed as int32.
enum naxRandomDistribution {
  naxRandomDistributionUniform = 0,     ///< uniform on [low, high] (the default, [0, 1])
  naxRandomDistributionNormal = 1,      ///< normal with a mean and a standard deviation
  naxRandomDistributionExponential = 2  ///< exponential with a rate
};

namespace nax::detail {

/// Borrow unit of the subtract-with-borrow generator, 2^-153 (bits 0x3660000000000000).
/// Converted to float it underflows to 0, and the float ring runs without a borrow.
inline constexpr double kSwbBorrowUnit = 0x1p-153;

/// Scales and constants of the float and double generators.
template <typename T>
struct RandomConstants;

template <>
struct RandomConstants<double> {
  /// A 32-bit raw number on [0, 1].
  static double Unit32(uint32 raw) { return double(raw) / 4294967295.0; }
  /// raw * range / (2^32 - 1) + low, the multiplication first.
  static double Uniform32(uint32 raw, double low, double range) {
    return double(raw) * range / 4294967295.0 + low;
  }
  /// A 32-bit raw number on [-1, 1]: divide, double, subtract 1.
  static double Signed32(uint32 raw) { return double(raw) / 4294967295.0 * 2.0 - 1.0; }
  static constexpr double kScale64 = 5.421010862427522e-20;    // 2^-64
  static constexpr double kSigned64 = 1.0842021724855044e-19;  // 2^-63
  static constexpr double kLogGuard = 1e-9;
  static constexpr double kLogFloor = -20.72326583694641;
  static constexpr double kR = 3.442619855899;
  static constexpr double kV = 0.00991256303526217;
  static constexpr double kTailDensity = 0.002669629083880923;  // exp(-R^2 / 2)
  static constexpr double kX0 = 3.7130862467425505;             // V / exp(-R^2 / 2)
};

template <>
struct RandomConstants<float> {
  static float Unit32(uint32 raw) { return float(raw) * 2.3283064365386963e-10f; }
  static float Uniform32(uint32 raw, float low, float range) {
    return float(raw) * range * 2.3283064365386963e-10f + low;
  }
  static float Signed32(uint32 raw) { return float(raw) * 4.656612873077393e-10f - 1.0f; }
  static constexpr float kScale64 = 5.421010862427522e-20f;
  static constexpr float kSigned64 = 1.0842021724855044e-19f;
  static constexpr float kLogGuard = 1e-7f;
  static constexpr float kLogFloor = -16.11809539794922f;
  static constexpr float kR = 3.442619800567627f;
  static constexpr float kV = 0.009912563487887383f;
  static constexpr float kTailDensity = 0.002669629408046603f;
  static constexpr float kX0 = 3.7130862467425505f;
};

/// log(p) for p above the guard (1e-9 / 1e-7f), else the log of the guard.
template <typename T>
inline T GuardedLog(T p) {
  return p > RandomConstants<T>::kLogGuard ? std::log(p) : RandomConstants<T>::kLogFloor;
}

/// Exact conversion of a 64-bit raw number, the same value as T(v) but without the
/// branch on the top bit that compilers emit for it (half of the draws would mispredict).
inline double ToReal(uint64 v, double) {
  // Both halves convert exactly and the one addition rounds once.
  return double(uint32(v >> 32)) * 4294967296.0 + double(uint32(v));
}
inline float ToReal(uint64 v, float) {
  // Below 2^63 the signed conversion is exact; above, halving with a sticky low bit keeps
  // the rounding (the number has far more than 26 significant bits).
  const float direct = float(int64(v & 0x7fffffffffffffffull));
  const float halved = float(int64((v >> 1) | (v & 1u))) * 2.0f;
  return int64(v) < 0 ? halved : direct;
}

/// The 32-bit xorshift generator with its four words held in locals; Store writes them
/// back. Unit, Signed and Uniform are scaled draws, Layer the low seven bits of a step.
template <typename T>
class Xorshift32Engine {
 public:
  explicit Xorshift32Engine(uint32* state)
      : s(state), x(state[0]), y(state[1]), z(state[2]), w(state[3]) {}
  void Store() const {
    s[0] = x;
    s[1] = y;
    s[2] = z;
    s[3] = w;
  }
  uint32 Next() {
    const uint32 t = x ^ (x << 11);
    x = y;
    y = z;
    z = w;
    w = w ^ (w >> 19) ^ t ^ (t >> 8);
    return w;
  }
  T Unit() { return RandomConstants<T>::Unit32(Next()); }
  T Signed() { return RandomConstants<T>::Signed32(Next()); }
  T Uniform(T low, T range) { return RandomConstants<T>::Uniform32(Next(), low, range); }
  uint32 Layer() { return Next() & 0x7Fu; }
  T WedgeDraw() { return Unit(); }

 private:
  uint32* s;
  uint32 x, y, z, w;
};

/// The 64-bit xorshift generator. Its wedge draw is the raw number unscaled, which makes
/// nearly every wedge test of its normal draw succeed: that distribution is kept as is.
template <typename T>
class Xorshift64Engine {
 public:
  explicit Xorshift64Engine(uint64* state)
      : s(state), a(state[0]), b(state[1]), c(state[2]), d(state[3]) {}
  void Store() const {
    s[0] = a;
    s[1] = b;
    s[2] = c;
    s[3] = d;
  }
  uint64 Next() {
    const uint64 t = a ^ (a << 13);
    a = b;
    b = c;
    c = d;
    d = d ^ (d >> 17) ^ t ^ (t >> 7);
    return d;
  }
  T Unit() { return ToReal(Next(), T()) * RandomConstants<T>::kScale64; }
  T Signed() { return ToReal(Next(), T()) * RandomConstants<T>::kSigned64 - T(1); }
  T Uniform(T low, T range) {
    return ToReal(Next(), T()) * range * RandomConstants<T>::kScale64 + low;
  }
  uint32 Layer() { return uint32(Next() & 0x7Fu); }
  T WedgeDraw() { return ToReal(Next(), T()); }

 private:
  uint64* s;
  uint64 a, b, c, d;
};

/// The subtract-with-borrow generator on its ring of 32 values in (0, 1]. Its normal
/// draw takes the layer from the 32-bit xorshift generator, which it advances too.
template <typename T>
class SwbEngine {
 public:
  SwbEngine(T* ringValues, int32* ringIndex, T* ringCarry, T borrowUnit, uint32* xorshift32)
      : ring(ringValues), indexOut(ringIndex), carryOut(ringCarry), index(*ringIndex),
        carry(*ringCarry), borrow(borrowUnit), layers(xorshift32) {}
  void Store() const {
    *indexOut = index;
    *carryOut = carry;
    layers.Store();
  }
  /// One step: ring[i] = ring[i - 12] - ring[i - 27] - carry, plus 1 with a new borrow
  /// when that is not positive. The index is kept as stored (a negative one included) and
  /// addresses the ring modulo 32.
  T Next() {
    // Without a branch: the sign of t is a coin toss and a branch would mispredict.
    // With gradual underflow d - carry > 0 exactly when d > carry, and adding 0 or
    // multiplying by 0 and 1 is exact, so this is the plain rule with a shorter chain.
    const T d = ring[(index + 20) & 31] - ring[(index + 5) & 31];
    const T t0 = d - carry;
    const T wrap = T(!(d > carry));
    carry = wrap * borrow;
    const T t = t0 + wrap;
    ring[index & 31] = t;
    if (++index == 32) index = 0;
    return t;
  }
  T Unit() { return Next(); }
  T Signed() { return T(2) * Next() - T(1); }
  T Uniform(T low, T range) { return Next() * range + low; }
  uint32 Layer() { return layers.Next() & 0x7Fu; }
  T WedgeDraw() { return Next(); }

 private:
  T* ring;
  int32* indexOut;
  T* carryOut;
  int32 index;
  T carry;
  T borrow;
  Xorshift32Engine<T> layers;
};

/// A standard normal draw by the 128-layer ziggurat; x holds the 129 layer abscissas and
/// ratio their 128 successive quotients.
template <typename T, typename Engine>
inline T ZigguratNormal(Engine& g, const T* x, const T* ratio) {
  using C = RandomConstants<T>;
  for (;;) {
    const T u = g.Signed();
    const uint32 i = g.Layer();
    if (ratio[i] > std::fabs(u)) return u * x[i];
    if (i == 0) {  // the tail beyond R
      T tx, ty;
      do {
        tx = GuardedLog(g.Unit()) / C::kR;
        ty = T(-2) * GuardedLog(g.Unit());
      } while (!(tx * tx <= ty));
      const T s = tx - C::kR;
      return u < T(0) ? s : -s;
    }
    const T v = u * x[i];
    const T f1 = std::exp(T(-0.5) * (x[i + 1] * x[i + 1] - v * v));
    const T f0 = std::exp(T(-0.5) * (x[i] * x[i] - v * v));
    if (T(1) > f1 + (f0 - f1) * g.WedgeDraw()) return v;
  }
}

/// Two's complement bits of v rounded half away from zero (add or subtract 0.5, then
/// truncate); magnitudes of 2^64 and more saturate.
template <typename T>
inline uint64 RoundedBits(T v) {
  const T limit = T(18446744073709551616.0);
  const T magnitude = std::fabs(v) + T(0.5);
  const uint64 r = magnitude >= limit ? ~uint64(0) : uint64(magnitude);
  return v < T(0) ? uint64(0) - r : r;
}

}  // namespace nax::detail

/// Source of pseudo-random numbers of type T (float or double).
///
/// One object holds the states of the three generators and the parameters of the three
/// distributions. Choose with SetAlgorithm and SetUniform / SetNormal / SetExponential,
/// call Initialize, then draw with GetNumber or GetArrayNumbers. A new object's xorshift
/// generators start from fixed states (the same sequence in every run); its ring starts
/// from the clock.
template <typename T>
class CNaxRandom {
  static_assert(nax::detail::kIsReal<T>, "CNaxRandom is instantiated for float and double only");

 public:
  /// A drawing function of one generator and one distribution.
  typedef T (CNaxRandom::*NumberMethod)();

  /// Uniform on [0, 1] by Xorshift32, not initialized (GetNumber gives 0 until
  /// Initialize). The xorshift states are fixed; the ring comes from the clock.
  CNaxRandom();

  /// Chooses the generator (naxRandomAlgorithm); the object must be initialized again.
  void SetAlgorithm(int32 newAlgorithm) {
    algorithm = newAlgorithm;
    initialized = 0;
  }
  /// Uniform distribution on [low, high]; the object must be initialized again.
  void SetUniform(T low, T high) {
    distribution = naxRandomDistributionUniform;
    uniformLow = low;
    uniformRange = high - low;
    initialized = 0;
  }
  /// Normal distribution with mean and standard deviation sigma; initialize again.
  void SetNormal(T mean, T sigma) {
    distribution = naxRandomDistributionNormal;
    normalMean = mean;
    normalSigma = sigma;
    initialized = 0;
  }
  /// Exponential distribution of the given rate (mean 1 / rate); initialize again.
  void SetExponential(T rate) {
    distribution = naxRandomDistributionExponential;
    exponentialRate = rate;
    initialized = 0;
  }
  int32 GetAlgorithm() const { return algorithm; }
  int32 GetDistribution() const { return distribution; }

  /// Chooses the drawing function, sets the borrow unit and builds the ziggurat tables.
  void Initialize() {
    numberMethod = GetChooseNumberMethod();
    swbBorrow = static_cast<T>(nax::detail::kSwbBorrowUnit);
    CreateZigguratTables();
    initialized = 1;
  }
  /// The drawing function of the current distribution and generator; null for an
  /// unknown distribution, the Xorshift32 member for an unknown generator.
  NumberMethod GetChooseNumberMethod() const;
  /// Builds the layer abscissas of the normal ziggurat and their ratios.
  void CreateZigguratTables();

  /// One number of the chosen distribution; 0 when not initialized.
  T GetNumber() { return initialized ? (this->*numberMethod)() : T(0); }
  /// `count` numbers into `values` when initialized and count > 0; else nothing.
  void GetArrayNumbers(int32 count, T* values);
  /// 1 when GetNumber gives a value below 0.5, else 0 (so 1 when not initialized).
  int32 GetBoolean() { return GetNumber() < T(0.5) ? 1 : 0; }

  /// An integer of [low, high], each with an equal share (u = 1 gives high + 1); low when
  /// high <= low. Xorshift32, or SWB when that is the algorithm.
  int32 GetIntegerNumber32(int32 low, int32 high);
  /// low + the rounding of u (high - low): the two ends get half a share; low when
  /// high <= low. Xorshift64, or SWB when that is the algorithm.
  int64 GetIntegerNumber64(int64 low, int64 high);
  /// `count` integers low + round(u (high - low)) (ends at half share); all low when
  /// high equals low. Xorshift32, or SWB when that is the algorithm.
  void GetArrayIntegerNumbers32(int32 low, int32 high, int32 count, int32* values);
  /// As the 32-bit form with Xorshift64, or SWB when that is the algorithm.
  void GetArrayIntegerNumbers64(int64 low, int64 high, int64 count, int64* values);

  /// One raw step of the 32-bit xorshift generator.
  uint32 Xorshift32();
  /// One raw step of the 64-bit xorshift generator.
  uint64 Xorshift64();
  /// One step of the subtract-with-borrow generator: the new ring value, in (0, 1].
  T SWB();
  /// One Xorshift32 step scaled to [0, 1].
  T GetXorshift32();
  /// One Xorshift64 step scaled to [0, 1].
  T GetXorshift64();

  /// Drawing functions of the nine pairs of distribution and generator. The normal ones
  /// need the tables of Initialize.
  T GetUniformXorshift32() { return DrawOne<0, 0>(); }
  T GetUniformXorshift64() { return DrawOne<1, 0>(); }
  T GetUniformSWB() { return DrawOne<2, 0>(); }
  T GetNormalXorshift32() { return DrawOne<0, 1>(); }
  T GetNormalXorshift64() { return DrawOne<1, 1>(); }
  T GetNormalSWB() { return DrawOne<2, 1>(); }
  T GetExponentialXorshift32() { return DrawOne<0, 2>(); }
  T GetExponentialXorshift64() { return DrawOne<1, 2>(); }
  T GetExponentialSWB() { return DrawOne<2, 2>(); }

  /// Xorshift32 state from one seed, mixed by a table of primes.
  void SetXorshift32Seed(uint32 seed);
  /// Xorshift64 state from one seed, mixed by the same table.
  void SetXorshift64Seed(uint64 seed);
  /// The four Xorshift32 words as given.
  void SetXorshift32Seeds(uint32 x, uint32 y, uint32 z, uint32 w);
  /// The four Xorshift64 words as given.
  void SetXorshift64Seeds(uint64 a, uint64 b, uint64 c, uint64 d);
  /// The first Xorshift32 word.
  uint32 GetXorshift32Seed() const { return xorshift32State[0]; }
  /// The first Xorshift64 word.
  uint64 GetXorshift64Seed() const { return xorshift64State[0]; }
  void GetXorshift32Seeds(uint32& x, uint32& y, uint32& z, uint32& w) const;
  void GetXorshift64Seeds(uint64& a, uint64& b, uint64& c, uint64& d) const;
  /// Copies the 32 ring values of the SWB generator in.
  void SetSWBSeeds(const T* seeds);
  /// Copies the 32 ring values out.
  void GetSWBSeeds(T* seeds) const;
  /// Ring position (reduced by the truncating remainder by 32) and current borrow.
  void SetSWBState(int32 index, T carry) {
    swbIndex = index % 32;
    swbCarry = carry;
  }
  void GetSWBState(int32& index, T& carry) const {
    index = swbIndex;
    carry = swbCarry;
  }

  /// Reseeds the chosen generator from the clock (whole seconds): a xorshift state is
  /// mixed with -now; for SWB the ring is refilled from the Xorshift32 generator.
  void SetRandomSeeds() { SeedFromClock(kAnyGenerator, 0, 0); }
  /// As above with seed - now.
  void SetRandomSeeds(uint32 seed) { SeedFromClock(kAnyGenerator, seed, seed); }
  void SetRandomSeeds(uint64 seed) { SeedFromClock(kAnyGenerator, uint32(seed), seed); }
  /// Reseeds the chosen xorshift generator from the clock; nothing for SWB.
  void SetRandomXorshiftSeeds() { SeedFromClock(kXorshiftOnly, 0, 0); }
  void SetRandomXorshiftSeeds(uint32 seed) { SeedFromClock(kXorshiftOnly, seed, seed); }
  void SetRandomXorshiftSeeds(uint64 seed) { SeedFromClock(kXorshiftOnly, uint32(seed), seed); }
  /// Reseeds the chosen xorshift generator from the clock, then refills the ring from
  /// the Xorshift32 generator; for SWB only the refill.
  void SetRandomSWBSeeds() { SeedFromClock(kRing, 0, 0); }
  void SetRandomSWBSeeds(uint32 seed) { SeedFromClock(kRing, seed, seed); }
  void SetRandomSWBSeeds(uint64 seed) { SeedFromClock(kRing, uint32(seed), seed); }

 private:
  enum SeedTarget { kAnyGenerator, kXorshiftOnly, kRing };

  template <int Algorithm>
  auto MakeEngine() {
    if constexpr (Algorithm == 0) {
      return nax::detail::Xorshift32Engine<T>(xorshift32State);
    } else if constexpr (Algorithm == 1) {
      return nax::detail::Xorshift64Engine<T>(xorshift64State);
    } else {
      return nax::detail::SwbEngine<T>(swbState, &swbIndex, &swbCarry, swbBorrow,
                                       xorshift32State);
    }
  }
  /// One raw step of a generator, its state written back.
  template <int Algorithm>
  auto StepOnce() {
    auto g = MakeEngine<Algorithm>();
    const auto raw = g.Next();
    g.Store();
    return raw;
  }
  /// `count` draws of one distribution and generator, the state kept in locals.
  template <int Algorithm, int Distribution>
  void DrawMany(int32 count, T* values);
  template <int Algorithm, int Distribution>
  T DrawOne() {
    T value;
    DrawMany<Algorithm, Distribution>(1, &value);
    return value;
  }
  template <typename Engine>
  void FillIntegers32(Engine g, int32 low, T width, int32 count, int32* values);
  template <typename Engine>
  void FillIntegers64(Engine g, int64 low, T width, int64 count, int64* values);
  void Reseed32(uint32 v);
  void Reseed64(uint64 v);
  void FillRing();
  void SeedFromClock(SeedTarget target, uint32 seed32, uint64 seed64);

  NumberMethod numberMethod = nullptr;
  int32 algorithm = naxRandomAlgorithmXorshift32;
  int32 distribution = naxRandomDistributionUniform;
  int32 initialized = 0;
  T uniformLow = T(0);
  T uniformRange = T(1);
  uint32 xorshift32State[4] = {0, 0, 0, 0};
  uint64 xorshift64State[4] = {0, 0, 0, 0};
  T swbState[32] = {};
  T swbCarry = T(0);
  T swbBorrow = T(0);
  int32 swbIndex = 0;
  T normalMean = T(0);
  T normalSigma = T(1);
  T zigguratX[129] = {};
  T zigguratRatio[128] = {};
  T exponentialRate = T(1);
};

template <typename T>
CNaxRandom<T>::CNaxRandom() {
  Reseed32(uint32(0) - uint32(std::time(nullptr)));
  SetRandomSWBSeeds();
  swbCarry = T(0);
  swbBorrow = static_cast<T>(nax::detail::kSwbBorrowUnit);
  swbIndex = 0;
  SetXorshift32Seeds(123456789u, 362436069u, 521288629u, 88675123u);
  SetXorshift64Seeds(88172645463325252ull, 0x7f4809ed9054adfull, 0x62c6c85408a4c66cull,
                     0x908fac67fa2a9a82ull);
}

template <typename T>
typename CNaxRandom<T>::NumberMethod CNaxRandom<T>::GetChooseNumberMethod() const {
  static constexpr NumberMethod kMethods[3][3] = {
      {&CNaxRandom::GetUniformXorshift32, &CNaxRandom::GetUniformXorshift64,
       &CNaxRandom::GetUniformSWB},
      {&CNaxRandom::GetNormalXorshift32, &CNaxRandom::GetNormalXorshift64,
       &CNaxRandom::GetNormalSWB},
      {&CNaxRandom::GetExponentialXorshift32, &CNaxRandom::GetExponentialXorshift64,
       &CNaxRandom::GetExponentialSWB}};
  if (distribution < 0 || distribution > 2) return nullptr;
  const int32 generator = (algorithm == 1 || algorithm == 2) ? algorithm : 0;
  return kMethods[distribution][generator];
}

template <typename T>
void CNaxRandom<T>::CreateZigguratTables() {
  using C = nax::detail::RandomConstants<T>;
  zigguratX[0] = C::kX0;
  zigguratX[1] = C::kR;
  zigguratX[128] = T(0);
  T f = C::kTailDensity;
  for (int32 i = 2; i <= 127; ++i) {
    f += C::kV / zigguratX[i - 1];
    const T l = f > C::kLogGuard ? std::log(f) : C::kLogFloor;
    const T v = T(-2) * l;
    zigguratX[i] = C::kLogGuard > std::fabs(v) ? T(0) : std::sqrt(v);
    f = std::exp(T(-0.5) * zigguratX[i] * zigguratX[i]);
  }
  for (int32 i = 0; i < 128; ++i) zigguratRatio[i] = zigguratX[i + 1] / zigguratX[i];
}

template <typename T>
template <int Algorithm, int Distribution>
void CNaxRandom<T>::DrawMany(int32 count, T* values) {
  auto g = MakeEngine<Algorithm>();
  if constexpr (Distribution == 0) {
    const T low = uniformLow;
    const T range = uniformRange;
    for (int32 k = 0; k < count; ++k) values[k] = g.Uniform(low, range);
  } else if constexpr (Distribution == 1) {
    const T mean = normalMean;
    const T sigma = normalSigma;
    for (int32 k = 0; k < count; ++k) {
      values[k] = nax::detail::ZigguratNormal(g, zigguratX, zigguratRatio) * sigma + mean;
    }
  } else {
    const T rate = exponentialRate;
    for (int32 k = 0; k < count; ++k) values[k] = -nax::detail::GuardedLog(g.Unit()) / rate;
  }
  g.Store();
}

template <typename T>
void CNaxRandom<T>::GetArrayNumbers(int32 count, T* values) {
  if (!initialized || count <= 0) return;
  // The whole array goes to the loop of the chosen drawing function, which keeps the
  // generator in registers; this gives the same numbers as `count` calls of it.
  typedef void (CNaxRandom::*ManyMethod)(int32, T*);
  static constexpr struct {
    NumberMethod one;
    ManyMethod many;
  } kLoops[9] = {
      {&CNaxRandom::GetUniformXorshift32, &CNaxRandom::DrawMany<0, 0>},
      {&CNaxRandom::GetUniformXorshift64, &CNaxRandom::DrawMany<1, 0>},
      {&CNaxRandom::GetUniformSWB, &CNaxRandom::DrawMany<2, 0>},
      {&CNaxRandom::GetNormalXorshift32, &CNaxRandom::DrawMany<0, 1>},
      {&CNaxRandom::GetNormalXorshift64, &CNaxRandom::DrawMany<1, 1>},
      {&CNaxRandom::GetNormalSWB, &CNaxRandom::DrawMany<2, 1>},
      {&CNaxRandom::GetExponentialXorshift32, &CNaxRandom::DrawMany<0, 2>},
      {&CNaxRandom::GetExponentialXorshift64, &CNaxRandom::DrawMany<1, 2>},
      {&CNaxRandom::GetExponentialSWB, &CNaxRandom::DrawMany<2, 2>}};
  for (const auto& loop : kLoops) {
    if (loop.one == numberMethod) {
      (this->*loop.many)(count, values);
      return;
    }
  }
  for (int32 k = 0; k < count; ++k) values[k] = (this->*numberMethod)();
}

template <typename T>
template <typename Engine>
void CNaxRandom<T>::FillIntegers32(Engine g, int32 low, T width, int32 count, int32* values) {
  for (int32 k = 0; k < count; ++k) {
    values[k] = int32(uint32(uint64(int64(low)) + nax::detail::RoundedBits(g.Unit() * width)));
  }
  g.Store();
}

template <typename T>
template <typename Engine>
void CNaxRandom<T>::FillIntegers64(Engine g, int64 low, T width, int64 count, int64* values) {
  for (int64 k = 0; k < count; ++k) {
    values[k] = int64(uint64(low) + nax::detail::RoundedBits(g.Unit() * width));
  }
  g.Store();
}

template <typename T>
int32 CNaxRandom<T>::GetIntegerNumber32(int32 low, int32 high) {
  if (high <= low) return low;
  const T u = algorithm == naxRandomAlgorithmSWB ? SWB() : GetXorshift32();
  const T width = T(int64(high) - int64(low) + 1);
  const T s = (T(low) - T(0.5)) + u * width;
  return int32(uint32(nax::detail::RoundedBits(s)));
}

template <typename T>
int64 CNaxRandom<T>::GetIntegerNumber64(int64 low, int64 high) {
  if (high <= low) return low;
  const T u = algorithm == naxRandomAlgorithmSWB ? SWB() : GetXorshift64();
  const T width = T(uint64(high) - uint64(low));
  return int64(uint64(low) + nax::detail::RoundedBits(u * width));
}

template <typename T>
void CNaxRandom<T>::GetArrayIntegerNumbers32(int32 low, int32 high, int32 count,
                                             int32* values) {
  if (count <= 0) return;
  if (high == low) {
    for (int32 k = 0; k < count; ++k) values[k] = low;
    return;
  }
  const T width = T(int64(high) - int64(low));
  if (algorithm == naxRandomAlgorithmSWB) {
    FillIntegers32(MakeEngine<2>(), low, width, count, values);
  } else {
    FillIntegers32(MakeEngine<0>(), low, width, count, values);
  }
}

template <typename T>
void CNaxRandom<T>::GetArrayIntegerNumbers64(int64 low, int64 high, int64 count,
                                             int64* values) {
  if (count <= 0) return;
  if (high == low) {
    for (int64 k = 0; k < count; ++k) values[k] = low;
    return;
  }
  const T width = high > low ? T(uint64(high) - uint64(low)) : -T(uint64(low) - uint64(high));
  if (algorithm == naxRandomAlgorithmSWB) {
    FillIntegers64(MakeEngine<2>(), low, width, count, values);
  } else {
    FillIntegers64(MakeEngine<1>(), low, width, count, values);
  }
}

template <typename T>
uint32 CNaxRandom<T>::Xorshift32() {
  return StepOnce<0>();
}

template <typename T>
uint64 CNaxRandom<T>::Xorshift64() {
  return StepOnce<1>();
}

template <typename T>
T CNaxRandom<T>::SWB() {
  return StepOnce<2>();
}

template <typename T>
T CNaxRandom<T>::GetXorshift32() {
  return nax::detail::RandomConstants<T>::Unit32(Xorshift32());
}

template <typename T>
T CNaxRandom<T>::GetXorshift64() {
  return nax::detail::ToReal(Xorshift64(), T()) * nax::detail::RandomConstants<T>::kScale64;
}

namespace nax::detail {
/// Multipliers of the one-word seeding, chosen by the seed modulo 13.
inline constexpr uint64 kSeedPrimes[13] = {3, 5, 7, 13, 17, 19, 23, 37, 47, 59, 61, 67, 71};
inline uint64 MixSeed(uint64 seed) { return 2971215073ull * seed * kSeedPrimes[seed % 13]; }
}  // namespace nax::detail

template <typename T>
void CNaxRandom<T>::SetXorshift32Seed(uint32 seed) {
  const uint32 m = uint32(nax::detail::MixSeed(seed));
  SetXorshift32Seeds(m, (m << 5) ^ 0x75bcd15u, (m << 7) ^ 0x159a55e5u, (m >> 15) ^ 0x1f123bb5u);
}

template <typename T>
void CNaxRandom<T>::SetXorshift64Seed(uint64 seed) {
  const uint64 m = nax::detail::MixSeed(seed);
  SetXorshift64Seeds(m, (m << 13) ^ 0x139408dcbbf7a44ull, (m << 21) ^ 0x139408dcbbf7a44ull,
                     (m << 9) ^ 0x7f4809ed9054adfull);
}

template <typename T>
void CNaxRandom<T>::SetXorshift32Seeds(uint32 x, uint32 y, uint32 z, uint32 w) {
  xorshift32State[0] = x;
  xorshift32State[1] = y;
  xorshift32State[2] = z;
  xorshift32State[3] = w;
}

template <typename T>
void CNaxRandom<T>::SetXorshift64Seeds(uint64 a, uint64 b, uint64 c, uint64 d) {
  xorshift64State[0] = a;
  xorshift64State[1] = b;
  xorshift64State[2] = c;
  xorshift64State[3] = d;
}

template <typename T>
void CNaxRandom<T>::GetXorshift32Seeds(uint32& x, uint32& y, uint32& z, uint32& w) const {
  x = xorshift32State[0];
  y = xorshift32State[1];
  z = xorshift32State[2];
  w = xorshift32State[3];
}

template <typename T>
void CNaxRandom<T>::GetXorshift64Seeds(uint64& a, uint64& b, uint64& c, uint64& d) const {
  a = xorshift64State[0];
  b = xorshift64State[1];
  c = xorshift64State[2];
  d = xorshift64State[3];
}

template <typename T>
void CNaxRandom<T>::SetSWBSeeds(const T* seeds) {
  for (int32 k = 0; k < 32; ++k) swbState[k] = seeds[k];
}

template <typename T>
void CNaxRandom<T>::GetSWBSeeds(T* seeds) const {
  for (int32 k = 0; k < 32; ++k) seeds[k] = swbState[k];
}

template <typename T>
void CNaxRandom<T>::Reseed32(uint32 v) {
  uint32* s = xorshift32State;
  s[0] = v + s[3];
  s[1] = s[0] ^ (s[0] << 5);
  s[2] = (s[0] >> 7) ^ (s[1] << 13);
  s[3] = (s[1] << 11) ^ (s[2] >> 3);
}

template <typename T>
void CNaxRandom<T>::Reseed64(uint64 v) {
  uint64* s = xorshift64State;
  s[0] = v + s[3];
  s[1] = s[0] ^ (s[0] << 11);
  s[2] = (s[0] >> 13) ^ (s[1] << 27);
  s[3] = (s[1] << 21) ^ (s[2] >> 7);
}

template <typename T>
void CNaxRandom<T>::FillRing() {
  auto g = MakeEngine<0>();
  for (int32 k = 0; k < 32; ++k) swbState[k] = g.Unit();
  g.Store();
}

template <typename T>
void CNaxRandom<T>::SeedFromClock(SeedTarget target, uint32 seed32, uint64 seed64) {
  const int64 now = int64(std::time(nullptr));
  if (algorithm == naxRandomAlgorithmXorshift32) {
    Reseed32(seed32 - uint32(now));
  } else if (algorithm == naxRandomAlgorithmXorshift64) {
    Reseed64(seed64 - uint64(now));
  } else if (algorithm != naxRandomAlgorithmSWB) {
    return;  // an unknown generator is left alone
  }
  if (target == kRing || (target == kAnyGenerator && algorithm == naxRandomAlgorithmSWB)) {
    FillRing();
  }
}

extern template class CNaxRandom<float>;
extern template class CNaxRandom<double>;

#endif  // NAX_RANDOM_H
