#include "host/convert/WritersWords.h"

#include "host/sentence/Say.h"

#include <cstddef>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace movieconv {
namespace {

constexpr const char* kNoReason = Phrase("the media writer gave no reason");

/// As the writer has them, with the system's word behind those that do not have it themselves.
constexpr const char* kKnown[] = {Phrase("Writing to \"{}\" failed after {} bytes: {}"),
                                  Phrase("Syncing \"{}\" failed: {}"),
                                  Phrase("Renaming \"{}\" failed: {}"),
                                  Phrase("No file can be created in the folder \"{}\": {}"),
                                  Phrase("Another conversion is writing this file ({})"),
                                  Phrase("The file exists already ({})"),
                                  Phrase("The encoder for \"{}\" does not accept {}: {}"),
                                  Phrase("The encoder {} failed: {}"),
                                  Phrase("Pictures of {}x{} cannot be written; choose another size"),
                                  kNoReason,
                                  Phrase("There is not enough memory"),
                                  Phrase("No thread can be started: {}")};

constexpr std::string_view kPlace = "{}";

/// The text as made by the pattern; nothing when it was not. Each part ends where what follows comes first.
std::optional<Sentence> TakenApart(std::string_view text, const char* pattern) {
    std::vector<Sentence> parts;
    for (std::string_view rest = pattern;;) {
        const std::string_view before = rest.substr(0, rest.find(kPlace));
        if (!text.starts_with(before))
            return std::nullopt;
        text.remove_prefix(before.size());
        rest.remove_prefix(before.size());
        if (rest.empty())
            return text.empty() ? std::optional(Sentence(pattern, std::move(parts))) : std::nullopt;
        rest.remove_prefix(kPlace.size());
        const std::string_view behind = rest.substr(0, rest.find(kPlace));
        const std::size_t end = behind.empty() ? text.size() : text.find(behind);
        if (end == std::string_view::npos)
            return std::nullopt;
        const auto kind = behind.empty() ? Sentence::Kind::kWords : Sentence::Kind::kName; // a reason, a name
        parts.emplace_back(kind, std::string(text.substr(0, end)));
        text.remove_prefix(end);
    }
}

} // namespace

Sentence WritersWords(const WriterStatus& failure) {
    std::string text = failure.szWhat[0] != '\0' ? failure.szWhat : kNoReason;
    if (text.back() == '.') // a sentence goes on behind it
        text.pop_back();
    const char* system = std::strerror(failure.nSystemError);
    if (failure.nSystemError != 0 && text.find(system) == std::string::npos)
        text += fmt::format(" ({})", system);
    for (const char* pattern : kKnown)
        if (std::optional<Sentence> known = TakenApart(text, pattern))
            return *std::move(known);
    return text;
}

} // namespace movieconv
