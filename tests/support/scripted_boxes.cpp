#include "support/scripted_boxes.h"

namespace quotas::test {

ScriptedBoxes::ScriptedBoxes()
{
    setBoxes(this);
}

ScriptedBoxes::~ScriptedBoxes()
{
    setBoxes(nullptr);
}

QStringList ScriptedBoxes::texts() const
{
    QStringList out;
    for (const ShownBox& box : shown)
        out << box.text;
    return out;
}

Answer ScriptedBoxes::message(const QString& text, Buttons buttons, Icon icon, const QString& title)
{
    shown.append({text, buttons, icon, title, false, QString()});
    if (onShow)
        onShow(shown.constLast());
    if (!m_answers.isEmpty())
        return m_answers.dequeue();
    switch (buttons) {
    case Buttons::Ok: return Answer::Ok;
    case Buttons::OkCancel: return Answer::Cancel;
    default: return Answer::No;
    }
}

std::optional<QString> ScriptedBoxes::input(const QString& prompt, const QString& title, const QString& defaultText)
{
    shown.append({prompt, Buttons::OkCancel, Icon::None, title, true, defaultText});
    if (onShow)
        onShow(shown.constLast());
    if (!m_inputs.isEmpty())
        return m_inputs.dequeue();
    return std::nullopt;
}

}  // namespace quotas::test
