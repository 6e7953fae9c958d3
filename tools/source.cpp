#include "tools/source.h"

namespace tools {

std::unique_ptr<source> open_source(const source_options &options) {
    const pixel_format *format = options.format.empty() ? nullptr : &format_named(options.format);
    if (options.path.starts_with("testcard:")) {
        if (!options.size.empty())
            throw fault("--size is for raw frames; a test card has it in its name: testcard:",
                        options.size);
        return open_testcard(options.path, format ? *format : format_named("yuv420"),
                             options.colour.empty() ? nullptr : &colour_named(options.colour));
    }
    auto in = std::make_unique<input>(options.path);
    if (!options.size.empty()) {
        // "frames.nv21" names its format by its ending.
        if (!format) format = find_format(ending_of(options.path));
        if (!format) throw fault(in->name(), ": raw frames need --format as well as --size");
        picture_shape shape{format};
        parse_size(options.size, "--size", shape.width, shape.height);
        return open_raw(std::move(in), shape);
    }
    const std::string begin = in->peek(9);
    if (begin.empty()) in->fail(-1, 0, "the input is empty");
    if (begin.starts_with("\x89PNG\r\n\x1a\n"))
        return open_png(std::move(in), format ? *format : format_named("rgb888"));
    if (begin == "YUV4MPEG2") {
        auto opened = open_y4m(std::move(in));
        if (format && format != opened->shape().format)
            throw fault(opened->name(), ": holds ", opened->shape().format->name, ", not ",
                        format->name, " as --format says");
        return opened;
    }
    throw fault(in->name(),
                ": neither Y4M nor PNG; raw frames need --format and --size, such as --format nv21 "
                "--size 640x480");
}

}  // namespace tools
