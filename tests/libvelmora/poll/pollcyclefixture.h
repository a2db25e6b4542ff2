#pragma once

#include "libvelmora/poll/pollcycle.h"
#include "tests/support/fakeclock.h"
#include "tests/support/fakeecu.h"
#include "tests/support/fakeproxy.h"

#include <obd/parameterfactory.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora::test {

using support::FakeEcu;
using support::FakeProxy;

inline constexpr PollPace careful{};
inline constexpr PollPace fastSingle{std::chrono::milliseconds(0), std::chrono::milliseconds(0), 1};
inline constexpr PollPace fastSix{std::chrono::milliseconds(0), std::chrono::milliseconds(0), 6};
inline constexpr PollPace fastAddressed{std::chrono::milliseconds(0), std::chrono::milliseconds(0), 1, true};

// Notes which module requests go to.
struct FakeChannel : IChannelControl
{
    void addressModule(std::optional<unsigned int> id) override { module = id; }
    void address(std::optional<RequestAddress> const& /*address*/) override {}
    std::string refusedAddress() const override { return {}; }
    AddressedReply takeReply() override { return {}; }
    void onConnected() override {}
    ChannelStatistics statistics() const override { return {}; }

    std::optional<unsigned int> module;
};

// A vehicle whose modules answer in 12 ms, and a poller on it that runs in a time of its own.
class PollCycleTest : public testing::Test
{
protected:
    PollCycleTest()
    {
        m_proxy->during([this] { m_clock.advance(12); });
        m_engine->setSupported(obd::ObdMode::CurrentData, {0x04, 0x05, 0x0B, 0x0C, 0x0D, 0x10, 0x11, 0x33});
        m_proxy->setEcus({m_engine, m_gearbox});
    }

    void want(std::shared_ptr<FakeEcu> const& ecu, int pid, std::optional<double> hertz = {})
    {
        auto const id = obd::ParameterIdentifier(pid).id();
        m_sources.push_back({ecu, obd::ParameterFactory().createParameter(id), hertz});
    }
    void want(int pid) { want(m_engine, pid); }

    // For so many milliseconds from the start of the cycle, or from where it was.
    void run(PollPace const& pace, unsigned int ms)
    {
        if (m_cycle == nullptr) {
            m_cycle = std::make_unique<PollCycle>(
                m_proxy, m_sources, pace,
                [](unsigned char pid) { return obd::ParameterFactory::dataLength(obd::ParameterIdentifier(pid).id()); },
                m_units, [this](PollResult const& result) { m_results.push_back(result); }, &m_channel);
        }
        unsigned int const end = m_clock.millis() + ms;
        while (m_clock.millis() < end) {
            if (auto const wait = m_cycle->wait(); wait.count() > 0) {
                m_clock.advance(static_cast<unsigned int>(wait.count()));
            } else {
                m_cycle->step();
            }
        }
    }

    // Texts of what was read last from a module.
    std::string last(unsigned int module, int pid) const
    {
        std::string text;
        for (PollResult const& result : m_results) {
            if (result.module == module && result.id == pid) {
                text = result.values.front()->value;
            }
        }
        return text;
    }
    std::size_t count(unsigned int module, int pid) const
    {
        return static_cast<std::size_t>(std::count_if(m_results.begin(), m_results.end(), [&](auto const& result) {
            return result.module == module && result.id == pid;
        }));
    }

    // Modules answer in so many milliseconds, and at their own addresses in so many; 0: not at all. Notes how requests
    // go.
    void answerIn(unsigned int broadcast, unsigned int addressed)
    {
        m_proxy->during([this, broadcast, addressed] {
            m_way += m_channel.module ? 'a' : 'b';
            m_clock.advance(m_channel.module ? std::max(addressed, 20U) : broadcast);
            if (addressed == 0) {
                m_channel.module ? m_proxy->fail("01 0C", FakeProxy::Status::NoResponse)
                                 : m_proxy->answer("01 0C", "41 0C 1A F8");
            }
        });
    }

    support::FakeClock m_clock;
    FakeChannel m_channel;
    std::string m_way;
    std::shared_ptr<FakeProxy> m_proxy = std::make_shared<FakeProxy>();
    std::shared_ptr<FakeEcu> m_engine = std::make_shared<FakeEcu>(0x7E8);
    std::shared_ptr<FakeEcu> m_gearbox = std::make_shared<FakeEcu>(0x7E9);
    std::vector<PollSource> m_sources;
    std::unique_ptr<PollCycle> m_cycle;
    std::vector<PollResult> m_results;
    Units m_units = Units::Metric;
};

} // namespace velmora::test
