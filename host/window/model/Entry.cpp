#include "host/window/model/Entry.h"

#include "host/window/model/JsonPath.h"
#include "text/Path.h"
#include "text/Printable.h"

#include <QJsonArray>

#include <algorithm>
#include <array>

namespace movieconv::window {
namespace {

constexpr std::array<const char*, 6> kStateNames = {"waiting", "active", "done",
                                                    "stopped", "failed", "interrupted"};

QJsonArray EncodeAll(const std::vector<std::string>& paths) {
    QJsonArray array;
    for (const std::string& path : paths)
        array.append(EncodePath(path));
    return array;
}

std::vector<std::string> DecodeAll(const QJsonArray& array) {
    std::vector<std::string> paths;
    for (const QJsonValue value : array)
        paths.push_back(DecodePath(value));
    return paths;
}

QStringList Strings(const QJsonValue& value) {
    QStringList strings;
    for (const QJsonValue one : value.toArray())
        strings.append(one.toString());
    return strings;
}

QJsonObject OutcomeToJson(const Outcome& outcome) {
    return {{QStringLiteral("sentence"), outcome.sentence},
            {QStringLiteral("files"), EncodeAll(outcome.files)},
            {QStringLiteral("not_carried"), QJsonArray::fromStringList(outcome.notCarried)},
            {QStringLiteral("bytes"), static_cast<double>(outcome.bytes)},
            {QStringLiteral("position"), outcome.position},
            {QStringLiteral("worked"), outcome.worked}};
}

Outcome OutcomeFromJson(const QJsonObject& json, State state) {
    Outcome outcome;
    outcome.ending = state == State::kDone      ? Ending::kDone
                     : state == State::kStopped ? Ending::kStopped
                                                : Ending::kFailed;
    outcome.sentence = json[QLatin1String("sentence")].toString();
    outcome.files = DecodeAll(json[QLatin1String("files")].toArray());
    outcome.notCarried = Strings(json[QLatin1String("not_carried")]);
    outcome.bytes = static_cast<int64_t>(json[QLatin1String("bytes")].toDouble());
    outcome.position = json[QLatin1String("position")].toDouble();
    outcome.worked = json[QLatin1String("worked")].toDouble();
    return outcome;
}

} // namespace

std::optional<double> Entry::SecondsWanted() const {
    if (!facts || !facts->lengthKnown)
        return wishes.end ? std::optional(std::max(0.0, *wishes.end - wishes.begin)) : std::nullopt;
    const double end = std::min(wishes.end.value_or(facts->seconds), facts->seconds);
    return std::max(0.0, end - wishes.begin);
}

QString Readable(const std::string& path) {
    return QString::fromStdString(path);
}

QString Shown(const std::string& text) {
    QString shown = Readable(text);
    for (QChar& sign : shown) {
        if (sign == QLatin1Char('\t') || text::IsCommand(sign.unicode()))
            sign = QChar::ReplacementCharacter;
    }
    return shown;
}

QString NameOf(const std::string& path) {
    return Shown(path.substr(path.rfind('/') + 1));
}

QJsonObject ToJson(const Entry& entry) {
    QJsonObject json{
        {QStringLiteral("source"), EncodePath(entry.source)},
        {QStringLiteral("target"), EncodePath(entry.target)},
        {QStringLiteral("state"), QLatin1String(kStateNames.at(static_cast<size_t>(entry.state)))},
        {QStringLiteral("wishes"), ToJson(entry.wishes)}};
    if (entry.targetNamed)
        json[QLatin1String("target_named")] = true;
    if (entry.replace)
        json[QLatin1String("replace")] = true;
    if (entry.IsOver()) {
        json[QLatin1String("outcome")] = OutcomeToJson(entry.outcome);
        json[QLatin1String("notes")] = QJsonArray::fromStringList(entry.notes);
    }
    return json;
}

std::optional<Entry> EntryFromJson(const QJsonObject& json) {
    Entry entry;
    entry.source = DecodePath(json[QLatin1String("source")]);
    entry.target = DecodePath(json[QLatin1String("target")]);
    const auto state =
        std::find(kStateNames.begin(), kStateNames.end(), json[QLatin1String("state")].toString());
    if (entry.source.empty() || state == kStateNames.end())
        return std::nullopt;
    entry.state = static_cast<State>(state - kStateNames.begin());
    if (entry.state == State::kActive)
        entry.state = State::kInterrupted;
    entry.wishes = WishesFromJson(json[QLatin1String("wishes")].toObject());
    entry.targetNamed = json[QLatin1String("target_named")].toBool();
    entry.replace = json[QLatin1String("replace")].toBool();
    entry.outcome = OutcomeFromJson(json[QLatin1String("outcome")].toObject(), entry.state);
    entry.notes = Strings(json[QLatin1String("notes")]);
    return entry;
}

} // namespace movieconv::window
