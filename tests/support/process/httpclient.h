#pragma once

#include <arpa/inet.h>
#include <string>
#include <sys/socket.h>
#include <unistd.h>

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
    // All up to the end of the connection.
    std::string readAll()
    {
        std::string result;
        char buffer[65536];
        for (ssize_t count = 0; (count = ::recv(m_socket, buffer, sizeof(buffer), 0)) > 0;) {
            result.append(buffer, static_cast<std::size_t>(count));
        }
        return result;
    }
    // All up to and with that text; less if the connection ends before.
    std::string readUntil(std::string const& text)
    {
        std::string result;
        for (char each = 0; ::recv(m_socket, &each, 1, 0) == 1;) {
            result += each;
            if (result.ends_with(text)) {
                break;
            }
        }
        return result;
    }
    std::string ask(std::string const& request) { return send(request) ? readAll() : std::string(); }

private:
    int m_socket;
    bool m_connected = false;
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
