// Reads a car over a network adapter: minimal IP-ADDRESS PORT

#include <obd/obd.h>

#include <arpa/inet.h>
#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <sys/socket.h>
#include <thread>

// Keeps nothing, so that every setting has its default.
struct NoSettings : obd::ISettings
{
    void setInt(std::string const&, int) override {}
    void setString(std::string const&, std::string const&) override {}
    bool getInt(std::string const&, int&) override { return false; }
    bool getString(std::string const&, std::string&) override { return false; }
    void sync() override {}
};

static void readLoop(int link, obd::IDataBridge& bridge)
{
    unsigned char buffer[256];
    for (ssize_t n = 0; (n = recv(link, buffer, sizeof(buffer), 0)) > 0;) {
        bridge.set({buffer, buffer + n});
    }
    bridge.invalidate();
}

static void writeLoop(int link, obd::IDataBridge& bridge, std::atomic<bool> const& done)
{
    for (std::vector<unsigned char> bytes; bridge.get(bytes) || !done; bytes.clear()) {
        if (!bytes.empty()) {
            send(link, bytes.data(), bytes.size(), MSG_NOSIGNAL);
        }
    }
}

static void readCar()
{
    auto const sensors = obd::SensorServiceBuilder::createSensorService();
    for (int reading = 0; reading < 5; ++reading) {
        for (auto const& sensor : sensors->fetchSensors(obd::ParameterIdentifier(0x0C).id())) {
            std::printf("%s: %s rpm\n", sensor->name.c_str(), sensor->value ? sensor->value->value.c_str() : "-");
        }
    }
    for (auto const& code : obd::TroubleCodeServiceBuilder::createTroubleCodeService()->fetchConfirmedCodes()) {
        std::printf("Trouble code: %s %s\n", code->code.c_str(), code->description.c_str());
    }
}

int main(int count, char** arguments)
{
    int const link = socket(AF_INET, SOCK_STREAM, 0);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<in_port_t>(count == 3 ? std::atoi(arguments[2]) : 0));
    if (count != 3 || inet_pton(AF_INET, arguments[1], &address.sin_addr) != 1 ||
        connect(link, reinterpret_cast<sockaddr*>(&address), sizeof(address)) != 0) {
        std::fprintf(stderr, "No adapter. Usage: minimal IP-ADDRESS PORT\n");
        return 1;
    }
    obd::LIBOBDOpen("");
    auto car = obd::ObdVelmoraBuilder::createObdVelmora(0, 0, 0, std::make_shared<NoSettings>());
    auto const bridge = std::make_shared<obd::DataBridge>();
    std::atomic<bool> done{false};
    std::thread reader([&] { readLoop(link, *bridge); });
    std::thread writer([&] { writeLoop(link, *bridge, done); });
    bool const opened = car->getConnectionManager()->openConnection(bridge, obd::VehicleProtocol::Automatic, false);
    opened ? readCar() : void(std::fprintf(stderr, "No car answers.\n"));
    car.reset(); // closes the connection
    done = true;
    writer.join();
    shutdown(link, SHUT_RDWR);
    reader.join();
    obd::LIBOBDClose();
    return opened ? 0 : 1;
}
