// The functions of the status header that tell of formats and codecs: no exception leaves them.
#include "writer/FormatTable.h"
#include "writer/Guarded.h"
#include "writer/WriterStatus.h"

#include <cstddef>

uint32_t MWGetFormatTraits(uint32_t format) {
    return writer::Guarded<uint32_t>(0, [&] { return writer::FormatTraits(format); });
}

uint32_t MWFindCodec(uint32_t format, uint32_t code, int forSound) {
    const writer::Container* container = writer::FindContainer(format);
    if (container == nullptr)
        return 0;
    if (forSound != 0) {
        const writer::SoundCodec* codec = writer::FindSoundCodec(*container, code);
        return codec != nullptr && writer::FindEncoder(*codec, 16) != nullptr ? codec->code : 0;
    }
    const writer::PictureCodec* codec = writer::FindPictureCodec(*container, code);
    return codec != nullptr && writer::FindEncoder(*codec) != nullptr ? codec->code : 0;
}

int MWGetQualityScale(uint32_t code, double* best, double* worst) {
    const writer::PictureCodec* codec = writer::FindPictureCodec(code);
    if (codec == nullptr || codec->quality.kind == writer::QualityKind::kNone || best == nullptr ||
        worst == nullptr)
        return 0;
    *best = codec->quality.best;
    *worst = codec->quality.worst;
    return 1;
}

int MWGetPictureDepth(uint32_t code) {
    const writer::PictureCodec* codec = writer::FindPictureCodec(code);
    return codec == nullptr ? 0 : writer::TakesDeep(*codec) ? 10 : 8;
}

int MWPicturesAhead(uint32_t codec, int speed) {
    return writer::Guarded(0, [&] {
        const writer::PictureCodec* found = writer::FindPictureCodec(codec);
        const int place = (speed != 0 ? speed : writer::kUsualSpeed) - 1;
        return found == nullptr || place < 0 || place >= static_cast<int>(found->looksAhead.size())
                   ? 0
                   : found->looksAhead.at(static_cast<std::size_t>(place));
    });
}

int MWCarriesTag(uint32_t format, const char* key, const char* value) {
    return writer::Guarded(0, [&] {
        const writer::Container* container = writer::FindContainer(format);
        const bool isTold = key != nullptr && value != nullptr;
        return container != nullptr && isTold && writer::CarriesTag(*container, key, value) ? 1 : 0;
    });
}

int MWCarriesTrackTag(uint32_t format, const char* key, const char* value) {
    return writer::Guarded(0, [&] {
        const writer::Container* container = writer::FindContainer(format);
        const bool isTold = key != nullptr && value != nullptr;
        return container != nullptr && isTold && writer::CarriesTrackTag(*container, key, value) ? 1 : 0;
    });
}

int MWCarriedTrackFlags(uint32_t format) {
    const writer::Container* container = writer::FindContainer(format);
    return container != nullptr ? container->trackFlags : 0;
}

int MWCarriesPackets(uint32_t format, const char* codec) {
    return writer::Guarded(0, [&] {
        const writer::Container* container = writer::FindContainer(format);
        const AVCodecDescriptor* known = codec != nullptr ? avcodec_descriptor_get_by_name(codec) : nullptr;
        return container != nullptr && known != nullptr &&
                       writer::PacketForm(*container, known->id) != AV_CODEC_ID_NONE
                   ? 1
                   : 0;
    });
}
