#include "host/window/model/Wishes.h"

#include "host/window/model/JsonPath.h"

#include <QJsonArray>

#include <algorithm>

namespace movieconv::window {
namespace {

constexpr double kLongest = 1e7; // seconds, four months
constexpr int kMostCut = 16384;  // pixels
constexpr int kMostTracks = 99999;

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
    for (const QJsonValue number : value.toArray())
        if (number.isDouble())
            numbers.append(number.toInt());
    return numbers;
}

QJsonArray FilesToJson(const std::vector<SubtitleFile>& files) {
    QJsonArray array;
    for (const SubtitleFile& file : files)
        array.append(QJsonObject{{QStringLiteral("path"), EncodePath(file.path)},
                                 {QStringLiteral("language"), file.language}});
    return array;
}

std::vector<SubtitleFile> SubtitleFilesOf(const QJsonValue& json) {
    std::vector<SubtitleFile> files;
    for (const QJsonValue file : json.toArray()) {
        const std::string path = DecodePath(file[QLatin1String("path")]);
        if (!path.empty())
            files.push_back({path, file[QLatin1String("language")].toString()});
    }
    return files;
}

std::optional<Margins> MarginsOf(const QJsonValue& json) {
    const QJsonArray sides = json.toArray();
    if (sides.size() != 4)
        return std::nullopt;
    const auto side = [&](int number) { return std::clamp(sides[number].toInt(), 0, kMostCut); };
    return Margins{side(0), side(1), side(2), side(3)};
}

QString WordFor(Wishes::Hdr choice) {
    return choice == Wishes::Hdr::kKeep    ? QStringLiteral("keep")
           : choice == Wishes::Hdr::kUsual ? QStringLiteral("sdr")
                                           : QStringLiteral("auto");
}

QString WordFor(Wishes::Deinterlace choice) {
    return choice == Wishes::Deinterlace::kOff   ? QStringLiteral("off")
           : choice == Wishes::Deinterlace::kAll ? QStringLiteral("all")
                                                 : QStringLiteral("auto");
}

void PutSubtitles(QJsonObject& json, const Wishes& wishes) {
    Put(json, "subtitles", wishes.subtitles);
    if (!wishes.subtitleFiles.empty())
        json[QLatin1String("subtitle_files")] = FilesToJson(wishes.subtitleFiles);
    if (!wishes.subtitleCharset.isEmpty())
        json[QLatin1String("subtitle_charset")] = wishes.subtitleCharset;
    Put(json, "burnt_track", wishes.burning.track);
    if (!wishes.burning.file.empty())
        json[QLatin1String("burnt_file")] = EncodePath(wishes.burning.file);
}

void PutTexts(QJsonObject& json, const Wishes& wishes) {
    if (!wishes.chapters)
        json[QLatin1String("chapters")] = false;
    if (!wishes.texts)
        json[QLatin1String("texts")] = false;
    Put(json, "title", wishes.title);
}

} // namespace

Wishes ForAnyMovie(const Wishes& wishes) {
    return WithOwn(wishes, Wishes());
}

Wishes WithOwn(const Wishes& general, const Wishes& own) {
    Wishes both = general;
    both.begin = own.begin;
    both.end = own.end;
    both.sounds = own.sounds;
    both.subtitles = own.subtitles;
    both.subtitleFiles = own.subtitleFiles;
    both.subtitleCharset = own.subtitleCharset;
    both.burning = own.burning;
    both.cut = own.cut;
    both.title = own.title;
    return both;
}

void SetBegin(Wishes& wishes, double begin, double length) {
    if (begin < length)
        wishes.begin = begin;
    if (wishes.end && wishes.begin >= *wishes.end)
        wishes.end.reset();
}

void SetEnd(Wishes& wishes, std::optional<double> end, double length) {
    const bool makesSense = end && *end > wishes.begin && *end < length;
    wishes.end = makesSense ? end : std::nullopt;
}

void Burn(Wishes& wishes, const Burning& burning) {
    wishes.burning = burning;
    if (burning.track && wishes.subtitles)
        wishes.subtitles->removeAll(*burning.track);
}

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
    PutSubtitles(json, wishes);
    Put(json, "copy_sound", wishes.copySound);
    Put(json, "channels", wishes.channels);
    if (wishes.deinterlace != defaults.deinterlace)
        json[QLatin1String("deinterlace")] = WordFor(wishes.deinterlace);
    if (wishes.crop)
        json[QLatin1String("crop")] = true;
    if (wishes.cut)
        json[QLatin1String("cut")] =
            QJsonArray{wishes.cut->top, wishes.cut->bottom, wishes.cut->left, wishes.cut->right};
    if (wishes.hdr != defaults.hdr)
        json[QLatin1String("hdr")] = WordFor(wishes.hdr);
    Put(json, "depth", wishes.depth);
    PutTexts(json, wishes);
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
        if (json[QLatin1String("deinterlace")].toString() == WordFor(choice))
            wishes.deinterlace = choice;
    wishes.crop = json[QLatin1String("crop")].toBool(false);
    wishes.cut = MarginsOf(json[QLatin1String("cut")]);
    for (const auto choice : {Wishes::Hdr::kKeep, Wishes::Hdr::kUsual})
        if (json[QLatin1String("hdr")].toString() == WordFor(choice))
            wishes.hdr = choice;
    wishes.depth = IntegerOf(json, "depth", 8, 10);
    wishes.subtitleFiles = SubtitleFilesOf(json[QLatin1String("subtitle_files")]);
    wishes.subtitleCharset = json[QLatin1String("subtitle_charset")].toString();
    wishes.burning.track = IntegerOf(json, "burnt_track", 0, kMostTracks);
    if (!wishes.burning.track)
        wishes.burning.file = DecodePath(json[QLatin1String("burnt_file")]);
    if (json[QLatin1String("copy_sound")].isBool())
        wishes.copySound = json[QLatin1String("copy_sound")].toBool();
    wishes.chapters = json[QLatin1String("chapters")].toBool(true);
    wishes.texts = json[QLatin1String("texts")].toBool(true);
    if (json[QLatin1String("title")].isString())
        wishes.title = json[QLatin1String("title")].toString();
    wishes.withPictures = json[QLatin1String("pictures")].toBool(true);
    wishes.withSound = json[QLatin1String("sound")].toBool(true);
    return wishes;
}

} // namespace movieconv::window
