// CNaxBaseMatrix: the run-time sized matrix container.
//
// A matrix owns one row-major heap array of rows x cols elements, element (r, c) at
// r * cols + c. The container gives element access, part copies, element-wise arithmetic,
// the general product and printing. Its shape is fixed at construction; assignment copies
// elements in flat order and never resizes. Indices and shapes are not checked, except by
// the equality tests and the rectangle transfers FillPart, DumpPart and PrintPartOfMatrix.
#ifndef NAX_BASE_MATRIX_H
#define NAX_BASE_MATRIX_H

#include <algorithm>
#include <iostream>

#include "nax/base_vector.h"
#include "nax/complex.h"
#include "nax/detail/matrix_kernels.h"
#include "nax/scalar.h"
#include "nax/types.h"

/// Run-time sized row-major matrix for float, double and the two complex types.
template <typename T>
class CNaxBaseMatrix {
  static_assert(nax::detail::kIsReal<T> || std::is_same_v<T, CNaxComplex<float>> ||
                    std::is_same_v<T, CNaxComplex<double>>,
                "CNaxBaseMatrix is instantiated for float, double and CNaxComplex<float|double>");

 public:
  /// n x n zeros.
  explicit CNaxBaseMatrix(int32 n) : CNaxBaseMatrix(n, n) {}
  /// rows x cols zeros.
  CNaxBaseMatrix(int32 rows, int32 cols)
      : rows(rows), cols(cols), data(nax::detail::AllocateZeroed<T>(rows * cols)) {}
  /// n x n, n * n elements copied from source (row-major).
  CNaxBaseMatrix(int32 n, const T* source) : CNaxBaseMatrix(n, n, source) {}
  /// rows x cols, rows * cols elements copied from source (row-major).
  CNaxBaseMatrix(int32 rows, int32 cols, const T* source)
      : rows(rows), cols(cols), data(nax::detail::AllocateCopy(rows * cols, source)) {}
  /// Deep copy.
  CNaxBaseMatrix(const CNaxBaseMatrix& other)
      : rows(other.rows), cols(other.cols),
        data(nax::detail::AllocateCopy(other.rows * other.cols, other.data)) {}
  virtual ~CNaxBaseMatrix() { nax::detail::Release(data); }

  /// Copies rows * cols elements of this matrix's shape from other, in flat order; other's
  /// shape is not consulted. Nothing happens for self-assignment or an empty matrix.
  virtual CNaxBaseMatrix& operator=(const CNaxBaseMatrix& other) {
    if (this != &other && Count() > 0) nax::detail::CopyElements(Count(), other.data, data);
    return *this;
  }
  /// Multiplies every element by value.
  virtual CNaxBaseMatrix& operator*=(T value) {
    Mul(value);
    return *this;
  }

  int32 RowsNb() const { return rows; }
  int32 ColsNb() const { return cols; }
  /// 1 when rows = cols.
  int32 IsSquare() const { return rows == cols; }

  T& operator()(int32 row, int32 col) { return data[row * cols + col]; }
  const T& operator()(int32 row, int32 col) const { return data[row * cols + col]; }
  /// Element index of the flat row-major array.
  T& operator[](int32 index) { return data[index]; }
  const T& operator[](int32 index) const { return data[index]; }

  void SetElement(int32 row, int32 col, T value) { data[row * cols + col] = value; }
  void AddToElement(int32 row, int32 col, T value) { data[row * cols + col] += value; }
  void MulElement(int32 row, int32 col, T value) { data[row * cols + col] *= value; }

