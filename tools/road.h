// The conversions that lead from one format to another.
#ifndef TOOLS_ROAD_H
#define TOOLS_ROAD_H

#include <string>
#include <vector>

#include "tools/stage.h"

namespace tools {

// Who does a step.
enum class method { csc, dither, samples };

// True if the library has this conversion; found out by asking it for a tiny picture.
bool offered(const pixel_format &from, const pixel_format &to, method how);

// The best chain of conversions, with the pictures between them.
class road : public stage {
  public:
    // From pictures of `from` to the format `to`. With `dither` the last step is a dithered one.
    // Ends in a fault where no chain leads there.
    road(const picture_shape &from, const pixel_format &to, bool dither);

    // Lines and columns beyond the size of `from` are overwritten. Where there is nothing to do,
    // the result is `from`.
    picture &run(picture &from) override;
    // "nv12 -> yuv420 -> rgb565 (dithered)"
    std::string text() const override;
    picture_shape out() const override;
    // What a step on the way loses that both ends could hold; empty if nothing.
    std::string loss() const;
    // Comparable between roads: fewer and gentler steps cost less.
    int cost() const { return cost_; }

  private:
    struct step {
        method how;
        picture out;
    };
    picture_shape from_;
    std::vector<step> steps_;
    int cost_ = 0;
};

}  // namespace tools

#endif
