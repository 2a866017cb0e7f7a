#pragma once

#include <QByteArray>
#include <QString>

namespace quotas {

// Windows-1252, the single-byte code page the registry's text values pass
// through; characters it lacks become "?".
QByteArray toCodePage1252(const QString& text);
QString fromCodePage1252(const QByteArray& bytes);

}  // namespace quotas
