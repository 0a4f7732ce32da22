// FFmpeg's filters, loaded when the first picture needs one: with what they depend on, they cost memory and
// time at every start.
#ifndef MOVIECONV_FFMPEG_FILTERLIBRARY_H
#define MOVIECONV_FFMPEG_FILTERLIBRARY_H

#include <cstdint> // for FFmpeg's headers
#include <stdexcept>

extern "C" {
#include <libavfilter/avfilter.h>
#include <libavfilter/buffersink.h>
#include <libavfilter/buffersrc.h>
}

namespace av {

/// Why pictures cannot be filtered.
class FilterError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// The library's functions under its own names.
struct FilterLibrary {
    decltype(&::avfilter_get_by_name) avfilter_get_by_name;
    decltype(&::avfilter_graph_alloc) avfilter_graph_alloc;
    decltype(&::avfilter_graph_config) avfilter_graph_config;
    decltype(&::avfilter_graph_create_filter) avfilter_graph_create_filter;
    decltype(&::avfilter_graph_free) avfilter_graph_free;
    decltype(&::avfilter_graph_parse_ptr) avfilter_graph_parse_ptr;
    decltype(&::avfilter_inout_alloc) avfilter_inout_alloc;
    decltype(&::avfilter_inout_free) avfilter_inout_free;
    decltype(&::av_buffersink_get_frame) av_buffersink_get_frame;
    decltype(&::av_buffersrc_add_frame) av_buffersrc_add_frame;
};

/// Loads it at the first call, for the rest of the process. Any thread. Throws FilterError when it is
/// missing.
const FilterLibrary& Filters();

} // namespace av

#endif
