// Two-dimensional channels and their multi-level lifting wavelet transform.
//
// A channel is either raw (a row-major array of samples) or decomposed (a tree of
// sub-channels: low and high bands of a split along rows, columns or both, the low band
// possibly split further). It keeps the absolute position of its first sample, so that a
// part cut out of a larger signal is transformed with the same sample parities as the whole.
//
// Ownership: a node owns its data, its sub-channel records and the trees below them; the
// filter is not owned and must outlive the channel. FWT, FWTStep, IFWT and DestroyingIFWT
// consume a raw (respectively decomposed) channel and return a new tree owned by the caller.
//
// Noise reduction and enhancement of the high bands, and the editing routines (windows,
// packing, rescaling), are defined in nax/detail/wavelet_denoise.h and
// nax/detail/wavelet_edit.h.
#ifndef NAX_CHANNEL_H
#define NAX_CHANNEL_H

#include <cmath>
#include <cstring>
#include <iostream>

#include "nax/detail/wavelet_channel.h"
#include "nax/lifting.h"
#include "nax/types.h"
#include "nax/wavelet_filter.h"

/// Index of a sub-channel of a decomposed channel.
enum naxSubChannelType : int32 {
  naxSubChannelLow = 0,  ///< low band (LL in two dimensions); the next level's parent
  naxSubChannelHH = 1,   ///< high band of a one-dimensional split; HH in two dimensions
  naxSubChannelLH = 2,   ///< high along X, low along Y
  naxSubChannelHL = 3    ///< low along X, high along Y
};

/// How the thresholds of noise reduction are found. Sigma is the noise estimate of the
/// finest band, N the channel's sample count, d its depth, n a band's sample count.
enum naxWaveletDenoising : int32 {
  /// The caller's threshold on the first level, times the caller's ratio on each further one.
  naxDenoisingByGivenThresholds = 0,
  /// sigma * sqrt(2 ln N) on all levels.
  naxDenoisingUniversal = 1,
  /// sigma * sqrt(2 ln N) / sqrt(2^(d-1)) on the first level, times sqrt(2) per level.
  naxDenoisingUniversalByLevels = 2,
  /// Per band: sqrt(ln(n/d)) * sigma^2 / sqrt(V), V the band's variance.
  naxDenoisingByBandDeviation = 3,
  /// Per band: sqrt(ln(n/d)) * sigma^2 / sqrt(V - sigma^2).
  naxDenoisingByBandSignal = 4,
  /// As 4, keeping small coefficients that stand beside a large one.
  naxDenoisingByBandSignalAndNeighbours = 5
};

template <typename T>
class CNaxWaveletDecomposition;

/// Copies a packed `width` by `height` block into `destination`, an array of `cols`
/// columns, with its top-left corner at (left, top). Nothing for a height under 1.
template <typename T>
void naxInsertRectData(const T* source, T* destination, int32 cols, int32 left, int32 top,
                       int32 width, int32 height);
/// Copies the `width` by `height` block at (left, top) of `source`, an array of `cols`
/// columns, into the packed array `destination`. Nothing for a height under 1.
template <typename T>
void naxExtractRectData(const T* source, int32 cols, int32 left, int32 top, int32 width,
                        int32 height, T* destination);
/// Copies a `width` by `height` block from (sourceLeft, sourceTop) of `source`, of
/// `sourceCols` columns, to (destinationLeft, destinationTop) of `destination`, of
/// `destinationCols` columns. Nothing for a width or height under 1.
template <typename T>
void naxInsertPartRectData(const T* source, T* destination, int32 sourceCols, int32 sourceLeft,
                           int32 sourceTop, int32 destinationCols, int32 destinationLeft,
                           int32 destinationTop, int32 width, int32 height);

/// A two-dimensional array of samples and, once transformed, the tree of its sub-channels.
template <typename T>
class CNaxChannel {
  static_assert(nax::detail::kIsReal<T>, "CNaxChannel is defined for float and double");

 public:
  /// Empty channel: all fields zero.
  CNaxChannel() = default;
  /// Shape and position of the first sample, no data.
  CNaxChannel(int32 cols, int32 rows, int32 offsetX, int32 offsetY);
  /// Shape, position and a copy of cols*rows samples of `data` (none for null `data`).
  CNaxChannel(int32 cols, int32 rows, const T* data, int32 offsetX, int32 offsetY);
  /// Channels are copied explicitly (CopyRawChannel, CloneDecomposedChannel, ...).
  CNaxChannel(const CNaxChannel<T>&) = delete;
  CNaxChannel<T>& operator=(const CNaxChannel<T>&) = delete;
  /// As Destroy.
  ~CNaxChannel() { Destroy(); }

  /// Releases the data or the whole tree of sub-channels and sets every field to zero. A
  /// channel with fewer than one column or row keeps its shape; only its offsets, filter,
  /// type, normalization and flag are cleared (and any storage is released).
  void Destroy();
  /// Allocates cols*rows samples (when there are none) and sets them to zero.
  void Initialize();
  /// Sets every sample of this node and of all sub-channels to zero; the shape stays.
  void Clean();
  /// Copies cols*rows samples from `data`, allocating when needed; null `data` releases the
  /// buffer. On a decomposed channel only sets the data pointer null.
  void SetData(const T* data);
  /// Stores the type; a decomposed channel of another non-zero type is destroyed first.
  void SetType(naxChannelType type);
  /// Stores the filter; a decomposed channel whose filter has another wavelet type is
  /// destroyed first.
  void SetFilter(CNaxWaveletFilter<T>* filter);
  /// Filter, type and normalization in one step, with the rules of SetType and SetFilter.
  void SetDecompositionTypes(CNaxWaveletFilter<T>* filter, naxChannelType type,
                             naxWaveletNormalization normalization);
  void SetTypeOfNormalization(naxWaveletNormalization normalization) {
    m_normalization = normalization;
  }
  void SetColsNb(int32 cols) { m_cols = cols; }
  void SetRowsNb(int32 rows) { m_rows = rows; }
  void SetOffsetX(int32 offsetX) { m_offsetX = offsetX; }
  void SetOffsetY(int32 offsetY) { m_offsetY = offsetY; }
  void SetSubChannelsNb(int32 number) { m_subChannelsNb = number; }
  void SetDecompositionFlag(int32 decomposed) { m_decomposed = decomposed; }
  /// Stores `channel` as sub-channel `index` (0 to 3); this channel takes ownership. The
  /// record held there before is not released.
  void SetSubChannel(CNaxChannel<T>* channel, int32 index);

  int32 GetColsNb() const { return m_cols; }
  int32 GetRowsNb() const { return m_rows; }
  int32 GetOffsetX() const { return m_offsetX; }
  int32 GetOffsetY() const { return m_offsetY; }
  int32 GetSubChannelsNb() const { return m_subChannelsNb; }
  CNaxWaveletFilter<T>* GetFilter() const { return m_filter; }
  /// Wavelet type of the filter; the filter must be set.
  naxWaveletType GetFilterType() const { return m_filter->GetWavelet(); }
  naxChannelType GetType() const { return m_type; }
  naxWaveletNormalization GetTypeOfNormalization() const { return m_normalization; }
  /// Non-zero when the channel holds sub-channels instead of data.
  int32 IsDecomposed() const { return m_decomposed; }
  /// Number of levels from this node down through sub-channel 0; 0 for a raw channel.
  int32 GetDepth() const;
  /// The samples, row-major; null for a decomposed channel.
  T* GetData() const { return m_data; }

  /// Sample (col, row), unchecked.
  T& operator()(int32 col, int32 row) { return m_data[Index(col, row)]; }
  const T& operator()(int32 col, int32 row) const { return m_data[Index(col, row)]; }
  /// Sub-channel pointer, unchecked.
  CNaxChannel<T>* operator[](int32 index) const { return m_subChannels[index]; }
  /// Sub-channel `index`; null when there is no such sub-channel.
  CNaxChannel<T>* SubChannel(int32 index) const;
  /// Sub-channel `index` of the node `level` steps below this one; null when `level` is not
  /// less than the depth or `index` is out of range.
  CNaxChannel<T>* SubChannel(int32 level, int32 index) const;
  /// Shape of sub-channels 0 and 1 (a decomposed channel is required).
  int32 GetLowColsNb() const { return m_subChannels[0]->m_cols; }
  int32 GetLowRowsNb() const { return m_subChannels[0]->m_rows; }
  int32 GetHighColsNb() const { return m_subChannels[1]->m_cols; }
  int32 GetHighRowsNb() const { return m_subChannels[1]->m_rows; }

  /// Builds zeroed sub-channels of a split of this channel's shape by `type` (1, 2 or 3),
  /// marks the channel decomposed and stores the three settings here and in the
  /// sub-channels. Any other type leaves no sub-channels and the channel not decomposed.
  void CreateOneLevelSubChannels(CNaxWaveletFilter<T>* filter, naxChannelType type,
                                 naxWaveletNormalization normalization);
  /// The same, with the settings of `channel` and sub-channels shaped like its own.
  void CreateOneLevelSubChannels(const CNaxChannel<T>* channel);
  /// Copies of the high sub-channels of `channel` and an empty low one (shape only).
  void CloneOneLevelSubChannels(const CNaxChannel<T>* channel);
  /// Copies filter, type and normalization into each direct sub-channel (SetDecompositionTypes).
  void Inherit();

