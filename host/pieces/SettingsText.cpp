#include "host/pieces/SettingsText.h"

#include "host/convert/Formats.h"

#include <cmath>
#include <fmt/format.h>
#include <limits>
#include <map>
#include <set>
#include <stdexcept>
#include <string>
#include <type_traits>
#include <vector>

namespace movieconv {
namespace {

[[noreturn]] void RefuseSetting(const std::string& what) {
    throw std::invalid_argument(what);
}

template <class Figure>
Json ToJson(const Steps<Figure>& steps);
template <class Figure>
void FromJson(const Json& json, Steps<Figure>& steps);

template <class Value>
Json ToJson(const Value& value) {
    if constexpr (std::is_same_v<Value, uint32_t>) // a four-character code
        return value == 0 ? "" : CodeName(value);
    else if constexpr (std::is_enum_v<Value>)
        return static_cast<int>(value);
    else if constexpr (std::is_same_v<Value, Size>)
        return Json::array({value.width, value.height});
    else if constexpr (std::is_same_v<Value, Crop>)
        return Json::array({value.top, value.bottom, value.left, value.right});
    else if constexpr (std::is_same_v<Value, Tag>)
        return Json::array({NameAsJson(value.key), NameAsJson(value.value)});
    else if constexpr (std::is_same_v<Value, SubtitleFileWish>)
        return Json::array({NameAsJson(value.path), NameAsJson(value.language)});
    else if constexpr (std::is_same_v<Value, std::string>) // may name a file
        return NameAsJson(value);
    else
        return value;
}

template <class Value>
Json ToJson(const std::vector<Value>& values) {
    Json list = Json::array();
    for (const Value& value : values)
        list.push_back(ToJson(value));
    return list;
}

template <class Key, class Value>
Json PairsToJson(const std::map<Key, Value>& map) {
    Json list = Json::array();
    for (const auto& [key, value] : map)
        list.push_back(Json::array({ToJson(key), ToJson(value)}));
    return list;
}

template <class Figure>
Json ToJson(const Steps<Figure>& steps) {
    return PairsToJson(steps.from);
}

template <class Value>
void FromJson(const Json& json, Value& value) {
    if constexpr (std::is_same_v<Value, uint32_t>) {
        const auto text = json.get<std::string>();
        const std::optional<uint32_t> code = text.empty() ? 0 : ParseCode(text);
        if (!code)
            RefuseSetting("\"" + text + "\" is no code");
        value = *code;
    } else if constexpr (std::is_enum_v<Value>) {
        value = static_cast<Value>(json.get<int>());
    } else if constexpr (std::is_same_v<Value, Size>) {
        value = {json.at(0).get<int32_t>(), json.at(1).get<int32_t>()};
    } else if constexpr (std::is_same_v<Value, Crop>) {
        value.top = json.at(0).get<int>();
        value.bottom = json.at(1).get<int>();
        value.left = json.at(2).get<int>();
        value.right = json.at(3).get<int>();
    } else if constexpr (std::is_same_v<Value, Tag> || std::is_same_v<Value, SubtitleFileWish>) {
        value = {NameFromJson(json.at(0)), NameFromJson(json.at(1))};
    } else if constexpr (std::is_same_v<Value, std::string>) {
        value = NameFromJson(json);
    } else if constexpr (std::is_same_v<Value, bool>) {
        value = json.get<bool>();
    } else if constexpr (std::is_integral_v<Value>) {
        const auto number = json.get<int64_t>();
        if (!json.is_number_integer() || number < 0 || number > std::numeric_limits<Value>::max())
            RefuseSetting("a number is out of its range");
        value = static_cast<Value>(number);
    } else {
        value = json.get<Value>();
        if constexpr (std::is_floating_point_v<Value>)
            if (!std::isfinite(value) || value < 0)
                RefuseSetting("a number is out of its range");
    }
}

template <class Value>
void FromJson(const Json& json, std::vector<Value>& values) {
    for (const Json& item : json)
        FromJson(item, values.emplace_back());
}

template <class Key, class Value>
void PairsFromJson(const Json& json, std::map<Key, Value>& map) {
    for (const Json& pair : json) {
        Key key{};
        FromJson(pair.at(0), key);
        FromJson(pair.at(1), map[key]);
    }
}

template <class Figure>
void FromJson(const Json& json, Steps<Figure>& steps) {
    PairsFromJson(json, steps.from);
}

template <class Figure>
void FromJson(const Json& json, std::map<uint32_t, Steps<Figure>>& map) {
    PairsFromJson(json, map);
}

template <class Figure>
Json ToJson(const std::map<uint32_t, Steps<Figure>>& map) {
    return PairsToJson(map);
}

/// Enters each field under its name.
class Writer {
public:
    explicit Writer(Json& json) : json_(json) {}

