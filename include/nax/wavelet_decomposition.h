// Wavelet decomposition of images of several planes.
//
// One CNaxChannel per colour or data plane, under one owned filter and one normalization.
// Images come in and go out in pixel form (T, pixel-interleaved: element (x, y) of plane
// c at (y * width + x) * planes + c), in 8-bit form (the same order, one byte a sample)
// and in packed form (the same order, each plane being its packed tree). The transforms,
// noise reduction, enhancement and mixing run plane by plane.
#ifndef NAX_WAVELET_DECOMPOSITION_H
#define NAX_WAVELET_DECOMPOSITION_H

#include <cmath>
#include <memory>

#include "nax/channel.h"
#include "nax/types.h"
#include "nax/wavelet_filter.h"

/// An image of several planes and, once transformed, the wavelet trees of its planes.
template <typename T>
class CNaxWaveletDecomposition {
  static_assert(nax::detail::kIsReal<T>, "CNaxWaveletDecomposition is defined for float and double");

 public:
  /// No planes and no filter.
  CNaxWaveletDecomposition() = default;
  /// No planes; an owned filter of `type`; normalization 0.
  explicit CNaxWaveletDecomposition(naxWaveletType type);
  /// Deep copy of the planes and the filter.
  CNaxWaveletDecomposition(const CNaxWaveletDecomposition<T>& other) { Copy(other); }
  CNaxWaveletDecomposition<T>& operator=(const CNaxWaveletDecomposition<T>& other);
  /// As Destroy.
  ~CNaxWaveletDecomposition() { Destroy(); }

  /// This object becomes a deep copy of `other`.
  void Copy(const CNaxWaveletDecomposition<T>& other);
  /// New deep copy, owned by the caller.
  CNaxWaveletDecomposition<T>* CloneDecomposition() const;
  /// Releases the planes, their array and the filter; no planes remain.
  void Destroy();

  /// Plane `index`, unchecked.
  CNaxChannel<T>* operator[](int32 index) const { return m_channels[index]; }
  int32 GetChannelsNb() const { return m_channelsNb; }
  CNaxWaveletFilter<T>* GetFilter() const { return m_filter; }
  /// Wavelet type of the filter; -1 without a filter.
  naxWaveletType GetWaveletType() const {
    return m_filter != nullptr ? m_filter->GetWavelet() : static_cast<naxWaveletType>(-1);
  }
  naxWaveletNormalization GetTypeOfNormalization() const { return m_normalization; }
  int32 IsDecomposed() const { return m_decomposed; }
  /// Columns and rows of plane 0 (0 without planes).
  int32 GetImageWidth() const;
  int32 GetImageHeight() const;

  /// Replaces the planes by `number` zeroed planes of cols by rows.
  void CreateChannels(int32 cols, int32 rows, int32 number);
  void SetChannelsNb(int32 number) { m_channelsNb = number; }
  /// Plane `index` becomes a copy of the tree of `channel`.
  void SetChannel(const CNaxChannel<T>* channel, int32 index);
  void SetIsDecomposed(int32 decomposed) { m_decomposed = decomposed; }
  void SetTypeOfNormalization(naxWaveletNormalization normalization) {
    m_normalization = normalization;
  }
  /// Installs an owned filter of `type` and gives it to the planes (a decomposed plane of
  /// another wavelet type is destroyed, as by CNaxChannel::SetFilter).
  void SetFilter(naxWaveletType type);
  /// Installs an owned filter of `type` and the normalization and gives both to the planes.
  void SetDecompositionTypes(naxWaveletType type, naxWaveletNormalization normalization);
  /// Gives `filter`, the planes' own channel type and `normalization` to every node of
  /// every plane (by the rule of CNaxChannel::SetDecompositionTypes at the top).
  void SetDecompositionTypesToChannels(CNaxWaveletFilter<T>* filter,
                                       naxWaveletNormalization normalization);
  /// The same with `type` as the channel type.
  void SetDecompositionTypesToChannels(CNaxWaveletFilter<T>* filter, naxChannelType type,
                                       naxWaveletNormalization normalization);

