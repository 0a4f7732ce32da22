// Which clips of an output are finished: by its lines a run that broke off can be gone on with.
#ifndef MOVIECONV_HOST_PIECES_CLIPJOURNAL_H
#define MOVIECONV_HOST_PIECES_CLIPJOURNAL_H

#include "host/convert/Request.h"
#include "host/pieces/SettingsText.h"

#include <cstdint>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace movieconv {

/// A file beside the output that only grows: what is converted and how, then a line for each clip, each with
/// a check of its own.
class ClipJournal {
public:
    /// `request` is a conversion into clips.
    explicit ClipJournal(const Request& request);

    const std::string& Path() const { return path_; }
    bool Exists() const;

    /// Throws Failure when something else stands in the journal's place.
    void RequirePlace() const;

    /// Whether it can be told later that the source is still the same: not of pipes and playlists.
    bool IsPossible() const;

    /// The clip to go on with: the first one that is not known to be finished. Nothing without a journal.
    /// Throws Failure when it is of another conversion, when a finished clip was changed since and may not be
    /// replaced, or when it cannot be read.
    std::optional<ClipStart> Leftover();

    /// Writes what is to be gone on with, or begins anew; `opened` is BirthOf the first clip to come. Throws
    /// Failure, as NoteFinished does.
    void Begin(const std::string& opened);

    /// Whether a clip that stands there is of the run that Leftover found, which listed it further on or was
    /// just completing it, and not somebody else's.
    bool IsOurs(const std::string& clip) const;

    /// Whether any such clip is there, of this run or the one that Leftover found.
    bool HasClips() const;

    /// The clip before `next` is finished, in that file; `opened` is BirthOf the next one. Lastingly.
    void NoteFinished(const std::string& clip, ClipStart next, const std::string& opened);

    /// With what a kill left in the making.
    void Remove() const;

private:
    struct Entry {
        std::string clip; ///< Its name.
        Json mark;
        ClipStart next;
        std::string opened; ///< BirthOf the clip behind it, which was being written then.
    };

    std::string Header() const;
    static std::optional<Entry> EntryOn(const std::string& line);
    bool IsFinished(const Entry& entry) const;

    const Request request_;
    const std::string path_;
    // Of the journal that was found:
    std::string kept_;             // the lines up to the clip to go on with
    int next_ = 0;                 // its number
    std::vector<Entry> further_;   // what else it lists
    std::set<std::string> births_; // of clips that were being written
};

} // namespace movieconv

#endif
