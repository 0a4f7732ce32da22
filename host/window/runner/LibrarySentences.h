// The sentences that the conversion library has for people, as the window's translations know them.
#ifndef MOVIECONV_HOST_WINDOW_RUNNER_LIBRARYSENTENCES_H
#define MOVIECONV_HOST_WINDOW_RUNNER_LIBRARYSENTENCES_H

#include <span>

namespace movieconv::window {

/// Sentences and clauses, with other quotes than the library's; %1 to %6 stand for names, numbers, lists and
/// further clauses. Of two that fit the first is meant.
std::span<const char* const> LibrarySentences();

/// Single words: what a stream is, what a list holds.
std::span<const char* const> LibraryNouns();

} // namespace movieconv::window

#endif