  /// Deep copy of one node of `channel`, its data included, without sub-channels.
  void CopyRawChannel(const CNaxChannel<T>* channel) { CopyFrom(channel, false); }
  /// Deep copy of the whole tree of `channel`.
  void CopyDecomposedChannel(const CNaxChannel<T>* channel) { CopyFrom(channel, true); }
  /// New copy of this node with its data (owned by the caller).
  CNaxChannel<T>* CloneRawChannel() const;
  /// New copy of the whole tree (owned by the caller); null for a raw channel.
  CNaxChannel<T>* CloneDecomposedChannel() const;
  /// 1 when shape and offsets agree and every pair of samples differs by at most
  /// `tolerance` (two channels without data are equal, one without data is not), else 0.
  int32 RawChannelIsAlmostEqual(const CNaxChannel<T>* channel, T tolerance) const;
  /// Writes the channel, or each band of its tree, to the standard output stream.
  void Print() const;

  /// Decomposition of `depth` levels by `type`. A raw channel is consumed (left empty); a
  /// decomposed one stays and a deeper copy is returned; depth under 1 gives a copy. The
  /// result belongs to the caller; null when the channel is too small for one step.
  CNaxChannel<T>* FWT(CNaxWaveletFilter<T>* filter, naxChannelType type, int32 depth);
  /// FWT of a raw channel without normalization; null for depth under 1.
  CNaxChannel<T>* FWTRawChannel(CNaxWaveletFilter<T>* filter, naxChannelType type, int32 depth);
  /// One more level: a raw channel is consumed and the new tree returned; on a decomposed
  /// channel its lowest band is split and `this` returned. Null when the shape is too small
  /// (type 1 needs 2 rows, type 2 needs 2 columns, type 3 both).
  CNaxChannel<T>* FWTStep(CNaxWaveletFilter<T>* filter, naxChannelType type);
  /// As FWT, with the result moved into this channel.
  void FWTInPlace(CNaxWaveletFilter<T>* filter, naxChannelType type, int32 depth);
  /// Full inverse: undoes the normalization, consumes this tree and returns the raw channel
  /// (owned by the caller); null for a raw channel.
  CNaxChannel<T>* IFWT();
  /// Inverse of the top level only, whose low band must be raw. This node keeps its shape
  /// and records; its sub-channel data are consumed by the inverse lifting.
  CNaxChannel<T>* IFWTStep();
  /// As IFWT, with the result moved into this channel.
  void IFWTInPlace();
  /// IFWT without the denormalization.
  CNaxChannel<T>* DestroyingIFWT();

  /// All lifting steps of the filter on one pair of halves; `axis` non-zero lifts along rows.
  void LiftDirect(CNaxChannel<T>* low, CNaxChannel<T>* high, int32 axis);
  /// The inverse steps in reverse order.
  void LiftInverse(CNaxChannel<T>* low, CNaxChannel<T>* high, int32 axis);
  /// Deals the samples of `raw` to the sub-channels by the parity of their absolute
  /// coordinates (this channel's offsets); Unite is the exact reverse.
  void Split(const CNaxChannel<T>* raw);
  void Unite(CNaxChannel<T>* raw) const;

  /// Applies the channel's normalization to the whole tree.
  void Normalize() { Normalize(GetDepth(), m_normalization); }
  /// Undoes the channel's normalization on the whole tree.
  void Denormalize() { Denormalize(GetDepth(), m_normalization); }
  /// Scales `depth` levels by the norms of the kind (1: first norms, other non-zero: second).
  void Normalize(int32 depth, naxWaveletNormalization normalization);
  /// Scales `depth` levels by the inverse norms of the kind.
  void Denormalize(int32 depth, naxWaveletNormalization normalization);
  /// Scales `depth` levels with explicit low and high factors: a band at level k (from 0)
  /// takes low^(k*dim) times its own factor (low*high, high*high or low*low in two
  /// dimensions; high or low in one). Factors within 1e-6 of 1 are skipped.
  void Normalize(int32 depth, naxWaveletNormalization normalization, T low, T high);

  /// Copy of the lowest low band (owned by the caller); null for a raw channel.
  CNaxChannel<T>* GetLowChannel() const;
  /// Copy of band `type` at `level` (1 is the top); null when the level is beyond the depth,
  /// the channel is raw or the band is decomposed.
  CNaxChannel<T>* GetHighChannel(int32 level, naxSubChannelType type) const;
  /// Destroys sub-channel 0 of this node; its record stays.
  void DestroyLowestSubChannel();

  // -------------------------------------------------------------------------------------
  // Noise reduction and enhancement of the high bands

  /// Noise deviation: median of the absolute values of the finest high band (sub-channel
  /// 1 of this node) over 0.6745; 0 for a raw channel.
  T EstimateNoise() const;
  /// Thresholds s^2 / sqrt(V - s^2) averaged over the high bands of the first level into
  /// `first` (1e6 for a band whose variance V hardly exceeds the noise s^2), and the ratio
  /// of the second level's average to the first's into `ratio` (0 for depth 1 or a raw
  /// channel).
  void EstimateThreshold(T& first, T& ratio) const;
  /// Largest of the signed sample `index` and the absolute values of its neighbours above,
  /// left, right and below-right (the mask of the neighbour-aware shrinkage).
  T GetAbsMaxInMask(const T* data, int32 index, int32 cols, int32 rows) const;
  /// Cleaned clone (owned by the caller): coefficients with |c| <= t vanish, t being
  /// `threshold` on the top level and `threshold` * `ratio` on all deeper ones; with `soft`
  /// non-zero the others shrink by t toward 0. Bands with t <= 1e-6 stay. Null when raw.
  CNaxChannel<T>* CleanDirectly(T threshold, T ratio, int32 soft) const;
  /// Cleaned clone (owned by the caller) with the thresholds of `method`; `first` and
  /// `ratio` carry the given thresholds in (method 0) and report the first level's
  /// threshold and the ratio between levels. Null for a raw channel.
  CNaxChannel<T>* CleanBelowThreshold(T& first, T& ratio, int32 soft,
                                      naxWaveletDenoising method) const;
  /// Translation-invariant denoising of a raw channel: the average of CleanBelowThreshold
  /// over the unshifted and `shifts` randomly circularly shifted two-dimensional
  /// transforms of `depth` levels. Returns a raw channel (owned by the caller) and the
  /// averaged thresholds.
  CNaxChannel<T>* CleanWithCircularShifts(T& first, T& ratio, int32 shifts,
                                          CNaxWaveletFilter<T>* filter, int32 depth,
                                          int32 soft, naxWaveletDenoising method) const;
  /// This channel becomes a raw copy of `channel` with element (x, y) taken from
  /// ((x + shiftX) mod cols, (y + shiftY) mod rows).
  void CopyDataWithShifts(const CNaxChannel<T>* channel, int32 shiftY, int32 shiftX);
  /// Multiplies the high bands by `factor` on the top level, and by factors halved (or
  /// doubled, for a factor under 1) toward 1 on the deeper levels while they stay away
  /// from 1.
  void Enhance(T factor);
  /// Multiplies the high bands of `level` (1 is the top) by `factor`.
  void EnhanceHRLevel(T factor, int32 level);
  /// Multiplies band `index` of `level` (1 is the top) by `factor`.
  void EnhanceSubLevel(T factor, int32 level, int32 index);
  /// Multiplies the samples of this node by `factor`.
  void EnhanceRawData(T factor);
  /// Multiplies the high bands of level k (0 the top) by factors[k] and the lowest low
  /// band by factors[depth].
  void EditByLevels(const T* factors);
  /// Blends band by band: weights[k] * this + (1 - weights[k]) * other on level k, the
  /// lowest low band with weights[depth]. The result goes into `result` (emptied first)
  /// or, when it is null, into a new channel owned by the caller; returns it.
  CNaxChannel<T>* MixByLevels(const CNaxChannel<T>* other, const T* weights,
                              CNaxChannel<T>* result) const;
  /// a * this + b * other, sample by sample or band by band; the deeper tree is first
  /// reconstructed down to the common depth. The result goes into `result` (emptied
  /// first) or, when it is null, into a new channel owned by the caller; returns it.
  CNaxChannel<T>* Combine(const CNaxChannel<T>* other, T a, T b, CNaxChannel<T>* result) const;

  // -------------------------------------------------------------------------------------
  // Editing: windows, packing and rescaling

