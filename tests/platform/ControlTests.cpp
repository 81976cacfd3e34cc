// Controls, menus and alerts as a person finds them: worked with the mouse and the keys, read by their names.
#include <atomic>
#include <cmath>
#include <set>

#include <QCheckBox>
#include <QClipboard>
#include <QLabel>
#include <QListView>
#include <QProgressBar>
#include <QPushButton>
#include <QScreen>
#include <QScrollBar>
#include <QToolTip>

#include "Driver.h"
#include "Stage.h"
#include "Worker.h"
#include "platform/Alert.h"
#include "platform/Button.h"
#include "platform/ListView.h"
#include "platform/Menu.h"
#include "platform/MenuField.h"
#include "platform/ScrollView.h"
#include "platform/StatusBar.h"
#include "platform/StringView.h"
#include "platform/TextControl.h"

using Controls = StageTest;

TEST_F(Controls, HaveNamesAndLettersOfTheirOwnAndSendTheirMessages) {
    auto* ok = Add(new BButton(BRect(10, 10, 90, 39), "ok", "Save & go", new BMessage(1)));
    Add(new BButton(BRect(100, 10, 190, 39), "other", "Search", new BMessage(2)));
    Add(new BButton(BRect(200, 10, 230, 39), "none left", "Ss", nullptr));
    Add(new BButton(BRect(10, 130, 190, 159), "a word's beginning", "Sales tax", nullptr));
    auto* box = Add(new BCheckBox(BRect(10, 50, 200, 70), "box", "Sell", new BMessage(3)));
    Add(new BTextControl(BRect(10, 90, 300, 110), "text", "Shares", ""));
    window->SetDefaultButton(ok);
    Show();
    EXPECT_EQ(Find<QPushButton>("ok")->accessibleName(), "Save & go");
    for (const auto& [name, shown] : {std::pair{"ok", "&Save && go"},
                                      {"other", "S&earch"},
                                      {"none left", "Ss"},
                                      {"a word's beginning", "Sales &tax"},
                                      {"box", "Se&ll"}})
        EXPECT_EQ(Find<QAbstractButton>(name)->text(), shown);
    const auto* line = Find<QLineEdit>("text");
    EXPECT_EQ(line->accessibleName(), "Shares");
    EXPECT_EQ(qobject_cast<QLabel*>(line->parentWidget()->children().first())->text(), "S&hares");
    QTest::keyClick(Toolkit(), Qt::Key_H, Qt::AltModifier);
    EXPECT_EQ(QApplication::focusWidget(), line);

    QTest::mouseClick(Find<QPushButton>("ok"), Qt::LeftButton);
    QTest::mouseClick(Find<QCheckBox>("box"), Qt::LeftButton, {}, QPoint(8, 10));
    EXPECT_EQ(box->Value(), B_CONTROL_ON);
    box->SetValue(B_CONTROL_OFF); // the program's own change sends nothing
    for (const auto& [name, key] : {std::pair{"other", Qt::Key_Space},
                                    {"other", Qt::Key_Enter},
                                    {"box", Qt::Key_Space},
                                    {"text", Qt::Key_Return}}) {
        Find<QWidget>(name)->setFocus();
        QTest::keyClick(QApplication::focusWidget(), key);
    }
    EXPECT_EQ(Received(6), (Codes{1, 3, 2, 2, 3, 1}));
    EXPECT_EQ(box->Value(), B_CONTROL_ON);
}

// Of the darkest and the lightest pixel that a widget shows inside its frame.
std::pair<double, double> Luminances(const QWidget* widget) {
    constexpr int frame = 4;
    const QPoint place = widget->mapTo(widget->window(), QPoint(0, 0));
    const QImage shown =
        widget->window()->grab(QRect(place, widget->size()).adjusted(frame, frame, -frame, -frame)).toImage();
    std::set<double> luminances;
    for (int y = 0; y < shown.height(); ++y)
        for (int x = 0; x < shown.width(); ++x)
            luminances.insert(std::pow(qGray(shown.pixel(x, y)) / 255.0, 2.2));
    return {*luminances.begin(), *luminances.rbegin()};
}

