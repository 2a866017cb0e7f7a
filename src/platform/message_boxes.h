#pragma once

#include <QString>
#include <optional>

namespace quotas {

enum class Icon {
    None,
    Critical,
    Question,
    Exclamation,
    Information
};
// YesNoDefaultNo asks before something that cannot be taken back: Enter answers No.
enum class Buttons {
    Ok,
    OkCancel,
    YesNo,
    YesNoCancel,
    YesNoDefaultNo
};
enum class Answer {
    Ok,
    Cancel,
    Yes,
    No
};

// The one way the component talks to the user in a box: Qt dialogs in the
// windows, a console in the command line, a script in the tests.
class MessageBoxes {
public:
    virtual ~MessageBoxes() = default;
    virtual Answer message(const QString& text, Buttons buttons, Icon icon, const QString& title) = 0;
    // The typed text, or nothing when the user cancels.
    virtual std::optional<QString> input(const QString& prompt, const QString& title, const QString& defaultText) = 0;
};

// The title of a box that has none of its own.
QString applicationTitle();

// The boxes in use on this thread: Qt dialogs unless replaced. Not owned;
// nullptr goes back to the Qt dialogs.
MessageBoxes& boxes();
void setBoxes(MessageBoxes* replacement);

// Shorthands with the defaults of a plain message box.
Answer msgBox(const QString& text, Buttons buttons = Buttons::Ok, Icon icon = Icon::None, const QString& title = QString());
std::optional<QString> inputBox(const QString& prompt, const QString& title = QString(), const QString& defaultText = QString());

// Qt's message box and input dialog, over the active window.
class QtMessageBoxes final : public MessageBoxes {
public:
    Answer message(const QString& text, Buttons buttons, Icon icon, const QString& title) override;
    std::optional<QString> input(const QString& prompt, const QString& title, const QString& defaultText) override;
};

}  // namespace quotas
