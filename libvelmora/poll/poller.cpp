#include "libvelmora/poll/poller.h"

#include <common/clock.h>
#include <obd/parameterfactory.h>
#include <obd/sensorpids.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds longestSleep{20}; // so that the end is not waited for

} // namespace

PidLength pidLengths(std::vector<PollSource> const& sources)
{
    bool const fourBanks = std::any_of(sources.begin(), sources.end(), [](PollSource const& source) {
        return source.ecu != nullptr && source.ecu->oxygenSensorBanks() == obd::OxygenSensorBank::Pid1D;
    });
    // How long a trim is there, only the reply can tell: such are asked alone.
    return [fourBanks](unsigned char pid) {
        return fourBanks && obd::isFuelTrim(pid)
                   ? std::nullopt
                   : obd::ParameterFactory::dataLength(obd::ParameterIdentifier(pid).id());
    };
}

Poller::Poller(std::shared_ptr<obd::IObdProxy> const& proxy, std::vector<PollSource> const& sources,
               PollPace const& pace, Units units, PollCycle::Sink sink, IChannelControl* channel)
    : m_cycle(proxy, sources, pace, pidLengths(sources), units, std::move(sink), channel), m_thread([this] { run(); })
{}

Poller::~Poller()
{
    m_stop = true;
    m_cycle.stop();
    m_thread.join();
}

void Poller::run()
{
    while (!m_stop) {
        std::chrono::milliseconds const wait = std::min(m_cycle.wait(), longestSleep);
        if (wait.count() > 0) {
            tervex::sleepMillis(static_cast<unsigned int>(wait.count()));
        } else {
            m_cycle.step();
        }
    }
}

} // namespace velmora
