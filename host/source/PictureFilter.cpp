#include "host/source/PictureFilter.h"

#include "host/source/FilterLibrary.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <fmt/format.h>
#include <new>
#include <utility>

namespace movieconv {
namespace {

// Light is made linear, brought to the smaller gamut and rolled off above what SDR's white is.
constexpr char kToneMap[] = "zscale=t=linear:npl=100,format=gbrpf32le,zscale=p=bt709,tonemap=hable:desat=0,"
                            "zscale=t=bt709:m=bt709:r=tv,format=";

void Check(int result) {
    av::CheckMemory(result);
    if (result < 0)
        throw SourceError("its pictures cannot be filtered: " + av::ErrorText(result));
}

/// What HDR pictures mean that do not say it themselves.
void CompleteColours(AVFrame& picture, int transfer) {
    if (picture.color_trc == AVCOL_TRC_UNSPECIFIED)
        picture.color_trc = static_cast<AVColorTransferCharacteristic>(transfer);
    if (picture.color_primaries == AVCOL_PRI_UNSPECIFIED)
        picture.color_primaries = AVCOL_PRI_BT2020;
    if (picture.colorspace == AVCOL_SPC_UNSPECIFIED)
        picture.colorspace = AVCOL_SPC_BT2020_NCL;
    if (picture.color_range == AVCOL_RANGE_UNSPECIFIED)
        picture.color_range = AVCOL_RANGE_MPEG;
}

} // namespace

void PictureFilter::GraphFree::operator()(AVFilterGraph* graph) const {
    Filters().avfilter_graph_free(&graph);
}

PictureFilter::PictureFilter(const PictureStreamInfo& pictures, const SourceChoice& choice)
    : deinterlace_(choice.deinterlace),
      deep_(choice.deep && pictures.depth > 8),
      transfer_(IsHdr(pictures) && !choice.keepHdr ? pictures.colorTransfer : 0) {}

PictureFilter::~PictureFilter() = default;

bool PictureFilter::Push(AVFrame& picture, std::optional<int64_t> stamp, const Sink& sink) {
    const bool interlaced = deinterlace_ == Deinterlace::kAll ||
                            (deinterlace_ == Deinterlace::kFlagged && picture.interlaced_frame != 0);
    deinterlaced_ = deinterlaced_ || interlaced;
    if (!graph_ && !interlaced && transfer_ == 0)
        return sink(picture, stamp);
    if (graph_ && !Fits(picture) && !Finish(sink))
        return false;
    if (!graph_)
        Build(picture);
    if (transfer_ != 0)
        CompleteColours(picture, transfer_);
    picture.pts = count_++;
    stamps_.push_back(stamp);
    Check(Filters().av_buffersrc_add_frame(entry_, &picture));
    return HandOut(sink);
}

bool PictureFilter::Finish(const Sink& sink) {
    if (!graph_)
        return true;
    Check(Filters().av_buffersrc_add_frame(entry_, nullptr));
    const bool goesOn = HandOut(sink);
    graph_.reset();
    stamps_.clear();
    return goesOn;
}

bool PictureFilter::Fits(const AVFrame& picture) const {
    return picture.width == form_->width && picture.height == form_->height &&
           picture.format == form_->format;
}

void PictureFilter::Build(const AVFrame& picture) {
    graph_.reset(Filters().avfilter_graph_alloc());
    if (!graph_)
        throw std::bad_alloc();
    const std::string form = fmt::format("video_size={}x{}:pix_fmt={}:time_base=1/25:pixel_aspect=1/1",
                                         picture.width, picture.height, picture.format);
    Check(Filters().avfilter_graph_create_filter(&entry_, Filters().avfilter_get_by_name("buffer"), "in",
                                                 form.c_str(), nullptr, graph_.get()));
    Check(Filters().avfilter_graph_create_filter(&exit_, Filters().avfilter_get_by_name("buffersink"), "out",
                                                 nullptr, nullptr, graph_.get()));
    std::string chain = deinterlace_ == Deinterlace::kAll       ? "bwdif=mode=send_frame:deint=all"
                        : deinterlace_ == Deinterlace::kFlagged ? "bwdif=mode=send_frame:deint=interlaced"
                                                                : "";
    if (transfer_ != 0)
        chain += (chain.empty() ? "" : ",") + std::string(kToneMap) + (deep_ ? "yuv420p10" : "yuv420p");
    AVFilterInOut* inputs = Filters().avfilter_inout_alloc();
    AVFilterInOut* outputs = Filters().avfilter_inout_alloc();
    int result = AVERROR(ENOMEM);
    if (inputs != nullptr && outputs != nullptr) {
        *outputs = {av_strdup("in"), entry_, 0, nullptr};
        *inputs = {av_strdup("out"), exit_, 0, nullptr};
        result = Filters().avfilter_graph_parse_ptr(graph_.get(), chain.c_str(), &inputs, &outputs, nullptr);
    }
    Filters().avfilter_inout_free(&inputs);
    Filters().avfilter_inout_free(&outputs);
    Check(result);
    Check(Filters().avfilter_graph_config(graph_.get(), nullptr));
    form_ = av::NewFrame();
    form_->width = picture.width;
    form_->height = picture.height;
    form_->format = picture.format;
}

bool PictureFilter::HandOut(const Sink& sink) {
    for (;;) {
        const av::Frame picture = av::NewFrame();
        const int result = Filters().av_buffersink_get_frame(exit_, picture.get());
        if (result == AVERROR(EAGAIN) || result == AVERROR_EOF)
            return true;
        Check(result);
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
