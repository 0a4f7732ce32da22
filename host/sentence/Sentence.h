// What people are told, as a pattern and what stands in its places: for front ends in other languages.
#ifndef MOVIECONV_HOST_SENTENCE_SENTENCE_H
#define MOVIECONV_HOST_SENTENCE_SENTENCE_H

#include <string>
#include <utility>
#include <vector>

namespace movieconv {

/// A sentence without a full stop, a clause or a word in English, which knows how it was made. Empty by
/// default: nothing is told.
class Sentence {
public:
    enum class Kind {
        kWords,  ///< Made by Say; without a pattern a text that someone else made, such as FFmpeg.
        kName,   ///< A name, a number, a time: the same in all languages.
        kCodec,  ///< FFmpeg's name of a codec.
        kAmount, ///< Bytes, with a decimal point: "1.2 GB".
        kList,   ///< The parts, as "a", "a and b", "a, b and c".
    };

    Sentence() = default;
    /// A text of someone else's.
    Sentence(std::string text) : text_(std::move(text)) {} // NOLINT(*-explicit-*): whatever is told is one
    Sentence(Kind kind, std::string text, std::vector<Sentence> parts = {})
        : kind_(kind), text_(std::move(text)), parts_(std::move(parts)) {}
    /// With the parts in the pattern's places. `pattern` has to last.
    Sentence(const char* pattern, std::vector<Sentence> parts);

    const std::string& Text() const { return text_; } ///< In English.
    bool IsEmpty() const { return text_.empty(); }

    Kind Is() const { return kind_; }
    const char* Pattern() const { return pattern_; } ///< Null where there is none.
    const std::vector<Sentence>& Parts() const { return parts_; }

    friend bool operator==(const Sentence& a, const Sentence& b) { return a.text_ == b.text_; }
    friend bool operator<(const Sentence& a, const Sentence& b) { return a.text_ < b.text_; }

private:
    Kind kind_ = Kind::kWords;
    const char* pattern_ = nullptr;
    std::string text_;
    std::vector<Sentence> parts_;
};

} // namespace movieconv

#endif
