// Packed YUV to RGB: the kernels. The rows belong to yuv2rgb.
#include "simgp/packed2rgb.h"

#include "simgp/walk.h"

using namespace simgp;

namespace {

template <const format &From, const format &To>
void packed_to_rgb(const csc_args &a) {
    const row_table &live = live_rows(a.src_widths[0]);
    yuv_to_rgb_row *const row = yuv_to_rgb_row_of<From, To, yuv_rule::usual>(live);
    walk_one_plane(a, src_lines(a, 0), From.bytes[0], dst_lines(a, 0), To.bytes[0],
                   [=](const uint8_t *src, uint8_t *dst, ptrdiff_t width) {
                       row(src, nullptr, nullptr, dst, width);
                   });
}

}  // namespace

#define DEFINE(name, from, to, rule) \
    SIMGP_CSC_KERNEL(name, packed_to_rgb<formats::from, formats::to>(args))
SIMGP_PACKED_TO_RGB_KERNELS(DEFINE)
#undef DEFINE
