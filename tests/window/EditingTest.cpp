// What is chosen on a movie's page, and what it comes to.
#include "host/window/widgets/EntryPage.h"
#include "host/window/widgets/RangeStrip.h"
#include "tests/window/WindowBench.h"

#include <QAbstractSpinBox>
#include <QComboBox>
#include <QDir>
#include <QLineEdit>
#include <QScrollArea>
#include <QSignalSpy>
#include <QSlider>
#include <QToolButton>
#include <QWheelEvent>

using namespace movieconv::window;

namespace {

struct EditingTest : WindowBench {
    void Type(const char* field, const QString& words) {
        auto* edit = Named<QLineEdit>(field);
        edit->setFocus();
        edit->selectAll();
        QTest::keyClicks(edit, words);
    }
    void Activate() {
        Window().activateWindow();
        ASSERT_TRUE(QTest::qWaitForWindowActive(&Window()));
    }
};

void TurnWheelOver(QWidget& widget) {
    QWheelEvent turn(QPointF(5, 5), widget.mapToGlobal(QPointF(5, 5)), {}, QPoint(0, -120), Qt::NoButton,
                     Qt::NoModifier, Qt::NoScrollPhase, false);
    QApplication::sendEvent(&widget, &turn);
}

} // namespace

TEST_F(EditingTest, LeavesTheWheelToThePage) {
    Add({"a.mkv"});
    Wishes wishes;
    wishes.cut = Margins{10, 10, 10, 10};
    wishes.subtitleFiles = {{folder / "a.srt", "de"}};
    app->TheQueue().SetWishes(At(0).id, wishes);
    for (QToolButton* button : The<EntryPage>()->findChildren<QToolButton*>())
        if (button->isCheckable())
            button->click();
    Activate();
    The<QueueView>()->setFocus();
    const auto isControl = [](QWidget* widget) {
        return qobject_cast<QComboBox*>(widget) || qobject_cast<QAbstractSpinBox*>(widget) ||
               qobject_cast<QSlider*>(widget);
    };
    int controls = 0;
    for (QWidget* widget : The<EntryPage>()->findChildren<QWidget*>()) {
        if (!isControl(widget))
            continue;
        TurnWheelOver(*widget);
        ++controls;
        EXPECT_EQ(At(0).wishes, wishes) << widget->accessibleName().toStdString();
        EXPECT_FALSE(widget->hasFocus()) << widget->accessibleName().toStdString();
    }
    EXPECT_GT(controls, 12);
    auto* quality = Named<QSlider>("Quality");
    quality->setFocus();
    TurnWheelOver(*quality);
    EXPECT_TRUE(At(0).wishes.quality) << "which has the focus";
}

TEST_F(EditingTest, GoesBackToTheNamingRulesAtOnce) {
    Add({"a.mkv"});
    Activate();
    Type("File to save as", QString::fromStdString(folder / "mine.mp4") + "\r");
    EXPECT_EQ(At(0).target, folder / "mine.mp4");
    Press(Named<QToolButton>("Back to the naming rules"));
    EXPECT_EQ(At(0).target, folder / "a.mp4");
    EXPECT_FALSE(At(0).targetNamed);
}

TEST_F(EditingTest, CompletesNames) {
    Add({"a.mkv"});
    Activate();
    const struct {
        QString typed;
        std::string target;
    } cases[] = {{"mine", folder / "mine.mp4"},
                 {"mr. b. 1.5", folder / "mr. b. 1.5.mp4"},
                 {"more/mine.m4v", folder / "more/mine.m4v"},
                 {"mine.mkv", folder / "mine.mkv"},
                 {"yours", folder / "yours.mkv"}, // whose format is shown now
                 {"./more/../mine.mp4", folder / "mine.mp4"},
                 {"/elsewhere/mine.mp4", "/elsewhere/mine.mp4"},
                 {"~/mine.mp4", QDir::homePath().toStdString() + "/mine.mp4"}};
    for (const auto& [typed, target] : cases) {
        Type("File to save as", typed + "\r");
        EXPECT_EQ(At(0).target, target);
        EXPECT_EQ(Named<QLineEdit>("File to save as")->text().toStdString(), target);
    }
}

TEST_F(EditingTest, GivesAChosenNameTheExtensionOfTheFormat) {
    Add({"a.mkv"});
    Activate();
    Type("File to save as", "mine.mp4\r");
    QTest::keyClicks(Named<QComboBox>("File format"), "Matr");
    EXPECT_EQ(At(0).wishes.format, "mkv");
    EXPECT_EQ(At(0).target, folder / "mine.mkv");
    QTest::keyClick(Named<QComboBox>("Preset"), Qt::Key_Down);
    EXPECT_EQ(At(0).target, folder / "mine.webm") << "the preset's";
    Type("File to save as", "mine.mkv\r");
    QTest::keyClick(Named<QSlider>("Quality"), Qt::Key_Home);
    EXPECT_EQ(At(0).target, folder / "mine.mkv") << "as it was named";
}

