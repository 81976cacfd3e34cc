#pragma once

#include <netinet/in.h>

enum class HostLookup { Found, NotFound, Stopped };

// Reads a name that is an IPv4 address in figures, for which nobody needs to be asked.
[[nodiscard]] bool ReadNumericAddress(const char* name, in_addr* address);

// Stores a host's first IPv4 address; false when the name has none.
using NameResolver = bool (*)(const char* name, in_addr* address);

// The system's resolver, which may take its time and cannot be interrupted.
[[nodiscard]] bool ResolveName(const char* name, in_addr* address);

// Finds the first IPv4 address of a host by name, or returns Stopped as soon as `stopFd` (-1 for never) is
// readable. The resolver then goes on by itself on a thread that owns all it works with, and its result is
// dropped; the program may end meanwhile.
[[nodiscard]] HostLookup LookUpHost(const char* name, int stopFd, in_addr* address,
                                    NameResolver resolver = ResolveName);
