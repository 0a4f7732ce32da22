// What can go wrong with a conversion, in kinds that a front end can act on.
#ifndef MOVIECONV_HOST_CONVERT_FAILURE_H
#define MOVIECONV_HOST_CONVERT_FAILURE_H

#include "host/sentence/SentenceError.h"

#include <utility>

namespace movieconv {

/// Who can do something about it.
enum class Category {
    kInternal, ///< Nobody: no memory, or a fault of the program.
    kRequest,  ///< What was asked for makes no sense or does not fit together.
    kSource,   ///< The source cannot be read, or not to its end.
    kOutput,   ///< The output cannot be written.
    kNoSpace,  ///< The disk or the quota is full.
};

/// What a front end may want to add a word of its own to, such as the name of a switch.
enum class Reason {
    kOther,
    kNoMemory,      ///< The text may be empty.
    kNoFormat,      ///< The output's name tells no file format, and the request neither.
    kExists,        ///< The output is there already, and the request does not let it be replaced.
    kCodec,         ///< The file format or the codec cannot be written.
    kBeginTooLate,  ///< The begin is not before the source's end.
    kPlaylist,      ///< The source is a playlist, and the request does not allow that.
    kLeftover,      ///< What an earlier run left would be lost, and the request does not allow that.
    kCannotResume,  ///< What is left of an earlier run is of another conversion.
    kUnknownLength, ///< The source tells no length, and the request neither.
    kNoPreset,      ///< There is no preset of that name.
};

/// A failure that ends a conversion or keeps it from beginning: what, where and what to do.
class Failure : public SentenceError {
public:
    // cppcheck-suppress passedByValue ; moved, since copying could throw
    Failure(Category category, Sentence words, Reason reason = Reason::kOther) noexcept
        : SentenceError(std::move(words)), category_(category), reason_(reason) {}

    Category Kind() const { return category_; }
    Reason Why() const { return reason_; }

private:
    Category category_;
    Reason reason_;
};

} // namespace movieconv

#endif
