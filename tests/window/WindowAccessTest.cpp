// Whether everything in the window can be reached, read and named.
#include "host/window/widgets/EntryPage.h"
#include "host/window/widgets/Look.h"
#include "host/window/widgets/NamingDialog.h"
#include "tests/window/WindowBench.h"

#include <QAccessible>
#include <QComboBox>
#include <QLineEdit>
#include <QMenuBar>
#include <QScrollArea>
#include <QSlider>
#include <QToolButton>
#include <QTranslator>

#include <algorithm>
#include <cmath>
#include <map>
#include <set>

using namespace movieconv::window;

using WindowAccessTest = WindowBench;

namespace {

/// Visits all that a screen reader can reach, below `node`.
void Visit(QAccessibleInterface* node, std::set<QAccessibleInterface*>& seen, QStringList& nameless) {
    if (node == nullptr || !node->isValid() || !seen.insert(node).second)
        return;
    const std::set<QAccessible::Role> needNames = {
        QAccessible::PushButton,   QAccessible::CheckBox, QAccessible::RadioButton, QAccessible::ComboBox,
        QAccessible::EditableText, QAccessible::Slider,   QAccessible::ProgressBar, QAccessible::List,
        QAccessible::ListItem,     QAccessible::MenuItem, QAccessible::Graphic};
    const bool partOfAnother = node->parent() != nullptr && node->parent()->role() == QAccessible::ComboBox;
    if (needNames.contains(node->role()) && !partOfAnother && node->text(QAccessible::Name).isEmpty() &&
        !node->state().invisible) {
        const QObject* object = node->object();
        nameless += QStringLiteral("%1 %2").arg(object ? object->metaObject()->className() : "?",
                                                object ? object->objectName() : QString());
    }
    for (int i = 0; i < node->childCount(); ++i)
        Visit(node->child(i), seen, nameless);
}

} // namespace

TEST_F(WindowAccessTest, NamesEveryControlForScreenReaders) {
    Add({"a.mkv", "b.mkv", "c.mkv"});
    const auto visit = [&] {
        std::set<QAccessibleInterface*> seen;
        QStringList nameless;
        Visit(QAccessible::queryAccessibleInterface(&Window()), seen, nameless);
        EXPECT_TRUE(nameless.isEmpty()) << nameless.join("\n").toStdString();
        return seen.size();
    };
    EXPECT_GT(visit(), 50U);
    for (QToolButton* button : The<EntryPage>()->findChildren<QToolButton*>())
        if (button->isCheckable())
            button->click();
    visit();
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    visit();
    Script(0).End(Ending::kFailed, "It broke.");
    ASSERT_TRUE(AwaitScripts(2));
    Act("quit");
    Select(0);
    visit();
    Act("naming");
    std::set<QAccessibleInterface*> seen;
    QStringList nameless;
    Visit(QAccessible::queryAccessibleInterface(The<NamingDialog>()), seen, nameless);
    EXPECT_TRUE(nameless.isEmpty()) << nameless.join("\n").toStdString();
}

TEST_F(WindowAccessTest, GivesEveryKeyToOneControl) {
    Add({"a.mkv"});
    std::map<QString, QStringList> keys;
    const auto add = [&](const QString& words) {
        const QString key = QKeySequence::mnemonic(words).toString();
        if (!key.isEmpty())
            keys[key] += words;
    };
    for (const QAction* action : Window().menuBar()->actions())
        add(action->text());
    for (QToolButton* button : The<EntryPage>()->findChildren<QToolButton*>())
        if (button->isCheckable())
            button->click();
    for (QWidget* widget : Window().findChildren<QWidget*>()) {
        const auto* button = qobject_cast<QAbstractButton*>(widget);
        const auto* label = qobject_cast<QLabel*>(widget);
        if (widget->isVisible() && button != nullptr)
            add(button->text());
        else if (widget->isVisible() && label != nullptr && label->buddy() != nullptr)
            add(label->text());
    }
    EXPECT_GT(keys.size(), 12U);
    for (const auto& [key, owners] : keys)
        EXPECT_EQ(owners.size(), 1) << key.toStdString() << ": " << owners.join(", ").toStdString();
}

namespace {

/// Words that have less room than they need; names that may be cut are whole in a tool tip.
QStringList CutWords(const QWidget& window) {
    QStringList cut;
    for (const QWidget* widget : window.findChildren<QWidget*>()) {
        const auto* label = qobject_cast<const QLabel*>(widget);
        const auto* button = qobject_cast<const QAbstractButton*>(widget);
        const QString words = label != nullptr    ? label->text()
                              : button != nullptr ? button->text()
                                                  : QString();
        if (widget->isVisible() && !words.isEmpty() &&
            widget->toolTip() != QString(words).replace(QLatin1String("&&"), QLatin1String("&")) &&
            !(label != nullptr && label->wordWrap()) && widget->width() < widget->sizeHint().width())
            cut += words;
        const auto* scroll = qobject_cast<const QScrollArea*>(widget);
        if (scroll != nullptr && scroll->isVisible() &&
            scroll->widget()->width() > scroll->viewport()->width())
            cut += QStringLiteral("%1, %2 pixels")
                       .arg(scroll->parentWidget()->metaObject()->className())
                       .arg(scroll->widget()->width() - scroll->viewport()->width());
    }
    return cut;
}

} // namespace

