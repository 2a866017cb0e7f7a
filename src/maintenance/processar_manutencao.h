#pragma once

#include <QString>

namespace quotas {

class Connection;
class MaintenancePanel;

// The database maintenance run, in five passes:
//  1-3. Null amounts (rend1, rend2, quota, pago) become 0 in the active,
//       inactive and history movements; a row without a Null is not rewritten,
//       and each repaired row is saved on its own.
//  4-5. The totals of the active and of the inactive accounts are rebuilt
//       from their movements (sums rounded to cents); a member with movements
//       and no account gets one. Each of these passes (reset and rebuild)
//       commits as one transaction: a failure leaves the previous totals.
// The history enters no total. The progress display "Velumo.General" shows
// while each of passes 4 and 5 resets and fetches.
//
// At the end the panel shows the finished state, the animation stops and the
// box "Manutenção de Dados Concluída." is shown. On a failure the animation
// stops, the buttons stay as they were and QuotasError is thrown with a
// Portuguese message saying where the maintenance stopped and why; what was
// saved before stays saved.
//
// Movements without a member (socio_id Null) enter no total and create no
// account; a box after the closing one says how many were left out, and that
// count is returned.
int ProcessarManutencao(Connection& connection, MaintenancePanel& panel);

}  // namespace quotas
