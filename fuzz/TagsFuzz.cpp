// Small files with texts, labels, chapters, covers, attached files and subtitles of all kinds: what the
// writer says is complete can be read, and holds no more than was given.
#include "ffmpeg/AvHandles.h"
#include "fuzz/Fuzz.h"
#include "media/FourCC.h"
#include "media/MediaWriter.h"
#include "tests/support/Folder.h"
#include "tests/writer/TestSource.h"
#include "text/Utf8.h"
#include "writer/WriterStatus.h"

#include <filesystem>
#include <string>
#include <vector>

namespace {

constexpr int64_t kSecond = 10'000'000;
constexpr int64_t kYear = 365 * 24 * 3600 * kSecond;

std::string Text(FuzzedDataProvider& input) {
    std::string text = input.ConsumeRandomLengthString(40);
    if (input.ConsumeIntegralInRange(0, 31) == 0)
        text.append(100000, 'x');
    return text;
}

std::string Key(FuzzedDataProvider& input) {
    if (input.ConsumeIntegralInRange(0, 3) == 0)
        return input.ConsumeRandomLengthString(12);
    return input.PickValueInArray({"title", "artist", "album", "date", "comment", "description", "genre",
                                   "creation_time", "location", "track", "disc", "language", "composer",
                                   "encoder", "COMMENT", "hd_video", "media_type"});
}

/// A time within some seconds, mostly.
int64_t Time(FuzzedDataProvider& input) {
    if (input.ConsumeIntegralInRange(0, 7) == 0)
        return input.ConsumeIntegralInRange(-kYear, kYear);
    return input.ConsumeIntegralInRange(-kSecond, 3 * kSecond);
}

/// Subtitles that come in any order, and with any times.
struct Cues {
    std::vector<std::pair<int64_t, int64_t>> times;
    std::vector<std::string> texts;
    std::size_t next = 0;
    av::Packet packet = av::NewPacket();

