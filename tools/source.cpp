#include "tools/source.h"

#include <sys/stat.h>

#include "tools/numbered.h"

namespace tools {

namespace {

// What ffmpeg can read and this program cannot, by how it begins; null for everything else.
const char *foreign_kind(std::string_view begin) {
    using namespace std::string_view_literals;
    return begin.starts_with("\xFF\xD8\xFF"sv)                            ? "a JPEG"
           : begin.substr(0, 8).ends_with("ftyp")                         ? "an MP4"
           : begin.starts_with("\x1A\x45\xDF\xA3"sv)                      ? "a Matroska"
           : begin.starts_with("RIFF")                                    ? "a RIFF"
           : begin.starts_with("GIF8")                                    ? "a GIF"
           : begin.starts_with("BM")                                      ? "a BMP"
           : begin.starts_with("II*\0"sv) || begin.starts_with("MM\0*"sv) ? "a TIFF"
           : begin.starts_with("\x30\x26\xB2\x75"sv)                      ? "an ASF"
           : begin.starts_with("FLV")                                     ? "an FLV"
           : begin.starts_with("\0\0\0\1"sv)                              ? "an H.264 or H.265"
           : begin.starts_with("\0\0\1\xBA"sv) || begin.starts_with("\0\0\1\xB3"sv) ? "an MPEG"
                                                                                    : nullptr;
}

std::unique_ptr<source> open_file(const source_options &options, const std::string &path) {
    const pixel_format *format = options.format.empty() ? nullptr : &format_named(options.format);
    auto in = std::make_unique<input>(path);
    const std::string begin = in->peek(12);
    const bool png = begin.starts_with("\x89PNG\r\n\x1a\n"), y4m = begin.starts_with("YUV4MPEG2");
    const bool ppm = (begin.starts_with("P6") || begin.starts_with("P5")) && begin.size() > 2 &&
                     isspace(static_cast<unsigned char>(begin[2]));
    // "frames.nv21" names the format of raw frames by its ending.
    const pixel_format *raw = format ? format : find_format(ending_of(path));
    if (!options.size.empty()) {
        if (!raw && (png || y4m || ppm))
            throw fault(in->name(), ": --size is for raw frames; this file says its own, which ",
                        "--resize changes");
        if (!raw)
            throw fault(in->name(),
                        ": raw frames need --format as well as --size, such as --format ",
                        "nv21 --size ", options.size);
        picture_shape shape{raw};
        parse_size(options.size, "--size", shape.width, shape.height);
        return open_raw(std::move(in), shape);
    }
    if (begin.empty()) in->fail(-1, 0, "the input is empty");
    if (png) return open_png(std::move(in), format ? *format : format_named("rgb888"));
    if (y4m || ppm) {
        auto opened = ppm ? open_ppm(std::move(in)) : open_y4m(std::move(in));
        if (format && format != opened->shape().format)
            throw fault(opened->name(), ": holds ", opened->shape().format->name, ", not ",
                        format->name, " as --format says");
        return opened;
    }
    if (const char *kind = foreign_kind(begin))
        throw fault(in->name(), ": ", kind, " file; ffmpeg reads it: ffmpeg -i ",
                    path == "-" ? "FILE" : "'" + path + "'",
                    " -f yuv4mpegpipe -pix_fmt yuv420p - | simgp-convert - -o OUTPUT");
    if (raw)
        throw fault(in->name(), ": raw frames of ", raw->name,
                    " need --size, such as --size 640x480");
    throw fault(in->name(),
                ": neither Y4M nor PNG nor PPM; raw frames need --format and --size, such as "
                "--format nv21 --size 640x480");
}

// Still pictures of one shape, one after the other. The number of the first is 0 or 1.
class numbered_source : public source {
  public:
    explicit numbered_source(const source_options &options)
        : options_(options), files_(options.path) {
        struct stat about;
        if (stat(files_.name(0).c_str(), &about) != 0) number_ = 1;
        current_ = open_file(options_, files_.name(number_));
        name_ = options.path;
        shape_ = current_->shape();
        traits_ = current_->traits();
    }

    bool next(picture &to) override {
        for (;;) {
            if (current_->next(to)) return true;
            const std::string name = files_.name(++number_);
            struct stat about;
            if (stat(name.c_str(), &about) != 0) return false;
            current_ = open_file(options_, name);
            const picture_shape &shape = current_->shape();
            if (!(shape == shape_))
                throw fault(name, ": ", shape.format->name, " ", shape.width, "x", shape.height,
                            " among pictures of ", shape_.format->name, " ", shape_.width, "x",
                            shape_.height);
        }
    }
    double done() const override { return -1; }

  private:
    source_options options_;
    numbered_name files_;
    int64_t number_ = 0;
    std::unique_ptr<source> current_;
};

}  // namespace

std::unique_ptr<source> open_source(const source_options &options) {
    if (options.path.starts_with("testcard:")) {
        if (!options.size.empty())
            throw fault("--size is for raw frames; a test card has it in its name: testcard:",
                        options.size);
        return open_testcard(
            options.path,
            options.format.empty() ? format_named("yuv420") : format_named(options.format),
            options.colour.empty() ? nullptr : &colour_named(options.colour));
    }
    struct stat about;
    const bool pattern =
        options.path.find('%') != std::string::npos && stat(options.path.c_str(), &about) != 0;
    if (pattern && numbered_name(options.path).numbered)
        return std::make_unique<numbered_source>(options);
    return open_file(options, options.path);
}

}  // namespace tools
