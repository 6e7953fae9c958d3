// simgp-probe on streams made by hand: what it lists, where it cuts, what it says about bad input.
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>
#include <vector>

#include "scmn/bits.h"
#include "tests/program.h"

namespace {

using nlohmann::json;
const std::string probe = SIMGP_PROBE;

struct picture {
    uint64_t offset, size;
    bool key;
    bool operator==(const picture &) const = default;
};
void PrintTo(const picture &p, std::ostream *out) {
    *out << p.offset << "+" << p.size << (p.key ? " key" : "");
}

// A stream that is written piece by piece and remembers its pictures.
struct stream {
    std::string bytes;
    std::vector<picture> pictures;

    // A picture: its headers, its first bytes, and payload that holds no start code.
    void add(const std::string &start, bool key, size_t payload) {
        pictures.push_back({bytes.size(), start.size() + payload, key});
        bytes += start + std::string(payload, '\x55');
    }
};

std::vector<picture> listed(const json &file) {
    std::vector<picture> pictures;
    for (const json &p : file["pictures"]) pictures.push_back({p["offset"], p["size"], p["key"]});
    return pictures;
}

// A NAL unit from pairs of value and number of bits; ue() gives the pair of an Exp-Golomb code.
using bit_field = std::pair<uint32_t, int>;
bit_field ue(uint32_t value) { return {value + 1, 2 * (31 - scmn_bsr_clz_in_code(value + 1)) + 1}; }
std::string nal(uint8_t header, std::vector<bit_field> fields, bool long_code = false) {
    uint8_t buffer[64];
    scmn_bsw_ctx bits;
    scmn_bsw_init(&bits, buffer, sizeof buffer, nullptr);
    fields.push_back({1, 1});  // stop bit
    for (const auto &[value, count] : fields) scmn_bsw_write(&bits, value, count);
    while (bits.free_bits != 8) scmn_bsw_write1(&bits, 0);
    std::string unit =
        std::string(long_code ? "\0\0\0\1" : "\0\0\1", long_code ? 4 : 3) + char(header);
    int zeros = 0;
    for (const uint8_t *p = buffer; p < bits.cur; p++) {
        if (zeros >= 2 && *p <= 3) unit += '\3', zeros = 0;
        unit += char(*p);
        zeros = *p == 0 ? zeros + 1 : 0;
    }
    return unit;
}

bit_field se(int value) { return ue(value > 0 ? 2 * uint32_t(value) - 1 : 2 * uint32_t(-value)); }

// Pictures counted modulo 16, in frames or fields; and how their order is told, by a count of 8 bits or not
// at all.
const std::vector<bit_field> by_8_bits = {ue(0), ue(4)}, as_they_come = {ue(2)};
std::string sequence_set(bool frames_only, const std::vector<bit_field> &order = as_they_come) {
    std::vector<bit_field> fields = {{77, 8}, {0, 8}, {30, 8}, ue(0), ue(0)};
    fields.insert(fields.end(), order.begin(), order.end());
    const std::vector<bit_field> rest = {ue(1),  {0, 1}, ue(10), ue(8), {frames_only, 1},
                                         {1, 1}, {0, 1}, {0, 1}};
    fields.insert(fields.end(), rest.begin(), rest.end());
    return nal(0x67, fields, true);
}
const std::string picture_set = nal(0x68, {ue(0), ue(0), {0, 1}, {0, 1}, ue(0)}, true);
std::string slice(bool idr, uint32_t block, uint32_t frame, std::vector<bit_field> field = {},
                  uint32_t idr_id = 3, std::vector<bit_field> order = {}) {
    std::vector<bit_field> fields = {ue(block), ue(7), ue(0), {frame % 16, 4}};
    fields.insert(fields.end(), field.begin(), field.end());
    if (idr) fields.push_back(ue(idr_id));
    fields.insert(fields.end(), order.begin(), order.end());
    fields.push_back({0x155555, 24});
    return nal(idr ? 0x65 : 0x41, fields);
}

class probe_test : public testing::Test {
  protected:
    json ask(const std::string &arguments) {
        const program::outcome got = program::run(place, probe + " --json " + arguments);
        EXPECT_EQ(got.err, "");
        EXPECT_EQ(got.status, 0);
        return json::parse(got.out);
    }
    void expect_pictures(const stream &s, const std::string &codec) {
        const std::string path = place.write("stream", s.bytes);
        for (const std::string &arguments : {path, "- <" + path, "- < <(cat " + path + ")"}) {
            const program::outcome got =
                program::run(place, "bash -c '" + probe + " --json " + arguments + "'");
            EXPECT_EQ(got.status, 0) << got.err;
            const json file = json::parse(got.out)[0];
            EXPECT_EQ(file["codec"], codec);
            EXPECT_EQ(listed(file), s.pictures);
            EXPECT_EQ(file["summary"]["pictures"], s.pictures.size());
        }
    }
    // Bad input: status 1, one line that names what is wrong, no list.
    void expect_fault(const std::string &arguments, const std::string &text) {
        const program::outcome got = program::run(place, probe + " " + arguments);
        EXPECT_EQ(got.status, 1) << arguments;
        EXPECT_EQ(got.out.find("pictures,"), std::string::npos);
        EXPECT_EQ(std::count(got.err.begin(), got.err.end(), '\n'), 1) << got.err;
        EXPECT_NE(got.err.find(text), std::string::npos) << got.err;
    }

