// The conversions that lead from one format to another.
#pragma once

#include <string>
#include <vector>

#include "tools/stage.h"

namespace tools {

/// Who does a step.
enum class Via { csc, dither, samples };

/// True if the library has this conversion; found out by asking it for a tiny picture.
bool offered(const Format &from, const Format &to, Via via);

/// The best chain of conversions, with the pictures between them.
class Road : public Stage {
  public:
    /// From pictures of `from` to the format `to`. With `dither` the last step is a dithered one.
    /// Ends in a Fault where no chain leads there.
    Road(const Shape &from, const Format &to, bool dither);

    /// Lines and columns beyond the size of `from` are set (Picture::pad). Where there is nothing
    /// to do, the result is `from`.
    Picture &run(Picture &from) override;
    /// "nv12 -> yuv420 -> rgb565 (dithered)"
    std::string text() const override;
    Shape out() const override;
    /// What a step on the way loses that both ends could hold; empty if nothing.
    std::string loss() const;
    /// Comparable between roads: fewer and gentler steps cost less.
    int cost() const { return cost_; }

  private:
    struct Step {
        Via via;
        Picture out;
    };
    Shape from_;
    std::vector<Step> steps_;
    int cost_ = 0;
};

}  // namespace tools
