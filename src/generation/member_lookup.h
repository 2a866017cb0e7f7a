#pragma once

#include <QString>
#include <optional>

namespace quotas {

class Connection;

struct StaffMember {
    int socioId = 0;
    QString nome;
};

// The member whose staff number at the employer (no_tap) is exactly the
// typed text; the first one when several share it. The text reaches the
// database only as a bound value, so a quote in it is just a character.
std::optional<StaffMember> findMemberByStaffNumber(Connection& connection, const QString& noTap);

}  // namespace quotas
