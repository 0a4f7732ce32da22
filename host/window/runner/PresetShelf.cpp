#include "host/window/runner/PresetShelf.h"

#include "host/convert/CodecPlan.h"
#include "host/convert/Failure.h"
#include "host/convert/Formats.h"
#include "host/window/runner/LibraryWords.h"
#include "text/Path.h"

#include <QCoreApplication>
#include <QDir>
#include <QFile>
#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>
#include <QSaveFile>

#include <algorithm>
#include <array>
#include <cmath>
#include <filesystem>
#include <utility>

namespace movieconv::window {
namespace {

struct PresetWords {
    const char* name;
    const char* title;
    const char* description;
};

constexpr std::array kPresetWords = {
    PresetWords{
        "standard", QT_TRANSLATE_NOOP("Presets", "Standard"),
        QT_TRANSLATE_NOOP("Presets", "Looks like the source and plays on nearly everything (H.264, AAC).")},
    PresetWords{
        "small", QT_TRANSLATE_NOOP("Presets", "Small"),
        QT_TRANSLATE_NOOP("Presets", "Half the size at nearly the same quality, and slower (HEVC, AAC).")},
    PresetWords{"best", QT_TRANSLATE_NOOP("Presets", "Best"),
                QT_TRANSLATE_NOOP("Presets", "No difference to be seen, in large files (H.264, AAC).")},
    PresetWords{
        "web", QT_TRANSLATE_NOOP("Presets", "Web"),
        QT_TRANSLATE_NOOP("Presets", "For web pages, in formats that are free of patents (VP9, Opus).")},
    PresetWords{"av1", QT_TRANSLATE_NOOP("Presets", "AV1"),
                QT_TRANSLATE_NOOP("Presets", "The smallest files, for new players (AV1, Opus).")},
    PresetWords{
        "phone", QT_TRANSLATE_NOOP("Presets", "Phone"),
        QT_TRANSLATE_NOOP("Presets", "Small pictures for small screens (H.264 up to 720 lines, AAC).")},
    PresetWords{
        "archive", QT_TRANSLATE_NOOP("Presets", "Archive"),
        QT_TRANSLATE_NOOP(
            "Presets",
            "Lossless up to 10 bits, but for colours finer than 4:2:0; very large files (FFV1, FLAC).")},
    PresetWords{"sound", QT_TRANSLATE_NOOP("Presets", "Sound alone"),
                QT_TRANSLATE_NOOP("Presets", "Leaves the pictures out (AAC).")},
    PresetWords{
        "classic", QT_TRANSLATE_NOOP("Presets", "Classic"),
        QT_TRANSLATE_NOOP("Presets", "As the program converted in its first version (MPEG-4, AAC).")}};

constexpr int kUsualHeight = 1080; // for which a preset's place on the window's scale is reckoned

/// The part of a codec's scale that the window's covers.
struct Scale {
    double centre; // which is 50 in the window
    double span;   // lower is better
    QualityRange whole;
};

std::optional<Scale> ScaleOf(uint32_t codec) {
    const std::optional<QualityRange> whole = QualityRangeOf(codec);
    if (!whole)
        return std::nullopt;
    const double width = whole->worst - whole->best;
    return Scale{whole->best + 0.45 * width, 0.4 * width, *whole};
}

const FileFormatInfo* FormatOf(const Preset& preset) {
    const auto code = preset.preferences.format;
    return FindFormat(code ? CodeName(*code) : "mp4");
}

std::optional<double> OwnQuality(const Preset& preset, uint32_t codec, int height) {
    const Steps<double>* own = preset.preferences.QualitiesOf(codec);
    return own != nullptr ? own->At(height) : std::nullopt;
}

/// The preset's own quality on the window's scale; -1 when it has none.
int UsualQuality(const Preset& preset) {
    const std::optional<uint32_t> codec = CodecOf(preset, FormatOf(preset));
    const std::optional<Scale> scale = codec ? ScaleOf(*codec) : std::nullopt;
    const std::optional<double> own = scale ? OwnQuality(preset, *codec, kUsualHeight) : std::nullopt;
    if (!own)
        return -1;
    return static_cast<int>(
        std::clamp(std::lround(50 + (scale->centre - *own) / scale->span * 100), 0L, 100L));
}

PresetFacts FactsOf(const Preset& preset) {
    PresetFacts facts;
    facts.name = QString::fromStdString(preset.name);
    facts.title = facts.name;
    facts.description = QString::fromStdString(preset.description);
    if (const FileFormatInfo* format = FormatOf(preset))
        facts.extension = QString::fromUtf8(format->szExtensions).section(QLatin1Char(','), 0, 0);
    facts.quality = UsualQuality(preset);
    facts.copiesSound = preset.preferences.copySound;
    for (const Sentence& complaint : preset.complaints)
        facts.complaints += SentenceOf(complaint);
    return facts;
}

[[noreturn]] void Fail(const QString& sentence) {
    throw PresetError(sentence.toStdString());
}

void WriteFile(const std::string& path, const QByteArray& text) {
    std::error_code unknown; // the file tells
    std::filesystem::create_directories(text::FolderOf(path), unknown);
    QSaveFile file(QFile::decodeName(QByteArray::fromStdString(path)));
    if (!file.open(QIODevice::WriteOnly) || file.write(text) != text.size() || !file.commit())
        Fail(QCoreApplication::translate("Presets", "The preset cannot be saved: %1.")
                 .arg(file.errorString()));
}

/// The preset's steps, moved to where the wish is.
QJsonObject LadderOf(const Preset& preset, uint32_t codec, int wish) {
    QJsonObject ladder;
    const Steps<double>* own = preset.preferences.QualitiesOf(codec);
    if (own == nullptr)
        return ladder;
    for (const auto& step : own->from)
        if (const auto quality = QualityOf(preset, codec, step.first, wish))
            ladder[QString::number(step.first)] = *quality;
    return ladder;
}

void PutPictures(QJsonObject& video, const Preset& preset, const Wishes& wishes) {
    if (wishes.height)
        video[QStringLiteral("fit_within")] = QStringLiteral("32768x%1").arg(std::max(2, *wishes.height));
    if (wishes.rate)
        video[QStringLiteral("frame_rate")] = *wishes.rate;
    if (!wishes.withPictures)
        video[QStringLiteral("leave_out")] = true;
    const FileFormatInfo* format =
        wishes.format ? FindFormat(wishes.format->toStdString()) : FormatOf(preset);
    const std::optional<uint32_t> codec = CodecOf(preset, format);
    const QJsonObject ladder =
        codec && wishes.quality ? LadderOf(preset, *codec, *wishes.quality) : QJsonObject();
    if (ladder.isEmpty())
        return;
    QJsonObject qualities = video.value(QStringLiteral("quality")).toObject();
    qualities[QString::fromStdString(CodeName(*codec))] = ladder;
    video[QStringLiteral("quality")] = qualities;
}

void PutSound(QJsonObject& audio, const Preset& preset, const Wishes& wishes) {
    const bool copies = preset.preferences.copySound;
    const bool copy = wishes.copySound.value_or(copies);
    if (copy != copies)
        audio[QStringLiteral("codec")] = copy ? QJsonValue(QStringLiteral("copy")) : QJsonValue::Null;
    if (wishes.channels && !copy)
        audio[QStringLiteral("channels")] = *wishes.channels;
    if (!wishes.withSound)
        audio[QStringLiteral("leave_out")] = true;
}

/// Wishes for any movie that presets have no words for.
QStringList BeyondPresets(const Wishes& wishes) {
    const std::pair<bool, const char*> all[] = {
        {wishes.crop, QT_TRANSLATE_NOOP("Presets", "cropping")},
        {wishes.deinterlace != Wishes::Deinterlace::kAuto, QT_TRANSLATE_NOOP("Presets", "deinterlacing")},
        {wishes.hdr != Wishes::Hdr::kAuto, QT_TRANSLATE_NOOP("Presets", "HDR")},
        {wishes.depth.has_value(), QT_TRANSLATE_NOOP("Presets", "colour depth")},
        {wishes.clip.has_value(), QT_TRANSLATE_NOOP("Presets", "length of clips")},
        {!wishes.chapters, QT_TRANSLATE_NOOP("Presets", "leaving chapters out")},
        {!wishes.texts, QT_TRANSLATE_NOOP("Presets", "leaving texts out")}};
    QStringList names;
    for (const auto& [wished, name] : all)
        if (wished)
            names += QCoreApplication::translate("Presets", name);
    return names;
}

/// What all that the preset says comes to, without a parent.
QJsonObject WholeOf(const Preset& preset) {
    QJsonObject json = QJsonDocument::fromJson(QByteArray::fromStdString(preset.text)).object();
    json[QStringLiteral("parent")] = QJsonValue::Null;
    return json;
}

bool IsSame(const std::string& path, const std::string& other) {
    std::error_code unknown;
    return std::filesystem::equivalent(path, other, unknown);
}

std::string PlaceOnShelf(const std::string& name) {
    const std::string folder = OwnPresetFolder();
    return folder.empty() ? "" : folder + "/" + name + ".json";
}

} // namespace

std::vector<PresetFacts> PresetsOnShelf() {
    std::vector<PresetFacts> all;
    for (const PresetSummary& summary : ListPresets()) {
        try {
            PresetFacts facts = FactsOf(movieconv::LoadPreset(summary.name));
            const auto words =
                std::find_if(kPresetWords.begin(), kPresetWords.end(), [&](const PresetWords& one) {
                    return summary.path.empty() && summary.name == one.name;
                });
            if (words != kPresetWords.end()) {
                facts.title = QCoreApplication::translate("Presets", words->title);
                facts.description = QCoreApplication::translate("Presets", words->description);
            }
            // One's own takes the place of the program's of that name.
            std::erase_if(all, [&](const PresetFacts& one) { return one.name == facts.name; });
            all.push_back(std::move(facts));
        } catch (const PresetError&) {
            continue; // what cannot be used is not offered
        }
    }
    return all;
}

PresetFacts TakeIntoShelf(const std::string& path) {
    Preset preset = movieconv::LoadPreset(path);
    preset.name = std::filesystem::path(path).stem().string();
    const std::string place = PlaceOnShelf(preset.name);
    std::error_code unknown;
    if (place.empty())
        Fail(QCoreApplication::translate("Presets", "There is no folder for presets of your own."));
    if (IsSame(path, place))
        return FactsOf(preset);
    if (std::filesystem::exists(place, unknown))
        Fail(QCoreApplication::translate("Presets", "You have a preset “%1” already.")
                 .arg(QString::fromStdString(preset.name)));
    WriteFile(place, QJsonDocument(WholeOf(preset)).toJson());
    return FactsOf(preset);
}

QStringList WritePreset(const std::string& path, const Wishes& wishes) {
    const std::string parent = wishes.preset.toStdString();
    const Preset preset = movieconv::LoadPreset(parent);
    // One that is changed cannot be its own parent.
    QJsonObject json = IsSame(path, PlaceOnShelf(parent))
                           ? WholeOf(preset)
                           : QJsonObject{{QStringLiteral("parent"), wishes.preset}};
    json[QStringLiteral("description")] =
        QCoreApplication::translate("Presets", "Made of “%1”.").arg(wishes.preset);
    if (const FileFormatInfo* format = wishes.format ? FindFormat(wishes.format->toStdString()) : nullptr)
        json[QStringLiteral("format")] = QString::fromStdString(CodeName(format->fccFormat)).toLower();
    // Asked for by [], what is missing would come in as null, which takes the parent's away.
    QJsonObject video = json.value(QStringLiteral("video")).toObject();
    QJsonObject audio = json.value(QStringLiteral("audio")).toObject();
    PutPictures(video, preset, wishes);
    PutSound(audio, preset, wishes);
    if (!video.isEmpty())
        json[QStringLiteral("video")] = video;
    if (!audio.isEmpty())
        json[QStringLiteral("audio")] = audio;
    WriteFile(path, QJsonDocument(json).toJson());
    return BeyondPresets(wishes);
}

std::optional<uint32_t> CodecOf(const Preset& preset, const FileFormatInfo* format) {
    if (format == nullptr || preset.preferences.noVideo)
        return std::nullopt;
    Request request;
    request.preferences = preset.preferences;
    try {
        return PictureCodecFor(request, *format);
    } catch (const Failure&) {
        return std::nullopt; // the library tells
    }
}

std::optional<double> QualityOf(const Preset& preset, uint32_t codec, int height, int wish) {
    const std::optional<Scale> scale = ScaleOf(codec);
    const std::optional<double> own = scale ? OwnQuality(preset, codec, height) : std::nullopt;
    const int usual = UsualQuality(preset);
    if (!own || usual < 0)
        return std::nullopt;
    const double quality = *own + (usual - wish) * scale->span / 100;
    return std::clamp(std::round(quality * 2) / 2, scale->whole.best, scale->whole.worst);
}

} // namespace movieconv::window
