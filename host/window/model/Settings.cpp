#include "host/window/model/Settings.h"

#include <QJsonDocument>

#include <algorithm>

namespace movieconv::window {
namespace {

const QString kPattern = QStringLiteral("naming/pattern");
const QString kTargetFolder = QStringLiteral("naming/folder");
const QString kWishes = QStringLiteral("wishes");
const QString kAtOnce = QStringLiteral("at_once");
const QString kSound = QStringLiteral("at_end/sound");
const QString kThen = QStringLiteral("at_end/then");
const QString kGeometry = QStringLiteral("window/geometry");
const QString kSplitter = QStringLiteral("window/splitter");
const QString kSourceFolder = QStringLiteral("window/folder");

} // namespace

Settings::Settings() : settings_(QStringLiteral("MovieConv"), QStringLiteral("movieconv-gui")) {}

Settings::Settings(const QString& path) : settings_(path, QSettings::IniFormat) {}

Naming Settings::LoadNaming() const {
    return {settings_.value(kPattern, Naming().pattern).toString(),
            settings_.value(kTargetFolder).toByteArray().toStdString()};
}

void Settings::Save(const Naming& naming) {
    settings_.setValue(kPattern, naming.pattern);
    settings_.setValue(kTargetFolder, QByteArray::fromStdString(naming.folder));
}

Wishes Settings::LoadWishes() const {
    return WishesFromJson(QJsonDocument::fromJson(settings_.value(kWishes).toByteArray()).object());
}

/// Without what belongs to one movie alone.
void Settings::Save(const Wishes& wishes) {
    settings_.setValue(kWishes, QJsonDocument(ToJson(ForAnyMovie(wishes))).toJson(QJsonDocument::Compact));
}

int Settings::LoadAtOnce() const {
    return std::clamp(settings_.value(kAtOnce, 1).toInt(), 1, 8);
}

void Settings::SaveAtOnce(int count) {
    settings_.setValue(kAtOnce, count);
}

AtEnd Settings::LoadAtEnd() const {
    const int then =
        std::clamp(settings_.value(kThen, 0).toInt(), 0, static_cast<int>(AtEnd::Then::kSuspend));
    return {settings_.value(kSound, false).toBool(), static_cast<AtEnd::Then>(then)};
}

void Settings::Save(const AtEnd& atEnd) {
    settings_.setValue(kSound, atEnd.sound);
    settings_.setValue(kThen, static_cast<int>(atEnd.then));
}

QByteArray Settings::LoadGeometry() const {
    return settings_.value(kGeometry).toByteArray();
}

void Settings::SaveGeometry(const QByteArray& geometry) {
    settings_.setValue(kGeometry, geometry);
}

QByteArray Settings::LoadSplitter() const {
    return settings_.value(kSplitter).toByteArray();
}

void Settings::SaveSplitter(const QByteArray& state) {
    settings_.setValue(kSplitter, state);
}

QString Settings::LoadFolder() const {
    return settings_.value(kSourceFolder).toString();
}

void Settings::SaveFolder(const QString& folder) {
    settings_.setValue(kSourceFolder, folder);
}

void Settings::Settle() {
    settings_.sync();
}

} // namespace movieconv::window
