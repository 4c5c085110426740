#pragma once

#include <QFile>
#include <QString>
#include <string>

namespace vtr {

// The suite's texts are bytes in the system's own encoding: the ANSI code page on Windows,
// UTF-8 elsewhere. File names are the same, so one conversion serves both.
inline QString FromSuiteText(const std::string& text) {
    return QFile::decodeName(QByteArray::fromStdString(text));
}

inline std::string ToSuiteText(const QString& text) {
    return QFile::encodeName(text).toStdString();
}

}  // namespace vtr
