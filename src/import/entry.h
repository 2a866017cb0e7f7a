#pragma once

namespace quotas {

// Shows frmImportarQuotas without waiting (created on first use).
void showImportDialog();

// "Simular Importação": the import's choices, then the dry run's verdicts;
// modal, a fresh dialog every time.
void showDryRunDialog();

}  // namespace quotas
