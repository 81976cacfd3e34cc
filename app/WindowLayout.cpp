#include "app/WindowLayout.h"

#include <charconv>
#include <cstdlib>
#include <sstream>
#include <string>

namespace {

constexpr int Greatest = 100000;

} // namespace

std::vector<int> ReadNumbers(const INI_FILEx& settings, const char* key) {
    char text[128];
    ReadSetting(settings, DisplaySection, key, text);
    std::vector<int> numbers;
    std::istringstream words(text);
    for (std::string word; words >> word;) {
        int number = 0;
        const char* end = word.data() + word.size();
        const auto [rest, error] = std::from_chars(word.data(), end, number);
        if (error != std::errc() || rest != end || number < -Greatest || number > Greatest)
            return {};
        numbers.push_back(number);
    }
    return numbers;
}

void WriteNumbers(const INI_FILEx& settings, const char* key, const std::vector<int>& numbers) {
    std::ostringstream text;
    const char* between = "";
    for (const int number : numbers) {
        text << between << number;
        between = " ";
    }
    static_cast<void>(settings.WriteString(DisplaySection, key, text.str().c_str()));
}
