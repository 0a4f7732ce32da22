// Files of subtitles with whatever is in them, through all that becomes of their cues: read in a character
// set, divided among clips, merged into one row, laid out as a script.
#include "fuzz/Fuzz.h"
#include "host/source/BesideTrack.h"
#include "host/source/Charset.h"
#include "host/source/CueDrawer.h"
#include "host/source/CueList.h"
#include "host/source/SourceError.h"
#include "host/source/SubtitleFile.h"
#include "tests/support/Folder.h"
#include "text/Utf8.h"
#include "writer/CueRow.h"

#include <algorithm>
#include <string>
#include <utility>
#include <vector>

using namespace movieconv;

namespace {

constexpr int64_t kSecond = kTicksPerSecond;

/// The packets of a file that begins like a known format, mostly.
std::vector<av::Packet> PacketsOf(const std::string& path) {
    std::vector<av::Packet> packets;
    try {
        SubtitleFile file(path, "");
        while (av::Packet packet = file.Take())
            packets.push_back(std::move(packet));
    } catch (const SourceError&) {
        packets.clear();
    }
    return packets;
}

/// What the files of a movie in clips get: each cue that is taken lies in its file, in order, and a cue that
/// ends in a file begins before that.
void FuzzClips(FuzzedDataProvider& input, std::vector<av::Packet> packets) {
    for (av::Packet& packet : packets)
        if (input.ConsumeIntegralInRange(0, 3) == 0) {
            packet->pts = WildInteger<int64_t>(input, packet->pts);
            packet->duration = WildInteger<int64_t>(input, packet->duration);
        }
    BesideBounds bounds;
    bounds.begin = input.ConsumeIntegralInRange<int64_t>(0, 3 * kSecond);
    bounds.ends = input.ConsumeBool();
    bounds.isCut = input.ConsumeBool();
    Failures failures([] {});
    std::size_t next = 0;
    BesidePackets track(
        [&](int64_t, bool) {
            const bool isThere = next < packets.size();
            return Demuxer::Beside{isThere ? std::move(packets[next++]) : nullptr, !isThere};
        },
        [](int64_t stamp, AVRational unit) {
            return av_rescale_q(stamp, unit, {1, kTicksPerSecond});
        },
        {1, 1000}, bounds, failures);
    int64_t fileBegin = bounds.begin;
    for (int file = input.ConsumeIntegralInRange(1, 4); file > 0; --file) {
        const int64_t fileEnd = fileBegin + input.ConsumeIntegralInRange<int64_t>(1, 4 * kSecond);
        bounds.fileEnd = bounds.isCut ? fileEnd : BesideBounds::kOpen;
        for (const bool closing : {false, true}) {
            const int64_t until = closing ? fileEnd : fileBegin + (fileEnd - fileBegin) / 2;
            BesideTrack::Item item;
            int taken = 0;
            while (track.Next(until, closing, item)) {
                FUZZ_CHECK(item.packet != nullptr && item.duration >= 0);
                if (bounds.isCut)
                    FUZZ_CHECK(item.time < fileEnd);
                FUZZ_CHECK(++taken < 100000);
            }
        }
        fileBegin = fileEnd;
    }
    FUZZ_CHECK(failures.First().IsEmpty());
}

/// One text at a time: what is handed out follows each other without overlaps.
void FuzzRow(FuzzedDataProvider& input) {
    int64_t position = INT64_MIN;
    writer::CueRow row([&](int64_t begin, int64_t end, const std::vector<std::string>& texts) {
        FUZZ_CHECK(begin >= position && end > begin && !texts.empty());
        position = end;
    });
    for (int count = input.ConsumeIntegralInRange(0, 40); count > 0; --count) {
        const auto begin = WildInteger<int64_t>(input, input.ConsumeIntegralInRange<int64_t>(-100, 1000));
        const auto end = WildInteger<int64_t>(input, input.ConsumeIntegralInRange<int64_t>(-100, 1000));
        if (input.ConsumeIntegralInRange(0, 7) == 0)
            row.Reach(begin);
        else
            row.Add(begin, end, "text");
    }
    row.Finish();
}

/// The script of a file is made, and tells at every time whether something changes.
void FuzzScript(FuzzedDataProvider& input, const std::string& path, std::vector<av::Packet> packets) {
    if (packets.empty())
        return;
    const SubtitleFile file(path, "");
    CueList list;
    list.parameters = av::CopyOf(*file.Stream().codecpar);
    for (av::Packet& packet : packets) {
        const int64_t begin = av_rescale_q(packet->pts, file.Stream().time_base, {1, kTicksPerSecond});
        const int64_t end = begin + WildInteger<int64_t>(input, kSecond) % (100000 * kSecond);
        list.cues.push_back({begin, end, std::move(packet)});
    }
    PictureStreamInfo pictures;
    pictures.width = 64;
    pictures.height = 48;
    const auto drawer = MakeTextDrawer(std::move(list), pictures, {});
    for (int64_t time = 0; time < 20 * kSecond; time += kSecond / 4)
        drawer->Changes(time);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static const Folder folder;
    av_log_set_level(AV_LOG_QUIET);
    FuzzedDataProvider input(data, size);
    FuzzRow(input);
    const int kind = input.ConsumeIntegralInRange(0, 3);
    const std::string charset = input.PickValueInArray({"", "", "UTF-16", "WINDOWS-1251", "SHIFT-JIS"});
    const std::string control = input.ConsumeRandomLengthString(64);
    const std::string rest = input.ConsumeRemainingBytesAsString();
    const char* const heads[] = {"", "1\n00:00:01,000 --> 00:00:02,500\n",
                                 "WEBVTT\n\n00:01.000 --> 00:02.000\n",
                                 ("[Script Info]\nScriptType: v4.00+\n[Events]\n"
                                  "Dialogue: 0,0:00:01.00,0:00:02.00,Default,,0,0,0,,")};
    const std::string text = heads[kind] + rest;
    try {
        const std::string converted = Decoded(text, charset);
        const bool isMarked = converted == text;
        FUZZ_CHECK(isMarked || Decoded(converted, "UTF-8") == converted);
    } catch (const SourceError&) {
        FUZZ_CHECK(!charset.empty());
    }
    const std::string path = folder / "cues";
    WriteFile(path, text);
    FuzzedDataProvider more(reinterpret_cast<const uint8_t*>(control.data()), control.size());
    FuzzClips(more, PacketsOf(path));
    FuzzScript(more, path, PacketsOf(path));
    return 0;
}
