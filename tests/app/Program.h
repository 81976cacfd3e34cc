#pragma once

#include <QAbstractItemView>

#include "ColumnListView/ColumnListView.h"
#include "DataFolder.h"
#include "Driver.h"
#include "app/NorvelApp.h"
#include "app/NorvelWindow.h"
#include "app/rows/NorvelItem.h"
#include "app/state/AppState.h"
#include "app/state/MessageCodes.h"
#include "platform/Menu.h"
#include "platform/MenuField.h"
#include "platform/StringView.h"
#include "util/interface/InterfaceHelpers.h"

using Texts = std::vector<std::string>;

inline constexpr const char* NotKept =
    "The change could not be saved! Is the disk full, or the file protected?";
inline constexpr const char* NothingToTake = "You must select a(n) investment(s) to cut or copy.";

// The program in a folder of the test's own: fill the folder, give the driver its steps, and Run. A step that
// waits in vain is told by its line.
class Program : public DataFolder, public Driver {
  public:
    Program() { BApplication::SetExecutablePath(File("quorvan").c_str()); }

    // From start to end, as main does it. The last step is to end the program. Returns its exit status.
    int Run() {
        NorvelApp application;
        application.Run();
        return application.ExitStatus();
    }
    int RunAndClose() { return Close().Run(); }

    Program& When(Condition condition, Action action, int line = __builtin_LINE()) {
        Driver::When("line " + std::to_string(line), std::move(condition), std::move(action));
        return *this;
    }
    Program& Await(Condition condition, int line = __builtin_LINE()) {
        return When(std::move(condition), Action([] {}), line);
    }
    Program& Answer(const std::string& text, const char* button = "Ok") {
        Driver::Answer(text, button);
        return *this;
    }
    // A step as soon as the main window is shown and nothing keeps the person out of it.
    Program& Then(Action action, int line = __builtin_LINE()) {
        const auto free = [] {
            return Main() && !QApplication::activeModalWidget() && !QApplication::activePopupWidget();
        };
        return When(free, std::move(action), line);
    }
    Program& Close() {
        return Then([] { Main()->close(); });
    }
    // A step that sends a command and waits for what it led to.
    Program& Send(uint32 code) {
        return Then([code] { Window()->PostMessage(code); });
    }
    Program& Select(const char* portfolio) {
        return Then([portfolio] { Choose(portfolio); });
    }
    // A step that selects these rows of the list and no others.
    Program& Mark(std::vector<int32> rows) {
        const auto mark = [rows = std::move(rows)] {
            List()->DeselectAll();
            for (const int32 row : rows)
                List()->Select(row, true);
        };
        return Then([mark] { Locked(mark); });
    }
    // A step that waits until the list shows these investments, by name and in this order, and, if one is
    // given, this total.
    Program& Expect(const Texts& names, const std::string& total = "", int line = __builtin_LINE()) {
        const auto shown = [=] {
            return Main() && Names() == names && (total.empty() || Total() == "Total Value: " + total);
        };
        return Await(shown, line);
    }

    static QWidget* Main() { return Driver::Window("Quorvan"); }
    static NorvelWindow* Window() { return static_cast<NorvelWindow*>(GetAppWindow(be_app, "Quorvan")); }
    static void Choose(const char* portfolio) {
        BMessage message(MessagePortfolioSelected);
        message.AddString(PortfolioNameField, portfolio);
        Window()->PostMessage(&message);
    }
    // The first such view at or below this one.
    template <class View>
    static View* Find(BView* view = Window()->FindView("top view")) {
        auto* found = dynamic_cast<View*>(view);
        for (int32 i = 0; !found && view && i < view->CountChildren(); ++i)
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
    static void ClickRow(int32 index) {
        List()->ScrollToRow(index);
        const BRect frame = List()->ItemFrame(index);
        const QPoint place(30, static_cast<int>((frame.top + frame.bottom) / 2 - List()->Bounds().top));
        QTest::mouseClick(RowsWidget()->viewport(), Qt::LeftButton, {}, place);
    }
    // Changes to the list want its window's lock.
    static void Locked(const Action& change) {
        ASSERT_TRUE(Window()->Lock());
        change();
        Window()->Unlock();
    }
};
