#include "program/live/performancepage.h"

#include "program/live/userfiles.h"
#include "program/view/performancetext.h"

#include <velmora/error.h>

namespace velmora::cli {

PerformancePage::PerformancePage(LiveReader const& reader)
    : m_reader(reader), m_imperial(reader.units() != Units::Metric)
{}

std::string PerformancePage::draw(std::string const& note, FrameStyle const& style) const
{
    return drawPerformance({m_reader.run(), m_imperial, note}, style);
}

std::string PerformancePage::save() const
{
    PerformanceRun const run = m_reader.run();
    if (run.speeds.empty()) {
        throw Error(ErrorKind::Failed, "There is no run yet");
    }
    return "Saved as " + saveUserText("performance", ".json", toJson(run, sprintGoals(m_imperial))).string();
}

} // namespace velmora::cli
