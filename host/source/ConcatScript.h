// Scripts that join movies end to end, in the form of FFmpeg's "concat" demultiplexer.
#ifndef MOVIECONV_HOST_SOURCE_CONCATSCRIPT_H
#define MOVIECONV_HOST_SOURCE_CONCATSCRIPT_H

#include "host/source/CompanionFiles.h"
#include "host/source/InputFile.h"

#include <string>

namespace movieconv {

/// Reads the script at `path` through `script`, which is then at its start again, and looks at every file
/// that it names, since the demultiplexer opens them without asking. Throws SourceError when one must not be
/// read or is of none of the `formats`, or when the script does more than name files and parts of them.
void CheckConcatScript(InputFile& script, const std::string& path, const CompanionFiles& companions,
                       const char* formats);

} // namespace movieconv

#endif
