#include "host/convert/SoundLoss.h"

#include "ffmpeg/Loudspeakers.h"
#include "host/convert/CarryPlan.h"
#include "host/convert/CodecPlan.h"
#include "host/convert/EncodePlan.h"
#include "host/sentence/Say.h"
#include "writer/WriterStatus.h"

#include <algorithm>
#include <array>
#include <utility>

namespace movieconv {
namespace {

/// "5.1", "stereo".
std::string LayoutName(uint64_t speakers) {
    AVChannelLayout layout{};
    std::array<char, 64> text{};
    av_channel_layout_from_mask(&layout, speakers);
    av_channel_layout_describe(&layout, text.data(), text.size());
    return text.data();
}

void TellLossOf(const SoundStreamInfo& sound, const SoundCoding& plan, EncodeParam param,
                std::vector<Sentence>& texts) {
    const int channels = plan.channels.value_or(sound.channels);
    const int rate = plan.sampleRate.value_or(sound.sampleRate);
    param.nChannels = channels;
    param.nSampleRate = rate;
    param.nBitsPerSample = sound.bitsPerSample;
    const AudioFormat format{sound.sampleRate, sound.channels, sound.bitsPerSample, 0, sound.duration};
    WriterSound written{};
    written.nChannelMask = sound.speakers;
    if (MWPlanSound(&param, &format, &written) == 0)
        return;
    const uint64_t asked = av::SpeakersFor(channels, sound.speakers);
    if (asked == 0 && written.nChannels < channels)
        texts.push_back(Say("its sound of {} channels got {}", channels, written.nChannels));
    if ((av::AlikeSpeakers(asked) & ~av::AlikeSpeakers(written.nChannelMask)) != 0)
        texts.push_back(Say("its {} sound became {}", LayoutName(asked), LayoutName(written.nChannelMask)));
    if (written.nSampleRate < rate)
        texts.push_back(Say("its sound of {} Hz got {}", rate, written.nSampleRate));
}

} // namespace

std::vector<Sentence> TellSoundLoss(const SourceInfo& source, const Request& request,
                                    const EncodeParam& param) {
    std::vector<Sentence> texts;
    if (!source.sound || request.copySound || param.bNoAudio != 0)
        return texts;
    const FileFormatInfo& format = ChooseFormat(request);
    const auto tell = [&](const SoundStreamInfo& sound) {
        TellLossOf(sound, PlanSound(request, format, sound), param, texts);
    };
    tell(*source.sound);
    for (const int stream : CarryPlan(source, request, format).FurtherSound())
        tell(*source.streams[static_cast<std::size_t>(stream)].sound);
    std::sort(texts.begin(), texts.end());
    texts.erase(std::unique(texts.begin(), texts.end()), texts.end());
    return texts;
}

} // namespace movieconv
