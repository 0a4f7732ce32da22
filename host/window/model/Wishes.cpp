#include "host/window/model/Wishes.h"

#include <QJsonArray>

namespace movieconv::window {
namespace {

constexpr double kLongest = 1e7; // seconds, four months

template <class T>
void Put(QJsonObject& json, const char* key, const std::optional<T>& value) {
    if (value)
        json[QLatin1String(key)] = *value;
}

void Put(QJsonObject& json, const char* key, const std::optional<QList<int>>& numbers) {
    if (!numbers)
        return;
    QJsonArray array;
    for (const int number : *numbers)
        array.append(number);
    json[QLatin1String(key)] = array;
}

std::optional<double> NumberOf(const QJsonObject& json, const char* key, double least, double most) {
    const QJsonValue value = json[QLatin1String(key)];
    const double number = value.toDouble(least - 1);
    return value.isDouble() && number >= least && number <= most ? std::optional(number) : std::nullopt;
}

std::optional<int> IntegerOf(const QJsonObject& json, const char* key, int least, int most) {
    const std::optional<double> number = NumberOf(json, key, least, most);
    return number ? std::optional(static_cast<int>(*number)) : std::nullopt;
}

std::optional<QList<int>> NumbersOf(const QJsonObject& json, const char* key) {
    const QJsonValue value = json[QLatin1String(key)];
    if (!value.isArray())
        return std::nullopt;
    QList<int> numbers;
    for (const QJsonValue& number : value.toArray())
        if (number.isDouble())
            numbers.append(number.toInt());
    return numbers;
}

QString NameOf(Wishes::Deinterlace choice) {
    return choice == Wishes::Deinterlace::kOff   ? QStringLiteral("off")
           : choice == Wishes::Deinterlace::kAll ? QStringLiteral("all")
                                                 : QStringLiteral("auto");
}

} // namespace

QJsonObject ToJson(const Wishes& wishes) {
    const Wishes defaults;
    QJsonObject json;
    json[QLatin1String("preset")] = wishes.preset;
    Put(json, "format", wishes.format);
    Put(json, "quality", wishes.quality);
    Put(json, "height", wishes.height);
    Put(json, "rate", wishes.rate);
    if (wishes.begin > 0)
        json[QLatin1String("begin")] = wishes.begin;
    Put(json, "end", wishes.end);
    Put(json, "clip", wishes.clip);
    Put(json, "sounds", wishes.sounds);
    Put(json, "subtitles", wishes.subtitles);
    Put(json, "channels", wishes.channels);
    if (wishes.deinterlace != defaults.deinterlace)
        json[QLatin1String("deinterlace")] = NameOf(wishes.deinterlace);
    if (wishes.crop)
        json[QLatin1String("crop")] = true;
    if (!wishes.withPictures)
        json[QLatin1String("pictures")] = false;
    if (!wishes.withSound)
        json[QLatin1String("sound")] = false;
    return json;
}

Wishes WishesFromJson(const QJsonObject& json) {
    Wishes wishes;
    wishes.preset = json[QLatin1String("preset")].toString(wishes.preset);
    if (json[QLatin1String("format")].isString())
        wishes.format = json[QLatin1String("format")].toString();
    wishes.quality = IntegerOf(json, "quality", 0, 100);
    wishes.height = IntegerOf(json, "height", 16, 16384);
    wishes.rate = NumberOf(json, "rate", 1, 1000);
    wishes.begin = NumberOf(json, "begin", 0, kLongest).value_or(0);
    wishes.end = NumberOf(json, "end", 0, kLongest);
    wishes.clip = NumberOf(json, "clip", 1, kLongest);
    wishes.sounds = NumbersOf(json, "sounds");
    wishes.subtitles = NumbersOf(json, "subtitles");
    wishes.channels = IntegerOf(json, "channels", 1, 8);
    for (const auto choice : {Wishes::Deinterlace::kOff, Wishes::Deinterlace::kAll})
        if (json[QLatin1String("deinterlace")].toString() == NameOf(choice))
            wishes.deinterlace = choice;
    wishes.crop = json[QLatin1String("crop")].toBool(false);
    wishes.withPictures = json[QLatin1String("pictures")].toBool(true);
    wishes.withSound = json[QLatin1String("sound")].toBool(true);
    return wishes;
}

} // namespace movieconv::window
