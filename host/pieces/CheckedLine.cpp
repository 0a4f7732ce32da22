#include "host/pieces/CheckedLine.h"

#include "host/pieces/Digest.h"

#include <stdexcept>

namespace movieconv {

Json ParseFlat(const std::string& text) {
    constexpr int kDeepest = 32;
    return Json::parse(text, [](int depth, Json::parse_event_t, const Json&) {
        if (depth > kDeepest)
            throw std::invalid_argument("it is nested too deep");
        return true;
    });
}

std::string CheckedLine(Json object) {
    object["check"] = DigestOf(object.dump());
    return object.dump() + "\n";
}

std::optional<Json> ObjectOn(const std::string& line) {
    try {
        Json object = ParseFlat(line);
        if (!object.is_object())
            return std::nullopt;
        object.erase("check");
        return CheckedLine(object) == line + "\n" ? std::optional(object) : std::nullopt;
    } catch (const Json::exception&) {
        return std::nullopt;
    } catch (const std::invalid_argument&) {
        return std::nullopt;
    }
}

} // namespace movieconv