TEST_F(EditingTest, MovesTheRangeByTheLeftButtonAlone) {
    Add({"a.mkv"});
    auto* strip = The<RangeStrip>();
    ASSERT_TRUE(Await([&] { return strip->isEnabled(); }));
    for (const Qt::MouseButton button : {Qt::RightButton, Qt::MiddleButton})
        QTest::mouseClick(strip, button, {}, QPoint(strip->width() / 2, 20));
    EXPECT_EQ(At(0).wishes, Wishes());
}

TEST_F(EditingTest, TakesDroppedMoviesWithoutMovingThem) {
    QMimeData data;
    data.setData(QStringLiteral("text/uri-list"), "file://" + QByteArray::fromStdString(Movie("a.mkv")));
    const Qt::DropActions both = Qt::MoveAction | Qt::CopyAction;
    QDragEnterEvent enter({300, 300}, both, &data, Qt::LeftButton, Qt::ShiftModifier);
    QApplication::sendEvent(&Window(), &enter);
    EXPECT_EQ(enter.dropAction(), Qt::CopyAction);
    QDropEvent drop({300, 300}, both, &data, Qt::LeftButton, Qt::ShiftModifier);
    QApplication::sendEvent(&Window(), &drop);
    EXPECT_TRUE(drop.isAccepted());
    EXPECT_EQ(drop.dropAction(), Qt::CopyAction) << "else the one who gave it removes it";
}

TEST_F(EditingTest, PlaysWhatIsSelectedAlthoughItIsNotCurrent) {
    QObject::disconnect(&Window(), &MainWindow::FileWanted, nullptr, nullptr);
    const QSignalSpy files(&Window(), &MainWindow::FileWanted);
    Add({"a.mkv"});
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    Script(0).End(Ending::kDone);
    ASSERT_TRUE(Await([&] { return !app->TheDispatcher().IsWorking(); }));
    Add({"b.mkv"});
    Select(1);
    The<QueueView>()->selectAll();
    Act("play");
    EXPECT_EQ(files.size(), 1);
}

TEST_F(EditingTest, NamesAPresetThatIsGone) {
    Wishes wishes;
    wishes.preset = "vanished";
    settings.Save(wishes);
    Begin();
    Add({"a.mkv"});
    auto* preset = Named<QComboBox>("Preset");
    EXPECT_EQ(preset->currentText(), "");
    EXPECT_EQ(preset->placeholderText(), "vanished");
    EXPECT_EQ(At(0).wishes.preset, "vanished");
}

TEST_F(EditingTest, ShowsHowManyMoviesAreConvertedAtTheSameTime) {
    settings.SaveAtOnce(4);
    Begin();
    EXPECT_EQ(app->TheDispatcher().AtOnce(), 4);
    EXPECT_TRUE(The<QAction>("atOnce4")->isChecked());
}

TEST_F(EditingTest, IsWalkedThroughInTheOrderOfThePage) {
    runner.subtitles = 5;
    Add({"a.mkv"});
    Wishes wishes;
    wishes.subtitleFiles = {{folder / "a.srt", "de"}};
    app->TheQueue().SetWishes(At(0).id, wishes);
    ASSERT_TRUE(Await([&] { return At(0).IsStartable(); }));
    Activate();
    The<QueueView>()->setFocus();
    QList<QWidget*> walk;
    for (int i = 0; i < 60; ++i) {
        QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
        walk += QApplication::focusWidget();
        EXPECT_EQ(qobject_cast<QScrollArea*>(walk.last()), nullptr);
    }
    const std::vector<QWidget*> order = {Named<QComboBox>("File format"),
                                         Check("Kommentar"),
                                         Check("Leave the sound"),
                                         Check("French"),
                                         Named<QPushButton>("Subtitles: All"),
                                         Named<QComboBox>("Language of a.srt"),
                                         Named<QToolButton>("Leave a.srt out"),
                                         Button("Add a subtitle file…"),
                                         Named<QLineEdit>("File to save as"),
                                         The<QPushButton>("startButton")};
    for (size_t i = 1; i < order.size(); ++i)
        EXPECT_LT(walk.indexOf(order[i - 1]), walk.indexOf(order[i])) << i;
}