  /// Loads `channels` planes of width by height from pixel form; the object becomes raw.
  void SetImage(int32 width, int32 height, int32 channels, const T* data);
  /// Loads from 8-bit form.
  void Set8BitsImage(int32 width, int32 height, int32 channels, const unsigned char* data);
  /// Writes pixel form. A decomposed object is first inverted in place and left raw with
  /// normalization 0. A plane without data gives zeros.
  void GetImageInPixelForm(T* data);
  /// Writes 8-bit form without any inverse: each sample rounded half away from zero and
  /// stored as its low eight bits (no clamping: 300 gives 44, 256 gives 0).
  void GetImageIn8BitsFormat(unsigned char* data) const;
  /// Writes packed form: each plane's tree packed (a raw plane as it is).
  void GetImageInPackedForm(T* data) const;
  /// Packed planes as a new raw object owned by the caller.
  CNaxWaveletDecomposition<T>* GetImageInPackedForm() const;
  /// Reverse of the packed form: a new object of wavelet `type` whose planes are the
  /// two-dimensional trees of `depth` levels read from this object's packed planes.
  CNaxWaveletDecomposition<T>* UnpackDecomposedImage(naxWaveletType type, int32 depth,
                                                     naxWaveletNormalization normalization) const;

  /// New decomposed object (owned by the caller) with every plane transformed by `depth`
  /// levels of `type` and this object's normalization. This object's raw planes are
  /// consumed (left empty). Depth under 1 gives copies and a raw object.
  CNaxWaveletDecomposition<T>* FWT(int32 depth, naxChannelType type);
  /// The same, each plane with its own depth and type.
  CNaxWaveletDecomposition<T>* FWT(const int32* depths, const naxChannelType* types);
  /// FWT at the largest depth that the shape of plane 0 allows; null for a type other
  /// than 1, 2, 3.
  CNaxWaveletDecomposition<T>* FWTMaxDepth(naxChannelType type);
  /// The same with each plane's depth limited by limits[plane].
  CNaxWaveletDecomposition<T>* FWTMaxDepth(naxChannelType type, const int32* limits);
  void FWTInPlace(int32 depth, naxChannelType type);
  void FWTInPlace(const int32* depths, const naxChannelType* types);
  void FWTMaxDepthInPlace(naxChannelType type);
  /// New raw object with the inverse of every plane; this object's planes are consumed.
  CNaxWaveletDecomposition<T>* IFWT();
  void IFWTInPlace();

  /// Smallest depth of the planes into `depth` (0 when raw); 1 when all are equal, else 0.
  int32 HasCommonDepth(int32& depth) const;
  /// 1 when both images have the same planes and shapes and all samples agree within
  /// `tolerance`, else 0. A decomposed operand is compared by its inverse and is consumed.
  int32 DecompositionsAreAlmostEqual(CNaxWaveletDecomposition<T>& other, T tolerance);

  /// EstimateThreshold of each plane into first[plane] and ratios[plane]; a raw object is
  /// estimated on a two-dimensional transform of `depth` levels of a copy.
  void EstimateThresholds(int32 depth, T* first, T* ratios) const;
  /// Replaces each decomposed plane by its CleanBelowThreshold, with the per-plane
  /// thresholds read from and reported into the two arrays.
  void ReduceNoise(T* first, T* ratios, int32 soft, naxWaveletDenoising method);
  /// Replaces each decomposed plane by its CleanDirectly with its own pair.
  void ReduceNoiseDirectly(const T* first, const T* ratios, int32 soft);
  /// Replaces each raw plane by its CleanWithCircularShifts.
  void ReduceNoiseByCircularShifts(T* first, T* ratios, int32 shifts, int32 depth, int32 soft,
                                   naxWaveletDenoising method);
  /// Enhance of each plane; nothing when |factor - 1| < 1e-6.
  void EnhanceSharpFeatures(T factor);
  /// EnhanceHRLevel of each plane.
  void EnhanceSharpFeatures(T factor, int32 level);
  /// EnhanceSubLevel of each plane.
  void EnhanceSharpFeatures(T factor, int32 level, int32 index);
  /// EditByLevels of each plane.
  void EditByLevels(const T* factors);
  /// a * this + b * other plane by plane, as a new object owned by the caller.
  CNaxWaveletDecomposition<T>* Combine(const CNaxWaveletDecomposition<T>& other, T a, T b) const;
  /// MixByLevels plane by plane, as a new object owned by the caller.
  CNaxWaveletDecomposition<T>* MixByLevels(const CNaxWaveletDecomposition<T>& other,
                                           const T* weights) const;
  /// New raw object with each plane's lowest low band resampled to the image's size.
  CNaxWaveletDecomposition<T>* GetScaledLowImage() const;
  /// New raw object with each plane's band (`level`, `type`) resampled to the image's size.
  CNaxWaveletDecomposition<T>* GetScaledHighImage(int32 level, naxSubChannelType type) const;

