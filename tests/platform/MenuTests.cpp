// Menu bars, pop-up fields and alerts, opened and worked as a person does.
#include <atomic>

#include <QAction>
#include <QMenu>
#include <QMenuBar>
#include <QMessageBox>
#include <QPushButton>
#include <QScreen>

#include "Driver.h"
#include "Stage.h"
#include "Worker.h"
#include "platform/Alert.h"
#include "platform/MenuBar.h"
#include "platform/MenuField.h"
#include "platform/TextControl.h"

namespace {

QMenu* OpenMenu() {
    EXPECT_TRUE(QTest::qWaitFor([] { return Driver::OpenMenu() != nullptr; }));
    return Driver::OpenMenu();
}

// Two items, the second one marked.
BPopUpMenu* Portfolios() {
    auto* menu = new BPopUpMenu("        ");
    menu->AddItem(new BMenuItem("First", new BMessage(1)));
    auto* second = new BMenuItem("Second & last", new BMessage(2));
    second->SetMarked(true);
    menu->AddItem(second);
    return menu;
}

class Looper : public BLooper {
  public:
    void MessageReceived(BMessage* message) override { last = message->what; }
    uint32 last = 0;
};

} // namespace

using MenuBars = StageTest;
using MenuFields = StageTest;
using Alerts = StageTest;

TEST_F(MenuBars, AskTheirWindowAndSendToTheItemsTarget) {
    auto* looper = new Looper;
    auto* file = new BMenu("File");
    file->AddItem(new BMenuItem("Save & <b>go</b>", new BMessage(1)));
    file->AddItem(new BSeparatorItem);
    auto* quit = new BMenuItem("Quit", new BMessage(2), 'Q');
    quit->SetTarget(looper);
    file->AddItem(quit);
    auto* more = new BMenu("More");
    more->AddItem(new BMenuItem("Deep", new BMessage(3)));
    file->AddItem(more);
    auto* bar = Add(new BMenuBar(BRect(0, 0, 0, 0), "menu bar"));
    const float emptyHeight = bar->Frame().Height();
    bar->AddItem(file);
    EXPECT_GT(bar->Frame().Height(), emptyHeight);
    EXPECT_EQ(bar->Frame().Width(), 399);
    EXPECT_EQ(bar->FindItem(3), more->ItemAt(0));
    EXPECT_FALSE(file->AddItem(quit)); // is in a menu
    Show();

    auto* widget = Find<QMenuBar>("menu bar");
    QTest::keyClick(Toolkit(), Qt::Key_F, Qt::AltModifier);
    QMenu* open = OpenMenu();
    ASSERT_TRUE(open);
    EXPECT_EQ(window->menusBegun, 1);
    EXPECT_EQ(widget->actions().first()->text(), "&File");
    auto* first = open->findChild<QAction*>("Save & <b>go</b>");
    ASSERT_TRUE(first);
    EXPECT_EQ(first->text(), "&Save && <b>go</b>");
    QTest::simulateEvent(open, true, Qt::Key_S, Qt::AltModifier, "s", true);
    EXPECT_TRUE(open->isVisible());
    QTest::mouseClick(open, Qt::LeftButton, {}, open->actionGeometry(first).center());
    EXPECT_EQ(Received(1), Codes{1});

    Activate(); // the test platform takes the menu for the active window
    QTest::keyClick(Toolkit(), Qt::Key_Q, Qt::ControlModifier);
    EXPECT_TRUE(QTest::qWaitFor([&] { return looper->last == 2; }));
    file->SetTargetForItems(looper);
    open->actions().last()->menu()->actions().first()->trigger();
    EXPECT_TRUE(QTest::qWaitFor([&] { return looper->last == 3; }));
    file->SetTargetForItems(nullptr);
    file->ItemAt(0)->SetEnabled(false);
    EXPECT_FALSE(first->isEnabled());
    const std::unique_ptr<BMenuItem> removed(file->ItemAt(0));
    EXPECT_TRUE(file->RemoveItem(removed.get()));
    EXPECT_FALSE(file->RemoveItem(removed.get()));
    EXPECT_EQ(open->actions().size(), 3);
    looper->Quit();
}

