// Stores that bypass the cache, against the library's own: whether frames should be written so, for
// somebody who reads them next. No kernel has such stores; lines that a kernel has written into a
// small buffer are moved on by them, which is what they cost at most one read of that buffer less.
#include <benchmark/benchmark.h>

#ifdef __SSE2__
#include <emmintrin.h>
#endif

#include <algorithm>

#include "bench/picture.h"
#include "simgp/copy.h"
#include "simgp/csc.h"
#include "simgp/describe.h"
#include "simgp/formats.h"
#include "simgp/rotate.h"

namespace bench {
namespace {

// The frames of a player: while one is shown, the next are made.
class ring {
  public:
    const picture &next(const simgp_img &like) {
        if (frames_.empty() || frames_[0].width[0] != like.width[0] ||
            frames_[0].height[0] != like.height[0]) {
            frames_.clear();
            for (int i = 0; i < 3; i++)
                frames_.emplace_back(like.format, like.width[0], like.height[0]);
        }
        return frames_[at_++ % frames_.size()];
    }

  private:
    std::vector<picture> frames_;
    size_t at_ = 0;
};

// Whoever shows the frame.
void read(const picture &p) {
    static uint8_t nothing;
    memory_traffic(p.memory, p.memory.get(), p.bytes, &nothing, 0)();
}

#ifdef __SSE2__
// Whole lines of padded planes, on cache lines on both sides.
void store_past_cache(const simgp_img &from, const simgp_img &to, int planes) {
    for (int k = 0; k < planes; k++) {
        const size_t bytes = size_t(from.stride[k]) * size_t(from.height[k]);
        for (size_t i = 0; i < bytes; i += sizeof(__m128i))
            _mm_stream_si128(reinterpret_cast<__m128i *>(to.plane[k] + i),
                             _mm_load_si128(reinterpret_cast<const __m128i *>(from.plane[k] + i)));
    }
    _mm_sfence();
}

// The operation, band by band by way of a buffer.
operation past_cache(const operation &f, const simgp_img &dst) {
    const int band = 16;
    const picture buffer(dst.format, dst.width[0], band);
    return [=](const simgp_img &s, const simgp_img &d) {
        for (int y = 0; y < s.height[0]; y += band) {
            const int count = std::min(band, s.height[0] - y);
            const simgp_img near = lines(buffer, 0, count);
            f(lines(s, y, count), near);
            store_past_cache(near, lines(d, y, count), simgp_format_planes(d.format));
        }
    };
}
#endif

}  // namespace

std::vector<comparison> stores_comparisons() {
    std::vector<conversion> all;
#ifdef __SSE2__
    const auto add = [&](int from, int to, std::string name, operation f) {
        conversion c{from, to, {0, 0, 0}};
        const auto frames = std::make_shared<ring>();
        c.name = name + ", then read";
        c.against_swscale = false;
        c.sizes = {"1920x1080", "3840x2160"};
        c.ours = [=](const simgp_img &s, const simgp_img &d) {
            const picture &frame = frames->next(d);
            f(s, frame);
            read(frame);
        };
        c.twin = {"past the cache",
                  [=](const simgp_img &, const simgp_img &d) -> operation {
                      return [=, g = past_cache(f, d)](const simgp_img &s, const simgp_img &to) {
                          const picture &frame = frames->next(to);
                          g(s, frame);
                          read(frame);
                      };
                  },
                  0.9};
        all.push_back(c);
    };
    constexpr int Y = SIMGP_FMT_YUV400, YUV = SIMGP_FMT_YUV420, NV = SIMGP_FMT_NV12;
    constexpr int pairs[][2] = {
        {Y, SIMGP_FMT_RGB565},
        {YUV, SIMGP_FMT_RGB565},
        {YUV, SIMGP_FMT_RGB888},
        {YUV, SIMGP_FMT_BGRA8888},
        {NV, SIMGP_FMT_RGB565},
        {NV, SIMGP_FMT_RGB888},
        {SIMGP_FMT_YUV422N, SIMGP_FMT_RGB565},
        {SIMGP_FMT_YUV444, SIMGP_FMT_RGB565},
        {SIMGP_FMT_UYVY, SIMGP_FMT_RGB565},
        {SIMGP_FMT_UYVY, SIMGP_FMT_RGB888},
        {SIMGP_FMT_UYVY, SIMGP_FMT_BGRA8888},
        {SIMGP_FMT_RGB888, SIMGP_FMT_RGB565},
        {SIMGP_FMT_RGBA8888, SIMGP_FMT_RGB565},
        {SIMGP_FMT_RGB888, YUV},
        {SIMGP_FMT_RGB565, NV},
        {YUV, SIMGP_FMT_YUV422N},
        {YUV, NV},
        {NV, YUV},
    };
    for (const auto &[from, to] : pairs)
        add(from, to,
            std::string(simgp::find_format(from)->name.text) + "_to_" +
                simgp::find_format(to)->name.text,
            [](const simgp_img &s, const simgp_img &d) {
                if (simgp_csc(&s, &d) != SIMGP_OK) fail("simgp_csc does not know a pair");
            });
    const auto add_plane = [&](const char *name, int format, simgp_plane_fn *kernel) {
        add(format, format, name, [=](const simgp_img &s, const simgp_img &d) {
            kernel(s.plane[0], s.width[0], s.height[0], s.stride[0], d.stride[0], d.plane[0]);
        });
    };
    add_plane("cpy_8b", Y, simgp_cpy_8b);
    add_plane("cpy_32b", SIMGP_FMT_RGBA8888, simgp_cpy_32b);
    add_plane("rot_8b_hori", Y, simgp_rot_8b_hori);
    add_plane("rot_16b_hori", SIMGP_FMT_RGB565, simgp_rot_16b_hori);
#endif
    return compare_all(all);
}

}  // namespace bench
