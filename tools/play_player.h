// The player: a film in a window, and what the keys do.
#ifndef TOOLS_PLAY_PLAYER_H
#define TOOLS_PLAY_PLAYER_H

#include <stdint.h>

#include <string>

#include "tools/play_chain.h"

namespace tools {

struct play_options {
    std::string path;
    std::string format;  // rgb565 or bgra8888; empty: that of the screen
    std::string size;    // of the window; empty: that of the film, as far as the screen has room
    look first;          // its format is not used
    bool overlay = false;
    bool paused = false;
    int64_t frames = 0;  // stop after so many; 0: when the user wants it
    std::string screenshot = "simgp-play.png";
    bool screenshot_at_end = false;  // beside those that the user takes
};

void play(const play_options &options);

}  // namespace tools

#endif
