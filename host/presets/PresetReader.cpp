#include "host/presets/PresetReader.h"

#include "host/convert/Formats.h"
#include "host/presets/Notation.h"
#include "host/presets/Preset.h"
#include "host/sentence/Say.h"
#include "media/Limits.h"

#include <algorithm>
#include <climits>
#include <fmt/format.h>
#include <functional>
#include <optional>

namespace movieconv {
namespace {

constexpr double kWorstQuality = 63; // of all scales

std::optional<int> ParseBound(const std::string& text) {
    return ParseWhole(text, 0, INT_MAX);
}

/// An object whose keys are all numbers.
bool IsLadder(const Json& value) {
    return value.is_object() && !value.empty() &&
           std::all_of(value.items().begin(), value.items().end(),
                       [](const auto& member) { return ParseBound(member.key()).has_value(); });
}

std::optional<double> AsQuality(const Json& value) {
    if (!value.is_number() || value.get<double>() < 0 || value.get<double>() > kWorstQuality)
        return std::nullopt;
    return value.get<double>();
}

std::optional<int32_t> AsRate(const Json& value) {
    if (value.is_string())
        return ParseRate(value.get<std::string>());
    if (!value.is_number_integer() || value.get<int64_t>() < 1 || value.get<int64_t>() > INT32_MAX)
        return std::nullopt;
    return value.get<int32_t>();
}

std::optional<double> AsFrameRate(const Json& value) {
    return value.is_string()   ? ParseFrameRate(value.get<std::string>())
           : value.is_number() ? ParseFrameRate(value.dump())
                               : std::nullopt;
}

std::optional<Size> AsSize(const Json& value) {
    return value.is_string() ? ParseSize(value.get<std::string>()) : std::nullopt;
}

std::optional<uint32_t> AsCode(const Json& value) {
    return value.is_string() ? ParseCode(value.get<std::string>()) : std::nullopt;
}

std::optional<bool> AsFlag(const Json& value) {
    return value.is_boolean() ? std::optional(value.get<bool>()) : std::nullopt;
}

/// Reads one of `names` as the enumerator of that place, from 1.
template <class Enumeration, class Names>
auto Among(const Names& names) {
    return [&names](const Json& value) -> std::optional<Enumeration> {
        const auto found =
            value.is_string() ? std::find(names.begin(), names.end(), value.get<std::string>()) : names.end();
        return found == names.end() ? std::nullopt
                                    : std::optional(static_cast<Enumeration>(found - names.begin() + 1));
    };
}

auto Within(int32_t least, int32_t most) {
    return [least, most](const Json& value) -> std::optional<int32_t> {
        if (!value.is_number_integer() || value.get<int64_t>() < least || value.get<int64_t>() > most)
            return std::nullopt;
        return value.get<int32_t>();
    };
}

class Reader {
public:
    Reader(const PresetText& text, std::vector<Sentence>& complaints)
        : text_(text), complaints_(complaints) {}

    Preferences Read() {
        const auto isText = [](const Json& value) {
            return value.is_string() ? std::optional(value.get<std::string>()) : std::nullopt;
        };
        std::string ignored;
        TakeMembers(text_.json, "",
                    {{"$schema", Taking(ignored, isText, Say("a text"))},
                     {"description", Taking(ignored, isText, Say("a text"))},
                     {"parent", Taking(ignored, isText, Say("the name of a preset, or null"))},
                     {"format", Taking(preferences_.format, &AsFormat, Say("a format's code or extension"))},
                     {"video", [this](const Json& value, const std::string& at) { TakeVideo(value, at); }},
                     {"audio", [this](const Json& value, const std::string& at) { TakeAudio(value, at); }}});
        return preferences_;
    }

private:
    using Take = std::function<void(const Json& value, const std::string& pointer)>;
    using Members = std::map<std::string, Take>;

    static std::optional<uint32_t> AsFormat(const Json& value) { return AsCode(value); }

