#include "ColumnListView/LabelText.h"

#include <vector>

namespace {

bool StartsCharacter(char byte) {
    return (static_cast<unsigned char>(byte) & 0xC0U) != 0x80U;
}

} // namespace

std::string TruncatedLabel(std::string_view text, float width,
                           const std::function<float(const std::string&)>& measure) {
    std::string whole(text);
    if (text.empty() || measure(whole) <= width)
        return whole;
    std::vector<std::size_t> cuts{0};
    for (std::size_t i = 1; i < text.size(); i++)
        if (StartsCharacter(text[i]))
            cuts.push_back(i);
    const auto cutAt = [&](std::size_t cut) { return whole.substr(0, cuts[cut]) + "..."; };
    std::size_t fits = 0; // the cut known to fit, or the first one, which is taken anyway
    std::size_t tooLong = cuts.size();
    while (tooLong - fits > 1) {
        const std::size_t middle = fits + (tooLong - fits) / 2;
        (measure(cutAt(middle)) <= width ? fits : tooLong) = middle;
    }
    return cutAt(fits);
}
