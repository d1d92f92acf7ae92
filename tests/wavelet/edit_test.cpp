// Channel editing: rectangle copies, cutting windows of raw channels and of trees (the
// inverse of a cut tree equals the window of the inverse of the whole), the windowed
// inverse, pasting, packing, rescaling by the transform and by interpolation.
#include "wavelet_test_support.h"

namespace {

using namespace nax_test;

template <typename T>
class EditTest : public ::testing::Test {};
TYPED_TEST_SUITE(EditTest, RealTypes);

TYPED_TEST(EditTest, RectangleCopiesRoundTrip) {
  using T = TypeParam;
  std::vector<T> big(9 * 7, T(-1)), block(4 * 3), back(4 * 3);
  for (size_t i = 0; i < block.size(); ++i) block[i] = T(i + 1);
  naxInsertRectData(block.data(), big.data(), 9, 2, 3, 4, 3);
  EXPECT_EQ(big[3 * 9 + 2], T(1));
  EXPECT_EQ(big[5 * 9 + 5], T(12));
  EXPECT_EQ(big[3 * 9 + 1], T(-1));
  naxExtractRectData(big.data(), 9, 2, 3, 4, 3, back.data());
  EXPECT_EQ(back, block);
  std::vector<T> other(5 * 5, T(0));
  naxInsertPartRectData(big.data(), other.data(), 9, 3, 4, 5, 1, 2, 2, 2);
  EXPECT_EQ(other[3 * 5 + 2], block[2 * 4 + 2]);
  naxInsertRectData(block.data(), big.data(), 9, 0, 0, 4, 0);  // no rows: nothing
  EXPECT_EQ(big[0], T(-1));
}

TYPED_TEST(EditTest, RawCutChecksItsWindow) {
  using T = TypeParam;
  std::vector<T> s(6 * 5);
  for (size_t i = 0; i < s.size(); ++i) s[i] = T(i);
  CNaxChannel<T> raw(6, 5, s.data(), 10, 20);
  Owned<T> cut(raw.Cut(11, 21, 13, 24));
  ASSERT_NE(cut, nullptr);
  EXPECT_EQ(cut->GetColsNb() * 10 + cut->GetRowsNb(), 34);
  EXPECT_EQ(cut->GetOffsetX(), 11);
  EXPECT_EQ((*cut)(2, 3), raw(3, 4));
  const int32 outside[][4] = {{9, 21, 13, 24}, {11, 21, 16, 24}, {12, 21, 11, 24}, {11, 25, 13, 24}};
  for (const auto& w : outside) EXPECT_EQ(raw.Cut(w[0], w[1], w[2], w[3]), nullptr);
}

// The property the decomposed cut exists for, over filters, types, offsets, windows and
// normalizations: the windowed inverse equals the window of the full inverse.
TYPED_TEST(EditTest, WindowedInverseEqualsWindowOfInverse) {
  using T = TypeParam;
  std::mt19937 rng(3);
  const int32 cols = 45, rows = 38;
  const std::vector<T> s = RandomSamples<T>(cols * rows, rng);
  const int32 offsets[][2] = {{0, 0}, {3, 6}, {1, 2}};
  const int32 windows[][4] = {{0, 0, 1, 1}, {17, 9, 5, 7}, {30, 20, 15, 18}, {0, 0, 45, 38}, {8, 31, 1, 7}};
  for (int32 wavelet = 0; wavelet < 12; ++wavelet) {
    CNaxWaveletFilter<T> filter(static_cast<naxWaveletType>(wavelet));
    for (int32 type = 1; type <= 3; ++type)
      for (const auto& o : offsets) {
        const auto norm = wavelet % 2 ? naxNormalizationBySecondNorms : naxNoNormalization;
        Owned<T> tree = MakeTree(s, cols, rows, &filter, 4, norm, static_cast<naxChannelType>(type), o[0], o[1]);
        Owned<T> copy(tree->CloneDecomposedChannel());
        Owned<T> whole(copy->IFWT());
        for (const auto& w : windows) {
          SCOPED_TRACE(::testing::Message() << "wavelet " << wavelet << " type " << type << " offset "
                                            << o[0] << " window " << w[0] << "," << w[1]);
          const int32 left = o[0] + w[0], top = o[1] + w[1];
          Owned<T> part(tree->IFWT(left, top, w[2], w[3]));
          ASSERT_NE(part, nullptr);
          Owned<T> expected(whole->Cut(left, top, left + w[2] - 1, top + w[3] - 1));
          ASSERT_EQ(part->RawChannelIsAlmostEqual(expected.get(), Tolerance<T>()), 1);
        }
        EXPECT_EQ(tree->IsDecomposed(), 1);  // the windowed inverse leaves the tree intact
        EXPECT_EQ(tree->IFWT(o[0] - 1, o[1], 3, 3), nullptr);
        // A cut keeps the depth of the tree.
        Owned<T> cut(tree->Cut(o[0] + 20, o[1] + 18, o[0] + 21, o[1] + 19));
        ASSERT_NE(cut, nullptr);
        EXPECT_EQ(cut->GetDepth(), tree->GetDepth());
      }
  }
}

TYPED_TEST(EditTest, PasteRestoresCutCoefficients) {
  using T = TypeParam;
  std::mt19937 rng(4);
  const std::vector<T> s = RandomSamples<T>(40 * 33, rng);
  CNaxWaveletFilter<T> filter(naxWavelet2_4);
  for (int32 type = 1; type <= 3; ++type) {
    Owned<T> tree = MakeTree(s, 40, 33, &filter, 3, naxNormalizationByFirstNorms, static_cast<naxChannelType>(type), 5, 2);
    Owned<T> cut(tree->Cut(20, 10, 27, 18));
    Owned<T> blank(tree->CloneDecomposedChannel());
    blank->Clean();
    blank->Paste(cut.get());
    Owned<T> expected(tree->IFWT(20, 10, 8, 9));
    Owned<T> restored(blank->IFWT(20, 10, 8, 9));
    EXPECT_EQ(restored->RawChannelIsAlmostEqual(expected.get(), Tolerance<T>()), 1);
    // Pasting the whole cut back into the original changes nothing.
    Owned<T> same(tree->CloneDecomposedChannel());
    same->Paste(cut.get());
    EXPECT_EQ(naxAreChannelsAlmostEqual(same.get(), tree.get(), T(0)), 1);
  }
  // A window of one tree moved into another by a multiple of 2^depth: the other's inverse
  // there shows the window. An odd move would change parities and is refused.
  CNaxWaveletFilter<T> wide(naxWavelet4_4);
  const std::vector<T> s1 = RandomSamples<T>(64 * 64, rng), s2 = RandomSamples<T>(64 * 64, rng);
  for (int32 type = 1; type <= 3; ++type) {
    const auto kind = static_cast<naxChannelType>(type);
    Owned<T> from = MakeTree(s1, 64, 64, &wide, 2, naxNormalizationBySecondNorms, kind, 0, 0);
    Owned<T> into = MakeTree(s2, 64, 64, &wide, 2, naxNormalizationBySecondNorms, kind, 0, 0);
    const auto move = [&](int32 dx, int32 dy) {
      const int32 margin = 5;  // the support of 4_4 reaches 5 coefficients
      return type == 1   ? into->CutAndPasteRows(from.get(), 28, 30, 32, 35, dx, dy)
             : type == 2 ? into->CutAndPasteColumns(from.get(), 28, 30, 32, 35, dx, dy)
                         : into->CutAndPaste2D(from.get(), 28, 30, 32, 35, dx, dy, margin, margin);
    };
    const int32 dx = type == 2 ? 3 : 8, dy = type == 1 ? 5 : -12;  // free along an unsplit axis
    EXPECT_EQ(move(type == 2 ? 4 : 6, type == 1 ? 0 : 2), nullptr);
    EXPECT_EQ(move(dx, dy), into.get());
    Owned<T> expected(from->IFWT(28, 30, 5, 6));
    Owned<T> moved(into->IFWT(28 + dx, 30 + dy, 5, 6));
    for (int32 i = 0; i < 30; ++i)
      ASSERT_NEAR(moved->GetData()[i], expected->GetData()[i], Tolerance<T>()) << "type " << type;
  }
  // Raw paste is clipped to this channel.
  CNaxChannel<T> target(4, 4, 0, 0);
  target.Initialize();
  std::vector<T> ones(3 * 3, T(1));
  CNaxChannel<T> patch(3, 3, ones.data(), 2, -1);
  target.Paste(&patch);
  EXPECT_EQ(target(2, 0) + target(3, 1), T(2));
  EXPECT_EQ(target(3, 2) + target(1, 0), T(0));
}

TYPED_TEST(EditTest, PackAndUnpackRoundTrip) {
  using T = TypeParam;
  std::mt19937 rng(6);
  CNaxWaveletFilter<T> filter(naxWavelet3_3);
  const int32 sizes[][2] = {{16, 16}, {13, 9}, {7, 22}};
  for (const auto& size : sizes)
    for (int32 type = 1; type <= 3; ++type) {
      const std::vector<T> s = RandomSamples<T>(size[0] * size[1], rng);
      const auto kind = static_cast<naxChannelType>(type);
      const int32 depth = type == 1   ? naxCalculateMaximumDepth(size[0])
                          : type == 2 ? naxCalculateMaximumDepth(size[1])
                                      : naxCalculateMaximumDepth(size[0], size[1]);
      Owned<T> tree = MakeTree(s, size[0], size[1], &filter, depth, naxNormalizationBySecondNorms, kind, 1, 0);
      Owned<T> packed(tree->PackDecomposedChannel());
      ASSERT_NE(packed, nullptr);
      EXPECT_EQ(packed->IsDecomposed(), 0);
      const CNaxChannel<T>* lowest = tree->SubChannel(tree->GetDepth() - 1, 0);
      EXPECT_EQ((*packed)(0, 0), (*lowest)(0, 0));  // the lowest low band stands top left
      Owned<T> unpacked(packed->UnpackDecomposedChannel(&filter, kind, depth, naxNormalizationBySecondNorms));
      EXPECT_EQ(unpacked->GetDepth(), tree->GetDepth());
      EXPECT_EQ(naxAreChannelsAlmostEqual(unpacked.get(), tree.get(), T(0)), 1);
      Owned<T> back(unpacked->IFWT());
      CNaxChannel<T> original(size[0], size[1], s.data(), 1, 0);
      EXPECT_EQ(back->RawChannelIsAlmostEqual(&original, Tolerance<T>()), 1);
    }
  CNaxChannel<T> raw(4, 4, 0, 0);
  raw.Initialize();
  EXPECT_EQ(raw.PackDecomposedChannel(), nullptr);
}

TYPED_TEST(EditTest, ScalingByTwoIsInvertedByHalving) {
  using T = TypeParam;
  std::mt19937 rng(9);
  const std::vector<T> s = RandomSamples<T>(11 * 8, rng);
  for (int32 wavelet = 0; wavelet < 12; ++wavelet) {
    CNaxWaveletFilter<T> filter(static_cast<naxWaveletType>(wavelet));
    CNaxChannel<T> raw(11, 8, s.data(), 3, 1);
    Owned<T> up(raw.ScaleRawChannelTwiceUp(&filter));
    EXPECT_EQ(up->GetColsNb(), 22);
    EXPECT_EQ(up->GetOffsetX(), 6);
    Owned<T> big(up->IFWT());
    Owned<T> down(big->ScaleRawChannelTwiceDown(&filter));
    EXPECT_EQ(down->RawChannelIsAlmostEqual(&raw, Tolerance<T>()), 1) << "wavelet " << wavelet;
  }
  // Trees: one more top level of zero bands, and the half-size decomposition.
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  const std::vector<T> t = RandomSamples<T>(32 * 24, rng);
  for (const auto norm : {naxNoNormalization, naxNormalizationBySecondNorms}) {
    Owned<T> tree = MakeTree(t, 32, 24, &filter, 2, norm, naxChannel2D, 0, 0);
    Owned<T> half(tree->ScaleDecomposedChannelTwiceDown());
    ASSERT_NE(half, nullptr);
    EXPECT_EQ(half->GetDepth(), 2);
    EXPECT_EQ(half->GetColsNb(), 16);
    CNaxChannel<T> raw(32, 24, t.data(), 0, 0);
    Owned<T> expected(raw.ScaleRawChannelTwiceDown(&filter));
    Owned<T> halfImage(half->IFWT());
    EXPECT_EQ(halfImage->RawChannelIsAlmostEqual(expected.get(), Tolerance<T>()), 1);
  }
  Owned<T> tree = MakeTree(t, 32, 24, &filter, 2, naxNoNormalization, naxChannel2D, 0, 0);
  Owned<T> bigger(tree->ScaleDecomposedChannelTwiceUp());
  EXPECT_EQ(bigger->GetDepth(), 3);
  EXPECT_EQ(bigger->GetColsNb(), 64);
  Owned<T> viaTree(bigger->IFWT());
  CNaxChannel<T> raw(32, 24, t.data(), 0, 0);
  Owned<T> up(raw.ScaleRawChannelTwiceUp(&filter));
  Owned<T> viaRaw(up->IFWT());
  EXPECT_EQ(viaTree->RawChannelIsAlmostEqual(viaRaw.get(), Tolerance<T>()), 1);
}

TYPED_TEST(EditTest, ScaleAndResize) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  std::vector<T> flat(12 * 10, T(5));
  CNaxChannel<T> raw(12, 10, flat.data(), 0, 0);
  for (const T factor : {T(2), T(3), T(0.5), T(0.3), T(1.5)}) {
    Owned<T> scaled(raw.Scale(factor, &filter));
    ASSERT_NE(scaled, nullptr) << factor;
    EXPECT_EQ(scaled->GetColsNb(), int32(12 * factor));
    for (int32 i = 0; i < scaled->GetColsNb() * scaled->GetRowsNb(); ++i)
      ASSERT_NEAR(scaled->GetData()[i], T(5), T(1e-4)) << factor;
  }
  for (const T refused : {T(0.03), T(33), T(0.25)})  // 0.25: 3 by 2 is under 3
    EXPECT_EQ(raw.Scale(refused, &filter), nullptr) << refused;
  Owned<T> same(raw.Scale(T(1), &filter));
  EXPECT_EQ(same->RawChannelIsAlmostEqual(&raw, T(0)), 1);
  Owned<T> resized(raw.Resize(7, 4));
  EXPECT_EQ(resized->GetColsNb(), 7);
  EXPECT_EQ(resized->GetData()[27], T(5));
}

TYPED_TEST(EditTest, ScaledBandsHaveTheImageShape) {
  using T = TypeParam;
  CNaxWaveletFilter<T> filter(naxWavelet2_2);
  std::vector<T> flat(21 * 14, T(3));
  flat[7] = T(9);
  Owned<T> tree = MakeTree(flat, 21, 14, &filter, 2, naxNoNormalization, naxChannel2D, 0, 0);
  Owned<T> low(tree->GetScaledLowChannel());
  ASSERT_NE(low, nullptr);
  EXPECT_EQ(low->GetRowsNb(), 14);
  EXPECT_NEAR(low->GetData()[21 * 13 + 20], T(3), T(1e-5));  // far from the bump
  Owned<T> high(tree->GetScaledHighChannel(1, naxSubChannelLH));
  ASSERT_NE(high, nullptr);
  EXPECT_EQ(high->GetColsNb(), 21);
  EXPECT_EQ(tree->GetScaledHighChannel(1, naxSubChannelLow), nullptr);  // decomposed band
  CNaxChannel<T> raw(21, 14, flat.data(), 0, 0);
  EXPECT_EQ(raw.GetScaledLowChannel(), nullptr);
}

}  // namespace
