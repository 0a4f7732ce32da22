// Where a program's bundle lies.
#ifndef MOVIECONV_PLATFORM_BUNDLEURL_H
#define MOVIECONV_PLATFORM_BUNDLEURL_H

#include <string>
#include <string_view>

/// The URL of the bundle of the program at the absolute path `executable`, as CFBundleCopyBundleURL gives it.
std::string BundleUrl(std::string_view executable);

#endif
