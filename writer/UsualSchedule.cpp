#include "writer/UsualSchedule.h"

#include <cstdlib>
#include <dirent.h>
#include <memory>

namespace writer {
namespace {

struct FolderClose {
    void operator()(DIR* folder) const { closedir(folder); }
};

/// Calls `see` for the threads of the process, as far as the system tells them.
template <class See>
void ForEachThread(const See& see) {
    const std::unique_ptr<DIR, FolderClose> folder(opendir("/proc/self/task"));
    if (!folder)
        return;
    while (const dirent* entry = readdir(folder.get()))
        if (const pid_t thread = std::atoi(entry->d_name); thread > 0)
            see(thread);
}

} // namespace

UsualSchedule::UsualSchedule() : policy_(sched_getscheduler(0)) {
    sched_getparam(0, &parameters_);
    ForEachThread([this](pid_t thread) { before_.insert(thread); });
}

UsualSchedule::~UsualSchedule() {
    if (sched_getscheduler(0) == policy_)
        return;
    sched_setscheduler(0, policy_, &parameters_);
    ForEachThread([this](pid_t thread) {
        if (before_.count(thread) == 0)
            sched_setscheduler(thread, policy_, &parameters_);
    });
}

} // namespace writer
