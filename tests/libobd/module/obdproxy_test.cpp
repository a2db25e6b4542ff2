#include "libobd/module/obdproxy.h"
#include "tests/support/logcapture.h"
#include "tests/support/wire/fakedevice.h"

#include <gtest/gtest.h>

#include <thread>

namespace {

using obd::IDevice;
using support::Bytes;

class Proxy : public testing::Test
{
protected:
    Proxy() { m_device->answer({0x01, 0x00}, 0x7E8, {0x41, 0x00, 0x08, 0x00, 0x00, 0x00}); }
    ~Proxy() override { m_proxy->releaseEcus(); }

    bool initialize()
    {
        m_proxy->setDevice(m_device);
        return m_proxy->initialize();
    }

    std::vector<unsigned int> ids()
    {
        std::vector<unsigned int> result;
        for (auto const& ecu : m_proxy->ecus()) {
            result.push_back(ecu->id());
        }
        return result;
    }

    std::shared_ptr<support::FakeDevice> m_device = std::make_shared<support::FakeDevice>();
    std::shared_ptr<obd::ObdProxy> m_proxy = std::make_shared<obd::ObdProxy>();
    support::LogCapture m_log;
};

TEST_F(Proxy, BeforeADeviceIsSetRequestsAreUnparsedAndTheVoltageIsZeroWithoutALine)
{
    obd::ResponseMap responses;
    std::string text;
    EXPECT_EQ(m_proxy->execute(Bytes{0x01, 0x00}, responses, 100), IDevice::Status::Unparsed);
    EXPECT_EQ(m_proxy->execute("ATI", text, 100), IDevice::Status::Unparsed);
    EXPECT_EQ(m_proxy->batteryVoltage(), 0.0F);
    EXPECT_FALSE(m_proxy->isConnected());
    EXPECT_EQ(m_proxy->protocol(), obd::ObdProtocolUnknown);
    EXPECT_EQ(m_proxy->firstEcu(), nullptr);
    EXPECT_TRUE(m_log.lines().empty());
}

TEST_F(Proxy, TellsInOneExchangeWhatTheAdapterSaidAndTheNumberOfTheBusWhileALinkStands)
{
    obd::ResponseMap responses;
    obd::AdapterNote note = obd::AdapterNote::ReplyLost;
    EXPECT_EQ(m_proxy->executeNoted(Bytes{0x01, 0x05}, responses, 100, note), IDevice::Status::Unparsed);
    EXPECT_EQ(note, obd::AdapterNote::None) << "nobody was asked";
    EXPECT_EQ(m_proxy->vehicleProtocol(), obd::VehicleProtocol::Automatic);
    m_device->note = obd::AdapterNote::ReplyLost;
    m_proxy->setDevice(m_device);
    EXPECT_EQ(m_proxy->executeNoted(Bytes{0x01, 0x05}, responses, 100, note), IDevice::Status::NoResponse);
    EXPECT_EQ(note, obd::AdapterNote::ReplyLost);
    EXPECT_EQ(m_proxy->vehicleProtocol(), obd::VehicleProtocol::Iso15765Can11Bit500);
    m_device->enabled = false;
    EXPECT_EQ(m_proxy->vehicleProtocol(), obd::VehicleProtocol::Automatic);
}

TEST_F(Proxy, NoDataToTheFirstRequestFailsWithStatusThreeAndAnEmptyList)
{
    m_device = std::make_shared<support::FakeDevice>();
    EXPECT_FALSE(initialize());
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"FATAL Failed to detect ECUs, invalid status 3"});
    EXPECT_TRUE(m_proxy->ecus().empty());
}

TEST_F(Proxy, FirstRequestHasElevenSeconds)
{
    ASSERT_TRUE(initialize());
    EXPECT_EQ(m_device->requests.front(), (Bytes{0x01, 0x00}));
    EXPECT_EQ(m_device->timeouts.front(), 11000U);
}

TEST_F(Proxy, ReplyWithoutAModuleFails)
{
    m_device->answer({0x01, 0x00}, support::FakeDevice::Answer{});
    EXPECT_FALSE(initialize());
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"FATAL Failed to detect ECUs, empty response"});
}

TEST_F(Proxy, DeviceLostBehindTheReplyFails)
{
    m_device->onRequest = [this](Bytes const&) { m_device->enabled = false; };
    EXPECT_FALSE(initialize());
    EXPECT_EQ(m_log.lines(), std::vector<std::string>{"FATAL Failed to detect ECUs, device not enabled"});
}

TEST_F(Proxy, LowestIdIsFirstWhoeverAnsweredFirst)
{
    m_device->answer({0x01, 0x00}, 0x7E9, {0x41, 0x00, 0x00, 0x00, 0x00, 0x00});
    ASSERT_TRUE(initialize());
    EXPECT_EQ(m_proxy->firstEcu()->id(), 0x7E8U);
    EXPECT_EQ(ids(), (std::vector<unsigned int>{0x7E8, 0x7E9}));
}

TEST_F(Proxy, ModuleThatRefusesTheFirstRequestIsAModuleAllTheSame)
{
    m_device->answer({0x01, 0x00}, 0x7EA, {0x7F, 0x01, 0x12});
    ASSERT_TRUE(initialize());
    EXPECT_EQ(ids(), (std::vector<unsigned int>{0x7E8, 0x7EA}));
}

