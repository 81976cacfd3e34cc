#include "db/Errors.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace {

struct Message {
    int code;
    std::string_view text;
};

#define DATABASE_ERROR_MESSAGE(name, code, message) {code, message},
constexpr Message Messages[] = {DATABASE_ERRORS(DATABASE_ERROR_MESSAGE)};

constexpr const Message* Find(int code) {
    return std::find_if(
        std::begin(Messages), std::end(Messages), [code](const Message& each) { return each.code == code; });
}

// Callers' buffers hold the longest, and no code stands for two.
static_assert(std::all_of(std::begin(Messages), std::end(Messages), [](const Message& each) {
    return each.text.size() < ErrorMessageSize && Find(each.code) == &each;
}));

} // namespace

const char* ErrorMessage(int code) {
    const Message* found = Find(code);
    return found != std::end(Messages) ? found->text.data() : "Unknown error";
}
