#pragma once

#include <functional>

#include <QColor>
#include <QString>
#include <vector>

namespace quotas {

class Recordset;

// A report described as data: bands of fixed height holding labels, fields,
// lines, filled rectangles and the count and sum functions, with every
// position in twips (1/1440 inch) inside its band. The engine lays the bands
// out on pages and one drawing routine paints them on any paged device.

struct ReportFont {
    QString family = QStringLiteral("Arial");
    double pointSize = 8.25;
    bool bold = false;
    bool italic = false;
};

enum class ItemKind {
    Label,  // fixed text; "%p" page, "%P" page count, "%D" date of printing, "%%" a percent sign
    Field,  // a column of the current row, through the item's format
    Line,   // a horizontal rule along the top of the item's box
    Box,    // a filled rectangle with a border
    Count,  // how many rows hold a value (not Null) in the column
    Sum,    // the sum of the column over the rows, through the item's format
};

enum class Align {
    Left,
    Center,
    Right
};

struct ReportItem {
    ItemKind kind = ItemKind::Label;
    QString name;
    QString text;    // a label's caption; the column of a field or function
    QString format;  // a field's or a sum's number format, e.g. "#,##0.00 Esc"
    int left = 0;
    int top = 0;
    int width = 0;
    int height = 0;
    ReportFont font;
    Align align = Align::Left;
    QColor lineColor = QColor(128, 128, 128);  // lines and box borders
    QColor fillColor = QColor(192, 192, 192);  // boxes
};

enum class BandKind {
    ReportHeader,
    PageHeader,
    Detail,
    PageFooter,
    ReportFooter
};

struct ReportBand {
    QString name;
    int height = 0;  // a band of height 0 is never printed
    std::vector<ReportItem> items;
    // Nothing else is printed on the page after this band (one letter per page).
    bool pageBreakAfter = false;
};

struct ReportLayout {
    QString name;     // prtListagemDividas, ...
    QString title;    // the preview window's and the PDF's title
    QString command;  // the named command of Data whose rows feed the detail band
    // When set, the rows the report shows, made from the command's: for
    // what is known beside the table's rows but not stored in them.
    std::function<Recordset&(Recordset& read)> rows;
    int width = 10575;
    ReportBand reportHeader;
    ReportBand pageHeader;
    ReportBand detail;
    ReportBand pageFooter;
    ReportBand reportFooter;

    const ReportBand& band(BandKind kind) const;
};

// The paper every report is laid out on: A4 portrait, the report centred
// across it, 1 cm above and below.
struct PaperSetup {
    static constexpr int kTwipsPerInch = 1440;
    static constexpr int kWidth = 11906;   // 210 mm
    static constexpr int kHeight = 16838;  // 297 mm
    static constexpr int kTopMargin = 567;
    static constexpr int kBottomMargin = 567;
    static int leftMargin(const ReportLayout& layout) { return (kWidth - layout.width) / 2; }
};

// Shorthands that keep the layouts readable as tables.
ReportBand reportBand(const QString& name, int height, std::vector<ReportItem> items = {}, bool pageBreakAfter = false);
ReportItem label(const QString& name, const QString& caption, int left, int top, int width, int height,
                 const ReportFont& font = {}, Align align = Align::Left);
ReportItem field(const QString& name, const QString& column, int left, int top, int width, int height,
                 const ReportFont& font = {}, Align align = Align::Left, const QString& format = QString());
ReportItem hline(const QString& name, int left, int top, int width, QColor color = QColor(128, 128, 128));
ReportItem box(const QString& name, int left, int top, int width, int height, QColor fill, QColor border);
ReportItem countOf(const QString& name, const QString& column, int left, int top, int width, int height,
                   const ReportFont& font = {}, Align align = Align::Left);
ReportItem sumOf(const QString& name, const QString& column, const QString& format, int left, int top, int width,
                 int height, const ReportFont& font = {}, Align align = Align::Left);

// The page footer of the listings: a rule, "Processado por Computador" and
// "Página: n / total".
ReportBand numberedPageFooter(const QString& name);

// Fonts by the names the layouts use; the drawing resolves Arial and Times
// New Roman to the metric-compatible Liberation fonts.
ReportFont arial(double pointSize = 8.25, bool bold = false, bool italic = false);
ReportFont timesNewRoman(double pointSize, bool bold = false, bool italic = false);

}  // namespace quotas
