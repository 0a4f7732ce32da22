#include "platform/LogRoute.h"

#include "text/Utf8.h"

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <exception>
#include <memory>
#include <mutex>
#include <new>
#include <string>
#include <string_view>

namespace {

/// A function that lines go to, and its calls in progress.
struct Target {
    LogRouteFunction function;
    void* user;
    int running = 0; // guarded by the route's mutex
};

/// The target that is set. It is called with nothing locked, so that it may log and take locks of its own.
class Route {
public:
    bool Set(LogRouteFunction function, void* user) {
        std::shared_ptr<Target> target;
        try {
            if (function)
                target = std::make_shared<Target>(Target{function, user});
        } catch (const std::bad_alloc&) {
            return false;
        }
        std::unique_lock lock(mutex_);
        target_.swap(target);
        set_.store(function != nullptr, std::memory_order_relaxed);
        if (target && t_depth == 0) // inside a call nobody may wait for that call's end
            idle_.wait(lock, [&target] { return target->running == 0; });
        return true;
    }

    bool IsSet() const { return set_.load(std::memory_order_relaxed); }

    bool Call(int level, const char* line) {
        std::unique_lock lock(mutex_);
        const std::shared_ptr<Target> target = target_;
        if (!target)
            return false;
        ++target->running;
        ++t_depth;
        lock.unlock();
        target->function(target->user, level, line);
        lock.lock();
        --t_depth;
        --target->running;
        idle_.notify_all();
        return true;
    }

private:
    std::mutex mutex_;
    std::condition_variable idle_;
    std::shared_ptr<Target> target_;
    std::atomic<bool> set_{false};
    static thread_local int t_depth; // calls that this thread is in
};

thread_local int Route::t_depth = 0;

/// Never destroyed: threads may log while the process ends.
Route& TheRoute() {
    alignas(Route) static std::byte place[sizeof(Route)];
    static auto* const route = new (place) Route;
    return *route;
}

/// A line as functions are given it: no line end, nothing that is not UTF-8.
std::string Cleaned(std::wstring_view line) {
    while (!line.empty() && (line.back() == L'\r' || line.back() == L'\n'))
        line.remove_suffix(1);
    std::wstring text(line);
    std::replace_if(
        text.begin(), text.end(), [](wchar_t c) { return c == L'\r' || c == L'\n'; }, L' ');
    std::replace_if(
        text.begin(), text.end(), [](wchar_t c) { return c >= 0xD800 && c <= 0xDFFF; }, L'\uFFFD');
    return text::ToUtf8(text);
}

} // namespace

int LogRouteSet(LogRouteFunction function, void* user) {
    return TheRoute().Set(function, user) ? 1 : 0;
}

int LogRouteTake(int level, const wchar_t* line) {
    if (!TheRoute().IsSet() || !line)
        return 0;
    std::string text;
    try {
        text = Cleaned(line);
    } catch (const std::exception&) {
        text.assign("..."); // no memory for the line
    }
    return TheRoute().Call(level, text.c_str()) ? 1 : 0;
}

int LogRouteTakeUtf8(int level, const char* line) {
    if (!TheRoute().IsSet() || !line)
        return 0;
    try {
        return LogRouteTake(level, text::FromUtf8(line).c_str());
    } catch (const std::exception&) {
        return TheRoute().Call(level, "...") ? 1 : 0;
    }
}
