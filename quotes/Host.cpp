#include "quotes/Host.h"

#include <arpa/inet.h>
#include <charconv>
#include <netdb.h>
#include <poll.h>
#include <sys/socket.h>
#include <system_error>
#include <thread>
#include <unistd.h>

#include "quotes/QuoteRetrieval.h"
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

// The resolver's thread sends the address it finds, or nothing, and closes its end.
HostLookup LookUpOnThread(const char* name, int stopFd, in_addr* address, NameResolver resolver) {
    int ends[2];
    if (socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, ends) != 0)
        return HostLookup::NotFound;
    try {
        std::thread([name = std::string(name), resolver, end = ends[1]] {
            in_addr found{};
            if (resolver(name.c_str(), &found))
                send(end, &found, sizeof found, MSG_NOSIGNAL);
            close(end);
        }).detach();
    } catch (const std::system_error&) {
        close(ends[1]); // no thread to be had: as with a resolver that lacks resources
    }
    HostLookup result = HostLookup::Stopped;
    if (WaitUnlessStopped(ends[0], POLLIN, stopFd))
        result = recv(ends[0], address, sizeof *address, 0) == sizeof *address ? HostLookup::Found
                                                                               : HostLookup::NotFound;
    close(ends[0]);
    return result;
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

bool ResolveName(const char* name, in_addr* address) {
    addrinfo hints{};
    hints.ai_family = AF_INET;
    hints.ai_socktype = SOCK_STREAM;
    addrinfo* list = nullptr;
    if (*name == '\0' || getaddrinfo(name, nullptr, &hints, &list) != 0)
        return false;
    *address = reinterpret_cast<const sockaddr_in*>(list->ai_addr)->sin_addr;
    freeaddrinfo(list);
    return true;
}

HostLookup LookUpHost(const char* name, int stopFd, in_addr* address, NameResolver resolver) {
    if (IsStopped(stopFd))
        return HostLookup::Stopped;
    if (inet_pton(AF_INET, name, address) == 1)
        return HostLookup::Found;
    if (stopFd < 0)
        return resolver(name, address) ? HostLookup::Found : HostLookup::NotFound;
    return LookUpOnThread(name, stopFd, address, resolver);
}
