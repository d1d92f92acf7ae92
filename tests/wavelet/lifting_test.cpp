// Lifting steps: hand-computed values of the two-tap fast path, the mirror rule of the
// four- and six-tap steps, forms A and B, and the inverse steps.
#include "nax/lifting.h"
#include "wavelet_test_support.h"

namespace {

using nax_test::RealTypes;

template <typename T>
class LiftingTest : public ::testing::Test {};
TYPED_TEST_SUITE(LiftingTest, RealTypes);

// One row of `n` samples with first absolute coordinate `offset`, split into low and high
// halves by the channel's shape rule.
template <typename T>
struct RowPair {
  CNaxChannel<T> low, high;
  RowPair(const std::vector<T>& lowData, int32 lowOffset, const std::vector<T>& highData,
          int32 highOffset, int32 rows = 1)
      : low(static_cast<int32>(lowData.size()) / rows, rows, lowData.data(), lowOffset, 0),
        high(static_cast<int32>(highData.size()) / rows, rows, highData.data(), highOffset, 0) {}
  T L(int32 i) const { return low.GetData()[i]; }
  T H(int32 i) const { return high.GetData()[i]; }
};

TYPED_TEST(LiftingTest, TwoTapStepsByHand) {
  using T = TypeParam;
  const T dual[2] = {T(-0.5), T(-0.5)}, prime[2] = {T(0.25), T(0.25)};
  {  // five samples from an even start: low 3, high 2; no border term in the predict
    RowPair<T> p({1, 3, 5}, 0, {10, 20}, 0);
    CNaxLifting<T> lift(&p.low, &p.high, 1);
    EXPECT_EQ(lift.GetEven(), p.low.GetData());
    lift.LiftUsing2Coef(0, dual, naxChannelRows);  // form A
    EXPECT_EQ(p.H(0), T(8));
    EXPECT_EQ(p.H(1), T(16));
    lift.LiftUsing2Coef(1, prime, naxChannelRows);  // form B, the target is longer
    EXPECT_EQ(p.L(0), T(5));   // 1 + 0.5 * 8
    EXPECT_EQ(p.L(1), T(9));   // 3 + 0.25 * 8 + 0.25 * 16
    EXPECT_EQ(p.L(2), T(13));  // 5 + 0.5 * 16
  }
  {  // equal lengths: the last target takes (c0 + c1) * src[last]
    RowPair<T> p({1, 3}, 0, {10, 20}, 0);
    CNaxLifting<T> lift(&p.low, &p.high, 1);
    lift.LiftUsing2Coef(0, dual, naxChannelRows);
    EXPECT_EQ(p.H(1), T(17));
  }
}

TYPED_TEST(LiftingTest, OddStartPutsTheHighHalfFirst) {
  using T = TypeParam;
  // Four samples from X = 1: high at X = 1, 3 (offset 0), low at X = 2, 4 (offset 1).
  RowPair<T> p({1, 5}, 1, {10, 20}, 0);
  CNaxLifting<T> lift(&p.low, &p.high, 1);
  EXPECT_EQ(lift.GetEven(), p.high.GetData());
  EXPECT_EQ(lift.GetOdd(), p.low.GetData());
  const T dual[2] = {T(-0.5), T(-0.5)}, prime[2] = {T(0.25), T(0.25)};
  lift.LiftUsing2Coef(0, dual, naxChannelRows);  // predict in form B
  EXPECT_EQ(p.H(0), T(9));   // 10 - 1 * 1
  EXPECT_EQ(p.H(1), T(17));  // 20 - 0.5 * 1 - 0.5 * 5
  lift.LiftUsing2Coef(1, prime, naxChannelRows);  // update in form A, equal lengths
  EXPECT_EQ(p.L(0), T(7.5));   // 1 + 0.25 * 9 + 0.25 * 17
  EXPECT_EQ(p.L(1), T(13.5));  // 5 + 0.5 * 17
}

// The sum of a step written straight from the mirror rule.
template <typename T>
std::vector<T> ReferenceStep(std::vector<T> target, const std::vector<T>& source, int32 taps,
                             int32 s, int32 lh, int32 rh, const T* c, bool inverse) {
  const int32 nS = static_cast<int32>(source.size());
  for (size_t i = 0; i < target.size(); ++i) {
    const int32 base = static_cast<int32>(i) + s - taps / 2;
    T sum = 0;
    for (int32 t = 0; t < taps; ++t) sum += c[t] * source[naxSymExtension(base + t, nS, lh, rh)];
    target[i] = inverse ? target[i] - sum : target[i] + sum;
  }
  return target;
}

TYPED_TEST(LiftingTest, LongStepsFollowTheMirrorRuleAlongRowsAndColumns) {
  using T = TypeParam;
  std::mt19937 rng(7);
  const T c6[6] = {T(0.1), T(-0.3), T(0.7), T(0.2), T(-0.45), T(0.05)};
  const T tol = sizeof(T) == 4 ? T(1e-5) : T(1e-13);
  for (int32 n = 2; n <= 13; ++n) {
    for (int32 offset = 0; offset < 2; ++offset) {
      const int32 lowN = offset == 0 ? (n + 1) / 2 : n / 2, highN = n - lowN;
      if (lowN == 0 || highN == 0) continue;
      for (int32 taps : {2, 4, 6}) {
        for (int32 step = 0; step < 2; ++step) {
          for (int32 direction = 1; direction <= 2; ++direction) {
            const int32 width = 3;  // the other axis
            const std::vector<T> low = nax_test::RandomSamples<T>(lowN * width, rng);
            const std::vector<T> high = nax_test::RandomSamples<T>(highN * width, rng);
            const bool rows = direction == 1;
            // Along rows the halves are lowN x width (cols x rows), along columns width x lowN.
            CNaxChannel<T> lo(rows ? lowN : width, rows ? width : lowN, low.data(),
                              rows ? (offset + 1) / 2 : 0, rows ? 0 : (offset + 1) / 2);
            CNaxChannel<T> hi(rows ? highN : width, rows ? width : highN, high.data(),
                              rows ? offset / 2 : 0, rows ? 0 : offset / 2);
            CNaxLifting<T> lift(&lo, &hi, rows ? 1 : 0);
            const naxChannelType dir = static_cast<naxChannelType>(direction);
            if (taps == 2) lift.LiftUsing2Coef(step, c6, dir);
            if (taps == 4) lift.LiftUsing4Coef(step, c6, dir);
            if (taps == 6) lift.LiftUsing6Coef(step, c6, dir);
            // Forms: predict writes the high half, update the low half.
            const bool highFirst = offset == 1;
            const bool formA = (step == 0) != highFirst;
            const std::vector<T>& even = highFirst ? high : low;
            const std::vector<T>& odd = highFirst ? low : high;
            const int32 evenN = highFirst ? highN : lowN, oddN = highFirst ? lowN : highN;
            const int32 srcN = formA ? evenN : oddN, tgtN = formA ? oddN : evenN;
            const int32 lh = formA ? 0 : 1;
            const int32 rh = formA ? (evenN == oddN) : (evenN != oddN);
            const T* result = (formA == highFirst) ? lo.GetData() : hi.GetData();
            for (int32 line = 0; line < width; ++line) {
              std::vector<T> src(srcN), tgt(tgtN);
              const std::vector<T>& s = formA ? even : odd;
              const std::vector<T>& t = formA ? odd : even;
              // Line `line` of each half: contiguous along rows, strided along columns.
              for (int32 i = 0; i < srcN; ++i) src[i] = rows ? s[line * srcN + i] : s[i * width + line];
              for (int32 i = 0; i < tgtN; ++i) tgt[i] = rows ? t[line * tgtN + i] : t[i * width + line];
              const auto ref = ReferenceStep(tgt, src, taps, formA ? 1 : 0, lh, rh, c6, false);
              for (int32 i = 0; i < tgtN; ++i) {
                const T got = rows ? result[line * tgtN + i] : result[i * width + line];
                EXPECT_NEAR(got, ref[i], tol) << "n " << n << " offset " << offset << " taps "
                                              << taps << " step " << step << " dir " << direction;
              }
            }
            // The inverse restores both halves.
            if (taps == 2) lift.InvLiftUsing2Coef(step, c6, dir);
            if (taps == 4) lift.InvLiftUsing4Coef(step, c6, dir);
            if (taps == 6) lift.InvLiftUsing6Coef(step, c6, dir);
            for (int32 i = 0; i < lowN * width; ++i) EXPECT_NEAR(lo.GetData()[i], low[i], tol);
            for (int32 i = 0; i < highN * width; ++i) EXPECT_NEAR(hi.GetData()[i], high[i], tol);
          }
        }
      }
    }
  }
}

TYPED_TEST(LiftingTest, OtherDirectionsLeaveTheDataAlone) {
  using T = TypeParam;
  RowPair<T> p({1, 3, 5}, 0, {10, 20}, 0);
  CNaxLifting<T> lift(&p.low, &p.high, 1);
  const T c[6] = {1, 1, 1, 1, 1, 1};
  for (int32 d : {0, 3, -1}) {
    lift.LiftUsing2Coef(0, c, static_cast<naxChannelType>(d));
    lift.LiftUsing6Coef(1, c, static_cast<naxChannelType>(d));
    lift.InvLiftUsing4Coef(0, c, static_cast<naxChannelType>(d));
  }
  const T expected[5] = {1, 3, 5, 10, 20};
  for (int32 i = 0; i < 5; ++i) EXPECT_EQ(i < 3 ? p.L(i) : p.H(i - 3), expected[i]) << i;
}

}  // namespace