  /// Window [left, right] x [top, bottom] (absolute, inclusive) as a new channel owned by
  /// the caller. Of a decomposed channel the result is a tree widened by the coefficients
  /// that the window's samples depend on, so that its inverse reproduces the window's
  /// samples. Null when the window is not inside the channel.
  CNaxChannel<T>* Cut(int32 left, int32 top, int32 right, int32 bottom) const;
  /// Writes `channel` (raw or decomposed, of the same kind) into this one at its offsets;
  /// parts outside this channel are left out.
  void Paste(const CNaxChannel<T>* channel);
  /// Samples [left, left + width) x [top, top + height) (absolute) of the reconstruction,
  /// computed from the coefficients of that window only; owned by the caller, null when
  /// this channel is raw or the window is not inside it. This tree stays intact.
  CNaxChannel<T>* IFWT(int32 left, int32 top, int32 width, int32 height) const;
  /// Cuts from the tree `channel`, of type 1, the coefficients of the window [left, right]
  /// x [top, bottom] (absolute, with the filter's margin) and pastes them into this tree
  /// of the same type moved by (dx, dy), level by level, so that this tree's inverse there
  /// shows the window. Returns this channel; null, with nothing changed, when the types
  /// differ, the window is not inside `channel` or a move along the split axis is not a
  /// multiple of 2^depth (the parities of a level would change).
  CNaxChannel<T>* CutAndPasteRows(const CNaxChannel<T>* channel, int32 left, int32 top,
                                  int32 right, int32 bottom, int32 dx, int32 dy);
  /// The same for trees of type 2.
  CNaxChannel<T>* CutAndPasteColumns(const CNaxChannel<T>* channel, int32 left, int32 top,
                                     int32 right, int32 bottom, int32 dx, int32 dy);
  /// The same for two-dimensional trees (and trees of any one type), with the margins
  /// along X and Y given in coefficients instead of the filter's.
  CNaxChannel<T>* CutAndPaste2D(const CNaxChannel<T>* channel, int32 left, int32 top,
                                int32 right, int32 bottom, int32 dx, int32 dy, int32 marginX,
                                int32 marginY);
  /// All bands in one raw channel of this shape: the lowest low band top left, each
  /// level's high bands right of and below its low band. Null for a raw channel.
  CNaxChannel<T>* PackDecomposedChannel() const;
  /// Reverse of PackDecomposedChannel on a raw channel: a tree of `depth` levels (fewer
  /// when the shape stops the split), owned by the caller.
  CNaxChannel<T>* UnpackDecomposedChannel(CNaxWaveletFilter<T>* filter, naxChannelType type,
                                          int32 depth, naxWaveletNormalization normalization) const;
  /// Lowest low band resampled to this channel's shape; null for a raw channel.
  CNaxChannel<T>* GetScaledLowChannel() const;
  /// Band `type` of `level` (1 is the top) resampled to this channel's shape; null when
  /// there is no such raw band.
  CNaxChannel<T>* GetScaledHighChannel(int32 level, naxSubChannelType type) const;
  /// One two-dimensional level of twice this raw channel's shape and offsets: the samples
  /// as its low band, zero high bands. Its inverse is the doubled signal.
  CNaxChannel<T>* ScaleRawChannelTwiceUp(CNaxWaveletFilter<T>* filter) const;
  /// Low band of one two-dimensional step of a copy: the raw channel at half size.
  CNaxChannel<T>* ScaleRawChannelTwiceDown(CNaxWaveletFilter<T>* filter) const;
  /// This tree under a new top level of zero high bands, of twice the shape and offsets.
  CNaxChannel<T>* ScaleDecomposedChannelTwiceUp() const;
  /// Decomposition of the half-size signal with this depth where the shape allows it
  /// (two-dimensional trees only; null otherwise).
  CNaxChannel<T>* ScaleDecomposedChannelTwiceDown() const;
  /// Raw channel rescaled by `factor` (1/32 to 32): wavelet doubling or halving to the
  /// nearest power of two, then bilinear resizing to the truncated size. Null outside
  /// the range, for a result under 3 samples a side, or for a decomposed channel.
  CNaxChannel<T>* Scale(T factor, CNaxWaveletFilter<T>* filter) const;
  /// Raw channel resampled bilinearly to cols by rows (exact doubling and halving by
  /// repetition and averaging); null for a decomposed channel or an empty shape.
  CNaxChannel<T>* Resize(int32 cols, int32 rows) const;

 private:
  template <typename U>
  friend class CNaxWaveletDecomposition;

  CNaxChannel<T>* CutFromRawChannel(int32 left, int32 top, int32 right, int32 bottom) const;
  CNaxChannel<T>* CutFromDecomposedChannel(int32 left, int32 top, int32 right, int32 bottom,
                                           CNaxChannel<T>* a, CNaxChannel<T>* b,
                                           CNaxChannel<T>* c, CNaxChannel<T>* d) const;
  CNaxChannel<T>* CutRectForRows(int32 left, int32 top, int32 right, int32 bottom,
                                 CNaxChannel<T>* a, CNaxChannel<T>* b, CNaxChannel<T>* c,
                                 CNaxChannel<T>* d, int32 margin) const;
  CNaxChannel<T>* CutRectForColumns(int32 left, int32 top, int32 right, int32 bottom,
                                    CNaxChannel<T>* a, CNaxChannel<T>* b, CNaxChannel<T>* c,
                                    CNaxChannel<T>* d, int32 margin) const;
  CNaxChannel<T>* CutRectFor2D(int32 left, int32 top, int32 right, int32 bottom,
                               CNaxChannel<T>* a, CNaxChannel<T>* b, CNaxChannel<T>* c,
                               CNaxChannel<T>* d, int32 margin) const;
  CNaxChannel<T>* CutRect(int32 left, int32 top, int32 right, int32 bottom,
                          CNaxChannel<T>* const records[4], int32 marginX, int32 marginY) const;
  void CutTree(const nax::detail::Span1D extent[2], CNaxChannel<T>* const records[4],
               CNaxChannel<T>* node) const;
  bool WindowInside(int32 left, int32 top, int32 right, int32 bottom) const;
  void PasteRawChannel(const CNaxChannel<T>* channel);
  void PasteSamples(const CNaxChannel<T>* channel, int32 margin);
  void PasteDecomposedChannel(const CNaxChannel<T>* channel, CNaxChannel<T>* a,
                              CNaxChannel<T>* b, CNaxChannel<T>* c, CNaxChannel<T>* d);
  void PasteRectForRows(const CNaxChannel<T>* channel, CNaxChannel<T>* a, CNaxChannel<T>* b,
                        CNaxChannel<T>* c, CNaxChannel<T>* d, int32 margin);
  void PasteRectForColumns(const CNaxChannel<T>* channel, CNaxChannel<T>* a, CNaxChannel<T>* b,
                           CNaxChannel<T>* c, CNaxChannel<T>* d, int32 margin);
  void PasteRectFor2D(const CNaxChannel<T>* channel, CNaxChannel<T>* a, CNaxChannel<T>* b,
                      CNaxChannel<T>* c, CNaxChannel<T>* d, int32 margin);
  void PasteRectOfType(naxChannelType type, const CNaxChannel<T>* channel, CNaxChannel<T>* a,
                       CNaxChannel<T>* b, CNaxChannel<T>* c, CNaxChannel<T>* d, int32 margin);
  void PasteBands(const CNaxChannel<T>* const bands[4], int32 count, int32 margin);
  bool ShiftTree(int32 dx, int32 dy);
  CNaxChannel<T>* ResampledCopy(const CNaxChannel<T>* band, int32 cols, int32 rows) const;
  int32 FilterMargin() const;
  void PackInto(T* packed, int32 packedCols) const;
  void UnpackFrom(const T* packed, int32 packedCols);
  void ShrinkBand(const CNaxChannel<T>* original, T t, int32 soft, naxWaveletDenoising method);
  void ScaleHighBands(T factor);
  CNaxChannel<T>* NodeAtLevel(int32 level) const;
  CNaxChannel<T>* ReducedTo(int32 depth) const;
  static void CombineSamples(const CNaxChannel<T>* x, const CNaxChannel<T>* y, T a, T b,
                             CNaxChannel<T>* result);
  static CNaxChannel<T>* DenoisedPass(CNaxChannel<T>* work, T& first, T& ratio,
                                      CNaxWaveletFilter<T>* filter, int32 depth, int32 soft,
                                      naxWaveletDenoising method);
  static constexpr int32 kMaxSubChannels = 4;
  struct LiftStep {
    int32 taps;
    int32 step;
    const T* coefficients;
  };

