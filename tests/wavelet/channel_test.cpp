// Channels and the transform: perfect reconstruction over filters, types, depths, sizes and
// offsets; shapes of the split; band values by hand; normalization factors; ownership;
// printing.
#include <functional>
#include <iostream>
#include <sstream>
#include <string>

#include "wavelet_test_support.h"

namespace {

using namespace nax_test;

template <typename T>
class ChannelTest : public ::testing::Test {};
TYPED_TEST_SUITE(ChannelTest, RealTypes);

// Reconstruction is exact to rounding relative to the largest coefficient (3_3, with its
// negative 4/9, lets the low bands grow with the depth).
TYPED_TEST(ChannelTest, PerfectReconstruction) {
  using T = TypeParam;
  std::mt19937 rng(1);
  const int32 sizes[][2] = {{1, 1}, {2, 1}, {1, 2}, {2, 2}, {3, 3}, {5, 2}, {7, 5},
                            {33, 7}, {5, 33}, {16, 16}, {33, 33}};
  const int32 offsets[][2] = {{0, 0}, {1, 0}, {0, 1}, {3, 5}, {-1, -2}, {-3, 7}};
  for (int32 wavelet = 0; wavelet < 12; ++wavelet) {
    CNaxWaveletFilter<T> filter(static_cast<naxWaveletType>(wavelet));
    for (const auto& size : sizes) {
      const std::vector<T> samples = RandomSamples<T>(size[0] * size[1], rng);
      for (const auto& offset : offsets) {
        for (int32 type = 1; type <= 3; ++type) {
          const int32 byCols = naxCalculateMaximumDepth(size[0]);
          const int32 byRows = naxCalculateMaximumDepth(size[1]);
          const int32 maxDepth = type == 3 ? std::min(byCols, byRows) : (type == 1 ? byCols : byRows);
          for (int32 depth = 1; depth <= maxDepth + 1; ++depth) {
            double scale = 1;  // of the plain tree, taken with norm 0
            for (int32 norm = 0; norm <= 2; ++norm) {
              SCOPED_TRACE(::testing::Message()
                           << "wavelet " << wavelet << " size " << size[0] << "x" << size[1]
                           << " offset " << offset[0] << "," << offset[1] << " type " << type
                           << " depth " << depth << " norm " << norm);
              CNaxChannel<T> raw(size[0], size[1], samples.data(), offset[0], offset[1]);
              raw.SetTypeOfNormalization(static_cast<naxWaveletNormalization>(norm));
              Owned<T> tree(raw.FWT(&filter, static_cast<naxChannelType>(type), depth));
              const bool tooSmall = (type != 2 && size[1] < 2) || (type != 1 && size[0] < 2);
              if (tooSmall) {
                // The step refuses and the channel survives.
                EXPECT_EQ(tree, nullptr);
                EXPECT_EQ(raw.GetData()[0], samples[0]);
                continue;
              }
              ASSERT_NE(tree, nullptr);
              EXPECT_EQ(raw.GetData(), nullptr);
              EXPECT_GE(tree->GetDepth(), std::min(depth, std::max(maxDepth, 1)));
              if (norm == 0) scale = std::max(1.0, MaxAbs(tree.get()));
              const T tol = T((sizeof(T) == 4 ? 5e-5 : 1e-13) * scale);
              Owned<T> back(tree->IFWT());
              ASSERT_NE(back, nullptr);
              ASSERT_EQ(back->GetColsNb(), size[0]);
              ASSERT_EQ(back->GetRowsNb(), size[1]);
              EXPECT_EQ(back->GetOffsetX(), offset[0]);
              EXPECT_EQ(back->GetOffsetY(), offset[1]);
              const T* out = back->GetData();
              for (int32 i = 0; i < size[0] * size[1]; ++i)
                ASSERT_NEAR(out[i], samples[i], tol) << "sample " << i;
            }
          }
        }
      }
    }
  }
}

// The transform lifts while it splits; the result must be that of the plain sequence
// Split, then LiftDirect on each pair (rows first), and the inverse that of LiftInverse
// (columns first), then Unite.
TYPED_TEST(ChannelTest, OnePassEqualsStepByStep) {
  using T = TypeParam;
  // Lift pairs {from band, to band, along rows} per type, in the order of the forward step.
  const int32 steps[3][4][3] = {
      {{0, 1, 1}}, {{0, 1, 0}}, {{0, 2, 1}, {3, 1, 1}, {0, 3, 0}, {2, 1, 0}}};
  std::mt19937 rng(21);
  const int32 sizes[][2] = {{2, 2}, {3, 5}, {8, 3}, {13, 40}, {40, 13}, {31, 64}};
  const int32 offsets[][2] = {{0, 0}, {1, 1}, {2, 3}, {5, 0}};
  for (int32 wavelet = 0; wavelet < 12; ++wavelet) {
    CNaxWaveletFilter<T> filter(static_cast<naxWaveletType>(wavelet));
    for (const auto& size : sizes) {
      const std::vector<T> samples = RandomSamples<T>(size[0] * size[1], rng);
      for (const auto& offset : offsets) {
        for (int32 type = 1; type <= 3; ++type) {
          SCOPED_TRACE(::testing::Message() << "wavelet " << wavelet << " size " << size[0] << "x"
                                            << size[1] << " offset " << offset[0] << ","
                                            << offset[1] << " type " << type);
          const auto kind = static_cast<naxChannelType>(type);
          const int32 count = type == 3 ? 4 : 1;
          CNaxChannel<T> raw(size[0], size[1], samples.data(), offset[0], offset[1]);
          CNaxChannel<T> manual(size[0], size[1], offset[0], offset[1]);
          manual.CreateOneLevelSubChannels(&filter, kind, naxNoNormalization);
          manual.Split(&raw);
          const int32* step = steps[type - 1][0];
          for (int32 k = 0; k < count; ++k, step += 3)
            manual.LiftDirect(manual.SubChannel(step[0]), manual.SubChannel(step[1]), step[2]);
          Owned<T> fused(raw.FWTStep(&filter, kind));
          ASSERT_NE(fused, nullptr);
          EXPECT_EQ(naxAreChannelsAlmostEqual(fused.get(), &manual, T(0)), 1);

          for (int32 k = 0; k < count; ++k) {  // columns first: 2, 3, 0, 1 for 2D
            step = steps[type - 1][(k + 2) % count];
            manual.LiftInverse(manual.SubChannel(step[0]), manual.SubChannel(step[1]), step[2]);
          }
          CNaxChannel<T> united(size[0], size[1], offset[0], offset[1]);
          manual.Unite(&united);
          Owned<T> back(fused->IFWTStep());
          ASSERT_NE(back, nullptr);
          EXPECT_EQ(back->RawChannelIsAlmostEqual(&united, T(0)), 1);
        }
      }
    }
  }
}

// Band shapes by the parity of the offset: {cols, rows, offset X, offset Y} per band.
TYPED_TEST(ChannelTest, SplitShapes) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  struct Case {
    int32 cols, rows, ox, oy;
    naxChannelType type;
    int32 bands[4][4];
  };
  const Case cases[] = {
      {5, 2, 4, 0, naxChannelRows, {{3, 2, 2, 0}, {2, 2, 2, 0}}},  // even offset: low 3
      {5, 2, 5, 0, naxChannelRows, {{2, 2, 3, 0}, {3, 2, 2, 0}}},  // odd offset: low 2
      {3, 7, 0, 1, naxChannelColumns, {{3, 3, 0, 1}, {3, 4, 0, 0}}},
      {7, 4, 3, 2, naxChannel2D, {{3, 2, 2, 1}, {4, 2, 1, 1}, {4, 2, 1, 1}, {3, 2, 2, 1}}}};
  for (const Case& c : cases) {
    CNaxChannel<T> node(c.cols, c.rows, c.ox, c.oy);
    node.CreateOneLevelSubChannels(&filter, c.type, naxNormalizationByFirstNorms);
    ASSERT_EQ(node.GetSubChannelsNb(), c.type == naxChannel2D ? 4 : 2);
    EXPECT_TRUE(node.IsDecomposed());
    for (int32 k = 0; k < node.GetSubChannelsNb(); ++k) {
      const CNaxChannel<T>* s = node.SubChannel(k);
      const int32 got[4] = {s->GetColsNb(), s->GetRowsNb(), s->GetOffsetX(), s->GetOffsetY()};
      for (int32 i = 0; i < 4; ++i) EXPECT_EQ(got[i], c.bands[k][i]) << "type " << c.type << " band " << k;
      EXPECT_EQ(s->GetTypeOfNormalization(), naxNormalizationByFirstNorms);
      EXPECT_EQ(s->GetData()[0], T(0));
    }
  }
  CNaxChannel<T> none(3, 7, 0, 1);  // other types leave no sub-channels
  none.CreateOneLevelSubChannels(&filter, naxChannelNone, naxNoNormalization);
  EXPECT_EQ(none.GetSubChannelsNb(), 0);
  EXPECT_FALSE(none.IsDecomposed());
}

