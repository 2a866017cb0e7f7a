#pragma once

class QCoreApplication;

namespace quotas {

// Qt's own texts (file chooser, print dialog, standard buttons, tooltips) in
// European Portuguese: Qt's Brazilian translation with the terms that differ
// on this side of the ocean replaced ("Arquivo" is "Ficheiro"). Installed
// once; true when Qt's translation was found.
bool installPortugueseTranslation(QCoreApplication& app);

}  // namespace quotas
