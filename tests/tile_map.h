// The tiled layout, written down once more: the tiles of a plane in the order of memory.
#ifndef TESTS_TILE_MAP_H
#define TESTS_TILE_MAP_H

#include <stddef.h>

#include <vector>

namespace rig {

class tile_map {
  public:
    tile_map(int width, int rows) : columns_((width + 63) / 64) {
        const int tile_rows = (rows + 31) / 32;
        offsets_.resize(size_t(columns_) * size_t(tile_rows));
        int upper = 0;
        for (; upper + 2 <= tile_rows; upper += 2)
            for (int column = 0; column < columns_; column += 4) {
                const int t = upper, b = upper + 1;
                place({{column, t}, {column + 1, t}, {column, b}, {column + 1, b}});
                if (column + 2 >= columns_) break;
                place({{column + 2, b}, {column + 3, b}, {column + 2, t}, {column + 3, t}});
            }
        if (upper < tile_rows)  // without a partner
            for (int column = 0; column < columns_; column += 4)
                place({{column, upper},
                       {column + 1, upper},
                       {column + 2, upper},
                       {column + 3, upper}});
    }

    ptrdiff_t at(int x, int y) const {
        return offsets_[size_t(y / 32 * columns_ + x / 64)] + y % 32 * 64 + x % 64;
    }
    ptrdiff_t size() const { return size_; }

  private:
    struct tile {
        int column, row;
    };
    // The next group of four tiles; those right of the picture leave their places empty.
    void place(const tile (&group)[4]) {
        for (const tile &t : group) {
            if (t.column < columns_) offsets_[size_t(t.row * columns_ + t.column)] = size_;
            size_ += 2048;
        }
    }

    int columns_;
    std::vector<ptrdiff_t> offsets_;
    ptrdiff_t size_ = 0;
};

}  // namespace rig

#endif