TYPED_TEST(ChannelTest, SplitDealsByAbsoluteParity) {
  using T = TypeParam;
  // Sample value 10 * X + Y with absolute coordinates: parities are readable from values.
  const int32 cols = 5, rows = 4, ox = 1, oy = 2;
  std::vector<T> v(cols * rows);
  for (int32 y = 0; y < rows; ++y)
    for (int32 x = 0; x < cols; ++x) v[y * cols + x] = T(10 * (x + ox) + (y + oy));
  CNaxChannel<T> raw(cols, rows, v.data(), ox, oy);
  CNaxChannel<T> split(cols, rows, ox, oy);
  split.CreateOneLevelSubChannels(nullptr, naxChannel2D, naxNoNormalization);
  split.Split(&raw);
  const int32 parity[4][2] = {{0, 0}, {1, 1}, {1, 0}, {0, 1}};  // X, Y parity per band
  for (int32 k = 0; k < 4; ++k) {
    const CNaxChannel<T>* s = split.SubChannel(k);
    for (int32 i = 0; i < s->GetColsNb() * s->GetRowsNb(); ++i) {
      const int32 value = static_cast<int32>(s->GetData()[i]);
      EXPECT_EQ((value / 10) % 2, parity[k][0]) << "band " << k;
      EXPECT_EQ((value % 10) % 2, parity[k][1]) << "band " << k;
    }
  }
  // Row-major order inside a band: HL (even X, odd Y) from (1, 2) starts at X = 2, Y = 3.
  const T firstHL[3] = {23, 43, 25};
  for (int32 i = 0; i < 3; ++i) EXPECT_EQ(split.SubChannel(3)->GetData()[i], firstHL[i]);
  CNaxChannel<T> united(cols, rows, ox, oy);
  split.Unite(&united);
  EXPECT_EQ(united.RawChannelIsAlmostEqual(&raw, T(0)), 1);
}

