#pragma once

#include <functional>
#include <string>
#include <string_view>

// The text itself when it fits into width, else its longest beginning of whole UTF-8 characters that fits
// with three dots behind it; the dots alone when nothing else fits. measure gives a text's width; it must not
// shrink as a text grows.
[[nodiscard]] std::string TruncatedLabel(std::string_view text, float width,
                                         const std::function<float(const std::string&)>& measure);
