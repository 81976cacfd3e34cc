#include "tools/DesktopFiles.h"

#include <algorithm>
#include <array>
#include <cstdlib>
#include <filesystem>
#include <ostream>
#include <string_view>
#include <system_error>

#include "resources/DesktopFiles.h"
#include "util/File.h"
#include "util/Strings.h"
#include "util/Utf8.h"

namespace {

namespace fs = std::filesystem;

constexpr std::size_t MaxDesktopFileSize = std::size_t{1} << 20U;
constexpr mode_t ReadableByAll = 0644;

struct DesktopFile {
    const char* folder; // below the data folder
    const char* extension;
    std::string_view (*content)();

    [[nodiscard]] std::string Path(const std::string& dataFolder) const {
        return dataFolder + "/" + folder + "/" + DesktopId + extension;
    }
};

// The entry comes last, so that a desktop that notices it at once finds its icon.
constexpr std::array<DesktopFile, 3> DesktopFilesInOrder = {{
    {"icons/hicolor/scalable/apps", ".svg", ProgramIcon},
    {"metainfo", ".metainfo.xml", ProgramMetainfo},
    {"applications", ".desktop", DesktopEntryTemplate},
}};
constexpr const DesktopFile& EntryFile = DesktopFilesInOrder.back();

std::string WithBackslashBefore(std::string_view letters, std::string_view text) {
    std::string result;
    for (const char letter : text) {
        if (letters.find(letter) != letters.npos)
            result += '\\';
        result += letter;
    }
    return result;
}

// Any text value of an entry.
std::string EntryText(std::string_view text) {
    return WithBackslashBefore("\\", text);
}

// A word of a command line: quoted, without field codes.
std::string Quoted(std::string_view word) {
    std::string quoted;
    for (const char letter : '"' + WithBackslashBefore("\"`$\\", word) + '"')
        quoted += letter == '%' ? "%%" : std::string(1, letter);
    return EntryText(quoted);
}

// A command's name may hold no equals sign, and some desktops look for it with its percent signs doubled:
// there a shell is the command.
std::string CommandText(std::string_view program) {
    const bool plain = program.find_first_of("=%") == program.npos;
    return plain ? Quoted(program) : "sh -c " + Quoted("exec \"$0\"") + " " + Quoted(program);
}

// The text of the line that begins with `key` and an equals sign; empty when there is none.
std::string ValueOf(std::string_view entry, const std::string& key) {
    const std::string begin = "\n" + key + "=";
    const std::size_t line = entry.find(begin);
    if (line == entry.npos)
        return {};
    const std::string_view value = entry.substr(line + begin.size());
    return std::string(value.substr(0, value.find('\n')));
}

void SetValue(std::string& entry, const std::string& key, const std::string& value) {
    const std::string line = "\n" + key + "=";
    entry.replace(entry.find(line), line.size() + ValueOf(entry, key).size(), line + value);
}

class Work {
  public:
    Work(const std::string& dataFolder, std::ostream& output, std::ostream& errors)
        : dataFolder_(dataFolder), output_(output), errors_(errors) {}

    void Install(const DesktopFile& file, std::string_view content);
    void Remove(const DesktopFile& file);
    void Fail(const std::string& sentence) {
        errors_ << "quorvan-cli: " << sentence << '\n';
        done_ = false;
    }
    void FailToDo(const std::string& what, const std::string& path, int error) {
        Fail(path + " cannot be " + what + ": " + Reason(error) + ".");
    }
    void Say(const char* fate, const std::string& path, const std::string& remark = "") {
        output_ << fate << "  " << path << (remark.empty() ? "" : ": ") << remark << '\n';
    }
    // Desktops look for new icons when this folder has changed.
    void TouchIconTheme() const {
        std::error_code ignored;
        fs::last_write_time(dataFolder_ + "/icons/hicolor", fs::file_time_type::clock::now(), ignored);
    }
    [[nodiscard]] bool IsDone() const { return done_; }

