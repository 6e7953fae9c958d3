// Where frames come from.
#pragma once

#include <memory>
#include <string>

#include "tools/input.h"
#include "tools/picture.h"

namespace tools {

/// What a stream says about its frames beyond their shape, in the words of a Y4M header.
struct Tempo {
    std::string rate = "25:1", interlacing = "p", aspect = "1:1";
};

class Source {
  public:
    virtual ~Source() = default;
    const Shape &shape() const { return shape_; }
    const Tempo &tempo() const { return tempo_; }
    const std::string &name() const { return name_; }

    /// Fills `to`, a picture of shape(), with the next frame; false where there is none.
    virtual bool next(Picture &to) = 0;
    /// How much of the whole has been delivered, 0 ... 1; negative if that is not known.
    virtual double done() const = 0;

  protected:
    Shape shape_;
    Tempo tempo_;
    std::string name_;
};

/// How the user described the input.
struct SourceOptions {
    std::string path;    // a file, "-", or "testcard:[WxH][@FRAMES]"
    std::string format;  // of raw frames and test cards; empty: as the file says
    std::string size;    // of raw frames
};

/// Opens whatever `options` name: a test card, raw frames (where a size is given), Y4M or PNG.
std::unique_ptr<Source> open_source(const SourceOptions &options);

std::unique_ptr<Source> open_y4m(std::unique_ptr<Input> input);
std::unique_ptr<Source> open_png(std::unique_ptr<Input> input, const Format &format);
std::unique_ptr<Source> open_raw(std::unique_ptr<Input> input, const Shape &shape);
std::unique_ptr<Source> open_testcard(const std::string &spec, const Format &format);

}  // namespace tools
