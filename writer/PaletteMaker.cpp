#include "writer/PaletteMaker.h"

#include "ffmpeg/FilterGraph.h"
#include "ffmpeg/FilterLibrary.h"
#include "writer/WriterFailure.h"
#include "writer/WriterStatus.h"

#include <cstring>
#include <string>
#include <utility>

namespace writer {
namespace {

// Ordered dither is the same wherever the picture is, so that what stands still stays the same.
constexpr char kChain[] = "split[picture][colours];[colours]palettegen=reserve_transparent=0[palette];"
                          "[picture][palette]paletteuse=dither=bayer:bayer_scale=3";

bool LooksTheSame(const AVFrame& one, const AVFrame& other) {
    if (one.width != other.width || one.height != other.height)
        return false;
    for (int row = 0; row < one.height; ++row)
        if (std::memcmp(one.data[0] + static_cast<ptrdiff_t>(row) * one.linesize[0],
                        other.data[0] + static_cast<ptrdiff_t>(row) * other.linesize[0],
                        static_cast<size_t>(one.width) * 4) != 0)
            return false;
    return true;
}

} // namespace

av::Frame PaletteMaker::Convert(av::Frame picture) {
    if (!last_ || !LooksTheSame(*last_, *picture)) {
        try {
            av::FilterGraph graph(*picture, kChain, 1);
            last_ = av::NewFrame();
            av::CheckMemory(av_frame_ref(last_.get(), picture.get()));
            picture->pts = 0;
            graph.Push(*picture);
            graph.Finish();
            made_ = graph.Take();
        } catch (const av::FilterError& error) {
            throw WriterFailure(kWriterErrorEncode, std::string("No palette can be made: ") + error.what());
        }
        if (!made_)
            throw WriterFailure(kWriterErrorEncode, "No palette came out.");
    }
    av::Frame result = av::NewFrame();
    av::CheckMemory(av_frame_ref(result.get(), made_.get()));
    return result;
}

} // namespace writer
