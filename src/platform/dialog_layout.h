#pragma once

#include <QFont>
#include <QRect>
#include <QWidget>

namespace quotas {

// The dialogs keep their layouts in twips, as they were drawn: 15 twips to
// the pixel at 96 DPI.
constexpr int kTwipsPerPixel = 15;

inline QRect twips(int left, int top, int width, int height)
{
    return QRect(left / kTwipsPerPixel, top / kTwipsPerPixel, width / kTwipsPerPixel, height / kTwipsPerPixel);
}

// Those layouts were drawn for a narrow 8-point dialog font (11 pixels); in
// the desktop's larger and wider default the captions would not fit their
// labels. Arial resolves to the metric-compatible Liberation Sans.
inline void useDialogFont(QWidget* dialog)
{
    QFont font(QStringLiteral("Arial"));
    font.setPixelSize(11);
    dialog->setFont(font);
}

}  // namespace quotas
