// Which functions a process was in when memory failed it and when it crashed, so that FFmpeg's own faults are
// told from ours. docs/reliability.md names those.
#ifndef MOVIECONV_TESTS_FAULTS_CRASHREPORT_H
#define MOVIECONV_TESTS_FAULTS_CRASHREPORT_H

#include <string>

/// Writes "In:" and the exported functions on the stack, from FFmpeg's innermost one on, to standard error;
/// for FailAllocation.
void TellPlace();

/// Makes a crash of this process do so as well.
void ReportCrashes();

/// Whether a process with that output has crashed in FFmpeg by a fault of its own.
bool IsKnownCrash(const std::string& output);

/// Whether the memory that failed was asked for while FFmpeg opened a source: it may pass over that without a
/// word.
bool WasOpening(const std::string& output);

#endif
