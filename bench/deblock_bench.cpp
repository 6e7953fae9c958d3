// Deblocking of planes. No library offers H.263's filter over a decoded picture: FFmpeg has one, but
// only inside its decoder. The nearest that can be called are the deblocking filters of its
// postprocessing library, which work along the same edges of 8 x 8 blocks, vertically and
// horizontally, and choose for each block between a strong and a weak one. The fastest of them is the
// peer. They leave other pictures, so nothing is compared but the time.
#include "simgp/deblock.h"

extern "C" {
#include <libpostproc/postprocess.h>
}

#include "bench/picture.h"

namespace bench {

static peer postproc_peer(const std::string &what, const char *filters) {
    return {"postproc " + what, [=](const simgp_img &, const simgp_img &p) -> operation {
                const std::shared_ptr<pp_mode> mode(
                    pp_get_mode_by_name_and_quality(filters, PP_QUALITY_MAX), pp_free_mode);
                const std::shared_ptr<pp_context> context(
                    pp_get_context(p.width[0], p.height[0], PP_FORMAT_420 | PP_CPU_CAPS_AUTO),
                    pp_free_context);
                if (!mode || !context) fail(std::string("postproc does not know ") + filters);
                return [=](const simgp_img &, const simgp_img &d) {
                    const uint8_t *from[3] = {d.plane[0]};
                    uint8_t *to[3] = {d.plane[0]};
                    pp_postprocess(from, d.stride, to, d.stride, d.width[0], d.height[0], nullptr,
                                   0, mode.get(), context.get(), 0);
                };
            }};
}

std::vector<comparison> deblock_comparisons() {
    const auto deblock = [](const char *name, decltype(simgp_dbf8x8) *run,
                            const std::vector<peer> &peers, const goal &goals) {
        conversion c{SIMGP_FMT_YUV400, SIMGP_FMT_YUV400, goals, peers, name};
        c.ours = [run](const simgp_img &, const simgp_img &p) {
            run(p.plane[0], 12, p.stride[0], p.width[0], p.height[0]);
        };
        c.tolerance = 0;
        c.sizes = {"320x240", "1920x1080", "3840x2160"};
        c.in_place = true;
        return c;
    };
    return compare_all({
        deblock("dbf8x8", simgp_dbf8x8,
                {postproc_peer("hb, vb", "hb:y,vb:y,fq:12"),
                 postproc_peer("h1, v1", "h1:y,v1:y,fq:12")},
                {5, 4}),
        deblock("dbf8x8_h263_hor", simgp_dbf8x8_h263_hor,
                {postproc_peer("vb", "vb:y,fq:12"), postproc_peer("v1", "v1:y,fq:12")}, {5, 4}),
        deblock("dbf8x8_h263_ver", simgp_dbf8x8_h263_ver,
                {postproc_peer("hb", "hb:y,fq:12"), postproc_peer("h1", "h1:y,fq:12")}, {5, 4}),
    });
}

}  // namespace bench
