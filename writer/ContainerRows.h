// The file formats that can be written, one row each. Whoever looks for one asks the format table.
#ifndef MOVIECONV_WRITER_CONTAINERROWS_H
#define MOVIECONV_WRITER_CONTAINERROWS_H

#include "writer/FormatTable.h"

#include <span>

namespace writer {

std::span<const Container> Containers();
std::span<const Carriage> Carriages();

} // namespace writer

#endif
