// The names of what a conversion writes for itself beside its output.
#ifndef MOVIECONV_HOST_PIECES_OUTPUTNAMES_H
#define MOVIECONV_HOST_PIECES_OUTPUTNAMES_H

#include "host/convert/Request.h"

#include <optional>
#include <string>

namespace movieconv {

/// The plan of an output that is made in pieces.
std::string PlanPathFor(const std::string& output);

/// What keeps others from working on a plan.
std::string LockPathFor(const std::string& planPath);

/// The place of a piece, beside its plan.
std::string PiecePath(const std::string& planPath, int number);

/// The number of the piece whose name a file's begins with.
std::optional<int> NumberIn(const std::string& name, const std::string& planPath);

/// The list of an output's finished clips.
std::string ClipListFor(const std::string& output);

/// What was converted into a folder.
std::string JournalIn(const std::string& folder);

/// Whose files are meant; what is empty has none.
struct Written {
    Request request;      ///< Its output, or the clips of that.
    std::string planPath; ///< Of a conversion in pieces.
    std::string folder;   ///< For many movies.
};

/// What a file of that name is or becomes, such as "the output or a part of it"; null when nothing of these.
const char* RoleAmongOutputs(const std::string& path, const Written& written);

} // namespace movieconv

#endif
