// Films are demultiplexed and decoded by FFmpeg. Where one may seek is decided by the library: the codec
// tag gives the media type, and scmn_is_vkeyfrm tells the key frames among the packets.
#include "tools/play_film.h"

#include <errno.h>
#include <math.h>
#include <string.h>
#include <sys/stat.h>

#include <algorithm>
#include <cmath>
#include <deque>
#include <new>
#include <utility>
#include <vector>

#include "scmn/scmn.h"
#include "tools/fault.h"
#include "tools/source.h"
#include "tools/stream.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavcodec/bsf.h>
#include <libavformat/avformat.h>
#include <libavutil/display.h>
#include <libavutil/pixdesc.h>
}

namespace tools {

namespace {

struct freed {
    void operator()(AVFormatContext *p) const { avformat_close_input(&p); }
    void operator()(AVBSFContext *p) const { av_bsf_free(&p); }
    void operator()(AVCodecContext *p) const { avcodec_free_context(&p); }
    void operator()(AVFrame *p) const { av_frame_free(&p); }
    void operator()(AVPacket *p) const { av_packet_free(&p); }
};
template <class T>
using owned = std::unique_ptr<T, freed>;

std::string words(int error) {
    char text[AV_ERROR_MAX_STRING_SIZE] = {};
    av_strerror(error, text, sizeof text);
    return text;
}

// "avc1"; bytes that are no letters as their numbers.
std::string tag_text(uint32_t tag) {
    std::string text;
    for (int k = 0; k < 4; ++k) {
        const char c = char(tag >> 8 * k);
        if (c < ' ' || c > '~') return "tag " + std::to_string(tag);
        text += c;
    }
    return text;
}

// Formats of decoders that the library has as well.
constexpr struct {
    AVPixelFormat decoded;
    int32_t code;
} known_formats[] = {
    {AV_PIX_FMT_YUV420P, SIMGP_FMT_YUV420},  {AV_PIX_FMT_YUVJ420P, SIMGP_FMT_YUV420},
    {AV_PIX_FMT_YUV422P, SIMGP_FMT_YUV422N}, {AV_PIX_FMT_YUVJ422P, SIMGP_FMT_YUV422N},
    {AV_PIX_FMT_YUV440P, SIMGP_FMT_YUV422W}, {AV_PIX_FMT_YUVJ440P, SIMGP_FMT_YUV422W},
    {AV_PIX_FMT_YUV444P, SIMGP_FMT_YUV444},  {AV_PIX_FMT_YUVJ444P, SIMGP_FMT_YUV444},
    {AV_PIX_FMT_GRAY8, SIMGP_FMT_YUV400},    {AV_PIX_FMT_NV12, SIMGP_FMT_NV12},
    {AV_PIX_FMT_NV21, SIMGP_FMT_NV21},       {AV_PIX_FMT_UYVY422, SIMGP_FMT_UYVY},
    {AV_PIX_FMT_YUYV422, SIMGP_FMT_YUYV},    {AV_PIX_FMT_RGB565LE, SIMGP_FMT_RGB565},
    {AV_PIX_FMT_BGR565LE, SIMGP_FMT_BGR565}, {AV_PIX_FMT_RGB24, SIMGP_FMT_RGB888},
    {AV_PIX_FMT_BGR24, SIMGP_FMT_BGR888},    {AV_PIX_FMT_RGBA, SIMGP_FMT_RGBA8888},
    {AV_PIX_FMT_BGRA, SIMGP_FMT_BGRA8888},   {AV_PIX_FMT_ARGB, SIMGP_FMT_ARGB8888},
    {AV_PIX_FMT_RGB0, SIMGP_FMT_RGBA8888},   {AV_PIX_FMT_BGR0, SIMGP_FMT_BGRA8888},
    {AV_PIX_FMT_0RGB, SIMGP_FMT_ARGB8888}};

// Bytes of packets that are kept, at most, in search of the next key frame.
constexpr int64_t most_ahead = 256 << 20;

class decoded_film : public film {
  public:
    explicit decoded_film(const std::string &path) {
        name_ = path;
        av_log_set_level(AV_LOG_QUIET);  // what is wrong is said here, in one line
        struct stat about;
        if (stat(path.c_str(), &about) == 0 && S_ISDIR(about.st_mode)) fail(strerror(EISDIR));
        open_file();
        const AVStream *stream = file_->streams[track_];
        const AVRational rate = av_guess_frame_rate(file_.get(), file_->streams[track_], nullptr);
        if (rate.num > 0 && rate.den > 0) frame_time_ = av_q2d(av_inv_q(rate));
        const AVRational aspect =
            av_guess_sample_aspect_ratio(file_.get(), file_->streams[track_], nullptr);
        if (aspect.num > 0 && aspect.den > 0) pixel_aspect_ = av_q2d(aspect);
        if (stream->start_time != AV_NOPTS_VALUE)
            start_ = double(stream->start_time) * av_q2d(stream->time_base);
        recognise(*stream->codecpar);
        open_decoder(*stream);
    }
    bool next(film_frame &to) override {
        for (;;) {
            const int result = avcodec_receive_frame(decoder_.get(), frame_.get());
            if (result == AVERROR_EOF) {
                if (!delivered_ && !any_)
                    fail("no picture can be decoded", error_ ? ": " + words(error_) : "");
                return false;
            }
            if (result == AVERROR(EAGAIN)) {
                feed();
                continue;
            }
            if (result < 0) {
                error_ = result;  // a damaged picture; the next one may do
                continue;
            }
            // Packets carry their numbers where FFmpeg expects times.
            if (frame_->pts != AV_NOPTS_VALUE) shown_ = size_t(frame_->pts);
            // Pictures that refer to what was before the key frame that was sought.
            if (begun_ > 0 && has_times() && position(shown_) < position(begun_) - frame_time_ / 2)
                continue;
            to.place = position(shown_);
            to.time = has_times() ? position(shown_)
                                  : (double(begun_) + double(delivered_)) * frame_time_;
            take(*frame_, to);
            if (!any_) read_turn(*frame_);
            ++delivered_;
            any_ = true;
            return true;
        }
    }

