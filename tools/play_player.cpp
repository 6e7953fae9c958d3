#include "tools/play_player.h"

#include <stdio.h>
#include <string.h>

#include <algorithm>
#include <cmath>
#include <optional>

#include "rows/choose.h"
#include "tools/output.h"
#include "tools/play_film.h"
#include "tools/play_overlay.h"
#include "tools/play_window.h"
#include "tools/rgb.h"
#include "tools/sink.h"

namespace tools {

namespace {

using clock = std::chrono::steady_clock;

// How far behind a key frame the arrow to the left still leads to the one before.
constexpr double left_slack = .7;
// A frame that is later than this is no longer made up for.
constexpr double most_late = .25;
// Times that leap further than this are not followed.
constexpr double longest_wait = 10;

// A picture and where it lies in the window.
struct placed {
    int x, y, width, height;
    bool operator==(const placed &) const = default;
};

// The largest of its ratio, in the middle.
placed fitted(int width, int height, double ratio) {
    int w = width, h = int(std::lround(width / ratio));
    if (h > height) h = height, w = int(std::lround(height * ratio));
    w = std::clamp(w, 1, width);
    h = std::clamp(h, 1, height);
    return {(width - w) / 2, (height - h) / 2, w, h};
}

void paste(picture &to, const picture &p, int x, int y) {
    const int lines = std::min(p.height(), to.height() - y);
    const int pixels = std::min(p.width(), to.width() - x);
    for (int line = 0; line < lines; ++line)
        memcpy(to.sample(0, x, y + line), p.line(0, line), size_t(pixels) * 3);
}

class player {
  public:
    explicit player(const play_options &options)
        : options_(options), film_(open_film(options.path)), look_(options.first) {
        if (!film_->next(frame_)) throw fault(film_->name(), ": holds no frame");
        look_.quarters = (look_.quarters + film_->quarters()) % 4;
        int width = 0, height = 0;
        if (options.size.empty()) {
            // As high as the film has lines, or, lying on its side, as wide.
            height = look_.is_upright()
                         ? frame_.image.height()
                         : int(std::lround(frame_.image.width() * film_->pixel_aspect()));
            width = std::max(1, int(std::lround(height * ratio())));
            check_size(width, height, film_->name());
        } else {
            parse_size(options.size, "--size", width, height);
        }
        window_.emplace("simgp-play: " + film_->name(), width, height, !options.size.empty());
        look_.format =
            options.format.empty() ? &window_->natural_format() : &format_named(options.format);
        overlay_on_ = options.overlay;
        paused_ = options.paused;
        // As if their keys had been pressed.
        look_.dither = false;
        look_.deblock = 0;
        if (options.first.dither) press('d');
        if (options.first.deblock) press('b');
    }

    void run() {
        draw();
        begin_clock();
        while (!quit_ && !is_done()) {
            if (is_moving() && !has_coming_) fetch();
            const bool moving = is_moving() && has_coming_;
            const double left =
                moving ? std::chrono::duration<double>(due() - clock::now()).count() : .5;
            char key = 0;
            const window::event event = window_->wait(stale_ ? 0 : left, key);
            if (event != window::event::none) handle(event, key);
            // Of many events the picture is drawn once; but they may not stop a film.
            if (event != window::event::none && left > -most_late) continue;
            if (is_moving() && has_coming_ && clock::now() >= due())
                step_on();
            else if (stale_)
                draw();
        }
        if (options_.screenshot_at_end && !quit_) save();
    }

  private:
    bool is_done() const { return options_.frames > 0 && (ended_ || frames_ >= options_.frames); }

    // Width over height of the picture as it is seen.
    double ratio() const {
        const double lying = frame_.image.width() * film_->pixel_aspect() / frame_.image.height();
        return look_.is_upright() ? lying : 1 / lying;
    }

    const colour &colour_now() const {
        return resolved(frame_.colour, frame_.image.width(), frame_.image.height());
    }

    bool is_moving() const { return !paused_ && !ended_; }

    // When the frame that comes is to be seen.
    clock::time_point due() const {
        const double time = std::min(coming_.time, frame_.time + longest_wait);
        return begun_ + std::chrono::duration_cast<clock::duration>(
                            std::chrono::duration<double>(time - begun_at_));
    }
    void begin_clock() {
        begun_ = clock::now();
        begun_at_ = frame_.time;
    }

    // Decodes the frame that comes.
    void fetch() {
        has_coming_ = decode_.measure([&] { return film_->next(coming_); });
        if (has_coming_) return;
        ended_ = true;
        stale_ = overlay_on_;
    }
    // Shows it.
    void step_on() {
        if (!has_coming_) fetch();
        if (!has_coming_) return;
        const bool late = clock::now() - due() > std::chrono::duration<double>(most_late);
        const bool leaps = coming_.time > frame_.time + longest_wait;
        std::swap(frame_, coming_);
        has_coming_ = false;
        ++frames_;
        draw();
        if (late || leaps) begin_clock();
    }

    // The chain for the frame, the window and the look of now.
    void prepare(const look &wish) {
        const picture_shape &from = frame_.image.shape();
        const bool upright = wish.is_upright();
        const double lying = from.width * film_->pixel_aspect() / from.height;
        const int width = window_->width(), height = window_->height();
        const placed at = fitted(width, height, upright ? lying : 1 / lying);
        const int32_t code = colour_now().code;
        if (chain_ && made_from_ == from && made_for_ == wish && made_in_ == code && place_ == at)
            return;
        auto made = std::make_unique<chain>(from, code, wish, at.width, at.height);
        chain_ = std::move(made);
        made_from_ = from;
        made_for_ = wish;
        made_in_ = code;
        place_ = at;
    }

