#include "tools/sheet.h"

#include <string.h>

#include <algorithm>
#include <cmath>

#include "tools/rgb.h"
#include "tools/sink.h"
#include "tools/text.h"

namespace tools {

namespace {

constexpr int gap = 8;
constexpr uint8_t paper = 48;

class sheet_sink : public sink {
  public:
    sheet_sink(const destination &to, still_writer write, int columns)
        : output_(to), write_(write), columns_(columns) {}

    void put(const picture &p) override {
        if (frame_ % every_ == 0) {
            if (tiles_.size() == 64) {
                for (size_t k = 1; k < 32; ++k) tiles_[k] = std::move(tiles_[2 * k]);
                tiles_.resize(32);
                every_ *= 2;
            }
            if (frame_ % every_ == 0)
                tiles_.push_back(make_tile(p, "frame " + std::to_string(frame_), 320, 240));
        }
        ++frame_;
    }
    void finish() override {
        write_(output_, lay_out(tiles_, columns_));
        output_.commit();
    }

  private:
    output output_;
    still_writer write_;
    int columns_;
    int64_t frame_ = 0, every_ = 1;
    std::vector<tile> tiles_;
};

}  // namespace

tile make_tile(const picture &p, const std::string &label, int max_width, int max_height) {
    picture full = to_rgb888(p);
    const int by = std::max({1, (full.width() + max_width - 1) / max_width,
                             (full.height() + max_height - 1) / max_height});
    if (by == 1) return {std::move(full), label};
    const int width = std::max(full.width() / by, 1), height = std::max(full.height() / by, 1);
    picture small({&full.format(), width, height});
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x)
            for (int c = 0; c < 3; ++c) {
                const int bottom = std::min(y * by + by, full.height());
                const int right = std::min(x * by + by, full.width());
                int sum = 0, pixels = 0;
                for (int fy = y * by; fy < bottom; ++fy)
                    for (int fx = x * by; fx < right; ++fx, ++pixels)
                        sum += *full.sample(c, fx, fy);
                *small.sample(c, x, y) = uint8_t((sum + pixels / 2) / pixels);
            }
    return {std::move(small), label};
}

picture lay_out(const std::vector<tile> &tiles, int columns) {
    if (tiles.empty()) throw fault("no picture for the sheet");
    const int count = int(tiles.size());
    int cell_width = 0, cell_height = 0;
    for (const tile &t : tiles) {
        cell_width = std::max({cell_width, t.image.width(), text_width(t.label, 1)});
        cell_height = std::max(cell_height, t.image.height());
    }
    if (columns <= 0)
        columns = int(std::lround(std::sqrt(double(count) * cell_height / cell_width)));
    columns = std::clamp(columns, 1, count);
    const int scale = cell_width >= 200 ? 2 : 1;
    const int label_height = text_height * scale + 4;

    std::vector<int> top{gap};  // of each line of tiles, and of what would follow the last
    for (int first = 0; first < count; first += columns) {
        int height = 0;
        for (int k = first; k < std::min(first + columns, count); ++k)
            height = std::max(height, tiles[k].image.height());
        top.push_back(top.back() + label_height + height + gap);
    }
    const int width = columns * (cell_width + gap) + gap;
    check_size(width, top.back(), "contact sheet");
    picture sheet({&format_coded(SIMGP_FMT_RGB888), width, top.back()});
    for (int y = 0; y < sheet.height(); ++y) memset(sheet.line(0, y), paper, sheet.line_bytes(0));
    for (int k = 0; k < count; ++k) {
        const tile &t = tiles[k];
        const int x = gap + k % columns * (cell_width + gap), y = top[k / columns];
        // A label that does not fit at the larger scale is written at the smaller one.
        draw_text(sheet, x, y, t.label, text_width(t.label, scale) <= cell_width ? scale : 1);
        for (int line = 0; line < t.image.height(); ++line)
            memcpy(sheet.sample(0, x, y + label_height + line), t.image.line(0, line),
                   t.image.line_bytes(0));
    }
    return sheet;
}

std::unique_ptr<sink> open_sheet_sink(const destination &to, still_writer write, int columns) {
    return std::make_unique<sheet_sink>(to, write, columns);
}

}  // namespace tools