TYPED_TEST(ChannelTest, BandValuesFollowTheLiftingRules) {
  using T = TypeParam;
  // One row pair along rows, 2_2: x = 1 4 2 8 5 (X = 0..4), on two identical rows.
  const std::vector<T> row = {1, 4, 2, 8, 5, 1, 4, 2, 8, 5};
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  CNaxChannel<T> raw(5, 2, row.data(), 0, 0);
  Owned<T> tree(raw.FWTStep(&filter, naxChannelRows));
  ASSERT_NE(tree, nullptr);
  const T* h = tree->SubChannel(1)->GetData();
  const T* l = tree->SubChannel(0)->GetData();
  // Predict: d0 = 4 - (1 + 2)/2 = 2.5, d1 = 8 - (2 + 5)/2 = 4.5.
  // Update: s0 = 1 + 0.5 * 2.5, s1 = 2 + (2.5 + 4.5)/4, s2 = 5 + 0.5 * 4.5; then row two.
  const T high[2] = {2.5, 4.5}, low[4] = {2.25, 3.75, 7.25, 2.25};
  for (int32 i = 0; i < 4; ++i) EXPECT_EQ(l[i], low[i]) << i;
  for (int32 i = 0; i < 2; ++i) EXPECT_EQ(h[i], high[i]) << i;

  // Haar 1_1 in two dimensions on a 2 x 2 block: d = b - a, s = a + d / 2 along rows, then
  // the same along columns.
  const std::vector<T> block = {1, 3, 5, 11};
  CNaxWaveletFilter<T> haar(naxWavelet1_1);
  CNaxChannel<T> b(2, 2, block.data(), 0, 0);
  Owned<T> t2(b.FWTStep(&haar, naxChannel2D));
  // Rows: (1, 3) -> s 2, d 2; (5, 11) -> s 8, d 6. Columns: LL (2, 8) -> 5, HL 6;
  // LH (2, 6) -> 4, HH 4.
  const T bands[4] = {5, 4, 4, 6};  // LL, HH, LH, HL
  for (int32 k = 0; k < 4; ++k) EXPECT_EQ(t2->SubChannel(k)->GetData()[0], bands[k]) << k;

  // 4_2 (three steps) on one row X = 0..3: 2 0 4 8.
  // Update with prime (-1/4, -1/4), form B: e0 = 2 - 0.5 * 0 = 2, e1 = 4 - 0.25 * (0 + 8) = 2.
  // Predict with dual (-1, -1), form A, equal lengths: o0 = 0 - (2 + 2) = -4, o1 = 8 - 2 * 2 = 4.
  // Update with prime2 (3/16, 3/16): e0 = 2 + 0.375 * -4 = 0.5, e1 = 2 + 3/16 * (-4 + 4) = 2.
  const std::vector<T> four = {2, 0, 4, 8, 2, 0, 4, 8};
  CNaxWaveletFilter<T> f42(naxWavelet4_2);
  CNaxChannel<T> c42(4, 2, four.data(), 0, 0);
  Owned<T> t42(c42.FWTStep(&f42, naxChannelRows));
  const T values[4] = {0.5, 2, -4, 4};  // low, then high
  for (int32 i = 0; i < 4; ++i) EXPECT_EQ(t42->SubChannel(i / 2)->GetData()[i % 2], values[i]) << i;
}

