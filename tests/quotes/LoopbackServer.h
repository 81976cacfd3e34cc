#pragma once

#include <arpa/inet.h>
#include <chrono>
#include <condition_variable>
#include <csignal>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <stdexcept>
#include <string>
#include <sys/socket.h>
#include <thread>
#include <unistd.h>
#include <utility>
#include <vector>

// What the server does with one connection once the request is there.
struct Reply {
    enum class End {
        Close,  // closes properly
        Reset,  // breaks the connection
        Hold,   // says nothing more until the client goes or the server is released
        Endless // sends the last piece again and again until the client goes
    };
    std::vector<std::string> pieces; // each in a send of its own
    End end = End::Close;
};

// A listening or merely reserved TCP socket on 127.0.0.1.
class LoopbackSocket {
  public:
    LoopbackSocket() {
        auto* const address = reinterpret_cast<sockaddr*>(&address_);
        socklen_t size = sizeof address_;
        if (bind(fd_, address, size) != 0)
            throw std::runtime_error("no loopback socket");
        getsockname(fd_, address, &size);
    }
    LoopbackSocket(const LoopbackSocket&) = delete;
    LoopbackSocket& operator=(const LoopbackSocket&) = delete;
    ~LoopbackSocket() { close(fd_); }

    [[nodiscard]] int Fd() const { return fd_; }
    [[nodiscard]] std::uint16_t Port() const { return ntohs(address_.sin_port); }
    // As a quote source's host field. Nobody listens unless listen was called: a connection is refused.
    [[nodiscard]] std::string Host() const { return "127.0.0.1:" + std::to_string(Port()); }

  private:
    int fd_ = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    sockaddr_in address_{AF_INET, 0, {htonl(INADDR_LOOPBACK)}, {}};
};

// How the bytes of one connection go in and out: -1 or 0 when it is over. The socket is the server's.
struct ServerStream {
    explicit ServerStream(int socket) : fd(socket) {}
    virtual ~ServerStream() = default;
    virtual long Read(char* bytes, std::size_t size) { return read(fd, bytes, size); }
    virtual long Write(const std::string& bytes) { return write(fd, bytes.data(), bytes.size()); }
    virtual void Finish() {}

    const int fd;
};

// An HTTP server on 127.0.0.1 with a thread of its own. It serves one connection after another: it records
// the request up to its empty line and does what the test says. Its end never waits for a client.
class LoopbackServer : public LoopbackSocket {
  public:
    using Answer = std::function<Reply(const std::string& request)>; // called on the server's thread
    using StreamMaker = std::function<std::unique_ptr<ServerStream>(int fd)>;

    explicit LoopbackServer(
        Answer answer, StreamMaker makeStream = [](int fd) { return std::make_unique<ServerStream>(fd); })
        : answer_(std::move(answer)), makeStream_(std::move(makeStream)) {
        listen(Fd(), 64);
        thread_ = std::jthread([this] { Run(); });
    }
    explicit LoopbackServer(const Reply& reply)
        : LoopbackServer([reply](const std::string&) { return reply; }) {}
    ~LoopbackServer() {
        Change([this] {
            stopping_ = true;
            shutdown(Fd(), SHUT_RDWR);
            shutdown(connection_, SHUT_RDWR);
        });
    }

    [[nodiscard]] std::vector<std::string> Requests() const {
        const std::lock_guard lock(mutex_);
        return requests_;
    }
    // False when not as many requests came within ten seconds.
    [[nodiscard]] bool WaitFor(std::size_t requests) const {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, std::chrono::seconds(10),
                                 [&] { return requests_.size() >= requests; });
    }
    // Lets the connection held at present be closed.
    void Release() {
        Change([this] { shutdown(connection_, SHUT_RD); });
    }

  private:
    void Change(const std::function<void()>& work) {
        const std::lock_guard lock(mutex_);
        work();
        changed_.notify_all();
    }

    void Run() {
        sigset_t all; // a stream may write to a client that has gone
        sigfillset(&all);
        pthread_sigmask(SIG_BLOCK, &all, nullptr);
        for (bool stopped = false; !stopped;) {
            const int fd = accept4(Fd(), nullptr, nullptr, SOCK_CLOEXEC);
            Change([&] {
                connection_ = fd;
                stopped = stopping_;
            });
            if (!stopped)
                Serve(*makeStream_(fd));
            Change([&] { close(std::exchange(connection_, -1)); });
        }
    }

    void Serve(ServerStream& stream) {
        std::string request;
        char bytes[1024];
        while (!request.ends_with("\n\n") && !request.ends_with("\r\n\r\n")) {
            const long got = stream.Read(bytes, sizeof bytes);
            if (got <= 0)
                return;
            request.append(bytes, static_cast<std::size_t>(got));
        }
        const Reply reply = answer_(request);
        Change([&] { requests_.push_back(request); });
        for (const std::string& piece : reply.pieces)
            if (stream.Write(piece) <= 0)
                return;
        while (reply.end == Reply::End::Hold && stream.Read(bytes, sizeof bytes) > 0) {
        }
        while (reply.end == Reply::End::Endless && stream.Write(reply.pieces.back()) > 0) {
        }
        const linger atOnce{1, 0};
        if (reply.end == Reply::End::Reset)
            setsockopt(connection_, SOL_SOCKET, SO_LINGER, &atOnce, sizeof atOnce);
        else
            stream.Finish();
    }

    Answer answer_;
    StreamMaker makeStream_;
    mutable std::mutex mutex_;
    mutable std::condition_variable changed_;
    std::vector<std::string> requests_;
    int connection_ = -1;
    bool stopping_ = false;
    std::jthread thread_; // last, since it uses all of the above
};
