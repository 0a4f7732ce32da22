#include "host/pieces/PieceFile.h"

#include "host/convert/Failure.h"
#include "host/pieces/Digest.h"
#include "host/pieces/WholeFile.h"
#include "text/Descriptor.h"
#include "text/LastingFile.h"
#include "text/Path.h"

#include <algorithm>
#include <cctype>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <filesystem>
#include <fmt/format.h>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

namespace movieconv {
namespace {

constexpr std::size_t kDigits = 64;
constexpr std::string_view kSuffix = ".piece";

/// The seal without its last line.
std::string Claim(const Plan& plan, int number, int64_t bytes) {
    return fmt::format("MCSEAL1\n{}\n{:010}\n{:020}\n", plan.hash, number, bytes);
}

std::size_t SealSize(const Plan& plan) {
    return Claim(plan, 0, 0).size() + kDigits + 1;
}

text::Descriptor OpenForReading(const std::string& path) {
    return text::Descriptor(open(path.c_str(), O_RDONLY | O_CLOEXEC));
}

/// Bytes of an open file; negative when it cannot be told.
int64_t SizeOf(const text::Descriptor& file) {
    struct stat status {};
    return file.Number() >= 0 && fstat(file.Number(), &status) == 0 && S_ISREG(status.st_mode)
               ? status.st_size
               : -1;
}

/// Whether it is a piece of a plan of that name, or is becoming one.
bool IsPieceName(const std::filesystem::path& file, const std::string& planPath) {
    const std::string name = file.filename().string();
    std::string_view rest(name);
    rest.remove_prefix(std::min(text::NameOf(planPath).size(), rest.size()));
    if (rest.empty() || rest.front() != '.')
        return false;
    rest.remove_prefix(1);
    const std::size_t digits = std::min(rest.find_first_not_of("0123456789"), rest.size());
    rest.remove_prefix(digits);
    return digits >= 4 &&
           (rest == kSuffix || rest.substr(0, kSuffix.size() + 1) == std::string(kSuffix) + ".");
}

/// The files that belong to a plan of that name, but for itself.
std::vector<std::filesystem::path> FilesOf(const std::string& planPath) {
    std::vector<std::filesystem::path> files = FilesThatBegin(planPath);
    const auto isOther = [&planPath](const std::filesystem::path& file) {
        return !IsInTheMaking(file, planPath) && !IsPieceName(file, planPath);
    };
    files.erase(std::remove_if(files.begin(), files.end(), isOther), files.end());
    return files;
}

} // namespace

std::string PiecePath(const std::string& planPath, int number) {
    return fmt::format("{}.{:04}{}", planPath, number, kSuffix);
}

bool PieceExists(const std::string& planPath, int number) {
    struct stat status {};
    return stat(PiecePath(planPath, number).c_str(), &status) == 0;
}

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

std::string FaultOf(const Plan& plan, const std::string& planPath, int number) {
    const std::string path = PiecePath(planPath, number);
    const auto fault = [&](const char* what) {
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
    if (!AddFile(digest, file.Number(), 0, bytes))
        return fault("cannot be read");
    digest.Add(claim);
    if (digest.Hex() + "\n" != seal.substr(claim.size()))
        return fault("was changed since it was made");
    return {};
}

bool IsPieceOf(const std::string& planPath, const std::string& file) {
    const auto files = FilesOf(planPath);
    std::error_code ignored;
    return std::any_of(files.begin(), files.end(), [&](const std::filesystem::path& piece) {
        return std::filesystem::equivalent(piece, file, ignored);
    });
}

int CountPieces(const std::string& planPath) {
    const auto files = FilesOf(planPath);
    return static_cast<int>(std::count_if(files.begin(), files.end(), [](const std::filesystem::path& file) {
        return file.extension() == kSuffix;
    }));
}

void RemovePieces(const std::string& planPath) {
    std::error_code ignored;
    for (const std::filesystem::path& file : FilesOf(planPath))
        std::filesystem::remove(file, ignored);
}

} // namespace movieconv
