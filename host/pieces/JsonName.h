// Names of files in JSON, which takes UTF-8 only: names are bytes.
#ifndef MOVIECONV_HOST_PIECES_JSONNAME_H
#define MOVIECONV_HOST_PIECES_JSONNAME_H

#include <nlohmann/json.hpp>
#include <string>

namespace movieconv {

using Json = nlohmann::ordered_json;

/// As it stands when it is UTF-8, else {"hex": its bytes}.
Json NameAsJson(const std::string& name);

/// Throws Json::exception or std::invalid_argument when it is no such value.
std::string NameFromJson(const Json& json);

} // namespace movieconv

#endif
