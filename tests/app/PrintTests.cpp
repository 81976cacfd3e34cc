// The print command, through the toolkit's own dialogs.
#include "Program.h"

#include <QDialog>
#include <QLineEdit>

#include "Pdf.h"

namespace {

constexpr uint32 PrintCommand = 1014;

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

TEST(Print, AsksOnceAndNothingAfterACancel) {
    Program program;
    program.AddPortfolio("Empty one");
    program.AddPortfolio("Full one");
    program.AddInvestment(MakeInvestment("Full one", "Timber", 12345.5F, 100));
    const TemporaryFolder prints;
    const std::string file = prints.File("report.pdf");
    program.Expect({"Timber"}).Send(PrintCommand);
    Answer(program, "page setup dialog", false);
    program.Send(PrintCommand);
    Answer(program, "page setup dialog", true);
    Answer(program, "print dialog", false, file);
    program.Then("nothing printed", [=] { EXPECT_FALSE(std::filesystem::exists(file)); });
    program.Then("button", [] { Driver::Press(Program::Main(), "print button"); });
    Answer(program, "page setup dialog", true);
    Answer(program, "print dialog", true, file);
    ExpectPrinted(program, file, "Timber");
    program.Select("Empty one").Expect({}).Send(PrintCommand);
    ExpectPrinted(program, file, "Empty one");
    // A place that is gone is told of, and asked for anew.
    program.Then("gone", [&] { std::filesystem::remove(prints.Path()); })
        .Send(PrintCommand)
        .Answer("The report could not be printed! Is the printer there, or the file protected?", "Ok");
    program.Send(PrintCommand);
    Answer(program, "page setup dialog", false);
    program.Close();
    program.Run();
}

} // namespace
