// The print command, through the toolkit's own dialogs.
#include "Program.h"

#include "Pdf.h"

namespace {

class Print : public testing::Test, protected Program {
  protected:
    Print() { setenv("HOME", prints_.Path().c_str(), 1); }
    // Steps that have the report printed in place of what is proposed, and wait for one of `content`.
    void PrintTo(const char* proposed, const std::string& named, const char* file, const char* content) {
        InDialog("print dialog", true, named, prints_.File(proposed));
        Await([=, this] { return prints_.Read(file).starts_with("%PDF"); }).Then([=, this] {
            EXPECT_NE(Output("pdftotext " + prints_.File(file) + " -").find(content), std::string::npos);
            EXPECT_EQ(Window()->FindView("printer view"), nullptr);
        });
    }
    const TemporaryFolder prints_;
};

TEST_F(Print, AsksOnceAndNothingAfterACancel) {
    qInstallMessageHandler([](QtMsgType, const QMessageLogContext&, const QString& text) {
        EXPECT_FALSE(text.contains("QPageSetupDialog")) << text.toStdString();
    });
    AddPortfolio("Empty one");
    AddPortfolio("Full one");
    AddInvestment(MakeInvestment("Full one", "Timber"));
    Expect({"Timber"}).Send(MessagePortfolioPrint);
    InDialog("page setup dialog", false);
    Then([] { Press(Main(), "print button"); });
    InDialog("page setup dialog", true);
    PrintTo("Full one.pdf", prints_.File("a.pdf"), "a.pdf", "Timber");
    // A file that is there is not replaced unasked. Another one may be named, by its name alone.
    Select("Empty one").Expect({}).Send(MessagePortfolioPrint);
    Answer("The file " + prints_.File("a.pdf") + " exists. Replace it by this report?", "No");
    PrintTo("a.pdf", "b.pdf", "b.pdf", "Empty one");
    Then([this] { std::filesystem::remove_all(prints_.Path()); });
    Send(MessagePortfolioPrint);
    Answer("The report could not be printed! Is the printer there, or the file protected?");
    Send(MessagePortfolioPrint);
    InDialog("page setup dialog", false);
    RunAndClose();
}

} // namespace