    [[noreturn]] void Refuse(const std::string& pointer, const Sentence& wanted) const {
        std::string name = pointer.substr(1);
        std::replace(name.begin(), name.end(), '/', '.');
        throw PresetError(Say("{}: \"{}\" has to be {}", text_.Place(pointer), name, wanted));
    }

    /// Puts what `as` makes of the value into `target`; null leaves the target alone.
    template <class Target, class As>
    Take Taking(Target& target, As as, const Sentence& wanted) const {
        return [this, &target, as, wanted](const Json& value, const std::string& pointer) {
            const auto read = as(value);
            if (!read)
                Refuse(pointer, wanted);
            target = *read;
        };
    }

    /// A figure alone, or a ladder of them.
    template <class Figure, class As>
    Steps<Figure> AsSteps(const Json& value, const std::string& pointer, As as,
                          const Sentence& wanted) const {
        Steps<Figure> steps;
        const auto take = [&](int bound, const Json& figure, const std::string& at) {
            const auto read = as(figure);
            if (!read)
                Refuse(at, wanted);
            steps.from[bound] = *read;
        };
        if (IsLadder(value)) {
            for (const auto& [bound, figure] : value.items())
                take(*ParseBound(bound), figure, fmt::format("{}/{}", pointer, bound));
        } else {
            take(0, value, pointer);
        }
        return steps;
    }

    void TakeMembers(const Json& object, const std::string& pointer, const Members& known) {
        if (!object.is_object())
            Refuse(pointer, Say("an object, in braces"));
        for (const auto& [key, value] : object.items()) {
            const std::string at = fmt::format("{}/{}", pointer, key);
            const auto found = known.find(key);
            if (found == known.end())
                complaints_.push_back(Say("{}: there is no \"{}\" in presets; it has no effect",
                                          text_.Place(at), at.substr(1)));
            else if (!value.is_null())
                found->second(value, at);
        }
    }

    Take TakingCodecs(std::vector<uint32_t>& codecs) const {
        return [this, &codecs](const Json& value, const std::string& pointer) {
            codecs.clear();
            for (const Json& code : value.is_array() ? value : Json::array({value})) {
                const std::optional<uint32_t> read = AsCode(code);
                if (!read)
                    Refuse(pointer, Say("a codec's code of up to four characters, or a list of them"));
                codecs.push_back(*read);
            }
        };
    }

    void TakeQuality(const Json& value, const std::string& pointer) {
        const Sentence wanted = Say("a number from 0 to 63, or such numbers by picture height or codec");
        const auto steps = [&](const Json& figures, const std::string& at) {
            return AsSteps<double>(figures, at, &AsQuality, wanted);
        };
        if (!value.is_object() || IsLadder(value)) {
            const uint32_t codec =
                preferences_.videoCodecs.empty() ? Preferences::kAnyCodec : preferences_.videoCodecs.front();
            preferences_.quality[codec] = steps(value, pointer);
            return;
        }
        for (const auto& [name, figures] : value.items()) {
            const std::optional<uint32_t> codec = ParseCode(name);
            if (!codec)
                Refuse(pointer, wanted);
            preferences_.quality[*codec] = steps(figures, fmt::format("{}/{}", pointer, name));
        }
    }

    void TakeVideo(const Json& value, const std::string& pointer) {
        const Sentence rate = Say("a bit rate such as \"{}\"", "1.5M");
        const Sentence frameRate = Say("a frame rate from {} to {}, such as 25 or \"{}\"", kLowestFrameRate,
                                       kHighestFrameRate, "30000/1001");
        Preferences& into = preferences_;
        TakeMembers(
            value, pointer,
            {{"codec", TakingCodecs(into.videoCodecs)},
             {"quality", [this](const Json& figures, const std::string& at) { TakeQuality(figures, at); }},
             {"rate", Taking(into.videoRate, &AsRate, rate)},
             {"max_rate", Taking(into.videoMaxRate, &AsRate, rate)},
             {"speed", Taking(into.speed, Among<Speed>(kSpeedNames),
                              Say("slowest, slower, slow, medium, fast, faster or fastest"))},
             {"profile", Taking(into.profile, Among<Profile>(kProfileNames), Say("baseline, main or high"))},
             {"fit_within", Taking(into.fitWithin, &AsSize, Say("a size such as \"{}\"", "1280x720"))},
             {"frame_rate", Taking(into.frameRate, &AsFrameRate, frameRate)},
             {"max_frame_rate", Taking(into.maxFrameRate, &AsFrameRate, frameRate)},
             {"leave_out", Taking(into.noVideo, &AsFlag, Say("true or false"))}});
    }

