// The report's page, read back as text and as a picture, and what it is drawn with.
#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <memory>

#include <QImage>

#include "DataFolder.h"
#include "Pdf.h"
#include "platform/Application.h"
#include "platform/PrintJob.h"
#include "platform/View.h"
#include "print/Banner.h"
#include "print/PrintTable.h"
#include "print/Report.h"
#include "print/ReportTexts.h"
#include "util/Dates.h"
#include "util/InterfaceHelpers.h"

namespace {

constexpr float Margin = 36;
constexpr float Near = 1; // points; placed text is rounded by less

struct Job : BPrintJob {
    Job(const std::string& file, const char* size) : BPrintJob("test") {
        BMessage settings;
        settings.AddString("output file", file.c_str());
        settings.AddString("page size", size);
        for (const char* margin : {"left margin", "top margin", "right margin", "bottom margin"})
            settings.AddFloat(margin, Margin);
        SetSettings(&settings);
    }
};

// A page that a test draws itself.
struct Drawing : BView {
    Drawing(BRect frame, std::function<void(BView*)> wanted)
        : BView(frame, "drawing", B_FOLLOW_NONE, B_WILL_DRAW), draw(std::move(wanted)) {}
    void Draw(BRect) override { draw(this); }
    std::function<void(BView*)> draw;
};

class ReportTest : public testing::Test {
  protected:
    ReportResult Print(const char* portfolio, const char* size = "A4") {
        Job job(file_, size);
        DATABASE investments(folder_.File("invest.db").c_str());
        const ReportResult result = PrintReport(job, nullptr, portfolio, investments);
        ReadBack(job);
        return result;
    }
    void Print(const std::function<void(BView*)>& draw) {
        Job job(file_, "A4");
        ASSERT_TRUE(job.BeginJob());
        Drawing drawing(job.PrintableRect(), draw);
        job.DrawView(&drawing, drawing.Bounds(), {0, 0});
        job.SpoolPage();
        ASSERT_TRUE(job.CommitJob());
        ReadBack(job);
    }
    // Keeps the words with their places from the printable part's left top.
    void ReadBack(const BPrintJob& job) {
        page_ = job.PrintableRect();
        picture_ = QImage();
        words_ = PdfWords(file_);
        for (PdfWord& word : words_) {
            for (float* edge : {&word.left, &word.top, &word.right, &word.bottom})
                *edge -= Margin;
        }
    }
    [[nodiscard]] PdfWord Word(const std::string& text) const { return FindWord(words_, text); }
    [[nodiscard]] long Count(const std::string& text) const {
        return std::count_if(words_.begin(), words_.end(),
                             [&](const PdfWord& word) { return word.text == text; });
    }
    // The page's words in reading order.
    [[nodiscard]] std::string Text() const {
        return Output("pdftotext -layout " + file_ + " - | tr -s ' \\n' ' '");
    }
    // The brightness of the page, 0 to 255, at a place in points.
    int Brightness(float x, float y) {
        constexpr float scale = 2;
        if (picture_.isNull()) {
            const std::string name = folder_.File("page");
            Output("pdftoppm -r 144 -gray -png -singlefile " + file_ + " " + name);
            picture_.load(QString::fromStdString(name + ".png"));
        }
        return qGray(
            picture_.pixel(static_cast<int>((x + Margin) * scale), static_cast<int>((y + Margin) * scale)));
    }
    // The darkest place of a piece of a line.
    int Darkest(float from, float to, float y) {
        int least = 255;
        for (int step = 0; from + static_cast<float>(step) / 2 < to; ++step)
            least = std::min(least, Brightness(from + static_cast<float>(step) / 2, y));
        return least;
    }

