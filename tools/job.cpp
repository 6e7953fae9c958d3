#include "tools/job.h"

#include <ctype.h>
#include <inttypes.h>
#include <stdio.h>

#include <algorithm>
#include <limits>
#include <memory>
#include <numeric>
#include <vector>

#include "tools/progress.h"
#include "tools/road.h"
#include "tools/sink.h"

namespace tools {

namespace {

std::string output_kind(const job &j) {
    std::string kind = j.as.empty() ? ending_of(j.output) : j.as;
    for (const char *known : {"png", "ppm", "y4m"})
        if (kind == known) return kind;
    return "raw";
}

// The cheapest of the formats that the kind of output can hold; dithering narrows them to those
// that can be dithered. A YUV format that gets less chroma than the frames have is the last choice.
const pixel_format &suitable(const job &j, const picture_shape &from, const std::string &kind,
                             int32_t code) {
    const pixel_format *best = nullptr;
    int best_cost = std::numeric_limits<int>::max();
    for (const pixel_format &format : formats()) {
        const bool fits = kind == "y4m" ? !y4m_tag(format).empty() : format.is_rgb();
        if (!fits) continue;
        try {
            const road r(from, format, j.dither, j.edit, code);
            const bool poorer =
                !format.is_rgb() && (format.chroma() < from.format->chroma() || !r.loss().empty());
            const int cost = r.cost() + (poorer ? 20 : 0);
            if (cost < best_cost) best = &format, best_cost = cost;
        } catch (const fault &) {
        }
    }
    if (!best)
        throw fault("no conversion leads from ", from.format->name, " to a format that ", kind,
                    " files hold", j.dither ? ", with dithering" : "");
    return *best;
}

const pixel_format &target(const job &j, const picture_shape &from, const std::string &kind,
                           int32_t code) {
    const pixel_format *named = j.to.empty() ? nullptr : &format_named(j.to);
    if (kind == "raw") {
        if (!named) named = find_format(ending_of(j.output));
        // The format of the source, or what a turn makes of it.
        return named ? *named
                     : turned(*from.format, j.edit.thumbnail ? SIMGP_ROT_90R : j.edit.turn);
    }
    if (!named) return suitable(j, from, kind, code);
    if (kind == "y4m" && y4m_tag(*named).empty())
        throw fault("Y4M files hold yuv400, yuv420, yuv422n and yuv444, not ", named->name);
    if (kind != "y4m" && !named->is_rgb())
        throw fault(kind, " files hold RGB pictures, not ", named->name,
                    "; leave --to out or name an RGB format");
    return *named;
}

// Files that other programs make of what this one writes.
void refuse_foreign_kinds(const job &j) {
    if (!j.as.empty() || j.output == "-") return;
    std::string ending = ending_of(j.output);
    for (char &c : ending) c = char(tolower(c));
    for (const char *film : {"mp4", "m4v", "mov", "mkv", "webm", "avi", "wmv", "flv", "mpg", "ts",
                             "h264", "264", "h265", "hevc", "ogv", "gif"})
        if (ending == film)
            throw fault(j.output, ": this program does not write .", ending,
                        "; ffmpeg does: simgp-convert ... -o - --as y4m | ffmpeg -i - '", j.output,
                        "' (for raw frames of that name say --as raw)");
    for (const char *still : {"jpg", "jpeg", "webp", "avif", "heic", "bmp", "tif", "tiff"})
        if (ending == still)
            throw fault(j.output, ": this program does not write .", ending,
                        "; ffmpeg does: simgp-convert ... -o - --as png | ffmpeg -i - '", j.output,
                        "' (for raw frames of that name say --as raw)");
}

// What the frames have and the files will not, in words; empty if nothing.
std::string loss_note(const picture_shape &from, const picture_shape &to, const job &j,
                      const video_traits &traits, const std::string &kind, const colour &c) {
    const pixel_format &a = *from.format, &b = *to.format;
    std::vector<std::string> notes;
    if (b.chroma() == 0 && a.chroma() > 0) {
        notes.emplace_back("no colour");
    } else if (b.chroma() < a.chroma() && b.chroma() > 0) {
        notes.push_back(std::string(b.chroma() == 1   ? "a quarter"
                                    : a.chroma() == 4 ? "half"
                                                      : "fewer") +
                        " of the chroma samples" +
                        (j.chroma_mean ? ", averaged" : ", those of every first pixel"));
    }
    if (b.is_rgb16() && !a.is_rgb16())
        notes.push_back(std::string("5 and 6 bits of each channel") +
                        (j.dither ? ", dithered" : ""));
    const auto has_alpha = [](const pixel_format &f) {
        return f.is_rgb() && f.planes[0].bytes == 4;
    };
    if (has_alpha(a) && (!has_alpha(b) || kind == "png" || kind == "ppm"))
        notes.push_back(has_alpha(b) ? "no alpha in a " + kind + " file" : "no alpha");
    const bool sited = traits.space == "420mpeg2" || traits.space == "420paldv";
    if (sited && &a != &b && b.chroma() > 0)
        notes.push_back("chroma as if it lay on the first pixel, not as " + traits.space + " says");
    if (kind == "raw" && !b.is_rgb() && a.is_rgb() == b.is_rgb() && c.full)
        notes.push_back("nothing that says " + std::string(c.name));
    std::string text;
    for (const std::string &n : notes) text.append(text.empty() ? "" : "; ").append(n);
    return text;
}

std::unique_ptr<sink> open_sink(const job &j, const std::string &kind, const video_traits &traits) {
    const destination to{j.output, j.may_replace};
    const still_writer write = kind == "png" ? write_png : write_ppm;
    if (kind == "raw" || kind == "y4m") {
        if (j.sheet)
            throw fault(j.output, ": a contact sheet is a still picture; name a .png or .ppm file");
        return kind == "raw" ? open_raw_sink(to) : open_y4m_sink(to, traits);
    }
    return j.sheet ? open_sheet_sink(to, write, j.columns) : open_still_sink(to, write);
}

// The colour of the frames.
const colour &colour_of_frames(const job &j, const source &in) {
    if (!j.source.colour.empty()) return colour_named(j.source.colour);
    return resolved(in.traits().colour, in.shape().width, in.shape().height);
}

// What a stream in colour `c` has to say of it: what its source did, what the user did, and what its
// size would not make one think.
colour_note note_of(const job &j, const colour &c, colour_note said, const picture_shape &to) {
    if (!said.range.empty() || !j.source.colour.empty() || c.full)
        said.range = c.full ? "full" : "limited";
    if (!said.matrix.empty() || !j.source.colour.empty() ||
        c.matrix != usual_matrix(to.width, to.height))
        said.matrix = c.matrix;
    return said;
}

// What is true of a stream when its pictures have another size, or are turned.
video_traits edited_traits(video_traits traits, const picture_shape &from, const picture_shape &to,
                           const edits &edit) {
    const bool quarter = edit.thumbnail || is_quarter(edit.turn);
    if (!edit.thumbnail && edit.turn == SIMGP_ROT_NONE && from.width == to.width &&
        from.height == to.height)
        return traits;
    // Lines no longer belong to one field or the other.
    if (traits.interlacing != "p") traits.interlacing.assign(1, '?');
    // Pixels as wide as `across` and as high as `down`, unless that is unknown.
    int64_t across = 0, down = 0;
    if (sscanf(traits.aspect.c_str(), "%" SCNd64 ":%" SCNd64, &across, &down) != 2) return traits;
    constexpr int64_t most = 1 << 20;
    if (across < 1 || down < 1 || across > most || down > most) return traits;
    if (quarter) std::swap(across, down);
    if (!edit.thumbnail) {
        across *= int64_t{quarter ? from.height : from.width} * to.height;
        down *= int64_t{quarter ? from.width : from.height} * to.width;
    }
    const int64_t common = std::gcd(across, down);
    traits.aspect = std::to_string(across / common) + ":" + std::to_string(down / common);
    return traits;
}

}  // namespace

void run(const job &wish) {
    job j = wish;
    if (!j.resize.empty()) parse_size(j.resize, "--resize", j.edit.width, j.edit.height);
    refuse_foreign_kinds(j);
    const std::unique_ptr<source> in = open_source(j.source);
    const std::string kind = output_kind(j);
    check_edits(in->shape(), j.edit);

    // What happens to a frame, in order; every stage takes up the shape that the one before leaves.
    std::vector<std::unique_ptr<stage>> stages;
    auto shape = [&] { return stages.empty() ? in->shape() : stages.back()->out(); };
    const colour &c = colour_of_frames(j, *in);
    const int32_t code = c.code | (j.chroma_mean ? int32_t{SIMGP_CHROMA_MEAN} : 0);
    const pixel_format &to = target(j, shape(), kind, code);
    for (auto &r : roads(shape(), to, j.dither, j.edit, code)) {
        if (!j.quiet && !j.verbose && !r->loss().empty())
            fprintf(stderr, "simgp-convert: note: %s passes through %s\n", r->text().c_str(),
                    r->loss().c_str());
        stages.push_back(std::move(r));
    }

    if (j.verbose) {
        fprintf(stderr, "%s: %s %dx%d, %s\n", in->name().c_str(),
                std::string(in->shape().format->name).c_str(), in->shape().width,
                in->shape().height, std::string(c.name).c_str());
        for (const auto &s : stages) fprintf(stderr, "%s\n", s->text().c_str());
    }

    video_traits traits = edited_traits(in->traits(), in->shape(), shape(), j.edit);
    traits.colour = note_of(j, c, traits.colour, shape());
    const std::string lost = loss_note(in->shape(), shape(), j, in->traits(), kind, c);
    if (!j.quiet && !lost.empty())
        fprintf(stderr, "simgp-convert: note: %s holds %s\n",
                std::string(shape().format->name).c_str(), lost.c_str());
    const std::unique_ptr<sink> out = open_sink(j, kind, traits);
    progress bar(!j.quiet);
    int64_t frames = 0;
    try {
        picture frame(in->shape());
        while ((j.frames == 0 || frames < j.frames) && in->next(frame)) {
            picture *at = &frame;
            for (const auto &s : stages) at = &s->run(*at);
            out->put(*at);
            ++frames;
            double part = in->done();
            if (j.frames) part = std::max(part, double(frames) / double(j.frames));
            bar.show(frames, part);
        }
        if (frames == 0) throw fault(in->name(), ": holds no frame");
        out->finish();
    } catch (const fault &f) {
        bar.clear();
        if (out->kept() == 0) throw;
        throw fault(f.what(), " (", out->kept(), " complete pictures stay)");
    }
    bar.clear();
    if (j.verbose)
        fprintf(stderr, "%lld frame%s -> %s\n", (long long)frames, frames == 1 ? "" : "s",
                j.output == "-" ? "standard output" : j.output.c_str());
}

std::string list_conversions() {
    std::string page = "Every format converts into every other, in one step and in any colour:\n ";
    for (const pixel_format &f : formats()) page.append(" ").append(f.name);
    page += "\n\nConversions that can be dithered:\n";
    for (const pixel_format &from : formats()) {
        std::string line;
        for (const pixel_format &to : formats())
            if (offered(from, to, method::dither)) line.append(" ").append(to.name);
        if (line.empty()) continue;
        page.append("  ").append(from.name).append(10 - from.name.size(), ' ');
        page.append("->").append(line).append("\n");
    }
    page += "Other formats are converted to one of these first; --verbose names it.\n\nColours:\n ";
    for (const colour &c : colours()) page.append(" ").append(c.name);
    return page + "\n";
}

}  // namespace tools
