// simgp-convert: takes frames from files, pipes or a test card through the library's conversions.
#include <algorithm>
#include <iterator>

#include "tools/job.h"
#include "tools/main.h"
#include "tools/output.h"

namespace {

constexpr const char *examples = R"(
Inputs: Y4M video (mono, 4:2:0, 4:2:2, 4:4:4 of 8 bits), PNG, PPM, numbered files such as
in-%04d.png (from 0 or 1 on), raw frames with --format and --size, a moving test card
testcard:[WIDTHxHEIGHT][@FRAMES] (one frame of 640x480, unless it says more), and "-" for the
standard input.
Outputs by their ending: .png, .ppm, .y4m, anything else raw frames; "-" is the standard output.

Between YUV and RGB, colours are what --colour says; without it, what the Y4M header says in its tags
XCOLORRANGE=FULL or LIMITED and XCOLORMATRIX=BT601, BT709 or BT2020. What is not said follows from
the size of the frames: HD (1280 or more pixels along the longer side, or more than 576 along the
other) is bt709, less is bt601; the range is limited. Y4M that is written says so where a reader
could not know.

Examples:
  simgp-convert clip.y4m -o frame-%04d.png
  simgp-convert clip.y4m -o overview.png --sheet
  simgp-convert clip.y4m -o screen.rgb565 --dither
  simgp-convert camera.nv21 --size 640x480 -o camera.png --frames 1
  simgp-convert photo.png -o photo.t64x32
  simgp-convert photo.t64x32 --size 640x480 -o back.png --verbose
  simgp-convert testcard:320x240@50 -o card.y4m
  simgp-convert clip.y4m -o small-%04d.png --deblock 4 --resize 320x240
  simgp-convert decoded.t64x32 --size 1280x720 -o screen.rgb565 --resize 480x800 --rotate 90r
  simgp-convert photo.png -o index.png --thumbnail
  simgp-convert camera.nv12 --size 1280x720 --colour bt601-full -o camera.png
  simgp-convert screen.bgra8888 --size 1920x1080 --chroma mean -o screen.y4m --to yuv420
  ffmpeg -i film.mp4 -f yuv4mpegpipe -pix_fmt yuv420p - | simgp-convert - -o film.png --sheet
)";

}  // namespace

int main(int argc, char **argv) {
    tools::tidy_on_signals();

    CLI::App app("Converts pictures and video frames between the formats of the simgp library.",
                 "simgp-convert");
    app.footer(examples);
    tools::job job;
    bool list = false;
    std::string demo;
    app.add_option("input", job.source.path, "file, \"-\", or testcard:[WxH][@FRAMES]");
    app.add_option("-o,--output", job.output, "file, out-%04d.png for a file each frame, or \"-\"");
    app.add_option("-t,--to", job.to,
                   "destination format; without it, what suits the output best (see --list)");
    app.add_option("-f,--format", job.source.format, "format of raw frames or of the test card");
    app.add_option("-s,--size", job.source.size, "size of raw frames, such as 640x480");
    app.add_option("-n,--frames", job.frames, "stop after so many frames; all without it")
        ->check(tools::at_least_one("; leave it out for all of them"));
    bool keep = false;
    app.add_flag("--no-clobber", keep, "leave files alone that are there already");
    app.add_option("--colour,--color", job.source.colour,
                   "what Y, U and V mean, instead of what the input says of it (see below)")
        ->check(CLI::IsMember(tools::colour_names()));
    std::string chroma = "first";
    app.add_option("--chroma", chroma,
                   "chroma that several pixels share: that of the first (the default), or the mean")
        ->check(CLI::IsMember({"first", "mean"}));
    app.add_flag("-d,--dither", job.dither, "dither on the way to 16-bit RGB");
    app.add_option("--deblock", job.edit.deblock,
                   "smooth the edges between blocks of 8 x 8, 0 (not at all) to 15; YUV only")
        ->check(CLI::Range(0, 15).description(""));
    const auto resize = app.add_option("--resize", job.resize,
                                       "size of what comes out, such as 320x240, after the turn");
    std::string turn(tools::turn_names[SIMGP_ROT_NONE]);
    const auto rotate =
        app.add_option("--rotate", turn,
                       "quarter turn to the left (90l) or right (90r), half turn "
                       "(180), mirrored left to right (hori) or top to bottom (vert)")
            ->check(CLI::IsMember({"90l", "90r", "180", "hori", "vert"}));
    app.add_flag("--thumbnail", job.edit.thumbnail,
                 "half the size and turned right, the quickest way: every second pixel")
        ->excludes(resize)
        ->excludes(rotate);
    app.add_flag("--sheet", job.sheet, "put the frames on one contact sheet");
    const auto columns = app.add_option("--columns", job.columns, "pictures in a row of the sheet")
                             ->check(tools::at_least_one());
    app.add_option("--as", job.as, "kind of output, whatever its name says")
        ->check(CLI::IsMember({"png", "ppm", "y4m", "raw"}));
    app.add_flag("-v,--verbose", job.verbose, "say which way the frames go, and who does what");
    app.add_flag("-q,--quiet", job.quiet, "no progress bar, no notes");
    app.set_version_flag("--version", "simgp-convert " SIMGP_TOOLS_VERSION);
    app.add_flag("--list", list, "list all conversions");
    app.add_option("--demo", demo,
                   "write pictures that show what the library does into this folder");

    const auto check = [&] {
        if (list) return;
        if (!demo.empty()) {
            if (!job.output.empty()) throw CLI::ExcludesError("--demo", "--output");
            return;
        }
        if (columns->count() > 0 && !job.sheet) throw CLI::RequiresError("--columns", "--sheet");
        if (job.source.path.empty()) throw CLI::RequiredError("input");
        if (job.output.empty()) throw CLI::RequiredError("--output");
        job.may_replace = !keep;
        job.chroma_mean = chroma == "mean";
        job.edit.turn =
            int(std::find(std::begin(tools::turn_names), std::end(tools::turn_names), turn) -
                std::begin(tools::turn_names));
    };
    return tools::run_program(app, argc, argv, check, [&] {
        if (list)
            fputs(tools::list_conversions().c_str(), stdout);
        else if (!demo.empty())
            tools::demo(demo, job.source);
        else
            tools::run(job);
        return 0;
    });
}
