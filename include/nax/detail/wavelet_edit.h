// Editing of channels: rectangle copies, cutting and pasting windows of raw channels and
// of their trees, the windowed inverse, packing a tree into one array, and rescaling by
// the transform and by interpolation.
//
// A window of a tree is cut so that its inverse reproduces the window's samples: on each
// level the coefficients that reach the wanted samples are kept, widened by the filter's
// margin and by what the deeper levels need, and each node of the cut keeps the absolute
// position of its first coefficient, so its splits have the parities of the whole.
//
// Included by nax/channel.h, after the class.
#ifndef NAX_DETAIL_WAVELET_EDIT_H
#define NAX_DETAIL_WAVELET_EDIT_H

#include <algorithm>
#include <cstring>
#include <memory>

#include "nax/interpolation.h"

// ---------------------------------------------------------------------------------------
// Rectangle copies

template <typename T>
void naxInsertRectData(const T* source, T* destination, int32 cols, int32 left, int32 top,
                       int32 width, int32 height) {
  if (height < 1 || width < 1) return;
  for (int32 y = 0; y < height; ++y)
    std::memcpy(destination + static_cast<int64>(top + y) * cols + left,
                source + static_cast<int64>(y) * width, static_cast<size_t>(width) * sizeof(T));
}

template <typename T>
void naxExtractRectData(const T* source, int32 cols, int32 left, int32 top, int32 width,
                        int32 height, T* destination) {
  if (height < 1 || width < 1) return;
  for (int32 y = 0; y < height; ++y)
    std::memcpy(destination + static_cast<int64>(y) * width,
                source + static_cast<int64>(top + y) * cols + left,
                static_cast<size_t>(width) * sizeof(T));
}

template <typename T>
void naxInsertPartRectData(const T* source, T* destination, int32 sourceCols, int32 sourceLeft,
                           int32 sourceTop, int32 destinationCols, int32 destinationLeft,
                           int32 destinationTop, int32 width, int32 height) {
  if (height < 1 || width < 1) return;
  for (int32 y = 0; y < height; ++y)
    std::memcpy(destination + static_cast<int64>(destinationTop + y) * destinationCols +
                    destinationLeft,
                source + static_cast<int64>(sourceTop + y) * sourceCols + sourceLeft,
                static_cast<size_t>(width) * sizeof(T));
}

namespace nax::detail {

/// Extent, relative to `node`, of its window in a cut tree along one axis: the `needed`
/// samples widened by `reach` on a split axis, and further by the samples whose low
/// coefficients the deeper levels need in their own widened windows; clipped to the node.
template <typename T>
Span1D CutExtent(const CNaxChannel<T>* node, bool alongX, bool split, Span1D needed,
                 int32 reach) {
  const int32 n = alongX ? node->GetColsNb() : node->GetRowsNb();
  const int32 offset = alongX ? node->GetOffsetX() : node->GetOffsetY();
  Span1D w = needed;
  if (split) {
    w.first -= reach;
    w.last += reach;
  }
  w.first = std::max(w.first, 0);
  w.last = std::min(w.last, n - 1);
  const CNaxChannel<T>* low = node->IsDecomposed() != 0 ? node->SubChannel(0) : nullptr;
  if (low == nullptr || low->IsDecomposed() == 0) return w;
  const Span1D lowNeeded = split ? LowSpan(w, offset) : w;
  if (lowNeeded.Length() < 1) return w;
  const Span1D deeper = CutExtent(low, alongX, split, lowNeeded, reach);
  if (!split) return {std::min(w.first, deeper.first), std::max(w.last, deeper.last)};
  const int32 start = IsOdd(offset, 0);  // index of the first low sample
  return {std::min(w.first, start + 2 * deeper.first),
          std::max(w.last, std::min(n - 1, start + 2 * deeper.last))};
}

}  // namespace nax::detail

// ---------------------------------------------------------------------------------------
// Cut

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::Cut(int32 left, int32 top, int32 right, int32 bottom) const {
  if (m_decomposed == 0) return CutFromRawChannel(left, top, right, bottom);
  return CutFromDecomposedChannel(left, top, right, bottom, nullptr, nullptr, nullptr, nullptr);
}