    bool seek(double here, bool forward, double slack) override {
        const double near = frame_time_ / 2;
        size_t best = packets_.size();
        for (size_t k = 0; k < packets_.size(); ++k) {
            if (!packets_[k].key) continue;
            const double there = position(k);
            if (forward ? there > here + near && (best == packets_.size() || there < position(best))
                        : there < here - std::max(near, slack) &&
                              (best == packets_.size() || there > position(best)))
                best = k;
        }
        if (best < packets_.size()) {
            go_to(best);
            return true;
        }
        if (!forward) return false;
        // Behind all that has been read so far.
        for (int64_t bytes = 0; bytes < most_ahead;) {
            owned<AVPacket> p = read();
            if (!p) break;
            bytes += p->size;
            const size_t number = size_t(p->pts);
            ahead_.push_back(std::move(p));
            if (!packets_[number].key || position(number) <= here + near) continue;
            ahead_.erase(ahead_.begin(), ahead_.end() - 1);
            begin_at(number);
            return true;
        }
        return false;
    }

  private:
    // What is known of a packet. Its number is its place in the stream.
    struct packet {
        double time;  // seconds from the start; NaN if the container does not say
        int64_t dts, offset;
        bool key;
    };

    template <class... Part>
    [[noreturn]] void fail(const Part &...part) const {
        throw fault(name_, ": ", part...);
    }
    void check(int result, const char *what) const {
        if (result < 0) fail(what, ": ", words(result));
    }

