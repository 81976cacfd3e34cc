// The report's page, read back as text and as a picture, what it is drawn with, and what its job answers.
#include "DataFolder.h"
#include "Driver.h"

#include <algorithm>
#include <cstring>
#include <limits>

#include <QImage>

#include "Pdf.h"
#include "SystemFonts.h"
#include "platform/Message.h"
#include "platform/ViewPicture.h"
#include "print/PrintTable.h"
#include "print/PrinterView.h"
#include "print/Report.h"
#include "print/ReportTexts.h"
#include "util/Dates.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr float Near = 1; // points; placed text is rounded by less
const BRect A4(0, 0, 523, 770);

struct Drawing : BView { // a page that a test draws itself
    explicit Drawing(std::function<void(BView*)> wanted)
        : BView(A4, "drawing", B_FOLLOW_NONE, B_WILL_DRAW), draw(std::move(wanted)) {}
    void Draw(BRect) override { draw(this); }
    std::function<void(BView*)> draw;
};

class ReportTest : public testing::Test {
  protected:
    void Print(BRect page = A4, float total = 0) {
        DATABASE investments(folder_.File("invest.db").c_str());
        PrinterView view(page, "Mine", total, &investments);
        Print(view);
    }
    // Keeps the view's words with their places, and its picture.
    void Print(BView& view) {
        const std::string file = folder_.File("page.pdf");
        folder_.Write("page.pdf", DrawPicture(&view, PictureFormat::Pdf));
        picture_.loadFromData(QByteArray::fromStdString(DrawPicture(&view, PictureFormat::Png, 2)));
        words_ = PdfWords(file);
        text_ = Output("pdftotext -layout " + file + " - | tr -s ' \\n\\f' ' '");
    }
    [[nodiscard]] PdfWord Word(const std::string& text) const { return FindWord(words_, text); }
    [[nodiscard]] float Height(const std::string& text) const { return Word(text).bottom - Word(text).top; }
    [[nodiscard]] long Count(const std::string& text) const {
        return std::ranges::count(words_, text, &PdfWord::text);
    }
    // The darkest place of a piece of a line, 0 to 255.
    [[nodiscard]] int Darkest(float from, float to, float y) const {
        int least = 255;
        for (int x = static_cast<int>(from * 2); x <= static_cast<int>(to * 2); ++x)
            least = std::min(least, qGray(picture_.pixel(x, static_cast<int>(y * 2))));
        return least;
    }
    [[nodiscard]] int Brightness(float x, float y) const { return Darkest(x, x, y); }

    BApplication application_{"test"};
    DataFolder folder_;
    std::vector<PdfWord> words_;
    std::string text_; // line by line
    QImage picture_;
};

TEST_F(ReportTest, ShowsTitlesTableAndFooter) {
    folder_.AddInvestment(MakeInvestment("Mine", "Small", 1, 2.5F));
    folder_.AddInvestment(MakeInvestment("Other", "Stranger", 1, 2.5F));
    folder_.AddInvestment(MakeInvestment("mine", "Large", 12345.5F, 100));
    Print(A4, 1'234'552.5F);
    int year = 0, month = 0, day = 0;
    GetDate(&year, &month, &day);
    ReportText date;
    FormatReportDate(year, month, day, date);
    EXPECT_EQ(text_ + ' ',
              std::string(" Quorvan Personal Portfolio Manager Page 1 Mine Total Value: $1,234,552.50 "
                          "Name Ticker Shares Price Value Agent Risk "
                          "Small TICK 1.000 2.50 2.50 Bank Med "
                          "Large TICK 12,345.500 100.00 1,234,550.00 Bank Med "
                          "Quorvan, version 1.0 2 investments ") +
                  date);
    // Numbers end at one place, each in its column; texts begin at one.
    EXPECT_NEAR(Word("1.000").right, Word("12,345.500").right, Near);
    EXPECT_NEAR(Word("2.50").right, Word("100.00").right, Near);
    EXPECT_GT(Word("1,234,550.00").left, Word("100.00").right);
    EXPECT_LT(Word("1,234,550.00").right, Word("Bank").left);
    EXPECT_NEAR(Word("Small").left, Word("Large").left, Near);
    // Bars of 18 points, from the top, and the heading.
    for (const float y : {1.0F, 17.0F, 37.0F, 53.0F, 91.0F, 100.0F, A4.bottom - 17})
        EXPECT_LT(Brightness(2, y), 50) << y;
    for (const float y : {20.0F, 34.0F, 57.0F, 71.0F, 88.0F, A4.bottom - 20})
        EXPECT_GT(Brightness(2, y), 200) << y;
    EXPECT_NEAR(Word("Quorvan").left + Word("Manager").right, A4.Width(), 2);
    EXPECT_NEAR(Word("Mine").left + Word("Mine").right, A4.Width(), 2);
    // All bars have one font, and all cells that fit another.
    for (const char* word : {"Mine", "Total", "version", "investments"})
        EXPECT_NEAR(Height(word), Height("Quorvan"), 0.1F) << word;
    for (const char* word : {"Name", "Large", "100.00", "Bank"})
        EXPECT_NEAR(Height(word), Height("Small"), 0.1F) << word;
    EXPECT_LT(Height("12,345.500"), Height("100.00"));
}

