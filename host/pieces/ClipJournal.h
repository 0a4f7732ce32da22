// Which clips of an output are finished: by its lines a run that broke off can be gone on with.
#ifndef MOVIECONV_HOST_PIECES_CLIPJOURNAL_H
#define MOVIECONV_HOST_PIECES_CLIPJOURNAL_H

#include "host/convert/Request.h"
#include "host/pieces/SettingsText.h"

#include <cstdint>
#include <optional>
#include <string>

namespace movieconv {

/// A file beside the output that only grows: what is converted and how, then a line for each clip, each with
/// a check of its own.
class ClipJournal {
public:
    /// `request` is a conversion into clips.
    explicit ClipJournal(const Request& request);

    const std::string& Path() const { return path_; }
    bool Exists() const;

    /// Whether it can be told later that the source is still the same: not of pipes and playlists.
    bool IsPossible() const;

    /// The clip to go on with: the first one that is not known to be finished. Nothing without a journal.
    /// Throws Failure when it is of another conversion, when a finished clip was changed since and may not be
    /// replaced, or when it cannot be read.
    std::optional<ClipStart> Leftover();

    /// Writes what is to be gone on with, or begins anew. Throws Failure, as NoteFinished does.
    void Begin();

    /// The clip before `next` is finished, in that file. Lastingly.
    void NoteFinished(const std::string& clip, ClipStart next);

    void Remove() const;

private:
    std::string Header() const;
    bool IsFinished(const Json& entry) const;

    const Request request_;
    const std::string path_;
    std::string kept_; // the lines of the journal that was found, up to the clip to go on with
};

} // namespace movieconv

#endif
