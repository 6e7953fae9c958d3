// What the tools know about the pixel formats, and pictures that own their memory.
#ifndef TOOLS_PICTURE_H
#define TOOLS_PICTURE_H

#include <stddef.h>
#include <stdint.h>

#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "simgp/simgp.h"

namespace tools {

// One plane: a unit of `bytes` bytes stands for 2^x_shift x 2^y_shift pixels.
struct plane_shape {
    int bytes, x_shift, y_shift;
};

// Where the samples of one channel lie: that of pixel (x, y) is the byte
// `first + step * (x >> x_shift)` of line `y >> y_shift` of the plane. A step of 0: no such
// channel.
struct channel {
    int plane, first, step, x_shift, y_shift;
};

// All that the tools know about the layout of a format, made from the library's own table. Only the
// bits of 16-bit RGB are the business of rgb.cpp.
struct pixel_format {
    enum class family { planar, packed, tiled, rgb16, rgb };

    int32_t code;
    std::string_view name;
    family kind;
    int plane_count;
    plane_shape planes[3];
    channel channels[3];  // Y, U, V or R, G, B; of no use in tiles and in 16 bits

    bool is_rgb() const { return kind == family::rgb || is_rgb16(); }
    bool is_rgb16() const { return kind == family::rgb16; }
    bool is_tiled() const { return kind == family::tiled; }
    // Two pixels share a group, which the last pixel of an odd line has only half of.
    bool is_packed() const { return kind == family::packed; }
    // A chroma sample stands for 2^chroma_x_shift() x 2^chroma_y_shift() pixels; shifts of 0 where
    // there is no chroma.
    int chroma_x_shift() const { return is_packed() ? 1 : planes[plane_count - 1].x_shift; }
    int chroma_y_shift() const { return planes[plane_count - 1].y_shift; }
    // Chroma samples per four pixels (0, 1, 2, 4): what a road through this format keeps of it.
    int chroma() const;
};

// Every format of the library, in the order of the codes.
std::span<const pixel_format> formats();
// Both end in a fault if there is no such format.
const pixel_format &format_named(std::string_view name);
const pixel_format &format_coded(int32_t code);
// As format_named, but null if there is none.
const pixel_format *find_format(std::string_view name);

// What stands behind the last dot of a file's name, where files of raw frames carry their format.
std::string ending_of(const std::string &path);

struct picture_shape {
    const pixel_format *format = nullptr;
    int width = 0, height = 0;  // pixels

    bool operator==(const picture_shape &) const = default;
};

// Ends in a fault that begins with `where` if the library's callers could not hold such a picture:
// sizes outside 1 ... 65535, or a frame of more than 1 GiB.
void check_size(int64_t width, int64_t height, const std::string &where);
// Reads "640x480", anything else ends in a fault; `what` names the text in it.
void parse_size(std::string_view text, const std::string &what, int &width, int &height);

// A picture in memory. Lines and columns are allocated up to the next multiple of four, so that a
// last odd column and line, of luma and of chroma, can always be taken for the first of a pair.
class picture {
  public:
    picture() = default;
    explicit picture(const picture_shape &shape);

    const picture_shape &shape() const { return shape_; }
    const pixel_format &format() const { return *shape_.format; }
    int width() const { return shape_.width; }
    int height() const { return shape_.height; }

    int planes() const { return format().plane_count; }
    uint8_t *line(int plane, int y) {
        return memory_.data() + layout_.offset[plane] + ptrdiff_t(y) * layout_.stride[plane];
    }
    const uint8_t *line(int plane, int y) const {
        return const_cast<picture *>(this)->line(plane, y);
    }
    // Visible bytes in a line and visible lines: what a raw file holds. A tiled plane is one line.
    size_t line_bytes(int plane) const;
    int lines(int plane) const;
    size_t raw_bytes() const;

    // The library's descriptor. `even_width` and `even_height` round the size up to even numbers;
    // nobody looks at what the added column and line hold.
    simgp_img descriptor(bool even_width = false, bool even_height = false);

    // The sample of channel `number` (Y, U, V or R, G, B) of pixel (x, y): a byte, so neither in tiles nor
    // in 16 bits.
    uint8_t *sample(int number, int x, int y) {
        const channel &c = format().channels[number];
        return line(c.plane, y >> c.y_shift) + c.first + c.step * (x >> c.x_shift);
    }
    const uint8_t *sample(int number, int x, int y) const {
        return const_cast<picture *>(this)->sample(number, x, y);
    }

  private:
    picture_shape shape_;
    std::vector<uint8_t> memory_;
    simgp_layout layout_ = {};
};

}  // namespace tools

#endif
