#include "program/live/performancepage.h"

#include "libvelmora/performance/performancejson.h"
#include "program/live/userfiles.h"
#include "program/view/performancetext.h"

#include <velmora/error.h>

#include <utility>

namespace velmora::cli {

PerformancePage::PerformancePage(std::shared_ptr<obd::IEcu> module, obd::IVelmoraSettings const& settings)
    : m_module(std::move(module)), m_settings(settings), m_model(m_module, settings)
{}

void PerformancePage::take(PollResult const& result)
{
    for (Reading const& reading : result.readings) {
        if (reading.module != m_module->id()) {
            continue;
        }
        if (std::optional<double> const kmh = speedIn(reading)) {
            m_meter.addSpeed(std::chrono::duration<double>(reading.time.time_since_epoch()).count(), *kmh);
        }
        if (std::optional<PowerModel::Output> const output = m_model.take(reading)) {
            m_meter.addPower(output->rpm, output->kilowatt, output->newtonMetre);
        }
    }
}

std::string PerformancePage::draw(std::string const& note, FrameStyle const& style) const
{
    bool const imperial = m_settings.unitSystem() == obd::UnitSystem::Imperial;
    return drawPerformance({m_meter, imperial, static_cast<int>(m_settings.vehicleWeight()), note}, style);
}

std::string PerformancePage::save() const
{
    if (m_meter.run().empty()) {
        throw Error(ErrorKind::Failed, "There is no run yet");
    }
    bool const imperial = m_settings.unitSystem() == obd::UnitSystem::Imperial;
    Json const json = performanceJson(m_meter, sprintGoals(imperial), static_cast<int>(m_settings.vehicleWeight()));
    return "Saved as " + saveUserText("performance", ".json", json.dump(2) + "\n").string();
}

} // namespace velmora::cli
