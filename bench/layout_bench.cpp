// Between layouts of YUV. Where samples only move, the limit is memory.
#include "simgp/layout.h"

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
void repeat_plane(const simgp_img &s, const simgp_img &d, int k) {
    for (int row = 0; row < 2; row++)
        CopyPlane(s.plane[k], s.stride[k], d.plane[k] + row * d.stride[k], 2 * d.stride[k],
                  s.width[k], s.height[k]);
}
void drop_plane(const simgp_img &s, const simgp_img &d, int k) {
    CopyPlane(s.plane[k], 2 * s.stride[k], d.plane[k], d.stride[k], s.width[k], s.height[k] / 2);
}
void repeat_rows(const simgp_img &s, const simgp_img &d) {
    copy_plane(s, 0, d, 0);
    for (int k = 1; k < 3; k++) repeat_plane(s, d, k);
}
void drop_rows(const simgp_img &s, const simgp_img &d) {
    copy_plane(s, 0, d, 0);
    for (int k = 1; k < 3; k++) drop_plane(s, d, k);
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

    // Planes alone, to half and twice the rows.
    const auto rows = [&](const char *name, simgp_plane_fn *kernel, const operation &theirs, int of,
                          int to) {
        conversion c{SIMGP_FMT_YUV400, SIMGP_FMT_YUV400, move, {libyuv_peer(theirs)}, name};
        c.ours = [=](const simgp_img &s, const simgp_img &d) {
            kernel(s.plane[0], s.width[0], s.height[0], s.stride[0], d.stride[0], d.plane[0]);
        };
        c.to_size = [=](const size &from) { return size{from.width, from.height * to / of}; };
        c.how = resizing::drops_or_repeats;
        c.part_read = of > to ? double(to) / of : 1;
        all.push_back(c);
    };
    rows(
        "1x2_to_1x1", simgp_csc_1x2_to_1x1,
        [](const simgp_img &s, const simgp_img &d) { drop_plane(s, d, 0); }, 2, 1);
    rows(
        "1x1_to_1x2", simgp_csc_1x1_to_1x2,
        [](const simgp_img &s, const simgp_img &d) { repeat_plane(s, d, 0); }, 1, 2);
    return compare_all(all);
}

}  // namespace bench
