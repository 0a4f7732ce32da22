#include "host/source/PictureDecoder.h"

#include "host/source/LogSilence.h"
#include "host/source/MediaTime.h"

#include <algorithm>
#include <utility>

namespace movieconv {
namespace {

constexpr std::size_t kPicturesAhead = 3;
constexpr std::size_t kHeavyPicturesAhead = 1; // each of many decoding threads keeps a finished one as well
constexpr std::size_t kBytesAhead = 256 << 20;

std::size_t Bytes(const AVFrame& frame) {
    const std::size_t sampleBytes = frame.format == AV_PIX_FMT_YUV420P10 ? 2 : 1;
    return sampleBytes * static_cast<std::size_t>(frame.width) * static_cast<std::size_t>(frame.height) * 3 /
           2;
}

/// Bits for a pixel of the coded stream; 0 when its rate is not told.
double BitsPerPixel(const Source& source) {
    const PictureStreamInfo& pictures = *source.Info().pictures;
    return static_cast<double>(source.PictureStream()->codecpar->bit_rate) /
           (pictures.frameRate * pictures.width * pictures.height);
}

} // namespace

PictureDecoder::PictureDecoder(const Source& source, Demuxer& demuxer, Failures& failures,
                               const SourceChoice& choice, SubtitleBurner* burner)
    : reader_(source.Reader()),
      demuxer_(demuxer),
      failures_(failures),
      stream_(source.PictureStream()->index),
      timeBase_(source.PictureStream()->time_base),
      parameters_(av::CopyOf(*source.PictureStream()->codecpar)),
      threads_(BitsPerPixel(source)),
      decoder_(std::make_unique<StreamDecoder>(*parameters_, timeBase_, threads_.Count())),
      filter_(*source.Info().pictures, choice),
      converter_(*source.Info().pictures, choice, burner != nullptr),
      burner_(burner),
      stamps_(ToMediaTime(1 / source.Info().pictures->frameRate)),
      queue_(threads_.OnTrial() ? kPicturesAhead : kHeavyPicturesAhead, kBytesAhead,
             {L"Movie::The picture decoder waits for the conversion",
              L"Movie::The conversion waits for the picture decoder"}) {
    const PictureStreamInfo& pictures = *source.Info().pictures;
    info_.format = {pictures.width, pictures.height, CredibleRate(pictures),
                    std::max(pictures.duration, kShortestTold)};
}

PictureDecoder::~PictureDecoder() {
    Stop();
    demuxer_.Stop();
    if (thread_.joinable())
        thread_.join();
}

double PictureDecoder::Seek(double seconds, int /*mode*/) {
    if (!thread_.joinable()) {
        range_.BeginAt(ToMediaTime(seconds));
        demuxer_.Seek(seconds);
    }
    return seconds;
}

void PictureDecoder::EndAt(double seconds) {
    range_.EndAt(ToMediaTime(seconds));
}

VideoImage* PictureDecoder::GetCurrentImage() {
    if (!ended_ && !current_.frame) {
        ended_ = !failures_.Attempt([this] { thread_ = NewThread(AsSilentAsHere([this] { Run(); })); }) ||
                 !Advance();
    }
    return ended_ ? nullptr : &image_;
}

int PictureDecoder::DecodeNext(int /*mode*/) {
    ended_ = ended_ || !Advance();
    return ended_ ? 0 : 1;
}

std::optional<int64_t> PictureDecoder::TimeOfNext() {
    if (!next_ && GetCurrentImage() != nullptr)
        next_ = queue_.Pop();
    return next_ ? std::optional(next_->stamp.time) : std::nullopt;
}

/// Makes the next picture the current one; the last one stays when there is none.
bool PictureDecoder::Advance() {
    if (!next_)
        next_ = queue_.Pop();
    if (!next_)
        return false;
    current_ = std::move(*next_);
    next_.reset();
    const AVFrame& frame = *current_.frame;
    image_ = {};
    image_.nType = kMediaTypePicture;
    image_.nFormat =
        frame.format == AV_PIX_FMT_YUV420P10 ? kPictureFormatPlanar420Deep : kPictureFormatPlanar420;
    image_.pY = frame.data[0];
    image_.pU = frame.data[1];
    image_.pV = frame.data[2];
    image_.nWidth = frame.width;
    image_.nHeight = frame.height;
    image_.nPitchY = frame.linesize[0];
    image_.nPitchU = frame.linesize[1];
    image_.nPitchV = frame.linesize[2];
    TellTimes(image_, current_.stamp);
    return true;
}

void PictureDecoder::Run() {
    failures_.Attempt([this] {
        DecodeAll();
        if (const auto last = stamps_.Finish(lastStay_.Told(reader_, timeBase_)); last && held_)
            Deliver(*last, true);
    });
    ranDry_ = !refused_;
    repaired_ = stamps_.Repaired();
    deinterlaced_ = filter_.Deinterlaced();
    leftInterlaced_ = filter_.LeftInterlaced();
    narrowed_ = converter_.Narrowed();
    damaged_ = unconverted_ + decoder_->Damaged();
    queue_.Finish();
}

void PictureDecoder::DecodeAll() {
    const auto accept = [this](AVFrame& frame) { return Accept(frame); };
    threads_.Begin();
    while (const av::Packet packet = demuxer_.Take(stream_)) {
        lastStay_.Add(*packet);
        if (!decoder_->Decode(packet.get(), accept))
            return;
        damaged_ = unconverted_ + decoder_->Damaged();
        if (!threads_.OnTrial())
            continue;
        if (const auto known = threads_.Consider(*packet); known && !UseMoreThreads(*known))
            return;
    }
    decoder_->Decode(nullptr, accept);
    if (!refused_)
        filter_.Finish(
            [this](AVFrame& picture, std::optional<int64_t> stamp) { return Hold(picture, stamp); });
}

bool PictureDecoder::Accept(AVFrame& frame) {
    if ((frame.flags & AV_FRAME_FLAG_DISCARD) != 0) // cut off by the container; not every decoder keeps it
        return true;
    if (skip_ > 0) {
        --skip_;
        return true;
    }
    ++decoded_;
    notes_.Look(frame);
    std::optional<int64_t> stamp;
    if (frame.best_effort_timestamp != AV_NOPTS_VALUE)
        stamp = reader_.MediaTime(frame.best_effort_timestamp, timeBase_);
    return filter_.Push(
        frame, stamp, [this](AVFrame& picture, std::optional<int64_t> time) { return Hold(picture, time); });
}

/// Keeps the picture until its stamp is settled, and hands on the one before it.
bool PictureDecoder::Hold(AVFrame& picture, std::optional<int64_t> stamp) {
    const auto previous = stamps_.Push(stamp);
    if (previous && !Deliver(*previous, false)) {
        held_.reset();
        return false;
    }
    held_ = av::NewFrame();
    av_frame_move_ref(held_.get(), &picture);
    return true;
}

/// Hands the held picture on, unless it is over before the conversion begins. False when that ends before it,
/// or nobody takes it any more.
bool PictureDecoder::Deliver(StampRepair::Stamp stamp, bool isLast) {
    decodedTo_ = stamp.time + stamp.duration;
    const StampRepair::Stamp whole = stamp;
    const PictureRange::Place place = range_.Fit(stamp, isLast);
    refused_ = place == PictureRange::Place::kBehind;
    if (place != PictureRange::Place::kWithin)
        return !refused_;
    av::Frame picture = converter_.Convert(*held_);
    if (!picture) {
        ++unconverted_;
        return true;
    }
    range_.Gave();
    threads_.OnPicture(queue_.Size() == 0);
    for (PictureStay stay(whole, stamp); !refused_ && !stay.IsOver();) {
        const StampRepair::Stamp part = TakePart(stay, burner_);
        av::Frame given = stay.IsOver() ? std::exchange(picture, nullptr) : av::CopyOf(*picture);
        if (burner_ != nullptr)
            burner_->Draw(*given, part.time);
        const std::size_t bytes = Bytes(*given);
        refused_ = !queue_.Push({std::move(given), part}, bytes);
    }
    return !refused_;
}

/// Begins again with more threads and skips the frames that are known, whatever lies between key pictures.
bool PictureDecoder::UseMoreThreads(const std::vector<av::Packet>& known) {
    decoder_ = std::make_unique<StreamDecoder>(*parameters_, timeBase_, DecodingThreads::Many());
    skip_ = decoded_;
    return std::all_of(known.begin(), known.end(), [this](const av::Packet& packet) {
        return decoder_->Decode(packet.get(), [this](AVFrame& frame) { return Accept(frame); });
    });
}

} // namespace movieconv
