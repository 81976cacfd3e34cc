// Rows of the investment list: their texts, pictures and order.
#include "Program.h"

#include "ColumnListView/ToUpperStr.h"

namespace {

INVESTMENT_DATA Moved(const char* name, float previous, float price, std::int8_t error) {
    INVESTMENT_DATA record = MakeInvestment("A", name, 2, price);
    record.PrevPrice = previous;
    record.QuoteError = error;
    return record;
}

TEST(NorvelItem, ShowsTheRecordAsItWas) {
    INVESTMENT_DATA record = MakeInvestment("A", "Alder, Inc.", 1250.5F, 12.375F, "Stock");
    record.Retire = 1;
    record.Date = {25, 12, 1999};
    record.QuoteError = 1;
    const auto item = NorvelItem::Make(record, 42);
    const std::string first = item->AccessibleText();
    EXPECT_EQ(
        first,
        "Alder, Inc., TICK, Stock, 1250.500, 12 3/8, 15,474.94, 12-25-1999, yes, Med, Bank, no price found");
    record = MakeInvestment("A", "Other");
    EXPECT_EQ(item->AccessibleText(), first);
    EXPECT_EQ(item->RecordNumber(), 42);
    for (const int32 column : {-1, 0, 11, 100})
        EXPECT_STREQ(item->Text(column), "");
}

TEST(NorvelItem, FieldsWithoutAnEndAreShownToTheirs) {
    INVESTMENT_DATA record;
    std::memset(&record, 'x', sizeof record);
    const auto item = NorvelItem::Make(record, 0);
    const std::pair<InvestmentColumn, std::size_t> lengths[] = {
        {InvestmentColumn::Name, 31},  {InvestmentColumn::Ticker, 7}, {InvestmentColumn::Type, 31},
        {InvestmentColumn::Agent, 31}, {InvestmentColumn::Risk, 71},  {InvestmentColumn::Price, 15},
    };
    for (const auto& [column, length] : lengths)
        EXPECT_EQ(std::strlen(item->Text(static_cast<int32>(column))), length);
}

// The order is that of upper-case copies, byte by byte.
TEST(NorvelItem, ComparesByTextWithoutRegardToLetterCase) {
    const char* names[] = {"",    "a",  "A",  "ab",       "aB",       "b",         "B a",        "[",
                           "a_b", "aZ", "az", "\xC3\xA4", "\xC3\x84", "a\xC3\xA4", "A\xC3\xA4z", "zebra"};
    constexpr auto column = static_cast<int32>(InvestmentColumn::Name);
    const auto sign = [](int number) { return (number > 0) - (number < 0); };
    for (const char* x : names) {
        for (const char* y : names) {
            const auto a = NorvelItem::Make(MakeInvestment("A", x), 0);
            const auto b = NorvelItem::Make(MakeInvestment("A", y), 1);
            const std::unique_ptr<char[]> upperX(ToUpperStr(x));
            const std::unique_ptr<char[]> upperY(ToUpperStr(y));
            EXPECT_EQ(sign(NorvelItem::MyCompare(a.get(), b.get(), column)),
                      sign(std::strcmp(upperX.get(), upperY.get())))
                << x << " : " << y;
        }
    }
    const auto low = NorvelItem::Make(MakeInvestment("A", "low", 1, 980), 0);
    const auto high = NorvelItem::Make(MakeInvestment("A", "high", 1, 12500), 1);
    EXPECT_LT(NorvelItem::MyCompare(high.get(), low.get(), static_cast<int32>(InvestmentColumn::Value)), 0);
}

TEST(NorvelItem, EachMoveHasItsPicture) {
    Program program;
    program.Write("Quorvan.ini", "[DISPLAY]\nColumnWidth0=20\n");
    program.AddPortfolio("A");
    struct Case {
        const char* name;
        float previous, price;
        std::int8_t error;
        QPoint pixel; // one that the picture draws
        uint8 color;
    };
    static constexpr Case cases[] = {
        {"up", 9, 10, 0, {7, 8}, 143},      {"down", 11, 10, 0, {7, 8}, 228},
        {"same", 10, 10, 0, {7, 6}, 191},   {"unknown", -1, 10, 0, {7, 9}, 163},
        {"not found", 9, 10, 1, {3, 3}, 0}, {"not found", 9, 10, 1, {4, 4}, 252},
    };
    for (const Case& each : cases)
        program.AddInvestment(Moved(each.name, each.previous, each.price, each.error));
    program
        .Then("pictures",
              [] {
                  Program::Main()->resize(600, 500);
                  const QImage picture = Program::RowsWidget()->viewport()->grab().toImage();
                  for (int32 i = 0; i < static_cast<int32>(std::size(cases)); ++i) {
                      const BRect frame = Program::List()->ItemFrame(i);
                      const int below =
                          static_cast<int>(std::ceil(std::max(0.F, Program::Row(i)->Height() - 20) * 0.5F));
                      const QPoint corner(2, static_cast<int>(frame.top) + 2 + below);
                      const rgb_color color = color_map_entry(cases[i].color);
                      EXPECT_EQ(picture.pixelColor(corner + cases[i].pixel),
                                QColor(color.red, color.green, color.blue))
                          << cases[i].name;
                      // Around the picture the row's white shows through.
                      EXPECT_EQ(picture.pixelColor(corner + QPoint(15, 0)), QColor(Qt::white))
                          << cases[i].name;
                  }
                  Program::ClickRow(0);
                  const QColor selected =
                      Program::RowsWidget()->viewport()->grab().toImage().pixelColor(QPoint(1, 1));
                  EXPECT_EQ(selected, QColor(178, 178, 178));
              })
        .Close();
    program.Run();
}

} // namespace
