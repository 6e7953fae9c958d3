// What becomes of a frame between the decoder and the window, and what each step of it costs.
#ifndef TOOLS_PLAY_CHAIN_H
#define TOOLS_PLAY_CHAIN_H

#include <chrono>
#include <memory>
#include <string>
#include <vector>

#include "tools/colour.h"
#include "tools/road.h"

namespace tools {

// A running mean of what one step takes.
class step_time {
  public:
    explicit step_time(std::string what) : what_(std::move(what)) {}
    // Calls work() and adds the time that it took.
    template <class Work>
    auto measure(Work work) {
        struct Add {
            step_time &to;
            std::chrono::steady_clock::time_point start = std::chrono::steady_clock::now();
            ~Add() { to.add(std::chrono::steady_clock::now() - start); }
        } adds_at_the_end{*this};
        return work();
    }
    const std::string &what() const { return what_; }
    double ms() const { return ms_; }

  private:
    void add(std::chrono::duration<double, std::milli> spent) {
        ++count_;
        // Of the first frames all count the same, later the last ones count most.
        ms_ += (spent.count() - ms_) / (count_ < 16 ? count_ : 16);
    }

    std::string what_;
    double ms_ = 0;
    int count_ = 0;
};

// Strength of deblocking, where nobody names one: a mild one.
constexpr int usual_deblocking = 4;

// How the user wants to see the frames.
struct look {
    const pixel_format *format = nullptr;  // of the screen
    bool tiled = false;                    // frames come in tiles, as hardware decoders write them
    int deblock = 0;                       // strength; 0: not
    bool dither = false;
    int quarters = 0;       // quarter turns to the right, 0 ... 3,
    bool mirrored = false;  // of a picture that was mirrored left to right before

    bool operator==(const look &) const = default;
    bool is_upright() const { return quarters % 2 == 0; }
    // A quarter turn to the right, and mirrors, of what is seen.
    void turn() { quarters = (quarters + 1) % 4; }
    void mirror(bool left_to_right);
};

class chain {
  public:
    // Makes frames of `from` into pictures of `width` x `height`. Ends in a fault if that cannot be.
    chain(const picture_shape &from, int32_t colour, const look &wish, int width, int height);
    // The frame stays as it is. The result is valid until the next call.
    picture &run(picture &frame);
    const std::vector<step_time> &times() const { return times_; }

  private:
    bool changes_frames_;
    picture copy_;
    std::vector<std::unique_ptr<road>> roads_;
    std::vector<step_time> times_;  // of all their steps, in order
};

}  // namespace tools

#endif