TEST_F(WindowAccessTest, HasRoomForEveryWordInEveryLanguage) {
    for (const char* language : {"en", "de"}) {
        QTranslator translator;
        ASSERT_TRUE(
            translator.load(QStringLiteral(WINDOW_TRANSLATIONS "/movieconv-gui_%1.qm").arg(language)));
        QApplication::installTranslator(&translator);
        std::filesystem::remove(folder / "queue");
        runner.scripts.clear();
        Begin();
        Window().resize(Window().minimumSize());
        const auto look = [&](const char* page) {
            QApplication::processEvents(); // what is new on the page gets its place
            const QStringList cut = CutWords(Window());
            EXPECT_TRUE(cut.isEmpty()) << language << ", " << page << ":\n" << cut.join("\n").toStdString();
        };
        look("empty");
        Add({"a.mkv", "b.mkv"});
        for (QToolButton* button : The<EntryPage>()->findChildren<QToolButton*>())
            if (button->isCheckable())
                button->click();
        look("entry");
        Wishes wishes = At(0).wishes;
        wishes.cut = Margins{1000, 0, 1000, 0};
        wishes.subtitleFiles = {{folder / "a rather long name for a file of subtitles.srt", "de"}};
        app->TheQueue().SetWishes(At(0).id, wishes);
        look("everything on the entry's page");
        Act("start");
        ASSERT_TRUE(AwaitScripts(1));
        Script(0).Figure(5000, 6000, 0.1);
        ASSERT_TRUE(Await([&] { return At(0).figures.position > 0; }));
        look("work");
        Script(0).End(Ending::kDone);
        ASSERT_TRUE(AwaitScripts(2));
        Select(0);
        look("over");
        Act("naming");
        QApplication::processEvents();
        const QStringList cut = CutWords(*The<NamingDialog>());
        EXPECT_TRUE(cut.isEmpty()) << language << ": " << cut.join("\n").toStdString();
        app.reset();
        QApplication::removeTranslator(&translator);
    }
    Begin();
}

namespace {

/// By which people with weak sight tell a colour from another one: 1 for the same, 21 for black and white.
double Contrast(const QColor& one, const QColor& other) {
    const auto light = [](const QColor& colour) {
        const auto linear = [](double share) { return std::pow(share, 2.2); };
        return 0.2126 * linear(colour.redF()) + 0.7152 * linear(colour.greenF()) +
               0.0722 * linear(colour.blueF()) + 0.05;
    };
    return std::max(light(one), light(other)) / std::min(light(one), light(other));
}

} // namespace

TEST_F(WindowAccessTest, StaysReadableWhenTheSystemTurnsDarkOrLight) {
    const auto faint = [&] {
        QStringList words;
        for (const QLabel* label : Window().findChildren<QLabel*>())
            if (label->isVisible() && Contrast(label->palette().color(QPalette::WindowText),
                                               QApplication::palette().color(QPalette::Window)) < 4)
                words += label->text();
        return words.join(QStringLiteral("\n")).toStdString();
    };
    Add({"a.mkv"});
    Act("start");
    ASSERT_TRUE(AwaitScripts(1));
    for (const bool dark : {true, false}) {
        QApplication::setPalette(OwnPalette(dark));
        EXPECT_TRUE(Await([&] { return faint().empty(); })) << (dark ? "dark:\n" : "light:\n") << faint();
    }
}

TEST_F(WindowAccessTest, ReachesEveryControlByTab) {
    Add({"a.mkv"});
    Window().activateWindow();
    ASSERT_TRUE(QTest::qWaitForWindowActive(&Window()));
    std::set<QWidget*> reached;
    The<QueueView>()->setFocus();
    for (int i = 0; i < 60; ++i) {
        QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
        reached.insert(QApplication::focusWidget());
    }
    for (QWidget* widget : Window().findChildren<QWidget*>()) {
        const bool control = qobject_cast<QAbstractButton*>(widget) || qobject_cast<QComboBox*>(widget) ||
                             qobject_cast<QLineEdit*>(widget) || qobject_cast<QSlider*>(widget);
        const bool inner = widget->parentWidget() && qobject_cast<QLineEdit*>(widget->parentWidget());
        if (control && !inner && widget->isVisibleTo(&Window()) && widget->isEnabled() &&
            widget->focusPolicy() != Qt::NoFocus) {
            EXPECT_TRUE(reached.contains(widget))
                << widget->metaObject()->className() << " " << widget->accessibleName().toStdString();
        }
    }
}
