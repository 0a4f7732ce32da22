// Keeps the program's standard output to itself: the engine prints lines of its own there, which go to the
// log instead.
#ifndef MOVIECONV_HOST_TERMINAL_STANDARDSTREAMS_H
#define MOVIECONV_HOST_TERMINAL_STANDARDSTREAMS_H

#include <optional>
#include <string>
#include <string_view>

namespace movieconv {

/// Makes descriptor 1 the log file, or nothing without one, sends the log sink's and FFmpeg's lines the same
/// way, and keeps the real standard output for Print. Throws Failure when the log file cannot be opened or
/// must not be written to: a symbolic link, what is no file, and without `overwrite` a file that is no log.
class StandardStreams {
public:
    StandardStreams(const std::optional<std::string>& logFile, bool overwrite);
    StandardStreams(const StandardStreams&) = delete;
    StandardStreams& operator=(const StandardStreams&) = delete;

    /// Writes to the real standard output at once. What a reader that is gone does not take is dropped;
    /// false, with errno set, when the text is lost for another reason.
    bool Print(std::string_view text) const { return Write(output_, text); }

    /// Likewise, for what is told besides: a loss is told once on standard error, and nothing is written
    /// after it, lest it be taken for the end of a line that was cut.
    void Report(std::string_view text) const;

    /// Reports a line, which is given without its end; what terminals obey in it is made visible.
    void ReportLine(std::string_view line) const;

    /// Writes a line to standard error, likewise.
    void PrintError(std::string_view line) const;

    bool OutputIsTerminal() const;

    /// Columns of the terminal; 80 when it does not tell.
    int Columns() const;

private:
    static int OpenLog(const std::string& path, bool overwrite);
    static bool Write(int descriptor, std::string_view text);

    int output_;
    mutable bool lost_ = false;
};

} // namespace movieconv

#endif
