#include "host/pieces/PieceFile.h"

#include "host/convert/Failure.h"
#include "host/convert/OutputCheck.h"
#include "host/pieces/Digest.h"
#include "host/pieces/OutputNames.h"
#include "host/pieces/PlanText.h"
#include "host/pieces/WholeFile.h"
#include "host/sentence/Say.h"
#include "text/Descriptor.h"
#include "text/FileNames.h"
#include "text/LastingFile.h"
#include "text/Path.h"

#include <algorithm>
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
constexpr int64_t kReadAtOnce = 1 << 20;            // a piece can be as large as a movie
constexpr std::string_view kPieceHead = "MCPIECE1"; // with which the media writer begins one

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

/// The number of the piece whose name a file has.
std::optional<int> PieceNumber(const std::filesystem::path& file, const std::string& planPath) {
    const std::string name = file.filename().string();
    const std::optional<int> number = NumberIn(name, planPath);
    return number && name == text::NameOf(PiecePath(planPath, *number)) ? number : std::nullopt;
}

/// A name without what the media writer puts behind it until the file is complete.
std::string WithoutPartialSuffix(const std::string& name) {
    const std::size_t end = name.rfind(text::kPartialSuffix);
    for (int number = 1; end != std::string::npos && number <= text::kMostPartials; ++number)
        if (name.compare(end, std::string::npos, text::PartialSuffix(number)) == 0)
            return name.substr(0, end);
    return name;
}

/// Whether it is what a process left that was killed while it made a piece.
bool IsUnfinishedPiece(const std::filesystem::path& file, const std::string& planPath) {
    const std::string name = WithoutPartialSuffix(file.filename().string());
    const std::optional<int> number = NumberIn(name, planPath);
    return number && IsInTheMaking(name, PiecePath(planPath, *number)) && BeginsLike(file, kPieceHead);
}

/// The files that belong to a plan of that name, but for itself.
std::vector<std::filesystem::path> FilesOf(const std::string& planPath) {
    std::vector<std::filesystem::path> files = FilesThatBegin(planPath);
    const auto isOther = [&planPath](const std::filesystem::path& file) {
        const bool isPiece = PieceNumber(file, planPath) && BeginsLike(file, kPieceHead);
        return !isPiece && !IsUnfinishedPiece(file, planPath) && !IsPlanInTheMaking(file, planPath);
    };
    files.erase(std::remove_if(files.begin(), files.end(), isOther), files.end());
    return files;
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

void RequirePlaces(const std::string& planPath, const Request& request, std::optional<int> only) {
    for (const std::filesystem::path& file : FilesThatBegin(planPath)) {
        const std::optional<int> number = PieceNumber(file, planPath);
        if (!number || (only && number != only))
            continue;
        if (const Sentence role = WhatIsReadFrom(file.string(), request); !role.IsEmpty())
            throw Failure(Category::kRequest, Say("\"{}\" is {}, and has the name of a piece that is to "
                                                  "be made; rename it, or give the output another name",
                                                  file.string(), role));
        if (!BeginsLike(file, kPieceHead))
            throw Failure(Category::kOutput,
                          fmt::format("a piece would replace another file, \"{}\"; rename or "
                                      "remove it, or give the output another name",
                                      file.string()));
    }
}

int CountPieces(const std::string& planPath) {
    const auto files = FilesOf(planPath);
    return static_cast<int>(std::count_if(files.begin(), files.end(), [&](const std::filesystem::path& file) {
        return PieceNumber(file, planPath).has_value();
    }));
}

void RemovePieces(const std::string& planPath, const Request& request) {
    std::error_code ignored;
    for (const std::filesystem::path& file : FilesOf(planPath))
        if (WhatIsReadFrom(file.string(), request).IsEmpty())
            std::filesystem::remove(file, ignored);
}

} // namespace movieconv
