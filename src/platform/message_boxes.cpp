#include "platform/message_boxes.h"

#include <QApplication>
#include <QInputDialog>
#include <QMessageBox>
#include <QPushButton>
#include <utility>

namespace quotas {

namespace {

thread_local MessageBoxes* replaced = nullptr;

QWidget* owner()
{
    if (QWidget* modal = QApplication::activeModalWidget())
        return modal;
    return QApplication::activeWindow();
}

}  // namespace

QString applicationTitle()
{
    return QStringLiteral("Quotas");
}

MessageBoxes& boxes()
{
    if (replaced)
        return *replaced;
    thread_local QtMessageBoxes qt;
    return qt;
}

void setBoxes(MessageBoxes* replacement)
{
    replaced = replacement;
}

Answer msgBox(const QString& text, Buttons buttons, Icon icon, const QString& title)
{
    return boxes().message(text, buttons, icon, title.isEmpty() ? applicationTitle() : title);
}

std::optional<QString> inputBox(const QString& prompt, const QString& title, const QString& defaultText)
{
    return boxes().input(prompt, title.isEmpty() ? applicationTitle() : title, defaultText);
}

Answer QtMessageBoxes::message(const QString& text, Buttons buttons, Icon icon, const QString& title)
{
    QMessageBox box(owner());
    box.setWindowTitle(title);
    box.setText(text);
    box.setTextFormat(Qt::PlainText);
    switch (icon) {
    case Icon::None: box.setIcon(QMessageBox::NoIcon); break;
    case Icon::Critical: box.setIcon(QMessageBox::Critical); break;
    case Icon::Question: box.setIcon(QMessageBox::Question); break;
    case Icon::Exclamation: box.setIcon(QMessageBox::Warning); break;
    case Icon::Information: box.setIcon(QMessageBox::Information); break;
    }
    switch (buttons) {
    case Buttons::Ok: box.setStandardButtons(QMessageBox::Ok); break;
    case Buttons::OkCancel: box.setStandardButtons(QMessageBox::Ok | QMessageBox::Cancel); break;
    case Buttons::YesNo: box.setStandardButtons(QMessageBox::Yes | QMessageBox::No); break;
    case Buttons::YesNoCancel: box.setStandardButtons(QMessageBox::Yes | QMessageBox::No | QMessageBox::Cancel); break;
    case Buttons::YesNoDefaultNo:
        box.setStandardButtons(QMessageBox::Yes | QMessageBox::No);
        box.setDefaultButton(QMessageBox::No);
        box.setEscapeButton(QMessageBox::No);
        break;
    }
    // Our own Portuguese, whatever translation of Qt is loaded.
    const std::pair<QMessageBox::StandardButton, const char*> texts[] = {
        {QMessageBox::Yes, "&Sim"}, {QMessageBox::No, "&Não"}, {QMessageBox::Cancel, "Cancelar"}, {QMessageBox::Ok, "OK"}};
    for (const auto& [button, text] : texts) {
        if (QAbstractButton* b = box.button(button))
            b->setText(QString::fromUtf8(text));
    }
    switch (box.exec()) {
    case QMessageBox::Yes: return Answer::Yes;
    case QMessageBox::No: return Answer::No;
    case QMessageBox::Ok: return Answer::Ok;
    default: return Answer::Cancel;
    }
}

std::optional<QString> QtMessageBoxes::input(const QString& prompt, const QString& title, const QString& defaultText)
{
    QInputDialog dialog(owner());
    dialog.setWindowTitle(title);
    dialog.setLabelText(prompt);
    dialog.setTextValue(defaultText);
    dialog.setOkButtonText(QStringLiteral("OK"));
    dialog.setCancelButtonText(QStringLiteral("Cancelar"));
    if (dialog.exec() != QDialog::Accepted)
        return std::nullopt;
    return dialog.textValue();
}

}  // namespace quotas
