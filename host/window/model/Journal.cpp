#include "host/window/model/Journal.h"

#include "text/LastingFile.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QStandardPaths>

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>
#include <utility>

namespace movieconv::window {
namespace {

constexpr int kVersion = 1;

/// False with errno set.
bool Save(const std::string& path, const QByteArray& bytes) {
    constexpr mode_t kForTheOwner = 0600;
    return text::ReplaceLastingly(path, path + ".new", {bytes.data(), static_cast<size_t>(bytes.size())},
                                  kForTheOwner);
}

/// Where the file is afterwards: under a name of its own, or where it was.
std::string SetAside(const std::string& path) {
    std::string aside = path + ".unreadable";
    for (int number = 2; access(aside.c_str(), F_OK) == 0; ++number)
        aside = path + ".unreadable-" + std::to_string(number);
    return std::rename(path.c_str(), aside.c_str()) == 0 ? aside : path;
}

QByteArray Serialise(const std::vector<Entry>& entries) {
    QJsonArray array;
    for (const Entry& entry : entries)
        array.append(ToJson(entry));
    return QJsonDocument(
               QJsonObject{{QStringLiteral("version"), kVersion}, {QStringLiteral("entries"), array}})
        .toJson(QJsonDocument::Compact);
}

} // namespace

Journal::Journal(std::string path, OnFailure failed)
    : path_(std::move(path)), failed_(std::move(failed)), thread_([this] { Run(); }) {}

Journal::~Journal() {
    {
        const std::lock_guard lock(mutex_);
        ending_ = true;
        changed_.notify_all();
    }
    thread_.join();
    if (lock_ >= 0)
        close(lock_);
}

/// Where nothing can be locked, nobody else can be told.
bool Journal::IsOwn() {
    if (!own_) {
        lock_ = open((path_ + ".lock").c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600);
        struct flock whole {};
        whole.l_type = F_WRLCK;
        own_ = lock_ < 0 || fcntl(lock_, F_SETLK, &whole) == 0 || (errno != EACCES && errno != EAGAIN);
    }
    return *own_;
}

std::vector<Entry> Journal::Load(QString& complaint) {
    if (!IsOwn()) {
        complaint = QCoreApplication::translate(
            "Journal",
            "Another window has the saved queue. What is added here is lost when this one is closed.");
        return {};
    }
    QFile file(QFile::decodeName(path_.c_str()));
    if (!file.exists())
        return {};
    file.open(QIODevice::ReadOnly); // what cannot be opened is not the queue either
    const QJsonObject json = QJsonDocument::fromJson(file.readAll()).object();
    if (json[QLatin1String("version")].toInt() != kVersion) {
        file.close();
        const std::string aside = SetAside(path_);
        own_ = aside != path_; // else it must not be replaced
        complaint =
            QCoreApplication::translate("Journal", "The saved queue could not be read. It was kept as %1.")
                .arg(Readable(aside));
        return {};
    }
    std::vector<Entry> entries;
    for (const QJsonValue value : json[QLatin1String("entries")].toArray())
        if (auto entry = EntryFromJson(value.toObject()))
            entries.push_back(*std::move(entry));
    return entries;
}

void Journal::Keep(std::vector<Entry> entries) {
    if (!IsOwn())
        return;
    const std::lock_guard lock(mutex_);
    next_ = std::move(entries);
    changed_.notify_all();
}

void Journal::Settle() {
    std::unique_lock lock(mutex_);
    changed_.wait(lock, [&] { return !next_ && !writing_; });
}

std::string Journal::UsualPath() {
    const QString folder = QStandardPaths::writableLocation(QStandardPaths::AppLocalDataLocation);
    QDir().mkpath(folder);
    return QFile::encodeName(folder + QStringLiteral("/queue.json")).toStdString();
}

void Journal::Run() {
    std::unique_lock lock(mutex_);
    while (true) {
        changed_.wait(lock, [&] { return next_ || ending_; });
        if (!next_)
            return;
        const std::vector<Entry> entries = *std::exchange(next_, std::nullopt);
        writing_ = true;
        lock.unlock();
        WriteAndTell(entries);
        lock.lock();
        writing_ = false;
        changed_.notify_all();
    }
}

void Journal::WriteAndTell(const std::vector<Entry>& entries) {
    const bool failed = !Save(path_, Serialise(entries));
    if (failed && !failing_ && failed_) {
        failed_(QCoreApplication::translate(
                    "Journal", "The queue cannot be saved in %1: %2. It will be lost when the program ends.")
                    .arg(Readable(path_), QString::fromLocal8Bit(std::strerror(errno))));
    }
    failing_ = failed;
}

} // namespace movieconv::window
