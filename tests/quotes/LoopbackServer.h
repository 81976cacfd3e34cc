#pragma once

#include <arpa/inet.h>
#include <cerrno>
#include <chrono>
#include <condition_variable>
#include <csignal>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <netinet/in.h>
#include <poll.h>
#include <stdexcept>
#include <string>
#include <string_view>
#include <sys/eventfd.h>
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
    bool inStep = false; // send each piece only when the test has called Taken for all before it
};

// A listening or merely reserved TCP socket on 127.0.0.1.
class LoopbackSocket {
  public:
    explicit LoopbackSocket(std::uint16_t port = 0) : fd_(socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
        const int on = 1;
        setsockopt(fd_, SOL_SOCKET, SO_REUSEADDR, &on, sizeof on);
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_port = htons(port);
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        socklen_t size = sizeof address;
        bound_ = bind(fd_, reinterpret_cast<sockaddr*>(&address), size) == 0 &&
                 getsockname(fd_, reinterpret_cast<sockaddr*>(&address), &size) == 0;
        port_ = ntohs(address.sin_port);
    }
    LoopbackSocket(const LoopbackSocket&) = delete;
    LoopbackSocket& operator=(const LoopbackSocket&) = delete;
    ~LoopbackSocket() { close(fd_); }

    [[nodiscard]] bool IsBound() const { return bound_; }
    [[nodiscard]] int Fd() const { return fd_; }
    [[nodiscard]] std::uint16_t Port() const { return port_; }
    // As a quote source's host field. Nobody listens unless listen was called: a connection is refused.
    [[nodiscard]] std::string Host() const { return "127.0.0.1:" + std::to_string(port_); }

  private:
    int fd_;
    bool bound_ = false;
    std::uint16_t port_ = 0;
};

// How the bytes of one connection go in and out. The socket is the server's and does not block.
class ServerStream {
  public:
    explicit ServerStream(int fd) : fd_(fd) {}
    ServerStream(const ServerStream&) = delete;
    ServerStream& operator=(const ServerStream&) = delete;
    virtual ~ServerStream() = default;
    // As recv and send: -1 with errno EAGAIN when it has to wait.
    virtual ssize_t Read(char* bytes, std::size_t size) { return recv(fd_, bytes, size, 0); }
    virtual ssize_t Write(const char* bytes, std::size_t size) {
        return send(fd_, bytes, size, MSG_NOSIGNAL);
    }
    virtual void Finish() {}

  protected:
    [[nodiscard]] int Fd() const { return fd_; }

  private:
    int fd_;
};

// An HTTP server on 127.0.0.1 with a thread of its own. It serves one connection after another, reads the
// request up to its empty line, records it and does what the test says. It is there from construction to
// destruction, which never waits for a client.
class LoopbackServer {
  public:
    using Answer = std::function<Reply(const std::string& request)>; // called on the server's thread
    using StreamMaker = std::function<std::unique_ptr<ServerStream>(int fd)>;

    // Any free port when `port` is 0. `answer` decides by the request's text.
    explicit LoopbackServer(
        Answer answer, std::uint16_t port = 0,
        StreamMaker makeStream = [](int fd) { return std::make_unique<ServerStream>(fd); })
        : answer_(std::move(answer)),
          makeStream_(std::move(makeStream)),
          socket_(port),
          wake_(eventfd(0, EFD_NONBLOCK | EFD_CLOEXEC)) {
        if (!socket_.IsBound() || listen(socket_.Fd(), 64) != 0)
            throw std::runtime_error("no listening socket");
        thread_ = std::thread([this] { Run(); });
    }
    // The same reply for every connection.
    explicit LoopbackServer(const Reply& reply)
        : LoopbackServer([reply](const std::string&) { return reply; }) {}
    LoopbackServer(const LoopbackServer&) = delete;
    LoopbackServer& operator=(const LoopbackServer&) = delete;
    ~LoopbackServer() {
        Change([this] { stopping_ = true; });
        thread_.join();
        close(wake_);
    }

    [[nodiscard]] std::uint16_t Port() const { return socket_.Port(); }
    // As a quote source's host field.
    [[nodiscard]] std::string Host() const { return socket_.Host(); }

    [[nodiscard]] std::vector<std::string> Requests() const {
        const std::lock_guard lock(mutex_);
        return requests_;
    }
    // False when there are fewer than `count` requests after ten seconds.
    [[nodiscard]] bool WaitForRequests(std::size_t count) const {
        return Await([this, count] { return requests_.size() >= count; });
    }
    // Waits until that many connections are over on both sides.
    [[nodiscard]] bool WaitForEnds(std::size_t count) const {
        return Await([this, count] { return ends_ >= count; });
    }
    // Lets the connection held at present, and any later one, be closed.
    void Release() {
        Change([this] { released_ = true; });
    }
    // For replies in step: the client has taken this many bytes.
    void Taken(std::size_t bytes) {
        Change([this, bytes] { taken_ += bytes; });
    }

