#include "tests/operations.h"

#include <algorithm>
#include <cstring>

#include "scmn/scmn.h"
#include "simgp/simgp.h"
#include "tests/bilinear.h"
#include "tests/conversions.h"
#include "tests/irsz_kinds.h"
#include "tests/kept_planes.h"
#include "tests/turns.h"

namespace rig {

namespace {

using shapes = std::vector<plane_shape>;
using run = std::function<void(const picture &src, const picture &dst)>;

void must_be_ok(int32_t result) {
    if (result != SIMGP_OK) complain("the call was refused: " + std::to_string(result));
}

// Strides of such planes are rounded down to the unit.
plane_shape rounding(plane_shape shape, int unit) {
    shape.stride_unit = unit;
    shape.rounded = true;
    return shape;
}
plane_shape words(const size &s, int unit) {
    return rounding(samples(s.width, s.height, unit), unit);
}
// Samples whose lines advance by whole samples, unless there are three bytes in them.
plane_shape pixels(const size &s, int bytes) {
    return bytes == 3 ? samples(s.width, s.height, 3) : words(s, bytes);
}
plane_shape bytes_of(const size &s) { return samples(s.width, s.height); }

size turned_size(int rot, const size &s) { return is_quarter(rot) ? size{s.height, s.width} : s; }

// Any size about as large as this one, not empty.
size another(const size &s, const chooser &pick) {
    return {1 + pick(s.width + 3), 1 + pick(s.height + 3)};
}
size half(const size &s) { return {(s.width + 1) / 2, (s.height + 1) / 2}; }

job one_plane(const plane_shape &src, const plane_shape &dst, simgp_plane_fn *kernel) {
    return {{src}, {dst}, [=](const picture &s, const picture &d) {
                kernel(s.planes[0], s.widths[0], s.heights[0], s.strides[0], d.strides[0],
                       d.planes[0]);
            }};
}

// Conversions
// ------------------------------------------------------------------------------------

bool is_word(const format &f) { return f.pixel_bytes == 2 || f.pixel_bytes == 4; }

job conversion_job(int from, int to, bool by_kernel, const size &s, const run &convert) {
    const format &f = format_of(from), &t = format_of(to);
    job j{shapes_of(from, s.width, s.height), shapes_of(to, s.width, s.height), convert};
    if (is_word(f)) j.src[0] = rounding(j.src[0], f.pixel_bytes);
    if (is_word(t) && (f.is_rgb() || f.tiled)) j.dst[0] = rounding(j.dst[0], t.pixel_bytes);
    // Tiles have unused places; the kernels leave out some chroma at odd sizes, or write a line more.
    j.holes = t.tiled || (by_kernel && (s.width % 2 || s.height % 2));
    if (by_kernel && from == SIMGP_FMT_YUV420 && to == SIMGP_FMT_YUV422N)
        for (size_t k : {1, 2}) j.dst[k] = samples(half(s).width, 2 * half(s).height);
    return j;
}

void add_conversions(std::vector<operation> &all) {
    for (const conversion &c : conversions)
        all.push_back(
            {std::string("simgp_csc_") + c.name, "csc", [&c](const size &s, const chooser &) {
                 return conversion_job(
                     c.from, c.to, true, s,
                     [&c](const picture &a, const picture &b) { call(c.run, a, b); });
             }});
    all.push_back({"simgp_csc", "csc", [](const size &s, const chooser &pick) {
                       const conversion &c = conversions[pick(int(std::size(conversions)))];
                       return conversion_job(c.from, c.to, true, s,
                                             [&c](const picture &a, const picture &b) {
                                                 const simgp_img x = a.img(c.from), y = b.img(c.to);
                                                 must_be_ok(simgp_csc(&x, &y));
                                             });
                   }});
    all.push_back(
        {"simgp_csc_any", "csc_any", [](const size &s, const chooser &pick) {
             const int count = int(formats().size());
             const int from = formats()[size_t(pick(count))].code;
             const int to = formats()[size_t(pick(count))].code;
             const int32_t colour =
                 pick(SIMGP_COLOUR_BT2020_FULL + 1) + pick(2) * SIMGP_CHROMA_MEAN;
             const bool by_kernel = colour == SIMGP_COLOUR_BT601 && conversion_between(from, to);
             return conversion_job(from, to, by_kernel, s, [=](const picture &a, const picture &b) {
                 const simgp_img x = a.img(from), y = b.img(to);
                 must_be_ok(simgp_csc_any(&x, &y, colour));
             });
         }});
}

// Copies and layouts
// -----------------------------------------------------------------------------

plane_shape tiled(const size &s) { return shapes_of(SIMGP_FMT_T64X32, s.width, s.height)[0]; }

// A picture of one of the formats that keep theirs, each plane of any size.
int pick_format(const chooser &pick, bool with_words) {
    static const int codes[] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 50, 99, 200, 201, 250, 299};
    return codes[pick(with_words ? 16 : 12)];
}
std::vector<size> sizes_of(int code, const size &s, const chooser &pick) {
    std::vector<size> sizes;
    for (size_t k = 0; k < kept_planes(code).size(); k++)
        sizes.push_back(k == 0 ? s : pick(2) ? half(s) : another(s, pick));
    return sizes;
}
shapes planes_of(int code, const std::vector<size> &sizes) {
    shapes planes;
    for (size_t k = 0; k < sizes.size(); k++)
        planes.push_back(pixels(sizes[k], kept_planes(code)[k]));
    return planes;
}

void add_copies(std::vector<operation> &all) {
    const auto add = [&](const char *name, auto make) { all.push_back({name, "copy", make}); };
    struct {
        const char *name;
        simgp_plane_fn *kernel;
        int bytes, unit;
    } const copies[] = {{"simgp_cpy_8b", simgp_cpy_8b, 1, 1},
                        {"simgp_cpy_16b", simgp_cpy_16b, 2, 2},
                        {"simgp_cpy_24b", simgp_cpy_24b, 3, 1},
                        {"simgp_cpy_32b", simgp_cpy_32b, 4, 1}};
    for (const auto &c : copies)
        add(c.name, [c](const size &s, const chooser &) {
            const plane_shape shape = rounding(samples(s.width, s.height, c.bytes), c.unit);
            return one_plane(shape, shape, c.kernel);
        });
    add("simgp_cpy", [](const size &s, const chooser &pick) {
        const int code = pick_format(pick, true);
        const shapes planes = planes_of(code, sizes_of(code, s, pick));
        return job{planes, planes, [=](const picture &a, const picture &b) {
                       const simgp_img x = a.img(code), y = b.img(code);
                       must_be_ok(simgp_cpy(&x, &y));
                   }};
    });
    add("scmn_blk_mcpy", [](const size &s, const chooser &) {
        return job{{bytes_of(s)}, {bytes_of(s)}, [=](const picture &a, const picture &b) {
                       scmn_blk_mcpy(b.planes[0], a.planes[0], b.strides[0], a.strides[0], s.width,
                                     s.height);
                   }};
    });
    add("simgp_csc_1x2_to_1x1", [](const size &s, const chooser &) {
        return one_plane(bytes_of(s), samples(s.width, s.height / 2), simgp_csc_1x2_to_1x1);
    });
    add("simgp_csc_1x1_to_1x2", [](const size &s, const chooser &) {
        return one_plane(bytes_of(s), samples(s.width, 2 * s.height), simgp_csc_1x1_to_1x2);
    });
    add("simgp_csc_8b8b_pck", [](const size &s, const chooser &) {
        return job{{bytes_of(s), bytes_of(s)},
                   {samples(s.width, s.height, 2)},
                   [=](const picture &a, const picture &b) {
                       simgp_csc_8b8b_pck(a.planes[0], a.planes[1], s.width, s.height, a.strides[0],
                                          a.strides[1], b.strides[0], b.planes[0]);
                   }};
    });
    const auto apart = [](const size &s) {
        return shapes{samples((s.width + 1) / 2, s.height), samples(s.width / 2, s.height)};
    };
    add("simgp_csc_8b8b_unpck", [=](const size &s, const chooser &) {
        return job{{bytes_of(s)}, apart(s), [=](const picture &a, const picture &b) {
                       simgp_csc_8b8b_unpck(a.planes[0], s.width, s.height, a.strides[0],
                                            b.strides[0], b.strides[1], b.planes[0], b.planes[1]);
                   }};
    });
    add("simgp_csc_copy_tiles_to_linear", [](const size &s, const chooser &) {
        return job{{tiled(s)}, {bytes_of(s)}, [=](const picture &a, const picture &b) {
                       simgp_csc_copy_tiles_to_linear(a.planes[0], s.width, s.height, b.strides[0],
                                                      b.planes[0]);
                   }};
    });
    add("simgp_csc_unpack_tiles_to_linear", [=](const size &s, const chooser &) {
        return job{{tiled(s)}, apart(s), [=](const picture &a, const picture &b) {
                       simgp_csc_unpack_tiles_to_linear(a.planes[0], s.width, s.height,
                                                        b.strides[0], b.planes[0], b.strides[1],
                                                        b.planes[1]);
                   }};
    });
}

// Fills of as many bytes or words as the sizes of a sweep give, from 0 on.
void add_fills(std::vector<operation> &all) {
    using fill = void(void *, uint32_t, int32_t);
    struct {
        const char *name;
        fill *call;
        int block, unit, least;
        bool tail;
    } const fills[] = {
        {"scmn_mset_x128", scmn_mset_x128, 128, 1, 128, false},
        {"scmn_mset_x64", scmn_mset_x64, 128, 1, 0, false},
        {"scmn_mset_x64a", scmn_mset_x64a, 64, 1, 0, true},
        {"scmn_mset_x32", scmn_mset_x32, 32, 1, 0, false},
        {"scmn_mset_x32ax4", scmn_mset_x32ax4, 32, 1, 0, true},
        {"scmn_mclr_x64", [](void *p, uint32_t, int32_t n) { scmn_mclr_x64(p, n); }, 64, 4, 0,
         false},
    };
    for (const auto &f : fills)
        all.push_back(
            {f.name, "fill", [f](const size &s, const chooser &pick) {
                 const int32_t count = s.width + 130 * std::max(0, s.height - 1);
                 const uint32_t value = uint32_t(pick(65536)) * 65521u;
                 // x128 alone rounds up.
                 const int whole = (count + (f.least ? f.block - 1 : 0)) / f.block * f.block;
                 const int bytes = std::max(f.least, f.tail ? count : whole * f.unit);
                 return job{{}, {samples(bytes, 1)}, [=](const picture &, const picture &d) {
                                f.call(d.planes[0], value, count);
                            }};
             }});
}

// Dithering
// -------------------------------------------------------------------------------------

struct dithering {
    const char *name;
    simgp_csc_fn *kernel;
    int from, to;
};
#define DITHERING(from, to, name) \
    { "simgp_csc_" #name "_dither", simgp_csc_##name##_dither, SIMGP_FMT_##from, SIMGP_FMT_##to }
const dithering ditherings[] = {
    DITHERING(YUV400, RGB565, yuv400_to_rgb565),   DITHERING(YUV420, RGB565, yuv420_to_rgb565),
    DITHERING(YUV420, BGR565, yuv420_to_bgr565),   DITHERING(YUV422N, RGB565, yuv422n_to_rgb565),
    DITHERING(YUV422N, BGR565, yuv422n_to_bgr565), DITHERING(YUV422W, RGB565, yuv422w_to_rgb565),
    DITHERING(YUV422W, BGR565, yuv422w_to_bgr565), DITHERING(YUV444, RGB565, yuv444_to_rgb565),
    DITHERING(YUV444, BGR565, yuv444_to_bgr565),
};
#undef DITHERING

// The destination has lines of any length, behind the last pixel too. What belongs to no pixel of the
// last two lines may change, and is wiped.
job dithering_job(int from, int to, const size &s, const chooser &pick,
                  const std::function<void(const picture &, simgp_img)> &convert) {
    const int32_t line = 2 * s.width + (pick(2) ? pick(40) : 0), height = s.height;
    const bool bottom_up = pick(4) == 0;
    return {shapes_of(from, s.width, s.height),
            {samples(line * height, 1)},
            [=](const picture &a, const picture &b) {
                uint8_t *const memory = b.planes[0];
                const auto row = [=](int y) {
                    return memory + ptrdiff_t(bottom_up ? height - 1 - y : y) * line;
                };
                simgp_img img = b.img(to);
                img.plane[0] = height ? row(0) : memory;
                img.stride[0] = bottom_up ? -line : line;
                convert(a, img);
                for (int y = std::max(0, height - 2); y < height; y++)
                    memset(row(y) + 2 * s.width, 0, size_t(line - 2 * s.width));
            },
            nullptr,
            true};
}

void add_dithering(std::vector<operation> &all) {
    all.push_back({"simgp_dit_8b", "dither", [](const size &s, const chooser &) {
                       return one_plane(bytes_of(s), bytes_of(s), simgp_dit_8b);
                   }});
    for (const dithering &d : ditherings)
        all.push_back({d.name, "dither", [d](const size &s, const chooser &pick) {
                           return dithering_job(d.from, d.to, s, pick,
                                                [=](const picture &a, const simgp_img &to) {
                                                    d.kernel(a.planes, a.widths, a.heights,
                                                             a.strides, to.stride, to.plane);
                                                });
                       }});
    all.push_back({"simgp_csc_dither", "dither", [](const size &s, const chooser &pick) {
                       const int which = pick(int(std::size(ditherings)) + 3);
                       if (which == int(std::size(ditherings)))
                           return conversion_job(SIMGP_FMT_YUV420, SIMGP_FMT_YUV420, false, s,
                                                 [](const picture &a, const picture &b) {
                                                     const simgp_img x = a.img(SIMGP_FMT_YUV420),
                                                                     y = b.img(SIMGP_FMT_YUV420);
                                                     must_be_ok(simgp_csc_dither(&x, &y));
                                                 });
                       dithering d{"", nullptr, SIMGP_FMT_YV12, SIMGP_FMT_RGB565};
                       if (which < int(std::size(ditherings)))
                           d = ditherings[which];
                       else if (which % 2)
                           d.to = SIMGP_FMT_BGR565;
                       return dithering_job(d.from, d.to, s, pick,
                                            [=](const picture &a, const simgp_img &to) {
                                                const simgp_img x = a.img(d.from);
                                                must_be_ok(simgp_csc_dither(&x, &to));
                                            });
                   }});
}

// Turns
// ----------------------------------------------------------------------------------------

const char *const turn_names[] = {"none", "90l", "90r", "180", "hori", "vert"};

shapes turned_planes(int rot, shapes planes) {
    for (plane_shape &p : planes) p = pixels(turned_size(rot, {p.width, p.height}), p.sample_bytes);
    return planes;
}

void add_turns(std::vector<operation> &all) {
    for (int bytes : {1, 2})
        for (int rot = SIMGP_ROT_90L; rot <= SIMGP_ROT_VERT; rot++)
            all.push_back({"simgp_rot_" + std::to_string(8 * bytes) + "b_" + turn_names[rot],
                           "turn", [=](const size &s, const chooser &) {
                               const shapes plane = {pixels(s, bytes)};
                               return one_plane(
                                   plane[0], turned_planes(rot, plane)[0],
                                   (bytes == 1 ? simgp_tbl_fn_rot_8b : simgp_tbl_fn_rot_16b)[rot]);
                           }});
    all.push_back({"simgp_rot", "turn", [](const size &s, const chooser &pick) {
                       const int code = pick_format(pick, true), rot = pick(6);
                       const shapes planes = planes_of(code, sizes_of(code, s, pick));
                       return job{planes, turned_planes(rot, planes),
                                  [=](const picture &a, const picture &b) {
                                      const simgp_img x = a.img(code), y = b.img(code);
                                      must_be_ok(simgp_rot(&x, rot, &y));
                                  }};
                   }});
    for (int rot : {SIMGP_ROT_90L, SIMGP_ROT_90R})
        all.push_back({std::string("simgp_csc_1x2_to_1x1_rot_") + turn_names[rot], "turn",
                       [=](const size &s, const chooser &) {
                           return one_plane(bytes_of(s), samples(s.height / 2, s.width),
                                            simgp_tbl_fn_csc_1x2_to_1x1_rot[rot]);
                       }});
    all.push_back({"simgp_csc_rot", "turn", [](const size &s, const chooser &pick) {
                       const bool from_v = pick(2), to_v = pick(2);
                       const int from = from_v ? SIMGP_FMT_YV16 : SIMGP_FMT_YUV422N;
                       const int to = to_v ? SIMGP_FMT_YV12 : SIMGP_FMT_YUV420;
                       const int rot = pick(3);
                       shapes src = {bytes_of(s)}, dst = turned_planes(rot, src);
                       for (int k = 0; k < 2; k++) {
                           src.push_back(pick(2) ? samples(half(s).width, s.height)
                                                 : bytes_of(another(s, pick)));
                           const plane_shape &c = src.back();
                           const size kept = turned_size(rot, {c.width, c.height / 2});
                           dst.insert(dst.begin() + (from_v != to_v ? 1 : 1 + k), bytes_of(kept));
                       }
                       return job{src, dst, [=](const picture &a, const picture &b) {
                                      const simgp_img x = a.img(from), y = b.img(to);
                                      must_be_ok(simgp_csc_rot(&x, rot, &y));
                                  }};
                   }});
}

// Resizing
// --------------------------------------------------------------------------------------

// Something that becomes `to`: about as large, half, double, much more, or anything.
int source_length(int to, const chooser &pick) {
    switch (pick(8)) {
        case 0:
            return to;
        case 1:
            return (to + 1) / 2;
        case 2:
            return 2 * to;
        case 3:
            return to + 1;
        case 4:
            return std::max(1, to - 1);
        case 5:
            return to * (3 + pick(20)) + pick(3);
        default:
            return 1 + pick(2 * to + 2);
    }
}
size source_size(const size &to, const chooser &pick) {
    const int width = source_length(to.width, pick);
    return {width, source_length(to.height, pick)};
}
size not_empty(const size &s) { return {std::max(1, s.width), std::max(1, s.height)}; }

// A plane of which no more is there than the samples of a resize need.
plane_shape needed(const size &from, const size &to, int bytes) {
    const spread across(from.width, to.width), down(from.height, to.height);
    return pixels({across.behind(to.width - 1) + 1, down.behind(to.height - 1) + 1}, bytes);
}

job resize_job(simgp_rsz_fn *kernel, int bytes, int rot, const size &to, const chooser &pick) {
    const size from = source_size(to, pick), after = turned_size(rot, to);
    int32_t across = 0, down = 0;
    simgp_rsz_get_step(from.width, from.height, after.width, after.height, rot, &across, &down);
    return {
        {needed(from, to, bytes)}, {pixels(after, bytes)}, [=](const picture &a, const picture &b) {
            kernel(a.planes[0], a.strides[0], after.width, after.height, b.strides[0], b.planes[0],
                   across, down);
        }};
}

// Pictures, plane by plane. If the first one keeps its size, all do.
job resize_picture_job(int code, const std::vector<int> &bytes, int rot, const size &to,
                       const chooser &pick,
                       const std::function<int32_t(const simgp_img *, const simgp_img *)> &resize) {
    shapes src, dst;
    const bool kept = pick(8) == 0;
    for (size_t k = 0; k < bytes.size(); k++) {
        const size after = k == 0 ? to : pick(2) ? half(to) : another(to, pick);
        size from = kept ? after : source_size(after, pick);
        if (!kept && k == 0 && from.width == after.width && from.height == after.height)
            from.width++;
        src.push_back(pixels(from, bytes[k]));
        dst.push_back(pixels(turned_size(rot, after), bytes[k]));
        // simgp_rsz copies all but 16-bit RGB as bytes.
        if (kept && !rot && code / 100 != 2) src[k].rounded = dst[k].rounded = false;
    }
    return {src, dst, [=](const picture &a, const picture &b) {
                const simgp_img x = a.img(code), y = b.img(code);
                must_be_ok(resize(&x, &y));
            }};
}

void add_resizing(std::vector<operation> &all) {
    struct {
        const char *name;
        simgp_rsz_fn *kernel;
        int bytes;
    } const kernels[] = {{"simgp_rsz_8b", simgp_rsz_8b, 1},
                         {"simgp_rsz_8b8b", simgp_rsz_8b8b, 2},
                         {"simgp_rsz_8b8b8b", simgp_rsz_8b8b8b, 3},
                         {"simgp_rsz_8b8b8b8b", simgp_rsz_8b8b8b8b, 4},
                         {"simgp_rsz_5b6b5b", simgp_rsz_5b6b5b, 2}};
    for (const auto &k : kernels)
        all.push_back({k.name, "resize", [k](const size &s, const chooser &pick) {
                           return resize_job(k.kernel, k.bytes, 0, not_empty(s), pick);
                       }});
    all.push_back({"simgp_rsz", "resize", [](const size &s, const chooser &pick) {
                       static const int codes[] = {200, 201, 400, 401, 500, 501, 502, 503};
                       const int which = pick(16);
                       const int code = which < 8 ? codes[which] : pick_format(pick, false);
                       std::vector<int> bytes = kept_planes(code);
                       if (code >= 400) bytes = {code >= 500 ? 4 : 3};
                       return resize_picture_job(code, bytes, 0, not_empty(s), pick, simgp_rsz);
                   }});

    for (int rot = SIMGP_ROT_90L; rot <= SIMGP_ROT_180; rot++)
        for (int bytes : {1, 2})
            all.push_back({std::string(bytes == 1 ? "simgp_rsz_8b_rot_" : "simgp_rsz_8b8b_rot_") +
                               turn_names[rot],
                           "resize_rot", [=](const size &s, const chooser &pick) {
                               return resize_job((bytes == 1 ? simgp_tbl_fn_rsz_8b_rot
                                                             : simgp_tbl_fn_rsz_8b8b_rot)[rot],
                                                 bytes, rot, not_empty(s), pick);
                           }});
    all.push_back(
        {"simgp_rsz_8b_rot_90r_quarter", "resize_rot", [](const size &s, const chooser &) {
             return job{{samples(2 * s.height, 2 * s.width)},
                        {bytes_of(s)},
                        [=](const picture &a, const picture &b) {
                            simgp_rsz_8b_rot_90r_quarter(a.planes[0], a.strides[0], s.width,
                                                         s.height, b.strides[0], b.planes[0]);
                        }};
         }});
    all.push_back({"simgp_rsz_rot", "resize_rot", [](const size &s, const chooser &pick) {
                       const int code = pick_format(pick, false), rot = pick(4);
                       return resize_picture_job(code, kept_planes(code), rot, not_empty(s), pick,
                                                 [=](const simgp_img *a, const simgp_img *b) {
                                                     return simgp_rsz_rot(a, rot, b);
                                                 });
                   }});

    const auto to_rgb565 = [](int from, simgp_rsz_csc_fn *kernel, const size &s,
                              const chooser &pick) {
        const size to = not_empty(s), of = source_size(to, pick);
        job j{shapes_of(from, of.width, of.height),
              {words(to, 2)},
              [=](const picture &a, const picture &b) {
                  if (kernel)
                      return kernel(a.planes, a.widths, a.heights, a.strides, b.widths, b.heights,
                                    b.strides, b.planes);
                  const simgp_img x = a.img(from), y = b.img(SIMGP_FMT_RGB565);
                  must_be_ok(simgp_rsz_csc(&x, &y));
              }};
        if (from == SIMGP_FMT_YUV420 && pick(4) == 0)
            j.src[1] = j.src[2] = bytes_of(another(of, pick));
        return j;
    };
    all.push_back(
        {"simgp_rsz_csc_yuv420_to_rgb565", "resize_csc", [=](const size &s, const chooser &pick) {
             return to_rgb565(SIMGP_FMT_YUV420, simgp_rsz_csc_yuv420_to_rgb565, s, pick);
         }});
    all.push_back(
        {"simgp_rsz_csc_t64x32_to_rgb565", "resize_csc", [=](const size &s, const chooser &pick) {
             return to_rgb565(SIMGP_FMT_T64X32, simgp_rsz_csc_t64x32_to_rgb565, s, pick);
         }});
    all.push_back({"simgp_rsz_csc", "resize_csc", [=](const size &s, const chooser &pick) {
                       return to_rgb565(pick(2) ? SIMGP_FMT_T64X32 : SIMGP_FMT_YUV420, nullptr, s,
                                        pick);
                   }});
}

// The line-based resizer
// ------------------------------------------------------------------------

struct line_call {
    const irsz_kind *kind;
    size from, to;
    spread across, down;

    void run_full(const picture &a, const picture &b) const {
        kind->full(a.planes[0], int32_t(a.strides[0] / kind->unit), to.width, to.height,
                   int32_t(b.strides[0] / kind->unit), b.planes[0], across.packed(), down.packed());
    }
    void run_lines(const picture &a, const picture &b) const {
        for (int j = 0; j < to.height; j++) {
            const int fy = down.eighths(j);
            const void *const lines[] = {a.row(0, down.before(j)),
                                         fy ? a.row(0, down.behind(j)) : nullptr};
            kind->line(lines, tbl_rsz_weight + 4 * fy, to.width, across.shift, 1 << across.shift,
                       int32_t(across.step), b.row(0, j));
        }
    }
    // In bands of so many lines in turn, or, without any, as a whole.
    void run_object(const picture &a, const picture &b, const std::vector<int> &bands,
                    scmn_irsz_fn *entry) const {
        const scmn_irsz_param param{kind->format,
                                    bands.empty() ? SCMN_IRSZ_FULL : SCMN_IRSZ_LINE,
                                    from.width,
                                    from.height,
                                    a.strides[0] / kind->src_bytes,
                                    16,
                                    to.width,
                                    to.height,
                                    b.strides[0] / kind->dst_bytes,
                                    b.planes[0]};
        int32_t error = 1;
        scmn_irsz_ctx *const resizer = scmn_irsz_create(&param, &error);
        if (!resizer || error) return complain("no resizer");
        if (bands.empty()) entry(resizer, a.planes[0], 0, 0);
        size_t turn = 0;
        // The source has no more lines than are needed.
        const int last = int(a.parts[0].shape().rows);
        for (int line = 0; !bands.empty() && line < last;) {
            const int lines = std::min(bands[turn++ % bands.size()], last - line);
            entry(resizer, a.row(0, line), line, lines);
            line += lines;
        }
        if (!bands.empty() && (resizer->row != to.height || resizer->carry))
            complain("rows are missing");
        scmn_irsz_delete(resizer);
    }
};

void add_line_resizer(std::vector<operation> &all) {
    enum class way { full, lines, object };
    const auto add = [&](const std::string &name, const irsz_kind *kind, way how) {
        all.push_back(
            {name, "irsz", [=](const size &s, const chooser &pick) {
                 const irsz_kind &k = kind ? *kind : irsz_kinds[pick(int(std::size(irsz_kinds)))];
                 const size to = not_empty(s), from = source_size(to, pick);
                 const line_call c{&k, from, to, {from.width, to.width}, {from.height, to.height}};
                 plane_shape src = needed(from, to, k.src_bytes),
                             dst = samples(to.width, to.height, k.dst_bytes);
                 src.stride_unit = k.src_bytes, dst.stride_unit = k.dst_bytes;
                 src.rounded = false;
                 job j{{src}, {dst}, nullptr};
                 if (how == way::full)
                     j.run = [=](const picture &a, const picture &b) { c.run_full(a, b); };
                 if (how == way::lines)
                     j.run = [=](const picture &a, const picture &b) { c.run_lines(a, b); };
                 if (how == way::object) {
                     std::vector<int> bands(size_t(pick(5)));
                     for (int &band : bands) band = 1 + pick(pick(2) ? 3 : 40);
                     scmn_irsz_fn *const entry = kind ? k.entry : scmn_irsz;
                     j.run = [=](const picture &a, const picture &b) {
                         c.run_object(a, b, bands, entry);
                     };
                 }
                 // However it comes, it is the picture that is made as a whole.
                 if (how != way::full)
                     j.reference = [=](const picture &a, const picture &b) {
                         const forced scalar(all_targets()[0]);
                         c.run_full(a, b);
                     };
                 return j;
             }});
    };
    for (const irsz_kind &k : irsz_kinds) {
        const std::string name = std::string("scmn_irsz") + k.name;
        add(name + "_full", &k, way::full);
        add(name + "_line", &k, way::lines);
        add(name, &k, way::object);
    }
    add("scmn_irsz", nullptr, way::object);
}

// Deblocking
// ------------------------------------------------------------------------------------

void add_deblocking(std::vector<operation> &all) {
    using filter = void(uint8_t *, int16_t, int32_t, int32_t, int32_t);
    struct {
        const char *name;
        filter *call;
    } const filters[] = {{"simgp_dbf8x8", simgp_dbf8x8},
                         {"simgp_dbf8x8_h263_hor", simgp_dbf8x8_h263_hor},
                         {"simgp_dbf8x8_h263_ver", simgp_dbf8x8_h263_ver}};
    static const int16_t strengths[] = {INT16_MIN, -1,  0,   1,   2,   12,       13,
                                        16,        100, 159, 160, 161, INT16_MAX};
    for (const auto &f : filters)
        all.push_back(
            {f.name, "deblock", [f](const size &s, const chooser &pick) {
                 const int which = pick(26);
                 const int16_t strength = which < 13 ? strengths[which] : int16_t(which - 12);
                 return job{{},
                            {bytes_of(s)},
                            [=](const picture &, const picture &p) {
                                f.call(p.planes[0], strength, p.strides[0], s.width, s.height);
                            },
                            nullptr,
                            false,
                            true};
             }});
    all.push_back({"simgp_dbf8x8_yuv", "deblock", [](const size &s, const chooser &pick) {
                       const int16_t strength = int16_t(pick(16));
                       const int missing = pick(8);
                       shapes planes = {bytes_of(s), bytes_of(half(s)), bytes_of(another(s, pick))};
                       return job{{},
                                  planes,
                                  [=](const picture &, const picture &p) {
                                      simgp_img img = p.img(-7);
                                      for (int k = 0; k < 3; k++)
                                          if (missing >> k & 1) img.plane[k] = nullptr;
                                      must_be_ok(simgp_dbf8x8_yuv(&img, strength));
                                  },
                                  nullptr,
                                  false,
                                  true};
                   }});
}

// Key frames
// ------------------------------------------------------------------------------------

void add_key_frames(std::vector<operation> &all) {
    all.push_back(
        {"scmn_is_vkeyfrm", "keyframe", [](const size &s, const chooser &pick) {
             const int32_t length = s.width + 130 * std::max(0, s.height - 1);
             const int32_t type = 100 + pick(14);
             std::vector<std::pair<int, int>> codes(size_t(pick(4)));
             static const uint8_t kinds[] = {0xB6, 0x65, 0x41, 0x67, 0x80, 0x82, 0x09, 0x00};
             for (auto &[at, kind] : codes) at = pick(std::max(1, length)), kind = pick(8);
             job j{
                 {samples(length, 1)}, {samples(1, 1, 4)}, [=](const picture &a, const picture &b) {
                     const int32_t is = scmn_is_vkeyfrm(type, a.planes[0], length);
                     memcpy(b.planes[0], &is, 4);
                 }};
             j.season = [=](const picture &a) {
                 for (const auto &[at, kind] : codes)
                     for (int i = 0; i < 4 && at + i < length; i++)
                         a.row(0, 0)[at + i] = i == 3 ? kinds[kind] : i == 2;
             };
             return j;
         }});
}

// Any code
// --------------------------------------------------------------------------------------

void add_empty_calls(std::vector<operation> &all) {
    using call = std::function<int32_t(const simgp_img *, int32_t, const simgp_img *)>;
    const auto add = [&](const char *name, const call &entry) {
        all.push_back(
            {name, "empty", [=](const size &, const chooser &pick) {
                 static const int32_t nothing[] = {0, -1, INT32_MIN, -64};
                 static const int32_t something[] = {0, 1, 64, INT32_MAX, -1, INT32_MIN};
                 simgp_img a{}, b{};
                 for (simgp_img *img : {&a, &b}) {
                     const int which = pick(32);
                     const int codes = int(formats().size());
                     img->format = which < codes ? formats()[size_t(which)].code
                                   : which < 28  ? pick(600) - 4
                                                 : int32_t(uint32_t(pick(65536)) * 65521u);
                     for (int k = 0; k < 4; k++) {
                         img->plane[k] = reinterpret_cast<uint8_t *>(uintptr_t(16));
                         img->width[k] = nothing[pick(4)], img->height[k] = something[pick(6)];
                         if (pick(2)) std::swap(img->width[k], img->height[k]);
                         img->stride[k] = something[pick(6)];
                     }
                 }
                 if (pick(4) == 0) b.format = a.format;
                 const int32_t code = pick(8) ? pick(8) : int32_t(uint32_t(pick(65536)) * 65521u);
                 return job{{}, {samples(1, 1, 4)}, [=](const picture &, const picture &d) {
                                const int32_t result = entry(&a, code, &b);
                                memcpy(d.planes[0], &result, 4);
                            }};
             }});
    };
    using img = const simgp_img *;
    add("simgp_csc", [](img a, int32_t, img b) { return simgp_csc(a, b); });
    add("simgp_csc_any", [](img a, int32_t n, img b) {
        return simgp_csc_any(a, b, n ^ (n & 8 ? SIMGP_CHROMA_MEAN | 8 : 0));
    });
    add("simgp_csc_dither", [](img a, int32_t, img b) { return simgp_csc_dither(a, b); });
    add("simgp_csc_rot", [](img a, int32_t n, img b) { return simgp_csc_rot(a, n, b); });
    add("simgp_cpy", [](img a, int32_t, img b) { return simgp_cpy(a, b); });
    add("simgp_rot", [](img a, int32_t n, img b) { return simgp_rot(a, n, b); });
    add("simgp_rsz", [](img a, int32_t, img b) { return simgp_rsz(a, b); });
    add("simgp_rsz_rot", [](img a, int32_t n, img b) { return simgp_rsz_rot(a, n, b); });
    add("simgp_rsz_csc", [](img a, int32_t, img b) { return simgp_rsz_csc(a, b); });
    add("simgp_dbf8x8_yuv", [](img a, int32_t n, img) { return simgp_dbf8x8_yuv(a, int16_t(n)); });
}

}  // namespace

const std::vector<operation> &operations() {
    static const std::vector<operation> all = [] {
        std::vector<operation> list;
        add_conversions(list);
        add_copies(list);
        add_fills(list);
        add_dithering(list);
        add_turns(list);
        add_resizing(list);
        add_line_resizer(list);
        add_deblocking(list);
        add_key_frames(list);
        return list;
    }();
    return all;
}

const std::vector<operation> &empty_calls() {
    static const std::vector<operation> all = [] {
        std::vector<operation> list;
        add_empty_calls(list);
        return list;
    }();
    return all;
}

}  // namespace rig
