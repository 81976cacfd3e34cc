#pragma once

// A copy of text with the ASCII letters a to z turned to upper case and every other byte unchanged. The copy
// takes the text's length plus 1 bytes, allocated with new[]; the caller deletes it.
[[nodiscard]] char* ToUpperStr(const char* text);
