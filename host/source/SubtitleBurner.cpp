#include "host/source/SubtitleBurner.h"

#include "host/source/ColourMatrix.h"

#include <algorithm>
#include <utility>

namespace movieconv {
namespace {

OverlayColours ColoursFor(const PictureStreamInfo& pictures, bool keepsHdr) {
    // The signals of the light of a white page, 203 cd/m2.
    constexpr double kWhiteOfPerceptualQuantizer = 0.58;
    constexpr double kWhiteOfHybridLogGamma = 0.75;
    OverlayColours colours{HandedOutMatrix(pictures, keepsHdr), 1};
    if (IsHdr(pictures) && keepsHdr)
        colours.white = pictures.colorTransfer == kPerceptualQuantizer ? kWhiteOfPerceptualQuantizer
                                                                       : kWhiteOfHybridLogGamma;
    return colours;
}

bool EndsWith(const std::string& name, const std::string& end) {
    return name.size() >= end.size() && name.compare(name.size() - end.size(), end.size(), end) == 0;
}

std::vector<FontFile> FontsOf(const Source& source) {
    std::vector<FontFile> fonts;
    for (const StreamInfo& stream : source.Info().streams) {
        std::string name = stream.fileName;
        std::transform(name.begin(), name.end(), name.begin(), [](char letter) {
            return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter - 'A' + 'a') : letter;
        });
        const bool isFont = stream.mimeType.find("font") != std::string::npos ||
                            stream.mimeType.find("truetype") != std::string::npos ||
                            stream.mimeType.find("opentype") != std::string::npos || EndsWith(name, ".ttf") ||
                            EndsWith(name, ".otf") || EndsWith(name, ".ttc");
        if (stream.kind == StreamKind::kAttachment && isFont)
            fonts.push_back(source.StoredFile(stream.index));
    }
    return fonts;
}

} // namespace

SubtitleBurner::SubtitleBurner(const Source& source, const SourceChoice& choice)
    : colours_(ColoursFor(*source.Info().pictures, choice.keepHdr)) {
    CueList list = ReadCues(source, *choice.burn, choice.playlists);
    spans_ = list.Spans();
    unread_ = list.unread;
    const PictureStreamInfo& pictures = *source.Info().pictures;
    if (list.IsText())
        drawer_ = MakeTextDrawer(std::move(list), pictures, FontsOf(source));
    else
        drawer_ = MakeBitmapDrawer(std::move(list), pictures);
}

int64_t SubtitleBurner::ShownSince(int64_t time) const {
    const auto found = std::find_if(spans_.begin(), spans_.end(), [time](const CueList::Span& span) {
        return span.begin >= time || span.end > time;
    });
    return found != spans_.end() ? std::min(found->begin, time) : time;
}

void SubtitleBurner::Draw(AVFrame& picture, int64_t time) {
    const bool deep = picture.format == AV_PIX_FMT_YUV420P10;
    if (drawer_->Changes(time))
        overlay_ = Overlay(drawer_->Draw(time), colours_, deep);
    if (overlay_.Empty())
        return;
    av::CheckMemory(av_frame_make_writable(&picture));
    overlay_.DrawInto(picture);
}

} // namespace movieconv
