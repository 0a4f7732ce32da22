#include "host/source/ConcatScript.h"

#include "host/sentence/Say.h"
#include "host/source/SourceError.h"

#include <algorithm>
#include <array>
#include <string_view>
#include <system_error>

extern "C" {
#include <libavutil/avstring.h>
}

namespace movieconv {
namespace {

constexpr int64_t kLongestScript = 1 << 20;
constexpr char kSpaces[] = " \n\t\r"; // as the demultiplexer has them
constexpr std::array<std::string_view, 4> kHarmless{"ffconcat", "duration", "inpoint", "outpoint"};

std::string ReadWhole(InputFile& file) {
    std::string text;
    std::array<unsigned char, 4096> part{};
    int count = 0;
    while (static_cast<int64_t>(text.size()) <= kLongestScript &&
           (count = avio_read(file.Io(), part.data(), static_cast<int>(part.size()))) > 0)
        text.append(reinterpret_cast<const char*>(part.data()), static_cast<std::size_t>(count));
    if (static_cast<int64_t>(text.size()) > kLongestScript || avio_seek(file.Io(), 0, SEEK_SET) != 0)
        throw SourceError(Say("the script is too long or not a file"));
    return text;
}

/// The name in a "file" line, unquoted as the demultiplexer does it.
std::string NameIn(const std::string& rest) {
    const char* cursor = rest.c_str();
    char* token = av_get_token(&cursor, kSpaces);
    if (token == nullptr)
        throw std::bad_alloc();
    std::string name = token;
    av_free(token);
    return name;
}

void CheckName(const std::string& name, const std::string& folder, const CompanionFiles& companions,
               const char* formats) {
    // In a URL these have a meaning of their own, so that another file would be opened.
    if (name.empty() || name.find_first_of(":?#%\\") != std::string::npos)
        throw SourceError(Say("it names \"{}\", which is not a plain name", name));
    const std::string path = companions.Permit(name[0] == '/' ? name : folder + name);
    const std::unique_ptr<InputFile> file = companions.Open(path);
    const AVInputFormat* format = nullptr;
    const int result = av_probe_input_buffer2(file->Io(), &format, path.c_str(), nullptr, 0, 0);
    av::CheckMemory(result);
    if (result < 0 || av_match_list(format->name, formats, ',') == 0)
        throw SourceError(Say("it names \"{}\", which is not a movie", name));
}

void CheckLine(std::string_view line, const std::string& folder, const CompanionFiles& companions,
               const char* formats) {
    const std::size_t begin = line.find_first_not_of(kSpaces);
    if (begin == std::string_view::npos || line[begin] == '#')
        return;
    const std::size_t end = std::min(line.find_first_of(kSpaces, begin), line.size());
    const std::string_view keyword = line.substr(begin, end - begin);
    if (keyword == "file") {
        const std::size_t name = std::min(line.find_first_not_of(kSpaces, end), line.size());
        CheckName(NameIn(std::string(line.substr(name))), folder, companions, formats);
    } else if (std::find(kHarmless.begin(), kHarmless.end(), keyword) == kHarmless.end()) {
        throw SourceError(Say("its line \"{}\" is not understood", keyword));
    }
}

} // namespace

void CheckConcatScript(InputFile& script, const std::string& path, const CompanionFiles& companions,
                       const char* formats) {
    try {
        const std::string folder = path.substr(0, path.rfind('/') + 1);
        if (folder.find_first_of("?#%\\") != std::string::npos)
            throw SourceError(Say("its folder has a name that scripts cannot lie in"));
        const std::string text = ReadWhole(script);
        for (std::size_t begin = 0; begin < text.size();) {
            const std::size_t end =
                std::min(text.find_first_of(std::string_view("\r\n\0", 3), begin), text.size());
            CheckLine(std::string_view(text).substr(begin, end - begin), folder, companions, formats);
            begin = end + 1;
        }
    } catch (const SourceError& refusal) {
        throw SourceError(Say("cannot open \"{}\": {}", path, refusal.Words()));
    } catch (const std::system_error& error) {
        throw SourceError(Say("cannot open \"{}\": a file that it names: {}", path, error.code().message()));
    }
}

} // namespace movieconv