    template <class Value>
    void operator()(const char* name, const Value& value) {
        json_[name] = ToJson(value);
    }
    template <class Value>
    void operator()(const char* name, const std::optional<Value>& value) {
        if (value)
            json_[name] = ToJson(*value);
    }

private:
    Json& json_;
};

/// Takes each field from its name.
class Reader {
public:
    explicit Reader(const Json& json) : json_(json) {}

    template <class Value>
    void operator()(const char* name, Value& value) {
        known_.insert(name);
        FromJson(json_.at(name), value);
    }
    template <class Value>
    void operator()(const char* name, std::optional<Value>& value) {
        known_.insert(name);
        if (json_.contains(name))
            FromJson(json_.at(name), value.emplace());
    }

    /// Throws std::invalid_argument when there was more.
    void Finish() const {
        for (const auto& [name, value] : json_.items())
            if (known_.count(name) == 0)
                RefuseSetting("\"" + name + "\" is no setting");
    }

private:
    const Json& json_;
    std::set<std::string> known_;
};

template <class Archive, class Fields>
void Preferred(Archive& archive, Fields& preferences) {
    archive("format", preferences.format);
    archive("videoCodecs", preferences.videoCodecs);
    archive("audioCodecs", preferences.audioCodecs);
    archive("quality", preferences.quality);
    archive("videoRate", preferences.videoRate);
    archive("videoMaxRate", preferences.videoMaxRate);
    archive("speed", preferences.speed);
    archive("profile", preferences.profile);
    archive("fitWithin", preferences.fitWithin);
    archive("frameRate", preferences.frameRate);
    archive("maxFrameRate", preferences.maxFrameRate);
    archive("audioRate", preferences.audioRate);
    archive("channels", preferences.channels);
    archive("maxChannels", preferences.maxChannels);
    archive("sampleRate", preferences.sampleRate);
    archive("noAudio", preferences.noAudio);
}

template <class Archive, class Fields>
void Asked(Archive& archive, Fields& request) {
    archive("format", request.format);
    archive("videoCodec", request.videoCodec);
    archive("audioCodec", request.audioCodec);
    archive("copySound", request.copySound);
    archive("size", request.size);
    archive("fit", request.fit);
    archive("frameRate", request.frameRate);
    archive("quality", request.quality);
    archive("speed", request.speed);
    archive("videoRate", request.videoRate);
    archive("videoMaxRate", request.videoMaxRate);
    archive("audioRate", request.audioRate);
    archive("audioMaxRate", request.audioMaxRate);
    archive("maxSize", request.maxSize);
    archive("channels", request.channels);
    archive("sampleRate", request.sampleRate);
    archive("deinterlace", request.deinterlace);
    archive("crop", request.crop);
    archive("hdr", request.hdr);
    archive("depth", request.depth);
    archive("noAudio", request.noAudio);
    archive("audioTracks", request.audioTracks);
    archive("subtitles", request.subtitles);
    archive("subtitleFiles", request.subtitleFiles);
    archive("subtitleCharset", request.subtitleCharset);
    archive("burnSubtitles", request.burnSubtitles);
    archive("noChapters", request.noChapters);
    archive("noMetadata", request.noMetadata);
    archive("metadata", request.metadata);
    archive("begin", request.begin);
    archive("length", request.length);
}

} // namespace

Json SettingsAsJson(const Request& request) {
    Json json = Json::object();
    Writer writer(json);
    Asked(writer, request);
    Json preferences = Json::object();
    Writer preferred(preferences);
    Preferred(preferred, request.preferences);
    json["preferences"] = std::move(preferences);
    return json;
}

Json WishesAsJson(const Request& request) {
    Json json = SettingsAsJson(request);
    json["noVideo"] = request.noVideo;
    json["detectCrop"] = request.detectCrop;
    return json;
}

std::string DifferenceIn(const Json& before, const Json& now, const std::vector<std::string>& parts) {
    const auto text = [](const Json& json, const std::string& key) {
        return json.contains(key) ? json.at(key).dump() : std::string("nothing");
    };
    std::string what;
    for (const std::string& part : parts) {
        Json keys = before.at(part);
        keys.update(now.at(part));
        for (const auto& [key, value] : keys.items())
            if (text(before.at(part), key) != text(now.at(part), key))
                what += fmt::format("{}{} {} was {}, now {}", what.empty() ? "" : "; ", part, key,
                                    text(before.at(part), key), text(now.at(part), key));
    }
    return what;
}

Request SettingsFromJson(const Json& json) {
    Request request;
    Json asked = json;
    const Json& preferences = json.at("preferences");
    asked.erase("preferences");
    Reader reader(asked);
    Asked(reader, request);
    reader.Finish();
    Reader preferred(preferences);
    Preferred(preferred, request.preferences);
    preferred.Finish();
    return request;
}

} // namespace movieconv