    // Opens the file, and what makes its packets such as the library expects them.
    void open_file() {
        filter_.reset();
        file_.reset();
        AVFormatContext *file = nullptr;
        // The name is that of a file, whatever colons it has.
        int result = avformat_open_input(&file, ("file:" + name_).c_str(), nullptr, nullptr);
        if (result < 0) fail(words(result));
        file_.reset(file);
#if LIBAVFORMAT_VERSION_INT < AV_VERSION_INT(60, 16, 100)
        // What is known of the whole film comes with its first frame. Newer ones do so by themselves.
        av_format_inject_global_side_data(file_.get());
#endif
        check(avformat_find_stream_info(file_.get(), nullptr), "cannot be read");
        track_ = av_find_best_stream(file_.get(), AVMEDIA_TYPE_VIDEO, -1, -1, nullptr, 0);
        if (track_ < 0) fail("holds no video");
        for (unsigned k = 0; k < file_->nb_streams; ++k)
            if (int(k) != track_) file_->streams[k]->discard = AVDISCARD_ALL;
        const AVStream *stream = file_->streams[track_];
        const AVCodecParameters &codec = *stream->codecpar;
        // MP4 and Matroska store H.264 with lengths, which start codes have to replace; AVI packs two
        // MPEG-4 pictures into one packet.
        const bool lengths = codec.codec_id == AV_CODEC_ID_H264 && codec.extradata_size > 0 &&
                             codec.extradata[0] == 1;
        const char *filter = lengths                               ? "h264_mp4toannexb"
                             : codec.codec_id == AV_CODEC_ID_MPEG4 ? "mpeg4_unpack_bframes"
                                                                   : "null";
        AVBSFContext *made = nullptr;
        check(av_bsf_list_parse_str(filter, &made), filter);
        filter_.reset(made);
        check(avcodec_parameters_copy(filter_->par_in, &codec), filter);
        filter_->time_base_in = stream->time_base;
        check(av_bsf_init(made), filter);
        at_ = 0;
    }

    // The media type of the tag; where the container spells it in its own way, or in one that means
    // several codecs (mp4v, DIV4), that of the tag that the codec has in AVI files.
    void recognise(const AVCodecParameters &codec) {
        const AVCodecTag *const lists[] = {avformat_get_riff_video_tags(), nullptr};
        const uint32_t common = av_codec_get_tag(lists, codec.codec_id);
        uint32_t tag = codec.codec_tag ? codec.codec_tag : common;
        media_type_ = scmn_fcc2mt_vid(tag);
        if (common && scmn_fcc2mt_vid(common) != media_type_) {
            tag = common;
            media_type_ = scmn_fcc2mt_vid(common);
        }
        switch (media_type_) {
            case SCMN_MT_H264:
            case SCMN_MT_MPEG4:
            case SCMN_MT_H263:
            case SCMN_MT_WMV1:
            case SCMN_MT_WMV2:
            case SCMN_MT_DIV3:
                keys_ = std::string(media_name(media_type_)) + " (" + tag_text(tag) +
                        "): scmn_is_vkeyfrm";
                break;
            default:
                media_type_ = SCMN_MT_NONE;
                keys_ = std::string(avcodec_get_name(codec.codec_id)) + ": container";
        }
    }

    void open_decoder(const AVStream &stream) {
        const AVCodecID id = stream.codecpar->codec_id;
        const AVCodec *codec = avcodec_find_decoder(id);
        if (!codec) fail("nothing decodes ", avcodec_get_name(id));
        decoder_.reset(avcodec_alloc_context3(codec));
        frame_.reset(av_frame_alloc());
        if (!decoder_ || !frame_) fail("not enough memory");
        check(avcodec_parameters_to_context(decoder_.get(), filter_->par_out),
              avcodec_get_name(id));
        check(avcodec_open2(decoder_.get(), codec, nullptr), avcodec_get_name(id));
    }