// Each band of level j is scaled by the norm of its own filters times the low norm of the
// levels above; Denormalize undoes it.
TYPED_TEST(ChannelTest, NormalizationFactorsPerBand) {
  using T = TypeParam;
  std::mt19937 rng(3);
  const std::vector<T> samples = RandomSamples<T>(17 * 19, rng);
  for (int32 wavelet : {0, 7, 10}) {
    CNaxWaveletFilter<T> filter(static_cast<naxWaveletType>(wavelet));
    for (int32 type = 1; type <= 3; ++type) {
      const auto kind = static_cast<naxChannelType>(type);
      Owned<T> plain = MakeTree(samples, 17, 19, &filter, 3, naxNoNormalization, kind, 1);
      for (int32 norm = 1; norm <= 2; ++norm) {
        const double l = filter.GetLowNorm(2 - norm), h = filter.GetHighNorm(2 - norm);
        Owned<T> scaled = MakeTree(samples, 17, 19, &filter, 3,
                                   static_cast<naxWaveletNormalization>(norm), kind, 1);
        ASSERT_EQ(scaled->GetDepth(), 3);
        const int32 dim = type == 3 ? 2 : 1;
        for (int32 level = 0; level < 3; ++level)
          for (int32 band = level < 2 ? 1 : 0; band < 2 * dim; ++band) {
            double factor = type != 3 ? (band == 0 ? l : h)
                                      : (band == 0 ? l * l : band == 1 ? h * h : l * h);
            factor *= std::pow(l, dim * level);
            const CNaxChannel<T>* p = plain->SubChannel(level, band);
            const CNaxChannel<T>* s = scaled->SubChannel(level, band);
            for (int32 i = 0; i < Count(p); ++i)
              ASSERT_NEAR(s->GetData()[i], p->GetData()[i] * factor,
                          Tolerance<T>() * 20 * (1 + std::fabs(p->GetData()[i] * factor)))
                  << "wavelet " << wavelet << " type " << type << " level " << level;
          }
        scaled->Denormalize();
        EXPECT_EQ(naxAreChannelsAlmostEqual(scaled.get(), plain.get(), Tolerance<T>() * 20), 1);
      }
    }
  }
  // Haar with the first norms: low factor 1, so only the high bands change (-0.5 a dimension).
  const std::vector<T> block = {1, 3, 5, 11};
  CNaxWaveletFilter<T> haar(naxWavelet1_1);
  Owned<T> t = MakeTree(block, 2, 2, &haar, 1, naxNormalizationByFirstNorms);
  const T expected[4] = {5, 1, -2, -3};
  for (int32 k = 0; k < 4; ++k) EXPECT_EQ(t->SubChannel(k)->GetData()[0], expected[k]);
}

