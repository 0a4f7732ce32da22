#include "host/pieces/MarkText.h"

#include "host/pieces/Digest.h"

#include <fmt/format.h>

namespace movieconv {

Json MarkAsJson(const SourceMark& mark) {
    return {{"path", NameAsJson(mark.path)},
            {"bytes", mark.bytes},
            {"modified", mark.modified},
            {"headSha256", mark.head},
            {"tailSha256", mark.tail}};
}

Json MarksAsJson(const std::vector<SourceMark>& marks) {
    Json list = Json::array();
    for (const SourceMark& mark : marks)
        list.push_back(MarkAsJson(mark));
    return list;
}

SourceMark MarkFromJson(const Json& json) {
    SourceMark mark;
    mark.path = PathFromJson(json.at("path"));
    mark.bytes = Natural(json, "bytes");
    mark.modified = json.at("modified").get<int64_t>();
    mark.head = json.at("headSha256").get<std::string>();
    mark.tail = json.at("tailSha256").get<std::string>();
    return mark;
}

std::string HashOf(const SourceMark& mark) {
    return DigestOf(
        fmt::format("{}\n{}\n{}\n{}\n{}", mark.path, mark.bytes, mark.modified, mark.head, mark.tail));
}

} // namespace movieconv