    static int Next(void* context, int64_t until, int closing, WriterTrackItem* item) {
        auto* self = static_cast<Cues*>(context);
        item->llTime = until;
        if (self->next >= self->texts.size() || (closing == 0 && self->times[self->next].first >= until))
            return 0;
        const std::string& text = self->texts[self->next];
        const auto [begin, duration] = self->times[self->next++];
        av_packet_unref(self->packet.get());
        FUZZ_CHECK(av_new_packet(self->packet.get(), static_cast<int>(text.size())) == 0);
        std::copy(text.begin(), text.end(), self->packet->data);
        *item = {nullptr, self->packet.get(), begin, duration};
        return 1;
    }
};

void AddSubtitles(FuzzedDataProvider& input, uint32_t set, Cues& cues) {
    for (int count = input.ConsumeIntegralInRange(0, 6); count > 0; --count) {
        cues.times.emplace_back(Time(input), input.ConsumeIntegralInRange<int64_t>(0, 2 * kSecond));
        cues.texts.push_back(Text(input));
    }
    const av::CodecParameters parameters = av::NewParameters();
    parameters->codec_type = AVMEDIA_TYPE_SUBTITLE;
    parameters->codec_id = input.PickValueInArray(
        {AV_CODEC_ID_SUBRIP, AV_CODEC_ID_WEBVTT, AV_CODEC_ID_TEXT, AV_CODEC_ID_DVB_SUBTITLE});
    WriterTrack track{};
    track.pParameters = parameters.get();
    track.pfnNext = Cues::Next;
    track.pContext = &cues;
    FUZZ_CHECK(MWAddTrack(set, &track) == 1);
    MWSetTrackTag(set, kWriterTrackFurther, "language", Text(input).c_str());
    MWSetTrackTag(set, kWriterTrackFurther, "title", Text(input).c_str());
    MWSetTrackFlags(set, kWriterTrackFurther, input.ConsumeIntegral<int>());
}

/// How many chapters make sense.
unsigned AddExtras(FuzzedDataProvider& input, uint32_t set) {
    for (int count = input.ConsumeIntegralInRange(0, 6); count > 0; --count) {
        const std::string key = Key(input);
        MWSetTag(set, key.c_str(), Text(input).c_str());
    }
    for (const int track : {kWriterTrackPictures, kWriterTrackSound}) {
        MWSetTrackTag(set, track, Key(input).c_str(), Text(input).c_str());
        MWSetTrackFlags(set, track, input.ConsumeIntegral<int>());
    }
    unsigned chapters = 0;
    for (int count = input.ConsumeIntegralInRange(0, 5); count > 0; --count) {
        const int64_t begin = Time(input);
        chapters += static_cast<unsigned>(MWAddChapter(set, begin, Time(input), Text(input).c_str()));
    }
    std::string cover = input.PickValueInArray({"", "\xFF\xD8\xFF\xC0", "\x89PNG\r\n\x1A\n"});
    cover += input.ConsumeRandomLengthString(40);
    MWSetCover(set, cover.data(), static_cast<int64_t>(cover.size()));
    const std::string file = Text(input);
    MWAddAttachment(set, Text(input).c_str(), Text(input).c_str(), file.data(),
                    static_cast<int64_t>(file.size()));
    return chapters;
}

void WriteRecords(void* file) {
    TestPicture picture(32, 16);
    TestSound sound(8000, 1, 16);
    for (int number = 0; number < 5; ++number) {
        const int64_t time = number * kSecond / 5;
        MWWriteVideoFrame(file, &picture.Paint(number, time));
        MWWriteAudioData(file, &sound.Next(1600, time));
    }
}

void CheckReadable(const std::string& path, unsigned chapters) {
    AVFormatContext* context = nullptr;
    FUZZ_CHECK(avformat_open_input(&context, path.c_str(), nullptr, nullptr) == 0);
    const av::Input input(context);
    FUZZ_CHECK(context->nb_streams >= 1 && context->nb_chapters <= chapters);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static const Folder folder;
    av_log_set_level(AV_LOG_QUIET);
    FuzzedDataProvider input(data, size);
    WriterOptions options{};
    options.bRemovePartial = 1;
    options.nEncoderThreads = 1;
    const uint32_t set = MWRegisterOptions(&options);
    FUZZ_CHECK(set != 0);
    EncodeParam param{};
    param.fccFileFormat = input.PickValueInArray(
        {FourCC("MP4 "), FourCC("MOV "), FourCC("MKV "), FourCC("AVI "), FourCC("FLV "), FourCC("TS  "),
         FourCC("M4A "), FourCC("MP3 "), FourCC("FLAC"), FourCC("OGG ")});
    const bool isFlash = param.fccFileFormat == FourCC("FLV ");
    param.fccVideo = isFlash                                 ? FourCC("FLV1")
                     : param.fccFileFormat == FourCC("TS  ") ? FourCC("MPG2")
                                                             : FourCC("XVID");
    param.nReserved[kWriterSetWord] = set;
    const unsigned chapters = AddExtras(input, set);
    Cues cues;
    AddSubtitles(input, set, cues);
    const VideoFormat video{32, 16, 5.0, 1.0};
    const AudioFormat audio{8000, 1, 16, 0, 1.0};
    const std::string target = folder / "movie";
    void* file = MWCreateMediaFile(text::FromUtf8(target).c_str(), &param, &video, &audio);
    WriteRecords(file);
    const bool complete = MWCloseMediaFile(file, nullptr, nullptr) != 0;
    WriterStatus status{};
    FUZZ_CHECK(MWGetFileStatus(set, MWGetFileCount(set), &status) == 1);
    FUZZ_CHECK(MWUnregisterOptions(set) == 1);
    FUZZ_CHECK(complete == (status.nState == kWriterFileComplete));
    FUZZ_CHECK(complete == (status.nError == kWriterErrorNone));
    FUZZ_CHECK(folder.Names() == (complete ? std::vector<std::string>{"movie"} : std::vector<std::string>{}));
    if (complete) {
        CheckReadable(target, chapters);
        std::filesystem::remove(target);
    }
    return 0;
}
