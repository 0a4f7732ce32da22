// Files of a test's own.
#ifndef MOVIECONV_TESTS_SUPPORT_FOLDER_H
#define MOVIECONV_TESTS_SUPPORT_FOLDER_H

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <stdexcept>
#include <string>
#include <system_error>
#include <vector>

/// A folder that goes away with all that is in it.
class Folder {
public:
    Folder() : path_((std::filesystem::temp_directory_path() / "movieconv-XXXXXX").string()) {
        if (mkdtemp(path_.data()) == nullptr)
            throw std::runtime_error("no temporary folder");
    }
    ~Folder() {
        std::error_code ignored;
        std::filesystem::remove_all(path_, ignored);
    }
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;

    std::string operator/(const std::string& name) const { return path_ + "/" + name; }
    const std::string& Path() const { return path_; }

    /// Names of what is in it, or in a folder below it, sorted.
    std::vector<std::string> Names(const std::string& below = "") const {
        std::vector<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(*this / below))
            names.push_back(entry.path().filename().string());
        std::sort(names.begin(), names.end());
        return names;
    }

private:
    std::string path_;
};

/// How many entries a folder has.
inline int64_t CountEntries(const std::string& path) {
    const std::filesystem::directory_iterator entries(path);
    return std::distance(begin(entries), end(entries));
}

/// What is in a file; nothing when it cannot be read.
inline std::string ReadFile(const std::string& path) {
    std::ostringstream content;
    content << std::ifstream(path, std::ios::binary).rdbuf();
    return content.str();
}

inline void WriteFile(const std::string& path, const std::string& content) {
    std::ofstream(path, std::ios::binary) << content;
}

#endif
