// The print command, through the toolkit's own dialogs.
#include "Program.h"

#include <QDialog>

#include "Pdf.h"

namespace {

class Print : public testing::Test, protected Program {
  protected:
    // A step that answers one of the two dialogs.
    void InDialog(const char* name, bool accept, const std::string& file = "") {
        const auto shown = [name] {
            auto* found = qobject_cast<QDialog*>(QApplication::activeModalWidget());
            return found && found->objectName() == name ? found : nullptr;
        };
        When(name, shown, [=] {
            if (!file.empty())
                shown()->findChild<QLineEdit*>("filename")->setText(QString::fromStdString(file));
            accept ? shown()->accept() : shown()->reject();
        });
    }
    // A step that waits for a report of the portfolio or investment.
    void ExpectPrinted(const std::string& file, const std::string& name) {
        Await("report of " + name, [=, this] { return prints_.Read(file).starts_with("%PDF"); });
        Then(file, [=, this] {
            EXPECT_NE(Output("pdftotext -layout " + prints_.File(file) + " -").find(name), std::string::npos);
            EXPECT_EQ(Window()->FindView("printer view"), nullptr);
        });
    }
    // Steps that print over a file that is there already.
    void PrintOver(const std::string& file, const char* answer) {
        Then("in the way", [=, this] { prints_.Write(file, "kept"); }).Send(MessagePortfolioPrint);
        Answer("The file " + prints_.File(file) + " exists. Replace it by this report?", answer);
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
    Send(MessagePortfolioPrint);
    InDialog("page setup dialog", true);
    InDialog("print dialog", false, prints_.File("a.pdf"));
    Then("button", [this] {
        EXPECT_FALSE(prints_.Has("a.pdf"));
        Press(Main(), "print button");
    });
    InDialog("page setup dialog", true);
    InDialog("print dialog", true, prints_.File("a.pdf"));
    ExpectPrinted("a.pdf", "Timber");
    // A file that is there is not replaced unasked. Another one may be named, by its name alone.
    Select("Empty one").Expect({});
    PrintOver("a.pdf", "No");
    InDialog("print dialog", true, "b.pdf");
    ExpectPrinted("b.pdf", "Empty one");
    PrintOver("b.pdf", "Yes");
    ExpectPrinted("b.pdf", "Empty one");
    // A place that is gone is told of, and asked for anew.
    Then("gone", [this] {
        EXPECT_EQ(prints_.Read("a.pdf"), "kept");
        std::filesystem::remove_all(prints_.Path());
    }).Send(MessagePortfolioPrint);
    Answer("The report could not be printed! Is the printer there, or the file protected?", "Ok");
    Send(MessagePortfolioPrint);
    InDialog("page setup dialog", false);
    RunAndClose();
}

} // namespace
