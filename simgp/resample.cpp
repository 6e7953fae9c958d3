// The resampler's plans and memory.
#include "simgp/resample.h"

namespace simgp {

resampling::resampling(resize_kind kind, int32_t step_x, int32_t step_y, bool mirrored)
    : pixel_bytes(resized_pixel_bytes[size_t(kind)]),
      loops(live_rows().resize.of[size_t(kind)]),
      x(step_x),
      y(step_y),
      strip_() {
    constexpr uint32_t short_step = (5 << 18) / 4;
    strip_.step = x.step;
    strip_.shift = x.shift;
    strip_.mirrored = mirrored;
    strip_.keeps = y.shift == 0 && y.step < short_step;
    loops.measure(strip_);
}

ptrdiff_t resampling::strip_width(ptrdiff_t width, ptrdiff_t memory, ptrdiff_t beside) const {
    const ptrdiff_t step = strip_.plan_bytes + (keeps() ? 2 * ptrdiff_t(strip_.kept_bytes) : 0) +
                           (beside * strip_.step_bytes + pixel_bytes - 1) / pixel_bytes;
    ptrdiff_t most = PTRDIFF_MAX;
    if (step != 0) {
        constexpr ptrdiff_t loss = 3 * (resize_alignment - 1);  // of the plan and two rows
        most = (memory - loss) / step * strip_.step_bytes / pixel_bytes;
    }
    if (width <= most) return width;
    const ptrdiff_t strips = (width + most - 1) / most;
    const ptrdiff_t columns = round_up((width + strips - 1) / strips, strip_.step_bytes);
    return columns < most ? columns : most;
}

resize_strip resampling::plan(ptrdiff_t at, ptrdiff_t columns, const source_span &span,
                              uint8_t *memory) const {
    resize_strip s = strip_;
    s.x = int32_t(at);
    s.columns = int32_t(columns);
    s.first = int32_t(span.first);
    s.row_bytes = int32_t(span.columns * pixel_bytes);
    s.plan = memory;
    loops.plan(s);
    return s;
}

}  // namespace simgp
