#include "bench/colour/Swscale.h"

#include <map>
#include <memory>
#include <stdexcept>
#include <tuple>

extern "C" {
#include <libswscale/swscale.h>
}

namespace bench {
namespace {

struct Free {
    void operator()(SwsContext* context) const { sws_freeContext(context); }
};
using Context = std::unique_ptr<SwsContext, Free>;

AVPixelFormat formatOf(Layout layout) {
    switch (layout) {
    case Layout::Rgb24:
        return AV_PIX_FMT_BGR24;
    case Layout::Rgb32:
        return AV_PIX_FMT_BGRA;
    case Layout::Packed:
        return AV_PIX_FMT_YUYV422;
    case Layout::Planes:
        break;
    }
    return AV_PIX_FMT_YUV420P;
}

struct Rows {
    unsigned char* planes[4];
    int pitches[4];
};

Rows rowsOf(const Pictures& p, const Layouts& layouts, Layout layout) {
    switch (layout) {
    case Layout::Rgb24:
        return {{layouts.rgb24}, {p.pitch24}};
    case Layout::Rgb32:
        return {{layouts.rgb32}, {p.pitch32}};
    case Layout::Packed:
        return {{layouts.packed}, {p.pitchPacked}};
    case Layout::Planes:
        break;
    }
    const Planes& planes = layouts.planes;
    return {{planes.y, planes.u, planes.v}, {planes.pitchY, planes.pitchChroma, planes.pitchChroma}};
}

SwsContext* contextFor(const Pictures& p, Layout from, Layout to) {
    constexpr int kAccurate = SWS_BILINEAR | SWS_ACCURATE_RND | SWS_FULL_CHR_H_INT | SWS_FULL_CHR_H_INP;
    static std::map<std::tuple<int, int, Layout, Layout>, Context> made;
    Context& context = made[{p.width, p.height, from, to}];
    if (!context)
        context.reset(sws_getContext(p.width, p.height, formatOf(from), p.width, p.height, formatOf(to),
                                     kAccurate, nullptr, nullptr, nullptr));
    if (!context)
        throw std::runtime_error("swscale does not convert this");
    return context.get();
}

} // namespace

void convertAccurately(Pictures& p, Layout from, Layout to) {
    const Rows source = rowsOf(p, p.source, from);
    const Rows target = rowsOf(p, p.target, to);
    sws_scale(contextFor(p, from, to), source.planes, source.pitches, 0, p.height, target.planes,
              target.pitches);
}

} // namespace bench
