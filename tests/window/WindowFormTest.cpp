// What is chosen for a movie in the window, over a scripted runner.
#include "host/window/widgets/EntryPage.h"
#include "host/window/widgets/RangeStrip.h"
#include "tests/window/WindowBench.h"

#include <QComboBox>
#include <QFileDialog>
#include <QLineEdit>
#include <QSignalSpy>
#include <QSlider>
#include <QSpinBox>
#include <QToolButton>

using namespace movieconv::window;

using WindowFormTest = WindowBench;

TEST_F(WindowFormTest, EditsAnEntry) {
    Add({"a.mkv", "b.mkv"});
    Select(1);
    auto* preset = Named<QComboBox>("Preset");
    QTest::keyClick(preset, Qt::Key_Down);
    EXPECT_EQ(At(1).wishes.preset, "web");
    auto* format = Named<QComboBox>("File format");
    EXPECT_TRUE(format->currentText().contains(QStringLiteral("webm")));
    QTest::keyClick(format, Qt::Key_Down);
    QTest::keyClick(Named<QComboBox>("Picture size"), Qt::Key_Down);
    QTest::keyClick(Named<QSlider>("Quality"), Qt::Key_Home);
    EXPECT_EQ(At(1).wishes.format, "mp4");
    EXPECT_EQ(At(1).wishes.height, 2160);
    EXPECT_EQ(At(1).wishes.quality, 0);
    auto* begin = Named<QLineEdit>("Begin of the range");
    begin->selectAll();
    QTest::keyClicks(begin, "0:10");
    QTest::keyClick(begin, Qt::Key_Return);
    auto* end = Named<QLineEdit>("End of the range");
    end->selectAll();
    QTest::keyClicks(end, "50\r");
    EXPECT_EQ(At(1).wishes.begin, 10);
    EXPECT_EQ(At(1).wishes.end, 50);
    end->selectAll();
    QTest::keyClicks(end, "rubbish\r");
    EXPECT_FALSE(At(1).wishes.end);
    EXPECT_EQ(end->text(), "1:00");
    EXPECT_EQ(At(0).wishes, Wishes());

    Click("Use for all that wait");
    EXPECT_EQ(At(0).wishes.preset, "web");
    EXPECT_EQ(At(0).wishes.begin, 0);
    Add({"c.mkv"});
    EXPECT_EQ(At(2).wishes.preset, "web"); // the last choice is the next one's
    EXPECT_EQ(At(2).wishes.begin, 0) << "but for what belongs to one movie";
    EXPECT_EQ(Settings(QString::fromStdString(folder / "settings")).LoadWishes().format, "mp4");
}

TEST_F(WindowFormTest, ChoosesTracks) {
    Add({"a.mkv"});
    const auto press = [&](const QString& words) {
        for (QCheckBox* check : Window().findChildren<QCheckBox*>())
            if (check->text().contains(words) && check->isVisible())
                QTest::keyClick(check, Qt::Key_Space);
    };
    press("Kommentar");
    press("French");
    EXPECT_EQ(At(0).wishes.sounds, QList<int>{1});
    EXPECT_EQ(At(0).wishes.subtitles, QList<int>{});
    press("French");
    EXPECT_FALSE(At(0).wishes.subtitles) << "all of them";
    runner.subtitles = 30;
    Add({"b.mkv"});
    Select(1);
    QApplication::processEvents(); // what is new on the page appears
    for (const bool all : {false, true}) {
        Press(Named<QPushButton>(all ? "Subtitles: All" : "Subtitles: None"));
        EXPECT_EQ(At(1).wishes.subtitles.has_value(), !all);
        press("German");
        ASSERT_TRUE(At(1).wishes.subtitles);
        EXPECT_EQ(At(1).wishes.subtitles->size(), all ? 29 : 1);
    }
    EXPECT_EQ(At(0).wishes.sounds, QList<int>{1}) << "the other movie's";
}

