// Print jobs into PDF files, read back with a PDF reader.
#include <cerrno>
#include <csignal>
#include <filesystem>
#include <memory>
#include <sys/resource.h>

#include <QImage>

#include "Pdf.h"
#include "Stage.h"
#include "TemporaryFolder.h"
#include "platform/PrintJob.h"
#include "platform/StringView.h"

namespace {

// A view with a text at a known place and one further down.
class Page : public BView {
  public:
    Page(BRect frame, const char* name) : BView(frame, name, B_FOLLOW_NONE, B_WILL_DRAW) {
        BFont font;
        font.SetSize(12);
        SetFont(&font);
    }
    void Draw(BRect) override {
        DrawString(Name(), BPoint(36, 72));
        DrawString("Outside", BPoint(36, 700));
    }
};

class Job : public BPrintJob {
  public:
    explicit Job(const std::string& file) : BPrintJob("Quorvan") {
        BMessage settings;
        settings.AddString("page size", "A4");
        settings.AddString("output file", file.c_str());
        for (const char* margin : {"left margin", "top margin", "right margin", "bottom margin"})
            settings.AddFloat(margin, 36);
        SetSettings(&settings);
    }
};

} // namespace

using PrintJobs = StageTest;

TEST_F(PrintJobs, DrawViewsAndControlsInPoints) {
    const TemporaryFolder folder;
    const std::string file = folder.Path() + "/report.pdf";
    auto* page = Add(new Page(BRect(0, 0, 522, 769), "Report"));
    page->Hide();
    page->AddChild(new Page(BRect(100, 200, 300, 300), "Inner"));
    auto* hidden = new Page(BRect(100, 300, 300, 400), "Hidden");
    hidden->Hide();
    page->AddChild(hidden);
    page->AddChild(new BStringView(BRect(100, 500, 300, 520), "control", "Control"));
    Job job(file);
    ASSERT_TRUE(job.BeginJob());
    EXPECT_EQ(job.PrintableRect().LeftTop(), BPoint(0, 0));
    EXPECT_NEAR(job.PrintableRect().Width() + 1, 595 - 72, 1);
    job.DrawView(page, BRect(0, 0, 522, 600), BPoint(0, 0));
    job.SpoolPage();
    job.DrawView(page, BRect(0, 50, 522, 600), BPoint(0, 100));
    job.SpoolPage();
    ASSERT_TRUE(job.CommitJob());

    EXPECT_EQ(PdfPages(file), 2);
    const std::vector<PdfWord> first = PdfWords(file, 1);
    EXPECT_NEAR(FindWord(first, "Report").left, 36 + 36, 2);
    EXPECT_NEAR(FindWord(first, "Report").bottom, 36 + 72, 5);
    EXPECT_NEAR(FindWord(first, "Inner").left, 36 + 100 + 36, 2);
    EXPECT_NEAR(FindWord(first, "Inner").bottom, 36 + 200 + 72, 5);
    EXPECT_NE(Output("pdfimages -f 1 -l 1 -list " + file).find("image"), std::string::npos); // the control
    EXPECT_EQ(FindWord(first, "Hidden").text, "");
    Output("pdftoppm -r 72 -png -singlefile " + file + " " + folder.File("first"));
    const QImage picture(QString::fromStdString(folder.File("first.png")));
    const auto inked = [&](int top) {
        int dark = 0;
        for (int y = top; y < top + 14; y++)
            for (int x = 72; x < 112; x++)
                dark += qGray(picture.pixel(x, y)) < 128;
        return dark > 0;
    };
    EXPECT_TRUE(inked(36 + 60));
    EXPECT_FALSE(inked(36 + 688)); // outside what was to be drawn
    const std::vector<PdfWord> second = PdfWords(file, 2);
    EXPECT_NEAR(FindWord(second, "Report").bottom, 36 + 72 - 50 + 100, 5);
}

