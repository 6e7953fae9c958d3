#include "tools/road.h"

#include <algorithm>
#include <limits>
#include <vector>

#include "tools/fault.h"

namespace tools {

namespace {

struct size {
    int width, height;
};

size exchanged(const size &s, bool quarter) { return quarter ? size{s.height, s.width} : s; }

// Every step costs, and more so what it loses: bits of colour, chroma samples, and the rounding of
// a passage between YUV and RGB.
int step_cost(const pixel_format &from, const pixel_format &to) {
    int cost = 2;
    if (to.is_rgb16() && !from.is_rgb16()) cost += 10;
    if (from.is_rgb() != to.is_rgb()) cost += 2;
    if (to.chroma() == 0) cost += 20;
    const bool coarser =
        to.chroma_x_shift() > from.chroma_x_shift() || to.chroma_y_shift() > from.chroma_y_shift();
    if (!from.is_rgb() && (coarser || to.chroma() < from.chroma())) cost += 3;
    return cost;
}

// The filter works best on 8 bits. A picture that grows is best resized as it came, before chroma
// is repeated into steps; one that shrinks, where chroma has as many samples as it ever has, since
// the smaller picture needs each of them.
int resize_cost(const pixel_format &f, const size &from, const size &to, const pixel_format &source,
                const pixel_format &target) {
    const bool grows = int64_t{from.width} * from.height < int64_t{to.width} * to.height;
    const int best = grows ? source.chroma() : std::max(source.chroma(), target.chroma());
    return 2 + (f.is_rgb16() ? 10 : 0) + (f.chroma() != best ? 1 : 0);
}

// Blocks are those of the planes that were coded: chroma that has been repeated or dropped has others.
int deblock_cost(const pixel_format &f, const pixel_format &source) {
    const bool as_coded = f.chroma_x_shift() == source.chroma_x_shift() &&
                          f.chroma_y_shift() == source.chroma_y_shift();
    return as_coded ? 2 : 10;
}

// Of an odd number of columns (lines), the last one has a chroma sample of its own. If it comes
// first, that sample is taken for two columns, and every other one is a column off.
int turn_cost(const pixel_format &f, const size &from, int turn) {
    const bool columns_turn =
        turn == SIMGP_ROT_90L || turn == SIMGP_ROT_180 || turn == SIMGP_ROT_HORI;
    const bool lines_turn =
        turn == SIMGP_ROT_90R || turn == SIMGP_ROT_180 || turn == SIMGP_ROT_VERT;
    const bool off = (columns_turn && f.chroma_x_shift() && from.width % 2) ||
                     (lines_turn && f.chroma_y_shift() && from.height % 2);
    return off ? 8 : 2;
}

// What the library's resize can hold, plane by plane (simgp_rsz_get_step).
bool is_resizable(const pixel_format &f, const size &from, const size &to) {
    for (int k = 0; k < f.plane_count; ++k) {
        const auto extent = [](int n, int shift) { return (n + (1 << shift) - 1) >> shift; };
        const plane_shape &p = f.planes[k];
        const int w = extent(from.width, p.x_shift), h = extent(from.height, p.y_shift);
        int32_t step_x, step_y;
        simgp_rsz_get_step(w, h, extent(to.width, p.x_shift), extent(to.height, p.y_shift),
                           SIMGP_ROT_NONE, &step_x, &step_y);
        // The step of a single sample is 0, and right.
        if ((w > 1 && step_x == 0) || (h > 1 && step_y == 0)) return false;
    }
    return true;
}

// What is to be done, in order, and the sizes before and between.
struct plan {
    const pixel_format &source, &target;
    int turn;
    int32_t colour;
    std::vector<method> parts;
    std::vector<size> sizes;

    plan(const picture_shape &from, const pixel_format &to, const edits &wish, int32_t of_colour)
        : source(*from.format),
          target(to),
          turn(wish.thumbnail ? SIMGP_ROT_90R : wish.turn),
          colour(of_colour),
          sizes{{from.width, from.height}} {
        const auto add = [this](method how, const size &after) {
            parts.push_back(how);
            sizes.push_back(after);
        };
        const bool quarter = is_quarter(turn);
        const size before = sizes.back(), goal = exchanged({wish.width, wish.height}, quarter);
        if (wish.deblock > 0) add(method::deblock, before);
        if (wish.thumbnail)
            add(method::thumbnail, {(before.height + 1) / 2, (before.width + 1) / 2});
        if (wish.width > 0 && (goal.width != before.width || goal.height != before.height))
            add(method::resize, goal);
        if (wish.turn != SIMGP_ROT_NONE) add(method::turn, exchanged(sizes.back(), quarter));
    }

