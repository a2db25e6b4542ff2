#pragma once

#include "libobd/connection/connectionmanager.h"
#include "tests/support/dialogue/elmdialogue.h"
#include "tests/support/fakeclock.h"
#include "tests/support/logcapture.h"

#include <obd/dispatcher.h>
#include <obd/iconnectionmanager.h>
#include <obd/idataconnection.h>
#include <obd/iobdproxy.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

// A connection manager on a scripted channel, and who listens to it.
namespace support {

class PhaseRecorder : public obd::IConnectionPhaseListener
{
public:
    void onPhaseChanged(int phase) override
    {
        phases.push_back(phase);
        onPhase(phase);
    }

    std::vector<int> phases;
    std::function<void(int)> onPhase = [](int) {};
};

class Tap : public obd::IConnectionLogger
{
public:
    void onDataSent(std::vector<unsigned char> const& data) override { sent.emplace_back(data.begin(), data.end()); }
    void onDataReceived(std::vector<unsigned char> const& /*data*/) override { ++received; }

    std::vector<std::string> sent;
    int received = 0;
};

// A channel to nowhere: time passes, nothing comes.
class SilentChannel : public obd::IDataConnection
{
public:
    void setDelimiter(char /*delimiter*/) override {}
    bool isValid() const override { return true; }
    bool receive(std::vector<unsigned char>& /*out*/, int timeoutMs) override
    {
        tervex::sleepMillis(static_cast<unsigned int>(std::max(timeoutMs, 0)));
        return false;
    }
    void send(std::vector<unsigned char> const& /*bytes*/) override
    {
        if (throws) {
            throw std::runtime_error("out of memory");
        }
    }
    void addLogger(obd::IConnectionLogger* /*logger*/) override {}
    void removeLogger(obd::IConnectionLogger* /*logger*/) override {}

    bool throws = false;
};

class ConnectionManager : public testing::Test
{
protected:
    ConnectionManager() { m_manager.addPhaseListener(&m_phases); }
    ~ConnectionManager() override
    {
        obd::Dispatcher::getInstance().cancel();
        obd::Dispatcher::getInstance().setProxy(nullptr);
    }

    std::shared_ptr<ScriptedChannel> newChannel() { return std::make_shared<ScriptedChannel>(m_clock); }
    std::shared_ptr<ScriptedChannel> workingChannel()
    {
        auto channel = newChannel();
        expectOpening(*channel);
        return channel;
    }
    bool open(std::shared_ptr<obd::IDataConnection> const& channel)
    {
        return m_manager.openConnection(channel, obd::VehicleProtocol::Automatic, false);
    }
    // An opening that ends after the adapter was found, since no module answers.
    bool failAtVehicle(std::shared_ptr<ScriptedChannel> const& channel)
    {
        expectInitialize(*channel);
        channel->expect("ATTP0").reply("OK\r\r>");
        channel->expect("0100").loseLink();
        return open(channel);
    }
    std::vector<std::string> infoLines() const { return linesOf("INFO "); }
    std::vector<std::string> fatalLines() const { return linesOf("FATAL "); }

    FakeClock m_clock;
    LogCapture m_log;
    PhaseRecorder m_phases;
    Tap m_tap;
    obd::ConnectionManager m_manager;

private:
    // Those of the manager alone.
    std::vector<std::string> linesOf(std::string const& level) const
    {
        std::vector<std::string> found;
        for (std::string const& line : m_log.lines()) {
            bool const isOwn = line.find("Connection") != std::string::npos || line.find("lock") != std::string::npos ||
                               line.find("connection") != std::string::npos || line.find("Failed to") == 6;
            if (line.starts_with(level) && isOwn) {
                found.push_back(line.substr(level.size()));
            }
        }
        return found;
    }
};

} // namespace support
