#pragma once

#include "platform/message_boxes.h"

namespace quotas::cli {

// Message boxes of a headless run: each text printed as one line on stdout.
// Questions are answered Yes (the run was asked for on the command line) and
// input boxes take their proposed text.
class ConsoleBoxes final : public MessageBoxes {
public:
    Answer message(const QString& text, Buttons buttons, Icon icon, const QString& title) override;
    std::optional<QString> input(const QString& prompt, const QString& title, const QString& defaultText) override;
};

}  // namespace quotas::cli
