#include "libvelmora/performance/performancemeter.h"
#include "libvelmora/performance/powermodel.h"

#include <velmora/performance.h>

#include <utility>

namespace velmora {

struct PerformanceTimer::Parts
{
    std::shared_ptr<obd::IEcu> module; // null: of any
    obd::IVelmoraSettings const* settings = nullptr;
    std::unique_ptr<PowerModel> model;
    PerformanceMeter meter;
};

PerformanceTimer::PerformanceTimer() : m_parts(std::make_unique<Parts>()) {}

PerformanceTimer::PerformanceTimer(std::shared_ptr<obd::IEcu> module, obd::IVelmoraSettings const& settings)
    : PerformanceTimer()
{
    m_parts->model = std::make_unique<PowerModel>(module, settings);
    m_parts->module = std::move(module);
    m_parts->settings = &settings;
}

PerformanceTimer::~PerformanceTimer() = default;

void PerformanceTimer::take(Reading const& reading)
{
    if (m_parts->module != nullptr && reading.module != m_parts->module->id()) {
        return;
    }
    if (std::optional<double> const kmh = speedIn(reading)) {
        m_parts->meter.addSpeed(std::chrono::duration<double>(reading.time.time_since_epoch()).count(), *kmh);
    }
    if (m_parts->model == nullptr) {
        return;
    }
    if (std::optional<PowerModel::Output> const output = m_parts->model->take(reading)) {
        m_parts->meter.addPower(output->rpm, output->kilowatt, output->newtonMetre);
    }
}

PerformanceRun PerformanceTimer::run() const
{
    return m_parts->meter.run(m_parts->settings != nullptr ? static_cast<int>(m_parts->settings->vehicleWeight()) : 0);
}

} // namespace velmora
