// Paths in JSON: they may hold any bytes, which JSON may not.
#ifndef MOVIECONV_HOST_WINDOW_MODEL_JSONPATH_H
#define MOVIECONV_HOST_WINDOW_MODEL_JSONPATH_H

#include <QByteArray>
#include <QJsonValue>
#include <QString>

#include <string>

namespace movieconv::window {

inline QString EncodePath(const std::string& path) {
    return QString::fromLatin1(QByteArray::fromStdString(path).toPercentEncoding("/ ()[]{},;:+=!&'@#"));
}

inline std::string DecodePath(const QJsonValue& value) {
    return QByteArray::fromPercentEncoding(value.toString().toLatin1()).toStdString();
}

} // namespace movieconv::window

#endif
