#include "quotes/HostField.h"

#include <charconv>

#include "util/Strings.h"

namespace {

constexpr std::uint16_t TlsPort = 443;

// Takes the prefix off, in any letter case; false when it is not there.
bool TakePrefix(std::string_view* text, std::string_view prefix) {
    const std::string start(text->substr(0, prefix.size()));
    if (strcmpi(start.c_str(), prefix.data()) != 0)
        return false;
    text->remove_prefix(prefix.size());
    return true;
}

bool ParsePort(std::string_view text, std::uint16_t* port) {
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), *port);
    return error == std::errc() && end == text.data() + text.size() && *port != 0;
}

} // namespace

bool ParseHostField(std::string_view text, HostField* host) {
    *host = {};
    if (TakePrefix(&text, "https://")) {
        host->tls = true;
        host->port = TlsPort;
    } else {
        TakePrefix(&text, "http://"); // as a browser shows it
    }
    const std::size_t colon = text.find(':');
    if (colon != text.npos && !ParsePort(text.substr(colon + 1), &host->port))
        return false;
    host->name = text.substr(0, colon);
    return !host->name.empty() && host->name.find_first_of("/\\?#@[]%") == host->name.npos;
}
