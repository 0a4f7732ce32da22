// A chain of FFmpeg's filters for pictures of one size and format.
#ifndef MOVIECONV_FFMPEG_FILTERGRAPH_H
#define MOVIECONV_FFMPEG_FILTERGRAPH_H

#include "ffmpeg/AvHandles.h"

#include <memory>
#include <string>

struct AVFilterGraph;
struct AVFilterContext;

namespace av {

/// Pictures go in and come out in order, some of them later. For one thread. All functions throw FilterError,
/// or std::bad_alloc.
class FilterGraph {
public:
    /// For pictures such as `form`, whose stamps count in `unit`. `chain` is in FFmpeg's notation, from one
    /// open end to the other. 0 threads: as many as there are processors.
    FilterGraph(const AVFrame& form, const std::string& chain, int threads = 0, AVRational unit = {1, 25});
    ~FilterGraph();

    /// Whether the picture is of the size and format that the graph is made for.
    bool Fits(const AVFrame& picture) const;

    /// Takes the picture's content, whose stamp has to rise from one to the next.
    void Push(AVFrame& picture);

    /// Makes what is still held come out. Nothing can be pushed afterwards.
    void Finish();

    /// The next picture that has come out; null when there is none (yet).
    Frame Take();

private:
    struct GraphFree {
        void operator()(AVFilterGraph* graph) const;
    };

    void Connect(const std::string& chain);

    std::unique_ptr<AVFilterGraph, GraphFree> graph_;
    AVFilterContext* entry_ = nullptr; // the graph's
    AVFilterContext* exit_ = nullptr;
    const int width_;
    const int height_;
    const int format_;
};

} // namespace av

#endif
