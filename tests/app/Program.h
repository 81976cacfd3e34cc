#pragma once

#include <string>
#include <vector>

#include <QAbstractItemView>

#include "ColumnListView/ColumnListView.h"
#include "DataFolder.h"
#include "Driver.h"
#include "app/NorvelApp.h"
#include "app/NorvelWindow.h"
#include "app/rows/NorvelItem.h"
#include "app/state/AppState.h"
#include "app/state/MessageCodes.h"
#include "platform/MenuBar.h"
#include "platform/MenuField.h"
#include "platform/StringView.h"
#include "util/interface/InterfaceHelpers.h"

using Texts = std::vector<std::string>;

// The program in a folder of the test's own: fill the folder, give the driver its steps, and Run.
class Program : public DataFolder, public Driver {
  public:
    Program() { BApplication::SetExecutablePath(File("quorvan").c_str()); }

    // From start to end, as main does it. The last step is to end the program. Returns its exit status.
    int Run() {
        NorvelApp application;
        application.Run();
        return application.ExitStatus();
    }
    // The same, with a last step that closes the main window.
    int RunAndClose() { return Close().Run(); }
    // A step as soon as the main window is shown and nothing keeps the person out of it.
    Program& Then(std::string what, Action action) {
        When(
            std::move(what),
            [] { return Main() && !QApplication::activeModalWidget() && !QApplication::activePopupWidget(); },
            std::move(action));
        return *this;
    }
    Program& Close() {
        return Then(
            "close box", [] { Main()->close(); });
    }
    // A step that sends a command and waits for what it led to.
    Program& Send(uint32 code) {
        return Then(
            "command " + std::to_string(code), [code] { Window()->PostMessage(code); });
    }
    Program& Select(const std::string& portfolio) {
        return Then(
            "select " + portfolio,
            [portfolio] {
                BMessage message(1015);
                message.AddString("PortfolioName", portfolio.c_str());
                Window()->PostMessage(&message);
            });
    }
    // A step that selects these rows of the list and no others.
    Program& Mark(std::vector<int32> rows) {
        return Then(
            "mark rows",
            [rows = std::move(rows)] {
                Locked([&] {
                    List()->DeselectAll();
                    for (const int32 row : rows)
                        List()->Select(row, true);
                });
            });
    }
    // A step that waits until the list shows these investments, by name and in this order; then, if one is
    // given, the total must be this.
    Program& Expect(const Texts& names, const std::string& total = "") {
        std::string what = "rows:";
        for (const std::string& name : names)
            what += " " + name;
        When(
            what, [names] { return Main() && Names() == names; },
            [=] { EXPECT_TRUE(total.empty() || Total() == "Total Value: " + total) << what << Total(); });
        return *this;
    }

    static QWidget* Main() { return Driver::Window("Quorvan"); }
    static NorvelWindow* Window() { return static_cast<NorvelWindow*>(GetAppWindow(be_app, "Quorvan")); }
    // The first such view at or below this one.
    template <class View>
    static View* Find(BView* view = Window()->FindView("top view")) {
        auto* found = dynamic_cast<View*>(view);
        for (int32 i = 0; !found && i < view->CountChildren(); ++i)
            found = Find<View>(view->ChildAt(i));
        return found;
    }
    static ColumnListView* List() { return Find<ColumnListView>(); }
    static BMenu* Selector() { return Find<BMenuField>()->Menu(); }
    static std::string Total() { return Find<BStringView>()->Text(); }
    static NorvelItem* Row(int32 index) { return static_cast<NorvelItem*>(List()->ItemAt(index)); }
    static Texts Names() {
        Texts names;
        for (int32 i = 0; i < List()->CountItems(); ++i)
            names.emplace_back(Row(i)->Text(1));
        return names;
    }
    static QAbstractItemView* RowsWidget() { return Main()->findChild<QAbstractItemView*>(); }
    static void ClickRow(int32 index, Qt::KeyboardModifiers keys = {}) {
        List()->ScrollToRow(index);
        const BRect frame = List()->ItemFrame(index);
        const QPoint place(30, static_cast<int>((frame.top + frame.bottom) / 2 - List()->Bounds().top));
        QTest::mouseClick(RowsWidget()->viewport(), Qt::LeftButton, keys, place);
    }
    // Changes to the list want its window's lock.
    static void Locked(const Action& change) {
        ASSERT_TRUE(Window()->Lock());
        change();
        Window()->Unlock();
    }
};
