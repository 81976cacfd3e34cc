// The forms, worked by keyboard and mouse on real files, and the helpers over alerts and windows.
#include "Driver.h"

#include <cmath>
#include <sstream>

#include <QPushButton>

#include "DataFolder.h"
#include "app/model/PortfolioRules.h"
#include "app/state/AppState.h"
#include "dialogs/InvestmentDialog.h"
#include "dialogs/InvestmentInput.h"
#include "dialogs/PasswordDialogs.h"
#include "dialogs/PortfolioDialog.h"
#include "platform/Font.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr uint16 Both = DialogHasOk | DialogHasCancel;

class FormTest : public testing::Test, protected Driver {
  protected:
    FormTest() {
        CopyText(state_.settingsPath, folder_.File("Quorvan.ini"));
        state_.portfolios = std::make_unique<DATABASE>(folder_.File("portfol.db").c_str());
        state_.categories = std::make_unique<DATABASE>(folder_.File("misc.db").c_str());
        for (const char* category : {"Type", "Agent"})
            for (const char* entry : {"Bank", "Broker", "Fund"}) {
                CATEGORY_DATA record{};
                CopyText(record.Category, category);
                CopyText(record.Entry, entry);
                state_.categories->Append(&record);
            }
        app_state = &state_;
    }
    ~FormTest() override { app_state = nullptr; }

    // Types over what is selected in the form, and ends it by the key.
    void Enter(FieldForm* form, const char* shown, const char* typed, Qt::Key key) {
        InField([=] {
            EXPECT_EQ(Field()->text(), shown);
            Key(Qt::Key_Backspace);
            Type(typed, key);
        });
        EXPECT_EQ(form->DoModal(), key == Qt::Key_Return ? DialogOk : DialogCancel);
    }
    void Refused(const char* typed, const char* alert) {
        InField([=] { TypeOver(typed, Qt::Key_Return); });
        Answer(alert, "Ok");
    }

    BApplication application_{"test"};
    DataFolder folder_;
    AppState state_;
};

// All that the form may change or must leave, but the date.
std::string Fields(const INVESTMENT_DATA& record) {
    std::ostringstream all;
    all << record.Portfolio << '|' << record.Name << '|' << record.Ticker << '|' << record.Type << '|'
        << record.Risk << '|' << record.Agent << '|' << +record.Retire << +record.QuoteError << '|'
        << record.Shares << '|' << record.Price << '|' << record.Value << '|' << record.PrevPrice;
    return all.str();
}

InvestmentInput Amounts(const std::string& shares, const std::string& price) {
    InvestmentInput input;
    input.name = std::string(30, 'n') + "\xC3\xBC";
    input.shares = shares;
    input.price = price;
    return input;
}

TEST_F(FormTest, ThePasswordIsTakenByOkAlone) {
    folder_.Write("Quorvan.ini", "[GENERAL]\nPassword=0123456789abcdefgh\n");
    auto* settings = new SettingsDialog({100, 120}, Both);
    EXPECT_EQ(settings->Frame(), BRect(100, 120, 300, 120 + std::floor(7 * GetFontHeight(be_bold_font))));
    Enter(settings, "0123456789abcde", "new", Qt::Key_Escape);
    Enter(new SettingsDialog({0, 0}, Both), "0123456789abcde", "blank ", Qt::Key_Return);
    EXPECT_EQ(folder_.Read("Quorvan.ini"), "[GENERAL]\nPassword=blank\n");

    char answer[PasswordSize] = "first";
    auto* form = new PasswordDialog({300, 200}, answer, Both);
    EXPECT_EQ(form->Frame().LeftTop(), BPoint(std::floor(300 - form->Bounds().Width() / 2),
                                              std::floor(200 - 3 * GetFontHeight(be_bold_font))));
    Enter(form, "first", "0123456789abcdefgh", Qt::Key_Return);
    EXPECT_STREQ(answer, "0123456789abcde");
}

TEST_F(FormTest, APortfolioNameIsNewAndFitsItsRecord) {
    ASSERT_TRUE(AddPortfolio(*state_.portfolios, "growth"));
    Refused("  ", "Invalid portfolio name!");
    Refused("Growth", "Portfolio name already exists!");
    InField([] { TypeOver("Growth Fund 0123456789012345678\xC3\xBC", Qt::Key_Return); });
    char name[NameSize] = "";
    EXPECT_EQ((new PortfolioAddDialog(50, 50, "", name, state_.portfolios.get()))->DoModal(), DialogOk);
    EXPECT_STREQ(name, "Growth Fund 0123456789012345678");
    Refused("growth", "Portfolio name already exists!"); // unchanged
    InField([] { TypeOver("Else", Qt::Key_Escape); });
    char old[NameSize] = "growth";
    EXPECT_EQ((new PortfolioEditDialog(50, 50, "", old, state_.portfolios.get()))->DoModal(), DialogCancel);
    EXPECT_STREQ(old, "growth");
}

