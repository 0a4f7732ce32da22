#include "engine/WriterCalls.h"

#include <dlfcn.h>

namespace {

/// Where the object that holds `address` is loaded; null when there is none.
void* ObjectOf(void* address) {
    Dl_info info{};
    return address && dladdr(address, &info) != 0 ? info.dli_fbase : nullptr;
}

/// Fills `function` with the writer's function of that name. One of another object is another writer's.
template <class Function>
void LookUp(void* writer, const char* name, Function& function) {
    void* const address = dlsym(RTLD_DEFAULT, name);
    if (writer && ObjectOf(address) == writer)
        function = reinterpret_cast<Function>(address);
}

WriterCalls LookUpAll() {
    void* const writer = ObjectOf(dlsym(RTLD_DEFAULT, "MWCreateMediaFile"));
    WriterCalls calls;
    LookUp(writer, "MWGetVersion", calls.getVersion);
    LookUp(writer, "MWForwardLog", calls.forwardLog);
    LookUp(writer, "MWGetThreadFileStatus", calls.getThreadFileStatus);
    return calls;
}

} // namespace

const WriterCalls& Writer() {
    static const WriterCalls calls = LookUpAll();
    return calls;
}
