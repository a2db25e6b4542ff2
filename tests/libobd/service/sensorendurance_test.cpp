#include "tests/libobd/service/sensorservicefixture.h"
#include "tests/support/process/failingallocation.h"

#include <cstdlib>

namespace {

using support::pid;

// Time passes by the pauses between requests, and by what the test says a request takes; the worker's polls of an empty
// queue cost none, so that the test sees the cycle's own rate, however busy the machine is.
class CycleClock : public tervex::IClock
{
public:
    explicit CycleClock(tervex::IClock& previous) : m_previous(previous) { tervex::setClock(this); }
    ~CycleClock() override { tervex::setClock(&m_previous); }
    CycleClock(CycleClock const&) = delete;
    CycleClock& operator=(CycleClock const&) = delete;

    unsigned int millis() override { return m_millis; }
    void sleep(unsigned int ms) override
    {
        static constexpr unsigned int pollMs = 10;
        if (ms == pollMs) {
            std::this_thread::sleep_for(std::chrono::microseconds(10));
        } else {
            m_millis += ms;
        }
    }
    std::time_t wallSeconds() override { return 1709802302; }

    void advance(unsigned int ms) { m_millis += ms; }

private:
    tervex::IClock& m_previous;
    std::atomic<unsigned int> m_millis{1000};
};

class SensorEndurance : public support::SensorServiceFixture
{
protected:
    ~SensorEndurance() override
    {
        service.reset();
        rig.rig.dispatcher.cancel(); // before the clock goes
    }

    // Updates in a second of simulated time, with a vehicle that takes requestMs to answer.
    double rate(unsigned int requestMs)
    {
        open();
        proxy().during([this, requestMs] { clock.advance(requestMs); });
        service->startUpdates({pid(0x05), pid(0x0C), pid(0x0D)});
        awaitUpdates(1);
        unsigned int const start = clock.millis();
        std::size_t const before = recorder.updates.size();
        EXPECT_TRUE(loop().runUntil([&] { return clock.millis() - start >= 30000; }));
        return static_cast<double>(recorder.updates.size() - before) * 1000.0 / (clock.millis() - start);
    }

    CycleClock clock{rig.rig.clock};
};

TEST_F(SensorEndurance, RunsAtTheFloorOf30MillisecondsWithAVehicleThatAnswersAtOnce)
{
    EXPECT_NEAR(rate(0), 1000.0 / 30.0, 0.05 * 33.3);
}

TEST_F(SensorEndurance, RunsAtTheFloorWithAVehicleThatAnswersWithinIt)
{
    EXPECT_NEAR(rate(17), 1000.0 / 30.0, 0.05 * 33.3);
}

TEST_F(SensorEndurance, RunsAtTheRateOfASlowVehicle)
{
    EXPECT_NEAR(rate(100), 10.0, 0.5);
}

// Thirty minutes of 60 sensors are 60 000 requests. A leak of one object in a request would show as tens of thousands.
TEST_F(SensorEndurance, SixtySensorsForThirtyMinutesDoNotGrowMemory)
{
    std::vector<unsigned char> supported;
    for (int id = 0x03; id <= 0x7F; ++id) {
        supported.push_back(static_cast<unsigned char>(id));
        proxy().answer(std::string("01 ") + obd::ParameterIdentifier(id).toString().substr(1),
                       ("41 " + obd::ParameterIdentifier(id).toString().substr(1) + " 50 60 70 20").c_str());
    }
    engine->setSupported(obd::ObdMode::CurrentData, supported);
    open();
    std::vector<obd::ParameterIdentifier::Id> ids;
    for (auto const& descriptor : service->getDescriptors()) {
        bool const derived = descriptor->pid() >= 0xF0; // takes several requests
        if (ids.size() < 60 && !derived) {
            ids.push_back(descriptor->pid());
        }
    }
    ASSERT_EQ(ids.size(), 60U);

    std::size_t updates = 0;
    recorder.onUpdate = [&] {
        ++updates;
        recorder.updates.clear();
        if (updates % ids.size() == 0) {
            proxy().forgetRequests();
            log.clear();
        }
    };
    auto const runTo = [&](std::size_t count) { return loop().runUntil([&] { return updates >= count; }); };
    unsigned int const start = clock.millis();
    service->startUpdates(ids);
    ASSERT_TRUE(runTo(2 * ids.size()));
    long const before = support::liveAllocations();
    while (clock.millis() - start < 30U * 60U * 1000U) {
        ASSERT_TRUE(runTo(updates + 1000));
    }
    EXPECT_GT(updates, 59000U);
    EXPECT_LT(std::labs(support::liveAllocations() - before), static_cast<long>(10 * ids.size()));
}

} // namespace
