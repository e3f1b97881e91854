#pragma once
// Dense complex matrix for precoding: a precoder W maps the layers (columns) onto the antenna
// ports (rows), TS 38.211 clause 6.3.1.5 and clause 7.3.1.4.

#include <cstddef>
#include <vector>

#include "coding/coding_types.h"

namespace brinecomm {

template <class T>
class matrix {
  public:
    void resize(int rows, int columns) {
        rows_ = rows < 0 ? 0 : rows;
        columns_ = columns < 0 ? 0 : columns;
        values_.assign(static_cast<std::size_t>(rows_) * static_cast<std::size_t>(columns_), T{});
    }
    int rows() const { return rows_; }
    int columns() const { return columns_; }
    T& operator()(int row, int column) { return values_[index(row, column)]; }
    const T& operator()(int row, int column) const { return values_[index(row, column)]; }

  private:
    std::size_t index(int row, int column) const {
        return static_cast<std::size_t>(row) * static_cast<std::size_t>(columns_) +
               static_cast<std::size_t>(column);
    }
    int rows_ = 0;
    int columns_ = 0;
    std::vector<T> values_;
};

}  // namespace brinecomm
