// Y4M, uncompressed video: a line of text about the stream, then for each frame a line that begins
// with FRAME and the tight planes.
#include <ctype.h>

#include <algorithm>
#include <charconv>
#include <limits>

#include "tools/sink.h"
#include "tools/source.h"

namespace tools {

namespace {

constexpr size_t longest_line = 1024;

// Colour space tags. 4:2:0 comes in several sitings of chroma, which say where a sample belongs,
// not where it lies in memory. Of the tags of one format, the first is the one that is written.
constexpr struct {
    std::string_view tag;
    int32_t format;
} colour_tags[] = {{"420jpeg", SIMGP_FMT_YUV420},  {"420", SIMGP_FMT_YUV420},
                   {"420mpeg2", SIMGP_FMT_YUV420}, {"420paldv", SIMGP_FMT_YUV420},
                   {"422", SIMGP_FMT_YUV422N},     {"444", SIMGP_FMT_YUV444},
                   {"mono", SIMGP_FMT_YUV400}};

// Extensions of the header. The first is common, the second one of our own: there is no common one.
constexpr std::string_view range_key = "COLORRANGE", matrix_key = "COLORMATRIX";

std::string upper(std::string text) {
    for (char &c : text) c = char(toupper(c));
    return text;
}

const pixel_format *format_of_tag(std::string_view tag) {
    for (const auto &known : colour_tags)
        if (known.tag == tag) return &format_coded(known.format);
    return nullptr;
}

// "420p10", "mono16": a known layout, with a number of bits behind it.
bool high_depth(std::string_view tag) {
    for (const char *begin : {"420p", "422p", "444p", "440p", "mono"})
        if (tag.starts_with(begin)) {
            const std::string_view depth = tag.substr(4);
            return !depth.empty() &&
                   depth.find_first_not_of("0123456789") == std::string_view::npos;
        }
    return false;
}

class y4m_source : public source {
  public:
    explicit y4m_source(std::unique_ptr<input> in) : input_(std::move(in)) {
        name_ = input_->name();
        std::string header;
        if (!input_->line(header, longest_line)) fail(0, "the Y4M header has no end");
        if (!header.starts_with("YUV4MPEG2 "))
            fail(0, "the Y4M header does not begin with YUV4MPEG2");
        shape_.format = format_of_tag("420");  // unless the header says otherwise
        constexpr int64_t missing = std::numeric_limits<int64_t>::min();
        int64_t width = missing, height = missing;
        for (size_t at = 10; at < header.size();) {
            const size_t end = std::min(header.find(' ', at), header.size());
            const std::string tag = header.substr(at, end - at),
                              value = tag.substr(tag.empty() ? 0 : 1);
            const int64_t begin = int64_t(at);
            at = end + 1;
            if (tag.empty()) continue;
            switch (tag[0]) {
                case 'W':
                    width = number(value, begin);
                    break;
                case 'H':
                    height = number(value, begin);
                    break;
                case 'C':
                    if (high_depth(value))
                        fail(begin, "colour space ", tag,
                             " has more than 8 bits a sample; only 8-bit video is supported");
                    shape_.format = format_of_tag(value);
                    traits_.space = value;
                    if (!shape_.format)
                        fail(begin, "unknown colour space tag ", tag,
                             "; mono, 420, 422 and 444 are supported");
                    break;
                case 'F':
                    traits_.rate = value;
                    break;
                case 'I':
                    traits_.interlacing = value;
                    break;
                case 'A':
                    traits_.aspect = value;
                    break;
                case 'X':
                    extension(value, begin);
                    break;
                default:
                    fail(begin, "unknown tag '", tag, "' in the Y4M header");
            }
        }
        if (width == missing || height == missing)
            fail(0, "the Y4M header lacks ", width == missing ? "W" : "H");
        check_size(width, height, name_ + ": byte 0: Y4M header");
        shape_.width = int(width);
        shape_.height = int(height);
    }

    bool next(picture &to) override {
        const int64_t begin = input_->offset();
        if (input_->peek(1).empty()) return false;
        std::string header;
        if (!input_->line(header, longest_line) ||
            !(header == "FRAME" || header.starts_with("FRAME ")))
            input_->fail(frame_, begin, "no FRAME line where a frame should begin");
        read_frame(*input_, to, frame_);
        ++frame_;
        return true;
    }

    double done() const override { return input_->done(); }

  private:
    template <class... Part>
    [[noreturn]] void fail(int64_t at, const Part &...part) const {
        input_->fail(-1, at, part...);
    }

    // Comments, and what some programs say of the colour.
    void extension(const std::string &text, int64_t at) {
        const size_t sign = text.find('=');
        const std::string key = text.substr(0, sign);
        if (key != range_key && key != matrix_key) {
            traits_.extensions.push_back(text);
            return;
        }
        std::string value = sign == std::string::npos ? "" : text.substr(sign + 1);
        for (char &c : value) c = char(tolower(c));
        const auto &all = colours();
        const bool known = key == range_key
                               ? value == "full" || value == "limited"
                               : std::any_of(all.begin(), all.end(),
                                             [&](const colour &c) { return c.matrix == value; });
        if (!known) fail(at, "unknown colour in tag X", text);
        (key == range_key ? traits_.colour.range : traits_.colour.matrix) = value;
    }

    int64_t number(const std::string &text, int64_t at) const {
        int64_t value = 0;
        const auto result = std::from_chars(text.data(), text.data() + text.size(), value);
        if (result.ec == std::errc::invalid_argument || result.ptr != text.data() + text.size())
            fail(at, "'", text, "' is not a number");
        if (result.ec != std::errc()) fail(at, "impossible size ", text);
        return value;
    }

    std::unique_ptr<input> input_;
    int64_t frame_ = 0;
};

class y4m_sink : public sink {
  public:
    y4m_sink(const destination &to, const video_traits &traits) : output_(to), traits_(traits) {}

    void put(const picture &p) override {
        if (frames_++ == 0) {
            const bool same = format_of_tag(traits_.space) == &p.format();
            std::ostringstream header;
            header << "YUV4MPEG2 W" << p.width() << " H" << p.height() << " F" << traits_.rate
                   << " I" << traits_.interlacing << " A" << traits_.aspect << " C"
                   << (same ? traits_.space : y4m_tag(p.format()));
            const colour_note &known = traits_.colour;
            if (!known.range.empty()) header << " X" << range_key << "=" << upper(known.range);
            if (!known.matrix.empty()) header << " X" << matrix_key << "=" << upper(known.matrix);
            // FFmpeg writes the colour space a second time, as XYSCSS.
            for (const std::string &x : traits_.extensions)
                if (same || !x.starts_with("YSCSS=")) header << " X" << x;
            header << "\n";
            output_.write(header.str());
        }
        output_.write("FRAME\n");
        write_frame(output_, p);
    }
    void finish() override { output_.commit(); }

  private:
    output output_;
    video_traits traits_;
    int64_t frames_ = 0;
};

}  // namespace

std::string_view y4m_tag(const pixel_format &format) {
    for (const auto &known : colour_tags)
        if (known.format == format.code) return known.tag;
    return {};
}

std::unique_ptr<source> open_y4m(std::unique_ptr<input> in) {
    return std::make_unique<y4m_source>(std::move(in));
}

std::unique_ptr<sink> open_y4m_sink(const destination &to, const video_traits &traits) {
    return std::make_unique<y4m_sink>(to, traits);
}

}  // namespace tools
