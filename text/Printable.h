// Text of others as it may be shown to people.
#ifndef MOVIECONV_TEXT_PRINTABLE_H
#define MOVIECONV_TEXT_PRINTABLE_H

#include <string>
#include <string_view>

namespace text {

/// Whether a terminal obeys the character instead of showing it, or shows its neighbours in another order for
/// it. A tab is none of these.
bool IsCommand(wchar_t character);

/// The text on one line, as it stands but for commands, line ends and bytes that are no UTF-8, which are
/// shown by their numbers: "\x1b", "\u202e".
std::string Printable(std::string_view bytes);

} // namespace text

#endif
