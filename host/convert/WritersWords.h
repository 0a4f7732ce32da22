// What the media writer says has gone wrong.
#ifndef MOVIECONV_HOST_CONVERT_WRITERSWORDS_H
#define MOVIECONV_HOST_CONVERT_WRITERSWORDS_H

#include "host/sentence/Sentence.h"
#include "writer/WriterStatus.h"

namespace movieconv {

/// The failure's sentence with its system error. The writer's interface, which is C's, has it as a text: what
/// people meet most is taken apart again, so that it can be translated.
Sentence WritersWords(const WriterStatus& failure);

} // namespace movieconv

#endif
