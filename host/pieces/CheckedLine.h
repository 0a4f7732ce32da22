// The lines of a journal: a JSON object each, with a check of what it says.
#ifndef MOVIECONV_HOST_PIECES_CHECKEDLINE_H
#define MOVIECONV_HOST_PIECES_CHECKEDLINE_H

#include "host/pieces/SettingsText.h"

#include <optional>
#include <string>

namespace movieconv {

/// Throws Json::exception when it is no JSON, and std::invalid_argument when it is nested deeper than
/// anything that is written here: who copies or prints such a value may run out of stack.
Json ParseFlat(const std::string& text);

/// The line of an object that has no "check", with its end.
std::string CheckedLine(Json object);

/// The object on a line, which is given without its end; nothing when the line was cut or edited.
std::optional<Json> ObjectOn(const std::string& line);

} // namespace movieconv

#endif
