// Looks at the output's place before anything is written.
#ifndef MOVIECONV_HOST_CONVERT_OUTPUTCHECK_H
#define MOVIECONV_HOST_CONVERT_OUTPUTCHECK_H

#include "host/convert/Observer.h"
#include "host/convert/Request.h"

#include <map>
#include <optional>
#include <string>

namespace movieconv {

/// Throws Failure when the output, or a clip of it, would replace the input or an existing file without
/// leave, cannot be written where it is to go, or has a name that is too long for the file system or of which
/// no clip names can be made.
void CheckOutput(const Request& request);

/// Throws Failure when the file system of its folder cannot take the name. `suffix` is what it gets behind it
/// for a while, if that is not shortened there.
void CheckName(const std::string& path, const std::string& suffix = {});

/// Whatever stands under the names of clips of `output`: their numbers and paths.
std::map<int, std::string> ClipsOf(const std::string& output);

/// What is told of clips of an earlier conversion, which have numbers from `firstFree` on; nothing when there
/// are none.
std::optional<Warning> OlderClips(const std::string& output, int firstFree);

/// What the conversion reads the file of that name as, "the source itself" or "a file of subtitles that is
/// read"; empty when it does not read it.
Sentence WhatIsReadFrom(const std::string& path, const Request& request);

/// Removes what an earlier run has left of `output`, which has its name but was not completed. A file that
/// the conversion reads stays.
void RemoveUnfinished(const std::string& output, const Request& request);

/// Whether both names stand for one file that exists.
bool AreSame(const std::string& path, const std::string& other);

/// Whether a file of that name is or becomes the output, a clip of it, or what they are called until they are
/// complete.
bool IsOutput(const std::string& path, const Request& request);

} // namespace movieconv

#endif
