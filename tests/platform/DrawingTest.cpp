// Views: where they lie, what their drawing leaves on a picture, and print jobs, read back from their files.
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
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr rgb_color Red{255, 0, 0};
constexpr rgb_color Blue{0, 0, 255};

using Work = std::function<void(BView*)>;

// A view that draws what a test says.
struct Canvas : BView {
    Canvas(BRect frame, Work d) : BView(frame, "canvas", B_FOLLOW_NONE, B_WILL_DRAW), draw(std::move(d)) {}
    void Draw(BRect) override { draw(this); }
    Work draw;
};

// What is drawn on a screen with this many pixels to a logical one, each way.
QImage Drawn(const Work& draw, double density = 1) {
    Stage stage;
    stage.Add(new Canvas({0, 0, 99, 99}, draw));
    stage.window->Show();
    QImage image((QSizeF(100, 100) * density).toSize(), QImage::Format_RGB32);
    image.setDevicePixelRatio(density);
    stage.Toolkit()->render(&image, {}, QRect(0, 0, 100, 100));
    return image;
}

// The colours at these places: Red, Blue, blacK, White or the bevels' Dark.
std::string Colors(const QImage& picture, std::initializer_list<QPoint> places) {
    const QRgb known[] = {
        qRgb(255, 0, 0),
        qRgb(0, 0, 255),
        qRgb(0, 0, 0),
        qRgb(255, 255, 255),
        qRgb(colors::dark_gray.red, colors::dark_gray.green, colors::dark_gray.blue),
    };
    std::string found;
    for (const QPoint place : places)
        found += "RBKWD?"[std::find(std::begin(known), std::end(known), picture.pixel(place)) - known];
    return found;
}

} // namespace

TEST(Drawing, ShapesCoverTheirInclusiveRectangles) {
    const QImage picture = Drawn([](BView* view) {
        view->SetHighColor(Blue);
        view->FillRect({0, 70, 60, 99});
        view->SetHighColor(Red);
        view->FillRect({10, 10, 19, 19});
        view->StrokeRect({30, 10, 39, 19});
        view->StrokeLine({50, 10}, {59, 10});
        view->SetHighColor(Blue);
        view->FillArc({50, 60}, 20, 20, 0, 90);
        const BRegion region(BRect(80, 80, 84, 84));
        view->ConstrainClippingRegion(&region);
        view->FillRect({70, 70, 99, 99});
        view->ConstrainClippingRegion(nullptr);
        view->FillRect({98, 0, 99, 1});
        const BRect raised(5, 75, 24, 94);
        const BRect sunken(35, 75, 54, 94);
        ThreeDRectangle(view, &raised, 0);
        ThreeDRectangle(view, &sunken, 1);
        EXPECT_EQ(view->PenSize(), 1);
    });
    EXPECT_EQ(Colors(picture, {{10, 10}, {19, 19}, {20, 19}, {9, 10}}), "RRWW");
    EXPECT_EQ(Colors(picture, {{30, 10}, {39, 19}, {31, 11}, {40, 10}}), "RRWW");
    EXPECT_EQ(Colors(picture, {{50, 10}, {59, 10}, {60, 10}, {50, 11}}), "RRWW");
    // The first quarter lies right of and above the centre.
    EXPECT_EQ(Colors(picture, {{58, 52}, {42, 52}, {58, 65}, {42, 65}}), "BWWW");
    EXPECT_EQ(Colors(picture, {{80, 80}, {84, 84}, {85, 84}, {79, 80}, {98, 0}}), "BBWWB");
    // Bevels are lit from the left top.
    EXPECT_EQ(Colors(picture, {{15, 94}, {24, 85}, {15, 91}, {15, 75}, {5, 85}, {15, 73}}), "DDBWWB");
    EXPECT_EQ(Colors(picture, {{45, 75}, {35, 85}, {45, 73}, {45, 78}, {45, 94}, {54, 85}}), "DDBBWW");
}

TEST(Drawing, WhatMeetsLeavesNoSeamAtAnyDensity) {
    for (const double density : {1.25, 1.5, 1.75}) {
        const QImage picture = Drawn(
            [](BView* view) {
                view->SetHighColor(Red);
                view->SetLowColor(Red);
                for (int i = 0; i < 15; ++i) {
                    const float left = 7 * static_cast<float>(i);
                    view->FillRect({left, 0, left + 6, 9});
                    view->FillRectLow({left, 10, left + 6, 19});
                    view->StrokeLine({left, 20}, {left + 6, 20});
                }
            },
            density);
        for (int x = 0; x < picture.width(); ++x)
            for (int y = 0; y < static_cast<int>(21 * density); ++y)
                ASSERT_EQ(picture.pixel(x, y), qRgb(255, 0, 0)) << density << ": " << x << ", " << y;
    }
}

