// A file system that is soon full.
#ifndef MOVIECONV_TESTS_SUPPORT_SMALLDISK_H
#define MOVIECONV_TESTS_SUPPORT_SMALLDISK_H

#include <filesystem>
#include <string>
#include <sys/mount.h>

/// Usable only where the test may mount one.
class SmallDisk {
public:
    /// Mounts one of `size`, as "600k", in a new folder.
    SmallDisk(const std::string& path, const std::string& size) : path_(path) {
        std::filesystem::create_directory(path);
        mounted_ = mount("tmpfs", path.c_str(), "tmpfs", 0, ("size=" + size).c_str()) == 0;
    }
    ~SmallDisk() {
        if (mounted_)
            umount2(path_.c_str(), MNT_DETACH);
    }
    SmallDisk(const SmallDisk&) = delete;
    SmallDisk& operator=(const SmallDisk&) = delete;

    bool IsThere() const { return mounted_; }
    bool Grow() const { return mount(nullptr, path_.c_str(), nullptr, MS_REMOUNT, "size=60M") == 0; }

private:
    const std::string path_;
    bool mounted_ = false;
};

#endif
