// The settings dialog and the start-up password dialog, and the helpers over alerts.
#include "Driver.h"

#include <QLineEdit>

#include "TemporaryFolder.h"
#include "app/AppState.h"
#include "dialogs/PasswordDialog.h"
#include "dialogs/SettingsDialog.h"
#include "platform/Font.h"
#include "util/CharacterBuffer.h"
#include "util/InterfaceHelpers.h"

namespace {

constexpr uint16 Both = DialogHasOk | DialogHasCancel;

bool FieldHasFocus() {
    const auto* field = qobject_cast<QLineEdit*>(QApplication::focusWidget());
    return field && field->objectName() == "text control";
}

// Types over what is selected, then presses the key.
Driver::Action Type(const char* text, Qt::Key key) {
    return [text, key] {
        auto* field = qobject_cast<QLineEdit*>(QApplication::focusWidget());
        EXPECT_EQ(field->echoMode(), QLineEdit::Normal);
        EXPECT_EQ(field->selectedText(), field->text());
        QTest::keyClick(field, Qt::Key_Backspace);
        for (const QChar letter : QString::fromUtf8(text))
            QTest::sendKeyEvent(QTest::Click, field, Qt::Key_unknown, QString(letter), Qt::NoModifier);
        QTest::keyClick(field, key);
    };
}

class SettingsDialogTest : public testing::Test {
  protected:
    SettingsDialogTest() {
        CopyText(state_.settingsPath, folder_.File("Quorvan.ini"));
        app_state = &state_;
    }
    ~SettingsDialogTest() override { app_state = nullptr; }

    // The settings after the text was typed into the dialog on settings as given.
    std::string After(const char* before, const char* typed, Qt::Key key) {
        folder_.Write("Quorvan.ini", before);
        Driver driver;
        driver.When("settings dialog", FieldHasFocus, Type(typed, key));
        (new SettingsDialog({100, 100}, Both))->DoModal();
        return folder_.Read("Quorvan.ini");
    }

