// simgp-probe: names the codec of a stream and lists its pictures.
#include <stdio.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <optional>

#include "scmn/scmn.h"
#include "tools/main.h"
#include "tools/progress.h"
#include "tools/stream.h"

namespace {

using json = nlohmann::ordered_json;
using tools::fault;

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
  ffmpeg -v error -i film.mp4 -map 0:v:0 -c copy -f h264 - | simgp-probe -
)";

struct options {
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
        throw fault("--fourcc: ", text, " has more than 32 bits");
    }
    if (text.empty() || text.size() > 4)
        throw fault("--fourcc: \"", text, "\" is neither four characters nor a number");
    char name[4] = {' ', ' ', ' ', ' '};
    std::copy(text.begin(), text.end(), name);
    return SCMN_FOURCC(name[0], name[1], name[2], name[3]);
}

// Text on its way to standard output, in portions between which the progress bar makes room.
class listing {
  public:
    void write(const std::string &text, tools::progress *bar = nullptr) {
        text_ += text;
        if (text_.size() > 1 << 15) flush(bar);
    }
    void flush(tools::progress *bar = nullptr) {
        if (bar) bar->clear();
        fwrite(text_.data(), 1, text_.size(), stdout);
        text_.clear();
        if (fflush(stdout) != 0 || ferror(stdout))
            throw fault("standard output: cannot be written");
    }

  private:
    std::string text_;
};

template <class... Part>
std::string format(const char *pattern, Part... part) {
    char line[256];
    snprintf(line, sizeof line, pattern, part...);
    return line;
}

// Names of files need not be UTF-8; JSON has to be.
std::string dumped(const json &value) {
    return value.dump(-1, ' ', false, json::error_handler_t::replace);
}

struct summary {
    uint64_t pictures = 0, keys = 0, bytes = 0, largest = 0;
    uint64_t first_key = 0, last_key = 0, shortest = UINT64_MAX, longest = 0;

