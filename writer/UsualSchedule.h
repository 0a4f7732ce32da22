// Threads as the system schedules them usually, whatever an encoder would make of them.
#ifndef MOVIECONV_WRITER_USUALSCHEDULE_H
#define MOVIECONV_WRITER_USUALSCHEDULE_H

#include <sched.h>
#include <set>
#include <sys/types.h>

namespace writer {

/// Takes back what is done to the scheduling of the thread that made it, and gives the threads that are made
/// while it lives the same. SVT-AV1, when root opens it, makes its own threads and the caller real-time ones,
/// and so all that the caller makes from then on; one of them that spins starves those that it waits for.
class UsualSchedule {
public:
    UsualSchedule();
    ~UsualSchedule();
    UsualSchedule(const UsualSchedule&) = delete;
    UsualSchedule& operator=(const UsualSchedule&) = delete;

private:
    const int policy_;
    sched_param parameters_{};
    std::set<pid_t> before_; // the process's threads
};

} // namespace writer

#endif
