// How much of the program's work one thread does.
#ifndef MOVIECONV_HOST_SOURCE_PROCESSORUSE_H
#define MOVIECONV_HOST_SOURCE_PROCESSORUSE_H

#include <ctime>

namespace movieconv {

/// Counts from its construction, for the thread that constructs it and asks. CPU time only: what other
/// programs take from this one does not show.
class ProcessorUse {
public:
    /// How many processors the program would keep busy on average if this thread had never waited.
    double Processors() const {
        return Elapsed(CLOCK_PROCESS_CPUTIME_ID, program_) / Elapsed(CLOCK_THREAD_CPUTIME_ID, thread_);
    }

private:
    static double Seconds(clockid_t clock) {
        timespec time{};
        clock_gettime(clock, &time);
        return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) / 1e9;
    }
    static double Elapsed(clockid_t clock, double begin) { return Seconds(clock) - begin; }

    double program_ = Seconds(CLOCK_PROCESS_CPUTIME_ID);
    double thread_ = Seconds(CLOCK_THREAD_CPUTIME_ID);
};

} // namespace movieconv

#endif
