#include "tools/step.h"

#include <algorithm>
#include <utility>
#include <vector>

#include "tools/fault.h"

namespace tools {

namespace {

size_t index(const pixel_format &format) { return size_t(&format - formats().data()); }

bool v_first(const pixel_format &format) {
    return format.plane_count == 3 && format.channels[1].plane == 2;
}

int32_t call(method how, int code, const simgp_img &src, simgp_img dst) {
    switch (how) {
        case method::csc:
            // Grey has one meaning, also in 16 bits, and so has the matrix: where simgp_csc has rules of
            // its own (grey that is not expanded, a coarse matrix), the flag leads to the common one.
            if (src.format == SIMGP_FMT_YUV400 || src.format == SIMGP_FMT_NV21)
                code |= SIMGP_CHROMA_MEAN;
            return simgp_csc_any(&src, &dst, code);
        case method::dither:
            return simgp_csc_dither(&src, &dst);
        case method::deblock:
            return simgp_dbf8x8_yuv(&src, int16_t(code));
        case method::resize:
            return simgp_rsz(&src, &dst);
        case method::resize_csc:
            return simgp_rsz_csc(&src, &dst);
        case method::csc_turn:
            return simgp_csc_rot(&src, code, &dst);
        default:
            break;
    }
    // Turns go plane by plane and know nothing of what becomes of the format: chroma goes to the
    // planes of the format that it makes.
    if (v_first(format_coded(src.format)) != v_first(format_coded(dst.format))) {
        std::swap(dst.plane[1], dst.plane[2]);
        std::swap(dst.stride[1], dst.stride[2]);
    }
    dst.format = src.format;
    return how == method::resize_turn ? simgp_rsz_rot(&src, code, &dst)
                                      : simgp_rot(&src, code, &dst);
}

void check(int32_t result, const picture &src, const picture &dst) {
    if (result != SIMGP_OK)
        throw fault("the library refuses ", src.format().name, " -> ", dst.format().name,
                    ": result ", result);
}

// True if a tiled picture has room for the chroma of an odd last line: unless the chroma line would
// begin a tile row of its own, it lies in the last one.
bool tiles_hold_last_chroma(int height) { return height % 2 == 0 || (height >> 1) % 32 != 0; }

// Lets the line behind the last one hold the same, where lines of pixels have lines of their own.
void repeat_last_line(picture &p) {
    for (int k = 0; k < p.planes(); ++k)
        if (p.format().planes[k].y_shift == 0)
            std::copy_n(p.line(k, p.height() - 1), p.line_bytes(k), p.line(k, p.height()));
}

// Converts one picture, of which every last odd column and line gets chroma of its own. From RGB in
// BT.601, without means, some kernels of the library leave it out, and tiles have no line for it:
// these are given the next even size. Between YUV formats each colour has the same result, but
// BT.601 leaves it out there as well.
void convert(int32_t colour, picture &src, picture &dst) {
    const pixel_format &from = src.format(), &to = dst.format();
    if (!from.is_rgb() && !to.is_rgb()) colour = SIMGP_COLOUR_BT709 | (colour & SIMGP_CHROMA_MEAN);
    const bool left_out = from.is_rgb() && !to.is_rgb() && colour == SIMGP_COLOUR_BT601;
    const bool even_height = to.is_tiled() ? tiles_hold_last_chroma(src.height()) : left_out;
    if (even_height && src.height() % 2) repeat_last_line(src);
    check(call(method::csc, colour, src.descriptor(left_out, even_height), dst.descriptor()), src,
          dst);
}

// Given the next even size, nothing is left out.
void dither(picture &src, picture &dst) {
    const bool even = !dst.format().is_rgb();
    check(call(method::dither, 0, src.descriptor(even, even), dst.descriptor()), src, dst);
}

// A plane of bytes in memory.
struct byte_plane {
    uint8_t *first;
    int width, height, stride;
};

// Calls work(from, to) for planes of bytes: for those of the pictures, or, where samples have
// several bytes, for each of these bytes, taken apart and put together again.
template <class Work>
void work_by_bytes(picture &src, picture &dst, Work work) {
    const simgp_img in = src.descriptor(), out = dst.descriptor();
    const auto plane = [](const simgp_img &img, int k) {
        return byte_plane{img.plane[k], img.width[k], img.height[k], img.stride[k]};
    };
    for (int k = 0; k < src.planes(); ++k) {
        const bool exchanged = k > 0 && v_first(src.format()) != v_first(dst.format());
        const byte_plane from = plane(in, k), to = plane(out, exchanged ? 3 - k : k);
        const int bytes = src.format().planes[k].bytes;
        if (bytes == 1) {
            work(from, to);
            continue;
        }
        const pixel_format &grey = format_coded(SIMGP_FMT_YUV400);
        picture before({&grey, from.width, from.height}), after({&grey, to.width, to.height});
        for (int b = 0; b < bytes; ++b) {
            for (int y = 0; y < from.height; ++y)
                for (int x = 0; x < from.width; ++x)
                    before.line(0, y)[x] = src.line(k, y)[bytes * x + b];
            work(plane(before.descriptor(), 0), plane(after.descriptor(), 0));
            for (int y = 0; y < to.height; ++y)
                for (int x = 0; x < to.width; ++x)
                    dst.line(k, y)[bytes * x + b] = after.line(0, y)[x];
        }
    }
}

}  // namespace

const pixel_format &turned(const pixel_format &format, int turn) {
    if (!is_quarter(turn) || format.kind != pixel_format::family::planar) return format;
    if (format.code == SIMGP_FMT_YUV422W) return format_coded(SIMGP_FMT_YUV422N);
    if (format.code == SIMGP_FMT_YUV422N || format.code == SIMGP_FMT_YV16)
        return format_coded(SIMGP_FMT_YUV422W);
    return format;
}

bool offered(const pixel_format &from, const pixel_format &to, method how, int turn) {
    const std::span<const pixel_format> all = formats();
    const bool planar = from.kind == pixel_format::family::planar;
    switch (how) {
        case method::csc:
            if (&from == &to) return false;
            break;
        case method::deblock:  // takes every plane for one of bytes, whatever the format
            return planar && &from == &to &&
                   std::all_of(from.planes, from.planes + from.plane_count,
                               [](const plane_shape &p) { return p.bytes == 1; });
        case method::turn_bytes:
            return from.kind == pixel_format::family::rgb && &from == &to;
        case method::thumbnail:
            return (planar || from.is_rgb()) && &to == &turned(from, SIMGP_ROT_90R);
        case method::turn:
        case method::resize_turn:
            if (&to != &turned(from, turn)) return false;
            break;
        default:
            break;
    }
    constexpr size_t turns = SIMGP_ROT_VERT + 1;
    static std::vector<signed char> known(size_t(method::count) * turns * all.size() * all.size());
    signed char &answer =
        known[((size_t(how) * turns + size_t(turn)) * all.size() + index(from)) * all.size() +
              index(to)];
    if (answer == 0) {  // not asked
        const bool smaller =
            how == method::resize || how == method::resize_csc || how == method::resize_turn;
        const int size = smaller ? 4 : 8;
        picture src({&from, 8, 8}), dst({&to, size, size});
        answer = call(how, turn, src.descriptor(), dst.descriptor()) == SIMGP_OK ? 1 : -1;
    }
    return answer > 0;
}

step::step(method how, const picture_shape &to, int code) : how_(how), to_(to), code_(code) {
    if (how != method::deblock) made_ = picture(to);
}

picture &step::run(picture &from) {
    switch (how_) {
        case method::csc:
            convert(code_, from, made_);
            break;
        case method::dither:
            dither(from, made_);
            break;
        case method::turn_bytes:
            work_by_bytes(from, made_, [this](const byte_plane &src, const byte_plane &dst) {
                simgp_tbl_fn_rot_8b[code_](src.first, src.width, src.height, src.stride, dst.stride,
                                           dst.first);
            });
            break;
        case method::thumbnail:
            work_by_bytes(from, made_, [](const byte_plane &src, const byte_plane &dst) {
                simgp_rsz_8b_rot_90r_quarter(src.first, src.stride, dst.width, dst.height,
                                             dst.stride, dst.first);
            });
            break;
        case method::deblock:
            check(call(how_, code_, from.descriptor(), {}), from, from);
            return from;
        default:
            check(call(how_, code_, from.descriptor(), made_.descriptor()), from, made_);
    }
    return made_;
}

std::string step::note() const {
    const auto turning = [this](const char *how) {
        return std::string(how).append(turn_names[code_]);
    };
    switch (how_) {
        case method::dither:
            return "dithered";
        case method::deblock:
            return std::string("simgp_dbf8x8_yuv ").append(std::to_string(code_));
        case method::resize:
            return "simgp_rsz";
        case method::resize_csc:
            return "simgp_rsz_csc";
        case method::resize_turn:
            return turning("simgp_rsz_rot ");
        case method::turn:
            return turning("simgp_rot ");
        case method::csc_turn:
            return turning("simgp_csc_rot ");
        case method::turn_bytes:
            return turning("byte by byte, simgp_rot_8b_");
        case method::thumbnail:
            return "simgp_rsz_8b_rot_90r_quarter";
        default:
            return {};
    }
}

}  // namespace tools
