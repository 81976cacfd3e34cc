// Rows of the investment list: their texts, pictures and order.
#include "Program.h"

namespace {

TEST(NorvelItem, FieldsWithoutAnEndAreShownToTheirs) {
    INVESTMENT_DATA record;
    std::memset(&record, 'x', sizeof record);
    const NorvelItem item(record, 0);
    std::vector<std::size_t> lengths;
    for (int32 column = -1; column <= InvestmentColumnCount; ++column)
        lengths.push_back(std::strlen(item.Text(column)));
    EXPECT_EQ(lengths, (std::vector<std::size_t>{0, 0, 31, 7, 31, 39, 38, 8, 13, 3, 71, 31, 0}));
}

TEST(NorvelItem, ComparesByTextWithoutRegardToLetterCase) {
    // In their order, byte by byte behind the letters without an accent.
    const char* before = "";
    for (const char* name : {"a", "aB", "az", "B a", "[", "\xC3\x84", "\xC3\xA4"}) {
        const NorvelItem a(MakeInvestment("A", std::exchange(before, name)), 0);
        const NorvelItem b(MakeInvestment("A", name), 1);
        EXPECT_LT(NorvelItem::MyCompare(&a, &b, 1), 0) << name;
        EXPECT_GT(NorvelItem::MyCompare(&b, &a, 1), 0) << name;
    }
}

TEST(NorvelItem, EachMoveHasItsPicture) {
    Program program;
    program.Write("Quorvan.ini", "[DISPLAY]\nColumnWidth0=20\n");
    program.AddPortfolio("A");
    static constexpr struct {
        QPoint pixel; // one that the picture draws
        const char* words;
        float previous;
        std::int8_t error;
        uint8 color;
    } cases[] = {{{7, 8}, "price up", 9, 0, 143},
                 {{7, 8}, "price down", 11, 0, 228},
                 {{7, 6}, "price unchanged", 10, 0, 191},
                 {{7, 9}, "no earlier price", -1, 0, 163},
                 {{7, 9}, "no earlier price", 0, 0, 163},
                 {{7, 9}, "no earlier price", std::numeric_limits<float>::quiet_NaN(), 0, 163},
                 {{3, 3}, "no price found", 9, 1, 0},
                 {{4, 4}, "no price found", -1, -1, 252}};
    for (const auto& each : cases) {
        INVESTMENT_DATA record = MakeInvestment("A", "a");
        record.PrevPrice = each.previous;
        record.QuoteError = each.error;
        program.AddInvestment(record);
    }
    program.Then([] {
        const auto picture = [] { return Program::RowsWidget()->viewport()->grab().toImage(); };
        Program::Main()->resize(600, 600);
        const QImage rows = picture();
        for (int32 i = 0; i < std::ssize(cases); ++i) {
            const float below = std::ceil(std::max(0.F, Program::Row(i)->Height() - 20) * 0.5F);
            const QPoint corner(2, static_cast<int>(Program::List()->ItemFrame(i).top + 2 + below));
            const rgb_color color = color_map_entry(cases[i].color);
            EXPECT_EQ(rows.pixelColor(corner + cases[i].pixel), QColor(color.red, color.green, color.blue))
                << i;
            EXPECT_TRUE(Program::Row(i)->AccessibleText().ends_with(cases[i].words)) << i;
            // Around the picture the row's white shows through.
            EXPECT_EQ(rows.pixelColor(corner + QPoint(15, 0)), QColor(Qt::white)) << i;
        }
        Program::ClickRow(0);
        EXPECT_EQ(picture().pixelColor(QPoint(1, 1)), QColor(178, 178, 178));
    });
    program.RunAndClose();
}

} // namespace
