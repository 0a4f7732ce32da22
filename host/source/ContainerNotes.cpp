#include "host/source/ContainerNotes.h"

#include "ffmpeg/Mp4Box.h"
#include "host/source/ContainerParts.h"
#include "host/source/Languages.h"

#include <cstdint>

extern "C" {
#include <libavutil/avstring.h>
}

namespace movieconv {
namespace {

ContainerNotes OfMp4(const InputFile& file) {
    constexpr int64_t kVersionAndFlags = 4;
    constexpr int64_t kLongestTag = 36 + kVersionAndFlags; // with its end
    constexpr int64_t kLongestTitle = 4096;
    ContainerNotes notes;
    Parts boxes(file, ReadBoxHead);
    boxes.ForEach(boxes.Find(boxes.Whole(), av::BoxType("moov")), [&](const Part& track) {
        if (track.name != av::BoxType("trak"))
            return true;
        const Part language = boxes.Find(boxes.Find(track, av::BoxType("mdia")), av::BoxType("elng"));
        const Part title = boxes.Find(boxes.Find(track, av::BoxType("udta")), av::BoxType("name"));
        notes.streams.push_back({LanguageTagFrom(boxes.Text(language, kVersionAndFlags, kLongestTag)),
                                 boxes.Text(title, 0, kLongestTitle), AV_CODEC_ID_NONE});
        return true;
    });
    return notes;
}

} // namespace

ContainerNotes ReadContainerNotes(const InputFile& file, const AVFormatContext& context) {
    ContainerNotes notes;
    if (av_match_name("matroska", context.iformat->name) != 0)
        notes = ReadMatroskaNotes(file);
    else if (av_match_name("mov", context.iformat->name) != 0)
        notes = OfMp4(file);
    if (notes.streams.size() > context.nb_streams) // streams and tracks do not belong to each other
        notes.streams.clear();
    notes.streams.resize(context.nb_streams); // covers and attached files follow the tracks
    return notes;
}

} // namespace movieconv
