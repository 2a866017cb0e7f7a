#include "generation/member_lookup.h"

#include "platform/recordset.h"

namespace quotas {

std::optional<StaffMember> findMemberByStaffNumber(Connection& connection, const QString& noTap)
{
    Recordset rs;
    rs.open(QStringLiteral("select * from tbSocios where no_tap = ? order by socio_id"), connection, Cursor::Unspecified,
            Lock::Unspecified, {noTap});
    if (rs.eof())
        return std::nullopt;
    return StaffMember{rs.value(QStringLiteral("socio_id")).toInt(), rs.value(QStringLiteral("nome")).toString()};
}

}  // namespace quotas
