#pragma once

#include <algorithm>
#include <optional>
#include <string_view>

// The next token of `text`: the longest run of bytes that are none of `delimiters`, leading delimiters passed
// over. Moves `text` to behind the one delimiter that ends the token, or to its end. Without a token there is
// none, and `text` becomes empty. Nothing is remembered between calls, so that threads never meet here.
[[nodiscard]] inline std::optional<std::string_view> TakeToken(std::string_view& text,
                                                               std::string_view delimiters) {
    const std::size_t start = text.find_first_not_of(delimiters);
    if (start == text.npos) {
        text = {};
        return std::nullopt;
    }
    const std::size_t end = std::min(text.find_first_of(delimiters, start), text.size());
    const std::string_view token = text.substr(start, end - start);
    text.remove_prefix(std::min(end + 1, text.size()));
    return token;
}
