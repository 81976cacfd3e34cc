#include "util/IniFile.h"

#include <algorithm>
#include <cstdlib>
#include <limits>

#include "util/CharacterBuffer.h"
#include "util/File.h"
#include "util/Strings.h"

namespace {

constexpr std::size_t MaxLineLength = 127;
constexpr std::size_t MaxSectionLength = 61;
// Far beyond any settings file; keeps a file that is none from being taken into memory.
constexpr std::size_t MaxFileSize = std::size_t{4} * 1024 * 1024;

// Takes the next line off `rest`, its line feed included; a longer line comes in pieces of MaxLineLength
// bytes.
std::string_view TakeLine(std::string_view& rest) {
    const std::size_t end = rest.find('\n');
    const std::size_t length = end == std::string_view::npos ? rest.size() : end + 1;
    const std::string_view line = rest.substr(0, std::min(length, MaxLineLength));
    rest.remove_prefix(line.size());
    return line;
}

bool IsEntryOf(std::string_view line, std::string_view key) {
    return !line.starts_with(';') && line.substr(0, line.find('=')) == key && line.size() > key.size();
}

std::string HeaderOf(std::string_view section) {
    std::string header = "[";
    header += section;
    header += ']';
    return header;
}

bool HasControlCharacter(std::string_view text) {
    return std::any_of(
        text.begin(), text.end(),
        [](char c) {
            const auto byte = static_cast<unsigned char>(c);
            return (byte < 0x20U && c != '\t') || byte == 0x7FU;
        });
}

// Whether the entry, once written, would be read back as it is.
bool CanBeWritten(std::string_view section, std::string_view key, std::string_view value) {
    return section.size() <= MaxSectionLength && key.size() + 1 + value.size() + 1 <= MaxLineLength &&
           !key.empty() && key.find('=') == std::string_view::npos && key.front() != '[' &&
           key.front() != ';' && !HasControlCharacter(section) && !HasControlCharacter(key) &&
           !HasControlCharacter(value);
}

void AppendAsLine(std::string& content, std::string_view line) {
    // The file's last line may lack its line feed.
    if (!content.empty() && content.back() != '\n')
        content += '\n';
    content += line;
}

std::string WithEntry(std::string_view rest, std::string_view section, std::string_view key,
                      std::string_view value) {
    const std::string header = HeaderOf(section);
    std::string entry(key);
    entry.append("=").append(value).append("\n");
    std::string content;
    bool inSection = false;
    bool written = false;
    while (!rest.empty()) {
        const std::string_view line = TakeLine(rest);
        if (line.starts_with('[')) {
            const bool opens = line.starts_with(header);
            if (!opens && inSection && !written) {
                AppendAsLine(content, entry);
                written = true;
            }
            inSection = opens;
            content += line;
        } else if (inSection && !written && IsEntryOf(line, key)) {
            content += entry;
            written = true;
        } else {
            content += line;
        }
    }
    if (!written) {
        if (!inSection)
            AppendAsLine(content, header + "\n");
        AppendAsLine(content, entry);
    }
    return content;
}

} // namespace

INI_FILEx::INI_FILEx(const char* path) {
    if (!CopyText(filePath_, path))
        filePath_[0] = '\0';
}

bool INI_FILEx::Find(std::string_view section, std::string_view key, std::string& value) const {
    std::string content;
    if (ReadWholeFile(filePath_, content, MaxFileSize) != 0)
        return false;
    const std::string header = HeaderOf(section);
    bool inSection = false;
    for (std::string_view rest = content; !rest.empty();) {
        const std::string_view line = TakeLine(rest);
        if (line.starts_with('[')) {
            inSection = line.starts_with(header);
        } else if (inSection && IsEntryOf(line, key)) {
            value = line.substr(key.size() + 1);
            // Text ends at a NUL; blanks before it are trailing ones too.
            value.resize(std::min(value.find('\0'), value.size()));
            value.resize(value.find_last_not_of(" \n") + 1);
            return true;
        }
    }
    return false;
}

void INI_FILEx::ReadString(const char* section, const char* key, const char* defaultValue, char* result,
                           std::size_t size) const {
    std::string value;
    CopyText(result, size,
             Find(section, key, value) ? std::string_view(value) : std::string_view(defaultValue));
}

int INI_FILEx::ReadInt(const char* section, const char* key, int defaultValue) const {
    std::string value;
    if (!Find(section, key, value))
        return defaultValue;
    const long number = std::strtol(value.c_str(), nullptr, 10);
    return static_cast<int>(
        std::clamp<long>(number, std::numeric_limits<int>::min(), std::numeric_limits<int>::max()));
}

int INI_FILEx::WriteString(const char* section, const char* key, const char* value) const {
    std::string content;
    const std::string file = FollowLinks(filePath_);
    if (!CanBeWritten(section, key, value) || ReadWholeFile(file, content, MaxFileSize) != 0)
        return 1;
    const std::string changed = WithEntry(content, section, key, value);
    // Nothing to rewrite: the eleven column widths of a closing window are mostly the old ones.
    if (changed == content)
        return 0;
    const std::string temporary = file.substr(0, file.rfind('/') + 1) + "ini_file.tmp";
    return WriteWholeFile(file, temporary, changed, 0600, ExistingFile::Replace) == 0 ? 0 : 1;
}

int INI_FILEx::WriteInt(const char* section, const char* key, int value) const {
    return WriteString(section, key, std::to_string(value).c_str());
}

void ReadSetting(const INI_FILEx& file, const char* section, const char* key, char* result,
                 std::size_t size) {
    file.ReadString(section, key, "", result, size);
    const std::size_t length = std::string_view(result).size();
    if (length > 0 && result[length - 1] == '\r')
        result[length - 1] = '\0';
    Trim(result);
}
