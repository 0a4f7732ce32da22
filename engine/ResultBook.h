// What becomes of a converter's conversion: written by the host's thread and the worker, read from anywhere.
#ifndef MOVIECONV_ENGINE_RESULTBOOK_H
#define MOVIECONV_ENGINE_RESULTBOOK_H

#include "engine/Result.h"
#include "thread/SingleLock.h"

#include <atomic>
#include <cstdint>
#include <cstdlib>

#include <pthread.h>

class ResultBook {
public:
    ResultBook() = default;
    ~ResultBook() { pthread_mutex_destroy(&lock); }
    ResultBook(const ResultBook&) = delete;
    ResultBook& operator=(const ResultBook&) = delete;

    /// A conversion begins.
    void Begin();

    /// Notes what is wrong, unless something was before. Both texts are UTF-8, and cut where they do not
    /// fit. Needs no memory.
    void Fail(int category, const char* what, const char* path = "", int systemError = 0);

    /// Notes how the conversion ended. Without a failure that decides what it was; one that completed must
    /// have sent pictures where `pictures` are wanted.
    void End(unsigned outcome, bool pictures);

    /// Counts a picture, samples of sound, sent to the media writer. The worker's alone, for every record:
    /// they need no lock. Who reads meanwhile sees each figure whole, but not all of them of one moment.
    void CountPicture(bool taken) {
        Raise(picturesSent, 1);
        Raise(picturesRefused, taken ? 0 : 1);
    }
    void CountSamples(int32_t samples, bool taken) {
        Raise(samplesSent, samples);
        Raise(samplesRefused, taken ? 0 : samples);
    }

    /// Counts a picture that was moved by `shift`, in 100 ns. Likewise.
    void CountRestamped(int64_t shift) {
        Raise(picturesRestamped, 1);
        if (std::abs(shift) > std::abs(largestShift.load(std::memory_order_relaxed)))
            largestShift.store(shift, std::memory_order_relaxed);
    }

    /// Changes other figures.
    template <class Change>
    void Update(Change change) {
        const CSingleLock guard(&lock);
        change(result);
    }

    /// Fills as much of the record as there is. False for one that is too small.
    bool Copy(MCResult* to) const;

private:
    using Count = std::atomic<int64_t>;

    static void Raise(Count& count, int64_t by) {
        count.store(count.load(std::memory_order_relaxed) + by, std::memory_order_relaxed);
    }

    void FailLocked(int category, const char* what, const char* path, int systemError);

    mutable pthread_mutex_t lock = PTHREAD_MUTEX_INITIALIZER;
    MCResult result{sizeof(MCResult), 0, MC_RESULT_NONE, -1, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, {}, {}};
    Count picturesSent{0};
    Count picturesRefused{0};
    Count samplesSent{0};
    Count samplesRefused{0};
    Count picturesRestamped{0};
    Count largestShift{0};
};

#endif
