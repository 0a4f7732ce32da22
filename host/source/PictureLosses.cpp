#include "host/source/PictureLosses.h"

#include "host/sentence/Say.h"

namespace movieconv {
namespace {

constexpr int kMostDepth = 10; // of what is handed out

void AddLossesOfLight(const PictureStreamInfo& pictures, const SourceChoice& choice,
                      std::vector<Sentence>& texts) {
    if (IsHdr(pictures) && !choice.keepHdr)
        texts.push_back(Say("its HDR pictures were brought to the light and colours of BT.709"));
    else if (pictures.depth > 8 && !choice.deep)
        texts.push_back(Say("its pictures of {} bits got 8", pictures.depth));
    else if (pictures.depth > kMostDepth)
        texts.push_back(Say("its pictures of {} bits got 10", pictures.depth));
    if (pictures.dolbyVisionAlone)
        texts.push_back(Say("its colours are made for Dolby Vision alone, and are wrong without it"));
    else if (pictures.dolbyVision)
        texts.push_back(Say("what Dolby Vision adds to its pictures was left out"));
}

} // namespace

std::vector<Sentence> PictureLosses(const PictureStreamInfo& pictures, const SourceChoice& choice,
                                    const PictureDecoder& decoder) {
    std::vector<Sentence> texts;
    if (decoder.Deinterlaced())
        texts.push_back(Say("interlaced pictures were made progressive"));
    if (decoder.LeftInterlaced())
        texts.push_back(Say("interlaced pictures stayed as they are, in files that do not tell it"));
    AddLossesOfLight(pictures, choice, texts);
    if (decoder.Narrowed())
        texts.push_back(Say("its pictures of full range got the usual one, which has fewer levels"));
    if (!pictures.fineColours.empty())
        texts.push_back(
            Say("its {} pictures keep their colours at half the resolution (4:2:0)", pictures.fineColours));
    if (pictures.transparent)
        texts.push_back(Say("the transparency of its pictures was left out"));
    const PictureNotes& notes = decoder.Notes();
    const int width = pictures.width + pictures.crop.left + pictures.crop.right;
    const int height = pictures.height + pictures.crop.top + pictures.crop.bottom;
    if (int64_t{notes.Width()} * notes.Height() > int64_t{width} * height)
        texts.push_back(Say("some of its pictures have {}x{} and were fitted into those of {}x{}",
                            notes.Width(), notes.Height(), pictures.width, pictures.height));
    if (notes.Captioned())
        texts.push_back(Say("its closed captions were left out"));
    if (pictures.stereoscopic || notes.Stereoscopic())
        texts.push_back(Say("pictures for both eyes stayed as they are, in files that do not tell it"));
    if (pictures.spherical)
        texts.push_back(Say("spherical pictures stayed as they are, in files that do not tell it"));
    return texts;
}

} // namespace movieconv
