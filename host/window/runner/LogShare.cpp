#include "host/window/runner/LogShare.h"

#include <QCoreApplication>

namespace movieconv::window {
namespace {

constexpr int kMostLines = 100;

struct LogTexts {
    Q_DECLARE_TR_FUNCTIONS(LogShare)
};

} // namespace

LogShare::LogShare() : tap_([this](LogWeight weight, const std::string& line) { Take(weight, line); }) {}

void LogShare::Add(const std::shared_ptr<RunListener>& listener) {
    const std::lock_guard lock(mutex_);
    readers_.push_back({listener, 0});
}

void LogShare::Take(LogWeight weight, const std::string& line) {
    if (weight == LogWeight::kOther)
        return;
    const QString text = QString::fromStdString(line).trimmed();
    const std::lock_guard lock(mutex_);
    std::erase_if(readers_, [](const Reader& reader) { return reader.listener.expired(); });
    for (Reader& reader : readers_) {
        const std::shared_ptr<RunListener> listener = reader.listener.lock();
        if (!listener || reader.lines > kMostLines)
            continue;
        listener->OnNote(++reader.lines <= kMostLines ? text
                                                      : LogTexts::tr("There is more, which is left out."));
    }
}

} // namespace movieconv::window
