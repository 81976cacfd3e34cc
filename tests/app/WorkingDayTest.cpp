// A person's whole working day: everything is done by mouse and keys on the real window, and in the end every
// record is looked at byte by byte.
#include "Program.h"

#include <QPushButton>

namespace {

// With letters of more than one byte.
constexpr const char* CedarName = "C\xC3\xA9"
                                  "dar";
constexpr const char* Reserve = "R\xC3\xBC"
                                "ckhalt";

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

// Fills the investment form from top to bottom, going on with Tab over the pick lists, and confirms it with
// Enter.
void FillForm(const Typed& typed) {
    const std::pair<const char*, int> fields[] = {
        {typed.name, 1}, {typed.ticker, 1}, {typed.type, 2}, {typed.shares, 1}, {typed.price, 2}};
    for (const auto& [text, tabs] : fields) {
        Driver::TypeOver(text);
        for (int i = 0; i < tabs; ++i)
            Driver::Key(Qt::Key_Tab);
    }
    Driver::TypeOver(typed.agent, Qt::Key_Return);
}

class WorkingDay : public testing::Test, protected Program {
  protected:
    using Program::Run;

    // Opens a menu by the mouse and clicks one of its items.
    void Choose(const char* title, const char* label) {
        Then(
            std::string(title) + " > " + label,
            [title, label] {
                ClickTitle(Main(), title);
                ClickItem(label);
            });
    }
    void Fill(const char* title, Action action) {
        When(
            std::string("form: ") + title,
            [title] {
                return Driver::Window(title) && QApplication::activeModalWidget() == Driver::Window(title) &&
                       Field();
            },
            std::move(action));
    }
    // Gives the current or a new portfolio a name.
    void Name(const char* command, const char* title, const char* name) {
        Choose("Portfolio", command);
        Fill(
            title, [name] { TypeOver(name, Qt::Key_Return); });
        Await(std::string("portfolio ") + name, [name] {
            return Selector()->FindMarked() && Selector()->FindMarked()->Label() == std::string(name);
        });
    }
    // Opens the selector by the mouse and picks a portfolio.
    void Pick(const char* name) {
        Then(
            std::string("pick ") + name,
            [] {
                for (QPushButton* button : Main()->findChildren<QPushButton*>())
                    if (button->menu())
                        QTest::mouseClick(button, Qt::LeftButton);
            });
        When("the selector's menu", OpenMenu, [name] { ClickItem(name); });
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

TEST_F(WorkingDay, EveryRecordIsAsItShouldBe) {
    const dbDATE today = Today();
    for (const char* name : {"Old hand", "Short lived", "My first one"})
        Name("Add", "Add a Portfolio", name);
    for (const Typed& typed : Day) {
        Then(
            "Add button", [] { Press(Main(), "add button"); });
        Fill("Add an Investment", [&typed] { FillForm(typed); });
    }
    Expect({"Acme", "Birch & Sons", CedarName, "Dogwood", "Elm", "Fir", "Grove",
            "Hazel, long in name but not too", "Ironwood", "Juniper"});

    Then("select two", [] {
        ClickRow(1);
        ClickRow(3, Qt::ControlModifier);
    });
    Choose("Investment", "Cut");
    Pick("Old hand");
    Expect({});
    Choose("Investment", "Paste");
    Expect({"Birch & Sons", "Dogwood"});
    Pick("My first one");
    Await("eight rows", [] { return Names().size() == 8; });

    // A double click edits; the row keeps its place.
    Then("edit Elm", [] {
        ClickRow(2);
        QTest::mouseDClick(RowsWidget()->viewport(), Qt::LeftButton, {}, PlaceOfRow(2));
    });
    Fill(
        "Edit this Investment",
        [] {
            TypeOver("Elm again", Qt::Key_Tab);
            Driver::Window("Edit this Investment")->findChild<QLineEdit*>("price control")->setFocus();
            TypeOver("41.5", Qt::Key_Return);
        });
    When(
        "the edited row", [] { return Names().at(2) == "Elm again"; },
        [] { EXPECT_STREQ(Row(2)->Text(5), "41 1/2"); });

    Name("Edit", "Edit Portfolio", Reserve);
    Then("sort by name", [] {
        QTest::mouseClick(Main()->findChild<QWidget*>("column labels"), Qt::LeftButton, {}, QPoint(80, 6));
    });
    const Texts rest = {"Acme",     CedarName, "Elm again", "Fir", "Grove", "Hazel, long in name but not too",
                        "Ironwood", "Juniper"};
    Expect(rest);

    Pick("Short lived");
    Expect({});
    Choose("Portfolio", "Del");
    Answer("Are you sure you want to delete this portfolio?", "Yes").Answer("Are you really sure?", "Yes");
    Expect({"Birch & Sons", "Dogwood"}, "$31.50");
    Choose("File", "Quit");
    Run();

    std::vector<INVESTMENT_DATA> expected;
    for (const std::size_t i : {0U, 2U, 4U, 5U, 6U, 7U, 8U, 9U})
        expected.push_back(Expected(Reserve, Day[i], today));
    CopyTextZeroed(expected[2].Name, "Elm again");
    expected[2].Price = 41.5F;
    expected[2].Value = 7 * 41.5F;
    CopyTextZeroed(expected[5].Ticker, "HAZELNU");
    for (const std::size_t i : {1U, 3U})
        expected.push_back(Expected("Old hand", Day[i], today));
    ExpectInvestments(expected);
    EXPECT_EQ(Portfolios(), (Texts{"Old hand", Reserve}));

    Expect(rest);
    Choose("File", "Quit");
    Run();
    ExpectInvestments(expected);
}

} // namespace
