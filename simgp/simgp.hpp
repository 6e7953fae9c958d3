// simgp for C++20: views of pictures, pictures that own their memory, and the library's functions
// with a check in front.
//
//     simgp::const_view frame(SIMGP_FMT_NV12, 640, 480, bytes);       // any range of bytes
//     simgp::picture screen(SIMGP_FMT_RGB565, 640, 480);
//     if (simgp::result r = simgp::csc_any(frame, screen); !r) puts(r.text());
//
// All of it is inline over simgp/describe.h and the C functions; nothing throws, and it compiles
// without exceptions and RTTI. What it costs:
//
// - A view is a descriptor and two words, about 140 bytes. It is copied as such, owns nothing, and
//   is checked when it is made.
// - A call looks at the sizes of both pictures and calls the C function; pixels are not looked at.
// - A picture allocates when it is made, once. It moves, and is not copied.
//
// A view that cannot be is empty and remembers why; calls with it do nothing but say so. So a chain
// of views needs one check, that of the call at its end.
//
// The functions are those of C without the prefix, with its arguments in its order; the C headers
// say what they do. Not checked are memory that pictures share, and whether it is still there.
#ifndef SIMGP_SIMGP_HPP
#define SIMGP_SIMGP_HPP

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <memory>
#include <new>
#include <span>
#include <type_traits>
#include <utility>

#include "simgp/simgp.h"