TYPED_TEST(ChannelTest, OwnershipTransitions) {
  using T = TypeParam;
  std::mt19937 rng(5);
  const std::vector<T> samples = RandomSamples<T>(12 * 9, rng);
  CNaxWaveletFilter<T> filter(naxWavelet2_4);

  // Depth 0 returns a copy and leaves the channel intact.
  CNaxChannel<T> raw(12, 9, samples.data(), 0, 0);
  Owned<T> copy(raw.FWT(&filter, naxChannel2D, 0));
  ASSERT_NE(copy, nullptr);
  EXPECT_NE(copy->GetData(), raw.GetData());
  EXPECT_EQ(copy->RawChannelIsAlmostEqual(&raw, T(0)), 1);

  // A raw channel is consumed and left empty.
  Owned<T> tree(raw.FWT(&filter, naxChannel2D, 1));
  EXPECT_EQ(raw.GetColsNb() + raw.GetRowsNb(), 0);
  EXPECT_EQ(raw.GetData(), nullptr);
  EXPECT_EQ(tree->GetDepth(), 1);

  // A decomposed channel stays and a deeper clone comes back.
  Owned<T> deeper(tree->FWT(&filter, naxChannel2D, 2));
  EXPECT_EQ(tree->GetDepth(), 1);
  EXPECT_EQ(deeper->GetDepth(), 2);
  Owned<T> direct(CNaxChannel<T>(12, 9, samples.data(), 0, 0).FWT(&filter, naxChannel2D, 2));
  EXPECT_EQ(naxAreChannelsAlmostEqual(deeper.get(), direct.get(), T(0)), 1);

  // FWTStep on a decomposed channel deepens it in place and returns it.
  EXPECT_EQ(tree->FWTStep(&filter, naxChannel2D), tree.get());
  EXPECT_EQ(tree->GetDepth(), 2);
  EXPECT_EQ(naxAreChannelsAlmostEqual(tree.get(), direct.get(), T(0)), 1);

  // The inverse consumes the tree.
  Owned<T> back(deeper->IFWT());
  EXPECT_EQ(deeper->GetColsNb() + deeper->GetRowsNb(), 0);
  EXPECT_FALSE(deeper->IsDecomposed());
  EXPECT_EQ(back->GetTypeOfNormalization(), naxNoNormalization);
  EXPECT_EQ(back->IFWT(), nullptr);  // nothing to invert

  // In-place forms.
  CNaxChannel<T> inPlace(12, 9, samples.data(), 0, 0);
  inPlace.SetTypeOfNormalization(naxNormalizationBySecondNorms);
  inPlace.FWTInPlace(&filter, naxChannel2D, 2);
  EXPECT_EQ(inPlace.GetDepth(), 2);
  inPlace.IFWTInPlace();
  CNaxChannel<T> original(12, 9, samples.data(), 0, 0);
  EXPECT_EQ(inPlace.RawChannelIsAlmostEqual(&original, Tolerance<T>()), 1);

  // A too small channel survives a refused step.
  CNaxChannel<T> row(8, 1, samples.data(), 0, 0);
  EXPECT_EQ(row.FWT(&filter, naxChannelRows, 1), nullptr);
  EXPECT_EQ(row.FWTStep(&filter, naxChannel2D), nullptr);
  ASSERT_NE(row.GetData(), nullptr);
  EXPECT_EQ(row(3, 0), samples[3]);
}

TYPED_TEST(ChannelTest, OneColumnSplitAlongRows) {
  using T = TypeParam;
  // The crossed shape test lets a one-column channel split into 1 and 0 columns.
  const std::vector<T> samples = {1, 2, 3};
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  CNaxChannel<T> c(1, 3, samples.data(), 0, 0);
  Owned<T> tree(c.FWT(&filter, naxChannelRows, 3));
  ASSERT_NE(tree, nullptr);
  EXPECT_EQ(tree->GetDepth(), 3);
  EXPECT_EQ(tree->GetLowColsNb(), 1);
  EXPECT_EQ(tree->GetHighColsNb(), 0);
  EXPECT_EQ(tree->SubChannel(1)->GetData(), nullptr);
  Owned<T> back(tree->IFWT());
  EXPECT_EQ(back->GetData()[2], T(3));
}