TEST(DarkDesktop, LeavesControlsLightAndReadable) {
    qAddPreRoutine([] {
        QPalette dark(QColor(49, 54, 59), QColor(49, 54, 59));
        for (const auto role : {QPalette::WindowText, QPalette::Text, QPalette::ButtonText})
            dark.setColor(role, Qt::white);
        QApplication::setPalette(dark);
    });
    Stage stage;
    auto* ground = stage.Add(new BView(BRect(0, 0, 399, 299), "ground", B_FOLLOW_ALL_SIDES, B_WILL_DRAW));
    ground->AddChild(new BCheckBox(BRect(10, 10, 200, 40), "box", "Box", nullptr));
    ground->AddChild(new BTextControl(BRect(10, 50, 300, 80), "line", "Line", "typed"));
    ground->AddChild(new BButton(BRect(10, 90, 100, 120), "button", "Button", nullptr));
    ground->AddChild(new BMenuField(BRect(10, 130, 32, 150), "arrow", "", new BPopUpMenu("")));
    ground->AddChild(new BStatusBar(BRect(10, 160, 300, 200), "bar", "Working"));
    auto* total = new BStringView(BRect(10, 210, 200, 240), "total", "Total");
    ground->AddChild(total);
    struct HighRow : BListItem {
        void DrawItem(BView*, BRect, bool) override {}
        void Update(BView*, const BFont*) override { SetHeight(1000); }
    } row;
    auto* list = new BListView(BRect(310, 10, 370, 60), "list");
    list->AddItem(&row);
    ground->AddChild(new BScrollView("around", list, B_FOLLOW_NONE, 0, false, true, B_NO_BORDER));
    stage.Show();
    Stage::Find<QListView>("list")->verticalScrollBar()->setObjectName("scroll bar");
    ground->SetViewColor({216, 216, 216});
    for (const char* name : {"box", "line", "line container", "button", "arrow", "bar text", "scroll bar"}) {
        const auto [darkest, lightest] = Luminances(Stage::Find<QWidget>(name));
        EXPECT_GT((lightest + 0.05) / (darkest + 0.05), 4.5) << name;
        EXPECT_GT(lightest, std::pow(215 / 255.0, 2.2)) << name;
    }
    total->SetHighColor({0, 128, 0});
    EXPECT_EQ(Stage::Find<QLabel>("total")->palette().color(QPalette::WindowText), QColor(0, 128, 0));
}

