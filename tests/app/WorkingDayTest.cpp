// A person's whole working day: everything is done by mouse and keys on the real window, and in the end every
// record is looked at byte by byte.
#include "Program.h"

#include <functional>

#include <QLineEdit>

#include "util/Dates.h"

namespace {

constexpr const char* AddTitle = "Add an Investment";
// With letters of more than one byte.
constexpr const char* CedarName = "C\xC3\xA9"
                                  "dar";
constexpr const char* Reserve = "R\xC3\xBC"
                                "ckhalt";
constexpr const char* EditTitle = "Edit this Investment";

struct Typed {
    const char* name;
    const char* ticker;
    const char* type;
    const char* shares;
    const char* price;
    const char* agent;
};
constexpr Typed Day[] = {
    {"Acme", "ACM", "Stock", "100", "12.375", "Bank"},
    {"Birch & Sons", "BRCH", "Stock", "10.5", "3", ""},
    {CedarName, "", "Fund", "1e3", "0.25", "Broker"},
    {"Dogwood", "DGWD", "Bond Fund", "", "9", "Broker"},
    {"Elm", "ELM", "stock", "7", "abc", "Bank"},
    {"Fir", "FIR", "Other", "-2", "5", "Bank"},
    {"Grove", "GRV", "Fund", "333.333", "1.01", ""},
    {"Hazel, long in name but not too", "HAZELNUTS", "Fund", "1", "1", "Self"},
    {"Ironwood", "IRN", "Stock", "12345.678", "98.7654", "Bank"},
    {"Juniper", "JNP", "Stock", "2", "2", "Bank"},
};

// The record that the form must make of what was typed.
INVESTMENT_DATA Expected(const char* portfolio, const Typed& typed, dbDATE today) {
    INVESTMENT_DATA record{};
    CopyText(record.Portfolio, portfolio);
    CopyText(record.Name, typed.name);
    CopyText(record.Ticker, typed.ticker);
    CopyText(record.Type, typed.type);
    CopyText(record.Agent, typed.agent);
    CopyText(record.Risk, "Med");
    record.Shares = std::strtof(typed.shares, nullptr);
    record.Price = std::strtof(typed.price, nullptr);
    record.Value = record.Shares * record.Price;
    record.PrevPrice = NoPreviousPrice;
    record.Date = today;
    return record;
}

dbDATE Today() {
    int year = 0;
    int month = 0;
    int day = 0;
    GetDate(&year, &month, &day);
    return {static_cast<std::int8_t>(day), static_cast<std::int8_t>(month), static_cast<std::int16_t>(year)};
}

void TypeOver(const char* text) {
    auto* field = qobject_cast<QLineEdit*>(QApplication::focusWidget());
    ASSERT_TRUE(field);
    QTest::keyClick(field, Qt::Key_A, Qt::ControlModifier);
    QTest::keyClick(field, Qt::Key_Delete);
    for (const QChar letter : QString::fromUtf8(text))
        QTest::sendKeyEvent(QTest::Click, field, Qt::Key_unknown, QString(letter), Qt::NoModifier);
}

void Key(Qt::Key key) {
    QTest::keyClick(QApplication::focusWidget(), key);
}

// Fills the investment form from top to bottom, going on with Tab over the pick lists, and confirms it with
// Enter.
void FillForm(const Typed& typed) {
    const auto next = [](int fields) {
        while (fields-- > 0)
            Key(Qt::Key_Tab);
    };
    TypeOver(typed.name);
    next(1);
    TypeOver(typed.ticker);
    next(1);
    TypeOver(typed.type);
    next(2);
    TypeOver(typed.shares);
    next(1);
    TypeOver(typed.price);
    next(2);
    TypeOver(typed.agent);
    Key(Qt::Key_Return);
}

class WorkingDay : public Program {
  public:
    // Opens a menu by the mouse and clicks one of its items.
    WorkingDay& Choose(const char* title, const char* label) {
        Then(std::string(title) + " > " + label, [title, label] {
            auto* bar = Main()->findChild<QMenuBar*>();
            for (QAction* top : bar->actions()) {
                if (top->menu()->objectName() != title)
                    continue;
                QTest::mouseClick(bar, Qt::LeftButton, {}, bar->actionGeometry(top).center());
                for (QAction* item : top->menu()->actions())
                    if (item->objectName() == label)
                        QTest::mouseClick(top->menu(), Qt::LeftButton, {},
                                          top->menu()->actionGeometry(item).center());
            }
        });
        return *this;
    }
    WorkingDay& Fill(const char* title, Action action) {
        When(
            std::string("form: ") + title,
            [title] {
                return Driver::Window(title) && QApplication::activeModalWidget() == Driver::Window(title) &&
                       qobject_cast<QLineEdit*>(QApplication::focusWidget());
            },
            std::move(action));
        return *this;
    }
    WorkingDay& AddPortfolioByHand(const char* name) {
        Choose("Portfolio", "Add").Fill("Add a Portfolio", [name] {
            TypeOver(name);
            Key(Qt::Key_Return);
        });
        When(
            std::string("portfolio ") + name, [name] { return Marked() == name; }, [] {});
        return *this;
    }
    // Opens the selector by the mouse and picks a portfolio.
    WorkingDay& Pick(const char* name) {
        Then(std::string("pick ") + name, [] {
            for (QAbstractButton* button : Main()->findChildren<QAbstractButton*>())
                if (button->property("menu").isValid() || button->objectName().isEmpty())
                    QTest::mouseClick(button, Qt::LeftButton);
        });
        When(
            "the selector's menu", [] { return QApplication::activePopupWidget() != nullptr; },
            [name] {
                auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
                for (QAction* item : menu->actions())
                    if (item->objectName() == name)
                        QTest::mouseClick(menu, Qt::LeftButton, {}, menu->actionGeometry(item).center());
            });
        return *this;
    }
    static std::string Marked() {
        const BMenuItem* marked = Selector()->FindMarked();
        return marked ? marked->Label() : "";
    }
    // Every record of invest.db, compared with what it must be.
    void ExpectInvestments(const std::vector<INVESTMENT_DATA>& expected) const {
        DATABASE file(File("invest.db").c_str());
        DATABASE_HEADER header{};
        file.GetHeaderInfo(&header);
        ASSERT_EQ(header.recordCount, static_cast<std::int32_t>(expected.size()));
        EXPECT_EQ(header.deletedCount, 0);
        for (std::size_t i = 0; i < expected.size(); ++i) {
            INVESTMENT_DATA record{};
            ASSERT_EQ(file.Read(static_cast<long>(i), &record), 1);
            EXPECT_EQ(std::memcmp(&record, &expected[i], offsetof(INVESTMENT_DATA, Unused)), 0)
                << record.Name;
        }
    }
};

} // namespace

