#include "libvelmora/car/carcore.h"
#include "libvelmora/car/livestate.h"
#include "libvelmora/live/ratetext.h"

#include <obd/ivelmorasettings.h>

#include <utility>

namespace velmora {

LiveReader::LiveReader(std::shared_ptr<CarCore> core, std::shared_ptr<LiveState> state)
    : m_core(std::move(core)), m_state(std::move(state))
{}

LiveReader::~LiveReader()
{
    m_core->onThread([this] { m_state->drop(); });
}

bool LiveReader::wait(std::chrono::milliseconds time)
{
    return m_state->feed()->wait(time);
}

std::vector<LiveTurn> LiveReader::take()
{
    std::vector<LiveTurn> turns;
    for (PollResult& each : m_state->feed()->take()) {
        for (Reading const& reading : each.readings) {
            m_state->time(reading);
        }
        turns.push_back({each.module, static_cast<int>(each.id), std::move(each.readings), std::move(each.values)});
    }
    return turns;
}

std::vector<LiveParameter> LiveReader::parameters() const
{
    return m_core->onThread([this] { return m_state->choice().parameters(); });
}

void LiveReader::restart()
{
    m_core->onThread([this] { m_state->restart(); });
}

std::vector<LiveOffer> LiveReader::offers() const
{
    return m_core->onThread([this] { return m_state->choice().offers(); });
}

std::vector<int> LiveReader::picked() const
{
    return m_core->onThread([this] { return m_state->choice().picked(); });
}

void LiveReader::pick(std::vector<int> const& ids)
{
    m_core->onThread([this, &ids] {
        m_state->choice().pick(ids);
        m_state->restart();
    });
}

std::vector<std::string> LiveReader::words() const
{
    return m_core->onThread([this] { return m_state->choice().words(); });
}

std::string LiveReader::modulesText() const
{
    return m_core->onThread([this] { return m_state->choice().modulesText(); });
}

Units LiveReader::units() const
{
    return m_core->onThread([this] { return m_state->session().units(); });
}

void LiveReader::setMetric(bool metric)
{
    m_core->onThread([this, metric] {
        m_state->session().obd().getSettings()->setUnitSystem(metric ? obd::UnitSystem::Metric
                                                                     : obd::UnitSystem::Imperial);
        m_state->restart();
    });
}

void LiveReader::beginRuns()
{
    m_core->onThread([this] { m_state->beginRuns(); });
}

void LiveReader::endRuns()
{
    m_core->onThread([this] { m_state->endRuns(); });
}

PerformanceRun LiveReader::run() const
{
    return m_state->run();
}

std::string LiveReader::reachedRates() const
{
    return velmora::reachedRates(m_state->feed()->rates());
}

std::string LiveReader::missedRates() const
{
    return velmora::missedRates(m_state->feed()->rates());
}

std::string LiveReader::signalTroubles() const
{
    return m_core->onThread([this] { return m_state->choice().signalTroubles(); });
}

void LiveReader::checkAdapter() const
{
    m_core->onThread([this] { m_state->session().checkAdapter(); });
}

bool LiveReader::isConnected() const
{
    return m_core->onThread([this] { return m_state->session().proxy()->isConnected(); });
}

} // namespace velmora
