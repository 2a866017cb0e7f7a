#pragma once

#include <QByteArray>
#include <QString>

namespace quotas {

// The text of an employer's file as the office's programs save it: UTF-8
// with or without a byte order mark, UTF-16 with its mark (a spreadsheet's
// "Unicode text"), and otherwise Windows-1252, the code page of older
// Portuguese installations. Bytes that are not valid UTF-8 are never taken
// for UTF-8, so "João" saved in Windows-1252 arrives intact.
QString decodeImportText(const QByteArray& bytes);

// Windows-1252 to text; the five bytes the code page leaves undefined keep
// their C1 code points.
QString fromWindows1252(const QByteArray& bytes);

}  // namespace quotas
