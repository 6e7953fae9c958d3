// The readers of the tools (FUZZ_READER names one) with files of any bytes: what cannot be read ends in
// a fault, never in anything else.
#include <sys/mman.h>
#include <unistd.h>

#include <cstring>
#include <vector>

#include "fuzz/input.h"
#include "scmn/scmn.h"
#include "tools/source.h"
#include "tools/stream.h"

namespace {

using bytes = std::vector<uint8_t>;

// A file that holds these bytes.
std::string file_of(const uint8_t *data, size_t size) {
    static const int file = memfd_create("input", 0);
    if (file < 0 || ftruncate(file, 0) || pwrite(file, data, size, 0) != ssize_t(size)) abort();
    return "/proc/self/fd/" + std::to_string(file);
}

// All frames, of pictures that a fuzzer has time for.
void read_frames(const tools::source_options &options) {
    const auto source = tools::open_source(options);
    const tools::picture_shape &shape = source->shape();
    if (int64_t(shape.width) * shape.height > 1 << 20) return;
    tools::picture frame(shape);
    for (int frames = 0; frames < 100 && source->next(frame); frames++) {
        if (!(frame.shape() == shape)) fuzz::stop_at("a frame of another shape");
        if (source->done() > 1) fuzz::stop_at("more is read than there is");
    }
}

void read_y4m(fuzz::input &in) {
    bytes file(in.data(), in.data() + in.size());
    static const char mark[] = "YUV4MPEG2 ";
    file.insert(file.begin(), mark, mark + sizeof mark - 1);
    read_frames({.path = file_of(file.data(), file.size())});
}

void read_raw(fuzz::input &in) {
    const auto formats = tools::formats();
    const std::string format(formats[size_t(in.below(int(formats.size())))].name);
    // Small sizes; or whatever the words of one may be.
    std::string size = std::to_string(in.below(40)) + "x" + std::to_string(in.below(40));
    if (in.below(8) == 0) {
        size.clear();
        for (int left = in.below(12); left > 0; left--) size += "0123456789x-+ "[in.below(14)];
    }
    read_frames({.path = file_of(in.data(), in.size()), .format = format, .size = size});
}

// PNG: chunks of any kind with good check sums, as no bytes by chance have them.
uint32_t check_sum(const uint8_t *p, size_t size) {
    uint32_t sum = ~0u;
    for (size_t i = 0; i < size; i++) {
        sum ^= p[i];
        for (int bit = 0; bit < 8; bit++) sum = sum >> 1 ^ (sum & 1 ? 0xEDB88320u : 0);
    }
    return ~sum;
}
void append_word(bytes &to, uint32_t word) {
    for (int shift = 24; shift >= 0; shift -= 8) to.push_back(uint8_t(word >> shift));
}
void append_chunk(bytes &file, const char *kind, const bytes &content) {
    append_word(file, uint32_t(content.size()));
    const size_t begin = file.size();
    file.insert(file.end(), kind, kind + 4);
    file.insert(file.end(), content.begin(), content.end());
    append_word(file, check_sum(file.data() + begin, file.size() - begin));
}
// A zlib stream that stores the bytes as they are.
bytes stored(const bytes &content) {
    bytes stream = {0x78, 0x01, 1};
    const size_t size = content.size();
    for (size_t word : {size, ~size})
        for (int shift : {0, 8}) stream.push_back(uint8_t(word >> shift));
    stream.insert(stream.end(), content.begin(), content.end());
    uint32_t a = 1, b = 0;
    for (uint8_t byte : content) a = (a + byte) % 65521, b = (b + a) % 65521;
    append_word(stream, b << 16 | a);
    return stream;
}
void read_png(fuzz::input &in) {
    bytes file = {0x89, 'P', 'N', 'G', '\r', '\n', 0x1A, '\n'}, header;
    const bool damaged = in.below(8) == 0;
    append_word(header, uint32_t(in.below(damaged ? 1 << 17 : 40)));
    append_word(header, uint32_t(in.below(damaged ? 1 << 17 : 40)));
    static const uint8_t depths[] = {1, 2, 4, 8, 16}, kinds[] = {0, 2, 3, 4, 6};
    header.push_back(depths[in.below(5)]);
    header.push_back(kinds[in.below(5)]);
    for (int limit : {1, 1, 2}) header.push_back(uint8_t(in.below(damaged ? 4 : limit)));
    append_chunk(file, "IHDR", header);
    static const char *const names[] = {"IDAT", "PLTE", "tRNS", "gAMA", "sRGB",
                                        "IEND", "bKGD", "cHRM", "sBIT", "zTXt"};
    for (int left = in.below(6); left > 0; left--) {
        const char *const name = names[in.below(10)];
        bytes content(size_t(in.below(256)));
        for (uint8_t &byte : content) byte = uint8_t(in.below(256));
        append_chunk(file, name, content);
    }
    bytes rest(in.data(), in.data() + in.size());
    rest.resize(std::min<size_t>(in.size() + size_t(in.below(2) ? 0 : 8000), 65535));
    append_chunk(file, "IDAT", damaged ? rest : stored(rest));
    append_chunk(file, "IEND", {});
    if (damaged) {
        uint64_t pixels = 1;
        for (size_t at : {16, 20}) {
            uint32_t extent = 0;
            for (size_t i = 0; i < 4; i++) extent = extent << 8 | file[at + i];
            pixels *= extent;
        }
        if (pixels > 1 << 20) file.resize(29);  // it is refused in any case, but at once
    }
    static const char *const formats[] = {"", "rgb888", "rgba8888", "yuv420"};
    read_frames({.path = file_of(file.data(), file.size()), .format = formats[in.below(4)]});
}

void read_stream(fuzz::input &in) {
    static const int32_t types[] = {0, SCMN_MT_H264, SCMN_MT_MPEG4, SCMN_MT_H263};
    const int32_t type = types[in.below(4)];
    const size_t size = in.size();
    tools::input file(file_of(in.data(), size));
    tools::coded_stream stream(file, type);
    uint64_t end = 0;
    for (tools::coded_picture p; stream.next(p); end = p.offset + p.size) {
        if (p.size == 0) fuzz::stop_at("a picture of no bytes");
        if (p.offset < end || p.offset + p.size > size)
            fuzz::stop_at("pictures overlap or leave the stream");
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    fuzz::input in(data, size);
    try {
        const std::string reader = FUZZ_READER;
        if (reader == "y4m") read_y4m(in);
        if (reader == "raw") read_raw(in);
        if (reader == "png") read_png(in);
        if (reader == "stream") read_stream(in);
    } catch (const tools::fault &) {
    }
    return 0;
}
