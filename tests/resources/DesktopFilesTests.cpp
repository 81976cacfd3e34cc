// What the desktop shows of the program, judged by the desktop's own tools.
#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include <QApplication>
#include <QIcon>
#include <QImage>

#include "TemporaryFolder.h"
#include "platform/Application.h"
#include "resources/DesktopFiles.h"

namespace {

// What the command says; empty when it succeeds in silence.
std::string Complaints(const TemporaryFolder& folder, const std::string& command) {
    const int status = std::system((command + " >'" + folder.File("said") + "' 2>&1").c_str());
    return status == 0 ? "" : command + ": " + folder.Read("said");
}

TEST(DesktopFiles, AreWhatDesktopsExpect) {
    const TemporaryFolder folder;
    const std::string entry = folder.File(DesktopId) + ".desktop";
    const std::string metainfo = folder.File(DesktopId) + ".metainfo.xml";
    const std::string id = DesktopId;
    folder.Write(id + ".desktop", std::string(DesktopEntryTemplate()));
    folder.Write(id + ".metainfo.xml", std::string(ProgramMetainfo()));
    folder.Write(id + ".svg", std::string(ProgramIcon()));
    EXPECT_EQ(Complaints(folder, "desktop-file-validate --warn-kde '" + entry + "'"), "");
    EXPECT_EQ(folder.Read("said"), "");
    EXPECT_EQ(Complaints(folder, "appstreamcli validate --no-net --pedantic '" + metainfo + "'"), "");
    EXPECT_EQ(folder.Read("said").find("pedantic:"), std::string::npos) << folder.Read("said");
    EXPECT_EQ(Complaints(folder, "xmllint --noout --nonet '" + folder.File(id) + ".svg'"), "");
    EXPECT_NE(ProgramMetainfo().find("<id>" + id + "</id>"), std::string::npos);
    EXPECT_NE(ProgramMetainfo().find("<release version=\"" QUORVAN_VERSION "\""), std::string::npos);
    EXPECT_NE(DesktopEntryTemplate().find("\nIcon=" + id + "\n"), std::string::npos);
}

TEST(DesktopFiles, WindowsShowTheIconSharpAtEverySize) {
    const TemporaryFolder folder;
    folder.Write("icon.svg", std::string(ProgramIcon()));
    const std::string render = "cd '" + folder.Path() + "' && rsvg-convert icon.svg -o picture.png -w ";
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
        ASSERT_EQ(Complaints(folder, render + std::to_string(size)), "");
        const QImage other =
            QImage(QString::fromStdString(folder.File("picture.png"))).convertToFormat(QImage::Format_RGB32);
        int differing = 0;
        for (int y = 0; y < size; ++y)
            for (int x = 0; x < size; ++x)
                differing += qAlpha(shown.pixel(x, y)) == 255 &&
                             std::abs(qGray(shown.pixel(x, y)) - qGray(other.pixel(x, y))) > 40;
        EXPECT_LE(differing, size / 4) << size;
    }
}

} // namespace
