// What the conversion library says, in the window's language.
#include "host/window/runner/LibraryWords.h"
#include "host/convert/WritersWords.h"
#include "host/sentence/Say.h"
#include "tests/support/Folder.h"

#include <gtest/gtest.h>

#include <QCoreApplication>
#include <QRegularExpression>
#include <QTranslator>
#include <QXmlStreamReader>

#include <algorithm>
#include <filesystem>
#include <string>
#include <utility>
#include <vector>

using namespace movieconv;
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

/// The library's sentences as the German translations have them, with their words.
std::vector<std::pair<QString, QString>> GermanSentences() {
    QXmlStreamReader xml(
        QString::fromStdString(ReadFile(MOVIECONV_SOURCES "/host/window/translations/movieconv-gui_de.ts")));
    std::vector<std::pair<QString, QString>> all;
    QString context;
    while (!xml.atEnd()) {
        if (xml.readNext() != QXmlStreamReader::StartElement)
            continue;
        if (xml.name() == QLatin1String("name"))
            context = xml.readElementText();
        else if (context == QLatin1String("Library") && xml.name() == QLatin1String("source"))
            all.emplace_back(xml.readElementText(), QString());
        else if (context == QLatin1String("Library") && xml.name() == QLatin1String("translation"))
            all.back().second = xml.readElementText();
    }
    return all;
}

WriterStatus Failed(const char* what, int systemError) {
    WriterStatus status{};
    status.nSystemError = systemError;
    qstrncpy(status.szWhat, what, sizeof status.szWhat);
    return status;
}

} // namespace

// Lest a text is told that is not made by Say: it would stay English.
TEST(LibraryWords, TheTranslationsHaveEverySentenceOfTheLibrary) {
    const QStringList forNobody{
        "Format: Layer, Start, End, Style, Name, MarginL, MarginR, MarginV, Effect, Text"};
    QStringList known;
    for (const auto& [sentence, words] : GermanSentences())
        known += sentence;
    int runs = 0;
    for (const char* room : {"convert", "source", "presets"}) {
        for (const auto& file :
             std::filesystem::directory_iterator(MOVIECONV_SOURCES "/host/" + std::string(room))) {
            if (file.path().extension() != ".cpp")
                continue;
            for (const QString& words : WordsIn(file.path())) {
                ++runs;
                EXPECT_TRUE(forNobody.contains(words) ||
                            std::any_of(known.begin(), known.end(),
                                        [&](const QString& sentence) { return sentence.contains(words); }))
                    << file.path() << ": \"" << words.toStdString()
                    << "\" is not translated: make it by Say and run scripts/translate";
            }
        }
    }
    EXPECT_GT(runs, 100);
}

TEST(LibraryWords, TheGermanOnesHaveAllParts) {
    static const QRegularExpression place(QStringLiteral("\\{[^}]*\\}"));
    static const QRegularExpression numbered(QStringLiteral("\\{\\d\\}"));
    for (const auto& [sentence, words] : GermanSentences()) {
        const qsizetype parts = sentence.count(place);
        EXPECT_EQ(words.count(place), parts) << words.toStdString();
        for (qsizetype part = 0; words.contains(numbered) && part < parts; ++part)
            EXPECT_TRUE(words.contains(QStringLiteral("{%1}").arg(part))) << words.toStdString();
        EXPECT_FALSE(words.contains(QLatin1Char('"'))) << words.toStdString(); // it would become English
    }
}

TEST(LibraryWords, SayWhatTheLibrarySays) {
    NotCarried what{"subtitles", 3, "hdmv_pgs_subtitle", "ger", Say("{} cannot hold them, MKV can", "MP4")};
    EXPECT_EQ(LineOf(what), "subtitles 3 (Blu-ray (PGS), German): MP4 cannot hold them, MKV can");
    what = {"tags",
            std::nullopt,
            {},
            {},
            Say("{} cannot hold {}", "AVI",
                SayList({std::string("MOOD"), std::string("KEY"), std::string("title")}))};
    EXPECT_EQ(LineOf(what), "tags: AVI cannot hold MOOD, KEY and title");
    EXPECT_EQ(SentenceOf(Say("{} cannot hold \"{}\" sound as it is; {} can", "MP4", SayCodec("pcm_s16le"),
                             "MOV, MKV")),
              "MP4 cannot hold “PCM” sound as it is; MOV, MKV can.");
    EXPECT_EQ(InWindowsLanguage(Say("there is no preset \"{}\"", "x")), "there is no preset “x”");
    EXPECT_EQ(SentenceOf(Say("cannot open \"{}\": {}", "/m/a\nb.mkv", Say("it is cut off"))),
              "Cannot open “/m/a\uFFFDb.mkv”: it is cut off.");
    EXPECT_EQ(SentenceOf(std::string("something new")), "Something new.");
    EXPECT_EQ(SentenceOf({}), "");
}

