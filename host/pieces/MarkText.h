// Marks of files as text.
#ifndef MOVIECONV_HOST_PIECES_MARKTEXT_H
#define MOVIECONV_HOST_PIECES_MARKTEXT_H

#include "host/pieces/JsonName.h"
#include "host/pieces/SourceMark.h"

#include <string>
#include <vector>

namespace movieconv {

Json MarkAsJson(const SourceMark& mark);
Json MarksAsJson(const std::vector<SourceMark>& marks);

/// Throws Json::exception or std::invalid_argument when it is no such object.
SourceMark MarkFromJson(const Json& json);

/// Stands for the mark in journals.
std::string HashOf(const SourceMark& mark);

} // namespace movieconv

#endif
