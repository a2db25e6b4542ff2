#pragma once

#include "libobd/adapter/elmscantool.h"
#include "tests/support/dialogue/elmdialogue.h"
#include "tests/support/logcapture.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

// A driver on a scripted adapter.
class ElmScantoolFixture : public testing::Test
{
protected:
    using Status = obd::IDevice::Status;

    // Makes the driver take the other end for an adapter of that name, and forgets about it.
    void nameAdapter(std::string const& name)
    {
        std::string const describe(obd::familyTrait(name, &obd::ElmFamily::describe));
        m_channel->expect("ATI").reply(name + "\r\r>");
        m_channel->expect(describe).reply("\r>");
        ASSERT_TRUE(m_device.identifyInterface());
        ASSERT_EQ(m_device.device(), name);
        m_before = m_channel->sentBytes().size();
        m_dialoguesBefore = m_channel->dialogues().size();
        m_log.clear();
    }

    // Takes the driver as far as a vehicle link on the given protocol, and forgets about it.
    void connect(std::string const& number = "6")
    {
        support::expectInitialize(*m_channel);
        support::expectDetectVehicle(*m_channel, 0, "4100BE3FA813\r\r>", number);
        ASSERT_TRUE(m_device.initialize());
        ASSERT_TRUE(m_device.detectVehicle(obd::VehicleProtocol::Automatic));
        m_before = m_channel->sentBytes().size();
        m_dialoguesBefore = m_channel->dialogues().size();
        m_log.clear();
    }

    // What was sent since, terminators included.
    std::vector<std::string> sent() const
    {
        std::vector<std::string> all = m_channel->sentBytes();
        return {all.begin() + static_cast<std::ptrdiff_t>(m_before), all.end()};
    }

    // The commands since, each with the time spent in its reads.
    std::vector<support::Dialogue> dialogues() const
    {
        std::vector<support::Dialogue> all = m_channel->dialogues();
        return {all.begin() + static_cast<std::ptrdiff_t>(m_dialoguesBefore), all.end()};
    }

    support::FakeClock m_clock;
    support::LogCapture m_log;
    std::shared_ptr<support::ScriptedChannel> m_channel = std::make_shared<support::ScriptedChannel>(m_clock);
    obd::ElmScantool m_device{m_channel};

private:
    std::size_t m_before = 0;
    std::size_t m_dialoguesBefore = 0;
};
