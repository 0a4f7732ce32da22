#include "ffmpeg/FilterGraph.h"

#include "ffmpeg/FilterLibrary.h"

#include <new>

namespace av {
namespace {

void Check(int result) {
    CheckMemory(result);
    if (result < 0)
        throw FilterError(ErrorText(result));
}

} // namespace

void FilterGraph::GraphFree::operator()(AVFilterGraph* graph) const {
    Filters().avfilter_graph_free(&graph);
}

FilterGraph::FilterGraph(const AVFrame& form, const std::string& chain, int threads, AVRational unit)
    : graph_(Filters().avfilter_graph_alloc()),
      width_(form.width),
      height_(form.height),
      format_(form.format) {
    if (!graph_)
        throw std::bad_alloc();
    graph_->nb_threads = threads;
    const std::string description = "video_size=" + std::to_string(width_) + "x" + std::to_string(height_) +
                                    ":pix_fmt=" + std::to_string(format_) +
                                    ":time_base=" + std::to_string(unit.num) + "/" +
                                    std::to_string(unit.den) + ":pixel_aspect=1/1";
    Check(Filters().avfilter_graph_create_filter(&entry_, Filters().avfilter_get_by_name("buffer"), "in",
                                                 description.c_str(), nullptr, graph_.get()));
    Check(Filters().avfilter_graph_create_filter(&exit_, Filters().avfilter_get_by_name("buffersink"), "out",
                                                 nullptr, nullptr, graph_.get()));
    Connect(chain);
}

FilterGraph::~FilterGraph() = default;

void FilterGraph::Connect(const std::string& chain) {
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
}

bool FilterGraph::Fits(const AVFrame& picture) const {
    return picture.width == width_ && picture.height == height_ && picture.format == format_;
}

void FilterGraph::Push(AVFrame& picture) {
    Check(Filters().av_buffersrc_add_frame(entry_, &picture));
}

void FilterGraph::Finish() {
    Check(Filters().av_buffersrc_add_frame(entry_, nullptr));
}

Frame FilterGraph::Take() {
    Frame picture = NewFrame();
    const int result = Filters().av_buffersink_get_frame(exit_, picture.get());
    if (result == AVERROR(EAGAIN) || result == AVERROR_EOF)
        return nullptr;
    Check(result);
    return picture;
}

} // namespace av