TEST_F(WindowFormTest, AddsFilesOfSubtitles) {
    Add({"a.mkv"});
    for (const char* name : {"a.de.srt", "a.srt"}) {
        Click("Add a subtitle file…");
        auto* dialog = The<QFileDialog>("openSubtitles");
        EXPECT_FALSE(dialog->isModal());
        Q_EMIT dialog->filesSelected({QString::fromStdString(folder / name)});
        delete dialog;
    }
    using Files = std::vector<SubtitleFile>;
    EXPECT_EQ(At(0).wishes.subtitleFiles, (Files{{folder / "a.de.srt", "de"}, {folder / "a.srt", {}}}));
    auto* language = Named<QComboBox>("Language of a.srt");
    EXPECT_EQ(language->currentText(), "Language not told");
    QTest::keyClicks(language, "Fren");
    EXPECT_EQ(At(0).wishes.subtitleFiles[1].language, "fr");
    Press(Named<QToolButton>("Leave a.de.srt out"));
    EXPECT_EQ(At(0).wishes.subtitleFiles, (Files{{folder / "a.srt", "fr"}}));
    Add({"b.mkv"});
    EXPECT_TRUE(At(1).wishes.subtitleFiles.empty());
}

TEST_F(WindowFormTest, LeavesTheSoundAsItIs) {
    Add({"a.mkv"});
    QCheckBox* keep = Check("Leave the sound as it is");
    auto* channels = Named<QComboBox>("Sound channels");
    const Wishes& wishes = At(0).wishes;
    QTest::keyClick(keep, Qt::Key_Space);
    EXPECT_EQ(wishes.copySound, true);
    EXPECT_FALSE(channels->isEnabled());
    EXPECT_FALSE(channels->toolTip().isEmpty()) << "why not";
    QTest::keyClick(keep, Qt::Key_Space);
    EXPECT_FALSE(wishes.copySound) << "as the preset has it";
    EXPECT_TRUE(channels->isEnabled());
    QTest::keyClick(Named<QComboBox>("Preset"), Qt::Key_Up);
    EXPECT_EQ(wishes.preset, "kept");
    EXPECT_TRUE(keep->isChecked());
    QTest::keyClick(keep, Qt::Key_Space);
    EXPECT_EQ(wishes.copySound, false);
    Add({"b.mkv"});
    EXPECT_EQ(At(1).wishes.copySound, false) << "the last choice is the next one's";
}

TEST_F(WindowFormTest, DrawsSubtitlesIntoThePictures) {
    runner.subtitles = 3;
    Add({"a.mkv"});
    auto* box = Named<QComboBox>("Subtitles drawn into the pictures");
    const Wishes& wishes = At(0).wishes;
    QTest::keyClick(box, Qt::Key_Down);
    EXPECT_EQ(wishes.burning.track, 3);
    EXPECT_FALSE(wishes.subtitles) << "all others are carried";
    QCheckBox* track = Check("French");
    EXPECT_FALSE(track->isChecked());
    QTest::keyClick(track, Qt::Key_Space);
    EXPECT_EQ(wishes.subtitles, (QList<int>{3, 4, 5})) << "carried as well, since it is asked for";
    QTest::keyClick(box, Qt::Key_Down);
    EXPECT_EQ(wishes.burning.track, 4);
    EXPECT_EQ(wishes.subtitles, (QList<int>{3, 5}));
    Press(Named<QPushButton>("Draw the subtitles of a file"));
    auto* dialog = The<QFileDialog>("openSubtitles");
    EXPECT_FALSE(dialog->isModal());
    Q_EMIT dialog->fileSelected(QString::fromStdString(folder / "a.srt"));
    delete dialog;
    EXPECT_FALSE(wishes.burning.track);
    EXPECT_EQ(wishes.burning.file, folder / "a.srt");
    EXPECT_EQ(box->currentText(), "a.srt");
    Add({"b.mkv"});
    EXPECT_FALSE(At(1).wishes.burning.IsWanted()) << "it belongs to one movie";
    Select(0);
    QTest::keyClick(box, Qt::Key_Home);
    EXPECT_FALSE(wishes.burning.IsWanted());
}

