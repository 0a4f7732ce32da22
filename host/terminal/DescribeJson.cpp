#include "host/terminal/Describe.h"

#include "host/terminal/JsonLine.h"

#include <nlohmann/json.hpp>

#include <string>
#include <utility>
#include <vector>

namespace movieconv {
namespace {

using Json = nlohmann::ordered_json;

/// The figure when it is told.
Json Told(double value) {
    return value > 0 ? Json(value) : Json(nullptr);
}

Json TagsOf(const std::vector<Tag>& tags) {
    Json object = Json::object();
    for (const Tag& tag : tags)
        object[tag.key] = tag.value;
    return object;
}

Json FlagsOf(const StreamFlags& flags) {
    Json list = Json::array();
    const std::pair<bool, const char*> names[] = {{flags.isDefault, "default"},
                                                  {flags.forced, "forced"},
                                                  {flags.original, "original"},
                                                  {flags.dub, "dub"},
                                                  {flags.commentary, "commentary"},
                                                  {flags.hearingImpaired, "hearing_impaired"},
                                                  {flags.visualImpaired, "visual_impaired"}};
    for (const auto& [isSet, name] : names)
        if (isSet)
            list.push_back(name);
    return list;
}

const char* NameOf(Certainty certainty) {
    return certainty == Certainty::kKnown       ? "known"
           : certainty == Certainty::kEstimated ? "estimated"
                                                : "guessed";
}

void Add(Json& object, const PictureStreamInfo& pictures) {
    object["width"] = pictures.width;
    object["height"] = pictures.height;
    object["frame_rate"] = Told(pictures.frameRate);
    object["pixel_format"] = pictures.pixelFormat;
    object["depth"] = pictures.depth;
    object["pixel_aspect"] = {pictures.pixelAspect.num, pictures.pixelAspect.den};
    object["rotation"] = pictures.quarterTurns * 90;
    object["mirrored"] = pictures.mirrored;
    object["interlaced"] = pictures.interlaced;
    object["top_field_first"] = pictures.topFieldFirst;
    object["full_range"] = pictures.fullRange;
    object["primaries"] = pictures.colorPrimaries;
    object["transfer"] = pictures.colorTransfer;
    object["matrix"] = pictures.colorMatrix;
    object["mastering_display"] = nullptr;
    if (const auto& display = pictures.masteringDisplay) {
        object["mastering_display"] = {{"red", display->red},         {"green", display->green},
                                       {"blue", display->blue},       {"white", display->white},
                                       {"darkest", display->darkest}, {"brightest", display->brightest}};
    }
    object["light_level"] = nullptr;
    if (const auto& level = pictures.lightLevel) {
        object["light_level"] = {{"brightest_pixel", level->brightestPixel},
                                 {"brightest_picture", level->brightestPicture}};
    }
    object["dolby_vision"] = pictures.dolbyVision;
}

Json Object(const StreamInfo& stream) {
    Json object{{"index", stream.index},          {"kind", KindName(stream.kind)}, {"codec", stream.codec},
                {"profile", stream.profile},      {"language", stream.language},   {"title", stream.title},
                {"flags", FlagsOf(stream.flags)}, {"decodable", stream.decodable}};
    object["language_tag"] = stream.languageTag;
    object["begin_s"] = stream.begin ? Json(*stream.begin) : Json(nullptr);
    object["end_s"] = Told(stream.pictures ? stream.pictures->duration
                           : stream.sound  ? stream.sound->duration
                                           : stream.duration);
    object["bit_rate"] = Told(static_cast<double>(stream.bitRate));
    if (stream.pictures)
        Add(object, *stream.pictures);
    if (stream.sound) {
        object["sample_rate"] = stream.sound->sampleRate;
        object["channels"] = stream.sound->channels;
        object["layout"] = stream.sound->layout;
        object["bits"] = stream.sound->bitsPerSample;
    }
    if (stream.kind == StreamKind::kSubtitles)
        object["textual"] = stream.textual;
    if (stream.kind == StreamKind::kCover || stream.kind == StreamKind::kAttachment) {
        object["file_name"] = stream.fileName;
        object["mime_type"] = stream.mimeType;
        object["bytes"] = stream.bytes;
    }
    object["tags"] = TagsOf(stream.tags);
    return object;
}

} // namespace

std::string DescribeAsJson(const SourceInfo& source) {
    Json object{{"path", source.path},
                {"container", source.container},
                {"bytes", source.bytes},
                {"length_s", source.certainty == Certainty::kGuessed ? Json(nullptr) : Json(source.duration)},
                {"certainty", NameOf(source.certainty)}};
    object["pictures"] = source.pictures ? Json(source.pictures->index) : Json(nullptr);
    object["sound"] = source.sound ? Json(source.sound->index) : Json(nullptr);
    object["streams"] = Json::array();
    for (const StreamInfo& stream : source.streams)
        object["streams"].push_back(Object(stream));
    object["chapters"] = Json::array();
    for (const Chapter& chapter : source.chapters) {
        object["chapters"].push_back({{"begin_s", chapter.begin},
                                      {"end_s", chapter.end},
                                      {"title", chapter.title},
                                      {"tags", TagsOf(chapter.tags)}});
    }
    object["tags"] = TagsOf(source.tags);
    return JsonLine("info", object);
}

std::string EstimateAsJson(const Room& room) {
    const auto known = [](int64_t bytes) { return bytes < 0 ? Json(nullptr) : Json(bytes); };
    return JsonLine("estimate", {{"length_s", room.length},
                                 {"needed", known(room.needed)},
                                 {"folder", room.folder},
                                 {"free", known(room.free)}});
}

std::string PlanAsJson(const std::string& path, int pieces) {
    return JsonLine("plan", {{"path", path}, {"pieces", pieces}});
}

} // namespace movieconv
