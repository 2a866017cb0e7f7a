#pragma once

#include "reports/report_layout.h"

#include <QDate>
#include <QRect>
#include <QString>
#include <memory>
#include <vector>

namespace quotas {

// One printed item on a laid-out page: what the drawing routine paints and
// what a test reads (text, position, font) without any display.
struct PlacedItem {
    const ReportItem* item = nullptr;  // kind, name, font, alignment, colours
    BandKind band = BandKind::Detail;
    QString text;  // labels, fields and functions; empty for lines and boxes
    QRect rect;    // twips from the paper's top-left corner
};

struct ReportPage {
    std::vector<PlacedItem> items;
};

// The pages of one run of a report. It keeps its layout alive, since every
// placed item points into it.
struct ReportDocument {
    std::shared_ptr<const ReportLayout> layout;
    QDate printed;
    int rows = 0;
    std::vector<ReportPage> pages;

    int pageCount() const { return int(pages.size()); }
};

}  // namespace quotas
