#pragma once

namespace quotas {

// Prepare SqlServer_Prints, show the report's preview modally, then close
// the Dividas result set.
void showDebtListing();
void showDebtLetters();

}  // namespace quotas
