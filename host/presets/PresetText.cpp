#include "host/presets/PresetText.h"

#include "host/presets/Preset.h"
#include "host/sentence/Say.h"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstdio>
#include <cstring>
#include <fmt/format.h>
#include <iterator>
#include <memory>
#include <utility>
#include <vector>

namespace movieconv {
namespace {

constexpr std::size_t kMostBytes = 1 << 20;
constexpr std::size_t kDeepest = 32;

/// Walks through a text and counts its lines.
class CountingIterator {
public:
    using iterator_category = std::input_iterator_tag;
    using value_type = char;
    using difference_type = std::ptrdiff_t;
    using pointer = const char*;
    using reference = const char&;

    CountingIterator(const char* at, int* line) : at_(at), line_(line) {}
    reference operator*() const { return *at_; }
    CountingIterator& operator++() {
        *line_ += *at_ == '\n' ? 1 : 0;
        ++at_;
        return *this;
    }
    CountingIterator operator++(int) {
        const CountingIterator before = *this;
        ++*this;
        return before;
    }
    bool operator==(const CountingIterator& other) const { return at_ == other.at_; }
    bool operator!=(const CountingIterator& other) const { return at_ != other.at_; }

private:
    const char* at_;
    int* line_;
};

/// Enters where each key stands while the text is parsed.
class KeyCollector final : public nlohmann::json_sax<Json> {
public:
    KeyCollector(const std::string& where, const int& line, KeyLines& lines)
        : where_(where), line_(line), lines_(lines) {}

    bool null() override { return true; }
    bool boolean(bool) override { return true; }
    bool number_integer(number_integer_t) override { return true; }
    bool number_unsigned(number_unsigned_t) override { return true; }
    bool number_float(number_float_t, const string_t&) override { return true; }
    bool string(string_t&) override { return true; }
    bool binary(binary_t&) override { return true; }
    bool start_array(std::size_t) override { return Enter(); }
    bool end_array() override { return Leave(); }
    bool start_object(std::size_t) override { return Enter(); }
    bool end_object() override { return Leave(); }

    bool key(string_t& key) override {
        key_ = key;
        if (!lines_.try_emplace(Path() + "/" + key, line_).second)
            throw PresetError(Say("{}: \"{}\" is there twice", Place(), key));
        return true;
    }

    bool parse_error(std::size_t, const std::string&, const nlohmann::detail::exception& error) override {
        // What follows the place that it tells in its own way.
        const std::string text = error.what();
        const std::size_t column = text.find("column ");
        const std::size_t colon = text.find(": ", column == std::string::npos ? 0 : column);
        throw PresetError(Say("{}: this is no JSON: {}", Place(),
                              colon == std::string::npos ? text : text.substr(colon + 2)));
    }

private:
    std::string Place() const { return fmt::format("{}:{}", where_, line_); }
    /// What copies or prints values goes as deep as they are nested.
    bool Enter() {
        if (path_.size() == kDeepest)
            throw PresetError(Say("{}: this is nested too deep for a preset", Place()));
        path_.push_back(std::exchange(key_, ""));
        return true;
    }
    bool Leave() {
        path_.pop_back();
        return true;
    }
    std::string Path() const {
        std::string path;
        for (std::size_t i = 1; i < path_.size(); ++i) // the first is the whole, which has no name
            path += "/" + path_[i];
        return path;
    }

    const std::string& where_;
    const int& line_;
    KeyLines& lines_;
    std::vector<std::string> path_;
    std::string key_;
};

} // namespace

std::string PresetText::Place(const std::string& pointer) const {
    const auto found = lines.find(pointer);
    return found == lines.end() ? where : fmt::format("{}:{}", where, found->second);
}

PresetText ParsePresetText(const std::string& text, const std::string& where) {
    PresetText parsed{where, {}, {}};
    int line = 1;
    KeyCollector collector(where, line, parsed.lines);
    Json::sax_parse(CountingIterator(text.data(), &line), CountingIterator(text.data() + text.size(), &line),
                    &collector);
    parsed.json = Json::parse(text);
    if (!parsed.json.is_object())
        throw PresetError(Say("{}:1: a preset is a JSON object, in braces", where));
    return parsed;
}

PresetText ReadPresetFile(const std::string& path) {
    const auto fail = [&] {
        throw PresetError(Say("cannot read the preset \"{}\": {}", path, std::strerror(errno)));
    };
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(std::fopen(path.c_str(), "rbe"), std::fclose);
    if (!file)
        fail();
    std::string text(kMostBytes + 1, '\0');
    text.resize(std::fread(text.data(), 1, text.size(), file.get()));
    if (std::ferror(file.get()) != 0)
        fail();
    if (text.size() > kMostBytes)
        throw PresetError(Say("\"{}\" is too large for a preset", path));
    return ParsePresetText(text, path);
}

} // namespace movieconv
