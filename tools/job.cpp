#include "tools/job.h"

#include <cstdio>
#include <limits>
#include <memory>
#include <vector>

#include "tools/progress.h"
#include "tools/road.h"
#include "tools/sink.h"

namespace tools {

namespace {

std::string ending(const std::string &path) {
    const size_t dot = path.rfind('.');
    return dot == std::string::npos || path.find('/', dot) != std::string::npos
               ? ""
               : path.substr(dot + 1);
}

std::string output_kind(const Job &job) {
    const std::string kind = job.as.empty() ? ending(job.output) : job.as;
    for (const char *known : {"png", "ppm", "y4m"})
        if (kind == known) return kind;
    return "raw";
}

/// The cheapest of the formats that the kind of output can hold; `dither` narrows them to those
/// that can be dithered.
const Format &suitable(const Shape &from, const std::string &kind, bool dither) {
    const Format *best = nullptr;
    int best_cost = std::numeric_limits<int>::max();
    for (const Format &format : formats()) {
        const bool fits = kind == "y4m" ? !y4m_tag(format).empty() : format.is_rgb();
        if (!fits) continue;
        try {
            const int cost = Road(from, format, dither).cost();
            if (cost < best_cost) best = &format, best_cost = cost;
        } catch (const Fault &) {
        }
    }
    if (!best)
        throw Fault("no conversion leads from ", from.format->name, " to a format that ", kind,
                    " files hold", dither ? ", with dithering" : "");
    return *best;
}

const Format &target(const Job &job, const Shape &from, const std::string &kind) {
    const Format *named = job.to.empty() ? nullptr : &format_named(job.to);
    if (kind == "raw") {
        if (!named) named = find_format(ending(job.output));
        return named ? *named : *from.format;
    }
    if (!named) return suitable(from, kind, job.dither);
    if (kind == "y4m" && y4m_tag(*named).empty())
        throw Fault("Y4M files hold yuv400, yuv420, yuv422n and yuv444, not ", named->name);
    if (kind != "y4m" && !named->is_rgb())
        throw Fault(kind, " files hold RGB pictures, not ", named->name,
                    "; leave --to out or name an RGB format");
    return *named;
}

std::unique_ptr<Sink> open_sink(const Job &job, const std::string &kind, const Tempo &tempo) {
    const WriteStill write = kind == "png" ? write_png : write_ppm;
    if (kind == "raw" || kind == "y4m") {
        if (job.sheet)
            throw Fault(job.output,
                        ": a contact sheet is a still picture; name a .png or .ppm file");
        return kind == "raw" ? raw_sink(job.output) : y4m_sink(job.output, tempo);
    }
    return job.sheet ? sheet_sink(job.output, write, job.columns) : still_sink(job.output, write);
}

}  // namespace

void run(const Job &job) {
    const std::unique_ptr<Source> source = open_source(job.source);
    const std::string kind = output_kind(job);

    // What happens to a frame, in order; every stage takes up the shape that the one before leaves.
    std::vector<std::unique_ptr<Stage>> stages;
    auto shape = [&] { return stages.empty() ? source->shape() : stages.back()->out(); };
    {
        auto road = std::make_unique<Road>(shape(), target(job, shape(), kind), job.dither);
        if (!job.quiet && !job.verbose && !road->loss().empty())
            std::fprintf(stderr,
                         "simgp-convert: note: no direct conversion; %s passes through %s\n",
                         road->text().c_str(), road->loss().c_str());
        stages.push_back(std::move(road));
    }

    if (job.verbose) {
        std::fprintf(stderr, "%s: %s %dx%d\n", source->name().c_str(),
                     std::string(source->shape().format->name).c_str(), source->shape().width,
                     source->shape().height);
        for (const auto &stage : stages) std::fprintf(stderr, "%s\n", stage->text().c_str());
    }

    const std::unique_ptr<Sink> sink = open_sink(job, kind, source->tempo());
    Progress progress(!job.quiet);
    int64_t frames = 0;
    try {
        Picture frame(source->shape());
        while ((job.frames == 0 || frames < job.frames) && source->next(frame)) {
            Picture *at = &frame;
            for (const auto &stage : stages) at = &stage->run(*at);
            sink->put(*at);
            ++frames;
            double part = source->done();
            if (job.frames) part = std::max(part, double(frames) / double(job.frames));
            progress.show(frames, part);
        }
        if (frames == 0) throw Fault(source->name(), ": holds no frame");
        sink->finish();
    } catch (const Fault &fault) {
        progress.clear();
        if (sink->kept() == 0) throw;
        throw Fault(fault.what(), " (", sink->kept(), " complete pictures stay)");
    }
    progress.clear();
    if (job.verbose)
        std::fprintf(stderr, "%lld frame%s -> %s\n", (long long)frames, frames == 1 ? "" : "s",
                     job.output == "-" ? "standard output" : job.output.c_str());
}

std::string list_conversions() {
    std::string page = "Conversions of the library (* can be dithered):\n";
    for (const Format &from : formats()) {
        std::string line;
        for (const Format &to : formats()) {
            const bool plain = offered(from, to, Via::csc),
                       dithered = offered(from, to, Via::dither);
            if (plain || dithered) line.append(" ").append(to.name).append(dithered ? "*" : "");
        }
        if (line.empty()) continue;
        page.append("  ").append(from.name).append(10 - from.name.size(), ' ');
        page.append("->").append(line).append("\n");
    }
    page += "Formats that no conversion leads to; samples are moved into them from other YUV:\n ";
    for (const Format &to : formats())
        for (const Format &from : formats())
            if (offered(from, to, Via::samples)) {
                page.append(" ").append(to.name);
                break;
            }
    return page + "\nEverything else goes over several of these steps; --verbose names them.\n";
}

}  // namespace tools