 private:
  void DestroyChannels();
  void AllocateChannels(int32 number);
  void PassSettings();
  static void PassToTree(CNaxChannel<T>* channel, CNaxWaveletFilter<T>* filter,
                         naxChannelType type, naxWaveletNormalization normalization);
  CNaxWaveletDecomposition<T>* EmptyLike(int32 decomposed) const;
  CNaxWaveletDecomposition<T>* Transformed(const int32* depths, const naxChannelType* types);
  void TakeOver(CNaxWaveletDecomposition<T>* other);
  void Replace(int32 index, CNaxChannel<T>* channel);
  template <typename Sample, typename Convert>
  void Load(int32 width, int32 height, int32 channels, const Sample* data, Convert convert);
  template <typename Sample, typename Convert>
  void Interleave(const CNaxChannel<T>* const* planes, Sample* data, Convert convert) const;

  int32 m_channelsNb = 0;
  CNaxWaveletFilter<T>* m_filter = nullptr;
  CNaxChannel<T>** m_channels = nullptr;
  naxWaveletNormalization m_normalization = naxNoNormalization;
  int32 m_decomposed = 0;
};

// ---------------------------------------------------------------------------------------
// Construction, copies, planes

template <typename T>
CNaxWaveletDecomposition<T>::CNaxWaveletDecomposition(naxWaveletType type)
    : m_filter(new CNaxWaveletFilter<T>(type)) {}

template <typename T>
CNaxWaveletDecomposition<T>& CNaxWaveletDecomposition<T>::operator=(
    const CNaxWaveletDecomposition<T>& other) {
  if (this != &other) Copy(other);
  return *this;
}

template <typename T>
void CNaxWaveletDecomposition<T>::Copy(const CNaxWaveletDecomposition<T>& other) {
  if (this == &other) return;
  Destroy();
  // The filter's copy constructor does not carry the coefficients: build it anew.
  if (other.m_filter != nullptr) m_filter = new CNaxWaveletFilter<T>(other.m_filter->GetWavelet());
  m_normalization = other.m_normalization;
  m_decomposed = other.m_decomposed;
  AllocateChannels(other.m_channelsNb);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    if (other.m_channels[c] == nullptr) continue;
    m_channels[c]->CopyDecomposedChannel(other.m_channels[c]);
    PassToTree(m_channels[c], m_filter, m_channels[c]->GetType(),
               m_channels[c]->GetTypeOfNormalization());
  }
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::CloneDecomposition() const {
  return new CNaxWaveletDecomposition<T>(*this);
}

template <typename T>
void CNaxWaveletDecomposition<T>::DestroyChannels() {
  if (m_channels != nullptr)
    for (int32 c = 0; c < m_channelsNb; ++c) delete m_channels[c];
  delete[] m_channels;
  m_channels = nullptr;
  m_channelsNb = 0;
}

template <typename T>
void CNaxWaveletDecomposition<T>::Destroy() {
  DestroyChannels();
  delete m_filter;
  m_filter = nullptr;
  m_decomposed = 0;
}

template <typename T>
void CNaxWaveletDecomposition<T>::AllocateChannels(int32 number) {
  DestroyChannels();
  if (number < 1) return;
  m_channels = new CNaxChannel<T>*[number]();
  m_channelsNb = number;
  for (int32 c = 0; c < number; ++c) m_channels[c] = new CNaxChannel<T>();
}

template <typename T>
int32 CNaxWaveletDecomposition<T>::GetImageWidth() const {
  return m_channelsNb > 0 && m_channels[0] != nullptr ? m_channels[0]->GetColsNb() : 0;
}

