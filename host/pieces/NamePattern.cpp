#include "host/pieces/NamePattern.h"

#include "host/convert/Failure.h"

#include <cstddef>
#include <filesystem>
#include <fmt/format.h>
#include <map>
#include <system_error>

namespace movieconv {

std::string NameAfter(const std::string& pattern, const std::string& input, const std::string& extension) {
    const std::filesystem::path path = input;
    std::error_code unknown; // where the working folder is gone
    const std::filesystem::path folder = std::filesystem::absolute(path, unknown).parent_path();
    const std::string dotted = path.extension().string();
    const std::map<std::string, std::string> words{
        {"{name}", path.stem().string()},
        {"{from}", dotted.empty() ? dotted : dotted.substr(1)},
        {"{folder}", folder.filename().string()},
        {"{ext}", extension},
    };
    std::string name;
    std::size_t at = 0;
    for (std::size_t open = pattern.find('{'); open != std::string::npos; open = pattern.find('{', at)) {
        const std::size_t close = pattern.find('}', open);
        if (close == std::string::npos)
            break;
        const std::string word = pattern.substr(open, close + 1 - open);
        const auto meant = words.find(word);
        if (meant == words.end())
            throw Failure(
                Category::kRequest,
                fmt::format("--names has {{name}}, {{from}}, {{folder}} and {{ext}}, not \"{}\"", word));
        name += pattern.substr(at, open - at) + meant->second;
        at = close + 1;
    }
    return name + pattern.substr(at);
}

} // namespace movieconv
