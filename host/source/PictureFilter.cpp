#include "host/source/PictureFilter.h"

#include "ffmpeg/FilterLibrary.h"
#include "host/sentence/Say.h"
#include "host/source/SourceError.h"

extern "C" {
#include <libavutil/pixdesc.h>
}

#include <string>

namespace movieconv {
namespace {

// Light is made linear, brought to the smaller gamut and rolled off above what SDR's white is.
constexpr char kToneMap[] = "zscale=t=linear:npl=100,format=gbrpf32le,zscale=p=bt709,tonemap=hable:desat=0,"
                            "zscale=t=bt709:m=bt709:r=tv,format=";

/// Does `work` with the filters, whose errors are the source's. `matrix` is that of HDR to be brought to SDR;
/// null: there is none.
template <class Work>
void Filtering(Work work, const char* matrix) {
    try {
        work();
    } catch (const av::FilterError& error) {
        throw SourceError(
            matrix == nullptr
                ? Say("its pictures cannot be filtered: {}", WordsOf(error))
                : Say("its HDR pictures with the colour matrix \"{}\" cannot be brought to BT.709: {}",
                      matrix, WordsOf(error)));
    }
}

/// What HDR pictures mean that do not say it themselves.
void CompleteColours(AVFrame& picture, int transfer) {
    if (picture.color_trc == AVCOL_TRC_UNSPECIFIED)
        picture.color_trc = static_cast<AVColorTransferCharacteristic>(transfer);
    if (picture.color_primaries == AVCOL_PRI_UNSPECIFIED)
        picture.color_primaries = AVCOL_PRI_BT2020;
    // The filters do not know constant luminance, which has the same coefficients.
    if (picture.colorspace == AVCOL_SPC_UNSPECIFIED || picture.colorspace == AVCOL_SPC_BT2020_CL)
        picture.colorspace = AVCOL_SPC_BT2020_NCL;
    if (picture.color_range == AVCOL_RANGE_UNSPECIFIED)
        picture.color_range = AVCOL_RANGE_MPEG;
}

} // namespace

PictureFilter::PictureFilter(const PictureStreamInfo& pictures, const SourceChoice& choice)
    : deinterlace_(choice.deinterlace),
      deep_(choice.deep && pictures.depth > 8),
      transfer_(IsHdr(pictures) && !choice.keepHdr ? pictures.colorTransfer : 0) {}

bool PictureFilter::Push(AVFrame& picture, std::optional<int64_t> stamp, const Sink& sink) {
    const bool interlaced = deinterlace_ == Deinterlace::kAll ||
                            (deinterlace_ == Deinterlace::kFlagged && picture.interlaced_frame != 0);
    deinterlaced_ = deinterlaced_ || interlaced;
    leftInterlaced_ = leftInterlaced_ || (!interlaced && picture.interlaced_frame != 0);
    if (!graph_ && !interlaced && transfer_ == 0)
        return sink(picture, stamp);
    if (graph_ && !graph_->Fits(picture) && !Finish(sink))
        return false;
    Filtering(
        [&] {
            if (!graph_)
                graph_.emplace(picture, Chain());
            if (transfer_ != 0) {
                CompleteColours(picture, transfer_);
                matrix_ = av_color_space_name(picture.colorspace);
            }
            picture.pts = count_++;
            stamps_.push_back(stamp);
            graph_->Push(picture);
        },
        matrix_);
    return HandOut(sink);
}

bool PictureFilter::Finish(const Sink& sink) {
    if (!graph_)
        return true;
    Filtering([&] { graph_->Finish(); }, matrix_);
    const bool goesOn = HandOut(sink);
    graph_.reset();
    stamps_.clear();
    return goesOn;
}

std::string PictureFilter::Chain() const {
    std::string chain = deinterlace_ == Deinterlace::kAll       ? "bwdif=mode=send_frame:deint=all"
                        : deinterlace_ == Deinterlace::kFlagged ? "bwdif=mode=send_frame:deint=interlaced"
                                                                : "";
    if (transfer_ != 0)
        chain += (chain.empty() ? "" : ",") + std::string(kToneMap) + (deep_ ? "yuv420p10" : "yuv420p");
    return chain;
}

bool PictureFilter::HandOut(const Sink& sink) {
    for (;;) {
        av::Frame picture;
        Filtering([&] { picture = graph_->Take(); }, matrix_);
        if (!picture)
            return true;
        std::optional<int64_t> stamp;
        if (!stamps_.empty()) {
            stamp = stamps_.front();
            stamps_.pop_front();
        }
        if (!sink(*picture, stamp))
            return false;
    }
}

} // namespace movieconv
