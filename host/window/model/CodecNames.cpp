#include "host/window/model/CodecNames.h"

#include <QCoreApplication>

#include <algorithm>
#include <array>

namespace movieconv::window {
namespace {

struct Codecs {
    Q_DECLARE_TR_FUNCTIONS(Codecs)
};

struct Name {
    const char* code;
    const char* name;
};

// Names of their own, which are the same in every language.
constexpr std::array kNames = {Name{"aac", "AAC"},
                               Name{"ac3", "AC-3 (Dolby Digital)"},
                               Name{"alac", "ALAC"},
                               Name{"amr_nb", "AMR"},
                               Name{"amr_wb", "AMR-WB"},
                               Name{"ape", "Monkey’s Audio"},
                               Name{"ass", "ASS"},
                               Name{"av1", "AV1"},
                               Name{"cavs", "AVS"},
                               Name{"cinepak", "Cinepak"},
                               Name{"cook", "RealAudio"},
                               Name{"dnxhd", "DNxHD"},
                               Name{"dts", "DTS"},
                               Name{"dvb_subtitle", "DVB"},
                               Name{"dvb_teletext", "Teletext"},
                               Name{"dvd_subtitle", "DVD"},
                               Name{"dvvideo", "DV"},
                               Name{"eac3", "E-AC-3 (Dolby Digital Plus)"},
                               Name{"eia_608", "CEA-608"},
                               Name{"ffv1", "FFV1"},
                               Name{"flac", "FLAC"},
                               Name{"flv1", "Sorenson Spark"},
                               Name{"gif", "GIF"},
                               Name{"h263", "H.263"},
                               Name{"h264", "H.264"},
                               Name{"hdmv_pgs_subtitle", "Blu-ray (PGS)"},
                               Name{"hevc", "HEVC"},
                               Name{"huffyuv", "HuffYUV"},
                               Name{"mjpeg", "Motion JPEG"},
                               Name{"mlp", "MLP"},
                               Name{"mp1", "MP1"},
                               Name{"mp2", "MP2"},
                               Name{"mp3", "MP3"},
                               Name{"mpeg1video", "MPEG-1"},
                               Name{"mpeg2video", "MPEG-2"},
                               Name{"mpeg4", "MPEG-4"},
                               Name{"msmpeg4v3", "MS MPEG-4"},
                               Name{"opus", "Opus"},
                               Name{"otf", "OpenType"},
                               Name{"png", "PNG"},
                               Name{"prores", "ProRes"},
                               Name{"rv30", "RealVideo"},
                               Name{"rv40", "RealVideo"},
                               Name{"ssa", "SSA"},
                               Name{"subrip", "SRT"},
                               Name{"theora", "Theora"},
                               Name{"truehd", "TrueHD"},
                               Name{"ttf", "TrueType"},
                               Name{"utvideo", "Ut Video"},
                               Name{"vc1", "VC-1"},
                               Name{"vorbis", "Vorbis"},
                               Name{"vp6", "VP6"},
                               Name{"vp6f", "VP6"},
                               Name{"vp8", "VP8"},
                               Name{"vp9", "VP9"},
                               Name{"wavpack", "WavPack"},
                               Name{"webvtt", "WebVTT"},
                               Name{"wmapro", "WMA Pro"},
                               Name{"wmav1", "WMA"},
                               Name{"wmav2", "WMA"},
                               Name{"wmv1", "WMV 7"},
                               Name{"wmv2", "WMV 8"},
                               Name{"wmv3", "WMV 9"}};

// Names that are words.
constexpr std::array kWords = {Name{"mov_text", QT_TRANSLATE_NOOP("Codecs", "timed text")},
                               Name{"text", QT_TRANSLATE_NOOP("Codecs", "plain text")},
                               Name{"rawvideo", QT_TRANSLATE_NOOP("Codecs", "uncompressed")}};

const char* Find(const auto& names, const QString& code) {
    const auto found = std::find_if(names.begin(), names.end(),
                                    [&](const Name& one) { return code == QLatin1String(one.code); });
    return found == names.end() ? nullptr : found->name;
}

} // namespace

QString CodecName(const QString& code) {
    if (code.startsWith(QLatin1String("pcm_")))
        return QStringLiteral("PCM");
    if (const char* name = Find(kNames, code))
        return QString::fromUtf8(name);
    if (const char* word = Find(kWords, code))
        return Codecs::tr(word);
    return code;
}

QString ChannelsName(const QString& layout) {
    const QString plain = layout.section(QLatin1Char('('), 0, 0).trimmed();
    return plain == QLatin1String("mono")     ? Codecs::tr("mono")
           : plain == QLatin1String("stereo") ? Codecs::tr("stereo")
           : plain.isEmpty()                  ? layout
                                              : plain;
}

} // namespace movieconv::window
