// What the car is asked while it is awake: which sensors and signals, and who asks.

#include "libvelmora/watch/sessioncar.h"
#include "libvelmora/watch/watchsources.h"

#include <obd/vehiclemodelyear.h>

#include <utility>

namespace velmora {

std::vector<PollSource> SessionCar::chooseSources()
{
    m_signals = std::make_unique<SignalChoice>(*m_session);
    std::vector<PollSource> sources;
    addSources(*m_session, m_only, sources);
    if (sources.empty()) {
        sources = watchSources(*m_session, m_options.sensors, *m_signals);
        addSources(*m_session, m_further, sources);
    }
    return sources;
}

void SessionCar::readAlso(std::vector<std::string> const& wishes)
{
    m_further = wishes;
    changeSources();
}

void SessionCar::readOnly(std::vector<std::string> const& wishes)
{
    m_only = wishes;
    changeSources();
}

void SessionCar::changeSources()
{
    if (!m_up) {
        return;
    }
    std::vector<PollSource> sources = chooseSources();
    bool const asking = m_poller != nullptr;
    stopAsking();
    m_sources = std::move(sources);
    if (asking) {
        startAsking();
    }
}

SensorList SessionCar::sensors()
{
    SensorList list = sensorList(m_options.vehicle, m_sources);
    for (SignalRow const& row : m_signals->rows()) {
        list.sensors.push_back({row.module, row.sensor, row.request, row.name, row.unit, row.hertz.value_or(0.0)});
    }
    return list;
}

void SessionCar::startAsking()
{
    std::shared_ptr<obd::IObdProxy> const proxy = m_session->proxy();
    PollPace const pace = choosePace({m_options.fast, 6}, proxy->protocol(), obd::GetVehicleModelYear(m_vin));
    std::vector<PollSource> sources = m_sources;
    for (PollSource& each : m_signals->sources(false)) {
        sources.push_back(std::move(each));
    }
    m_poller = std::make_unique<Poller>(
        proxy, sources, pace, Units::Metric,
        [this](PollResult const& result) {
            if (m_options.onReading) {
                for (Reading const& each : result.readings) {
                    m_options.onReading(each);
                }
            }
            std::lock_guard const lock(m_mutex);
            for (Reading const& each : result.readings) {
                m_readings.push_back(each);
                m_readings.back().vehicle = m_options.vehicle;
            }
        },
        &m_session->channel());
}

void SessionCar::stopAsking()
{
    m_poller.reset();
}

std::vector<Reading> SessionCar::readings()
{
    std::lock_guard const lock(m_mutex);
    return std::exchange(m_readings, {});
}

} // namespace velmora
