#include "platform/BundleUrl.h"
#include "platform/Platform.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>

namespace {

TEST(BundleUrl, Table) {
    struct {
        const char* executable;
        const char* url;
    } const cases[] = {
        {"/usr/local/bin/movieconv", "file://localhost/usr/local/bin/"},
        {"/movieconv", "file://localhost/"},
        {"/Applications/My App.app/Contents/MacOS/My App", "file://localhost/Applications/My%20App.app/"},
        {"/X.app/Contents/x", "file://localhost/X.app/Contents/"},
        {"/X/Contents/MacOS/x", "file://localhost/X/Contents/MacOS/"},
        {"/.app/Contents/MacOS/x", "file://localhost/.app/Contents/MacOS/"},
        {"/Contents/MacOS/x", "file://localhost/Contents/MacOS/"},
        {"/a.app/SubContents/MacOS/x", "file://localhost/a.app/SubContents/MacOS/"},
        {"/50%20#?[]\"<>\\^`{|}/x", "file://localhost/50%2520%23%3F%5B%5D%22%3C%3E%5C%5E%60%7B%7C%7D/"},
        {"/-._~!$&'()*+,;=:@/x", "file://localhost/-._~!$&'()*+,;=:@/"},
        {"/\xC3\xA9\x01\x7F\xFF/x", "file://localhost/%C3%A9%01%7F%FF/"},
    };
    for (const auto& [executable, url] : cases)
        EXPECT_EQ(BundleUrl(executable), url) << executable;
}

TEST(Bundle, IsTheDirectoryOfTheRunningProgram) {
    const CFBundleRef bundle = CFBundleGetMainBundle();
    ASSERT_NE(bundle, nullptr);
    EXPECT_EQ(CFBundleGetMainBundle(), bundle);
    CFRelease(bundle); // borrowed, so it stays
    const CFURLRef url = CFBundleCopyBundleURL(bundle);
    ASSERT_NE(url, nullptr);
    const CFStringRef string = CFURLGetString(url);
    const std::string whole = BundleUrl(std::filesystem::read_symlink("/proc/self/exe").native());
    const auto length = static_cast<CFIndex>(whole.size());

    // The text is taken only where it fits.
    std::string buffer(whole.size() + 1, '#');
    EXPECT_FALSE(CFStringGetCString(string, buffer.data(), length, kCFStringEncodingUTF8));
    EXPECT_EQ(buffer, '\0' + std::string(whole.size(), '#'));
    EXPECT_TRUE(CFStringGetCString(string, buffer.data(), length + 1, kCFStringEncodingUTF8));
    EXPECT_EQ(buffer.c_str(), whole);

    EXPECT_FALSE(CFStringGetCString(string, buffer.data(), length + 1, 0x0600));
    EXPECT_FALSE(CFStringGetCString(string, buffer.data(), 0, kCFStringEncodingUTF8));
    EXPECT_FALSE(CFStringGetCString(string, nullptr, 10, kCFStringEncodingUTF8));
    CFRelease(url);

    EXPECT_EQ(CFBundleCopyBundleURL(nullptr), nullptr);
    EXPECT_EQ(CFURLGetString(nullptr), nullptr);
    EXPECT_FALSE(CFStringGetCString(nullptr, buffer.data(), length + 1, kCFStringEncodingUTF8));
    CFRelease(nullptr);
}

} // namespace
