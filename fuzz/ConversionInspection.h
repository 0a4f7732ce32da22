// What a conversion must have done, by the trace of the recording writer.
#ifndef MOVIECONV_FUZZ_CONVERSIONINSPECTION_H
#define MOVIECONV_FUZZ_CONVERSIONINSPECTION_H

#include "fuzz/Fuzz.h"
#include "fuzz/ListedDecoders.h"
#include "tests/engine/ScriptedHost.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <optional>
#include <string>
#include <string_view>

/// Goes through what one conversion did and holds it against what is promised.
class Inspection {
public:
    Inspection(const ListedVideo& pictureSource, const ListedAudio& soundSource, bool hasCallback)
        : video(pictureSource), audio(soundSource), reports(hasCallback) {}

    void Run() {
        for (const std::string& line : recording.trace)
            if (line.rfind("log ", 0) != 0)
                Read(line);
        FUZZ_CHECK(open == 0);
        FUZZ_CHECK(!called || !eventOutcome || *called == *eventOutcome);
        FUZZ_CHECK(called.has_value() == reports);
        FUZZ_CHECK(called || eventOutcome || creates == 0);
    }

    size_t creates = 0;
    std::optional<int> called;       // outcome told by the callback
    std::optional<int> eventOutcome; // outcome told by an event

private:
    bool Take(std::string_view prefix) {
        if (rest.substr(0, prefix.size()) != prefix)
            return false;
        rest.remove_prefix(prefix.size());
        return true;
    }
    int Number() const { return std::atoi(std::string(rest).c_str()); }

    void Read(const std::string& line) {
        rest = line;
        FUZZ_CHECK(!called); // it comes last
        if (Take("create "))
            Create(line);
        else if (Take("close #"))
            Close(Number());
        else if (Take("picture #"))
            Picture(Number());
        else if (Take("sound #") || Take("silence #"))
            Sound(Number());
        else if (Take("event finished "))
            Finish(eventOutcome);
        else if (Take("finished "))
            Finish(called);
        else if (Take("progress "))
            FUZZ_CHECK(before == "event progress " + std::to_string(Number()));
        before = line;
    }

    void Create(const std::string& line) {
        FUZZ_CHECK(open == 0 && !eventOutcome);
        ++creates;
        const size_t arrow = line.rfind(" -> ");
        FUZZ_CHECK(arrow != std::string::npos);
        open = line.compare(arrow, 5, " -> #") == 0 ? std::atoi(line.c_str() + arrow + 5) : 0;
        const std::string formats = line.substr(0, arrow);
        const bool noSound = formats.size() > 2 && formats.compare(formats.size() - 2, 2, " -") == 0;
        if (noSound) {
            loop = Loop::kPictures;
        } else {
            const size_t sound = formats.rfind(' ');
            loop = formats.compare(sound - 2, 2, " -") == 0 ? Loop::kSound : Loop::kBoth;
        }
    }

    void Close(int file) {
        FUZZ_CHECK(file == open);
        open = 0;
        expected = 0;
        bytes = 0;
        if (loop == Loop::kPictures && pictures > 0) {
            clipBase = video.AfterNext(pictures - 1).llTime;
            clipBase2 = video.AfterNext(pictures - 1).llTime2;
        }
    }

    void Picture(int file) {
        FUZZ_CHECK(file == open && loop != Loop::kSound);
        const VideoImage source = video.Picture(pictures);
        const VideoImage written = recording.pictures.at(pictures++);
        VideoImage moved = source;
        if (loop == Loop::kBoth) {
            moved.llTime = Add(source.llTime, shift);
            moved.llTime2 = Add(source.llTime2, shift);
        } else {
            moved.llTime = Subtract(source.llTime, clipBase);
            moved.llTime2 = Subtract(source.llTime2, clipBase2);
        }
        FUZZ_CHECK(SameBytes(written, moved));
    }

    void Sound(int file) {
        FUZZ_CHECK(file == open && loop != Loop::kPictures);
        const AudioFrame written = recording.sounds.at(sounds++);
        if (written.nType == kMediaTypeSilence)
            Silence(written);
        else
            Block(written);
    }

    void Silence(const AudioFrame& written) {
        FUZZ_CHECK(loop == Loop::kBoth);
        FUZZ_CHECK(written.llTime == expected && written.llTime2 == expected);
        FUZZ_CHECK(written.nDuration > 0 && written.nDuration <= 400000);
        FUZZ_CHECK(written.nLength >= 0 && written.nLength <= written.nBufferSize &&
                   written.nBufferSize == 1 << 20);
        expected = Add(expected, written.nDuration);
        silent = true;
    }

    void Block(const AudioFrame& written) {
        const AudioFrame& source = audio.Block(blocks++);
        FUZZ_CHECK(!silent); // there is no sound after the end of the sound
        if (loop == Loop::kSound) {
            FUZZ_CHECK(SameBytes(written, source));
            return;
        }
        if (blocks == 1)
            expected = origin = written.llTime;
        AudioFrame moved = source;
        moved.llTime = moved.llTime2 = expected;
        FUZZ_CHECK(SameBytes(written, moved));
        shift = Subtract(expected, source.llTime);
        bytes += source.nLength;
        const int32_t rate = audio.Format().nBytesPerSecond;
        expected = origin;
        if (rate > 0)
            expected = Add(origin, static_cast<int64_t>(static_cast<uint64_t>(bytes) * kSecond) / rate);
    }

    void Finish(std::optional<int>& outcome) {
        FUZZ_CHECK(open == 0 && !outcome);
        outcome = Number();
        FUZZ_CHECK(*outcome >= 0 && *outcome <= 3);
        const bool withRecord = rest.find("without record") == std::string_view::npos;
        FUZZ_CHECK(&outcome != &called || withRecord == (*outcome != 3 || creates > 1));
        if (*outcome == 0 && &outcome == &eventOutcome)
            FUZZ_CHECK(before.rfind(reports ? "progress 10000" : "event progress 10000", 0) == 0);
    }

    enum class Loop { kNone, kBoth, kPictures, kSound };

    const ListedVideo& video;
    const ListedAudio& audio;
    const bool reports;
    const recorder::Recording recording = recorder::Recorded();
    std::string_view rest;
    std::string before;
    Loop loop = Loop::kNone;
    int open = 0;
    size_t sounds = 0;
    size_t pictures = 0;
    size_t blocks = 0;
    bool silent = false;
    int64_t origin = -1;
    int64_t expected = -1;
    int64_t bytes = 0;
    int64_t shift = 0;
    int64_t clipBase = 0;
    int64_t clipBase2 = 0;
};

#endif
