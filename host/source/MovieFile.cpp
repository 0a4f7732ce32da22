#include "host/source/MovieFile.h"

#include "host/sentence/Say.h"
#include "host/source/ConcatScript.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <new>
#include <system_error>

extern "C" {
#include <libavutil/avstring.h>
}

namespace movieconv {
namespace {

constexpr char kPlaylists[] = "hls,dash,concat,imf,sdp,vobsub"; // name other files
constexpr char kFollowed[] = "hls,concat"; // let each of them be looked at before it is opened
// What a playlist may name: containers and bare streams of pictures and sound, nothing that turns a text into
// pictures, and no further playlist.
constexpr char kParts[] = "aac,ac3,aiff,asf,avi,caf,dts,dv,eac3,flac,flv,h264,hevc,ivf,m4v,matroska,mov,mp3,"
                          "mpeg,mpegts,mpegvideo,mxf,nut,obu,ogg,truehd,vc1,w64,wav";

bool IsOneOf(const AVInputFormat& format, const char* names) {
    return av_match_name(format.name, names) != 0 || av_match_list(format.name, names, ',') > 0;
}

int WasInterrupted(void* interruption) {
    return static_cast<const Interruption*>(interruption)->Interrupted() ? 1 : 0;
}

Sentence CannotOpen(const std::string& path, const Sentence& reason) {
    return Say("cannot open \"{}\": {}", path, reason);
}

/// Whether reading its head led so far beyond its first samples that nothing leads back to them.
bool SamplesArePassed(const AVFormatContext& context) {
    if (context.pb == nullptr || (context.pb->seekable & AVIO_SEEKABLE_NORMAL) != 0 ||
        av_match_name("mov", context.iformat->name) == 0)
        return false;
    return std::any_of(context.streams, context.streams + context.nb_streams, [&](AVStream* stream) {
        const AVIndexEntry* first = avformat_index_get_entry(stream, 0);
        return first != nullptr && first->pos < avio_tell(context.pb) &&
               avio_seek(context.pb, first->pos, SEEK_SET) < 0;
    });
}

/// For want of memory too: how much is asked for is written in the file.
Sentence ReasonOf(int error) {
    if (error == AVERROR_INVALIDDATA)
        return Say("it is not a movie, or its index is missing because it was never finished");
    return error == AVERROR(ENOMEM) ? Say("it asks for more memory than there is")
                                    : Sentence(av::ErrorText(error));
}

} // namespace

MovieFile::MovieFile(const std::string& path, bool playlists, Growth growth,
                     const std::shared_ptr<const Interruption>& interruption) try
    : path_(path), companions_(path, playlists, interruption), bytes_(path, growth, interruption) {
    // The prefix keeps a colon in the name from being read as a protocol.
    const std::string url = "file:" + path;
    Open(url, Recognise(url, playlists));
} catch (const std::system_error& error) {
    throw SourceError(CannotOpen(path, error.code().message()));
}

bool MovieFile::IsPlaylist() const {
    return IsOneOf(*input_->iformat, kPlaylists);
}

/// The format by what the file holds, and whether it is one that may be read.
const AVInputFormat& MovieFile::Recognise(const std::string& url, bool playlists) {
    const AVInputFormat* format = nullptr;
    const int result = av_probe_input_buffer2(bytes_.Io(), &format, url.c_str(), nullptr, 0, 0);
    av::CheckMemory(result);
    if (result < 0)
        throw SourceError(CannotOpen(path_, ReasonOf(result)));
    if (av_match_name("tty", format->name) != 0) // which draws letters as pictures
        throw SourceError(CannotOpen(path_, Say("it is a text, not a movie")));
    if (IsOneOf(*format, kPlaylists)) {
        if (!IsOneOf(*format, kFollowed))
            throw SourceError(CannotOpen(path_, Say("it is not a movie, but says where to find one")));
        if (!playlists)
            throw PlaylistError(CannotOpen(path_, Say("it is a playlist, which names other files")));
    }
    return *format;
}

void MovieFile::Open(const std::string& url, const AVInputFormat& format) {
    int result = TryToOpen(url, format, false);
    if (result >= 0 && MayHoldMore() && avio_seek(bytes_.Io(), 0, SEEK_SET) == 0)
        result = TryToOpen(url, format, true);
    companions_.AllowRepetition();
    if (!companions_.Refusal().IsEmpty())
        throw SourceError(CannotOpen(path_, companions_.Refusal()));
    if (result < 0 && !input_)
        throw SourceError(CannotOpen(path_, ReasonOf(result)));
    if (result < 0)
        throw SourceError(Say("cannot read the streams of \"{}\": {}", path_, ReasonOf(result)));
}

/// `patiently`: also when a stream begins late. An AVERROR below 0; without an input when it cannot be
/// opened.
int MovieFile::TryToOpen(const std::string& url, const AVInputFormat& format, bool patiently) {
    constexpr int64_t kPatientBytes = 64 << 20;
    constexpr int64_t kPatientTime = int64_t{120} * AV_TIME_BASE;
    input_.reset();
    av::Options settings;
    settings.Set("pattern_type", "none"); // "%d" in a name is no pattern
    settings.AllowNoProtocol();
    if (IsOneOf(format, kPlaylists))
        settings.Set("format_whitelist", (std::string(kParts) + "," + format.name).c_str());
    if (av_match_name("concat", format.name) != 0) { // the one that opens files without asking
        CheckConcatScript(bytes_, path_, companions_, kParts);
        settings.Set("protocol_whitelist", "file");
        settings.Set("safe", "0");
    }
    AVFormatContext* context = avformat_alloc_context();
    if (context == nullptr)
        throw std::bad_alloc();
    context->pb = bytes_.Io();
    context->interrupt_callback = {WasInterrupted, const_cast<Interruption*>(&bytes_.Interrupter())};
    if (patiently) {
        context->probesize = kPatientBytes;
        context->max_analyze_duration = kPatientTime;
    }
    companions_.Guard(*context);
    const int result = avformat_open_input(&context, url.c_str(), &format, settings.Get());
    input_.reset(context);
    if (result >= 0 && SamplesArePassed(*context))
        throw SourceError(CannotOpen(path_, Say("its index is at its end, and a pipe cannot be sought")));
    return result < 0 ? result : avformat_find_stream_info(context, nullptr);
}

/// Whether pictures or sound are announced, or can still come, of which nothing was found yet.
bool MovieFile::MayHoldMore() const {
    if (bytes_.Size() == 0 || IsPlaylist())
        return false;
    bool pictures = false;
    bool sound = false;
    bool unknown = false;
    for (unsigned i = 0; i < input_->nb_streams; ++i) {
        const AVCodecParameters& parameters = *input_->streams[i]->codecpar;
        const bool arePictures = parameters.codec_type == AVMEDIA_TYPE_VIDEO;
        const bool isSound = parameters.codec_type == AVMEDIA_TYPE_AUDIO;
        pictures = pictures || arePictures;
        sound = sound || isSound;
        unknown =
            unknown || ((arePictures ? parameters.width == 0 : isSound && parameters.sample_rate == 0) &&
                        avcodec_find_decoder(parameters.codec_id) != nullptr);
    }
    const bool canCome = (input_->ctx_flags & AVFMTCTX_NOHEADER) != 0 && !(pictures && sound);
    return unknown || canCome;
}

} // namespace movieconv
