#include "host/sentence/Sentence.h"

#include "host/sentence/Say.h"

namespace movieconv {

Sentence::Sentence(const char* pattern, std::vector<Sentence> parts)
    : pattern_(pattern), parts_(std::move(parts)) {
    std::string_view rest = pattern;
    for (const Sentence& part : parts_) {
        const std::string_view place = PlaceIn(rest, 0);
        const auto begin = static_cast<std::size_t>(place.data() - rest.data());
        text_.append(rest.substr(0, begin)).append(part.text_);
        rest.remove_prefix(begin + place.size());
    }
    text_.append(rest);
}

Sentence SayCodec(std::string name) {
    return {Sentence::Kind::kCodec, std::move(name)};
}

Sentence SayAmount(std::string text) {
    return {Sentence::Kind::kAmount, std::move(text)};
}

Sentence SayList(std::vector<Sentence> items) {
    std::string text;
    for (std::size_t i = 0; i < items.size(); ++i)
        text.append(i == 0 ? "" : i + 1 == items.size() ? " and " : ", ").append(items[i].Text());
    return {Sentence::Kind::kList, std::move(text), std::move(items)};
}

Sentence SayCounted(int64_t count, Sentence one, Sentence many) {
    return count <= 0 ? Sentence() : count == 1 ? std::move(one) : std::move(many);
}

void AddTold(std::vector<Sentence>& texts, Sentence text) {
    if (!text.IsEmpty())
        texts.push_back(std::move(text));
}

std::string_view PlaceIn(std::string_view pattern, std::size_t number) {
    std::size_t begin = pattern.find('{');
    for (; number > 0; --number)
        begin = pattern.find('{', begin + 1);
    return pattern.substr(begin, pattern.find('}', begin) + 1 - begin);
}

} // namespace movieconv
