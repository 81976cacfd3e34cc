// The settings dialog and the start-up password dialog, and the helpers over alerts.
#include "Driver.h"

#include <filesystem>

#include "TemporaryFolder.h"
#include "app/state/AppState.h"
#include "dialogs/PasswordDialogs.h"
#include "platform/Font.h"
#include "util/CharacterBuffer.h"
#include "util/interface/InterfaceHelpers.h"

namespace {

constexpr uint16 Both = DialogHasOk | DialogHasCancel;

// Types over what is selected, as soon as the keyboard is in the field, then presses the key.
class Typist : public Driver {
  public:
    void Enter(const char* text, Qt::Key key) {
        When(
            "the field", [] { return Field() && Field()->objectName() == "text control"; },
            [this, text, key] {
                shown_ = Field()->text().toStdString();
                EXPECT_EQ(Field()->echoMode(), QLineEdit::Normal);
                EXPECT_EQ(Field()->selectedText(), Field()->text());
                Key(Qt::Key_Backspace);
                Type(text, key);
            });
    }
    // What was in the field before.
    [[nodiscard]] const std::string& Shown() const { return shown_; }

  private:
    std::string shown_;
};

class SettingsDialogTest : public testing::Test, protected Typist {
  protected:
    SettingsDialogTest() {
        CopyText(state_.settingsPath, folder_.File("Quorvan.ini"));
        app_state = &state_;
    }
    ~SettingsDialogTest() override { app_state = nullptr; }

    BApplication application_{"test"};
    AppState state_;
    TemporaryFolder folder_;
};

TEST_F(SettingsDialogTest, OkWritesAndCancelDoesNot) {
    const struct {
        std::string before;
        const char* typed;
        Qt::Key key;
        std::string after;
        const char* shown = "";
    } cases[] = {
        {"[GENERAL]\nPassword=abc\n", "new one", Qt::Key_Return, "[GENERAL]\nPassword=new one\n", "abc"},
        {"[GENERAL]\r\nPassword=abc\r\n", "n", Qt::Key_Return, "[GENERAL]\r\nPassword=n\n", "abc"},
        {"[GENERAL]\n", "blank ", Qt::Key_Return, "[GENERAL]\nPassword=blank\n"},
        {"[GENERAL]\nPassword=abc\n", "", Qt::Key_Return, "[GENERAL]\nPassword=\n", "abc"},
        {"[GENERAL]\nPassword=0123456789abcdefgh\n", "new", Qt::Key_Escape,
         "[GENERAL]\nPassword=0123456789abcdefgh\n", "0123456789abcde"},
        {"[DISPLAY]\n", "abc", Qt::Key_Return, "[DISPLAY]\n[GENERAL]\nPassword=abc\n"},
        // Fifteen bytes, cut between whole characters.
        {"[GENERAL]\n", "0123456789abcdefgh", Qt::Key_Return, "[GENERAL]\nPassword=0123456789abcde\n"},
        {"[GENERAL]\n", "0123456789abcd\xC3\xA4", Qt::Key_Return, "[GENERAL]\nPassword=0123456789abcd\n"},
        {"", "abc", Qt::Key_Return, ""}, // there is no file, and none is made
    };
    for (const auto& each : cases) {
        std::filesystem::remove(folder_.File("Quorvan.ini"));
        if (!each.before.empty())
            folder_.Write("Quorvan.ini", each.before);
        Enter(each.typed, each.key);
        auto* dialog = new SettingsDialog({100, 120}, Both);
        EXPECT_EQ(dialog->Frame(), BRect(100, 120, 300, 120 + std::floor(7 * GetFontHeight(be_bold_font))));
        EXPECT_EQ(dialog->DoModal(), each.key == Qt::Key_Return ? DialogOk : DialogCancel);
        EXPECT_EQ(Shown(), each.shown) << each.before;
        EXPECT_EQ(folder_.Read("Quorvan.ini"), each.after) << each.before << each.typed;
        EXPECT_EQ(folder_.Has("Quorvan.ini"), !each.before.empty());
    }
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
        Typist typist;
        typist.Enter(each.typed, each.key);
        auto* dialog = new PasswordDialog({300, 200}, answer, Both);
        EXPECT_EQ(dialog->Frame().LeftTop(), BPoint(200, std::floor(200 - 3 * GetFontHeight(be_bold_font))));
        EXPECT_EQ(dialog->DoModal(), each.result);
        EXPECT_STREQ(answer, each.answer);
    }
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
