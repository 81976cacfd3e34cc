// The dialogs for portfolios and investments, worked by keyboard and mouse on real data files.
#include "Driver.h"

#include <limits>

#include <QCheckBox>
#include <QLineEdit>
#include <QMenu>
#include <QPushButton>

#include "DataFolder.h"
#include "app/model/PortfolioRules.h"
#include "app/state/AppState.h"
#include "dialogs/InvestmentDialog.h"
#include "dialogs/InvestmentInput.h"
#include "dialogs/PortfolioDialog.h"
#include "platform/TextControl.h"
#include "util/Dates.h"

namespace {

constexpr uint16 Both = DialogHasOk | DialogHasCancel;

class FormTest : public testing::Test, protected Driver {
  protected:
    FormTest() {
        state_.portfolios = std::make_unique<DATABASE>(folder_.File("portfol.db").c_str());
        state_.categories = std::make_unique<DATABASE>(folder_.File("misc.db").c_str());
        app_state = &state_;
    }
    ~FormTest() override { app_state = nullptr; }

    void AddEntry(const char* category, const char* text) const {
        CATEGORY_DATA record{};
        CopyText(record.Category, category);
        CopyText(record.Entry, text);
        state_.categories->Append(&record);
    }

    // A step as soon as the keyboard is in a field of the dialog with this title.
    void In(const char* title, Action action) {
        When(
            title,
            [title] {
                return Window(title) && QApplication::activeModalWidget() == Window(title) && Field();
            },
            std::move(action));
    }

