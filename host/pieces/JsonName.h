// Names of files in JSON, which takes UTF-8 only: names are bytes; and sizes.
#ifndef MOVIECONV_HOST_PIECES_JSONNAME_H
#define MOVIECONV_HOST_PIECES_JSONNAME_H

#include <cstdint>
#include <nlohmann/json.hpp>
#include <string>

namespace movieconv {

using Json = nlohmann::ordered_json;

/// As it stands when it is UTF-8, else {"hex": its bytes}.
Json NameAsJson(const std::string& name);

/// Throws Json::exception or std::invalid_argument when it is no such value.
std::string NameFromJson(const Json& json);

/// A path that names one place, without going back on its way; throws as well.
std::string PathFromJson(const Json& json);

/// The member of that name, 0 or more; throws as well.
int64_t Natural(const Json& json, const char* name);

} // namespace movieconv

#endif