    /// The codec may be "copy", which is no code: sound stays as it is.
    void TakeSoundCodec(const Json& value, const std::string& pointer) {
        preferences_.copySound = value == "copy";
        if (!preferences_.copySound)
            TakingCodecs(preferences_.audioCodecs)(value, pointer);
    }

    void TakeAudio(const Json& value, const std::string& pointer) {
        const Sentence rate = Say("a bit rate such as \"{}\", or such rates by number of channels", "160k");
        Preferences& into = preferences_;
        TakeMembers(
            value, pointer,
            {{"codec", [this](const Json& codec, const std::string& at) { TakeSoundCodec(codec, at); }},
             {"rate",
              [&](const Json& rates, const std::string& at) {
                  into.audioRate = AsSteps<int32_t>(rates, at, &AsRate, rate);
              }},
             {"channels", Taking(into.channels, Within(1, 8), Say("a number from 1 to 8"))},
             {"max_channels", Taking(into.maxChannels, Within(1, 8), Say("a number from 1 to 8"))},
             {"sample_rate",
              Taking(into.sampleRate, Within(4000, 384000), Say("a number from 4000 to 384000"))},
             {"leave_out", Taking(into.noAudio, &AsFlag, Say("true or false"))}});
    }

    const PresetText& text_;
    std::vector<Sentence>& complaints_;
    Preferences preferences_;
};

void MergeMembers(Json& into, const Json& from) {
    if (!from.is_object() || !into.is_object()) {
        into = from;
        return;
    }
    for (const auto& [key, value] : from.items()) {
        if (value.is_null())
            into.erase(key);
        else if (key == "quality" && into.contains(key))
            MergeMembers(into[key], value);
        else
            into[key] = value;
    }
}

/// A quality alone is its preset's first codec's; by codec it can be merged.
void NameQuality(Json& video, const Json& codecs) {
    const auto quality = video.find("quality");
    const Json& first = codecs.is_array() && !codecs.empty() ? codecs.front() : codecs;
    if (quality != video.end() && first.is_string() && (quality->is_number() || IsLadder(*quality)))
        *quality = Json{{first.get<std::string>(), *quality}};
}

void MergeVideo(Json& into, Json from) {
    if (!into.is_object() || !from.is_object()) {
        into = from;
        return;
    }
    NameQuality(into, into.value("codec", Json()));
    NameQuality(from, from.contains("codec") ? from["codec"] : into.value("codec", Json()));
    if (from.contains("rate") && !from.contains("quality"))
        into.erase("quality");
    if (from.contains("quality") && !from.contains("rate"))
        into.erase("rate");
    MergeMembers(into, from);
}

} // namespace

Preferences ReadPreferences(const PresetText& text, std::vector<Sentence>& complaints) {
    return Reader(text, complaints).Read();
}

Json MergePresets(const Json& parent, const Json& child) {
    Json merged = parent;
    for (const auto& [key, value] : child.items()) {
        if (value.is_null())
            merged.erase(key);
        else if (key == "video" && merged.contains(key))
            MergeVideo(merged[key], value);
        else if (key == "audio" && merged.contains(key))
            MergeMembers(merged[key], value);
        else
            merged[key] = value;
    }
    return merged;
}

} // namespace movieconv
