// simgp-probe: names the codec of a stream and lists its pictures.
#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <exception>
#include <nlohmann/json.hpp>
#include <optional>

#include "scmn/scmn.h"
#include "tools/progress.h"
#include "tools/stream.h"

namespace {

using json = nlohmann::ordered_json;
using tools::Fault;

constexpr const char *examples = R"(
Files are elementary streams: H.264 with start codes (Annex B), MPEG-4 part 2 or H.263; "-" is the
standard input. Offsets and sizes are in bytes; a picture begins with the headers in front of it.
A key picture is one where playback can start: IDR in H.264, intra-coded in the others.
Without files, the codec of the FourCC is named alone.

Examples:
  simgp-probe clip.h264
  simgp-probe --summary *.m4v
  simgp-probe --fourcc avc1
  simgp-probe --fourcc 0x55
  simgp-probe --json clip.h263 | jq '.[0].pictures[] | select(.key) | .offset'
  ffmpeg -i film.mp4 -c:v copy -an -bsf:v h264_mp4toannexb -f h264 - | simgp-probe -
)";

struct Options {
    std::optional<std::string> fourcc;
    std::vector<std::string> files;
    bool as_json = false, summary_only = false, quiet = false;
};

// The number of a tag: 0x and hexadecimal digits, decimal digits, or up to four characters.
uint32_t tag_of(const std::string &text) {
    const bool hex = text.starts_with("0x") && text.size() > 2;
    const char *digits = hex ? "0123456789abcdefABCDEF" : "0123456789";
    if (text.find_first_not_of(digits, hex ? 2 : 0) == std::string::npos && !text.empty()) {
        if (text.size() <= 10) {
            const unsigned long long number = std::stoull(text, nullptr, hex ? 16 : 10);
            if (number <= UINT32_MAX) return uint32_t(number);
        }
        throw Fault("--fourcc: ", text, " has more than 32 bits");
    }
    if (text.empty() || text.size() > 4)
        throw Fault("--fourcc: \"", text, "\" is neither four characters nor a number");
    char name[4] = {' ', ' ', ' ', ' '};
    std::copy(text.begin(), text.end(), name);
    return SCMN_FOURCC(name[0], name[1], name[2], name[3]);
}

// Text on its way to standard output, in portions between which the progress bar makes room.
class Output {
  public:
    void write(const std::string &text, tools::Progress *bar = nullptr) {
        text_ += text;
        if (text_.size() > 1 << 15) flush(bar);
    }
    void flush(tools::Progress *bar = nullptr) {
        if (bar) bar->clear();
        std::fwrite(text_.data(), 1, text_.size(), stdout);
        text_.clear();
        if (std::fflush(stdout) != 0 || std::ferror(stdout))
            throw Fault("standard output: cannot be written");
    }

  private:
    std::string text_;
};

template <typename... Part>
std::string format(const char *pattern, Part... part) {
    char line[256];
    std::snprintf(line, sizeof line, pattern, part...);
    return line;
}

struct Summary {
    uint64_t pictures = 0, keys = 0, bytes = 0, largest = 0;
    uint64_t first_key = 0, last_key = 0, shortest = UINT64_MAX, longest = 0;

    void add(const tools::CodedPicture &picture) {
        bytes += picture.size;
        largest = std::max(largest, picture.size);
        if (picture.key) {
            if (keys++ == 0) {
                first_key = pictures;
            } else {
                shortest = std::min(shortest, pictures - last_key);
                longest = std::max(longest, pictures - last_key);
            }
            last_key = pictures;
        }
        pictures++;
    }
    double spacing() const { return double(last_key - first_key) / double(keys - 1); }
};

json to_json(const Summary &s, uint64_t stream_bytes) {
    json spacing;
    if (s.keys > 1)
        spacing = {{"shortest", s.shortest}, {"mean", s.spacing()}, {"longest", s.longest}};
    return {{"pictures", s.pictures},       {"key_pictures", s.keys},
            {"key_spacing", spacing},       {"picture_bytes", s.bytes},
            {"largest_picture", s.largest}, {"stream_bytes", stream_bytes}};
}

std::string to_text(const Summary &s, uint64_t stream_bytes) {
    const auto number = [](uint64_t n) { return std::to_string(n); };
    std::string text = number(s.pictures) + (s.pictures == 1 ? " picture, " : " pictures, ") +
                       number(s.keys) + " key";
    if (s.keys > 1)
        text += format(", one every %.1f (%llu to %llu)", s.spacing(),
                       (unsigned long long)s.shortest, (unsigned long long)s.longest);
    text += "; " + number(s.bytes) + " bytes, the largest " + number(s.largest);
    if (stream_bytes > s.bytes)
        text += "; " + number(stream_bytes - s.bytes) + " bytes outside pictures";
    return text + "\n";
}

