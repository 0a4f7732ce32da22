// The settings of a conversion as JSON, there and back.
#ifndef MOVIECONV_HOST_PIECES_SETTINGSTEXT_H
#define MOVIECONV_HOST_PIECES_SETTINGSTEXT_H

#include "host/convert/Request.h"

#include <nlohmann/json.hpp>

namespace movieconv {

using Json = nlohmann::ordered_json;

/// Everything that decides what is in the output, but for the names.
Json SettingsAsJson(const Request& request);

/// Throws nlohmann::json::exception or std::invalid_argument when it is not such an object.
Request SettingsFromJson(const Json& json);

} // namespace movieconv

#endif