TEST_F(MenuFields, ShowTheMarkedItem) {
    auto* menu = Portfolios();
    auto* field = Add(new BMenuField(BRect(0, 20, 300, 22), "portfolio", "Portfolio:", menu));
    field->SetDivider(80);
    int changes = 0;
    field->SetTextChangedHook([&] { changes++; });
    Show();
    auto* button = Find<QPushButton>("portfolio");
    EXPECT_EQ(button->text(), "Second && last");
    EXPECT_LT(field->VisibleRight(), 300);
    EXPECT_GT(field->VisibleRight(), 80 + field->StringWidth("Second & last"));
    EXPECT_GE(field->Frame().Height(), QFontMetrics(QApplication::font()).height());

    auto* longer = new BMenuItem("A portfolio that has a rather long name of its own", nullptr);
    longer->SetMarked(true);
    menu->AddItem(longer); // a marked item unmarks the others as it comes
    EXPECT_FALSE(menu->ItemAt(1)->IsMarked());
    EXPECT_EQ(changes, 1);
    EXPECT_EQ(field->VisibleRight(), 300);
    EXPECT_TRUE(button->text().startsWith("A p") && button->text().endsWith("own"))
        << button->text().toStdString();
    EXPECT_EQ(button->toolTip(), longer->Label());
    menu->ItemAt(0)->SetMarked(true);
    EXPECT_EQ(button->text(), "First");
    EXPECT_EQ(button->toolTip(), "");
    EXPECT_EQ(button->accessibleName(), "Portfolio:");
    EXPECT_EQ(button->accessibleDescription(), "First");
    menu->ItemAt(0)->SetMarked(false);
    EXPECT_EQ(button->text(), "        "); // nothing is marked
    EXPECT_EQ(changes, 3);
}

TEST_F(MenuFields, AreOpenedAndChosenFromByKeyAndPointer) {
    auto* menu = Portfolios();
    auto* field = Add(new BMenuField(BRect(0, 20, 300, 22), "portfolio", "Portfolio:", menu));
    field->MakeFocus();
    Show();
    EXPECT_TRUE(field->IsFocus());
    auto* button = Find<QPushButton>("portfolio");
    menu->ItemAt(1)->SetMarked(false);
    QTest::keyClick(button, Qt::Key_Down);
    QMenu* unmarked = OpenMenu();
    ASSERT_TRUE(unmarked);
    EXPECT_TRUE(QTest::qWaitFor([&] { return unmarked->activeAction() == unmarked->actions()[0]; }));
    QTest::keyClick(unmarked, Qt::Key_Escape);
    for (const Qt::Key key : {Qt::Key_Down, Qt::Key_Up, Qt::Key_Space, Qt::Key_Return}) {
        menu->ItemAt(1)->SetMarked(true);
        QTest::keyClick(QApplication::focusWidget(), key);
        QMenu* open = OpenMenu();
        ASSERT_TRUE(open) << key;
        EXPECT_TRUE(QTest::qWaitFor([&] { return open->activeAction() == open->actions()[1]; }));
        QTest::keyClick(open, Qt::Key_Up);
        QTest::keyClick(open, Qt::Key_Return);
        EXPECT_TRUE(menu->ItemAt(0)->IsMarked());
        EXPECT_EQ(button->text(), "First");
        EXPECT_EQ(Received(1), Codes{1});
    }
    QTest::mousePress(button, Qt::LeftButton);
    QMenu* open = OpenMenu();
    ASSERT_TRUE(open);
    QTest::mouseClick(open, Qt::LeftButton, {}, open->actionGeometry(open->actions()[0]).center());
    EXPECT_EQ(Received(1), Codes{1}); // choosing the marked one again
}

