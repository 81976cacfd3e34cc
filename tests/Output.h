#pragma once

#include <array>
#include <cstdio>
#include <string>

// What a shell command writes, without the last line's end.
inline std::string Output(const std::string& command) {
    FILE* pipe = popen(command.c_str(), "r");
    std::string output;
    std::array<char, 4096> part{};
    while (const std::size_t length = std::fread(part.data(), 1, part.size(), pipe))
        output.append(part.data(), length);
    pclose(pipe);
    if (output.ends_with('\n'))
        output.pop_back();
    return output;
}
