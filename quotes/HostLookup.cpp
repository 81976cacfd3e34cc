#include "quotes/HostLookup.h"

#include <arpa/inet.h>
#include <cstdint>
#include <memory>
#include <mutex>
#include <netdb.h>
#include <poll.h>
#include <string>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <system_error>
#include <thread>
#include <unistd.h>

#include "quotes/StopSignal.h"

namespace {

// One look-up, shared by who asks and the thread that resolves: the last of the two takes it down.
class PendingLookup {
  public:
    PendingLookup(const char* name, NameResolver resolver)
        : name_(name), resolver_(resolver), doneFd_(eventfd(0, EFD_CLOEXEC)) {}
    PendingLookup(const PendingLookup&) = delete;
    PendingLookup& operator=(const PendingLookup&) = delete;
    ~PendingLookup() { close(doneFd_); }

    void Run() {
        in_addr address{};
        const bool found = resolver_(name_.c_str(), &address);
        const std::lock_guard lock(mutex_);
        found_ = found;
        address_ = address;
        const std::uint64_t one = 1;
        (void)!write(doneFd_, &one, sizeof one);
    }

    [[nodiscard]] HostLookup Await(int stopFd, in_addr* address) {
        if (WaitUnlessStopped(doneFd_, POLLIN, stopFd) == Waited::Stopped)
            return HostLookup::Stopped;
        const std::lock_guard lock(mutex_);
        *address = address_;
        return found_ ? HostLookup::Found : HostLookup::NotFound;
    }

    [[nodiscard]] bool IsUsable() const { return doneFd_ >= 0; }

  private:
    std::string name_;
    NameResolver resolver_;
    int doneFd_;
    std::mutex mutex_;
    bool found_ = false;
    in_addr address_{};
};

HostLookup LookUpOnThread(const char* name, int stopFd, in_addr* address, NameResolver resolver) {
    const auto lookup = std::make_shared<PendingLookup>(name, resolver);
    if (!lookup->IsUsable())
        return HostLookup::NotFound;
    try {
        std::thread([lookup] { lookup->Run(); }).detach();
    } catch (const std::system_error&) {
        return HostLookup::NotFound; // no thread to be had: as with a resolver that lacks resources
    }
    return lookup->Await(stopFd, address);
}

} // namespace

bool ReadNumericAddress(const char* name, in_addr* address) {
    return inet_pton(AF_INET, name, address) == 1;
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
    if (stopFd < 0)
        return resolver(name, address) ? HostLookup::Found : HostLookup::NotFound;
    return LookUpOnThread(name, stopFd, address, resolver);
}
