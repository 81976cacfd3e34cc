#pragma once

#include <cstdint>
#include <netinet/in.h>
#include <string>
#include <string_view>

// What the host field of a quote source names.
struct HostField {
    std::string name;
    std::uint16_t port = 80;
    bool tls = false;
};

// Reads a host field: NAME (port 80), NAME:PORT, https://NAME (port 443) or https://NAME:PORT; "http://"
// before the first two says the same. False when it is none of them: the port is no number from 1 to 65535,
// or the name is empty or has characters that belong to other parts of an address.
[[nodiscard]] bool ParseHostField(std::string_view text, HostField* host);

enum class HostLookup { Found, NotFound, Stopped };

// Stores a host's first IPv4 address; false when the name has none.
using NameResolver = bool (*)(const char* name, in_addr* address);

// The system's resolver, which may take its time and cannot be interrupted.
[[nodiscard]] bool ResolveName(const char* name, in_addr* address);

// Finds the first IPv4 address of a host by name, or returns Stopped as soon as `stopFd` (-1 for never) is
// readable. The resolver then goes on by itself on a thread that owns all it works with, and its result is
// dropped; the program may end meanwhile. An address in figures is read without a resolver.
[[nodiscard]] HostLookup LookUpHost(const char* name, int stopFd, in_addr* address,
                                    NameResolver resolver = ResolveName);
