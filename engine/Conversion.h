// What the three conversion loops share.
#ifndef MOVIECONV_ENGINE_CONVERSION_H
#define MOVIECONV_ENGINE_CONVERSION_H

#include "engine/ConvThread.h"
#include "engine/ProgressInfo.h"

#include <string>

/// One conversion in progress, on the worker thread: its file, its position, its clock and its news to the
/// host. A loop derives from it, keeps its own values and puts the pieces in its own order.
class ConvThread::Conversion {
public:
    explicit Conversion(ConvThread& owner) : converter(owner) {}
    Conversion(const Conversion&) = delete;
    Conversion& operator=(const Conversion&) = delete;

    /// Tells the host that there is no conversion, and why; without an event where there never was one.
    int ReportFailure(int category, const char* what, bool event = true);

    /// The same for the exception being handled.
    int ReportException();

protected:
    /// Makes `fileName` the file that is written; false when it could not be created.
    bool CreateFile(const wchar_t* fileName);

    /// Creates the output file, or the first clip when the output is split.
    bool CreateFirstFile();

    /// Opens the next clip when the output is split and no file is open, whether or not the writer can create
    /// it. False only when there is no name for it.
    bool CreateDueClip();

    /// Raises a negative begin time to 0.
    double BeginTime();

    /// Starts measuring.
    void StartClock();

    /// True when the requested length, if there is one, has been converted.
    bool LengthReached() const;

    /// True when the current clip is as long as clips are to be.
    bool ClipFull() const;

    /// Closes the current clip; the next one begins at the current position.
    void CloseClip();

    /// The body of a loop; an exception of a decoder's ends it with kOutcomeFailed.
    template <class Body>
    unsigned Guarded(Body body) {
        try {
            return body();
        } catch (...) {
            NoteException();
            return kOutcomeFailed;
        }
    }

    /// Hands a picture, a block of sound to the writer, whether there is a file or not.
    void Send(const VideoImage& picture);
    void Send(const AudioFrame& block);

    /// True when the regular pace asks for a new estimate: every second during the first three, then every
    /// two.
    bool EstimateDue(uint32_t now) const;

    /// Tells the host how far the conversion is, with `preview` for display if it is not null. False when the
    /// host cancels. Only with a callback.
    bool NotifyProgress(uint32_t now, VideoImage* preview);

    /// Closes the file and tells the host that and how the conversion ended.
    int Finish(unsigned outcome, double doneLength);

    ConvThread& converter;
    const VideoFormat* pVideoFormat = nullptr; // null when no pictures are written
    const AudioFormat* pAudioFormat = nullptr; // null when no sound is written
    void* hFile = nullptr;                     // null between clips
    std::string filePath;                      // the current file's, UTF-8
    bool bFileEmpty = true;                    // nothing was sent into the current file
    int64_t nPicturesTaken = 0;                // of the current file
    int64_t nSamplesTaken = 0;                 // likewise
    double dPosition = 0.0;                    // seconds of the source converted
    double dClipStart = 0.0;                   // position at which the current clip began
    double dSpeed = 0.0;                       // estimate: source seconds per second
    double dRemaining = 0.0;                   // estimate: seconds still needed
    uint32_t tStart = 0;                       // ms
    uint32_t tLastEstimate = 0;                // ms

private:
    void CloseFile(ProgressCallback callback, void* context);
    void NoteException();
    void NoteFailure(int category, const char* what);
    unsigned CallBack(unsigned kind, unsigned value, const ProgressInfo* info);
    ProgressInfo MakeProgressInfo(int32_t nProgress, uint32_t elapsed) const;
    int Post(unsigned wParam, unsigned lParam) const;
    int NotifyFinished(unsigned outcome, ProgressInfo* info, bool event);
};

#endif