    enum class Found { Nothing, Ours, Foreign };
    static Found Look(const std::string& path, std::string& content);

  private:
    const std::string& dataFolder_;
    std::ostream& output_;
    std::ostream& errors_;
    bool done_ = true;
};

Work::Found Work::Look(const std::string& path, std::string& content) {
    if (!FileExists(path))
        return Found::Nothing;
    const bool ours =
        ReadWholeFile(path, content, MaxDesktopFileSize) == 0 && content.find(DesktopId) != std::string::npos;
    return ours ? Found::Ours : Found::Foreign;
}

void Work::Install(const DesktopFile& file, std::string_view content) {
    const std::string path = file.Path(dataFolder_);
    std::string present;
    const Found found = Look(path, present);
    if (found == Found::Foreign)
        return Fail(path + " is there already and is not Quorvan's; move it away and try again.");
    if (found == Found::Ours && present == content)
        return Say("kept", path);
    std::error_code noFolder;
    fs::create_directories(fs::path(path).parent_path(), noFolder);
    const ExistingFile existing = found == Found::Ours ? ExistingFile::Replace : ExistingFile::Keep;
    const int error =
        noFolder ? noFolder.value() : WriteWholeFile(path, path + ".part", content, ReadableByAll, existing);
    if (error != 0)
        return FailToDo("made", path, error);
    const std::string before = ValueOf(present, "TryExec");
    Say("made", path,
        before.empty() || before == ValueOf(content, "TryExec") ? "" : "in place of one for " + before);
}

void Work::Remove(const DesktopFile& file) {
    const std::string path = file.Path(dataFolder_);
    std::string present;
    const Found found = Look(path, present);
    if (found == Found::Foreign)
        return Say("kept", path, "it is not Quorvan's");
    if (found == Found::Nothing)
        return;
    if (const int error = RemoveFile(SystemFiles(), path); error != 0)
        FailToDo("removed", path, error);
    else
        Say("removed", path);
}

} // namespace

std::string PersonalDataFolder() {
    const char* data = std::getenv("XDG_DATA_HOME");
    if (data && *data == '/')
        return data;
    const char* home = std::getenv("HOME");
    return home && *home == '/' ? std::string(home) + "/.local/share" : std::string();
}

std::optional<std::string> DesktopEntryFor(const std::string& program) {
    const auto isControl = [](char letter) { return static_cast<unsigned char>(letter) < ' '; };
    if (std::any_of(program.begin(), program.end(), isControl) || !IsUtf8(program))
        return std::nullopt;
    std::string entry(DesktopEntryTemplate());
    SetValue(entry, "TryExec", EntryText(program));
    SetValue(entry, "Exec", CommandText(program));
    return entry;
}

bool InstallDesktopFiles(const std::string& program, const std::string& dataFolder, std::ostream& output,
                         std::ostream& errors) {
    Work work(dataFolder, output, errors);
    const std::optional<std::string> entry = DesktopEntryFor(program);
    if (!entry) {
        work.Fail("A desktop entry cannot start " + program +
                  ": its path has a sign that no entry can hold. Use a folder without it.");
        return false;
    }
    for (const DesktopFile& file : DesktopFilesInOrder)
        work.Install(file, &file == &EntryFile ? *entry : file.content());
    work.TouchIconTheme();
    return work.IsDone();
}

bool RemoveDesktopFiles(const std::string& program, const std::string& dataFolder, std::ostream& output,
                        std::ostream& errors) {
    Work work(dataFolder, output, errors);
    const std::string path = EntryFile.Path(dataFolder);
    std::string present;
    if (Work::Look(path, present) == Work::Found::Ours && ValueOf(present, "TryExec") != EntryText(program)) {
        work.Say("kept", path,
                 "it starts " + ValueOf(present, "TryExec") +
                     "; setup that folder with --remove-desktop, or this one with "
                     "--desktop first");
        return true;
    }
    for (const DesktopFile& file : DesktopFilesInOrder)
        work.Remove(file);
    work.TouchIconTheme();
    return work.IsDone();
}
