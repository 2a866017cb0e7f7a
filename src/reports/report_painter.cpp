#include "reports/report_painter.h"

#include "platform/errors.h"

#include <QFont>
#include <QFontMetricsF>
#include <QHash>
#include <QPageLayout>
#include <QPagedPaintDevice>
#include <QPainter>
#include <QPdfWriter>
#include <QPrinter>
#include <QSaveFile>
#include <memory>

namespace quotas {

namespace {

// A hairline of the old reports: one screen pixel at 96 DPI.
constexpr double kLineWidth = 15.0;

// Arial and Times New Roman are asked for by name; where they are missing the
// metric-compatible Liberation fonts take their place, so that every text
// keeps the width its box was drawn for.
QStringList familiesFor(const QString& family)
{
    if (family.compare(QStringLiteral("Arial"), Qt::CaseInsensitive) == 0)
        return {family, QStringLiteral("Liberation Sans")};
    if (family.compare(QStringLiteral("Times New Roman"), Qt::CaseInsensitive) == 0)
        return {family, QStringLiteral("Liberation Serif")};
    return {family};
}

struct PreparedFont {
    QFont font;
    QFontMetricsF metrics;
};

struct FontKey {
    QString family;
    int twips;
    bool bold;
    bool italic;
    bool operator==(const FontKey&) const = default;
};

size_t qHash(const FontKey& k, size_t seed = 0)
{
    return qHashMulti(seed, k.family, k.twips, k.bold, k.italic);
}

// Fonts sized in twips (20 per point), so the painter's scale to the
// device's resolution sizes text and boxes alike on every device.
const PreparedFont& preparedFont(const ReportFont& f)
{
    thread_local QHash<FontKey, std::shared_ptr<PreparedFont>> cache;
    const FontKey key{f.family, qRound(f.pointSize * 20.0), f.bold, f.italic};
    auto it = cache.constFind(key);
    if (it == cache.constEnd()) {
        QFont font;
        font.setFamilies(familiesFor(f.family));
        font.setPixelSize(key.twips);
        font.setBold(f.bold);
        font.setItalic(f.italic);
        font.setHintingPreference(QFont::PreferNoHinting);
        it = cache.insert(key, std::make_shared<PreparedFont>(PreparedFont{font, QFontMetricsF(font)}));
    }
    return **it;
}

void drawText(QPainter& painter, const PlacedItem& placed)
{
    if (placed.text.isEmpty())
        return;
    const ReportItem& item = *placed.item;
    const PreparedFont& prepared = preparedFont(item.font);
    painter.setFont(prepared.font);
    const QRectF box(placed.rect);
    const double width = prepared.metrics.horizontalAdvance(placed.text);
    if (width <= box.width() && !placed.text.contains(u'\n')) {
        // The common case, one line that fits: placed directly, without the
        // cost of a laid-out paragraph and never cut at the box's foot.
        double x = box.left();
        if (item.align == Align::Center)
            x += (box.width() - width) / 2.0;
        else if (item.align == Align::Right)
            x += box.width() - width;
        painter.drawText(QPointF(x, box.top() + prepared.metrics.ascent()), placed.text);
        return;
    }
    // Too wide for its box: wrapped at words and kept inside the box.
    int flags = Qt::AlignTop | Qt::TextWordWrap;
    flags |= item.align == Align::Center ? Qt::AlignHCenter : item.align == Align::Right ? Qt::AlignRight
                                                                                         : Qt::AlignLeft;
    painter.save();
    painter.setClipRect(box, Qt::IntersectClip);
    painter.drawText(box, flags, placed.text);
    painter.restore();
}

}  // namespace

void paintReportPage(QPainter& painter, const ReportPage& page)
{
    const QPen textPen(Qt::black);
    for (const PlacedItem& placed : page.items) {
        const ReportItem& item = *placed.item;
        switch (item.kind) {
        case ItemKind::Line:
            painter.setPen(QPen(item.lineColor, kLineWidth));
            painter.drawLine(QPointF(placed.rect.left(), placed.rect.top()),
                             QPointF(placed.rect.left() + placed.rect.width(), placed.rect.top()));
            break;
        case ItemKind::Box:
            painter.setPen(QPen(item.lineColor, kLineWidth));
            painter.setBrush(item.fillColor);
            painter.drawRect(QRectF(placed.rect));
            painter.setBrush(Qt::NoBrush);
            break;
        default:
            painter.setPen(textPen);
            drawText(painter, placed);
            break;
        }
    }
}

void setUpReportDevice(QPagedPaintDevice& device)
{
    device.setPageLayout(QPageLayout(QPageSize(QPageSize::A4), QPageLayout::Portrait, QMarginsF(0, 0, 0, 0),
                                     QPageLayout::Millimeter));
}

void setUpReportPrinter(QPrinter& printer, const ReportDocument& doc)
{
    printer.setFullPage(true);
    setUpReportDevice(printer);
    printer.setDocName(doc.layout->title);
}

void paintReport(const ReportDocument& doc, QPagedPaintDevice& device, const QPageRanges& ranges)
{
    QPainter painter;
    if (!painter.begin(&device))
        throw QuotasError(QStringLiteral("Não foi possível começar a imprimir \"%1\".").arg(doc.layout->title));
    painter.setRenderHint(QPainter::Antialiasing);
    const double scale = double(device.logicalDpiX()) / PaperSetup::kTwipsPerInch;
    bool first = true;
    for (int p = 0; p < doc.pageCount(); ++p) {
        if (!ranges.isEmpty() && !ranges.contains(p + 1))
            continue;
        if (!first && !device.newPage()) {
            painter.end();
            throw QuotasError(QStringLiteral("Não foi possível passar à página %1 de \"%2\".").arg(p + 1).arg(doc.layout->title));
        }
        first = false;
        painter.save();
        painter.scale(scale, scale);
        paintReportPage(painter, doc.pages[size_t(p)]);
        painter.restore();
    }
    painter.end();
}

void writeReportPdf(const ReportDocument& doc, const QString& path)
{
    QSaveFile file(path);
    if (!file.open(QIODevice::WriteOnly))
        throw QuotasError(QStringLiteral("Não foi possível escrever o ficheiro \"%1\": %2").arg(path, file.errorString()));
    {
        QPdfWriter writer(&file);
        writer.setResolution(PaperSetup::kTwipsPerInch);
        writer.setTitle(doc.layout->title);
        writer.setCreator(QStringLiteral("Quotas"));
        setUpReportDevice(writer);
        paintReport(doc, writer);
    }
    if (!file.commit())
        throw QuotasError(QStringLiteral("Não foi possível escrever o ficheiro \"%1\": %2").arg(path, file.errorString()));
}

}  // namespace quotas