template <typename T>
int32 CNaxWaveletDecomposition<T>::GetImageHeight() const {
  return m_channelsNb > 0 && m_channels[0] != nullptr ? m_channels[0]->GetRowsNb() : 0;
}

template <typename T>
void CNaxWaveletDecomposition<T>::CreateChannels(int32 cols, int32 rows, int32 number) {
  AllocateChannels(number);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    m_channels[c]->SetColsNb(cols);
    m_channels[c]->SetRowsNb(rows);
    m_channels[c]->Initialize();
    m_channels[c]->SetFilter(m_filter);
    m_channels[c]->SetTypeOfNormalization(m_normalization);
  }
  m_decomposed = 0;
}

template <typename T>
void CNaxWaveletDecomposition<T>::SetChannel(const CNaxChannel<T>* channel, int32 index) {
  if (channel == nullptr || index < 0 || index >= m_channelsNb) return;
  if (m_channels[index] == nullptr) m_channels[index] = new CNaxChannel<T>();
  m_channels[index]->CopyDecomposedChannel(channel);
}

// Filter, type and normalization into every node of a tree. The top follows the rule of
// SetDecompositionTypes; the nodes below must carry the same filter, since the inverse of
// each level reads its own node's filter.
template <typename T>
void CNaxWaveletDecomposition<T>::PassToTree(CNaxChannel<T>* channel,
                                             CNaxWaveletFilter<T>* filter, naxChannelType type,
                                             naxWaveletNormalization normalization) {
  if (channel == nullptr) return;
  channel->SetDecompositionTypes(filter, type, normalization);
  for (CNaxChannel<T>* node = channel; node != nullptr && node->IsDecomposed() != 0;
       node = node->SubChannel(0)) {
    node->SetDecompositionTypes(filter, type, normalization);
    node->Inherit();
  }
}

template <typename T>
void CNaxWaveletDecomposition<T>::PassSettings() {
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr)
      PassToTree(m_channels[c], m_filter, m_channels[c]->GetType(), m_normalization);
}

template <typename T>
void CNaxWaveletDecomposition<T>::SetFilter(naxWaveletType type) {
  auto* filter = new CNaxWaveletFilter<T>(type);
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr) {
      m_channels[c]->SetFilter(filter);
      PassToTree(m_channels[c], filter, m_channels[c]->GetType(),
                 m_channels[c]->GetTypeOfNormalization());
    }
  delete m_filter;
  m_filter = filter;
}

template <typename T>
void CNaxWaveletDecomposition<T>::SetDecompositionTypes(naxWaveletType type,
                                                        naxWaveletNormalization normalization) {
  auto* filter = new CNaxWaveletFilter<T>(type);
  m_normalization = normalization;
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr)
      PassToTree(m_channels[c], filter, m_channels[c]->GetType(), normalization);
  delete m_filter;
  m_filter = filter;
}

template <typename T>
void CNaxWaveletDecomposition<T>::SetDecompositionTypesToChannels(
    CNaxWaveletFilter<T>* filter, naxWaveletNormalization normalization) {
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr)
      PassToTree(m_channels[c], filter, m_channels[c]->GetType(), normalization);
}

template <typename T>
void CNaxWaveletDecomposition<T>::SetDecompositionTypesToChannels(
    CNaxWaveletFilter<T>* filter, naxChannelType type, naxWaveletNormalization normalization) {
  for (int32 c = 0; c < m_channelsNb; ++c) PassToTree(m_channels[c], filter, type, normalization);
}

// ---------------------------------------------------------------------------------------
// Image forms

template <typename T>
template <typename Sample, typename Convert>
void CNaxWaveletDecomposition<T>::Load(int32 width, int32 height, int32 channels,
                                       const Sample* data, Convert convert) {
  AllocateChannels(channels);
  m_decomposed = 0;
  if (m_channelsNb < 1 || width < 1 || height < 1) return;
  const int64 n = static_cast<int64>(width) * height;
  std::unique_ptr<T[]> plane(new T[n]);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    for (int64 k = 0; k < n; ++k) plane[k] = convert(data[k * channels + c]);
    CNaxChannel<T>* channel = m_channels[c];
    channel->SetColsNb(width);
    channel->SetRowsNb(height);
    channel->SetData(plane.get());
    channel->SetFilter(m_filter);
    channel->SetTypeOfNormalization(m_normalization);
  }
}

