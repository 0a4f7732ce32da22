#include "writer/FileSystem.h"

#include "text/FileNames.h"
#include "text/LastingFile.h"
#include "text/Path.h"
#include "text/Utf8.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <new>
#include <utility>

#include <fcntl.h>
#include <libgen.h>
#include <sys/stat.h>
#include <unistd.h>

namespace writer {
namespace {

/// Calls again what a signal has interrupted; the result, or the negated errno.
template <typename Call>
int64_t Retry(Call call) {
    int64_t result;
    do {
        result = call();
    } while (result < 0 && errno == EINTR);
    return result < 0 ? -errno : result;
}

class PosixFile final : public ByteFile {
public:
    PosixFile() = default;
    ~PosixFile() override {
        if (descriptor_ >= 0)
            close(descriptor_);
    }

    /// 0, or an errno value.
    int Create(const std::string& path, const std::string& like) {
        struct stat model {};
        const bool modelled = stat(like.c_str(), &model) == 0 && S_ISREG(model.st_mode);
        const mode_t mode = modelled ? model.st_mode & 0777 : 0666;
        const int64_t result =
            Retry([&] { return open(path.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, mode); });
        descriptor_ = static_cast<int>(result);
        if (result >= 0 && modelled)
            Resemble(model);
        return result < 0 ? static_cast<int>(-result) : 0;
    }

    int64_t Write(const uint8_t* data, int64_t size) override {
        const int64_t result = Retry([&] { return write(descriptor_, data, static_cast<size_t>(size)); });
        unsent_ += std::max<int64_t>(result, 0);
        if (unsent_ >= kMostUnsent)
            Send();
        return result;
    }
    int64_t Read(uint8_t* data, int64_t size) override {
        return Retry([&] { return read(descriptor_, data, static_cast<size_t>(size)); });
    }
    int64_t Seek(int64_t offset, int whence) override {
        return Retry([&] { return lseek(descriptor_, offset, whence); });
    }
    int64_t Truncate(int64_t size) override {
        return Retry([&] { return ftruncate(descriptor_, size); });
    }
    int64_t Sync() override {
        return Retry([&] { return fsync(descriptor_); });
    }

private:
    /// Gigabytes that the system has kept from the disk would make the sync at the end of a large file last.
    static constexpr int64_t kMostUnsent = 16 << 20;

    /// Makes what was written go to the disk from now on, without waiting for it. An error is the sync's to
    /// tell.
    void Send() {
        unsent_ = 0;
        sync_file_range(descriptor_, 0, 0, SYNC_FILE_RANGE_WRITE);
    }

    /// Who may not give a file away still gives it the group where he is in it. What a group may do is not
    /// granted to another one.
    void Resemble(const struct stat& model) const {
        struct stat own {};
        if (fchown(descriptor_, model.st_uid, model.st_gid) != 0 &&
            fchown(descriptor_, static_cast<uid_t>(-1), model.st_gid) != 0)
            errno = 0;
        const bool sameGroup = fstat(descriptor_, &own) == 0 && own.st_gid == model.st_gid;
        fchmod(descriptor_, model.st_mode & (sameGroup ? 0777 : 0707));
    }

    int descriptor_ = -1;
    int64_t unsent_ = 0; // bytes written since the last Send
};

class PosixFiles final : public FileSystem {
public:
    std::unique_ptr<ByteFile> Create(const std::string& path, const std::string& like, int& error) override {
        auto file = std::make_unique<PosixFile>(); // first: without memory nothing must be left on the disk
        error = file->Create(path, like);
        return error != 0 ? nullptr : std::move(file);
    }

    int Rename(const std::string& from, const std::string& to, bool replace) override {
        if (replace)
            return rename(from.c_str(), to.c_str()) == 0 ? 0 : errno;
        return text::RenameToMissing(from, to);
    }

    int Remove(const std::string& path) override { return unlink(path.c_str()) == 0 ? 0 : errno; }

    bool IsMissing(const std::string& path) override {
        return access(path.c_str(), F_OK) != 0 && (errno == ENOENT || errno == ENOTDIR);
    }

    int SyncFolder(const std::string& path) override {
        std::array<char, PATH_MAX> folder; // no memory is wanted where the file has its name already
        std::snprintf(folder.data(), folder.size(), "%s", path.c_str());
        const int descriptor = open(dirname(folder.data()), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
        if (descriptor < 0)
            return errno;
        const int error = fsync(descriptor) == 0 ? 0 : errno;
        close(descriptor);
        // Some file systems cannot sync a folder; there is nothing more that one could do.
        return error == EINVAL ? 0 : error;
    }
};

} // namespace

FileSystem& SystemFiles() {
    static PosixFiles files;
    return files;
}

int CheckTarget(const std::string& path) {
    struct stat status {};
    if (stat(path.c_str(), &status) != 0)
        return 0;
    if (S_ISREG(status.st_mode))
        return EEXIST;
    return S_ISDIR(status.st_mode) ? EISDIR : EINVAL;
}

std::string ResolveTarget(const std::string& path) {
    const std::unique_ptr<char, decltype(&std::free)> real(realpath(path.c_str(), nullptr), &std::free);
    if (!real && errno == ENOMEM)
        throw std::bad_alloc();
    return real ? std::string(real.get()) : path;
}

std::unique_ptr<ByteFile> CreateBeside(FileSystem& files, const std::string& target, std::string& path,
                                       int& error) {
    struct stat status {};
    if (lstat(target.c_str(), &status) != 0 && errno == ENAMETOOLONG) { // its temporary name would fit
        error = ENAMETOOLONG;
        return nullptr;
    }
    const std::string name = text::NameOf(target);
    const std::string folder = target.substr(0, target.size() - name.size());
    const long told = pathconf(text::FolderOf(target).c_str(), _PC_NAME_MAX);
    // Some file systems count characters and tell the most bytes that those may have.
    const size_t longest = told > 0 ? std::min<size_t>(static_cast<size_t>(told), NAME_MAX) : NAME_MAX;
    for (int number = 1; number <= text::kMostPartials; ++number) {
        const std::string tail = text::PartialSuffix(number);
        path = folder;
        path.append(text::CutTo(longest - tail.size(), name)).append(tail);
        std::unique_ptr<ByteFile> file = files.Create(path, target, error);
        if (file || error != EEXIST)
            return file;
    }
    return nullptr;
}

} // namespace writer
