#include "tests/log/ScriptedBundle.h"

#include "platform/Platform.h"

#include <cstring>

ScriptedBundle g_bundle;

CFBundleRef CFBundleGetMainBundle() {
    return g_bundle.missing == Missing::Bundle ? nullptr : reinterpret_cast<CFBundleRef>(&g_bundle);
}

CFURLRef CFBundleCopyBundleURL(CFBundleRef bundle) {
    if (g_bundle.missing == Missing::Url)
        return nullptr;
    ++g_bundle.urlsOut;
    return reinterpret_cast<CFURLRef>(bundle);
}

CFStringRef CFURLGetString(CFURLRef url) {
    return g_bundle.missing == Missing::String ? nullptr : reinterpret_cast<CFStringRef>(url);
}

Boolean CFStringGetCString(CFStringRef /*string*/, char* buffer, CFIndex bufferSize,
                           CFStringEncoding encoding) {
    // As the usual one does, it leaves what fits in the buffer when the text does not.
    if (encoding != kCFStringEncodingUTF8)
        return 0;
    std::strncpy(buffer, g_bundle.url.c_str(), static_cast<std::size_t>(bufferSize));
    return g_bundle.url.size() < static_cast<std::size_t>(bufferSize);
}

void CFRelease(CFTypeRef /*object*/) {
    --g_bundle.urlsOut;
}