    // Ends in a fault if no road can do it.
    void check() const {
        for (size_t k = 0; k < parts.size(); ++k) {
            if (parts[k] == method::deblock && source.is_rgb())
                throw fault(
                    "--deblock smooths planes of YUV as a decoder leaves them, but the frames are ",
                    source.name, "; deblock before they become RGB");
            const size &s = sizes[k], &goal = sizes[k + 1];
            if (parts[k] == method::resize &&
                !is_resizable(format_coded(SIMGP_FMT_YUV400), s, goal))
                throw fault("--resize: ", s.width, "x", s.height, " cannot become ", goal.width,
                            "x", goal.height,
                            " at once: more than 8192 columns or lines have to shrink to a third "
                            "or less, more than 16384 to a fifth, 32768 to a ninth; resize twice");
        }
    }

    // Calls go(parts done after it, format after it, method, cost) for every step that begins with
    // pictures of `f` when `done` parts are done.
    template <class Go>
    void for_each_step(const pixel_format &f, size_t done, Go go) const {
        for (const pixel_format &to : formats()) {
            // Rounding into RGB and back again.
            const int there_and_back = !source.is_rgb() && f.is_rgb() && !to.is_rgb() ? 12 : 0;
            if (offered(f, to, method::csc))
                go(done, to, method::csc, step_cost(f, to) + there_and_back);
        }
        if (done == parts.size()) return;
        const size &from = sizes[done], &to = sizes[done + 1];
        const pixel_format &after = turned(f, turn);
        switch (parts[done]) {
            case method::resize: {
                if (!is_resizable(f, from, to)) break;
                const int cost = resize_cost(f, from, to, source, target);
                if (offered(f, f, method::resize)) go(done + 1, f, method::resize, cost);
                if ((colour & ~SIMGP_CHROMA_MEAN) == SIMGP_COLOUR_BT601)
                    for (const pixel_format &g : formats())
                        if (offered(f, g, method::resize_csc))
                            go(done + 1, g, method::resize_csc, step_cost(f, g));
                if (done + 1 < parts.size() && offered(f, after, method::resize_turn, turn))
                    go(done + 2, after, method::resize_turn, cost + turn_cost(f, to, turn));
                break;
            }
            case method::turn:
                if (offered(f, after, method::turn, turn))
                    go(done + 1, after, method::turn, turn_cost(f, from, turn));
                if (offered(f, f, method::turn_bytes)) go(done + 1, f, method::turn_bytes, 6);
                // Of an odd number of lines the last one gets no chroma; nothing is averaged.
                if (from.height % 2 == 0 && !(colour & SIMGP_CHROMA_MEAN))
                    for (const pixel_format &g : formats())
                        if (offered(f, g, method::csc_turn, turn))
                            go(done + 1, g, method::csc_turn,
                               step_cost(f, g) + turn_cost(f, from, turn) - 2);
                break;
            case method::thumbnail:
                if (offered(f, after, method::thumbnail)) {
                    const bool bytes = f.planes[f.plane_count - 1].bytes > 1;
                    go(done + 1, after, method::thumbnail,
                       bytes ? 6 : turn_cost(f, exchanged(to, true), turn));
                }
                break;
            case method::deblock:
                if (offered(f, f, method::deblock))
                    go(done + 1, f, method::deblock, deblock_cost(f, source));
                break;
            default:
                if (offered(f, f, parts[done])) go(done + 1, f, parts[done], 2);
        }
    }
};

}  // namespace

void check_edits(const picture_shape &from, const edits &wish) {
    plan(from, *from.format, wish, SIMGP_COLOUR_BT601).check();
}

road::road(const picture_shape &from, const pixel_format &to, bool dither, const edits &wish,
           int32_t colour)
    : from_(from) {
    constexpr int far = std::numeric_limits<int>::max() / 2;
    struct place {
        int cost = far;
        size_t before = 0;
        method how = method::csc;
        bool settled = false;
    };
    // Dijkstra's way over the formats, once for each number of parts that are done. Dithering comes
    // last of all: it is decided after the rest.
    const plan p(from, to, wish, colour);
    p.check();
    const std::span<const pixel_format> all = formats();
    const size_t count = all.size(), last = p.parts.size() * count;
    const auto index = [&](const pixel_format &f) { return size_t(&f - all.data()); };
    std::vector<place> places(last + count);
    const size_t start = index(*from_.format);
    places[start].cost = 0;
    for (;;) {
        size_t at = places.size();
        for (size_t k = 0; k < places.size(); ++k)
            if (!places[k].settled && places[k].cost < far &&
                (at == places.size() || places[k].cost < places[at].cost))
                at = k;
        if (at == places.size()) break;
        places[at].settled = true;
        p.for_each_step(all[at % count], at / count,
                        [&](size_t done, const pixel_format &f, method how, int cost) {
                            place &there = places[done * count + index(f)];
                            cost += places[at].cost;
                            if (!there.settled && cost < there.cost) there = {cost, at, how, false};
                        });
    }
    size_t end = last + index(to);
    cost_ = places[end].cost;
    if (dither) {
        cost_ = far;
        for (size_t k = 0; k < count; ++k) {
            if (places[last + k].cost >= far || !offered(all[k], to, method::dither)) continue;
            // RGB becomes YUV for this alone, so it may as well keep its chroma.
            const int poorer = from_.format->is_rgb() ? 4 - all[k].chroma() : 0;
            const int cost = places[last + k].cost + step_cost(all[k], to) + poorer;
            if (cost < cost_) cost_ = cost, end = last + k;
        }
    }
    if (cost_ >= far)
        throw fault("no conversion leads from ", from_.format->name, " to ", to.name,
                    dither ? " with dithering" : "", "; see --list");
    const auto add = [&](method how, size_t at) {
        const size &s = p.sizes[at / count];
        steps_.emplace_back(how, picture_shape{&all[at % count], s.width, s.height},
                            how == method::deblock ? wish.deblock
                            : how == method::csc   ? colour
                                                   : p.turn);
    };
    for (size_t k = end; k != start; k = places[k].before) add(places[k].how, k);
    std::reverse(steps_.begin(), steps_.end());
    if (dither) add(method::dither, last + index(to));
}

picture_shape road::out() const { return steps_.empty() ? from_ : steps_.back().out(); }

picture &road::run(picture &from) {
    picture *at = &from;
    for (step &s : steps_) at = &s.run(*at);
    return *at;
}

std::string road::text() const {
    std::string text(from_.format->name);
    const picture_shape *before = &from_;
    for (const step &s : steps_) {
        const picture_shape &out = s.out();
        text.append(" -> ").append(out.format->name);
        if (out.width != before->width || out.height != before->height)
            text.append(" ")
                .append(std::to_string(out.width))
                .append("x")
                .append(std::to_string(out.height));
        if (!s.note().empty()) text.append(" (").append(s.note()).append(")");
        before = &out;
    }
    return text;
}

std::string road::loss() const {
    if (steps_.size() < 2) return {};
    // The coarsest chroma on the way; quarter turns exchange its directions. Bits and colour itself are
    // dear enough for no road to lead through less of them than its ends have.
    int x_shift = 0, y_shift = 0;
    const auto pass = [&](const pixel_format &f) {
        x_shift = std::max(x_shift, f.chroma_x_shift());
        y_shift = std::max(y_shift, f.chroma_y_shift());
    };
    pass(*from_.format);
    for (const step &s : steps_) {
        if (s.turns() && is_quarter(s.code())) std::swap(x_shift, y_shift);
        pass(*s.out().format);
    }
    const int ends = std::min(from_.format->chroma(), steps_.back().out().format->chroma());
    return 4 >> (x_shift + y_shift) < ends ? "4:2:0 chroma" : "";
}

std::vector<std::unique_ptr<road>> roads(const picture_shape &from, const pixel_format &to,
                                         bool dither, const edits &wish, int32_t colour) {
    std::vector<std::unique_ptr<road>> all;
    const bool in_bt601 = (colour & ~SIMGP_CHROMA_MEAN) == SIMGP_COLOUR_BT601;
    if (!dither || !to.is_rgb() || in_bt601) {
        all.push_back(std::make_unique<road>(from, to, dither, wish, colour));
        return all;
    }
    const bool is_rgb = from.format->is_rgb();
    if (!is_rgb)
        all.push_back(
            std::make_unique<road>(from, format_coded(SIMGP_FMT_RGB888), false, wish, colour));
    all.push_back(std::make_unique<road>(is_rgb ? from : all.back()->out(), to, true,
                                         is_rgb ? wish : edits{}, SIMGP_COLOUR_BT601));
    return all;
}

}  // namespace tools
