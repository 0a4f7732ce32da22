// The whole window over a scripted runner, for tests.
#ifndef MOVIECONV_TESTS_WINDOW_WINDOWBENCH_H
#define MOVIECONV_TESTS_WINDOW_WINDOWBENCH_H

#include "host/window/App.h"
#include "host/window/widgets/NoticeBar.h"
#include "host/window/widgets/QueueView.h"
#include "tests/support/Folder.h"
#include "tests/window/ScriptedRunner.h"

#include <gtest/gtest.h>

#include <QAction>
#include <QApplication>
#include <QCheckBox>
#include <QDropEvent>
#include <QLabel>
#include <QMimeData>
#include <QPushButton>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

struct WindowBench : testing::Test {
    Folder folder;
    ScriptedRunner runner;
    movieconv::window::Settings settings{QString::fromStdString(folder / "settings")};
    std::unique_ptr<movieconv::window::App> app;

    WindowBench() { Begin(); }

    void Begin(const std::vector<std::string>& movies = {}) {
        app.reset();
        app = std::make_unique<movieconv::window::App>(runner, settings, folder / "queue");
        app->Begin(movies);
    }

    movieconv::window::MainWindow& Window() { return app->Window(); }
    const movieconv::window::Entry& At(size_t row) { return app->TheQueue().Entries().at(row); }
    ScriptedRunner::Script& Script(size_t number) { return *runner.scripts.at(number); }

    std::string Movie(const std::string& name) {
        WriteFile(folder / name, "movie60");
        return folder / name;
    }

    void Add(const std::vector<std::string>& names) {
        std::vector<std::string> paths;
        for (const std::string& name : names)
            paths.push_back(Movie(name));
        const size_t before = app->TheQueue().Entries().size();
        app->TheQueue().Add(paths);
        ASSERT_TRUE(Await([&] {
            const auto& entries = app->TheQueue().Entries();
            return entries.size() == before + names.size() &&
                   std::none_of(entries.begin(), entries.end(),
                                [](auto& entry) { return entry.IsBeingExamined(); });
        }));
    }

    template <class T>
    T* The(const char* name = nullptr) {
        T* found = Window().findChild<T*>(name == nullptr ? QString() : QLatin1String(name));
        if (found == nullptr)
            ADD_FAILURE() << "the window has no "
                          << (name == nullptr ? T::staticMetaObject.className() : name);
        return found;
    }
    template <class T>
    T* Named(const QString& accessibleName) {
        for (T* found : Window().findChildren<T*>())
            if (found->accessibleName() == accessibleName)
                return found;
        ADD_FAILURE() << "the window has no " << accessibleName.toStdString();
        return nullptr;
    }
    QPushButton* Button(const QString& text) {
        for (QPushButton* button : Window().findChildren<QPushButton*>())
            if (QString(button->text()).remove(QLatin1Char('&')) == text && button->isVisible())
                return button;
        ADD_FAILURE() << "the window shows no button " << text.toStdString();
        return nullptr;
    }
    QCheckBox* Check(const QString& words) {
        for (QCheckBox* check : Window().findChildren<QCheckBox*>())
            if (check->text().contains(words) && check->isVisible())
                return check;
        ADD_FAILURE() << "the window shows no box " << words.toStdString();
        return nullptr;
    }
    void Act(const char* name) {
        auto* action = The<QAction>(name);
        EXPECT_TRUE(action->isEnabled()) << name;
        action->trigger();
    }
    /// What has just come into a layout may not have a place yet on which it could be pressed.
    static void Press(QWidget* button) {
        ASSERT_NE(button, nullptr);
        ASSERT_TRUE(Await([&] { return button->isVisible() && !button->size().isEmpty(); }));
        QTest::mouseClick(button, Qt::LeftButton);
    }
    void Click(const QString& text) {
        if (QPushButton* button = Button(text))
            Press(button);
    }
    void Select(size_t row) { The<movieconv::window::QueueView>()->Select(At(row).id); }
    bool AwaitScripts(size_t count) {
        return Await([&] { return runner.scripts.size() == count; });
    }
    bool Tells(const QString& words) {
        const auto labels = The<movieconv::window::NoticeBar>()->findChildren<QLabel*>();
        return std::any_of(labels.begin(), labels.end(),
                           [&](const QLabel* label) { return label->text().contains(words); });
    }
    template <class Page>
    bool Shows() {
        return The<Page>()->isVisible();
    }

    void Drop(const QByteArray& uris, QWidget* place = nullptr) {
        QMimeData data;
        data.setData(QStringLiteral("text/uri-list"), uris);
        QDragEnterEvent enter({300, 300}, Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
        QWidget* target = place == nullptr ? &Window() : place;
        QApplication::sendEvent(target, &enter);
        ASSERT_TRUE(enter.isAccepted());
        QDropEvent drop({300, 300}, Qt::CopyAction, &data, Qt::LeftButton, Qt::NoModifier);
        QApplication::sendEvent(target, &drop);
    }
};

#endif