    void add(const tools::coded_picture &picture) {
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

json to_json(const summary &s, const tools::description &about, uint64_t stream_bytes) {
    json spacing, size, profile;
    if (about.width) size = {{"width", about.width}, {"height", about.height}};
    if (!about.profile.empty()) profile = about.profile;
    if (s.keys > 1)
        spacing = {{"shortest", s.shortest}, {"mean", s.spacing()}, {"longest", s.longest}};
    return {{"size", size},
            {"profile", profile},
            {"pictures", s.pictures},
            {"key_pictures", s.keys},
            {"key_spacing", spacing},
            {"picture_bytes", s.bytes},
            {"largest_picture", s.largest},
            {"stream_bytes", stream_bytes}};
}

std::string to_text(const summary &s, const tools::description &about, uint64_t stream_bytes) {
    const auto number = [](uint64_t n) { return std::to_string(n); };
    std::string text;
    if (about.width) text += format("%dx%d", about.width, about.height);
    if (!about.profile.empty()) text += (text.empty() ? "" : ", ") + about.profile;
    if (!text.empty()) text += "; ";
    text += number(s.pictures) + (s.pictures == 1 ? " picture, " : " pictures, ") + number(s.keys) +
            " key";
    if (s.keys > 1)
        text += format(", one every %.1f (%llu to %llu)", s.spacing(),
                       (unsigned long long)s.shortest, (unsigned long long)s.longest);
    text += "; " + number(s.bytes) + " bytes, the largest " + number(s.largest);
    if (stream_bytes > s.bytes)
        text += "; " + number(stream_bytes - s.bytes) + " bytes outside pictures";
    return text + "\n";
}

// Lists one file. In JSON an object, in pieces, so that its length does not matter.
void list(const std::string &path, int32_t media_type, const options &o, listing &out) {
    tools::progress bar(!o.quiet);
    bool open = false;  // the array of pictures
    try {
        tools::input in(path);
        tools::coded_stream stream(in, media_type);
        const char *by = media_type ? "FourCC" : "start codes";
        if (o.as_json) {
            const json head = {{"file", path},
                               {"codec", tools::media_name(stream.media_type())},
                               {"media_type", stream.media_type()},
                               {"recognised_by", by}};
            const std::string text = dumped(head);
            out.write(" " + text.substr(0, text.size() - 1));
            if (!o.summary_only) out.write(",\"pictures\":["), open = true;
        } else {
            out.write(path + ": " + tools::media_name(stream.media_type()) + ", from its " + by +
                      "\n");
            if (!o.summary_only) out.write("  picture        offset      size  key\n");
        }

        summary total;
        tools::coded_picture picture;
        while (stream.next(picture)) {
            if (!o.summary_only && o.as_json) {
                const json line = {
                    {"offset", picture.offset}, {"size", picture.size}, {"key", picture.key}};
                out.write((total.pictures ? ",\n  " : "\n  ") + dumped(line), &bar);
            } else if (!o.summary_only) {
                out.write(format("%9llu %13llu %9llu  %s", (unsigned long long)total.pictures,
                                 (unsigned long long)picture.offset,
                                 (unsigned long long)picture.size, picture.key ? "key\n" : "-\n"),
                          &bar);
            }
            total.add(picture);
            bar.show(
                int64_t(total.pictures),
                in.size() > 0 ? double(picture.offset + picture.size) / double(in.size()) : -1);
        }
        if (total.pictures == 0)
            throw fault(in.name(), ": no ", tools::media_name(stream.media_type()), " picture in ",
                        in.offset(), " bytes");
        const uint64_t stream_bytes = uint64_t(in.offset());
        if (o.as_json)
            out.write((open ? "],\n  " : ",") +
                      ("\"summary\":" + dumped(to_json(total, stream.about(), stream_bytes))) +
                      "}");
        else
            out.write("  " + to_text(total, stream.about(), stream_bytes));
        out.flush(&bar);
    } catch (const fault &f) {
        if (o.as_json) {
            const json error = {{"error", f.what()}};
            const std::string text = dumped(error).substr(1);
            out.write(open ? "],\n  " + text : " {\"file\":" + dumped(path) + "," + text);
        }
        out.flush(&bar);
        throw;
    }
}

// Names the codec of a tag.
void name(const std::string &text, uint32_t tag, listing &out, bool as_json) {
    const int32_t type = scmn_fcc2mt(tag);
    if (as_json)
        out.write(
            dumped(json::array(
                {{{"fourcc", text}, {"codec", tools::media_name(type)}, {"media_type", type}}})) +
            "\n");
    else
        out.write(text + ": " + tools::media_name(type) + ", media type " + std::to_string(type) +
                  "\n");
    out.flush();
}

int run(const options &o) {
    listing out;
    int32_t media_type = 0;
    if (o.fourcc) {
        const uint32_t tag = tag_of(*o.fourcc);
        media_type = scmn_fcc2mt(tag);
        if (media_type == SCMN_MT_NONE) throw fault("--fourcc: ", *o.fourcc, " is not known");
        if (o.files.empty()) {
            name(*o.fourcc, tag, out, o.as_json);
            return 0;
        }
    }
    int status = 0;
    if (o.as_json) out.write("[\n");
    for (size_t i = 0; i < o.files.size(); i++) {
        try {
            list(o.files[i], media_type, o, out);
        } catch (const fault &f) {
            // The other files are listed all the same.
            fprintf(stderr, "simgp-probe: %s\n", f.what());
            status = 1;
        }
        if (o.as_json) out.write(i + 1 < o.files.size() ? ",\n" : "\n");
    }
    if (o.as_json) out.write("]\n");
    out.flush();
    return status;
}

}  // namespace

int main(int argc, char **argv) {
    CLI::App app("Names the codec of video streams and lists their pictures.", "simgp-probe");
    app.footer(examples);
    options o;
    app.add_option("files", o.files, "elementary streams, or \"-\"");
    app.add_option("-c,--fourcc", o.fourcc,
                   "the codec, by its FourCC or WAVE format tag; otherwise start codes tell");
    app.add_flag("-j,--json", o.as_json, "write JSON, an array with an object for each file");
    app.add_flag("-s,--summary", o.summary_only, "leave the list of pictures out");
    app.add_flag("-q,--quiet", o.quiet, "no progress bar");
    app.set_version_flag("--version", "simgp-probe " SIMGP_TOOLS_VERSION);
    const auto check = [&] {
        if (o.files.empty() && !o.fourcc) throw CLI::RequiredError("a file or --fourcc");
    };
    return tools::run_program(app, argc, argv, check, [&] { return run(o); });
}
