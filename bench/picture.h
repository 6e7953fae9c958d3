// Pictures for the benchmarks, and comparisons of conversions between two formats.
#ifndef BENCH_PICTURE_H
#define BENCH_PICTURE_H

#include "bench/bench.h"

namespace bench {

// A descriptor with memory: planes on cache lines, lines padded to whole cache lines.
struct picture : simgp_img {
    picture(int format, int width, int height);

    std::shared_ptr<uint8_t[]> memory;  // all planes, one after the other
    size_t bytes;                       // of the planes

    int pixels() const { return width[0] * height[0]; }
};

// Fills a picture with smooth colours and a little noise. Peers that interpolate or average chroma
// then differ little from those that repeat or drop it.
void paint(const picture &p);

// Ends the program unless b shows what a shows: of each channel, the mean difference may be
// `tolerance` of 255. Both have the same format and size.
void expect_alike(const std::string &what, const picture &a, const picture &b, double tolerance);

// A part of a picture: `count` lines from line y on; y is even.
simgp_img lines(const simgp_img &p, int y, int count);

using operation = std::function<void(const simgp_img &src, const simgp_img &dst)>;

// What is made once for one pair of pictures, such as a scaler's context.
using operation_maker = std::function<operation(const simgp_img &src, const simgp_img &dst)>;

struct peer {
    std::string name;
    operation_maker make;
};

// The operation with the planes of U and V exchanged in the source, or in the destination.
operation exchange_src_chroma(const operation &f);
operation exchange_dst_chroma(const operation &f);

// A libyuv function over the first `From` planes of the source and `To` of the destination:
// pointer, stride, pointer, stride, ..., what is given in `more`, width, height.
template <int From, int To, class Function, class... More>
operation of_planes(Function *f, More... more) {
    return [=](const simgp_img &s, const simgp_img &d) {
        const auto to = [&](auto... args) {
            if constexpr (To == 1)
                f(args..., d.plane[0], d.stride[0], more..., s.width[0], s.height[0]);
            else if constexpr (To == 2)
                f(args..., d.plane[0], d.stride[0], d.plane[1], d.stride[1], more..., s.width[0],
                  s.height[0]);
            else
                f(args..., d.plane[0], d.stride[0], d.plane[1], d.stride[1], d.plane[2],
                  d.stride[2], more..., s.width[0], s.height[0]);
        };
        if constexpr (From == 1)
            to(s.plane[0], s.stride[0]);
        else if constexpr (From == 2)
            to(s.plane[0], s.stride[0], s.plane[1], s.stride[1]);
        else
            to(s.plane[0], s.stride[0], s.plane[1], s.stride[1], s.plane[2], s.stride[2]);
    };
}

// libyuv as a peer; in two steps over a band of lines that stays in the cache, where it has no
// direct way.
peer libyuv_peer(operation f);
peer libyuv_peer(operation first, int between, operation second);

// How an operation comes from one size to another.
enum class resizing { none, drops_or_repeats, interpolates };

// swscale, with whichever of its fast modes takes least time (that do no less than ours). Nothing
// where it does not know the formats, or has nothing to do.
std::vector<peer> swscale_peer(int from, int to, int extra_flags = 0, resizing how = resizing::none,
                               int32_t colour = 0);

struct size {
    int width, height;
};

// The conversion from one format to another at the usual sizes, ours by `ours`.
struct conversion {
    int from, to;
    goal goals;
    std::vector<peer> peers = {};  // besides swscale, if that is asked for
    std::string name = {};         // of itself "nv12_to_rgb565"
    operation ours = {};           // of itself simgp_csc
    std::string name_prefix = {};  // before the name that it has of itself
    int32_t colour = 0;            // SIMGP_COLOUR_*, for swscale
    double tolerance = 4;          // for peers, see expect_alike; 0: they are not held against ours
    double part_read = 1;          // of the source's bytes
    int plane = -1;                // the only one, of both, that is dealt with
    int twin_from = -1;            // the conversion from this format is to be no faster than 0.9
    // Other work of ours on the same pictures, whose speed is to be kept to this part.
    struct {
        std::string name;
        operation_maker make;
        double goal = 0;
    } twin = {};

    // The destination's size: as this says; or if the operation resizes otherwise, any that the
    // name of a size has ("64x48 to 32x24"); or that of the source.
    std::function<size(const size &from)> to_size = {};
    resizing how = resizing::none;
    std::vector<std::string> sizes = {};  // names; of itself the usual ones
    bool against_swscale = true;
    // `ours` and the peers get one picture as source and destination, as it was painted, each time.
    bool in_place = false;
};
comparison compare(conversion c);
std::vector<comparison> compare_all(const std::vector<conversion> &all);

}  // namespace bench

#endif
