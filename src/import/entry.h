#pragma once

namespace quotas {

// Shows frmImportarQuotas without waiting (created on first use).
void showImportDialog();

}  // namespace quotas
