#include "host/window/model/Naming.h"

#include "text/Path.h"
#include "text/Utf8.h"

#include <QDir>

#include <algorithm>
#include <filesystem>

namespace movieconv::window {
namespace {

constexpr size_t kLongestName = 240; // of 255 bytes: the rest is for the temporary file's ending

std::string Stem(const std::string& path) {
    const std::string name = text::NameOf(path);
    const size_t dot = name.rfind('.');
    return dot == std::string::npos || dot == 0 ? name : name.substr(0, dot);
}

void ReplaceAll(std::string& text, const std::string& mark, const std::string& value) {
    for (size_t at = text.find(mark); at != std::string::npos; at = text.find(mark, at + value.size()))
        text.replace(at, mark.size(), value);
}

std::string Fill(const Entry& entry, const QString& pattern, const QDate& today) {
    std::string name = pattern.toStdString();
    const int height = entry.wishes.height.value_or(entry.facts ? entry.facts->height : 0);
    ReplaceAll(name, "{preset}", entry.wishes.preset.toStdString());
    ReplaceAll(name, "{height}", height > 0 ? std::to_string(height) + "p" : std::string());
    ReplaceAll(name, "{date}", today.toString(Qt::ISODate).toStdString());
    ReplaceAll(name, "{name}", Stem(entry.source)); // last: a source's name may hold marks
    std::replace(name.begin(), name.end(), '/', '-');
    const bool useless = name.find_first_not_of(" .") == std::string::npos;
    return useless ? Stem(entry.source) : name;
}

/// What stands behind the last point may as well be a part of the name.
bool HasExtension(const std::string& path, const QStringList& known) {
    const std::string extension = std::filesystem::path(path).extension().string();
    return !extension.empty() &&
           known.contains(QString::fromStdString(extension.substr(1)), Qt::CaseInsensitive);
}

} // namespace

std::string TargetFor(const Entry& entry, const Naming& naming, const QString& extension, const QDate& today,
                      const IsTaken& isTaken) {
    const std::string folder = naming.folder.empty() ? text::FolderOf(entry.source) : naming.folder;
    const std::string stem = Fill(entry, naming.pattern, today);
    std::string path;
    int number = 1;
    do {
        const std::string ending = (number > 1 ? " (" + std::to_string(number) + ")" : std::string()) + "." +
                                   extension.toStdString();
        path = (folder == "/" ? folder : folder + "/") +
               std::string(text::CutTo(kLongestName - ending.size(), stem)) + ending;
        ++number;
    } while (isTaken(path));
    return path;
}

std::string CompletePath(const std::string& typed, const Entry& entry, const QString& extension,
                         const QStringList& known) {
    namespace fs = std::filesystem;
    fs::path path = typed.starts_with("~/") ? QDir::homePath().toStdString() + typed.substr(1) : typed;
    path = (fs::path(text::FolderOf(entry.source)) / path).lexically_normal();
    if (!path.has_filename())
        path /= Stem(entry.source);
    return HasExtension(path, known) ? path.string() : path.string() + "." + extension.toStdString();
}

std::string WithExtension(const std::string& path, const QString& extension, const QStringList& known) {
    const std::string stem = HasExtension(path, known) ? path.substr(0, path.rfind('.')) : path;
    return stem + "." + extension.toStdString();
}

} // namespace movieconv::window