  /// Row row from cols elements of source.
  void SetRow(int32 row, const T* source) { std::copy(source, source + cols, data + row * cols); }
  /// Column col from rows elements of source.
  void SetColumn(int32 col, const T* source) {
    for (int32 r = 0; r < rows; ++r) data[r * cols + col] = source[r];
  }
  /// Row row to cols elements of target.
  void Row(int32 row, T* target) const {
    std::copy(data + row * cols, data + (row + 1) * cols, target);
  }
  /// Column col to rows elements of target.
  void Column(int32 col, T* target) const {
    for (int32 r = 0; r < rows; ++r) target[r] = data[r * cols + col];
  }
  void SetRowVector(int32 row, const CNaxBaseVector<T>& v) {
    for (int32 c = 0; c < cols; ++c) data[row * cols + c] = v[c];
  }
  void SetColVector(int32 col, const CNaxBaseVector<T>& v) {
    for (int32 r = 0; r < rows; ++r) data[r * cols + col] = v[r];
  }
  /// Row row as a new vector of cols components.
  CNaxBaseVector<T> RowVector(int32 row) const {
    CNaxBaseVector<T> v(cols);
    for (int32 c = 0; c < cols; ++c) v[c] = data[row * cols + c];
    return v;
  }
  /// Column col as a new vector of rows components.
  CNaxBaseVector<T> ColVector(int32 col) const {
    CNaxBaseVector<T> v(rows);
    for (int32 r = 0; r < rows; ++r) v[r] = data[r * cols + col];
    return v;
  }
  /// The min(rows, cols) diagonal elements as a new vector.
  CNaxBaseVector<T> Diagonal() const {
    const int32 n = std::min(rows, cols);
    CNaxBaseVector<T> v(n);
    for (int32 i = 0; i < n; ++i) v[i] = data[i * cols + i];
    return v;
  }
  /// this(row, col + i) = v[vectorStart + i] for i < count.
  void SetPartRowVector(int32 row, int32 col, int32 count, int32 vectorStart,
                        const CNaxBaseVector<T>& v) {
    for (int32 i = 0; i < count; ++i) data[row * cols + col + i] = v[vectorStart + i];
  }
  /// this(row + i, col) = v[vectorStart + i] for i < count; the column comes first.
  void SetPartColVector(int32 col, int32 row, int32 count, int32 vectorStart,
                        const CNaxBaseVector<T>& v) {
    for (int32 i = 0; i < count; ++i) data[(row + i) * cols + col] = v[vectorStart + i];
  }
  /// this(row, col + i) = other(otherRow, otherCol + i) for i < count.
  void CopyPartRow(int32 row, int32 col, int32 count, int32 otherRow, int32 otherCol,
                   const CNaxBaseMatrix& other) {
    if (count < 1) return;
    const T* from = other.data + otherRow * other.cols + otherCol;
    std::copy(from, from + count, data + row * cols + col);
  }
  /// this(row + i, col) = other(otherRow + i, otherCol) for i < count; the column comes first.
  void CopyPartColumn(int32 col, int32 row, int32 count, int32 otherCol, int32 otherRow,
                      const CNaxBaseMatrix& other) {
    for (int32 i = 0; i < count; ++i)
      data[(row + i) * cols + col] = other.data[(otherRow + i) * other.cols + otherCol];
  }

  /// The whole array from rows * cols elements of source, row-major.
  void Fill(const T* source) { nax::detail::CopyElements(Count(), source, data); }
  /// The whole array to rows * cols elements of target, row-major.
  void Dump(T* target) const { nax::detail::CopyElements(Count(), data, target); }

  /// Copies the rectangle [firstRow, lastRow] x [firstCol, lastCol] from a dense array, row by
  /// row when byRows is not 0, else column by column. Returns silently on a bad range; the last
  /// column is tested against the number of rows, so wide matrices refuse their outer columns.
  void FillPart(int32 firstRow, int32 firstCol, int32 lastRow, int32 lastCol, const T* source,
                int32 byRows) {
    if (!PartIsValid(firstRow, firstCol, lastRow, lastCol, rows)) return;
    VisitPart(firstRow, firstCol, lastRow, lastCol, byRows,
              [&](int32 index, int32 k) { data[index] = source[k]; });
  }
  /// Copies the rectangle to a dense array, in the order and with the tests of FillPart.
  void DumpPart(int32 firstRow, int32 firstCol, int32 lastRow, int32 lastCol, T* target,
                int32 byRows) const {
    if (!PartIsValid(firstRow, firstCol, lastRow, lastCol, rows)) return;
    VisitPart(firstRow, firstCol, lastRow, lastCol, byRows,
              [&](int32 index, int32 k) { target[k] = data[index]; });
  }

  void SetToZero() { nax::detail::SetElements(Count(), data, nax::detail::ScalarOf<T>(0)); }
  void SetConstant(T value) { std::fill(data, data + Count(), value); }
  /// Zeros, then value on the min(rows, cols) diagonal elements.
  void SetDiagonal(T value) {
    SetToZero();
    const int32 n = std::min(rows, cols);
    for (int32 i = 0; i < n; ++i) data[i * cols + i] = value;
  }
  /// Sum of the min(rows, cols) diagonal elements.
  T Trace() const {
    const int32 n = std::min(rows, cols);
    T sum = T();
    for (int32 i = 0; i < n; ++i) sum += data[i * cols + i];
    return sum;
  }

