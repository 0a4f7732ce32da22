#include "platform/BundleUrl.h"

namespace {

bool EndsWith(std::string_view text, std::string_view end) {
    return text.size() >= end.size() && text.substr(text.size() - end.size()) == end;
}

/// The directory, with its "/", that counts as the bundle.
std::string_view BundleDirectory(std::string_view executable) {
    const std::string_view directory = executable.substr(0, executable.rfind('/') + 1);
    constexpr std::string_view kInner = "Contents/MacOS/";
    if (!EndsWith(directory, kInner))
        return directory;
    const std::string_view enclosing = directory.substr(0, directory.size() - kInner.size());
    return EndsWith(enclosing, ".app/") && !EndsWith(enclosing, "/.app/") ? enclosing : directory;
}

/// What the path of a URL holds as it stands; everything else is percent-encoded, bytes above 127 included.
bool StandsForItself(char byte) {
    return (byte >= '0' && byte <= '9') || (byte >= 'A' && byte <= 'Z') || (byte >= 'a' && byte <= 'z') ||
           std::string_view("/-._~!$&'()*+,;=:@").find(byte) != std::string_view::npos;
}

} // namespace

std::string BundleUrl(std::string_view executable) {
    constexpr char kDigits[] = "0123456789ABCDEF";
    std::string url = "file://localhost";
    for (const char byte : BundleDirectory(executable)) {
        if (StandsForItself(byte)) {
            url += byte;
        } else {
            const auto value = static_cast<unsigned char>(byte);
            url += {'%', kDigits[value >> 4], kDigits[value & 15]};
        }
    }
    return url;
}
