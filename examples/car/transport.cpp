// Brings a transport of its own, here a plain socket: transport IP-ADDRESS PORT

#include <velmora/car.h>

#include <arpa/inet.h>
#include <iostream>
#include <sys/socket.h>
#include <thread>
#include <unistd.h>

struct Socket : velmora::IPort
{
    int const link = socket(AF_INET, SOCK_STREAM, 0);
    std::thread reader;

    Socket(char const* host, int port)
    {
        sockaddr_in const address{AF_INET, htons(static_cast<in_port_t>(port)), {inet_addr(host)}, {}};
        if (connect(link, reinterpret_cast<sockaddr const*>(&address), sizeof(address)) != 0)
            throw velmora::Error(velmora::ErrorKind::PortFailed, "Nobody listens there");
    }
    ~Socket() override { Socket::close(), ::close(link); }
    void start(Receiver onBytes, LossHandler onLost) override
    {
        reader = std::thread([this, onBytes, onLost] {
            char bytes[256];
            for (ssize_t n = 0; (n = recv(link, bytes, sizeof(bytes), 0)) > 0;)
                onBytes({bytes, static_cast<std::size_t>(n)});
            onLost();
        });
    }
    void write(std::string_view bytes) override { send(link, bytes.data(), bytes.size(), MSG_NOSIGNAL); }
    void close() override { shutdown(link, SHUT_RDWR), reader.joinable() ? reader.join() : void(); }
};

int main(int count, char** arguments)
try {
    velmora::CarOptions options;
    options.openPort = [&] { return std::make_unique<Socket>(arguments[1], count > 2 ? std::stoi(arguments[2]) : 0); };
    std::cout << velmora::Car(options).read({"RPM"}).front() << '\n';
} catch (velmora::Error const& error) {
    return std::cerr << error << '\n', static_cast<int>(error.kind());
}