TEST(WorkingDay, EveryRecordIsAsItShouldBe) {
    const dbDATE today = Today();
    WorkingDay day;
    day.AddPortfolioByHand("Old hand").AddPortfolioByHand("Short lived").AddPortfolioByHand("My first one");
    for (const Typed& typed : Day) {
        day.Then("Add button", [] { Driver::Press(Program::Main(), "add button"); });
        day.Fill(AddTitle, [&typed] { FillForm(typed); });
    }
    day.Expect({"Acme", "Birch & Sons", CedarName, "Dogwood", "Elm", "Fir", "Grove",
                "Hazel, long in name but not too", "Ironwood", "Juniper"});

    day.Then("select two", [] {
        Program::ClickRow(1);
        Program::ClickRow(3, Qt::ControlModifier);
    });
    day.Choose("Investment", "Cut").Pick("Old hand").Expect({});
    day.Choose("Investment", "Paste").Expect({"Birch & Sons", "Dogwood"});
    day.Pick("My first one");
    day.When(
        "eight rows", [] { return Program::Names().size() == 8; }, [] {});

    // A double click edits; the row keeps its place.
    day.Then("edit Elm", [] {
        const BRect frame = Program::List()->ItemFrame(2);
        const QPoint place(30, static_cast<int>((frame.top + frame.bottom) / 2));
        QTest::mouseClick(Program::RowsWidget()->viewport(), Qt::LeftButton, {}, place);
        QTest::mouseDClick(Program::RowsWidget()->viewport(), Qt::LeftButton, {}, place);
    });
    day.Fill(EditTitle, [] {
        TypeOver("Elm again");
        QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
        Driver::Window(EditTitle)->findChild<QLineEdit*>("price control")->setFocus();
        TypeOver("41.5");
        Key(Qt::Key_Return);
    });
    day.When(
        "the edited row", [] { return Program::Names().at(2) == "Elm again"; },
        [] { EXPECT_STREQ(Program::Row(2)->Text(5), "41 1/2"); });

    day.Choose("Portfolio", "Edit").Fill("Edit Portfolio", [] {
        TypeOver(Reserve);
        Key(Qt::Key_Return);
    });
    day.When(
        "renamed", [] { return WorkingDay::Marked() == Reserve; }, [] {});
    day.Then("sort by name", [] {
        auto* header = Program::Main()->findChild<QWidget*>("column labels");
        QTest::mouseClick(header, Qt::LeftButton, {}, QPoint(80, 6));
    });
    day.Expect({"Acme", CedarName, "Elm again", "Fir", "Grove", "Hazel, long in name but not too", "Ironwood",
                "Juniper"});

    day.Pick("Short lived").Expect({});
    day.Choose("Portfolio", "Del")
        .Answer("Are you sure you want to delete this portfolio?", "Yes")
        .Answer("Are you really sure?", "Yes");
    day.Expect({"Birch & Sons", "Dogwood"});
    day.Then("total", [] { EXPECT_EQ(Program::Total(), "Total Value: $31.50"); });
    day.Choose("File", "Quit");
    day.Run();

    std::vector<INVESTMENT_DATA> expected;
    for (const std::size_t i : {0U, 2U, 4U, 5U, 6U, 7U, 8U, 9U})
        expected.push_back(Expected(Reserve, Day[i], today));
    CopyTextZeroed(expected[2].Name, "Elm again");
    expected[2].Price = 41.5F;
    expected[2].Value = 7 * 41.5F;
    CopyTextZeroed(expected[5].Ticker, "HAZELNU");
    for (const std::size_t i : {1U, 3U})
        expected.push_back(Expected("Old hand", Day[i], today));
    day.ExpectInvestments(expected);
    EXPECT_EQ(day.Portfolios(), (Texts{"Old hand", Reserve}));

    day.Expect({"Acme", CedarName, "Elm again", "Fir", "Grove", "Hazel, long in name but not too", "Ironwood",
                "Juniper"});
    day.Choose("File", "Quit");
    day.Run();
    day.ExpectInvestments(expected);
}