    program::folder place;
};

TEST_F(probe_test, h264_pictures_of_several_slices) {
    stream s;
    const std::string delimiter("\0\0\0\1\x09\x10", 6), sei("\0\0\1\x06\x05\x01\x00\x80", 8);
    s.add(
        delimiter + sequence_set(true) + picture_set + sei + slice(true, 0, 0) + slice(true, 40, 0),
        true, 50);
    s.add(delimiter + slice(false, 0, 1) + slice(false, 40, 1) + slice(false, 80, 1), false, 10);
    // Without a delimiter, and without its first slice: the frame number tells.
    s.add(slice(false, 40, 2), false, 10);
    s.add(sei + slice(false, 0, 2), false, 10);  // the same number, but a header between
    s.add(sequence_set(true) + picture_set + slice(true, 0, 0), true, 10);
    expect_pictures(s, "H.264");

    // Two fields are two pictures.
    stream fields;
    fields.add(sequence_set(false) + picture_set + slice(true, 0, 0, {{1, 1}, {0, 1}}), true, 10);
    fields.add(slice(false, 0, 0, {{1, 1}, {1, 1}}), false, 10);
    fields.add(slice(false, 0, 1, {{0, 1}}), false, 10);
    expect_pictures(fields, "H.264");
}

// Each element of a slice's header that tells pictures apart, without a delimiter: the slices are
// otherwise the same.
TEST_F(probe_test, h264_slices_of_different_pictures) {
    const std::string sets = sequence_set(true) + picture_set;
    stream ids;
    ids.add(sets + slice(true, 0, 0, {}, 1) + slice(true, 0, 0, {}, 1), true, 0);
    ids.add(slice(true, 0, 0, {}, 2) + slice(true, 9, 0, {}, 2), true, 0);
    ids.add(slice(true, 0, 0, {}, 0x7FFF) + slice(true, 9, 0, {}, 0x7FFF), true, 0);
    ids.add(slice(true, 0, 0, {}, 0x7FFE), true, 0);
    ids.add(slice(false, 0, 0), false, 0);  // no longer IDR
    expect_pictures(ids, "H.264");

    stream orders;
    const auto ordered = [](uint32_t block, uint32_t order) {
        return slice(false, block, 1, {}, 0, {{order, 8}});
    };
    orders.add(sequence_set(true, by_8_bits) + picture_set + slice(true, 0, 0, {}, 0, {{0, 8}}),
               true, 0);
    orders.add(ordered(0, 2) + ordered(0, 2) + ordered(0x7FFF, 2), false, 0);
    orders.add(ordered(0, 3) + ordered(0, 3), false, 0);
    orders.add(ordered(0, 0x83), false, 0);
    expect_pictures(orders, "H.264");

    // Long numbers of small values, before the last byte of which a 3 stands against start codes.
    stream zeros;
    const auto wide = [](uint32_t order) {
        return nal(0x41, {ue(0), ue(7), ue(0), {0, 16}, {order, 16}, {0x155555, 24}});
    };
    ASSERT_NE(wide(4).find(std::string("\0\0\3\2", 4)), std::string::npos);
    zeros.add(nal(0x67,
                  {{77, 8},
                   {0, 8},
                   {30, 8},
                   ue(0),
                   ue(12),
                   ue(0),
                   ue(12),
                   ue(1),
                   {0, 1},
                   ue(10),
                   ue(8),
                   {1, 1},
                   {1, 1},
                   {0, 1},
                   {0, 1}},
                  true) +
                  picture_set +
                  nal(0x65, {ue(0), ue(7), ue(0), {0, 16}, ue(0), {0, 16}, {0x155555, 24}}),
              true, 0);
    for (uint32_t order : {0, 1, 2, 4, 7, 5}) zeros.add(wide(order) + wide(order), false, 0);
    expect_pictures(zeros, "H.264");
}

// Differences to the order that is expected, and to that of the second field, where the sets announce them.
TEST_F(probe_test, h264_slices_of_pictures_out_of_order) {
    const std::string set_of_differences = nal(0x68, {ue(0), ue(0), {0, 1}, {1, 1}, ue(0)}, true);
    const std::vector<bit_field> in_cycles = {ue(1), {0, 1}, se(-3), se(5), ue(2), se(1), se(-1)};
    struct {
        std::vector<bit_field> order;
        std::string picture_set;
        std::vector<std::vector<bit_field>> slices;  // no two alike
    } const kinds[] = {
        {by_8_bits,
         set_of_differences,
         {{{0, 8}, se(0)}, {{0, 8}, se(1)}, {{0, 8}, se(-1)}, {{1, 8}, se(-1)}}},
        {in_cycles,
         set_of_differences,
         {{se(0), se(0)}, {se(0), se(1)}, {se(-2), se(1)}, {se(-2), se(-1)}}},
        {in_cycles, picture_set, {{se(0)}, {se(2)}, {se(-2)}}},
    };
    for (const auto &kind : kinds) {
        stream s;
        std::string sets = sequence_set(true, kind.order) + kind.picture_set;
        for (const auto &order : kind.slices) {
            const std::string one = slice(false, 0, 1, {}, 0, order);
            s.add(sets + one + one, false, 0);
            sets.clear();
        }
        expect_pictures(s, "H.264");
    }
}

// What profiles with a format of chroma say before the count of pictures: scaling lists that end early
// and that do not, planes apart. Read wrongly, the two fields would not be two pictures.
TEST_F(probe_test, h264_profiles_with_chroma) {
    const auto sequence = [](uint32_t profile, uint32_t chroma) {
        std::vector<bit_field> fields = {{profile, 8}, {0, 8}, {30, 8}, ue(0), ue(chroma)};
        if (chroma == 3) fields.push_back({1, 1});  // planes apart
        fields.insert(fields.end(), {ue(6), ue(6), {0, 1}, {1, 1}, {1, 1}, ue(16), {1, 1}});
        fields.insert(fields.end(), 16, ue(0));  // a list of its own, behind a default
        fields.insert(fields.end(), {{0, 4}, {1, 1}, ue(16)});  // the first list of 64 is a default
        fields.insert(fields.end(), chroma == 3 ? 5 : 1, {0, 1});
        fields.insert(
            fields.end(),
            {ue(0), ue(2), ue(1), {0, 1}, ue(10), ue(8), {0, 1}, {0, 1}, {1, 1}, {0, 1}, {0, 1}});
        return nal(0x67, fields, true);
    };
    for (uint32_t profile : {100, 110, 122, 244, 44, 83, 86, 118, 128, 138, 139, 134, 135})
        for (uint32_t chroma : {1, 3}) {
            const auto field = [&](uint32_t bottom) {
                std::vector<bit_field> fields = {ue(0), ue(7), ue(0)};
                if (chroma == 3) fields.push_back({0, 2});
                fields.insert(fields.end(), {{1, 4}, {1, 1}, {bottom, 1}, {0x155555, 24}});
                return nal(0x41, fields);
            };
            stream s;
            s.add(sequence(profile, chroma) + picture_set + field(0) + field(0), false, 0);
            s.add(field(1) + field(1), false, 0);
            s.add(field(0), false, 0);
            const std::string path = place.write("stream", s.bytes);
            EXPECT_EQ(listed(ask(path)[0]), s.pictures) << profile << " " << chroma;
        }
}

TEST_F(probe_test, mpeg4_and_h263) {
    const std::string headers("\0\0\1\xB0\1\0\0\1\xB5\x09\0\0\1\0\0\0\1\x20\x08\x84", 20);
    const auto vop = [](int type) { return std::string("\0\0\1\xB6", 4) + char(type << 6 | 0x10); };
    stream m;
    m.add(headers + vop(0), true, 30);
    m.add(vop(1), false, 9);
    m.add(vop(2), false, 0);
    m.add(std::string("\0\0\1\xB3\0\0\x07", 7) + vop(0), true, 7);
    m.bytes += std::string("\0\0\1\xB1", 4);
    m.pictures.back().size += 4;
    expect_pictures(m, "MPEG-4 part 2");

    stream h;
    for (int i = 0; i < 5; i++)
        h.add(std::string("\0\0\x80", 3) + char(i << 2 | 2) + char(i % 3 ? 0x0A : 0x08), i % 3 == 0,
              40);
    expect_pictures(h, "H.263");
}

// Start codes at every place around the seams of what is read at a time.
TEST_F(probe_test, long_streams) {
    stream s;
    s.add(sequence_set(true) + picture_set + slice(true, 0, 0), true, 1000);
    for (uint32_t i = 1; s.bytes.size() < (4 << 20); i++) {
        const size_t seam = (s.bytes.size() / (1 << 20) + 1) << 20;
        const bool near = seam - s.bytes.size() < 400;
        s.add(slice(false, 0, i), false,
              near ? i % 3 : std::min<size_t>(seam - s.bytes.size() - 300, 70000));
    }
    expect_pictures(s, "H.264");
}

// A parameter set that lies across the end of what is read at a time counts all the same: fields,
// where frames were before.
TEST_F(probe_test, parameter_sets_across_a_seam) {
    for (size_t before = 0; before < 24; before++) {
        stream s;
        s.add(sequence_set(true) + picture_set + slice(true, 0, 0), true, 0);
        s.bytes.append((1 << 20) - before - s.bytes.size(), '\x55');
        s.pictures.back().size = s.bytes.size();
        s.add(sequence_set(false) + picture_set + slice(true, 0, 0, {{1, 1}, {0, 1}}), true, 0);
        s.add(slice(false, 0, 0, {{1, 1}, {1, 1}}), false, 0);
        s.add(slice(false, 0, 1, {{0, 1}}), false, 10);
        const std::string path = place.write("stream", s.bytes);
        EXPECT_EQ(listed(ask(path)[0]), s.pictures) << before;
    }
}

TEST_F(probe_test, text_and_summary) {
    stream s;
    s.bytes = "junk";
    for (int i = 0; i < 7; i++)
        s.add(std::string("\0\0\1\xB6", 4) + (i % 3 ? "\x50" : "\x10"), i % 3 == 0, 15);
    const std::string path = place.write("a.m4v", s.bytes);
    const program::outcome got = program::run(place, probe + " " + path);
    EXPECT_EQ(got.out, path +
                           ": MPEG-4 part 2, from its start codes\n"
                           "  picture        offset      size  key\n"
                           "        0             4        20  key\n"
                           "        1            24        20  -\n"
                           "        2            44        20  -\n"
                           "        3            64        20  key\n"
                           "        4            84        20  -\n"
                           "        5           104        20  -\n"
                           "        6           124        20  key\n"
                           "  7 pictures, 3 key, one every 3.0 (3 to 3); 140 bytes, the largest "
                           "20; 4 bytes outside pictures\n");
    EXPECT_EQ(got.err, "");
    const json file = ask("--summary " + path)[0];
    EXPECT_EQ(file["summary"]["key_spacing"]["mean"], 3.0);
    EXPECT_EQ(file["summary"]["stream_bytes"], 144);
    EXPECT_FALSE(file.contains("pictures"));
    EXPECT_EQ(ask("--fourcc xvid " + path)[0]["recognised_by"], "FourCC");
}

// Headers as encoders write them.
TEST_F(probe_test, sizes_and_profiles_come_from_the_headers) {
    using namespace std::string_literals;
    const struct {
        std::string bytes, text;
    } cases[] = {
        {"\0\0\1\xB0\1\0\0\1\xB5\x89\x13\0\0\1\0\0\0\1\x20\0\xC4\x8D\x88\0\xCD\x0B\4\x24\x14\x43"
         "\0\0\1\xB6\x10\x60\xB1\x82"s,
         "352x288, Simple, level 1; 1 picture"},
        {"\0\0\x80\2\x1C\xE8\x21\0\x10\x8C\x62\x64\x80\x22\0\xCC\x40\x40"s, "200x152; 1 picture"},
        {"\0\0\x80\2\x0C\x12\x34\x56"s, "352x288; 1 picture"},
        // Cropped by a column and three lines of chroma.
        {"\0\0\0\1\x67\xF4\0\x0D\x91\x9B\x28\x2C\x10\xF7\x3E\2\x20\0\0\3\0\x20\0\0\6\x41\xE2\x85"
         "\x32\xC0\0\0\1\x68\xEB\xE3\xC4\x48\x44\0\0\1\x65\x88\x84\0\x10"s,
         "350x250, High 4:4:4 Predictive, level 1.3; 1 picture"},
        {sequence_set(false) + picture_set + slice(true, 0, 0, {{0, 1}}),
         "176x288, Main, level 3; 1 picture"},
    };
    for (const auto &c : cases) {
        const program::outcome got =
            program::run(place, probe + " --summary " + place.write("stream", c.bytes));
        EXPECT_NE(got.out.find("  " + c.text), std::string::npos) << c.text << "\n" << got.out;
    }
    EXPECT_EQ(
        ask("--summary " + place.write("stream", cases[0].bytes))[0]["summary"]["size"]["width"],
        352);
}

TEST_F(probe_test, tags) {
    const struct {
        const char *tag;
        int type;
    } tags[] = {{"avc1", 104}, {"aac", 306}, {"0x55", 305}, {"85", 305}, {"WMV3", 107}};
    for (const auto &[tag, type] : tags)
        EXPECT_EQ(ask(std::string("--fourcc ") + tag)[0]["media_type"], type) << tag;
    for (const char *tag : {"abcd", "toolong", "\"\"", "0x123456789", "99999999999999999999"})
        expect_fault(std::string("--fourcc ") + tag, "--fourcc");
}

TEST_F(probe_test, bad_input) {
    using namespace std::string_literals;
    expect_fault(place / "missing", "No such file");
    expect_fault(place.write("empty", ""), "empty");
    expect_fault(place / "", "directory");
    expect_fault(place.write("text", "no stream at all\n"), "no start codes");
    expect_fault(place.write("mp4",
                             "\0\0\0\x18"
                             "ftypisom"s),
                 "MP4");
    expect_fault(place.write("asf", "\x30\x26\xB2\x75 and more"), "has no elementary streams");
    expect_fault(place.write("ps", "\0\0\1\xBA\x44"s), "MPEG program stream");
    expect_fault(place.write("lengths", "\0\0\0\2\x67\1\0\0\0\3\x65\1\2"s),
                 "lengths in place of start codes");
    expect_fault(place.write("zeros", std::string(64, 0)), "no start codes");
    const std::string sets = place.write("sets", sequence_set(true) + picture_set);
    expect_fault(sets, "no H.264 picture");
    expect_fault("--fourcc WMV1 " + sets, "no start codes");

    // In JSON the fault stands in its file's object, and the other files are listed.
    const std::string good =
        place.write("good", sequence_set(true) + picture_set + slice(true, 0, 0));
    const program::outcome got =
        program::run(place, probe + " --json " + sets + " " + good + " /nowhere");
    EXPECT_EQ(got.status, 1);
    const json files = json::parse(got.out);
    ASSERT_EQ(files.size(), 3u);
    EXPECT_NE(std::string(files[0]["error"]).find("no H.264 picture"), std::string::npos);
    EXPECT_EQ(files[1]["pictures"].size(), 1u);
    EXPECT_TRUE(files[2].contains("error"));

    EXPECT_EQ(program::run(place, probe).status, 2);
    EXPECT_EQ(program::run(place, probe + " --nonsense").status, 2);
    EXPECT_EQ(program::run(place, probe + " " + good + " >/dev/full").status, 1);
}

}  // namespace
