#include "host/source/LateStreams.h"

#include <algorithm>

namespace movieconv {
namespace {

/// The programme's streams of the kind that `stream` is, in its order.
std::vector<int> StreamsLike(const AVFormatContext& context, const AVProgram& program, int stream) {
    const AVMediaType kind = context.streams[stream]->codecpar->codec_type;
    std::vector<int> streams;
    for (unsigned i = 0; i < program.nb_stream_indexes; ++i)
        if (context.streams[program.stream_index[i]]->codecpar->codec_type == kind)
            streams.push_back(static_cast<int>(program.stream_index[i]));
    return streams;
}

/// Which layer it has is known only from the packets.
bool IsMpegSound(AVCodecID codec) {
    return codec == AV_CODEC_ID_MP1 || codec == AV_CODEC_ID_MP2 || codec == AV_CODEC_ID_MP3;
}

} // namespace

void LateStreams::See(const AVFormatContext& context, int stream) {
    for (unsigned i = 0; i < context.nb_programs; ++i) {
        const std::vector<int> all = StreamsLike(context, *context.programs[i], stream);
        const auto found = std::find(all.begin(), all.end(), stream);
        if (found != all.end())
            places_[stream] = {context.programs[i]->id, static_cast<std::size_t>(found - all.begin())};
    }
}

int LateStreams::Replaced(const AVFormatContext& context, int stream) const {
    const AVMediaType kind = context.streams[stream]->codecpar->codec_type;
    for (const auto& [taken, place] : places_) {
        for (unsigned i = 0; i < context.nb_programs; ++i) {
            const AVProgram& program = *context.programs[i];
            if (program.id != place.program || context.streams[taken]->codecpar->codec_type != kind)
                continue;
            const std::vector<int> now = StreamsLike(context, program, stream);
            const bool isGone = std::find(now.begin(), now.end(), taken) == now.end();
            if (isGone && place.position < now.size() && now[place.position] == stream)
                return taken;
        }
    }
    return -1;
}

/// Than all that are taken.
bool LateStreams::IsOfOtherProgramme(const AVFormatContext& context, int stream) const {
    bool isOfAny = false;
    for (unsigned i = 0; i < context.nb_programs; ++i) {
        const AVProgram& program = *context.programs[i];
        const std::vector<int> all = StreamsLike(context, program, stream);
        if (std::find(all.begin(), all.end(), stream) == all.end())
            continue;
        isOfAny = true;
        if (std::any_of(places_.begin(), places_.end(),
                        [&](const auto& taken) { return taken.second.program == program.id; }))
            return false;
    }
    return isOfAny;
}

void LateStreams::Leave(const AVFormatContext& context, int stream, bool replaces, int64_t begin,
                        int64_t end) {
    const AVMediaType kind = context.streams[stream]->codecpar->codec_type;
    if (kind != AVMEDIA_TYPE_VIDEO && kind != AVMEDIA_TYPE_AUDIO)
        return;
    const bool wasTold = stream < known_ && !replaces; // before the conversion
    if (wasTold || IsOfOtherProgramme(context, stream))
        return;
    const StreamKind told = kind == AVMEDIA_TYPE_VIDEO ? StreamKind::kPictures : StreamKind::kSound;
    Left& left = left_.try_emplace(stream, Left{told, begin, end}).first->second;
    left.begin = std::min(left.begin, begin);
    left.end = std::max(left.end, end);
}

std::vector<LateStreams::Left> LateStreams::AllLeft() const {
    std::vector<Left> all;
    for (const auto& [stream, left] : left_)
        all.push_back(left);
    return all;
}

bool AreAlike(const AVStream& one, const AVStream& other) {
    const AVCodecID codec = one.codecpar->codec_id;
    const bool sameCodec =
        codec == other.codecpar->codec_id || (IsMpegSound(codec) && IsMpegSound(other.codecpar->codec_id));
    return sameCodec && av_cmp_q(one.time_base, other.time_base) == 0;
}

} // namespace movieconv
