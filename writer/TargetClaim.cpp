#include "writer/TargetClaim.h"

#include "text/Path.h"
#include "writer/WriterFailure.h"

#include <cerrno>
#include <mutex>
#include <set>

#include <sys/stat.h>

namespace writer {
namespace {

struct Claims {
    std::mutex mutex;
    std::set<std::string> keys;
};

/// Never destroyed: a file may be closed while the process ends.
Claims& TheClaims() {
    static auto* const claims = new Claims;
    return *claims;
}

/// The folder by what it is, the file by its name.
std::string KeyOf(const std::string& target) {
    struct stat folder {};
    if (stat(text::FolderOf(target).c_str(), &folder) != 0)
        return target; // which cannot be created
    return std::to_string(folder.st_dev) + ":" + std::to_string(folder.st_ino) + "/" + text::NameOf(target);
}

} // namespace

TargetClaim::TargetClaim(const std::string& target) : key_(KeyOf(target)) {
    Claims& claims = TheClaims();
    const std::lock_guard lock(claims.mutex);
    if (!claims.keys.insert(key_).second)
        throw WriterFailure(kWriterErrorExists, "Another conversion is writing this file.", EEXIST);
}

TargetClaim::~TargetClaim() {
    Claims& claims = TheClaims();
    const std::lock_guard lock(claims.mutex);
    claims.keys.erase(key_);
}

} // namespace writer