TEST(Drawing, BitmapsKeepTheirTransparentPixelsAndStaySharpOnDenseScreens) {
    BBitmap bitmap(BRect(0, 0, 2, 0), B_CMAP8);
    const uint8 pixels[] = {0, B_TRANSPARENT_MAGIC_CMAP8};
    bitmap.SetBits(pixels, 2, 0, B_CMAP8);
    bitmap.SetBits(pixels, 2, 2, B_CMAP8); // beyond the end: left out but for the first byte
    const auto draw = [&](BView* view) {
        view->SetLowColor(Blue);
        view->DrawBitmap(&bitmap, BPoint(20, 10));
        view->SetDrawingMode(B_OP_OVER);
        view->DrawBitmap(&bitmap, BPoint(10, 10));
    };
    EXPECT_EQ(Colors(Drawn(draw), {{9, 10}, {10, 10}, {11, 10}, {12, 10}, {20, 10}, {21, 10}}), "WKWKKB");
    EXPECT_EQ(Colors(Drawn(draw, 2), {{19, 20}, {20, 20}, {21, 21}, {22, 20}, {23, 21}, {24, 20}}), "WKKWWK");
    // Between two whole densities only the pixels that two share are mixed: here there is one such at each
    // side of the middle.
    EXPECT_EQ(Colors(Drawn(draw, 1.5), {{14, 15}, {15, 15}, {18, 15}}), "WKK");
}

TEST(Drawing, TextTooWideBeginsAtTheLeftAndLowTextEndsAtTheBottom) {
    const auto drawn = [](const char* text, uint8 flags) {
        return Drawn([=](BView* view) {
            font_height height;
            view->GetFontHeight(&height);
            const BRect room(10, 20, 59, 20 + height.ascent + height.descent);
            DrawText(view, &room, text, flags);
        });
    };
    EXPECT_EQ(drawn("HHHHHHHHHHHHHHHH", DrawTextCenter), drawn("HHHHHHHHHHHHHHHH", DrawTextLeft));
    EXPECT_EQ(drawn("H", DrawTextBottom), drawn("H", DrawTextTop));
    EXPECT_NE(drawn("H", DrawTextTop), drawn("", DrawTextTop));
}

TEST_F(StageTest, ViewsFollowTheirParentsEdges) {
    const std::pair<BView*, BRect> views[] = {
        // and where each is then
        {Add(new BView({10, 10, 29, 29}, "", B_FOLLOW_LEFT | B_FOLLOW_TOP, 0)), {10, 10, 29, 29}},
        {Add(new BView({10, 10, 29, 29}, "", B_FOLLOW_RIGHT | B_FOLLOW_BOTTOM, 0)), {50, 30, 69, 49}},
        {Add(new BView({10, 10, 29, 29}, "", B_FOLLOW_ALL_SIDES, 0)), {10, 10, 69, 49}},
    };
    window->ResizeTo(439, 319);
    for (const auto& [view, frame] : views)
        EXPECT_EQ(view->Frame(), frame);
}

class PrintJobs : public testing::Test {
  protected:
    // What the job's settings say.
    static std::string Told(const BPrintJob& job) {
        const std::unique_ptr<BMessage> settings(job.Settings());
        const char* file = "";
        int32 copies = 0, resolution = 0;
        bool landscape = false, colour = true;
        float margin = 0;
        settings->FindString("output file", &file);
        settings->FindInt32("copies", &copies);
        settings->FindInt32("resolution", &resolution);
        settings->FindBool("landscape", &landscape);
        settings->FindBool("colour", &colour);
        settings->FindFloat("left margin", &margin);
        return (QString(file) + ": %1 at %2, %3%4, %5")
            .arg(copies)
            .arg(resolution)
            .arg(landscape)
            .arg(colour)
            .arg(std::lround(margin))
            .toStdString();
    }
    void Configure(BPrintJob& job, const char* file) const {
        BMessage settings;
        settings.AddString("page size", "A4");
        settings.AddString("output file", folder_.File(file).c_str());
        for (const char* margin : {"left margin", "top margin", "right margin", "bottom margin"})
            settings.AddFloat(margin, 36);
        job.SetSettings(&settings);
    }

    BApplication application_{"test"};
    TemporaryFolder folder_;
    Canvas page_{BRect(0, 0, 522, 769), [](BView* view) {
                     view->SetHighColor(Red);
                     view->FillRect({10, 20, 29, 39});
                     view->FillRect({10, 700, 29, 719});
                 }};
};

