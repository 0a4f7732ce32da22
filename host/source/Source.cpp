#include "host/source/Source.h"

#include "host/sentence/Say.h"
#include "host/source/Probe.h"
#include "host/source/SourceTexts.h"
#include "host/source/StreamChoice.h"
#include "host/source/StreamDescription.h"

#include <cstddef>
#include <utility>
#include <vector>

namespace movieconv {
namespace {

Sentence NothingToConvert(const std::string& path, const SourceChoice& choice) {
    if (choice.pictures && choice.sound)
        return Say("\"{}\" holds no pictures and no sound that can be decoded", path);
    return choice.pictures ? Say("\"{}\" holds no pictures that can be decoded", path)
                           : Say("\"{}\" holds no sound that can be decoded", path);
}

} // namespace

Source::Source(const std::string& path, const SourceChoice& choice,
               std::shared_ptr<Interruption> interruption)
    : reader_(path, choice.playlists, choice.untilNow ? Growth::kLeftOut : Growth::kRead,
              std::move(interruption)) {
    AVFormatContext& context = *reader_.Context();
    info_.path = path;
    info_.bytes = reader_.File().Bytes();
    info_.container =
        context.iformat->long_name != nullptr ? context.iformat->long_name : context.iformat->name;
    info_.streams = DescribeStreams(context, reader_.Start());
    info_.chapters = DescribeChapters(context, reader_.Start());
    info_.tags = DescribeTags(context.metadata);
    TakeNotes(reader_.File().Notes(), info_);
    PutTextsRight(context.iformat->name, info_);
    const ChosenStreams chosen = ChooseStreams(info_.streams, choice);
    WantedTracks(info_.streams, StreamKind::kSubtitles, choice.subtitles); // throws
    std::vector<int> selected;
    if (chosen.pictures >= 0) {
        selected.push_back(chosen.pictures);
        info_.pictures = StreamOf(chosen.pictures).pictures;
    }
    if (chosen.sound >= 0) {
        selected.push_back(chosen.sound);
        info_.sound = StreamOf(chosen.sound).sound;
    }
    if (selected.empty())
        throw SourceError(NothingToConvert(path, choice));
    for (Tag& tag : DescribeService(context, selected.front()))
        info_.tags.push_back(std::move(tag));
    reader_.Select(std::move(selected));
    Probe();
    info_.isImage = IsImage(*reader_.Context(), info_);
    if (info_.pictures)
        CropPictures(choice.crop);
}

/// The pictures' shape is that of what is left. Throws CropError when that is too little.
void Source::CropPictures(const Crop& crop) {
    constexpr int kLeast = 16; // pixels
    PictureStreamInfo& pictures = *info_.pictures;
    const auto even = [](int pixels) { return pixels & ~1; };
    pictures.crop = {even(crop.top), even(crop.bottom), even(crop.left), even(crop.right)};
    const int width = pictures.width - pictures.crop.left - pictures.crop.right;
    const int height = pictures.height - pictures.crop.top - pictures.crop.bottom;
    if (!crop.CutsNothing() && (width < kLeast || height < kLeast)) {
        throw CropError(Say("too little is left of the pictures of \"{}\", which are {}x{}", info_.path,
                            pictures.width, pictures.height));
    }
    pictures.width = width;
    pictures.height = height;
}

/// Finds out what only reading tells, for the chosen streams.
void Source::Probe() {
    if (info_.pictures)
        ProbeFrameRate(reader_, info_);
    if (info_.pictures)
        ProbeLight(reader_, info_);
    ProbeLength(reader_, info_);
    if (info_.pictures)
        StreamOf(info_.pictures->index).pictures = info_.pictures;
    if (info_.sound)
        StreamOf(info_.sound->index).sound = info_.sound;
}

StreamInfo& Source::StreamOf(int index) {
    return info_.streams[static_cast<std::size_t>(index)];
}

std::vector<uint8_t> Source::StoredFile(int stream) const {
    const AVFormatContext& context = *reader_.Context();
    if (stream < 0 || stream >= static_cast<int>(context.nb_streams))
        return {};
    const AVStream& found = *context.streams[stream];
    const AVCodecParameters& parameters = *found.codecpar;
    if ((found.disposition & AV_DISPOSITION_ATTACHED_PIC) != 0)
        return {found.attached_pic.data, found.attached_pic.data + found.attached_pic.size};
    if (parameters.codec_type == AVMEDIA_TYPE_ATTACHMENT)
        return {parameters.extradata, parameters.extradata + parameters.extradata_size};
    return {};
}

av::CodecParameters Source::ParametersOf(int stream) const {
    av::CodecParameters parameters = av::CopyOf(*reader_.Context()->streams[stream]->codecpar);
    const std::string& codec = info_.streams[static_cast<std::size_t>(stream)].codec;
    if (parameters->codec_id == AV_CODEC_ID_NONE)
        if (const AVCodecDescriptor* known = avcodec_descriptor_get_by_name(codec.c_str()))
            parameters->codec_id = known->id;
    return parameters;
}

const AVStream* Source::PictureStream() const {
    return info_.pictures ? reader_.Context()->streams[info_.pictures->index] : nullptr;
}

const AVStream* Source::SoundStream() const {
    return info_.sound ? reader_.Context()->streams[info_.sound->index] : nullptr;
}

} // namespace movieconv
