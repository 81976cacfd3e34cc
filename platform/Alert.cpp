#include "platform/Alert.h"

#include <atomic>
#include <memory>

#include <QApplication>
#include <QLabel>
#include <QMessageBox>
#include <QPushButton>

#include "platform/private/Loop.h"
#include "platform/private/Mnemonics.h"

namespace {

// What an alert shows; owned by the interface thread's work, which may outlast a caller that was stopped.
struct AlertText {
    std::string title;
    std::string text;
    std::vector<std::string> buttons;
    alert_type type;

    [[nodiscard]] int32 LastButton() const { return static_cast<int32>(buttons.size()) - 1; }
};

struct AlertLook {
    QMessageBox::Icon icon;
    const char* name; // of the icon, for who does not see it
};

AlertLook LookOf(alert_type type) {
    switch (type) {
    case B_WARNING_ALERT:
        return {QMessageBox::Warning, "Warning"};
    case B_STOP_ALERT:
        return {QMessageBox::Critical, "Error"};
    default:
        return {QMessageBox::Information, "Information"};
    }
}

void ShowIcon(QMessageBox& box, const AlertLook& look) {
    box.setIcon(look.icon);
    for (QLabel* label : box.findChildren<QLabel*>())
        if (!label->pixmap().isNull())
            label->setAccessibleName(QString::fromUtf8(look.name));
}

// In every desktop's order of buttons, those of the action role stand as they were added.
std::vector<QPushButton*> AddButtons(QMessageBox& box, const AlertText& alert) {
    std::vector<QPushButton*> buttons;
    for (const std::string& label : alert.buttons) {
        QPushButton* button = box.addButton(QString(), QMessageBox::ActionRole);
        button->setObjectName(QString::fromStdString(label));
        button->setAccessibleName(QString::fromStdString(label));
        ShowLabel(button, label.c_str());
        buttons.push_back(button);
    }
    box.setDefaultButton(buttons.back());
    box.setEscapeButton(buttons.back());
    AssignMnemonics(&box);
    return buttons;
}

int32 ShowAlert(const AlertText& alert, const std::function<bool()>& cancelled) {
    QMessageBox box;
    box.setObjectName(QStringLiteral("alert"));
    box.setWindowTitle(QString::fromStdString(alert.title));
    box.setWindowModality(Qt::ApplicationModal);
    box.setTextFormat(Qt::PlainText);
    box.setText(QString::fromStdString(alert.text));
    ShowIcon(box, LookOf(alert.type));
    const std::vector<QPushButton*> buttons = AddButtons(box, alert);
    RunDialog(box, cancelled);
    for (std::size_t index = 0; index < buttons.size(); ++index)
        if (box.clickedButton() == buttons[index])
            return static_cast<int32>(index);
    return alert.LastButton();
}

int32 ShowAlertAndWait(const AlertText& alert) {
    if (OnInterfaceThread())
        return ShowAlert(alert, nullptr);
    struct Exchange {
        std::atomic<int32> result;
        std::atomic<bool> cancelled{false};
    };
    const auto exchange = std::make_shared<Exchange>();
    exchange->result = alert.LastButton();
    const bool answered = CallOnInterfaceThread([alert, exchange] {
        if (!exchange->cancelled)
            exchange->result = ShowAlert(alert, [exchange] { return exchange->cancelled.load(); });
    });
    exchange->cancelled = !answered;
    return answered ? exchange->result.load() : alert.LastButton();
}

} // namespace

BAlert::BAlert(const char* title, const char* text, const char* button1, const char* button2,
               const char* button3, alert_type type)
    : title_(title ? title : ""), text_(text ? text : ""), type_(type) {
    for (const char* button : {button1, button2, button3})
        if (button)
            buttons_.emplace_back(button);
    if (buttons_.empty())
        buttons_.emplace_back("Ok");
}

int32 BAlert::Go() {
    const AlertText alert{std::move(title_), std::move(text_), std::move(buttons_), type_};
    delete this;
    return ShowAlertAndWait(alert);
}