TEST_F(ReportTest, CutsWhatWouldBeTooSmall) {
    const std::string name(31, 'W'), agent(25, 'M');
    INVESTMENT_DATA record = MakeInvestment("Mine", name, 1, 1);
    CopyText(record.Agent, agent);
    record.Risk[0] = '\0';
    folder_.AddInvestment(record);
    Print();
    const float m = (Word(agent).left - Word(name).left) / 62; // both begin 5 points inside their columns
    BFont least(*be_fixed_font);
    least.SetSize(7);
    EXPECT_NEAR(Word(agent).right - Word(agent).left, least.StringWidth(agent.c_str()), Near);
    const float risk = 74 * m, middle = (Word(agent).top + Word(agent).bottom) / 2;
    EXPECT_GT(Word(agent).right, risk + 10); // the text goes on unseen
    EXPECT_LT(std::max(Darkest(risk - 8, risk - 1, middle), Darkest(risk, risk + 1, middle)), 100);
    EXPECT_GT(Darkest(risk + 2, 81 * m - 1, middle), 200); // beyond the line between
}

TEST_F(ReportTest, CountsWhatItHasRoomFor) {
    for (const auto& [more, count] :
         {std::pair(0, " 0 investments "), {1, " 1 investment "}, {199, " of 200 "}}) {
        for (int i = 0; i < more; ++i)
            folder_.AddInvestment(MakeInvestment("Mine", "n", 2, 10.25F));
        Print();
        EXPECT_NE(text_.find(count), text_.npos) << text_;
    }
    // All that are whole above the footer count; one more may be half behind it.
    const long shown = std::stol(text_.substr(text_.rfind(' ', text_.find(" of 200 ") - 1)));
    EXPECT_EQ(std::clamp(Count("TICK"), shown, shown + 1), Count("TICK")) << shown;
}

// Whether two words stand in one another's place.
bool Touch(const PdfWord& one, const PdfWord& other) {
    constexpr float room = 2; // above and below the letters in a word's box
    return one.left < other.right && other.left < one.right && one.top + room < other.bottom - room &&
           other.top + room < one.bottom - room;
}