TEST_F(Controls, TextsKeepToTheirPlaceAndBytesWhateverIsPutIn) {
    auto* text = Add(new BTextControl(BRect(10, 90, 309, 92), "text", "Text", ""));
    auto* line = Find<QLineEdit>("text");
    EXPECT_EQ(line->geometry().left(), 149);
    text->SetDivider(80);
    text->ResizeTo(319, text->Frame().Height());
    Show();
    EXPECT_EQ(line->geometry(), QRect(80, 0, 240, static_cast<int>(text->Frame().Height()) + 1));
    EXPECT_GE(line->height(), QFontMetrics(QApplication::font()).height());
    // The limit in bytes, the text with the cursor behind its first letters, how many from there are
    // replaced, what is pasted, and what is there then.
    const std::tuple<int32, const char*, int, int, const char*, const char*, int> cases[] = {
        {8, "abcd", 4, 0, "efgh", "abcdefgh", 8},
        {6, "abcd", 1, 0, "xyz", "abcd", 1}, // what does not fit is not taken in part
        {4, "abcd", 1, 2, "xy", "axyd", 3},
        {5, "abcd", 4, 0, "\xC3\xA9", "abcd", 4},
        {8, "a", 1, 0, "b\nc\td\r", "ab c d", 6}, // line ends and tabs become blanks
    };
    for (const auto& [limit, before, cursor, replaced, pasted, after, cursorAfter] : cases) {
        text->SetMaxBytes(limit);
        text->SetText(before);
        line->setSelection(cursor, replaced);
        if (replaced == 0)
            line->setCursorPosition(cursor);
        QApplication::clipboard()->setText(QString::fromUtf8(pasted));
        line->paste();
        EXPECT_EQ(std::pair(std::string(text->Text()), line->cursorPosition()),
                  std::pair(std::string(after), cursorAfter));
    }
    text->SetMaxBytes(3);
    EXPECT_STREQ(text->Text(), "ab ");
    text->SetText("x\xC3\xA9\xC3\xA9");
    EXPECT_STREQ(text->Text(), "x\xC3\xA9");
    // A letter that is refused leaves the text as it was, with what can be undone.
    text->SetText("old");
    text->MakeFocus();
    EXPECT_TRUE(text->IsFocus());
    QTest::keyClicks(line, "abcd"); // over the old text, which the focus selects
    EXPECT_STREQ(text->Text(), "abc");
    EXPECT_TRUE(QToolTip::text().contains("At most 3 characters fit here"));
    line->undo();
    EXPECT_STREQ(text->Text(), "old");
    // The toolkit's own record of what assistive technology was told would keep a line that goes unheard.
    bool heard = false;
    QObject::connect(line, &QObject::destroyed, [&] { heard = true; });
    ASSERT_TRUE(text->RemoveSelf());
    delete text;
    EXPECT_TRUE(heard);
}

TEST_F(Controls, StatusBarsShowWhatAWorkerTellsThem) {
    auto* bar = Add(new BStatusBar(BRect(10, 10, 190, 50), "bar", "Checking:"));
    bar->SetMaxValue(4);
    Show();
    const Worker worker([&] {
        for (int step = 0; step < 3; ++step) {
            window->Lock();
            bar->Update(1);
            bar->SetText((" T" + std::to_string(step)).c_str());
            window->Unlock();
        }
    });
    const auto* widget = Find<QProgressBar>("bar");
    EXPECT_TRUE(QTest::qWaitFor([&] { return widget->accessibleName() == "Checking: T2"; }));
    EXPECT_EQ(Find<QLabel>("bar text")->text(), "Checking: T2");
    EXPECT_EQ(widget->value() * 4, widget->maximum() * 3);
    bar->Update(100);
    EXPECT_TRUE(QTest::qWaitFor([&] { return widget->value() == widget->maximum(); }));
}

QMenu* OpenMenu() {
    EXPECT_TRUE(QTest::qWaitFor([] { return Driver::OpenMenu() != nullptr; }));
    return Driver::OpenMenu();
}

// A field of two items, the second one marked.
BMenuField* Portfolios(BRect frame, const char* label) {
    auto* menu = new BPopUpMenu("        ");
    menu->AddItem(new BMenuItem("First", new BMessage(1)));
    menu->AddItem(new BMenuItem("Second & last", new BMessage(2)));
    menu->ItemAt(1)->SetMarked(true);
    return new BMenuField(frame, "portfolio", label, menu);
}