    BApplication application_{"test"};
    DataFolder folder_;
    std::string file_ = folder_.File("report.pdf");
    BRect page_;
    std::vector<PdfWord> words_;
    QImage picture_;
};

TEST_F(ReportTest, ShowsTitlesTableAndFooter) {
    folder_.AddInvestment(MakeInvestment("Mine", "Small", 1, 2.5F));
    folder_.AddInvestment(MakeInvestment("Other", "Stranger", 1, 2.5F));
    folder_.AddInvestment(MakeInvestment("mine", "Large", 12345.5F, 100));
    ASSERT_EQ(Print("Mine"), ReportResult::Printed);
    int year = 0, month = 0, day = 0;
    GetDate(&year, &month, &day);
    ReportText date;
    FormatReportDate(year, month, day, date);
    EXPECT_EQ(Text().substr(0, Text().find_last_not_of(" \f") + 1) + "  ",
              std::string(
                  " Quorvan Personal Portfolio Manager Page 1 Mine Total Value: $1,234,552.50 "
                  "Name Ticker Shares Price Value Agent Risk Small TICK 1.000 2.50 2.50 Bank Med "
                  "Large TICK 12,345.500 100.00 1,234,550.00 Bank Med Quorvan, version 1.0 2 investments ") +
                  date);
    // Numbers end at one place, each in its column; texts begin at one.
    EXPECT_NEAR(Word("1.000").right, Word("12,345.500").right, Near);
    EXPECT_NEAR(Word("2.50").right, Word("100.00").right, Near);
    EXPECT_GT(Word("1,234,550.00").left, Word("100.00").right);
    EXPECT_LT(Word("1,234,550.00").right, Word("Bank").left);
    EXPECT_NEAR(Word("Small").left, Word("Large").left, Near);
    // Bars of 18 points, from the top, and the heading.
    for (const float y : {1.0F, 17.0F, 37.0F, 53.0F, 91.0F, 100.0F, page_.bottom - 17, page_.bottom - 1})
        EXPECT_LT(Brightness(2, y), 50) << y;
    for (const float y : {20.0F, 34.0F, 57.0F, 71.0F, 88.0F, page_.bottom - 20})
        EXPECT_GT(Brightness(2, y), 200) << y;
    EXPECT_NEAR(Word("Quorvan").left + Word("Manager").right, page_.Width(), 2);
    EXPECT_NEAR(Word("Mine").left + Word("Mine").right, page_.Width(), 2);
}

TEST_F(ReportTest, MakesWideCellsFitAndCutsWhatWouldBeTooSmall) {
    const std::string longName(31, 'W');
    const std::string longAgent(31, 'M');
    INVESTMENT_DATA record = MakeInvestment("Mine", longName, 1, 1234567.5F);
    CopyText(record.Agent, longAgent);
    record.Risk[0] = '\0';
    folder_.AddInvestment(record);
    ASSERT_EQ(Print("Mine"), ReportResult::Printed);
    const PdfWord name = Word(longName);
    const PdfWord agent = Word(longAgent);
    const float m = (agent.left - name.left) / 62; // both begin 5 points inside their columns
    EXPECT_LT(name.right, 24 * m);                 // small enough to fit
    const float risk = 74 * m;
    const float middle = (agent.top + agent.bottom) / 2;
    EXPECT_GT(agent.right, risk + 10); // the text goes on unseen
    EXPECT_LT(Darkest(risk - 8, risk - 1, middle), 100);
    EXPECT_LT(Darkest(risk, risk + 1, middle), 100); // the line between
    EXPECT_GT(Darkest(risk + 2, 81 * m - 1, middle), 200);
    EXPECT_EQ(Count("1,234,567.50"), 2);
    EXPECT_GT(Word("1,234,567.50").left, 42 * m);
    EXPECT_LT(Word("1,234,567.50").right, 52 * m - 5);
}

TEST_F(ReportTest, IsOnePageHoweverManyInvestmentsThereAre) {
    const struct {
        int more;
        const char* total;
        const char* count;
    } cases[] = {{0, " $0.00 Name", " 0 investments "},
                 {1, " $20.50 Name", " 1 investment "},
                 {199, " $4100.00 Name", " of 200 investments "}};
    long all = 0;
    for (const auto& each : cases) {
        for (int i = 0; i < each.more; ++i)
            folder_.AddInvestment(MakeInvestment("Mine", "n", 2, 10.25F));
        all += each.more;
        ASSERT_EQ(Print("Mine"), ReportResult::Printed);
        EXPECT_EQ(PdfPages(file_), 1);
        EXPECT_NE(Text().find(each.total), std::string::npos) << Text();
        EXPECT_NE(Text().find(each.count), std::string::npos) << Text();
        EXPECT_TRUE(all == 200 || Count("TICK") == all) << Count("TICK");
    }
    // All that are whole above the footer count; one more may be half behind it.
    const long rows = Count("TICK");
    const std::size_t of = Text().find(" of 200 ");
    const long shown = std::stol(Text().substr(Text().rfind(' ', of - 1)));
    EXPECT_GT(shown, 30);
    EXPECT_TRUE(rows == shown || rows == shown + 1) << rows << " rows, " << shown;
    EXPECT_LT(words_[words_.size() - 20].bottom, page_.bottom);
}

TEST_F(ReportTest, TheTableFitsThePage) {
    folder_.AddInvestment(MakeInvestment("Mine", "Name1", 1, 18450.37F));
    const float largest = [] {
        BFont font(*be_fixed_font);
        font.SetSize(std::min(font.Size(), 12.0F));
        return font.StringWidth("m");
    }();
    for (const char* size : {"A5", "A4", "Letter", "A3"}) {
        ASSERT_EQ(Print("Mine", size), ReportResult::Printed);
        const float m = (Word("TICK").left - Word("Name1").left) / 24;
        EXPECT_LT(81 * m, page_.Width() + Near) << size;
        EXPECT_LT(Darkest(81 * m - 1, 81 * m + 1.5F, (Word("TICK").top + Word("TICK").bottom) / 2), 100)
            << size; // the last line
        EXPECT_GT(Word("18,450.37").left, 42 * m + 2) << size;
        if (std::string(size) == "A3")
            EXPECT_NEAR(m, largest, 0.05F);
        else
            EXPECT_GT(81 * m, page_.Width() * 0.85F) << size;
    }
}

TEST_F(ReportTest, NothingIsPrintedWhenNotAllCanBeRead) {
    for (int i = 0; i < 3; ++i)
        folder_.AddInvestment(MakeInvestment("Mine", "n"));
    folder_.Write("report.pdf", "old");
    Job job(file_, "A4");
    DATABASE investments(folder_.File("invest.db").c_str());
    const auto size = std::filesystem::file_size(folder_.File("invest.db"));
    std::filesystem::resize_file(folder_.File("invest.db"), size - 100);
    EXPECT_EQ(PrintReport(job, nullptr, "Mine", investments), ReportResult::NotRead);
    EXPECT_EQ(folder_.Read("report.pdf"), "old");
}

TEST_F(ReportTest, ATableIsLaidOutInCharactersOrToAWidth) {
    TABLE_COLUMN_ENTRY columns[] = {{10, "", DrawTextLeft}, {-3, "", DrawTextLeft}, {30, "", DrawTextRight}};
    BView view({0, 0, 99, 99}, "view", B_FOLLOW_NONE, B_WILL_DRAW);
    const float m = view.StringWidth("m");
    for (const float width : {0.0F, 80.0F}) {
        PRINT_TABLE table(&view, 7, 20, 3, columns, width);
        const float unit = width > 0 ? width / 40 : m;
        const float edges[] = {7, 7 + 10 * unit, 7 + 10 * unit, 7 + 40 * unit};
        for (int i = 0; i <= 3; ++i)
            EXPECT_FLOAT_EQ(table.GetColumnXCoord(i), edges[i]) << i;
        BRect rect(1, 2, 3, 4);
        for (const int none : {-1, 3, 4})
            EXPECT_EQ(table.GetColumnXCoords(none, &rect), -1);
        EXPECT_EQ(rect, BRect(1, 2, 3, 4));
        EXPECT_EQ(table.GetColumnXCoord(-1), -1);
        EXPECT_EQ(table.GetColumnXCoord(4), -1);
        EXPECT_EQ(table.GetColumnXCoords(2, &rect), 0);
        EXPECT_EQ(rect, BRect(edges[2], 2, edges[3], 4));
        EXPECT_EQ(table.RowPosition(), 20);
    }
    EXPECT_EQ(PRINT_TABLE(&view, 7, 20, 3, nullptr, 50).GetColumnXCoord(0), 57);
}

TEST_F(ReportTest, RowsFollowEachOtherAndStayInTheirCells) {
    TABLE_COLUMN_ENTRY columns[] = {{20, "First", DrawTextLeft}, {20, "", DrawTextRight}};
    // As large as its cells and without an end: reading on would be found out.
    const auto cells = std::make_unique<char[]>(8);
    std::copy_n("abcdefgh", 8, cells.get());
    float line = 0;
    Print([&](BView* view) {
        BFont font;
        view->GetFont(&font);
        line = GetFontHeight(&font);
        PRINT_TABLE table(view, 10, 50, 2, columns, 0);
        table.DrawHeader();
        EXPECT_FLOAT_EQ(table.RowPosition(), 50 + line * 1.25F);
        EXPECT_FLOAT_EQ(table.RowEnd(), 50 + line * 2.25F);
        table.DrawText(cells.get(), 4);
        table.DrawText(cells.get(), 0);
        EXPECT_FLOAT_EQ(table.RowPosition(), 50 + line * 3.25F + 10);
        table.DrawGridLines();
    });
    EXPECT_NEAR(Word("abcd").left, 15, Near);
    EXPECT_NEAR(Word("efgh").right, 10 + columns[1].x + columns[1].width - 7, Near);
    const float row = 50 + line * 1.25F;
    EXPECT_LT(Brightness(10.5F, row + line), 50);
    EXPECT_LT(Brightness(10.5F + columns[1].x, row + line), 50);
    EXPECT_LT(Brightness(100, row + 2 * line + 10.5F), 50); // the bottom
    EXPECT_GT(Brightness(200, row + line + 2.5F), 200);     // none between rows
}

TEST_F(ReportTest, ABannerPlacesItsTextByItsFlags) {
    const struct {
        const char* text;
        short flags;
        float place; // of the text's middle in the bar: 0 left, 1 centre, 2 right
    } cases[] = {{"left", BannerInverse | BannerLeft, 0},
                 {"right", BannerInverse | BannerRight | BannerLeft | BannerCenter, 2},
                 {"center", BannerCenter, 1},
                 {"none", BannerInverse, 0},
                 {"round", BannerInverse | BannerLeft | BannerCenter | BannerRounded, 0}};
    Print([&](BView* view) {
        BRect bar(100, 0, 299, 39);
        for (const auto& each : cases) {
            Banner(view, each.text, &bar, each.flags);
            EXPECT_EQ(view->HighColor(), each.flags & BannerInverse ? colors::white : colors::black);
            bar.OffsetBy(0, 50);
        }
    });
    float top = 0;
    for (const auto& each : cases) {
        const PdfWord word = Word(each.text);
        EXPECT_NEAR((word.top + word.bottom) / 2, top + 20, 3) << each.text;
        if (each.place == 1)
            EXPECT_NEAR((word.left + word.right) / 2, 200, 2);
        else
            EXPECT_NEAR(each.place == 0 ? word.left : word.right, each.place == 0 ? 100 : 297, 2)
                << each.text;
        const bool inverse = (each.flags & BannerInverse) != 0;
        EXPECT_EQ(Brightness(250, top + 2) < 50, inverse) << each.text;
        EXPECT_EQ(Brightness(298, top + 38) < 50, inverse && !(each.flags & BannerRounded)) << each.text;
        top += 50;
    }
}

} // namespace
