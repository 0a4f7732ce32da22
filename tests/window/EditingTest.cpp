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

} // namespace

TEST_F(EditingTest, GoesBackToTheNamingRulesAtOnce) {
    Add({"a.mkv"});
    Activate();
    Type("File to save as", QString::fromStdString(folder / "mine.mp4") + "\r");
    EXPECT_EQ(At(0).target, folder / "mine.mp4");
    Press(Named<QToolButton>("Back to the naming rules"));
    EXPECT_EQ(At(0).target, folder / "a.mp4");
    EXPECT_FALSE(At(0).targetNamed);
}
