#include "host/window/runner/SourceFacts.h"

#include "host/window/model/CodecNames.h"
#include "host/window/model/Entry.h"

#include <utility>

namespace movieconv::window {
namespace {

struct SourceKnowledge : OwnKnowledge {
    explicit SourceKnowledge(SourceInfo source) : info(std::move(source)) {}
    const SourceInfo info;
};

TrackFacts TrackOf(const StreamInfo& stream) {
    TrackFacts track;
    track.number = stream.index;
    track.language = QString::fromStdString(stream.language);
    track.title = Shown(stream.title);
    track.details = CodecName(QString::fromStdString(stream.codec));
    if (stream.sound && !stream.sound->layout.empty())
        track.details += QStringLiteral(", ") + ChannelsName(QString::fromStdString(stream.sound->layout));
    track.bitRate = stream.bitRate;
    return track;
}

/// The value of a text of the movie's; empty when there is none.
QString TextOf(const SourceInfo& info, const char* key) {
    for (const Tag& tag : info.tags)
        if (tag.key == key)
            return QString::fromStdString(tag.value);
    return {};
}

void AddPictures(MovieFacts& facts, const PictureStreamInfo& pictures) {
    facts.width = pictures.width;
    facts.height = pictures.height;
    facts.rate = pictures.frameRate;
    facts.pictureCodec = CodecName(QString::fromStdString(pictures.codec));
    facts.interlaced = pictures.interlaced;
    facts.hdr = IsHdr(pictures);
    facts.depth = pictures.depth;
}

} // namespace

MovieFacts FactsOf(SourceInfo info) {
    MovieFacts facts;
    facts.seconds = info.duration;
    facts.lengthKnown = info.certainty != Certainty::kGuessed;
    facts.bytes = info.bytes;
    facts.title = TextOf(info, "title");
    if (info.pictures)
        AddPictures(facts, *info.pictures);
    for (const StreamInfo& stream : info.streams) {
        if (stream.kind == StreamKind::kSound)
            facts.sounds.push_back(TrackOf(stream));
        else if (stream.kind == StreamKind::kSubtitles)
            facts.subtitles.push_back(TrackOf(stream));
    }
    facts.chapters = static_cast<int>(info.chapters.size());
    facts.own = std::make_shared<SourceKnowledge>(std::move(info));
    return facts;
}

const SourceInfo* InfoBehind(const MovieFacts& facts) {
    const auto* known = dynamic_cast<const SourceKnowledge*>(facts.own.get());
    return known == nullptr ? nullptr : &known->info;
}

} // namespace movieconv::window
