// The settings of a conversion as JSON, there and back.
#ifndef MOVIECONV_HOST_PIECES_SETTINGSTEXT_H
#define MOVIECONV_HOST_PIECES_SETTINGSTEXT_H

#include "host/convert/Request.h"
#include "host/pieces/JsonName.h"

#include <string>
#include <vector>

namespace movieconv {

/// Everything that decides what is in the output, but for the names.
Json SettingsAsJson(const Request& request);

/// The same with what a plan has worked out already: everything that was asked for.
Json WishesAsJson(const Request& request);

/// What differs between two objects in these parts of them, which are objects themselves, in words; empty
/// when nothing does.
std::string DifferenceIn(const Json& before, const Json& now, const std::vector<std::string>& parts);

/// Throws nlohmann::json::exception or std::invalid_argument when it is not such an object.
Request SettingsFromJson(const Json& json);

} // namespace movieconv

#endif