TEST_F(Proxy, SecondModulesFailedInitKeepsBothModules)
{
    m_device->answer({0x01, 0x00}, 0x7E9, {0x7F, 0x01, 0x12});
    EXPECT_TRUE(initialize());
    EXPECT_EQ(ids(), (std::vector<unsigned int>{0x7E8, 0x7E9}));
}

TEST_F(Proxy, FirstModulesFailedInitFails)
{
    int count = 0;
    m_device->onRequest = [&](Bytes const& request) {
        if (request == Bytes{0x01, 0x00} && ++count == 2) {
            m_device->answer({0x01, 0x00}, support::FakeDevice::Answer{IDevice::Status::NoResponse, {}});
        }
    };
    EXPECT_FALSE(initialize());
    EXPECT_TRUE(m_log.contains("FATAL Failed to get supported 01 IDs 0x1 - 0x20 for ECU 0x7e8 frame 0x0"));
}

TEST_F(Proxy, LinkLostWhileTheFirstModuleIsReadFailsThoughItsInitSucceeds)
{
    m_device->onRequest = [this](Bytes const& request) {
        if (request == Bytes{0x06, 0x00}) {
            m_device->enabled = false;
        }
    };
    EXPECT_FALSE(initialize());
    EXPECT_EQ(m_device->requests.back(), (Bytes{0x06, 0x00})) << "the remaining steps are skipped";
    EXPECT_EQ(ids(), std::vector<unsigned int>{0x7E8}) << "what was read stays";
}

TEST_F(Proxy, UnknownIdGivesNull)
{
    ASSERT_TRUE(initialize());
    EXPECT_EQ(m_proxy->ecu(0x123), nullptr);
    EXPECT_EQ(m_proxy->ecu(0x7E8)->id(), 0x7E8U);
}

TEST_F(Proxy, SecondInitializeReleasesTheOldModules)
{
    ASSERT_TRUE(initialize());
    std::weak_ptr<obd::IEcu> const dropped = m_proxy->firstEcu();
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_TRUE(dropped.expired());
    std::shared_ptr<obd::IEcu> const held = m_proxy->firstEcu();
    ASSERT_TRUE(m_proxy->initialize());
    EXPECT_EQ(held->id(), 0x7E8U) << "held elsewhere it stays valid";
    EXPECT_NE(held, m_proxy->firstEcu());
}

TEST_F(Proxy, NewDeviceLeavesTheModulesUntilTheNextInitialize)
{
    ASSERT_TRUE(initialize());
    m_proxy->setDevice(nullptr);
    EXPECT_FALSE(m_proxy->isConnected());
    EXPECT_EQ(m_proxy->ecus().size(), 1U);
}

TEST_F(Proxy, LostLinkRefusesRequestsWithoutTouchingTheDevice)
{
    ASSERT_TRUE(initialize());
    std::size_t const before = m_device->requests.size();
    m_device->enabled = false;
    obd::ResponseMap responses;
    EXPECT_EQ(m_proxy->execute(Bytes{0x01, 0x0C}, responses, 100), IDevice::Status::Unparsed);
    EXPECT_EQ(m_device->requests.size(), before);
    EXPECT_EQ(m_proxy->protocol(), obd::ObdProtocolUnknown);
}

TEST_F(Proxy, VoltageIsTheDevices)
{
    ASSERT_TRUE(initialize());
    EXPECT_FLOAT_EQ(m_proxy->batteryVoltage(), 12.5F);
    m_device->volts = 0.0F;
    m_log.clear();
    EXPECT_EQ(m_proxy->batteryVoltage(), 0.0F);
    m_device->voltsRead = false;
    EXPECT_EQ(m_proxy->batteryVoltage(), 0.0F);
    EXPECT_EQ(m_log.lines(),
              (std::vector<std::string>{"ERROR Failed to get battery voltage", "ERROR Failed to get battery voltage"}));
}

TEST_F(Proxy, TextCommandsGoToTheDevice)
{
    ASSERT_TRUE(initialize());
    std::string reply;
    EXPECT_EQ(m_proxy->execute("ATRV", reply, 100), IDevice::Status::Ok);
    EXPECT_EQ(m_device->lastCommand, "ATRV");
    EXPECT_EQ(reply, "OK");
}

TEST_F(Proxy, OneExchangeAtATimeWhateverThreadAsks)
{
    ASSERT_TRUE(initialize());
    std::atomic<int> inside{0};
    std::atomic<int> most{0};
    m_device->onRequest = [&](Bytes const&) {
        int const now = ++inside;
        most = std::max(most.load(), now);
        std::this_thread::yield();
        --inside;
    };
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([this] {
            for (int i = 0; i < 50; ++i) {
                obd::ResponseMap responses;
                m_proxy->execute(Bytes{0x01, 0x00}, responses, 100);
                m_proxy->ecu(0x7E8);
            }
        });
    }
    for (std::thread& thread : threads) {
        thread.join();
    }
    EXPECT_EQ(most, 1);
}

TEST_F(Proxy, ReleasedProxyAndModulesAreGone)
{
    ASSERT_TRUE(initialize());
    std::weak_ptr<obd::ObdProxy> const watched = m_proxy;
    m_proxy->releaseEcus();
    m_proxy = std::make_shared<obd::ObdProxy>();
    EXPECT_TRUE(watched.expired());
}

} // namespace
