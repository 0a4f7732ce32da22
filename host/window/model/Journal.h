// The queue on the disk, so that it survives whatever ends the program.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_JOURNAL_H
#define MOVIECONV_HOST_WINDOW_MODEL_JOURNAL_H

#include "host/window/model/Entry.h"

#include <condition_variable>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <thread>
#include <vector>

namespace movieconv::window {

/// One JSON file that is replaced as a whole: whoever reads it finds the queue as it was at some moment.
/// Writing happens on a thread of its own, for a disk may take its time. It belongs to the program that loads
/// it first, for as long as that runs: another one neither reads nor writes it.
class Journal {
public:
    using OnFailure = std::function<void(const QString& sentence)>;

    /// `failed` hears, on the journal's thread, when the file cannot be written; once until it could again.
    Journal(std::string path, OnFailure failed);
    Journal(const Journal&) = delete;
    Journal& operator=(const Journal&) = delete;
    /// Writes what was kept last.
    ~Journal();

    /// The queue that was kept last; none when there is no file. A file that cannot be understood is set
    /// aside under another name, and `complaint` tells so, as well as that it belongs to another program.
    /// Before the first Keep.
    std::vector<Entry> Load(QString& complaint);

    /// Writes the entries, soon. Returns at once; of several calls in a row only the last may be written.
    void Keep(std::vector<Entry> entries);

    /// Waits until everything kept so far is on the disk or has failed.
    void Settle();

    /// Where the journal of a user belongs. Makes the folder.
    static std::string UsualPath();

private:
    bool IsOwn();
    void Run();
    void WriteAndTell(const std::vector<Entry>& entries);

    const std::string path_;
    const OnFailure failed_;
    std::optional<bool> own_; // nothing until it matters
    int lock_ = -1;
    bool failing_ = false; // the thread's
    std::mutex mutex_;
    std::condition_variable changed_;
    std::optional<std::vector<Entry>> next_;
    bool writing_ = false;
    bool ending_ = false;
    std::thread thread_;
};

} // namespace movieconv::window

#endif