  void Add(const CNaxBaseMatrix& other) {
    for (int32 i = 0, n = Count(); i < n; ++i) data[i] += other.data[i];
  }
  void Sub(const CNaxBaseMatrix& other) {
    for (int32 i = 0, n = Count(); i < n; ++i) data[i] -= other.data[i];
  }
  void Mul(T value) {
    for (int32 i = 0, n = Count(); i < n; ++i) data[i] *= value;
  }
  /// Divides every element; the divisor is not tested.
  void Div(T value) {
    for (int32 i = 0, n = Count(); i < n; ++i) data[i] /= value;
  }
  CNaxBaseMatrix& operator+=(const CNaxBaseMatrix& other) {
    Add(other);
    return *this;
  }
  CNaxBaseMatrix& operator-=(const CNaxBaseMatrix& other) {
    Sub(other);
    return *this;
  }
  CNaxBaseMatrix& operator/=(T value) {
    Div(value);
    return *this;
  }
  CNaxBaseMatrix operator+(const CNaxBaseMatrix& other) const {
    CNaxBaseMatrix r(*this);
    r.Add(other);
    return r;
  }
  CNaxBaseMatrix operator-(const CNaxBaseMatrix& other) const {
    CNaxBaseMatrix r(*this);
    r.Sub(other);
    return r;
  }
  CNaxBaseMatrix operator*(T value) const {
    CNaxBaseMatrix r(*this);
    r.Mul(value);
    return r;
  }
  CNaxBaseMatrix operator/(T value) const {
    CNaxBaseMatrix r(*this);
    r.Div(value);
    return r;
  }
  /// Matrix product, rows x other.cols, summed over this matrix's cols.
  CNaxBaseMatrix operator*(const CNaxBaseMatrix& other) const {
    CNaxBaseMatrix r(rows, other.cols);
    nax::detail::MultiplyRaw(data, other.data, r.data, rows, cols, other.cols);
    return r;
  }
  /// Product with a column vector: rows components, summed over cols.
  CNaxBaseVector<T> operator*(const CNaxBaseVector<T>& v) const {
    CNaxBaseVector<T> r(rows);
    for (int32 i = 0; i < rows; ++i) {
      T sum = T();
      for (int32 c = 0; c < cols; ++c) sum += data[i * cols + c] * v[c];
      r[i] = sum;
    }
    return r;
  }
  /// New cols x rows matrix, the transpose.
  CNaxBaseMatrix Transpose() const {
    CNaxBaseMatrix r(cols, rows);
    for (int32 i = 0; i < rows; ++i)
      for (int32 c = 0; c < cols; ++c) r.data[c * rows + i] = data[i * cols + c];
    return r;
  }
  /// New matrix of cols rows and rows columns whose flat element i is minus flat element i of
  /// this one: the negation for a square matrix; a rectangular one keeps its flat order under
  /// the swapped shape.
  CNaxBaseMatrix Negate() const {
    CNaxBaseMatrix r(cols, rows);
    for (int32 i = 0, n = Count(); i < n; ++i) r.data[i] = -data[i];
    return r;
  }

  /// 1 when the shapes agree and no two elements differ by more than the default tolerance
  /// (complex elements: by a non-zero safe-root distance); 1 for two empty matrices.
  int32 operator==(const CNaxBaseMatrix& other) const {
    if (rows != other.rows || cols != other.cols) return 0;
    return nax::detail::ArraysAlmostEqual(Count(), data, other.data,
                                          nax::detail::EqualityTol<T>());
  }
  int32 operator!=(const CNaxBaseMatrix& other) const { return !(*this == other); }

  /// Prints the rectangle to the standard output, one "( a b ... )" line per row and a blank
  /// line after the last. Returns silently on a range outside the matrix.
  void PrintPartOfMatrix(int32 firstRow, int32 firstCol, int32 lastRow, int32 lastCol) const {
    if (!PartIsValid(firstRow, firstCol, lastRow, lastCol, cols)) return;
    for (int32 r = firstRow; r <= lastRow; ++r) {
      std::cout << "( ";
      for (int32 c = firstCol; c < lastCol; ++c) {
        PrintElement(data[r * cols + c]);
        std::cout << " ";
      }
      PrintElement(data[r * cols + lastCol]);
      std::cout << " )" << std::endl;
    }
    std::cout << std::endl;
  }

 protected:
  int32 Count() const { return rows * cols; }

  int32 rows;
  int32 cols;
  T* data;

 private:
  // Range test of the rectangle transfers; colLimit is rows for FillPart and DumpPart.
  int32 PartIsValid(int32 firstRow, int32 firstCol, int32 lastRow, int32 lastCol,
                    int32 colLimit) const {
    if (firstRow < 0 || firstRow > lastRow || lastRow >= rows) return 0;
    if (firstCol < 0 || firstCol > lastCol || lastCol >= colLimit) return 0;
    return 1;
  }
  // Calls visit(flat index, rank in the dense sequence) over the rectangle, row by row or
  // column by column.
  template <typename Visit>
  void VisitPart(int32 firstRow, int32 firstCol, int32 lastRow, int32 lastCol, int32 byRows,
                 Visit visit) const {
    int32 k = 0;
    if (byRows) {
      for (int32 r = firstRow; r <= lastRow; ++r)
        for (int32 c = firstCol; c <= lastCol; ++c) visit(r * cols + c, k++);
    } else {
      for (int32 c = firstCol; c <= lastCol; ++c)
        for (int32 r = firstRow; r <= lastRow; ++r) visit(r * cols + c, k++);
    }
  }
  static void PrintElement(const T& value) {
    if constexpr (nax::detail::kIsComplex<T>) {
      std::cout << value.Real();
      if (value.Imag() >= 0)
        std::cout << " + " << value.Imag();
      else
        std::cout << " - " << -value.Imag();
      std::cout << "*i ";
    } else {
      std::cout << value;
    }
  }
};

extern template class CNaxBaseMatrix<float>;
extern template class CNaxBaseMatrix<double>;
extern template class CNaxBaseMatrix<CNaxComplex<float>>;
extern template class CNaxBaseMatrix<CNaxComplex<double>>;

#endif  // NAX_BASE_MATRIX_H
