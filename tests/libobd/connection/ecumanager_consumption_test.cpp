#include "libobd/connection/connectionnotifier.h"
#include "libobd/connection/ecumanager.h"
#include "libobd/connection/velmorasettings.h"
#include "tests/support/fakeproxy.h"
#include "tests/support/logcapture.h"
#include "tests/support/memorysettings.h"

#include <obd/parameterdescriptor.h>
#include <obd/powertrainparameter.h>

#include <gtest/gtest.h>

namespace {

class EcuManagerConsumption : public testing::Test
{
protected:
    EcuManagerConsumption() { m_proxy.setEcus({m_engine}); }

    // The names of what is displayed of a module that reports these.
    std::vector<std::string> names(obd::IgnitionType type, std::vector<unsigned char> const& pids)
    {
        m_engine->setIgnitionType(type).setSupported(obd::ObdMode::CurrentData, pids);
        m_manager.onConnectionOpened();
        std::vector<std::string> found;
        for (auto const& descriptor : m_manager.getParameters(0x7E8)) {
            found.push_back(descriptor->description());
        }
        return found;
    }

    support::LogCapture m_log;
    std::shared_ptr<support::FakeEcu> m_engine = std::make_shared<support::FakeEcu>(0x7E8U);
    support::FakeProxy m_proxy;
    obd::ConnectionNotifier m_notifier;
    obd::VelmoraSettings m_settings{std::make_shared<support::MemorySettings>()};
    obd::EcuManager m_manager{m_notifier, &m_proxy, &m_settings};
};

TEST_F(EcuManagerConsumption, IsDescribedByTheModelThatSuitsTheModule)
{
    EXPECT_EQ(names(obd::IgnitionType::Spark, {0x0D, 0x10, 0xF0}).back(), "Fuel consumption");
    EXPECT_EQ(names(obd::IgnitionType::Spark, {0x0B, 0x0C, 0x0D, 0x0F, 0xF0}).back(), "Fuel consumption");
    EXPECT_EQ(names(obd::IgnitionType::Compression, {0x04, 0x0D, 0x10, 0xF0}).back(), "Fuel consumption");
    EXPECT_FALSE(m_log.contains("ERROR Failed to create sensor 0xf0"));
}

TEST_F(EcuManagerConsumption, WithoutASuitingModelItIsLeftOutAndTheOthersFollow)
{
    auto const found = names(obd::IgnitionType::Compression, {0x0D, 0x10, 0xF0, 0xF4});
    EXPECT_EQ(found.size(), 3U);
    EXPECT_EQ(found.back(), "Battery voltage");
    EXPECT_TRUE(m_log.contains("ERROR Failed to create sensor 0xf0"));
}

} // namespace