  int64 Index(int32 col, int32 row) const { return static_cast<int64>(row) * m_cols + col; }
  int64 Size() const {
    return m_cols > 0 && m_rows > 0 ? static_cast<int64>(m_cols) * m_rows : 0;
  }
  static T* NewSamples(int64 n, bool zero);
  void ReleaseStorage();
  void CopyFrom(const CNaxChannel<T>* channel, bool tree);
  void TakeOver(CNaxChannel<T>* channel);
  void CopyGeometry(const CNaxChannel<T>* channel);
  void CopySettings(const CNaxChannel<T>* channel);
  CNaxChannel<T>* NewBand(int32 cols, int32 rows, int32 offsetX, int32 offsetY, bool zero) const;
  bool StartSubChannelsLike(const CNaxChannel<T>* channel);
  void BuildSubChannels(CNaxWaveletFilter<T>* filter, naxChannelType type,
                        naxWaveletNormalization normalization, bool zero);
  bool FilterTypeDiffers(const CNaxWaveletFilter<T>* filter) const;
  bool SubChannelsFitShape() const;
  CNaxChannel<T>* Sub(int32 k) const { return m_subChannels[k]; }
  int32 LiftSteps(LiftStep steps[3]) const;
  void LiftRow(const CNaxLifting<T>& record, int32 row, bool inverse) const;
  // The vertical steps of one pair run as a pipeline over rows (see AdvancePipe).
  struct VerticalPipe {
    LiftStep steps[3];
    int32 count;
    bool inverse;
    int32 targetsLow[3];  // per step in run order: 1 for an update (low target)
    int32 length[2];      // rows of the high (0) and the low (1) channel
    int32 ready[2];       // rows of each channel available from outside
    int32 done[3];        // target rows finished by each step
    int32 limit;          // cap on the first step
  };
  void StartPipe(VerticalPipe& pipe, const CNaxChannel<T>* low, const CNaxChannel<T>* high,
                 bool inverse) const;
  void AdvancePipe(VerticalPipe& pipe, const CNaxLifting<T>& record) const;
  static int32 FinalRows(const VerticalPipe& pipe, int32 channel);
  // The lifting records and vertical pipes of one level, shared by the two one-pass routines.
  struct LiftPlan {
    bool twoD, columnsOnly, vertical;
    CNaxLifting<T> evenY, oddY;  // along X, for the rows of even and of odd Y
    CNaxLifting<T> pairA, pairB;  // vertical pairs: (0, 3) and (2, 1) in 2D, (0, 1) along columns
    VerticalPipe pipeA, pipeB;
  };
  LiftPlan MakeLiftPlan(bool inverse) const;
  void SplitAndLift(const CNaxChannel<T>* raw);
  void LiftAndUnite(CNaxChannel<T>* raw) const;
  CNaxChannel<T>* InverseOneLevel();
  static void Scale(CNaxChannel<T>* channel, T factor);
  void PrintSamples(std::ostream& os) const;
  void PrintBands(std::ostream& os, int32 level) const;

  int32 m_cols = 0;
  int32 m_rows = 0;
  int32 m_offsetX = 0;
  int32 m_offsetY = 0;
  int32 m_subChannelsNb = 0;
  CNaxChannel<T>** m_subChannels = nullptr;
  CNaxWaveletFilter<T>* m_filter = nullptr;
  naxChannelType m_type = naxChannelNone;
  T* m_data = nullptr;
  naxWaveletNormalization m_normalization = naxNoNormalization;
  int32 m_decomposed = 0;
};

/// 1 when two trees have the same structure, shapes and offsets and all their samples agree
/// within `tolerance`; two null channels are equal.
template <typename T>
int32 naxAreChannelsAlmostEqual(const CNaxChannel<T>* a, const CNaxChannel<T>* b, T tolerance);

// ---------------------------------------------------------------------------------------
// Construction, storage and plain access

template <typename T>
CNaxChannel<T>::CNaxChannel(int32 cols, int32 rows, int32 offsetX, int32 offsetY)
    : m_cols(cols), m_rows(rows), m_offsetX(offsetX), m_offsetY(offsetY) {}

template <typename T>
CNaxChannel<T>::CNaxChannel(int32 cols, int32 rows, const T* data, int32 offsetX, int32 offsetY)
    : m_cols(cols), m_rows(rows), m_offsetX(offsetX), m_offsetY(offsetY) {
  SetData(data);
}

template <typename T>
T* CNaxChannel<T>::NewSamples(int64 n, bool zero) {
  if (n <= 0) return nullptr;
  return zero ? new T[static_cast<size_t>(n)]() : new T[static_cast<size_t>(n)];
}

template <typename T>
void CNaxChannel<T>::ReleaseStorage() {
  if (m_subChannels != nullptr) {
    for (int32 k = 0; k < kMaxSubChannels; ++k) delete m_subChannels[k];
    delete[] m_subChannels;
    m_subChannels = nullptr;
  }
  m_subChannelsNb = 0;
  delete[] m_data;
  m_data = nullptr;
}

template <typename T>
void CNaxChannel<T>::Destroy() {
  const bool hasArea = m_cols >= 1 && m_rows >= 1;
  ReleaseStorage();
  if (hasArea) {
    m_cols = 0;
    m_rows = 0;
  }
  m_offsetX = 0;
  m_offsetY = 0;
  m_filter = nullptr;
  m_type = naxChannelNone;
  m_normalization = naxNoNormalization;
  m_decomposed = 0;
}

template <typename T>
void CNaxChannel<T>::Initialize() {
  const int64 n = Size();
  if (m_data == nullptr) m_data = NewSamples(n, true);
  else if (n > 0) std::memset(m_data, 0, static_cast<size_t>(n) * sizeof(T));
}

template <typename T>
void CNaxChannel<T>::Clean() {
  const int64 n = Size();
  if (m_data != nullptr && n > 0) std::memset(m_data, 0, static_cast<size_t>(n) * sizeof(T));
  if (m_subChannels != nullptr)
    for (int32 k = 0; k < kMaxSubChannels; ++k)
      if (m_subChannels[k] != nullptr) m_subChannels[k]->Clean();
}

template <typename T>
void CNaxChannel<T>::SetData(const T* data) {
  if (m_decomposed != 0 || data == nullptr) {
    delete[] m_data;
    m_data = nullptr;
    return;
  }
  const int64 n = Size();
  if (m_data == nullptr) m_data = NewSamples(n, false);
  if (n > 0) std::memcpy(m_data, data, static_cast<size_t>(n) * sizeof(T));
}

template <typename T>
bool CNaxChannel<T>::FilterTypeDiffers(const CNaxWaveletFilter<T>* filter) const {
  return m_filter != nullptr && filter != nullptr && m_filter->GetWavelet() != filter->GetWavelet();
}

template <typename T>
void CNaxChannel<T>::SetType(naxChannelType type) {
  if (m_decomposed != 0 && m_type != naxChannelNone && m_type != type) Destroy();
  m_type = type;
}

template <typename T>
void CNaxChannel<T>::SetFilter(CNaxWaveletFilter<T>* filter) {
  if (m_decomposed != 0 && FilterTypeDiffers(filter)) Destroy();
  m_filter = filter;
}

template <typename T>
void CNaxChannel<T>::SetDecompositionTypes(CNaxWaveletFilter<T>* filter, naxChannelType type,
                                           naxWaveletNormalization normalization) {
  if (m_decomposed != 0 &&
      ((m_type != naxChannelNone && m_type != type) || FilterTypeDiffers(filter)))
    Destroy();
  m_filter = filter;
  m_type = type;
  m_normalization = normalization;
}

template <typename T>
void CNaxChannel<T>::SetSubChannel(CNaxChannel<T>* channel, int32 index) {
  if (index < 0 || index >= kMaxSubChannels) return;
  if (m_subChannels == nullptr) m_subChannels = new CNaxChannel<T>*[kMaxSubChannels]();
  m_subChannels[index] = channel;
}

