// Brings a transport of its own, here a plain socket: transport IP-ADDRESS PORT

#include <velmora/car.h>

#include <arpa/inet.h>
#include <iostream>
#include <thread>
#include <unistd.h>

struct Socket : velmora::IPort
{
    int const link = socket(AF_INET, SOCK_STREAM, 0);
    std::thread reader;
    Socket(char const* host, char const* port)
    {
        sockaddr_in const address{AF_INET, htons(static_cast<in_port_t>(std::stoi(port))), {inet_addr(host)}, {}};
        if (connect(link, reinterpret_cast<sockaddr const*>(&address), sizeof(address)) != 0)
            throw velmora::Error(velmora::ErrorKind::PortFailed, "Nobody listens there");
    }
    ~Socket() override { Socket::close(), ::close(link); }
    void start(Receiver bytes, LossHandler lost) override { reader = std::thread(&Socket::run, this, bytes, lost); }
    void run(Receiver const& onBytes, LossHandler const& onLost) const
    {
        char bytes[256];
        for (ssize_t n = 0; (n = recv(link, bytes, sizeof(bytes), 0)) > 0;)
            onBytes({bytes, static_cast<std::size_t>(n)});
        onLost();
    }
    void write(std::string_view bytes) override { send(link, bytes.data(), bytes.size(), MSG_NOSIGNAL); }
    void close() override { shutdown(link, SHUT_RDWR), reader.joinable() ? reader.join() : void(); }
};

int main(int count, char** arguments)
try {
    auto const open = [=] { return std::make_unique<Socket>(arguments[count > 2], count > 2 ? arguments[2] : "0"); };
    std::cout << velmora::Car(velmora::CarOptions{.openPort = open}).read({"RPM"}).front() << '\n';
} catch (velmora::Error const& error) {
    return std::cerr << error << '\n', static_cast<int>(error.kind());
}