TEST_F(Controls, MenuBarsSendToTheItemsTarget) {
    auto* other = new RecordingWindow({}, "other");
    other->Show();
    auto* file = new BMenu("File");
    file->AddItem(new BMenuItem("Save & <b>go</b>", new BMessage(1)));
    file->AddItem(new BSeparatorItem);
    auto* quit = new BMenuItem("Quit", new BMessage(2), 'Q');
    quit->SetTarget(other);
    file->AddItem(quit);
    auto* bar = Add(new BMenuBar(BRect(0, 0, 0, 0), "menu bar"));
    const float emptyHeight = bar->Frame().Height();
    bar->AddItem(file);
    EXPECT_GT(bar->Frame().Height(), emptyHeight);
    EXPECT_EQ(bar->FindItem(2), quit);
    EXPECT_FALSE(file->AddItem(quit)); // is in a menu
    Show();

    QTest::keyClick(Toolkit(), Qt::Key_F, Qt::AltModifier);
    QMenu* open = OpenMenu();
    EXPECT_EQ(Find<QMenuBar>("menu bar")->actions().first()->text(), "&File");
    auto* first = open->findChild<QAction*>("Save & <b>go</b>");
    EXPECT_EQ(first->text(), "&Save && <b>go</b>");
    QTest::simulateEvent(open, true, Qt::Key_S, Qt::AltModifier, "s", true);
    EXPECT_TRUE(open->isVisible());
    Driver::ClickItem("Save & <b>go</b>");
    EXPECT_EQ(Received(1), Codes{1});

    Activate(); // the test platform takes the menu for the active window
    QTest::keyClick(Toolkit(), Qt::Key_Q, Qt::ControlModifier);
    file->SetTargetForItems(other);
    first->trigger();
    EXPECT_TRUE(QTest::qWaitFor([&] { return other->received == Codes{2, 1}; }));
    const std::unique_ptr<BMenuItem> removed(file->ItemAt(0));
    EXPECT_TRUE(file->RemoveItem(removed.get()));
    EXPECT_FALSE(file->RemoveItem(removed.get()));
    EXPECT_EQ(open->actions().size(), 2);
}

TEST_F(Controls, MenuFieldsShowTheMarkedItem) {
    auto* field = Add(Portfolios(BRect(0, 20, 300, 22), "Portfolio:"));
    BMenu* menu = field->Menu();
    field->SetDivider(80);
    int changes = 0;
    field->SetTextChangedHook([&] { changes++; });
    Show();
    const auto* button = Find<QPushButton>("portfolio");
    EXPECT_EQ(button->text(), "Second && last");
    EXPECT_LT(field->VisibleRight(), 300);
    EXPECT_GT(field->VisibleRight(), 80 + field->StringWidth("Second & last"));
    EXPECT_GE(field->Frame().Height(), QFontMetrics(QApplication::font()).height());

    auto* longer = new BMenuItem("A portfolio that has a rather long name of its own", nullptr);
    longer->SetMarked(true);
    menu->AddItem(longer); // a marked item unmarks the others as it comes
    EXPECT_FALSE(menu->ItemAt(1)->IsMarked());
    EXPECT_EQ(field->VisibleRight(), 300);
    EXPECT_TRUE(button->text().startsWith("A p") && button->text().endsWith("own"))
        << button->text().toStdString();
    EXPECT_EQ(button->toolTip(), longer->Label());
    menu->ItemAt(0)->SetMarked(true);
    EXPECT_EQ(button->text() + '|' + button->toolTip(), "First|");
    EXPECT_EQ(button->accessibleName() + button->accessibleDescription(), "Portfolio:First");
    menu->ItemAt(0)->SetMarked(false);
    EXPECT_EQ(button->text(), "        "); // nothing is marked
    EXPECT_EQ(changes, 3);
}

TEST_F(Controls, MenuFieldsAreOpenedAndChosenFromByKeyAndPointer) {
    auto* field = Add(Portfolios(BRect(0, 20, 300, 22), "Portfolio:"));
    BMenu* menu = field->Menu();
    field->MakeFocus();
    Show();
    EXPECT_TRUE(field->IsFocus());
    auto* button = Find<QPushButton>("portfolio");
    // The keyboard begins at the marked item, or at the first.
    for (const auto& [key, marked] : {std::pair{Qt::Key_Down, false},
                                      {Qt::Key_Down, true},
                                      {Qt::Key_Up, true},
                                      {Qt::Key_Space, true},
                                      {Qt::Key_Return, true}}) {
        menu->ItemAt(1)->SetMarked(marked);
        QTest::keyClick(button, key);
        QMenu* open = OpenMenu();
        const QAction* wanted = open->actions()[marked];
        EXPECT_TRUE(QTest::qWaitFor([&] { return open->activeAction() == wanted; })) << key;
        if (marked)
            QTest::keyClick(open, Qt::Key_Up);
        QTest::keyClick(open, Qt::Key_Return);
        EXPECT_TRUE(menu->ItemAt(0)->IsMarked());
        EXPECT_EQ(button->text(), "First");
        EXPECT_EQ(Received(1), Codes{1});
    }
    QTest::mousePress(button, Qt::LeftButton);
    OpenMenu();
    Driver::ClickItem("First");
    EXPECT_EQ(Received(1), Codes{1}); // choosing the marked one again

    // Many long items stay on the screen, in one column.
    for (int number = 0; number < 200; ++number)
        menu->AddItem(new BMenuItem((std::string(28, 'W') + std::to_string(number)).c_str(), nullptr));
    menu->ItemAt(150)->SetMarked(true);
    QTest::keyClick(button, Qt::Key_Down);
    const QMenu* open = OpenMenu();
    QAction* marked = open->actions()[150];
    EXPECT_TRUE(QTest::qWaitFor([&] { return open->rect().contains(open->actionGeometry(marked)); }));
    EXPECT_LE(open->height(), open->screen()->availableGeometry().height());
}

