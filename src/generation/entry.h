#pragma once

namespace quotas {

// Shows frmGerarQuotas modally (created on first use); returns when it closes.
void showGenerationDialog();

// Shows frmAnularGeracao modally; returns when it closes.
void showUndoDialog();

}  // namespace quotas