template <typename T>
bool CNaxChannel<T>::WindowInside(int32 left, int32 top, int32 right, int32 bottom) const {
  return left >= m_offsetX && top >= m_offsetY && right >= left && bottom >= top &&
         right <= m_offsetX + m_cols - 1 && bottom <= m_offsetY + m_rows - 1;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutFromRawChannel(int32 left, int32 top, int32 right,
                                                  int32 bottom) const {
  if (!WindowInside(left, top, right, bottom)) return nullptr;
  auto* result = new CNaxChannel<T>(right - left + 1, bottom - top + 1, left, top);
  result->m_filter = m_filter;
  result->m_type = m_type;
  result->m_normalization = m_normalization;
  if (m_data != nullptr) {
    result->m_data = NewSamples(result->Size(), false);
    naxExtractRectData(m_data, m_cols, left - m_offsetX, top - m_offsetY, result->m_cols,
                       result->m_rows, result->m_data);
  }
  return result;
}

template <typename T>
int32 CNaxChannel<T>::FilterMargin() const {
  if (m_filter == nullptr) return 0;
  const int32 low = std::min(m_filter->GetPrimeStartInd(), m_filter->GetDualStartInd());
  const int32 high = std::max(m_filter->GetPrimeEndInd(), m_filter->GetDualEndInd());
  return std::max(-low, high);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutFromDecomposedChannel(int32 left, int32 top, int32 right,
                                                         int32 bottom, CNaxChannel<T>* a,
                                                         CNaxChannel<T>* b, CNaxChannel<T>* c,
                                                         CNaxChannel<T>* d) const {
  const int32 margin = FilterMargin();
  switch (m_type) {
    case naxChannelRows: return CutRectForRows(left, top, right, bottom, a, b, c, d, margin);
    case naxChannelColumns: return CutRectForColumns(left, top, right, bottom, a, b, c, d, margin);
    case naxChannel2D: return CutRectFor2D(left, top, right, bottom, a, b, c, d, margin);
    default: return nullptr;
  }
}

// The three cuts of a tree by its type. (left, top, right, bottom) is the wanted window;
// `margin` counts the coefficients on each side of a reconstructed sample that it depends
// on; a to d, when not null, are the records that receive the top level's sub-channels.
template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutRectForRows(int32 left, int32 top, int32 right, int32 bottom,
                                               CNaxChannel<T>* a, CNaxChannel<T>* b,
                                               CNaxChannel<T>* c, CNaxChannel<T>* d,
                                               int32 margin) const {
  if (m_type != naxChannelRows) return nullptr;
  CNaxChannel<T>* records[4] = {a, b, c, d};
  return CutRect(left, top, right, bottom, records, margin, 0);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutRectForColumns(int32 left, int32 top, int32 right,
                                                  int32 bottom, CNaxChannel<T>* a,
                                                  CNaxChannel<T>* b, CNaxChannel<T>* c,
                                                  CNaxChannel<T>* d, int32 margin) const {
  if (m_type != naxChannelColumns) return nullptr;
  CNaxChannel<T>* records[4] = {a, b, c, d};
  return CutRect(left, top, right, bottom, records, 0, margin);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutRectFor2D(int32 left, int32 top, int32 right, int32 bottom,
                                             CNaxChannel<T>* a, CNaxChannel<T>* b,
                                             CNaxChannel<T>* c, CNaxChannel<T>* d,
                                             int32 margin) const {
  if (m_type != naxChannel2D) return nullptr;
  CNaxChannel<T>* records[4] = {a, b, c, d};
  return CutRect(left, top, right, bottom, records, margin, margin);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutRect(int32 left, int32 top, int32 right, int32 bottom,
                                        CNaxChannel<T>* const records[4], int32 marginX,
                                        int32 marginY) const {
  using nax::detail::Span1D;
  if (m_decomposed == 0 || !WindowInside(left, top, right, bottom)) return nullptr;
  const bool splitX = m_type != naxChannelColumns, splitY = m_type != naxChannelRows;
  // A margin of m coefficients is 2m samples of the level it is counted on.
  const Span1D extent[2] = {
      nax::detail::CutExtent(this, true, splitX, {left - m_offsetX, right - m_offsetX},
                             2 * marginX),
      nax::detail::CutExtent(this, false, splitY, {top - m_offsetY, bottom - m_offsetY},
                             2 * marginY)};
  auto* result = new CNaxChannel<T>();
  CutTree(extent, records, result);
  return result;
}

// Fills `node` with the window `extent` (relative to this node) of this tree, level by
// level; the bands of each level are the coefficients of the samples of its window.
template <typename T>
void CNaxChannel<T>::CutTree(const nax::detail::Span1D extent[2],
                             CNaxChannel<T>* const records[4], CNaxChannel<T>* node) const {
  using namespace nax::detail;
  node->ReleaseStorage();
  node->m_cols = extent[0].Length();
  node->m_rows = extent[1].Length();
  node->m_offsetX = m_offsetX + extent[0].first;
  node->m_offsetY = m_offsetY + extent[1].first;
  node->m_filter = m_filter;
  node->m_type = m_type;
  node->m_normalization = m_normalization;
  node->m_decomposed = 0;
  if (m_decomposed == 0 || m_subChannels == nullptr) {
    if (m_data == nullptr) return;
    node->m_data = NewSamples(node->Size(), false);
    naxExtractRectData(m_data, m_cols, extent[0].first, extent[1].first, node->m_cols,
                       node->m_rows, node->m_data);
    return;
  }
  const bool splitX = m_type != naxChannelColumns, splitY = m_type != naxChannelRows;
  const Span1D xs[2] = {splitX ? LowSpan(extent[0], m_offsetX) : extent[0],
                        splitX ? HighSpan(extent[0], m_offsetX) : extent[0]};
  const Span1D ys[2] = {splitY ? LowSpan(extent[1], m_offsetY) : extent[1],
                        splitY ? HighSpan(extent[1], m_offsetY) : extent[1]};
  const int32 band[4][2] = {{0, 0}, {1, 1}, {1, 0}, {0, 1}};  // X half, Y half
  node->m_subChannels = new CNaxChannel<T>*[kMaxSubChannels]();
  node->m_subChannelsNb = m_subChannelsNb;
  CNaxChannel<T>* const none[4] = {nullptr, nullptr, nullptr, nullptr};
  for (int32 k = 0; k < m_subChannelsNb && k < kMaxSubChannels; ++k) {
    if (m_subChannels[k] == nullptr) continue;
    CNaxChannel<T>* sub = records != nullptr && records[k] != nullptr ? records[k]
                                                                      : new CNaxChannel<T>();
    node->m_subChannels[k] = sub;
    const Span1D window[2] = {xs[band[k][0]], ys[band[k][1]]};
    m_subChannels[k]->CutTree(window, none, sub);
  }
  node->m_decomposed = 1;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::IFWT(int32 left, int32 top, int32 width, int32 height) const {
  const int32 right = left + width - 1, bottom = top + height - 1;
  if (m_decomposed == 0 || !WindowInside(left, top, right, bottom)) return nullptr;
  std::unique_ptr<CNaxChannel<T>> cut(Cut(left, top, right, bottom));
  if (cut == nullptr) return nullptr;
  std::unique_ptr<CNaxChannel<T>> raw(cut->IFWT());
  if (raw == nullptr) return nullptr;
  return raw->CutFromRawChannel(left, top, right, bottom);
}

// ---------------------------------------------------------------------------------------
// Paste

template <typename T>
void CNaxChannel<T>::Paste(const CNaxChannel<T>* channel) {
  if (channel == nullptr || channel == this) return;
  if (m_decomposed == 0 && channel->m_decomposed == 0) {
    PasteRawChannel(channel);
  } else if (m_decomposed != 0 && channel->m_decomposed != 0 && channel->m_type == m_type) {
    PasteDecomposedChannel(channel, channel->SubChannel(0), channel->SubChannel(1),
                           channel->SubChannel(2), channel->SubChannel(3));
  }
}

template <typename T>
void CNaxChannel<T>::PasteRawChannel(const CNaxChannel<T>* channel) {
  PasteSamples(channel, 0);
}

// Writes the samples of `channel` less `margin` on each side into this node, where they
// overlap it (by absolute position).
template <typename T>
void CNaxChannel<T>::PasteSamples(const CNaxChannel<T>* channel, int32 margin) {
  if (channel == nullptr || channel->m_data == nullptr || m_data == nullptr) return;
  const int32 x0 = std::max(m_offsetX, channel->m_offsetX + margin);
  const int32 y0 = std::max(m_offsetY, channel->m_offsetY + margin);
  const int32 x1 = std::min(m_offsetX + m_cols, channel->m_offsetX + channel->m_cols - margin);
  const int32 y1 = std::min(m_offsetY + m_rows, channel->m_offsetY + channel->m_rows - margin);
  naxInsertPartRectData(channel->m_data, m_data, channel->m_cols, x0 - channel->m_offsetX,
                        y0 - channel->m_offsetY, m_cols, x0 - m_offsetX, y0 - m_offsetY,
                        x1 - x0, y1 - y0);
}

template <typename T>
void CNaxChannel<T>::PasteDecomposedChannel(const CNaxChannel<T>* channel, CNaxChannel<T>* a,
                                            CNaxChannel<T>* b, CNaxChannel<T>* c,
                                            CNaxChannel<T>* d) {
  switch (m_type) {
    case naxChannelRows: PasteRectForRows(channel, a, b, c, d, 0); break;
    case naxChannelColumns: PasteRectForColumns(channel, a, b, c, d, 0); break;
    case naxChannel2D: PasteRectFor2D(channel, a, b, c, d, 0); break;
    default: break;
  }
}

// The three pastes of a tree by its type: a to d are the sub-channels of `channel` that go
// into this node's sub-channels; `margin` coefficients on each side of each band are left
// out.
template <typename T>
void CNaxChannel<T>::PasteRectForRows(const CNaxChannel<T>* channel, CNaxChannel<T>* a,
                                      CNaxChannel<T>* b, CNaxChannel<T>* c, CNaxChannel<T>* d,
                                      int32 margin) {
  PasteRectOfType(naxChannelRows, channel, a, b, c, d, margin);
}

template <typename T>
void CNaxChannel<T>::PasteRectForColumns(const CNaxChannel<T>* channel, CNaxChannel<T>* a,
                                         CNaxChannel<T>* b, CNaxChannel<T>* c,
                                         CNaxChannel<T>* d, int32 margin) {
  PasteRectOfType(naxChannelColumns, channel, a, b, c, d, margin);
}

template <typename T>
void CNaxChannel<T>::PasteRectFor2D(const CNaxChannel<T>* channel, CNaxChannel<T>* a,
                                    CNaxChannel<T>* b, CNaxChannel<T>* c, CNaxChannel<T>* d,
                                    int32 margin) {
  PasteRectOfType(naxChannel2D, channel, a, b, c, d, margin);
}

// Pastes the bands a to d when `channel` was split by `type`: two bands for rows or columns,
// four for 2D.
template <typename T>
void CNaxChannel<T>::PasteRectOfType(naxChannelType type, const CNaxChannel<T>* channel,
                                     CNaxChannel<T>* a, CNaxChannel<T>* b, CNaxChannel<T>* c,
                                     CNaxChannel<T>* d, int32 margin) {
  if (channel->m_type != type) return;
  const CNaxChannel<T>* bands[4] = {a, b, c, d};
  PasteBands(bands, type == naxChannel2D ? 4 : 2, margin);
}

template <typename T>
void CNaxChannel<T>::PasteBands(const CNaxChannel<T>* const bands[4], int32 count, int32 margin) {
  if (m_subChannels == nullptr) return;
  for (int32 k = 0; k < count && k < m_subChannelsNb; ++k) {
    CNaxChannel<T>* target = m_subChannels[k];
    const CNaxChannel<T>* source = bands[k];
    if (target == nullptr || source == nullptr) continue;
    if (target->m_decomposed == 0 && source->m_decomposed == 0) {
      target->PasteSamples(source, margin);
    } else if (target->m_decomposed != 0 && source->m_decomposed != 0 &&
               source->m_type == target->m_type) {
      const CNaxChannel<T>* deeper[4] = {source->SubChannel(0), source->SubChannel(1),
                                         source->SubChannel(2), source->SubChannel(3)};
      target->PasteBands(deeper, source->m_subChannelsNb, margin);
    }
  }
}

// Moves a tree by (dx, dy) samples: each level's offsets move by the shift of its own
// sample grid. False, with nothing moved, when a shift along a split axis is not a
// multiple of 2^depth, so that parities would change.
template <typename T>
bool CNaxChannel<T>::ShiftTree(int32 dx, int32 dy) {
  const int32 depth = GetDepth();
  const int32 unit = depth < 30 ? 1 << depth : 1 << 30;
  if ((m_type != naxChannelColumns && dx % unit != 0) || (m_type != naxChannelRows && dy % unit != 0))
    return false;
  m_offsetX += dx;
  m_offsetY += dy;
  if (m_subChannels != nullptr)
    for (int32 k = 0; k < m_subChannelsNb; ++k)
      if (m_subChannels[k] != nullptr)
        m_subChannels[k]->ShiftTree(m_type != naxChannelColumns ? dx / 2 : dx,
                                    m_type != naxChannelRows ? dy / 2 : dy);
  return true;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutAndPasteRows(const CNaxChannel<T>* channel, int32 left,
                                                int32 top, int32 right, int32 bottom, int32 dx,
                                                int32 dy) {
  if (channel->m_type != naxChannelRows) return nullptr;
  return CutAndPaste2D(channel, left, top, right, bottom, dx, dy, channel->FilterMargin(), 0);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutAndPasteColumns(const CNaxChannel<T>* channel, int32 left,
                                                   int32 top, int32 right, int32 bottom,
                                                   int32 dx, int32 dy) {
  if (channel->m_type != naxChannelColumns) return nullptr;
  return CutAndPaste2D(channel, left, top, right, bottom, dx, dy, 0, channel->FilterMargin());
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::CutAndPaste2D(const CNaxChannel<T>* channel, int32 left,
                                              int32 top, int32 right, int32 bottom, int32 dx,
                                              int32 dy, int32 marginX, int32 marginY) {
  if (channel == nullptr || channel == this || channel->m_type != m_type || m_decomposed == 0)
    return nullptr;
  CNaxChannel<T>* const none[4] = {nullptr, nullptr, nullptr, nullptr};
  std::unique_ptr<CNaxChannel<T>> cut(
      channel->CutRect(left, top, right, bottom, none, marginX, marginY));
  if (cut == nullptr || !cut->ShiftTree(dx, dy)) return nullptr;
  Paste(cut.get());
  return this;
}

// ---------------------------------------------------------------------------------------
// Packing

template <typename T>
void CNaxChannel<T>::PackInto(T* packed, int32 packedCols) const {
  if (m_decomposed == 0 || m_subChannels == nullptr) {
    if (m_data != nullptr) naxInsertRectData(m_data, packed, packedCols, 0, 0, m_cols, m_rows);
    return;
  }
  const CNaxChannel<T>* low = m_subChannels[0];
  const int32 lc = low != nullptr ? low->m_cols : 0, lr = low != nullptr ? low->m_rows : 0;
  for (int32 k = 1; k < m_subChannelsNb; ++k) {
    const CNaxChannel<T>* band = m_subChannels[k];
    if (band == nullptr || band->m_data == nullptr) continue;
    const int32 x = k == 3 || m_type == naxChannelColumns ? 0 : lc;
    const int32 y = k == 2 || m_type == naxChannelRows ? 0 : lr;
    naxInsertRectData(band->m_data, packed, packedCols, x, y, band->m_cols, band->m_rows);
  }
  if (low != nullptr) low->PackInto(packed, packedCols);
}

template <typename T>
void CNaxChannel<T>::UnpackFrom(const T* packed, int32 packedCols) {
  if (m_decomposed == 0 || m_subChannels == nullptr) {
    if (m_data != nullptr) naxExtractRectData(packed, packedCols, 0, 0, m_cols, m_rows, m_data);
    return;
  }
  CNaxChannel<T>* low = m_subChannels[0];
  const int32 lc = low != nullptr ? low->m_cols : 0, lr = low != nullptr ? low->m_rows : 0;
  for (int32 k = 1; k < m_subChannelsNb; ++k) {
    CNaxChannel<T>* band = m_subChannels[k];
    if (band == nullptr || band->m_data == nullptr) continue;
    const int32 x = k == 3 || m_type == naxChannelColumns ? 0 : lc;
    const int32 y = k == 2 || m_type == naxChannelRows ? 0 : lr;
    naxExtractRectData(packed, packedCols, x, y, band->m_cols, band->m_rows, band->m_data);
  }
  if (low != nullptr) low->UnpackFrom(packed, packedCols);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::PackDecomposedChannel() const {
  if (m_decomposed == 0) return nullptr;
  auto* packed = new CNaxChannel<T>(m_cols, m_rows, m_offsetX, m_offsetY);
  packed->m_filter = m_filter;
  packed->m_normalization = m_normalization;
  packed->Initialize();
  if (packed->m_data != nullptr) PackInto(packed->m_data, m_cols);
  return packed;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::UnpackDecomposedChannel(CNaxWaveletFilter<T>* filter,
                                                        naxChannelType type, int32 depth,
                                                        naxWaveletNormalization normalization)
    const {
  if (m_decomposed != 0 || m_data == nullptr) return nullptr;
  auto* result = new CNaxChannel<T>(m_cols, m_rows, m_offsetX, m_offsetY);
  result->m_normalization = normalization;
  CNaxChannel<T>* node = result;
  int32 levels = 0;
  for (; levels < depth; ++levels) {
    // The same refusal as FWTStep, so the tree has the depth a transform would reach.
    if ((type == naxChannelRows && node->m_rows < 2) ||
        (type == naxChannelColumns && node->m_cols < 2) ||
        (type == naxChannel2D && (node->m_rows < 2 || node->m_cols < 2)))
      break;
    node->CreateOneLevelSubChannels(filter, type, normalization);
    if (node->m_decomposed == 0) break;
    node = node->m_subChannels[0];
  }
  if (levels == 0) {
    delete result;
    return CloneRawChannel();
  }
  result->UnpackFrom(m_data, m_cols);
  return result;
}

// ---------------------------------------------------------------------------------------
// Rescaling

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::ResampledCopy(const CNaxChannel<T>* band, int32 cols,
                                              int32 rows) const {
  if (band == nullptr || band->m_data == nullptr || band->Size() < 1 || cols < 1 || rows < 1)
    return nullptr;
  auto* result = new CNaxChannel<T>(cols, rows, m_offsetX, m_offsetY);
  result->m_filter = m_filter;
  result->m_normalization = m_normalization;
  result->m_data = NewSamples(result->Size(), false);
  CNaxInterpolation::InterpolateData2DBilinear(band->m_rows, band->m_cols, rows, cols, band->m_data,
                                         result->m_data);
  return result;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::GetScaledLowChannel() const {
  if (m_decomposed == 0) return nullptr;
  const int32 depth = GetDepth();
  return ResampledCopy(SubChannel(depth - 1, naxSubChannelLow), m_cols, m_rows);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::GetScaledHighChannel(int32 level, naxSubChannelType type) const {
  if (m_decomposed == 0 || level < 1 || level > GetDepth()) return nullptr;
  const CNaxChannel<T>* band = SubChannel(level - 1, type);
  if (band == nullptr || band->m_decomposed != 0) return nullptr;
  return ResampledCopy(band, m_cols, m_rows);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::ScaleRawChannelTwiceUp(CNaxWaveletFilter<T>* filter) const {
  if (m_decomposed != 0) return nullptr;
  auto* result = new CNaxChannel<T>(2 * m_cols, 2 * m_rows, 2 * m_offsetX, 2 * m_offsetY);
  result->CreateOneLevelSubChannels(filter, naxChannel2D, m_normalization);
  CNaxChannel<T>* low = result->SubChannel(0);
  if (low != nullptr && low->m_data != nullptr && m_data != nullptr && low->Size() == Size())
    std::memcpy(low->m_data, m_data, static_cast<size_t>(Size()) * sizeof(T));
  return result;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::ScaleRawChannelTwiceDown(CNaxWaveletFilter<T>* filter) const {
  if (m_decomposed != 0) return nullptr;
  std::unique_ptr<CNaxChannel<T>> copy(CloneRawChannel());
  std::unique_ptr<CNaxChannel<T>> tree(copy->FWTStep(filter, naxChannel2D));
  if (tree == nullptr || tree->m_subChannels == nullptr) return nullptr;
  CNaxChannel<T>* low = tree->m_subChannels[0];
  tree->m_subChannels[0] = nullptr;
  return low;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::ScaleDecomposedChannelTwiceUp() const {
  if (m_decomposed == 0) return nullptr;
  auto* result = new CNaxChannel<T>(2 * m_cols, 2 * m_rows, 2 * m_offsetX, 2 * m_offsetY);
  result->CreateOneLevelSubChannels(m_filter, naxChannel2D, m_normalization);
  // The low band's shape and offsets are this channel's: it takes the whole tree.
  if (result->m_subChannels != nullptr && result->m_subChannels[0] != nullptr)
    result->m_subChannels[0]->CopyDecomposedChannel(this);
  return result;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::ScaleDecomposedChannelTwiceDown() const {
  if (m_decomposed == 0 || m_type != naxChannel2D) return nullptr;
  const naxWaveletNormalization normalization = m_normalization;
  std::unique_ptr<CNaxChannel<T>> clone(CloneDecomposedChannel());
  if (normalization != naxNoNormalization) clone->Denormalize();
  clone->FWTStep(m_filter, naxChannel2D);  // one level more where the low band allows it
  CNaxChannel<T>* half = clone->m_subChannels[0];
  clone->m_subChannels[0] = nullptr;
  for (CNaxChannel<T>* node = half; node != nullptr && node->m_decomposed != 0;
       node = node->m_subChannels[0]) {
    node->m_filter = m_filter;
    node->m_type = m_type;
    node->m_normalization = normalization;
    node->Inherit();
  }
  half->m_normalization = normalization;
  if (half->m_decomposed != 0) half->Normalize();
  return half;
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::Resize(int32 cols, int32 rows) const {
  if (m_decomposed != 0) return nullptr;
  return ResampledCopy(this, cols, rows);
}

template <typename T>
CNaxChannel<T>* CNaxChannel<T>::Scale(T factor, CNaxWaveletFilter<T>* filter) const {
  if (factor < T(0.03125) || factor > T(32) || m_decomposed != 0 || m_data == nullptr)
    return nullptr;
  if (std::fabs(factor - T(1)) <= T(1e-6)) return CloneRawChannel();
  const int32 cols = static_cast<int32>(m_cols * factor);
  const int32 rows = static_cast<int32>(m_rows * factor);
  if (cols < 3 || rows < 3) return nullptr;
  std::unique_ptr<CNaxChannel<T>> current(CloneRawChannel());
  T power = T(1);
  if (factor > T(1)) {
    while (power < factor - T(1e-6)) {  // double until the power reaches the factor
      std::unique_ptr<CNaxChannel<T>> up(current->ScaleRawChannelTwiceUp(filter));
      current.reset(up->IFWT());
      power *= T(2);
    }
  } else {
    while (power * T(0.5) >= factor - T(1e-6)) {  // halve while not below the factor
      std::unique_ptr<CNaxChannel<T>> down(current->ScaleRawChannelTwiceDown(filter));
      if (down == nullptr) break;
      current = std::move(down);
      power *= T(0.5);
    }
  }
  CNaxChannel<T>* result = current->Resize(cols, rows);
  result->m_offsetX = static_cast<int32>(m_offsetX * factor);
  result->m_offsetY = static_cast<int32>(m_offsetY * factor);
  result->m_filter = m_filter;
  result->m_type = m_type;
  result->m_normalization = m_normalization;
  return result;
}

#endif  // NAX_DETAIL_WAVELET_EDIT_H
