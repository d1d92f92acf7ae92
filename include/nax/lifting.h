// Lifting steps of the wavelet transform on a pair of polyphase halves.
//
// A record binds the low and high sub-channels of one split and runs one step on them in
// place: predict (step 0) writes into the high band reading the low band, update (step 1)
// the reverse. The signal is extended by whole-sample symmetry around its first and last
// sample, for every length and every parity of its start. Reference: W. Sweldens, "The
// lifting scheme: a construction of second generation wavelets", SIAM J. Math. Anal. 29
// (1998).
#ifndef NAX_LIFTING_H
#define NAX_LIFTING_H

#include "nax/detail/wavelet_lifting.h"
#include "nax/types.h"
#include "nax/wavelet_filter.h"

/// Kind of transform of a decomposed channel; also the direction of a lifting step.
enum naxChannelType : int32 {
  naxChannelNone = 0,     ///< not transformed
  naxChannelRows = 1,     ///< each row is transformed (the columns are split); 2 sub-channels
  naxChannelColumns = 2,  ///< each column is transformed (the rows are split); 2 sub-channels
  naxChannel2D = 3        ///< both: 4 sub-channels
};

template <typename T>
class CNaxChannel;

/// Working record of one lifting pass over the two halves of a split. It owns nothing.
template <typename T>
class CNaxLifting {
  static_assert(nax::detail::kIsReal<T>, "CNaxLifting is defined for float and double");

 public:
  /// Binds `low` and `high`. A non-zero `axis` means the halves are interleaved along the
  /// columns (lifting along rows), zero along the rows. The half whose first sample stands
  /// first in the interleaved signal (the one with the other offset when the offsets on the
  /// axis differ, i.e. `high`) becomes the even half.
  CNaxLifting(const CNaxChannel<T>* low, const CNaxChannel<T>* high, int32 axis);
  ~CNaxLifting() {}
  CNaxLifting(const CNaxLifting<T>& other) = default;
  CNaxLifting<T>& operator=(const CNaxLifting<T>& other) = default;

  /// Data of the half that stands first in the interleaved order.
  T* GetEven() const { return m_even; }
  /// Data of the other half.
  T* GetOdd() const { return m_odd; }

  /// One step: `step` 0 predicts (adds to the high band a sum of low samples), any other
  /// value updates (adds to the low band a sum of high samples). `direction` 1 lifts along
  /// each row, 2 along each column (whole rows at a time); other values do nothing.
  void LiftUsing2Coef(int32 step, const T* coefficients, naxChannelType direction) {
    Run(2, step, coefficients, direction, false, 0, -1);
  }
  void LiftUsing4Coef(int32 step, const T* coefficients, naxChannelType direction) {
    Run(4, step, coefficients, direction, false, 0, -1);
  }
  void LiftUsing6Coef(int32 step, const T* coefficients, naxChannelType direction) {
    Run(6, step, coefficients, direction, false, 0, -1);
  }
  /// The inverse steps: subtract the same sums.
  void InvLiftUsing2Coef(int32 step, const T* coefficients, naxChannelType direction) {
    Run(2, step, coefficients, direction, true, 0, -1);
  }
  void InvLiftUsing4Coef(int32 step, const T* coefficients, naxChannelType direction) {
    Run(4, step, coefficients, direction, true, 0, -1);
  }
  void InvLiftUsing6Coef(int32 step, const T* coefficients, naxChannelType direction) {
    Run(6, step, coefficients, direction, true, 0, -1);
  }

 private:
  friend class CNaxChannel<T>;

  // Source, target and mirror flags of a step (forms A and B).
  nax::detail::LiftForm<T> Form(int32 step, naxChannelType direction) const;
  // One step of `taps` taps over the lines [lineBegin, lineEnd) (lineEnd < 0: all lines).
  // A line is a row of both halves along rows, a target row along columns.
  void Run(int32 taps, int32 step, const T* coefficients, naxChannelType direction,
           bool inverse, int32 lineBegin, int32 lineEnd) const;
  template <int N, bool Inverse>
  void RunTaps(const nax::detail::LiftForm<T>& form, naxChannelType direction, const T* c,
               int32 lineBegin, int32 lineEnd) const;

