#pragma once

#include <functional>
#include <string>
#include <string_view>

// The text itself when it fits into width, else its longest beginning of whole UTF-8 characters that fits
// with three dots behind it; the dots alone when nothing else fits. measure gives a text's width.
[[nodiscard]] std::string TruncatedLabel(std::string_view text, float width,
                                         const std::function<float(const std::string&)>& measure);

// A copy of text with the ASCII letters a to z turned to upper case and every other byte unchanged. The copy
// takes the text's length plus 1 bytes, allocated with new[]; the caller deletes it.
[[nodiscard]] char* ToUpperStr(const char* text);
