#include "tools/play_chain.h"

namespace tools {

namespace {

std::string name_of(const step &s) {
    const std::string who = s.how() == method::csc      ? "simgp_csc_any"
                            : s.how() == method::dither ? "simgp_csc_dither"
                                                        : s.note();
    return who + " -> " + std::string(s.out().format->name);
}

// The one rotation code, or the two, that make up a look; the second one mirrors.
struct turns {
    int first, second = SIMGP_ROT_NONE;
};

turns turns_of(const look &l) {
    constexpr int plain[4] = {SIMGP_ROT_NONE, SIMGP_ROT_90R, SIMGP_ROT_180, SIMGP_ROT_90L};
    if (!l.mirrored) return {plain[l.quarters]};
    // To mirror left to right and turn is to turn the same way and mirror top to bottom.
    if (!l.is_upright()) return {plain[l.quarters], SIMGP_ROT_VERT};
    return {l.quarters == 0 ? SIMGP_ROT_HORI : SIMGP_ROT_VERT};
}

}  // namespace

void look::mirror(bool left_to_right) {
    // A mirror turns the other way round what was turned before it; that from top to bottom is the one
    // from left to right and a half turn.
    quarters = ((left_to_right ? 4 : 6) - quarters) % 4;
    mirrored = !mirrored;
}

chain::chain(const picture_shape &from, int32_t colour, const look &wish, int width, int height)
    : changes_frames_(wish.deblock > 0) {
    picture_shape at = from;
    const auto add = [&](const pixel_format &to, bool dither, const edits &edit) {
        for (auto &r : roads(at, to, dither, edit, colour)) {
            at = r->out();
            for (const step &s : r->steps()) times_.emplace_back(name_of(s));
            roads_.push_back(std::move(r));
        }
    };
    const turns turn = turns_of(wish);
    edits edit;
    edit.deblock = wish.deblock;
    edit.turn = turn.first;
    edit.width = width;
    edit.height = height;
    if (wish.tiled) add(format_coded(SIMGP_FMT_T64X32), false, {});
    if (turn.second != SIMGP_ROT_NONE) {
        // Tiles cannot be turned.
        add(at.format->is_tiled() ? format_coded(SIMGP_FMT_YUV420) : turned(*at.format, turn.first),
            false, edit);
        edit = {};
        edit.turn = turn.second;
    }
    add(*wish.format, wish.dither, edit);
}

picture &chain::run(picture &frame) {
    picture *at = &frame;
    if (changes_frames_) at = &(copy_ = frame);
    size_t k = 0;
    for (const auto &r : roads_)
        for (step &s : r->steps()) at = times_[k++].measure([&] { return &s.run(*at); });
    return *at;
}

}  // namespace tools
