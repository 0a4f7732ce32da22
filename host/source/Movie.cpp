#include "host/source/Movie.h"

#include "host/source/MediaTime.h"

#include <fmt/format.h>

namespace movieconv {

Movie::Movie(const std::string& path, SourceChoice choice) : source_(path, choice), demuxer_(source_) {
    if (source_.PictureStream() != nullptr)
        pictures_ = std::make_unique<PictureDecoder>(source_, demuxer_);
    if (source_.SoundStream() != nullptr)
        sound_ = std::make_unique<SoundDecoder>(source_, demuxer_);
}

void Movie::EndPicturesAt(double seconds) {
    if (pictures_)
        pictures_->EndAt(seconds);
}

void Movie::Stop() {
    demuxer_.Stop();
    if (pictures_)
        pictures_->Stop();
    if (sound_)
        sound_->Stop();
}

std::optional<Shortfall> Movie::Missing() const {
    const auto reached = [&](const AVStream* stream) {
        return ToSeconds(demuxer_.EndOf(stream->index).value_or(0));
    };
    Reached ends;
    if (pictures_ && pictures_->RanDry())
        ends.pictures = reached(source_.PictureStream());
    if (sound_ && sound_->RanDry())
        ends.sound = reached(source_.SoundStream());
    return FindShortfall(Info().promise, ends);
}

std::vector<std::string> Movie::Complaints() const {
    std::vector<std::string> texts;
    if (const int jumps = demuxer_.ClockJumps(); jumps > 0) {
        texts.push_back(fmt::format("the source's clock jumped {}; the parts were joined",
                                    jumps == 1 ? "once" : fmt::format("{} times", jumps)));
    }
    if (pictures_ && pictures_->Damaged() > 0)
        texts.push_back(fmt::format("{} damaged pieces of picture data were skipped", pictures_->Damaged()));
    if (pictures_ && pictures_->Repaired() > 0) {
        texts.push_back(
            fmt::format("{} pictures had a missing or falling time stamp", pictures_->Repaired()));
    }
    if (sound_ && sound_->Damaged() > 0)
        texts.push_back(fmt::format("{} damaged pieces of sound data were skipped", sound_->Damaged()));
    if (sound_ && sound_->Corrections() > 0) {
        texts.push_back(
            fmt::format("the sound had {} gaps or overlaps, which were closed", sound_->Corrections()));
    }
    return texts;
}

} // namespace movieconv