TEST_F(ReportTest, NothingIsCutNorTouchesAnotherOnAnyPaper) {
    const std::string wide(31, 'W');
    const BRect papers[] = {{0, 0, 523, 770}, {0, 0, 770, 523}, {0, 0, 348, 523},
                            {0, 0, 523, 348}, {0, 0, 226, 348}, {0, 0, 348, 226}};
    folder_.AddInvestment(MakeInvestment(wide.c_str(), "Name0", 123456.5F, 18450.37F));
    const std::string cut = "A-name-that-may-be-cut-at-31"; // where its letters would be too small
    folder_.AddInvestment(MakeInvestment(wide.c_str(), cut.c_str(), 1, 1));
    for (const int more : {1, 70}) {
        for (int i = 0; i < more; ++i)
            folder_.AddInvestment(MakeInvestment(wide.c_str(), "Name1", 1, 18450.37F));
        DATABASE investments(folder_.File("invest.db").c_str());
        for (std::size_t n = 0; n < 2 * std::size(papers); ++n) {
            const float size = n % 2 ? 12.0F : 27.0F;
            const BRect& paper = papers[n / 2];
            SCOPED_TRACE(testing::Message() << size << " on " << paper.right << " x " << paper.bottom);
            const SystemFonts fonts(size);
            PrinterView view(paper, wide.c_str(), 1e28F, &investments);
            Print(view);
            for (std::size_t i = 0; i < words_.size(); ++i) {
                EXPECT_TRUE(words_[i].left >= 0 && words_[i].right <= paper.right) << words_[i].text;
                for (std::size_t k = 0; k < i; ++k)
                    EXPECT_TRUE(!Touch(words_[i], words_[k]) || words_[k].text == cut)
                        << words_[i].text << " " << words_[k].text;
            }
            EXPECT_LT(Height(cut), Height("TICK") + 0.1F);
            for (const char* word : {"Manager", "version", "investments", "123,456.500"})
                EXPECT_EQ(Count(word), 1) << word << text_;
            EXPECT_NEAR(Height("123,456.500"), Height("1.000"), 0.1F);
            const float m = (Word("TICK").left - Word("Name0").left) / 24;
            EXPECT_NEAR(Word("123,456.500").right, 42 * m - 5, Near); // before the line
            // The table is as wide as the bars, or its letters are as large, or as small, as can be.
            EXPECT_LE(81 * m, paper.right + Near);
            BFont letters(*be_fixed_font);
            letters.SetSize(more == 1 ? std::min(size, 12.0F) : 8);
            EXPECT_TRUE(81 * m > paper.right - 5 || std::abs(letters.StringWidth("m") - m) < 0.2F) << m;
            // Before rows are left out, they fill the page.
            float end = more == 1 ? paper.bottom : 0;
            for (const PdfWord& word : words_)
                end = word.text == "Name1" ? std::max(end, word.bottom) : end;
            EXPECT_GT(end, paper.bottom - 18 - 2 * (Height("TICK") + 5));
        }
    }
}

TEST_F(ReportTest, ItsJobSaysWhatBecameOfIt) {
    folder_.AddInvestment(MakeInvestment("Mine", "n", 6));
    DATABASE investments(folder_.File("invest.db").c_str());
    auto settings = std::make_unique<BMessage>();
    settings->AddString("output file", folder_.File("page.pdf").c_str());
    settings->AddFloat("top margin", 50);
    settings->AddBool("settled", true);
    const auto run = [&] { return RunReportJob(nullptr, "Mine", investments, settings); };
    Driver driver;
    const auto replace = [&](const char* answer) {
        driver.Answer("The file " + folder_.File("page.pdf") + " exists. Replace it by this report?", answer);
    };
    folder_.Write("page.pdf", "old");
    replace("No");
    driver.InDialog("print dialog", false);
    EXPECT_EQ(run(), ReportResult::Cancelled);
    const auto size = std::filesystem::file_size(folder_.File("invest.db"));
    std::filesystem::resize_file(folder_.File("invest.db"), size - 100);
    replace("Yes");
    EXPECT_EQ(run(), ReportResult::NotRead);
    EXPECT_EQ(folder_.Read("page.pdf"), "old");
    std::filesystem::resize_file(folder_.File("invest.db"), size);
    replace("Yes");
    EXPECT_EQ(run(), ReportResult::Printed);
    EXPECT_GE(FindWord(PdfWords(folder_.File("page.pdf")), "$60.00").left, 0);
    std::filesystem::remove_all(folder_.Path());
    EXPECT_EQ(run(), ReportResult::NotPrinted);
    driver.InDialog("page setup dialog", true); // asked for anew, from what was kept
    driver.InDialog("print dialog", false);
    EXPECT_EQ(run(), ReportResult::Cancelled);
    float margin = 0;
    EXPECT_TRUE(settings->FindFloat("top margin", &margin) == B_OK && std::abs(margin - 50) < Near) << margin;
}

