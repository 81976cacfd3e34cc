// Rows of the investment list: their texts, pictures and order.
#include "Program.h"

#include "util/Utf8.h"

namespace {

TEST(NorvelItem, ShowsTheRecordAsItWas) {
    INVESTMENT_DATA record = MakeInvestment("A", "Alder, Inc.", 1250.5F, 12.375F, "Stock");
    record.Retire = 1;
    record.Date = {25, 12, 1999};
    record.QuoteError = 1;
    const NorvelItem item(record, 42);
    const std::string first = item.AccessibleText();
    EXPECT_EQ(
        first,
        "Alder, Inc., TICK, Stock, 1250.500, 12 3/8, 15,474.94, 12-25-1999, yes, Med, Bank, no price found");
    record = MakeInvestment("A", "Other");
    EXPECT_EQ(item.AccessibleText(), first);
    EXPECT_EQ(item.RecordNumber(), 42);
    for (const int32 column : {-1, 0, 11, 100})
        EXPECT_STREQ(item.Text(column), "");
}

TEST(NorvelItem, FieldsWithoutAnEndAreShownToTheirs) {
    INVESTMENT_DATA record;
    std::memset(&record, 'x', sizeof record);
    const NorvelItem item(record, 0);
    using Column = InvestmentColumn;
    for (const auto& [column, length] : {std::pair{Column::Name, 31U},
                                         {Column::Ticker, 7},
                                         {Column::Type, 31},
                                         {Column::Agent, 31},
                                         {Column::Risk, 71},
                                         {Column::Price, 38}})
        EXPECT_EQ(std::strlen(item.Text(static_cast<int32>(column))), length);
}

TEST(NorvelItem, ComparesByTextWithoutRegardToLetterCase) {
    const char* names[] = {"", "a", "aB", "B a", "[", "az", "\xC3\xA4", "\xC3\x84"};
    // Their places among the upper-case copies, byte by byte.
    const int ranks[] = {0, 1, 2, 4, 5, 3, 7, 6};
    const auto sign = [](int number) { return (number > 0) - (number < 0); };
    for (std::size_t x = 0; x < std::size(names); ++x) {
        for (std::size_t y = 0; y < std::size(names); ++y) {
            const NorvelItem a(MakeInvestment("A", names[x]), 0);
            const NorvelItem b(MakeInvestment("A", names[y]), 1);
            EXPECT_EQ(sign(NorvelItem::MyCompare(&a, &b, 1)), sign(ranks[x] - ranks[y]))
                << names[x] << " : " << names[y];
        }
    }
}

TEST(NorvelItem, EachMoveHasItsPicture) {
    Program program;
    program.Write("Quorvan.ini", "[DISPLAY]\nColumnWidth0=20\n");
    program.AddPortfolio("A");
    static constexpr struct {
        float previous;
        std::int8_t error;
        QPoint pixel; // one that the picture draws
        uint8 color;
    } cases[] = {
        {9, 0, {7, 8}, 143},  {11, 0, {7, 8}, 228},
        {10, 0, {7, 6}, 191}, {-1, 0, {7, 9}, 163},
        {9, 1, {3, 3}, 0},    {-1, -1, {4, 4}, 252},
        {0, 0, {7, 9}, 163},  {std::numeric_limits<float>::quiet_NaN(), 0, {7, 9}, 163},
    };
    for (const auto& each : cases) {
        INVESTMENT_DATA record = MakeInvestment("A", "a");
        record.PrevPrice = each.previous;
        record.QuoteError = each.error;
        program.AddInvestment(record);
    }
    program.Then("pictures", [] {
        const auto picture = [] { return Program::RowsWidget()->viewport()->grab().toImage(); };
        Program::Main()->resize(600, 600);
        const QImage rows = picture();
        for (int32 i = 0; i < std::ssize(cases); ++i) {
            const float below = std::ceil(std::max(0.F, Program::Row(i)->Height() - 20) * 0.5F);
            const QPoint corner(2, static_cast<int>(Program::List()->ItemFrame(i).top + 2 + below));
            const rgb_color color = color_map_entry(cases[i].color);
            EXPECT_EQ(rows.pixelColor(corner + cases[i].pixel), QColor(color.red, color.green, color.blue))
                << i;
            // Around the picture the row's white shows through.
            EXPECT_EQ(rows.pixelColor(corner + QPoint(15, 0)), QColor(Qt::white)) << i;
        }
        Program::ClickRow(0);
        EXPECT_EQ(picture().pixelColor(QPoint(1, 1)), QColor(178, 178, 178));
    });
    program.RunAndClose();
}

} // namespace
