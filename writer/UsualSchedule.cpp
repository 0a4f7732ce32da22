#include "writer/UsualSchedule.h"

#include <cstdlib>
#include <filesystem>
#include <system_error>

namespace writer {
namespace {

/// None where the system does not tell.
std::set<pid_t> ThreadsOfTheProcess() {
    std::set<pid_t> threads;
    std::error_code error;
    for (std::filesystem::directory_iterator each("/proc/self/task", error), end; !error && each != end;
         each.increment(error))
        threads.insert(std::atoi(each->path().filename().c_str()));
    return threads;
}

} // namespace

UsualSchedule::UsualSchedule() : policy_(sched_getscheduler(0)), before_(ThreadsOfTheProcess()) {
    sched_getparam(0, &parameters_);
}

UsualSchedule::~UsualSchedule() {
    if (sched_getscheduler(0) == policy_)
        return;
    sched_setscheduler(0, policy_, &parameters_);
    for (const pid_t thread : ThreadsOfTheProcess())
        if (before_.count(thread) == 0)
            sched_setscheduler(thread, policy_, &parameters_);
}

} // namespace writer