TEST_F(PrintJobs, DrawViewsAndControlsInPoints) {
    const auto draw = [](BView* view) { view->FillRect(view->Bounds()); };
    auto* hidden = new Canvas({100, 300, 199, 399}, draw);
    hidden->Hide();
    page_.Hide();
    page_.AddChild(hidden);
    page_.AddChild(new Canvas({100, 200, 199, 299}, draw));
    page_.AddChild(new BStringView(BRect(100, 500, 300, 520), "control", "Control"));
    BPrintJob job("Quorvan");
    Configure(job, "report.pdf");
    ASSERT_TRUE(job.BeginJob());
    EXPECT_EQ(job.PrintableRect().LeftTop(), BPoint(0, 0));
    EXPECT_NEAR(job.PrintableRect().Width() + 1, 595 - 72, 1);
    job.DrawView(&page_, BRect(0, 0, 522, 600), BPoint(0, 0));
    job.SpoolPage();
    job.DrawView(&page_, BRect(0, 5, 522, 600), BPoint(0, 100));
    job.SpoolPage();
    ASSERT_TRUE(job.CommitJob());

    const std::string file = folder_.File("report.pdf");
    EXPECT_EQ(PdfPages(file), 2);
    EXPECT_NE(Output("pdfimages -f 1 -l 1 -list " + file).find("image"), std::string::npos); // the control
    Output("pdftoppm -r 72 -png " + file + " " + folder_.File("page"));
    const QImage first(QString::fromStdString(folder_.File("page-1.png")));
    const QImage second(QString::fromStdString(folder_.File("page-2.png")));
    // The margins are 36; nothing is drawn that was not to be.
    EXPECT_EQ(Colors(first, {{44, 60}, {48, 60}, {64, 60}, {68, 60}, {55, 53}, {55, 58}, {55, 740}}),
              "WRRWWRW");
    EXPECT_EQ(Colors(first, {{134, 240}, {138, 240}, {234, 334}, {234, 340}}), "WKKW");
    EXPECT_EQ(Colors(second, {{55, 149}, {55, 153}, {55, 168}, {55, 173}}), "WRRW");
}

TEST_F(PrintJobs, KeepTheirSetUpInAMessageAndRefuseNonsense) {
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
    second.SetSettings(std::unique_ptr<BMessage>(first.Settings()).get());
    EXPECT_EQ(Told(second), "/tmp/x.pdf: 3 at 300, 10, 50");
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
    const auto begin = [&](BPrintJob& job, const char* name) {
        Configure(job, name);
        const bool begun = job.BeginJob();
        job.DrawView(&page_, page_.Bounds(), BPoint(0, 0));
        job.SpoolPage();
        return begun;
    };
    const auto files = [&] { return std::distance(std::filesystem::directory_iterator(folder_.Path()), {}); };
    folder_.Write("old.pdf", "old");
    std::filesystem::permissions(folder_.File("old.pdf"), std::filesystem::perms{0640});
    std::filesystem::create_symlink("old.pdf", folder_.File("link.pdf"));
    std::filesystem::create_directory(folder_.File("folder.pdf"));
    for (const auto& [name, reason] : {std::pair{"missing/report.pdf", ENOENT}, {"folder.pdf", EISDIR}}) {
        BPrintJob nowhere("nowhere");
        EXPECT_FALSE(begin(nowhere, name)) << name;
        EXPECT_EQ(errno, reason) << name;
        EXPECT_FALSE(nowhere.CommitJob()) << name;
    }
    for (const char* name : {"new.pdf", "link.pdf"}) {
        BPrintJob dropped("dropped");
        ASSERT_TRUE(begin(dropped, name));
        EXPECT_FALSE(dropped.BeginJob());
    }
    {
        BPrintJob full("full");
        ASSERT_TRUE(begin(full, "old.pdf"));
        std::signal(SIGXFSZ, SIG_IGN);
        rlimit before{};
        getrlimit(RLIMIT_FSIZE, &before);
        const rlimit little{500, before.rlim_max};
        setrlimit(RLIMIT_FSIZE, &little);
        EXPECT_FALSE(full.CommitJob());
        EXPECT_EQ(errno, EIO);
        setrlimit(RLIMIT_FSIZE, &before);
    }
    EXPECT_EQ(folder_.Read("old.pdf"), "old");
    EXPECT_EQ(files(), 3);
    // A link's target is replaced, and keeps its permissions; the job still tells the name that it was given.
    BPrintJob good("good");
    ASSERT_TRUE(begin(good, "link.pdf"));
    EXPECT_TRUE(Told(good).starts_with(folder_.File("link.pdf")));
    EXPECT_TRUE(good.CommitJob());
    EXPECT_TRUE(Told(good).starts_with(folder_.File("link.pdf")));
    EXPECT_TRUE(folder_.Read("old.pdf").starts_with("%PDF"));
    EXPECT_EQ(std::filesystem::status(folder_.File("old.pdf")).permissions(), std::filesystem::perms{0640});
    EXPECT_EQ(files(), 3);
}
