#include "host/window/model/Words.h"

#include "host/window/model/Languages.h"

#include <QCoreApplication>
#include <QLocale>
#include <QStringList>
#include <QTextDocument>

#include <algorithm>
#include <cmath>

namespace movieconv::window {
namespace {

struct Words {
    Q_DECLARE_TR_FUNCTIONS(Words)
};

QString ActiveLine(const Figures& figures) {
    if (figures.phase != Phase::kConverting)
        return PhaseText(figures.phase);
    QStringList parts;
    if (figures.fraction >= 0)
        parts += Words::tr("%1 %").arg(QLocale().toString(figures.fraction * 100, 'f', 1));
    if (figures.speed)
        parts += SpeedText(*figures.speed);
    if (figures.left)
        parts += Words::tr("%1 left").arg(LeftText(*figures.left));
    return parts.isEmpty() ? PhaseText(figures.phase) : parts.join(QStringLiteral(" · "));
}

QString WaitingLine(const Entry& entry, const QString& preset) {
    if (!entry.unusable.isEmpty())
        return Words::tr("Cannot be converted");
    QStringList parts;
    if (!entry.facts)
        parts += Words::tr("Looking at it…");
    else if (const auto seconds = entry.SecondsWanted())
        parts += ClockText(*seconds);
    parts += preset;
    parts += Words::tr("to %1").arg(NameOf(entry.target));
    return parts.join(QStringLiteral(" · "));
}

} // namespace

QString ClockText(double seconds) {
    const auto whole = static_cast<int64_t>(std::max(0.0, std::floor(seconds + 0.5)));
    const QString rest = QStringLiteral("%1:%2");
    const auto two = [](int64_t number) { return QStringLiteral("%1").arg(number, 2, 10, QLatin1Char('0')); };
    if (whole < 3600)
        return rest.arg(QString::number(whole / 60), two(whole % 60));
    return QStringLiteral("%1:%2:%3")
        .arg(QString::number(whole / 3600), two(whole / 60 % 60), two(whole % 60));
}

QString ExactClockText(double seconds) {
    const int64_t milliseconds = std::llround(std::max(0.0, seconds) * 1000);
    const int64_t whole = milliseconds / 1000;
    QString clock = ClockText(static_cast<double>(whole));
    if (milliseconds % 1000 == 0)
        return clock;
    QString rest = QStringLiteral("%1").arg(milliseconds % 1000, 3, 10, QLatin1Char('0'));
    while (rest.endsWith(QLatin1Char('0')))
        rest.chop(1);
    return clock + QLocale().decimalPoint() + rest;
}

std::optional<double> ParseClock(const QString& text) {
    const QStringList parts = text.trimmed().split(QLatin1Char(':'));
    if (parts.size() > 3)
        return std::nullopt;
    double seconds = 0;
    for (qsizetype i = 0; i < parts.size(); ++i) {
        bool understood = false;
        const bool last = i + 1 == parts.size();
        const double number =
            last ? QString(parts[i]).replace(QLatin1Char(','), QLatin1Char('.')).toDouble(&understood)
                 : parts[i].toUInt(&understood);
        if (!understood || !(number >= 0) || number > 1e7 || (i > 0 && number >= 60))
            return std::nullopt;
        seconds = seconds * 60 + number;
    }
    return seconds;
}

QString LeftText(double seconds) {
    const int minutes = static_cast<int>(std::ceil(std::min(seconds, 1e8) / 60));
    if (seconds < 10)
        return Words::tr("a few seconds");
    if (minutes <= 1)
        return Words::tr("less than a minute");
    if (minutes < 60)
        return Words::tr("about %n minutes", "", minutes);
    return Words::tr("about %1 h %2 min").arg(minutes / 60).arg(minutes % 60);
}

QString BytesText(int64_t bytes) {
    return QLocale().formattedDataSize(bytes, bytes < 10'000'000 ? 1 : 0, QLocale::DataSizeSIFormat);
}

QString SpeedText(double speed) {
    return Words::tr("%1×").arg(QLocale().toString(speed, 'f', speed < 10 ? 1 : 0));
}

QString FactsLine(const MovieFacts& facts) {
    QStringList parts;
    if (facts.width > 0)
        parts += QStringLiteral("%1 × %2").arg(facts.width).arg(facts.height);
    if (facts.rate > 0)
        parts += Words::tr("%1 pictures a second").arg(QLocale().toString(facts.rate, 'g', 4));
    if (!facts.pictureCodec.isEmpty())
        parts += facts.pictureCodec;
    if (!facts.sounds.empty())
        parts += facts.sounds.front().details;
    if (facts.lengthKnown)
        parts += ClockText(facts.seconds);
    if (facts.bytes > 0)
        parts += BytesText(facts.bytes);
    return parts.join(QStringLiteral(" · "));
}

QString TrackLine(const TrackFacts& track) {
    QStringList parts;
    if (!track.language.isEmpty())
        parts += LanguageName(track.language);
    if (!track.title.isEmpty())
        parts += track.title;
    if (parts.isEmpty())
        parts += Words::tr("Track %1").arg(track.number);
    return track.details.isEmpty()
               ? parts.join(QStringLiteral(", "))
               : QStringLiteral("%1 (%2)").arg(parts.join(QStringLiteral(", ")), track.details);
}

QString ForToolTip(const QString& text) {
    return Qt::mightBeRichText(text) ? QStringLiteral("<p>%1</p>").arg(text.toHtmlEscaped()) : text;
}

QString PhaseText(Phase phase) {
    switch (phase) {
    case Phase::kPreparing:
        return Words::tr("Starting…");
    case Phase::kConverting:
        return Words::tr("Converting");
    case Phase::kPaused:
        return Words::tr("Paused");
    case Phase::kWaitingForRoom:
        return Words::tr("The disk is full: waiting for room");
    case Phase::kFinishing:
        return Words::tr("Finishing the file…");
    case Phase::kStopping:
        return Words::tr("Stopping, keeping what is done…");
    }
    return {};
}

QString StateLine(const Entry& entry, const QString& preset) {
    switch (entry.state) {
    case State::kWaiting:
        return WaitingLine(entry, preset);
    case State::kActive:
        return ActiveLine(entry.figures);
    case State::kDone:
        return Words::tr("Done · %1").arg(BytesText(entry.outcome.bytes));
    case State::kStopped:
        return Words::tr("Stopped after %1").arg(ClockText(entry.outcome.position));
    case State::kFailed:
        return entry.outcome.sentence;
    case State::kInterrupted:
        return Words::tr("Interrupted when the program ended");
    }
    return {};
}

} // namespace movieconv::window