    BApplication application_{"test"};
    DataFolder folder_;
    AppState state_;
};

TEST_F(FormTest, ALargeFontLeavesRoomForButtonsAndFields) {
    const BFont* usual = be_plain_font;
    BFont large;
    large.SetSize(3 * large.Size());
    be_plain_font = &large;
    char name[NameSize] = "";
    INVESTMENT_DATA record{};
    auto* small = new PortfolioAddDialog(0, 0, "small", name, state_.portfolios.get());
    EXPECT_GE(small->FindView("Ok button")->Frame().left, 0);
    small->Quit();
    auto* form = new InvestmentDialog(0, 0, "form", &record, Both);
    const auto* field = dynamic_cast<BTextControl*>(form->FindView("ticker control"));
    EXPECT_GE(field->Frame().Width() - field->Divider(), large.StringWidth("123456"));
    form->Quit();
    be_plain_font = usual;
}

TEST_F(FormTest, APortfolioNameIsNewAndFitsItsRecord) {
    ASSERT_TRUE(AddPortfolio(*state_.portfolios, "growth"));
    const char* add = "Add a Portfolio";
    In(add, [] { Key(Qt::Key_Return); });
    Answer("Invalid portfolio name!", "Ok");
    In(add, [] { TypeOver("  ", Qt::Key_Return); });
    Answer("Invalid portfolio name!", "Ok");
    In(add, [] { TypeOver("Growth", Qt::Key_Return); });
    Answer("Portfolio name already exists!", "Ok");
    In(add, [] { TypeOver("Growth Fund 0123456789012345678\xC3\xBC", Qt::Key_Return); });
    char name[NameSize] = "";
    EXPECT_EQ((new PortfolioAddDialog(50, 50, add, name, state_.portfolios.get()))->DoModal(), DialogOk);
    EXPECT_STREQ(name, "Growth Fund 0123456789012345678");

    const char* edit = "Edit Portfolio";
    In(edit, [] { Key(Qt::Key_Return); }); // unchanged
    Answer("Portfolio name already exists!", "Ok");
    In(edit, [] { TypeOver("Else", Qt::Key_Escape); });
    char present[NameSize] = "growth";
    EXPECT_EQ((new PortfolioEditDialog(50, 50, edit, present, state_.portfolios.get()))->DoModal(),
              DialogCancel);
    EXPECT_STREQ(present, "growth");
}

TEST_F(FormTest, AnInvestmentIsEnteredByKeyboardAlone) {
    AddEntry("Agent", "Bank");
    AddEntry("Type", "Stock");
    const char* title = "Add an Investment";
    In(title, [] { TypeOver("  ", Qt::Key_Return); });
    Answer("You must enter a Name!", "Ok");
    In(title, [] {
        TypeOver("M\xC3\xBCller & Co", Qt::Key_Tab);
        TypeOver("LONGTICKER", Qt::Key_Tab);
        TypeOver("my type", Qt::Key_Tab);
        Key(Qt::Key_Tab); // over the types
        TypeOver("1e39", Qt::Key_Tab);
        TypeOver("10", Qt::Key_Return);
    });
    Answer("The number of shares is too large!", "Ok");
    In(title, [] { TypeOver("2,5", Qt::Key_Return); }); // over the one that was refused
    Answer("Shares must be a plain number such as 1250.5, with a point and no other separator!", "Ok");
    In(title, [title] {
        TypeOver("2.5");
        Window(title)->findChild<QCheckBox*>("retirement check")->setFocus();
        Key(Qt::Key_Space);
        Key(Qt::Key_Return);
    });
    INVESTMENT_DATA record{};
    EXPECT_EQ((new InvestmentDialog(50, 50, title, &record, Both))->DoModal(), DialogOk);
    EXPECT_STREQ(record.Name, "M\xC3\xBCller & Co");
    EXPECT_STREQ(record.Ticker, "LONGTIC");
    EXPECT_STREQ(record.Type, "my type");
    EXPECT_STREQ(record.Risk, "Med");
    EXPECT_STREQ(record.Agent, "");
    EXPECT_EQ(record.Shares, 2.5F);
    EXPECT_EQ(record.Price, 10.F);
    EXPECT_EQ(record.Value, 25.F);
    EXPECT_EQ(record.Retire, 1);
    EXPECT_STREQ(record.Portfolio, "");
}

TEST_F(FormTest, TheFormShowsTheRecordAndPickListsFillTheirFields) {
    for (const char* type : {"Stock", "Fund"})
        AddEntry("Type", type);
    for (const char* agent : {"Bank", "Broker"})
        AddEntry("Agent", agent);
    INVESTMENT_DATA record = MakeInvestment("P", "Acme", 12.5F, 3, "stock");
    CopyText(record.Risk, "High");
    CopyText(record.Agent, "Broker");
    record.QuoteError = 1;
    const char* title = "Edit this Investment";
    std::vector<std::string> shown;
    const auto field = [title](const char* name) { return Window(title)->findChild<QLineEdit*>(name); };
    In(
        title,
        [&] {
            for (const char* name : {"name control", "ticker control", "type control", "shares control",
                                     "price control", "agent control"})
                shown.push_back(field(name)->text().toStdString());
            QAction* fund = nullptr;
            for (const QPushButton* button : Window(title)->findChildren<QPushButton*>())
                for (QAction* action : button->menu() ? button->menu()->actions() : QList<QAction*>()) {
                    if (action->isChecked())
                        shown.push_back(action->objectName().toStdString());
                    if (action->objectName() == "Fund")
                        fund = action;
                }
            ASSERT_TRUE(fund);
            fund->trigger();
        });
    When(
        "the picked type", [&] { return Window(title) && field("type control")->text() == "Fund"; },
        [] { Key(Qt::Key_Return); });
    EXPECT_EQ((new InvestmentDialog(50, 50, title, &record, Both))->DoModal(), DialogOk);
    // No type is "stock" to the letter, so the first one stays marked.
    EXPECT_EQ(shown, (std::vector<std::string>{"Acme", "TICK", "stock", "12.500", "3.00", "Broker", "Stock",
                                               "High", "Broker"}));
    EXPECT_STREQ(record.Type, "Fund");
    EXPECT_STREQ(record.Portfolio, "P");
    EXPECT_EQ(record.PrevPrice, NoPreviousPrice);
    EXPECT_EQ(record.QuoteError, 1);
}

TEST(InvestmentInput, AmountsAreNumbersARecordCanHold) {
    using enum InvestmentCheck;
    const struct {
        const char* shares;
        const char* price;
        InvestmentCheck check;
        float value;
    } cases[] = {
        {"12.5", "2", Accepted, 25},         {"abc", "10", Accepted, 0},
        {"inf", "nan", Accepted, 0},         {"", "3", Accepted, 0},
        {" -2 ", "1.5", Accepted, -3},       {"1e-60", "1e30", Accepted, 0},
        {"1e39", "1", SharesTooLarge, 7},    {"1", "-1e999", PriceTooLarge, 7},
        {"1e30", "1e30", ValueTooLarge, 7},  {"1", "44,50", PriceNotPlain, 7},
        {"1,250.5", "2", SharesNotPlain, 7}, {"1", "12 3/8", PriceNotPlain, 7},
        {"1", "$12.50", PriceNotPlain, 7},   {"10", "7.00", Accepted, 70},
    };
    for (const auto& each : cases) {
        INVESTMENT_DATA record{};
        record.Value = 7;
        InvestmentInput input;
        input.name = "N";
        input.shares = each.shares;
        input.price = each.price;
        EXPECT_EQ(FillInvestment(input, &record), each.check) << each.shares;
        EXPECT_EQ(record.Value, each.value) << each.shares;
    }
}

// The form shows fewer decimals than a record has, and nothing for an amount below 0.
TEST(InvestmentInput, AmountsLeftAsShownStayWhatTheyWere) {
    for (const float exact : {45.375F, 1.0044F, 0.001F, 3e38F, 2.5F, -5.0F}) {
        INVESTMENT_DATA record = MakeInvestment("P", "N");
        record.Shares = 1.0004F;
        record.Price = exact;
        InvestmentInput input;
        input.name = "N";
        input.shares = ShownShares(record);
        input.price = ShownPrice(record);
        EXPECT_LE(input.price.size(), std::size_t{MaxAmountBytes});
        EXPECT_TRUE(exact < 1e9F || std::stof(input.price) == exact) << input.price;
        EXPECT_EQ(FillInvestment(input, &record), InvestmentCheck::Accepted);
        EXPECT_EQ(record.Shares, 1.0004F);
        EXPECT_EQ(record.Price, exact);
        EXPECT_EQ(record.Value, 1.0004F * exact);
        input.shares = "2";
        input.price = "45.37";
        EXPECT_EQ(FillInvestment(input, &record), InvestmentCheck::Accepted);
        EXPECT_EQ(record.Value, 2 * 45.37F);
    }
}

TEST(InvestmentInput, TextsAreCutToTheirFieldsBetweenWholeCharacters) {
    INVESTMENT_DATA record = MakeInvestment("P", "old");
    InvestmentInput input;
    input.name = std::string(30, 'n') + "\xC3\xBC";
    input.ticker = "TICKERS1";
    EXPECT_EQ(FillInvestment(input, &record), InvestmentCheck::Accepted);
    EXPECT_EQ(record.Name, std::string(30, 'n'));
    EXPECT_STREQ(record.Ticker, "TICKERS");
    EXPECT_STREQ(record.Risk, "Med") << "no choice leaves the risk as it was";
    int year = 0;
    GetDate(&year, nullptr, nullptr);
    EXPECT_EQ(record.Date.year, year);
}

} // namespace
