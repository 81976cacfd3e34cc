// What the desktop shows of the program, judged by the desktop's own tools.
#include <gtest/gtest.h>

#include <string>

#include <QApplication>
#include <QIcon>
#include <QImage>

#include "Shell.h"
#include "platform/Application.h"
#include "resources/DesktopFiles.h"

namespace {

class DesktopFiles : public testing::Test {
  protected:
    DesktopFiles() {
        files_.Write("a.desktop", std::string(DesktopEntryTemplate()));
        files_.Write("a.metainfo.xml", std::string(ProgramMetainfo()));
        files_.Write("a.svg", std::string(ProgramIcon()));
    }
    void Judge(const std::string& command) {
        EXPECT_EQ(files_.Run(command), 0) << command << files_.Output() << files_.Errors();
    }

    Shell files_;
};

TEST_F(DesktopFiles, AreWhatDesktopsExpect) {
    const std::string id = DesktopId;
    Judge("desktop-file-validate --warn-kde a.desktop");
    EXPECT_EQ(files_.Output() + files_.Errors(), "");
    Judge("mv a.metainfo.xml " + id + ".metainfo.xml && appstreamcli validate --no-net --pedantic *.xml");
    EXPECT_FALSE(files_.Says("pedantic:") || files_.Complains("pedantic:"));
    Judge("xmllint --noout --nonet a.svg");
    EXPECT_NE(ProgramMetainfo().find("<id>" + id + "</id>"), std::string::npos);
    EXPECT_NE(ProgramMetainfo().find("<release version=\"" QUORVAN_VERSION "\""), std::string::npos);
    EXPECT_NE(DesktopEntryTemplate().find("\nIcon=" + id + "\n"), std::string::npos);
}

TEST_F(DesktopFiles, WindowsShowTheIconSharpAtEverySize) {
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
        Judge("rsvg-convert a.svg -o a.png -w " + std::to_string(size));
        const QImage other =
            QImage(QString::fromStdString(files_.File("a.png"))).convertToFormat(QImage::Format_RGB32);
        int differing = 0;
        for (int y = 0; y < size; ++y)
            for (int x = 0; x < size; ++x)
                differing += qAlpha(shown.pixel(x, y)) == 255 &&
                             std::abs(qGray(shown.pixel(x, y)) - qGray(other.pixel(x, y))) > 40;
        EXPECT_LE(differing, size / 4) << size;
    }
}

} // namespace