TEST_F(PrintJobs, KeepTheirSetUpInAMessageAndRefuseNonsense) {
    const auto settingsOf = [](const BPrintJob& job) { return std::unique_ptr<BMessage>(job.Settings()); };
    BMessage wanted;
    wanted.AddString("page size", "A5");
    wanted.AddString("output file", "/tmp/x.pdf");
    wanted.AddBool("landscape", true);
    wanted.AddFloat("left margin", 50);
    wanted.AddInt32("copies", 3);
    wanted.AddInt32("resolution", 300);
    wanted.AddBool("colour", false);
    BPrintJob first("first");
    first.SetSettings(&wanted);
    BPrintJob second("second");
    second.SetSettings(settingsOf(first).get());
    const auto kept = settingsOf(second);
    int32 copies = 0, resolution = 0;
    bool landscape = false, colour = true;
    float margin = 0;
    EXPECT_TRUE(kept->FindInt32("copies", &copies) == B_OK && copies == 3) << copies;
    EXPECT_TRUE(kept->FindInt32("resolution", &resolution) == B_OK && resolution == 300) << resolution;
    EXPECT_TRUE(kept->FindBool("landscape", &landscape) == B_OK && landscape);
    EXPECT_TRUE(kept->FindBool("colour", &colour) == B_OK && !colour);
    EXPECT_TRUE(kept->FindFloat("left margin", &margin) == B_OK && std::abs(margin - 50) < 0.5F) << margin;
    EXPECT_NEAR(second.PrintableRect().Height(), 420 - 2 * 12, 40); // A5 on its side

    BMessage nonsense;
    nonsense.AddString("page size", "elephant");
    nonsense.AddFloat("page width", -5);
    nonsense.AddFloat("left margin", 1e9F);
    nonsense.AddInt32("copies", -1);
    nonsense.AddInt32("resolution", 1 << 30);
    second.SetSettings(&nonsense);
    second.SetSettings(nullptr);
    EXPECT_NEAR(second.PrintableRect().Width(), first.PrintableRect().Width(), 1);
}

TEST_F(PrintJobs, LeaveFilesAsTheyWereUnlessAllIsWritten) {
    const TemporaryFolder folder;
    auto* page = Add(new Page(BRect(0, 0, 500, 700), "Page"));
    const auto begin = [&](Job& job) {
        const bool begun = job.BeginJob();
        job.DrawView(page, page->Bounds(), BPoint(0, 0));
        job.SpoolPage();
        return begun;
    };
    const auto files = [&] { return std::distance(std::filesystem::directory_iterator(folder.Path()), {}); };
    folder.Write("old.pdf", "old");
    std::filesystem::permissions(folder.File("old.pdf"), std::filesystem::perms{0640});
    std::filesystem::create_symlink("old.pdf", folder.File("link.pdf"));
    std::filesystem::create_directory(folder.File("folder.pdf"));
    for (const auto& [name, reason] : {std::pair{"missing/report.pdf", ENOENT}, {"folder.pdf", EISDIR}}) {
        Job nowhere(folder.File(name));
        EXPECT_FALSE(begin(nowhere)) << name;
        EXPECT_EQ(errno, reason) << name;
        EXPECT_FALSE(nowhere.CommitJob()) << name;
    }
    for (const char* name : {"new.pdf", "link.pdf"}) {
        Job dropped(folder.File(name));
        ASSERT_TRUE(begin(dropped));
        EXPECT_FALSE(dropped.BeginJob());
    }
    {
        Job full(folder.File("old.pdf"));
        ASSERT_TRUE(begin(full));
        std::signal(SIGXFSZ, SIG_IGN);
        rlimit before{};
        getrlimit(RLIMIT_FSIZE, &before);
        const rlimit little{2000, before.rlim_max};
        setrlimit(RLIMIT_FSIZE, &little);
        EXPECT_FALSE(full.CommitJob());
        EXPECT_EQ(errno, EIO);
        setrlimit(RLIMIT_FSIZE, &before);
    }
    EXPECT_EQ(folder.Read("old.pdf"), "old");
    EXPECT_EQ(files(), 3);
    // A link's target is replaced, and keeps its permissions; the job still tells the name that it was given.
    Job good(folder.File("link.pdf"));
    ASSERT_TRUE(begin(good));
    for (const bool committed : {false, true}) {
        const std::unique_ptr<BMessage> settings(good.Settings());
        const char* name = "";
        settings->FindString("output file", &name);
        EXPECT_EQ(name, folder.File("link.pdf"));
        if (!committed)
            EXPECT_TRUE(good.CommitJob());
    }
    EXPECT_TRUE(folder.Read("old.pdf").starts_with("%PDF"));
    EXPECT_EQ(std::filesystem::status(folder.File("old.pdf")).permissions(), std::filesystem::perms{0640});
    EXPECT_EQ(files(), 3);
}
