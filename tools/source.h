// Where frames come from.
#ifndef TOOLS_SOURCE_H
#define TOOLS_SOURCE_H

#include <memory>
#include <string>
#include <vector>

#include "tools/colour.h"
#include "tools/input.h"
#include "tools/picture.h"

namespace tools {

// What a stream says about its frames beyond their shape, in the words of a Y4M header.
struct video_traits {
    std::string rate = "25:1", interlacing = "p", aspect = "1:1";
    colour_note colour;
    // The colour space tag that a Y4M header had, which says where chroma lies, and its X tags but
    // for those of the colour.
    std::string space;
    std::vector<std::string> extensions;
};

class source {
  public:
    virtual ~source() = default;
    const picture_shape &shape() const { return shape_; }
    const video_traits &traits() const { return traits_; }
    const std::string &name() const { return name_; }

    // Fills `to`, a picture of shape(), with the next frame; false where there is none.
    virtual bool next(picture &to) = 0;
    // How much of the whole has been delivered, 0 ... 1; negative if that is not known.
    virtual double done() const = 0;

  protected:
    picture_shape shape_;
    video_traits traits_;
    std::string name_;
};

// How the user described the input.
struct source_options {
    std::string path = {};    // a file, "-", or "testcard:[WxH][@FRAMES]"
    std::string format = {};  // of raw frames and test cards; empty: as the file says
    std::string size = {};    // of raw frames
    std::string colour = {};  // empty: as the file says, or the usual one
};

// Opens whatever `options` name: a test card, raw frames (where a size is given), Y4M, PNG or PPM; a
// name with a number in it, such as in-%04d.png, stands for files from number 0 or 1 on.
std::unique_ptr<source> open_source(const source_options &options);

std::unique_ptr<source> open_y4m(std::unique_ptr<input> in);
std::unique_ptr<source> open_png(std::unique_ptr<input> in, const pixel_format &format);
std::unique_ptr<source> open_ppm(std::unique_ptr<input> in);
std::unique_ptr<source> open_raw(std::unique_ptr<input> in, const picture_shape &shape);
// `drawn_in` is what it is drawn in; null: the usual one of its size.
std::unique_ptr<source> open_testcard(const std::string &spec, const pixel_format &format,
                                      const colour *drawn_in);

}  // namespace tools

#endif
