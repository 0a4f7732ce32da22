// From what is dropped or opened to movies.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_INTAKE_H
#define MOVIECONV_HOST_WINDOW_MODEL_INTAKE_H

#include <QByteArray>
#include <QStringList>

#include <string>
#include <vector>

namespace movieconv::window {

/// The local files of a text/uri-list, byte for byte as the system has them; other addresses go into
/// `others`.
std::vector<std::string> PathsOfUriList(const QByteArray& list, QStringList& others);

/// Files as they are, folders replaced by the files in them and below whose names look like movies, in the
/// order in which people count ("2" before "10"). What holds none is named in `complaints`, a sentence each.
/// Reads the disk.
std::vector<std::string> FindMovies(const std::vector<std::string>& paths, QStringList& complaints);

/// Extensions of movies and sound files, without dots.
const QStringList& MovieExtensions();

} // namespace movieconv::window

#endif
