#pragma once

#include <QString>

namespace quotas {

// The union's name and postal address at the head of every debt letter:
// texts of the installation, kept in letterhead.txt (see letterheadPath) as
// UTF-8 lines "nome = ..." and "morada = ..." (lines starting
// with "#" are comments). A missing file or line gives the default: the name
// "Orbela" and no address line.
struct Letterhead {
    QString name = QStringLiteral("Orbela");
    QString address;
};

// $QUOTAS_DATA_DIR/letterhead.txt when that variable is set; else
// /etc/quotas/letterhead.txt when it exists; else the example in the
// installation's data folder.
QString letterheadPath();

// Throws QuotasError when the file exists but cannot be read.
Letterhead readLetterhead(const QString& path = letterheadPath());

}  // namespace quotas
