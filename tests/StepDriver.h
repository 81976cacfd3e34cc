#pragma once

#include <deque>
#include <functional>
#include <string>

#include <QTest>
#include <QtWidgets>

#include "platform/Application.h"

// Works the program as a person would, while the caller's own code waits in a modal dialog or in the
// application's loop: each step waits for its condition and then does its action, with real events on
// widgets. Steps begin as soon as there is an application object. A condition that does not come true within
// a time limit is told to the subclass and quits the application. One at a time; interface thread.
class StepDriver : public QObject {
    Q_DISABLE_COPY_MOVE(StepDriver)

  public:
    using Condition = std::function<bool()>;
    using Action = std::function<void()>;

    StepDriver() {
        self_ = this;
        const auto start = [] { QTimer::singleShot(PollMilliseconds, self_, &StepDriver::Poll); };
        if (QCoreApplication::instance())
            start();
        else
            qAddPreRoutine(start);
    }
    ~StepDriver() override { self_ = nullptr; }

    StepDriver& When(std::string what, Condition condition, Action action) {
        steps_.push_back({std::move(what), std::move(condition), std::move(action)});
        return *this;
    }

    // Waits until it is so.
    StepDriver& Await(std::string what, Condition condition) {
        return When(std::move(what), std::move(condition), Action([] {}));
    }

    // Waits for an alert with this text and presses one of its buttons. The next step comes when the code
    // that showed it has gone on.
    StepDriver& Answer(const std::string& text, const char* button) {
        const auto shown = [text] { return Alert() && Alert()->text() == text.c_str(); };
        return When("alert: " + text, shown, [this, button] {
            answered_ = Alert();
            Press(answered_, button);
        });
    }

    // Waits for one of the toolkit's dialogs, which proposes a file's name if one is given, names another
    // file there if one is given, and ends it.
    StepDriver& InDialog(const char* name, bool accept, const std::string& file = "",
                         const std::string& proposed = "") {
        const auto shown = [name] {
            auto* found = qobject_cast<QDialog*>(QApplication::activeModalWidget());
            return found && found->objectName() == name ? found : nullptr;
        };
        const auto field = [shown] {
            return shown()->findChildren<QLineEdit*>(QRegularExpression("^file[nN]ame")).value(0);
        };
        const auto ready = [=] {
            return shown() && (proposed.empty() || field()->text() == proposed.c_str());
        };
        return When(name, ready, [=] {
            if (!file.empty())
                field()->setText(QString::fromStdString(file));
            accept ? shown()->accept() : shown()->reject();
        });
    }

    // The alert that is shown; null when there is none.
    static QMessageBox* Alert() { return qobject_cast<QMessageBox*>(QApplication::activeModalWidget()); }
    // The visible window with this title; null when there is none.
    static QWidget* Window(const char* title) {
        for (QWidget* window : QApplication::topLevelWidgets())
            if (window->isVisible() && window->windowTitle() == QString::fromUtf8(title))
                return window;
        return nullptr;
    }
    static Condition WindowShown(const char* title) {
        return [title] { return Window(title) != nullptr; };
    }
    // The menu that is open; null when there is none.
    static QMenu* OpenMenu() { return qobject_cast<QMenu*>(QApplication::activePopupWidget()); }
    // The field that the keyboard is in; null when there is none.
    static QLineEdit* Field() { return qobject_cast<QLineEdit*>(QApplication::focusWidget()); }
    // To the open menu or what else has the keyboard.
    static void Key(Qt::Key key, Qt::KeyboardModifiers with = {}) {
        for (QWidget* at : {QApplication::activePopupWidget(), QApplication::focusWidget(),
                            QApplication::activeModalWidget()})
            if (at)
                return QTest::keyClick(at, key, with);
        self_->Fail("nothing has the keyboard");
    }
    // Types any letters, also those that no key of the test's keyboard has, and then the key if one is given.
    static void Type(const char* text, Qt::Key last = Qt::Key_unknown) {
        for (const QChar letter : QString::fromUtf8(text))
            QTest::sendKeyEvent(QTest::Click, QApplication::focusWidget(), Qt::Key_unknown, QString(letter),
                                Qt::NoModifier);
        if (last != Qt::Key_unknown)
            Key(last);
    }
    // The same, over all that is in the field.
    static void TypeOver(const char* text, Qt::Key last = Qt::Key_unknown) {
        Key(Qt::Key_A, Qt::ControlModifier);
        Key(Qt::Key_Delete);
        Type(text, last);
    }
    // Clicks a menu's title in the window's menu bar.
    static void ClickTitle(const QWidget* window, const char* title) {
        Click(window->findChild<QMenuBar*>(), title);
    }
    // Clicks an item of the open menu.
    static void ClickItem(const char* label) { Click(OpenMenu(), label); }
    // Clicks a button found by its name; without such a button the step after it will wait in vain.
    static void Press(QWidget* window, const char* button) {
        if (auto* found = window->findChild<QAbstractButton*>(QString::fromUtf8(button)))
            QTest::mouseClick(found, Qt::LeftButton);
        else
            self_->Fail(std::string("there is no button ") + button);
    }

  protected:
    virtual void Fail(const std::string& sentence) = 0;
    // Tells of every step that was not reached, which subclasses want at their end.
    void FailForStepsLeft() {
        for (const Step& step : steps_)
            Fail("never came to: " + step.what);
        steps_.clear();
    }

  private:
    struct Step {
        std::string what;
        Condition condition;
        Action action;
    };

    static constexpr int PollMilliseconds = 5;
    static constexpr int PatienceMilliseconds = 60000;

    template <class Menu>
    static void Click(Menu* menu, const char* name) {
        for (QAction* item : menu->actions())
            if ((item->menu() ? item->menu()->objectName() : item->objectName()) == name)
                QTest::mouseClick(menu, Qt::LeftButton, {}, menu->actionGeometry(item).center());
    }
    void Poll() {
        const bool ready = !answered_ && !steps_.empty() && steps_.front().condition();
        if (!ready && deadline_.hasExpired()) {
            Fail("waited in vain for: " + (steps_.empty() ? "the end" : steps_.front().what));
            steps_.clear();
            be_app->PostMessage(B_QUIT_REQUESTED);
            return;
        }
        // Before the action, which may wait in a loop of its own.
        QTimer::singleShot(PollMilliseconds, Qt::CoarseTimer, this, &StepDriver::Poll);
        if (!ready)
            return;
        const Action action = std::move(steps_.front().action);
        steps_.pop_front();
        deadline_.setRemainingTime(PatienceMilliseconds);
        action();
    }

    static inline StepDriver* self_ = nullptr;
    std::deque<Step> steps_;
    QPointer<QMessageBox> answered_;
    QDeadlineTimer deadline_{PatienceMilliseconds};
};
