// Multi-plane image decomposition: byte images through the transform and back, the 8-bit
// wrap, depths, the packed form, comparisons, copies, and noise reduction of all planes.
#include "nax/wavelet_decomposition.h"
#include "wavelet_test_support.h"

namespace {

using namespace nax_test;

template <typename T>
class DecompositionTest : public ::testing::Test {};
TYPED_TEST_SUITE(DecompositionTest, RealTypes);

template <typename T>
using Image = std::unique_ptr<CNaxWaveletDecomposition<T>>;

std::vector<unsigned char> RandomBytes(size_t n, uint32 seed) {
  std::mt19937 rng(seed);
  std::uniform_int_distribution<int> u(0, 255);
  std::vector<unsigned char> v(n);
  for (auto& b : v) b = static_cast<unsigned char>(u(rng));
  return v;
}

TYPED_TEST(DecompositionTest, ByteImagesComeBackUnchanged) {
  using T = TypeParam;
  const int32 sizes[][2] = {{7, 5}, {13, 9}, {33, 17}, {1, 6}, {16, 16}};
  for (int32 wavelet = 0; wavelet < 12; wavelet += 1) {
    for (const auto& size : sizes) {
      for (const auto norm : {naxNoNormalization, naxNormalizationByFirstNorms, naxNormalizationBySecondNorms}) {
        SCOPED_TRACE(::testing::Message() << "wavelet " << wavelet << " size " << size[0] << "x" << size[1]
                                          << " norm " << norm);
        const std::vector<unsigned char> bytes = RandomBytes(size_t(size[0]) * size[1] * 3, wavelet + 1);
        CNaxWaveletDecomposition<T> image(static_cast<naxWaveletType>(wavelet));
        image.SetTypeOfNormalization(norm);
        image.Set8BitsImage(size[0], size[1], 3, bytes.data());
        Image<T> tree(image.FWTMaxDepth(naxChannel2D));
        ASSERT_NE(tree, nullptr);
        Image<T> back(tree->IFWT());
        EXPECT_EQ(back->IsDecomposed(), 0);
        std::vector<unsigned char> out(bytes.size());
        back->GetImageIn8BitsFormat(out.data());
        ASSERT_EQ(out, bytes);
        // The same through a fixed depth and the pixel form of a decomposed object.
        image.Set8BitsImage(size[0], size[1], 3, bytes.data());
        image.FWTInPlace(2, naxChannelRows);
        std::vector<T> pixels(bytes.size());
        image.GetImageInPixelForm(pixels.data());
        EXPECT_EQ(image.IsDecomposed(), 0);  // left raw
        EXPECT_EQ(image.GetTypeOfNormalization(), naxNoNormalization);
        for (size_t i = 0; i < bytes.size(); ++i) ASSERT_NEAR(pixels[i], T(bytes[i]), T(1e-3));
      }
    }
  }
}

TYPED_TEST(DecompositionTest, EightBitFormWrapsInsteadOfClamping) {
  using T = TypeParam;
  const T pixels[8] = {T(255.5), T(300), T(-0.5), T(-1.4), T(2.5), T(-256.6), T(1e12), T(0.49)};
  CNaxWaveletDecomposition<T> image(naxWavelet2_2);
  image.SetImage(4, 1, 2, pixels);
  unsigned char out[8];
  image.GetImageIn8BitsFormat(out);
  const unsigned char expected[8] = {0, 44, 255, 255, 3, 255, 0, 0};  // 1e12 = 0xE8D4A51000
  for (int32 i = 0; i < 8; ++i) EXPECT_EQ(out[i], expected[i]) << i;
}

TYPED_TEST(DecompositionTest, DepthsOfPlanes) {
  using T = TypeParam;
  const std::vector<unsigned char> bytes = RandomBytes(64 * 64 * 3, 5);
  CNaxWaveletDecomposition<T> image(naxWavelet2_4);
  image.Set8BitsImage(64, 64, 3, bytes.data());
  const int32 depths[3] = {3, 2, 4};
  const naxChannelType types[3] = {naxChannel2D, naxChannel2D, naxChannel2D};
  Image<T> tree(image.FWT(depths, types));
  int32 depth = -1;
  EXPECT_EQ(tree->HasCommonDepth(depth), 0);
  EXPECT_EQ(depth, 2);
  EXPECT_EQ(image[0]->GetData(), nullptr);  // the source planes are consumed
  image.Set8BitsImage(64, 64, 3, bytes.data());
  const int32 limits[3] = {1, 9, 3};
  tree.reset(image.FWTMaxDepth(naxChannel2D, limits));
  for (int32 c = 0; c < 3; ++c) EXPECT_EQ((*tree)[c]->GetDepth(), c == 1 ? 5 : limits[c]);
  std::vector<unsigned char> narrow(3 * 100 * 2);
  image.Set8BitsImage(3, 100, 2, narrow.data());
  tree.reset(image.FWTMaxDepth(naxChannel2D));
  EXPECT_EQ(tree->IsDecomposed(), 0);
  EXPECT_EQ(tree->HasCommonDepth(depth), 1);
  EXPECT_EQ(depth, 0);
  EXPECT_EQ(image.FWTMaxDepth(naxChannelNone), nullptr);
}

TYPED_TEST(DecompositionTest, PackedFormAndComparisons) {
  using T = TypeParam;
  const int32 w = 19, h = 14;
  const std::vector<unsigned char> bytes = RandomBytes(size_t(w) * h * 2, 8);
  CNaxWaveletDecomposition<T> image(naxWavelet4_2);
  image.SetTypeOfNormalization(naxNormalizationBySecondNorms);
  image.Set8BitsImage(w, h, 2, bytes.data());
  CNaxWaveletDecomposition<T> original(image);  // deep copy, own filter
  Image<T> tree(image.FWT(3, naxChannel2D));
  std::vector<T> packed(bytes.size());
  tree->GetImageInPackedForm(packed.data());
  Image<T> packedImage(tree->GetImageInPackedForm());
  std::vector<T> again(bytes.size());
  packedImage->GetImageInPixelForm(again.data());
  EXPECT_EQ(again, packed);
  Image<T> unpacked(packedImage->UnpackDecomposedImage(naxWavelet4_2, 3, naxNormalizationBySecondNorms));
  EXPECT_EQ(unpacked->IsDecomposed(), 1);
  for (int32 c = 0; c < 2; ++c) EXPECT_EQ(naxAreChannelsAlmostEqual((*unpacked)[c], (*tree)[c], T(0)), 1);
  // Decompositions of one image by different filters compare equal by their inverses.
  CNaxWaveletDecomposition<T> other(original);
  other.SetFilter(naxWavelet1_3);
  Image<T> otherTree(other.FWT(2, naxChannelColumns));
  EXPECT_EQ(unpacked->DecompositionsAreAlmostEqual(*otherTree, T(1e-3)), 1);
  EXPECT_EQ((*otherTree)[0]->IsDecomposed(), 0);  // consumed by the comparison
  CNaxWaveletDecomposition<T> copy(original), changed(original);
  EXPECT_EQ(copy.DecompositionsAreAlmostEqual(changed, T(0)), 1);
  changed[1]->GetData()[7] += T(0.01);
  EXPECT_EQ(copy.DecompositionsAreAlmostEqual(changed, T(0.02)), 1);
  EXPECT_EQ(copy.DecompositionsAreAlmostEqual(changed, T(0.001)), 0);
}

TYPED_TEST(DecompositionTest, CopiesOwnTheirFilter) {
  using T = TypeParam;
  const std::vector<unsigned char> bytes = RandomBytes(12 * 10 * 3, 2);
  Image<T> tree;
  {
    CNaxWaveletDecomposition<T> image(naxWavelet3_5);
    image.Set8BitsImage(12, 10, 3, bytes.data());
    Image<T> source(image.FWT(2, naxChannel2D));
    tree.reset(source->CloneDecomposition());
  }  // the source objects and their filters are gone
  EXPECT_EQ(tree->GetWaveletType(), naxWavelet3_5);
  EXPECT_EQ((*tree)[2]->SubChannel(0)->GetFilter(), tree->GetFilter());
  Image<T> back(tree->IFWT());
  std::vector<unsigned char> out(bytes.size());
  back->GetImageIn8BitsFormat(out.data());
  EXPECT_EQ(out, bytes);
}

TYPED_TEST(DecompositionTest, ReducingNoiseOfAllPlanes) {
  using T = TypeParam;
  const int32 w = 48, h = 40, planes = 3;
  const std::vector<T> clean = Smooth<T>(w, h, planes);
  std::vector<T> noisy = Noise<T>(w * h * planes, T(12), 99);
  for (size_t i = 0; i < noisy.size(); ++i) noisy[i] += clean[i];
  const auto psnr = [&](const std::vector<T>& v) { return Psnr(v.data(), clean); };
  const double before = psnr(noisy);
  CNaxWaveletDecomposition<T> image(naxWavelet2_2);
  image.SetTypeOfNormalization(naxNormalizationBySecondNorms);
  image.SetImage(w, h, planes, noisy.data());
  image.FWTMaxDepthInPlace(naxChannel2D);
  T first[planes] = {}, ratios[planes] = {};
  image.EstimateThresholds(0, first, ratios);
  for (int32 c = 0; c < planes; ++c) EXPECT_GT(first[c], T(0));
  image.ReduceNoise(first, ratios, 1, naxDenoisingUniversal);
  for (int32 c = 0; c < planes; ++c) EXPECT_EQ(ratios[c], T(1));
  std::vector<T> out(clean.size());
  image.GetImageInPixelForm(out.data());
  EXPECT_GT(psnr(out), before + 3);

  image.SetImage(w, h, planes, noisy.data());
  image.ReduceNoiseByCircularShifts(first, ratios, 3, 3, 1, naxDenoisingUniversal);
  image.GetImageInPixelForm(out.data());
  EXPECT_GT(psnr(out), before + 4);

  // Enhancement, mixing and the scaled bands run plane by plane.
  image.SetImage(w, h, planes, noisy.data());
  Image<T> a(image.FWT(2, naxChannel2D));
  image.SetImage(w, h, planes, clean.data());
  Image<T> b(image.FWT(2, naxChannel2D));
  const T weights[3] = {0, 0, 0};
  Image<T> mixed(a->MixByLevels(*b, weights));
  Image<T> combined(a->Combine(*b, T(0), T(1)));
  EXPECT_EQ(mixed->DecompositionsAreAlmostEqual(*combined, T(1e-3)), 1);
  Image<T> low(b->GetScaledLowImage());
  EXPECT_EQ((*low)[1]->GetColsNb(), w);
  Image<T> high(b->GetScaledHighImage(1, naxSubChannelHH));
  EXPECT_EQ((*high)[2]->GetRowsNb(), h);
  Image<T> sharper(b->CloneDecomposition());
  sharper->EnhanceSharpFeatures(T(2));
  EXPECT_EQ((*sharper)[0]->SubChannel(1)->GetData()[3], (*b)[0]->SubChannel(1)->GetData()[3] * T(2));
}

}  // namespace
