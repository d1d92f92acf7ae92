// Noise reduction and enhancement of channel trees: the noise estimate, the thresholds,
// hard and soft shrinkage, cycle spinning, and scaling, mixing and combining of bands.
//
// The noise deviation is the median absolute deviation of the finest diagonal band over
// 0.6745, and the universal threshold sigma * sqrt(2 ln N), after D. L. Donoho,
// I. M. Johnstone, "Ideal spatial adaptation by wavelet shrinkage", Biometrika 81 (1994).
// Cycle spinning averages the denoised results over circular shifts, after R. R. Coifman,
// D. L. Donoho, "Translation-invariant de-noising", Lecture Notes in Statistics 103 (1995).
//
// Included by nax/channel.h, after the class.
#ifndef NAX_DETAIL_WAVELET_DENOISE_H
#define NAX_DETAIL_WAVELET_DENOISE_H

#include <algorithm>
#include <cmath>
#include <cstring>
#include <memory>

#include "nax/random.h"
#include "nax/statistics.h"

namespace nax::detail {

/// Variance about 0 of n samples, as CNaxStatistics::Variance(0); 0 for fewer than two.
template <typename T>
T VarianceAboutZero(const T* data, int64 n) {
  if (n < 2) return T(0);
  return CNaxStatistics<T>(static_cast<int32>(n), const_cast<T*>(data)).Variance(T(0));
}

/// Median of n samples as CNaxStatistics::Median gives it (the middle one of the sorted
/// samples, or the mean of the two middle ones), found by selection instead of a full
/// sort. The samples are reordered.
template <typename T>
T MedianBySelection(T* data, int64 n) {
  if (n < 1) return T(0);
  T* middle = data + (n - 1) / 2;
  std::nth_element(data, middle, data + n);
  if (n % 2 != 0) return *middle;
  return (*middle + *std::min_element(middle + 1, data + n)) / T(2);
}

/// Largest absolute value of n samples.
template <typename T>
T MaxAbs(const T* data, int64 n) {
  T m = T(0);
  for (int64 i = 0; i < n; ++i) m = std::fmax(m, std::fabs(data[i]));
  return m;
}

/// Zeroes the samples with |c| <= t; with `soft` the others move toward 0 by t.
template <typename T>
void ShrinkSamples(T* __restrict data, int64 n, T t, int32 soft) {
  if (soft != 0) {
    for (int64 i = 0; i < n; ++i) {
      const T c = data[i];
      data[i] = std::fabs(c) <= t ? T(0) : (c >= T(0) ? c - t : c + t);
    }
  } else {
    for (int64 i = 0; i < n; ++i)
      if (std::fabs(data[i]) <= t) data[i] = T(0);
  }
}

/// sigma * sqrt(2) * sqrt(ln n), with the guarded logarithm and root of the library.
template <typename T>
T UniversalThreshold(T sigma, int64 n) {
  const double x = static_cast<double>(n);
  const double lnN = x <= 1e-9 ? -20.72326583694641 : std::log(x);
  const double root = std::fabs(lnN) < 1e-9 || lnN < 0 ? 0.0 : std::sqrt(lnN);
  return sigma * T(1.4142135623730951) * T(root);
}

/// sqrt(ln(n/d)) of the band thresholds, in single precision: the guard 1e-7 gives the
/// logarithm -16.118095; a root of a magnitude under 1e-7 (or of a negative value) is 0.
inline float BandLogRoot(int64 n, int32 depth) {
  const float x = static_cast<float>(n) / static_cast<float>(depth);
  const float l = x <= 1e-7f ? -16.118095f : std::log(x);
  return std::fabs(l) < 1e-7f || l < 0.0f ? 0.0f : std::sqrt(l);
}

/// Adds `src`, a rows by cols array, to `sum` circularly shifted: element (x, y) of `src`
/// goes to ((x + shiftX) mod cols, (y + shiftY) mod rows), shifts in range.
template <typename T>
void AddShifted(const T* src, int32 cols, int32 rows, int32 shiftX, int32 shiftY, T* sum) {
  for (int32 y = 0; y < rows; ++y) {
    const T* s = src + static_cast<int64>(y) * cols;
    T* d = sum + static_cast<int64>((y + shiftY) % rows) * cols;
    const int32 split = cols - shiftX;  // source columns before the wrap
    for (int32 x = 0; x < split; ++x) d[x + shiftX] += s[x];
    for (int32 x = split; x < cols; ++x) d[x - split] += s[x];
  }
}

/// Mathematical remainder: in 0 .. n-1 for negative a too.
inline int32 Wrap(int32 a, int32 n) {
  const int32 r = a % n;
  return r < 0 ? r + n : r;
}

}  // namespace nax::detail