TYPED_TEST(ChannelTest, StepwiseInverseAndBands) {
  using T = TypeParam;
  std::mt19937 rng(9);
  const std::vector<T> samples = RandomSamples<T>(9 * 10, rng);
  CNaxWaveletFilter<T> filter(naxWavelet3_3);
  CNaxChannel<T> raw(9, 10, samples.data(), 1, 1);
  Owned<T> tree(raw.FWT(&filter, naxChannel2D, 2));

  EXPECT_EQ(tree->GetHighChannel(3, naxSubChannelHH), nullptr);
  EXPECT_EQ(tree->GetHighChannel(1, naxSubChannelLow), nullptr);  // decomposed band
  Owned<T> hl(tree->GetHighChannel(2, naxSubChannelHL));
  ASSERT_NE(hl, nullptr);
  EXPECT_EQ(hl->RawChannelIsAlmostEqual(tree->SubChannel(1, naxSubChannelHL), T(0)), 1);
  Owned<T> low(tree->GetLowChannel());
  EXPECT_EQ(low->RawChannelIsAlmostEqual(tree->SubChannel(1, 0), T(0)), 1);
  EXPECT_EQ(tree->SubChannel(2, 0), nullptr);

  // Invert the lowest level by hand, then the top level.
  CNaxChannel<T>* node = tree->SubChannel(0);
  Owned<T> lowRaw(node->IFWTStep());
  ASSERT_NE(lowRaw, nullptr);
  EXPECT_TRUE(node->IsDecomposed());  // the record stays
  EXPECT_EQ(tree->IFWTStep(), nullptr);  // its low band is still decomposed
  node->Destroy();
  delete node;
  tree->SetSubChannel(lowRaw.release(), 0);
  Owned<T> back(tree->IFWTStep());
  ASSERT_NE(back, nullptr);
  CNaxChannel<T> original(9, 10, samples.data(), 1, 1);
  EXPECT_EQ(back->RawChannelIsAlmostEqual(&original, Tolerance<T>()), 1);
}

TYPED_TEST(ChannelTest, CopiesAndComparisons) {
  using T = TypeParam;
  std::mt19937 rng(11);
  const std::vector<T> samples = RandomSamples<T>(8 * 8, rng);
  CNaxWaveletFilter<T> filter(naxWavelet4_4);
  CNaxChannel<T> raw(8, 8, samples.data(), 0, 0);
  Owned<T> tree(raw.FWT(&filter, naxChannel2D, 2));
  Owned<T> clone(tree->CloneDecomposedChannel());
  EXPECT_EQ(naxAreChannelsAlmostEqual(tree.get(), clone.get(), T(0)), 1);
  clone->SubChannel(1, 2)->GetData()[0] += T(0.5);
  EXPECT_EQ(naxAreChannelsAlmostEqual(tree.get(), clone.get(), T(0.4)), 0);
  EXPECT_EQ(naxAreChannelsAlmostEqual(tree.get(), clone.get(), T(0.6)), 1);

  CNaxChannel<T> copy;
  copy.CopyDecomposedChannel(tree.get());
  EXPECT_EQ(naxAreChannelsAlmostEqual(tree.get(), &copy, T(0)), 1);
  // A level-by-level clone: copies of the high bands and an empty low record.
  CNaxChannel<T> level(8, 8, 0, 0);
  level.CloneOneLevelSubChannels(tree.get());
  EXPECT_EQ(level.SubChannel(0)->GetData(), nullptr);
  EXPECT_EQ(level.SubChannel(0)->GetColsNb(), 4);
  EXPECT_EQ(level.SubChannel(1)->RawChannelIsAlmostEqual(tree->SubChannel(1), T(0)), 1);
  CNaxChannel<T> shaped(8, 8, 0, 0);
  shaped.CreateOneLevelSubChannels(tree.get());
  ASSERT_EQ(shaped.GetSubChannelsNb(), 4);
  EXPECT_EQ(shaped.SubChannel(2)->GetColsNb(), tree->SubChannel(2)->GetColsNb());
  EXPECT_EQ(shaped.SubChannel(2)->GetData()[0], T(0));
  EXPECT_EQ(shaped.SubChannel(2)->GetFilter(), &filter);
  Owned<T> node(tree->CloneRawChannel());  // one node, without its sub-channels
  EXPECT_EQ(node->GetSubChannelsNb(), 0);

  // Raw comparisons: shape and offsets first, then the data.
  CNaxChannel<T> a(2, 2, samples.data(), 0, 0), b(2, 2, samples.data(), 0, 1), e(2, 2, 0, 0);
  EXPECT_EQ(a.RawChannelIsAlmostEqual(&b, T(1)), 0);
  EXPECT_EQ(a.RawChannelIsAlmostEqual(&e, T(1)), 0);
  EXPECT_EQ(raw.CloneDecomposedChannel(), nullptr);

  // Clean zeroes the whole tree, Destroy of the lowest band keeps its record.
  Owned<T> shallow = MakeTree(samples, 8, 8, &filter, 1);
  shallow->Clean();
  EXPECT_EQ(shallow->SubChannel(1)->GetData()[3], T(0));
  shallow->DestroyLowestSubChannel();
  ASSERT_NE(shallow->SubChannel(0), nullptr);
  EXPECT_EQ(shallow->SubChannel(0)->GetData(), nullptr);

  // Setting a filter of another wavelet type or another split destroys the tree.
  CNaxWaveletFilter<T> other44(naxWavelet4_4), f22(naxWavelet2_2);
  tree->SetFilter(&other44);  // same wavelet type: kept
  tree->SetType(naxChannel2D);
  EXPECT_TRUE(tree->IsDecomposed());
  tree->SetFilter(&f22);
  EXPECT_FALSE(tree->IsDecomposed());
  EXPECT_EQ(tree->GetColsNb(), 0);
  copy.SetType(naxChannelRows);
  EXPECT_FALSE(copy.IsDecomposed());
}

