#include "tools/play_window.h"

#include <SDL.h>
#include <string.h>

#include <algorithm>
#include <cmath>

#include "tools/fault.h"

namespace tools {

namespace {

[[noreturn]] void fail(const char *what) { throw fault(what, ": ", SDL_GetError()); }

[[noreturn]] void quit_and_fail(const char *what) {
    const std::string why = SDL_GetError();
    SDL_Quit();
    throw fault(what, ": ", why);
}

SDL_Surface *surface_of(SDL_Window *window) {
    SDL_Surface *s = SDL_GetWindowSurface(window);
    if (!s) fail("the window cannot be drawn into");
    return s;
}

// Draws an RGB picture into a surface, pixel for pixel.
void draw(SDL_Surface *to, picture &p, int x, int y) {
    // SDL names 16-bit formats as words of the machine and these by their bytes.
    const Uint32 format = p.format().code == SIMGP_FMT_RGB565     ? SDL_PIXELFORMAT_RGB565
                          : p.format().code == SIMGP_FMT_BGRA8888 ? SDL_PIXELFORMAT_BGRA32
                                                                  : SDL_PIXELFORMAT_RGB24;
    const int pitch = int(p.line(0, 1) - p.line(0, 0));
    SDL_Surface *from = SDL_CreateRGBSurfaceWithFormatFrom(
        p.line(0, 0), p.width(), p.height(), 8 * p.format().planes[0].bytes, pitch, format);
    if (!from) fail("no picture can be drawn");
    SDL_SetSurfaceBlendMode(from, SDL_BLENDMODE_NONE);
    SDL_Rect at = {x, y, p.width(), p.height()};
    const int result = SDL_BlitSurface(from, nullptr, to, &at);
    SDL_FreeSurface(from);
    if (result != 0) fail("no picture can be drawn");
}

}  // namespace

window::window(const std::string &title, int width, int height, bool fixed) {
    // A screen saver may come; desktop effects may stay.
    SDL_SetHint(SDL_HINT_VIDEO_X11_NET_WM_BYPASS_COMPOSITOR, "0");
    if (SDL_Init(SDL_INIT_VIDEO) != 0) quit_and_fail("no screen");
    // Where SDL2 finds no screen it draws into memory. That is for those who ask for it.
    const char *asked = SDL_getenv("SDL_VIDEODRIVER");
    if (!(asked && *asked) && strcmp(SDL_GetCurrentVideoDriver(), "offscreen") == 0) {
        SDL_Quit();
        throw fault("no screen: neither DISPLAY nor WAYLAND_DISPLAY leads to one");
    }
    SDL_Rect room;
    if (!fixed && SDL_GetDisplayUsableBounds(0, &room) == 0 && room.w > 0 && room.h > 0) {
        const double shrink = std::min({1., double(room.w) / width, double(room.h) / height});
        width = std::max(1, int(std::lround(width * shrink)));
        height = std::max(1, int(std::lround(height * shrink)));
    }
    window_ = SDL_CreateWindow(title.c_str(), SDL_WINDOWPOS_UNDEFINED, SDL_WINDOWPOS_UNDEFINED,
                               width, height, SDL_WINDOW_RESIZABLE);
    if (!window_) quit_and_fail("no window");
}

window::~window() {
    SDL_DestroyWindow(window_);
    SDL_Quit();
}

int window::width() const { return surface_of(window_)->w; }
int window::height() const { return surface_of(window_)->h; }

const pixel_format &window::natural_format() const {
    const bool is_rgb565 = SDL_GetWindowPixelFormat(window_) == SDL_PIXELFORMAT_RGB565;
    return format_coded(is_rgb565 ? SIMGP_FMT_RGB565 : SIMGP_FMT_BGRA8888);
}

window::event window::wait(double seconds, char &key) {
    SDL_Event e;
    // Rounded up, so as not to spin through the last millisecond.
    if (!SDL_WaitEventTimeout(&e, int(std::ceil(std::max(seconds, 0.) * 1000)))) return event::none;
    if (e.type == SDL_QUIT) return event::quit;
    if (e.type == SDL_WINDOWEVENT) {
        if (e.window.event == SDL_WINDOWEVENT_SIZE_CHANGED) return event::resized;
        if (e.window.event == SDL_WINDOWEVENT_EXPOSED) return event::damaged;
    }
    if (e.type != SDL_KEYDOWN) return wait(0, key);
    const SDL_Keycode code = e.key.keysym.sym;
    if (code == SDLK_ESCAPE) return event::quit;
    if (code == SDLK_LEFT) return event::left;
    if (code == SDLK_RIGHT) return event::right;
    if (code < ' ' || code > '~') return wait(0, key);
    key = char(code);
    return event::key;
}

void window::show(picture &p, int x, int y, picture *overlay) {
    SDL_Surface *screen = surface_of(window_);
    if (p.width() < screen->w || p.height() < screen->h)
        SDL_FillRect(screen, nullptr, SDL_MapRGB(screen->format, 0, 0, 0));
    draw(screen, p, x, y);
    if (overlay) draw(screen, *overlay, 0, 0);
    if (SDL_UpdateWindowSurface(window_) != 0) fail("the window cannot be drawn into");
}

}  // namespace tools
