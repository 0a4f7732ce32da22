#include "ffmpeg/FilterLibrary.h"

#include <dlfcn.h>
#include <string>
#include <type_traits>

extern "C" {
#include <libavutil/macros.h>
}

namespace av {
namespace {

constexpr char kName[] = "libavfilter.so." AV_STRINGIFY(LIBAVFILTER_VERSION_MAJOR);

FilterLibrary Load() {
    void* library = dlopen(kName, RTLD_NOW | RTLD_LOCAL);
    const auto find = [&](auto& function, const char* name) {
        function = library != nullptr
                       ? reinterpret_cast<std::decay_t<decltype(function)>>(dlsym(library, name))
                       : nullptr;
        if (function == nullptr)
            throw FilterError(std::string(kName) + " cannot be loaded");
    };
    FilterLibrary filters{};
    find(filters.avfilter_get_by_name, "avfilter_get_by_name");
    find(filters.avfilter_graph_alloc, "avfilter_graph_alloc");
    find(filters.avfilter_graph_config, "avfilter_graph_config");
    find(filters.avfilter_graph_create_filter, "avfilter_graph_create_filter");
    find(filters.avfilter_graph_free, "avfilter_graph_free");
    find(filters.avfilter_graph_parse_ptr, "avfilter_graph_parse_ptr");
    find(filters.avfilter_inout_alloc, "avfilter_inout_alloc");
    find(filters.avfilter_inout_free, "avfilter_inout_free");
    find(filters.av_buffersink_get_frame, "av_buffersink_get_frame");
    find(filters.av_buffersrc_add_frame, "av_buffersrc_add_frame");
    return filters;
}

} // namespace

const FilterLibrary& Filters() {
    static const FilterLibrary filters = Load();
    return filters;
}

} // namespace av
