// Errors that people are told of.
#ifndef MOVIECONV_HOST_SENTENCE_SENTENCEERROR_H
#define MOVIECONV_HOST_SENTENCE_SENTENCEERROR_H

#include "host/sentence/Sentence.h"

#include <exception>
#include <string>
#include <utility>

namespace movieconv {

class SentenceError : public std::exception {
public:
    // cppcheck-suppress passedByValue ; moved, since copying could throw
    explicit SentenceError(Sentence words) noexcept : words_(std::move(words)) {}

    const char* what() const noexcept override { return Text().c_str(); }
    const std::string& Text() const { return words_.Text(); } ///< A sentence without a full stop.
    const Sentence& Words() const { return words_; }          ///< The same, for other languages.

private:
    Sentence words_;
};

/// What any error says.
inline Sentence WordsOf(const std::exception& error) {
    const auto* told = dynamic_cast<const SentenceError*>(&error);
    return told != nullptr ? told->Words() : Sentence(std::string(error.what()));
}

} // namespace movieconv

#endif
