// What the tools know about the pixel formats, and pictures that own their memory.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "simgp/simgp.h"

namespace tools {

enum class Kind { planar, packed, tiled, rgb16, rgb };

/// One plane: a unit of `bytes` bytes stands for 2^x_shift x 2^y_shift pixels.
struct PlaneShape {
    int bytes, x_shift, y_shift;
};

/// Where the samples of one channel lie: that of pixel (x, y) is the byte
/// `first + step * (x >> x_shift)` of row `y >> y_shift` of the plane. A step of 0: no such
/// channel.
struct Channel {
    int plane, first, step, x_shift, y_shift;
};

struct Format {
    int32_t code;
    std::string_view name;
    Kind kind;
    std::vector<PlaneShape> planes;
    Channel channel[3];  // Y, U, V or R, G, B; of no use for rgb16 and tiled

    bool is_rgb() const { return kind == Kind::rgb16 || kind == Kind::rgb; }
    /// Chroma samples per four pixels (0, 1, 2, 4): what a road through this format keeps of it.
    int chroma() const;
};

/// Every format of the library, in the order of the codes.
std::span<const Format> formats();
/// Both end in a Fault if there is no such format.
const Format &format_named(std::string_view name);
const Format &format_coded(int32_t code);
/// As format_named, but null if there is none.
const Format *find_format(std::string_view name);

struct Shape {
    const Format *format = nullptr;
    int width = 0, height = 0;  // pixels

    bool operator==(const Shape &) const = default;
};

/// Ends in a Fault that begins with `where` if the library's callers could not hold such a picture:
/// sizes outside 1 ... 65535, or a frame of more than 1 GiB.
void check_size(int64_t width, int64_t height, const std::string &where);
/// Reads "640x480", anything else ends in a Fault; `what` names the text in it.
void parse_size(std::string_view text, const std::string &what, int &width, int &height);

/// A picture in memory. Lines and columns are allocated up to the next even number, so that the
/// chroma of the last odd column and line always has the pixels that it belongs to.
class Picture {
  public:
    Picture() = default;
    explicit Picture(const Shape &shape);

    const Shape &shape() const { return shape_; }
    const Format &format() const { return *shape_.format; }
    int width() const { return shape_.width; }
    int height() const { return shape_.height; }

    int planes() const { return int(format().planes.size()); }
    uint8_t *row(int plane, int y) { return memory_.data() + start_[plane] + y * stride_[plane]; }
    const uint8_t *row(int plane, int y) const {
        return memory_.data() + start_[plane] + y * stride_[plane];
    }
    /// Visible bytes in a line and visible lines: what a raw file holds. A tiled plane is one line.
    size_t row_bytes(int plane) const { return row_bytes_[plane]; }
    int rows(int plane) const { return rows_[plane]; }
    size_t raw_bytes() const;

    /// The library's descriptor. `even_width` and `even_height` round the size up to even numbers;
    /// nobody looks at what the added column and line hold.
    simgp_img descriptor(bool even_width = false, bool even_height = false);

    /// Sample `channel` (Y, U, V or R, G, B) of pixel (x, y); for the kinds planar, packed and rgb.
    uint8_t *sample(int channel, int x, int y) {
        const Channel &c = format().channel[channel];
        return row(c.plane, y >> c.y_shift) + c.first + c.step * (x >> c.x_shift);
    }
    const uint8_t *sample(int channel, int x, int y) const {
        return const_cast<Picture *>(this)->sample(channel, x, y);
    }

  private:
    Shape shape_;
    std::vector<uint8_t> memory_;
    size_t start_[3] = {}, row_bytes_[3] = {};
    ptrdiff_t stride_[3] = {};
    int rows_[3] = {};
};

/// Bytes of a plane of `row_bytes` x `rows` samples in 64 x 32 tiles.
size_t tiled_plane_bytes(size_t row_bytes, size_t rows);

/// Copies samples from one YUV layout to another, neither of them tiled: chroma that the
/// destination has more of is repeated, of chroma that it has less of the top left sample is kept,
/// and chroma that the source has none of is grey.
void move_samples(const Picture &src, Picture &dst);

}  // namespace tools