    BApplication application_{"test"};
    AppState state_;
    TemporaryFolder folder_;
};

TEST_F(SettingsDialogTest, OkWritesAndCancelDoesNot) {
    EXPECT_EQ(After("[GENERAL]\nPassword=abc\n", "new one", Qt::Key_Return), "[GENERAL]\nPassword=new one\n");
    EXPECT_EQ(After("[GENERAL]\n", "blank ", Qt::Key_Return), "[GENERAL]\nPassword=blank\n");
    EXPECT_EQ(After("[GENERAL]\nPassword=abc\n", "", Qt::Key_Return), "[GENERAL]\nPassword=\n");
    EXPECT_EQ(After("[GENERAL]\nPassword=abc\n", "new", Qt::Key_Escape), "[GENERAL]\nPassword=abc\n");
    EXPECT_EQ(After("[DISPLAY]\n", "abc", Qt::Key_Return), "[DISPLAY]\n[GENERAL]\nPassword=abc\n");
    // Fifteen bytes, cut between whole characters.
    EXPECT_EQ(After("[GENERAL]\n", "0123456789abcdefgh", Qt::Key_Return),
              "[GENERAL]\nPassword=0123456789abcde\n");
    EXPECT_EQ(After("[GENERAL]\n", "0123456789abcd\xC3\xA4", Qt::Key_Return),
              "[GENERAL]\nPassword=0123456789abcd\n");
}

TEST_F(SettingsDialogTest, ShowsWhatIsStored) {
    folder_.Write("Quorvan.ini", "[GENERAL]\nPassword=0123456789abcdefgh\n");
    std::string shown;
    Driver driver;
    driver.When("settings dialog", FieldHasFocus, [&] {
        shown = qobject_cast<QLineEdit*>(QApplication::focusWidget())->text().toStdString();
        QTest::keyClick(QApplication::focusWidget(), Qt::Key_Escape);
    });
    auto* dialog = new SettingsDialog({100, 120}, Both);
    EXPECT_EQ(dialog->Frame(), BRect(100, 120, 300, 120 + std::floor(7 * GetFontHeight(be_bold_font))));
    EXPECT_EQ(dialog->DoModal(), DialogCancel);
    EXPECT_EQ(shown, "0123456789abcde");
}

TEST_F(SettingsDialogTest, WithoutASettingsFileNothingIsMade) {
    Driver driver;
    driver.When("settings dialog", FieldHasFocus, Type("abc", Qt::Key_Return));
    EXPECT_EQ((new SettingsDialog({100, 100}, Both))->DoModal(), DialogOk);
    EXPECT_FALSE(folder_.Has("Quorvan.ini"));
}

TEST(PasswordDialog, HandsBackWhatWasTyped) {
    const BApplication application("test");
    const struct {
        const char* typed;
        Qt::Key key;
        uint32 result;
        const char* answer;
    } cases[] = {
        {"Secret", Qt::Key_Return, DialogOk, "Secret"},
        {"", Qt::Key_Return, DialogOk, ""},
        {"Secret", Qt::Key_Escape, DialogCancel, "first"},
        {"0123456789abcdefgh", Qt::Key_Return, DialogOk, "0123456789abcde"},
    };
    for (const auto& each : cases) {
        char answer[PasswordSize] = "first";
        Driver driver;
        driver.When("password dialog", FieldHasFocus, Type(each.typed, each.key));
        EXPECT_EQ((new PasswordDialog({300, 200}, answer, Both))->DoModal(), each.result);
        EXPECT_STREQ(answer, each.answer);
    }
    char answer[PasswordSize] = "";
    auto* dialog = new PasswordDialog({300, 200}, answer, Both);
    EXPECT_EQ(dialog->Frame().left, 200);
    EXPECT_EQ(dialog->Frame().top, std::floor(200 - 3 * GetFontHeight(be_bold_font)));
    dialog->Quit();
}

TEST(InterfaceHelpers, AlertsAnswer) {
    const BApplication application("test");
    Driver driver;
    driver.Answer("Sure?", "Yes").Answer("Sure?", "No").When("closed", Driver::Alert, [] {
        Driver::Alert()->close();
    });
    EXPECT_FALSE(YesNoBox("Sure?"));
    EXPECT_TRUE(YesNoBox("Sure?"));
    EXPECT_TRUE(YesNoBox("Sure?"));
    driver.When("a stop alert", Driver::Alert, [] {
        EXPECT_EQ(Driver::Alert()->icon(), QMessageBox::Critical);
        EXPECT_EQ(Driver::Alert()->buttons().size(), 1);
        Driver::Press(Driver::Alert(), "Ok");
    });
    MessageBox("Stop", B_STOP_ALERT);
}

TEST(InterfaceHelpers, TheHomeFolderIsTheProgramsOrNone) {
    const std::string longest = "/" + std::string(126, 'f');
    const struct {
        std::string program;
        bool fits;
        std::string folder;
    } cases[] = {
        {"/opt/app/quorvan", true, "/opt/app"},
        {"/quorvan", true, ""},
        {longest + "/quorvan", true, longest},
        {longest + "f/quorvan", false, ""},
    };
    const BApplication application("test");
    for (const auto& each : cases) {
        BApplication::SetExecutablePath(each.program.c_str());
        char folder[PathBufferSize] = "left over";
        EXPECT_EQ(GetHomeDir(folder), each.fits);
        EXPECT_EQ(folder, each.folder);
    }
}

TEST(InterfaceHelpers, WindowsAreFoundByTheirExactTitle) {
    const BApplication application("test");
    auto* first = new BWindow({0, 0, 99, 99}, "Quorvan", B_TITLED_WINDOW, 0);
    auto* second = new BWindow({0, 0, 99, 99}, "Quorvan 2", B_TITLED_WINDOW, 0);
    EXPECT_EQ(GetAppWindow(be_app, "Quorvan 2"), second);
    EXPECT_EQ(GetAppWindow(be_app, "Quorvan"), first);
    EXPECT_EQ(GetAppWindow(be_app, "quorvan"), nullptr);
}

} // namespace
