// What is told to programs: one JSON object a line, described in docs/progress-json.md.
#ifndef MOVIECONV_HOST_TERMINAL_JSONLINE_H
#define MOVIECONV_HOST_TERMINAL_JSONLINE_H

#include <nlohmann/json_fwd.hpp>
#include <string>
#include <string_view>

namespace movieconv {

/// An object of the stream with these fields, and the line's end. Bytes that are not UTF-8 become U+FFFD.
std::string JsonLine(std::string_view event, const nlohmann::ordered_json& fields);

/// The same JSON, with what terminals obey written as numbers. `json` has none of it but line ends outside of
/// its strings.
std::string EscapeCommands(std::string_view json);

} // namespace movieconv

#endif
