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

// Callers' buffers hold the longest.
static_assert(std::all_of(std::begin(Messages), std::end(Messages),
                          [](const Message& each) { return each.text.size() < ErrorMessageSize; }));

} // namespace

const char* ErrorMessage(int code) {
    const auto* const found = std::find_if(std::begin(Messages), std::end(Messages),
                                           [code](const Message& each) { return each.code == code; });
    return found != std::end(Messages) ? found->text.data() : "Unknown error";
}
