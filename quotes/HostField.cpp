#include "quotes/HostField.h"

#include <charconv>

#include "util/Strings.h"

namespace {

constexpr std::string_view TlsPrefix = "https://";
constexpr std::uint16_t TlsPort = 443;

bool BeginsWithTlsPrefix(std::string_view text) {
    const std::string start(text.substr(0, TlsPrefix.size()));
    return strcmpi(start.c_str(), TlsPrefix.data()) == 0;
}

bool ParsePort(std::string_view text, std::uint16_t* port) {
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), *port);
    return error == std::errc() && end == text.data() + text.size() && *port != 0;
}

} // namespace

bool ParseHostField(std::string_view text, HostField* host) {
    *host = {};
    if (BeginsWithTlsPrefix(text)) {
        host->tls = true;
        host->port = TlsPort;
        text.remove_prefix(TlsPrefix.size());
    }
    const std::size_t colon = text.find(':');
    if (colon != text.npos && !ParsePort(text.substr(colon + 1), &host->port))
        return false;
    host->name = text.substr(0, colon);
    return !host->name.empty() && host->name.find_first_of("/\\?#@[]%") == host->name.npos;
}