TEST_F(Controls, MenuFieldsWithoutRoomForATextShowAnArrowAndAreCalledAfterTheirNeighbour) {
    Add(new BTextControl(BRect(10, 50, 279, 60), "type", "Type", ""));
    Add(Portfolios(BRect(280, 48, 300, 60), ""));
    Show();
    const auto* button = Find<QPushButton>("portfolio");
    EXPECT_EQ(button->geometry().left(), 0);
    EXPECT_LE(button->width(), 21);
    EXPECT_EQ(button->text(), "");
    EXPECT_EQ(button->accessibleName(), "Type choices");
}

TEST_F(Controls, AlertsAnswerWithTheButtonPressed) {
    const char* text = "Go <b>on</b> & on?";
    const auto ask = [&] { return (new BAlert("", text, "Yes", "Perhaps", "No", B_STOP_ALERT))->Go(); };
    Driver driver;
    for (const auto& [button, answer] : {std::pair{"Yes", 0}, {"Perhaps", 1}, {"No", 2}}) {
        driver.Answer(text, button);
        EXPECT_EQ(ask(), answer) << button;
    }
    driver.When("alert", Driver::Alert, [] {
        QMessageBox* box = Driver::Alert();
        EXPECT_EQ(box->objectName(), "alert");
        EXPECT_EQ(box->icon(), QMessageBox::Critical);
        EXPECT_EQ(box->textFormat(), Qt::PlainText);
        const auto button = [&](const char* name) { return box->findChild<QPushButton*>(name); };
        EXPECT_LT(button("Yes")->x(), button("Perhaps")->x());
        EXPECT_LT(button("Perhaps")->x(), button("No")->x());
        EXPECT_TRUE(button("No")->isDefault());
        QTest::simulateEvent(box, true, Qt::Key_Y, {}, "y", true);
        EXPECT_FALSE(button("Yes")->isDown());
        QTest::keyClick(box, Qt::Key_Escape);
    });
    EXPECT_EQ(ask(), 2);
    Show();
    for (const std::string& endless : {std::string(), QString(" and on").repeated(4000).toStdString()}) {
        QApplication::setActiveWindow(nullptr); // as for a moment after another alert
        driver.When("placed alert", Driver::Alert, [&] {
            QMessageBox* box = Driver::Alert();
            const auto* no = box->findChild<QPushButton*>("No");
            EXPECT_EQ(no->visibleRegion().boundingRect(), no->rect());
            EXPECT_TRUE(box->screen()->availableGeometry().contains(box->frameGeometry()));
            const QPoint off = box->geometry().center() - Toolkit()->geometry().center();
            EXPECT_TRUE(!endless.empty() || off.manhattanLength() < 3);
            Driver::Press(box, "No");
        });
        static_cast<void>((new BAlert("", (text + endless).c_str(), "Yes", "No"))->Go());
    }
}

TEST_F(Controls, AlertsBlockTheirCallerAloneAndEndWithItsStop) {
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