template <typename T>
void CNaxWaveletDecomposition<T>::SetImage(int32 width, int32 height, int32 channels,
                                           const T* data) {
  Load(width, height, channels, data, [](T v) { return v; });
}

template <typename T>
void CNaxWaveletDecomposition<T>::Set8BitsImage(int32 width, int32 height, int32 channels,
                                                const unsigned char* data) {
  Load(width, height, channels, data, [](unsigned char v) { return static_cast<T>(v); });
}

// Writes the samples of each plane, converted, into the interleaved array of the image's
// width and height; a plane without data (or null) gives zeros.
template <typename T>
template <typename Sample, typename Convert>
void CNaxWaveletDecomposition<T>::Interleave(const CNaxChannel<T>* const* planes, Sample* data,
                                             Convert convert) const {
  const int64 n = static_cast<int64>(GetImageWidth()) * GetImageHeight();
  const int32 count = m_channelsNb;
  for (int32 c = 0; c < count; ++c) {
    const CNaxChannel<T>* plane = planes[c];
    const T* samples = plane != nullptr ? plane->GetData() : nullptr;
    const int64 size = plane != nullptr ? static_cast<int64>(plane->GetColsNb()) * plane->GetRowsNb() : 0;
    for (int64 k = 0; k < n; ++k)
      data[k * count + c] = samples != nullptr && k < size ? convert(samples[k]) : Sample(0);
  }
}

template <typename T>
void CNaxWaveletDecomposition<T>::GetImageInPixelForm(T* data) {
  if (m_decomposed != 0) {
    PassSettings();
    for (int32 c = 0; c < m_channelsNb; ++c)
      if (m_channels[c] != nullptr && m_channels[c]->IsDecomposed() != 0)
        m_channels[c]->IFWTInPlace();
    m_normalization = naxNoNormalization;
    m_decomposed = 0;
  }
  Interleave(m_channels, data, [](T v) { return v; });
}

template <typename T>
void CNaxWaveletDecomposition<T>::GetImageIn8BitsFormat(unsigned char* data) const {
  Interleave(m_channels, data, [](T v) {
    if (std::isnan(v)) return static_cast<unsigned char>(0);
    const double r = std::trunc(v >= T(0) ? double(v) + 0.5 : double(v) - 0.5);
    double low = std::fmod(r, 256.0);  // the low eight bits, also of huge values
    if (low < 0) low += 256.0;
    return static_cast<unsigned char>(low);
  });
}

template <typename T>
void CNaxWaveletDecomposition<T>::GetImageInPackedForm(T* data) const {
  std::unique_ptr<CNaxWaveletDecomposition<T>> packed(GetImageInPackedForm());
  packed->Interleave(packed->m_channels, data, [](T v) { return v; });
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::GetImageInPackedForm() const {
  CNaxWaveletDecomposition<T>* result = EmptyLike(0);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    const CNaxChannel<T>* plane = m_channels[c];
    if (plane == nullptr) continue;
    if (plane->IsDecomposed() == 0) {
      result->m_channels[c]->CopyRawChannel(plane);
    } else {
      std::unique_ptr<CNaxChannel<T>> packed(plane->PackDecomposedChannel());
      result->m_channels[c]->TakeOver(packed.get());
    }
  }
  return result;
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::UnpackDecomposedImage(
    naxWaveletType type, int32 depth, naxWaveletNormalization normalization) const {
  auto* result = new CNaxWaveletDecomposition<T>(type);
  result->m_normalization = normalization;
  result->AllocateChannels(m_channelsNb);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    if (m_channels[c] == nullptr) continue;
    std::unique_ptr<CNaxChannel<T>> tree(m_channels[c]->UnpackDecomposedChannel(
        result->m_filter, naxChannel2D, depth, normalization));
    if (tree == nullptr) continue;
    if (tree->IsDecomposed() != 0) result->m_decomposed = 1;
    result->m_channels[c]->TakeOver(tree.get());
  }
  return result;
}

