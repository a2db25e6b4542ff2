#pragma once

#include "libvelmora/channel/fastchannel.h"
#include "libvelmora/session/libraryuse.h"
#include "libvelmora/session/session.h"
#include "simulator/simulatedcar.h"
#include "simulator/simulation.h"
#include "tests/support/temporaryfolder.h"
#include "tests/support/wire/peerwire.h"
#include "tests/support/workerclock.h"

#include <gtest/gtest.h>

#include <cctype>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora::test {

// A wire that tells of each request to the vehicle before it goes.
class WatchedWire : public support::PeerWire
{
public:
    WatchedWire(std::shared_ptr<obdsim::IPeer> peer, std::function<void(std::string const&)> onRequest)
        : PeerWire(std::move(peer)), m_onRequest(std::move(onRequest))
    {}

    void write(std::string_view bytes) override
    {
        for (char const each : bytes) {
            if (each == '\r') {
                if (!m_line.empty() && std::isdigit(static_cast<unsigned char>(m_line.front())) != 0) {
                    m_onRequest(m_line);
                }
                m_line.clear();
            } else {
                m_line += each;
            }
        }
        PeerWire::write(bytes);
    }

private:
    std::function<void(std::string const&)> m_onRequest;
    std::string m_line;
};

// A session on a simulated car in virtual time.
class ReadersTest : public testing::Test
{
protected:
    class UnusedPort : public IPort
    {
    public:
        void start(Receiver /*onBytes*/, LossHandler /*onLost*/) override {}
        void write(std::string_view /*bytes*/) override {}
        void close() override {}
    };

    // With something told to the car before, such as "module 7E9 silent".
    Session& connect(std::string const& vehicle, std::string const& before = "engine stop")
    {
        m_session.reset();
        m_car = obdsim::simulateCar({vehicle, "elm327-v1.5", {}});
        m_car->control("engine stop");
        m_car->control(before);
        SessionOptions options;
        options.port = "a car";
        options.settingsFile = (m_folder.path() / "settings.toml").string();
        options.openPort = [] { return std::make_unique<UnusedPort>(); };
        options.makeChannel = [this](std::shared_ptr<IWire> const&) -> std::shared_ptr<obd::IDataConnection> {
            auto const wire =
                std::make_shared<WatchedWire>(m_car, [this](std::string const& request) { onRequest(request); });
            return std::make_shared<FastChannel>(wire, ChannelOptions(), nullptr);
        };
        options.onProgress = [this](std::string const& text) { m_progress += text; };
        m_stopAt = 0;
        m_session.emplace(options);
        m_session->connect();
        m_asked.clear();
        return *m_session;
    }
    obd::IEcu const& module(std::size_t index = 0) { return *m_session->selectedModules().at(index); }

    void onRequest(std::string const& request)
    {
        m_asked.push_back(request);
        if (m_asked.size() == m_stopAt) {
            m_session->interrupt();
        }
    }

    LibraryUse const m_catalogue{std::string()}; // so that no session has to load it anew
    support::WorkerClock m_clock;
    testsupport::TemporaryFolder const m_folder;
    std::shared_ptr<obdsim::SimulatedCar> m_car;
    std::vector<std::string> m_asked; // since the connection stands
    std::string m_progress;
    std::size_t m_stopAt = 0; // which request ends the session; 0: none
    std::optional<Session> m_session;
};

} // namespace velmora::test