TEST(LibraryWords, TranslateClausesWithinClauses) {
    const Brackets brackets;
    const Sentence full = WritersWords(
        Failed("Writing to \"o.mp4.part\" failed after 9 bytes: No space left on device.", ENOSPC));
    const std::vector<std::pair<Sentence, const char*>> cases{
        {Say("cannot open \"{}\": {}", "/m/a and b %2, {0} c.mkv", Say("it is a text, not a movie")),
         "[cannot open “/m/a and b %2, {0} c.mkv”: [it is a text, not a movie]]"},
        {Say("\"{}\": {}", "/m/sound", Say("{} damaged pieces of sound data were skipped", 3)),
         "[“/m/sound”: [3 damaged pieces of sound data were skipped]]"},
        {Say("{} cannot hold its {}", "MP4",
             SayList({Say("language as {}", "sr-Latn"), Say("title"), Say("flags")})),
         "[MP4 cannot hold its [[language as sr-Latn], [title] and [flags]]]"},
        {Say("\"{}\" exists", "sound"), "[“sound” exists]"},
        {Say("the pictures are cropped to {}x{}: {} above, {} below, {} left, {} right", 1920, 800, 140, 140,
             0, 0),
         "[the pictures are cropped to 1920x800: 140 above, 140 below, 0 left, 0 right]"},
        {Say("cannot write \"{}\": {}", "o.mp4",
             WritersWords(Failed("No file can be created in the folder \"/m\": Permission denied.", EACCES))),
         "[cannot write “o.mp4”: [No file can be created in the folder “/m”: Permission denied]]"},
        {Say("reading \"{}\" failed after {}: {}; what was read is converted", "i.ts", "0:00:04.000",
             Say("it is cut off: it ends at {} although it announces {}", "0:00:04.000", "0:10:00.000")),
         "[reading “i.ts” failed after 0:00:04.000: [it is cut off: it ends at 0:00:04.000 although it "
         "announces 0:10:00.000]; what was read is converted]"},
        {Say("cannot begin {:.1f} s behind", 1.25), "[cannot begin 1.2 s behind]"},
        {Say("\"{}\" needs about {} to {} more, but only {} are free", "o.mp4", SayAmount("1.2 GB"),
             SayAmount("1.9 GB"), SayAmount("3.0 MB")),
         "[“o.mp4” needs about 1.2 GB to 1.9 GB more, but only 3.0 MB are free]"},
        {Say("cannot read \"{}\": {}", "i", Sentence("Invalid data found when processing input")),
         "[cannot read “i”: [Invalid data found when processing input]]"},
        {Say("cannot write \"{}\": {}; what was written so far is in \"{}\"", "o.mp4",
             Say("{}; {} were written, {} are free: make room or choose another disk", full, SayAmount("9 B"),
                 SayAmount("0 B")),
             "o.mp4.part"),
         "[cannot write “o.mp4”: [[Writing to “o.mp4.part” failed after 9 bytes: No space left on device]; "
         "9 B were written, 0 B are free: make room or choose another disk]; what was written so far is in "
         "“o.mp4.part”]"},
        {Say("{}: \"{}\" has to be {}", "/p/x.json:3", "video.rate",
             Say("a bit rate such as \"{}\"", "1.5M")),
         "[/p/x.json:3: “video.rate” has to be [a bit rate such as “1.5M”]]"}};
    for (const auto& [sentence, words] : cases)
        EXPECT_EQ(InWindowsLanguage(sentence).toStdString(), words);
}

// A language may need the parts in another order, and has its own quotes and point.
TEST(LibraryWords, FollowTheLanguageOfTheirWords) {
    class German : public QTranslator {
    public:
        QString translate(const char*, const char* text, const char*, int) const override {
            return QLatin1String(text) == QLatin1String("\"{}\" of {}") ? QStringLiteral("{1} von „{0}“")
                                                                        : QString();
        }
        bool isEmpty() const override { return false; }
    };
    German german;
    QCoreApplication::installTranslator(&german);
    const QLocale before;
    QLocale::setDefault(QLocale(QLocale::German));
    const QString words = InWindowsLanguage(Say("\"{}\" of {}", "a.b", SayAmount("1.2 GB")));
    QLocale::setDefault(before);
    QCoreApplication::removeTranslator(&german);
    EXPECT_EQ(words.toStdString(), "1,2 GB von „a.b“");
}

// The writer tells texts; those that are known are taken apart as they were made.
TEST(LibraryWords, KnowWhatTheWriterSays) {
    const Brackets brackets;
    const struct {
        const char* what;
        int error;
        const char* words;
    } cases[] = {
        {"Syncing \"/m/a\" failed: Input/output error.", EIO, "[Syncing “/m/a” failed: Input/output error]"},
        {"No file can be created in the folder \"/m\": Permission denied.", EACCES,
         "[No file can be created in the folder “/m”: Permission denied]"},
        {"The file exists already.", EEXIST, "[The file exists already (File exists)]"},
        {"Pictures of 7x9 cannot be written; choose another size.", 0,
         "[Pictures of 7x9 cannot be written; choose another size]"},
        {"The encoder libx264 failed: Generic error in an external library.", 0,
         "[The encoder libx264 failed: [Generic error in an external library]]"},
        {"There is not enough memory.", 0, "[There is not enough memory]"},
        {"Syncing the tape failed.", 0, "Syncing the tape failed"},
        {"", 0, "[the media writer gave no reason]"}};
    for (const auto& test : cases)
        EXPECT_EQ(InWindowsLanguage(WritersWords(Failed(test.what, test.error))).toStdString(), test.words);

    QString writer = QStringLiteral("the media writer gave no reason");
    for (const auto& file : std::filesystem::directory_iterator(MOVIECONV_SOURCES "/writer"))
        writer += QString::fromStdString(ReadFile(file.path()));
    const QStringList known = WordsIn(MOVIECONV_SOURCES "/host/convert/WritersWords.cpp");
    EXPECT_GT(known.size(), 8);
    static const QRegularExpression ends(QStringLiteral("[ (:]+$"));
    for (QString words : known)
        EXPECT_TRUE(writer.contains(words.remove(ends))) << words.toStdString();
}
