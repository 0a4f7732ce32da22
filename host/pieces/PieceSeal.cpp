#include "host/pieces/PieceSeal.h"

#include "host/convert/Failure.h"
#include "host/pieces/Digest.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/WholeFile.h"
#include "text/Descriptor.h"
#include "text/LastingFile.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <fmt/format.h>
#include <sys/stat.h>
#include <unistd.h>

namespace movieconv {
namespace {

constexpr std::size_t kDigits = 64;
constexpr int64_t kReadAtOnce = 1 << 20; // a piece can be as large as a movie

/// The seal without its last line.
std::string Claim(const Plan& plan, int number, int64_t bytes) {
    return fmt::format("MCSEAL1\n{}\n{:010}\n{:020}\n", plan.hash, number, bytes);
}

std::size_t SealSize(const Plan& plan) {
    return Claim(plan, 0, 0).size() + kDigits + 1;
}

text::Descriptor OpenForReading(const std::string& path) {
    return text::Descriptor(open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK)); // a pipe is no piece
}

/// Bytes of an open file; negative when it cannot be told.
int64_t SizeOf(const text::Descriptor& file) {
    struct stat status {};
    return file.Number() >= 0 && fstat(file.Number(), &status) == 0 && S_ISREG(status.st_mode)
               ? status.st_size
               : -1;
}

} // namespace

int64_t SealPiece(const std::string& file, const Plan& plan, const std::string& planPath, int number) {
    const std::string name = PiecePath(planPath, number);
    try {
        std::string seal;
        int64_t bytes = 0;
        {
            const text::Descriptor made = OpenForReading(file);
            bytes = SizeOf(made);
            seal = Claim(plan, number, bytes);
            Digest digest;
            if (bytes < 0 || !AddFile(digest, made.Number(), 0, bytes))
                throw Failure(Category::kOutput,
                              fmt::format("\"{}\" cannot be read again: {}", file, std::strerror(errno)));
            digest.Add(seal);
            seal += digest.Hex() + "\n";
        }
        AppendWhole(file, seal);
        if (!text::RenameLastingly(file, name))
            throw Failure(Category::kOutput,
                          fmt::format("\"{}\" cannot get its name: {}", name, std::strerror(errno)));
        return bytes + static_cast<int64_t>(seal.size());
    } catch (...) {
        unlink(file.c_str());
        throw;
    }
}

std::optional<std::string> FaultOf(const Plan& plan, const std::string& planPath, int number,
                                   const std::function<bool()>& goesOn) {
    const std::string path = PiecePath(planPath, number);
    const auto fault = [&](const char* what) -> std::optional<std::string> {
        return fmt::format("piece {} (\"{}\") {}", number, path, what);
    };
    const text::Descriptor file = OpenForReading(path);
    if (file.Number() < 0)
        return fault(errno == ENOENT ? "is missing" : "cannot be opened");
    const auto sealSize = static_cast<int64_t>(SealSize(plan));
    const int64_t bytes = SizeOf(file) - sealSize;
    std::string seal(static_cast<std::size_t>(sealSize), ' ');
    if (bytes < 0 || pread(file.Number(), seal.data(), seal.size(), static_cast<off_t>(bytes)) != sealSize ||
        seal.compare(0, 8, "MCSEAL1\n") != 0)
        return fault("is cut off, or no piece");
    const std::string claim = Claim(plan, number, bytes);
    if (seal.compare(0, claim.size(), claim) != 0) {
        const std::string other = seal.substr(8, kDigits);
        return fault(other != plan.hash ? "belongs to another plan" : "is another piece under its name");
    }
    Digest digest;
    for (int64_t at = 0; at < bytes; at += kReadAtOnce) {
        if (!goesOn())
            return std::nullopt;
        if (!AddFile(digest, file.Number(), at, std::min(kReadAtOnce, bytes - at)))
            return fault("cannot be read");
    }
    digest.Add(claim);
    if (digest.Hex() + "\n" != seal.substr(claim.size()))
        return fault("was changed since it was made");
    return "";
}

} // namespace movieconv
