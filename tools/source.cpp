#include "tools/source.h"

namespace tools {

namespace {

/// "frames.nv21" names its format by its ending.
const Format *format_of_ending(const std::string &path) {
    const size_t dot = path.rfind('.');
    return dot == std::string::npos ? nullptr : find_format(path.substr(dot + 1));
}

}  // namespace

std::unique_ptr<Source> open_source(const SourceOptions &options) {
    const Format *format = options.format.empty() ? nullptr : &format_named(options.format);
    if (options.path.starts_with("testcard:")) {
        if (!options.size.empty())
            throw Fault("--size is for raw frames; a test card has it in its name: testcard:",
                        options.size);
        return open_testcard(options.path, format ? *format : format_named("yuv420"));
    }
    auto input = std::make_unique<Input>(options.path);
    if (!options.size.empty()) {
        if (!format) format = format_of_ending(options.path);
        if (!format) throw Fault(input->name(), ": raw frames need --format as well as --size");
        Shape shape{format};
        parse_size(options.size, "--size", shape.width, shape.height);
        return open_raw(std::move(input), shape);
    }
    const std::string begin = input->peek(9);
    if (begin.empty()) input->fail(-1, 0, "the input is empty");
    if (begin.starts_with("\x89PNG\r\n\x1a\n"))
        return open_png(std::move(input), format ? *format : format_named("rgb888"));
    if (begin == "YUV4MPEG2") {
        auto source = open_y4m(std::move(input));
        if (format && format != source->shape().format)
            throw Fault(source->name(), ": holds ", source->shape().format->name, ", not ",
                        format->name, " as --format says");
        return source;
    }
    throw Fault(input->name(),
                ": neither Y4M nor PNG; raw frames need --format and --size, such as --format nv21 "
                "--size 640x480");
}

}  // namespace tools
