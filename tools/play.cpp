// simgp-play: shows films through the library, from the decoder's frame to the pixels of a window.
#include "tools/main.h"
#include "tools/play_player.h"

namespace {

constexpr const char *keys = R"(
Keys:
  space   pause            .   one frame on          left, right   to the key frame before, after
  r       quarter turn     h   mirror left to right  v             mirror top to bottom
  d       dither           b   deblock               f             16 or 32 bits a pixel
  o       overlay          s   screenshot            q, Esc        quit

The colour is what the stream says. What it does not say follows from the size of the frames: HD (1280
or more pixels along the longer side, or more than 576 along the other) is bt709, less is bt601; the
range is limited. The overlay tells which it was.

Examples:
  simgp-play film.mp4 --overlay
  simgp-play film.mkv --tiled --rgb565 --dither
  simgp-play testcard:1280x720 --size 480x800
)";

}  // namespace

int main(int argc, char **argv) {
    CLI::App app("Shows films through the simgp library.", "simgp-play");
    app.footer(keys);
    tools::play_options options;
    bool rgb565 = false, rgb32 = false, deblock = false;
    app.add_option("film", options.path,
                   "any film that FFmpeg reads, or testcard:[WxH][@FRAMES], 640x480 without end")
        ->required();
    app.add_flag("--tiled", options.first.tiled,
                 "bring frames into tiles of 64 x 32 first, as hardware decoders write them");
    const auto in_16 = app.add_flag("--rgb565", rgb565, "16-bit pixels, whatever the screen has");
    app.add_flag("--rgb32", rgb32, "32-bit pixels, whatever the screen has")->excludes(in_16);
    app.add_flag("-d,--dither", options.first.dither,
                 "dither, on the way to 16-bit pixels; --rgb565 asks for these");
    app.add_flag("-b,--deblock", deblock, "smooth the edges between blocks of 8 x 8");
    app.add_flag("--overlay", options.overlay,
                 "tell format, size, steps, instruction set and milliseconds");
    app.add_option("-s,--size", options.size, "size of the window, such as 640x480");
    app.add_option("-n,--frames", options.frames, "stop after so many frames")
        ->check(tools::at_least_one());
    app.add_flag("--pause", options.paused, "begin with the first frame, standing");
    const auto screenshot =
        app.add_option("--screenshot", options.screenshot,
                       "PNG file for the key s (simgp-play.png), and for the last of --frames");
    app.set_version_flag("--version", "simgp-play " SIMGP_TOOLS_VERSION);
    const auto check = [&] {
        if (rgb565) options.format = "rgb565";
        if (rgb32) options.format = "bgra8888";
        options.first.deblock = deblock ? tools::usual_deblocking : 0;
        options.screenshot_at_end = screenshot->count() > 0 && options.frames > 0;
    };
    return tools::run_program(app, argc, argv, check, [&] {
        tools::play(options);
        return 0;
    });
}
