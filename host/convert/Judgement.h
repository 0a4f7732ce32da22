// Whether a conversion was a success: it has to be proved.
#ifndef MOVIECONV_HOST_CONVERT_JUDGEMENT_H
#define MOVIECONV_HOST_CONVERT_JUDGEMENT_H

#include "host/convert/FileLedger.h"
#include "host/convert/Request.h"
#include "host/source/Movie.h"

#include <optional>
#include <string>

namespace movieconv {

/// What is known once a conversion has ended.
struct Evidence {
    const Request& request;
    const FileLedger& files;          ///< By the writer's word, and by what stands on the disk now.
    std::optional<Failure> brokenOff; ///< Why the conversion itself was ended, not by its user.
    Sentence readError;               ///< Why reading ended early; empty when it did not.
    Sentence shortfall;               ///< What the source promised and did not hold; empty when nothing.
    bool userStopped = false;
    int engineOutcome = 0; ///< kOutcome...
    double reached = 0;    ///< Seconds, in the source.
};

/// Why the source ended before what it promises, and before the length that was asked for, of which so many
/// seconds were reached; empty when it did not. Once the movie's streams ended.
Sentence WhyItEndedEarly(const Movie& movie, const Request& request, double reached);

/// Whether the files have become larger than the request allows.
std::optional<Failure> FindExcess(const Request& request, const FileLedger& files);

/// What went wrong first, in the order of what explains most; nothing only when everything that the source
/// holds, or up to where the user stopped, stands complete under its name.
std::optional<Failure> FindFailure(const Evidence& evidence);

} // namespace movieconv

#endif
