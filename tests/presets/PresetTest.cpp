// Presets as files: what they mean with their parents, and what is said of those that make no sense.
#include "host/presets/Preset.h"
#include "media/FourCC.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <string>

namespace {

using namespace movieconv;
namespace fs = std::filesystem;

constexpr uint32_t kH264 = FourCC("H264");
constexpr uint32_t kHevc = FourCC("HEVC");

class Presets : public testing::Test {
protected:
    Presets() {
        setenv("XDG_CONFIG_HOME", folder_.Path().c_str(), 1);
        fs::create_directories(folder_ / "movieconv/presets");
    }

    std::string Path(const std::string& name) const { return folder_ / "movieconv/presets/" + name; }
    void Own(const std::string& name, const std::string& text) const {
        WriteFile(Path(name + ".json"), text);
    }

    /// Why the preset cannot be used; empty when it can.
    static std::string Failure(const std::string& name) {
        try {
            LoadPreset(name);
            return "";
        } catch (const PresetError& error) {
            return error.what();
        }
    }

    const Folder folder_;
};

TEST_F(Presets, OfTheProgramAreWhole) {
    const std::vector<PresetSummary> list = ListPresets();
    ASSERT_EQ(list.size(), 9u);
    EXPECT_EQ(list.front().name, kStandardPreset);
    EXPECT_EQ(list.back().name, "classic");
    for (const PresetSummary& summary : list) {
        const Preset preset = LoadPreset(summary.name);
        EXPECT_TRUE(preset.complaints.empty()) << preset.complaints.front().Text();
        EXPECT_FALSE(summary.description.empty()) << summary.name;
        EXPECT_EQ(preset.description, summary.description);
    }
    const Preferences standard = LoadPreset("standard").preferences;
    const Steps<double>& quality = standard.quality.at(kH264);
    for (const auto& [height, crf] : {std::pair{2, 20}, {719, 20}, {720, 22}, {1080, 23}, {2160, 24}})
        EXPECT_EQ(quality.At(height), crf) << height;
    EXPECT_EQ(standard.audioRate.At(2), 160'000);
    EXPECT_EQ(standard.audioRate.At(6), 384'000);
    const Preferences phone = LoadPreset("phone").preferences;
    EXPECT_EQ(phone.profile, Profile::kBaseline);
    EXPECT_EQ(phone.fitWithin->height, 720);
    EXPECT_EQ(phone.maxFrameRate, 30);
    EXPECT_TRUE(LoadPreset("classic").preferences.quality.empty());
}

TEST_F(Presets, HoldWhatDiffersFromTheirParents) {
    Own("mine", R"({"description": "mine", "parent": "small", "video": {"quality": 30.5, "speed": null}})");
    Own("rated", R"({"parent": "mine", "video": {"rate": "2M"}, "audio": {"rate": 96000, "channels": 1}})");
    Own("again", R"({"parent": "rated", "video": {"codec": "h264", "quality": {"0": 21, "1000": 25}}})");
    Own("standard", R"({"video": {"speed": "slowest"}})"); // its parent is the program's
    Own("plain", "{}");
    Own("kept", R"({"audio": {"codec": "copy"}})");
    Own("converted", R"({"parent": "kept", "audio": {"codec": ["OPUS", "AAC"]}})");
    fs::create_directory(Path("below"));
    WriteFile(Path("below/file.json"), R"({"parent": "../mine.json", "format": "mkv"})");

    const Preset mine = LoadPreset("mine");
    EXPECT_EQ(mine.description, "mine");
    EXPECT_EQ(mine.preferences.quality.at(kHevc).At(2000), 30.5);
    EXPECT_EQ(mine.preferences.quality.at(kH264).At(2000), 24);
    EXPECT_FALSE(mine.preferences.speed);
    EXPECT_EQ(mine.preferences.audioCodecs.front(), FourCC("AAC "));

    const Preferences rated = LoadPreset("rated").preferences;
    EXPECT_TRUE(rated.quality.empty());
    EXPECT_EQ(rated.videoRate, 2'000'000);
    EXPECT_EQ(rated.audioRate.At(6), 96'000);
    EXPECT_EQ(rated.channels, 1);

    const Preferences again = LoadPreset("again").preferences;
    EXPECT_FALSE(again.videoRate);
    EXPECT_EQ(again.quality.at(kH264).At(1000), 25);
    EXPECT_EQ(again.videoCodecs, std::vector<uint32_t>{kH264});

    EXPECT_EQ(LoadPreset("plain").preferences.speed, Speed::kSlowest);
    EXPECT_FALSE(LoadPreset("plain").preferences.copySound);
    EXPECT_TRUE(LoadPreset("kept").preferences.copySound);
    const Preferences converted = LoadPreset("converted").preferences;
    EXPECT_FALSE(converted.copySound);
    EXPECT_EQ(converted.audioCodecs.size(), 2u);
    EXPECT_EQ(LoadPreset("standard").preferences.quality.at(kH264).At(2), 20);
    EXPECT_EQ(LoadPreset(Path("below/file.json")).preferences.quality.at(kHevc).At(2), 30.5);
    EXPECT_EQ(LoadPreset(Path("below/file.json")).preferences.format, FourCC("MKV "));

    const std::vector<PresetSummary> list = ListPresets();
    ASSERT_EQ(list.size(), 16u);
    EXPECT_EQ(list[9].name, "again");
    EXPECT_EQ(list[9].path, Path("again.json"));
}

TEST_F(Presets, KeepUnknownKeysAndTellThem) {
    Own("new", "{\n  \"video\": {\n    \"sharpness\": [1, 2]\n  },\n  \"year\": 2026\n}");
    Own("newer", R"({"parent": "new", "video": {"speed": "slow"}})");
    const Preset preset = LoadPreset("newer");
    EXPECT_NE(preset.text.find("sharpness"), std::string::npos) << preset.text;
    EXPECT_NE(preset.text.find("2026"), std::string::npos) << preset.text;
    ASSERT_EQ(preset.complaints.size(), 2u);
    EXPECT_EQ(preset.complaints[0].Text().find(Path("new.json") + ":3: there is no \"video/sharpness\""), 0u)
        << preset.complaints[0].Text();
    EXPECT_EQ(preset.complaints[1].Text().find(Path("new.json") + ":5: there is no \"year\""), 0u)
        << preset.complaints[1].Text();
}

TEST_F(Presets, TellWhereAndWhyTheyCannotBeUsed) {
    const struct {
        const char* text;
        const char* place; ///< Behind the file.
        const char* word;
    } cases[] = {
        {"", ":1: ", "no JSON"},
        {"{\n\"video\": {\n\"codec\": }\n}", ":3: ", "no JSON: syntax error"},
        {"{\"format\": \"mp4\"", ":1: ", "no JSON"},
        {"{\"description\": \"\xff\"}", ":1: ", "no JSON"},
        {"[]", ":1: ", "object"},
        {"{\n\"format\": \"mp4\",\n\"format\": \"mkv\"}", ":3: ", "twice"},
        {"{\n\"video\": 3}", ":2: ", "\"video\" has to be an object"},
        {"{\"video\": {\n\"codec\": 264}}", ":2: ", "\"video.codec\""},
        {"{\"video\": {\n\"codec\": [\"H264\", \"H.264\"]}}", ":2: ", "four characters"},
        {"{\"video\": {\"codec\": \"H264\",\n\"quality\": \"good\"}}", ":2: ", "0 to 63"},
        {"{\"video\": {\"quality\": {\"H264\":\n{\"0\": 20,\n\"720\": 99}}}}", ":3: ", "0 to 63"},
        {"{\"video\": {\n\"speed\": \"quick\"}}", ":2: ", "slowest, slower"},
        {"{\"video\": {\n\"rate\": \"2 Mbit\"}}", ":2: ", "bit rate"},
        {"{\"video\": {\n\"fit_within\": \"720p\"}}", ":2: ", "1280x720"},
        {"{\"video\": {\n\"frame_rate\": 240}}", ":2: ", "from 0.1 to 200"},
        {"{\"video\": {\n\"leave_out\": 1}}", ":2: ", "true or false"},
        {"{\"audio\": {\n\"rate\": {\"2\": \"160k\", \"six\": \"384k\"}}}", ":2: ", "number of channels"},
        {"{\"audio\": {\n\"channels\": 9}}", ":2: ", "1 to 8"},
        {"{\"audio\": {\n\"sample_rate\": 44100.5}}", ":2: ", "384000"},
        {"{\n\"parent\": 7}", ":2: ", "name of a preset"},
        {"{\n\n\"parent\": \"nobody\"}", ":3: ", "no preset \"nobody\""},
        {"{\n\"parent\": \"case\"}", ":2: ", "as a parent itself"},
    };
    for (const auto& test : cases) {
        Own("case", test.text);
        const std::string failure = Failure("case");
        EXPECT_EQ(failure.find(Path("case.json") + test.place), 0u) << test.text << ": " << failure;
        EXPECT_NE(failure.find(test.word), std::string::npos) << test.text << ": " << failure;
    }
    const std::vector<PresetSummary> list = ListPresets();
    EXPECT_NE(list.back().failure.find("as a parent itself"), std::string::npos) << "told in the list, too";
}

TEST_F(Presets, TellParentsInACircleAndFilesThatCannotBeRead) {
    Own("egg", "{\n\"parent\": \"hen\"}");
    Own("hen", "{\n\n\"parent\": \"egg\"}");
    EXPECT_EQ(Failure("egg").find(Path("hen.json") + ":3: "), 0u) << Failure("egg");
    fs::create_directory(Path("folder.json"));
    WriteFile(Path("large.json"), std::string((1 << 20) + 1, ' '));
    for (const auto& [name, word] : {std::pair<std::string, const char*>{"nobody", "no preset"},
                                     {"", "has a name"},
                                     {"a/b", "a/b\": No such file"},
                                     {"folder", "directory"},
                                     {"large", "too large"},
                                     {Path("nobody.json"), "No such file"}})
        EXPECT_NE(Failure(name).find(word), std::string::npos) << name << ": " << Failure(name);
}

} // namespace
