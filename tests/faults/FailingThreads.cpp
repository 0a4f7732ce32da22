// In place of pthread_create: the start of the thread whose number MOVIECONV_FAILING_THREAD names, from 1,
// fails. To be preloaded.
#include <atomic>
#include <cerrno>
#include <cstdlib>

#include <dlfcn.h>
#include <pthread.h>

extern "C" __attribute__((visibility("default"))) int pthread_create(pthread_t* thread,
                                                                     const pthread_attr_t* attributes,
                                                                     void* (*body)(void*),
                                                                     void* argument) noexcept {
    static std::atomic<int> started{0};
    const char* failing = std::getenv("MOVIECONV_FAILING_THREAD");
    if (failing && ++started == std::atoi(failing))
        return EAGAIN;
    using Create = int (*)(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*);
    static const auto create = reinterpret_cast<Create>(dlsym(RTLD_NEXT, "pthread_create"));
    return create(thread, attributes, body, argument);
}