// ---------------------------------------------------------------------------------------
// Transforms

// A new object of this wavelet type and normalization with as many empty planes.
template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::EmptyLike(int32 decomposed) const {
  auto* result = m_filter != nullptr ? new CNaxWaveletDecomposition<T>(m_filter->GetWavelet())
                                     : new CNaxWaveletDecomposition<T>();
  result->m_normalization = m_normalization;
  result->m_decomposed = decomposed;
  result->AllocateChannels(m_channelsNb);
  return result;
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::Transformed(
    const int32* depths, const naxChannelType* types) {
  CNaxWaveletDecomposition<T>* result = EmptyLike(1);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    CNaxChannel<T>* plane = m_channels[c];
    if (plane == nullptr) continue;
    if (plane->IsDecomposed() == 0) plane->SetTypeOfNormalization(m_normalization);
    std::unique_ptr<CNaxChannel<T>> tree(plane->FWT(m_filter, types[c], depths[c]));
    if (tree == nullptr) {  // too small for a step: the plane survives and is copied
      result->m_channels[c]->CopyDecomposedChannel(plane);
    } else {
      result->m_channels[c]->TakeOver(tree.get());
    }
  }
  if (m_filter != nullptr) result->SetDecompositionTypes(m_filter->GetWavelet(), m_normalization);
  return result;
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::FWT(int32 depth, naxChannelType type) {
  if (depth < 1) {
    CNaxWaveletDecomposition<T>* result = CloneDecomposition();
    result->m_decomposed = 0;
    return result;
  }
  std::unique_ptr<int32[]> depths(new int32[m_channelsNb > 0 ? m_channelsNb : 1]);
  std::unique_ptr<naxChannelType[]> types(new naxChannelType[m_channelsNb > 0 ? m_channelsNb : 1]);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    depths[c] = depth;
    types[c] = type;
  }
  return Transformed(depths.get(), types.get());
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::FWT(const int32* depths,
                                                              const naxChannelType* types) {
  return Transformed(depths, types);
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::FWTMaxDepth(naxChannelType type) {
  return FWTMaxDepth(type, nullptr);
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::FWTMaxDepth(naxChannelType type,
                                                                      const int32* limits) {
  const int32 cols = GetImageWidth(), rows = GetImageHeight();
  int32 depth;
  switch (type) {
    case naxChannelRows: depth = naxCalculateMaximumDepth(cols); break;
    case naxChannelColumns: depth = naxCalculateMaximumDepth(rows); break;
    case naxChannel2D: depth = naxCalculateMaximumDepth(cols, rows); break;
    default: return nullptr;
  }
  if (limits == nullptr) return FWT(depth, type);
  const int32 n = m_channelsNb > 0 ? m_channelsNb : 1;
  std::unique_ptr<int32[]> depths(new int32[n]);
  std::unique_ptr<naxChannelType[]> types(new naxChannelType[n]);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    depths[c] = limits[c] < depth ? limits[c] : depth;
    types[c] = type;
  }
  return Transformed(depths.get(), types.get());
}

template <typename T>
void CNaxWaveletDecomposition<T>::TakeOver(CNaxWaveletDecomposition<T>* other) {
  if (other == nullptr) return;
  Destroy();
  m_channelsNb = other->m_channelsNb;
  m_channels = other->m_channels;
  m_filter = other->m_filter;
  m_normalization = other->m_normalization;
  m_decomposed = other->m_decomposed;
  other->m_channels = nullptr;
  other->m_channelsNb = 0;
  other->m_filter = nullptr;
  delete other;
}

template <typename T>
void CNaxWaveletDecomposition<T>::FWTInPlace(int32 depth, naxChannelType type) {
  TakeOver(FWT(depth, type));
}

template <typename T>
void CNaxWaveletDecomposition<T>::FWTInPlace(const int32* depths, const naxChannelType* types) {
  TakeOver(FWT(depths, types));
}

template <typename T>
void CNaxWaveletDecomposition<T>::FWTMaxDepthInPlace(naxChannelType type) {
  TakeOver(FWTMaxDepth(type));
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::IFWT() {
  CNaxWaveletDecomposition<T>* result = EmptyLike(0);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    CNaxChannel<T>* plane = m_channels[c];
    if (plane == nullptr) continue;
    std::unique_ptr<CNaxChannel<T>> raw(plane->IsDecomposed() != 0 ? plane->IFWT() : nullptr);
    if (raw != nullptr) {
      result->m_channels[c]->TakeOver(raw.get());
    } else {
      result->m_channels[c]->CopyRawChannel(plane);
    }
    result->m_channels[c]->SetFilter(result->m_filter);
  }
  return result;
}

template <typename T>
void CNaxWaveletDecomposition<T>::IFWTInPlace() {
  TakeOver(IFWT());
}

template <typename T>
int32 CNaxWaveletDecomposition<T>::HasCommonDepth(int32& depth) const {
  depth = 0;
  if (m_decomposed == 0 || m_channelsNb < 1) return 1;
  int32 common = 1;
  depth = m_channels[0] != nullptr ? m_channels[0]->GetDepth() : 0;
  for (int32 c = 1; c < m_channelsNb; ++c) {
    const int32 d = m_channels[c] != nullptr ? m_channels[c]->GetDepth() : 0;
    if (d != depth) {
      common = 0;
      if (d < depth) depth = d;
    }
  }
  return common;
}

template <typename T>
int32 CNaxWaveletDecomposition<T>::DecompositionsAreAlmostEqual(CNaxWaveletDecomposition<T>& other,
                                                               T tolerance) {
  std::unique_ptr<CNaxWaveletDecomposition<T>> mine(m_decomposed != 0 ? IFWT() : nullptr);
  std::unique_ptr<CNaxWaveletDecomposition<T>> theirs(other.m_decomposed != 0 ? other.IFWT()
                                                                             : nullptr);
  const CNaxWaveletDecomposition<T>& a = mine != nullptr ? *mine : *this;
  const CNaxWaveletDecomposition<T>& b = theirs != nullptr ? *theirs : other;
  if (a.m_channelsNb != b.m_channelsNb) return 0;
  for (int32 c = 0; c < a.m_channelsNb; ++c) {
    const CNaxChannel<T>* x = a.m_channels[c];
    const CNaxChannel<T>* y = b.m_channels[c];
    if (x == nullptr || y == nullptr) {
      if (x != y) return 0;
      continue;
    }
    if (x->GetColsNb() != y->GetColsNb() || x->GetRowsNb() != y->GetRowsNb()) return 0;
    if ((x->GetData() == nullptr) != (y->GetData() == nullptr)) return 0;
    if (x->GetData() == nullptr) continue;
    const int64 n = static_cast<int64>(x->GetColsNb()) * x->GetRowsNb();
    for (int64 k = 0; k < n; ++k)
      if (std::fabs(x->GetData()[k] - y->GetData()[k]) > tolerance) return 0;
  }
  return 1;
}

// ---------------------------------------------------------------------------------------
// Noise reduction, enhancement, mixing

template <typename T>
void CNaxWaveletDecomposition<T>::Replace(int32 index, CNaxChannel<T>* channel) {
  if (channel == nullptr) return;
  delete m_channels[index];
  m_channels[index] = channel;
}

template <typename T>
void CNaxWaveletDecomposition<T>::EstimateThresholds(int32 depth, T* first, T* ratios) const {
  for (int32 c = 0; c < m_channelsNb; ++c) {
    first[c] = T(0);
    ratios[c] = T(0);
    const CNaxChannel<T>* plane = m_channels[c];
    if (plane == nullptr) continue;
    if (plane->IsDecomposed() != 0) {
      plane->EstimateThreshold(first[c], ratios[c]);
      continue;
    }
    std::unique_ptr<CNaxChannel<T>> copy(plane->CloneRawChannel());
    std::unique_ptr<CNaxChannel<T>> tree(copy->FWT(m_filter, naxChannel2D, depth));
    if (tree != nullptr) tree->EstimateThreshold(first[c], ratios[c]);
  }
}

template <typename T>
void CNaxWaveletDecomposition<T>::ReduceNoise(T* first, T* ratios, int32 soft,
                                              naxWaveletDenoising method) {
  PassSettings();
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr && m_channels[c]->IsDecomposed() != 0)
      Replace(c, m_channels[c]->CleanBelowThreshold(first[c], ratios[c], soft, method));
}

template <typename T>
void CNaxWaveletDecomposition<T>::ReduceNoiseDirectly(const T* first, const T* ratios,
                                                      int32 soft) {
  PassSettings();
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr && m_channels[c]->IsDecomposed() != 0)
      Replace(c, m_channels[c]->CleanDirectly(first[c], ratios[c], soft));
}

