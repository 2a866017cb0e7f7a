#pragma once

namespace quotas {

// Shows frmManutencaoDados modally (created on first use); returns when it closes.
void showMaintenanceDialog();

}  // namespace quotas