TEST_F(FormTest, AnInvestmentIsEnteredByKeyboardAlone) {
    Refused("  ", "You must enter a Name!");
    InField([] {
        for (const char* text : {"M\xC3\xBCller & Co", "LONGTICKER", "my type"})
            TypeOver(text, Qt::Key_Tab);
        Key(Qt::Key_Tab); // over the types
    });
    Refused("1e39", "The number of shares is too large!");
    Refused("2,5", "Shares must be a plain number such as 1250.5, with a point and no other separator!");
    InField([] { TypeOver("2.5", Qt::Key_Tab); });
    Refused("1/2", "Share price must be a plain number such as 1250.5, with a point and no other separator!");
    Refused("1e39", "The share price is too large!");
    Refused("3e38", "Shares times share price is too large!");
    InField([] {
        TypeOver("2.5", Qt::Key_Tab);
        TypeOver("10", Qt::Key_Return);
    });
    INVESTMENT_DATA record{};
    EXPECT_EQ((new InvestmentDialog(50, 50, "Add an Investment", &record, Both))->DoModal(), DialogOk);
    EXPECT_EQ(Fields(record), "|M\xC3\xBCller & Co|LONGTIC|my type|Med||00|2.5|10|25|0");
}

TEST_F(FormTest, TheFormShowsTheRecordAndPickListsFillTheirFields) {
    INVESTMENT_DATA record = MakeInvestment("P", "Acme", 12.5F, 3, "bank");
    CopyText(record.Risk, "High");
    CopyText(record.Agent, "Broker");
    record.QuoteError = record.Retire = 1;
    const auto shown = [] {
        QString texts;
        for (const QLineEdit* field : Window("Edit")->findChildren<QLineEdit*>())
            texts += field->text() + '|';
        return texts;
    };
    QString marked;
    InField([&] {
        EXPECT_EQ(shown(), "Acme|TICK|bank|12.500|3.00|Broker|");
        for (const QPushButton* button : Window("Edit")->findChildren<QPushButton*>()) {
            EXPECT_GE(button->visibleRegion().boundingRect().width(), 20);
            for (QAction* item : button->menu() ? button->menu()->actions() : QList<QAction*>()) {
                if (item->isChecked())
                    marked += item->objectName() + '|';
                if (item->objectName() == "Fund")
                    item->trigger();
            }
        }
    });
    When(
        "picked", [&] { return shown() == "Acme|TICK|Fund|12.500|3.00|Fund|"; }, [] { Key(Qt::Key_Return); });
    EXPECT_EQ((new InvestmentDialog(50, 50, "Edit", &record, Both))->DoModal(), DialogOk);
    EXPECT_EQ(marked, "Bank|High|Broker|"); // no type is "bank" to the letter
    EXPECT_EQ(Fields(record), "P|Acme|TICK|Fund|High|Fund|11|12.5|3|37.5|-1");
}

TEST(InvestmentInput, AmountsAreNumbersARecordCanHold) {
    using enum InvestmentCheck;
    const std::tuple<const char*, const char*, InvestmentCheck, float> cases[] = {
        {"12.5", "2", Accepted, 25},         {"abc", "10", Accepted, 0},
        {"inf", "nan", Accepted, 0},         {"", "3", Accepted, 0},
        {" -2 ", "1.5", Accepted, -3},       {"1e-60", "1e30", Accepted, 0},
        {"1,250.5", "2", SharesNotPlain, 7}, {"1", "-1e999", PriceTooLarge, 7},
        {"1", "$12.50", PriceNotPlain, 7},   {"10", "7.00", Accepted, 70},
    };
    for (const auto& [shares, price, check, value] : cases) {
        INVESTMENT_DATA record{};
        record.Value = 7;
        EXPECT_EQ(FillInvestment(Amounts(shares, price), &record), check) << shares << ' ' << price;
        EXPECT_EQ(record.Value, value) << shares << ' ' << price;
    }
}

// The form shows fewer decimals than a record has, and nothing for an amount below 0.
TEST(InvestmentInput, AmountsLeftAsShownStayWhatTheyWere) {
    for (const float exact : {45.375F, 0.001F, 3e38F, -5.0F}) {
        INVESTMENT_DATA record = MakeInvestment("P", "N", 1.0004F, exact);
        const InvestmentInput shown = Amounts(ShownShares(record), ShownPrice(record));
        EXPECT_LE(shown.price.size(), std::size_t{MaxAmountBytes});
        EXPECT_EQ(FillInvestment(shown, &record), InvestmentCheck::Accepted);
        EXPECT_EQ(std::tuple(+record.Shares, +record.Price), std::tuple(1.0004F, exact));
        EXPECT_EQ(FillInvestment(Amounts("2", "45.37"), &record), InvestmentCheck::Accepted);
        // No risk was chosen, and the name is cut between whole characters.
        EXPECT_EQ(Fields(record), "P|" + std::string(30, 'n') + "|||Med||00|2|45.37|90.74|-1");
        const dbDATE today = Today();
        EXPECT_EQ(std::memcmp(&record.Date, &today, sizeof today), 0);
    }
}

TEST_F(FormTest, AHomeFolderThatIsTooLongIsNone) {
    BApplication::SetExecutablePath((std::string(128, 'f') + "/quorvan").c_str());
    char found[PathBufferSize] = "left over";
    EXPECT_TRUE(!GetHomeDir(found) && *found == '\0');
}

} // namespace
