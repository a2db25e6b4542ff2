#pragma once

#include "libvelmora/performance/performancemeter.h"
#include "libvelmora/performance/powermodel.h"
#include "program/view/framestyle.h"

#include <memory>
#include <string>

namespace velmora::cli {

// Timed runs of one vehicle while its speed and engine speed alone are read.
class PerformancePage
{
public:
    // module: whose readings count. settings must outlive it.
    PerformancePage(std::shared_ptr<obd::IEcu> module, obd::IVelmoraSettings const& settings);

    void take(PollResult const& result);
    std::string draw(std::string const& note, FrameStyle const& style) const;
    // Writes the run to a file of the user's, and tells which.
    std::string save() const;

private:
    std::shared_ptr<obd::IEcu> const m_module;
    obd::IVelmoraSettings const& m_settings;
    PowerModel m_model;
    PerformanceMeter m_meter;
};

} // namespace velmora::cli
