#include "tools/road.h"

#include <algorithm>
#include <limits>
#include <vector>

#include "tools/fault.h"

namespace tools {

namespace {

size_t index(const pixel_format &format) { return size_t(&format - formats().data()); }

int32_t call(method how, const simgp_img &src, const simgp_img &dst) {
    return how == method::dither ? simgp_csc_dither(&src, &dst) : simgp_csc(&src, &dst);
}

// Every step costs, and more so what it loses: bits of colour, chroma samples, and the rounding of
// a passage between YUV and RGB.
int step_cost(const pixel_format &from, const pixel_format &to, method how) {
    int cost = how == method::samples ? 12 : 2;
    if (to.is_rgb16() && !from.is_rgb16()) cost += 10;
    if (from.is_rgb() != to.is_rgb()) cost += 2;
    if (to.chroma() < from.chroma() && !from.is_rgb()) cost += 3;
    return cost;
}

// True if a tiled picture has room for the chroma of an odd last line: unless the chroma line would
// begin a tile row of its own, it lies in the last one.
bool tiles_hold_last_chroma(int height) { return height % 2 == 0 || (height >> 1) % 32 != 0; }

// Converts one picture. The library may leave out the chroma of a last odd column or line; given
// the next even size it does not, and as chroma is never averaged, nothing of what is added shows.
// Conversions from YUV to RGB have their own rules for odd sizes, which are kept.
void convert(method how, picture &src, picture &dst) {
    const pixel_format &from = src.format(), &to = dst.format();
    if (how == method::samples) return move_samples(src, dst);
    const bool even_width = !to.is_rgb(), tiled = from.is_tiled();
    const bool even_height =
        even_width && ((!tiled && !to.is_tiled()) || tiles_hold_last_chroma(src.height()));
    const simgp_img in = src.descriptor(even_width, even_height), out = dst.descriptor();
    const int32_t result = call(how, in, out);
    if (result != SIMGP_OK)
        throw fault("the library refuses ", from.name, " -> ", to.name, ": result ", result);
    if (tiled && even_width && !even_height) {
        // The chroma of the last line is nowhere: that of the line above has to do.
        for (int k = 1; k < dst.planes(); ++k) {
            const int last = dst.lines(k) - 1;
            if (last > 0)
                std::copy_n(dst.line(k, last - 1), dst.line_bytes(k), dst.line(k, last));
            else
                std::fill_n(dst.line(k, last), dst.line_bytes(k), uint8_t{128});
        }
    }
}

}  // namespace

bool offered(const pixel_format &from, const pixel_format &to, method how) {
    const std::span<const pixel_format> all = formats();
    if (how == method::samples) {
        // Layouts that the library reads but never writes. That pictures can be brought into them
        // all the same, the tool moves samples into them itself.
        const auto writes = [&](const pixel_format &f) { return offered(f, to, method::csc); };
        return !from.is_rgb() && !from.is_tiled() && !to.is_rgb() && &from != &to &&
               std::none_of(all.begin(), all.end(), writes);
    }
    static std::vector<signed char> known(2 * all.size() * all.size());  // 0: not asked
    signed char &answer =
        known[2 * (index(from) * all.size() + index(to)) + (how == method::dither)];
    if (answer == 0) {
        picture src({&from, 8, 8}), dst({&to, 8, 8});
        answer = call(how, src.descriptor(), dst.descriptor()) == SIMGP_OK ? 1 : -1;
    }
    return answer > 0;
}

road::road(const picture_shape &from, const pixel_format &to, bool dither) : from_(from) {
    constexpr int far = std::numeric_limits<int>::max() / 2;
    struct place {
        int cost = far;
        size_t before = 0;
        method how = method::csc;
        bool settled = false;
    };
    // Dijkstra's way over the formats. Dithering comes last of all: it is decided after the rest.
    const std::span<const pixel_format> all = formats();
    const size_t count = all.size();
    std::vector<place> places(count);
    const size_t start = index(*from_.format);
    places[start].cost = 0;
    for (;;) {
        size_t at = count;
        for (size_t k = 0; k < count; ++k)
            if (!places[k].settled && places[k].cost < far &&
                (at == count || places[k].cost < places[at].cost))
                at = k;
        if (at == count) break;
        places[at].settled = true;
        for (size_t k = 0; k < count; ++k)
            for (method how : {method::csc, method::samples}) {
                if (places[k].settled || !offered(all[at], all[k], how)) continue;
                const int cost = places[at].cost + step_cost(all[at], all[k], how);
                if (cost < places[k].cost) places[k] = {cost, at, how, false};
            }
    }
    size_t end = index(to);
    cost_ = places[end].cost;
    if (dither) {
        size_t best = count;
        cost_ = far;
        for (size_t k = 0; k < count; ++k) {
            if (places[k].cost >= far || !offered(all[k], to, method::dither)) continue;
            const int cost = places[k].cost + step_cost(all[k], to, method::dither);
            if (cost < cost_) cost_ = cost, best = k;
        }
        if (best != count) end = best;
    }
    if (cost_ >= far)
        throw fault("no conversion leads from ", from_.format->name, " to ", to.name,
                    dither ? " with dithering" : "", "; see --list");
    auto add = [&](method how, const pixel_format &out) {
        steps_.push_back({how, picture({&out, from_.width, from_.height})});
    };
    for (size_t k = end; k != start; k = places[k].before) add(places[k].how, all[k]);
    std::reverse(steps_.begin(), steps_.end());
    if (dither) add(method::dither, to);
}

picture_shape road::out() const { return steps_.empty() ? from_ : steps_.back().out.shape(); }

picture &road::run(picture &from) {
    picture *at = &from;
    for (step &s : steps_) {
        convert(s.how, *at, s.out);
        at = &s.out;
    }
    return *at;
}

std::string road::text() const {
    std::string text(from_.format->name);
    for (const step &s : steps_) {
        text.append(" -> ").append(s.out.format().name);
        if (s.how == method::dither) text.append(" (dithered)");
        if (s.how == method::samples) text.append(" (samples moved by the tool)");
    }
    return text;
}

std::string road::loss() const {
    if (steps_.size() < 2) return {};
    const pixel_format &to = steps_.back().out.format();
    for (size_t k = 0; k + 1 < steps_.size(); ++k) {
        const pixel_format &between = steps_[k].out.format();
        if (between.is_rgb16() && !from_.format->is_rgb16()) return "16-bit colour";
        if (between.chroma() < std::min(from_.format->chroma(), to.chroma()))
            return between.chroma() == 1 ? "4:2:0 chroma" : "4:2:2 chroma";
    }
    return {};
}

}  // namespace tools
