// What the player shows: a film, or a test card, frame by frame.
#ifndef TOOLS_PLAY_FILM_H
#define TOOLS_PLAY_FILM_H

#include <memory>
#include <string>

#include "tools/colour.h"
#include "tools/picture.h"

namespace tools {

struct film_frame {
    picture image;       // a copy: the player may change it
    colour_note colour;  // what the stream says of it
    double time = 0;     // seconds from the start of the film
    double place = 0;    // the same, as seek() counts it
};

class film {
  public:
    virtual ~film() = default;
    // The next frame, in the order of showing. False behind the last one. Where nothing at all can be
    // read, or shown by this library, it ends in a fault.
    virtual bool next(film_frame &to) = 0;
    // Lets the next frame be the key frame behind or before the one at `place`; keys less than `slack`
    // seconds before it do not count. False if there is none: then nothing changes.
    virtual bool seek(double place, bool forward, double slack) = 0;

    const std::string &name() const { return name_; }
    // What decides where one may seek: "h264 (avc1): scmn_is_vkeyfrm".
    const std::string &keys() const { return keys_; }
    // Seconds from a frame to the next, where the times do not say.
    double frame_time() const { return frame_time_; }
    // Width of a pixel over its height.
    double pixel_aspect() const { return pixel_aspect_; }
    // Quarter turns to the right that make the film upright; known with the first frame.
    int quarters() const { return quarters_; }

  protected:
    std::string name_, keys_;
    double frame_time_ = 1. / 25, pixel_aspect_ = 1;
    int quarters_ = 0;
};

// "testcard:[WxH][@FRAMES]", which goes on for ever without a number, or anything that FFmpeg opens.
std::unique_ptr<film> open_film(const std::string &path);

}  // namespace tools

#endif
