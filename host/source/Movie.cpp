#include "host/source/Movie.h"

#include "host/sentence/Say.h"
#include "host/source/MediaTime.h"
#include "host/source/PictureLosses.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <limits>
#include <utility>

namespace movieconv {
namespace {

std::unique_ptr<SubtitleBurner> MakeBurner(const Source& source, const SourceChoice& choice) {
    if (!choice.burn)
        return nullptr;
    if (source.PictureStream() == nullptr)
        throw TrackError(Say("there are no pictures to draw subtitles into"));
    return std::make_unique<SubtitleBurner>(source, choice);
}

Sentence TellLate(const LateStreams::Left& left) {
    const double length = ToSeconds(left.end - left.begin);
    const double begin = ToSeconds(left.begin);
    return left.kind == StreamKind::kPictures
               ? Say("pictures of {:.0f} s, which the source announces only at {:.0f} s, were left out",
                     length, begin)
               : Say("sound of {:.0f} s, which the source announces only at {:.0f} s, was left out", length,
                     begin);
}

Sentence TellJumps(int jumps) {
    return SayCounted(jumps, Say("the source's clock jumped once; the parts were joined"),
                      Say("the source's clock jumped {} times; the parts were joined", jumps));
}

Sentence TellDamaged(const PictureDecoder& pictures) {
    const int64_t damaged = pictures.Damaged();
    return SayCounted(damaged, Say("1 damaged piece of picture data was skipped"),
                      Say("{} damaged pieces of picture data were skipped", damaged));
}

Sentence TellRepaired(const PictureDecoder& pictures) {
    const int64_t repaired = pictures.Repaired();
    return SayCounted(repaired, Say("1 picture had a missing or falling time stamp"),
                      Say("{} pictures had a missing or falling time stamp", repaired));
}

Sentence TellDamaged(const SoundDecoder& sound) {
    const int64_t damaged = sound.Damaged();
    return SayCounted(damaged, Say("1 damaged piece of sound data was skipped"),
                      Say("{} damaged pieces of sound data were skipped", damaged));
}

Sentence TellClosed(const SoundDecoder& sound) {
    const int64_t closed = sound.Corrections();
    return SayCounted(closed, Say("the sound had 1 gap or overlap, which was closed"),
                      Say("the sound had {} gaps or overlaps, which were closed", closed));
}

} // namespace

Movie::Movie(const std::string& path, const SourceChoice& choice, std::shared_ptr<Interruption> interruption)
    : choice_(choice),
      source_(path, choice, std::move(interruption)),
      burner_(MakeBurner(source_, choice)),
      failures_([this] { demuxer_.Stop(); }),
      demuxer_(source_, failures_),
      beside_(source_, choice_, demuxer_, failures_) {
    if (choice.fromStart)
        demuxer_.StayAtStart();
    if (source_.PictureStream() != nullptr && choice.stampsOnly)
        stamps_ = std::make_unique<PictureStamps>(source_, demuxer_, burner_.get());
    else if (source_.PictureStream() != nullptr)
        pictures_ = std::make_unique<PictureDecoder>(source_, demuxer_, failures_, choice, burner_.get());
    if (source_.SoundStream() != nullptr)
        sound_ = std::make_unique<SoundDecoder>(source_, demuxer_, failures_);
}

void Movie::EndPicturesAt(double seconds) {
    end_ = seconds;
    if (pictures_)
        pictures_->EndAt(seconds);
    if (stamps_)
        stamps_->EndAt(seconds);
}

void Movie::EndAt(double seconds) {
    EndPicturesAt(seconds);
    if (sound_)
        sound_->EndAt(seconds);
}

void Movie::Stop() {
    beside_.Stop();
    // Before the demuxer, lest a decoder take the stop for the source's end and hand on what belongs there;
    // the sound first, which goes on where pictures end.
    if (sound_)
        sound_->Stop();
    if (pictures_)
        pictures_->Stop();
    demuxer_.Stop();
}

std::optional<Shortfall> Movie::Missing() const {
    const auto reached = [&](int stream) { return ToSeconds(demuxer_.EndOf(stream).value_or(0)); };
    Reached ends;
    if ((pictures_ && pictures_->RanDry()) || (stamps_ && stamps_->RanDry()))
        ends.pictures = reached(Info().pictures->index);
    if (sound_ && sound_->RanDry())
        ends.sound = reached(Info().sound->index);
    std::optional<Shortfall> found = FindShortfall(Info().promise, ends);
    if (found && !found->cutOff)
        found = FindShortfall(ShownByStructure(), ends);
    if (!found)
        found = LateShortfall(ends);
    return found ? found : Undecoded();
}

/// What the source promises, of which the length that a last picture is said to stay is not to be found in
/// it.
Promise Movie::ShownByStructure() const {
    Promise promise = Info().promise;
    const std::vector<std::optional<double>> last = source_.Reader().File().LastPackets();
    const auto begin = [&](const auto& stream) -> std::optional<double> {
        const std::optional<double> shown =
            stream ? last[static_cast<std::size_t>(stream->index)] : std::nullopt;
        return shown ? std::optional(*shown - ToSeconds(source_.Reader().Start())) : std::nullopt;
    };
    const std::optional<double> pictures = begin(Info().pictures);
    const std::optional<double> sound = begin(Info().sound);
    if (promise.pictures && pictures)
        promise.pictures = std::min(*promise.pictures, *pictures);
    if (promise.sound && sound)
        promise.sound = std::min(*promise.sound, *sound);
    if (promise.all && (pictures || sound))
        promise.all = std::min(*promise.all, *std::max(pictures, sound));
    return promise;
}

/// What goes on only in streams that are not converted, since they came up late.
std::optional<Shortfall> Movie::LateShortfall(const Reached& ends) const {
    std::optional<Shortfall> found;
    for (const LateStreams::Left& left : demuxer_.LeftOut()) {
        Promise promise;
        (left.kind == StreamKind::kPictures ? promise.pictures : promise.sound) = ToSeconds(left.end);
        found = found ? found : FindShortfall(promise, ends);
    }
    return found;
}

/// What was read of a damaged stream but gave nothing up to its end, or to where it was to end. What is
/// copied is as its source.
std::optional<Shortfall> Movie::Undecoded() const {
    const double wanted = end_.value_or(std::numeric_limits<double>::max());
    const auto compare = [&](const auto& decoder, int stream) {
        std::optional<Shortfall> found;
        if (decoder->RanDry() && decoder->Damaged() > 0)
            found = FindShortfall(
                {false, std::min(ToSeconds(demuxer_.EndOf(stream).value_or(0)), wanted), {}, {}},
                {ToSeconds(decoder->DecodedTo()), {}});
        if (found)
            found->undecodable = Info().streams[static_cast<std::size_t>(stream)].kind;
        return found;
    };
    std::optional<Shortfall> found;
    if (pictures_)
        found = compare(pictures_, Info().pictures->index);
    if (!found && pictures_ && pictures_->RanDry() && LastPicture() == nullptr) // however short they are
        found = Shortfall{false, StreamKind::kPictures, 0, 0};
    if (!found && sound_ && !beside_.Copies(Info().sound->index))
        found = compare(sound_, Info().sound->index);
    return found;
}

std::vector<Sentence> Movie::Losses() const {
    return pictures_ ? PictureLosses(*Info().pictures, choice_, *pictures_) : std::vector<Sentence>();
}

std::vector<Sentence> Movie::Complaints() const {
    std::vector<Sentence> texts;
    for (const LateStreams::Left& left : demuxer_.LeftOut())
        AddTold(texts, TellLate(left));
    AddTold(texts, TellJumps(demuxer_.ClockJumps()));
    if (pictures_) {
        AddTold(texts, TellDamaged(*pictures_));
        AddTold(texts, TellRepaired(*pictures_));
    }
    if (sound_) {
        AddTold(texts, TellDamaged(*sound_));
        AddTold(texts, TellClosed(*sound_));
    }
    if (sound_ && !beside_.Copies(Info().sound->index) && sound_->Channels() > Info().sound->channels)
        AddTold(texts, Say("some of its sound has {} channels and got {}", sound_->Channels(),
                           Info().sound->channels));
    for (Sentence& text : beside_.Complaints())
        AddTold(texts, std::move(text));
    if (burner_ && std::find(texts.begin(), texts.end(), burner_->Unread()) == texts.end())
        AddTold(texts, burner_->Unread());
    return texts;
}

} // namespace movieconv
