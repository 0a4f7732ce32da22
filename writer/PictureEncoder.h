// The encoder for pictures. It belongs to one thread.
#ifndef MOVIECONV_WRITER_PICTUREENCODER_H
#define MOVIECONV_WRITER_PICTUREENCODER_H

#include "writer/Encoder.h"
#include "writer/FormatTable.h"
#include "writer/HdrLight.h"
#include "writer/KeyFrames.h"

#include <cstdint>
#include <deque>
#include <optional>

namespace writer {

/// Parameters of a picture encoder.
struct PictureSettings {
    int width;
    int height;
    AVRational rate;
    AVRational sampleAspect;
    int64_t bitrate;               ///< Bits per second.
    int64_t maxBitrate;            ///< Upper rate; 0: no limit.
    std::optional<double> quality; ///< On the codec's scale, instead of the bit rate.
    int speed;                     ///< Place on the codec's scale, from the slowest.
    const char* profile;           ///< Of H.264; null: the encoder's choice.
    int threads;
    bool inOrder; ///< Pictures are coded in the order in which they are shown.
    AVPixelFormat format;
    bool fullRange; ///< Luma covers 0 to 255.
    AVColorPrimaries primaries;
    AVColorTransferCharacteristic transfer;
    AVColorSpace matrix;
    std::optional<HdrLight> light;
};

/// The encoder itself only counts pictures, so that its rate control sees a steady rate and no codec's limits
/// on time bases matter; packets carry the ticks that were given with the pictures. Where those come seldom,
/// it is asked for the key frames that it would make too late by its count.
class PictureEncoder {
public:
    /// Throws WriterFailure (kWriterErrorCodec). `ticksPerPicture` is the usual distance of two pictures;
    /// `isCut`: CutHere may be called.
    PictureEncoder(const PictureCodec& codec, const PictureSettings& settings, EncoderFlags flags,
                   int ticksPerPicture, bool isCut);
    ~PictureEncoder();
    PictureEncoder(const PictureEncoder&) = delete;
    PictureEncoder& operator=(const PictureEncoder&) = delete;

    /// Encodes a picture that is shown from `tick` on; ticks rise. It is shown for `stay` ticks if none
    /// follows. Throws WriterFailure (kWriterErrorEncode).
    void Encode(AVFrame& frame, int64_t tick, int64_t stay, const PacketTaker& take);

    /// Cuts behind the picture encoded last: what comes now is only looked at, and its packets are not handed
    /// out. Once, and only where the codec looks ahead and `isCut` was told.
    void CutHere(const PacketTaker& take);

    /// Hands out what is still inside. Nothing can be encoded afterwards.
    void Finish(const PacketTaker& take);

    const AVCodecContext& Context() const { return *context_; }

private:
    bool HasBegun() const;
    bool HasAll() const;
    void SendHeld(const PacketTaker& take);
    void Send(AVFrame* frame, const PacketTaker& take);
    void Wait(AVPacket& packet);
    void HandOutWaiting(const PacketTaker& take);
    int64_t StayOf(int64_t index) const;
    int64_t TickOf(int64_t index) const;

    const int ticksPerPicture_;
    av::CodecContext context_;
    av::Packet packet_;
    KeyFrames keyFrames_;
    int64_t stay_ = 0;               ///< Of the picture that came last, if none follows.
    std::deque<av::Packet> waiting_; ///< The packet of that picture, and those decoded behind it.
    std::deque<int64_t> ticks_;      ///< Ticks of pictures that packets may still name, from firstIndex_ on.
    int64_t firstIndex_ = 0;
    int64_t nextIndex_ = 0;
    int64_t handedOut_ = 0;      ///< Packets.
    bool holds_;                 ///< The last picture is held back, since it may be the one before the cut.
    av::Frame held_;             ///< That one.
    std::optional<int64_t> cut_; ///< Pictures before the cut.
};

} // namespace writer

#endif