template <typename T>
void CNaxWaveletDecomposition<T>::ReduceNoiseByCircularShifts(T* first, T* ratios, int32 shifts,
                                                              int32 depth, int32 soft,
                                                              naxWaveletDenoising method) {
  PassSettings();
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr && m_channels[c]->IsDecomposed() == 0)
      Replace(c, m_channels[c]->CleanWithCircularShifts(first[c], ratios[c], shifts, m_filter,
                                                        depth, soft, method));
}

template <typename T>
void CNaxWaveletDecomposition<T>::EnhanceSharpFeatures(T factor) {
  if (std::fabs(factor - T(1)) < T(1e-6)) return;
  PassSettings();
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr) m_channels[c]->Enhance(factor);
}

template <typename T>
void CNaxWaveletDecomposition<T>::EnhanceSharpFeatures(T factor, int32 level) {
  PassSettings();
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr) m_channels[c]->EnhanceHRLevel(factor, level);
}

template <typename T>
void CNaxWaveletDecomposition<T>::EnhanceSharpFeatures(T factor, int32 level, int32 index) {
  PassSettings();
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr) m_channels[c]->EnhanceSubLevel(factor, level, index);
}

template <typename T>
void CNaxWaveletDecomposition<T>::EditByLevels(const T* factors) {
  PassSettings();
  for (int32 c = 0; c < m_channelsNb; ++c)
    if (m_channels[c] != nullptr) m_channels[c]->EditByLevels(factors);
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::Combine(
    const CNaxWaveletDecomposition<T>& other, T a, T b) const {
  CNaxWaveletDecomposition<T>* result = EmptyLike(0);
  for (int32 c = 0; c < m_channelsNb && c < other.m_channelsNb; ++c) {
    if (m_channels[c] == nullptr || other.m_channels[c] == nullptr) continue;
    m_channels[c]->Combine(other.m_channels[c], a, b, result->m_channels[c]);
    if (result->m_channels[c]->IsDecomposed() != 0) result->m_decomposed = 1;
  }
  result->PassSettings();
  return result;
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::MixByLevels(
    const CNaxWaveletDecomposition<T>& other, const T* weights) const {
  CNaxWaveletDecomposition<T>* result = EmptyLike(m_decomposed);
  for (int32 c = 0; c < m_channelsNb && c < other.m_channelsNb; ++c) {
    if (m_channels[c] == nullptr || other.m_channels[c] == nullptr) continue;
    m_channels[c]->MixByLevels(other.m_channels[c], weights, result->m_channels[c]);
  }
  result->PassSettings();
  return result;
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::GetScaledLowImage() const {
  CNaxWaveletDecomposition<T>* result = EmptyLike(0);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    if (m_channels[c] == nullptr) continue;
    std::unique_ptr<CNaxChannel<T>> band(m_channels[c]->GetScaledLowChannel());
    if (band != nullptr) result->m_channels[c]->TakeOver(band.get());
  }
  return result;
}

template <typename T>
CNaxWaveletDecomposition<T>* CNaxWaveletDecomposition<T>::GetScaledHighImage(
    int32 level, naxSubChannelType type) const {
  CNaxWaveletDecomposition<T>* result = EmptyLike(0);
  for (int32 c = 0; c < m_channelsNb; ++c) {
    if (m_channels[c] == nullptr) continue;
    std::unique_ptr<CNaxChannel<T>> band(m_channels[c]->GetScaledHighChannel(level, type));
    if (band != nullptr) result->m_channels[c]->TakeOver(band.get());
  }
  return result;
}

extern template class CNaxWaveletDecomposition<float>;
extern template class CNaxWaveletDecomposition<double>;

#endif  // NAX_WAVELET_DECOMPOSITION_H