template <typename T>
int32 CNaxChannel<T>::GetDepth() const {
  int32 depth = 0;
  const CNaxChannel<T>* node = this;
  while (node->m_subChannelsNb > 0 && node->m_subChannels != nullptr &&
         node->m_subChannels[0] != nullptr) {
    ++depth;
    node = node->m_subChannels[0];
  }
  return depth;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::SubChannel(int32 index) const {
  if (m_subChannels == nullptr || index < 0 || index >= m_subChannelsNb ||
      index >= kMaxSubChannels)
    return nullptr;
  return m_subChannels[index];
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::SubChannel(int32 level, int32 index) const {
  if (level < 0 || level >= GetDepth()) return nullptr;
  const CNaxChannel<T>* node = this;
  for (int32 k = 0; k < level; ++k) node = node->m_subChannels[0];
  return node->SubChannel(index);
}

// ---------------------------------------------------------------------------------------
// Sub-channel building, copies and comparisons

template <typename T>
void CNaxChannel<T>::BuildSubChannels(CNaxWaveletFilter<T>* filter, naxChannelType type,
                                      naxWaveletNormalization normalization, bool zero) {
  using namespace nax::detail;
  ReleaseStorage();
  m_filter = filter;
  m_type = type;
  m_normalization = normalization;
  m_decomposed = 0;
  if (type != naxChannelRows && type != naxChannelColumns && type != naxChannel2D) return;
  const bool splitX = type != naxChannelColumns, splitY = type != naxChannelRows;
  const int32 lowCols = splitX ? LowLength(m_cols, m_offsetX) : m_cols;
  const int32 highCols = splitX ? HighLength(m_cols, m_offsetX) : m_cols;
  const int32 lowX = splitX ? LowOffset(m_offsetX) : m_offsetX;
  const int32 highX = splitX ? HighOffset(m_offsetX) : m_offsetX;
  const int32 lowRows = splitY ? LowLength(m_rows, m_offsetY) : m_rows;
  const int32 highRows = splitY ? HighLength(m_rows, m_offsetY) : m_rows;
  const int32 lowY = splitY ? LowOffset(m_offsetY) : m_offsetY;
  const int32 highY = splitY ? HighOffset(m_offsetY) : m_offsetY;
  m_subChannels = new CNaxChannel<T>*[kMaxSubChannels]();
  m_subChannelsNb = type == naxChannel2D ? 4 : 2;
  // index: cols, rows, offset X, offset Y
  const int32 shape[4][4] = {{lowCols, lowRows, lowX, lowY},
                             {highCols, highRows, highX, highY},
                             {highCols, lowRows, highX, lowY},
                             {lowCols, highRows, lowX, highY}};
  for (int32 k = 0; k < m_subChannelsNb; ++k)
    m_subChannels[k] = NewBand(shape[k][0], shape[k][1], shape[k][2], shape[k][3], zero);
  m_decomposed = 1;
}

template <typename T>
void CNaxChannel<T>::CreateOneLevelSubChannels(CNaxWaveletFilter<T>* filter, naxChannelType type,
                                               naxWaveletNormalization normalization) {
  BuildSubChannels(filter, type, normalization, true);
}

// A band of the given shape and this node's settings; its samples are zeroed when `zero`.
template <typename T>
CNaxChannel<T>* CNaxChannel<T>::NewBand(int32 cols, int32 rows, int32 offsetX, int32 offsetY,
                                        bool zero) const {
  auto* sub = new CNaxChannel<T>(cols, rows, offsetX, offsetY);
  sub->m_data = NewSamples(sub->Size(), zero);
  sub->m_filter = m_filter;
  sub->m_type = m_type;
  sub->m_normalization = m_normalization;
  return sub;
}

template <typename T>
void CNaxChannel<T>::CopyGeometry(const CNaxChannel<T>* channel) {
  m_cols = channel->m_cols;
  m_rows = channel->m_rows;
  m_offsetX = channel->m_offsetX;
  m_offsetY = channel->m_offsetY;
}

template <typename T>
void CNaxChannel<T>::CopySettings(const CNaxChannel<T>* channel) {
  m_filter = channel->m_filter;
  m_type = channel->m_type;
  m_normalization = channel->m_normalization;
}

// Empties this node, takes the settings of `channel` and, when `channel` has sub-channels,
// an empty table for as many; false when there is nothing to build.
template <typename T>
bool CNaxChannel<T>::StartSubChannelsLike(const CNaxChannel<T>* channel) {
  ReleaseStorage();
  CopySettings(channel);
  m_decomposed = 0;
  if (channel->m_subChannels == nullptr || channel->m_subChannelsNb < 1) return false;
  m_subChannels = new CNaxChannel<T>*[kMaxSubChannels]();
  m_subChannelsNb = channel->m_subChannelsNb;
  return true;
}

template <typename T>
void CNaxChannel<T>::CreateOneLevelSubChannels(const CNaxChannel<T>* channel) {
  if (!StartSubChannelsLike(channel)) return;
  for (int32 k = 0; k < kMaxSubChannels; ++k) {
    const CNaxChannel<T>* model = channel->m_subChannels[k];
    if (model != nullptr)
      m_subChannels[k] =
          NewBand(model->m_cols, model->m_rows, model->m_offsetX, model->m_offsetY, true);
  }
  m_decomposed = 1;
}

template <typename T>
void CNaxChannel<T>::CloneOneLevelSubChannels(const CNaxChannel<T>* channel) {
  if (!StartSubChannelsLike(channel)) return;
  for (int32 k = 0; k < kMaxSubChannels; ++k) {
    const CNaxChannel<T>* model = channel->m_subChannels[k];
    if (model == nullptr) continue;
    auto* sub = new CNaxChannel<T>();
    if (k == 0) {  // the low band is filled by the next level of the clone
      sub->CopyGeometry(model);
      sub->CopySettings(model);
    } else {
      sub->CopyFrom(model, false);
    }
    m_subChannels[k] = sub;
  }
  m_decomposed = 1;
}

template <typename T>
void CNaxChannel<T>::Inherit() {
  if (m_subChannels == nullptr) return;
  for (int32 k = 0; k < kMaxSubChannels; ++k)
    if (m_subChannels[k] != nullptr)
      m_subChannels[k]->SetDecompositionTypes(m_filter, m_type, m_normalization);
}

template <typename T>
void CNaxChannel<T>::CopyFrom(const CNaxChannel<T>* channel, bool tree) {
  if (channel == this) return;
  ReleaseStorage();
  CopyGeometry(channel);
  CopySettings(channel);
  m_decomposed = tree ? channel->m_decomposed : 0;
  if (channel->m_data != nullptr) {
    m_data = NewSamples(Size(), false);
    if (m_data != nullptr)
      std::memcpy(m_data, channel->m_data, static_cast<size_t>(Size()) * sizeof(T));
  }
  if (tree && channel->m_subChannels != nullptr) {
    m_subChannels = new CNaxChannel<T>*[kMaxSubChannels]();
    m_subChannelsNb = channel->m_subChannelsNb;
    for (int32 k = 0; k < kMaxSubChannels; ++k) {
      if (channel->m_subChannels[k] == nullptr) continue;
      m_subChannels[k] = new CNaxChannel<T>();
      m_subChannels[k]->CopyFrom(channel->m_subChannels[k], true);
    }
  }
}

template <typename T>
void CNaxChannel<T>::TakeOver(CNaxChannel<T>* channel) {
  ReleaseStorage();
  CopyGeometry(channel);
  CopySettings(channel);
  m_subChannelsNb = channel->m_subChannelsNb;
  m_subChannels = channel->m_subChannels;
  m_data = channel->m_data;
  m_decomposed = channel->m_decomposed;
  channel->m_subChannels = nullptr;
  channel->m_subChannelsNb = 0;
  channel->m_data = nullptr;
  channel->Destroy();
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CloneRawChannel() const {
  auto* copy = new CNaxChannel<T>();
  copy->CopyFrom(this, false);
  return copy;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CloneDecomposedChannel() const {
  if (m_decomposed == 0) return nullptr;
  auto* copy = new CNaxChannel<T>();
  copy->CopyFrom(this, true);
  return copy;
}

template <typename T>
int32 CNaxChannel<T>::RawChannelIsAlmostEqual(const CNaxChannel<T>* channel, T tolerance) const {
  if (m_cols != channel->m_cols || m_rows != channel->m_rows ||
      m_offsetX != channel->m_offsetX || m_offsetY != channel->m_offsetY)
    return 0;
  if (m_data == nullptr || channel->m_data == nullptr)
    return m_data == nullptr && channel->m_data == nullptr ? 1 : 0;
  const int64 n = Size();
  for (int64 i = 0; i < n; ++i)
    if (std::fabs(m_data[i] - channel->m_data[i]) > tolerance) return 0;
  return 1;
}

template <typename T>
int32 naxAreChannelsAlmostEqual(const CNaxChannel<T>* a, const CNaxChannel<T>* b, T tolerance) {
  if (a == nullptr || b == nullptr) return a == b ? 1 : 0;
  if ((a->IsDecomposed() != 0) != (b->IsDecomposed() != 0)) return 0;
  if (a->IsDecomposed() == 0) return a->RawChannelIsAlmostEqual(b, tolerance);
  if (a->GetColsNb() != b->GetColsNb() || a->GetRowsNb() != b->GetRowsNb() ||
      a->GetOffsetX() != b->GetOffsetX() || a->GetOffsetY() != b->GetOffsetY() ||
      a->GetType() != b->GetType() || a->GetSubChannelsNb() != b->GetSubChannelsNb())
    return 0;
  for (int32 k = 0; k < a->GetSubChannelsNb(); ++k)
    if (naxAreChannelsAlmostEqual(a->SubChannel(k), b->SubChannel(k), tolerance) == 0) return 0;
  return 1;
}

// ---------------------------------------------------------------------------------------
// Split, unite and the lifting of one pair

template <typename T>
bool CNaxChannel<T>::SubChannelsFitShape() const {
  using namespace nax::detail;
  const int32 count = m_type == naxChannel2D ? 4 : 2;
  if ((m_type != naxChannelRows && m_type != naxChannelColumns && m_type != naxChannel2D) ||
      m_subChannels == nullptr || m_subChannelsNb != count)
    return false;
  const bool splitX = m_type != naxChannelColumns, splitY = m_type != naxChannelRows;
  const int32 cols[2] = {splitX ? LowLength(m_cols, m_offsetX) : m_cols,
                         splitX ? HighLength(m_cols, m_offsetX) : m_cols};
  const int32 rows[2] = {splitY ? LowLength(m_rows, m_offsetY) : m_rows,
                         splitY ? HighLength(m_rows, m_offsetY) : m_rows};
  const int32 band[4][2] = {{0, 0}, {1, 1}, {1, 0}, {0, 1}};  // X band, Y band
  for (int32 k = 0; k < count; ++k) {
    const CNaxChannel<T>* sub = m_subChannels[k];
    if (sub == nullptr || sub->m_cols != cols[band[k][0]] || sub->m_rows != rows[band[k][1]])
      return false;
    if (sub->Size() > 0 && sub->m_data == nullptr) return false;
  }
  return true;
}

template <typename T>
void CNaxChannel<T>::Split(const CNaxChannel<T>* raw) {
  using namespace nax::detail;
  if (raw == nullptr || raw->m_data == nullptr || raw->m_cols != m_cols ||
      raw->m_rows != m_rows || !SubChannelsFitShape())
    return;
  const int32 oddX = IsOdd(m_offsetX, 0);
  int32 next[2] = {0, 0};  // next row of the even-Y and odd-Y sub-channels
  for (int32 y = 0; y < m_rows; ++y) {
    const T* src = raw->m_data + Index(0, y);
    if (m_type == naxChannelColumns) {
      CNaxChannel<T>* sub = Sub(IsOdd(m_offsetY, y));
      std::memcpy(sub->m_data + sub->Index(0, next[IsOdd(m_offsetY, y)]++), src,
                  static_cast<size_t>(m_cols) * sizeof(T));
      continue;
    }
    const int32 oddY = m_type == naxChannel2D ? IsOdd(m_offsetY, y) : 0;
    CNaxChannel<T>* low = Sub(oddY ? 3 : 0);
    CNaxChannel<T>* high = Sub(oddY ? 1 : (m_type == naxChannel2D ? 2 : 1));
    const int32 r = m_type == naxChannel2D ? next[oddY]++ : y;
    DealRow(src, m_cols, oddX, low->m_data + low->Index(0, r), high->m_data + high->Index(0, r));
  }
}

template <typename T>
void CNaxChannel<T>::Unite(CNaxChannel<T>* raw) const {
  using namespace nax::detail;
  if (raw == nullptr || raw->m_cols != m_cols || raw->m_rows != m_rows || !SubChannelsFitShape())
    return;
  if (raw->m_data == nullptr) raw->m_data = NewSamples(raw->Size(), false);
  if (raw->m_data == nullptr) return;
  const int32 oddX = IsOdd(m_offsetX, 0);
  int32 next[2] = {0, 0};
  for (int32 y = 0; y < m_rows; ++y) {
    T* dst = raw->m_data + Index(0, y);
    if (m_type == naxChannelColumns) {
      const CNaxChannel<T>* sub = Sub(IsOdd(m_offsetY, y));
      std::memcpy(dst, sub->m_data + sub->Index(0, next[IsOdd(m_offsetY, y)]++),
                  static_cast<size_t>(m_cols) * sizeof(T));
      continue;
    }
    const int32 oddY = m_type == naxChannel2D ? IsOdd(m_offsetY, y) : 0;
    const CNaxChannel<T>* low = Sub(oddY ? 3 : 0);
    const CNaxChannel<T>* high = Sub(oddY ? 1 : (m_type == naxChannel2D ? 2 : 1));
    const int32 r = m_type == naxChannel2D ? next[oddY]++ : y;
    MergeRow(dst, m_cols, oddX, low->m_data + low->Index(0, r), high->m_data + high->Index(0, r));
  }
}

template <typename T>
int32 CNaxChannel<T>::LiftSteps(LiftStep steps[3]) const {
  if (m_filter == nullptr) return 0;
  const int32 type = m_filter->GetWavelet();
  const T* prime = m_filter->PrimeCoefficients();
  const T* dual = m_filter->DualCoefficients();
  const T* prime2 = m_filter->Prime2Coefficients();
  if (type >= 0 && type <= 5) {  // predict, update
    const int32 taps = type % 3 == 0 ? 2 : (type % 3 == 1 ? 4 : 6);
    steps[0] = {2, 0, dual};
    steps[1] = {taps, 1, prime};
    return 2;
  }
  if (type >= 6 && type <= 11) {  // update, predict, update
    const int32 taps = type % 3 == 0 ? 2 : (type % 3 == 1 ? 4 : 6);
    steps[0] = {2, 1, prime};
    steps[1] = {2, 0, dual};
    steps[2] = {taps, 1, prime2};
    return 3;
  }
  return 0;
}

template <typename T>
void CNaxChannel<T>::LiftDirect(CNaxChannel<T>* low, CNaxChannel<T>* high, int32 axis) {
  LiftStep steps[3];
  const int32 n = LiftSteps(steps);
  if (n == 0) return;
  const CNaxLifting<T> record(low, high, axis);
  const naxChannelType direction = axis != 0 ? naxChannelRows : naxChannelColumns;
  if (axis != 0) {  // rows are independent: all steps on one row while it is in cache
    const int32 rows = low->m_rows;
    for (int32 r = 0; r < rows; ++r) LiftRow(record, r, false);
    return;
  }
  for (int32 k = 0; k < n; ++k)
    record.Run(steps[k].taps, steps[k].step, steps[k].coefficients, direction, false, 0, -1);
}

template <typename T>
void CNaxChannel<T>::LiftInverse(CNaxChannel<T>* low, CNaxChannel<T>* high, int32 axis) {
  LiftStep steps[3];
  const int32 n = LiftSteps(steps);
  if (n == 0) return;
  const CNaxLifting<T> record(low, high, axis);
  if (axis != 0) {
    const int32 rows = low->m_rows;
    for (int32 r = 0; r < rows; ++r) LiftRow(record, r, true);
    return;
  }
  for (int32 k = n - 1; k >= 0; --k)
    record.Run(steps[k].taps, steps[k].step, steps[k].coefficients, naxChannelColumns, true, 0,
               -1);
}

template <typename T>
void CNaxChannel<T>::LiftRow(const CNaxLifting<T>& record, int32 row, bool inverse) const {
  LiftStep steps[3];
  const int32 n = LiftSteps(steps);
  for (int32 i = 0; i < n; ++i) {
    const LiftStep& s = steps[inverse ? n - 1 - i : i];
    record.Run(s.taps, s.step, s.coefficients, naxChannelRows, inverse, row, row + 1);
  }
}

template <typename T>
void CNaxChannel<T>::StartPipe(VerticalPipe& pipe, const CNaxChannel<T>* low,
                               const CNaxChannel<T>* high, bool inverse) const {
  LiftStep steps[3];
  pipe.count = LiftSteps(steps);
  pipe.inverse = inverse;
  for (int32 r = 0; r < pipe.count; ++r) {
    pipe.steps[r] = steps[inverse ? pipe.count - 1 - r : r];
    pipe.targetsLow[r] = pipe.steps[r].step != 0 ? 1 : 0;
    pipe.done[r] = 0;
  }
  pipe.length[0] = high->m_rows;
  pipe.length[1] = low->m_rows;
  pipe.ready[0] = inverse ? pipe.length[0] : 0;
  pipe.ready[1] = inverse ? pipe.length[1] : 0;
  pipe.limit = inverse ? 0 : pipe.length[0] + pipe.length[1];
}

// Runs every step of the pipe as far as its inputs allow. A step may lift target row i once
// the rows it reads (i - 3 to i + 3, or mirrored ones near the ends) are final for it and
// the previous step no longer reads row i: both hold when the previous step is complete or
// is kLag rows ahead. Each step thus sees exactly the data of the step-by-step order.
template <typename T>
void CNaxChannel<T>::AdvancePipe(VerticalPipe& pipe, const CNaxLifting<T>& record) const {
  constexpr int32 kLag = 12;
  for (int32 r = 0; r < pipe.count; ++r) {
    const int32 target = pipe.targetsLow[r], source = 1 - target;
    int32 sourceDone = pipe.ready[source], targetDone = pipe.ready[target];
    for (int32 q = 0; q < r; ++q) (pipe.targetsLow[q] == source ? sourceDone : targetDone) = pipe.done[q];
    int32 bound = sourceDone >= pipe.length[source] ? pipe.length[target] : sourceDone - kLag;
    if (bound > targetDone) bound = targetDone;
    if (r == 0 && bound > pipe.limit) bound = pipe.limit;
    if (bound <= pipe.done[r]) continue;
    const LiftStep& s = pipe.steps[r];
    record.Run(s.taps, s.step, s.coefficients, naxChannelColumns, pipe.inverse, pipe.done[r],
               bound);
    pipe.done[r] = bound;
  }
}

// Rows of a channel (0 high, 1 low) that no later step of the pipe changes.
template <typename T>
int32 CNaxChannel<T>::FinalRows(const VerticalPipe& pipe, int32 channel) {
  int32 rows = pipe.ready[channel];
  for (int32 r = 0; r < pipe.count; ++r)
    if (pipe.targetsLow[r] == channel) rows = pipe.done[r];
  return rows;
}

template <typename T>
typename CNaxChannel<T>::LiftPlan CNaxChannel<T>::MakeLiftPlan(bool inverse) const {
  const bool twoD = m_type == naxChannel2D, vertical = m_type != naxChannelRows;
  LiftPlan plan{twoD,
                m_type == naxChannelColumns,
                vertical,
                CNaxLifting<T>(Sub(0), Sub(twoD ? 2 : 1), 1),
                CNaxLifting<T>(twoD ? Sub(3) : Sub(0), Sub(1), 1),
                CNaxLifting<T>(Sub(0), Sub(twoD ? 3 : 1), 0),
                CNaxLifting<T>(twoD ? Sub(2) : Sub(0), Sub(1), 0),
                VerticalPipe{},
                VerticalPipe{}};
  if (vertical) StartPipe(plan.pipeA, Sub(0), Sub(twoD ? 3 : 1), inverse);
  if (twoD) StartPipe(plan.pipeB, Sub(2), Sub(1), inverse);
  return plan;
}

// Split followed by the lifting, in one pass over the rows of `raw`: each row is dealt to
// its halves and lifted along X while in cache, and the vertical steps follow a few rows
// behind. The result equals Split and then LiftDirect on each pair.
template <typename T>
void CNaxChannel<T>::SplitAndLift(const CNaxChannel<T>* raw) {
  using namespace nax::detail;
  LiftPlan p = MakeLiftPlan(false);
  const int32 oddX = IsOdd(m_offsetX, 0);
  int32 next[2] = {0, 0};
  for (int32 y = 0; y < m_rows; ++y) {
    const T* src = raw->m_data + Index(0, y);
    const int32 parity = p.vertical ? IsOdd(m_offsetY, y) : 0;
    const int32 r = p.vertical ? next[parity]++ : y;
    if (p.columnsOnly) {
      CNaxChannel<T>* sub = Sub(parity);
      std::memcpy(sub->m_data + sub->Index(0, r), src, static_cast<size_t>(m_cols) * sizeof(T));
    } else {
      CNaxChannel<T>* low = Sub(parity ? 3 : 0);
      CNaxChannel<T>* high = Sub(parity ? 1 : (p.twoD ? 2 : 1));
      DealRow(src, m_cols, oddX, low->m_data + low->Index(0, r), high->m_data + high->Index(0, r));
      LiftRow(parity ? p.oddY : p.evenY, r, false);
    }
    if (p.vertical) {
      ++p.pipeA.ready[parity ? 0 : 1];
      AdvancePipe(p.pipeA, p.pairA);
    }
    if (p.twoD) {
      ++p.pipeB.ready[parity ? 0 : 1];
      AdvancePipe(p.pipeB, p.pairB);
    }
  }
  if (p.vertical) AdvancePipe(p.pipeA, p.pairA);  // all rows are in: the pipe drains
  if (p.twoD) AdvancePipe(p.pipeB, p.pairB);
}

// Inverse lifting followed by the unite, in one pass over the rows of `raw`: the vertical
// inverse steps run just far enough ahead for the next output row, which is then lifted
// back along X and interleaved.
template <typename T>
void CNaxChannel<T>::LiftAndUnite(CNaxChannel<T>* raw) const {
  using namespace nax::detail;
  LiftPlan p = MakeLiftPlan(true);
  constexpr int32 kChunk = 32;
  const int32 oddX = IsOdd(m_offsetX, 0);
  int32 next[2] = {0, 0};
  for (int32 y = 0; y < m_rows; ++y) {
    T* dst = raw->m_data + Index(0, y);
    const int32 parity = p.vertical ? IsOdd(m_offsetY, y) : 0;
    const int32 r = p.vertical ? next[parity]++ : y;
    const int32 channel = parity ? 0 : 1;  // high or low rows of the vertical pairs
    if (p.vertical)
      while (FinalRows(p.pipeA, channel) <= r) {
        p.pipeA.limit += kChunk;
        AdvancePipe(p.pipeA, p.pairA);
      }
    if (p.twoD)
      while (FinalRows(p.pipeB, channel) <= r) {
        p.pipeB.limit += kChunk;
        AdvancePipe(p.pipeB, p.pairB);
      }
    if (p.columnsOnly) {
      const CNaxChannel<T>* sub = Sub(parity);
      std::memcpy(dst, sub->m_data + sub->Index(0, r), static_cast<size_t>(m_cols) * sizeof(T));
    } else {
      const CNaxChannel<T>* low = Sub(parity ? 3 : 0);
      const CNaxChannel<T>* high = Sub(parity ? 1 : (p.twoD ? 2 : 1));
      LiftRow(parity ? p.oddY : p.evenY, r, true);
      MergeRow(dst, m_cols, oddX, low->m_data + low->Index(0, r), high->m_data + high->Index(0, r));
    }
  }
}

// ---------------------------------------------------------------------------------------
// The transform

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::FWTStep(CNaxWaveletFilter<T>* filter, naxChannelType type) {
  // The shape test is crossed on purpose: splitting rows needs two rows, and so on.
  if (type == naxChannelRows && m_rows < 2) return nullptr;
  if (type == naxChannelColumns && m_cols < 2) return nullptr;
  if (type == naxChannel2D && (m_rows < 2 || m_cols < 2)) return nullptr;

  if (m_decomposed != 0) {  // split the lowest band one level further
    if (m_subChannels == nullptr || m_subChannelsNb < 1 || m_subChannels[0] == nullptr)
      return nullptr;
    CNaxChannel<T>* low = m_subChannels[0];
    CNaxChannel<T>* result = low->FWTStep(filter, type);
    if (result == nullptr) return nullptr;
    if (result != low) delete low;
    m_subChannels[0] = result;
    m_decomposed = 1;
    return this;
  }

  auto* result = new CNaxChannel<T>(m_cols, m_rows, m_offsetX, m_offsetY);
  // Every sample is written by the split below unless there is nothing to split.
  result->BuildSubChannels(filter, type, m_normalization, m_data == nullptr);
  // Split and lifting in one pass: the same result as Split, then LiftDirect on the pairs
  // (rows first in two dimensions: (0, 2) and (3, 1) along X, then (0, 3) and (2, 1)).
  if (m_data != nullptr && result->SubChannelsFitShape()) result->SplitAndLift(this);
  Destroy();  // the source lives on only in the sub-channels
  result->m_decomposed = 1;
  return result;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::FWTRawChannel(CNaxWaveletFilter<T>* filter, naxChannelType type,
                                              int32 depth) {
  if (depth < 1 || m_decomposed != 0) return nullptr;
  CNaxChannel<T>* result = FWTStep(filter, type);
  if (result == nullptr) return nullptr;
  if (result->m_subChannels != nullptr && result->m_subChannels[0] != nullptr) {
    CNaxChannel<T>* low = result->m_subChannels[0];
    CNaxChannel<T>* deeper = low->FWTRawChannel(filter, type, depth - 1);
    if (deeper != nullptr) {
      delete low;
      result->m_subChannels[0] = deeper;
    }
  }
  result->m_decomposed = 1;
  return result;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::FWT(CNaxWaveletFilter<T>* filter, naxChannelType type,
                                    int32 depth) {
  const naxWaveletNormalization normalization = m_normalization;  // the step clears it
  if (depth < 1) return m_decomposed != 0 ? CloneDecomposedChannel() : CloneRawChannel();

  CNaxChannel<T>* result = nullptr;
  if (m_decomposed == 0) {
    result = FWTRawChannel(filter, type, depth);
    if (result == nullptr) return nullptr;
  } else {
    result = CloneDecomposedChannel();
    const int32 more = depth - GetDepth();
    CNaxChannel<T>* parent = result;
    while (parent->m_subChannels != nullptr && parent->m_subChannels[0] != nullptr &&
           parent->m_subChannels[0]->m_subChannels != nullptr &&
           parent->m_subChannels[0]->m_subChannelsNb > 0)
      parent = parent->m_subChannels[0];
    CNaxChannel<T>* low = parent->m_subChannels != nullptr ? parent->m_subChannels[0] : nullptr;
    if (more >= 1 && low != nullptr) {
      CNaxChannel<T>* deeper = low->FWTRawChannel(filter, type, more);
      if (deeper != nullptr) {
        delete low;
        parent->m_subChannels[0] = deeper;
      }
    }
  }
  // An already normalized tree that is extended is scaled again, old levels included.
  if (normalization != naxNoNormalization && result->m_decomposed != 0)
    result->Normalize(depth, normalization);
  result->m_normalization = normalization;
  result->m_filter = filter;
  result->m_type = type;
  result->Inherit();
  return result;
}

template <typename T>
void CNaxChannel<T>::FWTInPlace(CNaxWaveletFilter<T>* filter, naxChannelType type, int32 depth) {
  CNaxChannel<T>* result = FWT(filter, type, depth);
  if (result == nullptr) return;
  TakeOver(result);
  delete result;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::InverseOneLevel() {
  const bool fits = SubChannelsFitShape();
  auto* result = new CNaxChannel<T>(m_cols, m_rows, m_offsetX, m_offsetY);
  result->m_data = NewSamples(result->Size(), !fits);
  // The same result as LiftInverse on the pairs (columns first in two dimensions), then
  // Unite, in one pass.
  if (fits && result->m_data != nullptr) LiftAndUnite(result);
  return result;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::DestroyingIFWT() {
  if (m_decomposed != 0 && m_subChannels != nullptr && m_subChannels[0] != nullptr &&
      m_subChannels[0]->m_decomposed != 0) {
    CNaxChannel<T>* low = m_subChannels[0];
    CNaxChannel<T>* raw = low->DestroyingIFWT();
    if (raw != nullptr) {
      delete low;
      m_subChannels[0] = raw;
    }
  }
  if (m_decomposed == 0) return nullptr;
  CNaxChannel<T>* result = InverseOneLevel();
  Destroy();
  return result;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::IFWT() {
  if (m_normalization != naxNoNormalization && m_decomposed != 0) Denormalize();
  return DestroyingIFWT();
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::IFWTStep() {
  if (m_decomposed == 0 || m_subChannels == nullptr || m_subChannels[0] == nullptr ||
      m_subChannels[0]->m_decomposed != 0)
    return nullptr;
  return InverseOneLevel();
}

template <typename T>
void CNaxChannel<T>::IFWTInPlace() {
  CNaxChannel<T>* result = IFWT();
  if (result == nullptr) return;
  TakeOver(result);
  delete result;
}

// ---------------------------------------------------------------------------------------
// Normalization

template <typename T>
void CNaxChannel<T>::Scale(CNaxChannel<T>* channel, T factor) {
  if (channel == nullptr) return;
  const int64 n = channel->Size();
  if (channel->m_data != nullptr)
    for (int64 i = 0; i < n; ++i) channel->m_data[i] *= factor;
  if (channel->m_subChannels != nullptr)
    for (int32 k = 0; k < kMaxSubChannels; ++k) Scale(channel->m_subChannels[k], factor);
}

template <typename T>
void CNaxChannel<T>::Normalize(int32 depth, naxWaveletNormalization normalization) {
  if (normalization == naxNoNormalization || m_filter == nullptr) return;
  const int32 which = normalization == naxNormalizationByFirstNorms ? 1 : 0;
  Normalize(depth, normalization, m_filter->GetLowNorm(which), m_filter->GetHighNorm(which));
}

template <typename T>
void CNaxChannel<T>::Denormalize(int32 depth, naxWaveletNormalization normalization) {
  if (normalization == naxNoNormalization || m_filter == nullptr) return;
  const int32 which = normalization == naxNormalizationByFirstNorms ? 1 : 0;
  Normalize(depth, normalization, T(1) / m_filter->GetLowNorm(which),
            T(1) / m_filter->GetHighNorm(which));
}

template <typename T>
void CNaxChannel<T>::Normalize(int32 depth, naxWaveletNormalization normalization, T low,
                               T high) {
  const int32 actual = GetDepth();
  const int32 levels = depth < actual ? depth : actual;
  if (normalization == naxNoNormalization || m_decomposed == 0 || levels < 1) return;
  const auto notOne = [](T f) { return std::fabs(f - T(1)) > T(1e-6); };
  CNaxChannel<T>* node = this;
  if (m_subChannelsNb == 4) {
    T a = low * high, b = high * high, c = low * low;
    const T step = low * low;
    for (int32 k = 0; k < levels; ++k) {
      if (notOne(a)) {
        Scale(node->SubChannel(3), a);
        Scale(node->SubChannel(2), a);
      }
      if (notOne(b)) Scale(node->SubChannel(1), b);
      if (k + 1 < levels) {
        node = node->m_subChannels[0];
        a *= step;
        b *= step;
        c *= step;
      }
    }
    if (notOne(c)) Scale(node->SubChannel(0), c);
  } else {
    T hh = high, ll = low;
    for (int32 k = 0; k < levels; ++k) {
      if (notOne(hh)) Scale(node->SubChannel(1), hh);
      if (k + 1 < levels) {
        node = node->m_subChannels[0];
        hh *= low;
        ll *= low;
      }
    }
    if (notOne(ll)) Scale(node->SubChannel(0), ll);
  }
}

// ---------------------------------------------------------------------------------------
// Bands

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::GetLowChannel() const {
  if (m_decomposed == 0) return nullptr;
  const int32 depth = GetDepth();
  if (depth < 1) return nullptr;
  const CNaxChannel<T>* low = SubChannel(depth - 1, naxSubChannelLow);
  return low != nullptr ? low->CloneRawChannel() : nullptr;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::GetHighChannel(int32 level, naxSubChannelType type) const {
  if (m_decomposed == 0 || level < 1 || level > GetDepth()) return nullptr;
  const CNaxChannel<T>* band = SubChannel(level - 1, type);
  if (band == nullptr || band->m_decomposed != 0) return nullptr;
  return band->CloneRawChannel();
}

template <typename T>
void CNaxChannel<T>::DestroyLowestSubChannel() {
  if (m_subChannels != nullptr && m_subChannels[0] != nullptr) m_subChannels[0]->Destroy();
}

// ---------------------------------------------------------------------------------------
// Printing

template <typename T>
void CNaxChannel<T>::PrintSamples(std::ostream& os) const {
  for (int32 y = 0; y < m_rows; ++y) {
    os << "( ";
    for (int32 x = 0; x < m_cols; ++x) os << m_data[Index(x, y)] << ' ';
    os << ")\n";
  }
}

template <typename T>
void CNaxChannel<T>::PrintBands(std::ostream& os, int32 level) const {
  const auto filled = [](const CNaxChannel<T>* c) { return c != nullptr && c->m_data != nullptr; };
  if (m_subChannelsNb == 4) {
    const CNaxChannel<T>* lh = SubChannel(2);
    const CNaxChannel<T>* hl = SubChannel(3);
    const CNaxChannel<T>* hh = SubChannel(1);
    if (filled(lh) && filled(hl) && filled(hh)) {
      os << "High frequency channels for level " << level << ":\n";
      os << "LH: \n";
      lh->PrintSamples(os);
      os << "HL: \n";
      hl->PrintSamples(os);
      os << "HH: \n";
      hh->PrintSamples(os);
    } else {
      // One band at a time; the HH band is labelled "LH: " here, as it always was.
      const char* names[3] = {"LH", "HL", "HH"};
      const char* labels[3] = {"LH: ", "HL: ", "LH: "};
      const CNaxChannel<T>* bands[3] = {lh, hl, hh};
      for (int32 k = 0; k < 3; ++k) {
        if (!filled(bands[k])) {
          os << names[k] << " channel for level " << level << " is empty.\n";
        } else {
          os << labels[k] << '\n';
          bands[k]->PrintSamples(os);
        }
      }
    }
  } else {
    const CNaxChannel<T>* high = SubChannel(1);
    if (!filled(high)) {
      os << "High frequency channel for level " << level << " is empty.\n";
    } else {
      os << "High frequency channel for level " << level << ":\n";
      high->PrintSamples(os);
    }
  }
}

template <typename T>
void CNaxChannel<T>::Print() const {
  std::ostream& os = std::cout;
  if (m_decomposed == 0) {
    if (m_data == nullptr) {
      os << "Raw channel is empty.\n";
    } else {
      os << "Raw channel: \n";
      PrintSamples(os);
    }
    os.flush();
    return;
  }
  const int32 depth = GetDepth();
  os << "Decomposedd channel with a depth of decomposition " << depth << ":\n";
  const CNaxChannel<T>* node = this;
  for (int32 level = 1; level <= depth; ++level) {
    node->PrintBands(os, level);
    if (level == depth) {
      const CNaxChannel<T>* low = node->SubChannel(0);
      const bool empty = low == nullptr || low->m_data == nullptr;
      const char* name = node->m_subChannelsNb == 4 ? " LL" : "";
      if (empty) {
        os << "Low frequency channel" << name << " for level " << level << " is empty.\n";
      } else {
        os << "Low  frequency channel" << name << " for level " << level << ":\n";
        low->PrintSamples(os);
      }
    }
    node = node->m_subChannels[0];
  }
  os.flush();
}

#include "nax/detail/wavelet_denoise.h"
#include "nax/detail/wavelet_edit.h"

extern template class CNaxChannel<float>;
extern template class CNaxChannel<double>;
extern template int32 naxAreChannelsAlmostEqual<float>(const CNaxChannel<float>*,
                                                       const CNaxChannel<float>*, float);
extern template int32 naxAreChannelsAlmostEqual<double>(const CNaxChannel<double>*,
                                                        const CNaxChannel<double>*, double);
extern template void naxInsertRectData<float>(const float*, float*, int32, int32, int32, int32,
                                              int32);
extern template void naxInsertRectData<double>(const double*, double*, int32, int32, int32,
                                               int32, int32);
extern template void naxExtractRectData<float>(const float*, int32, int32, int32, int32, int32,
                                               float*);
extern template void naxExtractRectData<double>(const double*, int32, int32, int32, int32,
                                                int32, double*);
extern template void naxInsertPartRectData<float>(const float*, float*, int32, int32, int32,
                                                  int32, int32, int32, int32, int32);
extern template void naxInsertPartRectData<double>(const double*, double*, int32, int32, int32,
                                                   int32, int32, int32, int32, int32);

#endif  // NAX_CHANNEL_H
