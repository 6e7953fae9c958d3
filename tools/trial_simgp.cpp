// Trials of the functions simgp_*.
#include <string.h>

#include "rows/conversions.h"  // the lists of kernels, by their names
#include "tools/trial.h"

namespace tools {
namespace {

using run_fn = void (*)(trial &, const function &);

bool is_quarter(int32_t rot) { return rot == SIMGP_ROT_90L || rot == SIMGP_ROT_90R; }

extent turned(extent e, int32_t rot) { return is_quarter(rot) ? extent{e.h, e.w} : e; }

std::vector<shape> turned(std::vector<shape> shapes, int32_t rot) {
    if (is_quarter(rot))
        for (shape &s : shapes) std::swap(s.width, s.height);
    return shapes;
}

// Descriptors ----------------------------------------------------------------------------------------

struct pair {
    int32_t from, to;
};

// All of them, one call after the other.
pair format_pair(const trial &t) {
    constexpr int count = int(std::size(formats));
    return {formats[t.index % count], formats[t.index / count % count]};
}

// The same format twice as a rule.
pair same_formats(trial &t) {
    const int32_t format = formats[t.index % int(std::size(formats))];
    return {format, t.one_in(16) ? t.one_of(formats) : format};
}

template <int32_t call(const simgp_img *, const simgp_img *)>
void convert(trial &t, const function &) {
    const auto [from, to] = format_pair(t);
    const extent size = t.small_size();
    const simgp_img src = picture(t, from, size), dst = destination(t, to, size);
    t.fill();
    t.result(uint32_t(call(&src, &dst)));
}

// Dithered luma waits in the last two rows of 16-bit RGB: what lies there between the rows may change.
void ignore_padding_of_last_rows(trial &t, const uint8_t *first, int32_t stride, extent size) {
    if (size.w <= 0) return;
    for (int32_t y = std::max(size.h - 2, 0); y < size.h; y++)
        t.ignore(first + ptrdiff_t(stride) * y + 2 * size.w, std::abs(stride) - 2 * size.w);
}

void convert_dithered(trial &t, const function &) {
    const auto [from, to] = format_pair(t);
    const extent size = t.small_size();
    const simgp_img src = picture(t, from, size), dst = destination(t, to, size);
    if (to == SIMGP_FMT_RGB565 || to == SIMGP_FMT_BGR565)
        ignore_padding_of_last_rows(t, dst.plane[0], dst.stride[0], size);
    t.fill();
    t.result(uint32_t(simgp_csc_dither(&src, &dst)));
}

void convert_any(trial &t, const function &) {
    const auto [from, to] = format_pair(t);
    const extent size = t.small_size();
    const simgp_img src = picture(t, from, size), dst = destination(t, to, size);
    const int32_t matrix = t.one_in(30) ? t.pick(-1, 6) : t.pick(0, 5);
    const int32_t colour = matrix + t.pick(0, 1) * SIMGP_CHROMA_MEAN;
    t.fill();
    t.result(uint32_t(simgp_csc_any(&src, &dst, colour)));
}

void convert_and_turn(trial &t, const function &) {
    static constexpr int32_t some[] = {SIMGP_FMT_YUV422N, SIMGP_FMT_YV16, SIMGP_FMT_YUV422N,
                                       SIMGP_FMT_YV16, SIMGP_FMT_NV12};
    static constexpr int32_t others[] = {SIMGP_FMT_YUV420, SIMGP_FMT_YV12, SIMGP_FMT_YUV420,
                                         SIMGP_FMT_YV12, SIMGP_FMT_YV16};
    const int32_t from = t.one_of(some), to = t.one_of(others);
    const int32_t rot = t.one_in(8) ? t.pick(-1, 7) : t.pick(0, 2);
    const extent size = t.size();
    const simgp_img src = picture(t, from, size), dst = destination(t, to, turned(size, rot));
    t.fill();
    t.result(uint32_t(simgp_csc_rot(&src, rot, &dst)));
}

void copy(trial &t, const function &) {
    const auto [from, to] = same_formats(t);
    const extent size = t.size();
    const simgp_img src = picture(t, from, size), dst = destination(t, to, size);
    t.fill();
    t.result(uint32_t(simgp_cpy(&src, &dst)));
}

void turn(trial &t, const function &) {
    const auto [from, to] = same_formats(t);
    const int32_t rot = t.one_in(16) ? t.pick(-1, 6) : t.pick(0, 5);
    const extent size = t.size();
    const simgp_img src = picture(t, from, size);
    simgp_img dst = picture(t, from, turned(shapes_of(from, size), rot));
    dst.format = to;
    t.fill();
    t.result(uint32_t(simgp_rot(&src, rot, &dst)));
}

void resize(trial &t, const function &) {
    const auto [from, to] = same_formats(t);
    const extent size = t.size(), other = t.one_in(8) ? size : t.size();
    const simgp_img src = picture(t, from, size), dst = picture(t, to, other);
    t.fill();
    t.result(uint32_t(simgp_rsz(&src, &dst)));
}

void resize_and_turn(trial &t, const function &) {
    const auto [from, to] = same_formats(t);
    const int32_t rot = t.one_in(16) ? t.pick(-1, 6) : t.pick(0, 5);
    const extent size = t.size(), other = t.one_in(8) ? turned(size, rot) : t.size();
    // What keeps its size is turned, plane by plane.
    const extent back = turned(other, rot);
    const bool keeps = back.w == size.w && back.h == size.h;
    const simgp_img src = picture(t, from, size);
    const simgp_img dst =
        picture(t, to, keeps ? turned(shapes_of(to, size), rot) : shapes_of(to, other));
    t.fill();
    t.result(uint32_t(simgp_rsz_rot(&src, rot, &dst)));
}

void resize_and_convert(trial &t, const function &) {
    static constexpr int32_t some[] = {SIMGP_FMT_YUV420, SIMGP_FMT_T64X32, SIMGP_FMT_YUV420,
                                       SIMGP_FMT_T64X32, SIMGP_FMT_NV12,   SIMGP_FMT_RGB565};
    const int32_t from = t.one_of(some);
    const int32_t to = t.one_in(8) ? t.one_of(formats) : int32_t(SIMGP_FMT_RGB565);
    const extent size = t.size(), other = t.size();
    const simgp_img src = picture(t, from, size), dst = picture(t, to, other);
    t.fill();
    t.result(uint32_t(simgp_rsz_csc(&src, &dst)));
}

void deblock_picture(trial &t, const function &) {
    simgp_img img = picture(t, SIMGP_FMT_YUV420, t.size());
    img.format = t.one_of(formats);
    if (t.one_in(4)) img.plane[t.pick(0, 2)] = nullptr;
    const int16_t strength = int16_t(t.one_in(8) ? t.pick(-2, 17) : t.pick(0, 15));
    t.fill();
    t.result(uint32_t(simgp_dbf8x8_yuv(&img, strength)));
}

// Kernels --------------------------------------------------------------------------------------------

// Of a whole picture: numbers are the two formats.
void picture_kernel(trial &t, const function &f) {
    const extent size = t.size();
    simgp_img src = picture(t, f.numbers[0], size);
    const simgp_img dst = destination(t, f.numbers[1], size);
    // Grey may lie in the lines that it becomes.
    if (f.numbers[0] == SIMGP_FMT_YUV400 && size.w > 0 && t.one_in(4)) {
        src.plane[0] = dst.plane[0] + size.w;
        src.stride[0] = dst.stride[0];
    }
    t.fill();
    code_of<simgp_csc_fn>(f)(src.plane, src.width, src.height, src.stride, dst.stride, dst.plane);
}

void dithering_kernel(trial &t, const function &f) {
    const extent size = t.size();
    const simgp_img src = picture(t, f.numbers[0], size), dst = destination(t, f.numbers[1], size);
    ignore_padding_of_last_rows(t, dst.plane[0], dst.stride[0], size);
    t.fill();
    code_of<simgp_csc_fn>(f)(src.plane, src.width, src.height, src.stride, dst.stride, dst.plane);
}

// Of one plane. Numbers: bytes of a sample, the rotation code; then what becomes of 2 rows, in rows.
void run_plane_kernel(trial &t, simgp_plane_fn *kernel, int32_t bytes, int32_t rot, int32_t rows) {
    const extent size = t.size();
    const extent to = turned({size.w, size.h > 0 ? size.h * rows / 2 : size.h}, rot);
    const plane src = t.add(size.w * bytes, size.h), dst = t.add(to.w * bytes, to.h);
    t.fill();
    if (!kernel) return t.result(0);
    kernel(src.first, size.w, size.h, src.stride, dst.stride, dst.first);
}

void plane_kernel(trial &t, const function &f) {
    run_plane_kernel(t, code_of<simgp_plane_fn>(f), f.numbers[0], f.numbers[1], f.numbers[2]);
}

void run_resize(trial &t, simgp_rsz_fn *kernel, int32_t bytes, int32_t rot) {
    const extent from = t.some_size(), to = t.some_size();
    const plane src = t.add(from.w * bytes, from.h), dst = t.add(to.w * bytes, to.h);
    int32_t step_x, step_y;
    simgp_rsz_get_step(from.w, from.h, to.w, to.h, rot, &step_x, &step_y);
    t.fill();
    if (!kernel) return t.result(0);
    kernel(src.first, src.stride, to.w, to.h, dst.stride, dst.first, step_x, step_y);
}

void resize_kernel(trial &t, const function &f) {
    run_resize(t, code_of<simgp_rsz_fn>(f), f.numbers[0], f.numbers[1]);
}

void resize_csc_kernel(trial &t, const function &f) {
    const simgp_img src = picture(t, f.numbers[0], t.some_size());
    const simgp_img dst = picture(t, SIMGP_FMT_RGB565, t.size());
    t.fill();
    code_of<simgp_rsz_csc_fn>(f)(src.plane, src.width, src.height, src.stride, dst.width,
                                 dst.height, dst.stride, dst.plane);
}

void quarter(trial &t, const function &) {
    const extent size = t.size();
    const plane src = t.add(2 * size.h, 2 * size.w), dst = t.add(size.w, size.h);
    t.fill();
    simgp_rsz_8b_rot_90r_quarter(src.first, src.stride, size.w, size.h, dst.stride, dst.first);
}

using deblock_fn = void(uint8_t *, int16_t, int32_t, int32_t, int32_t);

void deblock(trial &t, const function &f) {
    const extent size = t.size();
    const plane p = t.add(size.w, size.h);
    const int16_t strength = int16_t(t.one_in(8) ? t.pick(-32768, 32767) : t.pick(-1, 20));
    t.fill();
    code_of<deblock_fn>(f)(p.first, strength, p.stride, size.w, size.h);
}

void pack(trial &t, const function &) {
    const extent size = t.size();
    const plane a = t.add(size.w, size.h), b = t.add(size.w, size.h),
                to = t.add(2 * size.w, size.h);
    t.fill();
    simgp_csc_8b8b_pck(a.first, b.first, size.w, size.h, a.stride, b.stride, to.stride, to.first);
}

void unpack(trial &t, const function &) {
    const extent size = t.size();
    const plane from = t.add(size.w, size.h), a = t.add((size.w + 1) / 2, size.h),
                b = t.add(size.w / 2, size.h);
    t.fill();
    simgp_csc_8b8b_unpck(from.first, size.w, size.h, from.stride, a.stride, b.stride, a.first,
                         b.first);
}

void copy_tiles(trial &t, const function &) {
    const extent size = t.size();
    const simgp_img src = picture(t, SIMGP_FMT_T64X32, size);
    const plane to = t.add(size.w, size.h);
    t.fill();
    simgp_csc_copy_tiles_to_linear(src.plane[0], size.w, size.h, to.stride, to.first);
}

void unpack_tiles(trial &t, const function &) {
    const extent size = t.size();
    const simgp_img src = picture(t, SIMGP_FMT_T64X32, size);
    const plane u = t.add((size.w + 1) / 2, size.h), v = t.add(size.w / 2, size.h);
    t.fill();
    simgp_csc_unpack_tiles_to_linear(src.plane[0], size.w, size.h, u.stride, u.first, v.stride,
                                     v.first);
}

// Numbers -------------------------------------------------------------------------------------------

void tile_offset(trial &t, const function &) {
    const int32_t w = t.pick(1, 5000), h = t.pick(1, 5000);
    for (int i = 0; i < 8; i++) {
        const int32_t x = t.pick(0, w - 1), y = t.pick(0, h - 1);
        t.result(uint32_t(simgp_get_tile_offset(w, h, x, y)));
    }
}

void get_step(trial &t, const function &) {
    const auto length = [&] {
        return int32_t(t.one_in(10) ? t.word() : t.word() >> t.pick(15, 24));
    };
    int32_t extents[4], step_x, step_y;
    for (int32_t &e : extents) e = length();
    simgp_rsz_get_step(extents[0], extents[1], extents[2], extents[3], t.pick(-1, 7), &step_x,
                       &step_y);
    t.result(uint32_t(step_x));
    t.result(uint32_t(step_y));
}

// Tables: of the weights every byte, of the others what their entries do; an entry that is NULL is
// seen too.
void weights(trial &t, const function &) {
    t.result(simgp_tbl_rsz_weight, sizeof simgp_tbl_rsz_weight);
}

// Each entry in turn.
#define PLANE_TABLE(table, bytes, rows)                                    \
    [](trial &t, const function &) {                                       \
        run_plane_kernel(t, table[t.index % 6], bytes, t.index % 6, rows); \
    }
#define RESIZE_TABLE(table, bytes) \
    [](trial &t, const function &) { run_resize(t, table[t.index % 6], bytes, t.index % 6); }

// Names and versions: every text; of the version, which grows, that it is not older than the header.
void result_of(trial &t, const char *text) {
    t.result(text != nullptr);
    if (text) t.result(text, strlen(text) + 1);
}

void result_text(trial &t, const function &) {
    for (int32_t result = -12; result < 12; result++) result_of(t, simgp_result_text(result));
    result_of(t, simgp_result_text(int32_t(t.word())));
}

void format_name(trial &t, const function &) {
    for (int32_t format = -2; format < 700; format++) result_of(t, simgp_format_name(format));
    result_of(t, simgp_format_name(int32_t(t.word())));
}

// Known names, and those with one other character, the case of some letters among them.
void format_of_name(trial &t, const function &) {
    static constexpr const char *known[] = {
        "yuv400", "gray",  "grey",   "y800",     "yuv420",   "i420",     "iyuv",   "yuv420p",
        "yv12",   "yv16",  "nv12",   "nv21",     "yuv422n",  "i422",     "yuv422", "yuv422p",
        "yuv444", "i444",  "uyvy",   "yuyv",     "yuv422w",  "yuv440p",  "yuy2",   "uyvy422",
        "rgb565", "rgb24", "bgr565", "rgb565le", "rgba8888", "argb8888", "bgra",   "t64x32"};
    std::string name = t.one_of(known);
    t.result(uint32_t(simgp_format_of_name(name.c_str())));
    for (char &c : name)
        if (c >= 'a' && t.one_in(2)) c = char(c - 'a' + 'A');
    t.result(uint32_t(simgp_format_of_name(name.c_str())));
    const size_t at = size_t(t.pick(0, int32_t(name.size()) - 1));
    name[at] = char(t.pick(' ', 'z'));
    t.result(uint32_t(simgp_format_of_name(name.c_str())));
    t.result(uint32_t(simgp_format_of_name(name.substr(0, at).c_str())));
    t.result(uint32_t(simgp_format_of_name(nullptr)));
}

void version(trial &t, const function &) {
    t.result(simgp_version() >> 16 == SIMGP_VERSION_MAJOR && simgp_version() >= SIMGP_VERSION);
}

}  // namespace

void add_pixel_functions(std::vector<function> &all) {
    constexpr int few = 24, usual = 144, many = int(std::size(formats) * std::size(formats));
    const auto add = [&](const char *name, int calls, run_fn run, auto *code, int32_t a = 0,
                         int32_t b = 0, int32_t c = 0) {
        all.push_back({name, calls, run, reinterpret_cast<void (*)()>(code), {a, b, c}});
    };
    const auto add_plain = [&](const char *name, int calls, run_fn run) {
        all.push_back({name, calls, run});
    };

#define KERNEL(name, from, to, ...) \
    add(#name, usual, picture_kernel, name, SIMGP_FMT_##from, SIMGP_FMT_##to);
    SIMGP_YUV_TO_RGB_KERNELS(KERNEL)
    SIMGP_PACKED_TO_RGB_KERNELS(KERNEL)
    SIMGP_RGB_TO_YUV_KERNELS(KERNEL)
    SIMGP_RGB_TO_RGB565_KERNELS(KERNEL)
    SIMGP_LAYOUT_KERNELS(KERNEL)
    SIMGP_TILE_TO_RGB_KERNELS(KERNEL)
    SIMGP_TILE_KERNELS(KERNEL)
#undef KERNEL
#define KERNEL(name, from, to) \
    add(#name, usual, dithering_kernel, name, SIMGP_FMT_##from, SIMGP_FMT_##to);
    SIMGP_DITHER_KERNELS(KERNEL)
#undef KERNEL

#define KERNEL(name, ...) add(#name, usual, plane_kernel, name, __VA_ARGS__)
    KERNEL(simgp_cpy_8b, 1, SIMGP_ROT_NONE, 2);
    KERNEL(simgp_cpy_16b, 2, SIMGP_ROT_NONE, 2);
    KERNEL(simgp_cpy_24b, 3, SIMGP_ROT_NONE, 2);
    KERNEL(simgp_cpy_32b, 4, SIMGP_ROT_NONE, 2);
    KERNEL(simgp_csc_1x1_to_1x2, 1, SIMGP_ROT_NONE, 4);
    KERNEL(simgp_csc_1x2_to_1x1, 1, SIMGP_ROT_NONE, 1);
    KERNEL(simgp_csc_1x2_to_1x1_rot_90l, 1, SIMGP_ROT_90L, 1);
    KERNEL(simgp_csc_1x2_to_1x1_rot_90r, 1, SIMGP_ROT_90R, 1);
    KERNEL(simgp_dit_8b, 1, SIMGP_ROT_NONE, 2);
    KERNEL(simgp_rot_8b_90l, 1, SIMGP_ROT_90L, 2);
    KERNEL(simgp_rot_8b_90r, 1, SIMGP_ROT_90R, 2);
    KERNEL(simgp_rot_8b_180, 1, SIMGP_ROT_180, 2);
    KERNEL(simgp_rot_8b_hori, 1, SIMGP_ROT_HORI, 2);
    KERNEL(simgp_rot_8b_vert, 1, SIMGP_ROT_VERT, 2);
    KERNEL(simgp_rot_16b_90l, 2, SIMGP_ROT_90L, 2);
    KERNEL(simgp_rot_16b_90r, 2, SIMGP_ROT_90R, 2);
    KERNEL(simgp_rot_16b_180, 2, SIMGP_ROT_180, 2);
    KERNEL(simgp_rot_16b_hori, 2, SIMGP_ROT_HORI, 2);
    KERNEL(simgp_rot_16b_vert, 2, SIMGP_ROT_VERT, 2);
#undef KERNEL

#define KERNEL(name, ...) add(#name, usual, resize_kernel, name, __VA_ARGS__)
    KERNEL(simgp_rsz_8b, 1, SIMGP_ROT_NONE);
    KERNEL(simgp_rsz_8b8b, 2, SIMGP_ROT_NONE);
    KERNEL(simgp_rsz_8b8b8b, 3, SIMGP_ROT_NONE);
    KERNEL(simgp_rsz_8b8b8b8b, 4, SIMGP_ROT_NONE);
    KERNEL(simgp_rsz_5b6b5b, 2, SIMGP_ROT_NONE);
    KERNEL(simgp_rsz_8b_rot_90l, 1, SIMGP_ROT_90L);
    KERNEL(simgp_rsz_8b_rot_90r, 1, SIMGP_ROT_90R);
    KERNEL(simgp_rsz_8b_rot_180, 1, SIMGP_ROT_180);
    KERNEL(simgp_rsz_8b8b_rot_90l, 2, SIMGP_ROT_90L);
    KERNEL(simgp_rsz_8b8b_rot_90r, 2, SIMGP_ROT_90R);
    KERNEL(simgp_rsz_8b8b_rot_180, 2, SIMGP_ROT_180);
#undef KERNEL

#define KERNEL(name, run, ...) add(#name, usual, run, name, __VA_ARGS__)
    KERNEL(simgp_rsz_csc_yuv420_to_rgb565, resize_csc_kernel, SIMGP_FMT_YUV420);
    KERNEL(simgp_rsz_csc_t64x32_to_rgb565, resize_csc_kernel, SIMGP_FMT_T64X32);
    KERNEL(simgp_dbf8x8, deblock, 0);
    KERNEL(simgp_dbf8x8_h263_hor, deblock, 0);
    KERNEL(simgp_dbf8x8_h263_ver, deblock, 0);
#undef KERNEL

    add_plain("simgp_csc", many, convert<simgp_csc>);
    add_plain("simgp_csc_any", 3 * many, convert_any);
    add_plain("simgp_csc_dither", many, convert_dithered);
    add_plain("simgp_csc_rot", usual, convert_and_turn);
    add_plain("simgp_cpy", 2 * usual, copy);
    add_plain("simgp_rot", 4 * usual, turn);
    add_plain("simgp_rsz", 4 * usual, resize);
    add_plain("simgp_rsz_rot", 4 * usual, resize_and_turn);
    add_plain("simgp_rsz_csc", 2 * usual, resize_and_convert);
    add_plain("simgp_dbf8x8_yuv", usual, deblock_picture);
    add_plain("simgp_csc_8b8b_pck", usual, pack);
    add_plain("simgp_csc_8b8b_unpck", usual, unpack);
    add_plain("simgp_csc_copy_tiles_to_linear", usual, copy_tiles);
    add_plain("simgp_csc_unpack_tiles_to_linear", usual, unpack_tiles);
    add_plain("simgp_rsz_8b_rot_90r_quarter", usual, quarter);
    add_plain("simgp_get_tile_offset", 4 * usual, tile_offset);
    add_plain("simgp_rsz_get_step", 20 * usual, get_step);
    add_plain("simgp_version", 1, version);
    add_plain("simgp_result_text", few, result_text);
    add_plain("simgp_format_name", few, format_name);
    add_plain("simgp_format_of_name", 4 * usual, format_of_name);
    add_plain("simgp_tbl_rsz_weight", 1, weights);
    add_plain("simgp_tbl_fn_csc_1x2_to_1x1_rot", few,
              PLANE_TABLE(simgp_tbl_fn_csc_1x2_to_1x1_rot, 1, 1));
    add_plain("simgp_tbl_fn_rot_8b", few, PLANE_TABLE(simgp_tbl_fn_rot_8b, 1, 2));
    add_plain("simgp_tbl_fn_rot_16b", few, PLANE_TABLE(simgp_tbl_fn_rot_16b, 2, 2));
    add_plain("simgp_tbl_fn_rsz_8b_rot", few, RESIZE_TABLE(simgp_tbl_fn_rsz_8b_rot, 1));
    add_plain("simgp_tbl_fn_rsz_8b8b_rot", few, RESIZE_TABLE(simgp_tbl_fn_rsz_8b8b_rot, 2));
}

}  // namespace tools
