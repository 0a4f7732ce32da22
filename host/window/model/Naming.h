// Where the files go and what they are called.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_NAMING_H
#define MOVIECONV_HOST_WINDOW_MODEL_NAMING_H

#include "host/window/model/Entry.h"

#include <QDate>

#include <functional>
#include <string>

namespace movieconv::window {

struct Naming {
    /// With {name} for the source's name, {preset}, {height} and {date}.
    QString pattern = QStringLiteral("{name}");
    std::string folder; ///< Empty: beside the source.

    bool operator==(const Naming&) const = default;
};

/// Whether a name is used already.
using IsTaken = std::function<bool(const std::string& path)>;

/// The path for an entry's file, with the date `today` and with " (2)" and so on where the name is taken.
/// Never longer than a file system takes.
std::string TargetFor(const Entry& entry, const Naming& naming, const QString& extension, const QDate& today,
                      const IsTaken& isTaken);

/// What the user means by `typed`: beside the source unless a folder is named, with `extension` unless the
/// name ends in one of `known`.
std::string CompletePath(const std::string& typed, const Entry& entry, const QString& extension,
                         const QStringList& known);
/// With `extension` instead of one of `known`.
std::string WithExtension(const std::string& path, const QString& extension, const QStringList& known);

} // namespace movieconv::window

#endif
