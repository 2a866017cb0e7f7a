#include "reports/report_layout.h"

namespace quotas {

const ReportBand& ReportLayout::band(BandKind kind) const
{
    switch (kind) {
    case BandKind::ReportHeader: return reportHeader;
    case BandKind::PageHeader: return pageHeader;
    case BandKind::Detail: return detail;
    case BandKind::PageFooter: return pageFooter;
    case BandKind::ReportFooter: return reportFooter;
    }
    return detail;
}

namespace {

ReportItem item(ItemKind kind, const QString& name, const QString& text, int left, int top, int width, int height,
                const ReportFont& font, Align align)
{
    ReportItem i;
    i.kind = kind;
    i.name = name;
    i.text = text;
    i.left = left;
    i.top = top;
    i.width = width;
    i.height = height;
    i.font = font;
    i.align = align;
    return i;
}

}  // namespace

ReportBand reportBand(const QString& name, int height, std::vector<ReportItem> items, bool pageBreakAfter)
{
    ReportBand b;
    b.name = name;
    b.height = height;
    b.items = std::move(items);
    b.pageBreakAfter = pageBreakAfter;
    return b;
}

ReportItem label(const QString& name, const QString& caption, int left, int top, int width, int height, const ReportFont& font,
                 Align align)
{
    return item(ItemKind::Label, name, caption, left, top, width, height, font, align);
}

ReportItem field(const QString& name, const QString& column, int left, int top, int width, int height, const ReportFont& font,
                 Align align, const QString& format)
{
    ReportItem i = item(ItemKind::Field, name, column, left, top, width, height, font, align);
    i.format = format;
    return i;
}

ReportItem hline(const QString& name, int left, int top, int width, QColor color)
{
    ReportItem i = item(ItemKind::Line, name, QString(), left, top, width, 0, {}, Align::Left);
    i.lineColor = color;
    return i;
}

ReportItem box(const QString& name, int left, int top, int width, int height, QColor fill, QColor border)
{
    ReportItem i = item(ItemKind::Box, name, QString(), left, top, width, height, {}, Align::Left);
    i.fillColor = fill;
    i.lineColor = border;
    return i;
}

ReportItem countOf(const QString& name, const QString& column, int left, int top, int width, int height,
                   const ReportFont& font, Align align)
{
    return item(ItemKind::Count, name, column, left, top, width, height, font, align);
}

ReportItem sumOf(const QString& name, const QString& column, const QString& format, int left, int top, int width,
                 int height, const ReportFont& font, Align align)
{
    ReportItem i = item(ItemKind::Sum, name, column, left, top, width, height, font, align);
    i.format = format;
    return i;
}

ReportFont arial(double pointSize, bool bold, bool italic)
{
    return {QStringLiteral("Arial"), pointSize, bold, italic};
}

ReportFont timesNewRoman(double pointSize, bool bold, bool italic)
{
    return {QStringLiteral("Times New Roman"), pointSize, bold, italic};
}

ReportBand numberedPageFooter(const QString& name)
{
    return reportBand(
        name, 390,
        {hline(QStringLiteral("linRodape"), 75, 60, 10500),
         label(QStringLiteral("lblProcessado"), QStringLiteral("Processado por Computador"), 60, 105, 2130, 225, arial(6.75)),
         label(QStringLiteral("lblPagina"), QStringLiteral("Página:"), 8490, 105, 570, 255, arial(8.25, false, true)),
         label(QStringLiteral("lblPaginaNo"), QStringLiteral("%p"), 9090, 105, 585, 240, arial(8.25, false, true),
               Align::Right),
         label(QStringLiteral("lblBarra"), QStringLiteral("/"), 9720, 105, 135, 240),
         label(QStringLiteral("lblPaginas"), QStringLiteral("%P"), 9900, 105, 675, 240, arial(8.25, false, true))});
}

}  // namespace quotas
