// A media writer that writes nothing and records what it is asked for. It is an orvex.dylib of its own, so a
// test program that links it ahead of the engine has it in the real one's place.
//
// All recordings go into one trace of lines, to which a test's decoders and callbacks add theirs, so that the
// order of everything that happens in a conversion can be compared. Every function may be called from any
// thread.
#ifndef MOVIECONV_TESTS_RECORDER_RECORDINGWRITER_H
#define MOVIECONV_TESTS_RECORDER_RECORDINGWRITER_H

#include "media/EncodeParam.h"
#include "media/MediaRecords.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <functional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#pragma GCC visibility push(default)

namespace recorder {

struct Recording {
    /// Lines as
    ///
    ///     create NAME WxH@RATE RATE/CHANNELS -> #FILE
    ///     sound #FILE STAMP +BYTES
    ///     picture #FILE STAMP
    ///     close #FILE, or close #FILE with callback
    ///
    /// where formats that are null are "-", a failed create ends in "-> null", and sound of zeros alone, the
    /// engine's own, is called "silence".
    std::vector<std::string> trace;

    std::vector<AudioFrame> sounds;   ///< The records of the writes.
    std::vector<VideoImage> pictures; ///< The same.
    std::vector<EncodeParam> params;  ///< The parameters of the creates.
};

struct Behaviour {
    std::set<int> failingCreates = {};       ///< Their numbers, from 1.
    size_t takenWrites = SIZE_MAX;           ///< So many are taken, all later ones are refused.
    bool failingCloses = false;              ///< No file is complete.
    const FileFormatInfo* formats = nullptr; ///< What MWGetFileFormatInfos gives out; stays the caller's.
    std::function<void()> onWrite = {};      ///< Called in every write before it is noted.
    std::function<void()> onClose = {};      ///< Called in every final close, one with a callback.
};

/// Forgets all recordings, and behaves like this from now on.
void Reset(Behaviour behaviour = {});

/// Adds a line to the trace.
void Note(std::string_view line);

/// Everything since Reset.
Recording Recorded();

/// A line, as printf makes it.
template <class... Values>
std::string Line(const char* format, Values... values) {
    char text[256];
    snprintf(text, sizeof text, format, values...);
    return text;
}

} // namespace recorder

#pragma GCC visibility pop

/// Whether two records hold the same bytes.
template <class Record>
bool SameBytes(const Record& one, const Record& other) {
    return std::memcmp(&one, &other, sizeof one) == 0;
}

#endif
