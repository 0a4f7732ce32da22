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

#include <cstddef>
#include <cstdint>
#include <functional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#pragma GCC visibility push(default)

namespace recorder {

/// Forgets all recordings and everything that was set below.
void Reset();

/// Adds a line to the trace.
void Note(std::string_view line);

/// The trace since Reset:
///
///     create NAME WxH@RATE RATE/CHANNELS -> #FILE     formats that are null are "-", a failure is "-> null"
///     sound #FILE STAMP +BYTES                        "silence" for the engine's own, which is all zeros
///     picture #FILE STAMP
///     close #FILE, or close #FILE with callback
std::vector<std::string> Trace();

/// The records of the writes since Reset.
std::vector<AudioFrame> Sounds();
std::vector<VideoImage> Pictures();

/// The parameters of the creates since Reset.
std::vector<EncodeParam> Params();

/// Makes the creates with these numbers, from 1, fail.
void FailCreates(std::set<int> numbers);

/// What MWGetFileFormatInfos gives out; null at first. The table stays the caller's.
void SetFormatTable(const FileFormatInfo* table);

/// Called in every write before it is noted, and in every final close, one with a callback.
void OnWrite(std::function<void()> hook);
void OnClose(std::function<void()> hook);

} // namespace recorder

#pragma GCC visibility pop

#endif
