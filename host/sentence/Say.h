// Makes sentences.
#ifndef MOVIECONV_HOST_SENTENCE_SAY_H
#define MOVIECONV_HOST_SENTENCE_SAY_H

#include "host/sentence/Sentence.h"

#include <cstddef>
#include <cstdint>
#include <fmt/format.h>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>
#include <vector>

namespace movieconv {

/// A pattern for later, or a text of someone else's that is to be known: found as Say's are.
constexpr const char* Phrase(const char* text) {
    return text;
}

/// A codec's name within a sentence, amounts and lists likewise.
Sentence SayCodec(std::string name);
Sentence SayAmount(std::string text);
Sentence SayList(std::vector<Sentence> items);

/// `one` for a single thing, `many` for several; empty for none, of which nothing is told.
Sentence SayCounted(int64_t count, Sentence one, Sentence many);

/// Adds `text` to `texts` unless it is empty.
void AddTold(std::vector<Sentence>& texts, Sentence text);

/// The place with that number, from 0, of those in a pattern: "{}" or, with how it is to be filled, "{:.1f}".
std::string_view PlaceIn(std::string_view pattern, std::size_t number);

} // namespace movieconv

template <>
struct fmt::formatter<movieconv::Sentence> : fmt::formatter<std::string_view> {
    auto format(const movieconv::Sentence& sentence, fmt::format_context& context) const {
        return fmt::formatter<std::string_view>::format(sentence.Text(), context);
    }
};

namespace movieconv {

/// A sentence by its pattern, a literal as fmt has it, with places in the order of the parts and none of
/// them numbered. scripts/translate finds it in the sources by this function's name. A part can be a
/// sentence, which is translated in its turn; all else is filled in as it is.
template <class... Args>
Sentence Say(fmt::format_string<Args...> pattern, const Args&... args) {
    const fmt::string_view view = pattern;
    std::vector<Sentence> parts;
    [[maybe_unused]] const auto add = [&](const auto& arg) {
        if constexpr (std::is_same_v<std::decay_t<decltype(arg)>, Sentence>) {
            parts.push_back(arg);
        } else {
            const std::string_view place = PlaceIn({view.data(), view.size()}, parts.size());
            parts.emplace_back(Sentence::Kind::kName, fmt::vformat(place, fmt::make_format_args(arg)));
        }
    };
    (add(args), ...);
    return {view.data(), std::move(parts)};
}

} // namespace movieconv

#endif