TEST_F(MenuFields, OfManyLongItemsStayOnTheScreenInOneColumn) {
    auto* menu = new BPopUpMenu("");
    for (int number = 0; number < 200; number++)
        menu->AddItem(new BMenuItem((std::string(28, 'W') + std::to_string(number)).c_str(), nullptr));
    menu->ItemAt(150)->SetMarked(true);
    Add(new BMenuField(BRect(0, 20, 300, 22), "portfolio", "Portfolio:", menu));
    Show();
    QTest::keyClick(Find<QPushButton>("portfolio"), Qt::Key_Down);
    const QMenu* open = OpenMenu();
    ASSERT_TRUE(open);
    QAction* marked = open->actions()[150];
    EXPECT_TRUE(QTest::qWaitFor([&] { return open->rect().contains(open->actionGeometry(marked)); }));
    EXPECT_LE(open->height(), open->screen()->availableGeometry().height());
}

TEST_F(MenuFields, WithoutRoomForATextShowAnArrowAndAreCalledAfterTheirNeighbour) {
    Add(new BTextControl(BRect(10, 50, 279, 60), "type", "Type", ""));
    Add(new BMenuField(BRect(280, 48, 300, 60), "choices", "", Portfolios()));
    Show();
    const auto* button = Find<QPushButton>("choices");
    EXPECT_EQ(button->geometry().left(), 0);
    EXPECT_LE(button->width(), 21);
    EXPECT_EQ(button->text(), "");
    EXPECT_EQ(button->accessibleName(), "Type choices");
}

TEST_F(Alerts, AnswerWithTheButtonPressed) {
    for (const auto& [button, answer] : {std::pair{"Yes", 0}, {"Perhaps", 1}, {"No", 2}, {"Escape", 2}}) {
        auto* alert = new BAlert("", "Go <b>on</b> & on?", "Yes", "Perhaps", "No", B_STOP_ALERT);
        Driver driver;
        driver.When("alert", Driver::Alert, [&, button = button] {
            QMessageBox* box = Driver::Alert();
            EXPECT_EQ(box->objectName(), "alert");
            EXPECT_EQ(box->icon(), QMessageBox::Critical);
            EXPECT_EQ(box->textFormat(), Qt::PlainText);
            const auto place = [&](const char* name) { return box->findChild<QPushButton*>(name)->x(); };
            EXPECT_LT(place("Yes"), place("Perhaps"));
            EXPECT_LT(place("Perhaps"), place("No"));
            EXPECT_TRUE(box->findChild<QPushButton*>("No")->isDefault());
            QTest::simulateEvent(box, true, Qt::Key_Y, {}, "y", true);
            EXPECT_FALSE(box->findChild<QPushButton*>("Yes")->isDown());
            if (std::string("Escape") == button)
                QTest::keyClick(box, Qt::Key_Escape);
            else
                Driver::Press(box, button);
        });
        EXPECT_EQ(alert->Go(), answer) << button;
    }
}

TEST_F(Alerts, BlockTheirCallerAloneAndEndWithItsStop) {
    Show();
    std::atomic<int32> answer{-1};
    const auto ask = [&] { answer = (new BAlert("", "From a worker", "Yes", "No"))->Go(); };
    const auto shown = [] { return Driver::Alert() != nullptr; };
    Driver driver;
    driver.When(
        "alert", shown, [&] { window->PostMessage(5); });
    driver.When(
        "message", [&] { return !window->received.empty(); }, [] { Driver::Press(Driver::Alert(), "Yes"); });
    const Worker answered(ask);
    EXPECT_TRUE(QTest::qWaitFor([&] { return answer == 0; }));
    EXPECT_EQ(Received(1), Codes{5});
    const Worker stopped(ask);
    bool ended = false;
    driver.When(
        "alert", shown, [&] { ended = kill_thread(stopped.Id()) == B_OK; });
    EXPECT_TRUE(QTest::qWaitFor([&] { return ended && !shown(); }));
}
