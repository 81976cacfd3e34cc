// The print command, through the toolkit's own dialogs.
#include "Program.h"

#include <QDialog>

#include "Pdf.h"

namespace {

// A step that answers one of the two dialogs.
void Answer(Program& program, const char* dialog, bool accept, const std::string& file = "") {
    const auto shown = [dialog] {
        auto* found = qobject_cast<QDialog*>(QApplication::activeModalWidget());
        return found && found->objectName() == dialog ? found : nullptr;
    };
    program.When(dialog, shown, [=] {
        if (!file.empty())
            shown()->findChild<QLineEdit*>("filename")->setText(QString::fromStdString(file));
        accept ? shown()->accept() : shown()->reject();
    });
}

// A step that waits for a printed file with these words in a line of it.
void ExpectPrinted(Program& program, const std::string& file, const std::string& words) {
    program.When(
        "report of " + words, [file] { return std::filesystem::exists(file); },
        [=] {
            EXPECT_EQ(QApplication::activeModalWidget(), nullptr);
            EXPECT_NE(Output("pdftotext -layout " + file + " -").find(words), std::string::npos);
            EXPECT_EQ(Program::Window()->FindView("printer view"), nullptr);
            std::filesystem::remove(file);
        });
}

std::string* gWarnings = nullptr;

TEST(Print, PutsABareFileNameIntoTheFolderThatItOffered) {
    Program program;
    program.AddPortfolio("Full one");
    program.AddInvestment(MakeInvestment("Full one", "Timber", 1, 100));
    const TemporaryFolder prints;
    std::string warnings;
    gWarnings = &warnings;
    const auto previous = qInstallMessageHandler(
        [](QtMsgType, const QMessageLogContext&, const QString& text) { *gWarnings += text.toStdString(); });
    program.Expect({"Timber"}).Send(MessagePortfolioPrint);
    Answer(program, "page setup dialog", true);
    Answer(program, "print dialog", true, prints.File("first.pdf"));
    ExpectPrinted(program, prints.File("first.pdf"), "Timber");
    program.Then("in the way", [&] { prints.Write("first.pdf", "kept"); }).Send(MessagePortfolioPrint);
    const std::string replace =
        "The file " + prints.File("first.pdf") + " exists. Replace it by this report?";
    program.Answer(replace.c_str(), "No");
    Answer(program, "print dialog", true, "second.pdf");
    ExpectPrinted(program, prints.File("second.pdf"), "Timber");
    program.RunAndClose();
    qInstallMessageHandler(previous);
    EXPECT_EQ(warnings.find("QPageSetupDialog"), std::string::npos) << warnings;
}

TEST(Print, AsksOnceAndNothingAfterACancel) {
    Program program;
    program.AddPortfolio("Empty one");
    program.AddPortfolio("Full one");
    program.AddInvestment(MakeInvestment("Full one", "Timber", 12345.5F, 100));
    const TemporaryFolder prints;
    const std::string file = prints.File("report.pdf");
    program.Expect({"Timber"}).Send(MessagePortfolioPrint);
    Answer(program, "page setup dialog", false);
    program.Send(MessagePortfolioPrint);
    Answer(program, "page setup dialog", true);
    Answer(program, "print dialog", false, file);
    program.Then(
        "nothing printed", [=] { EXPECT_FALSE(std::filesystem::exists(file)); });
    program.Then("button", [] { Driver::Press(Program::Main(), "print button"); });
    Answer(program, "page setup dialog", true);
    Answer(program, "print dialog", true, file);
    ExpectPrinted(program, file, "Timber");
    program.Select("Empty one").Expect({}).Send(MessagePortfolioPrint);
    ExpectPrinted(program, file, "Empty one");
    // A file that is there is not replaced unasked; another one may be named.
    const std::string other = prints.File("other.pdf");
    program.Then("in the way", [&] { prints.Write("report.pdf", "kept"); }).Send(MessagePortfolioPrint);
    const std::string replaceFirst = "The file " + file + " exists. Replace it by this report?";
    program.Answer(replaceFirst.c_str(), "No");
    Answer(program, "print dialog", true, other);
    ExpectPrinted(program, other, "Empty one");
    program.Then(
        "kept", [&] { EXPECT_EQ(prints.Read("report.pdf"), "kept"); });
    program.Then("in the way again", [&] { prints.Write("other.pdf", "replaced"); })
        .Send(MessagePortfolioPrint);
    const std::string replaceOther = "The file " + other + " exists. Replace it by this report?";
    program.Answer(replaceOther.c_str(), "Yes");
    program.Await("the new report", [=, &prints] { return prints.Read("other.pdf").starts_with("%PDF"); });
    ExpectPrinted(program, other, "Empty one");
    // A place that is gone is told of, and asked for anew.
    program.Then("gone", [&] { std::filesystem::remove_all(prints.Path()); })
        .Send(MessagePortfolioPrint)
        .Answer("The report could not be printed! Is the printer there, or the file protected?", "Ok");
    program.Send(MessagePortfolioPrint);
    Answer(program, "page setup dialog", false);
    program.RunAndClose();
}

} // namespace
