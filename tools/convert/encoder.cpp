#include "convert/encoder.h"

#include <cstring>

#include "common/error.h"

namespace vidshow::tools {

namespace {

// What most clocks of most containers can count.
constexpr int kLargestTerm = 60000;

// Of encoders that know a steady quality by FFmpeg's scale of 1 (best) to 31.
constexpr int kQuality = 3;

const AVCodec* findCodec(const Options& options, const AVOutputFormat& container) {
    if (!options.encoder.empty()) {
        const AVCodec* const named = avcodec_find_encoder_by_name(options.encoder.c_str());
        if (named != nullptr && named->type == AVMEDIA_TYPE_VIDEO) return named;
        throw Error("there is no video encoder named " + options.encoder + " here");
    }
    const AVCodecID id = av_guess_codec(&container, nullptr, ("x." + options.extension).c_str(),
                                        nullptr, AVMEDIA_TYPE_VIDEO);
    // A container of sound holds a cover at most.
    const bool cover = id == AV_CODEC_ID_PNG && container.audio_codec != AV_CODEC_ID_NONE;
    if (id == AV_CODEC_ID_NONE || cover)
        throw Error("." + options.extension + " files hold no video");
    const AVCodec* const codec = avcodec_find_encoder(id);
    if (codec != nullptr) return codec;
    throw Error("nothing here encodes " + std::string(avcodec_get_name(id)) + " for ." +
                options.extension + " files; --encoder names another encoder");
}

AVRational nearestRate(const AVCodec& codec, AVRational rate) {
    AVRational cut = rate;
    av_reduce(&cut.num, &cut.den, rate.num, rate.den, kLargestTerm);
    if (codec.supported_framerates == nullptr) return cut;
    return codec.supported_framerates[av_find_nearest_q_idx(cut, codec.supported_framerates)];
}

// JPEG's samples are of full range for all readers, whatever a file says; its names imply that.
AVPixelFormat wantedPixels(const AVCodec& codec, AVPixelFormat own) {
    if (codec.id != AV_CODEC_ID_MJPEG) return own;
    switch (own) {
        case AV_PIX_FMT_YUV420P:
        case AV_PIX_FMT_NV12:
            return AV_PIX_FMT_YUVJ420P;
        case AV_PIX_FMT_YUYV422:
        case AV_PIX_FMT_UYVY422:
            return AV_PIX_FMT_YUVJ422P;
        default:
            return AV_PIX_FMT_YUVJ444P;
    }
}

// The form nearest to the pictures' own that the encoder takes.
AVPixelFormat nearestPixels(const AVCodec& codec, AVPixelFormat pictures) {
    const AVPixelFormat own = wantedPixels(codec, pictures);
    if (codec.pix_fmts == nullptr) return own;
    AVPixelFormat best = AV_PIX_FMT_NONE;
    const bool alpha = (av_pix_fmt_desc_get(own)->flags & AV_PIX_FMT_FLAG_ALPHA) != 0;
    for (const AVPixelFormat* format = codec.pix_fmts; *format != AV_PIX_FMT_NONE; ++format) {
        if (*format == own) return own;
        if (sws_isSupportedOutput(*format) == 0) continue;
        best = av_find_best_pix_fmt_of_2(best, *format, own, alpha ? 1 : 0, nullptr);
    }
    if (best == AV_PIX_FMT_NONE) {
        throw Error("the encoder " + std::string(codec.name) + " takes no pixels that can be made");
    }
    return best;
}

bool ofFullRange(AVPixelFormat pixels) {
    return pixels == AV_PIX_FMT_YUVJ420P || pixels == AV_PIX_FMT_YUVJ422P ||
           pixels == AV_PIX_FMT_YUVJ444P;
}

}  // namespace

bool Encoding::singlePictures() const {
    return std::strcmp(container->name, "image2") == 0;
}

Encoding chooseEncoding(const Options& options, AVRational frameRate) {
    Encoding encoding;
    encoding.container = av_guess_format(nullptr, ("x." + options.extension).c_str(), nullptr);
    encoding.codec = findCodec(options, *encoding.container);
    encoding.options = options.encoderOptions;
    encoding.frameRate = nearestRate(*encoding.codec, frameRate);
    return encoding;
}

void Encoder::Close::operator()(AVFormatContext* context) const {
    if ((context->oformat->flags & AVFMT_NOFILE) == 0) avio_closep(&context->pb);
    avformat_free_context(context);
}

Encoder::Encoder(const Encoding& encoding, const std::string& path, const AVFrame& first)
    : m_path(path), m_packet(checkMemory(av_packet_alloc())) {
    const std::string url = path == "-" ? "pipe:1" : "file:" + path;
    AVFormatContext* muxer = nullptr;
    check(avformat_alloc_output_context2(&muxer, encoding.container, nullptr, url.c_str()));
    m_muxer.reset(muxer);
    openCodec(encoding, first);
    openFile(encoding);
}

void Encoder::openCodec(const Encoding& encoding, const AVFrame& first) {
    m_codec.reset(checkMemory(avcodec_alloc_context3(encoding.codec)));
    m_codec->width = first.width;
    m_codec->height = first.height;
    m_codec->pix_fmt = nearestPixels(*encoding.codec, static_cast<AVPixelFormat>(first.format));
    m_codec->colorspace = isRgb(m_codec->pix_fmt) ? AVCOL_SPC_RGB : first.colorspace;
    const bool full = isRgb(m_codec->pix_fmt) || ofFullRange(m_codec->pix_fmt);
    m_codec->color_range = full ? AVCOL_RANGE_JPEG : first.color_range;
    m_codec->strict_std_compliance = FF_COMPLIANCE_UNOFFICIAL;  // MPEG-1 at ten pictures a second
    m_codec->framerate = encoding.frameRate;
    m_codec->time_base = av_inv_q(encoding.frameRate);
    if ((m_muxer->oformat->flags & AVFMT_GLOBALHEADER) != 0) {
        m_codec->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    }
    // Where an encoder has no scale of its own for it, its usual bit rate would spoil any clip.
    if (av_opt_find(m_codec->priv_data, "crf", nullptr, 0, 0) == nullptr) {
        m_codec->flags |= AV_CODEC_FLAG_QSCALE;
        m_codec->global_quality = kQuality * FF_QP2LAMBDA;
    }
    AvDictionary settings;
    for (const std::string& setting : encoding.options) {
        check(av_dict_parse_string(&settings.entries, setting.c_str(), "=", "", 0));
    }
    check(avcodec_open2(m_codec.get(), encoding.codec, &settings.entries));
    const AVDictionaryEntry* const left =
        av_dict_get(settings.entries, "", nullptr, AV_DICT_IGNORE_SUFFIX);
    if (left != nullptr) {
        throw Error("the encoder " + std::string(encoding.codec->name) + " knows no option " +
                    left->key);
    }
}

void Encoder::openFile(const Encoding& encoding) {
    m_stream = checkMemory(avformat_new_stream(m_muxer.get(), encoding.codec));
    m_stream->time_base = m_codec->time_base;
    m_stream->avg_frame_rate = encoding.frameRate;
    check(avcodec_parameters_from_context(m_stream->codecpar, m_codec.get()));
    if ((m_muxer->oformat->flags & AVFMT_NOFILE) == 0) {
        check(avio_open(&m_muxer->pb, m_muxer->url, AVIO_FLAG_WRITE));
    }
    AvDictionary settings;
    if (encoding.singlePictures()) av_dict_set(&settings.entries, "update", "1", 0);
    check(avformat_write_header(m_muxer.get(), &settings.entries));
}

AVFrame* Encoder::repacked(AVFrame* frame) {
    if (frame->format == m_codec->pix_fmt) return frame;
    const AVPixelFormat from = static_cast<AVPixelFormat>(frame->format);
    m_converter.reset(sws_getCachedContext(
        m_converter.release(), frame->width, frame->height, from, frame->width, frame->height,
        m_codec->pix_fmt, SWS_BICUBIC | SWS_ACCURATE_RND | SWS_FULL_CHR_H_INT | SWS_FULL_CHR_H_INP,
        nullptr, nullptr, nullptr));
    if (!m_converter) throw std::bad_alloc();
    AVFrame toldTarget = {};
    toldTarget.format = m_codec->pix_fmt;
    toldTarget.colorspace = frame->colorspace;
    toldTarget.color_range = m_codec->color_range;
    toldTarget.height = frame->height;
    const Colour full = {colourOf(*frame).matrix, Range::full};
    setConverterColours(m_converter.get(), isRgb(from) ? full : colourOf(*frame),
                        isRgb(m_codec->pix_fmt) ? full : colourOf(toldTarget));
    m_repacked.reset(checkMemory(av_frame_alloc()));
    m_repacked->format = m_codec->pix_fmt;
    m_repacked->width = frame->width;
    m_repacked->height = frame->height;
    check(av_frame_get_buffer(m_repacked.get(), 0));
    sws_scale(m_converter.get(), frame->data, frame->linesize, 0, frame->height, m_repacked->data,
              m_repacked->linesize);
    m_repacked->pts = frame->pts;
    return m_repacked.get();
}

void Encoder::write(AVFrame* frame) {
    AVFrame* const ready = repacked(frame);
    ready->quality = m_codec->global_quality;
    send(ready);
}

void Encoder::send(const AVFrame* frame) {
    check(avcodec_send_frame(m_codec.get(), frame));
    for (;;) {
        const int result = avcodec_receive_packet(m_codec.get(), m_packet.get());
        if (result == AVERROR(EAGAIN) || result == AVERROR_EOF) return;
        check(result);
        av_packet_rescale_ts(m_packet.get(), m_codec->time_base, m_stream->time_base);
        m_packet->stream_index = m_stream->index;
        // Clips of one picture would have no length otherwise.
        if (m_packet->duration == 0) {
            m_packet->duration = av_rescale_q(1, m_codec->time_base, m_stream->time_base);
        }
        check(av_interleaved_write_frame(m_muxer.get(), m_packet.get()));
    }
}

void Encoder::finish() {
    send(nullptr);
    check(av_write_trailer(m_muxer.get()));
    if ((m_muxer->oformat->flags & AVFMT_NOFILE) == 0) check(avio_closep(&m_muxer->pb));
}

void Encoder::check(int result) const {
    if (result < 0) throw Error("cannot write " + m_path + ": " + avErrorText(result));
}

}  // namespace vidshow::tools
