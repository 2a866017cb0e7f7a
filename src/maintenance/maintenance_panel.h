#pragma once

#include <QString>

namespace quotas {

// The dialog's caption, which the run also gives the progress display as its title.
QString maintenanceCaption();

// What the maintenance run drives on its dialog: one bar per pass, the busy
// animation and the buttons. The dialog implements it; the command line
// implements it on the console, and the tests record it.
class MaintenancePanel {
public:
    virtual ~MaintenancePanel() = default;

    virtual QString caption() const = 0;
    // The bar of pass 1 to 5 gets its maximum and goes back to 0.
    virtual void startBar(int pass, int maximum) = 0;
    // One more row done; the bar never goes past its maximum.
    virtual void stepBar(int pass) = 0;
    // Called often while the run works without moving a bar, so the dialog
    // can repaint and the animation keep moving (the dialog throttles it).
    virtual void keepAlive() {}
    // A clip that cannot be played leaves the animation still; the run goes on.
    virtual void playAnimation(const QString& clipFile) = 0;
    virtual void stopAnimation() = 0;
    // After a complete run: the exit button focused and captioned "&Fechar",
    // the start button hidden.
    virtual void showFinished() = 0;
};

}  // namespace quotas