    // The next packet of the track, filtered; null at the end.
    owned<AVPacket> receive() {
        owned<AVPacket> p(av_packet_alloc());
        if (!p) throw std::bad_alloc();
        for (;;) {
            const int result = av_bsf_receive_packet(filter_.get(), p.get());
            if (result == 0) return p;
            if (result == AVERROR(EAGAIN)) {
                const int got = av_read_frame(file_.get(), p.get());
                if (got == AVERROR(EAGAIN)) continue;
                if (got < 0) {
                    if (got != AVERROR_EOF) error_ = got;
                    av_bsf_send_packet(filter_.get(), nullptr);
                } else if (p->stream_index != track_ ||
                           av_bsf_send_packet(filter_.get(), p.get()) < 0) {
                    av_packet_unref(p.get());
                }
                continue;
            }
            if (result == AVERROR_EOF) return nullptr;
            error_ = result;  // a damaged packet is left out
        }
    }

    // The same, with its number in place of its time. What is met for the first time is noted down.
    owned<AVPacket> read() {
        owned<AVPacket> p = receive();
        if (p) number(*p);
        return p;
    }
    void number(AVPacket &p) {
        if (at_ == packets_.size()) {
            const bool key = media_type_ == SCMN_MT_NONE
                                 ? (p.flags & AV_PKT_FLAG_KEY) != 0
                                 : scmn_is_vkeyfrm(media_type_, p.data, p.size) != 0;
            const double unit = av_q2d(file_->streams[track_]->time_base);
            packets_.push_back(
                {p.pts == AV_NOPTS_VALUE ? NAN : double(p.pts) * unit - start_, p.dts, p.pos, key});
        }
        p.pts = int64_t(at_++);
    }

    void feed() {
        owned<AVPacket> p;
        if (ahead_.empty()) {
            p = read();
        } else {
            p = std::move(ahead_.front());
            ahead_.pop_front();
        }
        const int result = avcodec_send_packet(decoder_.get(), p.get());
        if (result < 0 && result != AVERROR_EOF) error_ = result;
    }

    bool has_times() const { return !packets_.empty() && !std::isnan(packets_[0].time); }
    // In seconds. Without times packets count as much, each of them one frame.
    double position(size_t number) const {
        if (number >= packets_.size()) return 0;
        const double time = packets_[number].time;
        return has_times() && !std::isnan(time) ? time : double(number) * frame_time_;
    }

    void begin_at(size_t number) {
        avcodec_flush_buffers(decoder_.get());
        begun_ = shown_ = number;
        delivered_ = 0;
    }

    void go_to(size_t number) {
        ahead_.clear();
        begin_at(number);
        if (jump(number)) return;
        // No times, or an index that leads astray: from the beginning.
        open_file();
        while (at_ < number && read()) {
        }
    }
    // Finds the packet by its time; it is the first one ahead then.
    bool jump(size_t number_wanted) {
        const packet wanted = packets_[number_wanted];
        if (wanted.dts == AV_NOPTS_VALUE) return false;
        if (av_seek_frame(file_.get(), track_, wanted.dts, AVSEEK_FLAG_BACKWARD) < 0) return false;
        av_bsf_flush(filter_.get());
        while (owned<AVPacket> p = receive()) {
            if (p->dts == wanted.dts && p->pos == wanted.offset) {
                at_ = number_wanted;
                number(*p);
                ahead_.push_back(std::move(p));
                return true;
            }
            if (p->dts != AV_NOPTS_VALUE && p->dts > wanted.dts) break;
        }
        return false;
    }