// Lists one file. In JSON an object, in pieces, so that its length does not matter.
void list(const std::string &path, int32_t media_type, const Options &options, Output &out) {
    tools::Progress bar(!options.quiet);
    bool open = false;  // the array of pictures
    try {
        tools::Input input(path);
        tools::CodedStream stream(input, media_type);
        const char *by = media_type ? "FourCC" : "start codes";
        if (options.as_json) {
            const json head = {{"file", path},
                               {"codec", tools::media_name(stream.media_type())},
                               {"media_type", stream.media_type()},
                               {"recognised_by", by}};
            const std::string text = head.dump(-1, ' ', false, json::error_handler_t::replace);
            out.write(" " + text.substr(0, text.size() - 1));
            if (!options.summary_only) out.write(",\"pictures\":["), open = true;
        } else {
            out.write(path + ": " + tools::media_name(stream.media_type()) + ", from its " + by +
                      "\n");
            if (!options.summary_only) out.write("  picture        offset      size  key\n");
        }

        Summary summary;
        tools::CodedPicture picture;
        while (stream.next(picture)) {
            if (!options.summary_only && options.as_json) {
                const json line = {
                    {"offset", picture.offset}, {"size", picture.size}, {"key", picture.key}};
                out.write((summary.pictures ? ",\n  " : "\n  ") + line.dump(), &bar);
            } else if (!options.summary_only) {
                out.write(format("%9llu %13llu %9llu  %s", (unsigned long long)summary.pictures,
                                 (unsigned long long)picture.offset,
                                 (unsigned long long)picture.size, picture.key ? "key\n" : "-\n"),
                          &bar);
            }
            summary.add(picture);
            bar.show(int64_t(summary.pictures),
                     input.size() > 0 ? double(picture.offset + picture.size) / double(input.size())
                                      : -1);
        }
        if (summary.pictures == 0)
            throw Fault(input.name(), ": no ", tools::media_name(stream.media_type()),
                        " picture in ", input.offset(), " bytes");
        const uint64_t stream_bytes = uint64_t(input.offset());
        if (options.as_json)
            out.write((open ? "],\n  " : ",") +
                      ("\"summary\":" + to_json(summary, stream_bytes).dump()) + "}");
        else
            out.write("  " + to_text(summary, stream_bytes));
        out.flush(&bar);
    } catch (const Fault &fault) {
        if (options.as_json) {
            const json error = {{"error", fault.what()}};
            std::string text = error.dump(-1, ' ', false, json::error_handler_t::replace).substr(1);
            out.write(open ? "],\n  " + text
                           : " {\"file\":" +
                                 json(path).dump(-1, ' ', false, json::error_handler_t::replace) +
                                 "," + text);
        }
        out.flush(&bar);
        throw;
    }
}

// Names the codec of a tag.
void name(const std::string &text, uint32_t tag, Output &out, bool as_json) {
    const int32_t type = scmn_fcc2mt(tag);
    if (as_json)
        out.write(
            json::array(
                {{{"fourcc", text}, {"codec", tools::media_name(type)}, {"media_type", type}}})
                .dump(-1, ' ', false, json::error_handler_t::replace) +
            "\n");
    else
        out.write(text + ": " + tools::media_name(type) + ", media type " + std::to_string(type) +
                  "\n");
    out.flush();
}

int run(const Options &options) {
    Output out;
    int32_t media_type = 0;
    if (options.fourcc) {
        const uint32_t tag = tag_of(*options.fourcc);
        media_type = scmn_fcc2mt(tag);
        if (media_type == SCMN_MT_NONE) throw Fault("--fourcc: ", *options.fourcc, " is not known");
        if (options.files.empty()) {
            name(*options.fourcc, tag, out, options.as_json);
            return 0;
        }
    }
    int status = 0;
    if (options.as_json) out.write("[\n");
    for (size_t i = 0; i < options.files.size(); i++) {
        try {
            list(options.files[i], media_type, options, out);
        } catch (const Fault &fault) {
            // The other files are listed all the same.
            std::fprintf(stderr, "simgp-probe: %s\n", fault.what());
            status = 1;
        }
        if (options.as_json) out.write(i + 1 < options.files.size() ? ",\n" : "\n");
    }
    if (options.as_json) out.write("]\n");
    out.flush();
    return status;
}

}  // namespace

int main(int argc, char **argv) {
    CLI::App app("Names the codec of video streams and lists their pictures.", "simgp-probe");
    app.footer(examples);
    Options options;
    app.add_option("files", options.files, "elementary streams, or \"-\"");
    app.add_option("-c,--fourcc", options.fourcc,
                   "the codec, by its FourCC or WAVE format tag; otherwise start codes tell");
    app.add_flag("-j,--json", options.as_json, "write JSON, an array with an object for each file");
    app.add_flag("-s,--summary", options.summary_only, "leave the list of pictures out");
    app.add_flag("-q,--quiet", options.quiet, "no progress bar");
    try {
        app.parse(argc, argv);
        if (options.files.empty() && !options.fourcc)
            throw CLI::RequiredError("a file or --fourcc");
    } catch (const CLI::Success &wish) {
        return app.exit(wish);
    } catch (const CLI::ParseError &error) {
        std::fprintf(stderr, "simgp-probe: %s (see --help)\n", error.what());
        return 2;
    }
    try {
        return run(options);
    } catch (const std::bad_alloc &) {
        std::fprintf(stderr, "simgp-probe: not enough memory\n");
    } catch (const std::exception &error) {
        std::fprintf(stderr, "simgp-probe: %s\n", error.what());
    }
    return 1;
}