std::string Printed(const std::function<void()>& f) {
  std::ostringstream out;
  std::streambuf* old = std::cout.rdbuf(out.rdbuf());
  f();
  std::cout.rdbuf(old);
  return out.str();
}

TEST(ChannelPrintTest, Texts) {
  CNaxChannel<double> empty;
  EXPECT_EQ(Printed([&] { empty.Print(); }), "Raw channel is empty.\n");
  const double v[] = {1, 2.5, -3, 4};
  CNaxChannel<double> raw(2, 2, v, 0, 0);
  EXPECT_EQ(Printed([&] { raw.Print(); }), "Raw channel: \n( 1 2.5 )\n( -3 4 )\n");

  CNaxWaveletFilter<double> haar(naxWavelet1_1);
  const double row[] = {1, 3, 5, 11, 2, 2, 0, 0};
  CNaxChannel<double> r1(4, 2, row, 0, 0);
  std::unique_ptr<CNaxChannel<double>> t1(r1.FWT(&haar, naxChannelRows, 1));
  EXPECT_EQ(Printed([&] { t1->Print(); }),
            "Decomposedd channel with a depth of decomposition 1:\n"
            "High frequency channel for level 1:\n( 2 6 )\n( 0 0 )\n"
            "Low  frequency channel for level 1:\n( 2 8 )\n( 2 0 )\n");

  const double block[] = {1, 3, 5, 11};
  CNaxChannel<double> r2(2, 2, block, 0, 0);
  std::unique_ptr<CNaxChannel<double>> t2(r2.FWT(&haar, naxChannel2D, 1));
  EXPECT_EQ(Printed([&] { t2->Print(); }),
            "Decomposedd channel with a depth of decomposition 1:\n"
            "High frequency channels for level 1:\n"
            "LH: \n( 4 )\nHL: \n( 6 )\nHH: \n( 4 )\n"
            "Low  frequency channel LL for level 1:\n( 5 )\n");
  // With one band empty each is told alone, and HH stands under "LH: ".
  t2->SubChannel(3)->SetData(nullptr);
  t2->SubChannel(0)->SetData(nullptr);
  EXPECT_EQ(Printed([&] { t2->Print(); }),
            "Decomposedd channel with a depth of decomposition 1:\n"
            "LH: \n( 4 )\nHL channel for level 1 is empty.\nLH: \n( 4 )\n"
            "Low frequency channel LL for level 1 is empty.\n");
  t1->SubChannel(1)->SetData(nullptr);
  t1->SubChannel(0)->SetData(nullptr);
  EXPECT_EQ(Printed([&] { t1->Print(); }),
            "Decomposedd channel with a depth of decomposition 1:\n"
            "High frequency channel for level 1 is empty.\n"
            "Low frequency channel for level 1 is empty.\n");
}

}  // namespace
