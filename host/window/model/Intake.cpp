#include "host/window/model/Intake.h"

#include "host/window/model/Entry.h"

#include <QCoreApplication>
#include <QSet>

#include <algorithm>
#include <filesystem>
#include <system_error>

namespace movieconv::window {
namespace {

namespace fs = std::filesystem;

bool LooksLikeMovie(const fs::path& path) {
    static const QSet<QString> known(MovieExtensions().begin(), MovieExtensions().end());
    const std::string extension = path.extension().string();
    return extension.size() > 1 && known.contains(QString::fromStdString(extension.substr(1)).toLower());
}

/// The number that begins at `at`, without the zeros before it; `at` is moved behind it.
QString NumberAt(const QString& text, qsizetype& at) {
    while (at < text.size() && text[at] == QLatin1Char('0'))
        ++at;
    const qsizetype begin = at;
    while (at < text.size() && text[at].isDigit())
        ++at;
    return text.mid(begin, at - begin);
}

/// As people sort: "part 2" comes before "part 10".
bool ComesBefore(const QString& left, const QString& right) {
    qsizetype l = 0;
    qsizetype r = 0;
    while (l < left.size() && r < right.size()) {
        if (left[l].isDigit() && right[r].isDigit()) {
            const QString one = NumberAt(left, l);
            const QString other = NumberAt(right, r);
            if (one != other)
                return one.size() != other.size() ? one.size() < other.size() : one < other;
        } else if (left[l] != right[r]) {
            return left[l] < right[r];
        } else {
            ++l;
            ++r;
        }
    }
    return right.size() - r > left.size() - l;
}

std::vector<std::string> MoviesBelow(const std::string& folder) {
    std::vector<std::string> movies;
    std::error_code error;
    fs::recursive_directory_iterator entry(folder, fs::directory_options::skip_permission_denied, error);
    for (; !error && entry != fs::recursive_directory_iterator(); entry.increment(error)) {
        std::error_code unknown;
        if (entry->is_regular_file(unknown) && LooksLikeMovie(entry->path()))
            movies.push_back(entry->path().string());
    }
    std::sort(movies.begin(), movies.end(), [](const std::string& left, const std::string& right) {
        return ComesBefore(Readable(left).toCaseFolded(), Readable(right).toCaseFolded());
    });
    return movies;
}

QString Tell(const char* text, const std::string& path) {
    return QCoreApplication::translate("Intake", text).arg(Shown(path));
}

} // namespace

std::vector<std::string> PathsOfUriList(const QByteArray& list, QStringList& others) {
    std::vector<std::string> paths;
    for (const QByteArray& raw : list.split('\n')) {
        const QByteArray line = raw.trimmed();
        if (line.isEmpty() || line.startsWith('#'))
            continue;
        QByteArray path = line;
        if (line.startsWith("file:")) {
            path = line.mid(5);
            if (path.startsWith("//"))
                path = path.mid(path.indexOf('/', 2)); // the host's name says nothing
        }
        if (path.startsWith('/'))
            paths.push_back(QByteArray::fromPercentEncoding(path).toStdString());
        else
            others.append(QString::fromUtf8(line));
    }
    return paths;
}

std::vector<std::string> FindMovies(const std::vector<std::string>& paths, QStringList& complaints) {
    std::vector<std::string> movies;
    for (const std::string& path : paths) {
        std::error_code error;
        const fs::file_status status = fs::status(path, error);
        if (fs::is_regular_file(status)) {
            movies.push_back(path);
        } else if (fs::is_directory(status)) {
            const std::vector<std::string> found = MoviesBelow(path);
            if (found.empty())
                complaints.append(
                    Tell(QT_TRANSLATE_NOOP("Intake", "There are no movies in the folder “%1”."), path));
            movies.insert(movies.end(), found.begin(), found.end());
        } else if (fs::exists(status)) {
            complaints.append(
                Tell(QT_TRANSLATE_NOOP("Intake", "“%1” is neither a file nor a folder."), path));
        } else {
            complaints.append(Tell(QT_TRANSLATE_NOOP("Intake", "“%1” was not found."), path));
        }
    }
    return movies;
}

const QStringList& MovieExtensions() {
    static const QStringList extensions =
        QStringLiteral("3g2 3gp aac ac3 aiff amr ape asf au avi caf dts dv eac3 f4v flac flv gxf ivf m1v m2t "
                       "m2ts m2v m4a m4v mka mkv "
                       "mod mov mp2 mp3 mp4 mpe mpeg mpg mts mxf nsv nut oga ogg ogm ogv opus qt rm rmvb swf "
                       "tod ts vob wav webm wma "
                       "wmv wtv wv y4m")
            .split(QLatin1Char(' '));
    return extensions;
}

} // namespace movieconv::window
