// The line-based resizer, with whole pictures and with bands, against the kernels that resize a plane
// at once: it should cost no more.
#include <string.h>

#include "bench/picture.h"
#include "scmn/irsz.h"
#include "simgp/csc.h"
#include "simgp/resize.h"

namespace bench {
namespace {

struct resizer {
    std::string name;
    int32_t format;
    int from, to;  // formats of pictures
    int src_bytes, dst_bytes;
    simgp_rsz_fn *plain;
};

// One picture, in bands of so many lines; 0: in one call.
void resize(const resizer &r, int band, const picture &src, const picture &dst) {
    const int32_t height = src.height[0];
    const scmn_irsz_param param = {r.format,
                                   band ? SCMN_IRSZ_LINE : SCMN_IRSZ_FULL,
                                   src.width[0],
                                   height,
                                   src.stride[0] / r.src_bytes,
                                   band,
                                   dst.width[0],
                                   dst.height[0],
                                   dst.stride[0] / r.dst_bytes,
                                   dst.plane[0]};
    scmn_irsz_ctx *const made = scmn_irsz_create(&param, nullptr);
    if (!made) fail(r.name + ": no resizer");
    for (int32_t line = 0, step = band ? band : height; line < height; line += step)
        scmn_irsz(made, src.plane[0] + ptrdiff_t(line) * src.stride[0], line,
                  height - line < step ? height - line : step);
    scmn_irsz_delete(made);
}

void resize_plain(const resizer &r, const picture &src, const picture &dst) {
    int32_t step_x, step_y;
    simgp_rsz_get_step(src.width[0], src.height[0], dst.width[0], dst.height[0], SIMGP_ROT_NONE,
                       &step_x, &step_y);
    r.plain(src.plane[0], src.stride[0], dst.width[0], dst.height[0], dst.stride[0], dst.plane[0],
            step_x, step_y);
}

comparison compare(const resizer &r, int band) {
    const auto make = [=](const std::string &size) {
        int w = 0, h = 0, to_w = 0, to_h = 0;
        if (sscanf(size.c_str(), "%dx%d to %dx%d", &w, &h, &to_w, &to_h) != 4)
            fail("no two sizes: " + size);
        // Lines of whole pixels, whatever these have.
        const auto sized = [](int format, int width, int height) {
            picture p(format, (width + 63) & -64, height);
            p.width[0] = width;
            return p;
        };
        const picture src = sized(r.from, w, h), dst = sized(r.to, to_w, to_h);
        paint(src);
        // Without words in between: what the kernel makes, and then the conversion.
        const picture plain = sized(r.from, to_w, to_h), other = sized(r.to, to_w, to_h);
        const auto at_once = [=] {
            resize_plain(r, src, plain);
            if (r.from != r.to && simgp_csc(&plain, &other) != SIMGP_OK) fail(r.name + ": no pair");
        };
        const picture &expected = r.from == r.to ? plain : other;
        resize(r, band, src, dst), at_once();
        for (int y = 0; y < to_h; y++)
            if (memcmp(dst.plane[0] + ptrdiff_t(y) * dst.stride[0],
                       expected.plane[0] + ptrdiff_t(y) * expected.stride[0],
                       size_t(to_w * r.dst_bytes)) != 0)
                fail(r.name + ": the results differ");
        match m{};
        m.units = double(to_w) * to_h;
        m.ours = [=] { resize(r, band, src, dst); };
        m.goals = {0, 0, 0};
        m.twin = {r.from == r.to ? "simgp_rsz" : "simgp_rsz, simgp_csc", at_once, m.units, 0.95};
        return m;
    };
    return {r.name + (band ? ", bands of " + std::to_string(band) : ", whole"),
            {"320x240 to 480x360", "1920x1080 to 1280x720", "1280x720 to 1920x1080",
             "1920x1080 to 3840x2160", "1920x1080 to 480x270"},
            make};
}

}  // namespace

std::vector<comparison> irsz_comparisons() {
    const resizer all[] = {
        {"irsz8b", SCMN_IRSZ_8B, SIMGP_FMT_YUV400, SIMGP_FMT_YUV400, 1, 1, simgp_rsz_8b},
        {"irsz8b8b8b", SCMN_IRSZ_8B8B8B, SIMGP_FMT_RGB888, SIMGP_FMT_RGB888, 3, 3,
         simgp_rsz_8b8b8b},
        {"irsz8b8b8b_5b6b5b", SCMN_IRSZ_8B8B8B_5B6B5B, SIMGP_FMT_RGB888, SIMGP_FMT_RGB565, 3, 2,
         simgp_rsz_8b8b8b},
        {"irsz5b6b5b", SCMN_IRSZ_5B6B5B, SIMGP_FMT_RGB565, SIMGP_FMT_RGB565, 2, 2,
         simgp_rsz_5b6b5b},
        {"irsz8b8b8b8b", SCMN_IRSZ_8B8B8B8B, SIMGP_FMT_RGBA8888, SIMGP_FMT_RGBA8888, 4, 4,
         simgp_rsz_8b8b8b8b},
    };
    std::vector<comparison> comparisons;
    for (const resizer &r : all)
        for (int band : {0, 16}) comparisons.push_back(compare(r, band));
    return comparisons;
}

}  // namespace bench
