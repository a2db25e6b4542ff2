#include "libvelmora/port/opening/openport.h"
#include "libvelmora/watch/sessioncar.h"
#include "tests/support/fakeclock.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <malloc.h>
#include <unistd.h>

namespace {

using namespace std::chrono_literals;
using velmora::SessionCar;

// A simulated adapter on a wire that a test pulls.
class PulledPort : public velmora::IPort
{
public:
    explicit PulledPort(std::function<void()>& pull) : m_pull(pull)
    {
        m_port = velmora::openPort(velmora::parsePortAddress("sim:petrol-can11?instant"));
    }
    ~PulledPort() override { m_pull = nullptr; }
    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_pull = onLost;
        m_port->start(std::move(onBytes), std::move(onLost));
    }
    void write(std::string_view bytes) override { m_port->write(bytes); }
    void close() override { m_port->close(); }

private:
    std::function<void()>& m_pull;
    std::unique_ptr<velmora::IPort> m_port;
};

struct Use
{
    long descriptors = 0;
    long threads = 0;
    std::size_t heap = 0; // bytes

    static long entries(char const* folder)
    {
        return std::distance(std::filesystem::directory_iterator(folder), std::filesystem::directory_iterator());
    }
    static Use now() { return {entries("/proc/self/fd"), entries("/proc/self/task"), ::mallinfo2().uordblks}; }
};

// Brings the car up, waits for a reading, pulls the wire.
void loseOnce(SessionCar& car, std::function<void()> const& pull)
{
    car.connect();
    EXPECT_EQ(car.vin().size(), 17U);
    car.startAsking();
    for (int i = 0; i < 2000 && car.readings().empty(); ++i) {
        car.wait(5ms);
    }
    pull();
    bool lost = false;
    for (int i = 0; i < 2000 && !lost; ++i) {
        try {
            car.wait(1ms);
            car.check();
        } catch (velmora::Error const&) {
            lost = true;
        }
    }
    EXPECT_TRUE(lost);
    car.disconnect();
}

// VELMORA_LOSSES=1440 is a day of one a minute.
TEST(SessionCar, LossesLeaveNothingBehind)
{
    char const* const wish = std::getenv("VELMORA_LOSSES");
    int const losses = wish == nullptr ? 3 : std::atoi(wish);
    testsupport::TemporaryFolder const folder;
    std::function<void()> pull;
    velmora::SessionCarOptions options;
    options.session.port = "pulled";
    options.session.settingsFile = folder.file("settings.toml");
    options.session.openPort = [&pull] { return std::make_unique<PulledPort>(pull); };
    options.vehicle = "van";
    SessionCar car(options);
    loseOnce(car, pull);
    loseOnce(car, pull); // what is learnt once is there
    Use const before = Use::now();
    for (int i = 0; i < losses; ++i) {
        loseOnce(car, pull);
    }
    Use after = Use::now();
    for (int i = 0; i < 400 && after.threads > before.threads; ++i) {
        ::usleep(5000); // a thread that was joined is listed for a moment more
        after = Use::now();
    }
    EXPECT_LE(after.descriptors, before.descriptors);
    EXPECT_LE(after.threads, before.threads);
    // A leak of a kilobyte a loss would show.
    EXPECT_LT(after.heap, before.heap + 4096 + static_cast<std::size_t>(losses) * 512);
    std::cout << losses << " losses: " << before.heap << " to " << after.heap << " bytes\n";
}

// Waits for a reading of that sensor.
bool comes(SessionCar& car, std::string const& sensor)
{
    for (int i = 0; i < 2000; ++i) {
        car.wait(5ms);
        for (velmora::Reading const& each : car.readings()) {
            if (each.sensor == sensor) {
                return true;
            }
        }
    }
    return false;
}

TEST(SessionCar, ReadsMoreOrOtherSensorsAsSoonAsItIsTold)
{
    testsupport::TemporaryFolder const folder;
    velmora::SessionCarOptions options;
    options.session.port = "sim:petrol-can11?instant";
    options.session.settingsFile = folder.file("settings.toml");
    options.vehicle = "van";
    options.sensors = {"RPM"};
    SessionCar car(options);
    car.readAlso({"SPEED"}); // counts once there is a car
    car.connect();
    EXPECT_EQ(car.visits(), 1U);
    EXPECT_EQ(car.sensors().sensors.size(), 2U);
    car.startAsking();
    EXPECT_TRUE(comes(car, "RPM"));
    EXPECT_TRUE(comes(car, "SPEED"));
    car.readAlso({"COOLANT_TEMP"});
    EXPECT_TRUE(comes(car, "COOLANT_TEMP"));
    car.readOnly({"THROTTLE_POS"});
    EXPECT_EQ(car.sensors().sensors.size(), 1U);
    EXPECT_TRUE(comes(car, "THROTTLE_POS"));
    car.readings();
    car.readOnly({});
    EXPECT_TRUE(comes(car, "RPM"));
    car.disconnect();
}

} // namespace
