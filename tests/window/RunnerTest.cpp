// What the window's runner makes of presets and wishes.
#include "host/convert/Formats.h"
#include "host/window/runner/Foresight.h"
#include "host/window/runner/PresetShelf.h"
#include "host/window/runner/Translation.h"
#include "media/FourCC.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <QJsonDocument>
#include <QJsonObject>
#include <QSet>

#include <algorithm>
#include <cstdlib>
#include <functional>
#include <iterator>

using namespace movieconv::window;

namespace {

/// With a folder for presets of its own.
struct RunnerTest : testing::Test {
    Folder folder;

    RunnerTest() { setenv("XDG_CONFIG_HOME", folder.Path().c_str(), 1); }
    ~RunnerTest() override { unsetenv("XDG_CONFIG_HOME"); }

    std::string Own(const std::string& name) const {
        return movieconv::OwnPresetFolder() + "/" + name + ".json";
    }
    static Order OrderOf(const Wishes& wishes, const std::string& target) {
        Order order{"in.mkv", target, wishes, false, {}};
        order.facts.width = 1920;
        order.facts.height = 1080;
        order.facts.rate = 25;
        return order;
    }
    static PresetFacts OnShelf(const QString& name) {
        for (const PresetFacts& facts : PresetsOnShelf())
            if (facts.name == name)
                return facts;
        ADD_FAILURE() << "no preset " << name.toStdString();
        return {};
    }
};

constexpr char kMine[] = R"({"description": "Mine", "parent": "small", "format": "mkv", "unknown": 1})";

} // namespace

