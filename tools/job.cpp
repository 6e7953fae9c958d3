#include "tools/job.h"

#include <stdio.h>

#include <algorithm>
#include <limits>
#include <memory>
#include <vector>

#include "tools/progress.h"
#include "tools/road.h"
#include "tools/sink.h"

namespace tools {

namespace {

std::string output_kind(const job &j) {
    const std::string kind = j.as.empty() ? ending_of(j.output) : j.as;
    for (const char *known : {"png", "ppm", "y4m"})
        if (kind == known) return kind;
    return "raw";
}

// The cheapest of the formats that the kind of output can hold; `dither` narrows them to those
// that can be dithered.
const pixel_format &suitable(const picture_shape &from, const std::string &kind, bool dither) {
    const pixel_format *best = nullptr;
    int best_cost = std::numeric_limits<int>::max();
    for (const pixel_format &format : formats()) {
        const bool fits = kind == "y4m" ? !y4m_tag(format).empty() : format.is_rgb();
        if (!fits) continue;
        try {
            const int cost = road(from, format, dither).cost();
            if (cost < best_cost) best = &format, best_cost = cost;
        } catch (const fault &) {
        }
    }
    if (!best)
        throw fault("no conversion leads from ", from.format->name, " to a format that ", kind,
                    " files hold", dither ? ", with dithering" : "");
    return *best;
}

const pixel_format &target(const job &j, const picture_shape &from, const std::string &kind) {
    const pixel_format *named = j.to.empty() ? nullptr : &format_named(j.to);
    if (kind == "raw") {
        if (!named) named = find_format(ending_of(j.output));
        return named ? *named : *from.format;
    }
    if (!named) return suitable(from, kind, j.dither);
    if (kind == "y4m" && y4m_tag(*named).empty())
        throw fault("Y4M files hold yuv400, yuv420, yuv422n and yuv444, not ", named->name);
    if (kind != "y4m" && !named->is_rgb())
        throw fault(kind, " files hold RGB pictures, not ", named->name,
                    "; leave --to out or name an RGB format");
    return *named;
}

std::unique_ptr<sink> open_sink(const job &j, const std::string &kind, const video_traits &traits) {
    const still_writer write = kind == "png" ? write_png : write_ppm;
    if (kind == "raw" || kind == "y4m") {
        if (j.sheet)
            throw fault(j.output, ": a contact sheet is a still picture; name a .png or .ppm file");
        return kind == "raw" ? open_raw_sink(j.output) : open_y4m_sink(j.output, traits);
    }
    return j.sheet ? open_sheet_sink(j.output, write, j.columns) : open_still_sink(j.output, write);
}

}  // namespace

void run(const job &j) {
    const std::unique_ptr<source> in = open_source(j.source);
    const std::string kind = output_kind(j);

    // What happens to a frame, in order; every stage takes up the shape that the one before leaves.
    std::vector<std::unique_ptr<stage>> stages;
    auto shape = [&] { return stages.empty() ? in->shape() : stages.back()->out(); };
    {
        auto r = std::make_unique<road>(shape(), target(j, shape(), kind), j.dither);
        if (!j.quiet && !j.verbose && !r->loss().empty())
            fprintf(stderr, "simgp-convert: note: no direct conversion; %s passes through %s\n",
                    r->text().c_str(), r->loss().c_str());
        stages.push_back(std::move(r));
    }

    if (j.verbose) {
        fprintf(stderr, "%s: %s %dx%d\n", in->name().c_str(),
                std::string(in->shape().format->name).c_str(), in->shape().width,
                in->shape().height);
        for (const auto &s : stages) fprintf(stderr, "%s\n", s->text().c_str());
    }

    const std::unique_ptr<sink> out = open_sink(j, kind, in->traits());
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
    std::string page = "Conversions of the library (* can be dithered):\n";
    for (const pixel_format &from : formats()) {
        std::string line;
        for (const pixel_format &to : formats()) {
            const bool plain = offered(from, to, method::csc),
                       dithered = offered(from, to, method::dither);
            if (plain || dithered) line.append(" ").append(to.name).append(dithered ? "*" : "");
        }
        if (line.empty()) continue;
        page.append("  ").append(from.name).append(10 - from.name.size(), ' ');
        page.append("->").append(line).append("\n");
    }
    page += "Formats that no conversion leads to; samples are moved into them from other YUV:\n ";
    for (const pixel_format &to : formats())
        for (const pixel_format &from : formats())
            if (offered(from, to, method::samples)) {
                page.append(" ").append(to.name);
                break;
            }
    return page + "\nEverything else goes over several of these steps; --verbose names them.\n";
}

}  // namespace tools