TEST_F(ReportTest, ATableIsLaidOutInCharactersOrToAWidth) {
    TABLE_COLUMN_ENTRY columns[] = {{10, "", DrawTextLeft}, {-3, "", DrawTextLeft}, {30, "", DrawTextRight}};
    BView view({0, 0, 99, 99}, "view", B_FOLLOW_NONE, B_WILL_DRAW);
    for (const float width : {0.0F, 80.0F}) {
        const PRINT_TABLE table(&view, 7, 20, 3, columns, width);
        const float unit = width > 0 ? 2 : view.StringWidth("m");
        const float edges[] = {-1, 7, 7 + 10 * unit, 7 + 10 * unit, 7 + 40 * unit, -1};
        for (int i = -1; i <= 4; ++i)
            EXPECT_FLOAT_EQ(table.GetColumnXCoord(i), edges[i + 1]) << i;
        EXPECT_EQ(table.GetColumnXCoords(-1, nullptr), -1);
    }
    EXPECT_EQ(PRINT_TABLE(&view, 7, 20, 3, nullptr, 50).GetColumnXCoord(0), 57);
}

TEST_F(ReportTest, RowsAndBannersKeepToTheirPlaces) {
    TABLE_COLUMN_ENTRY columns[] = {{20, "First", DrawTextLeft}, {20, "", DrawTextRight}};
    // As large as its cells and without an end: reading on would be found out.
    const auto cells = std::make_unique<char[]>(8);
    std::copy_n("abcdefgh", 8, cells.get());
    // Where the banner's text is: at the left, in the middle or at the right.
    const std::tuple<const char*, short, int> banners[] = {
        {"left", BannerInverse | BannerLeft, 0},
        {"right", BannerInverse | BannerRight | BannerLeft | BannerCenter, 2},
        {"center", BannerCenter, 1},
        {"round", BannerInverse | BannerLeft | BannerCenter | BannerRounded, 0}};
    float line = 0;
    Drawing page([&](BView* view) {
        BFont font;
        view->GetFont(&font);
        line = GetFontHeight(&font);
        PRINT_TABLE table(view, 10, 50, 2, columns, 0);
        table.DrawHeader();
        EXPECT_FLOAT_EQ(table.RowPosition(), 50 + line * 1.25F);
        table.DrawText(cells.get(), 4);
        table.DrawText(cells.get(), 0);
        EXPECT_FLOAT_EQ(table.RowPosition(), 50 + line * 3.25F + 10);
        table.DrawGridLines();
        BRect bar(100, 200, 299, 239);
        for (const auto& [text, flags, place] : banners) {
            Banner(view, text, &bar, flags);
            bar.OffsetBy(0, 50);
        }
    });
    Print(page);
    EXPECT_NEAR(Word("abcd").left, 15, Near);
    EXPECT_NEAR(Word("efgh").right, 10 + columns[1].x + columns[1].width - 5, Near);
    const float row = 50 + line * 1.25F;
    for (const float edge : {0.0F, columns[1].x, columns[1].x + columns[1].width})
        EXPECT_LT(Brightness(10.5F + edge, row + line), 50) << edge;
    EXPECT_LT(Brightness(100, row + 2 * line + 10.5F), 50); // the bottom
    EXPECT_GT(Brightness(200, row + line + 2.5F), 200);     // none between rows
    float top = 200;
    for (const auto& [text, flags, place] : banners) {
        const PdfWord word = Word(text);
        const float places[] = {word.left - 100, (word.left + word.right) / 2 - 200, word.right - 297};
        EXPECT_NEAR(places[place], 0, 2) << text;
        EXPECT_NEAR((word.top + word.bottom) / 2, top + 20, 3) << text;
        EXPECT_EQ(Brightness(250, top + 2) < 50, (flags & BannerInverse) != 0) << text;
        EXPECT_EQ(Brightness(298, top + 38) < 50, (flags & (BannerInverse | BannerRounded)) == BannerInverse);
        top += 50;
    }
}

TEST(ReportTexts, StayInTheirCellsWhateverTheRecord) {
    INVESTMENT_DATA record;
    std::memset(&record, 'x', sizeof record); // fields without an end
    record.Shares = std::numeric_limits<float>::quiet_NaN();
    record.Price = -std::numeric_limits<float>::infinity();
    record.Value = 1e26F; // 34 characters
    ReportRow row;
    FillReportRow(record, row);
    EXPECT_EQ(std::vector<std::string>(std::begin(row), std::end(row)),
              (std::vector<std::string>{std::string(31, 'x'), "xxxxxxxx", "nan", "-inf", "#####",
                                        std::string(31, 'x'), std::string(31, 'x')}));
    ReportText text;
    FormatReportDate(1999, 3, 5, text);
    EXPECT_STREQ(text, "March 05, 1999  ");
}

} // namespace
