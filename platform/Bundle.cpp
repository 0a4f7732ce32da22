#include "platform/BundleUrl.h"
#include "platform/Platform.h"

#include <cstring>
#include <filesystem>
#include <new>
#include <string>
#include <system_error>

struct OpaqueCFString {
    std::string text;
};

struct OpaqueCFURL {
    OpaqueCFString string;
};

struct OpaqueCFBundle {
    std::string url;
};

CFBundleRef CFBundleGetMainBundle() {
    // Never freed: workers may still log while the process ends.
    static OpaqueCFBundle* const bundle = []() -> OpaqueCFBundle* {
        try {
            std::error_code error;
            const auto executable = std::filesystem::read_symlink("/proc/self/exe", error);
            return error ? nullptr : new OpaqueCFBundle{BundleUrl(executable.native())};
        } catch (const std::bad_alloc&) {
            return nullptr;
        }
    }();
    return bundle;
}

CFURLRef CFBundleCopyBundleURL(CFBundleRef bundle) {
    if (!bundle)
        return nullptr;
    try {
        return new OpaqueCFURL{{bundle->url}};
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

CFStringRef CFURLGetString(CFURLRef url) {
    return url ? &url->string : nullptr;
}

Boolean CFStringGetCString(CFStringRef string, char* buffer, CFIndex bufferSize, CFStringEncoding encoding) {
    if (!buffer || bufferSize <= 0)
        return 0;
    buffer[0] = '\0';
    if (!string || encoding != kCFStringEncodingUTF8 ||
        string->text.size() >= static_cast<std::size_t>(bufferSize))
        return 0;
    std::memcpy(buffer, string->text.c_str(), string->text.size() + 1);
    return 1;
}

void CFRelease(CFTypeRef object) {
    // A URL has one owner, the one that copied it; there is nothing to count.
    if (object != CFBundleGetMainBundle())
        delete static_cast<const OpaqueCFURL*>(object);
}
