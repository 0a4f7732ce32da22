// What is asked of the desktop, on a bus of the test's own where stand-ins answer.
#include "host/window/desktop/Desktop.h"
#include "host/window/desktop/Instance.h"
#include "tests/window/ScriptedRunner.h"
#include "tests/window/StandIns.h"

#include <gtest/gtest.h>

#include <QDBusConnection>
#include <QSignalSpy>
#include <QUrl>
#include <QVariantMap>

#include <array>
#include <memory>
#include <poll.h>
#include <unistd.h>

using namespace movieconv::window;

namespace {

/// The stand-ins, under the names of those that they stand for.
struct OnABus : testing::Test {
    Desktop desktop;
    Login login{desktop};
    Notifications notifications{desktop};
    FileManager files{desktop};
    Portal portal;
    QDBusConnection bus =
        QDBusConnection::connectToBus(QDBusConnection::SessionBus, QStringLiteral("stand-ins"));

    void SetUp() override {
        ASSERT_TRUE(bus.isConnected());
        const auto stand = [&](const char* service, const char* path, QObject& object) {
            ASSERT_TRUE(
                bus.registerObject(QLatin1String(path), &object,
                                   QDBusConnection::ExportAllSlots | QDBusConnection::ExportAllSignals));
            ASSERT_TRUE(bus.registerService(QLatin1String(service)));
        };
        stand("org.freedesktop.login1", "/org/freedesktop/login1", login);
        stand("org.freedesktop.Notifications", "/org/freedesktop/Notifications", notifications);
        stand("org.freedesktop.FileManager1", "/org/freedesktop/FileManager1", files);
        stand("org.freedesktop.portal.Desktop", "/org/freedesktop/portal/desktop", portal);
    }
    void TearDown() override { QDBusConnection::disconnectFromBus(QStringLiteral("stand-ins")); }
    bool Awaits(const QString& call) {
        return Await([&] { return desktop.calls.contains(call); });
    }
};

/// Whether somebody else still holds the other end of a pipe.
bool IsHeld(int end) {
    pollfd state{end, POLLIN, 0};
    return poll(&state, 1, 0) == 0;
}

} // namespace

TEST_F(OnABus, TheMachineIsKeptAwakeUntilAllIsDone) {
    std::array<int, 2> ends{};
    ASSERT_EQ(pipe(ends.data()), 0);
    desktop.lock.giveFileDescriptor(ends[1]);
    SleepGuard guard;
    const QSignalSpy refused(&guard, &SleepGuard::Refused);
    guard.Hold();
    guard.Hold();
    ASSERT_TRUE(Awaits("inhibit idle:sleep block"));
    EXPECT_TRUE(IsHeld(ends[0]));
    guard.Release();
    EXPECT_TRUE(Await([&] { return !IsHeld(ends[0]); }));
    EXPECT_EQ(desktop.calls.size(), 1);
    EXPECT_TRUE(refused.isEmpty());
    close(ends[0]);

    ASSERT_TRUE(bus.unregisterService(QStringLiteral("org.freedesktop.login1")));
    guard.Hold();
    EXPECT_TRUE(Await([&] { return refused.size() == 1; })) << "told where there is nobody to ask";
}

TEST_F(OnABus, TheEndIsTold) {
    Notifier notifier;
    const QSignalSpy chosen(&notifier, &Notifier::Chosen);
    notifier.Notify(QStringLiteral("Done"), QStringLiteral("One movie."), true);
    ASSERT_TRUE(Awaits("notify 0 Done: One movie."));
    EXPECT_EQ(desktop.hints["sound-name"], "complete");
    EXPECT_EQ(desktop.hints["desktop-entry"], "org.movieconv.MovieConv");
    EXPECT_TRUE(Await([&] {
        Q_EMIT notifications.ActionInvoked(7, QStringLiteral("default"));
        return !chosen.isEmpty();
    }));
    notifier.Notify(QStringLiteral("Done"), QStringLiteral("Two."), false);
    ASSERT_TRUE(Awaits("notify 7 Done: Two.")) << "in place of the last one";
    EXPECT_FALSE(desktop.hints.contains("sound-name"));
    Suspend();
    EXPECT_TRUE(Awaits("suspend"));
    ShowInFolder("/m/ü 1\xFF.mp4");
    EXPECT_TRUE(Awaits("show file:///m/%C3%BC%201%FF.mp4"));
}

TEST_F(OnABus, ASecondProgramHandsItsMoviesToTheFirst) {
    const auto connection = [](const char* name) {
        return QDBusConnection::connectToBus(QDBusConnection::SessionBus, QLatin1String(name));
    };
    auto first = std::make_unique<Instance>(connection("first"));
    std::vector<std::vector<std::string>> asked;
    QObject::connect(first.get(), &Instance::Asked, [&](const auto& movies) { asked.push_back(movies); });
    EXPECT_FALSE(first->HandOver({"/m/a.mkv"})) << "it is the only one";
    const std::vector<std::string> movies{"/m/ü %1\xFF\n.mkv", "/m/b.mkv"};
    EXPECT_TRUE(Instance(connection("second")).HandOver(movies));
    EXPECT_TRUE(Instance(connection("third")).HandOver({}));
    EXPECT_EQ(asked, (std::vector{movies, {}}));
    first.reset();
    QDBusConnection::disconnectFromBus(QStringLiteral("first"));
    EXPECT_TRUE(Await([&] { return !Instance(connection("fourth")).HandOver({}); })) << "the first has ended";
    for (const char* name : {"second", "third", "fourth"})
        QDBusConnection::disconnectFromBus(QLatin1String(name));
}

TEST_F(OnABus, LightAndDarkFollowTheDesktop) {
    ColourWish wish;
    QSignalSpy told(&wish, &ColourWish::Told);
    wish.Ask();
    ASSERT_TRUE(Await([&] { return !told.isEmpty(); }));
    EXPECT_TRUE(told.takeFirst()[0].toBool());
    ASSERT_TRUE(Await([&] {
        Q_EMIT portal.SettingChanged(QStringLiteral("org.freedesktop.appearance"),
                                     QStringLiteral("color-scheme"), QDBusVariant(2U));
        return !told.isEmpty();
    }));
    EXPECT_FALSE(told.takeFirst()[0].toBool());
}
