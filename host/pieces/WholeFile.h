// Small files that are there whole or not at all.
#ifndef MOVIECONV_HOST_PIECES_WHOLEFILE_H
#define MOVIECONV_HOST_PIECES_WHOLEFILE_H

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace movieconv {

/// All of a file. Throws Failure (kSource) when it cannot be read or is larger than `most` bytes.
std::string ReadWhole(const std::string& path, int64_t most);

/// Writes it beside and gives it the name, synced; what stood there is replaced. Throws Failure.
void WriteWhole(const std::string& path, std::string_view text);

/// Likewise, unless something stands there: then it stays, and the answer is false.
bool WriteNew(const std::string& path, std::string_view text);

/// Writes behind what a file holds, and to the disk; makes it when there is none. Throws Failure,
/// also for a symbolic link and what is no file.
void AppendWhole(const std::string& path, std::string_view text);

/// A name beside `path` that no other process on any machine takes for the same purpose.
std::string NameInTheMaking(const std::string& path);

/// Whether the file has such a name: it is being made, or was left by a process that was killed. Others can
/// have such names, too; see BeginsLike.
bool IsInTheMaking(const std::filesystem::path& file, const std::string& path);

/// Whether it is a file that begins with `head`, or with as much of it as it is long.
bool BeginsLike(const std::filesystem::path& file, std::string_view head);

/// All whose paths begin so, as far as the folder can be read.
std::vector<std::filesystem::path> FilesThatBegin(const std::string& path);

} // namespace movieconv

#endif
