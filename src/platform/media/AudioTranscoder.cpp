#include "AudioTranscoder.h"

#include "StreamTime.h"

#include <algorithm>
#include <deque>

namespace platform {
namespace {

// Two samples of jitter between a frame's time and where the previous one
// ended is rounding, not a gap.
constexpr std::int64_t kJitter = 2;

} // namespace

struct AudioTranscoder::Source {
    AVStream* stream = nullptr;
    float volume = 1.0f;
    ffmpeg::CodecPtr decoder;
    ffmpeg::SwrPtr swr;
    ffmpeg::FramePtr frame = ffmpeg::makeFrame();
    // Samples for the clip's positions [emitted, emitted + size), per channel.
    std::vector<std::deque<float>> pending;
    bool ended = false;

    std::int64_t filled() const { return pending.empty() ? 0 : std::int64_t(pending[0].size()); }
};

AudioTranscoder::AudioTranscoder(ClipMuxer& muxer) : muxer_(muxer) {}
AudioTranscoder::~AudioTranscoder() = default;

std::unique_ptr<AudioTranscoder> AudioTranscoder::create(const std::vector<Input>& inputs,
                                                         ClipMuxer& muxer,
                                                         const EncodingSettings& settings,
                                                         ErrorPtr* error) {
    std::unique_ptr<AudioTranscoder> t(new AudioTranscoder(muxer));
    const AVChannelLayout* widest = nullptr;
    for (const Input& input : inputs) {
        auto source = std::make_unique<Source>();
        source->stream = input.stream;
        source->volume = input.volume;
        int err = 0;
        source->decoder = ffmpeg::openDecoder(input.stream, 1, &err);
        if (!source->decoder) {
            setError(error, ffmpeg::failure(err, QStringLiteral("cannot decode the audio")));
            return {};
        }
        const AVChannelLayout& layout = source->decoder->ch_layout;
        if (!widest || layout.nb_channels > widest->nb_channels)
            widest = &layout;
        t->sources_.push_back(std::move(source));
    }
    const AVCodec* codec = avcodec_find_encoder(AV_CODEC_ID_AAC);
    if (t->sources_.empty() || !codec) {
        setError(error,
                 ffmpeg::failure(AVERROR_ENCODER_NOT_FOUND, QStringLiteral("no AAC encoder")));
        return {};
    }
    t->encoder_.reset(avcodec_alloc_context3(codec));
    AVCodecContext* c = t->encoder_.get();
    const AVCodecContext* first = t->sources_.front()->decoder.get();
    c->sample_fmt = AV_SAMPLE_FMT_FLTP;
    c->sample_rate = first->sample_rate > 0 ? first->sample_rate : 48000;
    if (widest && widest->nb_channels > 0)
        av_channel_layout_copy(&c->ch_layout, widest);
    else
        av_channel_layout_default(&c->ch_layout, 2);
    c->bit_rate = settings.audioBitRate;
    c->time_base = {1, c->sample_rate};
    c->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    int err = avcodec_open2(c, codec, nullptr);
    if (err < 0) {
        setError(error, ffmpeg::failure(err, QStringLiteral("cannot open the AAC encoder")));
        return {};
    }
    for (auto& source : t->sources_) {
        const AVCodecContext* d = source->decoder.get();
        SwrContext* swr = nullptr;
        AVChannelLayout in = d->ch_layout;
        if (in.nb_channels <= 0)
            av_channel_layout_default(&in, 2);
        if ((err = swr_alloc_set_opts2(&swr, &c->ch_layout, c->sample_fmt, c->sample_rate, &in,
                                       d->sample_fmt, d->sample_rate, 0, nullptr)) < 0 ||
            (err = swr_init(swr)) < 0) {
            swr_free(&swr);
            setError(error, ffmpeg::failure(err, QStringLiteral("cannot convert the audio")));
            return {};
        }
        source->swr.reset(swr);
        source->pending.resize(c->ch_layout.nb_channels);
    }
    AVStream* out = muxer.addStream();
    if (!out || avcodec_parameters_from_context(out->codecpar, c) < 0) {
        setError(error,
                 ffmpeg::failure(AVERROR(ENOMEM), QStringLiteral("cannot make the audio track")));
        return {};
    }
    out->time_base = c->time_base;
    t->output_ = out;
    return t;
}

void AudioTranscoder::setRange(const MediaTime& start, const MediaTime& end) {
    start_ = start;
    total_ = std::max<std::int64_t>(
        0, StreamTime::fromMediaTime(end - start, AVRational{1, encoder_->sample_rate}));
}

bool AudioTranscoder::reads(int streamIndex) const {
    return std::any_of(sources_.begin(), sources_.end(),
                       [&](const auto& s) { return s->stream->index == streamIndex; });
}

bool AudioTranscoder::done() const {
    return emitted_ >= total_;
}

ErrorPtr AudioTranscoder::take(AVPacket* packet) {
    Source* source = nullptr;
    for (auto& s : sources_)
        if (s->stream->index == packet->stream_index)
            source = s.get();
    if (!source || source->ended || done()) {
        av_packet_unref(packet);
        return nullptr;
    }
    int err = avcodec_send_packet(source->decoder.get(), packet);
    av_packet_unref(packet);
    if (err < 0 && err != AVERROR(EAGAIN) && err != AVERROR_INVALIDDATA)
        return ffmpeg::failure(err, QStringLiteral("cannot decode the audio"));
    while ((err = avcodec_receive_frame(source->decoder.get(), source->frame.get())) >= 0) {
        ErrorPtr e = place(*source, source->frame.get());
        av_frame_unref(source->frame.get());
        if (e)
            return e;
    }
    if (err != AVERROR(EAGAIN) && err != AVERROR_EOF)
        return ffmpeg::failure(err, QStringLiteral("cannot decode the audio"));
    return mix(false);
}

// Converts a decoded frame and puts its samples where its time says in the
// clip: after silence when it comes late, overlapping samples dropped.
ErrorPtr AudioTranscoder::place(Source& source, AVFrame* frame) {
    AVCodecContext* c = encoder_.get();
    const std::int64_t pts = frame->best_effort_timestamp;
    if (pts == AV_NOPTS_VALUE)
        return nullptr;
    const AVRational samples{1, c->sample_rate};
    const std::int64_t at = StreamTime::fromMediaTime(
        StreamTime::toMediaTime(pts, source.stream->time_base) - start_, samples);
    ffmpeg::FramePtr converted = ffmpeg::makeFrame();
    converted->format = c->sample_fmt;
    converted->sample_rate = c->sample_rate;
    converted->nb_samples = int(swr_get_out_samples(source.swr.get(), frame->nb_samples)) + 16;
    av_channel_layout_copy(&converted->ch_layout, &c->ch_layout);
    if (av_frame_get_buffer(converted.get(), 0) < 0)
        return ffmpeg::failure(AVERROR(ENOMEM), QStringLiteral("cannot convert the audio"));
    const int got =
        swr_convert(source.swr.get(), converted->data, converted->nb_samples,
                    const_cast<const std::uint8_t**>(frame->extended_data), frame->nb_samples);
    if (got < 0)
        return ffmpeg::failure(got, QStringLiteral("cannot convert the audio"));
    const std::int64_t next = emitted_ + source.filled();
    std::int64_t skip = 0;
    if (at > next + kJitter) {
        for (auto& channel : source.pending)
            channel.insert(channel.end(), size_t(at - next), 0.0f);
    } else if (at < next - kJitter) {
        skip = next - at;
    }
    const std::int64_t room = total_ - (emitted_ + source.filled());
    const std::int64_t keep = std::min<std::int64_t>(got - skip, room);
    if (keep > 0)
        for (int ch = 0; ch < c->ch_layout.nb_channels; ++ch) {
            const float* data = reinterpret_cast<const float*>(converted->extended_data[ch]) + skip;
            source.pending[ch].insert(source.pending[ch].end(), data, data + keep);
        }
    if (room <= got - skip)
        source.ended = true;
    return nullptr;
}

ErrorPtr AudioTranscoder::mix(bool draining) {
    AVCodecContext* c = encoder_.get();
    const int frameSize = c->frame_size > 0 ? c->frame_size : 1024;
    for (;;) {
        // An input that lags far behind the others has nothing there: packets
        // lie in the file in time order, a few seconds apart at most.
        std::int64_t most = 0;
        for (const auto& s : sources_)
            most = std::max(most, s->filled());
        const std::int64_t patience = std::int64_t(c->sample_rate) * 3;
        const std::int64_t want = std::min<std::int64_t>(total_ - emitted_, frameSize);
        std::int64_t ready = total_ - emitted_;
        for (const auto& s : sources_) {
            if (s->ended || draining) {
                // Silent from where it stopped.
                if (s->filled() < want)
                    for (auto& channel : s->pending)
                        channel.insert(channel.end(), size_t(want - s->filled()), 0.0f);
            } else if (most - s->filled() > patience) {
                for (auto& channel : s->pending)
                    channel.insert(channel.end(), size_t(most - patience - s->filled()), 0.0f);
            }
            ready = std::min(ready, s->filled());
        }
        const int n = int(std::min<std::int64_t>(ready, frameSize));
        if (n <= 0 || (n < frameSize && emitted_ + n < total_))
            return nullptr;
        ffmpeg::FramePtr frame = ffmpeg::makeFrame();
        frame->format = c->sample_fmt;
        frame->sample_rate = c->sample_rate;
        frame->nb_samples = n;
        av_channel_layout_copy(&frame->ch_layout, &c->ch_layout);
        if (av_frame_get_buffer(frame.get(), 0) < 0)
            return ffmpeg::failure(AVERROR(ENOMEM), QStringLiteral("cannot mix the audio"));
        for (int ch = 0; ch < c->ch_layout.nb_channels; ++ch) {
            float* out = reinterpret_cast<float*>(frame->extended_data[ch]);
            std::fill(out, out + n, 0.0f);
            for (auto& s : sources_) {
                std::deque<float>& in = s->pending[ch];
                for (int k = 0; k < n; ++k)
                    out[k] += s->volume * in[size_t(k)];
                in.erase(in.begin(), in.begin() + n);
            }
            for (int k = 0; k < n; ++k)
                out[k] = std::clamp(out[k], -1.0f, 1.0f);
        }
        frame->pts = emitted_;
        emitted_ += n;
        if (ErrorPtr e = encode(frame.get()))
            return e;
    }
}

ErrorPtr AudioTranscoder::encode(AVFrame* frame) {
    int err = avcodec_send_frame(encoder_.get(), frame);
    if (err < 0)
        return ffmpeg::failure(err, QStringLiteral("cannot encode the audio"));
    ffmpeg::PacketPtr packet = ffmpeg::makePacket();
    while ((err = avcodec_receive_packet(encoder_.get(), packet.get())) >= 0)
        if ((err = muxer_.write(packet.get(), output_, encoder_->time_base)) < 0)
            return ffmpeg::failure(err, QStringLiteral("cannot write a sample"));
    if (err != AVERROR(EAGAIN) && err != AVERROR_EOF)
        return ffmpeg::failure(err, QStringLiteral("cannot encode the audio"));
    return nullptr;
}

ErrorPtr AudioTranscoder::finish() {
    for (auto& s : sources_) {
        if (s->ended)
            continue;
        avcodec_send_packet(s->decoder.get(), nullptr);
        while (avcodec_receive_frame(s->decoder.get(), s->frame.get()) >= 0) {
            ErrorPtr e = place(*s, s->frame.get());
            av_frame_unref(s->frame.get());
            if (e)
                return e;
        }
        s->ended = true;
    }
    if (ErrorPtr e = mix(true))
        return e;
    return encode(nullptr);
}

} // namespace platform
