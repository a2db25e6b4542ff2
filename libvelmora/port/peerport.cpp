#include "libvelmora/port/peerport.h"

#include "simulator/error.h"
#include "simulator/simulation.h"

#include <velmora/error.h>

#include <algorithm>
#include <optional>
#include <utility>

namespace velmora {

PeerPort::PeerPort(std::shared_ptr<obdsim::IPeer> peer, bool instant) : m_peer(std::move(peer)), m_instant(instant) {}

PeerPort::~PeerPort()
{
    PeerPort::close();
}

void PeerPort::start(Receiver onBytes, LossHandler onLost)
{
    m_onBytes = std::move(onBytes);
    m_onLost = std::move(onLost);
    m_start = std::chrono::steady_clock::now();
    m_peer->connect();
    m_thread = std::thread([this] { run(); });
}

void PeerPort::write(std::string_view bytes)
{
    std::lock_guard const lock(m_mutex);
    m_toPeer += bytes;
    m_wake.notify_one();
}

void PeerPort::close()
{
    {
        std::lock_guard const lock(m_mutex);
        m_stop = true;
        m_wake.notify_one();
    }
    if (m_thread.joinable()) {
        m_thread.join();
    }
}

obdsim::Time PeerPort::elapsed() const
{
    return std::chrono::duration_cast<obdsim::Time>(std::chrono::steady_clock::now() - m_start);
}

void PeerPort::waitForWork(std::unique_lock<std::mutex>& lock)
{
    auto const hasWork = [this] { return m_stop || !m_toPeer.empty(); };
    std::optional<obdsim::Time> const due = m_peer->nextOutput();
    if (due && m_instant) {
        m_start -= std::max(*due - elapsed(), obdsim::Time(0));
    } else if (due) {
        m_wake.wait_until(lock, m_start + *due, hasWork);
    } else {
        m_wake.wait(lock, hasWork);
    }
}

void PeerPort::run()
{
    std::unique_lock lock(m_mutex);
    while (!m_stop) {
        waitForWork(lock);
        std::string const toPeer = std::exchange(m_toPeer, {});
        lock.unlock();
        std::string output = m_peer->advanceTo(elapsed());
        if (!toPeer.empty()) {
            m_peer->receive(toPeer);
            output += m_peer->advanceTo(elapsed());
        }
        if (!output.empty()) {
            m_onBytes(output);
        }
        if (!m_peer->linkIsUp()) {
            m_onLost();
            return;
        }
        lock.lock();
    }
}

std::unique_ptr<IPort> openSimulatorPort(SimulatorAddress const& address)
{
    obdsim::SimulationOptions options;
    options.vehicle = address.vehicle.empty() ? options.vehicle : address.vehicle;
    options.adapter = address.adapter.empty() ? options.adapter : address.adapter;
    options.drive = address.drive;
    options.scenario = address.scenario;
    options.faults = address.faults;
    try {
        return std::make_unique<PeerPort>(obdsim::simulate(options), address.instant);
    } catch (obdsim::SimulatorError const& error) {
        throw Error(
            ErrorKind::PortFailed, std::string("Could not start the simulated car: ") + error.what(),
            {"sim:NAME takes a built-in car or a vehicle file, sim:NAME?drive=town a drive, adapter= and fault= "
             "others; `velmora simulate --list` lists them all"});
    }
}

std::unique_ptr<IPort> openReplayPort(ReplayAddress const& address)
{
    constexpr std::string_view instantEnding = "?instant"; // without the pauses of the recording
    bool const instant = address.file.ends_with(instantEnding);
    std::string const file = address.file.substr(0, address.file.size() - (instant ? instantEnding.size() : 0));
    try {
        return std::make_unique<PeerPort>(obdsim::replay(file), instant);
    } catch (obdsim::SimulatorError const& error) {
        throw Error(ErrorKind::PortFailed, std::string("Could not replay the recorded dialogue: ") + error.what(),
                    {"replay:FILE takes a file that `velmora record FILE` has written"});
    }
}

} // namespace velmora
