#include "reports/report_engine.h"

#include "component/stored_value.h"

#include "component/money.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "reports/report_format.h"

#include <QHash>
#include <cmath>

namespace quotas {

namespace {

struct Placement {
    BandKind band;
    int top;
};

using Plan = std::vector<std::vector<Placement>>;

// First pass: where every band goes. Heights are fixed, so the plan needs
// only the number of rows.
Plan paginate(const ReportLayout& layout, int rowCount)
{
    const int footerTop = PaperSetup::kHeight - PaperSetup::kBottomMargin - layout.pageFooter.height;
    Plan plan;
    int y = 0;
    bool bodyOnPage = false;
    bool breakPending = false;

    const auto newPage = [&] {
        plan.emplace_back();
        y = PaperSetup::kTopMargin;
        bodyOnPage = false;
        breakPending = false;
        if (plan.size() == 1 && layout.reportHeader.height > 0) {
            plan.back().push_back({BandKind::ReportHeader, y});
            y += layout.reportHeader.height;
            bodyOnPage = true;
        }
        if (layout.pageHeader.height > 0) {
            plan.back().push_back({BandKind::PageHeader, y});
            y += layout.pageHeader.height;
        }
    };
    const auto place = [&](BandKind kind) {
        const ReportBand& band = layout.band(kind);
        if (band.height <= 0)
            return;
        // A band taller than an empty page still goes somewhere: on a page of
        // its own, cut at the footer, rather than on no page at all.
        if (breakPending || (bodyOnPage && y + band.height > footerTop))
            newPage();
        plan.back().push_back({kind, y});
        y += band.height;
        bodyOnPage = true;
        breakPending = band.pageBreakAfter;
    };

    newPage();
    for (int row = 0; row < rowCount; ++row)
        place(BandKind::Detail);
    place(BandKind::ReportFooter);
    if (layout.pageFooter.height > 0) {
        for (auto& page : plan)
            page.push_back({BandKind::PageFooter, footerTop});
    }
    return plan;
}

QString substituteCodes(const QString& caption, int page, int pages, const QString& date)
{
    if (!caption.contains(u'%'))
        return caption;
    QString out;
    out.reserve(caption.size() + 16);
    for (qsizetype i = 0; i < caption.size(); ++i) {
        const QChar c = caption[i];
        if (c != u'%' || i + 1 == caption.size()) {
            out += c;
            continue;
        }
        const QChar code = caption[i + 1];
        if (code == u'p')
            out += QString::number(page);
        else if (code == u'P')
            out += QString::number(pages);
        else if (code == u'D')
            out += date;
        else if (code == u'%')
            out += u'%';
        else {
            out += c;
            continue;
        }
        ++i;
    }
    return out;
}

struct Aggregate {
    int count = 0;
    qint64 cents = 0;
};

}  // namespace

ReportDocument layOutReport(const std::shared_ptr<const ReportLayout>& layoutPtr, Recordset& rows, const QDate& printed)
{
    const ReportLayout& layout = *layoutPtr;
    ReportDocument doc;
    doc.layout = layoutPtr;
    doc.printed = printed;
    doc.rows = rows.recordCount();

    // Every column the layout names, resolved once.
    QHash<const ReportItem*, int> columns;
    for (const BandKind kind : {BandKind::ReportHeader, BandKind::PageHeader, BandKind::Detail, BandKind::PageFooter,
                                BandKind::ReportFooter}) {
        for (const ReportItem& item : layout.band(kind).items) {
            if (item.kind != ItemKind::Field && item.kind != ItemKind::Count && item.kind != ItemKind::Sum)
                continue;
            const int index = rows.fieldIndex(item.text);
            if (index < 0)
                throw QuotasError(QStringLiteral("O relatório \"%1\" usa o campo \"%2\", que o comando \"%3\" não tem.")
                                      .arg(layout.name, item.text, layout.command));
            columns.insert(&item, index);
        }
    }

    // The functions cover every row, wherever they are printed.
    QHash<const ReportItem*, Aggregate> aggregates;
    for (auto it = columns.cbegin(); it != columns.cend(); ++it) {
        if (it.key()->kind != ItemKind::Field)
            aggregates.insert(it.key(), {});
    }
    if (!aggregates.isEmpty() && doc.rows > 0) {
        for (rows.moveFirst(); !rows.eof(); rows.moveNext()) {
            for (auto it = aggregates.begin(); it != aggregates.end(); ++it) {
                const QVariant v = rows.value(columns.value(it.key()));
                if (v.isNull())
                    continue;
                ++it->count;
                // A value that is not an amount (printed as such) adds nothing.
                const StoredNumber amount = readStoredAmount(v);
                if (amount.isNumber())
                    it->cents += std::llround(roundCents(amount.value) * 100.0);
            }
        }
    }

    // Second pass: the items of every placed band.
    const Plan plan = paginate(layout, doc.rows);
    const int pages = int(plan.size());
    const int left = PaperSetup::leftMargin(layout);
    const QString date = longPortugueseDate(printed);
    if (doc.rows > 0)
        rows.moveFirst();
    doc.pages.resize(size_t(pages));
    for (int p = 0; p < pages; ++p) {
        ReportPage& page = doc.pages[size_t(p)];
        for (const Placement& placement : plan[size_t(p)]) {
            const ReportBand& band = layout.band(placement.band);
            page.items.reserve(page.items.size() + band.items.size());
            for (const ReportItem& item : band.items) {
                PlacedItem placed;
                placed.item = &item;
                placed.band = placement.band;
                placed.rect = QRect(left + item.left, placement.top + item.top, item.width, item.height);
                switch (item.kind) {
                case ItemKind::Label:
                    placed.text = substituteCodes(item.text, p + 1, pages, date);
                    break;
                case ItemKind::Field:
                    // Outside the detail a field shows the row about to print, if any.
                    if (!rows.eof())
                        placed.text = formatReportValue(rows.value(columns.value(&item)), item.format);
                    break;
                case ItemKind::Count:
                    placed.text = QString::number(aggregates.value(&item).count);
                    break;
                case ItemKind::Sum:
                    placed.text = formatReportValue(double(aggregates.value(&item).cents) / 100.0,
                                                    item.format.isEmpty() ? QStringLiteral("0.00") : item.format);
                    break;
                case ItemKind::Line:
                case ItemKind::Box:
                    break;
                }
                page.items.push_back(std::move(placed));
            }
            if (placement.band == BandKind::Detail)
                rows.moveNext();
        }
    }
    return doc;
}

}  // namespace quotas