  int32 m_axis;
  T* m_even;
  T* m_odd;
  int32 m_evenCols;
  int32 m_evenRows;
  int32 m_oddCols;
  int32 m_oddRows;
  int32 m_swapped;
};

// ---------------------------------------------------------------------------------------
// Implementation

template <typename T>
CNaxLifting<T>::CNaxLifting(const CNaxChannel<T>* low, const CNaxChannel<T>* high, int32 axis)
    : m_axis(axis) {
  const bool differ = axis != 0 ? low->GetOffsetX() != high->GetOffsetX()
                                : low->GetOffsetY() != high->GetOffsetY();
  const CNaxChannel<T>* even = differ ? high : low;
  const CNaxChannel<T>* odd = differ ? low : high;
  m_swapped = differ ? 1 : 0;
  m_even = even->GetData();
  m_odd = odd->GetData();
  if (axis != 0) {
    m_evenRows = m_oddRows = low->GetRowsNb();
    m_evenCols = even->GetColsNb();
    m_oddCols = odd->GetColsNb();
  } else {
    m_evenCols = m_oddCols = low->GetColsNb();
    m_evenRows = even->GetRowsNb();
    m_oddRows = odd->GetRowsNb();
  }
}

template <typename T>
nax::detail::LiftForm<T> CNaxLifting<T>::Form(int32 step, naxChannelType direction) const {
  const bool formA = (step == 0 && m_swapped != 1) || (step != 0 && m_swapped != 0);
  const bool rows = direction == naxChannelRows;
  const int32 evenLength = rows ? m_evenCols : m_evenRows;
  const int32 oddLength = rows ? m_oddCols : m_oddRows;
  nax::detail::LiftForm<T> f;
  if (formA) {  // even -> odd
    f = {m_even, m_odd, evenLength, oddLength, 1, 0, evenLength == oddLength ? 1 : 0};
  } else {  // odd -> even
    f = {m_odd, m_even, oddLength, evenLength, 0, 1, evenLength != oddLength ? 1 : 0};
  }
  return f;
}

template <typename T>
template <int N, bool Inverse>
void CNaxLifting<T>::RunTaps(const nax::detail::LiftForm<T>& f, naxChannelType direction,
                             const T* c, int32 lineBegin, int32 lineEnd) const {
  if (direction == naxChannelRows) {
    const int32 lines = m_evenRows < m_oddRows ? m_evenRows : m_oddRows;
    if (lineEnd < 0 || lineEnd > lines) lineEnd = lines;
    for (int32 r = lineBegin; r < lineEnd; ++r)
      nax::detail::LiftLine<N, Inverse>(f.tgt + static_cast<int64>(r) * f.tgtLength, f.tgtLength,
                                        f.src + static_cast<int64>(r) * f.srcLength, f.srcLength,
                                        f.shift, f.leftHalf, f.rightHalf, c);
  } else {
    const int32 width = m_evenCols < m_oddCols ? m_evenCols : m_oddCols;
    if (lineEnd < 0) lineEnd = f.tgtLength;
    nax::detail::LiftRowsOfLines<N, Inverse>(f, width, lineBegin, lineEnd, c);
  }
}

template <typename T>
void CNaxLifting<T>::Run(int32 taps, int32 step, const T* c, naxChannelType direction,
                         bool inverse, int32 lineBegin, int32 lineEnd) const {
  if (direction != naxChannelRows && direction != naxChannelColumns) return;
  const nax::detail::LiftForm<T> f = Form(step, direction);
  switch (taps * 2 + (inverse ? 1 : 0)) {
    case 4: RunTaps<2, false>(f, direction, c, lineBegin, lineEnd); break;
    case 5: RunTaps<2, true>(f, direction, c, lineBegin, lineEnd); break;
    case 8: RunTaps<4, false>(f, direction, c, lineBegin, lineEnd); break;
    case 9: RunTaps<4, true>(f, direction, c, lineBegin, lineEnd); break;
    case 12: RunTaps<6, false>(f, direction, c, lineBegin, lineEnd); break;
    case 13: RunTaps<6, true>(f, direction, c, lineBegin, lineEnd); break;
    default: break;
  }
}

extern template class CNaxLifting<float>;
extern template class CNaxLifting<double>;

// The record reads the shape of the channels it binds.
#include "nax/channel.h"

#endif  // NAX_LIFTING_H
