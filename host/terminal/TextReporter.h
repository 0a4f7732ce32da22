// Reports for people: a live line on a terminal, plain lines elsewhere.
#ifndef MOVIECONV_HOST_TERMINAL_TEXTREPORTER_H
#define MOVIECONV_HOST_TERMINAL_TEXTREPORTER_H

#include "host/terminal/Reporter.h"

#include <string>

namespace movieconv {

/// Errors only, on standard error.
class QuietReporter : public Reporter {
public:
    explicit QuietReporter(const StandardStreams& streams) : streams_(streams) {}
    void Warned(const Warning& news) override; ///< A movie's failure is an error, among others, too.
    void Error(const std::string& text) override;

protected:
    const StandardStreams& Streams() const { return streams_; }

private:
    const StandardStreams& streams_;
};

/// Warnings and the closing sentence too; what --progress none asks for.
class SparseReporter : public QuietReporter {
public:
    using QuietReporter::QuietReporter;
    void Warn(const std::string& text, const std::string& input) override;
    void LeftBehind(const NotCarried& report) override;
    void End(const EndReport& report) override;
};

/// Plain lines, one every few seconds.
class LineReporter : public SparseReporter {
public:
    using SparseReporter::SparseReporter;
    void Started(const Start& report) override;
    void Progressed(const Progress& report) override;
    void Closed(const ClosedFile& report) override;

private:
    double nextAt_ = 0; // seconds of work
};

/// One line that is drawn again and again.
class BarReporter : public LineReporter {
public:
    BarReporter(const StandardStreams& streams, bool colour) : LineReporter(streams), colour_(colour) {}
    void Progressed(const Progress& report) override;
    void Closed(const ClosedFile& report) override;
    void Warn(const std::string& text, const std::string& input) override;
    void Error(const std::string& text) override;
    void End(const EndReport& report) override;
    void LeaveLine() override;

private:
    void EraseLine();

    const bool colour_;
    bool drawn_ = false;
};

/// The figures of one progress line, at most `columns` wide: what does not fit is left out from the right.
std::string ProgressText(const Progress& report, int columns);

} // namespace movieconv

#endif