namespace simgp {
// The names of this interface stay apart from those inside the library.
inline namespace v1 {

// A result code of C, and in words what it means. True is success.
class [[nodiscard]] result {
  public:
    // A text of its own must be a constant.
    constexpr result(int32_t code = SIMGP_OK, const char *text = nullptr)
        : text_(text), code_(code) {}

    // Whether it is SIMGP_OK; the code; its text, of a few words of English.
    constexpr explicit operator bool() const { return code_ == SIMGP_OK; }
    constexpr int32_t code() const { return code_; }
    const char *text() const { return text_ ? text_ : simgp_result_text(code_); }

  private:
    const char *text_;  // a constant; null: that of the code
    int32_t code_;
};

// A plane: its first byte, and the bytes from one line to the next.
template <class Byte>
struct basic_plane {
    Byte *first;     // of the line that is processed first
    int32_t stride;  // in bytes; may be negative
};

// A picture in somebody else's memory. Byte is const uint8_t for sources, uint8_t for pictures
// that may be written.
template <class Byte>
class basic_view {
  public:
    // No picture.
    basic_view() = default;
    // No picture, and why: a constant text.
    static basic_view none(const char *why) {
        basic_view made;
        made.why_ = why;
        return made;
    }

    // In one piece of memory, as simgp_describe says.
    basic_view(int32_t format, int32_t width, int32_t height, std::span<Byte> memory,
               int32_t alignment = 1) {
        take(simgp_describe(&img_, format, width, height, alignment, memory.data(), memory.size(),
                            &why_));
    }
    // Of planes anywhere, as simgp_describe_planes says.
    basic_view(int32_t format, int32_t width, int32_t height,
               std::initializer_list<basic_plane<Byte>> planes) {
        basic_plane<Byte> p[3] = {};
        size_t count = 0;
        for (const basic_plane<Byte> &plane : planes)
            if (count < 3) p[count++] = plane;
        take(simgp_describe_planes(&img_, format, width, height, p[0].first, p[0].stride,
                                   p[1].first, p[1].stride, p[2].first, p[2].stride, &why_));
    }
    // Planes 0, 1 and 2 of YUV_420_888, as simgp_describe_yuv_420_888 says.
    static basic_view yuv_420_888(int32_t width, int32_t height, basic_plane<Byte> y,
                                  basic_plane<Byte> u, basic_plane<Byte> v, int32_t pixel_stride) {
        basic_view made;
        made.take(simgp_describe_yuv_420_888(&made.img_, width, height, y.first, y.stride, u.first,
                                             u.stride, v.first, v.stride, pixel_stride,
                                             &made.why_));
        return made;
    }
    // Of a descriptor that is there already.
    explicit basic_view(const simgp_img &img) : img_(img) { take(simgp_check(&img_, &why_)); }
    // A view that may write is one that reads.
    template <class Other>
    requires(std::is_const_v<Byte> && !std::is_const_v<Other>)
        basic_view(const basic_view<Other> &other)
        : img_(other.img()), why_(other ? nullptr : other.check().text()) {}

    // Whether there is a picture, and if not, why.
    explicit operator bool() const { return !why_; }
    result check() const { return why_ ? result(SIMGP_ERR_PARAM, why_) : result(); }

    // Sizes are those of the whole picture in pixels, and 0 of an empty view.
    int32_t format() const { return img_.format; }
    int32_t width() const { return img_.width[0]; }
    int32_t height() const { return img_.height[0]; }
    int planes() const { return why_ ? 0 : simgp_format_planes(img_.format); }

    // Of plane k, 0 ... planes() - 1. The bytes of its line y are the visible ones; tiled planes
    // have no lines.
    Byte *plane(int k) const { return img_.plane[k]; }
    int32_t stride(int k) const { return img_.stride[k]; }
    int32_t lines(int k) const { return simgp_plane_height(format(), k, height()); }
    std::span<Byte> line(int k, int32_t y) const {
        if (why_ || format() == SIMGP_FMT_T64X32) return {};
        return {img_.plane[k] + ptrdiff_t(y) * img_.stride[k],
                size_t(simgp_line_bytes(format(), k, width()))};
    }

    // Rows first ... first + rows - 1 as a picture, as simgp_band says.
    basic_view band(int32_t first, int32_t rows) const {
        basic_view made = *this;
        if (!why_) made.take(simgp_band(&img_, first, rows, &made.img_, &made.why_));
        return made;
    }

    // The descriptor, for the functions of C. Of a const_view, its planes must not be written.
    const simgp_img &img() const { return img_; }

  private:
    void take(int32_t result) {
        if (result == SIMGP_OK)
            why_ = nullptr;
        else
            img_ = no_img();
    }
    static constexpr simgp_img no_img() {
        simgp_img img{};
        img.format = -1;
        return img;
    }

    simgp_img img_ = no_img();
    const char *why_ = "no picture";  // null: there is one
};

// Of pictures that may be written, and of those that are only read.
using view = basic_view<uint8_t>;
using const_view = basic_view<const uint8_t>;

// How the memory of a picture goes.
struct aligned_delete {
    std::align_val_t at{16};  // how it was aligned
    // Releases p.
    void operator()(uint8_t *p) const { ::operator delete(p, at); }
};

// A picture that owns its memory, laid out as simgp_lay_out does. What it holds at first is not
// defined. It is empty if the arguments are refused or there is no memory.
class picture {
  public:
    // No picture.
    picture() = default;
    // As simgp_lay_out lays it out.
    picture(int32_t format, int32_t width, int32_t height, int32_t alignment = 64) {
        simgp_layout layout{};
        const char *why = "no memory";
        if (simgp_lay_out(&layout, format, width, height, alignment, &why) == SIMGP_OK) {
            const std::align_val_t at{alignment > 16 ? size_t(alignment) : 16};
            memory_ = {static_cast<uint8_t *>(::operator new(layout.bytes, at, std::nothrow)),
                       aligned_delete{at}};
        }
        if (memory_) {
            bytes_ = layout.bytes;
            all_ = view(format, width, height, memory(), alignment);
        } else {
            all_ = view::none(why);
        }
    }
    // Memory moves; what it came from is empty.
    picture(picture &&other) noexcept { swap(other); }
    picture &operator=(picture &&other) noexcept {
        picture old(std::move(*this));
        swap(other);
        return *this;
    }

    // Whether there is a picture, and if not, why.
    explicit operator bool() const { return bool(all_); }
    result check() const { return all_.check(); }

    // The whole of it.
    operator view() { return all_; }
    operator const_view() const { return all_; }
    view all() { return all_; }
    const_view all() const { return all_; }

    // Sizes are those of the whole picture in pixels, and 0 of an empty one.
    int32_t format() const { return all_.format(); }
    int32_t width() const { return all_.width(); }
    int32_t height() const { return all_.height(); }

    // Every byte, padding included.
    std::span<uint8_t> memory() { return {memory_.get(), bytes_}; }
    std::span<const uint8_t> memory() const { return {memory_.get(), bytes_}; }

  private:
    void swap(picture &other) noexcept {
        std::swap(memory_, other.memory_);
        std::swap(bytes_, other.bytes_);
        std::swap(all_, other.all_);
    }

    std::unique_ptr<uint8_t[], aligned_delete> memory_;
    size_t bytes_ = 0;
    view all_;
};

// What the checks in front of the calls share.
namespace checks {

// Kernels of samples of 2 and 4 bytes count strides in samples.
inline result of_strides(const simgp_img &img) {
    for (int32_t k = 0; k < simgp_format_planes(img.format); ++k) {
        const int32_t sample = simgp_plane_sample(img.format, k);
        if (img.format != SIMGP_FMT_T64X32 && sample != 3 && img.stride[k] % sample != 0)
            return {SIMGP_ERR_PARAM, "a stride is no multiple of the plane's samples"};
    }
    return {};
}
inline result of_both(const const_view &src, const const_view &dst) {
    for (const const_view *v : {&src, &dst}) {
        if (result r = v->check(); !r) return r;
        if (result r = of_strides(v->img()); !r) return r;
    }
    return {};
}
// Both, and whether the destination has the size of the source, turned.
inline result of_sizes(const const_view &src, const const_view &dst, bool turned = false) {
    if (result r = of_both(src, dst); !r) return r;
    if (dst.width() == (turned ? src.height() : src.width()) &&
        dst.height() == (turned ? src.width() : src.height()))
        return {};
    return {SIMGP_ERR_PARAM, turned ? "the destination has not the size of the turned source"
                                    : "source and destination have different sizes"};
}
inline bool is_quarter(int32_t rot) { return rot == SIMGP_ROT_90L || rot == SIMGP_ROT_90R; }
// A quarter turn makes 4:2:2 of one kind that of the other.
inline result of_turned_planes(const const_view &src, int32_t rot, int32_t to) {
    const int32_t from = src.format();
    const bool narrow = from == SIMGP_FMT_YUV422N, wide = from == SIMGP_FMT_YUV422W;
    const int32_t expected = !is_quarter(rot) ? from
                             : narrow         ? int32_t{SIMGP_FMT_YUV422W}
                             : wide           ? int32_t{SIMGP_FMT_YUV422N}
                                              : from;
    if (to == expected && !(is_quarter(rot) && from == SIMGP_FMT_YV16)) return {};
    return {SIMGP_ERR_PARAM, "the destination has not the format of the turned source"};
}
// That kernel makes one line of chroma more than such a picture has.
inline bool overflows(const const_view &src, const const_view &dst) {
    return src.format() == SIMGP_FMT_YUV420 && dst.format() == SIMGP_FMT_YUV422N &&
           src.height() % 2 != 0;
}

}  // namespace checks

// Refused besides what the C functions refuse: empty views, destinations of another size than the
// operation gives, strides that are no multiples of samples of 2 and 4 bytes.

inline result cpy(const const_view &src, const view &dst) {
    if (result r = checks::of_sizes(src, dst); !r) return r;
    return simgp_cpy(&src.img(), &dst.img());
}

// Refused: YUV420 to YUV422N at an odd height, which writes a line of chroma more than the picture
// has (layout.h); csc_any does that, too.
inline result csc(const const_view &src, const view &dst) {
    if (result r = checks::of_sizes(src, dst); !r) return r;
    if (checks::overflows(src, dst))
        return {SIMGP_ERR_PARAM, "simgp_csc writes a line of chroma more at odd heights"};
    return simgp_csc(&src.img(), &dst.img());
}

// YUV420 to YUV422N at an odd height follows the rule of csc_any.h for any colour, and stays inside
// the picture.
inline result csc_any(const const_view &src, const view &dst, int32_t colour = SIMGP_COLOUR_BT601) {
    if (result r = checks::of_sizes(src, dst); !r) return r;
    if (checks::overflows(src, dst)) colour |= SIMGP_CHROMA_MEAN;  // of which there is none
    return simgp_csc_any(&src.img(), &dst.img(), colour);
}

// Part `part` of `parts` of csc_any with that colour: with all of them done, in any order and on any threads, all of
// it is done (describe.h says of what else that holds).
inline result csc_any_part(const const_view &src, const view &dst, int32_t colour, int32_t parts,
                           int32_t part) {
    if (result r = checks::of_sizes(src, dst); !r) return r;
    if (parts < 1 || part < 0 || part >= parts) return {SIMGP_ERR_PARAM, "there is no such part"};
    const int32_t from = simgp_band_step(src.format()), to = simgp_band_step(dst.format());
    int32_t first = 0, rows = 0;
    simgp_share_rows(src.height(), from > to ? from : to, parts, part, &first, &rows);
    return rows == 0 ? result() : csc_any(src.band(first, rows), dst.band(first, rows), colour);
}

inline result csc_dither(const const_view &src, const view &dst) {
    if (result r = checks::of_sizes(src, dst); !r) return r;
    return simgp_csc_dither(&src.img(), &dst.img());
}

inline result csc_rot(const const_view &src, int32_t code, const view &dst) {
    if (result r = checks::of_sizes(src, dst, checks::is_quarter(code)); !r) return r;
    return simgp_csc_rot(&src.img(), code, &dst.img());
}

// The destination has the format of the source; after a quarter turn, YUV422N becomes YUV422W and
// the other way round, and YV16 nothing that has a name.
inline result rot(const const_view &src, int32_t code, const view &dst) {
    if (result r = checks::of_sizes(src, dst, checks::is_quarter(code)); !r) return r;
    if (result r = checks::of_turned_planes(src, code, dst.format()); !r) return r;
    return simgp_rot(&src.img(), code, &dst.img());
}

inline result rsz(const const_view &src, const view &dst) {
    if (result r = checks::of_both(src, dst); !r) return r;
    return simgp_rsz(&src.img(), &dst.img());
}

inline result rsz_csc(const const_view &src, const view &dst) {
    if (result r = checks::of_both(src, dst); !r) return r;
    return simgp_rsz_csc(&src.img(), &dst.img());
}

// Where the size is kept, this is rot, and the same formats are refused.
inline result rsz_rot(const const_view &src, int32_t code, const view &dst) {
    if (result r = checks::of_both(src, dst); !r) return r;
    if (checks::is_quarter(code) && src.width() == dst.height() && src.height() == dst.width())
        if (result r = checks::of_turned_planes(src, code, dst.format()); !r) return r;
    return simgp_rsz_rot(&src.img(), code, &dst.img());
}

// Of formats whose planes hold one sample a byte.
inline result dbf8x8_yuv(const view &img, int16_t strength) {
    if (result r = img.check(); !r) return r;
    simgp_img planes = img.img();
    for (int32_t k = 0; k < 3; ++k) {
        if (k >= img.planes())
            planes.plane[k] = nullptr;
        else if (img.format() == SIMGP_FMT_T64X32 || simgp_plane_sample(img.format(), k) != 1)
            return {SIMGP_ERR_UNSUPPORTED, "deblocking takes planes of 8-bit samples"};
    }
    return simgp_dbf8x8_yuv(&planes, strength);
}

}  // namespace v1
}  // namespace simgp

#endif
