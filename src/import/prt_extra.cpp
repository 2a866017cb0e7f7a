#include "import/prt_extra.h"

#include "component/shared_objects.h"
#include "platform/recordset.h"

namespace quotas {

namespace {

// The rows of extras with each line's reason beside them, as the last
// import left them (empty where it is not known, after a restart say).
Recordset& withReasons(Recordset& extras)
{
    static thread_local Recordset shown;
    QStringList columns;
    for (int i = 0; i < extras.fieldCount(); ++i)
        columns << extras.fieldName(i);
    shown.close();
    shown.openInMemory(columns << QStringLiteral("Motivo"));
    const QStringList& reasons = shared().rejectReasons;
    int row = 0;
    for (extras.moveFirst(); !extras.eof(); extras.moveNext(), ++row) {
        shown.addNew();
        for (int i = 0; i < extras.fieldCount(); ++i)
            shown.setValue(i, extras.value(i));
        shown.setValue(extras.fieldCount(), reasons.value(row));
        shown.update();
    }
    if (shown.recordCount() > 0)
        shown.moveFirst();
    return shown;
}

}  // namespace

ReportLayout rejectsListingLayout()
{
    const ReportFont bold = arial(8.25, true);
    const ReportFont italic = arial(8.25, false, true);
    ReportLayout r;
    r.name = QStringLiteral("prtExtra");
    r.title = QStringLiteral("Listagem de Dados não Importados para a Base de Dados");
    r.command = QStringLiteral("Extras");
    r.rows = withReasons;
    r.width = 10575;

    r.reportHeader = reportBand(QStringLiteral("Section4"), 330,
                                {label(QStringLiteral("Label8"),
                                       QStringLiteral("Listagem de Dados não Importados para a Base de Dados"), 75, 30,
                                       10470, 255, timesNewRoman(12, true), Align::Center)});
    r.pageHeader = reportBand(QStringLiteral("Section2"), 428,
                              {label(QStringLiteral("Label1"), QStringLiteral("Campo 1"), 75, 75, 1005, 240, bold),
                               label(QStringLiteral("Label2"), QStringLiteral("Campo 2"), 1125, 75, 3330, 240, bold),
                               label(QStringLiteral("Label9"), QStringLiteral("Motivo"), 4500, 75, 2070, 240, bold),
                               label(QStringLiteral("Label4"), QStringLiteral("Campo 3"), 6615, 75, 2055, 240, bold),
                               label(QStringLiteral("Label7"), QStringLiteral("Campo 4"), 8700, 75, 1860, 240, bold),
                               hline(QStringLiteral("Line1"), 75, 360, 10500)});
    r.detail = reportBand(QStringLiteral("Section1"), 337,
                          {field(QStringLiteral("Text2"), QStringLiteral("Field0"), 60, 45, 1020, 270),
                           field(QStringLiteral("Text1"), QStringLiteral("Field1"), 1140, 45, 3315, 270),
                           field(QStringLiteral("Text8"), QStringLiteral("Motivo"), 4500, 45, 2085, 270),
                           field(QStringLiteral("Text3"), QStringLiteral("Field2"), 6630, 45, 2055, 270),
                           field(QStringLiteral("Text7"), QStringLiteral("Field3"), 8715, 45, 1845, 270)});
    r.pageFooter = reportBand(
        QStringLiteral("Section3"), 435,
        {hline(QStringLiteral("Line2"), 75, 60, 10500),
         label(QStringLiteral("Label16"), QStringLiteral("Processado por Computador"), 30, 105, 2490, 255),
         label(QStringLiteral("Label18"), QStringLiteral("Página:"), 8490, 105, 570, 255, italic),
         label(QStringLiteral("Label15"), QStringLiteral("%p"), 9090, 105, 585, 240, italic, Align::Right),
         label(QStringLiteral("Label19"), QStringLiteral("/"), 9720, 105, 135, 240, italic),
         label(QStringLiteral("Label17"), QStringLiteral("%P"), 9900, 105, 675, 240, italic)});
    r.reportFooter = reportBand(
        QStringLiteral("Section5"), 360,
        {hline(QStringLiteral("Line3"), 75, 15, 10500),
         label(QStringLiteral("Label10"), QStringLiteral("Total de registos listados:"), 7425, 90, 2310, 195, bold),
         countOf(QStringLiteral("Function1"), QStringLiteral("Field0"), 9765, 75, 705, 225, arial(), Align::Right)});
    return r;
}

}  // namespace quotas