    colour_note note_of(const AVFrame &f, bool rgb) const {
        colour_note note;
        if (rgb) return note;
        switch (f.colorspace) {
            case AVCOL_SPC_BT709:
                note.matrix = "bt709";
                break;
            case AVCOL_SPC_FCC:  // within a hundredth of it
            case AVCOL_SPC_BT470BG:
            case AVCOL_SPC_SMPTE170M:
                note.matrix = "bt601";
                break;
            case AVCOL_SPC_BT2020_NCL:
                note.matrix = "bt2020";
                break;
            case AVCOL_SPC_UNSPECIFIED:
            case AVCOL_SPC_RESERVED:
            case AVCOL_SPC_RGB:  // said of grey pictures
                break;
            default: {
                const char *given = av_color_space_name(f.colorspace);
                fail("no matrix for YUV in ", given ? given : "an unknown colour space",
                     "; there are bt601, bt709 and bt2020");
            }
        }
        const bool jpeg = f.format == AV_PIX_FMT_YUVJ420P || f.format == AV_PIX_FMT_YUVJ422P ||
                          f.format == AV_PIX_FMT_YUVJ440P || f.format == AV_PIX_FMT_YUVJ444P;
        if (f.color_range == AVCOL_RANGE_JPEG || jpeg)
            note.range = "full";
        else if (f.color_range == AVCOL_RANGE_MPEG)
            note.range = "limited";
        return note;
    }

    // Cameras that are held upright film on their side, and say so.
    void read_turn(const AVFrame &first) {
        const AVFrameSideData *matrix = av_frame_get_side_data(&first, AV_FRAME_DATA_DISPLAYMATRIX);
        if (!matrix || matrix->size < 9 * sizeof(int32_t)) return;
        int32_t values[9];
        memcpy(values, matrix->data, sizeof values);
        const double left = av_display_rotation_get(values);  // degrees, to the left
        if (!std::isnan(left)) quarters_ = int(std::lround(-left / 90) + 4) % 4;
    }

    // Copies a decoded frame: the decoder still refers to its own.
    void take(const AVFrame &from, film_frame &to) const {
        picture_shape shape = {nullptr, from.width, from.height};
        for (const auto &known : known_formats)
            if (known.decoded == from.format) shape.format = &format_coded(known.code);
        if (!shape.format) {
            const char *given = av_get_pix_fmt_name(AVPixelFormat(from.format));
            fail("frames of ", given ? given : "an unknown format",
                 " cannot be shown; YUV and RGB of 8 bits a sample can");
        }
        check_size(shape.width, shape.height, name_);
        if (to.image.shape() != shape) to.image = picture(shape);
        for (int k = 0; k < to.image.planes(); ++k)
            for (int y = 0; y < to.image.lines(k); ++y)
                memcpy(to.image.line(k, y), from.data[k] + ptrdiff_t(y) * from.linesize[k],
                       to.image.line_bytes(k));
        to.colour = note_of(from, shape.format->is_rgb());
    }

    owned<AVFormatContext> file_;
    owned<AVBSFContext> filter_;
    owned<AVCodecContext> decoder_;
    owned<AVFrame> frame_;
    int track_ = -1;
    int32_t media_type_ = SCMN_MT_NONE;
    double start_ = 0;
    int error_ = 0;  // the last one that was passed over

    std::vector<packet> packets_;        // all that have been read, in their order
    size_t at_ = 0;                      // number of the next one from the file
    std::deque<owned<AVPacket>> ahead_;  // read, and not yet decoded
    size_t begun_ = 0, shown_ = 0;       // where decoding has begun; the packet of the last frame
    int64_t delivered_ = 0;              // frames since then
    bool any_ = false;
};

class card_film : public film {
  public:
    explicit card_film(const std::string &spec) {
        name_ = spec;
        keys_ = "none";
        card_ = open_source({.path = spec});
        // As long as anybody may look at it.
        const bool counted = spec.find('@') != std::string::npos;
        if (!counted) card_ = open_source({.path = spec + "@1000000000"});
    }
    bool next(film_frame &to) override {
        if (!card_->next(to.image)) return false;
        to.time = double(frame_++) * frame_time_;
        return true;
    }
    bool seek(double, bool, double) override { return false; }

  private:
    std::unique_ptr<source> card_;
    int64_t frame_ = 0;
};

}  // namespace

std::unique_ptr<film> open_film(const std::string &path) {
    if (path.starts_with("testcard:")) return std::make_unique<card_film>(path);
    return std::make_unique<decoded_film>(path);
}

}  // namespace tools
