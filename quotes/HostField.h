#pragma once

#include <cstdint>
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
