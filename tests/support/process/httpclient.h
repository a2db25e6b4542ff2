#pragma once

#include <algorithm>
#include <arpa/inet.h>
#include <chrono>
#include <string>
#include <sys/socket.h>
#include <unistd.h>
#include <utility>

namespace testsupport {

// A plain connection to a server on loopback.
class HttpClient
{
public:
    explicit HttpClient(unsigned short port) : m_socket(::socket(AF_INET, SOCK_STREAM, 0))
    {
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_port = htons(port);
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        timeval const limit{20, 0};
        ::setsockopt(m_socket, SOL_SOCKET, SO_RCVTIMEO, &limit, sizeof(limit));
        m_connected = ::connect(m_socket, reinterpret_cast<sockaddr*>(&address), sizeof(address)) == 0;
    }
    ~HttpClient() { ::close(m_socket); }
    HttpClient(HttpClient const&) = delete;
    HttpClient& operator=(HttpClient const&) = delete;

    bool connected() const { return m_connected; }
    bool send(std::string const& text) const
    {
        return ::send(m_socket, text.data(), text.size(), MSG_NOSIGNAL) == static_cast<ssize_t>(text.size());
    }
    // Says that nothing more comes from here.
    void endSending() const { ::shutdown(m_socket, SHUT_WR); }
    // All up to the end of the connection.
    std::string readAll()
    {
        while (receive()) {
        }
        return std::exchange(m_ahead, {});
    }
    // All up to and with that text; less if the connection ends before, or brings other things for two minutes.
    std::string readUntil(std::string const& text)
    {
        auto const limit = std::chrono::steady_clock::now() + std::chrono::minutes(2);
        std::size_t from = 0;
        std::size_t at = 0;
        while ((at = m_ahead.find(text, from)) == std::string::npos) {
            from = m_ahead.size() - std::min(m_ahead.size(), text.size());
            if (std::chrono::steady_clock::now() > limit || !receive()) {
                return std::exchange(m_ahead, {});
            }
        }
        std::string const rest = m_ahead.substr(at + text.size());
        m_ahead.resize(at + text.size());
        return std::exchange(m_ahead, rest);
    }
    std::string ask(std::string const& request) { return send(request) ? readAll() : std::string(); }

private:
    bool receive()
    {
        char buffer[65536];
        ssize_t const count = ::recv(m_socket, buffer, sizeof(buffer), 0);
        m_ahead.append(buffer, static_cast<std::size_t>(std::max<ssize_t>(count, 0)));
        return count > 0;
    }

    int m_socket;
    bool m_connected = false;
    std::string m_ahead; // received, and not given away yet
};

inline std::string httpGet(unsigned short port, std::string const& path)
{
    return HttpClient(port).ask("GET " + path + " HTTP/1.1\r\nHost: x\r\nConnection: close\r\n\r\n");
}

// What stands behind the header.
inline std::string httpBody(std::string const& reply)
{
    std::size_t const end = reply.find("\r\n\r\n");
    return end == std::string::npos ? std::string() : reply.substr(end + 4);
}

} // namespace testsupport