    // From the frame to the screen.
    void draw() {
        prepare(look_);
        picture_ = &chain_->run(frame_.image);
        present();
        stale_ = false;
    }
    void present() {
        if (overlay_on_) box_ = text_box(overlay_lines(), window_->width() >= 640 ? 2 : 1);
        show_.measure(
            [&] { window_->show(*picture_, place_.x, place_.y, overlay_on_ ? &box_ : nullptr); });
    }

    std::vector<std::string> overlay_lines() const {
        const picture &p = frame_.image;
        const auto size = [](int width, int height) {
            return std::to_string(width) + "x" + std::to_string(height);
        };
        std::vector<std::string> lines;
        lines.push_back(std::string(p.format().name) + " " + size(p.width(), p.height()) + " " +
                        (p.format().is_rgb() ? "" : colour_text(colour_now(), frame_.colour)));
        lines.push_back("-> " + std::string(look_.format->name) + " " +
                        size(place_.width, place_.height) + " by " +
                        simgp::target_name(simgp::live_target()));
        lines.push_back("keys: " + film_->keys());
        char time[64];
        snprintf(time, sizeof time, "%.2f s%s", frame_.time,
                 ended_    ? " end"
                 : paused_ ? " paused"
                           : "");
        lines.push_back(time);
        double sum = 0;
        const auto add = [&](const step_time &t) {
            lines.push_back(time_text(t.ms(), t.what()));
            sum += t.ms();
        };
        add(decode_);
        for (const step_time &t : chain_->times()) add(t);
        add(show_);
        lines.push_back(time_text(sum, "in all"));
        return lines;
    }

    // What the window shows, as a file.
    void save() {
        if (stale_) draw();
        picture all({&format_coded(SIMGP_FMT_RGB888), window_->width(), window_->height()});
        paste(all, to_rgb888(*picture_), place_.x, place_.y);
        if (overlay_on_) paste(all, box_, 0, 0);
        output out(destination{options_.screenshot});
        write_png(out, all);
        out.commit();
        printf("%s: frame at %.3f s\n", options_.screenshot.c_str(), frame_.time);
        fflush(stdout);
    }

    // Takes over a look, unless the library cannot do it to these frames.
    void change(const look &wish) {
        try {
            if (wish.dither && !wish.format->is_rgb16())
                throw fault("there is no dithering of 32-bit pixels; --rgb565 or the key f asks ",
                            "for 16 bits");
            prepare(wish);
            look_ = wish;
            stale_ = true;
        } catch (const fault &f) {
            fprintf(stderr, "simgp-play: %s\n", f.what());
        }
    }

    void seek(bool forward) {
        if (!film_->seek(frame_.place, forward, is_moving() ? left_slack : 0)) return;
        ended_ = has_coming_ = false;
        const int64_t frames = frames_;
        step_on();
        frames_ = frames;  // it takes the place of another
        begin_clock();
    }

    void handle(window::event event, char key) {
        switch (event) {
            case window::event::quit:
                quit_ = true;
                break;
            case window::event::resized:
                stale_ = true;
                break;
            case window::event::damaged:
                if (!stale_) present();
                break;
            case window::event::left:
            case window::event::right:
                seek(event == window::event::right);
                break;
            default:
                press(key);
        }
    }

    void press(char key) {
        look wish = look_;
        switch (key) {
            case 'q':
                quit_ = true;
                break;
            case ' ':
                paused_ = !paused_;
                stale_ = true;
                begin_clock();
                break;
            case '.':
                paused_ = true;
                if (!is_done() && !ended_) step_on();
                break;
            case 'r':
                wish.turn();
                change(wish);
                break;
            case 'h':
            case 'v':
                wish.mirror(key == 'h');
                change(wish);
                break;
            case 'd':
                wish.dither = !wish.dither;
                change(wish);
                break;
            case 'b':
                wish.deblock = wish.deblock ? 0 : usual_deblocking;
                change(wish);
                break;
            case 'f':
                wish.format =
                    &format_coded(look_.format->is_rgb16() ? SIMGP_FMT_BGRA8888 : SIMGP_FMT_RGB565);
                wish.dither &= wish.format->is_rgb16();
                change(wish);
                break;
            case 'o':
                overlay_on_ = !overlay_on_;
                stale_ = true;
                break;
            case 's':
                save();
                break;
            default:
                break;
        }
    }

    const play_options &options_;
    std::unique_ptr<film> film_;
    film_frame frame_;   // the one that is seen
    film_frame coming_;  // the one behind it, if it has been decoded
    bool has_coming_ = false;
    std::optional<window> window_;
    look look_;
    bool overlay_on_ = false, paused_ = false, ended_ = false, quit_ = false;
    bool stale_ = false;  // the window shows what is no longer so
    int64_t frames_ = 1;

    std::unique_ptr<chain> chain_;
    picture_shape made_from_;
    look made_for_;
    int32_t made_in_ = 0;
    placed place_ = {};

    picture *picture_ = nullptr;  // what is seen
    picture box_;
    step_time decode_{"decode and copy"}, show_{"show"};

    clock::time_point begun_;  // when the film's second begun_at_ was seen
    double begun_at_ = 0;
};

}  // namespace

void play(const play_options &options) { player(options).run(); }

}  // namespace tools
