// One step on the road of a picture: what the library does to it, and what the tool adds.
#ifndef TOOLS_STEP_H
#define TOOLS_STEP_H

#include <string>
#include <string_view>

#include "tools/picture.h"

namespace tools {

// Who does a step. The last two do without a descriptor function.
enum class method {
    csc,
    dither,
    deblock,  // in place
    resize,
    resize_csc,   // resize and conversion in one pass
    resize_turn,  // resize and turn in one pass
    turn,
    csc_turn,    // 4:2:2 to 4:2:0 and a turn in one pass
    turn_bytes,  // each byte of the pixels as a plane of its own
    thumbnail,   // half the size, turned right
    count
};

// "90l" and the others, by rotation code.
inline constexpr std::string_view turn_names[6] = {"none", "90l", "90r", "180", "hori", "vert"};

// True for the turns that exchange width and height.
constexpr bool is_quarter(int turn) { return turn == SIMGP_ROT_90L || turn == SIMGP_ROT_90R; }
// What the planes of a format are after a turn: quarter turns make 4:2:2 with narrow chroma into
// 4:2:2 with wide chroma, and the other way round.
const pixel_format &turned(const pixel_format &format, int turn);

// True if the step exists from one format to another; found out by asking the library for a tiny
// picture, where it has a say. `turn` is the rotation code of the methods that turn.
bool offered(const pixel_format &from, const pixel_format &to, method how, int turn = 0);

// A step, with the picture that it makes.
class step {
  public:
    // `code` is the colour of a conversion, the rotation code, or the strength of deblocking.
    step(method how, const picture_shape &to, int code);

    const picture_shape &out() const { return to_; }
    method how() const { return how_; }
    int code() const { return code_; }
    bool turns() const { return how_ >= method::resize_turn; }
    // Lines and columns beyond the size of `from` are overwritten.
    picture &run(picture &from);
    // Who does it, unless simgp_csc_any does: "simgp_rot 90l".
    std::string note() const;

  private:
    method how_;
    picture_shape to_;
    int code_;
    picture made_;
};

}  // namespace tools

#endif
