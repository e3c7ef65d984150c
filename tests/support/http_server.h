// A web server on this machine's loopback that answers as badly as some do.
#pragma once

#include <chrono>
#include <string>
#include <thread>

#include <arpa/inet.h>
#include <netinet/in.h>
#include <sys/socket.h>
#include <unistd.h>

namespace ingester {

/// Answers each connection with `answer(path)`: the head and body to send, of which every "~" is a pause of
/// half a second, and then hangs up.
class Http_Server {
public:
    using Answer = std::string (*)(const std::string& path);

    explicit Http_Server(Answer answer) : answer_(answer)
    {
        sockaddr_in place{};
        place.sin_family = AF_INET;
        place.sin_addr.s_addr = ::htonl(INADDR_LOOPBACK);
        ::socklen_t size = sizeof place;
        auto* const address = reinterpret_cast<sockaddr*>(&place);
        if (::bind(listener_, address, size) == 0 && ::listen(listener_, 8) == 0
            && ::getsockname(listener_, address, &size) == 0)
            port_ = ::ntohs(place.sin_port);
        worker_ = std::thread([this] { Serve(); });
    }
    ~Http_Server()
    {
        ::shutdown(listener_, SHUT_RDWR);  // which ends the wait for a connection
        worker_.join();
        ::close(listener_);
    }

    /// 0 when this machine lets no server be.
    [[nodiscard]] int Port() const { return port_; }

private:
    void Serve() const
    {
        for (int connection; (connection = ::accept4(listener_, nullptr, nullptr, SOCK_CLOEXEC)) >= 0;
             ::close(connection))
            Reply(connection);
    }

    void Reply(int connection) const
    {
        std::string asked;
        for (char c; !asked.ends_with("\r\n\r\n"); asked += c)
            if (::recv(connection, &c, 1, 0) != 1)
                return;
        const std::size_t start = asked.find(' ') + 1;
        for (const char c : answer_(asked.substr(start, asked.find(' ', start) - start)))
            if (c == '~')
                std::this_thread::sleep_for(std::chrono::milliseconds(500));
            else if (::send(connection, &c, 1, MSG_NOSIGNAL) != 1)
                return;
    }

    Answer answer_;
    int listener_ = ::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0);
    int port_ = 0;
    std::thread worker_;
};

}  // namespace ingester
