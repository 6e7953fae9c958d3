#include "tools/road.h"

#include <algorithm>
#include <array>
#include <limits>

#include "tools/fault.h"

namespace tools {

namespace {

constexpr size_t count = 19;  // formats

size_t index(const Format &format) { return size_t(&format - formats().data()); }

int32_t call(Via via, const simgp_img &src, const simgp_img &dst) {
    return via == Via::dither ? simgp_csc_dither(&src, &dst) : simgp_csc(&src, &dst);
}

/// Layouts that the library reads but never writes. That pictures can be brought into them all the
/// same, the tool moves samples into them itself.
bool only_by_samples(const Format &to) {
    switch (to.code) {
        case SIMGP_FMT_YUV400:
        case SIMGP_FMT_YUV444:
        case SIMGP_FMT_YV16:
        case SIMGP_FMT_YUV422W:
        case SIMGP_FMT_UYVY:
        case SIMGP_FMT_YUYV:
            return true;
        default:
            return false;
    }
}

/// Every step costs, and more so what it loses: bits of colour, chroma samples, and the rounding of
/// a passage between YUV and RGB.
int step_cost(const Format &from, const Format &to, Via via) {
    int cost = via == Via::samples ? 12 : 2;
    if (to.kind == Kind::rgb16 && from.kind != Kind::rgb16) cost += 10;
    if (from.is_rgb() != to.is_rgb()) cost += 2;
    if (to.chroma() < from.chroma() && !from.is_rgb()) cost += 3;
    return cost;
}

/// True if a tiled picture has room for the chroma of an odd last line: unless the chroma line would
/// begin a tile row of its own, it lies in the last one.
bool tiles_hold_last_chroma(int height) { return height % 2 == 0 || (height >> 1) % 32 != 0; }

/// Converts one picture. The library may leave out the chroma of a last odd column or line; given the
/// next even size it does not, and as chroma is never averaged, nothing of what is added shows.
/// Conversions from YUV to RGB have their own rules for odd sizes, which are kept.
void convert(Via via, Picture &src, Picture &dst) {
    const Format &from = src.format(), &to = dst.format();
    if (via == Via::samples) return move_samples(src, dst);
    const bool even_width = !to.is_rgb(), tiled = from.kind == Kind::tiled;
    const bool even_height =
        even_width && ((!tiled && to.kind != Kind::tiled) || tiles_hold_last_chroma(src.height()));
    const simgp_img in = src.descriptor(even_width, even_height), out = dst.descriptor();
    const int32_t result = call(via, in, out);
    if (result != SIMGP_OK)
        throw Fault("the library refuses ", from.name, " -> ", to.name, ": result ", result);
    if (tiled && even_width && !even_height) {
        // The chroma of the last line is nowhere: that of the line above has to do.
        for (int k = 1; k < dst.planes(); ++k) {
            const int last = dst.rows(k) - 1;
            if (last > 0)
                std::copy_n(dst.row(k, last - 1), dst.row_bytes(k), dst.row(k, last));
            else
                std::fill_n(dst.row(k, last), dst.row_bytes(k), uint8_t{128});
        }
    }
}

}  // namespace

bool offered(const Format &from, const Format &to, Via via) {
    static std::array<std::array<std::array<signed char, 2>, count>, count>
        known{};  // 0: not asked
    if (via == Via::samples)
        return only_by_samples(to) && !from.is_rgb() && from.kind != Kind::tiled && &from != &to;
    signed char &answer = known[index(from)][index(to)][via == Via::dither];
    if (answer == 0) {
        Picture src({&from, 8, 8}), dst({&to, 8, 8});
        answer = call(via, src.descriptor(), dst.descriptor()) == SIMGP_OK ? 1 : -1;
    }
    return answer > 0;
}

Road::Road(const Shape &from, const Format &to, bool dither) : from_(from) {
    constexpr int far = std::numeric_limits<int>::max() / 2;
    struct Place {
        int cost = far;
        size_t before = 0;
        Via via = Via::csc;
        bool settled = false;
    };
    // Dijkstra's way over the formats. Dithering comes last of all: it is decided after the rest.
    const std::span<const Format> all = formats();
    if (all.size() != count) throw Fault("the number of formats changed");
    std::array<Place, count> place;
    const size_t start = index(*from_.format);
    place[start].cost = 0;
    for (;;) {
        size_t at = count;
        for (size_t k = 0; k < count; ++k)
            if (!place[k].settled && place[k].cost < far &&
                (at == count || place[k].cost < place[at].cost))
                at = k;
        if (at == count) break;
        place[at].settled = true;
        for (size_t k = 0; k < count; ++k)
            for (Via via : {Via::csc, Via::samples}) {
                if (place[k].settled || !offered(all[at], all[k], via)) continue;
                const int cost = place[at].cost + step_cost(all[at], all[k], via);
                if (cost < place[k].cost) place[k] = {cost, at, via, false};
            }
    }
    size_t end = index(to);
    cost_ = place[end].cost;
    if (dither) {
        size_t best = count;
        cost_ = far;
        for (size_t k = 0; k < count; ++k) {
            if (place[k].cost >= far || !offered(all[k], to, Via::dither)) continue;
            const int cost = place[k].cost + step_cost(all[k], to, Via::dither);
            if (cost < cost_) cost_ = cost, best = k;
        }
        if (best != count) end = best;
    }
    if (cost_ >= far)
        throw Fault("no conversion leads from ", from_.format->name, " to ", to.name,
                    dither ? " with dithering" : "", "; see --list");
    auto add = [&](Via via, const Format &out) {
        steps_.push_back({via, Picture({&out, from_.width, from_.height})});
    };
    for (size_t k = end; k != start; k = place[k].before) add(place[k].via, all[k]);
    std::reverse(steps_.begin(), steps_.end());
    if (dither) add(Via::dither, to);
}

Shape Road::out() const { return steps_.empty() ? from_ : steps_.back().out.shape(); }

Picture &Road::run(Picture &from) {
    Picture *at = &from;
    for (Step &step : steps_) {
        convert(step.via, *at, step.out);
        at = &step.out;
    }
    return *at;
}

std::string Road::text() const {
    std::string text(from_.format->name);
    for (const Step &step : steps_) {
        text.append(" -> ").append(step.out.format().name);
        if (step.via == Via::dither) text.append(" (dithered)");
        if (step.via == Via::samples) text.append(" (samples moved by the tool)");
    }
    return text;
}

std::string Road::loss() const {
    if (steps_.size() < 2) return {};
    const Format &to = steps_.back().out.format();
    for (size_t k = 0; k + 1 < steps_.size(); ++k) {
        const Format &between = steps_[k].out.format();
        if (between.kind == Kind::rgb16 && from_.format->kind != Kind::rgb16)
            return "16-bit colour";
        if (between.chroma() < std::min(from_.format->chroma(), to.chroma()))
            return between.chroma() == 1 ? "4:2:0 chroma" : "4:2:2 chroma";
    }
    return {};
}

}  // namespace tools