// ---------------------------------------------------------------------------------------
// Estimates

template <typename T>
T CNaxChannel<T>::EstimateNoise() const {
  const CNaxChannel<T>* band = m_decomposed != 0 ? SubChannel(1) : nullptr;
  if (band == nullptr || band->m_data == nullptr || band->Size() < 1) return T(0);
  const int64 n = band->Size();
  std::unique_ptr<T[]> magnitudes(new T[n]);
  for (int64 i = 0; i < n; ++i) magnitudes[i] = std::fabs(band->m_data[i]);
  return nax::detail::MedianBySelection(magnitudes.get(), n) / T(0.6745);
}

template <typename T>
void CNaxChannel<T>::EstimateThreshold(T& first, T& ratio) const {
  first = T(0);
  ratio = T(0);
  if (m_decomposed == 0) return;
  const T sigma = EstimateNoise();
  const T s2 = sigma * sigma;
  // Average of s2 / sqrt(V - s2) over the high bands of one node.
  const auto levelSum = [s2](const CNaxChannel<T>* node) {
    T sum = T(0);
    for (int32 k = 1; k < node->m_subChannelsNb; ++k) {
      const CNaxChannel<T>* band = node->m_subChannels[k];
      if (band == nullptr || band->m_data == nullptr) continue;
      const T d = nax::detail::VarianceAboutZero(band->m_data, band->Size()) - s2;
      if (d < T(1e-6)) {
        sum += T(1e6);
      } else {
        const T root = std::fabs(d) < T(1e-9) ? T(0) : std::sqrt(d);
        sum += s2 / root;
      }
    }
    return sum;
  };
  const int32 bands = m_subChannelsNb - 1;
  if (bands < 1) return;
  first = levelSum(this) / T(bands);
  if (GetDepth() > 1) ratio = levelSum(m_subChannels[0]) / (first * T(bands));
}

template <typename T>
T CNaxChannel<T>::GetAbsMaxInMask(const T* data, int32 index, int32 cols, int32 rows) const {
  const int32 x = index % cols, y = index / cols;
  T m = data[index];  // the centre enters with its sign
  if (y > 0) m = std::fmax(m, std::fabs(data[index - cols]));
  if (x > 0) m = std::fmax(m, std::fabs(data[index - 1]));
  if (x + 1 < cols) m = std::fmax(m, std::fabs(data[index + 1]));
  // Below-right: only the row is tested, so in the last column this is the first sample
  // two rows down; it is skipped only where it would lie past the array.
  const int64 below = static_cast<int64>(index) + cols + 1;
  if (y + 1 < rows && below < static_cast<int64>(cols) * rows) m = std::fmax(m, std::fabs(data[below]));
  return m;
}

