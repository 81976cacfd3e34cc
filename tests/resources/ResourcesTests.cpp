#include "Shell.h"

#include <QApplication>
#include <QIcon>

#include "platform/Application.h"
#include "resources/DesktopFiles.h"
#include "resources/StatusImages.h"

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
    files.Run("desktop-file-validate --warn-kde a.desktop; appstreamcli validate --no-net --pedantic *.xml "
              ">said || "
              "cat said; grep pedantic: said; cat *.* | grep -c -e '^Icon=" +
              id + "$' -e '<id>" + id + "</id>' -e '<release version=\"" QUORVAN_VERSION "\"'");
    EXPECT_EQ(files.Output() + files.Errors(), "3\n");
}

TEST(DesktopFiles, WindowsShowTheIconSharpAtEverySize) {
    const BApplication application("test");
    EXPECT_FALSE(BApplication::SetDesktopIdentity(DesktopId, "no picture"));
    ASSERT_TRUE(BApplication::SetDesktopIdentity(DesktopId, ProgramIcon()));
    EXPECT_EQ(QApplication::desktopFileName(), QString(DesktopId));
    for (const int size : {16, 22, 24, 32, 48, 64, 128, 256}) {
        const QImage shown = QApplication::windowIcon().pixmap(size, size).toImage();
        EXPECT_LT(qAlpha(shown.pixel(0, 0)), 128) << size;
        // The ring's parts meet at a clean line: no pixel of a mixed colour beside it.
        EXPECT_EQ(shown.pixel(size / 2 - 1, size * 7 / 32), qRgb(255, 255, 255)) << size;
        EXPECT_EQ(shown.pixel(size / 2, size * 7 / 32), qRgb(255, 184, 28)) << size;
    }
}
