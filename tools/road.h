// The steps that lead from one format to another, and what is done to the pictures on the way.
#ifndef TOOLS_ROAD_H
#define TOOLS_ROAD_H

#include <memory>
#include <string>
#include <vector>

#include "tools/stage.h"
#include "tools/step.h"

namespace tools {

// What is done to pictures beside converting them, in this order.
struct edits {
    int deblock = 0;            // strength; 0: none
    int width = 0, height = 0;  // of what comes out, after the turn; 0: not resized
    int turn = SIMGP_ROT_NONE;
    bool thumbnail = false;  // half the size, turned right; not together with the two above
};

// Ends in a fault if these edits cannot be done to such pictures, whatever they become.
void check_edits(const picture_shape &from, const edits &wish);

// The best chain of steps, with the pictures between them.
class road : public stage {
  public:
    // From pictures of `from` to the format `to`. With `dither` the last step is a dithered one,
    // which is always one of BT.601. `colour`: SIMGP_COLOUR_*, perhaps with SIMGP_CHROMA_MEAN.
    // Ends in a fault where no chain leads there.
    road(const picture_shape &from, const pixel_format &to, bool dither, const edits &wish = {},
         int32_t colour = SIMGP_COLOUR_BT601);

    // Lines and columns beyond the size of `from` are overwritten, and with deblocking it may be
    // changed itself. Where there is nothing to do, the result is `from`.
    picture &run(picture &from) override;
    // "nv12 -> yuv420 -> rgb565 (dithered)"
    std::string text() const override;
    picture_shape out() const override;
    // What is left on the way of the chroma that both ends could hold; empty if all of it.
    std::string loss() const;
    // Comparable between roads: fewer and gentler steps cost less.
    int cost() const { return cost_; }
    // For callers that take the steps of run() one by one.
    std::vector<step> &steps() { return steps_; }

  private:
    picture_shape from_;
    std::vector<step> steps_;
    int cost_ = 0;
};

// The roads to `to`, one after the other, where dithering is wanted in any colour: a dithered
// conversion to RGB is one of BT.601, so other colours become RGB first, and then that.
std::vector<std::unique_ptr<road>> roads(const picture_shape &from, const pixel_format &to,
                                         bool dither, const edits &wish, int32_t colour);

}  // namespace tools

#endif
