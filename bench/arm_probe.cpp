// Calls one NEON row of the library, or of libyuv, once: the program that arm_cost.py traces.
//   arm_probe               a line for each row: name, address, pixels for each unit of size, two sizes
//   arm_probe NUMBER SIZE   calls the row of that line
#include <libyuv/convert_argb.h>
#include <libyuv/rotate_row.h>
#include <libyuv/row.h>
#include <libyuv/scale_row.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include "rows/choose.h"

namespace {

using namespace simgp;

// Samples and pixels: the widest row takes 2048 pixels of 4 bytes from each of two lines.
alignas(64) uint8_t a[1 << 16], b[1 << 16], c[1 << 16], d[1 << 16], e[1 << 16], f[1 << 16];
constexpr ptrdiff_t second = 1 << 14;

using code = void (*)();

struct row {
    char name[40];
    code address;
    int pixels;  // for each unit of size
    int sizes[2];
    void (*call)(code, int size);
};
row rows[512];
int count;

template <class F>
void add(const char *name, F *function, F *scalar, void (*call)(code, int), int pixels = 1,
         int first = 512, int other = 1024) {
    if (!function || function == scalar) return;
    row &r = rows[count++];
    snprintf(r.name, sizeof r.name, "%s", name);
    r.address = reinterpret_cast<code>(function);
    r.pixels = pixels, r.call = call, r.sizes[0] = first, r.sizes[1] = other;
}

template <class F>
F *as(code address) {
    return reinterpret_cast<F *>(address);
}

// NAME(f, n) calls the row f of that type with size n.
#define CALL(name, type, ...) \
    void name(code address, int n) { as<type>(address)(__VA_ARGS__); }

constexpr yuv_to_rgb to_rgb_how{{298, 16, 409, 100, 208, 516}, false, false, {true, false}};
constexpr rgb_weights to_yuv_how{{66, 129, 25}, {-38, -74, 112}, {112, -94, -18}, 16, false, false},
    to_yuv_means{{66, 129, 25}, {-38, -74, 112}, {112, -94, -18}, 16, false, true};
constexpr repacking order{true, false, false};
uint8_t *const channels[3] = {d, e, f};
const uint8_t *const channels_in[3] = {a, b, c};

#define LINE(second) \
    { {{a, a + second}, b, c, {d, d + second}}, n, 1, 0, 0, 0, 0, &to_rgb_how }
CALL(call_row, yuv_to_rgb_rows, LINE(0))
CALL(call_pair, yuv_to_rgb_rows, LINE(second))
CALL(call_to_yuv, rgb_to_yuv_row, a, d, e, f, n)
CALL(call_rgb_to_rgb, rgb_to_rgb_row, a, d, n)
CALL(call_pack, pack_rows, a, 0, b, 0, d, 0, n, 1)
CALL(call_unpack, unpack_rows, a, 0, d, 0, e, 0, n, 1)
CALL(call_dither, dither_row, a, b, c, d, n)
#define SAMPLES(u, v, rows) \
    { a, second, d, second, u, 0, v, 0, n, rows, rows == 2 }
CALL(call_any_to_grey, any_to_yuv_rows, to_yuv_how, SAMPLES(nullptr, nullptr, 1))
CALL(call_any_to_half, any_to_yuv_rows, to_yuv_how, SAMPLES(e, f, 1))
CALL(call_any_to_pairs, any_to_yuv_rows, to_yuv_how, SAMPLES(e, nullptr, 1))
CALL(call_any_to_means, any_to_yuv_rows, to_yuv_means, SAMPLES(e, nullptr, 2))
CALL(call_chroma, chroma_row, to_yuv_how, channels_in, d, e, n)
CALL(call_split_pixels, split_pixels_row, a, channels, n)
CALL(call_repack, repack_rows, order, {a, 0, d, 0, n, 1})
CALL(call_join_groups, join_groups_row, a, b, c, d, n, true)
#define SPLIT(v, shared, mean) \
    { a, second, d, second, e, second, v, second, n, 2, true, shared, mean }
CALL(call_split_groups, split_groups_rows, SPLIT(f, false, false))
CALL(call_split_to_planes, split_groups_rows, SPLIT(f, true, false))
CALL(call_split_to_pairs, split_groups_rows, SPLIT(nullptr, true, false))
CALL(call_split_means, split_groups_rows, SPLIT(f, true, true))
CALL(call_mean, mean_row, a, b, d, n)
CALL(call_mean_of_blocks, mean_of_blocks_rows, a, b, 0, d, 0, n, 1)
CALL(call_resample, resample_row, a, d, n)
CALL(call_detile, detile_rows, a, d, 256, n)
CALL(call_entile, entile_rows, a, 256, d, n)
CALL(call_detile_unpack, detile_unpack_rows, a, d, 256, e, 256, n)
CALL(call_entile_pack, entile_pack_rows, a, 256, b, 256, d, n)
CALL(call_tile_to_rgb, tile_to_rgb_rows, a, b, d, 256, n)
CALL(call_line_edge, deblock_line_edge, a, b, c, d, n, 8)
CALL(call_column_edges, deblock_column_edges, a, 2048, n, 8, 8)
CALL(call_transpose, transpose_block, a, 256, d, 256, n, 32, 0)
CALL(call_reverse, reverse_row, a, d, n)
CALL(call_fill, fill_row, d, 0x01020304, size_t(n))
void call_find(code address, int n) {
    memset(a, 1, sizeof a);
    as<find_code_row>(address)(a, n, 0xFF, 1);
}

// A line of the resampler, half way between two, at From source samples for To of the destination. Which
// of its rows does that is the plan's choice; the plan is made before.
template <int From, int To>
resize_strip strip_of(int columns) {
    alignas(resize_alignment) static uint8_t plan[1 << 16];
    const resize_loops &loops = rows_of(target::neon).resize.of[size_t(resize_kind::bytes1)];
    resize_strip s{};
    s.step = uint32_t((From << 18) / To);
    s.columns = columns;
    s.row_bytes = second;
    s.plan = plan;
    loops.measure(s);
    loops.plan(s);
    return s;
}
template <int From, int To>
void call_resize(code address, int n) {
    const resize_strip s = strip_of<From, To>(n);
    const resize_line line{s.keeps ? e : a, b, 4};
    if (s.keeps)
        as<resize_across_row>(address)(s, a, f, 0, &line, 1, d, 0);
    else
        as<resize_both_row>(address)(s, &line, 1, d, 0, 0);
}

// libyuv's, by what they take.
using rows31 = void(const uint8_t *, const uint8_t *, const uint8_t *, uint8_t *,
                    const libyuv::YuvConstants *, int);
using rows21 = void(const uint8_t *, const uint8_t *, uint8_t *, const libyuv::YuvConstants *, int);
using rows11 = void(const uint8_t *, uint8_t *, const libyuv::YuvConstants *, int);
using plain11 = void(const uint8_t *, uint8_t *, int);
using plain12 = void(const uint8_t *, uint8_t *, uint8_t *, int);
using plain13 = void(const uint8_t *, uint8_t *, uint8_t *, uint8_t *, int);
using plain21 = void(const uint8_t *, const uint8_t *, uint8_t *, int);
using plain31 = void(const uint8_t *, const uint8_t *, const uint8_t *, uint8_t *, int);
using two_lines = void(const uint8_t *, int, uint8_t *, uint8_t *, int);
using scaled = void(const uint8_t *, ptrdiff_t, uint8_t *, int);
using interpolated = void(uint8_t *, const uint8_t *, ptrdiff_t, int, int);
using columns_filtered = void(uint8_t *, const uint8_t *, int, int, int);
using transposed = void(const uint8_t *, int, uint8_t *, int, int);
using filled = void(uint8_t *, uint32_t, int);
const libyuv::YuvConstants *const matrix = &libyuv::kYuvI601Constants;
CALL(peer_31, rows31, a, b, c, d, matrix, n)
CALL(peer_21, rows21, a, b, d, matrix, n)
CALL(peer_11, rows11, a, d, matrix, n)
CALL(peer_plain_11, plain11, a, d, n)
CALL(peer_plain_12, plain12, a, d, e, n)
CALL(peer_plain_13, plain13, a, d, e, f, n)
CALL(peer_plain_21, plain21, a, b, d, n)
CALL(peer_plain_31, plain31, a, b, c, d, n)
CALL(peer_lines, two_lines, a, second, d, e, n)
CALL(peer_scaled, scaled, a, second, d, n)
CALL(peer_interpolated, interpolated, d, a, second, n, 128)
CALL(peer_columns, columns_filtered, d, a, n, 0, 3 << 15)
CALL(peer_transposed, transposed, a, 2048, d, 64, n)
CALL(peer_filled, filled, d, 0x01020304, n)

constexpr const char *matrices[] = {"", "coarse "},
                     *layouts[] = {"half", "full", "uv", "vu", "uyvy", "yuyv"},
                     *packings[] = {"rgb565",   "bgr565",   "rgb888",  "bgr888",
                                    "rgba8888", "bgra8888", "argb8888"},
                     *chroma_ins[] = {"half", "full", "pairs", "groups"},
                     *kinds[] = {"words", "three", "four"},
                     *rgb_ins[] = {"words", "three", "four", "four, alpha first"},
                     *sample_kinds[] = {"bytes", "words", "even bytes"};
const char *layout_name(size_t l) { return l ? layouts[l - 1] : "grey"; }

char text[64];
template <class... Parts>
const char *named(const char *form, Parts... parts) {
    snprintf(text, sizeof text, form, parts...);
    return text;
}

void list_conversions(const row_table &n, const row_table &s) {
    for (size_t m = 0; m < size_t(yuv_matrix::count); m++)
        for (size_t l = 0; l < size_t(yuv_layout::count); l++)
            for (size_t p = 0; p < size_t(rgb_packing::count); p++) {
                add(named("%s%s to %s", matrices[m], layout_name(l), packings[p]),
                    n.yuv2rgb.row[m][l][p], s.yuv2rgb.row[m][l][p], call_row);
                add(named("%s%s to %s, two", matrices[m], layout_name(l), packings[p]),
                    n.yuv2rgb.pair[m][l][p], s.yuv2rgb.pair[m][l][p], call_pair, 2);
            }
    for (size_t p = 0; p < size_t(rgb_packing::count); p++) {
        for (size_t l = 0; l < size_t(yuv_layout::count); l++)
            add(named("%s to %s", packings[p], layout_name(l)), n.rgb2yuv.row[p][l],
                s.rgb2yuv.row[p][l], call_to_yuv);
        add(named("%s to rgb565", packings[p]), n.rgb2yuv.to_rgb565[p], s.rgb2yuv.to_rgb565[p],
            call_rgb_to_rgb);
        add(named("tile to %s", packings[p]), n.tile.to_rgb[p], s.tile.to_rgb[p], call_tile_to_rgb,
            64, 16, 32);
    }
}

void list_any(const any_rows &n, const any_rows &s) {
    for (size_t k = 0; k < size_t(pixel_kind::count); k++) {
        for (size_t l = 0; l < size_t(chroma_in::count); l++) {
            add(named("any %s to %s", chroma_ins[l], kinds[k]), n.to_rgb[l][k], s.to_rgb[l][k],
                call_row);
            add(named("any %s to %s, two", chroma_ins[l], kinds[k]), n.to_rgb_pair[l][k],
                s.to_rgb_pair[l][k], call_pair, 2);
        }
        const auto to_yuv = [&](const char *to, auto call, int lines) {
            add(named(to, kinds[k]), n.to_yuv[k], s.to_yuv[k], call, lines);
        };
        to_yuv("any %s to grey", call_any_to_grey, 1);
        to_yuv("any %s to half", call_any_to_half, 1);
        to_yuv("any %s to pairs", call_any_to_pairs, 1);
        to_yuv("any %s to means, two", call_any_to_means, 2);
        for (size_t to = 0; to < size_t(pixel_kind::count); to++)
            add(named("any %s to %s", kinds[k], kinds[to]), n.repack[k][to], s.repack[k][to],
                call_repack);
    }
    for (size_t k = 0; k < size_t(rgb_in::count); k++)
        add(named("any split %s", rgb_ins[k]), n.split_pixels[k], s.split_pixels[k],
            call_split_pixels);
    add("any chroma", n.chroma, s.chroma, call_chroma);
    const auto split = [&](const char *name, auto call) {
        add(name, n.split_groups, s.split_groups, call, 4);
    };
    split("any split groups, two", call_split_groups);
    split("any split groups to planes, two", call_split_to_planes);
    split("any split groups to pairs, two", call_split_to_pairs);
    split("any split groups, means, two", call_split_means);
    add("any join groups", n.join_groups, s.join_groups, call_join_groups, 2);
    add("any mean of lines", n.mean_of_lines, s.mean_of_lines, call_mean);
    add("any mean of blocks", n.mean_of_blocks, s.mean_of_blocks, call_mean_of_blocks);
    add("any every second", n.every_second, s.every_second, call_resample);
    add("any twice", n.twice, s.twice, call_resample);
}

template <int From, int To>
void list_resizing(const resize_loops &n, const resize_loops &s) {
    const bool keeps = strip_of<From, To>(512).keeps;
    const char *const name = named("resize bytes, %d to %d", From, To);
    if (keeps)
        add(name, n.across, s.across, call_resize<From, To>);
    else
        add(name, n.both, s.both, call_resize<From, To>);
}

void list_others(const row_table &n, const row_table &s) {
    constexpr size_t bytes1 = size_t(resize_kind::bytes1);
    list_resizing<2, 3>(n.resize.of[bytes1], s.resize.of[bytes1]);
    list_resizing<4, 3>(n.resize.of[bytes1], s.resize.of[bytes1]);
    list_resizing<3, 2>(n.resize.of[bytes1], s.resize.of[bytes1]);
    list_resizing<2, 1>(n.resize.of[bytes1], s.resize.of[bytes1]);
    add("pack", n.layout.pack, s.layout.pack, call_pack);
    add("unpack", n.layout.unpack, s.layout.unpack, call_unpack);
    add("dither", n.dither.dither, s.dither.dither, call_dither);
    add("detile", n.tile.detile, s.tile.detile, call_detile, 64, 16, 32);
    add("entile", n.tile.entile, s.tile.entile, call_entile, 64, 16, 32);
    add("detile, unpack", n.tile.detile_unpack, s.tile.detile_unpack, call_detile_unpack, 64, 16,
        32);
    add("entile, pack", n.tile.entile_pack, s.tile.entile_pack, call_entile_pack, 64, 16, 32);
    add("line edge", n.deblock.line_edge, s.deblock.line_edge, call_line_edge);
    add("column edges", n.deblock.column_edges, s.deblock.column_edges, call_column_edges, 64, 32,
        64);
    for (size_t k = 0; k < size_t(sample_kind::count); k++)
        add(named("transpose %s", sample_kinds[k]), n.rotate.transpose[k], s.rotate.transpose[k],
            call_transpose, 32, 16, 32);
    for (size_t k = 0; k < sizeof n.rotate.reverse / sizeof *n.rotate.reverse; k++)
        add(named("reverse %s", sample_kinds[k]), n.rotate.reverse[k], s.rotate.reverse[k],
            call_reverse);
    add("fill", n.mem.fill, s.mem.fill, call_fill);
    add("find code", n.keyframe.find_code, s.keyframe.find_code, call_find);
}

template <class F>
void peer(const char *name, F *function, void (*call)(code, int), int pixels = 1) {
    add(name, function, static_cast<F *>(nullptr), call, pixels);
}
#define PEER(name, ...) peer("libyuv " #name, libyuv::name##_NEON, __VA_ARGS__);
void list_peers() {
    PEER(I422ToRGB565Row, peer_31)
    PEER(I422ToRGB24Row, peer_31)
    PEER(I422ToARGBRow, peer_31)
    PEER(I422ToRGBARow, peer_31)
    PEER(I444ToARGBRow, peer_31)
    PEER(NV12ToRGB565Row, peer_21)
    PEER(NV12ToRGB24Row, peer_21)
    PEER(NV21ToRGB24Row, peer_21)
    PEER(NV12ToARGBRow, peer_21)
    PEER(UYVYToARGBRow, peer_11)
    PEER(YUY2ToARGBRow, peer_11)
    PEER(RAWToYRow, peer_plain_11)
    PEER(RGB24ToYRow, peer_plain_11)
    PEER(ARGBToYRow, peer_plain_11)
    PEER(RGB565ToYRow, peer_plain_11)
    PEER(RAWToUVRow, peer_lines)
    PEER(RGB24ToUVRow, peer_lines)
    PEER(ARGBToUVRow, peer_lines)
    PEER(RGB565ToUVRow, peer_lines)
    PEER(ARGBToRGB565Row, peer_plain_11)
    PEER(ARGBToRAWRow, peer_plain_11)
    PEER(RGB565ToARGBRow, peer_plain_11)
    PEER(RAWToARGBRow, peer_plain_11)
    PEER(RAWToRGB24Row, peer_plain_11)
    PEER(SplitRGBRow, peer_plain_13)
    PEER(YUY2ToYRow, peer_plain_11)
    PEER(YUY2ToUV422Row, peer_plain_12)
    PEER(YUY2ToUVRow, peer_lines)
    PEER(I422ToYUY2Row, peer_plain_31)
    PEER(SplitUVRow, peer_plain_12)
    PEER(MergeUVRow, peer_plain_21)
    PEER(InterpolateRow, peer_interpolated)
    PEER(ScaleRowDown2, peer_scaled)
    PEER(ScaleRowDown2Box, peer_scaled)
    PEER(ScaleRowDown34_1_Box, peer_scaled)
    PEER(ScaleFilterCols, peer_columns)
    PEER(TransposeWx8, peer_transposed, 8)
    PEER(MirrorRow, peer_plain_11)
    PEER(ARGBSetRow, peer_filled, 4)
}

}  // namespace

int main(int argc, char **argv) {
    const row_table &n = rows_of(target::neon), &s = rows_of(target::scalar);
    list_conversions(n, s);
    list_any(n.any, s.any);
    list_others(n, s);
    list_peers();
    if (argc == 3) {
        const row &r = rows[atoi(argv[1])];
        r.call(r.address, atoi(argv[2]));
        return 0;
    }
    for (int i = 0; i < count; i++)
        printf("%s\t%#llx\t%d\t%d\t%d\n", rows[i].name,
               static_cast<unsigned long long>(reinterpret_cast<uintptr_t>(rows[i].address)),
               rows[i].pixels, rows[i].sizes[0], rows[i].sizes[1]);
}
