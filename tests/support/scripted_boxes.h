#pragma once

#include "platform/message_boxes.h"

#include <QList>
#include <QQueue>
#include <functional>
#include <optional>

namespace quotas::test {

// A box the code under test showed.
struct ShownBox {
    QString text;
    Buttons buttons = Buttons::Ok;
    Icon icon = Icon::None;
    QString title;
    bool isInput = false;
    QString defaultText;
};

// Message and input boxes answered from a script, for as long as it lives.
// Unscripted boxes get Ok (a plain message), No (a question) or Cancel (an
// input box), so a forgotten answer never confirms anything.
class ScriptedBoxes final : public MessageBoxes {
public:
    ScriptedBoxes();
    ~ScriptedBoxes() override;

    void answer(Answer a) { m_answers.enqueue(a); }
    void answerInput(std::optional<QString> text) { m_inputs.enqueue(std::move(text)); }

    // Called as each box is shown, before it is answered (to look at focus, say).
    std::function<void(const ShownBox&)> onShow;

    QList<ShownBox> shown;
    const ShownBox& last() const { return shown.constLast(); }
    QStringList texts() const;

    Answer message(const QString& text, Buttons buttons, Icon icon, const QString& title) override;
    std::optional<QString> input(const QString& prompt, const QString& title, const QString& defaultText) override;

private:
    QQueue<Answer> m_answers;
    QQueue<std::optional<QString>> m_inputs;
};

}  // namespace quotas::test
