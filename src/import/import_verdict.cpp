#include "import/import_verdict.h"

#include <algorithm>

namespace quotas {

QString ImportVerdict::kindText() const
{
    switch (kind) {
    case Kind::Post: return QStringLiteral("registar");
    case Kind::LeaveAlone: return QStringLiteral("deixar");
    case Kind::Reject: return QStringLiteral("rejeitar");
    }
    return QString();
}

int ImportVerdicts::count(ImportVerdict::Kind kind) const
{
    return int(std::count_if(lines.begin(), lines.end(), [kind](const ImportVerdict& v) { return v.kind == kind; }));
}

qint64 ImportVerdicts::postedCents() const
{
    qint64 sum = 0;
    for (const ImportVerdict& v : lines) {
        if (v.kind == ImportVerdict::Kind::Post)
            sum += v.pagoAfter;
    }
    return sum;
}

}  // namespace quotas