TEST_F(WindowFormTest, ChoosesWhatIsSeldomNeeded) {
    Add({"a.mkv"});
    for (QToolButton* button : The<EntryPage>()->findChildren<QToolButton*>())
        if (button->isCheckable())
            Press(button);
    for (const char* name : {"Pictures a second", "Sound channels", "Cut into clips", "Deinterlacing", "Crop",
                             "HDR pictures", "Colour depth"})
        QTest::keyClick(Named<QComboBox>(name), Qt::Key_Down);
    const Wishes& wishes = At(0).wishes;
    EXPECT_EQ(wishes.rate, 60);
    EXPECT_EQ(wishes.channels, 1);
    EXPECT_EQ(wishes.clip, 60);
    EXPECT_EQ(wishes.deinterlace, Wishes::Deinterlace::kOff);
    EXPECT_TRUE(wishes.crop);
    EXPECT_EQ(wishes.hdr, Wishes::Hdr::kKeep);
    EXPECT_EQ(wishes.depth, 8);
    QTest::keyClick(Named<QComboBox>("Crop"), Qt::Key_Down);
    auto* above = Named<QSpinBox>("Pixels to cut off: above");
    EXPECT_TRUE(above->isVisible());
    above->selectAll();
    QTest::keyClicks(above, "140");
    QTest::keyClick(Named<QSpinBox>("Pixels to cut off: left"), Qt::Key_Up);
    EXPECT_EQ(wishes.cut, (Margins{140, 0, 2, 0}));
    EXPECT_FALSE(wishes.crop);
    auto* title = Named<QLineEdit>("Title");
    EXPECT_EQ(title->text(), "A title");
    title->selectAll();
    QTest::keyClicks(title, "Mine");
    EXPECT_EQ(wishes.title, "Mine");
    for (QCheckBox* check : Window().findChildren<QCheckBox*>())
        if (check->text().remove('&').startsWith("Keep"))
            QTest::keyClick(check, Qt::Key_Space);
    EXPECT_FALSE(wishes.chapters || wishes.texts);
    EXPECT_TRUE(wishes.withSound);
}

TEST_F(WindowFormTest, ChoosesATarget) {
    Add({"a.mkv"});
    WriteFile(folder / "there.mp4", "something");
    auto* target = Named<QLineEdit>("File to save as");
    target->selectAll();
    QTest::keyClicks(target, QString::fromStdString(folder / "there.mp4") + "\r");
    ASSERT_TRUE(Await([&] { return At(0).findings.targetExists; }));
    EXPECT_TRUE(Named<QLabel>("Warnings")->isVisible());
    for (QCheckBox* check : Window().findChildren<QCheckBox*>())
        if (check->text().contains(QStringLiteral("Replace")))
            QTest::keyClick(check, Qt::Key_Space);
    EXPECT_TRUE(At(0).replace);
}

TEST_F(WindowFormTest, ChoosesARangeOnTheStrip) {
    Add({"a.mkv"});
    auto* strip = The<RangeStrip>();
    ASSERT_TRUE(Await([&] { return strip->isEnabled(); }));
    QTest::mousePress(strip, Qt::LeftButton, {}, QPoint(strip->width() / 4, 20));
    QTest::mouseRelease(strip, Qt::LeftButton);
    EXPECT_NEAR(At(0).wishes.begin, 15, 1);
    const double begin = At(0).wishes.begin;
    QTest::keyClick(strip, Qt::Key_Right);
    EXPECT_NEAR(At(0).wishes.begin, begin + 1, 1e-6);
    QTest::keyClick(strip, Qt::Key_E);
    QTest::keyClick(strip, Qt::Key_Left);
    EXPECT_NEAR(*At(0).wishes.end, 59, 1e-6);
    QTest::keyClick(strip, Qt::Key_PageUp);
    EXPECT_GT(*At(0).wishes.end, At(0).wishes.begin); // never before the begin
    QTest::keyClick(strip, Qt::Key_End);
    EXPECT_FALSE(At(0).wishes.end);
    QTest::keyClick(strip, Qt::Key_B);
    QTest::keyClick(strip, Qt::Key_Home);
    EXPECT_EQ(At(0).wishes.begin, 0);
}

TEST_F(WindowFormTest, SavesAndLoadsPresets) {
    Add({"a.mkv"});
    const QString path = QString::fromStdString(folder / "own.json");
    Click("Save as preset…");
    Q_EMIT The<QFileDialog>("savePreset")->fileSelected(path);
    The<QFileDialog>("savePreset")->close();
    EXPECT_EQ(runner.saved.at(folder / "own.json"), At(0).wishes);
    EXPECT_FALSE(Tells("The preset is saved"));
    runner.unkept = QStringList{"cropping", "HDR"};
    Click("Save as preset…");
    Q_EMIT The<QFileDialog>("savePreset")->fileSelected(path);
    EXPECT_TRUE(Tells("cropping, HDR"));
    Click("Load preset…");
    Q_EMIT The<QFileDialog>("loadPreset")->fileSelected(path);
    EXPECT_EQ(At(0).wishes.preset, "web");
    Q_EMIT The<QFileDialog>("loadPreset")->fileSelected(path + "x");
    EXPECT_TRUE(Tells("This is no preset."));
}