  private:
    template <class Work>
    void Change(Work work) {
        {
            const std::lock_guard lock(mutex_);
            work();
        }
        changed_.notify_all();
        const std::uint64_t one = 1;
        (void)!write(wake_, &one, sizeof one);
    }
    template <class Condition>
    bool Await(Condition condition) const {
        std::unique_lock lock(mutex_);
        return changed_.wait_for(lock, std::chrono::seconds(10), condition);
    }

    // Waits until the socket has one of `events`. False when the server is being destroyed, when `release`
    // becomes true, or when the client goes.
    template <class Release>
    bool Wait(int fd, short events, Release release) {
        for (;;) {
            {
                const std::lock_guard lock(mutex_);
                if (stopping_ || release())
                    return false;
            }
            pollfd fds[] = {{fd, static_cast<short>(events | POLLRDHUP), 0}, {wake_, POLLIN, 0}};
            poll(fds, 2, -1);
            if (fds[1].revents != 0) {
                std::uint64_t count = 0;
                (void)!read(wake_, &count, sizeof count);
            }
            if (fds[0].revents & (events | POLLERR))
                return true;
            if (fds[0].revents != 0)
                return false;
        }
    }
    bool Wait(int fd, short events) {
        return Wait(fd, events, [] { return false; });
    }

    void Run() {
        // A stream may write to a client that has gone.
        sigset_t pipe;
        sigemptyset(&pipe);
        sigaddset(&pipe, SIGPIPE);
        pthread_sigmask(SIG_BLOCK, &pipe, nullptr);
        while (Wait(socket_.Fd(), POLLIN)) {
            const int fd = accept4(socket_.Fd(), nullptr, nullptr, SOCK_NONBLOCK | SOCK_CLOEXEC);
            if (fd < 0)
                continue;
            Serve(fd);
            close(fd);
            Change([this] { ++ends_; });
        }
    }

    void Serve(int fd) {
        const std::unique_ptr<ServerStream> stream = makeStream_(fd);
        std::string request;
        if (!stream || !ReadRequest(fd, *stream, request))
            return;
        const Reply reply = answer_(request);
        Change([&] {
            requests_.push_back(request);
            taken_ = 0;
        });
        std::size_t sent = 0;
        for (const std::string& piece : reply.pieces) {
            if (reply.inStep)
                Wait(fd, 0, [&] { return taken_ >= sent; });
            if (!Write(fd, *stream, piece))
                return;
            sent += piece.size();
        }
        End(fd, *stream, reply);
    }

    void End(int fd, ServerStream& stream, const Reply& reply) {
        if (reply.end == Reply::End::Hold)
            Wait(fd, 0, [this] { return released_; });
        while (reply.end == Reply::End::Endless && Write(fd, stream, reply.pieces.back())) {
        }
        if (reply.end == Reply::End::Reset) {
            const linger atOnce{1, 0};
            setsockopt(fd, SOL_SOCKET, SO_LINGER, &atOnce, sizeof atOnce);
        } else {
            stream.Finish();
        }
    }

    bool ReadRequest(int fd, ServerStream& stream, std::string& request) {
        char bytes[1024];
        while (!request.ends_with("\n\n") && !request.ends_with("\r\n\r\n")) {
            const ssize_t got = stream.Read(bytes, sizeof bytes);
            if (got > 0)
                request.append(bytes, static_cast<std::size_t>(got));
            else if (got == 0 || errno != EAGAIN || !Wait(fd, POLLIN))
                return false;
        }
        return true;
    }

    bool Write(int fd, ServerStream& stream, std::string_view piece) {
        while (!piece.empty()) {
            const ssize_t sent = stream.Write(piece.data(), piece.size());
            if (sent > 0)
                piece.remove_prefix(static_cast<std::size_t>(sent));
            else if (errno != EAGAIN || !Wait(fd, POLLOUT))
                return false;
        }
        return true;
    }

    Answer answer_;
    StreamMaker makeStream_;
    LoopbackSocket socket_;
    int wake_;
    mutable std::mutex mutex_;
    mutable std::condition_variable changed_;
    std::vector<std::string> requests_;
    std::size_t ends_ = 0;
    std::size_t taken_ = 0;
    bool released_ = false;
    bool stopping_ = false;
    std::thread thread_; // last, since it uses all of the above
};
