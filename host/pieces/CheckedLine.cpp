#include "host/pieces/CheckedLine.h"

#include "host/pieces/Digest.h"

namespace movieconv {

std::string AsText(const Json& json) {
    return json.dump(-1, ' ', false, Json::error_handler_t::replace);
}

std::string CheckedLine(Json object) {
    object["check"] = DigestOf(AsText(object));
    return AsText(object) + "\n";
}

std::optional<Json> ObjectOn(const std::string& line) {
    Json object = Json::parse(line, nullptr, false);
    if (!object.is_object())
        return std::nullopt;
    object.erase("check");
    return CheckedLine(object) == line + "\n" ? std::optional(object) : std::nullopt;
}

} // namespace movieconv
