// The converter: two decoders, the parameters of one output, and the worker thread that converts.
#ifndef MOVIECONV_ENGINE_CONVTHREAD_H
#define MOVIECONV_ENGINE_CONVTHREAD_H

#include "engine/ResultBook.h"
#include "engine/SourceDecoders.h"
#include "media/Decoders.h"
#include "media/EncodeParam.h"
#include "media/ProgressCallback.h"
#include "platform/Window.h"
#include "thread/BaseThread.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include <pthread.h>

/// Characters of a clip name, its terminator included.
constexpr int kClipNameSize = 512;

/// The object behind a converter handle; api/MovieConv.h says how it is used.
///
/// Every public operation belongs to the host's thread. Pause, Resume, Abort, Stop, Wait, EnablePreview and
/// the queries may be called from any thread while the worker runs; the setters and Start want a converter
/// that does not run.
class ConvThread : public BaseThread {
protected:
    int svc() override;

public:
    /// Takes the output's picture size, frame rate, sample rate and channels from the sources. The decoders
    /// stay the caller's and must outlive the converter; either may be null. Throws std::bad_alloc.
    ConvThread(VideoDecoder* video, AudioDecoder* audio);
    virtual ~ConvThread();

    /// The converter over a host's tables; either may be null. Null, with a line in the log, when one makes
    /// no sense or its source cannot be described. Throws std::bad_alloc.
    static std::unique_ptr<ConvThread> FromSources(const MCVideoSource* video, const MCAudioSource* audio);

    int SetEncodeParam(const EncodeParam* param);
    int GetEncodeParam(EncodeParam* out) const;
    int SetOutputFile(const wchar_t* path);
    int SetSplitParam(int mode, unsigned long value);
    unsigned EnablePreview(unsigned enable);
    unsigned EnableEvents(unsigned enable);

    int Start(double begin, double length, OpaqueWindowPtr* window, ProgressCallback callback, void* context);
    int Pause();
    int Resume();
    int Stop(unsigned, unsigned);
    int Abort(unsigned, unsigned);

    int GetResult(MCResult* out) const;
    unsigned EnableStopOnFailure(unsigned enable);

    int GetTargetCount() const;
    int GetTargetFileName(wchar_t* buffer, int index) const;
    long long GetEstimateDiskSpace() const;
    static long long GetDiskFreeSpace(const wchar_t* path);

private:
    // What the three loops share, and each loop's own values; see Conversion.h.
    class Conversion;
    class AudioVideoLoop;
    class AudioLoop;
    class VideoLoop;

    // The loops' bodies. The results carry no meaning beyond the last notification's.
    int process();
    int process_audio_only();
    int process_video_only();

    /// Runs the loop that fits the streams.
    void Dispatch();

    /// Switches the decoder's stream off, for this and every later run; an empty decoder is forgotten.
    template <class Decoder>
    void Drop(Decoder*& decoder, int32_t& bNoStream);

    /// Makes and records the name of the next clip. Null, with a log line, when no such name can be made.
    wchar_t* CreateNewClip();

    VideoDecoder* pVideoDecoder;
    AudioDecoder* pAudioDecoder;
    EncodeParam encodeParam;
    std::wstring strOutputFile;
    OpaqueWindowPtr* hProgressWnd = nullptr;
    ProgressCallback pfnProgress = nullptr;
    void* pProgressContext = nullptr;
    std::atomic<uint32_t> bPreview{1};
    double dBeginTime = 0.0;                          // seconds
    double dLength = -1.0;                            // seconds, as asked for
    double dConvLength = 0.0;                         // seconds that there are to convert
    pthread_mutex_t lock = PTHREAD_MUTEX_INITIALIZER; // serialises Stop
    int32_t nSplitMode = 0;                           // 1 splits the output into clips
    uint32_t nSplitValue = 0;                         // milliseconds of a clip
    std::vector<std::unique_ptr<wchar_t[]>> vecTargetNames;

    // Guards what the worker changes and the host may read meanwhile: the clip names, the decoder pointers
    // and the parameters. The worker is the only one to write them while it runs, so its own reads do
    // without.
    mutable pthread_mutex_t sharedLock = PTHREAD_MUTEX_INITIALIZER;

    std::atomic<uint32_t> bEvents{1};
    std::atomic<uint32_t> bStopOnFailure{0};
    ResultBook results;
    std::unique_ptr<SourceVideo> ownVideo; // of a converter from tables
    std::unique_ptr<SourceAudio> ownAudio;
};

#endif
