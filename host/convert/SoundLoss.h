// What becomes less of the sound on its way into the output, by what the format and the codec take.
#ifndef MOVIECONV_HOST_CONVERT_SOUNDLOSS_H
#define MOVIECONV_HOST_CONVERT_SOUNDLOSS_H

#include "host/convert/Request.h"
#include "host/sentence/Sentence.h"
#include "host/source/SourceInfo.h"
#include "media/EncodeParam.h"

#include <vector>

namespace movieconv {

/// A sentence each, without what was asked for. `param` as for the conversion.
std::vector<Sentence> TellSoundLoss(const SourceInfo& source, const Request& request,
                                    const EncodeParam& param);

} // namespace movieconv

#endif