// ---------------------------------------------------------------------------------------
// Cleaning

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CleanDirectly(T threshold, T ratio, int32 soft) const {
  if (m_decomposed == 0) return nullptr;
  CNaxChannel<T>* clone = CloneDecomposedChannel();
  T t = threshold;
  for (CNaxChannel<T>* node = clone; node != nullptr && node->m_decomposed != 0;
       node = node->m_subChannels[0]) {
    if (t > T(1e-6))
      for (int32 k = 1; k < node->m_subChannelsNb; ++k) {
        CNaxChannel<T>* band = node->m_subChannels[k];
        if (band != nullptr && band->m_data != nullptr)
          nax::detail::ShrinkSamples(band->m_data, band->Size(), t, soft);
      }
    t = threshold * ratio;  // once, not per level
    if (node->m_subChannels == nullptr) break;
  }
  return clone;
}

template <typename T>
void CNaxChannel<T>::ShrinkBand(const CNaxChannel<T>* original, T t, int32 soft,
                                naxWaveletDenoising method) {
  const int64 n = Size();
  if (method != naxDenoisingByBandSignalAndNeighbours) {
    nax::detail::ShrinkSamples(m_data, n, t, soft);
    return;
  }
  // The neighbourhood is read from the original band, so the order of the writes is free.
  const T* mask = original->m_data;
  for (int64 i = 0; i < n; ++i) {
    const T c = m_data[i];
    if (soft != 0 && c >= t) {
      m_data[i] = c - t;
    } else if (soft != 0 && c <= -t) {
      m_data[i] = c + t;
    } else if (GetAbsMaxInMask(mask, static_cast<int32>(i), m_cols, m_rows) < t) {
      m_data[i] = T(0);
    }
  }
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CleanBelowThreshold(T& first, T& ratio, int32 soft,
                                                    naxWaveletDenoising method) const {
  if (m_decomposed == 0) return nullptr;
  CNaxChannel<T>* clone = CloneDecomposedChannel();
  const T sigma = EstimateNoise(), s2 = sigma * sigma;
  const int32 depth = GetDepth();
  const bool byBand = method == naxDenoisingByBandDeviation || method == naxDenoisingByBandSignal ||
                      method == naxDenoisingByBandSignalAndNeighbours;
  T t = T(0);
  if (method == naxDenoisingByGivenThresholds) {
    t = first;
  } else if (method == naxDenoisingUniversal || method == naxDenoisingUniversalByLevels) {
    t = nax::detail::UniversalThreshold(sigma, Size());
    if (method == naxDenoisingUniversalByLevels) {
      const T root = std::sqrt(std::pow(T(2), T(std::abs(depth - 1))));
      t = depth - 1 < 0 ? t * root : t / root;
    }
  }
  CNaxChannel<T>* node = clone;
  const CNaxChannel<T>* source = this;
  for (int32 level = 0; level < depth; ++level) {
    for (int32 k = 1; k < node->m_subChannelsNb; ++k) {
      CNaxChannel<T>* band = node->m_subChannels[k];
      if (band == nullptr || band->m_data == nullptr || band->Size() < 1) continue;
      if (byBand) {
        const T root = T(nax::detail::BandLogRoot(band->Size(), depth));
        T v = nax::detail::VarianceAboutZero(band->m_data, band->Size());
        bool found;
        if (method == naxDenoisingByBandDeviation) {
          found = v > T(1e-6);
        } else {
          v -= s2;
          found = v >= T(1e-6);
        }
        t = found ? root * s2 / std::sqrt(v) : nax::detail::MaxAbs(band->m_data, band->Size());
        if (level == 0) first += t;
      }
      if (t > T(1e-6)) band->ShrinkBand(source->m_subChannels[k], t, soft, method);
    }
    if (byBand && level == 0 && node->m_subChannelsNb > 1) first /= T(node->m_subChannelsNb - 1);
    if (level == 1) {
      if (method == naxDenoisingUniversal) ratio = T(1);
      else if (method == naxDenoisingUniversalByLevels) ratio = T(1.4142135623730951);
      else ratio = first != T(0) ? t / first : T(0);
    }
    if (method == naxDenoisingUniversalByLevels) t *= T(1.4142135623730951);
    else if (method == naxDenoisingByGivenThresholds) t *= ratio;
    node = node->m_subChannels[0];
    source = source->m_subChannels[0];
  }
  clone->m_filter = m_filter;
  clone->m_type = m_type;
  clone->m_normalization = m_normalization;
  return clone;
}

// One pass of cycle spinning: transform `work` (consumed), clean, reconstruct. A channel
// too small for the transform comes back unchanged.
template <typename T>
CNaxChannel<T>* CNaxChannel<T>::DenoisedPass(CNaxChannel<T>* work, T& first, T& ratio,
                                             CNaxWaveletFilter<T>* filter, int32 depth,
                                             int32 soft, naxWaveletDenoising method) {
  std::unique_ptr<CNaxChannel<T>> tree(work->FWT(filter, naxChannel2D, depth));
  if (tree == nullptr) return work->CloneRawChannel();
  if (tree->m_decomposed == 0) return tree.release();
  std::unique_ptr<CNaxChannel<T>> cleaned(tree->CleanBelowThreshold(first, ratio, soft, method));
  tree.reset();
  return cleaned->IFWT();
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CleanWithCircularShifts(T& first, T& ratio, int32 shifts,
                                                        CNaxWaveletFilter<T>* filter,
                                                        int32 depth, int32 soft,
                                                        naxWaveletDenoising method) const {
  if (m_decomposed != 0 || m_data == nullptr || Size() < 1) return nullptr;
  const int64 n = Size();
  std::unique_ptr<T[]> sum(new T[n]);
  const T firstIn = first, ratioIn = ratio;
  {
    std::unique_ptr<CNaxChannel<T>> work(CloneRawChannel());
    std::unique_ptr<CNaxChannel<T>> pass(
        DenoisedPass(work.get(), first, ratio, filter, depth, soft, method));
    std::memcpy(sum.get(), pass->m_data, static_cast<size_t>(n) * sizeof(T));
  }
  CNaxRandom<T> random;
  random.SetRandomSeeds();
  random.SetUniform(T(0), T(1));
  random.Initialize();
  T firstSum = first, ratioSum = ratio;
  CNaxChannel<T> work;
  for (int32 round = 0; round < shifts; ++round) {
    const int32 sy = random.GetIntegerNumber32(0, m_rows / 4);
    const int32 sx = random.GetIntegerNumber32(0, m_cols / 4);
    work.CopyDataWithShifts(this, sy, sx);
    work.m_normalization = naxNormalizationBySecondNorms;  // whatever this channel holds
    T roundFirst = firstIn, roundRatio = ratioIn;
    std::unique_ptr<CNaxChannel<T>> pass(
        DenoisedPass(&work, roundFirst, roundRatio, filter, depth, soft, method));
    // Element (x, y) of the pass stands for ((x + sx) mod cols, (y + sy) mod rows).
    nax::detail::AddShifted(pass->m_data, m_cols, m_rows, nax::detail::Wrap(sx, m_cols),
                            nax::detail::Wrap(sy, m_rows), sum.get());
    firstSum += roundFirst;
    ratioSum += roundRatio;
  }
  const T scale = T(1) / T(shifts + 1 > 0 ? shifts + 1 : 1);
  for (int64 i = 0; i < n; ++i) sum[i] *= scale;
  first = firstSum * scale;
  ratio = ratioSum * scale;
  CNaxChannel<T>* result = CloneRawChannel();
  std::memcpy(result->m_data, sum.get(), static_cast<size_t>(n) * sizeof(T));
  return result;
}

template <typename T>
void CNaxChannel<T>::CopyDataWithShifts(const CNaxChannel<T>* channel, int32 shiftY,
                                        int32 shiftX) {
  if (channel == this) {  // shift a copy of the own samples
    std::unique_ptr<CNaxChannel<T>> copy(CloneRawChannel());
    CopyDataWithShifts(copy.get(), shiftY, shiftX);
    return;
  }
  ReleaseStorage();
  CopyGeometry(channel);
  m_normalization = channel->m_normalization;
  m_decomposed = 0;
  if (channel->m_data == nullptr || Size() < 1) return;
  m_data = NewSamples(Size(), false);
  const int32 sx = nax::detail::Wrap(shiftX, m_cols), sy = nax::detail::Wrap(shiftY, m_rows);
  const size_t tail = static_cast<size_t>(m_cols - sx), head = static_cast<size_t>(sx);
  for (int32 y = 0; y < m_rows; ++y) {
    const T* src = channel->m_data + Index(0, (y + sy) % m_rows);
    T* dst = m_data + Index(0, y);
    std::memcpy(dst, src + sx, tail * sizeof(T));
    std::memcpy(dst + tail, src, head * sizeof(T));
  }
}

// ---------------------------------------------------------------------------------------
// Enhancement and editing by levels

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::NodeAtLevel(int32 level) const {
  const CNaxChannel<T>* node = this;
  for (int32 k = 1; k < level && node != nullptr && node->m_subChannels != nullptr; ++k)
    node = node->m_subChannels[0];
  return const_cast<CNaxChannel<T>*>(node);
}

template <typename T>
void CNaxChannel<T>::ScaleHighBands(T factor) {
  for (int32 k = 1; k < m_subChannelsNb; ++k)
    if (m_subChannels[k] != nullptr) m_subChannels[k]->EnhanceRawData(factor);
}

template <typename T>
void CNaxChannel<T>::Enhance(T factor) {
  if (std::fabs(factor - T(1)) < T(1e-6) || m_decomposed == 0) return;
  T g = factor;
  for (CNaxChannel<T>* node = this; node != nullptr && node->m_decomposed != 0;
       node = node->m_subChannels[0]) {
    node->ScaleHighBands(g);
    if (factor > T(1)) {
      g /= T(2);
      if (g <= T(1)) break;
    } else {
      g *= T(2);
      if (g >= T(1)) break;
    }
  }
}

template <typename T>
void CNaxChannel<T>::EnhanceHRLevel(T factor, int32 level) {
  if (m_decomposed == 0 || level > GetDepth()) return;
  NodeAtLevel(level)->ScaleHighBands(factor);
}

template <typename T>
void CNaxChannel<T>::EnhanceSubLevel(T factor, int32 level, int32 index) {
  if (m_decomposed == 0 || level > GetDepth()) return;
  CNaxChannel<T>* band = NodeAtLevel(level)->SubChannel(index);
  if (band != nullptr) band->EnhanceRawData(factor);
}

template <typename T>
void CNaxChannel<T>::EnhanceRawData(T factor) {
  if (m_data == nullptr) return;
  const int64 n = Size();
  for (int64 i = 0; i < n; ++i) m_data[i] *= factor;
}

template <typename T>
void CNaxChannel<T>::EditByLevels(const T* factors) {
  if (m_decomposed == 0) return;
  const int32 depth = GetDepth();
  CNaxChannel<T>* node = this;
  for (int32 level = 0; level < depth; ++level) {
    node->ScaleHighBands(factors[level]);
    if (level + 1 < depth) node = node->m_subChannels[0];
  }
  if (node->m_subChannels[0] != nullptr) node->m_subChannels[0]->EnhanceRawData(factors[depth]);
}

// ---------------------------------------------------------------------------------------
// Mixing and combining

// result = a * x + b * y over the samples of every node the three trees share in shape.
template <typename T>
void CNaxChannel<T>::CombineSamples(const CNaxChannel<T>* x, const CNaxChannel<T>* y, T a, T b,
                                    CNaxChannel<T>* result) {
  if (x == nullptr || y == nullptr || result == nullptr) return;
  if (result->m_data != nullptr && x->m_data != nullptr && y->m_data != nullptr &&
      x->m_cols == y->m_cols && x->m_rows == y->m_rows && result->Size() == x->Size()) {
    const int64 n = result->Size();
    const T* __restrict px = x->m_data;
    const T* __restrict py = y->m_data;
    T* __restrict pr = result->m_data;
    for (int64 i = 0; i < n; ++i) pr[i] = a * px[i] + b * py[i];
  }
  if (result->m_subChannels == nullptr || x->m_subChannels == nullptr ||
      y->m_subChannels == nullptr)
    return;
  for (int32 k = 0; k < result->m_subChannelsNb; ++k)
    if (k < x->m_subChannelsNb && k < y->m_subChannelsNb)
      CombineSamples(x->m_subChannels[k], y->m_subChannels[k], a, b, result->m_subChannels[k]);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::MixByLevels(const CNaxChannel<T>* other, const T* weights,
                                            CNaxChannel<T>* result) const {
  if (result == nullptr) result = new CNaxChannel<T>();
  result->Destroy();
  result->CopyDecomposedChannel(this);
  const int32 depth = GetDepth();
  CNaxChannel<T>* node = result;
  const CNaxChannel<T>* mine = this;
  const CNaxChannel<T>* theirs = other;
  for (int32 level = 0; level < depth && theirs != nullptr; ++level) {
    const T w = weights[level];
    for (int32 k = 1; k < node->m_subChannelsNb && k < theirs->m_subChannelsNb; ++k)
      CombineSamples(mine->m_subChannels[k], theirs->m_subChannels[k], w, T(1) - w,
                     node->m_subChannels[k]);
    node = node->m_subChannels[0];
    mine = mine->m_subChannels[0];
    theirs = theirs->m_subChannelsNb > 0 ? theirs->m_subChannels[0] : nullptr;
  }
  if (theirs != nullptr && mine->m_data != nullptr)  // the lowest low band, or raw data
    CombineSamples(mine, theirs, weights[depth], T(1) - weights[depth], node);
  return result;
}

// A copy of this tree reconstructed up to `depth` levels: the normalization is taken off,
// the levels below `depth` are inverted, and the normalization is put back on the rest.
template <typename T>
CNaxChannel<T>* CNaxChannel<T>::ReducedTo(int32 depth) const {
  CNaxChannel<T>* clone = CloneDecomposedChannel();
  if (clone == nullptr) return CloneRawChannel();
  const naxWaveletNormalization normalization = m_normalization;
  if (normalization != naxNoNormalization) clone->Denormalize();
  if (depth < 1) {
    CNaxChannel<T>* raw = clone->DestroyingIFWT();
    delete clone;
    return raw;
  }
  CNaxChannel<T>* parent = clone->NodeAtLevel(depth);
  CNaxChannel<T>* low = parent->m_subChannels[0];
  if (low != nullptr && low->m_decomposed != 0) {
    CNaxChannel<T>* raw = low->DestroyingIFWT();
    delete low;
    raw->m_filter = m_filter;
    raw->m_type = m_type;
    raw->m_normalization = normalization;
    parent->m_subChannels[0] = raw;
  }
  if (normalization != naxNoNormalization) clone->Normalize(depth, normalization);
  return clone;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::Combine(const CNaxChannel<T>* other, T a, T b,
                                        CNaxChannel<T>* result) const {
  const int32 mine = GetDepth(), theirs = other->GetDepth();
  std::unique_ptr<CNaxChannel<T>> reducedMine(mine > theirs ? ReducedTo(theirs) : nullptr);
  std::unique_ptr<CNaxChannel<T>> reducedTheirs(theirs > mine ? other->ReducedTo(mine) : nullptr);
  const CNaxChannel<T>* x = reducedMine != nullptr ? reducedMine.get() : this;
  const CNaxChannel<T>* y = reducedTheirs != nullptr ? reducedTheirs.get() : other;
  if (result == nullptr) result = new CNaxChannel<T>();
  result->Destroy();
  result->CopyDecomposedChannel(x);
  CombineSamples(x, y, a, b, result);
  return result;
}

#endif  // NAX_DETAIL_WAVELET_DENOISE_H
