// Between layouts of YUV. Where samples only move, the limit is memory.
#include <libyuv.h>

#include "bench/picture.h"

namespace bench {
namespace {

using namespace libyuv;

// libyuv's I420ToI422 and I422ToI420 interpolate; with its plane copies, strides doubled, rows are
// repeated and dropped as ours are.
void copy_plane(const simgp_img &s, int from, const simgp_img &d, int to) {
    CopyPlane(s.plane[from], s.stride[from], d.plane[to], d.stride[to], s.width[from],
              s.height[from]);
}
void repeat_rows(const simgp_img &s, const simgp_img &d) {
    copy_plane(s, 0, d, 0);
    for (int k = 1; k < 3; k++)
        for (int row = 0; row < 2; row++)
            CopyPlane(s.plane[k], s.stride[k], d.plane[k] + row * d.stride[k], 2 * d.stride[k],
                      s.width[k], s.height[k]);
}
void drop_rows(const simgp_img &s, const simgp_img &d) {
    copy_plane(s, 0, d, 0);
    for (int k = 1; k < 3; k++)
        CopyPlane(s.plane[k], 2 * s.stride[k], d.plane[k], d.stride[k], s.width[k],
                  s.height[k] / 2);
}

}  // namespace

std::vector<comparison> layout_comparisons() {
    const goal move{1.0, 0, 0.9};
    const operation nv12_to_i420 = of_planes<2, 3>(NV12ToI420);
    const operation nv21_to_i420 = of_planes<2, 3>(NV21ToI420);
    const operation drop_and_exchange = exchange_dst_chroma(drop_rows);

    // clang-format off
    std::vector<conversion> all = {
        {SIMGP_FMT_YUV420,  SIMGP_FMT_YV12,    move, {libyuv_peer(exchange_dst_chroma(of_planes<3, 3>(I420Copy)))}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_YUV422N, move, {libyuv_peer(repeat_rows)}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_NV12,    move, {libyuv_peer(of_planes<3, 2>(I420ToNV12))}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_NV21,    move, {libyuv_peer(of_planes<3, 2>(I420ToNV21))}},
        {SIMGP_FMT_YUV422N, SIMGP_FMT_YUV420,  move, {libyuv_peer(drop_rows)}},
        {SIMGP_FMT_YUV422N, SIMGP_FMT_YV12,    move, {libyuv_peer(drop_and_exchange)}},
        {SIMGP_FMT_YV16,    SIMGP_FMT_YUV420,  move, {libyuv_peer(drop_and_exchange)}},
        {SIMGP_FMT_YV16,    SIMGP_FMT_YV12,    move, {libyuv_peer(drop_rows)}},
        {SIMGP_FMT_NV12,    SIMGP_FMT_YUV420,  move, {libyuv_peer(nv12_to_i420)}},
        {SIMGP_FMT_NV12,    SIMGP_FMT_YV12,    move, {libyuv_peer(exchange_dst_chroma(nv12_to_i420))}},
        {SIMGP_FMT_NV21,    SIMGP_FMT_YUV420,  move, {libyuv_peer(nv21_to_i420)}},
        {SIMGP_FMT_NV21,    SIMGP_FMT_YV12,    move, {libyuv_peer(exchange_dst_chroma(nv21_to_i420))}},
    };
    // clang-format on
    for (conversion &c : all)  // of chroma, every second row
        if (c.from == SIMGP_FMT_YUV422N || c.from == SIMGP_FMT_YV16) c.part_read = 0.75;
    return compare_all(all);
}

}  // namespace bench
