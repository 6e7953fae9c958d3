// Where frames go.
#ifndef TOOLS_SINK_H
#define TOOLS_SINK_H

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "tools/output.h"
#include "tools/picture.h"
#include "tools/raw.h"
#include "tools/source.h"

namespace tools {

class sink {
  public:
    virtual ~sink() = default;
    virtual void put(const picture &p) = 0;
    // All frames are there: completes the file. Without this call no unfinished file stays.
    virtual void finish() = 0;
    // Complete files that stay even if the work fails now.
    virtual int64_t kept() const { return 0; }
};

std::unique_ptr<sink> open_raw_sink(const destination &to);
std::unique_ptr<sink> open_y4m_sink(const destination &to, const video_traits &traits);

// What the colour space tag of a Y4M stream says for this format; empty if Y4M cannot hold it.
std::string_view y4m_tag(const pixel_format &format);

// Writes one still picture, of any RGB format.
using still_writer = void (*)(output &out, const picture &p);
void write_png(output &out, const picture &p);
void write_ppm(output &out, const picture &p);

// Still pictures. A path with a number in it ("out-%04d.png"; the first picture is number 0) gives
// a file for each frame, any other path holds one frame and a second one is a fault.
std::unique_ptr<sink> open_still_sink(const destination &to, still_writer write);
// One still picture that shows the frames in a grid; `columns` 0 makes it about as wide as high.
// Of more than 64 frames it shows every second, fourth, ...
std::unique_ptr<sink> open_sheet_sink(const destination &to, still_writer write, int columns);

}  // namespace tools

#endif
