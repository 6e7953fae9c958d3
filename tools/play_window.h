// A window on the screen, by SDL2.
#ifndef TOOLS_PLAY_WINDOW_H
#define TOOLS_PLAY_WINDOW_H

#include <string>

#include "tools/picture.h"

struct SDL_Window;

namespace tools {

class window {
  public:
    // Where pixels are `fixed`, the window gets the size that is asked for, else it shrinks to what the
    // screen has room for. Fails with a fault, as every member does.
    window(const std::string &title, int width, int height, bool fixed);
    ~window();
    window(const window &) = delete;
    window &operator=(const window &) = delete;

    int width() const;
    int height() const;
    // The format of the screen's own pixels, or, if the library has no such format, one of 32 bits.
    const pixel_format &natural_format() const;

    enum class event { none, quit, resized, damaged, key, left, right };
    // Waits up to so many seconds for an event; `key` is the character of the key then.
    event wait(double seconds, char &key);

    // Shows `p`, rgb565 or bgra8888, with its top left corner at (x, y), black around it, and an
    // rgb888 picture, unless that is null, in the top left corner of all.
    void show(picture &p, int x, int y, picture *overlay);

  private:
    SDL_Window *window_ = nullptr;
};

}  // namespace tools

#endif
