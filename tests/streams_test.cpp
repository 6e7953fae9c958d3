// Key frames and codec tags on streams that FFmpeg encodes here and now: every packet's answer
// against the container's key flag, every track's tag against what FFmpeg put there, simgp-probe's
// pictures against FFmpeg's parsers. What differs for a reason stands below with it; nothing else
// may differ.
#include <gtest/gtest.h>

#include <nlohmann/json.hpp>
#include <vector>

#include "scmn/scmn.h"
#include "tests/program.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavcodec/bsf.h>
#include <libavformat/avformat.h>
}

namespace {

const char *const picture = "-f lavfi -i testsrc2=size=176x144:rate=25:duration=4";
const char *const sound = "-f lavfi -i sine=frequency=440:sample_rate=44100:duration=1";

bool is_elementary(const std::string &file) {
    const std::string ending = file.substr(file.rfind('.'));
    return ending == ".h264" || ending == ".m4v" || ending == ".h263";
}

struct packet {
    std::vector<uint8_t> bytes;
    int64_t position;
    bool key;
};

struct track {
    AVCodecID codec;
    uint32_t tag;
    std::vector<packet> packets;
};

// All packets of the file's first track. Where H.264 is stored with lengths, start codes take their
// place.
track read_track(const std::string &path) {
    AVFormatContext *file = nullptr;
    if (avformat_open_input(&file, path.c_str(), nullptr, nullptr) < 0) {
        ADD_FAILURE() << path << " cannot be opened";
        return {};
    }
    // Containers know their key frames; parsers of H.263 call every picture one.
    if (!is_elementary(path)) file->flags |= AVFMT_FLAG_NOPARSE;
    EXPECT_GE(avformat_find_stream_info(file, nullptr), 0);
    const AVCodecParameters *codec = file->streams[0]->codecpar;
    track result = {codec->codec_id, codec->codec_tag, {}};
    AVBSFContext *start_codes = nullptr;
    const bool lengths = codec->codec_id == AV_CODEC_ID_H264 && codec->extradata_size > 0 &&
                         codec->extradata[0] == 1;
    EXPECT_GE(av_bsf_list_parse_str(lengths ? "h264_mp4toannexb" : "null", &start_codes), 0);
    avcodec_parameters_copy(start_codes->par_in, codec);
    EXPECT_GE(av_bsf_init(start_codes), 0);
    AVPacket *p = av_packet_alloc();
    while (av_read_frame(file, p) >= 0) {
        if (p->stream_index != 0) {
            av_packet_unref(p);
            continue;
        }
        EXPECT_GE(av_bsf_send_packet(start_codes, p), 0);
        while (av_bsf_receive_packet(start_codes, p) >= 0) {
            result.packets.push_back(
                {{p->data, p->data + p->size}, p->pos, (p->flags & AV_PKT_FLAG_KEY) != 0});
            av_packet_unref(p);
        }
    }
    av_packet_free(&p);
    av_bsf_free(&start_codes);
    avformat_close_input(&file);
    return result;
}

int32_t media_type_of(AVCodecID codec) {
    switch (codec) {
        case AV_CODEC_ID_H264:
            return SCMN_MT_H264;
        case AV_CODEC_ID_MPEG4:
            return SCMN_MT_MPEG4;
        case AV_CODEC_ID_H263:
        case AV_CODEC_ID_H263P:
            return SCMN_MT_H263;
        case AV_CODEC_ID_WMV1:
            return SCMN_MT_WMV1;
        case AV_CODEC_ID_WMV2:
            return SCMN_MT_WMV2;
        case AV_CODEC_ID_MSMPEG4V3:
            return SCMN_MT_DIV3;
        case AV_CODEC_ID_PCM_S16LE:
            return SCMN_MT_PCM;
        case AV_CODEC_ID_PCM_ALAW:
            return SCMN_MT_ALAW;
        case AV_CODEC_ID_PCM_MULAW:
            return SCMN_MT_MULAW;
        case AV_CODEC_ID_MP2:
            return SCMN_MT_MPEGAUDIO;
        case AV_CODEC_ID_MP3:
            return SCMN_MT_MP3;
        case AV_CODEC_ID_AAC:
            return SCMN_MT_AAC;
        case AV_CODEC_ID_AC3:
            return SCMN_MT_AC3;
        case AV_CODEC_ID_DTS:
            return SCMN_MT_DTS;
        case AV_CODEC_ID_WMAV1:
        case AV_CODEC_ID_WMAV2:
            return SCMN_MT_WMA;
        default:
            return -1;
    }
}

// Does a packet hold a recovery point: SEI message 6 of a NAL unit of type 6?
bool has_recovery_point(const std::vector<uint8_t> &b) {
    for (size_t k = 0; k + 5 < b.size(); k++)
        if (b[k] == 0 && b[k + 1] == 0 && b[k + 2] == 1 && (b[k + 3] & 31) == 6) {
            // Messages: type and size, then that many bytes.
            for (size_t at = k + 4; at + 1 < b.size() && b[at] != 0x80; at += 2 + b[at + 1]) {
                if (b[at] == 6) return true;
                if (b[at] == 255 || b[at + 1] == 255) break;
            }
        }
    return false;
}

// Why a packet's answer may differ from the container's flag.
enum reason {
    none,
    // The container marks recovery points (I-pictures of open groups, starts of an intra refresh);
    // they are not IDR pictures.
    recovery_points,
    // Packed B-pictures: two pictures in a packet and, in place of the second, a placeholder of a
    // few bytes later. It repeats the coding type of the picture before, also of an intra picture.
    placeholders,
    // FFmpeg's parser of raw H.263 calls every picture a key frame.
    all_flagged
};

struct clip {
    const char *file, *options;
    reason differs = none;
};
const clip clips[] = {
    {"slices.h264", "-c:v libx264 -g 25 -bf 2 -slices 4 -x264-params aud=1"},
    {"single.avi", "-c:v libx264 -g 10 -bf 0 -x264-params scenecut=0"},
    {"b.mp4", "-c:v libx264 -g 25 -bf 3 -slices 2"},
    {"interlaced.mp4", "-c:v libx264 -g 25 -flags +ildct -x264-params interlaced=1"},
    {"open.mp4", "-c:v libx264 -g 25 -bf 3 -x264-params open-gop=1:scenecut=0", recovery_points},
    {"open.h264", "-c:v libx264 -g 25 -bf 3 -x264-params open-gop=1:scenecut=0", recovery_points},
    {"refresh.mp4", "-c:v libx264 -g 25 -bf 0 -x264-params intra-refresh=1", recovery_points},
    {"b.m4v", "-c:v mpeg4 -g 12 -bf 2 -f m4v"},
    {"b.avi", "-c:v mpeg4 -g 12 -bf 2"},
    {"mpeg4.mp4", "-c:v mpeg4 -g 12 -bf 2"},
    {"resync.avi", "-c:v mpeg4 -g 12 -vtag XVID -ps 300 -flags +aic"},
    {"packed.avi", "-c:v libxvid -g 12 -bf 2 -vtag DIVX", placeholders},
    {"plain.h263", "-c:v h263 -g 12", all_flagged},
    {"h263.avi", "-c:v h263 -g 12 -ps 300"},
    {"h263.3gp", "-c:v h263 -g 12"},
    {"plus.avi", "-c:v h263p -g 12 -umv 1 -aiv 1 -obmc 1"},
    {"plus.h263", "-c:v h263p -g 12 -structured_slices 1", all_flagged},
    {"wmv1.asf", "-c:v wmv1 -g 12"},
    {"wmv1.avi", "-c:v wmv1 -g 12"},
    {"wmv2.asf", "-c:v wmv2 -g 12"},
    {"wmv2.avi", "-c:v wmv2 -g 12"},
    {"div3.avi", "-c:v msmpeg4 -g 12 -vtag DIV3"},
    {"div3.asf", "-c:v msmpeg4 -g 12"},
};

class streams : public testing::Test {
  protected:
    // Encodes a file, once.
    static std::string encode(const char *source, const char *options, const std::string &file) {
        if (std::filesystem::exists(*place / file)) return *place / file;
        const program::outcome got =
            program::run(*place, std::string("ffmpeg -v error -nostdin -y ") + source + " " +
                                     options + " " + (*place / file));
        EXPECT_EQ(got.status, 0) << file << ": " << got.err;
        return *place / file;
    }
    static void SetUpTestSuite() { place = new program::folder; }
    static void TearDownTestSuite() { delete place; }
    static inline program::folder *place;
};

TEST_F(streams, key_frames) {
    for (const clip &c : clips) {
        SCOPED_TRACE(c.file);
        const track t = read_track(encode(picture, c.options, c.file));
        int keys = 0, others = 0, excused = 0;
        for (size_t i = 0; i < t.packets.size(); i++) {
            const packet &p = t.packets[i];
            const bool key =
                scmn_is_vkeyfrm(media_type_of(t.codec), p.bytes.data(), int32_t(p.bytes.size()));
            (key ? keys : others)++;
            if (key == p.key) continue;
            const bool excuse = c.differs == recovery_points ? !key && has_recovery_point(p.bytes)
                                : c.differs == placeholders  ? key && p.bytes.size() < 20
                                                             : c.differs == all_flagged && !key;
            EXPECT_TRUE(excuse) << "packet " << i << ", " << p.bytes.size() << " bytes: " << key
                                << ", container " << p.key;
            excused += excuse;
        }
        EXPECT_GE(t.packets.size(), 95u);
        EXPECT_GT(others, 30);
        EXPECT_GE(keys, c.differs == recovery_points ? 1 : 4);
        EXPECT_EQ(excused > 0, c.differs != none);
        printf("%-15s %3zu packets, %2d key, %d excused\n", c.file, t.packets.size(), keys,
               excused);
    }
}

TEST_F(streams, tags) {
    struct {
        const char *file, *source, *options;
        int32_t unlike = -1;  // what the mapping says instead, for a reason
    } const files[] = {
        {"pcm.wav", sound, "-c:a pcm_s16le"},
        {"alaw.wav", sound, "-c:a pcm_alaw"},
        {"mulaw.wav", sound, "-c:a pcm_mulaw"},
        {"mp2.wav", sound, "-c:a mp2"},
        {"mp3.wav", sound, "-c:a libmp3lame"},
        {"aac.wav", sound, "-c:a aac"},
        {"ac3.wav", sound, "-c:a ac3"},
        {"dts.wav", sound, "-c:a dca -strict -2"},
        {"wma1.wav", sound, "-c:a wmav1"},
        {"wma2.asf", sound, "-c:a wmav2"},
        {"mp3.avi", sound, "-c:a libmp3lame"},
        {"ac3.avi", sound, "-c:a ac3"},
        {"aac.mp4", sound, "-c:a aac"},
        // mp4a only says that a description follows; here it describes MP3.
        {"mp3.mp4", sound, "-c:a libmp3lame", SCMN_MT_AAC},
        // Not among the tags of the mapping.
        {"ac3.mp4", sound, "-c:a ac3", SCMN_MT_NONE},
        // In ASF and by default MS-MPEG4 version 3 is called MP43, which is not either.
        {"div3.asf", picture, "-c:v msmpeg4", SCMN_MT_NONE},
    };
    for (const auto &f : files) {
        SCOPED_TRACE(f.file);
        const track t = read_track(encode(f.source, f.options, f.file));
        ASSERT_NE(media_type_of(t.codec), -1);
        EXPECT_EQ(scmn_fcc2mt(t.tag), f.unlike == -1 ? media_type_of(t.codec) : f.unlike)
            << std::hex << t.tag;
    }
    for (const clip &c : clips) {
        SCOPED_TRACE(c.file);
        if (is_elementary(c.file) || std::string(c.file) == "div3.asf") continue;
        const track t = read_track(encode(picture, c.options, c.file));
        EXPECT_EQ(scmn_fcc2mt(t.tag), media_type_of(t.codec)) << std::hex << t.tag;
        printf("%-15s %.4s\n", c.file, reinterpret_cast<const char *>(&t.tag));
    }
}

TEST_F(streams, probe_cuts_where_parsers_do) {
    for (const clip &c : clips) {
        if (!is_elementary(c.file)) continue;
        SCOPED_TRACE(c.file);
        const std::string path = encode(picture, c.options, c.file);
        const track t = read_track(path);
        const program::outcome got = program::run(*place, SIMGP_PROBE " --json " + path);
        ASSERT_EQ(got.status, 0) << got.err;
        const auto list = nlohmann::json::parse(got.out)[0];
        EXPECT_EQ(list["media_type"], media_type_of(t.codec));
        ASSERT_EQ(list["pictures"].size(), t.packets.size());
        for (size_t i = 0; i < t.packets.size(); i++) {
            const auto &p = list["pictures"][i];
            EXPECT_EQ(p["offset"], t.packets[i].position) << i;
            EXPECT_EQ(p["size"], t.packets[i].bytes.size()) << i;
            EXPECT_EQ(p["key"], scmn_is_vkeyfrm(media_type_of(t.codec), t.packets[i].bytes.data(),
                                                int32_t(t.packets[i].bytes.size())) == 1)
                << i;
        }
    }
}

}  // namespace
