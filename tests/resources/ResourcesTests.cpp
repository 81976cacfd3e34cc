#include <gtest/gtest.h>

#include <string>

#include <QApplication>
#include <QIcon>
#include <QImage>

#include "Shell.h"
#include "platform/Application.h"
#include "resources/DesktopFiles.h"
#include "resources/StatusImages.h"

namespace {

// The drawings are seen in their source; here is that none of their pixels changes unseen.
TEST(StatusImages, KeepTheirPixels) {
    std::uint32_t sum = 2166136261; // FNV-1a
    for (const auto& image : {UpArrowImageData, DownArrowImageData, EqualsSignImageData,
                              QuestionMarkImageData, ErrorSymbolImageData})
        for (const std::uint8_t pixel : image)
            sum = (sum ^ pixel) * 16777619;
    EXPECT_EQ(sum, 730447393U);
}

// What the desktop shows of the program, judged by the desktop's own tools.
TEST(DesktopFiles, AreWhatDesktopsExpect) {
    const std::string id = DesktopId;
    Shell files;
    files.Write("a.desktop", std::string(DesktopEntryTemplate()));
    files.Write(id + ".metainfo.xml", std::string(ProgramMetainfo()));
    EXPECT_EQ(files.Run("desktop-file-validate --warn-kde a.desktop"), 0);
    EXPECT_EQ(files.Output() + files.Errors(), "");
    EXPECT_EQ(files.Run("appstreamcli validate --no-net --pedantic *.xml 2>&1"), 0) << files.Output();
    EXPECT_FALSE(files.Says("pedantic:"));
    EXPECT_NE(ProgramMetainfo().find("<id>" + id + "</id>"), std::string::npos);
    EXPECT_NE(ProgramMetainfo().find("<release version=\"" QUORVAN_VERSION "\""), std::string::npos);
    EXPECT_NE(DesktopEntryTemplate().find("\nIcon=" + id + "\n"), std::string::npos);
}

TEST(DesktopFiles, WindowsShowTheIconSharpAtEverySize) {
    Shell files;
    files.Write("a.svg", std::string(ProgramIcon()));
    const BApplication application("test");
    ASSERT_FALSE(BApplication::SetDesktopIdentity(DesktopId, "no picture"));
    EXPECT_TRUE(QApplication::windowIcon().isNull());
    ASSERT_TRUE(BApplication::SetDesktopIdentity(DesktopId, ProgramIcon()));
    EXPECT_EQ(QApplication::desktopFileName(), QString(DesktopId));
    for (const int size : {16, 22, 24, 32, 48, 64, 128, 256}) {
        const QImage shown = QApplication::windowIcon().pixmap(size, size, QIcon::Normal).toImage();
        ASSERT_EQ(shown.size(), QSize(size, size));
        EXPECT_LT(qAlpha(shown.pixel(0, 0)), 128) << size;
        // The ring's parts meet at a clean line: no pixel of a mixed colour beside it.
        const int ring = size * 7 / 32;
        EXPECT_EQ(shown.pixel(size / 2 - 1, ring), qRgb(255, 255, 255)) << size;
        EXPECT_EQ(shown.pixel(size / 2, ring), qRgb(255, 184, 28)) << size;
        // Another renderer draws the same picture, so nothing in it is one toolkit's own.
        ASSERT_EQ(files.Run("rsvg-convert a.svg -o a.png -w " + std::to_string(size)), 0) << files.Errors();
        const QImage other =
            QImage(QString::fromStdString(files.File("a.png"))).convertToFormat(QImage::Format_RGB32);
        int differing = 0;
        for (int y = 0; y < size; ++y)
            for (int x = 0; x < size; ++x)
                differing += qAlpha(shown.pixel(x, y)) == 255 &&
                             std::abs(qGray(shown.pixel(x, y)) - qGray(other.pixel(x, y))) > 40;
        EXPECT_LE(differing, size / 4) << size;
    }
}

} // namespace
