// What was converted into a folder: by its lines it is known what need not be converted again.
#ifndef MOVIECONV_HOST_PIECES_BATCHJOURNAL_H
#define MOVIECONV_HOST_PIECES_BATCHJOURNAL_H

#include "host/pieces/JsonName.h"
#include "host/pieces/SourceMark.h"

#include <map>
#include <mutex>
#include <optional>
#include <string>

namespace movieconv {

/// One file that only grows, a JSON object a line, each with a check of its own. All functions may be called
/// on any thread.
class BatchJournal {
public:
    enum class State {
        kUnknown, ///< Nothing is known of the output.
        kBegun,   ///< What stands there was begun from this source with these settings; no more is known.
        kDone,    ///< It was made of this source with these settings, and still stands there.
    };

    /// Reads what is there. Throws Failure when it cannot be read, or is something else.
    explicit BatchJournal(const std::string& folder);

    /// Lines that were cut, edited or are of something else.
    int Damaged() const { return damaged_; }

    /// `settings` is what SettingsAsJson gives, as text.
    State StateOf(const std::string& output, const SourceMark& source, const std::string& settings) const;

    /// What a run that broke off left of the output, under a temporary name; nothing when there is none.
    std::optional<std::string> Unfinished(const std::string& output) const;

    /// Both throw Failure when the line cannot be written. `temporary` is the output's name until it is
    /// complete: what stands under its own name later may be somebody else's.
    void NoteBegun(const std::string& output, const SourceMark& source, const std::string& settings,
                   const std::string& temporary);
    void NoteDone(const std::string& output, const SourceMark& source, const std::string& settings);

private:
    struct Entry {
        bool done = false;
        std::string task;           ///< Hash of source and settings.
        std::string result;         ///< Hash of the output's mark when it is done, before that its BirthOf.
        std::string temporary = {}; ///< The name of what is not done.
    };

    void Read(const std::string& text);
    bool Enter(const std::optional<Json>& line);
    void Note(const std::string& output, const Entry& entry);

    const std::string path_;
    mutable std::mutex mutex_;
    std::map<std::string, Entry> entries_; // by the output's name
    int damaged_ = 0;
};

} // namespace movieconv

#endif
