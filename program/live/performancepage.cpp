#include "program/live/performancepage.h"

#include "program/live/userfiles.h"
#include "program/view/performancetext.h"

#include <obd/ivelmorasettings.h>
#include <velmora/error.h>

#include <utility>

namespace velmora::cli {

PerformancePage::PerformancePage(std::shared_ptr<obd::IEcu> module, obd::IVelmoraSettings const& settings)
    : m_settings(settings), m_timer(std::move(module), settings)
{}

bool PerformancePage::isImperial() const
{
    return m_settings.unitSystem() == obd::UnitSystem::Imperial;
}

std::string PerformancePage::draw(std::string const& note, FrameStyle const& style) const
{
    return drawPerformance({m_timer.run(), isImperial(), note}, style);
}

std::string PerformancePage::save() const
{
    PerformanceRun const run = m_timer.run();
    if (run.speeds.empty()) {
        throw Error(ErrorKind::Failed, "There is no run yet");
    }
    return "Saved as " + saveUserText("performance", ".json", toJson(run, sprintGoals(isImperial()))).string();
}

} // namespace velmora::cli
