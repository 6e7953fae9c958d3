// Where frames go.
#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "tools/output.h"
#include "tools/picture.h"
#include "tools/raw.h"
#include "tools/source.h"

namespace tools {

class Sink {
  public:
    virtual ~Sink() = default;
    virtual void put(const Picture &picture) = 0;
    /// All frames are there: completes the file. Without this call no unfinished file stays.
    virtual void finish() = 0;
    /// Complete files that stay even if the work fails now.
    virtual int64_t kept() const { return 0; }
};

std::unique_ptr<Sink> raw_sink(const std::string &path);
std::unique_ptr<Sink> y4m_sink(const std::string &path, const Tempo &tempo);

/// What the colour space tag of a Y4M stream says for this format; empty if Y4M cannot hold it.
std::string_view y4m_tag(const Format &format);

/// Writes one still picture, of any RGB format.
using WriteStill = void (*)(Output &output, const Picture &picture);
void write_png(Output &output, const Picture &picture);
void write_ppm(Output &output, const Picture &picture);

/// Still pictures. A path with a number in it ("out-%04d.png"; the first picture is number 0) gives
/// a file for each frame, any other path holds one frame and a second one is a Fault.
std::unique_ptr<Sink> still_sink(const std::string &path, WriteStill write);
/// One still picture that shows the frames in a grid; `columns` 0 makes it about as wide as high.
/// Of more than 64 frames it shows every second, fourth, ...
std::unique_ptr<Sink> sheet_sink(const std::string &path, WriteStill write, int columns);

}  // namespace tools
