#include "libvelmora/performance/runboard.h"

#include "libvelmora/performance/performancejson.h"
#include "libvelmora/performance/sprint.h"

#include <utility>

namespace velmora {

void RunBoard::begin(std::shared_ptr<obd::IEcu> const& module, obd::IVelmoraSettings const& settings)
{
    auto model = std::make_unique<PowerModel>(module, settings);
    int const kilograms = settings.vehicleWeight();
    std::lock_guard const lock(m_mutex);
    m_model = std::move(model);
    m_module = module->id();
    m_kilograms = kilograms;
    m_meter.reset();
    m_begun = true;
    m_changed = true;
}

void RunBoard::end()
{
    std::lock_guard const lock(m_mutex);
    m_model.reset();
    m_changed = true;
}

void RunBoard::take(Reading const& reading)
{
    std::lock_guard const lock(m_mutex);
    if (m_model == nullptr || reading.module != m_module) {
        return;
    }
    if (std::optional<double> const kmh = speedIn(reading)) {
        m_meter.addSpeed(std::chrono::duration<double>(reading.time.time_since_epoch()).count(), *kmh);
        m_changed = true;
    }
    if (std::optional<PowerModel::Output> const output = m_model->take(reading)) {
        m_meter.addPower(output->rpm, output->kilowatt, output->newtonMetre);
    }
}

bool RunBoard::isActive() const
{
    std::lock_guard const lock(m_mutex);
    return m_model != nullptr;
}

Json RunBoard::state(bool whole) const
{
    std::lock_guard const lock(m_mutex);
    if (!m_begun) {
        return {};
    }
    Json json = performanceJson(m_meter.run(m_kilograms), allSprintGoals());
    if (!whole) {
        json.erase("speed");
    }
    json["active"] = m_model != nullptr;
    json["kmh"] = m_meter.kmh();
    return json;
}

bool RunBoard::takeChange()
{
    std::lock_guard const lock(m_mutex);
    return std::exchange(m_changed, false);
}

} // namespace velmora