TEST_F(RunnerTest, OffersThePresetsOfTheProgramAndOnesOwn) {
    std::filesystem::create_directories(movieconv::OwnPresetFolder());
    WriteFile(Own("mine"), kMine);
    WriteFile(Own("broken"), "{");
    WriteFile(
        Own("web"),
        R"({"description": "Instead of the program's", "format": "webm", "video": {"codec": "VP80", "rate": "1M"}})");
    QStringList names;
    for (const PresetFacts& facts : PresetsOnShelf()) {
        names += facts.name;
        EXPECT_FALSE(facts.title.isEmpty() || facts.description.isEmpty() || facts.extension.isEmpty())
            << facts.name.toStdString();
    }
    EXPECT_EQ(names, QStringList({"standard", "small", "best", "av1", "phone", "archive", "sound", "classic",
                                  "mine", "web"}));
    EXPECT_EQ(OnShelf("mine").description, "Mine");
    EXPECT_EQ(OnShelf("mine").extension, "mkv");
    EXPECT_EQ(OnShelf("sound").extension, "m4a");
    EXPECT_EQ(OnShelf("web").description, "Instead of the program's");
    for (const char* without : {"sound", "archive", "web", "classic"})
        EXPECT_EQ(OnShelf(without).quality, -1) << without;
    EXPECT_LT(OnShelf("small").quality, OnShelf("standard").quality);
    EXPECT_LT(OnShelf("standard").quality, OnShelf("best").quality);
}

// The place where the slider stands at first changes nothing; to the left of it is worse, to the right
// better.
TEST_F(RunnerTest, MovesThePresetsOwnQuality) {
    for (const char* name : {"standard", "small", "best", "av1", "phone"}) {
        SCOPED_TRACE(name);
        const movieconv::Preset preset = movieconv::LoadPreset(name);
        const int usual = OnShelf(name).quality;
        for (const auto& [codec, steps] : preset.preferences.quality) {
            for (const int height : {480, 720, 1080, 2160}) {
                const double own = *steps.At(height);
                EXPECT_EQ(QualityOf(preset, codec, height, usual), own);
                EXPECT_GT(QualityOf(preset, codec, height, 0), own);
                EXPECT_LE(QualityOf(preset, codec, height, 100), own);
                const auto scale = movieconv::QualityRangeOf(codec);
                EXPECT_LE(*QualityOf(preset, codec, height, 0), scale->worst);
                EXPECT_GE(*QualityOf(preset, codec, height, 100), scale->best);
            }
        }
    }
}

TEST_F(RunnerTest, AsksTheLibraryForWhatIsWished) {
    Wishes wishes;
    movieconv::Request request = ToRequest(OrderOf(wishes, "out.mp4"));
    EXPECT_FALSE(request.quality || request.size || request.videoCodec || request.frameRate);
    EXPECT_FALSE(request.preferences.quality.empty());
    EXPECT_EQ(request.deinterlace, movieconv::Deinterlace::kFlagged);
    const double usual = EstimatedRate(OrderOf(wishes, "out.mp4"), request);

    wishes.quality = 10;
    wishes.height = 360;
    wishes.deinterlace = Wishes::Deinterlace::kOff;
    wishes.begin = 5;
    wishes.end = 7;
    request = ToRequest(OrderOf(wishes, "out.webm"));
    ASSERT_TRUE(request.quality && request.size);
    EXPECT_GT(*request.quality, 28) << "VP9's, of which the preset has 28 for so few lines";
    EXPECT_EQ(request.size->width, 640);
    EXPECT_EQ(request.size->height, 360);
    EXPECT_EQ(request.deinterlace, movieconv::Deinterlace::kNone);
    EXPECT_EQ(request.length, 2);
    EXPECT_LT(EstimatedRate(OrderOf(wishes, "out.webm"), request), usual);

    wishes.crop = true; // what is left has another shape, and no borders are to be put back
    request = ToRequest(OrderOf(wishes, "out.webm"));
    EXPECT_TRUE(request.detectCrop && !request.size);
    EXPECT_EQ(request.preferences.fitWithin->height, 360);
    wishes.cut = Margins{140, 140, 0, 0};
    request = ToRequest(OrderOf(wishes, "out.webm"));
    EXPECT_EQ(request.size->width, 864);
    EXPECT_EQ(request.crop.top + request.crop.bottom, 280);
    EXPECT_FALSE(request.detectCrop);
    wishes.height = 1080; // the source's, which what is left does not have any more
    request = ToRequest(OrderOf(wishes, "out.webm"));
    ASSERT_TRUE(request.size);
    EXPECT_EQ(request.size->height, 1080);
    wishes.height = 800;
    EXPECT_FALSE(ToRequest(OrderOf(wishes, "out.webm")).size) << "what is left has just that";

    EXPECT_TRUE(ToRequest(OrderOf({}, "out.mp3")).noVideo);
    Wishes lost;
    lost.preset = "there is none";
    EXPECT_THROW(ToRequest(OrderOf(lost, "out.mp4")), movieconv::PresetError);
}

TEST_F(RunnerTest, AsksTheLibraryForTracksAndTexts) {
    Wishes wishes;
    movieconv::Request request = ToRequest(OrderOf(wishes, "out.mkv"));
    EXPECT_FALSE(request.audioTracks || request.subtitles || request.noChapters || request.noMetadata);
    EXPECT_TRUE(request.metadata.empty() && request.subtitleFiles.empty());
    wishes.sounds = QList<int>{1, 4};
    wishes.subtitles = QList<int>{};
    wishes.subtitleFiles = {{"/s/a.srt", "de"}};
    wishes.subtitleCharset = "BIG5";
    wishes.chapters = wishes.texts = false;
    wishes.title = "Mine";
    wishes.hdr = Wishes::Hdr::kUsual;
    wishes.depth = 8;
    request = ToRequest(OrderOf(wishes, "out.mkv"));
    EXPECT_EQ(request.audioTracks, (movieconv::TrackList{{"1", "4"}}));
    ASSERT_TRUE(request.subtitles);
    EXPECT_TRUE(request.subtitles->empty());
    ASSERT_EQ(request.subtitleFiles.size(), 1U);
    EXPECT_EQ(request.subtitleFiles[0].path, "/s/a.srt");
    EXPECT_EQ(request.subtitleFiles[0].language, "de");
    EXPECT_EQ(request.subtitleCharset, "BIG5");
    EXPECT_TRUE(request.noChapters && request.noMetadata);
    ASSERT_EQ(request.metadata.size(), 1U);
    EXPECT_EQ(request.metadata[0].key + "=" + request.metadata[0].value, "title=Mine");
    EXPECT_EQ(request.hdr, movieconv::Hdr::kSdr);
    EXPECT_EQ(request.depth, 8);
}

TEST_F(RunnerTest, AsksTheLibraryToCopySoundAndToDrawSubtitles) {
    Wishes wishes;
    wishes.copySound = true;
    wishes.channels = 1;
    wishes.burning.track = 3;
    movieconv::Request request = ToRequest(OrderOf(wishes, "out.mkv"));
    EXPECT_TRUE(request.copySound);
    EXPECT_FALSE(request.channels) << "they exclude each other";
    EXPECT_EQ(request.burnSubtitles, "3");
    wishes.burning = {{}, "/s/a.srt"};
    EXPECT_EQ(ToRequest(OrderOf(wishes, "out.mkv")).burnSubtitles, "/s/a.srt");
    EXPECT_EQ(ToRequest(OrderOf(wishes, "out.mp3")).burnSubtitles, "") << "there are no pictures";

    Order order = OrderOf(wishes, "out.mkv");
    order.facts.width = 0;
    order.facts.sounds = {{1, {}, {}, {}, 640'000}, {2, {}, {}, {}, 320'000}};
    EXPECT_EQ(EstimatedRate(order, ToRequest(order)), 960'000);
    order.wishes.sounds = QList<int>{2};
    EXPECT_EQ(EstimatedRate(order, ToRequest(order)), 320'000);
}

TEST_F(RunnerTest, SavesWishesAsAPresetAndTakesThemBack) {
    Wishes wishes;
    wishes.format = "mkv";
    wishes.quality = 80;
    wishes.height = 720;
    wishes.rate = 24;
    wishes.channels = 1;
    wishes.copySound = true;
    wishes.begin = 30; // of one movie alone
    wishes.burning.track = 3;
    WritePreset(Own("mine"), wishes);
    EXPECT_EQ(OnShelf("mine").extension, "mkv");
    EXPECT_NEAR(OnShelf("mine").quality, 80, 3);
    const movieconv::Preset mine = movieconv::LoadPreset("mine");
    EXPECT_TRUE(mine.complaints.empty()) << mine.complaints.front().Text();
    EXPECT_EQ(mine.preferences.fitWithin->height, 720);
    EXPECT_EQ(mine.preferences.frameRate, 24);
    EXPECT_TRUE(mine.preferences.copySound && OnShelf("mine").copiesSound);
    EXPECT_FALSE(mine.preferences.channels) << "the sound's own";
    EXPECT_TRUE(mine.preferences.speed) << "the parent's";

    Wishes changed; // and saved under the name of the preset that it changes
    changed.preset = "mine";
    changed.withSound = false;
    changed.copySound = false;
    WritePreset(Own("mine"), changed);
    EXPECT_FALSE(movieconv::LoadPreset("mine").preferences.copySound);
    EXPECT_TRUE(movieconv::LoadPreset("mine").preferences.noAudio);
    EXPECT_EQ(movieconv::LoadPreset("mine").preferences.frameRate, 24);

    EXPECT_THROW(WritePreset("/proc/none/x.json", wishes), movieconv::PresetError);
}

TEST_F(RunnerTest, MovesAndSavesAQualityThatIsForAllCodecs) {
    std::filesystem::create_directories(movieconv::OwnPresetFolder());
    WriteFile(Own("flat"), R"({"parent": null, "format": "mkv", "video": {"quality": 10}})");
    ASSERT_GE(OnShelf("flat").quality, 0);
    Wishes wishes;
    wishes.preset = "flat";
    wishes.quality = OnShelf("flat").quality - 20;
    WritePreset(Own("mine"), wishes);
    EXPECT_NEAR(OnShelf("mine").quality, *wishes.quality, 3);
    EXPECT_EQ(ToRequest(OrderOf(wishes, "o.mkv")).quality,
              movieconv::LoadPreset("mine").preferences.QualitiesOf(FourCC("XVID"))->At(1080));
}

TEST_F(RunnerTest, SavesAPresetWithAllElseThatItsParentSays) {
    const struct {
        std::function<void(Wishes&)> wish;
        const char* group;
        const char* member;
        QJsonValue value;
    } cases[] = {{[](Wishes& wishes) { wishes.rate = 24; }, "video", "frame_rate", 24},
                 {[](Wishes& wishes) { wishes.height = 360; }, "video", "fit_within", "32768x360"},
                 {[](Wishes& wishes) { wishes.channels = 1; }, "audio", "channels", 1},
                 {[](Wishes& wishes) { wishes.withSound = false; }, "audio", "leave_out", true},
                 {[](Wishes& wishes) { wishes.withPictures = false; }, "video", "leave_out", true}};
    const auto read = [](const std::string& name) {
        QJsonObject json =
            QJsonDocument::fromJson(QByteArray::fromStdString(movieconv::LoadPreset(name).text)).object();
        json.remove("description");
        return json;
    };
    for (const PresetFacts& facts : PresetsOnShelf()) {
        for (const auto& [wish, group, member, value] : cases) {
            Wishes wishes;
            wishes.preset = facts.name;
            wish(wishes);
            WritePreset(Own("mine"), wishes);
            QJsonObject expected = read(facts.name.toStdString());
            QJsonObject part = expected.value(group).toObject();
            part[QLatin1String(member)] = value;
            expected[QLatin1String(group)] = part;
            EXPECT_EQ(read("mine"), expected) << facts.name.toStdString() << ", " << member;
        }
        std::filesystem::remove(Own("mine"));
    }
}

TEST_F(RunnerTest, TellsWhichWishesPresetsCannotHold) {
    const std::function<void(Wishes&)> wishes[] = {
        [](Wishes& wish) { wish.crop = true; },
        [](Wishes& wish) { wish.deinterlace = Wishes::Deinterlace::kAll; },
        [](Wishes& wish) { wish.hdr = Wishes::Hdr::kUsual; },
        [](Wishes& wish) { wish.depth = 8; },
        [](Wishes& wish) { wish.clip = 60; },
        [](Wishes& wish) { wish.chapters = false; },
        [](Wishes& wish) { wish.texts = false; }};
    Wishes all;
    EXPECT_TRUE(WritePreset(Own("mine"), all).isEmpty());
    for (const auto& wish : wishes) {
        Wishes one;
        wish(one);
        EXPECT_EQ(WritePreset(Own("mine"), one).size(), 1);
        wish(all);
    }
    const QStringList names = WritePreset(Own("mine"), all);
    EXPECT_EQ(QSet<QString>(names.begin(), names.end()).size(), std::ssize(wishes))
        << names.join(", ").toStdString();
}

TEST_F(RunnerTest, LooksForTheFilesThatAnOrderWrites) {
    WriteFile(folder / "whole.mp4", "x");
    WriteFile(folder / "cut_03.mp4", "x");
    const struct {
        const char* target;
        bool clips;
        std::string existing;
    } cases[] = {{"whole.mp4", false, folder / "whole.mp4"},
                 {"whole.mp4", true, ""},
                 {"cut.mp4", false, ""},
                 {"cut.mp4", true, folder / "cut_03.mp4"}};
    for (const auto& [target, clips, existing] : cases) {
        Wishes wishes;
        if (clips)
            wishes.clip = 60;
        const Order order = OrderOf(wishes, folder / target);
        EXPECT_EQ(ExistingFileOf(order), existing) << target;
        const Findings findings = Foresee(order);
        EXPECT_EQ(findings.targetExists, !existing.empty()) << target;
        const QStringList told = findings.warnings.filter(QStringLiteral("already"));
        EXPECT_EQ(told.size(), existing.empty() ? 0 : 1) << target;
    }
}

TEST_F(RunnerTest, TakesAPresetFromElsewhere) {
    std::filesystem::create_directory(folder / "sticks");
    WriteFile(folder / "sticks/mine.json", kMine);
    const PresetFacts taken = TakeIntoShelf(folder / "sticks/mine.json");
    EXPECT_EQ(taken.name, "mine");
    EXPECT_EQ(taken.complaints.filter(QStringLiteral("there is no “unknown” in presets")).size(), 1);
    std::filesystem::remove_all(folder / "sticks");
    EXPECT_EQ(OnShelf("mine").description, "Mine");
    EXPECT_FALSE(movieconv::LoadPreset("mine").preferences.quality.empty());
    EXPECT_EQ(TakeIntoShelf(Own("mine")).name, "mine");

    std::filesystem::create_directory(folder / "sticks");
    WriteFile(folder / "sticks/mine.json", R"({"description": "another"})");
    EXPECT_THROW(TakeIntoShelf(folder / "sticks/mine.json"), movieconv::PresetError);
    EXPECT_EQ(OnShelf("mine").description, "Mine") << "nothing is replaced unasked";
    WriteFile(folder / "sticks/words.json", "words");
    EXPECT_THROW(TakeIntoShelf(folder / "sticks/words.json"), movieconv::PresetError);
    EXPECT_FALSE(std::filesystem::exists(Own("words")));
}
