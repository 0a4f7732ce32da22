// What the conversion library says, in the window's language.
#include "host/window/runner/LibraryWords.h"
#include "host/window/runner/LibrarySentences.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <QCoreApplication>
#include <QRegularExpression>
#include <QTranslator>

#include <algorithm>
#include <filesystem>

using namespace movieconv::window;

namespace {

/// A language that puts all words of its own in brackets.
class Brackets : public QTranslator {
public:
    Brackets() { QCoreApplication::installTranslator(this); }
    ~Brackets() override { QCoreApplication::removeTranslator(this); }
    QString translate(const char* context, const char* text, const char*, int) const override {
        return QLatin1String(context) == QLatin1String("Library") ? QStringLiteral("[%1]").arg(text)
                                                                  : QString();
    }
    bool isEmpty() const override { return false; }
};

/// The runs of words in a source's texts, of two words at least: what lies between parts and quotes.
QStringList WordsIn(const std::filesystem::path& path) {
    static const QRegularExpression comment(QStringLiteral("^\\s*(//|#include).*$|\\s//[^\"]*$"),
                                            QRegularExpression::MultilineOption);
    static const QRegularExpression literal(QStringLiteral("\"((?:[^\"\\\\]|\\\\.)*)\""));
    static const QRegularExpression part(QStringLiteral("\\{[^}]*\\}|\\\\.|%[a-z]+"));
    static const QRegularExpression twoWords(QStringLiteral("[a-z]{2,},? [a-z]+"));
    QString text = QString::fromStdString(ReadFile(path));
    text.remove(comment);
    QStringList found;
    for (const QRegularExpressionMatch& match : literal.globalMatch(text))
        if (!match.captured(1).contains(QLatin1String("::"))) // names of places in the code
            for (const QString& run : match.captured(1).split(part))
                if (run.contains(twoWords))
                    found += run.trimmed();
    return found;
}

} // namespace

TEST(LibraryWords, KnowEverySentenceOfTheLibrary) {
    // For wishes that the window does not have: scripts of movies, and a largest size.
    const QStringList elsewhere{"ConcatScript.cpp", "SizePlan.cpp"};
    // For programs.
    const QStringList forNobody{
        "Format: Layer, Start, End, Style, Name, MarginL, MarginR, MarginV, Effect, Text", "; see"};
    QStringList known;
    for (const auto& all : {LibrarySentences(), LibraryNouns()})
        for (const char* sentence : all)
            known += QString::fromUtf8(sentence);
    int runs = 0;
    for (const char* room : {"convert", "source", "presets"}) {
        for (const auto& file :
             std::filesystem::directory_iterator(MOVIECONV_SOURCES "/host/" + std::string(room))) {
            const std::string name = file.path().filename();
            if (file.path().extension() != ".cpp" || elsewhere.contains(QString::fromStdString(name)))
                continue;
            for (const QString& words : WordsIn(file.path())) {
                ++runs;
                EXPECT_TRUE(forNobody.contains(words) ||
                            std::any_of(known.begin(), known.end(),
                                        [&](const QString& sentence) { return sentence.contains(words); }))
                    << name << ": \"" << words.toStdString()
                    << "\" is in none of host/window's LibrarySentences";
            }
        }
    }
    EXPECT_GT(runs, 100);
}

TEST(LibraryWords, SayWhatTheLibrarySays) {
    movieconv::NotCarried what{"subtitles", 3, "hdmv_pgs_subtitle", "ger", "MP4 cannot hold them, MKV can"};
    EXPECT_EQ(LineOf(what), "subtitles 3 (Blu-ray (PGS), German): MP4 cannot hold them, MKV can");
    what = {"tags", std::nullopt, {}, {}, "AVI cannot hold MOOD, KEY and title"};
    EXPECT_EQ(LineOf(what), "tags: AVI cannot hold MOOD, KEY and title");
    EXPECT_EQ(SentenceOf("MP4 cannot hold \"pcm_s16le\" sound as it is; MOV, MKV can"),
              "MP4 cannot hold “PCM” sound as it is; MOV, MKV can.");
    EXPECT_EQ(InWindowsLanguage("there is no preset \"x\"; see \"movieconv --list-presets\""),
              "there is no preset “x”");
    EXPECT_EQ(SentenceOf("cannot open \"/m/a\nb.mkv\": it is cut off"),
              "Cannot open “/m/a\uFFFDb.mkv”: it is cut off.");
    EXPECT_EQ(SentenceOf("something new"), "Something new.");
}

TEST(LibraryWords, TranslateClausesWithinClauses) {
    struct Case {
        const char* text;
        const char* words;
    };
    const Brackets brackets;
    for (const auto& [text, words] : std::vector<Case>{
             {"cannot open \"/m/a and b %2, c.mkv\": it is a text, not a movie",
              "[cannot open “/m/a and b %2, c.mkv”: [it is a text, not a movie]]"},
             {"\"/m/x: y.mkv\": 3 damaged pieces of sound data were skipped",
              "[“/m/x: y.mkv”: [3 damaged pieces of sound data were skipped]]"},
             {"MP4 cannot hold its language as sr-Latn, title and flags",
              "[MP4 cannot hold its [[language as sr-Latn], [title] and [flags]]]"},
             {"the pictures are cropped to 1920x800: 140 above, 140 below, 0 left, 0 right",
              "[the pictures are cropped to 1920x800: 140 above, 140 below, 0 left, 0 right]"},
             {"\"o.mp4\" needs about 1.2 GB to 1.9 GB more, but only 3.0 MB are free",
              "[“o.mp4” needs about 1.2 GB to 1.9 GB more, but only 3.0 MB are free]"},
             {"cannot write \"o.mp4\": No file can be created in the folder \"/m\": Permission denied",
              "[cannot write “o.mp4”: [No file can be created in the folder “/m”: Permission denied]]"},
             {"cannot write \"o.mp4\": Writing to \"o.mp4.part\" failed after 9 bytes: No space left on "
              "device; "
              "9 B were written, 0 B are free: make room or choose another disk; what was written so far is "
              "in "
              "\"o.mp4.part\"",
              "[cannot write “o.mp4”: [[Writing to “o.mp4.part” failed after 9 bytes: No space left on "
              "device]; "
              "9 B were written, 0 B are free: make room or choose another disk]; what was written so far is "
              "in "
              "“o.mp4.part”]"},
             {"reading \"i.ts\" failed after 0:00:04.000: it is cut off: it ends at 0:00:04.000 although it "
              "announces 0:10:00.000; what was read is converted",
              "[reading “i.ts” failed after 0:00:04.000: [it is cut off: it ends at 0:00:04.000 although it "
              "announces 0:10:00.000]; what was read is converted]"},
             {"/p/x.json:3: \"video.rate\" has to be a bit rate such as \"1.5M\"",
              "[/p/x.json:3: “video.rate” has to be [a bit rate such as “1.5M”]]"}})
        EXPECT_EQ(InWindowsLanguage(text).toStdString(), words);
}
