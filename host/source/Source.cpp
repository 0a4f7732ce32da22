#include "host/source/Source.h"

#include "host/source/Languages.h"
#include "host/source/Probe.h"
#include "host/source/SourceTexts.h"
#include "host/source/StreamChoice.h"
#include "host/source/StreamDescription.h"
#include "host/source/SubtitleFile.h"

#include <algorithm>
#include <cstddef>
#include <fmt/format.h>
#include <utility>
#include <vector>

extern "C" {
#include <libavutil/avstring.h>
}

namespace movieconv {
namespace {

std::string NothingToConvert(const std::string& path, const SourceChoice& choice) {
    return fmt::format("\"{}\" holds no {} that can be decoded", path,
                       choice.pictures && choice.sound ? "pictures and no sound"
                       : choice.pictures               ? "pictures"
                                                       : "sound");
}

/// Puts the text in the place of that of the same name, where there is one.
void ReplaceTag(std::vector<Tag>& tags, const std::string& key, const std::string& text) {
    const auto known = std::find_if(tags.begin(), tags.end(), [&](const Tag& tag) {
        return av_strcasecmp(tag.key.c_str(), key.c_str()) == 0;
    });
    if (known != tags.end() && !text.empty())
        known->value = ToUtf8(text, "");
}

/// Of a chapter's titles the first one is what people gave it first.
void PreferFirstTitles(const std::vector<ContainerNotes::Titles>& titles, std::vector<Chapter>& chapters) {
    auto next = chapters.begin();
    for (const ContainerNotes::Titles& each : titles) {
        const auto found = std::find_if(next, chapters.end(), [&](const Chapter& chapter) {
            return chapter.title == ToUtf8(each.last, "");
        });
        if (found != chapters.end()) {
            found->title = ToUtf8(each.first, "");
            next = found + 1;
        }
    }
}

/// Gives attached files what is said of them, each to the first one of its name that has nothing yet.
void DescribeFiles(const std::vector<ContainerNotes::File>& files, std::vector<StreamInfo>& streams) {
    for (const ContainerNotes::File& file : files) {
        const auto stream = std::find_if(streams.begin(), streams.end(), [&](const StreamInfo& each) {
            return each.kind == StreamKind::kAttachment && each.title.empty() &&
                   each.fileName == ToUtf8(file.name, "");
        });
        if (stream != streams.end())
            stream->title = ToUtf8(file.description, "");
    }
}

/// Where the container tells more than FFmpeg reads.
void TakeNotes(const ContainerNotes& notes, SourceInfo& info) {
    for (std::size_t i = 0; i < info.streams.size(); ++i) {
        StreamInfo& stream = info.streams[i];
        const std::string& tag = notes.streams[i].languageTag;
        const std::string language = ThreeLetters(tag.substr(0, tag.find('-')));
        if (LanguageName(language) != language) // it is a known one
            stream.language = language != ThreeLetters(stream.language) ? language : stream.language;
        if (tag.find('-') != std::string::npos || language != ThreeLetters(stream.language))
            stream.languageTag = tag;
        if (stream.title.empty())
            stream.title = ToUtf8(notes.streams[i].title, "");
    }
    for (const Tag& tag : notes.repeated)
        ReplaceTag(info.tags, tag.key, tag.value);
    ReplaceTag(info.tags, "title", notes.title);
    DescribeFiles(notes.files, info.streams);
    PreferFirstTitles(notes.titles, info.chapters);
    info.furtherTitles = static_cast<int>(notes.titles.size());
    const int unread = std::max(notes.chapters - static_cast<int>(info.chapters.size()), 0);
    info.disorderedChapters = std::min(notes.disordered, unread);
    info.unreadChapters = unread - info.disorderedChapters;
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
        throw CropError(fmt::format("too little is left of the pictures of \"{}\", which are {}x{}",
                                    info_.path, pictures.width, pictures.height));
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

const AVStream* Source::PictureStream() const {
    return info_.pictures ? reader_.Context()->streams[info_.pictures->index] : nullptr;
}

const AVStream* Source::SoundStream() const {
    return info_.sound ? reader_.Context()->streams[info_.sound->index] : nullptr;
}

} // namespace movieconv
